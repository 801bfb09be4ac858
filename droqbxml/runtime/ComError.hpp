// The one error type of the library. A ComError carries the platform's error record
// (number, source, description, help file, help context, last system error); the runtime's
// own errors (type mismatch, overflow, file errors, ...) are raised through
// raiseRuntimeError with the platform's numbers and texts and the source "DroQbXml".
#ifndef DROQBXML_RUNTIME_COMERROR_HPP_
#define DROQBXML_RUNTIME_COMERROR_HPP_

#include <cstdint>
#include <exception>
#include <string>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

// The platform's current-error object: what a raised error carries to the host.
struct ErrorRecord {
  int32_t Number = 0;
  Text Source;
  Text Description;
  Text HelpFile;
  int32_t HelpContext = 0;
  int32_t LastDllError = 0;
};

class ComError : public std::exception {
 public:
  explicit ComError(ErrorRecord record);

  const ErrorRecord& record() const noexcept { return record_; }
  int32_t number() const noexcept { return record_.Number; }
  const Text& source() const noexcept { return record_.Source; }
  const Text& description() const noexcept { return record_.Description; }
  // The description in UTF-8.
  const char* what() const noexcept override { return what_.c_str(); }

 private:
  ErrorRecord record_;
  std::string what_;
};

// The runtime's own error numbers (the platform's, not the component's ERROR_NUMBER).
namespace RuntimeError {
inline constexpr int32_t kInvalidProcedureCall = 5;
inline constexpr int32_t kOverflow = 6;
inline constexpr int32_t kTypeMismatch = 13;
inline constexpr int32_t kBadFileNameOrNumber = 52;
inline constexpr int32_t kFileNotFound = 53;
inline constexpr int32_t kTooManyFiles = 67;
inline constexpr int32_t kPermissionDenied = 70;
inline constexpr int32_t kPathFileAccessError = 75;
inline constexpr int32_t kPathNotFound = 76;
inline constexpr int32_t kObjectNotSet = 91;
inline constexpr int32_t kInvalidUseOfNull = 94;
inline constexpr int32_t kCantCreateObject = 429;
inline constexpr int32_t kMemberNotSupported = 438;
inline constexpr int32_t kArgumentNotOptional = 449;
inline constexpr int32_t kDuplicateKey = 457;
}  // namespace RuntimeError

// The platform's description of one of the runtime's numbers ("Overflow", ...).
Text runtimeErrorDescription(int32_t number);

// Raises a runtime error: the number, its platform description and source "DroQbXml".
[[noreturn]] void raiseRuntimeError(int32_t number);

// Raises an error with the given values (help file and context empty).
[[noreturn]] void raiseError(int32_t number, Text source, Text description);

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_COMERROR_HPP_

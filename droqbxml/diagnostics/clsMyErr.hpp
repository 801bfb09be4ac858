// clsMyErr: the component's error object. One shared instance per thread (see basGlobals)
// keeps the last error; every component error is raised through its Raise, or through
// raiseComponentError, which does exactly that.
#ifndef DROQBXML_DIAGNOSTICS_CLSMYERR_HPP_
#define DROQBXML_DIAGNOSTICS_CLSMYERR_HPP_

#include <cstdint>

#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Object.hpp"
#include "droqbxml/runtime/Variant.hpp"

namespace droqbxml {

class clsMyErr final : public Object {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const Text& Description() const { return description_; }
  void Description(const Text& value) { description_ = value; }
  // A number kept as text.
  const Text& HelpContext() const { return helpContext_; }
  void HelpContext(const Text& value) { helpContext_ = value; }
  const Text& HelpFile() const { return helpFile_; }
  void HelpFile(const Text& value) { helpFile_ = value; }
  int32_t LastDllError() const { return lastDllError_; }
  void LastDllError(int32_t value) { lastDllError_ = value; }
  int32_t Number() const { return number_; }
  void Number(int32_t value) { number_ = value; }
  const Text& Source() const { return source_; }
  void Source(const Text& value) { source_ = value; }

  // Every property back to "" or 0.
  void Clear();

  // Stores a given error record (its description also becomes the source, as hosts have
  // always seen it), or else the given values over the previous ones (left-out values keep
  // the previous error's), then raises Number, Source and Description when Number is not
  // 0. With Number 0 it returns normally. oErr is left out, empty or nothing, or an error
  // object whose values stand for the record (anything else is the runtime's 13).
  void Raise(const Variant& oErr = Variant::missing(), const Variant& lNumber = Variant::missing(),
             const Variant& sSource = Variant::missing(),
             const Variant& sDescription = Variant::missing(),
             const Variant& sHelpFile = Variant::missing(),
             const Variant& sHelpContext = Variant::missing(),
             const Variant& lLastDllError = Variant::missing());
  // The same with the platform's error record (a caught ComError's record()).
  void Raise(const ErrorRecord& oErr);

  // Clear, then store each value given. Never raises: a value that does not convert is
  // left cleared.
  void SetErrorInfo(const Variant& lErrorNumber = Variant::missing(),
                    const Variant& sSource = Variant::missing(),
                    const Variant& sDescription = Variant::missing(),
                    const Variant& sHelpFile = Variant::missing(),
                    const Variant& sHelpContext = Variant::missing());

  // Copies an error record under the given source (not the record's). Never raises.
  void SetError(const ErrorRecord& ErrObj, const Text& Source);

  // Copies the record when given, then appends one record to "Logs\ErrorLog.txt" under the
  // installation path. A log that cannot be opened or written raises the file error.
  // oErr as for Raise.
  void LogError(const Variant& oErr = Variant::missing());
  void LogError(const ErrorRecord& oErr);

  // The stored values as an error record.
  ErrorRecord record() const;

 private:
  Text description_;
  Text helpContext_;
  Text helpFile_;
  int32_t lastDllError_ = 0;
  int32_t number_ = 0;
  Text source_;
};

// Raises a component error through the shared error object: number, source, description.
[[noreturn]] void raiseComponentError(ERROR_NUMBER number, Text source, Text description);

}  // namespace droqbxml

#endif  // DROQBXML_DIAGNOSTICS_CLSMYERR_HPP_

// ComError and the table of the runtime's own error texts.
#include "droqbxml/runtime/ComError.hpp"

#include <array>
#include <utility>

#include "droqbxml/runtime/Utf.hpp"

namespace droqbxml {
namespace {

struct RuntimeErrorText {
  int32_t number;
  std::u16string_view description;
};

constexpr std::array<RuntimeErrorText, 15> kRuntimeErrors{{
    {RuntimeError::kInvalidProcedureCall, u"Invalid procedure call or argument"},
    {RuntimeError::kOverflow, u"Overflow"},
    {RuntimeError::kTypeMismatch, u"Type mismatch"},
    {RuntimeError::kBadFileNameOrNumber, u"Bad file name or number"},
    {RuntimeError::kFileNotFound, u"File not found"},
    {RuntimeError::kTooManyFiles, u"Too many files"},
    {RuntimeError::kPermissionDenied, u"Permission denied"},
    {RuntimeError::kPathFileAccessError, u"Path/File access error"},
    {RuntimeError::kPathNotFound, u"Path not found"},
    {RuntimeError::kObjectNotSet, u"Object variable or With block variable not set"},
    {RuntimeError::kInvalidUseOfNull, u"Invalid use of Null"},
    {RuntimeError::kCantCreateObject, u"ActiveX component can't create object"},
    {RuntimeError::kMemberNotSupported, u"Object doesn't support this property or method"},
    {RuntimeError::kArgumentNotOptional, u"Argument not optional"},
    {RuntimeError::kDuplicateKey, u"This key is already associated with an element of this collection"},
}};

}  // namespace

ComError::ComError(ErrorRecord record)
    : record_(std::move(record)), what_(toUtf8(record_.Description)) {}

Text runtimeErrorDescription(int32_t number) {
  for (const auto& row : kRuntimeErrors) {
    if (row.number == number) return Text(row.description);
  }
  return u"Application-defined or object-defined error";
}

void raiseRuntimeError(int32_t number) {
  raiseError(number, u"DroQbXml", runtimeErrorDescription(number));
}

void raiseError(int32_t number, Text source, Text description) {
  ErrorRecord record;
  record.Number = number;
  record.Source = std::move(source);
  record.Description = std::move(description);
  throw ComError(std::move(record));
}

}  // namespace droqbxml

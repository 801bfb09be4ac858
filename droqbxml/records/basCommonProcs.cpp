// getElementValue and the empty-element error.
#include "droqbxml/records/basCommonProcs.hpp"

#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/records/internal/TextSearch.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml::basCommonProcs {
namespace {

constexpr size_t kSelfClosingWindow = 100;

[[noreturn]] void raiseEmptyElementError(const Text& path, TextView source) {
  // "a an" is the text hosts have always matched on.
  raiseComponentError(PARING, Text(source),
                      u"The response returned a an empty '" + path +
                          u"'.\r\nThis element is not allowed to be empty.");
}

// A self-closing form wholly inside the window at the cursor: its 0-based position.
size_t selfClosingAt(const Text& value, size_t cursor, const Text& tag) {
  const TextView window = TextView(value).substr(cursor, kSelfClosingWindow);
  const size_t at = window.find(tag);
  return at == TextView::npos ? Text::npos : cursor + at;
}

}  // namespace

int32_t findInResponse(int32_t start, const Text& text, TextView what) {
  if (start < 1) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  if (static_cast<size_t>(start) > text.size() + 1) return 0;
  const size_t at = internal::findForward(text, what, static_cast<size_t>(start - 1));
  return at == Text::npos ? 0 : static_cast<int32_t>(at + 1);
}

Text getElementValue(const Text& Value, const Text& ElementName, int32_t& StartPoint,
                     int32_t& EndPoint, bool Required, const Text& Parent) {
  const int32_t cursor = EndPoint;
  if (cursor < 1) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  const auto from = static_cast<size_t>(cursor - 1);
  if (from <= Value.size()) {
    for (const Text& tag : {u"<" + ElementName + u"/>", u"<" + ElementName + u" />"}) {
      const size_t at = selfClosingAt(Value, from, tag);
      if (at != Text::npos) {
        // Empty by its form: the required test is not made.
        StartPoint = static_cast<int32_t>(at + 1);
        EndPoint = findInResponse(StartPoint, Value, u"/>");
        return {};
      }
    }
  }
  Text result;
  const int32_t start = findInResponse(cursor, Value, u"<" + ElementName + u">");
  if (start > 0) {
    StartPoint = start + static_cast<int32_t>(ElementName.size()) + 2;
    EndPoint = findInResponse(StartPoint, Value, u"</" + ElementName + u">");
    if (EndPoint > 0) {
      result = Value.substr(static_cast<size_t>(StartPoint - 1),
                            static_cast<size_t>(EndPoint - StartPoint));
    }
  } else {
    StartPoint = cursor;
  }
  if (result.empty() && Required) {
    raiseEmptyElementError(Parent + u"<" + ElementName + u">",
                           u"DroQbXml.basCommonProcs.getElementValue");
  }
  return result;
}

}  // namespace droqbxml::basCommonProcs

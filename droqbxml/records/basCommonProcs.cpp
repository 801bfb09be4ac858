// getElementValue and the empty-element error.
#include "droqbxml/records/basCommonProcs.hpp"

#include <algorithm>
#include <iterator>
#include <string>

#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/records/internal/TagIndex.hpp"
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

// The first "<N/>", else the first "<N />", lying wholly inside the window at the cursor:
// its 0-based position. `open` is "<N". Found from the "/>"s in the window, which
// responses seldom hold (searched through the read's scope: an absent one is looked for
// once a read, or in the index).
size_t selfClosingAt(const Text& value, size_t cursor, TextView open) {
  const size_t windowEnd = std::min(value.size(), cursor + kSelfClosingWindow);
  size_t spaced = Text::npos;
  for (size_t close = internal::SearchScope::find(value, u"/>", cursor);
       close != TextView::npos && close + 2 <= windowEnd;
       close = internal::SearchScope::find(value, u"/>", close + 1)) {
    if (close >= cursor + open.size() &&
        TextView(value).substr(close - open.size(), open.size()) == open) {
      return close - open.size();
    }
    if (spaced == Text::npos && close >= cursor + open.size() + 1 && value[close - 1] == u' ' &&
        TextView(value).substr(close - 1 - open.size(), open.size()) == open) {
      spaced = close - 1 - open.size();
    }
  }
  return spaced;
}

// What the read's index (when it has one) shows at once of an element read from 0-based
// `from`: that no "/>" ends within the self-closing window, and then whether the text holds
// no start tag "<N>" either (the element is absent).
enum class ByIndex : uint8_t { Unknown, NotSelfClosed, Absent };
ByIndex byIndex(const Text& value, TextView name, size_t from) {
  const internal::TagIndex* index = internal::SearchScope::indexOf(value);
  if (index == nullptr || from > value.size()) return ByIndex::Unknown;
  const size_t close = index->findSelfClose(from);
  if (close != TextView::npos && close + 2 <= std::min(value.size(), from + kSelfClosingWindow)) {
    return ByIndex::Unknown;
  }
  return index->lacks(name) ? ByIndex::Absent : ByIndex::NotSelfClosed;
}

}  // namespace

int32_t findInResponse(int32_t start, const Text& text, TextView what) {
  if (start < 1) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  if (static_cast<size_t>(start) > text.size() + 1) return 0;
  const size_t at = internal::SearchScope::find(text, what, static_cast<size_t>(start - 1));
  return at == Text::npos ? 0 : static_cast<int32_t>(at + 1);
}

Text getElementValue(const Text& Value, TextView ElementName, int32_t& StartPoint,
                     int32_t& EndPoint, bool Required, TextView Parent) {
  return getElementValue(Value, ElementName, StartPoint, EndPoint, Required, Parent, {});
}

Text getElementValue(const Text& Value, TextView ElementName, int32_t& StartPoint,
                     int32_t& EndPoint, bool Required, TextView Parent, TextView ParentTail) {
  const int32_t cursor = EndPoint;
  if (cursor < 1) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  const auto from = static_cast<size_t>(cursor - 1);
  Text result;
  // Most elements a record asks for are absent from the response: the index tells.
  const ByIndex known = byIndex(Value, ElementName, from);
  if (known == ByIndex::Absent) {
    StartPoint = cursor;
  } else {
    // "<N>" and "</N>" side by side in one buffer, on the stack for the usual short names.
    const size_t n = ElementName.size();
    char16_t onStack[128];
    thread_local Text forLongNames;
    char16_t* tags = onStack;
    if (2 * n + 5 > std::size(onStack)) {
      forLongNames.resize(2 * n + 5);
      tags = forLongNames.data();
    }
    tags[0] = u'<';
    std::char_traits<char16_t>::copy(tags + 1, ElementName.data(), n);
    tags[n + 1] = u'>';
    tags[n + 2] = u'<';
    tags[n + 3] = u'/';
    std::char_traits<char16_t>::copy(tags + n + 4, ElementName.data(), n);
    tags[2 * n + 4] = u'>';
    const TextView startTag(tags, n + 2);
    const TextView endTag(tags + n + 2, n + 3);
    if (known == ByIndex::Unknown && from <= Value.size()) {
      const size_t at = selfClosingAt(Value, from, startTag.substr(0, n + 1));
      if (at != Text::npos) {
        // Empty by its form: the required test is not made.
        StartPoint = static_cast<int32_t>(at + 1);
        EndPoint = findInResponse(StartPoint, Value, u"/>");
        return {};
      }
    }
    const int32_t start = findInResponse(cursor, Value, startTag);
    if (start > 0) {
      StartPoint = start + static_cast<int32_t>(ElementName.size()) + 2;
      EndPoint = findInResponse(StartPoint, Value, endTag);
      if (EndPoint > 0) {
        result = Value.substr(static_cast<size_t>(StartPoint - 1),
                              static_cast<size_t>(EndPoint - StartPoint));
      }
    } else {
      StartPoint = cursor;
    }
  }
  if (result.empty() && Required) {
    raiseEmptyElementError(Text(Parent) + Text(ParentTail) + u"<" + Text(ElementName) + u">",
                           u"DroQbXml.basCommonProcs.getElementValue");
  }
  return result;
}

}  // namespace droqbxml::basCommonProcs

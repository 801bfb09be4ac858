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
// How far from the cursor a tag is looked for first, without the read's memory or index.
constexpr size_t kNearby = 64;

// "<N>" and "</N>" side by side in one buffer, on the stack for the usual short names,
// made when first asked for.
class ElementTags {
 public:
  explicit ElementTags(TextView name) : name_(name) {}
  TextView start() { return {made(), name_.size() + 2}; }
  TextView end() { return {made() + name_.size() + 2, name_.size() + 3}; }

 private:
  const char16_t* made() {
    if (tags_ != nullptr) return tags_;
    const size_t n = name_.size();
    thread_local Text forLongNames;
    tags_ = onStack_;
    if (2 * n + 5 > std::size(onStack_)) {
      forLongNames.resize(2 * n + 5);
      tags_ = forLongNames.data();
    }
    tags_[0] = u'<';
    std::char_traits<char16_t>::copy(tags_ + 1, name_.data(), n);
    tags_[n + 1] = u'>';
    tags_[n + 2] = u'<';
    tags_[n + 3] = u'/';
    std::char_traits<char16_t>::copy(tags_ + n + 4, name_.data(), n);
    tags_[2 * n + 4] = u'>';
    return tags_;
  }

  TextView name_;
  char16_t* tags_ = nullptr;
  char16_t onStack_[128];
};

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

}  // namespace

Shown shownByIndex(const Text& Value, TextView ElementName, int32_t EndPoint) {
  const internal::TagIndex* index = internal::SearchScope::indexOf(Value);
  if (index == nullptr || EndPoint < 1) return Shown::Nothing;
  const auto from = static_cast<size_t>(EndPoint - 1);
  if (from > Value.size()) return Shown::Nothing;
  const size_t close = index->findSelfClose(from);
  if (close != TextView::npos && close + 2 <= std::min(Value.size(), from + kSelfClosingWindow)) {
    return Shown::Nothing;
  }
  return index->lacks(ElementName) ? Shown::Absent : Shown::NotSelfClosed;
}

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
  // Most elements a record asks for are absent from the response: the index tells.
  return getElementValue(Value, ElementName, StartPoint, EndPoint, Required, Parent, ParentTail,
                         shownByIndex(Value, ElementName, EndPoint));
}

Text getElementValue(const Text& Value, TextView ElementName, int32_t& StartPoint,
                     int32_t& EndPoint, bool Required, TextView Parent, TextView ParentTail,
                     Shown shown) {
  const int32_t cursor = EndPoint;
  if (cursor < 1) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  const auto from = static_cast<size_t>(cursor - 1);
  Text result;
  if (shown == Shown::Absent) {
    StartPoint = cursor;
  } else {
    ElementTags tags(ElementName);
    if (shown == Shown::Nothing && from <= Value.size()) {
      const size_t at = selfClosingAt(Value, from, tags.start().substr(0, ElementName.size() + 1));
      if (at != Text::npos) {
        // Empty by its form: the required test is not made.
        StartPoint = static_cast<int32_t>(at + 1);
        EndPoint = findInResponse(StartPoint, Value, u"/>");
        return {};
      }
    }
    // Elements mostly stand where the cursor is, and their end tags after their text.
    const size_t near = internal::findTagNear(Value, from, kNearby, ElementName, false);
    const int32_t start = near != TextView::npos ? static_cast<int32_t>(near + 1)
                                                 : findInResponse(cursor, Value, tags.start());
    if (start > 0) {
      StartPoint = start + static_cast<int32_t>(ElementName.size()) + 2;
      const size_t close = internal::findTagNear(Value, static_cast<size_t>(StartPoint - 1),
                                                 kNearby, ElementName, true);
      EndPoint = close != TextView::npos ? static_cast<int32_t>(close + 1)
                                         : findInResponse(StartPoint, Value, tags.end());
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

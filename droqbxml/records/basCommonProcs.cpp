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

// Where a search goes on (1-based) once findTagNear found nothing near `from`: no tag starts
// before it, so what is found from there is what a search from `from` finds.
int32_t beyondNear(const Text& value, size_t from) {
  return static_cast<int32_t>(std::min(value.size(), from + kNearby) + 1);
}

[[noreturn]] void raiseEmptyElementError(TextView parent, TextView parentTail, TextView name) {
  // "a an" is the text hosts have always matched on.
  raiseComponentError(PARING, u"DroQbXml.basCommonProcs.getElementValue",
                      u"The response returned a an empty '" + Text(parent) + Text(parentTail) +
                          u"<" + Text(name) + u">'.\r\nThis element is not allowed to be empty.");
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

// The index when it shows that no "/>" ends within the self-closing window at the cursor.
const internal::TagIndex* indexNotSelfClosed(const Text& value, int32_t cursor) {
  const internal::TagIndex* index = internal::SearchScope::indexOf(value);
  if (index == nullptr || cursor < 1) return nullptr;
  const auto from = static_cast<size_t>(cursor - 1);
  if (from > value.size()) return nullptr;
  const size_t close = index->findSelfClose(from);
  if (close != TextView::npos && close + 2 <= std::min(value.size(), from + kSelfClosingWindow)) {
    return nullptr;
  }
  return index;
}

}  // namespace

Shown shownByIndex(const Text& Value, TextView ElementName, int32_t EndPoint) {
  const internal::TagIndex* index = indexNotSelfClosed(Value, EndPoint);
  if (index == nullptr) return Shown::Nothing;
  return index->lacks(ElementName) ? Shown::Absent : Shown::NotSelfClosed;
}

CursorView::Look CursorView::look(const Text& value, size_t field, int32_t cursor) {
  if (cursor != cursor_) moveTo(value, cursor);
  if (index_ == nullptr) return {Shown::Nothing, Text::npos};
  if (groups_[field] == internal::TagIndex::kNone) return {Shown::Absent, Text::npos};
  if (opening_ != Text::npos && internal::tagAt(value, opening_, nameAt_(field), false)) {
    return {Shown::NotSelfClosed, opening_};
  }
  return {Shown::NotSelfClosed, Text::npos};
}

void CursorView::moveTo(const Text& value, int32_t cursor) {
  cursor_ = cursor;
  index_ = indexNotSelfClosed(value, cursor);
  opening_ = Text::npos;
  if (index_ != nullptr && groups_.empty()) {
    groups_ = internal::SearchScope::groupsOf(*index_, table_, count_, nameAt_);
  }
  if (index_ != nullptr && cursor == endTagAt_) {
    // Past the end tag, blanks, then the next tag: the first '<' from the cursor on
    // besides the end tag's own.
    const size_t end = std::min(value.size() - 1, afterEndTag_ + kNearby);
    size_t at = afterEndTag_;
    while (at < end &&
           (value[at] == u'\n' || value[at] == u'\r' || value[at] == u' ' || value[at] == u'\t')) {
      ++at;
    }
    if (at < end && value[at] == u'<' && value[at + 1] != u'/') opening_ = at;
  }
}

void CursorView::read(const Text& value, size_t field, int32_t endPoint) {
  const TextView name = nameAt_(field);
  endTagAt_ = 0;
  if (endPoint < 1 || !internal::tagAt(value, static_cast<size_t>(endPoint - 1), name, true)) {
    return;
  }
  endTagAt_ = endPoint;
  afterEndTag_ = static_cast<size_t>(endPoint - 1) + name.size() + 3;
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
  if (shown != Shown::Absent) {
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
    // Elements mostly stand where the cursor is.
    const size_t near = internal::findTagNear(Value, from, kNearby, ElementName, false);
    const int32_t start = near != TextView::npos
                              ? static_cast<int32_t>(near + 1)
                              : findInResponse(beyondNear(Value, from), Value, tags.start());
    if (start > 0) {
      return getElementValueAt(Value, ElementName, static_cast<size_t>(start - 1), StartPoint,
                               EndPoint, Required, Parent, ParentTail);
    }
  }
  StartPoint = cursor;
  if (Required) raiseEmptyElementError(Parent, ParentTail, ElementName);
  return {};
}

Text getElementValueAt(const Text& Value, TextView ElementName, size_t startTag,
                       int32_t& StartPoint, int32_t& EndPoint, bool Required, TextView Parent,
                       TextView ParentTail) {
  StartPoint = static_cast<int32_t>(startTag + ElementName.size() + 3);
  // End tags mostly stand just after their text.
  const size_t close =
      internal::findTagNear(Value, static_cast<size_t>(StartPoint - 1), kNearby, ElementName, true);
  EndPoint = close != TextView::npos
                 ? static_cast<int32_t>(close + 1)
                 : findInResponse(beyondNear(Value, static_cast<size_t>(StartPoint - 1)), Value,
                                  ElementTags(ElementName).end());
  // The end tag is found from the content's start, so it never stands before it.
  if (EndPoint > StartPoint) {
    return Text(Value.data() + StartPoint - 1, static_cast<size_t>(EndPoint - StartPoint));
  }
  if (Required) raiseEmptyElementError(Parent, ParentTail, ElementName);
  return {};
}

}  // namespace droqbxml::basCommonProcs

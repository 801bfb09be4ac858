// Response scanning: the one primitive every record uses to read a value out of response
// text by literal tag search, with a cursor that only moves forward.
#ifndef DROQBXML_RECORDS_BASCOMMONPROCS_HPP_
#define DROQBXML_RECORDS_BASCOMMONPROCS_HPP_

#include <cstddef>
#include <cstdint>
#include <span>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml::internal {
class TagIndex;
}

namespace droqbxml::basCommonProcs {

// Reads element ElementName from Value, searching from the cursor EndPoint (1-based).
// - A self-closing "<N/>" or "<N />" lying wholly within the 100 characters from the cursor
//   gives "" at once (never an error), StartPoint at the tag, EndPoint at its "/>".
// - Otherwise the start tag "<N>" exactly (no attributes, no blanks) is searched from the
//   cursor to the end of the text, not bounded by any enclosing element: StartPoint is the
//   content's first character, EndPoint the end tag's "<" (0 when the end tag is missing),
//   and the content is returned as it stands (no trimming, no unescaping).
// - Absent: "", StartPoint = the cursor, EndPoint unchanged.
// An empty result with Required raises PARING from "DroQbXml.basCommonProcs.getElementValue"
// naming Parent + "<N>". A cursor below 1 is the runtime's 5. Names and parents are taken
// as views, so literals, texts and the records' own tables all pass without copies.
Text getElementValue(const Text& Value, TextView ElementName, int32_t& StartPoint,
                     int32_t& EndPoint, bool Required, TextView Parent);
// The same with the parent in two pieces, put together only for the error.
Text getElementValue(const Text& Value, TextView ElementName, int32_t& StartPoint,
                     int32_t& EndPoint, bool Required, TextView Parent, TextView ParentTail);

// What the read's index (when it has one) shows at once of getElementValue(Value,
// ElementName, ..., EndPoint, ...): nothing; that no "/>" ends within the self-closing
// window; or that, besides, the text holds no "<N>" (the read gives "" and StartPoint =
// EndPoint).
enum class Shown : uint8_t { Nothing, NotSelfClosed, Absent };
Shown shownByIndex(const Text& Value, TextView ElementName, int32_t EndPoint);
// getElementValue told what shownByIndex gave for the same text, name and cursor.
Text getElementValue(const Text& Value, TextView ElementName, int32_t& StartPoint,
                     int32_t& EndPoint, bool Required, TextView Parent, TextView ParentTail,
                     Shown shown);

// Whether `name` is made of XML name characters only, as every record's table names are.
// The index answers for such a name without looking at its characters.
constexpr bool isPlainName(TextView name) {
  const auto letter = [](char16_t c) {
    return (c >= u'A' && c <= u'Z') || (c >= u'a' && c <= u'z') || c == u'_' || c == u':';
  };
  if (name.empty() || !letter(name.front())) return false;
  for (const char16_t c : name) {
    if (!letter(c) && !(c >= u'0' && c <= u'9') && c != u'.' && c != u'-') return false;
  }
  return true;
}

// getElementValue once its start tag "<N>" has been found at 0-based position startTag.
Text getElementValueAt(const Text& Value, TextView ElementName, size_t startTag,
                       int32_t& StartPoint, int32_t& EndPoint, bool Required, TextView Parent,
                       TextView ParentTail);

// What a record's reader knows of the text at its cursor, looked at once while the cursor
// stays there (an absent field leaves it where it is). Reads of one text only, within one
// read (see internal::SearchScope), of the fields of one table of plain names.
class CursorView {
 public:
  // The table's names: nameAt(0) .. nameAt(count - 1), `table` telling the table.
  CursorView(const void* table, size_t count, TextView (*nameAt)(size_t))
      : table_(table), count_(count), nameAt_(nameAt) {}

  struct Look {
    Shown shown;
    // "<N>" when it is the first start tag at the cursor (so the first "<N>" from it on),
    // else Text::npos.
    size_t startTag;
  };
  // shownByIndex for field `field` at the cursor, and where its start tag is when the
  // cursor stands at the end tag of the last field read and the element after it is N.
  Look look(const Text& value, size_t field, int32_t cursor);
  // Tells that field `field` was read and left its EndPoint there.
  void read(const Text& value, size_t field, int32_t endPoint);
  // The same when EndPoint is known to be at the field's end tag, or 0 (as
  // getElementValueAt leaves it).
  void readToEndTag(size_t nameLength, int32_t endPoint) {
    endTagAt_ = endPoint;
    afterEndTag_ = static_cast<size_t>(endPoint - 1) + nameLength + 3;
  }

 private:
  void moveTo(const Text& value, int32_t cursor);

  const void* table_;
  size_t count_;
  TextView (*nameAt_)(size_t);
  std::span<const uint32_t> groups_;  // the fields' groups in the read's index, once it has one
  int32_t cursor_ = 0;
  const internal::TagIndex* index_ = nullptr;
  size_t opening_ = Text::npos;
  int32_t endTagAt_ = 0;  // the cursor at a known "</N>", else 0
  size_t afterEndTag_ = 0;
};

// The first 1-based position of `what` at or after `start` in `text`, 0 when absent: the
// platform's InStr over response text, answered from the tag index when `what` is a tag.
int32_t findInResponse(int32_t start, const Text& text, TextView what);

}  // namespace droqbxml::basCommonProcs

#endif  // DROQBXML_RECORDS_BASCOMMONPROCS_HPP_

// Response scanning: the one primitive every record uses to read a value out of response
// text by literal tag search, with a cursor that only moves forward.
#ifndef DROQBXML_RECORDS_BASCOMMONPROCS_HPP_
#define DROQBXML_RECORDS_BASCOMMONPROCS_HPP_

#include <cstdint>

#include "droqbxml/runtime/Text.hpp"

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

// The first 1-based position of `what` at or after `start` in `text`, 0 when absent: the
// platform's InStr over response text, answered from the tag index when `what` is a tag.
int32_t findInResponse(int32_t start, const Text& text, TextView what);

}  // namespace droqbxml::basCommonProcs

#endif  // DROQBXML_RECORDS_BASCOMMONPROCS_HPP_

// The one escaper for every value the component writes into a request, and the one
// unescaper for response text. With the character-code flag false (what every caller in
// the component passes) character codes are those of Windows-1252; with true, Unicode code
// units. Escaping never fails; unescaping fails only on "&#;" (13) and on a code with no
// character (5) or out of range (6).
#ifndef DROQBXML_QBXML_XMLESCAPING_HPP_
#define DROQBXML_QBXML_XMLESCAPING_HPP_

#include "droqbxml/runtime/Text.hpp"
#include "droqbxml/runtime/Variant.hpp"

namespace droqbxml {

// One character: the five entities for ' " < > &, other codes 32..126 unchanged, every
// other code as "&#" + decimal code + ";". A character outside the code page has the code
// of "?" and so stays unchanged. Only the first character of the text counts;
// an empty text is the runtime's 5.
Text XMLEscapeChar(TextView c, bool useUnicode = false);
Text XMLEscapeString(TextView s, bool useUnicode = false);

// Escapes with an optional length limit. A limit counts only when its kind is a 32-bit or
// 16-bit integer: a limit of any other kind above 0 gives "" (hosts rely on this). The
// limit applies to the raw text and to the escaped text, and an entity cut in two by it
// is dropped whole. A limit of 0 or less gives "".
Text XMLEscapeText(const Text& s, const Variant& maxLen = Variant::missing(),
                   bool useUnicode = false);

// True when the last "&" has no ";" after it.
bool EndsInPartialEntity(TextView t);
// Drops a trailing partial entity: the text before the last "&" when no ";" follows it.
Text CutPartialEntity(TextView t);

// Replaces the five entities (in table order, "&amp;" last), then decimal references.
// Other named entities, hexadecimal references and a lone "&" are left as they are.
Text XMLUnEscapeText(const Text& s, bool useUnicode = false);
// The same, over s itself (no copy of a text that holds nothing to unescape); on an error
// s is as it was.
void unescapeInPlace(Text& s, bool useUnicode = false);

}  // namespace droqbxml

#endif  // DROQBXML_QBXML_XMLESCAPING_HPP_

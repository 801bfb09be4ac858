// Escaping straight onto the end of a text, for writers that would otherwise escape into a
// text of its own and copy it: the builder's simple elements.
#ifndef DROQBXML_QBXML_INTERNAL_ESCAPEINTO_HPP_
#define DROQBXML_QBXML_INTERNAL_ESCAPEINTO_HPP_

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml::internal {

// Appends XMLEscapeString(s, useUnicode) to out.
void escapeInto(Text& out, TextView s, bool useUnicode);

}  // namespace droqbxml::internal

#endif  // DROQBXML_QBXML_INTERNAL_ESCAPEINTO_HPP_

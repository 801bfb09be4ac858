// Forward search in response text, with an index that makes repeated searches for the
// same tag cheap. Records read a response by searching literal tags forward from a moving
// cursor; an element absent from a record is searched to the end of the text, which would
// make reading many records from one large response quadratic. The index answers those
// searches with the same result as a plain forward search.
#ifndef DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_
#define DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_

#include <cstddef>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml::internal {

// The first position (0-based) at or after `from` where `pattern` occurs in `text`, or
// Text::npos; exactly what text.find(pattern, from) gives. A pattern that is one whole tag
// ("<Name>", "</Name>") is answered from an index of the text's tags, built on first use
// and kept for the few most recent texts of the thread (response texts are not changed
// while records read them).
size_t findForward(const Text& text, TextView pattern, size_t from);

}  // namespace droqbxml::internal

#endif  // DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_

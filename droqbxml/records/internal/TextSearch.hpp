// Forward search in response text. Records read a response by searching literal tags
// forward from a moving cursor; every search answers exactly what a literal search of the
// text passed gives, and nothing is kept from one call to the next: a host may reuse a
// string's buffer for a new response of the same length, or change a response in place,
// and the next search still sees exactly the text it is given.
#ifndef DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_
#define DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_

#include <cstddef>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml::internal {

// The first position (0-based) at or after `from` where `pattern` occurs in `text`, or
// Text::npos: exactly what text.find(pattern, from) gives.
size_t findForward(TextView text, TextView pattern, size_t from);

}  // namespace droqbxml::internal

#endif  // DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_

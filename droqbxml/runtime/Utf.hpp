// UTF-8 at the edges of the library: files, the console, SQLite and XML parsers.
// Invalid input (lone surrogates, bad UTF-8 sequences) becomes U+FFFD.
#ifndef DROQBXML_RUNTIME_UTF_HPP_
#define DROQBXML_RUNTIME_UTF_HPP_

#include <cstddef>
#include <string>
#include <string_view>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

std::string toUtf8(TextView text);
Text fromUtf8(std::string_view utf8);

// The offset of the first byte that does not begin a well-formed UTF-8 character (no
// overlong forms, surrogates or code points above U+10FFFF), or npos when all of it is
// UTF-8.
std::size_t firstInvalidUtf8(std::string_view utf8);

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_UTF_HPP_

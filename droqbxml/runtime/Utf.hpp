// UTF-8 at the edges of the library: files, the console, SQLite and XML parsers.
// Invalid input (lone surrogates, bad UTF-8 sequences) becomes U+FFFD.
#ifndef DROQBXML_RUNTIME_UTF_HPP_
#define DROQBXML_RUNTIME_UTF_HPP_

#include <string>
#include <string_view>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

std::string toUtf8(TextView text);
Text fromUtf8(std::string_view utf8);

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_UTF_HPP_

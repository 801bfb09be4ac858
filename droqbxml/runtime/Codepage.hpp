// Character codes of the platform's ANSI code page, Windows-1252, for the escaper.
#ifndef DROQBXML_RUNTIME_CODEPAGE_HPP_
#define DROQBXML_RUNTIME_CODEPAGE_HPP_

#include <cstdint>

namespace droqbxml {

// The cp1252 byte of a character; 63 ("?") when cp1252 cannot represent it.
int32_t ansiCode(char16_t c);
// The character of a cp1252 code 0..255; any other code is the runtime's 5. The five
// unassigned bytes (0x81, 0x8D, 0x8F, 0x90, 0x9D) map to the same code points.
char16_t ansiChar(int32_t code);
// The character of a Unicode code unit -32768..65535 (negative values wrap, as the
// platform's ChrW does); any other code is the runtime's 5.
char16_t unicodeChar(int32_t code);

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_CODEPAGE_HPP_

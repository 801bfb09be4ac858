// Text of the object model: 16-bit code units, as the automation platform keeps strings.
// Lengths, limits and positions count code units. This header also holds the few text
// rules the platform fixes: trimming removes spaces only, case folding is ASCII only.
#ifndef DROQBXML_RUNTIME_TEXT_HPP_
#define DROQBXML_RUNTIME_TEXT_HPP_

#include <cstdint>
#include <string>
#include <string_view>

namespace droqbxml {

using Text = std::u16string;
using TextView = std::u16string_view;

// Removes U+0020 at both ends; tabs and line ends are kept, as the platform's Trim does.
TextView trimView(TextView text);
Text trim(TextView text);

// ASCII letters only; every other code unit is unchanged.
inline char16_t upperAscii(char16_t c) {
  return (c >= u'a' && c <= u'z') ? static_cast<char16_t>(c - u'a' + u'A') : c;
}
Text upperAscii(TextView text);
Text lowerAscii(TextView text);
bool equalsIgnoreCase(TextView a, TextView b);

// Text made of ASCII characters, for literals and numbers written by the library itself.
Text asciiText(std::string_view ascii);

// 1-based search of the platform's InStr: the position of `what` at or after `start`
// (1-based), 0 when absent. A start beyond the text gives 0; a start below 1 is the
// runtime's 5.
int32_t inStr(int32_t start, TextView text, TextView what);

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_TEXT_HPP_

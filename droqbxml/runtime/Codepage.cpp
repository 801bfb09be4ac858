// The upper half of Windows-1252; the lower half and 0xA0..0xFF are Latin-1.
#include "droqbxml/runtime/Codepage.hpp"

#include <array>

#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {
namespace {

constexpr std::array<char16_t, 32> kHigh{{
    0x20AC, 0x0081, 0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021,  // 80-87
    0x02C6, 0x2030, 0x0160, 0x2039, 0x0152, 0x008D, 0x017D, 0x008F,  // 88-8F
    0x0090, 0x2018, 0x2019, 0x201C, 0x201D, 0x2022, 0x2013, 0x2014,  // 90-97
    0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0x009D, 0x017E, 0x0178,  // 98-9F
}};

}  // namespace

int32_t ansiCode(char16_t c) {
  if (c < 0x80 || (c >= 0xA0 && c <= 0xFF)) return c;
  for (size_t i = 0; i < kHigh.size(); ++i) {
    if (kHigh[i] == c) return static_cast<int32_t>(0x80 + i);
  }
  return '?';
}

char16_t ansiChar(int32_t code) {
  if (code < 0 || code > 255) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  if (code >= 0x80 && code < 0xA0) return kHigh[static_cast<size_t>(code - 0x80)];
  return static_cast<char16_t>(code);
}

char16_t unicodeChar(int32_t code) {
  if (code < -32768 || code > 65535) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  return static_cast<char16_t>(code & 0xFFFF);
}

}  // namespace droqbxml

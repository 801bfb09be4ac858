// UTF-16 to UTF-8 and back, replacing whatever cannot be converted by U+FFFD, and the
// check for well-formed UTF-8.
#include "droqbxml/runtime/Utf.hpp"

#include <cstdint>
#include <cstring>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace droqbxml {
namespace {

constexpr char32_t kReplacement = 0xFFFD;

// Writes one code point as UTF-8 at `out`; returns the position after it.
char* writeUtf8(char* out, char32_t cp) {
  if (cp < 0x80) {
    *out++ = static_cast<char>(cp);
  } else if (cp < 0x800) {
    *out++ = static_cast<char>(0xC0 | (cp >> 6));
    *out++ = static_cast<char>(0x80 | (cp & 0x3F));
  } else if (cp < 0x10000) {
    *out++ = static_cast<char>(0xE0 | (cp >> 12));
    *out++ = static_cast<char>(0x80 | ((cp >> 6) & 0x3F));
    *out++ = static_cast<char>(0x80 | (cp & 0x3F));
  } else {
    *out++ = static_cast<char>(0xF0 | (cp >> 18));
    *out++ = static_cast<char>(0x80 | ((cp >> 12) & 0x3F));
    *out++ = static_cast<char>(0x80 | ((cp >> 6) & 0x3F));
    *out++ = static_cast<char>(0x80 | (cp & 0x3F));
  }
  return out;
}

bool isHighSurrogate(char16_t c) { return c >= 0xD800 && c <= 0xDBFF; }
bool isLowSurrogate(char16_t c) { return c >= 0xDC00 && c <= 0xDFFF; }

// The UTF-8 length of n units.
size_t utf8Length(const char16_t* in, size_t n) {
  size_t bytes = 0;
  for (size_t i = 0; i < n; ++i) {
#if defined(__SSE2__)
    if (i + 8 <= n) {
      const __m128i units = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i));
      const __m128i above = _mm_and_si128(units, _mm_set1_epi16(static_cast<int16_t>(0xFF80)));
      if (_mm_movemask_epi8(_mm_cmpeq_epi16(above, _mm_setzero_si128())) == 0xFFFF) {
        bytes += 8;
        i += 7;
        continue;
      }
    }
#endif
    const char16_t c = in[i];
    if (c < 0x80) {
      bytes += 1;
    } else if (c < 0x800) {
      bytes += 2;
    } else if (isHighSurrogate(c) && i + 1 < n && isLowSurrogate(in[i + 1])) {
      bytes += 4;
      ++i;
    } else {
      bytes += 3;  // the rest of the plane, and a lone surrogate's U+FFFD
    }
  }
  return bytes;
}

}  // namespace

// Both directions size the result by a bound (UTF-8 to UTF-16, and UTF-16 to UTF-8 until its
// first unit that is not ASCII, where the rest is sized exactly), then write it through a
// pointer; runs of ASCII, most of any qbXML text, are copied sixteen at a time with SSE2
// (eight at a time elsewhere).

std::string toUtf8(TextView text) {
  const char16_t* in = text.data();
  const size_t n = text.size();
  // Every unit takes a byte at least, and exactly one while the text is ASCII: the result
  // starts at that size and takes its exact size at the first unit that is not ASCII.
  std::string out(n, '\0');
  bool exact = false;
  char* dst = out.data();
  size_t i = 0;
  while (i < n) {
#if defined(__SSE2__)
    if (i + 16 <= n) {
      const __m128i low = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i));
      const __m128i high = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i + 8));
      const __m128i mask = _mm_set1_epi16(static_cast<int16_t>(0xFF80));
      const __m128i above = _mm_and_si128(_mm_or_si128(low, high), mask);
      if (_mm_movemask_epi8(_mm_cmpeq_epi16(above, _mm_setzero_si128())) == 0xFFFF) {
        _mm_storeu_si128(reinterpret_cast<__m128i*>(dst), _mm_packus_epi16(low, high));
        dst += 16;
        i += 16;
        continue;
      }
    }
#else
    if (i + 8 <= n) {
      uint64_t a = 0;
      uint64_t b = 0;
      std::memcpy(&a, in + i, 8);
      std::memcpy(&b, in + i + 4, 8);
      if (((a | b) & 0xFF80FF80FF80FF80ull) == 0) {
        for (size_t k = 0; k < 8; ++k) dst[k] = static_cast<char>(in[i + k]);
        dst += 8;
        i += 8;
        continue;
      }
    }
#endif
    const char16_t c = in[i];
    if (c >= 0x80 && !exact) {
      const auto written = static_cast<size_t>(dst - out.data());
      out.resize(written + utf8Length(in + i, n - i));
      dst = out.data() + written;
      exact = true;
    }
    char32_t cp = c;
    if (isHighSurrogate(c) && i + 1 < n && isLowSurrogate(in[i + 1])) {
      cp = 0x10000 + ((static_cast<char32_t>(c) - 0xD800) << 10) +
           (static_cast<char32_t>(in[i + 1]) - 0xDC00);
      ++i;
    } else if (isHighSurrogate(c) || isLowSurrogate(c)) {
      cp = kReplacement;
    }
    dst = writeUtf8(dst, cp);
    ++i;
  }
  return out;
}

Text fromUtf8(std::string_view utf8) {
  // Never more code units than bytes: a four-byte sequence gives two, anything else one
  // per byte or fewer.
  Text out(utf8.size(), u'\0');
  char16_t* dst = out.data();
  const auto* in = reinterpret_cast<const unsigned char*>(utf8.data());
  const size_t n = utf8.size();
  size_t i = 0;
  while (i < n) {
#if defined(__SSE2__)
    if (i + 16 <= n) {
      const __m128i bytes = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + i));
      if (_mm_movemask_epi8(bytes) == 0) {
        const __m128i zero = _mm_setzero_si128();
        _mm_storeu_si128(reinterpret_cast<__m128i*>(dst), _mm_unpacklo_epi8(bytes, zero));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(dst + 8), _mm_unpackhi_epi8(bytes, zero));
        dst += 16;
        i += 16;
        continue;
      }
    }
#else
    if (i + 8 <= n) {
      uint64_t word = 0;
      std::memcpy(&word, in + i, 8);
      if ((word & 0x8080808080808080ull) == 0) {
        for (size_t k = 0; k < 8; ++k) dst[k] = in[i + k];
        dst += 8;
        i += 8;
        continue;
      }
    }
#endif
    const unsigned char b0 = in[i];
    if (b0 < 0x80) {
      *dst++ = b0;
      ++i;
      continue;
    }
    size_t length = 0;
    char32_t cp = 0;
    char32_t minimum = 0;
    if ((b0 & 0xE0) == 0xC0) {
      length = 2, cp = b0 & 0x1F, minimum = 0x80;
    } else if ((b0 & 0xF0) == 0xE0) {
      length = 3, cp = b0 & 0x0F, minimum = 0x800;
    } else if ((b0 & 0xF8) == 0xF0) {
      length = 4, cp = b0 & 0x07, minimum = 0x10000;
    }
    bool valid = length != 0;
    for (size_t k = 1; valid && k < length; ++k) {
      const unsigned char b = i + k < n ? in[i + k] : 0;
      if ((b & 0xC0) != 0x80) {
        valid = false;
        length = k;  // resynchronise at the byte that broke the sequence
      } else {
        cp = (cp << 6) | (b & 0x3F);
      }
    }
    if (valid && (cp < minimum || cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF))) {
      valid = false;
    }
    if (!valid) {
      *dst++ = static_cast<char16_t>(kReplacement);
      i += length == 0 ? 1 : length;
      continue;
    }
    if (cp >= 0x10000) {
      cp -= 0x10000;
      *dst++ = static_cast<char16_t>(0xD800 + (cp >> 10));
      *dst++ = static_cast<char16_t>(0xDC00 + (cp & 0x3FF));
    } else {
      *dst++ = static_cast<char16_t>(cp);
    }
    i += length;
  }
  out.resize(static_cast<size_t>(dst - out.data()));
  return out;
}

std::size_t firstInvalidUtf8(std::string_view utf8) {
  std::size_t i = 0;
  while (i < utf8.size()) {
    const auto lead = static_cast<unsigned char>(utf8[i]);
    if (lead < 0x80) {
      ++i;
      continue;
    }
    std::size_t length = 0;
    char32_t code = 0;
    char32_t least = 0;
    if ((lead & 0xE0) == 0xC0) {
      length = 2, code = lead & 0x1F, least = 0x80;
    } else if ((lead & 0xF0) == 0xE0) {
      length = 3, code = lead & 0x0F, least = 0x800;
    } else if ((lead & 0xF8) == 0xF0) {
      length = 4, code = lead & 0x07, least = 0x10000;
    } else {
      return i;
    }
    if (i + length > utf8.size()) return i;
    for (std::size_t k = 1; k < length; ++k) {
      const auto next = static_cast<unsigned char>(utf8[i + k]);
      if ((next & 0xC0) != 0x80) return i;
      code = (code << 6) | (next & 0x3F);
    }
    if (code < least || code > 0x10FFFF || (code >= 0xD800 && code <= 0xDFFF)) return i;
    i += length;
  }
  return std::string_view::npos;
}

}  // namespace droqbxml

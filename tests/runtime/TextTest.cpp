// The UTF-8 edges, and the fast converters against a plain reference (trimming, case, search
// and damaged UTF-8 read: testdata/calls/runtime_conversions.txt).
#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>
#include <vector>

#include "droqbxml/runtime/Text.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

TEST(TextTest, Utf8EdgesReplaceWhatCannotConvert) {
  const Text text = u"A\u00e9\u20ac\U0001F600\0Z";
  EXPECT_EQ(fromUtf8(toUtf8(Text(text.data(), 7))), Text(text.data(), 7));
  EXPECT_EQ(toUtf8(Text(1, char16_t{0xD800})), "\xEF\xBF\xBD");
  EXPECT_EQ(toUtf8(Text{char16_t{0xDC00}, u'a'}),
            "\xEF\xBF\xBD"
            "a");
}

// The converters as they were written first, one code point at a time: the reference the
// fast paths must agree with.
std::string referenceToUtf8(TextView text) {
  std::string out;
  const auto put = [&](char32_t cp) {
    if (cp < 0x80) {
      out += static_cast<char>(cp);
    } else if (cp < 0x800) {
      out += {static_cast<char>(0xC0 | (cp >> 6)), static_cast<char>(0x80 | (cp & 0x3F))};
    } else if (cp < 0x10000) {
      out += {static_cast<char>(0xE0 | (cp >> 12)), static_cast<char>(0x80 | ((cp >> 6) & 0x3F)),
              static_cast<char>(0x80 | (cp & 0x3F))};
    } else {
      out += {static_cast<char>(0xF0 | (cp >> 18)), static_cast<char>(0x80 | ((cp >> 12) & 0x3F)),
              static_cast<char>(0x80 | ((cp >> 6) & 0x3F)), static_cast<char>(0x80 | (cp & 0x3F))};
    }
  };
  for (size_t i = 0; i < text.size(); ++i) {
    const char16_t c = text[i];
    const bool high = c >= 0xD800 && c <= 0xDBFF;
    if (high && i + 1 < text.size() && text[i + 1] >= 0xDC00 && text[i + 1] <= 0xDFFF) {
      put(0x10000 + ((char32_t{c} - 0xD800) << 10) + (char32_t{text[i + 1]} - 0xDC00));
      ++i;
    } else {
      put(c >= 0xD800 && c <= 0xDFFF ? 0xFFFD : c);
    }
  }
  return out;
}

Text referenceFromUtf8(std::string_view bytes) {
  Text out;
  for (size_t i = 0; i < bytes.size();) {
    const auto b0 = static_cast<unsigned char>(bytes[i]);
    const size_t length = b0 < 0x80             ? 1
                          : (b0 & 0xE0) == 0xC0 ? 2
                          : (b0 & 0xF0) == 0xE0 ? 3
                          : (b0 & 0xF8) == 0xF0 ? 4
                                                : 0;
    char32_t cp = length == 1 ? b0 : b0 & (0xFF >> (length + 1));
    size_t used = length;
    for (size_t k = 1; k < length; ++k) {
      const auto b = i + k < bytes.size() ? static_cast<unsigned char>(bytes[i + k]) : 0;
      if ((b & 0xC0) != 0x80) {
        used = k;
        break;
      }
      cp = (cp << 6) | (b & 0x3F);
    }
    constexpr char32_t kMinimum[] = {0, 0, 0x80, 0x800, 0x10000};
    if (length == 0 || used != length || cp < kMinimum[length] || cp > 0x10FFFF ||
        (cp >= 0xD800 && cp <= 0xDFFF)) {
      out += u'\uFFFD';
      i += length == 0 ? 1 : used;
    } else if (cp >= 0x10000) {
      out += {static_cast<char16_t>(0xD800 + ((cp - 0x10000) >> 10)),
              static_cast<char16_t>(0xDC00 + ((cp - 0x10000) & 0x3FF))};
      i += length;
    } else {
      out += static_cast<char16_t>(cp);
      i += length;
    }
  }
  return out;
}

// Mostly ASCII, in runs that end anywhere around the sixteen-unit blocks of the fast paths,
// with every kind of sequence and damage between them.
TEST(TextTest, FastConvertersAgreeWithTheReference) {
  std::mt19937 random(20261125);
  const std::vector<std::string> pieces{"\xC3\xA9",     "\xE2\x82\xAC",     "\xF0\x9F\x98\x80",
                                        "\xC3",         "\xE2\x82",         "\xC0\xAF",
                                        "\xED\xA0\x80", "\xF4\x90\x80\x80", "\xFF",
                                        "\x80",         "\xF0\x9F\x98",     std::string(1, '\0')};
  const std::vector<Text> units{u"\u00e9",
                                u"\u20ac",
                                u"\U0001F600",
                                Text(1, char16_t{0xD800}),
                                Text(1, char16_t{0xDC00}),
                                u"\u07FF\u0800",
                                Text(1, char16_t{0x7F}),
                                Text(1, char16_t{0x80}),
                                Text(1, char16_t{0xFFFF})};
  for (int round = 0; round < 3000; ++round) {
    std::string bytes;
    Text text;
    while (bytes.size() < random() % 100) {
      const size_t run = random() % 40;
      for (size_t k = 0; k < run; ++k) {
        const char c = static_cast<char>(' ' + random() % 95);
        bytes += c;
        text += static_cast<char16_t>(c);
      }
      bytes += pieces[random() % pieces.size()];
      text += units[random() % units.size()];
    }
    ASSERT_EQ(fromUtf8(bytes), referenceFromUtf8(bytes)) << ::testing::PrintToString(bytes);
    ASSERT_EQ(toUtf8(text), referenceToUtf8(text)) << toUtf8(text);
    const Text ascii(text.begin(),
                     std::find_if(text.begin(), text.end(), [](char16_t c) { return c >= 0x80; }));
    ASSERT_EQ(toUtf8(ascii), referenceToUtf8(ascii));
    ASSERT_EQ(fromUtf8(toUtf8(text)), fromUtf8(referenceToUtf8(text)));
  }
}

}  // namespace
}  // namespace droqbxml

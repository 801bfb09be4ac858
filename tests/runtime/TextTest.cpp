// Trimming, case folding, search and the UTF-8 edges.
#include <gtest/gtest.h>

#include "droqbxml/runtime/Text.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

TEST(TextTest, TrimAndCaseTouchSpacesAndAsciiOnly) {
  EXPECT_EQ(trim(u"  a b  "), u"a b");
  EXPECT_EQ(trim(u"\t a \r\n"), u"\t a \r\n");
  EXPECT_EQ(trim(u"   "), u"");
  EXPECT_EQ(upperAscii(u"abc\u00e9z"), u"ABC\u00e9Z");
  EXPECT_TRUE(equalsIgnoreCase(u"DroItemsCol", u"droitemscol"));
  EXPECT_FALSE(equalsIgnoreCase(u"\u00e9", u"\u00c9"));
}

TEST(TextTest, InStrIsOneBased) {
  EXPECT_EQ(inStr(1, u"abcabc", u"c"), 3);
  EXPECT_EQ(inStr(4, u"abcabc", u"c"), 6);
  EXPECT_EQ(inStr(7, u"abcabc", u"c"), 0);
  EXPECT_EQ(inStr(1, u"abc", u"x"), 0);
  EXPECT_TRUE(
      test::raisesRuntime([] { inStr(0, u"abc", u"a"); }, RuntimeError::kInvalidProcedureCall));
}

TEST(TextTest, Utf8EdgesReplaceWhatCannotConvert) {
  const Text text = u"A\u00e9\u20ac\U0001F600\0Z";
  EXPECT_EQ(fromUtf8(toUtf8(Text(text.data(), 7))), Text(text.data(), 7));
  EXPECT_EQ(toUtf8(Text(1, char16_t{0xD800})), "\xEF\xBF\xBD");
  EXPECT_EQ(toUtf8(Text{char16_t{0xDC00}, u'a'}),
            "\xEF\xBF\xBD"
            "a");
  EXPECT_EQ(fromUtf8("\xC3"), u"\uFFFD");
  EXPECT_EQ(fromUtf8("\xE2\x82"
                     "A"),
            u"\uFFFDA");                           // the byte that breaks a sequence stays
  EXPECT_EQ(fromUtf8("\xC0\xAF"), u"\uFFFD");      // overlong
  EXPECT_EQ(fromUtf8("\xED\xA0\x80"), u"\uFFFD");  // encoded surrogate
}

}  // namespace
}  // namespace droqbxml

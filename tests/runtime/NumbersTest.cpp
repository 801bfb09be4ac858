// Numeric text conversions, rounding and the fixed formats.
#include "droqbxml/runtime/Numbers.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raisesRuntime;

TEST(NumbersTest, ReadsThePlatformsNumericForms) {
  const struct {
    const char16_t* text;
    double value;
  } cases[] = {
      {u"42", 42},          {u"  -1,234.5  ", -1234.5}, {u"+.5", 0.5},   {u"1.", 1},
      {u"1.5E2", 150},      {u"2d-1", 0.2},             {u"&HFF", 255},  {u"&hFFFF", -1},
      {u"&H10000", 65536},  {u"&O17", 15},              {u"0e99999999999", 0},
  };
  for (const auto& c : cases) {
    EXPECT_TRUE(isNumeric(c.text)) << toUtf8(c.text);
    EXPECT_DOUBLE_EQ(textToDouble(c.text), c.value) << toUtf8(c.text);
  }
  for (const char16_t* bad : {u"", u"   ", u"abc", u"1.2.3", u"E5", u".", u"1e", u"- 1",
                              u"\t1", u",1", u"&H", u"&HG", u"1 2", u"&HFFFFFFFFF"}) {
    EXPECT_FALSE(isNumeric(bad)) << toUtf8(bad);
  }
  EXPECT_TRUE(raisesRuntime([] { textToDouble(u"abc"); }, RuntimeError::kTypeMismatch));
  EXPECT_TRUE(raisesRuntime([] { textToDouble(u"1E400"); }, RuntimeError::kOverflow));
  EXPECT_EQ(textToDouble(u"1E-400"), 0.0);
}

TEST(NumbersTest, RoundsHalfToEvenAndRaisesOverflow) {
  EXPECT_EQ(textToLong(u"2.5"), 2);
  EXPECT_EQ(textToLong(u"3.5"), 4);
  EXPECT_EQ(textToLong(u"-2.5"), -2);
  EXPECT_EQ(textToLong(u"2.5000001"), 3);
  EXPECT_EQ(textToLong(u"007"), 7);
  EXPECT_EQ(textToLong(u"-2147483648"), std::numeric_limits<int32_t>::min());
  EXPECT_EQ(textToLong(u"2147483647.4"), 2147483647);
  EXPECT_TRUE(raisesRuntime([] { textToLong(u"2147483647.5"); }, RuntimeError::kOverflow));
  EXPECT_TRUE(raisesRuntime([] { textToLong(u"1E30"); }, RuntimeError::kOverflow));
  EXPECT_EQ(textToInteger(u"-32768"), -32768);
  EXPECT_TRUE(raisesRuntime([] { textToInteger(u"32768"); }, RuntimeError::kOverflow));
  EXPECT_EQ(doubleToLong(0.5), 0);
  EXPECT_EQ(doubleToLong(1.5), 2);
  EXPECT_TRUE(raisesRuntime([] { doubleToLong(std::nan("")); }, RuntimeError::kOverflow));
  EXPECT_EQ(doubleToInteger(-32768.4), -32768);
}

TEST(NumbersTest, CurrencyKeepsFourDecimalsExactly) {
  EXPECT_EQ(textToCurrency(u"12.5"), 125000);
  EXPECT_EQ(textToCurrency(u"2.00005"), 20000);  // half to even
  EXPECT_EQ(textToCurrency(u"2.00015"), 20002);
  EXPECT_EQ(textToCurrency(u"922337203685477.5807"), std::numeric_limits<int64_t>::max());
  EXPECT_EQ(textToCurrency(u"-922337203685477.5808"), std::numeric_limits<int64_t>::min());
  EXPECT_TRUE(
      raisesRuntime([] { textToCurrency(u"922337203685477.5808"); }, RuntimeError::kOverflow));
  EXPECT_EQ(currencyToText(125000), u"12.5");
  EXPECT_EQ(currencyToText(-5), u"-0.0005");
  EXPECT_EQ(currencyToText(std::numeric_limits<int64_t>::min()), u"-922337203685477.5808");
}

TEST(NumbersTest, WritesDoublesInShortestFifteenDigitForm) {
  EXPECT_EQ(doubleToText(7.5), u"7.5");
  EXPECT_EQ(doubleToText(0.1 + 0.2), u"0.3");
  EXPECT_EQ(doubleToText(123456789012345.0), u"123456789012345");
  EXPECT_EQ(doubleToText(1e15), u"1E+15");
  EXPECT_EQ(doubleToText(0.0001), u"0.0001");
  EXPECT_EQ(doubleToText(0.00001), u"1E-05");
  EXPECT_EQ(doubleToText(-0.0), u"0");
}

TEST(NumbersTest, FixedFormatsRoundHalfAwayOnFifteenDigits) {
  const struct {
    const char16_t* text;
    int decimals;
    const char16_t* expected;
  } cases[] = {
      {u"12.5", 2, u"12.50"},      {u"0.5", 2, u".50"},        {u"2.675", 2, u"2.68"},
      {u"-1.005", 2, u"-1.01"},    {u"0.004", 2, u".00"},      {u"-0.004", 2, u".00"},
      {u"99.995", 2, u"100.00"},   {u"1E20", 2, u"100000000000000000000.00"},
      {u"12.5", 5, u"12.50000"},   {u"0.000005", 5, u".00001"}, {u" 1,000 ", 2, u"1000.00"},
      {u"abc", 2, u"abc"},         {u"", 5, u""},
  };
  for (const auto& c : cases) {
    EXPECT_EQ(formatFixed(c.text, c.decimals), c.expected) << toUtf8(c.text);
  }
}

}  // namespace
}  // namespace droqbxml

// The value checks: normalised results, refusals with their number, source and message,
// the runtime failures they let through, and the checks reached by name.
#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <functional>
#include <vector>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/qbxml/basValidations.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using namespace basValidations;
using test::raises;
using test::raisesRuntime;

using Check = Text (*)(const Text&);

// The refusal of `check` (its published name) with `shown` and the check's type words in
// the message.
::testing::AssertionResult refuses(const std::function<void()>& body, ERROR_NUMBER number,
                                   TextView check, TextView shown, TextView typeWords) {
  return test::raisesRefusal(body, number, check, shown, typeWords);
}

Text intCheck(const Text& value, int32_t mode, int32_t upper, int32_t lower) {
  return CheckINTTYPE(value, mode, upper, lower);
}

Text strCheck(const Text& value, int16_t maxLen, bool truncate) {
  return CheckSTRTYPE(value, maxLen, truncate);
}

// A value and what its check gives back.
struct Normalised {
  const char16_t* value;
  const char16_t* expected;
};

TEST(basValidationsTest, EmptyTextPassesEveryCheck) {
  for (Check check : {&CheckWageType, &CheckJobStatus, &CheckAccountType, &CheckAMTTYPE,
                      &CheckBOOLTYPE, &CheckDATETYPE, &CheckDATETIMETYPE, &CheckPRICETYPE,
                      &CheckQUANTYPE, &CheckIDTYPE, &CheckPERCENTTYPE}) {
    EXPECT_EQ(check(u""), u"");
  }
  EXPECT_EQ(intCheck(u"", 2, 10, 1), u"");
  EXPECT_EQ(strCheck(u"", 3, false), u"");
}

TEST(basValidationsTest, ClosedListsGiveTheQbxmlSpellingInAnyCase) {
  const struct {
    Check check;
    const char16_t* value;
    const char16_t* expected;
  } cases[] = {
      {&CheckWageType, u"hourly", u"Hourly"},
      {&CheckWageType, u"SaLaRy", u"Salary"},
      {&CheckJobStatus, u"inprogress", u"InProgress"},
      {&CheckJobStatus, u"NOTAWARDED", u"NotAwarded"},
      {&CheckAccountType, u"costofgoodssold", u"CostOfGoodsSold"},
      // The hyphen and the lower-case "p" are kept.
      {&CheckAccountType, u"NON-POSTING", u"Non-posting"},
      {&CheckAccountType, u"Non-Posting", u"Non-posting"},
      {&CheckBOOLTYPE, u"1", u"true"},
      {&CheckBOOLTYPE, u"True", u"true"},
      {&CheckBOOLTYPE, u"fALSE", u"false"},
  };
  for (const auto& c : cases) EXPECT_EQ(c.check(c.value), c.expected) << toUtf8(c.value);
}

TEST(basValidationsTest, ClosedListsRefuseOtherValuesUntrimmed) {
  EXPECT_TRUE(raises([] { CheckWageType(u"Daily"); }, TYPE_WAGE,
                     u"DroQbXml.basValidations.CheckWageType",
                     u"The value 'Daily' is not an allowable Wage Type value.  Please refer to "
                     u"the qbXML specifications."));
  const struct {
    Check check;
    const char16_t* value;
    ERROR_NUMBER number;
    const char16_t* name;
    const char16_t* typeWords;
  } cases[] = {
      {&CheckWageType, u" Hourly", TYPE_WAGE, u"CheckWageType", u"Wage Type"},
      {&CheckJobStatus, u"In Progress", JOB_STATUS, u"CheckJobStatus", u"job status"},
      {&CheckJobStatus, u"Closed ", JOB_STATUS, u"CheckJobStatus", u"job status"},
      {&CheckAccountType, u"NonPosting", TYPE_ACCOUNT, u"CheckAccountType", u"account type"},
      {&CheckAccountType, u"Bank\t", TYPE_ACCOUNT, u"CheckAccountType", u"account type"},
      {&CheckBOOLTYPE, u"yes", TYPE_BOOL, u"CheckBOOLTYPE", u"BOOLTYPE"},
      {&CheckBOOLTYPE, u"true ", TYPE_BOOL, u"CheckBOOLTYPE", u"BOOLTYPE"},
      {&CheckBOOLTYPE, u"-1", TYPE_BOOL, u"CheckBOOLTYPE", u"BOOLTYPE"},
  };
  for (const auto& c : cases) {
    EXPECT_TRUE(refuses([&] { c.check(c.value); }, c.number, c.name, c.value, c.typeWords))
        << toUtf8(c.value);
  }
}

TEST(basValidationsTest, AmountsGetTwoDecimals) {
  const Normalised cases[] = {
      {u"12.5", u"12.50"},
      {u"0.5", u".50"},
      {u"-0.5", u"-.50"},
      {u"2.675", u"2.68"},
      {u"1,234", u"1234.00"},
      {u" +7 ", u"7.00"},
      {u"99999999.99", u"99999999.99"},
      {u"-99999999.99", u"-99999999.99"},
      {u"99999999.994", u"99999999.99"},
      {u"1E3", u"1000.00"},
  };
  for (const auto& c : cases) EXPECT_EQ(CheckAMTTYPE(c.value), c.expected) << toUtf8(c.value);
}

TEST(basValidationsTest, RefusedAmountShowsItsFormattedText) {
  const struct {
    const char16_t* value;
    const char16_t* shown;
  } cases[] = {
      {u"100000000", u"100000000.00"},     // out of range
      {u"99999999.995", u"100000000.00"},  // out of range once rounded
      {u"-100000000", u"-100000000.00"},   // 13 characters with the sign
      {u"1234567890123", u"1234567890123.00"},
      {u"abc", u"abc"},  // not numeric: the formatting leaves it as it is
      {u"12.5.1", u"12.5.1"},
  };
  for (const auto& c : cases) {
    EXPECT_TRUE(
        refuses([&] { CheckAMTTYPE(c.value); }, TYPE_AMOUNT, u"CheckAMTTYPE", c.shown, u"AMTTYPE"))
        << toUtf8(c.value);
  }
}

TEST(basValidationsTest, AmountAndQuantityOverflowIsRaisedUnderTheChecksName) {
  const auto shared = basGlobals::SharedErrorObject();
  const struct {
    Check check;
    const char16_t* value;
    const char16_t* source;
  } cases[] = {
      {&CheckAMTTYPE, u"1E400", u"DroQbXml.basValidations.CheckAMTTYPE"},
      {&CheckAMTTYPE, u"&HFFFFFFFFF", u"DroQbXml.basValidations.CheckAMTTYPE"},
      {&CheckQUANTYPE, u"-1E400", u"DroQbXml.basValidations.CheckQUANTYPE"},
  };
  for (const auto& c : cases) {
    shared->Clear();
    EXPECT_TRUE(raises([&] { c.check(c.value); }, RuntimeError::kOverflow, c.source, u"Overflow"))
        << toUtf8(c.value);
    EXPECT_EQ(shared->Number(), RuntimeError::kOverflow);
    EXPECT_EQ(shared->Source(), c.source);
  }
}

TEST(basValidationsTest, IntegersInDecimalWithLengthOrRangeMode) {
  EXPECT_EQ(intCheck(u"007", 0, 0, 0), u"7");
  EXPECT_EQ(intCheck(u"2.5", 0, 0, 0), u"2");  // half to even
  EXPECT_EQ(intCheck(u"10", 2, 10, 1), u"10");
  EXPECT_EQ(intCheck(u"1", 2, 10, 1), u"1");
  EXPECT_EQ(intCheck(u"-5", 2, 0, -5), u"-5");
  EXPECT_EQ(intCheck(u"12345", 1, 5, 0), u"12345");
  EXPECT_EQ(intCheck(u"99999", 4, 1, 1), u"99999");  // other modes check nothing more

  const struct {
    const char16_t* value;
    int32_t mode;
    int32_t upper;
    int32_t lower;
  } refused[] = {
      {u"15", 2, 10, 1},
      {u"0", 2, 10, 1},
      {u"123456", 1, 5, 0},
      {u"007", 1, 2, 0},  // the length of the text, not of the number
  };
  for (const auto& c : refused) {
    EXPECT_TRUE(refuses([&] { intCheck(c.value, c.mode, c.upper, c.lower); }, TYPE_INT,
                        u"CheckINTTYPE", c.value, u"INTTYPE"))
        << toUtf8(c.value);
  }
  // The conversion comes first, whatever the mode.
  EXPECT_TRUE(raisesRuntime([] { intCheck(u"2147483648", 1, 3, 0); }, RuntimeError::kOverflow));
  EXPECT_TRUE(raisesRuntime([] { intCheck(u"abc", 1, 1, 0); }, RuntimeError::kTypeMismatch));
}

TEST(basValidationsTest, StringsAreCutOrRefusedBeyondTheirLimit) {
  EXPECT_EQ(strCheck(u"ABCDEF", 3, true), u"ABC");
  EXPECT_EQ(strCheck(u"ABC", 3, false), u"ABC");
  EXPECT_EQ(strCheck(u"ABCDEF", 0, false), u"ABCDEF");  // no limit below 1
  EXPECT_EQ(strCheck(u"ABCDEF", -1, false), u"ABCDEF");
  EXPECT_TRUE(refuses([] { strCheck(u"ABCDEF", 3, false); }, TYPE_STRING, u"CheckSTRTYPE",
                      u"ABCDEF", u"STRTYPE"));
}

TEST(basValidationsTest, DatesKeepTheirFirstTenCharacters) {
  const Normalised cases[] = {
      {u"2004-02-29", u"2004-02-29"},
      // No leap-year rule: the 29th of February passes in every year.
      {u"2003-02-29", u"2003-02-29"},
      // Only February has its own last day; every other month allows the 31st.
      {u"2004-04-31", u"2004-04-31"},
      // February's limit applies only to a month written "02".
      {u"2004- 2-30", u"2004- 2-30"},
      {u"2004-05-06T10:00:00", u"2004-05-06"},
      {u"0000-12-01", u"0000-12-01"},
  };
  for (const auto& c : cases) EXPECT_EQ(CheckDATETYPE(c.value), c.expected) << toUtf8(c.value);
}

TEST(basValidationsTest, DatesRefusedOrNotConverted) {
  for (const char16_t* value :
       {u"2004-02-30", u"2004-13-01", u"2004-00-10", u"2004-01-32", u"2004-01-00", u"2004/01/01",
        u"2004-01/01", u"2004", u"2004-01", u"12345-01-01"}) {
    EXPECT_TRUE(
        refuses([&] { CheckDATETYPE(value); }, TYPE_DATE, u"CheckDATETYPE", value, u"DATETYPE"))
        << toUtf8(value);
  }
  // Year, month and day that are not numbers are the runtime's type mismatch, tested in
  // that order: "2004/ab" fails on its separator before its month is read.
  for (const char16_t* value :
       {u"abcd-01-01", u"2004-ab-01", u"2004-01-xx", u"2004-", u"2004-01-", u"1/2/2004"}) {
    EXPECT_TRUE(raisesRuntime([&] { CheckDATETYPE(value); }, RuntimeError::kTypeMismatch))
        << toUtf8(value);
  }
  EXPECT_TRUE(refuses([] { CheckDATETYPE(u"2004/ab"); }, TYPE_DATE, u"CheckDATETYPE", u"2004/ab",
                      u"DATETYPE"));
}

TEST(basValidationsTest, PricesKeepFourDecimalsWrittenWithFive) {
  const Normalised cases[] = {
      {u"12.5", u"12.50000"},
      {u"0.5", u".50000"},
      {u"+5", u"5.00000"},
      {u"12.34565", u"12.34560"},  // currency rounds half to even
      {u"12.34575", u"12.34580"},
      {u"9999999999.9999", u"9999999999.99990"},
      {u"-9999999999.99994", u"-9999999999.99990"},
  };
  for (const auto& c : cases) EXPECT_EQ(CheckPRICETYPE(c.value), c.expected) << toUtf8(c.value);

  for (const char16_t* value : {u"10000000000", u"-10000000000", u"9999999999.99995"}) {
    EXPECT_TRUE(
        refuses([&] { CheckPRICETYPE(value); }, TYPE_PRICE, u"CheckPRICETYPE", value, u"PRICETYPE"))
        << toUtf8(value);
  }
  EXPECT_TRUE(raisesRuntime([] { CheckPRICETYPE(u"abc"); }, RuntimeError::kTypeMismatch));
  EXPECT_TRUE(raisesRuntime([] { CheckPRICETYPE(u"1E30"); }, RuntimeError::kOverflow));
}

TEST(basValidationsTest, QuantitiesWithFiveDecimalsWithinRange) {
  const Normalised cases[] = {
      {u"2.5", u"2.50000"},
      {u"1.234567", u"1.23457"},
      {u"0.000001", u".00000"},
      {u"9999999.99999", u"9999999.99999"},
      {u"-9999999.99999", u"-9999999.99999"},
  };
  for (const auto& c : cases) EXPECT_EQ(CheckQUANTYPE(c.value), c.expected) << toUtf8(c.value);

  // Text that is not a number is refused like a number out of range, with the text given.
  for (const char16_t* value : {u"10000000", u"9999999.999991", u"-10000000", u"abc", u"1-"}) {
    EXPECT_TRUE(refuses([&] { CheckQUANTYPE(value); }, TYPE_QUNANTITY, u"CheckQUANTYPE", value,
                        u"QUANTYPE"))
        << toUtf8(value);
  }
}

TEST(basValidationsTest, PercentsInShortestFormAndPassThroughChecks) {
  EXPECT_EQ(CheckPERCENTTYPE(u"7.50"), u"7.5");
  EXPECT_EQ(CheckPERCENTTYPE(u"-012.250"), u"-12.25");
  EXPECT_TRUE(raisesRuntime([] { CheckPERCENTTYPE(u"7%"); }, RuntimeError::kTypeMismatch));
  EXPECT_TRUE(raisesRuntime([] { CheckPERCENTTYPE(u"1E400"); }, RuntimeError::kOverflow));

  const Text odd{u' ', char16_t{0}, u'x', char16_t{0xD800}, u'\t'};
  EXPECT_EQ(CheckDATETIMETYPE(odd), odd);
  EXPECT_EQ(CheckIDTYPE(odd), odd);
}

TEST(basValidationsTest, HugeAndControlTextIsRefusedOrReported) {
  const Text huge(200000, u'9');
  EXPECT_TRUE(
      refuses([&] { CheckWageType(huge); }, TYPE_WAGE, u"CheckWageType", huge, u"Wage Type"));
  EXPECT_TRUE(
      refuses([&] { CheckDATETYPE(huge); }, TYPE_DATE, u"CheckDATETYPE", huge, u"DATETYPE"));
  EXPECT_TRUE(raises([&] { CheckQUANTYPE(huge); }, RuntimeError::kOverflow,
                     u"DroQbXml.basValidations.CheckQUANTYPE", u"Overflow"));
  EXPECT_TRUE(raises([&] { CheckAMTTYPE(huge); }, RuntimeError::kOverflow,
                     u"DroQbXml.basValidations.CheckAMTTYPE", u"Overflow"));
  EXPECT_TRUE(raisesRuntime([&] { CheckPRICETYPE(huge); }, RuntimeError::kOverflow));
  EXPECT_TRUE(raisesRuntime([&] { intCheck(huge, 1, 5, 0); }, RuntimeError::kOverflow));
  EXPECT_EQ(strCheck(huge, 4, true), u"9999");

  const Text control{u'1', char16_t{0}, u'2'};
  EXPECT_TRUE(
      refuses([&] { CheckBOOLTYPE(control); }, TYPE_BOOL, u"CheckBOOLTYPE", control, u"BOOLTYPE"));
  EXPECT_TRUE(
      refuses([&] { CheckAMTTYPE(control); }, TYPE_AMOUNT, u"CheckAMTTYPE", control, u"AMTTYPE"));
  EXPECT_TRUE(raisesRuntime([&] { CheckDATETYPE(control); }, RuntimeError::kTypeMismatch));
}

TEST(basValidationsTest, ChecksAreReachableByName) {
  const auto module = CreateObject(u"DroQbXml.basValidations");
  EXPECT_EQ(module->className(), u"basValidations");
  EXPECT_EQ(module->call(u"checkwagetype", {Variant(u"salary")}).toText(), u"Salary");
  EXPECT_EQ(module->call(u"CheckAMTTYPE", {Variant(12.5)}).toText(), u"12.50");
  EXPECT_EQ(module->call(u"CheckPERCENTTYPE", {Variant(u"7.50")}).toText(), u"7.5");

  std::vector<Variant> intArgs{Variant(u"007"), Variant(int32_t{2}), Variant(int32_t{10}),
                               Variant(int32_t{1})};
  EXPECT_EQ(module->invoke(u"CheckINTTYPE", MemberKind::Method, intArgs).toText(), u"7");

  std::vector<Variant> strArgs{Variant(u"ABCDEF"), Variant(int16_t{3}), Variant(true)};
  EXPECT_EQ(module->invoke(u"CheckSTRTYPE", MemberKind::Method, strArgs).toText(), u"ABC");

  EXPECT_TRUE(refuses([&] { module->call(u"CheckJobStatus", {Variant(u"Lost")}); }, JOB_STATUS,
                      u"CheckJobStatus", u"Lost", u"job status"));
  EXPECT_TRUE(raisesRuntime([&] { module->call(u"CheckFOOTYPE", {Variant(u"x")}); },
                            RuntimeError::kMemberNotSupported));
}

}  // namespace
}  // namespace droqbxml

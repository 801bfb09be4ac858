// The value checks: normalised results, refusals with their number, source and message,
// the runtime failures they let through, and the checks reached by name.
#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <functional>
#include <string>
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

TEST(basValidationsTest, DateTimesAndIdsPassAnyText) {
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

// The table of ByNameTablesTest calls every check by name; names are matched without
// regard to case, a number converts as text, and an unknown check is the runtime's 438.
TEST(basValidationsTest, ChecksAreReachableByName) {
  const auto module = CreateObject(u"DroQbXml.basValidations");
  EXPECT_EQ(module->className(), u"basValidations");
  EXPECT_EQ(module->call(u"checkwagetype", {Variant(u"salary")}).toText(), u"Salary");
  EXPECT_EQ(module->call(u"CheckAMTTYPE", {Variant(12.5)}).toText(), u"12.50");
  EXPECT_TRUE(raisesRuntime([&] { module->call(u"CheckFOOTYPE", {Variant(u"x")}); },
                            RuntimeError::kMemberNotSupported));
}

}  // namespace
}  // namespace droqbxml

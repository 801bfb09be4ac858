// The value checks: normalised results, refusals with their number, source and message,
// the runtime failures they let through, and the checks reached by name.
#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <cstdio>
#include <functional>
#include <sstream>
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

// One argument of a call in the table: "text" (with \\t, \\" and \\\\ escaped), an integer,
// true or false.
Variant argument(std::string_view text) {
  if (text == "true" || text == "false") return Variant(text == "true");
  if (text.front() != '"') return Variant(static_cast<int32_t>(std::stol(std::string(text))));
  std::string value;
  for (size_t i = 1; i + 1 < text.size(); ++i) {
    if (text[i] == '\\')
      value += text[++i] == 't' ? '\t' : text[i];
    else
      value += text[i];
  }
  return Variant(fromUtf8(value));
}

// What a call gives: => "result", or => error NUMBER SOURCE: DESCRIPTION.
std::string outcome(const std::string& call) {
  const size_t open = call.find('(');
  std::vector<Variant> args;
  std::string rest = call.substr(open + 1, call.rfind(')') - open - 1);
  for (size_t at = 0; at < rest.size();) {
    size_t end = at;
    if (rest[at] == '"') {
      for (end = at + 1; rest[end] != '"'; ++end) end += rest[end] == '\\' ? 1 : 0;
      ++end;
    } else {
      end = std::min(rest.find(',', at), rest.size());
    }
    args.push_back(argument(std::string_view(rest).substr(at, end - at)));
    at = end + 2;
  }
  try {
    const auto module = CreateObject(u"DroQbXml.basValidations");
    const Text result =
        module->invoke(fromUtf8(call.substr(0, open)), MemberKind::Method, args).toText();
    return "\"" + toUtf8(result) + "\"";
  } catch (const ComError& error) {
    char number[16];
    std::snprintf(number, sizeof number, error.number() < 0 ? "0x%08X" : "%d", error.number());
    return std::string("error ") + number + " " + toUtf8(error.source()) + ": " +
           toUtf8(error.description());
  }
}

// The published checks by name, each call of testdata/checks/value_checks.txt with what it
// gives back or raises: closed lists, amounts, integers, strings, dates, prices, quantities
// and percents, their refusals and the runtime's failures they let through.
TEST(basValidationsTest, EveryCallOfTheTable) {
  std::istringstream lines(
      test::readFile(std::string(DROQBXML_TESTDATA_DIR) + "/checks/value_checks.txt"));
  std::string table;
  std::string line;
  while (std::getline(lines, line)) {
    if (line.starts_with("#")) {
      table += line + "\n";
      continue;
    }
    const std::string call = line.substr(0, line.find(" =>"));
    table += call + " => " + outcome(call) + "\n";
  }
  EXPECT_TRUE(test::matchesGolden(fromUtf8(table), "checks/value_checks.txt"));
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

// The table calls by name with text and typed arguments; names are matched without regard
// to case, a number converts as text, and an unknown check is the runtime's 438.
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

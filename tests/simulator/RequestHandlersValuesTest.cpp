// The request handlers' own pieces: QuickBooks' number conversion and formats, text reduced to
// ISO-8859-1, the clock and its fixed present, and the stored form of fields.
#include <gtest/gtest.h>

#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "simulator/handlers/Clock.hpp"
#include "simulator/handlers/Fields.hpp"
#include "simulator/handlers/Values.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator::handlers {
namespace {

TEST(RequestHandlersValuesTest, NumbersConvertAsQuickBooksConvertsThem) {
  struct Case {
    const char* text;
    NumberKind kind;
    std::optional<int64_t> value;
  };
  const Case cases[] = {
      {"12", NumberKind::Amount, 12 * kScale},
      {"-12.50", NumberKind::Amount, -1250 * kCent},
      {"+0.05", NumberKind::Amount, 5 * kCent},
      {"246.9", NumberKind::Amount, std::nullopt},  // an amount has two decimals or none
      {"246.901", NumberKind::Amount, std::nullopt},
      {"246.", NumberKind::Amount, std::nullopt},
      {".50", NumberKind::Amount, std::nullopt},
      {"1234567890123.00", NumberKind::Amount, 123456789012300 * kCent},
      {"12345678901234", NumberKind::Amount, std::nullopt},
      {"1,000.00", NumberKind::Amount, std::nullopt},
      {"0.12345", NumberKind::Price, 12345},
      {"0.123456", NumberKind::Price, std::nullopt},
      {"85.5", NumberKind::Price, 8550000},
      {"12345678901", NumberKind::Price, std::nullopt},
      {"2.5", NumberKind::Quantity, 250000},
      {"1e3", NumberKind::Quantity, std::nullopt},
      {"7.25", NumberKind::Percent, 725000},
      {"", NumberKind::Percent, std::nullopt},
      {"-", NumberKind::Percent, std::nullopt},
  };
  for (const Case& each : cases) {
    EXPECT_EQ(parseNumber(each.text, each.kind), each.value) << each.text;
  }
}

TEST(RequestHandlersValuesTest, NumbersAreWrittenInEachTypesForm) {
  EXPECT_EQ(formatNumber(0, NumberKind::Amount), "0.00");
  EXPECT_EQ(formatNumber(-1250 * kCent, NumberKind::Amount), "-12.50");
  EXPECT_EQ(formatNumber(-1, NumberKind::Amount), "0.00");  // no "-0.00"
  EXPECT_EQ(formatNumber(12345, NumberKind::Amount), "0.12");
  EXPECT_EQ(formatNumber(85 * kScale, NumberKind::Price), "85.00");
  EXPECT_EQ(formatNumber(12500, NumberKind::Price), "0.125");
  EXPECT_EQ(formatNumber(-33333, NumberKind::Price), "-0.33333");
  EXPECT_EQ(formatNumber(2 * kScale, NumberKind::Quantity), "2");
  EXPECT_EQ(formatNumber(250000, NumberKind::Quantity), "2.5");
  EXPECT_EQ(formatNumber(0, NumberKind::Quantity), "0");
  EXPECT_EQ(formatNumber(750000, NumberKind::Percent), "7.50");
  EXPECT_EQ(formatNumber(INT64_MIN + 1, NumberKind::Quantity), "-92233720368547.75807");
}

TEST(RequestHandlersValuesTest, ArithmeticRoundsHalfAwayFromZero) {
  EXPECT_EQ(roundToCents(500), 1000);  // 0.005 -> 0.01
  EXPECT_EQ(roundToCents(-500), -1000);
  EXPECT_EQ(roundToCents(499), 0);
  EXPECT_EQ(multiply(3 * kScale, 33333), 99999);
  EXPECT_EQ(multiply(2, 250000), 5);  // 0.00002 * 2.5 = 0.00005
  // Products beyond 64 bits before scaling back still come out exact.
  EXPECT_EQ(multiply(9999999999 * kScale, 90000), 899999999910000);
  EXPECT_EQ(divide(300 * kScale, 4 * kScale), 75 * kScale);
  EXPECT_EQ(divide(1 * kScale, 3 * kScale), 33333);
  EXPECT_EQ(divide(2 * kScale, 3 * kScale), 66667);
  EXPECT_EQ(divide(5, 0), 0);
  EXPECT_EQ(percentOf(63500000, 750000), 4762500);  // 7.5 % of 635.00 = 47.625
  EXPECT_EQ(roundToCents(percentOf(10 * kCent, 750000)), 1 * kCent);
}

TEST(RequestHandlersValuesTest, TextKeepsIso88591AndReplacesTheRest) {
  EXPECT_EQ(latin1Text("plain & <tags>"), "plain & <tags>");
  EXPECT_EQ(latin1Text("caf\xC3\xA9 \xC3\xBF"), "caf\xC3\xA9 \xC3\xBF");  // é and ÿ stay
  EXPECT_EQ(latin1Text("5\xE2\x82\xAC"), "5?");                           // the euro sign
  EXPECT_EQ(latin1Text("\xF0\x9F\x98\x80!"), "?!");                       // one ? per character
  EXPECT_EQ(latin1Text("\xC3"), "?");                                     // cut short
  EXPECT_EQ(latin1Text("a\xFF"
                       "b"),
            "a?b");                        // not UTF-8
  EXPECT_EQ(latin1Text("\xC1\x81"), "?");  // overlong "A"
  EXPECT_EQ(booleanText("1"), "true");
  EXPECT_EQ(booleanText("false"), "false");
  EXPECT_EQ(booleanText("0"), "false");
}

TEST(RequestHandlersClockTest, AFixedPresentSetsTheTimeAndTheLocalOffset) {
  const test::ScopedVariable now("DROQBXML_SIMULATOR_NOW", "2009-03-02T10:40:23-05:00");
  EXPECT_EQ(currentTime(), 1236008423);
  EXPECT_EQ(formatDateTime(currentTime()), "2009-03-02T10:40:23-05:00");
  EXPECT_EQ(formatDateTime(1236008423 - 11 * 3600), "2009-03-01T23:40:23-05:00");
  EXPECT_EQ(formatDate(0), "1969-12-31");
  EXPECT_EQ(parseDateTime("2009-03-02", false), 1235970000);  // local midnight
  EXPECT_EQ(parseDateTime("2009-03-02", true), 1235970000 + 86399);
  EXPECT_EQ(parseDateTime("2009-03-02T10:40:23", false), 1236008423);
  EXPECT_EQ(parseDateTime("2009-03-02T16:40:23+01:00", false), 1236008423);
  EXPECT_EQ(parseDateTime("2008-02-29", false).has_value(), true);
  for (const char* wrong : {"2009-02-29", "2009-13-01", "2009-3-2", "2009-03-02T25:00:00",
                            "2009-03-02T10:40", "2009-03-02 10:40:23", "2009-03-02T10:40:23Z"}) {
    EXPECT_EQ(parseDateTime(wrong, false), std::nullopt) << wrong;
  }

  now.set("2024-07-01T09:30:00+05:30");
  EXPECT_EQ(formatDateTime(currentTime()), "2024-07-01T09:30:00+05:30");
  // Not a full date and time: the real clock and time zone are used.
  now.set("2024-07-01");
  EXPECT_GT(currentTime(), 1700000000);
}

TEST(RequestHandlersFieldsTest, StoredFieldsComeBackAsTheyWere) {
  const std::vector<Field> fields{
      Field::value("Name", "Caf\xC3\xA9"),
      Field::value("NoSuchElementName", std::string(300, 'x')),  // stored inline, long value
      Field::aggregate("BillAddress", {Field::value("Addr1", "1 Main"), Field::value("City", "")}),
      Field::reference("ItemRef", ListTable::Items, 70000),
      Field::aggregate("Empty", {}),
  };
  const std::string blob = encodeFields(fields);
  const std::vector<Field> back = decodeFields(blob);
  ASSERT_EQ(back.size(), fields.size());
  for (size_t i = 0; i < fields.size(); ++i) {
    EXPECT_EQ(back[i].name, fields[i].name);
    EXPECT_EQ(back[i].kind, fields[i].kind);
    EXPECT_EQ(back[i].text, fields[i].text);
    EXPECT_EQ(back[i].table, fields[i].table);
    EXPECT_EQ(back[i].row, fields[i].row);
    EXPECT_EQ(back[i].children.size(), fields[i].children.size());
  }
  EXPECT_EQ(back[2].children[0].text, "1 Main");
  // Known names cost one byte: "Name" and its value take 2 + 5 bytes.
  EXPECT_EQ(encodeFields({fields[0]}).size(), 7u);
  EXPECT_TRUE(decodeFields("").empty());

  // Anything else is a damaged record, never a crash.
  for (const std::string& damaged : {blob.substr(0, blob.size() - 1), std::string("\xFF\xFF\xFF"),
                                     std::string("\x07", 1), std::string("\x05\x7F", 2)}) {
    EXPECT_THROW(decodeFields(damaged), std::runtime_error);
  }
}

}  // namespace
}  // namespace droqbxml::simulator::handlers

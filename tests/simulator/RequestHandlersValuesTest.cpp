// The request handlers' own pieces: the clock and its fixed present, and the stored form of
// fields (numbers and text: testdata/calls/stand_in_values.txt).
#include <gtest/gtest.h>

#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "simulator/handlers/Clock.hpp"
#include "simulator/handlers/Fields.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator::handlers {
namespace {

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

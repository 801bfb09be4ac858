// The request handlers' own pieces: the real clock, and the stored form of fields.
#include <gtest/gtest.h>

#include <stdexcept>
#include <string>
#include <vector>

#include "simulator/handlers/Clock.hpp"
#include "simulator/handlers/Fields.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator::handlers {
namespace {

// A present that is not a full date and time leaves the real clock in use (the fixed present
// and the formats: testdata/calls/stand_in_values.txt).
TEST(RequestHandlersClockTest, APresentThatIsNotADateTimeIsIgnored) {
  const test::ScopedVariable now("DROQBXML_SIMULATOR_NOW", "2024-07-01");
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

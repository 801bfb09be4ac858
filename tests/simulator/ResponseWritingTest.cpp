// The stand-in's response writing against the plain ways of doing the same, on random and extreme
// values: times and identifiers against the C library's formatting, escaping against escaping
// one character at a time, and Ret children in remembered places against ranks in the schema's
// order and arrangements worked out afresh.
#include <gtest/gtest.h>

#include <climits>
#include <cstdio>
#include <ctime>
#include <random>
#include <string>
#include <vector>

#include "simulator/RequestDocument.hpp"
#include "simulator/handlers/Clock.hpp"
#include "simulator/handlers/Response.hpp"
#include "simulator/handlers/Store.hpp"
#include "simulator/internal/SchemaModel.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator::handlers {
namespace {

TEST(ResponseWritingTest, TimesAndIdentifiersAsPrintfWritesThem) {
  // From before the year 0 to past 9999 (written as printf writes them there too), with
  // offsets up to the largest the variable can give.
  std::mt19937_64 random(7);
  test::ScopedVariable now("DROQBXML_SIMULATOR_NOW");
  std::uniform_int_distribution<int64_t> times(-62200000000, 320000000000);
  const std::vector<int64_t> edges{0, -1, LLONG_MIN, LLONG_MAX, 253402300799};
  for (size_t round = 0; round < 3000; ++round) {
    const int hours = static_cast<int>(random() % 100);
    const int minutes = static_cast<int>(random() % 100);  // past 59 too: the variable takes them
    const int offset = hours * 3600 + minutes * 60;
    const char sign = random() % 2 ? '-' : '+';
    char text[48];
    std::snprintf(text, sizeof text, "2009-03-02T10:40:23%c%02d:%02d", sign, hours, minutes);
    now.set(text);
    const int64_t time = round < 2 ? edges[round] : round == 2 ? edges[4] : times(random);
    const std::time_t local = time + (sign == '-' ? -offset : offset);
    std::tm civil{};
    ASSERT_NE(gmtime_r(&local, &civil), nullptr);
    std::snprintf(text, sizeof text, "%04d-%02d-%02dT%02d:%02d:%02d%c%02d:%02d",
                  civil.tm_year + 1900, civil.tm_mon + 1, civil.tm_mday, civil.tm_hour,
                  civil.tm_min, civil.tm_sec, sign, offset / 3600, offset / 60 % 60);
    ASSERT_EQ(formatDateTime(time), text) << time;
    const int64_t id = round < 4 ? edges[round] : static_cast<int64_t>(random() >> random() % 64);
    std::snprintf(text, sizeof text, "%llX-%lld", static_cast<unsigned long long>(id),
                  static_cast<long long>(time));
    ASSERT_EQ(txnIdText(id, time), text);
  }
}

TEST(ResponseWritingTest, TextEscapedAsOneCharacterAtATime) {
  // Texts of every length from 1 to 40 from characters that need escaping, characters next to them
  // and UTF-8 bytes, in an element and in the status message attribute.
  std::mt19937 random(3);
  const std::string alphabet = "&<\">'%;a7 \n\x7F\x80\xC3\xA9";
  const auto escaped = [](const std::string& text, bool attribute) {
    std::string out;
    for (const char c : text) {
      out += c == '&'                ? "&amp;"
             : c == '<'              ? "&lt;"
             : c == '"' && attribute ? "&quot;"
                                     : std::string(1, c);
    }
    return out;
  };
  Store noFile(nullptr);  // values need no store
  for (int round = 0; round < 4000; ++round) {
    std::string text;
    for (size_t size = 1 + random() % 40; text.size() < size;)
      text += alphabet[random() % (round % 3 ? 4 : alphabet.size())];
    std::string out;
    writeRecord(out, Field::value("Memo", text), noFile);
    ASSERT_EQ(out, "<Memo>" + escaped(text, false) + "</Memo>\n") << text;
    Answer answer{"CustomerAddRs", std::nullopt, Status{}, 0};
    answer.status.message = text;
    out.clear();
    finishAnswer(out, 0, answer);
    ASSERT_NE(out.find("statusMessage=\"" + escaped(text, true) + "\" />"), std::string::npos)
        << text;
  }
}

TEST(ResponseWritingTest, ChildrenInTheOrderTheSchemaListsThem) {
  // Every aggregate's ranks against each name's place in its order.
  const auto aggregates = internal::aggregates();
  for (size_t index = 0; index < aggregates.size(); ++index) {
    const auto& content = internal::automatonOf(static_cast<int>(index));
    const auto order = schemaChildOrder(aggregates[index].name);
    for (size_t rank = 0; rank < order.size(); ++rank) {
      ASSERT_EQ(content.rankOf(order[rank]), static_cast<int>(rank)) << aggregates[index].name;
    }
    ASSERT_EQ(content.rankOf("NoSuchChild"), -1);
  }
  // A remembered order against one worked out afresh, on field lists that repeat, or change
  // a little from the last (two fields swapped, a name replaced), or change altogether, holding
  // repeated names and names the aggregate does not have.
  std::mt19937 random(11);
  const std::vector<std::string> kAggregates{"CustomerRet", "InvoiceRet", "InvoiceLineGroupRet",
                                             "AccountRet"};
  SchemaOrder remembering({2, 0});
  Store noFile(nullptr);  // values need no store
  std::string aggregate;
  std::vector<std::string_view> names;
  std::vector<Field> fields;
  const auto anyName = [&] { return std::string(names[random() % names.size()]); };
  for (int round = 0; round < 3000; ++round) {
    const auto change = random() % 4;
    if (change == 0 || fields.size() < 2) {
      aggregate = kAggregates[random() % kAggregates.size()];
      names = schemaChildOrder(aggregate);
      names.insert(names.end(), {"Unknown", "InvoiceLineGroupRet", "IsPaid", "TxnLineID"});
      fields.clear();
      for (size_t count = random() % 12; count > 0; --count) {
        fields.push_back(Field::value(anyName(), std::to_string(fields.size())));
      }
    } else if (change == 1) {
      std::swap(fields[random() % fields.size()].name, fields[random() % fields.size()].name);
    } else if (change == 2) {
      fields[random() % fields.size()].name = anyName();
    }
    // Written from the remembered places, and as a Ret aggregate arranged afresh.
    std::string remembered;
    std::string afresh;
    writeRecord(remembered, aggregate, fields, remembering.places(aggregate, fields), noFile);
    writeRecord(afresh, Field::aggregate(aggregate, SchemaOrder({2, 0}).arrange(aggregate, fields)),
                noFile);
    ASSERT_EQ(remembered, afresh);
  }
}

}  // namespace
}  // namespace droqbxml::simulator::handlers

// Statements kept between documents against statements prepared for each document: the same
// random documents of adds and queries (adds refused part way, references to nothing, values
// that do not convert, queries by name, identifier and filter), answered from two company
// files made alike, give the same responses and leave the same rows, and a kept statement
// never holds the file between documents.
#include <gtest/gtest.h>
#include <sqlite3.h>

#include <random>
#include <string>
#include <vector>

#include "simulator/CompanyFile.hpp"
#include "simulator/RequestDocument.hpp"
#include "simulator/RequestHandlers.hpp"
#include "simulator/handlers/Store.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator {
namespace {

class Requests {
 public:
  explicit Requests(unsigned seed) : random_(seed) {}

  std::string document() {
    std::string requests;
    for (int count = pick(4) + 1; count > 0; --count) requests += request();
    return "<?xml version=\"1.0\"?>\n<?qbxml version=\"13.0\"?>\n<QBXML>\n<QBXMLMsgsRq onError=\"" +
           std::string(pick(2) == 0 ? "stopOnError" : "continueOnError") + "\">\n" + requests +
           "</QBXMLMsgsRq>\n</QBXML>\n";
  }

 private:
  int pick(int count) { return std::uniform_int_distribution<int>(0, count - 1)(random_); }
  std::string any(const std::vector<std::string>& values) {
    return values[static_cast<size_t>(pick(static_cast<int>(values.size())))];
  }
  static std::string element(const std::string& name, const std::string& content) {
    return "<" + name + ">" + content + "</" + name + ">";
  }
  static std::string ref(const std::string& name, const std::string& fullName) {
    return element(name, element("FullName", fullName));
  }
  std::string customer() { return any({"Acme", "Bolt", "Acme:Kitchen", "R &amp; D", "Nobody"}); }
  std::string item() { return any({"Labor", "Tile", "Promo", "Sub", "Missing"}); }
  // Too many decimals is a value QuickBooks takes in and then refuses the request for.
  std::string amount() { return any({"12.50", "0", "-3", "1000.25", "1.000001", "85"}); }

  std::string request() {
    switch (pick(9)) {
      case 0: {
        const std::string name = any({"Acme", "Bolt", "Kitchen", "R &amp; D", "Caf\xC3\xA9"});
        std::string add = element("Name", name);
        if (name == "Kitchen") add += ref("ParentRef", any({"Acme", "Nobody"}));
        if (pick(2) == 0) add += element("CompanyName", "\"Quoted\" &lt;Co&gt;");
        if (pick(3) == 0) add += element("OpenBalance", amount());
        if (pick(3) == 0) add += ref("SalesTaxCodeRef", any({"TAX", "NON", "OUT"}));
        return element("CustomerAddRq", element("CustomerAdd", add));
      }
      case 1:
        return element(
            "ItemServiceAddRq",
            element("ItemServiceAdd",
                    element("Name", any({"Labor", "Sub"})) +
                        element("SalesOrPurchase", element("Price", amount()) +
                                                       ref("AccountRef", any({"Sales", "None"})))));
      case 2:
        return element(
            "ItemInventoryAddRq",
            element("ItemInventoryAdd", element("Name", "Tile") + element("SalesPrice", amount()) +
                                            ref("IncomeAccountRef", "Sales") +
                                            ref("COGSAccountRef", "Cost of Goods Sold") +
                                            ref("AssetAccountRef", "Inventory Asset") +
                                            element("QuantityOnHand", any({"10", "2.5"}))));
      case 3:
        return element("ItemDiscountAddRq",
                       element("ItemDiscountAdd", element("Name", "Promo") +
                                                      element("DiscountRatePercent", "10") +
                                                      ref("AccountRef", "Sales")));
      case 4:
      case 5: {
        const bool invoice = pick(3) != 0;
        const std::string stem = invoice ? "Invoice" : "Estimate";
        std::string add = ref("CustomerRef", customer());
        if (pick(2) == 0) add += element("RefNumber", any({"7", "A-9", "TooLongRefNumber"}));
        for (int lines = pick(4) + (invoice ? 0 : 1); lines > 0; --lines) {
          std::string line = ref("ItemRef", item());
          if (pick(2) == 0) line += element("Quantity", any({"2", "1.5", "0"}));
          line += pick(2) == 0 ? element("Rate", amount()) : "";
          add += element(stem + "LineAdd", line);
        }
        return element(stem + "AddRq", element(stem + "Add", add));
      }
      case 6: {
        const std::string by =
            any({"", "<FullName>Acme</FullName><FullName>Nobody</FullName>",
                 "<ListID>80000001-1236008423</ListID>", "<MaxReturned>2</MaxReturned>",
                 "<ActiveStatus>All</ActiveStatus><NameFilter><MatchCriterion>"
                 "StartsWith</MatchCriterion><Name>A</Name></NameFilter>"});
        return element("CustomerQueryRq",
                       by + (pick(3) == 0 ? element("IncludeRetElement", "Name") : ""));
      }
      case 7:
        return element(any({"ItemQueryRq", "AccountQueryRq", "ItemServiceQueryRq"}),
                       any({"", "<FullName>Labor</FullName>", "<MaxReturned>3</MaxReturned>"}));
      default:
        return element(any({"InvoiceQueryRq", "EstimateQueryRq"}),
                       any({"", "<RefNumber>7</RefNumber>", "<TxnID>1-1236008423</TxnID>",
                            "<EntityFilter><FullNameWithChildren>Acme</FullNameWithChildren>"
                            "</EntityFilter>"}) +
                           (pick(2) == 0 ? element("IncludeLineItems", "true") : ""));
    }
  }

  std::mt19937 random_;
};

// Every row of every table, in key order, each value with its kind.
std::string contents(sqlite3* db) {
  std::string text;
  sqlite3_stmt* tables = nullptr;
  sqlite3_prepare_v2(db, "SELECT name FROM sqlite_schema WHERE type = 'table' ORDER BY name", -1,
                     &tables, nullptr);
  while (sqlite3_step(tables) == SQLITE_ROW) {
    const std::string table = reinterpret_cast<const char*>(sqlite3_column_text(tables, 0));
    sqlite3_stmt* rows = nullptr;
    sqlite3_prepare_v2(db, ("SELECT * FROM " + table + " ORDER BY 1, 2").c_str(), -1, &rows,
                       nullptr);
    while (sqlite3_step(rows) == SQLITE_ROW) {
      text += table;
      for (int column = 0; column < sqlite3_column_count(rows); ++column) {
        const auto* bytes = static_cast<const char*>(sqlite3_column_blob(rows, column));
        text += " " + std::to_string(sqlite3_column_type(rows, column)) + ":" +
                std::string(bytes ? bytes : "",
                            static_cast<size_t>(sqlite3_column_bytes(rows, column)));
      }
      text += "\n";
    }
    sqlite3_finalize(rows);
  }
  sqlite3_finalize(tables);
  return text;
}

// Whether any statement of the connection is still running (and so holds the file).
bool anyBusy(sqlite3* db) {
  for (sqlite3_stmt* at = sqlite3_next_stmt(db, nullptr); at; at = sqlite3_next_stmt(db, at)) {
    if (sqlite3_stmt_busy(at)) return true;
  }
  return false;
}

// The response, or the error the document was refused with.
std::string answered(CompanyFile& company, const RequestDocument& document,
                     handlers::StatementCache* kept) {
  try {
    return answerRequests(company, document, kept);
  } catch (const std::exception& error) {
    return std::string("refused: ") + error.what();
  }
}

TEST(KeptStatementsTest, AnswerAsStatementsPreparedForEachDocument) {
  test::TemporaryFolder folder;
  const test::ScopedVariable now("DROQBXML_SIMULATOR_NOW", "2009-03-02T10:40:23-05:00");
  CompanyFile::create(folder / "kept.qbw", {"Orvanne Builders", true, {}});
  CompanyFile::create(folder / "fresh.qbw", {"Orvanne Builders", true, {}});
  CompanyFile kept(folder / "kept.qbw");
  CompanyFile fresh(folder / "fresh.qbw");
  handlers::StatementCache statements(kept.db());
  int answeredDocuments = 0;
  for (unsigned seed = 1; seed <= 12; ++seed) {
    Requests requests(seed);
    for (int round = 0; round < 25; ++round) {
      const std::string text = requests.document();
      const ReadResult read = readRequest(text);
      if (!read.document) continue;
      ++answeredDocuments;
      ASSERT_EQ(answered(kept, *read.document, &statements),
                answered(fresh, *read.document, nullptr))
          << "seed " << seed << ", document:\n"
          << text;
      ASSERT_FALSE(anyBusy(kept.db())) << text;
    }
    ASSERT_EQ(contents(kept.db()), contents(fresh.db())) << "seed " << seed;
  }
  EXPECT_GT(answeredDocuments, 200);
}

}  // namespace
}  // namespace droqbxml::simulator

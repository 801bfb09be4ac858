// Statements kept between documents against statements prepared for each document: the same
// random documents of adds and queries (adds refused part way, references to nothing, values
// QuickBooks refuses, queries by name, identifier and filter), answered from two company files
// made alike, give the same responses and leave the same rows, and a kept statement never
// holds the file between documents.
#include <gtest/gtest.h>
#include <sqlite3.h>

#include <map>
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

// What each {x} of a request may become, chosen at random (and expanded again).
const std::map<char, std::vector<std::string>> kChoices{
    {'D', {"{R}", "{R}{R}", "{R}{R}{R}{R}"}},
    {'R',
     {"<CustomerAddRq><CustomerAdd><Name>{N}</Name>{P}{O}{B}{T}</CustomerAdd></CustomerAddRq>",
      "<ItemServiceAddRq><ItemServiceAdd><Name>{I}</Name><SalesOrPurchase><Price>{A}</Price>"
      "<AccountRef><FullName>{S}</FullName></AccountRef></SalesOrPurchase></ItemServiceAdd>"
      "</ItemServiceAddRq>",
      "<ItemInventoryAddRq><ItemInventoryAdd><Name>Tile</Name><SalesPrice>{A}</SalesPrice>"
      "<IncomeAccountRef><FullName>Sales</FullName></IncomeAccountRef><COGSAccountRef><FullName>"
      "Cost of Goods Sold</FullName></COGSAccountRef><AssetAccountRef><FullName>Inventory Asset"
      "</FullName></AssetAccountRef><QuantityOnHand>10</QuantityOnHand></ItemInventoryAdd>"
      "</ItemInventoryAddRq>",
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>{C}</FullName></CustomerRef>{F}{L}{L}"
      "</InvoiceAdd></InvoiceAddRq>",
      "<EstimateAddRq><EstimateAdd><CustomerRef><FullName>{C}</FullName></CustomerRef>{F}{E}{E}"
      "</EstimateAdd></EstimateAddRq>",
      "<CustomerQueryRq>{W}</CustomerQueryRq>", "<ItemQueryRq>{W}</ItemQueryRq>",
      "<InvoiceQueryRq>{X}</InvoiceQueryRq>", "<EstimateQueryRq>{X}</EstimateQueryRq>"}},
    {'N', {"Acme", "Bolt", "Kitchen", "R &amp; D", "Caf\xC3\xA9"}},
    {'C', {"Acme", "Bolt", "Acme:Kitchen", "R &amp; D", "Nobody"}},
    {'I', {"Labor", "Tile", "Promo", "Missing"}},
    {'S', {"Sales", "None"}},
    // Too many decimals is a value QuickBooks takes in and then refuses the request for.
    {'A', {"12.50", "0", "-3", "1000.25", "1.000001"}},
    {'P', {"", "<ParentRef><FullName>{C}</FullName></ParentRef>"}},
    {'O', {"", "<CompanyName>\"Quoted\" &lt;Co&gt;</CompanyName>"}},
    {'B', {"", "<OpenBalance>{A}</OpenBalance>"}},
    {'T', {"", "<SalesTaxCodeRef><FullName>{K}</FullName></SalesTaxCodeRef>"}},
    {'K', {"TAX", "NON", "OUT"}},
    {'F',
     {"", "<RefNumber>7</RefNumber>", "<RefNumber>A-9</RefNumber>",
      "<RefNumber>TooLongRefNumber</RefNumber>"}},
    {'L', {"", "<InvoiceLineAdd><ItemRef><FullName>{I}</FullName></ItemRef>{Q}</InvoiceLineAdd>"}},
    {'E', {"<EstimateLineAdd><ItemRef><FullName>{I}</FullName></ItemRef>{Q}</EstimateLineAdd>"}},
    {'Q', {"", "<Quantity>2</Quantity>", "<Quantity>1.5</Quantity><Rate>{A}</Rate>"}},
    {'W',
     {"", "<FullName>Acme</FullName><FullName>Nobody</FullName>",
      "<ListID>80000001-1236008423</ListID>", "<MaxReturned>2</MaxReturned>",
      "<ActiveStatus>All</ActiveStatus><NameFilter><MatchCriterion>StartsWith"
      "</MatchCriterion><Name>A</Name></NameFilter><IncludeRetElement>Name"
      "</IncludeRetElement>"}},
    {'X',
     {"", "<RefNumber>7</RefNumber>", "<TxnID>1-1236008423</TxnID>",
      "<EntityFilter><FullNameWithChildren>Acme</FullNameWithChildren></EntityFilter>"
      "<IncludeLineItems>true</IncludeLineItems>"}},
};

std::string expand(std::mt19937& random, const std::string& text) {
  std::string out;
  for (size_t at = 0; at < text.size(); ++at) {
    if (text[at] != '{') {
      out += text[at];
      continue;
    }
    const auto& choices = kChoices.at(text[at + 1]);
    out += expand(random, choices[random() % choices.size()]);
    at += 2;
  }
  return out;
}

// Every row of every table, each value with its kind.
std::string contents(sqlite3* db) {
  std::string text;
  for (const char* table : {"counters", "customers", "accounts", "items", "sales_tax_codes",
                            "estimates", "estimate_lines", "invoices", "invoice_lines"}) {
    sqlite3_stmt* rows = nullptr;
    sqlite3_prepare_v2(db, ("SELECT * FROM " + std::string(table) + " ORDER BY 1, 2").c_str(), -1,
                       &rows, nullptr);
    while (sqlite3_step(rows) == SQLITE_ROW) {
      for (int column = 0; column < sqlite3_column_count(rows); ++column) {
        const auto* bytes = static_cast<const char*>(sqlite3_column_blob(rows, column));
        text += std::to_string(sqlite3_column_type(rows, column)) + ":" +
                std::string(bytes ? bytes : "", sqlite3_column_bytes(rows, column)) + " ";
      }
      text += "\n";
    }
    sqlite3_finalize(rows);
  }
  return text;
}

// The response, or the error the document was refused with.
std::string answered(CompanyFile& company, const RequestDocument& document,
                     handlers::StatementCache* kept) {
  std::string response = "what a session answered before";
  try {
    if (kept == nullptr) return answerRequests(company, document);
    handlers::answerRequests(company, document, kept, response);
    return response;
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
    std::mt19937 random(seed);
    for (int round = 0; round < 25; ++round) {
      const std::string text = expand(
          random, std::string("<?xml version=\"1.0\"?>\n<?qbxml version=\"13.0\"?>\n<QBXML>\n") +
                      "<QBXMLMsgsRq onError=\"" + (round % 2 ? "stopOnError" : "continueOnError") +
                      "\">{D}</QBXMLMsgsRq>\n</QBXML>\n");
      const ReadResult read = readRequest(text);
      if (!read.document) continue;
      ++answeredDocuments;
      ASSERT_EQ(answered(kept, *read.document, &statements),
                answered(fresh, *read.document, nullptr))
          << "seed " << seed << ", document:\n"
          << text;
      for (sqlite3_stmt* at = sqlite3_next_stmt(kept.db(), nullptr); at;
           at = sqlite3_next_stmt(kept.db(), at)) {
        ASSERT_FALSE(sqlite3_stmt_busy(at)) << sqlite3_sql(at) << " still runs after\n" << text;
      }
    }
    ASSERT_EQ(contents(kept.db()), contents(fresh.db())) << "seed " << seed;
  }
  EXPECT_GT(answeredDocuments, 250);
}

}  // namespace
}  // namespace droqbxml::simulator

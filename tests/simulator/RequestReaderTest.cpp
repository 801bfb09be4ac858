// Reading and checking request documents: the qbXML 13.0 checks with their lines, paths and
// messages, the safety limits, and agreement with the validator schema (xmllint) on values,
// choices and counts that the generated requests of EveryRequestTypeTest do not have. The
// tree as read, the prolog and leaf values: testdata/calls/stand_in_reading.txt.
#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>
#include <random>
#include <regex>
#include <string>
#include <string_view>
#include <vector>

#include "simulator/RequestDocument.hpp"
#include "simulator/internal/SchemaCheck.hpp"
#include "simulator/internal/SchemaModel.hpp"
#include "tests/TestSupport.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator {
namespace {

using Lines = std::vector<std::string>;

// A document as the component's builder writes it: XML declaration, the DOCTYPE without a
// system literal, CR LF line ends, TAB indentation, no <?qbxml?> line. `requests` (LF line
// ends, each line ended) starts on line 5.
std::string builderDocument(std::string_view requests) {
  const std::string text =
      "<?xml version=\"1.0\"?>\n<!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.0//EN\" >\n"
      "<QBXML>\n\t<QBXMLMsgsRq onError=\"stopOnError\">\n" +
      std::string(requests) + "\t</QBXMLMsgsRq>\n</QBXML>";
  return std::regex_replace(text, std::regex("\n"), "\r\n");
}

// The builder's document with one entry of `lines` a line, the first on line 5.
std::string doc(const Lines& lines) {
  std::string requests;
  for (const std::string& line : lines) requests += "\t\t" + line + "\n";
  return builderDocument(requests);
}

// Every problem as "line element: message".
Lines problemsOf(const ReadResult& result) {
  Lines lines;
  for (const Problem& problem : result.problems) {
    lines.push_back(std::to_string(problem.line) + " " + problem.element + ": " + problem.message);
  }
  return lines;
}

Lines problemsOf(std::string_view document) { return problemsOf(readRequest(document)); }

TEST(RequestReaderTest, AcceptsTheBuildersGoldenRequests) {
  // Refused: rollbackOnError, which the schema lists and QuickBooks Desktop refuses; the
  // builder's invoice query with list filters that InvoiceQueryRq does not have; an unknown
  // request.
  const std::filesystem::path folder = std::filesystem::path(DROQBXML_TESTDATA_DIR) / "requests";
  Lines problems;
  for (const char* file :
       {"frame.xml", "two_requests.xml", "query_all_customer.xml", "query_listid_account.xml",
        "query_fullname_account_escaped.xml", "query_fullname_item_service.xml",
        "query_all_item_inventory.xml", "query_active_customer_all_from.xml", "frame_rollback.xml",
        "query_active_invoice_inactive_dates.xml", "query_fullname_unknown_item.xml"}) {
    for (const std::string& line : problemsOf(test::readFile(folder / file))) {
      problems.push_back(file + (": " + line));
    }
  }
  EXPECT_TRUE(test::linesMatchGolden(problems, "reader/builder_requests.txt"));
}

// Documents under tests/testdata/simulator/reader/, each with its problems in the golden file
// beside it: children out of order (checking goes on from the element out of place) and
// missing (reported on the line where the parent starts); unknown elements and stray text;
// too many elements, elements newer than the document's version (reported once for a run) and
// choices mixed; values, each message naming the value and what was expected; attributes
// missing, unknown and outside their values. Leaf values, versions, the root, onError,
// malformed XML and bytes that are not UTF-8: testdata/calls/stand_in_reading.txt.
TEST(RequestReaderTest, ReportsProblemsWithLineAndPath) {
  for (const std::string name : {"order_and_missing", "unknown_and_stray",
                                 "cardinality_and_choices", "value_formats", "attributes"}) {
    const std::string document = test::readFile(std::filesystem::path(DROQBXML_TESTDATA_DIR) /
                                                "simulator/reader" / (name + ".xml"));
    EXPECT_TRUE(test::linesMatchGolden(problemsOf(document), "reader/" + name + ".txt"));
  }
}

TEST(RequestReaderTest, RefusesDtdsAndEntitiesWithoutExpandingThem) {
  // Nine levels of ten references each: a billion "lol"s if expanded.
  std::string laughs = "<?xml version=\"1.0\"?>\n<!DOCTYPE QBXML [\n <!ENTITY lol0 \"lol\">\n";
  for (int i = 1; i <= 9; ++i) {
    std::string ten;
    for (int k = 0; k < 10; ++k) ten += "&lol" + std::to_string(i - 1) + ";";
    laughs += " <!ENTITY lol" + std::to_string(i) + " \"" + ten + "\">\n";
  }
  laughs +=
      "]>\n<QBXML><QBXMLMsgsRq onError=\"stopOnError\"><CustomerQueryRq><FullName>&lol9;"
      "</FullName></CustomerQueryRq></QBXMLMsgsRq></QBXML>";
  const auto started = std::chrono::steady_clock::now();
  const ReadResult result = readRequest(laughs);
  EXPECT_LT(std::chrono::steady_clock::now() - started, std::chrono::seconds(2));
  EXPECT_FALSE(result.document);
  EXPECT_EQ(problemsOf(result), (Lines{"2 : a DOCTYPE with an internal subset is not accepted: "
                                       "a request may not declare entities or other markup"}));
  // Empty subsets, external entities, a DOCTYPE past the prolog: stand_in_reading.txt.
}

TEST(RequestReaderTest, BoundsNestingElementCountProblemsAndSize) {
  const std::string head =
      "<?qbxml version=\"13.0\"?>\n<QBXML>\n<QBXMLMsgsRq onError=\"stopOnError\">";
  const auto nested = [&](int depth) {
    std::string text = head;
    for (int i = 2; i < depth; ++i) text += "<A>";
    for (int i = 2; i < depth; ++i) text += "</A>";
    return text + "</QBXMLMsgsRq></QBXML>";
  };
  // 200 levels parse (and are then checked); 201 are refused while parsing.
  EXPECT_EQ(problemsOf(nested(200)),
            (Lines{"3 QBXML/QBXMLMsgsRq/A: unknown element 'A' in QBXMLMsgsRq"}));
  const Lines deep = problemsOf(nested(201));
  ASSERT_EQ(deep.size(), 1u);
  EXPECT_TRUE(deep[0].ends_with("/A/A: elements nested deeper than 200 levels")) << deep[0];
  EXPECT_TRUE(deep[0].starts_with("3 QBXML/QBXMLMsgsRq/A/A/")) << deep[0];
  EXPECT_EQ(problemsOf(nested(100000)), deep);

  std::string many = head + "\n";
  for (int i = 0; i < 1'000'000; ++i) many += "<A/>";
  EXPECT_EQ(problemsOf(many + "</QBXMLMsgsRq></QBXML>"),
            (Lines{"4 QBXML/QBXMLMsgsRq/A: more than 1000000 elements in one document"}));

  // At most a hundred problems are kept, and the last says more follow.
  const Lines unknown = problemsOf(doc(Lines(150, "<Foo/>")));
  ASSERT_EQ(unknown.size(), 101u);
  EXPECT_EQ(unknown[99], "104 QBXML/QBXMLMsgsRq/Foo: unknown element 'Foo' in QBXMLMsgsRq");
  EXPECT_EQ(unknown[100],
            "105 QBXML/QBXMLMsgsRq/Foo: more problems follow; only the first 100 are listed");

  // A valid document padded past 100 MB is refused before anything is parsed.
  const std::string valid = builderDocument("");
  std::string padded = valid + "<!--";
  padded.append(100 * 1024 * 1024 - padded.size() - 3, 'x');
  padded += "-->";
  ASSERT_EQ(padded.size(), 100u * 1024 * 1024);
  EXPECT_EQ(problemsOf(padded), Lines{});
  padded.insert(valid.size() + 4, "x");
  const auto started = std::chrono::steady_clock::now();
  EXPECT_EQ(problemsOf(padded),
            (Lines{"1 : the document has 104857601 bytes; a request may have at most 104857600 "
                   "(100 MB)"}));
  EXPECT_LT(std::chrono::steady_clock::now() - started, std::chrono::milliseconds(500));
}

TEST(RequestReaderTest, SurvivesArbitraryBytes) {
  const std::string valid =
      doc({"<InvoiceAddRq requestID=\"2\">", "<InvoiceAdd>",
           "<CustomerRef><FullName>A &amp; B</FullName></CustomerRef><TxnDate>2024-01-31</TxnDate>",
           "<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><Quantity>2</Quantity>"
           "<Rate>85.00</Rate></InvoiceLineAdd>",
           "</InvoiceAdd>", "</InvoiceAddRq>"});
  ASSERT_EQ(problemsOf(valid), Lines{});
  std::mt19937 random(20240229);
  for (int round = 0; round < 400; ++round) {
    std::string text = valid;
    for (int edits = 1 + static_cast<int>(random() % 4); edits > 0; --edits) {
      const std::size_t at = random() % text.size();
      const unsigned kind = random() % 3;
      if (kind == 0) text[at] = static_cast<char>(random() % 256);
      if (kind == 1) text.erase(at, 1 + random() % 8);
      if (kind == 2) text.insert(at, 1, "<>&;/\"'="[random() % 8]);
    }
    const ReadResult result = readRequest(text);
    EXPECT_EQ(result.document.has_value(), result.problems.empty());
    for (const Problem& problem : result.problems) {
      EXPECT_GE(problem.line, 1);
      EXPECT_FALSE(problem.message.empty());
    }
  }
}

TEST(RequestReaderTest, AutomataAgreeOnWhereContentMayEnd) {
  const auto all = internal::aggregates();
  ASSERT_FALSE(all.empty());
  for (std::size_t i = 0; i < all.size(); ++i) {
    const internal::ContentAutomaton& automaton = internal::automatonOf(static_cast<int>(i));
    EXPECT_EQ(automaton.acceptsEmpty, automaton.missingAtStart.empty()) << all[i].name;
    for (std::size_t p = 0; p < automaton.positions.size(); ++p) {
      EXPECT_EQ(automaton.accepting[p], automaton.missingAfter[p].empty())
          << all[i].name << " after " << automaton.nameAt(static_cast<int>(p));
    }
    if (i > 0) {
      EXPECT_LT(all[i - 1].name, all[i].name);
    }
    EXPECT_EQ(internal::findAggregate(all[i].name), static_cast<int>(i));
  }
  EXPECT_EQ(internal::findAggregate("NoSuchAggregate"), -1);
  EXPECT_TRUE(schemaChildOrder("NoSuchAggregate").empty());
}

// Agreement with the validator schema on the documents of tests/testdata/simulator/
// schema-samples/, on values, choices and counts that EveryRequestTypeTest's generated
// requests do not have. Accepted requests are grouped in a few documents; each refused one
// stands alone, so that one refusal cannot hide another.
TEST(RequestReaderTest, AgreesWithTheValidatorSchemaOnSamples) {
  const std::pair<std::string, bool> samples[] = {
      {"lists", true},
      {"items", true},
      // An invoice, unlike an estimate, may have no lines.
      {"transactions", true},
      {"two_names", false},
      {"bad_date", false},
      {"bad_guid", false},
      {"contact_ref_as_list_ref", false},
      {"mixed_choice", false},
      {"max_zero", false},
      {"long_listid", false},
      {"bad_iterator", false},
      {"blank_status", false},
      {"both_choices", false},
      {"estimate_no_lines", false},
      {"both_dates", false},
      {"time_in_date", false},
      {"unknown_attribute", false},
      {"leaf_with_attribute", false},
      // Amounts with one decimal reach the request, answered there with status 3040: the
      // document is read, and the problem reported.
      {"one_decimal", false}};
  const auto folder = std::filesystem::path(DROQBXML_TESTDATA_DIR) / "simulator/schema-samples";
  std::vector<std::filesystem::path> files;
  for (const auto& [name, valid] : samples) files.push_back(folder / (name + ".xml"));
  const test::TemporaryFolder scratch;
  const auto verdicts = test::xmllintVerdicts(files, scratch.root());
  if (!verdicts) GTEST_SKIP() << "xmllint or the validator schema is not available";
  for (const auto& [name, valid] : samples) {
    const ReadResult result = readRequest(test::readFile(folder / (name + ".xml")));
    EXPECT_EQ(result.problems.empty(), valid)
        << name << (result.problems.empty() ? "" : ": " + problemsOf(result)[0]);
    EXPECT_EQ(verdicts->at(name), valid) << name;
  }
}

}  // namespace
}  // namespace droqbxml::simulator

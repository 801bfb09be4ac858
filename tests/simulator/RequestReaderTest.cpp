// Reading and checking request documents: the hand-read prolog, Expat's tree, the qbXML 13.0
// checks with their lines, paths and messages, the safety limits, and agreement with the
// validator schema (xmllint) on values, choices and counts that the generated requests of
// EveryRequestTypeTest do not have.
#include <gtest/gtest.h>

#include <cctype>
#include <chrono>
#include <filesystem>
#include <optional>
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

using internal::ValueType;
using Lines = std::vector<std::string>;

// A document as the component's builder writes it: XML declaration, the DOCTYPE without a
// system literal, CR LF line ends, TAB indentation, no <?qbxml?> line. `requests` (LF line
// ends, each line ended) starts on line 5.
std::string builderDocument(std::string_view requests, std::string_view onError = "stopOnError") {
  const std::string text =
      "<?xml version=\"1.0\"?>\n<!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.0//EN\" >\n"
      "<QBXML>\n\t<QBXMLMsgsRq onError=\"" +
      std::string(onError) + "\">\n" + std::string(requests) + "\t</QBXMLMsgsRq>\n</QBXML>";
  return std::regex_replace(text, std::regex("\n"), "\r\n");
}

// The builder's document with one entry of `lines` a line, the first on line 5.
std::string doc(const Lines& lines, std::string_view onError = "stopOnError") {
  std::string requests;
  for (const std::string& line : lines) requests += "\t\t" + line + "\n";
  return builderDocument(requests, onError);
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

TEST(RequestReaderTest, AcceptsDocumentsAsTheBuilderWritesThem) {
  const ReadResult result = readRequest(doc(
      {"<CustomerAddRq requestID=\"2\">", "<CustomerAdd>",
       "<Name>Tom&apos;s &quot;A&amp;B&quot; &lt;1&gt;&#9;caf&#233; \xC5\x81\xC3\xB3\x64\xC5\xBA "
       "\xE2\x98\x83 \xF0\x9F\x98\x80 &#8364;&#x1F600;</Name>",
       "<IsActive>true</IsActive><BillAddress><Addr1>1 Main St</Addr1>",
       "<City>Springfield</City></BillAddress>", "</CustomerAdd></CustomerAddRq>",
       "<CustomerQueryRq requestID=\"3\" />"}));
  ASSERT_EQ(problemsOf(result), Lines{});
  EXPECT_EQ(result.document->qbxmlVersion, "1.0");
  const XmlNode& root = result.document->root;
  EXPECT_EQ(root.name, "QBXML");
  EXPECT_EQ(root.line, 3);
  const XmlNode& messages = *root.child("QBXMLMsgsRq");
  EXPECT_EQ(messages.attribute("onError"), "stopOnError");
  EXPECT_EQ(messages.attribute("responseData"), std::nullopt);
  ASSERT_EQ(messages.children.size(), 2u);
  EXPECT_EQ(messages.children[0].attribute("requestID"), "2");
  const XmlNode& customer = *messages.children[0].child("CustomerAdd");
  // Characters outside Latin-1 stay as they are, written or referenced.
  EXPECT_EQ(customer.child("Name")->text,
            "Tom's \"A&B\" <1>\tcaf\xC3\xA9 \xC5\x81\xC3\xB3\x64\xC5\xBA \xE2\x98\x83 "
            "\xF0\x9F\x98\x80 \xE2\x82\xAC\xF0\x9F\x98\x80");
  EXPECT_EQ(customer.child("Name")->line, 7);
  EXPECT_EQ(customer.child("BillAddress")->child("City")->line, 9);
  EXPECT_EQ(customer.child("Phone"), nullptr);
  EXPECT_EQ(messages.childrenNamed("CustomerQueryRq").size(), 1u);
  EXPECT_EQ(messages.children[1].line, 11);

  // <?qbxml version?> with LF line ends and no DOCTYPE; the version instruction wins over
  // the DOCTYPE; a DOCTYPE with a system literal, a comment and a byte order mark are fine;
  // the DOCTYPE may name version 1.1.
  const struct {
    const char* document;
    const char* version;
  } versions[] = {
      {"<?xml version=\"1.0\" encoding=\"utf-8\"?>\n<?qbxml version=\"13.0\"?>\n<QBXML>\n"
       "<QBXMLMsgsRq onError=\"continueOnError\">\n<AccountQueryRq>\n<FullName>Bank</FullName>\n"
       "</AccountQueryRq>\n</QBXMLMsgsRq>\n</QBXML>\n",
       "13.0"},
      {"\xEF\xBB\xBF<?xml version=\"1.0\"?>\n<!-- sent by a host -->\n<!DOCTYPE QBXML PUBLIC "
       "\"-//INTUIT//DTD QBXML QBD 1.1//EN\" \"http://x/qbxml.dtd\">\n<?qbxml version='8.0'?>\n"
       "<QBXML><QBXMLMsgsRq onError=\"stopOnError\"/></QBXML>",
       "8.0"},
      {"<!DOCTYPE QBXML PUBLIC '-//INTUIT//DTD QBXML QBD 1.1//EN'><QBXML><QBXMLMsgsRq "
       "onError=\"stopOnError\"/></QBXML>",
       "1.1"},
  };
  for (const auto& v : versions) {
    const ReadResult read = readRequest(v.document);
    ASSERT_EQ(problemsOf(read), Lines{}) << v.version;
    EXPECT_EQ(read.document->qbxmlVersion, v.version);
  }
  const ReadResult lf = readRequest(versions[0].document);
  EXPECT_EQ(lf.document->root.child("QBXMLMsgsRq")->children[0].child("FullName")->line, 6);
}

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
// missing, unknown and outside their values.
TEST(RequestReaderTest, ReportsProblemsWithLineAndPath) {
  for (const std::string name : {"order_and_missing", "unknown_and_stray",
                                 "cardinality_and_choices", "value_formats", "attributes"}) {
    const std::string document = test::readFile(std::filesystem::path(DROQBXML_TESTDATA_DIR) /
                                                "simulator/reader" / (name + ".xml"));
    EXPECT_TRUE(test::linesMatchGolden(problemsOf(document), "reader/" + name + ".txt"));
  }
  EXPECT_EQ(problemsOf("<?qbxml version=\"13.0\"?>\n<QBXML/>"),
            (Lines{"2 QBXML: QuickBooks Desktop refuses a QBXML without QBXMLMsgsRq: it has no "
                   "request to answer"}));
  EXPECT_EQ(problemsOf("<?qbxml version=\"13.0\"?>\n<QBXMLMsgsRq onError=\"stopOnError\"/>"),
            (Lines{"2 QBXMLMsgsRq: expected root element QBXML; found: QBXMLMsgsRq"}));
}

TEST(RequestReaderTest, ChecksTheDeclaredVersion) {
  const auto customer = [](std::string_view version) {
    return "<?qbxml version=\"" + std::string(version) +
           "\"?>\n<QBXML><QBXMLMsgsRq onError=\"stopOnError\"><CustomerAddRq><CustomerAdd>"
           "<Name>A</Name><ClassRef><FullName>B</FullName></ClassRef></CustomerAdd>"
           "</CustomerAddRq></QBXMLMsgsRq></QBXML>";
  };
  EXPECT_EQ(problemsOf(customer("12.0")), Lines{});
  EXPECT_EQ(problemsOf(customer("2.0")),
            (Lines{"2 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/ClassRef: 'ClassRef' in "
                   "CustomerAdd came with qbXML 12.0; this document is qbXML 2.0"}));
  for (const char* unknown : {"14.0", "6.1", "3.5"}) {
    EXPECT_EQ(problemsOf(customer(unknown)),
              (Lines{"1 : qbXML version '" + std::string(unknown) +
                     "' is not one QuickBooks Desktop knows (1.0, 1.1, 2.0, 2.1, 3.0, 4.0, 4.1, "
                     "5.0 and every N.0 up to 13.0)"}));
  }
}

TEST(RequestReaderTest, ChecksLeafValueFormats) {
  const struct {
    ValueType type;
    Lines accepted;
    Lines refused;
  } cases[] = {
      {ValueType::kBool, {"true", "0", " false\n", ""}, {"True", "yes", "2"}},
      {ValueType::kDate,
       {"2024-02-29", "2000-02-29", " 2024-12-31 ", ""},
       {"2023-02-29", "1900-02-29", "2024-04-31", "2024-13-01", "0000-01-01", "2024-1-5",
        "2024-01-01T10:00:00", "01/02/2024"}},
      {ValueType::kDateTime,
       {"2024-03-02", "2009-03-02T10:40:23", "2009-03-02T10:40:23-05:00",
        "2009-03-02T23:59:59+14:00", ""},
       {"2009-03-02T24:00:00", "2009-03-02T10:40", "2009-03-02 10:40:23", "2009-03-02T10:40:23Z",
        "2009-02-30T10:40:23", "2009-03-02T10:40:23-0500"}},
      {ValueType::kInt, {"42", " -7 ", "+0", "99999999999999999999"}, {"", "1.5", "1e3", "-"}},
      {ValueType::kAmt,
       {"246.90", "246.9", "-0.123456", "12.", ""},
       {"abc", "1,000.00", " 12.00", "."}},
      {ValueType::kPrice, {"85.123456"}, {"1e5"}},
      {ValueType::kQuan, {"2.5"}, {"two"}},
      {ValueType::kPercent, {"-7.5"}, {"7.5%"}},
      {ValueType::kFloat, {" 1.25 ", ""}, {"1.2.3"}},
      {ValueType::kGuid,
       {"{12345678-9ABC-def0-1234-56789abcdef0}", "0"},
       {"12345678-9ABC-def0-1234-56789abcdef0", "{12345678-9ABC-def0-1234-56789abcdefg}", ""}},
      // Thirty-six characters, not bytes.
      {ValueType::kId,
       {"80000001-1234567890", std::string(36, '1'),
        "\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9"
        "\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9"},
       {std::string(37, '1')}},
      {ValueType::kStr, {"any text at all: STRTYPE lengths are QuickBooks' business"}, {}},
  };
  for (const auto& c : cases) {
    for (const std::string& text : c.accepted) {
      EXPECT_EQ(internal::valueProblem(c.type, text), std::nullopt)
          << static_cast<int>(c.type) << " '" << text << "'";
    }
    for (const std::string& text : c.refused) {
      EXPECT_NE(internal::valueProblem(c.type, text), std::nullopt)
          << static_cast<int>(c.type) << " '" << text << "'";
    }
  }
  EXPECT_EQ(internal::valueProblem(ValueType::kId, std::string(37, 'x')),
            "'" + std::string(37, 'x') + "' is longer than the 36 characters of an IDTYPE value");
}

TEST(RequestReaderTest, GivesEmptyLeavesTheirSchemaDefault) {
  const ReadResult result = readRequest(
      doc({"<InvoiceQueryRq><PaidStatus/></InvoiceQueryRq>",
           "<CustomerQueryRq><ActiveStatus></ActiveStatus></CustomerQueryRq>",
           "<CustomerAddRq><CustomerAdd><Name>A</Name><IsActive/><JobStatus/></CustomerAdd>"
           "</CustomerAddRq>"}));
  ASSERT_EQ(problemsOf(result), Lines{});
  const XmlNode& messages = *result.document->root.child("QBXMLMsgsRq");
  EXPECT_EQ(messages.children[0].child("PaidStatus")->text, "All");
  EXPECT_EQ(messages.children[1].child("ActiveStatus")->text, "ActiveOnly");
  EXPECT_EQ(messages.children[2].child("CustomerAdd")->child("JobStatus")->text, "None");
  EXPECT_EQ(messages.children[2].child("CustomerAdd")->child("IsActive")->text, "");
  // Only an empty element takes the default; blanks are a value, and not an enum value.
  EXPECT_EQ(problemsOf(doc({"<CustomerQueryRq><ActiveStatus> </ActiveStatus></CustomerQueryRq>"})),
            (Lines{"5 QBXML/QBXMLMsgsRq/CustomerQueryRq/ActiveStatus: ' ' is not one of: "
                   "ActiveOnly, InactiveOnly, All"}));
}

TEST(RequestReaderTest, ChecksAttributes) {
  for (const char* onError : {"stopOnError", "continueOnError"}) {
    EXPECT_EQ(problemsOf(builderDocument("", onError)), Lines{}) << onError;
  }
  EXPECT_EQ(problemsOf(builderDocument("", "StopOnError")),
            (Lines{"4 QBXML/QBXMLMsgsRq: 'StopOnError' is not a value of attribute 'onError' "
                   "(continueOnError, rollbackOnError, stopOnError)"}));
}

TEST(RequestReaderTest, ReportsMalformedXmlWithTheOpenElements) {
  const struct {
    std::string document;
    const char* problem;
  } cases[] = {
      {doc({"<CustomerAddRq><CustomerAdd>", "<Name>A</Nme>", "</CustomerAdd></CustomerAddRq>"}),
       "6 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/Name: not well-formed XML: mismatched tag"},
      {doc({"<CustomerQueryRq><FullName>&nbsp;</FullName></CustomerQueryRq>"}),
       "5 QBXML/QBXMLMsgsRq/CustomerQueryRq/FullName: not well-formed XML: undefined entity"},
      {builderDocument("") + "\r\n<QBXML/>",
       "7 : not well-formed XML: junk after document element"},
      {"<?qbxml version=\"13.0\"?>\n", "2 : not well-formed XML: no element found"},
      {"", "1 : not well-formed XML: no element found"},
      {"\n<?xml version=\"1.0\"?><QBXML/>",
       "2 : not well-formed XML: XML or text declaration not at start of entity"},
      {"<QBXML><QBXMLMsgsRq onError=\"stopOnError\"/></QBXML>",
       "1 : no qbXML version: a request starts with <?qbxml version=\"N.N\"?> or the QBXML "
       "DOCTYPE"},
      {"<?qbxml version=\"thirteen\"?><QBXML><QBXMLMsgsRq onError=\"stopOnError\"/></QBXML>",
       "1 : qbXML version 'thirteen' is not of the form N.N"},
      {"<!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.0//EN\"\n<QBXML/>",
       "1 : malformed DOCTYPE: expected <!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD "
       "1.0//EN\" >"},
      {"<?qbxml version=\"13.0\"?>\n<!DOCTYPE QBXML>\n<!DOCTYPE QBXML>\n<QBXML/>",
       "3 : more than one DOCTYPE"},
  };
  for (const auto& c : cases) EXPECT_EQ(problemsOf(c.document), Lines{c.problem}) << c.document;
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
  const Lines refused{
      "2 : a DOCTYPE with an internal subset is not accepted: a request may not "
      "declare entities or other markup"};
  EXPECT_EQ(problemsOf(result), refused);
  // Any internal subset, also an empty one or one after a public identifier.
  EXPECT_EQ(problemsOf("<?xml version=\"1.0\"?>\n<!DOCTYPE QBXML PUBLIC \"x\" \"y\" []><QBXML/>"),
            refused);
  // An external entity is never loaded: the reference stays undefined.
  EXPECT_EQ(problemsOf("<?qbxml version=\"13.0\"?>\n<!DOCTYPE QBXML SYSTEM \"file:///etc/passwd\">"
                       "\n<QBXML><QBXMLMsgsRq onError=\"stopOnError\"><CustomerQueryRq><FullName>"
                       "&xxe;</FullName></CustomerQueryRq></QBXMLMsgsRq></QBXML>"),
            (Lines{"3 QBXML/QBXMLMsgsRq/CustomerQueryRq/FullName: not well-formed XML: undefined "
                   "entity"}));
  // A DOCTYPE that the prolog does not reach is refused by the parser.
  EXPECT_EQ(problemsOf("<?qbxml version=\"13.0\"?>\n<QBXML>\n<!DOCTYPE QBXML [<!ENTITY a \"b\">]>"
                       "</QBXML>"),
            (Lines{"3 QBXML: not well-formed XML: invalid token"}));
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

TEST(RequestReaderTest, ReportsBytesThatAreNotUtf8) {
  const auto withName = [](std::string_view name) {
    return doc({"<CustomerQueryRq>", "<FullName>" + std::string(name) + "</FullName>",
                "</CustomerQueryRq>"});
  };
  const std::string at = "6 QBXML/QBXMLMsgsRq/CustomerQueryRq/FullName: ";
  EXPECT_EQ(problemsOf(withName("caf\xE9")), Lines{at + "text is not valid UTF-8 (byte 0xE9)"});
  for (const char* bad :
       {"\xC0\xAF", "\xED\xA0\x80", "\xF4\x90\x80\x80", "\xE2\x82", "\x80", "\xFF"}) {
    const ReadResult result = readRequest(withName(bad));
    EXPECT_FALSE(result.document) << bad;
    ASSERT_EQ(result.problems.size(), 1u);
    EXPECT_TRUE(result.problems[0].message.starts_with("text is not valid UTF-8")) << bad;
  }
  // In the prolog, and characters that are UTF-8 but not allowed in XML.
  EXPECT_EQ(problemsOf("<!DOCTYPE QBXML PUBLIC \"\xFF\">"),
            (Lines{"1 : text is not valid UTF-8 (byte 0xFF)"}));
  for (const std::string& bad : {std::string("a\x01"), std::string("a\0b", 3)}) {
    EXPECT_EQ(problemsOf(withName(bad)), Lines{at + "not well-formed XML: invalid token"});
  }
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

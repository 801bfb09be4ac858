// Reading and checking request documents: the hand-read prolog, Expat's tree, the qbXML 13.0
// checks with their lines, paths and messages, the safety limits, schemaChildOrder, and
// agreement with the validator schema (xmllint) on a sample of requests.
#include <gtest/gtest.h>
#include <unistd.h>

#include <cctype>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <optional>
#include <random>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

#include "simulator/RequestDocument.hpp"
#include "simulator/internal/SchemaCheck.hpp"
#include "simulator/internal/SchemaModel.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml::simulator {
namespace {

using internal::ValueType;

const std::filesystem::path kShared = DROQBXML_SHARED_DIR;

std::string withCrLf(std::string_view text) {
  std::string result;
  for (char c : text) {
    if (c == '\n') result += '\r';
    result += c;
  }
  return result;
}

// A document as the component's builder writes it: XML declaration, the DOCTYPE without a
// system literal, CR LF line ends, TAB indentation, no <?qbxml?> line. `requests` (LF line
// ends, each line ended) starts on line 5.
std::string builderDocument(std::string_view requests, std::string_view onError = "stopOnError") {
  return withCrLf(
      "<?xml version=\"1.0\"?>\n"
      "<!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.0//EN\" >\n"
      "<QBXML>\n"
      "\t<QBXMLMsgsRq onError=\"" +
      std::string(onError) + "\">\n" + std::string(requests) +
      "\t</QBXMLMsgsRq>\n"
      "</QBXML>");
}

// Every problem as "line element: message".
std::vector<std::string> problemsOf(const ReadResult& result) {
  std::vector<std::string> lines;
  for (const Problem& problem : result.problems) {
    lines.push_back(std::to_string(problem.line) + " " + problem.element + ": " + problem.message);
  }
  return lines;
}

std::vector<std::string> problemsOf(std::string_view document) {
  return problemsOf(readRequest(document));
}

using Lines = std::vector<std::string>;

TEST(RequestReaderTest, AcceptsDocumentsAsTheBuilderWritesThem) {
  const ReadResult result = readRequest(
      builderDocument("\t\t<CustomerAddRq requestID=\"2\">\n"
                      "\t\t\t<CustomerAdd>\n"
                      "\t\t\t\t<Name>Tom&apos;s &quot;A&amp;B&quot; &lt;1&gt;&#9;caf&#233;</Name>\n"
                      "\t\t\t\t<IsActive>true</IsActive>\n"
                      "\t\t\t\t<BillAddress>\n"
                      "\t\t\t\t\t<Addr1>1 Main St</Addr1>\n"
                      "\t\t\t\t\t<City>Springfield</City>\n"
                      "\t\t\t\t</BillAddress>\n"
                      "\t\t\t\t<OpenBalance>246.90</OpenBalance>\n"
                      "\t\t\t\t<OpenBalanceDate>2024-02-29</OpenBalanceDate>\n"
                      "\t\t\t</CustomerAdd>\n"
                      "\t\t</CustomerAddRq>\n"
                      "\t\t<CustomerQueryRq requestID=\"3\" />\n"));
  ASSERT_EQ(problemsOf(result), Lines{});
  ASSERT_TRUE(result.document);
  EXPECT_EQ(result.document->qbxmlVersion, "1.0");
  const XmlNode& root = result.document->root;
  EXPECT_EQ(root.name, "QBXML");
  EXPECT_EQ(root.line, 3);
  const XmlNode* messages = root.child("QBXMLMsgsRq");
  ASSERT_NE(messages, nullptr);
  EXPECT_EQ(messages->attribute("onError"), "stopOnError");
  EXPECT_EQ(messages->attribute("responseData"), std::nullopt);
  ASSERT_EQ(messages->children.size(), 2u);
  const XmlNode& add = messages->children[0];
  EXPECT_EQ(add.attribute("requestID"), "2");
  const XmlNode* customer = add.child("CustomerAdd");
  ASSERT_NE(customer, nullptr);
  const XmlNode* name = customer->child("Name");
  ASSERT_NE(name, nullptr);
  EXPECT_EQ(name->text, "Tom's \"A&B\" <1>\tcaf\xC3\xA9");
  EXPECT_EQ(name->line, 7);
  EXPECT_EQ(customer->child("BillAddress")->child("City")->line, 11);
  EXPECT_EQ(customer->child("Phone"), nullptr);
  EXPECT_EQ(messages->childrenNamed("CustomerQueryRq").size(), 1u);
  EXPECT_EQ(messages->children[1].line, 17);

  // The same with <?qbxml version?>, LF line ends and no DOCTYPE.
  const ReadResult versioned = readRequest(
      "<?xml version=\"1.0\" encoding=\"utf-8\"?>\n<?qbxml version=\"13.0\"?>\n<QBXML>\n"
      "<QBXMLMsgsRq onError=\"continueOnError\">\n<AccountQueryRq>\n"
      "<FullName>Bank</FullName>\n</AccountQueryRq>\n</QBXMLMsgsRq>\n</QBXML>\n");
  ASSERT_EQ(problemsOf(versioned), Lines{});
  EXPECT_EQ(versioned.document->qbxmlVersion, "13.0");
  EXPECT_EQ(versioned.document->root.child("QBXMLMsgsRq")->children[0].child("FullName")->line, 6);

  // The version instruction wins over the DOCTYPE; a DOCTYPE with a system literal, a
  // comment and a byte order mark are fine; the DOCTYPE may name version 1.1.
  const ReadResult both = readRequest(
      "\xEF\xBB\xBF<?xml version=\"1.0\"?>\n<!-- sent by a host -->\n"
      "<!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.1//EN\" \"http://x/qbxml.dtd\">\n"
      "<?qbxml version='8.0'?>\n<QBXML><QBXMLMsgsRq onError=\"stopOnError\"/></QBXML>");
  ASSERT_EQ(problemsOf(both), Lines{});
  EXPECT_EQ(both.document->qbxmlVersion, "8.0");
  const ReadResult old = readRequest(
      "<!DOCTYPE QBXML PUBLIC '-//INTUIT//DTD QBXML QBD 1.1//EN'>"
      "<QBXML><QBXMLMsgsRq onError=\"stopOnError\"/></QBXML>");
  ASSERT_EQ(problemsOf(old), Lines{});
  EXPECT_EQ(old.document->qbxmlVersion, "1.1");
}

TEST(RequestReaderTest, AcceptsTheBuildersGoldenRequests) {
  const std::filesystem::path folder = std::filesystem::path(DROQBXML_TESTDATA_DIR) / "requests";
  for (const char* file : {"frame.xml", "frame_rollback.xml", "two_requests.xml",
                           "query_all_customer.xml", "query_listid_account.xml",
                           "query_fullname_account_escaped.xml", "query_fullname_item_service.xml",
                           "query_all_item_inventory.xml", "query_active_customer_all_from.xml"}) {
    const ReadResult result = readRequest(test::readFile(folder / file));
    EXPECT_EQ(problemsOf(result), Lines{}) << file;
    EXPECT_TRUE(result.document) << file;
  }
  // The builder's invoice query carries list filters that InvoiceQueryRq does not have.
  EXPECT_EQ(problemsOf(test::readFile(folder / "query_active_invoice_inactive_dates.xml")),
            (Lines{"6 QBXML/QBXMLMsgsRq/InvoiceQueryRq/ActiveStatus: unknown element "
                   "'ActiveStatus' in InvoiceQueryRq",
                   "7 QBXML/QBXMLMsgsRq/InvoiceQueryRq/FromModifiedDate: unknown element "
                   "'FromModifiedDate' in InvoiceQueryRq",
                   "8 QBXML/QBXMLMsgsRq/InvoiceQueryRq/ToModifiedDate: unknown element "
                   "'ToModifiedDate' in InvoiceQueryRq"}));
  EXPECT_EQ(problemsOf(test::readFile(folder / "query_fullname_unknown_item.xml")),
            (Lines{"5 QBXML/QBXMLMsgsRq/UnknownItemSentByDRO: unknown element "
                   "'UnknownItemSentByDRO' in QBXMLMsgsRq"}));
}

TEST(RequestReaderTest, ReportsOrderAndMissingChildrenWithLineAndPath) {
  EXPECT_EQ(problemsOf(builderDocument("\t\t<CustomerAddRq>\n"
                                       "\t\t\t<CustomerAdd>\n"
                                       "\t\t\t\t<CompanyName>Acme</CompanyName>\n"
                                       "\t\t\t\t<Name>Acme</Name>\n"
                                       "\t\t\t</CustomerAdd>\n"
                                       "\t\t</CustomerAddRq>\n")),
            (Lines{"7 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/CompanyName: expected one "
                   "of: Name; found: CompanyName",
                   "8 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/Name: expected one of: "
                   "Salutation, FirstName, MiddleName, LastName, Suffix, JobTitle, BillAddress, "
                   "ShipAddress, ShipToAddress, PrintAs, Phone, Mobile and 37 more; found: "
                   "Name, which belongs before CompanyName"}));
  // After an element out of place, checking goes on from that element.
  EXPECT_EQ(problemsOf(builderDocument("\t\t<CustomerAddRq>\n"
                                       "\t\t\t<CustomerAdd>\n"
                                       "\t\t\t\t<Name>Acme</Name>\n"
                                       "\t\t\t\t<Phone>1</Phone>\n"
                                       "\t\t\t\t<CompanyName>Acme</CompanyName>\n"
                                       "\t\t\t\t<FirstName>Al</FirstName>\n"
                                       "\t\t\t</CustomerAdd>\n"
                                       "\t\t</CustomerAddRq>\n")),
            (Lines{"9 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/CompanyName: expected one "
                   "of: Mobile, Pager, AltPhone, Fax, Email, Cc, Contact, AltContact, "
                   "AdditionalContactRef, Contacts, CustomerTypeRef, TermsRef and 26 more; "
                   "found: CompanyName, which belongs before Phone"}));
  EXPECT_EQ(problemsOf(builderDocument("\t\t<EstimateAddRq>\n"
                                       "\t\t\t<EstimateAdd>\n"
                                       "\t\t\t\t<TxnDate>2024-03-01</TxnDate>\n"
                                       "\t\t\t\t<EstimateLineAdd/>\n"
                                       "\t\t\t</EstimateAdd>\n"
                                       "\t\t</EstimateAddRq>\n"
                                       "\t\t<EstimateAddRq>\n"
                                       "\t\t\t<EstimateAdd>\n"
                                       "\t\t\t\t<CustomerRef><FullName>A</FullName></CustomerRef>\n"
                                       "\t\t\t</EstimateAdd>\n"
                                       "\t\t</EstimateAddRq>\n"
                                       "\t\t<EstimateAddRq/>\n"
                                       "\t\t<EstimateAddRq><EstimateAdd/></EstimateAddRq>\n")),
            (Lines{"7 QBXML/QBXMLMsgsRq/EstimateAddRq/EstimateAdd/TxnDate: expected one of: "
                   "CustomerRef; found: TxnDate",
                   "12 QBXML/QBXMLMsgsRq/EstimateAddRq/EstimateAdd: missing required element "
                   "'EstimateLineAdd' or 'EstimateLineGroupAdd' in EstimateAdd",
                   "16 QBXML/QBXMLMsgsRq/EstimateAddRq: missing required element 'EstimateAdd' "
                   "in EstimateAddRq",
                   "17 QBXML/QBXMLMsgsRq/EstimateAddRq/EstimateAdd: missing required element "
                   "'CustomerRef' in EstimateAdd"}));
  // A required element missing between present ones, and an empty envelope.
  EXPECT_EQ(problemsOf(builderDocument("\t\t<AccountAddRq>\n"
                                       "\t\t\t<AccountAdd>\n"
                                       "\t\t\t\t<Name>Sales</Name>\n"
                                       "\t\t\t\t<AccountNumber>4000</AccountNumber>\n"
                                       "\t\t\t</AccountAdd>\n"
                                       "\t\t</AccountAddRq>\n")),
            (Lines{"8 QBXML/QBXMLMsgsRq/AccountAddRq/AccountAdd/AccountNumber: expected one of: "
                   "IsActive, ParentRef, AccountType; found: AccountNumber"}));
  EXPECT_EQ(problemsOf("<?qbxml version=\"13.0\"?>\n<QBXML/>"),
            (Lines{"2 QBXML: missing required element 'QBXMLMsgsRq' in QBXML"}));
  EXPECT_EQ(problemsOf("<?qbxml version=\"13.0\"?>\n<QBXMLMsgsRq onError=\"stopOnError\"/>"),
            (Lines{"2 QBXMLMsgsRq: expected root element QBXML; found: QBXMLMsgsRq"}));
}

TEST(RequestReaderTest, ReportsUnknownElementsUnsupportedRequestsAndStrayText) {
  EXPECT_EQ(problemsOf(builderDocument("\t\t<VendorQueryRq requestID=\"2\"/>\n"
                                       "\t\t<CustomerAddRq>\n"
                                       "\t\t\t<CustomerAdd>\n"
                                       "\t\t\t\t<Name>A<Foo/></Name>\n"
                                       "\t\t\t\t<Foo>1</Foo>\n"
                                       "\t\t\t\tloose text\n"
                                       "\t\t\t</CustomerAdd>\n"
                                       "\t\t</CustomerAddRq>\n")),
            (Lines{"5 QBXML/QBXMLMsgsRq/VendorQueryRq: unsupported request 'VendorQueryRq'",
                   "7 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd: unexpected text 'loose text' "
                   "in CustomerAdd",
                   "8 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/Name/Foo: unexpected element "
                   "'Foo' in Name, which holds a value, not other elements",
                   "9 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/Foo: unknown element 'Foo' in "
                   "CustomerAdd"}));
}

TEST(RequestReaderTest, ReportsCardinalityAndChoices) {
  std::string contacts;
  for (int i = 0; i < 9; ++i) {
    contacts +=
        "\t\t\t\t<AdditionalContactRef><ContactName>Main</ContactName>"
        "<ContactValue>1</ContactValue></AdditionalContactRef>\n";
  }
  EXPECT_EQ(problemsOf(builderDocument("\t\t<CustomerAddRq>\n"
                                       "\t\t\t<CustomerAdd>\n"
                                       "\t\t\t\t<Name>A</Name>\n"
                                       "\t\t\t\t<Name>B</Name>\n" +
                                       contacts +
                                       "\t\t\t</CustomerAdd>\n"
                                       "\t\t</CustomerAddRq>\n")),
            (Lines{"8 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/Name: too many 'Name' "
                   "elements in CustomerAdd (at most 1)",
                   "17 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/AdditionalContactRef: too "
                   "many 'AdditionalContactRef' elements in CustomerAdd (at most 8)"}));
  EXPECT_EQ(problemsOf(builderDocument(
                "\t\t<InvoiceAddRq>\n"
                "\t\t\t<InvoiceAdd>\n"
                "\t\t\t\t<CustomerRef><ListID>80000001-1</ListID></CustomerRef>\n"
                "\t\t\t\t<InvoiceLineAdd>\n"
                "\t\t\t\t\t<Rate>10.00</Rate>\n"
                "\t\t\t\t\t<RatePercent>5</RatePercent>\n"
                "\t\t\t\t</InvoiceLineAdd>\n"
                "\t\t\t\t<InvoiceLineAdd/>\n"
                "\t\t\t\t<InvoiceLineGroupAdd><ItemGroupRef><FullName>G</FullName>"
                "</ItemGroupRef></InvoiceLineGroupAdd>\n"
                "\t\t\t\t<InvoiceLineAdd/>\n"
                "\t\t\t</InvoiceAdd>\n"
                "\t\t</InvoiceAddRq>\n"
                "\t\t<CustomerQueryRq>\n"
                "\t\t\t<ListID>1</ListID>\n"
                "\t\t\t<ListID>2</ListID>\n"
                "\t\t\t<ActiveStatus>All</ActiveStatus>\n"
                "\t\t\t<ListID>3</ListID>\n"
                "\t\t</CustomerQueryRq>\n"
                "\t\t<ItemServiceAddRq>\n"
                "\t\t\t<ItemServiceAdd><Name>Labor</Name></ItemServiceAdd>\n"
                "\t\t</ItemServiceAddRq>\n"
                "\t\t<ItemSalesTaxGroupAddRq>\n"
                "\t\t\t<ItemSalesTaxGroupAdd><Name>T</Name></ItemSalesTaxGroupAdd>\n"
                "\t\t</ItemSalesTaxGroupAddRq>\n")),
            (Lines{"10 QBXML/QBXMLMsgsRq/InvoiceAddRq/InvoiceAdd/InvoiceLineAdd/RatePercent: "
                   "expected one of: ClassRef, Amount, TaxAmount, OptionForPriceRuleConflict, "
                   "InventorySiteRef, InventorySiteLocationRef, SerialNumber, LotNumber, "
                   "ServiceDate, SalesTaxCodeRef, IsTaxable, OverrideItemAccountRef and 4 more; "
                   "found: RatePercent",
                   "20 QBXML/QBXMLMsgsRq/CustomerQueryRq/ActiveStatus: expected one of: ListID, "
                   "IncludeRetElement, OwnerID; found: ActiveStatus",
                   "21 QBXML/QBXMLMsgsRq/CustomerQueryRq/ListID: expected one of: "
                   "FromModifiedDate, ToModifiedDate, NameFilter, NameRangeFilter, "
                   "TotalBalanceFilter, CurrencyFilter, ClassFilter, IncludeRetElement, OwnerID; "
                   "found: ListID",
                   "24 QBXML/QBXMLMsgsRq/ItemServiceAddRq/ItemServiceAdd: missing required "
                   "element 'SalesOrPurchase' or 'SalesAndPurchase' in ItemServiceAdd",
                   "27 QBXML/QBXMLMsgsRq/ItemSalesTaxGroupAddRq/ItemSalesTaxGroupAdd: missing "
                   "required element 'ItemSalesTaxRef' in ItemSalesTaxGroupAdd"}));
}

TEST(RequestReaderTest, ChecksLeafValueFormats) {
  const struct {
    ValueType type;
    const char* text;
    bool accepted;
  } cases[] = {
      {ValueType::kBool, "true", true},
      {ValueType::kBool, "0", true},
      {ValueType::kBool, " false\n", true},
      {ValueType::kBool, "", true},
      {ValueType::kBool, "True", false},
      {ValueType::kBool, "yes", false},
      {ValueType::kBool, "2", false},
      {ValueType::kDate, "2024-02-29", true},
      {ValueType::kDate, "2000-02-29", true},
      {ValueType::kDate, " 2024-12-31 ", true},
      {ValueType::kDate, "", true},
      {ValueType::kDate, "2023-02-29", false},
      {ValueType::kDate, "1900-02-29", false},
      {ValueType::kDate, "2024-04-31", false},
      {ValueType::kDate, "2024-13-01", false},
      {ValueType::kDate, "0000-01-01", false},
      {ValueType::kDate, "2024-1-5", false},
      {ValueType::kDate, "2024-01-01T10:00:00", false},
      {ValueType::kDate, "01/02/2024", false},
      {ValueType::kDateTime, "2024-03-02", true},
      {ValueType::kDateTime, "2009-03-02T10:40:23", true},
      {ValueType::kDateTime, "2009-03-02T10:40:23-05:00", true},
      {ValueType::kDateTime, "2009-03-02T23:59:59+14:00", true},
      {ValueType::kDateTime, "", true},
      {ValueType::kDateTime, "2009-03-02T24:00:00", false},
      {ValueType::kDateTime, "2009-03-02T10:40", false},
      {ValueType::kDateTime, "2009-03-02 10:40:23", false},
      {ValueType::kDateTime, "2009-03-02T10:40:23Z", false},
      {ValueType::kDateTime, "2009-02-30T10:40:23", false},
      {ValueType::kDateTime, "2009-03-02T10:40:23-0500", false},
      {ValueType::kInt, "42", true},
      {ValueType::kInt, " -7 ", true},
      {ValueType::kInt, "+0", true},
      {ValueType::kInt, "99999999999999999999", true},
      {ValueType::kInt, "", false},
      {ValueType::kInt, "1.5", false},
      {ValueType::kInt, "1e3", false},
      {ValueType::kInt, "-", false},
      {ValueType::kAmt, "246.90", true},
      {ValueType::kAmt, "246.9", true},
      {ValueType::kAmt, "-0.123456", true},
      {ValueType::kAmt, "12.", true},
      {ValueType::kAmt, "", true},
      {ValueType::kAmt, "abc", false},
      {ValueType::kAmt, "1,000.00", false},
      {ValueType::kAmt, " 12.00", false},
      {ValueType::kAmt, ".", false},
      {ValueType::kPrice, "85.123456", true},
      {ValueType::kPrice, "1e5", false},
      {ValueType::kQuan, "2.5", true},
      {ValueType::kQuan, "two", false},
      {ValueType::kPercent, "-7.5", true},
      {ValueType::kPercent, "7.5%", false},
      {ValueType::kFloat, " 1.25 ", true},
      {ValueType::kFloat, "", true},
      {ValueType::kFloat, "1.2.3", false},
      {ValueType::kGuid, "{12345678-9ABC-def0-1234-56789abcdef0}", true},
      {ValueType::kGuid, "0", true},
      {ValueType::kGuid, "12345678-9ABC-def0-1234-56789abcdef0", false},
      {ValueType::kGuid, "{12345678-9ABC-def0-1234-56789abcdefg}", false},
      {ValueType::kGuid, "", false},
      {ValueType::kId, "80000001-1234567890", true},
      {ValueType::kId, "123456789012345678901234567890123456", true},
      {ValueType::kId, "1234567890123456789012345678901234567", false},
      {ValueType::kId,
       "\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9"
       "\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9\xC3\xA9"
       "\xC3\xA9\xC3\xA9",
       true},
      {ValueType::kStr, "any text at all, of any length: STRTYPE lengths are QuickBooks' business",
       true},
  };
  for (const auto& c : cases) {
    EXPECT_EQ(!internal::valueProblem(c.type, c.text).has_value(), c.accepted)
        << static_cast<int>(c.type) << " '" << c.text << "'";
  }
  EXPECT_EQ(internal::valueProblem(ValueType::kId, std::string(37, 'x')),
            "'" + std::string(37, 'x') + "' is longer than the 36 characters of an IDTYPE value");

  // In a document: each message names the value and what was expected.
  EXPECT_EQ(
      problemsOf(builderDocument(
          "\t\t<CustomerAddRq>\n"
          "\t\t\t<CustomerAdd>\n"
          "\t\t\t\t<Name>A</Name>\n"
          "\t\t\t\t<IsActive>Maybe</IsActive>\n"
          "\t\t\t\t<OpenBalance>246.9</OpenBalance>\n"
          "\t\t\t\t<OpenBalanceDate>2023-02-29</OpenBalanceDate>\n"
          "\t\t\t\t<CreditLimit>lots</CreditLimit>\n"
          "\t\t\t\t<JobStatus>Done</JobStatus>\n"
          "\t\t\t\t<ExternalGUID>{1234}</ExternalGUID>\n"
          "\t\t\t</CustomerAdd>\n"
          "\t\t</CustomerAddRq>\n"
          "\t\t<CustomerQueryRq>\n"
          "\t\t\t<MaxReturned>0</MaxReturned>\n"
          "\t\t\t<FromModifiedDate>2024-01-01T10:00</FromModifiedDate>\n"
          "\t\t</CustomerQueryRq>\n"
          "\t\t<CustomerQueryRq><MaxReturned>ten</MaxReturned></CustomerQueryRq>\n"
          "\t\t<AccountAddRq><AccountAdd><Name>X</Name><AccountType>Banking</AccountType>"
          "</AccountAdd></AccountAddRq>\n")),
      (Lines{"8 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/IsActive: 'Maybe' is not a BOOLTYPE "
             "value (true, false, 1, 0)",
             "10 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/OpenBalanceDate: '2023-02-29' is not "
             "a DATETYPE value (a valid date yyyy-mm-dd)",
             "11 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/CreditLimit: 'lots' is not an "
             "AMTTYPE value (a number)",
             "12 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/JobStatus: 'Done' is not one of: "
             "Awarded, Closed, InProgress, None, NotAwarded, Pending",
             "13 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/ExternalGUID: '{1234}' is not a "
             "GUIDTYPE value ({XXXXXXXX-XXXX-XXXX-XXXX-XXXXXXXXXXXX} or 0)",
             "17 QBXML/QBXMLMsgsRq/CustomerQueryRq/MaxReturned: '0' is less than 1, the least "
             "MaxReturned may be",
             "18 QBXML/QBXMLMsgsRq/CustomerQueryRq/FromModifiedDate: '2024-01-01T10:00' is not a "
             "DATETIMETYPE value (a valid date yyyy-mm-dd, optionally followed by Thh:mm:ss and "
             "then by +hh:mm or -hh:mm)",
             "20 QBXML/QBXMLMsgsRq/CustomerQueryRq/MaxReturned: 'ten' is not an INTTYPE value (a "
             "whole number)",
             "21 QBXML/QBXMLMsgsRq/AccountAddRq/AccountAdd/AccountType: 'Banking' is not one of: "
             "AccountsPayable, AccountsReceivable, Bank, CostOfGoodsSold, CreditCard, Equity, "
             "Expense, FixedAsset, Income, LongTermLiability, NonPosting, OtherAsset, "
             "OtherCurrentAsset, OtherCurrentLiability, OtherExpense, OtherIncome"}));
}

TEST(RequestReaderTest, GivesEmptyLeavesTheirSchemaDefault) {
  const ReadResult result = readRequest(builderDocument(
      "\t\t<InvoiceQueryRq><PaidStatus/></InvoiceQueryRq>\n"
      "\t\t<CustomerQueryRq><ActiveStatus></ActiveStatus></CustomerQueryRq>\n"
      "\t\t<CustomerAddRq><CustomerAdd><Name>A</Name><IsActive/><JobStatus/></CustomerAdd>"
      "</CustomerAddRq>\n"));
  ASSERT_EQ(problemsOf(result), Lines{});
  const XmlNode& messages = *result.document->root.child("QBXMLMsgsRq");
  EXPECT_EQ(messages.children[0].child("PaidStatus")->text, "All");
  EXPECT_EQ(messages.children[1].child("ActiveStatus")->text, "ActiveOnly");
  EXPECT_EQ(messages.children[2].child("CustomerAdd")->child("JobStatus")->text, "None");
  EXPECT_EQ(messages.children[2].child("CustomerAdd")->child("IsActive")->text, "");
  // Only an empty element takes the default; blanks are a value, and not an enum value.
  EXPECT_EQ(problemsOf(builderDocument(
                "\t\t<CustomerQueryRq><ActiveStatus> </ActiveStatus></CustomerQueryRq>\n")),
            (Lines{"5 QBXML/QBXMLMsgsRq/CustomerQueryRq/ActiveStatus: ' ' is not one of: "
                   "ActiveOnly, InactiveOnly, All"}));
}

TEST(RequestReaderTest, ChecksAttributes) {
  for (const char* onError : {"stopOnError", "continueOnError", "rollbackOnError"}) {
    EXPECT_EQ(problemsOf(builderDocument("", onError)), Lines{}) << onError;
  }
  EXPECT_EQ(problemsOf(builderDocument("", "StopOnError")),
            (Lines{"4 QBXML/QBXMLMsgsRq: 'StopOnError' is not a value of attribute 'onError' "
                   "(stopOnError, continueOnError, rollbackOnError)"}));
  EXPECT_EQ(
      problemsOf("<?qbxml version=\"13.0\"?>\n<QBXML>\n<QBXMLMsgsRq>\n"
                 "<CustomerQueryRq requestID=\"1\" iterator=\"Begin\" metaData=\"NoMetaData\" "
                 "color=\"red\">\n<FullName a=\"b\">A</FullName>\n</CustomerQueryRq>\n"
                 "<InvoiceAddRq><InvoiceAdd defMacro=\"TxnID:1\"><CustomerRef><FullName>A"
                 "</FullName></CustomerRef><InvoiceLineAdd defMacro=\"x\"/></InvoiceAdd>"
                 "</InvoiceAddRq>\n<EstimateAddRq><EstimateAdd><CustomerRef><FullName>A</FullName>"
                 "</CustomerRef><EstimateLineAdd defMacro=\"x\"/></EstimateAdd></EstimateAddRq>\n"
                 "</QBXMLMsgsRq>\n</QBXML>"),
      (Lines{"3 QBXML/QBXMLMsgsRq: missing required attribute 'onError' on QBXMLMsgsRq",
             "4 QBXML/QBXMLMsgsRq/CustomerQueryRq: 'Begin' is not a value of attribute "
             "'iterator' (Start, Continue, Stop)",
             "4 QBXML/QBXMLMsgsRq/CustomerQueryRq: unknown attribute 'color' on CustomerQueryRq",
             "5 QBXML/QBXMLMsgsRq/CustomerQueryRq/FullName: unknown attribute 'a' on FullName",
             "8 QBXML/QBXMLMsgsRq/EstimateAddRq/EstimateAdd/EstimateLineAdd: unknown attribute "
             "'defMacro' on EstimateLineAdd"}));
}

TEST(RequestReaderTest, ReportsMalformedXmlWithTheOpenElements) {
  EXPECT_EQ(problemsOf(builderDocument("\t\t<CustomerAddRq>\n"
                                       "\t\t\t<CustomerAdd>\n"
                                       "\t\t\t\t<Name>A</Nme>\n"
                                       "\t\t\t</CustomerAdd>\n"
                                       "\t\t</CustomerAddRq>\n")),
            (Lines{"7 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/Name: not well-formed XML: "
                   "mismatched tag"}));
  EXPECT_EQ(problemsOf(builderDocument("\t\t<CustomerQueryRq><FullName>&nbsp;</FullName>"
                                       "</CustomerQueryRq>\n")),
            (Lines{"5 QBXML/QBXMLMsgsRq/CustomerQueryRq/FullName: not well-formed XML: undefined "
                   "entity"}));
  EXPECT_EQ(problemsOf(builderDocument("") + "\r\n<QBXML/>"),
            (Lines{"7 : not well-formed XML: junk after document element"}));
  EXPECT_EQ(problemsOf("<?qbxml version=\"13.0\"?>\n"),
            (Lines{"2 : not well-formed XML: no element found"}));
  EXPECT_EQ(problemsOf(""), (Lines{"1 : not well-formed XML: no element found"}));
  EXPECT_EQ(problemsOf("\n<?xml version=\"1.0\"?><QBXML/>"),
            (Lines{"2 : not well-formed XML: XML or text declaration not at start of entity"}));
  EXPECT_EQ(problemsOf("<QBXML><QBXMLMsgsRq onError=\"stopOnError\"/></QBXML>"),
            (Lines{"1 : no qbXML version: a request starts with <?qbxml version=\"N.N\"?> or the "
                   "QBXML DOCTYPE"}));
  EXPECT_EQ(problemsOf("<?qbxml version=\"thirteen\"?><QBXML><QBXMLMsgsRq onError=\"stopOnError\"/>"
                       "</QBXML>"),
            (Lines{"1 : qbXML version 'thirteen' is not of the form N.N"}));
  EXPECT_EQ(problemsOf("<!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.0//EN\"\n"
                       "<QBXML/>"),
            (Lines{"1 : malformed DOCTYPE: expected <!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML "
                   "QBD 1.0//EN\" >"}));
  EXPECT_EQ(problemsOf("<?qbxml version=\"13.0\"?>\n<!DOCTYPE QBXML>\n<!DOCTYPE QBXML>\n<QBXML/>"),
            (Lines{"3 : more than one DOCTYPE"}));
}

TEST(RequestReaderTest, RefusesDtdsAndEntitiesWithoutExpandingThem) {
  std::string laughs = "<?xml version=\"1.0\"?>\n<!DOCTYPE QBXML [\n <!ENTITY lol \"lol\">\n";
  for (int i = 1; i <= 9; ++i) {
    laughs += " <!ENTITY lol" + std::to_string(i) + " \"";
    for (int k = 0; k < 10; ++k)
      laughs += "&lol" + (i == 1 ? std::string() : std::to_string(i - 1)) + ";";
    laughs += "\">\n";
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

TEST(RequestReaderTest, BoundsNestingElementCountAndSize) {
  const auto nested = [](int depth) {
    std::string text = "<?qbxml version=\"13.0\"?>\n<QBXML>\n<QBXMLMsgsRq onError=\"stopOnError\">";
    for (int i = 2; i < depth; ++i) text += "<A>";
    for (int i = 2; i < depth; ++i) text += "</A>";
    return text + "</QBXMLMsgsRq></QBXML>";
  };
  // 200 levels parse (and are then checked); 201 are refused while parsing.
  EXPECT_EQ(problemsOf(nested(200)),
            (Lines{"3 QBXML/QBXMLMsgsRq/A: unknown element 'A' in QBXMLMsgsRq"}));
  const std::vector<std::string> deep = problemsOf(nested(201));
  ASSERT_EQ(deep.size(), 1u);
  EXPECT_TRUE(deep[0].ends_with("/A/A: elements nested deeper than 200 levels")) << deep[0];
  EXPECT_TRUE(deep[0].starts_with("3 QBXML/QBXMLMsgsRq/A/A/")) << deep[0];
  EXPECT_EQ(problemsOf(nested(100000)), deep);

  std::string many = "<?qbxml version=\"13.0\"?>\n<QBXML>\n<QBXMLMsgsRq onError=\"stopOnError\">\n";
  for (int i = 0; i < 1'000'000; ++i) many += "<A/>";
  EXPECT_EQ(problemsOf(many + "</QBXMLMsgsRq></QBXML>"),
            (Lines{"4 QBXML/QBXMLMsgsRq/A: more than 1000000 elements in one document"}));

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
    return builderDocument("\t\t<CustomerQueryRq>\n\t\t\t<FullName>" + std::string(name) +
                           "</FullName>\n\t\t</CustomerQueryRq>\n");
  };
  EXPECT_EQ(problemsOf(withName("caf\xE9")),
            (Lines{"6 QBXML/QBXMLMsgsRq/CustomerQueryRq/FullName: text is not valid UTF-8 (byte "
                   "0xE9)"}));
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
  EXPECT_EQ(problemsOf(withName("a\x01")),
            (Lines{"6 QBXML/QBXMLMsgsRq/CustomerQueryRq/FullName: not well-formed XML: invalid "
                   "token"}));
  EXPECT_EQ(problemsOf(withName(std::string("a\0b", 3))),
            (Lines{"6 QBXML/QBXMLMsgsRq/CustomerQueryRq/FullName: not well-formed XML: invalid "
                   "token"}));
}

TEST(RequestReaderTest, KeepsCharactersOutsideLatin1AsText) {
  const ReadResult result = readRequest(builderDocument(
      "\t\t<CustomerQueryRq><FullName>\xC5\x81\xC3\xB3\x64\xC5\xBA \xE2\x98\x83 \xF0\x9F\x98\x80 "
      "&#8364;&#x1F600;</FullName></CustomerQueryRq>\n"));
  ASSERT_EQ(problemsOf(result), Lines{});
  EXPECT_EQ(
      result.document->root.child("QBXMLMsgsRq")->child("CustomerQueryRq")->child("FullName")->text,
      "\xC5\x81\xC3\xB3\x64\xC5\xBA \xE2\x98\x83 \xF0\x9F\x98\x80 \xE2\x82\xAC\xF0\x9F\x98\x80");
}

TEST(RequestReaderTest, KeepsAtMostAHundredProblems) {
  std::string requests;
  for (int i = 0; i < 150; ++i) requests += "\t\t<Foo/>\n";
  const ReadResult result = readRequest(builderDocument(requests));
  ASSERT_EQ(result.problems.size(), 101u);
  EXPECT_EQ(problemsOf(result)[99],
            "104 QBXML/QBXMLMsgsRq/Foo: unknown element 'Foo' in QBXMLMsgsRq");
  EXPECT_EQ(problemsOf(result)[100],
            "105 QBXML/QBXMLMsgsRq/Foo: more problems follow; only the first 100 are listed");
}

TEST(RequestReaderTest, SurvivesArbitraryBytes) {
  const std::string valid = builderDocument(
      "\t\t<InvoiceAddRq requestID=\"2\">\n\t\t\t<InvoiceAdd>\n"
      "\t\t\t\t<CustomerRef><FullName>A &amp; B</FullName></CustomerRef>\n"
      "\t\t\t\t<TxnDate>2024-01-31</TxnDate>\n"
      "\t\t\t\t<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef>"
      "<Quantity>2</Quantity><Rate>85.00</Rate></InvoiceLineAdd>\n"
      "\t\t\t</InvoiceAdd>\n\t\t</InvoiceAddRq>\n");
  ASSERT_EQ(problemsOf(valid), Lines{});
  std::mt19937 random(20240229);
  for (int round = 0; round < 400; ++round) {
    std::string text = valid;
    const int edits = 1 + static_cast<int>(random() % 4);
    for (int e = 0; e < edits; ++e) {
      const std::size_t at = random() % text.size();
      switch (random() % 3) {
        case 0:
          text[at] = static_cast<char>(random() % 256);
          break;
        case 1:
          text.erase(at, 1 + random() % 8);
          break;
        default:
          text.insert(at, 1, "<>&;/\"'="[random() % 8]);
          break;
      }
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

// The element names of one line of the compact order ("Name: A?, (B | C)*, D{0..8}").
std::vector<std::string> compactNames(const std::string& line) {
  std::vector<std::string> names;
  std::string name;
  for (char c : line.substr(line.find(':') + 1) + " ") {
    if (std::isalnum(static_cast<unsigned char>(c))) {
      name += c;
    } else {
      if (!name.empty() && std::isupper(static_cast<unsigned char>(name[0]))) {
        names.push_back(name);
      }
      name.clear();
    }
  }
  return names;
}

TEST(RequestReaderTest, SchemaChildOrderFollowsTheElementOrder) {
  const std::filesystem::path compact = kShared / "qbxml/element-order/qbxml130_compact.txt";
  if (!std::filesystem::exists(compact)) GTEST_SKIP() << "no " << compact;
  std::istringstream lines(test::readFile(compact));
  std::string line;
  int compared = 0;
  while (std::getline(lines, line)) {
    const std::string aggregate = line.substr(0, line.find(':'));
    const std::vector<std::string_view> order = schemaChildOrder(aggregate);
    ASSERT_FALSE(order.empty()) << aggregate;
    EXPECT_EQ(std::vector<std::string>(order.begin(), order.end()), compactNames(line))
        << aggregate;
    ++compared;
  }
  EXPECT_GE(compared, 50);

  // CustomerRet against its block in the detailed order: the element lines outside any
  // nested {...} content, groups flattened.
  const std::filesystem::path detailed = kShared / "qbxml/element-order/qbxml130_detailed.txt";
  std::istringstream block(test::readFile(detailed));
  while (std::getline(block, line) && line != "CustomerRet") {
  }
  std::vector<std::string> expected;
  int depth = 0;
  while (std::getline(block, line) && !line.empty()) {
    const std::string body = line.substr(line.find_first_not_of(' '));
    if (body == "}") {
      --depth;
      continue;
    }
    if (depth == 0 && body[0] != '<')
      expected.push_back(body.substr(0, body.find_first_of("?*+{ :")));
    if (body.back() == '{') ++depth;
  }
  const std::vector<std::string_view> customer = schemaChildOrder("CustomerRet");
  EXPECT_GE(expected.size(), 60u);
  EXPECT_EQ(std::vector<std::string>(customer.begin(), customer.end()), expected);
}

// xmllint's verdict on a document (DOCTYPE line dropped), or nothing when it cannot run.
std::optional<bool> xmllintAccepts(const std::string& document, const std::string& name) {
  const std::filesystem::path schema = kShared / "qbxml/xsd/qbxmlops130.xsd";
  if (!std::filesystem::exists(schema) || std::system("xmllint --version >/dev/null 2>&1") != 0) {
    return std::nullopt;
  }
  const std::filesystem::path file =
      std::filesystem::temp_directory_path() /
      ("droqbxml-xmllint-" + std::to_string(::getpid()) + "-" + name + ".xml");
  std::string copy = document;
  const std::size_t doctype = copy.find("<!DOCTYPE");
  if (doctype != std::string::npos) copy.erase(doctype, copy.find('\n', doctype) + 1 - doctype);
  test::writeFile(file, copy);
  const std::string command =
      "xmllint --noout --schema '" + schema.string() + "' '" + file.string() + "' >/dev/null 2>&1";
  const int status = std::system(command.c_str());
  std::filesystem::remove(file);
  return status == 0;
}

TEST(RequestReaderTest, AgreesWithTheValidatorSchemaOnSamples) {
  const struct {
    const char* name;
    const char* requests;
  } samples[] = {
      {"customer_add_full",
       "<CustomerAddRq requestID=\"2\"><CustomerAdd><Name>Acme</Name><IsActive>1</IsActive>"
       "<ParentRef><FullName>Parent</FullName></ParentRef><CompanyName>Acme Inc</CompanyName>"
       "<Salutation>Mr</Salutation><FirstName>Al</FirstName><LastName>Smith</LastName>"
       "<BillAddress><Addr1>1 Main</Addr1><City>X</City><PostalCode>1</PostalCode></BillAddress>"
       "<ShipAddress><Addr1>2 Main</Addr1></ShipAddress>"
       "<ShipToAddress><Name>Dock</Name><Addr1>3 Main</Addr1><DefaultShipTo>true</DefaultShipTo>"
       "</ShipToAddress><Phone>1</Phone><Email>a@b.c</Email><Contact>Al</Contact>"
       "<AdditionalContactRef><ContactName>Main</ContactName><ContactValue>1</ContactValue>"
       "</AdditionalContactRef><CustomerTypeRef><FullName>T</FullName></CustomerTypeRef>"
       "<TermsRef><ListID>1</ListID></TermsRef><OpenBalance>-12.50</OpenBalance>"
       "<OpenBalanceDate>2024-02-29</OpenBalanceDate><SalesTaxCodeRef><FullName>Tax</FullName>"
       "</SalesTaxCodeRef><CreditLimit>1000.00</CreditLimit><JobStatus>InProgress</JobStatus>"
       "<JobStartDate></JobStartDate><Notes>n</Notes><PreferredDeliveryMethod>Email"
       "</PreferredDeliveryMethod><ExternalGUID>{12345678-1234-1234-1234-123456789ABC}"
       "</ExternalGUID></CustomerAdd><IncludeRetElement>ListID</IncludeRetElement>"
       "</CustomerAddRq>"},
      {"customer_add_order",
       "<CustomerAddRq><CustomerAdd><CompanyName>A</CompanyName><Name>A"
       "</Name></CustomerAdd></CustomerAddRq>"},
      {"customer_add_two_names",
       "<CustomerAddRq><CustomerAdd><Name>A</Name><Name>A</Name>"
       "</CustomerAdd></CustomerAddRq>"},
      {"customer_add_bad_bool",
       "<CustomerAddRq><CustomerAdd><Name>A</Name><IsActive>Maybe"
       "</IsActive></CustomerAdd></CustomerAddRq>"},
      {"customer_add_bad_date",
       "<CustomerAddRq><CustomerAdd><Name>A</Name><OpenBalanceDate>"
       "2023-02-29</OpenBalanceDate></CustomerAdd></CustomerAddRq>"},
      {"customer_add_bad_amount",
       "<CustomerAddRq><CustomerAdd><Name>A</Name><CreditLimit>"
       "12a</CreditLimit></CustomerAdd></CustomerAddRq>"},
      {"customer_add_bad_guid",
       "<CustomerAddRq><CustomerAdd><Name>A</Name><ExternalGUID>{1}"
       "</ExternalGUID></CustomerAdd></CustomerAddRq>"},
      {"customer_add_contact_ref_as_list_ref",
       "<CustomerAddRq><CustomerAdd><Name>A</Name><AdditionalContactRef><FullName>x</FullName>"
       "</AdditionalContactRef></CustomerAdd></CustomerAddRq>"},
      {"customer_query_filters",
       "<CustomerQueryRq requestID=\"3\" iterator=\"Start\"><MaxReturned>10</MaxReturned>"
       "<ActiveStatus>All</ActiveStatus><FromModifiedDate>2009-03-02T10:40:23-05:00"
       "</FromModifiedDate><NameFilter><MatchCriterion>StartsWith</MatchCriterion><Name>A</Name>"
       "</NameFilter><TotalBalanceFilter><Operator>GreaterThan</Operator><Amount>10.00</Amount>"
       "</TotalBalanceFilter><ClassFilter><FullNameWithChildren>C</FullNameWithChildren>"
       "</ClassFilter></CustomerQueryRq>"},
      {"customer_query_mixed_choice",
       "<CustomerQueryRq><ListID>1</ListID><ActiveStatus>All"
       "</ActiveStatus></CustomerQueryRq>"},
      {"customer_query_max_zero",
       "<CustomerQueryRq><MaxReturned>0</MaxReturned>"
       "</CustomerQueryRq>"},
      {"customer_query_long_listid",
       "<CustomerQueryRq><ListID>1234567890123456789012345678901234567</ListID>"
       "</CustomerQueryRq>"},
      {"customer_query_bad_iterator", "<CustomerQueryRq iterator=\"Begin\"/>"},
      {"customer_query_default_status", "<CustomerQueryRq><ActiveStatus/></CustomerQueryRq>"},
      {"customer_query_blank_status",
       "<CustomerQueryRq><ActiveStatus> </ActiveStatus>"
       "</CustomerQueryRq>"},
      {"customer_query_empty_max", "<CustomerQueryRq><MaxReturned/></CustomerQueryRq>"},
      {"account_add",
       "<AccountAddRq><AccountAdd><Name>Sales</Name><AccountType>Income"
       "</AccountType><AccountNumber>4000</AccountNumber><OpenBalance>0"
       "</OpenBalance></AccountAdd></AccountAddRq>"},
      {"account_add_bad_type",
       "<AccountAddRq><AccountAdd><Name>S</Name><AccountType>Banking"
       "</AccountType></AccountAdd></AccountAddRq>"},
      {"account_add_missing_type",
       "<AccountAddRq><AccountAdd><Name>S</Name></AccountAdd>"
       "</AccountAddRq>"},
      {"account_query",
       "<AccountQueryRq metaData=\"MetaDataOnly\"><ActiveStatus>ActiveOnly"
       "</ActiveStatus><AccountType>Bank</AccountType><AccountType>Income"
       "</AccountType></AccountQueryRq>"},
      {"item_service_add",
       "<ItemServiceAddRq><ItemServiceAdd><Name>Labor</Name><BarCode>"
       "<BarCodeValue>1</BarCodeValue></BarCode><SalesOrPurchase><Desc>Work"
       "</Desc><Price>85.00</Price><AccountRef><FullName>Income</FullName>"
       "</AccountRef></SalesOrPurchase></ItemServiceAdd></ItemServiceAddRq>"},
      {"item_service_add_no_choice",
       "<ItemServiceAddRq><ItemServiceAdd><Name>Labor</Name>"
       "</ItemServiceAdd></ItemServiceAddRq>"},
      {"item_service_add_both",
       "<ItemServiceAddRq><ItemServiceAdd><Name>L</Name>"
       "<SalesOrPurchase/><SalesAndPurchase/></ItemServiceAdd>"
       "</ItemServiceAddRq>"},
      {"item_non_inventory_add",
       "<ItemNonInventoryAddRq><ItemNonInventoryAdd><Name>Pipe</Name><SalesAndPurchase>"
       "<SalesDesc>s</SalesDesc><SalesPrice>1.5</SalesPrice><IncomeAccountRef><FullName>I"
       "</FullName></IncomeAccountRef><PurchaseCost>1</PurchaseCost><ExpenseAccountRef>"
       "<FullName>E</FullName></ExpenseAccountRef></SalesAndPurchase></ItemNonInventoryAdd>"
       "</ItemNonInventoryAddRq>"},
      {"item_other_charge_add",
       "<ItemOtherChargeAddRq><ItemOtherChargeAdd><Name>Fee</Name>"
       "<SalesOrPurchase><PricePercent>5</PricePercent>"
       "</SalesOrPurchase></ItemOtherChargeAdd></ItemOtherChargeAddRq>"},
      {"item_inventory_add",
       "<ItemInventoryAddRq><ItemInventoryAdd><Name>Widget</Name><SalesPrice>2.00</SalesPrice>"
       "<IncomeAccountRef><FullName>I</FullName></IncomeAccountRef><COGSAccountRef><FullName>C"
       "</FullName></COGSAccountRef><AssetAccountRef><FullName>A</FullName></AssetAccountRef>"
       "<QuantityOnHand>10</QuantityOnHand><TotalValue>20.00</TotalValue><InventoryDate>"
       "2024-01-01</InventoryDate></ItemInventoryAdd></ItemInventoryAddRq>"},
      {"item_discount_add",
       "<ItemDiscountAddRq><ItemDiscountAdd><Name>D</Name>"
       "<DiscountRatePercent>10</DiscountRatePercent><AccountRef><FullName>"
       "D</FullName></AccountRef></ItemDiscountAdd></ItemDiscountAddRq>"},
      {"item_subtotal_add",
       "<ItemSubtotalAddRq><ItemSubtotalAdd><Name>Sub</Name><ItemDesc>s"
       "</ItemDesc></ItemSubtotalAdd></ItemSubtotalAddRq>"},
      {"item_group_add",
       "<ItemGroupAddRq><ItemGroupAdd><Name>G</Name><IsPrintItemsInGroup>false"
       "</IsPrintItemsInGroup><ItemGroupLine><ItemRef><FullName>Labor"
       "</FullName></ItemRef><Quantity>2</Quantity></ItemGroupLine>"
       "<ItemGroupLine/></ItemGroupAdd></ItemGroupAddRq>"},
      {"item_payment_add",
       "<ItemPaymentAddRq><ItemPaymentAdd><Name>P</Name><PaymentMethodRef>"
       "<FullName>Cash</FullName></PaymentMethodRef></ItemPaymentAdd>"
       "</ItemPaymentAddRq>"},
      {"item_sales_tax_add",
       "<ItemSalesTaxAddRq><ItemSalesTaxAdd><Name>T</Name><TaxRate>7.5"
       "</TaxRate><TaxVendorRef><FullName>State</FullName></TaxVendorRef>"
       "</ItemSalesTaxAdd></ItemSalesTaxAddRq>"},
      {"item_sales_tax_group_add",
       "<ItemSalesTaxGroupAddRq><ItemSalesTaxGroupAdd><Name>G</Name><ItemSalesTaxRef><FullName>T"
       "</FullName></ItemSalesTaxRef><ItemSalesTaxRef><FullName>U</FullName></ItemSalesTaxRef>"
       "</ItemSalesTaxGroupAdd></ItemSalesTaxGroupAddRq>"},
      {"item_sales_tax_group_add_empty",
       "<ItemSalesTaxGroupAddRq><ItemSalesTaxGroupAdd><Name>G"
       "</Name></ItemSalesTaxGroupAdd></ItemSalesTaxGroupAddRq>"},
      {"item_queries",
       "<ItemQueryRq><NameRangeFilter><FromName>A</FromName></NameRangeFilter></ItemQueryRq>"
       "<ItemServiceQueryRq><ClassFilter><ListID>1</ListID></ClassFilter></ItemServiceQueryRq>"
       "<ItemNonInventoryQueryRq><FullName>A</FullName><FullName>B</FullName>"
       "</ItemNonInventoryQueryRq><ItemOtherChargeQueryRq/><ItemInventoryQueryRq>"
       "<ActiveStatus>All</ActiveStatus></ItemInventoryQueryRq><ItemDiscountQueryRq/>"
       "<ItemSubtotalQueryRq><OwnerID>0</OwnerID></ItemSubtotalQueryRq><ItemGroupQueryRq/>"
       "<ItemPaymentQueryRq/><ItemSalesTaxQueryRq/><ItemSalesTaxGroupQueryRq/>"},
      {"item_subtotal_query_class",
       "<ItemSubtotalQueryRq><ClassFilter><ListID>1</ListID>"
       "</ClassFilter></ItemSubtotalQueryRq>"},
      {"payroll_item_wage_query",
       "<PayrollItemWageQueryRq metaData=\"NoMetaData\">"
       "<ActiveStatus>All</ActiveStatus><IncludeRetElement>Name"
       "</IncludeRetElement></PayrollItemWageQueryRq>"},
      {"payroll_item_wage_query_owner",
       "<PayrollItemWageQueryRq><OwnerID>0</OwnerID>"
       "</PayrollItemWageQueryRq>"},
      {"payroll_item_wage_query_iterator", "<PayrollItemWageQueryRq iterator=\"Start\"/>"},
      {"estimate_add",
       "<EstimateAddRq><EstimateAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
       "<TxnDate>2024-03-01</TxnDate><RefNumber>1</RefNumber><BillAddress><Addr1>1</Addr1>"
       "</BillAddress><PONumber>P</PONumber><Memo>m</Memo><ExchangeRate>1.25</ExchangeRate>"
       "<EstimateLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><Desc>d</Desc><Quantity>"
       "2.5</Quantity><Rate>85.00</Rate><Amount>212.50</Amount><MarkupRatePercent>5"
       "</MarkupRatePercent><DataExt><OwnerID>0</OwnerID><DataExtName>X</DataExtName>"
       "<DataExtValue>1</DataExtValue></DataExt></EstimateLineAdd><EstimateLineGroupAdd>"
       "<ItemGroupRef><FullName>G</FullName></ItemGroupRef><Quantity>1</Quantity>"
       "</EstimateLineGroupAdd><EstimateLineAdd/></EstimateAdd></EstimateAddRq>"},
      {"estimate_add_no_lines",
       "<EstimateAddRq><EstimateAdd><CustomerRef><FullName>A"
       "</FullName></CustomerRef></EstimateAdd></EstimateAddRq>"},
      {"estimate_add_no_customer",
       "<EstimateAddRq><EstimateAdd><EstimateLineAdd/>"
       "</EstimateAdd></EstimateAddRq>"},
      {"estimate_add_line_group_without_ref",
       "<EstimateAddRq><EstimateAdd><CustomerRef><FullName>A</FullName></CustomerRef>"
       "<EstimateLineGroupAdd><Quantity>1</Quantity></EstimateLineGroupAdd></EstimateAdd>"
       "</EstimateAddRq>"},
      {"estimate_query",
       "<EstimateQueryRq><MaxReturned>5</MaxReturned><TxnDateRangeFilter><DateMacro>ThisMonth"
       "</DateMacro></TxnDateRangeFilter><EntityFilter><FullName>Acme</FullName></EntityFilter>"
       "<RefNumberRangeFilter><FromRefNumber>1</FromRefNumber></RefNumberRangeFilter>"
       "<IncludeLineItems>true</IncludeLineItems></EstimateQueryRq>"},
      {"estimate_query_both_dates",
       "<EstimateQueryRq><TxnDateRangeFilter><FromTxnDate>"
       "2024-01-01</FromTxnDate><DateMacro>Today</DateMacro>"
       "</TxnDateRangeFilter></EstimateQueryRq>"},
      {"invoice_add",
       "<InvoiceAddRq requestID=\"9\"><InvoiceAdd defMacro=\"TxnID:Inv\"><CustomerRef><ListID>"
       "80000001-1</ListID></CustomerRef><ARAccountRef><FullName>AR</FullName></ARAccountRef>"
       "<TxnDate>2024-01-31</TxnDate><ShipAddress><City>Y</City></ShipAddress><IsPending>false"
       "</IsPending><DueDate>2024-02-29</DueDate><ShipDate>2024-02-01</ShipDate>"
       "<IsToBePrinted>0</IsToBePrinted><InvoiceLineAdd defMacro=\"TxnID:L\"><ItemRef><FullName>"
       "Labor</FullName></ItemRef><Quantity>2</Quantity><RatePercent>-10</RatePercent>"
       "<ServiceDate>2024-01-15</ServiceDate><SalesTaxCodeRef><FullName>Non</FullName>"
       "</SalesTaxCodeRef></InvoiceLineAdd><InvoiceLineGroupAdd><ItemGroupRef><FullName>G"
       "</FullName></ItemGroupRef><ServiceDate>2024-01-15</ServiceDate></InvoiceLineGroupAdd>"
       "</InvoiceAdd></InvoiceAddRq>"},
      {"invoice_add_no_lines",
       "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>A</FullName>"
       "</CustomerRef></InvoiceAdd></InvoiceAddRq>"},
      {"invoice_add_rate_and_percent",
       "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>A</FullName></CustomerRef>"
       "<InvoiceLineAdd><Rate>1</Rate><RatePercent>1</RatePercent></InvoiceLineAdd>"
       "</InvoiceAdd></InvoiceAddRq>"},
      {"invoice_add_bad_time",
       "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>A</FullName>"
       "</CustomerRef><TxnDate>2024-01-31T10:00:00</TxnDate></InvoiceAdd>"
       "</InvoiceAddRq>"},
      {"invoice_query",
       "<InvoiceQueryRq iterator=\"Continue\" iteratorID=\"{x}\"><ModifiedDateRangeFilter>"
       "<FromModifiedDate>2024-01-01</FromModifiedDate></ModifiedDateRangeFilter>"
       "<AccountFilter><ListIDWithChildren>1</ListIDWithChildren></AccountFilter>"
       "<RefNumberFilter><MatchCriterion>Contains</MatchCriterion><RefNumber>7</RefNumber>"
       "</RefNumberFilter><CurrencyFilter><FullName>USD</FullName></CurrencyFilter><PaidStatus>"
       "NotPaidOnly</PaidStatus><IncludeLinkedTxns>1</IncludeLinkedTxns></InvoiceQueryRq>"},
      {"invoice_query_active_status",
       "<InvoiceQueryRq><ActiveStatus>All</ActiveStatus>"
       "</InvoiceQueryRq>"},
      {"unknown_attribute", "<CustomerQueryRq colour=\"red\"/>"},
      {"leaf_with_attribute",
       "<CustomerQueryRq><FullName lang=\"en\">A</FullName>"
       "</CustomerQueryRq>"},
  };
  if (!xmllintAccepts(builderDocument(""), "probe")) {
    GTEST_SKIP() << "xmllint or the validator schema is not available";
  }
  int accepted = 0;
  int refused = 0;
  for (const auto& sample : samples) {
    const std::string document = builderDocument(std::string("\t\t") + sample.requests + "\n");
    const ReadResult result = readRequest(document);
    const std::optional<bool> verdict = xmllintAccepts(document, sample.name);
    ASSERT_TRUE(verdict.has_value());
    EXPECT_EQ(result.problems.empty(), *verdict)
        << sample.name << (result.problems.empty() ? "" : ": " + problemsOf(result)[0]);
    (*verdict ? accepted : refused) += 1;
  }
  EXPECT_GE(accepted, 15);
  EXPECT_GE(refused, 15);
}

// Where the stand-in deliberately differs from the validator schema, as QuickBooks does.
TEST(RequestReaderTest, DiffersFromTheValidatorSchemaWhereQuickBooksDoes) {
  // Amounts with one decimal reach the request (answered there with status 3040).
  const std::string amount = builderDocument(
      "\t\t<CustomerAddRq><CustomerAdd><Name>A</Name><OpenBalance>246.9</OpenBalance>"
      "</CustomerAdd></CustomerAddRq>\n");
  EXPECT_EQ(problemsOf(amount), Lines{});
  // Valid qbXML requests that the stand-in does not answer are refused whole.
  const std::string vendors = builderDocument("\t\t<VendorQueryRq/>\n");
  EXPECT_EQ(problemsOf(vendors),
            (Lines{"5 QBXML/QBXMLMsgsRq/VendorQueryRq: unsupported request 'VendorQueryRq'"}));
  // A request document needs one message set.
  const std::string empty = "<?qbxml version=\"13.0\"?>\n<QBXML/>";
  EXPECT_FALSE(problemsOf(empty).empty());
  if (xmllintAccepts(builderDocument(""), "probe")) {
    EXPECT_EQ(xmllintAccepts(amount, "amount"), false);
    EXPECT_EQ(xmllintAccepts(vendors, "vendors"), true);
    EXPECT_EQ(xmllintAccepts(empty, "empty"), true);
  }
}

}  // namespace
}  // namespace droqbxml::simulator

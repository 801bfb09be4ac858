// The stand-in's answers to request documents, driven through readRequest and answerRequests
// against company files in temporary folders: whole responses for customer and invoice adds,
// QuickBooks' status codes and messages, onError, references, jobs, pricing and sales tax,
// query filters, text rules, version rules, the size of a company file, the shapes of real
// QuickBooks responses, and validation of every response kind against the qbXML schema.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <regex>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "droqbxml/runtime/ComError.hpp"
#include "simulator/CompanyFile.hpp"
#include "simulator/RequestDocument.hpp"
#include "simulator/RequestHandlers.hpp"
#include "tests/TestSupport.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator {
namespace {

const std::filesystem::path kShared = DROQBXML_SHARED_DIR;
const std::filesystem::path kTestData = DROQBXML_TESTDATA_DIR;

// The moment every test starts at: the ListIDs of the file's entries end in its Unix time.
constexpr const char* kNow = "2009-03-02T10:40:23-05:00";
constexpr const char* kStamp = "1236008423";

// ListIDs of a new company's entries: accounts in chart order of creation (Accounts
// Receivable, Undeposited Funds, Inventory Asset, Sales Tax Payable, Sales, Cost of Goods
// Sold, Job Expenses), sales tax codes (Tax, Non), the sales tax item (State Tax), and the
// entries a test adds after them.
std::string listId(int number) {
  char text[16];
  std::snprintf(text, sizeof text, "%X", 0x80000000u + static_cast<unsigned>(number));
  return std::string(text) + "-" + kStamp;
}

class RequestHandlersTest : public ::testing::Test {
 protected:
  void SetUp() override {
    if (const char* old = std::getenv("DROQBXML_SIMULATOR_NOW")) previousNow_ = old;
    setNow(kNow);
  }

  void TearDown() override {
    company_.reset();
    if (previousNow_) {
      ::setenv("DROQBXML_SIMULATOR_NOW", previousNow_->c_str(), 1);
    } else {
      ::unsetenv("DROQBXML_SIMULATOR_NOW");
    }
  }

  static void setNow(const char* now) { ::setenv("DROQBXML_SIMULATOR_NOW", now, 1); }

  // A new company file (sales tax on or off); the default one is created on first use.
  void newCompany(bool salesTax) {
    company_.reset();
    const auto path = folder_ / ("company" + std::to_string(++companies_) + ".qbw");
    CompanyFile::create(path, CompanySettings{"Orvanne Builders", salesTax});
    company_ = std::make_unique<CompanyFile>(path);
  }

  CompanyFile& company() {
    if (!company_) newCompany(true);
    return *company_;
  }

  static std::string document(std::string_view requests, std::string_view onError,
                              std::string_view prolog) {
    return "<?xml version=\"1.0\"?>\n" + std::string(prolog) +
           "\n<QBXML>\n<QBXMLMsgsRq onError=\"" + std::string(onError) + "\">\n" +
           std::string(requests) + "\n</QBXMLMsgsRq>\n</QBXML>\n";
  }

  // The response to `requests` in a qbXML 13.0 document.
  std::string answer(std::string_view requests, std::string_view onError = "stopOnError",
                     std::string_view prolog = "<?qbxml version=\"13.0\"?>") {
    const ReadResult read = readRequest(document(requests, onError, prolog));
    for (const Problem& problem : read.problems) {
      ADD_FAILURE() << "request refused: " << problem.line << " " << problem.element << ": "
                    << problem.message;
    }
    if (!read.document) return {};
    return answerRequests(company(), *read.document);
  }

  test::TemporaryFolder folder_;
  std::unique_ptr<CompanyFile> company_;
  int companies_ = 0;
  std::optional<std::string> previousNow_;
};

// "CustomerAddRs 0 Info Status OK" for every response element, in order.
std::vector<std::string> statuses(const std::string& response) {
  static const std::regex element(
      "<([A-Za-z]+Rs)(?: requestID=\"[^\"]*\")? statusCode=\"([0-9]+)\" "
      "statusSeverity=\"([A-Za-z]+)\" statusMessage=\"([^\"]*)\"");
  std::vector<std::string> found;
  for (std::sregex_iterator at(response.begin(), response.end(), element), end; at != end; ++at) {
    found.push_back((*at)[1].str() + " " + (*at)[2].str() + " " + (*at)[3].str() + " " +
                    (*at)[4].str());
  }
  return found;
}

// The text of every element `name` in the response, in order.
std::vector<std::string> texts(const std::string& response, const std::string& name) {
  const std::regex element("<" + name + ">([^<]*)</" + name + ">");
  std::vector<std::string> found;
  for (std::sregex_iterator at(response.begin(), response.end(), element), end; at != end; ++at) {
    found.push_back((*at)[1].str());
  }
  return found;
}

// The part of the response from the first start tag `name` (at or after `from`) to its end
// tag, or the empty text.
std::string section(const std::string& response, const std::string& name, size_t from = 0) {
  size_t start = response.find("<" + name, from);
  while (start != std::string::npos && response[start + name.size() + 1] != '>' &&
         response[start + name.size() + 1] != ' ') {
    start = response.find("<" + name, start + 1);
  }
  if (start == std::string::npos) return {};
  const size_t end = response.find("</" + name + ">", start);
  return end == std::string::npos ? std::string() : response.substr(start, end - start);
}

// The element tree of the first `aggregate` of a response, values left out: the shape of a
// record, written "Name,BillAddress{Addr1,City},...". Indentation and line breaks do not
// matter, so real responses re-indented by whoever published them compare too.
std::string shape(const std::string& response, const std::string& aggregate,
                  const std::set<std::string>& leaveOut = {}) {
  struct Node {
    std::string name;
    std::vector<Node> children;
  };
  const std::function<std::string(const Node&)> describe = [&](const Node& node) {
    std::string text;
    for (const Node& child : node.children) {
      if (leaveOut.contains(child.name)) continue;
      if (!text.empty()) text += ",";
      text += child.name;
      if (!child.children.empty()) text += "{" + describe(child) + "}";
    }
    return text;
  };
  static const std::regex tag("<(/?)([A-Za-z][A-Za-z0-9]*)[^>]*?(/?)>");
  std::vector<Node> open{Node{"#", {}}};
  for (std::sregex_iterator at(response.begin(), response.end(), tag), end; at != end; ++at) {
    if ((*at)[1].length() > 0) {
      if (open.size() < 2) return {};
      Node done = std::move(open.back());
      open.pop_back();
      if (done.name == aggregate) return describe(done);
      open.back().children.push_back(std::move(done));
    } else if ((*at)[3].length() > 0) {
      open.back().children.push_back(Node{(*at)[2].str(), {}});
    } else {
      open.push_back(Node{(*at)[2].str(), {}});
    }
  }
  return {};
}

constexpr std::string_view kLaborAndKit =
    "<ItemServiceAddRq><ItemServiceAdd><Name>Labor</Name><SalesOrPurchase><Desc>Labor, per "
    "hour</Desc><Price>85</Price><AccountRef><FullName>Sales</FullName></AccountRef>"
    "</SalesOrPurchase></ItemServiceAdd></ItemServiceAddRq>"
    "<ItemNonInventoryAddRq><ItemNonInventoryAdd><Name>Nails</Name><SalesOrPurchase><Desc>Box "
    "of nails</Desc><Price>0.125</Price><AccountRef><FullName>Sales</FullName></AccountRef>"
    "</SalesOrPurchase></ItemNonInventoryAdd></ItemNonInventoryAddRq>"
    "<ItemGroupAddRq><ItemGroupAdd><Name>Kitchen Kit</Name><ItemDesc>Kitchen fitting "
    "kit</ItemDesc><ItemGroupLine><ItemRef><FullName>Labor</FullName></ItemRef><Quantity>2"
    "</Quantity></ItemGroupLine><ItemGroupLine><ItemRef><FullName>Nails</FullName></ItemRef>"
    "<Quantity>100</Quantity></ItemGroupLine></ItemGroupAdd></ItemGroupAddRq>"
    "<ItemSubtotalAddRq><ItemSubtotalAdd><Name>Subtotal</Name><ItemDesc>Subtotal</ItemDesc>"
    "</ItemSubtotalAdd></ItemSubtotalAddRq>";

constexpr std::string_view kAcme =
    "<CustomerAddRq><CustomerAdd><Name>Acme</Name></CustomerAdd></CustomerAddRq>";

// --- Whole responses ---------------------------------------------------------------------

TEST_F(RequestHandlersTest, CustomerAddAndQueryAnswerAsQuickBooksWritesThem) {
  const std::string response = answer(
      "<CustomerAddRq requestID=\"2\"><CustomerAdd><Name>Tom's \"A&amp;B\" &lt;Builders&gt;</Name>"
      "<CompanyName>A&amp;B Builders</CompanyName><FirstName>Tom</FirstName>"
      "<BillAddress><Addr1>1 Main St</Addr1><City>Springfield</City><State>IL</State>"
      "<PostalCode>62701</PostalCode></BillAddress><Phone>555-0100</Phone>"
      "<Email>tom@example.com</Email><OpenBalance>150.00</OpenBalance><CreditLimit>2000"
      "</CreditLimit></CustomerAdd></CustomerAddRq>"
      "<CustomerAddRq requestID=\"3\"><CustomerAdd><Name>Kitchen</Name><ParentRef><ListID>" +
      listId(1) +
      "</ListID></ParentRef><JobStatus>InProgress</JobStatus><JobDesc>New kitchen</JobDesc>"
      "</CustomerAdd></CustomerAddRq>"
      "<CustomerQueryRq><ActiveStatus>All</ActiveStatus></CustomerQueryRq>");
  EXPECT_EQ(response, test::readFile(kTestData / "simulator" / "customer_add_and_query.xml"));
}

TEST_F(RequestHandlersTest, InvoiceAddAnswersWithTheWholeInvoice) {
  answer(std::string(kAcme) + std::string(kLaborAndKit));
  const std::string response = answer(
      "<InvoiceAddRq requestID=\"7\"><InvoiceAdd><CustomerRef><FullName>Acme</FullName>"
      "</CustomerRef><TxnDate>2009-03-01</TxnDate><RefNumber>INV-0099</RefNumber>"
      "<Memo>Kitchen &amp; bath</Memo>"
      "<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><Quantity>3</Quantity>"
      "</InvoiceLineAdd>"
      "<InvoiceLineAdd><ItemRef><FullName>Nails</FullName></ItemRef><Desc>Nails, loose</Desc>"
      "<Quantity>10</Quantity><Rate>1.5</Rate><SalesTaxCodeRef><FullName>NON</FullName>"
      "</SalesTaxCodeRef></InvoiceLineAdd>"
      "<InvoiceLineAdd><ItemRef><FullName>Subtotal</FullName></ItemRef></InvoiceLineAdd>"
      "<InvoiceLineAdd><Desc>Site visit included</Desc></InvoiceLineAdd>"
      "<InvoiceLineGroupAdd><ItemGroupRef><FullName>Kitchen Kit</FullName></ItemGroupRef>"
      "<Quantity>2</Quantity></InvoiceLineGroupAdd></InvoiceAdd></InvoiceAddRq>");
  EXPECT_EQ(response, test::readFile(kTestData / "simulator" / "invoice_add.xml"));
}

TEST_F(RequestHandlersTest, NewCompanyHoldsChartOfAccountsTaxCodesAndSalesTaxItem) {
  const std::string response =
      answer("<AccountQueryRq/><ItemQueryRq/><CustomerQueryRq/><EstimateQueryRq/>");
  // Accounts come in chart order: by type, then by name.
  EXPECT_EQ(texts(response, "FullName"),
            (std::vector<std::string>{"Accounts Receivable", "Inventory Asset", "Undeposited Funds",
                                      "Sales Tax Payable", "Sales", "Cost of Goods Sold",
                                      "Job Expenses"}));
  EXPECT_EQ(texts(section(response, "ItemSalesTaxRet"), "Name"),
            std::vector<std::string>{"State Tax"});
  EXPECT_EQ(
      texts(response, "AccountType"),
      (std::vector<std::string>{"AccountsReceivable", "OtherCurrentAsset", "OtherCurrentAsset",
                                "OtherCurrentLiability", "Income", "CostOfGoodsSold", "Expense"}));
  EXPECT_EQ(texts(response, "SpecialAccountType"),
            (std::vector<std::string>{"AccountsReceivable", "InventoryAssets", "UndepositedFunds",
                                      "SalesTaxPayable", "CostOfGoodsSold"}));
  EXPECT_EQ(texts(response, "TaxRate"), std::vector<std::string>{"7.50"});
  const std::string none = " 1 Info A query request did not find a matching object in QuickBooks";
  EXPECT_EQ(
      statuses(response),
      (std::vector<std::string>{"AccountQueryRs 0 Info Status OK", "ItemQueryRs 0 Info Status OK",
                                "CustomerQueryRs" + none, "EstimateQueryRs" + none}));

  // The sales tax codes exist whatever the setting: customers resolve them by name.
  newCompany(false);
  const std::string withoutTax = answer(
      "<ItemQueryRq/><CustomerAddRq><CustomerAdd><Name>Acme</Name><SalesTaxCodeRef><FullName>"
      "Non</FullName></SalesTaxCodeRef></CustomerAdd></CustomerAddRq>");
  EXPECT_EQ(statuses(withoutTax),
            (std::vector<std::string>{"ItemQueryRs" + none, "CustomerAddRs 0 Info Status OK"}));
  EXPECT_EQ(texts(section(withoutTax, "SalesTaxCodeRef"), "ListID"),
            std::vector<std::string>{listId(2)});
  EXPECT_EQ(section(withoutTax, "ItemSalesTaxRef"), "");
}

// --- Status codes and messages ------------------------------------------------------------

TEST_F(RequestHandlersTest, NumbersQuickBooksCannotConvertAreRefusedWith3040) {
  answer(std::string(kAcme) + std::string(kLaborAndKit));
  const std::string response = answer(
      "<CustomerAddRq><CustomerAdd><Name>Bolt</Name><CreditLimit>246.9</CreditLimit>"
      "</CustomerAdd></CustomerAddRq>"
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Nobody</FullName></CustomerRef>"
      "<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><Amount>10.001</Amount>"
      "</InvoiceLineAdd></InvoiceAdd></InvoiceAddRq>"
      "<EstimateAddRq><EstimateAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<EstimateLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><Quantity>1.123456"
      "</Quantity></EstimateLineAdd></EstimateAdd></EstimateAddRq>"
      "<ItemServiceAddRq><ItemServiceAdd><Name>Travel</Name><SalesOrPurchase><Price>1.000001"
      "</Price></SalesOrPurchase></ItemServiceAdd></ItemServiceAddRq>"
      "<ItemDiscountAddRq><ItemDiscountAdd><Name>Promo</Name><DiscountRatePercent>10.000001"
      "</DiscountRatePercent></ItemDiscountAdd></ItemDiscountAddRq>"
      "<CustomerQueryRq><FullName>Bolt</FullName></CustomerQueryRq>",
      "continueOnError");
  EXPECT_EQ(statuses(response),
            (std::vector<std::string>{
                "CustomerAddRs 3040 Error There was an error when converting the amount "
                "&quot;246.9&quot; in the field &quot;CreditLimit&quot;. ",
                // Conversion comes before references: the unknown customer is not reported.
                "InvoiceAddRs 3040 Error There was an error when converting the amount "
                "&quot;10.001&quot; in the field &quot;Amount&quot;. ",
                "EstimateAddRs 3040 Error There was an error when converting the quantity "
                "&quot;1.123456&quot; in the field &quot;Quantity&quot;. ",
                "ItemServiceAddRs 3040 Error There was an error when converting the price "
                "&quot;1.000001&quot; in the field &quot;Price&quot;. ",
                "ItemDiscountAddRs 3040 Error There was an error when converting the percentage "
                "&quot;10.000001&quot; in the field &quot;DiscountRatePercent&quot;. ",
                "CustomerQueryRs 500 Warn The query request has not been fully completed. There "
                "was a required element (&quot;Bolt&quot;) that could not be found in "
                "QuickBooks."}));
  // A refused request leaves no element behind it: no content, self-closing.
  EXPECT_NE(response.find("statusMessage=\"There was an error when converting the amount "
                          "&quot;246.9&quot; in the field &quot;CreditLimit&quot;. \" />\n"),
            std::string::npos);
}

TEST_F(RequestHandlersTest, TakenNamesAndOverlongNamesAreRefused) {
  const std::string response =
      answer(std::string(kAcme) +
                 "<CustomerAddRq><CustomerAdd><Name>ACME</Name></CustomerAdd></CustomerAddRq>"
                 "<CustomerAddRq><CustomerAdd><Name>Job</Name><ParentRef><FullName>Acme</FullName>"
                 "</ParentRef></CustomerAdd></CustomerAddRq>"
                 "<CustomerAddRq><CustomerAdd><Name>job</Name><ParentRef><FullName>acme</FullName>"
                 "</ParentRef></CustomerAdd></CustomerAddRq>"
                 "<AccountAddRq><AccountAdd><Name>sales</Name><AccountType>Income</AccountType>"
                 "</AccountAdd></AccountAddRq>"
                 // Items of every kind share one name list.
                 "<ItemServiceAddRq><ItemServiceAdd><Name>State tax</Name><SalesOrPurchase><Price>1"
                 "</Price></SalesOrPurchase></ItemServiceAdd></ItemServiceAddRq>"
                 "<CustomerAddRq><CustomerAdd><Name>" +
                 std::string(42, 'x') +
                 "</Name></CustomerAdd></CustomerAddRq>"
                 "<CustomerAddRq><CustomerAdd><Name>" +
                 std::string(41, 'x') + "</Name></CustomerAdd></CustomerAddRq>",
             "continueOnError");
  EXPECT_EQ(statuses(response),
            (std::vector<std::string>{
                "CustomerAddRs 0 Info Status OK",
                "CustomerAddRs 3100 Error The name &quot;ACME&quot; of the list element is "
                "already in use.",
                "CustomerAddRs 0 Info Status OK",
                "CustomerAddRs 3100 Error The name &quot;Acme:job&quot; of the list element is "
                "already in use.",
                "AccountAddRs 3100 Error The name &quot;sales&quot; of the list element is "
                "already in use.",
                "ItemServiceAddRs 3100 Error The name &quot;State tax&quot; of the list element "
                "is already in use.",
                "CustomerAddRs 3070 Error The string &quot;" + std::string(42, 'x') +
                    "&quot; in the field &quot;Name&quot; is too long.",
                "CustomerAddRs 0 Info Status OK"}));
}

TEST_F(RequestHandlersTest, ReferencesThatDoNotResolveAreRefusedWith3140) {
  answer(std::string(kAcme) + std::string(kLaborAndKit));
  const std::string tail =
      ".  QuickBooks error message: Invalid argument.  The specified record does not exist in "
      "the list.";
  const std::string response = answer(
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Zenith</FullName></CustomerRef>"
      "</InvoiceAdd></InvoiceAddRq>"
      "<EstimateAddRq><EstimateAdd><CustomerRef><ListID>80000009-1236008423</ListID>"
      "</CustomerRef><EstimateLineAdd><Desc>Survey</Desc></EstimateLineAdd></EstimateAdd>"
      "</EstimateAddRq>"
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef></InvoiceLineAdd>"
      "<InvoiceLineAdd><ItemRef><FullName>Plaster</FullName></ItemRef></InvoiceLineAdd>"
      "</InvoiceAdd></InvoiceAddRq>"
      "<EstimateAddRq><EstimateAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<EstimateLineGroupAdd><ItemGroupRef><FullName>Labor</FullName></ItemGroupRef>"
      "</EstimateLineGroupAdd></EstimateAdd></EstimateAddRq>"
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<InvoiceLineAdd><ItemRef><FullName>Kitchen Kit</FullName></ItemRef></InvoiceLineAdd>"
      "</InvoiceAdd></InvoiceAddRq>"
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><SalesTaxCodeRef><FullName>"
      "Exempt</FullName></SalesTaxCodeRef></InvoiceLineAdd></InvoiceAdd></InvoiceAddRq>"
      "<CustomerAddRq><CustomerAdd><Name>Bath</Name><ParentRef><FullName>Nobody</FullName>"
      "</ParentRef></CustomerAdd></CustomerAddRq>"
      "<CustomerAddRq><CustomerAdd><Name>Bath</Name><TermsRef><FullName>Net 30</FullName>"
      "</TermsRef></CustomerAdd></CustomerAddRq>"
      "<ItemInventoryAddRq><ItemInventoryAdd><Name>Tile</Name><IncomeAccountRef><FullName>"
      "Revenue</FullName></IncomeAccountRef></ItemInventoryAdd></ItemInventoryAddRq>"
      "<ItemGroupAddRq><ItemGroupAdd><Name>Bath Kit</Name><ItemGroupLine><ItemRef><FullName>"
      "Kitchen Kit</FullName></ItemRef></ItemGroupLine></ItemGroupAdd></ItemGroupAddRq>"
      "<InvoiceQueryRq/>",
      "continueOnError");
  EXPECT_EQ(statuses(response),
            (std::vector<std::string>{
                "InvoiceAddRs 3140 Error There is an invalid reference to QuickBooks Customer "
                "&quot;Zenith&quot; in the Invoice" +
                    tail,
                "EstimateAddRs 3140 Error There is an invalid reference to QuickBooks Customer "
                "&quot;80000009-1236008423&quot; in the Estimate" +
                    tail,
                "InvoiceAddRs 3140 Error There is an invalid reference to QuickBooks Item "
                "&quot;Plaster&quot; in the Invoice line" +
                    tail,
                "EstimateAddRs 3140 Error There is an invalid reference to QuickBooks Item "
                "&quot;Labor&quot; in the Estimate line" +
                    tail,
                "InvoiceAddRs 3140 Error There is an invalid reference to QuickBooks Item "
                "&quot;Kitchen Kit&quot; in the Invoice line" +
                    tail,
                "InvoiceAddRs 3140 Error There is an invalid reference to QuickBooks SalesTaxCode "
                "&quot;Exempt&quot; in the Invoice line" +
                    tail,
                "CustomerAddRs 3140 Error There is an invalid reference to QuickBooks Customer "
                "&quot;Nobody&quot; in the Customer" +
                    tail,
                "CustomerAddRs 3140 Error There is an invalid reference to QuickBooks Terms "
                "&quot;Net 30&quot; in the Customer" +
                    tail,
                "ItemInventoryAddRs 3140 Error There is an invalid reference to QuickBooks "
                "Account &quot;Revenue&quot; in the Item Inventory" +
                    tail,
                "ItemGroupAddRs 3140 Error There is an invalid reference to QuickBooks Item "
                "&quot;Kitchen Kit&quot; in the Item Group" +
                    tail,
                // The invoice whose second line failed was rolled back whole.
                "InvoiceQueryRs 1 Info A query request did not find a matching object in "
                "QuickBooks"}));
}

TEST_F(RequestHandlersTest, LineTaxCodesWhileSalesTaxIsOffGetQuickBooksTaxMessage) {
  newCompany(false);
  answer(std::string(kAcme) + std::string(kLaborAndKit));
  const std::string message =
      ".  QuickBooks error message: You can't set taxable if Sales tax is turned off or the item "
      "is not a taxable item type.";
  const std::string response = answer(
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><SalesTaxCodeRef><FullName>"
      "NON</FullName></SalesTaxCodeRef></InvoiceLineAdd></InvoiceAdd></InvoiceAddRq>"
      "<EstimateAddRq><EstimateAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<EstimateLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><SalesTaxCodeRef><FullName>"
      "NON</FullName></SalesTaxCodeRef></EstimateLineAdd></EstimateAdd></EstimateAddRq>"
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><Quantity>2</Quantity>"
      "</InvoiceLineAdd></InvoiceAdd></InvoiceAddRq>",
      "continueOnError");
  const std::vector<std::string> found = statuses(response);
  ASSERT_EQ(found.size(), 3u);
  EXPECT_EQ(found[0],
            "InvoiceAddRs 3140 Error There is an invalid reference to QuickBooks InvoiceLineItem "
            "SalesTaxCode &quot;NON&quot; in the Invoice line" +
                message);
  EXPECT_EQ(found[1],
            "EstimateAddRs 3140 Error There is an invalid reference to QuickBooks "
            "EstimateLineItem SalesTaxCode &quot;NON&quot; in the Estimate line" +
                message);
  // Without tax codes the invoice carries no tax at all.
  EXPECT_EQ(found[2], "InvoiceAddRs 0 Info Status OK");
  const std::string invoice = section(response, "InvoiceRet");
  EXPECT_EQ(texts(invoice, "SalesTaxPercentage"), std::vector<std::string>{"0.00"});
  EXPECT_EQ(texts(invoice, "SalesTaxTotal"), std::vector<std::string>{"0.00"});
  EXPECT_EQ(texts(invoice, "BalanceRemaining"), std::vector<std::string>{"170.00"});
  EXPECT_EQ(invoice.find("SalesTaxCodeRef"), std::string::npos);
  EXPECT_EQ(invoice.find("ItemSalesTaxRef"), std::string::npos);
}

TEST_F(RequestHandlersTest, QueriesReportMissingNamesWith500AndEmptyFiltersWith1) {
  answer(std::string(kAcme) +
         "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
         "<RefNumber>A-1</RefNumber></InvoiceAdd></InvoiceAddRq>");
  const std::string response = answer(
      "<CustomerQueryRq requestID=\"a\"><FullName>Nobody</FullName><FullName>acme</FullName>"
      "</CustomerQueryRq>"
      "<CustomerQueryRq><ListID>80000001-1</ListID></CustomerQueryRq>"
      "<AccountQueryRq><FullName>Tom&apos;s &quot;A&amp;B&quot;</FullName></AccountQueryRq>"
      "<ItemServiceQueryRq><FullName>State Tax</FullName></ItemServiceQueryRq>"
      "<PayrollItemWageQueryRq><FullName>Hourly</FullName></PayrollItemWageQueryRq>"
      "<PayrollItemWageQueryRq/>"
      "<InvoiceQueryRq><TxnID>9-1236008423</TxnID></InvoiceQueryRq>"
      "<InvoiceQueryRq><RefNumber>a-1</RefNumber><RefNumber>A-2</RefNumber></InvoiceQueryRq>"
      "<InvoiceQueryRq><RefNumberCaseSensitive>a-1</RefNumberCaseSensitive></InvoiceQueryRq>"
      "<CustomerQueryRq><ActiveStatus>InactiveOnly</ActiveStatus></CustomerQueryRq>",
      "continueOnError");
  const auto missing = [](const std::string& request, const std::string& value) {
    return request +
           " 500 Warn The query request has not been fully completed. There was a required "
           "element (&quot;" +
           value + "&quot;) that could not be found in QuickBooks.";
  };
  const std::string none = " 1 Info A query request did not find a matching object in QuickBooks";
  EXPECT_EQ(statuses(response),
            (std::vector<std::string>{
                missing("CustomerQueryRs", "Nobody"), missing("CustomerQueryRs", "80000001-1"),
                missing("AccountQueryRs", "Tom's &quot;A&amp;B&quot;"),
                // A sales tax item is no service item.
                missing("ItemServiceQueryRs", "State Tax"),
                missing("PayrollItemWageQueryRs", "Hourly"), "PayrollItemWageQueryRs" + none,
                missing("InvoiceQueryRs", "9-1236008423"), missing("InvoiceQueryRs", "A-2"),
                missing("InvoiceQueryRs", "a-1"), "CustomerQueryRs" + none}));
  // A warning still returns what was found.
  const std::string first = response.substr(0, response.find("</CustomerQueryRs>"));
  EXPECT_EQ(texts(first, "Name"), std::vector<std::string>{"Acme"});
  EXPECT_NE(response.find("<CustomerQueryRs requestID=\"a\" statusCode=\"500\""),
            std::string::npos);
  EXPECT_EQ(texts(response, "RefNumber"), std::vector<std::string>{"A-1"});
}

// --- onError ------------------------------------------------------------------------------

TEST_F(RequestHandlersTest, OnErrorDecidesWhetherLaterRequestsAreAnswered) {
  const std::string requests =
      "<CustomerAddRq requestID=\"1\"><CustomerAdd><Name>Acme</Name></CustomerAdd>"
      "</CustomerAddRq>"
      "<CustomerQueryRq requestID=\"2\"><FullName>Nobody</FullName></CustomerQueryRq>"
      "<CustomerAddRq requestID=\"3\"><CustomerAdd><Name>acme</Name></CustomerAdd>"
      "</CustomerAddRq>"
      "<CustomerAddRq requestID=\"4\"><CustomerAdd><Name>Bolt</Name></CustomerAdd>"
      "</CustomerAddRq>";
  // A warning does not stop; the first error does, and nothing after it is answered or done.
  const std::string stopped = answer(requests, "stopOnError");
  EXPECT_EQ(statuses(stopped).size(), 3u);
  EXPECT_EQ(stopped.find("requestID=\"4\""), std::string::npos);
  EXPECT_TRUE(
      stopped.ends_with("The name &quot;acme&quot; of the list element is already in "
                        "use.\" />\n</QBXMLMsgsRs>\n</QBXML>\n"));
  EXPECT_NE(answer("<CustomerQueryRq><FullName>Bolt</FullName></CustomerQueryRq>")
                .find("statusCode=\"500\""),
            std::string::npos);

  newCompany(true);
  const std::string continued = answer(requests, "continueOnError");
  EXPECT_EQ(statuses(continued).size(), 4u);
  EXPECT_NE(continued.find("<CustomerAddRs requestID=\"4\" statusCode=\"0\""), std::string::npos);

  // QuickBooks refuses rollbackOnError outright, before doing anything.
  newCompany(true);
  const ReadResult read =
      readRequest(document(requests, "rollbackOnError", "<?qbxml version=\"13.0\"?>"));
  ASSERT_TRUE(read.document);
  EXPECT_TRUE(test::raises([&] { answerRequests(company(), *read.document); },
                           static_cast<int32_t>(0x80040400u), u"QBXMLRP.RequestProcessor.1",
                           u"QuickBooks found an error when parsing the provided XML text "
                           u"stream."));
  EXPECT_NE(answer("<CustomerQueryRq/>").find("statusCode=\"1\""), std::string::npos);
}

// --- References, jobs ---------------------------------------------------------------------

TEST_F(RequestHandlersTest, ReferencesResolveByListIdOrByFullNameWithoutRegardToCase) {
  const std::string response = answer(
      std::string(kAcme) +
          "<CustomerAddRq><CustomerAdd><Name>Bolt</Name><SalesTaxCodeRef><ListID>" + listId(2) +
          "</ListID><FullName>Tax</FullName></SalesTaxCodeRef></CustomerAdd></CustomerAddRq>"
          "<InvoiceAddRq><InvoiceAdd><CustomerRef><ListID>" +
          listId(1) +
          "</ListID></CustomerRef><ARAccountRef><FullName>ACCOUNTS RECEIVABLE</FullName>"
          "</ARAccountRef></InvoiceAdd></InvoiceAddRq>"
          "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>bolt</FullName></CustomerRef>"
          "</InvoiceAdd></InvoiceAddRq>"
          // The right number with another creation time is another entry.
          "<InvoiceAddRq><InvoiceAdd><CustomerRef><ListID>80000001-1236008424</ListID>"
          "</CustomerRef></InvoiceAdd></InvoiceAddRq>",
      "continueOnError");
  const std::vector<std::string> found = statuses(response);
  ASSERT_EQ(found.size(), 5u);
  EXPECT_EQ(found[3], "InvoiceAddRs 0 Info Status OK");
  EXPECT_EQ(found[4].substr(0, 17), "InvoiceAddRs 3140");
  // ListID wins over FullName; a reference is written with both, as the entry has them.
  EXPECT_EQ(texts(section(response, "SalesTaxCodeRef", response.find("Bolt")), "FullName"),
            std::vector<std::string>{"NON"});
  const size_t first = response.find("<InvoiceRet>");
  EXPECT_EQ(texts(section(response, "CustomerRef", first), "FullName"),
            std::vector<std::string>{"Acme"});
  EXPECT_EQ(texts(section(response, "ARAccountRef", first), "FullName"),
            std::vector<std::string>{"Accounts Receivable"});
  EXPECT_EQ(
      texts(section(response, "CustomerRef", response.find("<InvoiceRet>", first + 1)), "ListID"),
      std::vector<std::string>{listId(2)});
}

TEST_F(RequestHandlersTest, JobsAreCustomersWithAParent) {
  const std::string response =
      answer(std::string(kAcme) + std::string(kLaborAndKit) +
             "<CustomerAddRq><CustomerAdd><Name>Zeta</Name></CustomerAdd></CustomerAddRq>"
             "<CustomerAddRq><CustomerAdd><Name>Kitchen</Name><ParentRef><FullName>Acme</FullName>"
             "</ParentRef></CustomerAdd></CustomerAddRq>"
             "<CustomerAddRq><CustomerAdd><Name>Kitchen</Name><ParentRef><FullName>Zeta</FullName>"
             "</ParentRef></CustomerAdd></CustomerAddRq>"
             "<CustomerAddRq><CustomerAdd><Name>Cabinets</Name><ParentRef><FullName>ACME:kitchen"
             "</FullName></ParentRef></CustomerAdd></CustomerAddRq>"
             "<CustomerAddRq><CustomerAdd><Name>Acme Annex</Name></CustomerAdd></CustomerAddRq>"
             "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme:Kitchen:Cabinets</FullName>"
             "</CustomerRef><InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef>"
             "<Amount>100.00</Amount></InvoiceLineAdd></InvoiceAdd></InvoiceAddRq>"
             "<CustomerQueryRq/>");
  const std::string query = section(response, "CustomerQueryRs");
  // Hierarchical order: a customer, its jobs, then the next customer.
  EXPECT_EQ(texts(query, "Name"), (std::vector<std::string>{"Acme", "Kitchen", "Cabinets",
                                                            "Acme Annex", "Zeta", "Kitchen"}));
  EXPECT_EQ(texts(query, "Sublevel"), (std::vector<std::string>{"0", "1", "2", "0", "0", "1"}));
  const std::vector<std::string> fullNames = texts(query, "FullName");
  EXPECT_EQ(std::count(fullNames.begin(), fullNames.end(), "Acme:Kitchen:Cabinets"), 1);
  EXPECT_EQ(std::count(fullNames.begin(), fullNames.end(), "Zeta:Kitchen"), 1);
  EXPECT_EQ(texts(section(query, "ParentRef", query.find("<Name>Cabinets</Name>")), "FullName"),
            std::vector<std::string>{"Acme:Kitchen"});
  // The job's invoice (100.00 and 7.5 % tax) is its balance and counts in its parents' totals.
  EXPECT_EQ(texts(query, "Balance"),
            (std::vector<std::string>{"0.00", "0.00", "107.50", "0.00", "0.00", "0.00"}));
  EXPECT_EQ(texts(query, "TotalBalance"),
            (std::vector<std::string>{"107.50", "107.50", "107.50", "0.00", "0.00", "0.00"}));
  // And in the accounts it went to.
  const std::string accounts = answer(
      "<AccountQueryRq><FullName>Accounts Receivable</FullName><FullName>Sales Tax Payable"
      "</FullName></AccountQueryRq>");
  EXPECT_EQ(texts(accounts, "Balance"), (std::vector<std::string>{"107.50", "7.50"}));
}

// --- Pricing and sales tax ----------------------------------------------------------------

TEST_F(RequestHandlersTest, LinesArePricedAndTaxedAsQuickBooksDoes) {
  answer(std::string(kAcme) + std::string(kLaborAndKit) +
         "<ItemDiscountAddRq><ItemDiscountAdd><Name>Loyalty</Name><ItemDesc>Loyalty discount"
         "</ItemDesc><DiscountRatePercent>10</DiscountRatePercent><AccountRef><FullName>Sales"
         "</FullName></AccountRef></ItemDiscountAdd></ItemDiscountAddRq>"
         "<ItemSalesTaxAddRq><ItemSalesTaxAdd><Name>County</Name><TaxRate>1.25</TaxRate>"
         "</ItemSalesTaxAdd></ItemSalesTaxAddRq>"
         "<ItemSalesTaxGroupAddRq><ItemSalesTaxGroupAdd><Name>Combined</Name><ItemSalesTaxRef>"
         "<FullName>State Tax</FullName></ItemSalesTaxRef><ItemSalesTaxRef><FullName>County"
         "</FullName></ItemSalesTaxRef></ItemSalesTaxGroupAdd></ItemSalesTaxGroupAddRq>"
         "<CustomerAddRq><CustomerAdd><Name>Exempt Co</Name><SalesTaxCodeRef><FullName>Non"
         "</FullName></SalesTaxCodeRef></CustomerAdd></CustomerAddRq>"
         "<ItemInventoryAddRq><ItemInventoryAdd><Name>Tile</Name><SalesPrice>40</SalesPrice>"
         "<PurchaseCost>25</PurchaseCost></ItemInventoryAdd></ItemInventoryAddRq>");
  const std::string response = answer(
      // Quantity times rate; the item's price; a given amount with no rate; a discount of the
      // line before; a subtotal; a group twice over; a sales tax group's summed rate.
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<ItemSalesTaxRef><FullName>Combined</FullName></ItemSalesTaxRef>"
      "<InvoiceLineAdd><ItemRef><FullName>Nails</FullName></ItemRef><Quantity>3</Quantity>"
      "<Rate>0.33333</Rate></InvoiceLineAdd>"
      "<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><Quantity>2.5</Quantity>"
      "</InvoiceLineAdd>"
      "<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><Quantity>4</Quantity>"
      "<Amount>300.00</Amount></InvoiceLineAdd>"
      "<InvoiceLineAdd><ItemRef><FullName>Loyalty</FullName></ItemRef></InvoiceLineAdd>"
      "<InvoiceLineAdd><ItemRef><FullName>Subtotal</FullName></ItemRef></InvoiceLineAdd>"
      "<InvoiceLineGroupAdd><ItemGroupRef><FullName>Kitchen Kit</FullName></ItemGroupRef>"
      "<Quantity>2</Quantity></InvoiceLineGroupAdd>"
      "</InvoiceAdd></InvoiceAddRq>"
      // A customer whose tax code is not taxable pays no tax; an estimate has a total; a
      // markup prices an item at its cost plus the markup.
      "<EstimateAddRq><EstimateAdd><CustomerRef><FullName>Exempt Co</FullName></CustomerRef>"
      "<EstimateLineAdd><ItemRef><FullName>Labor</FullName></ItemRef></EstimateLineAdd>"
      "<EstimateLineAdd><ItemRef><FullName>Tile</FullName></ItemRef><Quantity>2</Quantity>"
      "<MarkupRatePercent>15</MarkupRatePercent></EstimateLineAdd>"
      "<EstimateLineAdd><ItemRef><FullName>Tile</FullName></ItemRef><MarkupRate>5"
      "</MarkupRate></EstimateLineAdd></EstimateAdd></EstimateAddRq>"
      // Tax is rounded once on the taxable total, half away from zero.
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<InvoiceLineAdd><Desc>Odd job</Desc><Amount>0.10</Amount><SalesTaxCodeRef><FullName>Tax"
      "</FullName></SalesTaxCodeRef></InvoiceLineAdd></InvoiceAdd></InvoiceAddRq>");
  const std::string invoice = section(response, "InvoiceAddRs");
  EXPECT_EQ(texts(invoice, "Amount"),
            (std::vector<std::string>{"1.00", "212.50", "300.00", "-30.00", "483.50", "340.00",
                                      "25.00"}));
  EXPECT_EQ(texts(invoice, "Rate"),
            (std::vector<std::string>{"0.33333", "85.00", "75.00", "85.00", "0.125"}));
  EXPECT_EQ(texts(invoice, "RatePercent"), std::vector<std::string>{"10.00"});
  EXPECT_EQ(texts(invoice, "Desc"),
            (std::vector<std::string>{"Box of nails", "Labor, per hour", "Labor, per hour",
                                      "Loyalty discount", "Subtotal", "Kitchen fitting kit",
                                      "Labor, per hour", "Box of nails"}));
  EXPECT_EQ(texts(invoice, "Quantity"),
            (std::vector<std::string>{"3", "2.5", "4", "2", "4", "200"}));
  EXPECT_EQ(texts(invoice, "TotalAmount"), std::vector<std::string>{"365.00"});
  // 848.50 of lines, all taxable, at 7.5 % + 1.25 % = 74.24375.
  EXPECT_EQ(texts(invoice, "Subtotal"), std::vector<std::string>{"848.50"});
  EXPECT_EQ(texts(invoice, "SalesTaxPercentage"), std::vector<std::string>{"8.75"});
  EXPECT_EQ(texts(invoice, "SalesTaxTotal"), std::vector<std::string>{"74.24"});
  EXPECT_EQ(texts(invoice, "BalanceRemaining"), std::vector<std::string>{"922.74"});

  const std::string estimate = section(response, "EstimateRet");
  EXPECT_EQ(texts(estimate, "Rate"), (std::vector<std::string>{"85.00", "28.75", "30.00"}));
  EXPECT_EQ(texts(estimate, "Amount"), (std::vector<std::string>{"85.00", "57.50", "30.00"}));
  EXPECT_EQ(texts(estimate, "Subtotal"), std::vector<std::string>{"172.50"});
  EXPECT_EQ(texts(estimate, "SalesTaxTotal"), std::vector<std::string>{"0.00"});
  EXPECT_EQ(texts(estimate, "TotalAmount"), std::vector<std::string>{"172.50"});
  EXPECT_EQ(texts(section(estimate, "CustomerSalesTaxCodeRef"), "FullName"),
            std::vector<std::string>{"NON"});

  const std::string small = section(response, "InvoiceRet", response.find("</EstimateAddRs>"));
  EXPECT_EQ(texts(small, "SalesTaxTotal"), std::vector<std::string>{"0.01"});  // 0.0075
  EXPECT_EQ(texts(small, "RefNumber"), std::vector<std::string>{"2"});
}

TEST_F(RequestHandlersTest, TransactionsNumberThemselvesAndTakeTheCustomersDefaults) {
  answer(
      "<CustomerAddRq><CustomerAdd><Name>Acme</Name><BillAddress><Addr1>1 Main St</Addr1>"
      "</BillAddress><ShipAddress><Addr1>Dock 4</Addr1></ShipAddress></CustomerAdd>"
      "</CustomerAddRq>");
  const std::string response = answer(
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<RefNumber>INV-0999</RefNumber></InvoiceAdd></InvoiceAddRq>"
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<BillAddress><Addr1>Other</Addr1></BillAddress></InvoiceAdd></InvoiceAddRq>"
      "<EstimateAddRq><EstimateAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<EstimateLineAdd><Desc>Survey</Desc></EstimateLineAdd></EstimateAdd></EstimateAddRq>"
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
      "<RefNumber>123456789012</RefNumber></InvoiceAdd></InvoiceAddRq>",
      "continueOnError");
  EXPECT_EQ(texts(response, "RefNumber"), (std::vector<std::string>{"INV-0999", "INV-1000", "1"}));
  EXPECT_EQ(texts(response, "TxnID"),
            (std::vector<std::string>{"1-1236008423", "2-1236008423", "3-1236008423"}));
  EXPECT_EQ(texts(response, "TxnLineID"), std::vector<std::string>{"4-1236008423"});
  EXPECT_EQ(texts(response, "TxnNumber"), (std::vector<std::string>{"1", "2", "3"}));
  EXPECT_EQ(texts(response, "TxnDate"),
            (std::vector<std::string>{"2009-03-02", "2009-03-02", "2009-03-02"}));
  EXPECT_EQ(texts(response, "Addr1"), (std::vector<std::string>{"1 Main St", "Dock 4", "Other",
                                                                "Dock 4", "1 Main St", "Dock 4"}));
  ASSERT_EQ(statuses(response).size(), 4u);
  EXPECT_EQ(statuses(response)[3],
            "InvoiceAddRs 3070 Error The string &quot;123456789012&quot; in the field "
            "&quot;RefNumber&quot; is too long.");
}

// --- Query filters ------------------------------------------------------------------------

TEST_F(RequestHandlersTest, ListFiltersSelectByActivityModificationNameAndCount) {
  answer(
      "<CustomerAddRq><CustomerAdd><Name>Acme</Name></CustomerAdd></CustomerAddRq>"
      "<CustomerAddRq><CustomerAdd><Name>Bolt</Name><IsActive>0</IsActive></CustomerAdd>"
      "</CustomerAddRq>");
  setNow("2009-03-05T09:00:00-05:00");
  answer(
      "<CustomerAddRq><CustomerAdd><Name>Cobalt</Name></CustomerAdd></CustomerAddRq>"
      "<CustomerAddRq><CustomerAdd><Name>Delta</Name></CustomerAdd></CustomerAddRq>");
  const auto names = [&](const std::string& filter) {
    return texts(answer("<CustomerQueryRq>" + filter + "</CustomerQueryRq>"), "Name");
  };
  using Names = std::vector<std::string>;
  EXPECT_EQ(names(""), (Names{"Acme", "Cobalt", "Delta"}));
  EXPECT_EQ(names("<ActiveStatus>InactiveOnly</ActiveStatus>"), Names{"Bolt"});
  EXPECT_EQ(names("<ActiveStatus>All</ActiveStatus>"), (Names{"Acme", "Bolt", "Cobalt", "Delta"}));
  // Inactive entries are found by name whatever their status.
  EXPECT_EQ(names("<FullName>Bolt</FullName>"), Names{"Bolt"});
  // Both ends of a date range count; a date alone covers its whole day.
  EXPECT_EQ(names("<FromModifiedDate>2009-03-05</FromModifiedDate>"), (Names{"Cobalt", "Delta"}));
  EXPECT_EQ(names("<ActiveStatus>All</ActiveStatus><ToModifiedDate>2009-03-02</ToModifiedDate>"),
            (Names{"Acme", "Bolt"}));
  EXPECT_EQ(names("<FromModifiedDate>2009-03-05T09:00:00-05:00</FromModifiedDate>"
                  "<ToModifiedDate>2009-03-05T09:00:00</ToModifiedDate>"),
            (Names{"Cobalt", "Delta"}));
  EXPECT_EQ(names("<FromModifiedDate>2009-03-05T09:00:01-05:00</FromModifiedDate>"), Names{});
  EXPECT_EQ(names("<FromModifiedDate>2009-03-02T15:40:23+00:00</FromModifiedDate>"
                  "<ToModifiedDate>2009-03-02T10:40:23-05:00</ToModifiedDate>"),
            Names{"Acme"});
  EXPECT_EQ(names("<MaxReturned>2</MaxReturned>"), (Names{"Acme", "Cobalt"}));
  EXPECT_EQ(names("<NameFilter><MatchCriterion>Contains</MatchCriterion><Name>LT</Name>"
                  "</NameFilter>"),
            (Names{"Cobalt", "Delta"}));
  EXPECT_EQ(names("<NameFilter><MatchCriterion>StartsWith</MatchCriterion><Name>a</Name>"
                  "</NameFilter>"),
            Names{"Acme"});
  EXPECT_EQ(names("<ActiveStatus>All</ActiveStatus><NameRangeFilter><FromName>B</FromName>"
                  "<ToName>C</ToName></NameRangeFilter>"),
            (Names{"Bolt", "Cobalt"}));
  // IncludeRetElement keeps only the elements it names.
  const std::string trimmed = answer(
      "<CustomerQueryRq><FullName>Acme</FullName><IncludeRetElement>ListID"
      "</IncludeRetElement><IncludeRetElement>Name</IncludeRetElement></CustomerQueryRq>");
  EXPECT_EQ(shape(trimmed, "CustomerRet"), "ListID,Name");
  const std::string accounts = answer(
      "<AccountQueryRq><AccountType>OtherCurrentAsset</AccountType><AccountType>Income"
      "</AccountType></AccountQueryRq>");
  EXPECT_EQ(texts(accounts, "Name"), (Names{"Inventory Asset", "Undeposited Funds", "Sales"}));
  const std::string items = answer(std::string(kLaborAndKit) + "<ItemQueryRq/>");
  EXPECT_EQ(texts(section(items, "ItemQueryRs"), "Name"),
            (Names{"Labor", "Nails", "Subtotal", "Kitchen Kit", "State Tax"}));
  EXPECT_EQ(texts(answer("<ItemGroupQueryRq/>"), "Name"), Names{"Kitchen Kit"});
}

TEST_F(RequestHandlersTest, TransactionFiltersSelectByDateCustomerAndPayment) {
  answer(std::string(kAcme) + std::string(kLaborAndKit) +
         "<CustomerAddRq><CustomerAdd><Name>Kitchen</Name><ParentRef><FullName>Acme</FullName>"
         "</ParentRef></CustomerAdd></CustomerAddRq>"
         "<CustomerAddRq><CustomerAdd><Name>Bolt</Name></CustomerAdd></CustomerAddRq>"
         "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
         "<TxnDate>2009-01-10</TxnDate><InvoiceLineAdd><ItemRef><FullName>Labor</FullName>"
         "</ItemRef></InvoiceLineAdd></InvoiceAdd></InvoiceAddRq>"
         "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme:Kitchen</FullName></CustomerRef>"
         "<TxnDate>2009-02-10</TxnDate></InvoiceAdd></InvoiceAddRq>");
  setNow("2009-03-09T08:00:00-05:00");
  answer(
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Bolt</FullName></CustomerRef>"
      "<TxnDate>2009-03-10</TxnDate><InvoiceLineAdd><ItemRef><FullName>Labor</FullName>"
      "</ItemRef></InvoiceLineAdd></InvoiceAdd></InvoiceAddRq>");
  const auto refs = [&](const std::string& filter) {
    return texts(answer("<InvoiceQueryRq>" + filter + "</InvoiceQueryRq>"), "RefNumber");
  };
  using Refs = std::vector<std::string>;
  EXPECT_EQ(refs(""), (Refs{"1", "2", "3"}));
  EXPECT_EQ(refs("<MaxReturned>1</MaxReturned>"), Refs{"1"});
  EXPECT_EQ(refs("<ModifiedDateRangeFilter><FromModifiedDate>2009-03-03</FromModifiedDate>"
                 "</ModifiedDateRangeFilter>"),
            Refs{"3"});
  EXPECT_EQ(refs("<TxnDateRangeFilter><FromTxnDate>2009-02-10</FromTxnDate><ToTxnDate>"
                 "2009-03-10</ToTxnDate></TxnDateRangeFilter>"),
            (Refs{"2", "3"}));
  EXPECT_EQ(refs("<EntityFilter><FullName>Acme</FullName></EntityFilter>"), Refs{"1"});
  EXPECT_EQ(refs("<EntityFilter><FullNameWithChildren>Acme</FullNameWithChildren>"
                 "</EntityFilter>"),
            (Refs{"1", "2"}));
  EXPECT_EQ(refs("<EntityFilter><ListIDWithChildren>" + listId(1) +
                 "</ListIDWithChildren></EntityFilter>"),
            (Refs{"1", "2"}));
  // The invoice without lines has nothing to pay.
  EXPECT_EQ(refs("<PaidStatus>PaidOnly</PaidStatus>"), Refs{"2"});
  EXPECT_EQ(refs("<PaidStatus>NotPaidOnly</PaidStatus>"), (Refs{"1", "3"}));
  // Lines only when asked for.
  EXPECT_EQ(
      answer("<InvoiceQueryRq><RefNumber>1</RefNumber></InvoiceQueryRq>").find("InvoiceLineRet"),
      std::string::npos);
  EXPECT_EQ(texts(answer("<InvoiceQueryRq><RefNumber>1</RefNumber><IncludeLineItems>true"
                         "</IncludeLineItems></InvoiceQueryRq>"),
                  "TxnLineID"),
            std::vector<std::string>{"2-1236008423"});
}

// --- Text and versions --------------------------------------------------------------------

TEST_F(RequestHandlersTest, TextIsKeptInIso88591AndEscapedAsQuickBooksWritesIt) {
  const std::string response = answer(
      "<CustomerAddRq requestID=\"&quot;1&quot;\"><CustomerAdd><Name>Caf&#233; 5&#8364; "
      "&#x1F600;</Name><Notes>Tom's &lt;b&gt; &amp; \"q\"</Notes></CustomerAdd></CustomerAddRq>"
      "<CustomerQueryRq><FullName>Caf\xC3\xA9 5\xE2\x82\xAC ?</FullName></CustomerQueryRq>");
  EXPECT_EQ(texts(response, "Name"),
            (std::vector<std::string>{"Caf\xC3\xA9 5? ?", "Caf\xC3\xA9 5? ?"}));
  EXPECT_EQ(texts(response, "Notes")[0], "Tom's &lt;b> &amp; \"q\"");
  EXPECT_NE(response.find("<CustomerAddRs requestID=\"&quot;1&quot;\" statusCode=\"0\""),
            std::string::npos);
  EXPECT_TRUE(response.starts_with("<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n"));
  EXPECT_EQ(response.find('\r'), std::string::npos);
  EXPECT_EQ(response.find("\n\n"), std::string::npos);
  EXPECT_EQ(response.find("\n "), std::string::npos);
}

TEST_F(RequestHandlersTest, OlderQbxmlVersionsGetOnlyTheElementsTheyKnew) {
  answer(std::string(kAcme) + std::string(kLaborAndKit) +
         "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
         "<InvoiceLineGroupAdd><ItemGroupRef><FullName>Kitchen Kit</FullName></ItemGroupRef>"
         "</InvoiceLineGroupAdd></InvoiceAdd></InvoiceAddRq>");
  const std::string requests =
      "<InvoiceQueryRq><IncludeLineItems>true</IncludeLineItems></InvoiceQueryRq>"
      "<AccountQueryRq><FullName>Accounts Receivable</FullName></AccountQueryRq>";
  const std::string v13 = answer(requests);
  const std::string v1 = answer(requests, "stopOnError",
                                "<!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.0//EN\" >");
  const std::string v2 = answer(requests, "stopOnError", "<?qbxml version=\"2.0\"?>");
  for (const std::string element : {"IsPaid", "IsToBeEmailed", "SpecialAccountType"}) {
    EXPECT_EQ(texts(v13, element).size(), 1u) << element;
    EXPECT_EQ(texts(v1, element).size(), 0u) << element;
  }
  EXPECT_EQ(texts(v2, "IsPaid").size(), 1u);
  EXPECT_EQ(texts(v2, "SpecialAccountType").size(), 0u);
  // A line group's own TxnLineID came with qbXML 2.1; its lines always had theirs.
  EXPECT_EQ(texts(v13, "TxnLineID").size(), 3u);
  EXPECT_EQ(texts(v2, "TxnLineID").size(), 2u);
}

// --- Real QuickBooks responses and the schema ---------------------------------------------

std::string realResponse(const std::string& name) {
  return test::readFile(kShared / "qbxml" / "responses" / name);
}

TEST_F(RequestHandlersTest, RecordsHaveTheShapeOfQuickBooksOwnResponses) {
  if (!std::filesystem::exists(kShared / "qbxml" / "responses")) {
    GTEST_SKIP() << "no real responses at " << kShared;
  }
  // Customer adds of companies without sales tax, with the same fields set.
  newCompany(false);
  const std::string joe = answer(
      "<CustomerAddRq><CustomerAdd><Name>Joseph Customer</Name><CompanyName>Joes Garage"
      "</CompanyName><Salutation>Mr</Salutation><FirstName>Joe</FirstName><LastName>Customer"
      "</LastName><BillAddress><Addr1>123 Main St.</Addr1><City>Mountain View</City><State>CA"
      "</State><PostalCode>94566</PostalCode></BillAddress><Email>joecustomer@gmail.com</Email>"
      "<AccountNumber>89087</AccountNumber><CreditLimit>2000.00</CreditLimit></CustomerAdd>"
      "</CustomerAddRq>");
  const std::string real = realResponse("CustomerAddRs__qbwc-gem_test_helper.xml");
  EXPECT_EQ(shape(joe, "CustomerRet"), shape(real, "CustomerRet"));
  EXPECT_EQ(texts(joe, "JobStatus"), texts(real, "JobStatus"));
  EXPECT_EQ(texts(joe, "TotalBalance"), texts(real, "TotalBalance"));
  const std::string keith = answer(
      "<CustomerAddRq><CustomerAdd><Name>20706 - Eastern XYZ University</Name><CompanyName>"
      "Eastern XYZ University</CompanyName><FirstName>Keith</FirstName><LastName>Palmer"
      "</LastName><BillAddress><Addr1>Eastern XYZ University</Addr1><Addr2>College of "
      "Engineering</Addr2><Addr3>123 XYZ Road</Addr3><City>Storrs-Mansfield</City><State>CT"
      "</State><PostalCode>88130</PostalCode><Country>USA</Country></BillAddress><Phone>"
      "860-634-1602</Phone><AltPhone>860-429-0021</AltPhone><Fax>860-429-5183</Fax><Email>"
      "keith@consolibyte.com</Email><Contact>Keith Palmer</Contact></CustomerAdd>"
      "</CustomerAddRq>");
  EXPECT_EQ(shape(keith, "CustomerRet"),
            shape(realResponse("qbxml-gem__customer_add_rs.xml"), "CustomerRet"));

  // An inventory part as QuickBooks completes it.
  newCompany(true);
  const std::string part = answer(
      "<ItemInventoryAddRq><ItemInventoryAdd><Name>product name here</Name><SalesDesc>your "
      "sales description here</SalesDesc><SalesPrice>85</SalesPrice><IncomeAccountRef>"
      "<FullName>Sales</FullName></IncomeAccountRef><COGSAccountRef><FullName>Cost of Goods "
      "Sold</FullName></COGSAccountRef><AssetAccountRef><FullName>Inventory Asset</FullName>"
      "</AssetAccountRef></ItemInventoryAdd></ItemInventoryAddRq>");
  const std::string realPart = realResponse("qbxml-gem__item_inventory_add_rs.xml");
  EXPECT_EQ(shape(part, "ItemInventoryRet"), shape(realPart, "ItemInventoryRet"));
  for (const std::string element :
       {"SalesPrice", "PurchaseCost", "QuantityOnHand", "AverageCost", "QuantityOnOrder"}) {
    EXPECT_EQ(texts(part, element), texts(realPart, element)) << element;
  }

  // Estimates and invoices, leaving out the templates and printed address blocks the stand-in
  // does not keep.
  const std::set<std::string> notKept{"TemplateRef", "BillAddressBlock"};
  const std::string estimate = answer(
      "<CustomerAddRq><CustomerAdd><Name>176007582 - Eastern XYZ University</Name><BillAddress>"
      "<Addr1>Eastern XYZ University</Addr1><Addr2>College of Engineering</Addr2><Addr3>123 XYZ "
      "Road</Addr3><City>Storrs-Mansfield</City><State>CT</State><PostalCode>06268</PostalCode>"
      "<Country>USA</Country></BillAddress></CustomerAdd></CustomerAddRq>" +
      std::string(kLaborAndKit) +
      "<EstimateAddRq><EstimateAdd><CustomerRef><FullName>176007582 - Eastern XYZ University"
      "</FullName></CustomerRef><EstimateLineAdd><ItemRef><FullName>Labor</FullName></ItemRef>"
      "<Desc>Test Estimate Line Item</Desc><Quantity>2</Quantity><Rate>1.00</Rate>"
      "</EstimateLineAdd><EstimateLineAdd><ItemRef><FullName>Nails</FullName></ItemRef>"
      "<Desc>Test Estimate 2</Desc><Quantity>4</Quantity><Rate>1.00</Rate></EstimateLineAdd>"
      "<EstimateLineAdd><Desc>Test Esitmate 3</Desc></EstimateLineAdd>"
      "</EstimateAdd></EstimateAddRq>");
  const std::string realEstimate =
      realResponse("EstimateQueryRs__php-qbwc-tester_index-512729409.xml");
  EXPECT_EQ(shape(estimate, "EstimateRet", notKept), shape(realEstimate, "EstimateRet", notKept));
  for (const std::string element : {"Desc", "Quantity", "Rate", "Amount", "Subtotal"}) {
    EXPECT_EQ(texts(section(estimate, "EstimateRet"), element), texts(realEstimate, element))
        << element;
  }

  const std::string invoice = answer(
      "<ItemServiceAddRq><ItemServiceAdd><Name>Awesome</Name><SalesTaxCodeRef><FullName>Non"
      "</FullName></SalesTaxCodeRef><SalesOrPurchase><Price>10</Price></SalesOrPurchase>"
      "</ItemServiceAdd></ItemServiceAddRq>"
      "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>176007582 - Eastern XYZ University"
      "</FullName></CustomerRef><InvoiceLineAdd><ItemRef><FullName>Awesome</FullName>"
      "</ItemRef><Quantity>1</Quantity></InvoiceLineAdd></InvoiceAdd></InvoiceAddRq>");
  const std::string realInvoice =
      realResponse("InvoiceQueryRs__ruby-fixture_index-31094748425.xml");
  EXPECT_EQ(shape(invoice, "InvoiceLineRet"), shape(realInvoice, "InvoiceLineRet"));
  for (const std::string element : {"Quantity", "Rate", "Amount", "Subtotal", "AppliedAmount",
                                    "BalanceRemaining", "IsPaid", "IsToBePrinted"}) {
    EXPECT_EQ(texts(invoice, element), texts(realInvoice, element)) << element;
  }
}

TEST_F(RequestHandlersTest, EveryResponseKindValidatesAgainstTheQbxmlSchema) {
  const std::filesystem::path schema = kShared / "qbxml" / "xsd" / "qbxmlops130.xsd";
  if (!std::filesystem::exists(schema)) GTEST_SKIP() << "no qbXML schema at " << schema;
  if (std::system("xmllint --version > /dev/null 2>&1") != 0) GTEST_SKIP() << "no xmllint";

  const std::string response = answer(
      "<CustomerAddRq requestID=\"1\"><CustomerAdd><Name>Acme</Name><IsActive>true</IsActive>"
      "<CompanyName>Acme Inc</CompanyName><Salutation>Ms</Salutation><FirstName>Ann</FirstName>"
      "<LastName>Lee</LastName><BillAddress><Addr1>1 Main St</Addr1><City>Springfield</City>"
      "<State>IL</State><PostalCode>62701</PostalCode><Country>USA</Country><Note>Rear</Note>"
      "</BillAddress><ShipAddress><Addr1>Dock 4</Addr1></ShipAddress><Phone>555-0100</Phone>"
      "<Fax>555-0101</Fax><Email>ann@example.com</Email><Contact>Ann Lee</Contact>"
      "<OpenBalance>10.00</OpenBalance><OpenBalanceDate>2009-01-01</OpenBalanceDate>"
      "<ResaleNumber>R-1</ResaleNumber><AccountNumber>A-1</AccountNumber><CreditLimit>500.00"
      "</CreditLimit><JobStatus>Awarded</JobStatus><JobStartDate>2009-03-01</JobStartDate>"
      "<JobDesc>Renovation</JobDesc><Notes>Call first</Notes></CustomerAdd></CustomerAddRq>"
      "<CustomerAddRq><CustomerAdd><Name>Kitchen</Name><ParentRef><FullName>Acme</FullName>"
      "</ParentRef></CustomerAdd></CustomerAddRq>"
      "<AccountAddRq><AccountAdd><Name>Checking</Name><AccountType>Bank</AccountType>"
      "<AccountNumber>1000</AccountNumber><Desc>Main account</Desc><OpenBalance>250.00"
      "</OpenBalance></AccountAdd></AccountAddRq>"
      "<AccountAddRq><AccountAdd><Name>Payroll</Name><ParentRef><FullName>Checking</FullName>"
      "</ParentRef><AccountType>Bank</AccountType></AccountAdd></AccountAddRq>" +
          std::string(kLaborAndKit) +
          "<ItemOtherChargeAddRq><ItemOtherChargeAdd><Name>Freight</Name><SalesAndPurchase>"
          "<SalesDesc>Freight</SalesDesc><SalesPrice>12.5</SalesPrice><IncomeAccountRef><FullName>"
          "Sales</FullName></IncomeAccountRef><PurchaseDesc>Carrier</PurchaseDesc><PurchaseCost>10"
          "</PurchaseCost><ExpenseAccountRef><FullName>Job Expenses</FullName></ExpenseAccountRef>"
          "</SalesAndPurchase></ItemOtherChargeAdd></ItemOtherChargeAddRq>"
          "<ItemInventoryAddRq><ItemInventoryAdd><Name>Tile</Name><SalesDesc>Tile, box</SalesDesc>"
          "<SalesPrice>40</SalesPrice><IncomeAccountRef><FullName>Sales</FullName>"
          "</IncomeAccountRef><PurchaseCost>25</PurchaseCost><COGSAccountRef><FullName>Cost of "
          "Goods Sold</FullName></COGSAccountRef><AssetAccountRef><FullName>Inventory Asset"
          "</FullName></AssetAccountRef><ReorderPoint>5</ReorderPoint><QuantityOnHand>12"
          "</QuantityOnHand><TotalValue>300.00</TotalValue><InventoryDate>2009-01-01"
          "</InventoryDate></ItemInventoryAdd></ItemInventoryAddRq>"
          "<ItemDiscountAddRq><ItemDiscountAdd><Name>Loyalty</Name><ItemDesc>Loyalty discount"
          "</ItemDesc><DiscountRatePercent>10</DiscountRatePercent><AccountRef><FullName>Sales"
          "</FullName></AccountRef></ItemDiscountAdd></ItemDiscountAddRq>"
          "<ItemPaymentAddRq><ItemPaymentAdd><Name>Deposit</Name><ItemDesc>Deposit received"
          "</ItemDesc><DepositToAccountRef><FullName>Undeposited Funds</FullName>"
          "</DepositToAccountRef></ItemPaymentAdd></ItemPaymentAddRq>"
          "<ItemSalesTaxAddRq><ItemSalesTaxAdd><Name>County</Name><ItemDesc>County tax</ItemDesc>"
          "<TaxRate>1.25</TaxRate></ItemSalesTaxAdd></ItemSalesTaxAddRq>"
          "<ItemSalesTaxGroupAddRq><ItemSalesTaxGroupAdd><Name>Combined</Name><ItemSalesTaxRef>"
          "<FullName>State Tax</FullName></ItemSalesTaxRef><ItemSalesTaxRef><FullName>County"
          "</FullName></ItemSalesTaxRef></ItemSalesTaxGroupAdd></ItemSalesTaxGroupAddRq>"
          "<EstimateAddRq><EstimateAdd><CustomerRef><FullName>Acme:Kitchen</FullName></CustomerRef>"
          "<TxnDate>2009-03-02</TxnDate><PONumber>PO-7</PONumber><Memo>First estimate</Memo>"
          "<EstimateLineGroupAdd><ItemGroupRef><FullName>Kitchen Kit</FullName></ItemGroupRef>"
          "</EstimateLineGroupAdd><EstimateLineAdd><ItemRef><FullName>Loyalty</FullName></ItemRef>"
          "</EstimateLineAdd><EstimateLineAdd><ItemRef><FullName>Tile</FullName></ItemRef>"
          "<Quantity>2</Quantity><MarkupRatePercent>15</MarkupRatePercent></EstimateLineAdd>"
          "</EstimateAdd></EstimateAddRq>"
          "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Acme</FullName></CustomerRef>"
          "<IsPending>false</IsPending><PONumber>PO-8</PONumber><FOB>Works</FOB><ItemSalesTaxRef>"
          "<FullName>Combined</FullName></ItemSalesTaxRef><Memo>First invoice</Memo>"
          "<InvoiceLineGroupAdd><ItemGroupRef><FullName>Kitchen Kit</FullName></ItemGroupRef>"
          "<Quantity>2</Quantity><ServiceDate>2009-03-01</ServiceDate></InvoiceLineGroupAdd>"
          "<InvoiceLineAdd><ItemRef><FullName>Freight</FullName></ItemRef><ServiceDate>2009-03-02"
          "</ServiceDate></InvoiceLineAdd><InvoiceLineAdd><ItemRef><FullName>Subtotal</FullName>"
          "</ItemRef></InvoiceLineAdd><InvoiceLineAdd><ItemRef><FullName>Deposit</FullName>"
          "</ItemRef><Amount>-50.00</Amount></InvoiceLineAdd></InvoiceAdd></InvoiceAddRq>"
          "<CustomerQueryRq><ActiveStatus>All</ActiveStatus></CustomerQueryRq>"
          "<CustomerQueryRq><FullName>Nobody</FullName><FullName>Acme</FullName></CustomerQueryRq>"
          "<AccountQueryRq/>"
          "<ItemQueryRq/><ItemServiceQueryRq/><ItemNonInventoryQueryRq/><ItemOtherChargeQueryRq/>"
          "<ItemInventoryQueryRq/><ItemDiscountQueryRq/><ItemSubtotalQueryRq/><ItemGroupQueryRq/>"
          "<ItemPaymentQueryRq/><ItemSalesTaxQueryRq/><ItemSalesTaxGroupQueryRq/>"
          "<PayrollItemWageQueryRq/>"
          "<EstimateQueryRq><IncludeLineItems>true</IncludeLineItems></EstimateQueryRq>"
          "<InvoiceQueryRq><IncludeLineItems>true</IncludeLineItems></InvoiceQueryRq>"
          "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Nobody</FullName></CustomerRef>"
          "</InvoiceAdd></InvoiceAddRq>",
      "continueOnError");
  std::set<std::string> kinds;
  for (const std::string& status : statuses(response)) {
    kinds.insert(status.substr(0, status.find(' ')));
    EXPECT_TRUE(status.find(" Error ") == std::string::npos ||
                status.starts_with("InvoiceAddRs 3140"))
        << status;
  }
  EXPECT_EQ(kinds.size(), 30u);
  // The group comes first in the invoice, as it was asked for.
  const std::string invoice = section(response, "InvoiceRet");
  EXPECT_LT(invoice.find("<InvoiceLineGroupRet>"), invoice.find("<InvoiceLineRet>\n<TxnLineID>"));

  const std::filesystem::path file = folder_ / "response.xml";
  test::writeFile(file, response);
  const std::string command = "xmllint --noout --schema '" + schema.string() + "' '" +
                              file.string() + "' > '" + (folder_ / "xmllint.txt").string() +
                              "' 2>&1";
  EXPECT_EQ(std::system(command.c_str()), 0) << test::readFile(folder_ / "xmllint.txt");
}

// --- Size of a company file ---------------------------------------------------------------

TEST_F(RequestHandlersTest, CompanyFileStaysSmall) {
  const std::filesystem::path path = folder_ / "company1.qbw";
  answer(std::string(kLaborAndKit));
  const auto size = [&] { return static_cast<double>(std::filesystem::file_size(path)); };
  constexpr int kCustomers = 400;
  std::string customers;
  for (int i = 0; i < kCustomers; ++i) {
    const std::string n = std::to_string(i);
    customers += "<CustomerAddRq><CustomerAdd><Name>Customer " + n +
                 "</Name><CompanyName>Company " + n + "</CompanyName><BillAddress><Addr1>" + n +
                 " Main Street</Addr1><City>"
                 "Springfield</City><State>IL</State><PostalCode>62701</PostalCode></BillAddress>"
                 "<Phone>555-0100</Phone></CustomerAdd></CustomerAddRq>";
  }
  const double beforeCustomers = size();
  answer(customers);
  const double perCustomer = (size() - beforeCustomers) / kCustomers;

  // Invoices of one line and of eleven: the difference is ten lines.
  constexpr int kInvoices = 200;
  const auto invoices = [&](int lines) {
    std::string requests;
    for (int i = 0; i < kInvoices; ++i) {
      requests += "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>Customer " + std::to_string(i) +
                  "</FullName></CustomerRef>";
      for (int l = 0; l < lines; ++l) {
        requests += "<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><Quantity>" +
                    std::to_string(l + 1) + "</Quantity></InvoiceLineAdd>";
      }
      requests += "</InvoiceAdd></InvoiceAddRq>";
    }
    const double before = size();
    answer(requests);
    return size() - before;
  };
  const double oneLine = invoices(1);
  const double perLine = (invoices(11) - oneLine) / (kInvoices * 10);
  RecordProperty("BytesPerCustomer", std::to_string(perCustomer));
  RecordProperty("BytesPerInvoiceLine", std::to_string(perLine));
  EXPECT_LT(perCustomer, 200.0);
  EXPECT_LT(perLine, 90.0);
  EXPECT_GT(perLine, 0.0);
}

}  // namespace
}  // namespace droqbxml::simulator

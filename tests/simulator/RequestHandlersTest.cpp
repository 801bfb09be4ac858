// The stand-in's answers to request documents, driven through readRequest and answerRequests
// against company files in temporary folders: whole responses for customer and invoice adds,
// QuickBooks' status codes and messages, onError, references, jobs, pricing and sales tax,
// query filters, text rules, version rules, the size of a company file, the shapes of real
// QuickBooks responses, and validation of every response kind against the qbXML schema.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <initializer_list>
#include <memory>
#include <regex>
#include <set>
#include <sstream>
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

using Texts = std::vector<std::string>;

const std::filesystem::path kShared = DROQBXML_SHARED_DIR;
const std::filesystem::path kTestData = DROQBXML_TESTDATA_DIR;

// The moment every test starts at: the ListIDs of the file's entries end in its Unix time.
constexpr const char* kNow = "2009-03-02T10:40:23-05:00";
constexpr const char* kStamp = "1236008423";
constexpr std::string_view kVersion13 = "<?qbxml version=\"13.0\"?>";

// ListIDs of a new company's entries: accounts in chart order of creation (Accounts
// Receivable, Undeposited Funds, Inventory Asset, Sales Tax Payable, Sales, Cost of Goods
// Sold, Job Expenses), sales tax codes (Tax, Non), the sales tax item (State Tax), and the
// entries a test adds after them.
std::string listId(int number) {
  char text[16];
  std::snprintf(text, sizeof text, "%X", 0x80000000u + static_cast<unsigned>(number));
  return std::string(text) + "-" + kStamp;
}

// Requests written compactly: "CustomerAdd#2{Name=Acme;BillAddress{City=X}};CustomerQuery{}"
// is a CustomerAddRq with requestID 2 around a CustomerAdd, then a CustomerQueryRq. Inside,
// "Name=value" is an element holding the value with &, < and > escaped, "KindRef=name" a
// reference by full name and "Name{...}" an aggregate; ';' separates them.
std::string rq(std::string_view compact) {
  std::string out;
  std::vector<std::string> closing;
  for (size_t at = 0; at < compact.size(); ++at) {
    if (compact[at] == ';') continue;
    if (compact[at] == '}') {
      out += closing.back();
      closing.pop_back();
      continue;
    }
    const size_t mark = compact.find_first_of("={", at);
    const std::string name(compact.substr(at, mark - at));
    if (compact[mark] == '{' && closing.empty()) {
      const size_t hash = name.find('#');
      const std::string kind = name.substr(0, hash);
      const std::string id =
          hash == std::string::npos ? "" : " requestID=\"" + name.substr(hash + 1) + "\"";
      const std::string inner = kind.ends_with("Add") ? kind : "";
      out += "<" + kind + "Rq" + id + ">" + (inner.empty() ? "" : "<" + inner + ">");
      closing.push_back((inner.empty() ? "" : "</" + inner + ">") + "</" + kind + "Rq>");
    } else if (compact[mark] == '{') {
      out += "<" + name + ">";
      closing.push_back("</" + name + ">");
    } else {
      const size_t end = std::min(compact.find_first_of(";}", mark), compact.size());
      std::string value;
      for (char c : compact.substr(mark + 1, end - mark - 1)) {
        value += c == '&' ? "&amp;" : c == '<' ? "&lt;" : c == '>' ? "&gt;" : std::string(1, c);
      }
      if (name.ends_with("Ref")) value = "<FullName>" + value + "</FullName>";
      out += "<" + name + ">" + value + "</" + name + ">";
      at = end - 1;
      continue;
    }
    at = mark;
  }
  return out;
}

// The compact requests of the file tests/testdata/simulator/`name`, its lines joined and those
// starting with "//" left out.
std::string rqFile(const std::string& name) {
  std::istringstream lines(test::readFile(kTestData / "simulator" / name));
  std::string compact;
  for (std::string line; std::getline(lines, line);) {
    if (!line.starts_with("//")) compact += line;
  }
  return rq(compact);
}

class RequestHandlersTest : public ::testing::Test {
 protected:
  // Every 13.0 response the test received must be valid against the qbXML schema.
  void TearDown() override {
    company_.reset();
    const auto verdicts = test::xmllintVerdicts(responses_, folder_.root());
    if (!verdicts) return;
    int valid = 0;
    for (const auto& [name, validates] : *verdicts) valid += validates ? 1 : 0;
    EXPECT_EQ(valid, static_cast<int>(responses_.size()))
        << test::readFile(folder_ / "xmllint.txt");
  }

  void setNow(const char* now) const { now_.set(now); }

  // A new company file (sales tax on or off); the default one is created on first use.
  void newCompany(bool salesTax) {
    company_.reset();
    const auto path = folder_ / ("company" + std::to_string(++companies_) + ".qbw");
    CompanyFile::create(path, CompanySettings{"Orvanne Builders", salesTax, {}});
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

  // The response to `requests` in a qbXML 13.0 document, kept for the schema check (older
  // versions answer to their own schemas). Values QuickBooks refuses per request may be
  // there; anything that would refuse the document fails the test.
  std::string answer(std::string_view requests, std::string_view onError = "stopOnError",
                     std::string_view prolog = kVersion13) {
    const ReadResult read = readRequest(document(requests, onError, prolog));
    for (const Problem& problem : read.problems) {
      if (problem.perRequest) continue;
      ADD_FAILURE() << "request refused: " << problem.line << " " << problem.element << ": "
                    << problem.message;
    }
    if (!read.document) return {};
    const std::string response = answerRequests(company(), *read.document);
    if (prolog == kVersion13) {
      responses_.push_back(folder_ / ("response" + std::to_string(responses_.size()) + ".xml"));
      test::writeFile(responses_.back(), response);
    }
    return response;
  }

  test::TemporaryFolder folder_;
  test::ScopedVariable now_{"DROQBXML_SIMULATOR_NOW", kNow};
  std::unique_ptr<CompanyFile> company_;
  int companies_ = 0;
  std::vector<std::filesystem::path> responses_;  // the responses to check
};

// Every match of `pattern` in `response`, its groups joined by spaces.
Texts matches(const std::string& response, const std::regex& pattern) {
  Texts found;
  for (std::sregex_iterator at(response.begin(), response.end(), pattern), end; at != end; ++at) {
    found.emplace_back((*at)[1].str());
    for (size_t group = 2; group < at->size(); ++group) found.back() += " " + (*at)[group].str();
  }
  return found;
}

// "CustomerAddRs 0 Info Status OK" for every response element, in order.
Texts statuses(const std::string& response) {
  static const std::regex element(
      "<([A-Za-z]+Rs)(?: requestID=\"[^\"]*\")? statusCode=\"([0-9]+)\" "
      "statusSeverity=\"([A-Za-z]+)\" statusMessage=\"([^\"]*)\"");
  return matches(response, element);
}

// The text of every element `name` in the response, in order.
Texts texts(const std::string& response, const std::string& name) {
  return matches(response, std::regex("<" + name + ">([^<]*)</" + name + ">"));
}

// Each request of testdata/simulator/<name> in compact form, then " =>" and the values of
// `element` in what `answer` gives for it ('#' lines are kept as they are).
::testing::AssertionResult answersMatch(const std::string& name, const std::string& element,
                                        const std::function<std::string(std::string)>& answer) {
  std::istringstream lines(test::readFile(kTestData / "simulator" / name));
  Texts table;
  for (std::string line; std::getline(lines, line);) {
    if (!line.starts_with("#")) {
      const std::string request = line.substr(0, line.find(" =>"));
      line = request + " =>";
      for (const std::string& value : texts(answer(rq(request)), element)) {
        line += (line.ends_with(" =>") ? " " : ", ") + value;
      }
    }
    table.push_back(line);
  }
  return test::linesMatchGolden(table, name);
}

// Appends "label Element: value | value" for each of `elements` in `part` (for a golden file).
void listValues(Texts& lines, const std::string& label, const std::string& part,
                std::initializer_list<const char*> elements) {
  for (const char* element : elements) {
    std::string line = label + " " + element + ":";
    for (const std::string& value : texts(part, element)) {
      line += (line.ends_with(":") ? " " : " | ") + value;
    }
    lines.push_back(line);
  }
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
  static const std::regex tag("<(/?)([A-Za-z][A-Za-z0-9]*)[^>]*?(/?)>");
  std::vector<std::string> open{""};  // the described children of each open element
  const auto describe = [&](const std::string& name, const std::string& children) {
    if (leaveOut.contains(name)) return;
    open.back() += (open.back().empty() ? "" : ",") + name;
    if (!children.empty()) open.back() += "{" + children + "}";
  };
  for (std::sregex_iterator at(response.begin(), response.end(), tag), end; at != end; ++at) {
    if ((*at)[1].length() > 0) {
      if (open.size() < 2) return {};
      const std::string children = open.back();
      open.pop_back();
      if ((*at)[2] == aggregate) return children;
      describe((*at)[2], children);
    } else if ((*at)[3].length() > 0) {
      describe((*at)[2], "");
    } else {
      open.emplace_back();
    }
  }
  return {};
}

const std::string kAcmeAndItems = rq(
    "CustomerAdd{Name=Acme};ItemServiceAdd{Name=Labor;SalesOrPurchase{Desc=Labor, per hour;"
    "Price=85;AccountRef=Sales}};ItemNonInventoryAdd{Name=Nails;SalesOrPurchase{Desc=Box of nails;"
    "Price=0.125;AccountRef=Sales}};ItemGroupAdd{Name=Kitchen Kit;ItemDesc=Kitchen fitting kit;"
    "ItemGroupLine{ItemRef=Labor;Quantity=2};ItemGroupLine{ItemRef=Nails;Quantity=100}};"
    "ItemSubtotalAdd{Name=Subtotal;ItemDesc=Subtotal}");
// The same items without the customer.
const std::string kItems = kAcmeAndItems.substr(kAcmeAndItems.find("<ItemServiceAddRq>"));
const std::string kNone = " 1 Info A query request did not find a matching object in QuickBooks";

// --- Whole responses ---------------------------------------------------------------------

TEST_F(RequestHandlersTest, CustomerAddAndQueryAnswerAsQuickBooksWritesThem) {
  EXPECT_EQ(
      answer(rq("CustomerAdd#2{Name=Tom's \"A&B\" <Builders>;CompanyName=A&B Builders;"
                "FirstName=Tom;BillAddress{Addr1=1 Main St;City=Springfield;State=IL;"
                "PostalCode=62701};Phone=555-0100;Email=tom@example.com;OpenBalance=150.00;"
                "CreditLimit=2000};CustomerAdd#3{Name=Kitchen;ParentRef{ListID=" +
                listId(1) +
                "};JobStatus=InProgress;JobDesc=New kitchen};CustomerQuery{ActiveStatus=All}")),
      test::readFile(kTestData / "simulator" / "customer_add_and_query.xml"));
}

TEST_F(RequestHandlersTest, InvoiceAddAnswersWithTheWholeInvoice) {
  answer(kAcmeAndItems);
  EXPECT_EQ(answer(rq("InvoiceAdd#7{CustomerRef=Acme;TxnDate=2009-03-01;RefNumber=INV-0099;"
                      "Memo=Kitchen & bath;InvoiceLineAdd{ItemRef=Labor;Quantity=3};InvoiceLineAdd{"
                      "ItemRef=Nails;Desc=Nails, loose;Quantity=10;Rate=1.5;SalesTaxCodeRef=NON};"
                      "InvoiceLineAdd{ItemRef=Subtotal};InvoiceLineAdd{Desc=Site visit included};"
                      "InvoiceLineGroupAdd{ItemGroupRef=Kitchen Kit;Quantity=2}}")),
            test::readFile(kTestData / "simulator" / "invoice_add.xml"));
}

TEST_F(RequestHandlersTest, NewCompanyHoldsChartOfAccountsTaxCodesAndSalesTaxItem) {
  const std::string response =
      answer(rq("AccountQuery{};ItemQuery{};CustomerQuery{};EstimateQuery{}"));
  // Accounts come in chart order: by type, then by name.
  EXPECT_EQ(texts(response, "FullName"),
            (Texts{"Accounts Receivable", "Inventory Asset", "Undeposited Funds",
                   "Sales Tax Payable", "Sales", "Cost of Goods Sold", "Job Expenses"}));
  EXPECT_EQ(texts(section(response, "ItemSalesTaxRet"), "Name"), Texts{"State Tax"});
  EXPECT_EQ(texts(response, "TaxRate"), Texts{"7.50"});
  EXPECT_EQ(statuses(response),
            (Texts{"AccountQueryRs 0 Info Status OK", "ItemQueryRs 0 Info Status OK",
                   "CustomerQueryRs" + kNone, "EstimateQueryRs" + kNone}));

  // The sales tax codes exist whatever the setting: customers resolve them by name.
  newCompany(false);
  const std::string untaxed = answer(rq("ItemQuery{};CustomerAdd{Name=A;SalesTaxCodeRef=Non}"));
  EXPECT_EQ(statuses(untaxed), (Texts{"ItemQueryRs" + kNone, "CustomerAddRs 0 Info Status OK"}));
  EXPECT_EQ(texts(section(untaxed, "SalesTaxCodeRef"), "ListID"), Texts{listId(2)});
  EXPECT_EQ(section(untaxed, "ItemSalesTaxRef"), "");
}

// --- Status codes and messages ------------------------------------------------------------

// Conversion comes before references (the unknown customer of the invoice with 10.001 is not
// reported); the invoice whose second line failed is rolled back whole.
TEST_F(RequestHandlersTest, RefusedAddsGetQuickBooksStatusCodeAndMessage) {
  answer(kAcmeAndItems);
  const std::string response = answer(rqFile("refused_adds.rq"), "continueOnError");
  EXPECT_TRUE(test::linesMatchGolden(statuses(response), "refused_adds_statuses.txt"));
  // A refused request leaves no element behind it: no content, self-closing.
  EXPECT_NE(response.find("statusMessage=\"There was an error when converting the amount "
                          "&quot;246.9&quot; in the field &quot;CreditLimit&quot;. \" />\n"),
            std::string::npos);
}

// The invoice's and the estimate's line tax codes are refused; the invoice without them carries
// no tax at all.
TEST_F(RequestHandlersTest, LineTaxCodesWhileSalesTaxIsOffGetQuickBooksTaxMessage) {
  newCompany(false);
  answer(kAcmeAndItems);
  const std::string response =
      answer(rq("InvoiceAdd{CustomerRef=Acme;InvoiceLineAdd{ItemRef=Labor;SalesTaxCodeRef=NON}};"
                "EstimateAdd{CustomerRef=Acme;EstimateLineAdd{ItemRef=Labor;SalesTaxCodeRef=NON}};"
                "InvoiceAdd{CustomerRef=Acme;InvoiceLineAdd{ItemRef=Labor;Quantity=2}}"),
             "continueOnError");
  EXPECT_TRUE(
      test::linesMatchGolden(statuses(response), "tax_codes_while_tax_is_off_statuses.txt"));
  const std::string invoice = section(response, "InvoiceRet");
  EXPECT_EQ(texts(invoice, "SalesTaxPercentage"), Texts{"0.00"});
  EXPECT_EQ(texts(invoice, "SalesTaxTotal"), Texts{"0.00"});
  EXPECT_EQ(texts(invoice, "BalanceRemaining"), Texts{"170.00"});
  EXPECT_EQ(invoice.find("SalesTaxCodeRef"), std::string::npos);
  EXPECT_EQ(invoice.find("ItemSalesTaxRef"), std::string::npos);
}

// A sales tax item is no service item; RefNumber is found without regard to case,
// RefNumberCaseSensitive is not.
TEST_F(RequestHandlersTest, QueriesReportMissingNamesWith500AndEmptyFiltersWith1) {
  answer(rq("CustomerAdd{Name=Acme};InvoiceAdd{CustomerRef=Acme;RefNumber=A-1}"));
  const std::string response =
      answer(rq("CustomerQuery#a{FullName=Nobody;FullName=acme};CustomerQuery{ListID=80000001-1};"
                "AccountQuery{FullName=Tom's \"A&B\"};ItemServiceQuery{FullName=State Tax};"
                "PayrollItemWageQuery{FullName=Hourly};PayrollItemWageQuery{};InvoiceQuery{"
                "TxnID=9-1236008423};InvoiceQuery{RefNumber=a-1;RefNumber=A-2};InvoiceQuery{"
                "RefNumberCaseSensitive=a-1};CustomerQuery{ActiveStatus=InactiveOnly}"),
             "continueOnError");
  EXPECT_TRUE(test::linesMatchGolden(statuses(response), "missing_names_statuses.txt"));
  // A warning still returns what was found.
  EXPECT_EQ(texts(response.substr(0, response.find("</CustomerQueryRs>")), "Name"), Texts{"Acme"});
  EXPECT_NE(response.find("<CustomerQueryRs requestID=\"a\" statusCode=\"500\""),
            std::string::npos);
  EXPECT_EQ(texts(response, "RefNumber"), Texts{"A-1"});
}

// --- onError ------------------------------------------------------------------------------

TEST_F(RequestHandlersTest, OnErrorDecidesWhetherLaterRequestsAreAnswered) {
  const std::string requests =
      rq("CustomerAdd#1{Name=Acme};CustomerQuery#2{FullName=Nobody};CustomerAdd#3{Name=acme};"
         "CustomerAdd#4{Name=Bolt}");
  // A warning does not stop; the first error does, and nothing after it is answered or done.
  const std::string stopped = answer(requests, "stopOnError");
  EXPECT_EQ(statuses(stopped).size(), 3u);
  EXPECT_EQ(stopped.find("requestID=\"4\""), std::string::npos);
  EXPECT_TRUE(
      stopped.ends_with("The name &quot;acme&quot; of the list element is already in "
                        "use.\" />\n</QBXMLMsgsRs>\n</QBXML>\n"));
  EXPECT_NE(answer(rq("CustomerQuery{FullName=Bolt}")).find("statusCode=\"500\""),
            std::string::npos);

  newCompany(true);
  const std::string continued = answer(requests, "continueOnError");
  EXPECT_EQ(statuses(continued).size(), 4u);
  EXPECT_NE(continued.find("<CustomerAddRs requestID=\"4\" statusCode=\"0\""), std::string::npos);

  // QuickBooks refuses rollbackOnError outright, before doing anything: the reader already
  // does, and a document that got past it anyway is refused whole.
  newCompany(true);
  ReadResult read = readRequest(document(requests, "rollbackOnError", kVersion13));
  EXPECT_FALSE(read.document);
  read = readRequest(document(requests, "continueOnError", kVersion13));
  ASSERT_TRUE(read.document);
  read.document->root.children[0].attributes[0].second = "rollbackOnError";
  EXPECT_TRUE(test::raises([&] { answerRequests(company(), *read.document); },
                           static_cast<int32_t>(0x80040400u), u"QBXMLRP.RequestProcessor.1",
                           u"QuickBooks found an error when parsing the provided XML text "
                           u"stream."));
  EXPECT_NE(answer(rq("CustomerQuery{}")).find("statusCode=\"1\""), std::string::npos);
}

// --- References, jobs ---------------------------------------------------------------------

TEST_F(RequestHandlersTest, ReferencesResolveByListIdOrByFullNameWithoutRegardToCase) {
  const std::string response =
      answer(rq("CustomerAdd{Name=Acme};CustomerAdd{Name=Bolt;SalesTaxCodeRef{ListID=" + listId(2) +
                ";FullName=Tax}};InvoiceAdd{CustomerRef{ListID=" + listId(1) +
                "};ARAccountRef=ACCOUNTS RECEIVABLE};InvoiceAdd{CustomerRef=bolt};"
                // The right number with another creation time is another entry.
                "InvoiceAdd{CustomerRef{ListID=80000001-1236008424}}"),
             "continueOnError");
  const Texts found = statuses(response);
  ASSERT_EQ(found.size(), 5u);
  EXPECT_EQ(found[3], "InvoiceAddRs 0 Info Status OK");
  EXPECT_EQ(found[4].substr(0, 17), "InvoiceAddRs 3140");
  // ListID wins over FullName; a reference is written with both, as the entry has them.
  EXPECT_EQ(texts(section(response, "SalesTaxCodeRef", response.find("Bolt")), "FullName"),
            Texts{"NON"});
  const size_t first = response.find("<InvoiceRet>");
  EXPECT_EQ(texts(section(response, "CustomerRef", first), "FullName"), Texts{"Acme"});
  EXPECT_EQ(texts(section(response, "ARAccountRef", first), "FullName"),
            Texts{"Accounts Receivable"});
  EXPECT_EQ(
      texts(section(response, "CustomerRef", response.find("<InvoiceRet>", first + 1)), "ListID"),
      Texts{listId(2)});
}

TEST_F(RequestHandlersTest, JobsAreCustomersWithAParent) {
  const std::string response =
      answer(kAcmeAndItems +
             rq("CustomerAdd{Name=Zeta};CustomerAdd{Name=Kitchen;ParentRef=Acme};CustomerAdd{"
                "Name=Kitchen;ParentRef=Zeta};CustomerAdd{Name=Cabinets;ParentRef=ACME:kitchen};"
                "CustomerAdd{Name=Acme Annex};InvoiceAdd{CustomerRef=Acme:Kitchen:Cabinets;"
                "InvoiceLineAdd{ItemRef=Labor;Amount=100.00}};CustomerQuery{}"));
  const std::string jobs = section(response, "CustomerQueryRs");
  // Names in hierarchical order (a customer, its jobs, then the next customer): jobs.txt.
  const Texts fullNames = texts(jobs, "FullName");
  EXPECT_EQ(std::count(fullNames.begin(), fullNames.end(), "Acme:Kitchen:Cabinets"), 1);
  EXPECT_EQ(std::count(fullNames.begin(), fullNames.end(), "Zeta:Kitchen"), 1);
  EXPECT_EQ(texts(section(jobs, "ParentRef", jobs.find("<Name>Cabinets</Name>")), "FullName"),
            Texts{"Acme:Kitchen"});
  // The job's invoice (100.00 and 7.5 % tax) is its balance and counts in its parents' totals,
  // and in the accounts it went to.
  Texts values;
  listValues(values, "jobs", jobs, {"Name", "Sublevel", "Balance", "TotalBalance"});
  listValues(values, "accounts",
             answer(rq("AccountQuery{FullName=Accounts Receivable;FullName=Sales Tax Payable}")),
             {"Balance"});
  EXPECT_TRUE(test::linesMatchGolden(values, "jobs.txt"));
}

// --- Pricing and sales tax ----------------------------------------------------------------

TEST_F(RequestHandlersTest, LinesArePricedAndTaxedAsQuickBooksDoes) {
  answer(kAcmeAndItems +
         rq("ItemDiscountAdd{Name=Loyalty;ItemDesc=Loyalty discount;DiscountRatePercent=10;"
            "AccountRef=Sales};ItemSalesTaxAdd{Name=County;TaxRate=1.25};ItemSalesTaxGroupAdd{"
            "Name=Combined;ItemSalesTaxRef=State Tax;ItemSalesTaxRef=County};CustomerAdd{"
            "Name=Exempt Co;SalesTaxCodeRef=Non};ItemInventoryAdd{Name=Tile;SalesPrice=40;"
            "PurchaseCost=25}"));
  const std::string response = answer(rq(
      // Quantity times rate; the item's price; a given amount with no rate; a discount of the
      // line before; a subtotal; a group twice over; a sales tax group's summed rate.
      "InvoiceAdd{CustomerRef=Acme;ItemSalesTaxRef=Combined;InvoiceLineAdd{ItemRef=Nails;"
      "Quantity=3;Rate=0.33333};InvoiceLineAdd{ItemRef=Labor;Quantity=2.5};InvoiceLineAdd{"
      "ItemRef=Labor;Quantity=4;Amount=300.00};InvoiceLineAdd{ItemRef=Loyalty};InvoiceLineAdd{"
      "ItemRef=Subtotal};InvoiceLineGroupAdd{ItemGroupRef=Kitchen Kit;Quantity=2}};"
      // A customer whose tax code is not taxable pays no tax; an estimate has a total; a
      // markup prices an item at its cost plus the markup.
      "EstimateAdd{CustomerRef=Exempt Co;EstimateLineAdd{ItemRef=Labor};EstimateLineAdd{"
      "ItemRef=Tile;Quantity=2;MarkupRatePercent=15};EstimateLineAdd{ItemRef=Tile;"
      "MarkupRate=5}};"
      // Tax is rounded once on the taxable total, half away from zero.
      "InvoiceAdd{CustomerRef=Acme;InvoiceLineAdd{Desc=Odd job;Amount=0.10;"
      "SalesTaxCodeRef=Tax}}"));
  // 848.50 of lines, all taxable, at 7.5 % + 1.25 % = 74.24375; 0.10 taxed at 0.0075.
  Texts values;
  listValues(values, "invoice", section(response, "InvoiceAddRs"),
             {"Amount", "Rate", "RatePercent", "Desc", "Quantity", "TotalAmount", "Subtotal",
              "SalesTaxPercentage", "SalesTaxTotal", "BalanceRemaining"});
  const std::string estimate = section(response, "EstimateRet");
  listValues(values, "estimate", estimate,
             {"Rate", "Amount", "Subtotal", "SalesTaxTotal", "TotalAmount"});
  listValues(values, "estimate tax code", section(estimate, "CustomerSalesTaxCodeRef"),
             {"FullName"});
  listValues(values, "small invoice",
             section(response, "InvoiceRet", response.find("</EstimateAddRs>")),
             {"SalesTaxTotal", "RefNumber"});
  EXPECT_TRUE(test::linesMatchGolden(values, "priced_lines.txt"));
}

TEST_F(RequestHandlersTest, InvoicesSellFromStock) {
  answer(kAcmeAndItems +
         rq("ItemInventoryAdd{Name=Tile;SalesPrice=40;QuantityOnHand=10;TotalValue=250};"
            "ItemGroupAdd{Name=Tile Kit;ItemGroupLine{ItemRef=Tile;Quantity=4}}"));
  // Three sold, four and four more in two kits; an estimate and a refused invoice sell
  // nothing; below zero is allowed.
  answer(rq("InvoiceAdd{CustomerRef=Acme;InvoiceLineAdd{ItemRef=Tile;Quantity=3};"
            "InvoiceLineAdd{ItemRef=Labor;Quantity=1};InvoiceLineGroupAdd{ItemGroupRef=Tile Kit;"
            "Quantity=2}};EstimateAdd{CustomerRef=Acme;EstimateLineAdd{ItemRef=Tile;Quantity=5}};"
            "InvoiceAdd{CustomerRef=Nobody;InvoiceLineAdd{ItemRef=Tile;Quantity=1}}"),
         "continueOnError");
  const std::string tile = answer(rq("ItemInventoryQuery{FullName=Tile}"));
  EXPECT_EQ(texts(tile, "QuantityOnHand"), Texts{"-1"});
  EXPECT_EQ(texts(tile, "AverageCost"), Texts{"25.00"});
}

TEST_F(RequestHandlersTest, TransactionsNumberThemselvesAndTakeTheCustomersDefaults) {
  answer(rq("CustomerAdd{Name=Acme;BillAddress{Addr1=1 Main St};ShipAddress{Addr1=Dock 4}}"));
  const std::string response = answer(
      rq("InvoiceAdd{CustomerRef=Acme;RefNumber=INV-0999};InvoiceAdd{CustomerRef=Acme;"
         "BillAddress{Addr1=Other}};EstimateAdd{CustomerRef=Acme;EstimateLineAdd{Desc=Survey}};"
         "InvoiceAdd{CustomerRef=Acme;RefNumber=123456789012}"),
      "continueOnError");
  Texts values;
  listValues(values, "transactions", response,
             {"RefNumber", "TxnID", "TxnLineID", "TxnNumber", "TxnDate", "Addr1"});
  EXPECT_TRUE(test::linesMatchGolden(values, "numbered_transactions.txt"));
  ASSERT_EQ(statuses(response).size(), 4u);
  EXPECT_EQ(statuses(response)[3],
            "InvoiceAddRs 3070 Error The string &quot;123456789012&quot; in the field "
            "&quot;RefNumber&quot; is too long.");
}

// --- Query filters ------------------------------------------------------------------------

TEST_F(RequestHandlersTest, ListFiltersSelectByActivityModificationNameAndCount) {
  answer(rq("CustomerAdd{Name=Acme};CustomerAdd{Name=Bolt;IsActive=0}"));
  setNow("2009-03-05T09:00:00-05:00");
  answer(rq("CustomerAdd{Name=Cobalt};CustomerAdd{Name=Delta}") + kItems);
  EXPECT_TRUE(answersMatch("list_queries.txt", "Name",
                           [&](const std::string& request) { return answer(request); }));
  // IncludeRetElement keeps only the elements it names.
  EXPECT_EQ(shape(answer(rq("CustomerQuery{FullName=Acme;IncludeRetElement=ListID;"
                            "IncludeRetElement=Name}")),
                  "CustomerRet"),
            "ListID,Name");
}

TEST_F(RequestHandlersTest, TransactionFiltersSelectByDateCustomerAndPayment) {
  answer(kAcmeAndItems +
         rq("CustomerAdd{Name=Kitchen;ParentRef=Acme};CustomerAdd{Name=Bolt};InvoiceAdd{"
            "CustomerRef=Acme;TxnDate=2009-01-10;InvoiceLineAdd{ItemRef=Labor}};InvoiceAdd{"
            "CustomerRef=Acme:Kitchen;TxnDate=2009-02-10}"));
  setNow("2009-03-09T08:00:00-05:00");
  answer(rq("InvoiceAdd{CustomerRef=Bolt;TxnDate=2009-03-10;InvoiceLineAdd{ItemRef=Labor}}"));
  EXPECT_TRUE(answersMatch("invoice_queries.txt", "RefNumber",
                           [&](const std::string& request) { return answer(request); }));
  // Lines only when asked for.
  EXPECT_EQ(answer(rq("InvoiceQuery{RefNumber=1}")).find("InvoiceLineRet"), std::string::npos);
  EXPECT_EQ(texts(answer(rq("InvoiceQuery{RefNumber=1;IncludeLineItems=true}")), "TxnLineID"),
            Texts{"2-1236008423"});
}

// --- Text and versions --------------------------------------------------------------------

TEST_F(RequestHandlersTest, TextIsKeptInIso88591AndEscapedAsQuickBooksWritesIt) {
  const std::string response = answer(
      "<CustomerAddRq requestID=\"&quot;1&quot;\"><CustomerAdd><Name>Caf&#233; 5&#8364; "
      "&#x1F600;</Name><Notes>Tom's &lt;b&gt; &amp; \"q\"</Notes></CustomerAdd></CustomerAddRq>" +
      rq("CustomerQuery{FullName=Caf\xC3\xA9 5\xE2\x82\xAC ?}"));
  EXPECT_EQ(texts(response, "Name"), (Texts{"Caf\xC3\xA9 5? ?", "Caf\xC3\xA9 5? ?"}));
  EXPECT_EQ(texts(response, "Notes")[0], "Tom's &lt;b> &amp; \"q\"");
  EXPECT_NE(response.find("<CustomerAddRs requestID=\"&quot;1&quot;\" statusCode=\"0\""),
            std::string::npos);
}

TEST_F(RequestHandlersTest, OlderQbxmlVersionsGetOnlyTheElementsTheyKnew) {
  answer(kAcmeAndItems + rq("InvoiceAdd{CustomerRef=Acme;InvoiceLineGroupAdd{"
                            "ItemGroupRef=Kitchen Kit}}"));
  const std::string requests =
      rq("InvoiceQuery{IncludeLineItems=true};AccountQuery{FullName=Accounts Receivable}");
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

// Records against QuickBooks' own responses to the same requests: the element tree of a
// record (leaving out the templates and printed address blocks the stand-in does not keep)
// and the values of the named elements in the whole response.
TEST_F(RequestHandlersTest, RecordsHaveTheShapeOfQuickBooksOwnResponses) {
  const std::filesystem::path folder = kShared / "qbxml" / "responses";
  if (!std::filesystem::exists(folder)) GTEST_SKIP() << "no real responses at " << folder;
  // Two lines a case: whether the company has sales tax, the record, the real response's
  // file and the elements whose values are compared; then the requests.
  std::istringstream cases(test::readFile(kTestData / "simulator" / "real_response_cases.txt"));
  const std::set<std::string> notKept{"TemplateRef", "BillAddressBlock"};
  bool salesTax = true;
  for (std::string line, requests; std::getline(cases, line);) {
    if (line.starts_with("#") || !std::getline(cases, requests)) continue;
    std::istringstream words(line);
    std::string tax, record, file;
    words >> tax >> record >> file;
    if ((tax == "tax") != salesTax || !company_) {
      newCompany(tax == "tax");
      salesTax = tax == "tax";
      answer(kItems);
    }
    const std::string mine = answer(rq(requests));
    const std::string real = test::readFile(folder / file);
    EXPECT_EQ(shape(mine, record, notKept), shape(real, record, notKept)) << file;
    for (std::string element; words >> element;) {
      EXPECT_EQ(texts(mine, element), texts(real, element)) << file << " " << element;
    }
  }
}

// Every response of every test is checked against the schema when the test ends; this one
// asks for each kind of response, with as many fields as the stand-in keeps.
TEST_F(RequestHandlersTest, EveryResponseKindValidatesAgainstTheQbxmlSchema) {
  if (!test::xmllintVerdicts({}, folder_.root())) GTEST_SKIP() << "no xmllint or qbXML schema";
  const std::string response = answer(kItems + rqFile("every_response_kind.rq"), "continueOnError");
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
}

// --- Size of a company file ---------------------------------------------------------------

TEST_F(RequestHandlersTest, CompanyFileStaysSmall) {
  answer(kItems);
  const auto growth = [&](const std::string& compact) {
    const auto before = std::filesystem::file_size(company().path());
    answer(rq(compact));
    return static_cast<double>(std::filesystem::file_size(company().path()) - before);
  };
  constexpr int kCustomers = 400;
  std::string customers;
  for (int i = 0; i < kCustomers; ++i) {
    const std::string n = std::to_string(i);
    customers += "CustomerAdd{Name=Customer " + n + ";CompanyName=Company " + n +
                 ";BillAddress{Addr1=" + n +
                 " Main Street;City=Springfield;State=IL;PostalCode=62701};Phone=555-0100};";
  }
  const double perCustomer = growth(customers) / kCustomers;

  // Invoices of one line and of eleven: the difference is ten lines.
  constexpr int kInvoices = 200;
  const auto invoices = [&](int lines) {
    std::string requests;
    for (int i = 0; i < kInvoices; ++i) {
      requests += "InvoiceAdd{CustomerRef=Customer " + std::to_string(i);
      for (int l = 1; l <= lines; ++l) {
        requests += ";InvoiceLineAdd{ItemRef=Labor;Quantity=" + std::to_string(l) + "}";
      }
      requests += "};";
    }
    return growth(requests);
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

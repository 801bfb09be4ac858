// The stand-in's answers to request documents, driven through readRequest and answerRequests
// against company files in temporary folders: whole responses for customer and invoice adds,
// tables of requests and what the responses hold (QuickBooks' status codes and messages,
// onError, references, jobs, pricing and sales tax, query filters, text and version rules),
// rollbackOnError, the size of a company file, the shapes of real QuickBooks responses, and
// validation of every response kind against the qbXML schema.
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
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
#include "tests/TableSupport.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator {
namespace {

using Texts = std::vector<std::string>;

const std::filesystem::path kShared = DROQBXML_SHARED_DIR;
const std::filesystem::path kTestData = DROQBXML_TESTDATA_DIR;

// The moment every test starts at: the ListIDs of the file's entries end in its Unix time.
constexpr const char* kNow = "2009-03-02T10:40:23-05:00";
constexpr std::string_view kVersion13 = "<?qbxml version=\"13.0\"?>";

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

// "CustomerAddRs#2 0 Info Status OK" for every response element, in order ("#2" for its
// requestID, when it has one).
Texts statuses(const std::string& response) {
  static const std::regex element(
      "<([A-Za-z]+Rs)(?: requestID=\"([^\"]*)\")? statusCode=\"([0-9]+)\" "
      "statusSeverity=\"([A-Za-z]+)\" statusMessage=\"([^\"]*)\"");
  Texts found;
  for (std::sregex_iterator at(response.begin(), response.end(), element), end; at != end; ++at) {
    found.push_back((*at)[1].str() + ((*at)[2].matched ? "#" + (*at)[2].str() : "") + " " +
                    (*at)[3].str() + " " + (*at)[4].str() + " " + (*at)[5].str());
  }
  return found;
}

// The text of every element `name` in the response, in order.
Texts texts(const std::string& response, const std::string& name) {
  const std::regex element("<" + name + ">([^<]*)</" + name + ">");
  Texts found;
  for (std::sregex_iterator at(response.begin(), response.end(), element), end; at != end; ++at) {
    found.push_back((*at)[1].str());
  }
  return found;
}

// The part of `text` from the `n`th start tag `name` to its end tag, or the empty text.
std::string section(const std::string& text, const std::string& name, int n = 1) {
  size_t start = std::string::npos;
  for (size_t at = text.find("<" + name); at != std::string::npos && n > 0;
       at = text.find("<" + name, at + 1)) {
    const char next = text[at + name.size() + 1];
    if ((next == '>' || next == ' ') && --n == 0) start = at;
  }
  const size_t end = start == std::string::npos ? start : text.find("</" + name + ">", start);
  return end == std::string::npos ? std::string() : text.substr(start, end - start);
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

  // Requests of a table: compact, "@FILE" for the compact requests of a file, or quoted as
  // they are sent.
  static std::string requests(const std::string& text) {
    if (text.starts_with('@')) return rqFile(text.substr(1));
    return text.starts_with('"') ? test::unquoted(text) : rq(text);
  }

  // One step of a table under testdata/simulator/answers (the steps: see new_company.txt).
  std::string step(const std::string& line) {
    if (line.starts_with("company ")) {
      newCompany(line.ends_with(" tax"));
      return "";
    }
    if (line.starts_with("now ")) {
      now_.set(line.substr(4).c_str());
      return "";
    }
    if (line.starts_with("send")) {
      const size_t space = line.find(' ');
      const std::string version = line.substr(4, space - 4);
      std::string rest = line.substr(space + 1);
      const bool goOn = rest.starts_with("continueOnError ");
      if (goOn) rest = rest.substr(rest.find(' ') + 1);
      last_ = answer(requests(rest), goOn ? "continueOnError" : "stopOnError",
                     version.empty() ? std::string(kVersion13)
                     : version == "@1.0"
                         ? "<!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.0//EN\" >"
                         : "<?qbxml version=\"" + version.substr(1) + "\"?>");
      const Texts found = statuses(last_);
      if (std::all_of(found.begin(), found.end(), [](const std::string& status) {
            return status.ends_with(" 0 Info Status OK");
          })) {
        return std::to_string(found.size()) + " ok";
      }
      std::string shown;
      for (const std::string& status : found) {
        shown += (shown.empty() ? "" : ", ") + test::quoted(status, false);
      }
      return shown;
    }
    // A view: "PATH: " (SECTION[#N]/... each inside the one before), then what to show,
    // then " of REQUESTS" to send them first.
    size_t at = line.find_first_of(" :");
    const std::string path = at < line.size() && line[at] == ':' ? line.substr(0, at) : "";
    at = path.empty() ? 0 : at + 2;
    size_t end = line.compare(at, 4, "has ") == 0     ? test::afterQuoted(line, at + 4)
                 : line.compare(at, 6, "shape ") == 0 ? line.find(' ', at + 6)
                                                      : line.find(' ', at);
    end = std::min(end, line.size());
    if (end < line.size()) last_ = answer(requests(line.substr(end + 4)));
    std::string part = last_;
    std::istringstream sections(path);
    for (std::string name; std::getline(sections, name, '/');) {
      const size_t hash = name.find('#');
      part = section(part, name.substr(0, hash),
                     hash == std::string::npos ? 1 : std::stoi(name.substr(hash + 1)));
    }
    const std::string what = line.substr(at, end - at);
    if (what.starts_with("has ")) {
      return part.find(test::unquoted(what.substr(4))) == std::string::npos ? "false" : "true";
    }
    if (what.starts_with("shape ")) return shape(part, what.substr(6));
    std::string values;
    for (const std::string& value : texts(part, what)) {
      values += (values.empty() ? "" : " | ") + (value.empty() ? "\"\"" : value);
    }
    return values.empty() ? "none" : values;
  }

  void runTable(const std::string& name) {
    test::runTable("simulator/answers/" + name,
                   [&](const std::string& line) { return step(line); });
  }

  test::TemporaryFolder folder_;
  test::ScopedVariable now_{"DROQBXML_SIMULATOR_NOW", kNow};
  std::unique_ptr<CompanyFile> company_;
  int companies_ = 0;
  std::vector<std::filesystem::path> responses_;  // the responses to check
  std::string last_;                              // the response a table's views look at
};

const std::string kItems = rqFile("items.rq");
const std::string kAcmeAndItems = rq("CustomerAdd{Name=Acme}") + kItems;

// --- Whole responses ---------------------------------------------------------------------

TEST_F(RequestHandlersTest, CustomerAddAndQueryAnswerAsQuickBooksWritesThem) {
  EXPECT_EQ(answer(rq("CustomerAdd#2{Name=Tom's \"A&B\" <Builders>;CompanyName=A&B Builders;"
                      "FirstName=Tom;BillAddress{Addr1=1 Main St;City=Springfield;State=IL;"
                      "PostalCode=62701};Phone=555-0100;Email=tom@example.com;OpenBalance=150.00;"
                      "CreditLimit=2000};CustomerAdd#3{Name=Kitchen;ParentRef{ListID="
                      "80000001-1236008423};JobStatus=InProgress;JobDesc=New kitchen};"
                      "CustomerQuery{ActiveStatus=All}")),
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

// --- Tables of requests and what the responses hold ----------------------------------------

TEST_F(RequestHandlersTest, NewCompanyHoldsChartOfAccountsTaxCodesAndSalesTaxItem) {
  runTable("new_company.txt");
}

TEST_F(RequestHandlersTest, RefusalsGetQuickBooksStatusCodesAndMessages) {
  runTable("status_codes.txt");
}

TEST_F(RequestHandlersTest, OnErrorDecidesWhetherLaterRequestsAreAnswered) {
  runTable("on_error.txt");
}

TEST_F(RequestHandlersTest, ReferencesResolveAndJobsAreCustomersWithAParent) {
  runTable("references_and_jobs.txt");
}

TEST_F(RequestHandlersTest, TransactionsArePricedTaxedNumberedAndSellFromStock) {
  runTable("transactions.txt");
}

TEST_F(RequestHandlersTest, QueryFiltersSelectByActivityDatesNamesCustomersAndPayment) {
  runTable("query_filters.txt");
}

TEST_F(RequestHandlersTest, TextIsKeptInIso88591AndOlderVersionsGetOnlyTheirElements) {
  runTable("text_and_versions.txt");
}

// QuickBooks refuses rollbackOnError and versions it does not know outright, before doing
// anything: the reader already does, and a document that got past it anyway is refused whole.
TEST_F(RequestHandlersTest, RollbackOnErrorAndUnknownVersionsAreRefusedWhole) {
  const std::string requests = rq("CustomerAdd{Name=Acme};CustomerAdd{Name=Bolt}");
  ReadResult read = readRequest(document(requests, "rollbackOnError", kVersion13));
  EXPECT_FALSE(read.document);
  read = readRequest(document(requests, "continueOnError", kVersion13));
  ASSERT_TRUE(read.document);
  read.document->root.children[0].attributes[0].second = "rollbackOnError";
  EXPECT_TRUE(test::raises([&] { answerRequests(company(), *read.document); },
                           static_cast<int32_t>(0x80040400u), u"QBXMLRP.RequestProcessor.1",
                           u"QuickBooks found an error when parsing the provided XML text "
                           u"stream."));
  read.document->root.children[0].attributes[0].second = "continueOnError";
  for (const char* version : {"99999999999.0", "13.99999999999", "14.0", ""}) {
    read.document->qbxmlVersion = version;
    EXPECT_THROW(answerRequests(company(), *read.document), ComError) << version;
  }
  EXPECT_NE(answer(rq("CustomerQuery{}")).find("statusCode=\"1\""), std::string::npos);
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
    kinds.insert(status.substr(0, status.find_first_of("# ")));
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

// droqbxml demo: the main job on a new machine. It creates (or reuses) a company file of
// the embedded stand-in, opens a connection and a session through the facade, sends the
// builder's queries for accounts, items and customers, adds a customer, a job, an account,
// an item of every kind the component builds, an estimate and an invoice with lines and a
// line group, and reads each back from its add response. Requests that QuickBooks' schema
// refuses as the component writes them are sent too. A second company file, with sales tax
// off, shows how QuickBooks refuses line tax codes. One line a step and a summary; with
// --verbose, every request, response and record dump as well.
#include <algorithm>
#include <filesystem>
#include <functional>
#include <initializer_list>
#include <ostream>
#include <random>
#include <string>
#include <system_error>
#include <utility>

#include "cli/Cli.hpp"
#include "cli/Commands.hpp"
#include "droqbxml/droqbxml.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/CompanyFile.hpp"
#include "simulator/RequestDocument.hpp"

namespace droqbxml::cli {
namespace {

// Names in a company file are unique: each run on the same file adds customers of its own,
// numbered after the top-level customers the file already holds.
Text runLabel(const Text& customerQueryResponse) {
  size_t customers = 0;
  for (size_t at = customerQueryResponse.find(u"<Sublevel>0</Sublevel>"); at != Text::npos;
       at = customerQueryResponse.find(u"<Sublevel>0</Sublevel>", at + 1)) {
    ++customers;
  }
  return asciiText(std::to_string(customers + 1));
}

constexpr const char* kRule = "------------------------------------------------------------";

// The first value of an element in a response, "" when there is none.
std::string firstValue(const Text& response, const std::string& name) {
  const Text open = fromUtf8("<" + name + ">");
  const size_t at = response.find(open);
  if (at == Text::npos) return {};
  const size_t from = at + open.size();
  const size_t close = response.find(u'<', from);
  return close == Text::npos ? std::string() : toUtf8(response.substr(from, close - from));
}

// How many records of one kind a response holds.
size_t countOf(const Text& response, const std::string& retTag) {
  const Text open = fromUtf8("<" + retTag + ">");
  size_t count = 0;
  for (size_t at = response.find(open); at != Text::npos; at = response.find(open, at + 1)) {
    ++count;
  }
  return count;
}

// The first response's status as QuickBooks wrote it; an empty code when there is none.
struct QuickBooksStatus {
  std::string code;
  std::string severity;
  std::string message;
};

QuickBooksStatus quickBooksStatus(const Text& response) {
  // The text of an attribute up to the first of `ends` after it.
  const auto attribute = [&](const char* name, std::initializer_list<TextView> ends) {
    const Text key = fromUtf8(std::string(name) + "=\"");
    const size_t at = response.find(key);
    if (at == Text::npos) return std::string();
    const size_t from = at + key.size();
    size_t close = Text::npos;
    for (const TextView end : ends) close = std::min(close, response.find(end, from));
    return close == Text::npos ? std::string() : toUtf8(response.substr(from, close - from));
  };
  // The message is the last attribute; the wrapper's unescaping may have put quotes in it.
  return {attribute("statusCode", {u"\""}), attribute("statusSeverity", {u"\""}),
          attribute("statusMessage", {u"\">", u"\" />", u"\"/>"})};
}

// A record in one line: how QuickBooks knows it (ListID or TxnID, FullName or Name, a
// reference number, EditSequence) and its balance, stock or total where it has one. Members
// the record lacks or left empty are left out.
std::string identity(Object& record) {
  const ClassInfo& info = record.classInfo();
  std::string text;
  for (const TextView name : {u"ListID", u"TxnID", u"FullName", u"RefNumber", u"EditSequence",
                              u"Balance", u"QuantityOnHand", u"TotalAmount", u"BalanceRemaining"}) {
    TextView member = name;
    if (name == u"FullName" && info.findMember(name) < 0) member = u"Name";
    if (info.findMember(member) < 0) continue;
    const std::string value = toUtf8(record.get(member).toText());
    if (value.empty()) continue;
    text += (text.empty() ? "" : ", ") + toUtf8(Text(member)) + " " + value;
  }
  return text.empty() ? "nothing" : text;
}

// The first problem lint finds in a request QuickBooks refused, in a few words.
std::string firstProblem(const Text& request) {
  const auto problems = simulator::readRequest(toUtf8(request)).problems;
  if (problems.empty()) return "lint finds nothing";
  std::string text =
      "lint, line " + std::to_string(problems.front().line) + ": " + problems.front().message;
  if (problems.size() > 1) text += " (and " + std::to_string(problems.size() - 1) + " more)";
  return text;
}

enum class Outcome { Succeeded, RefusedAsExpected, Unexpected };

// What the demo prints: by default one line a step and a summary; verbose, every request,
// response and record dump as well.
class Report {
 public:
  Report(Io io, bool verbose) : io_(io), verbose_(verbose) {}

  std::ostream& out() { return io_.out; }
  bool verbose() const { return verbose_; }

  // Sends one request; verbose, prints it with the answer and, where the stand-in's schema
  // check refused it, what lint finds in it.
  Text send(Session& session, const std::string& title, const Text& request) {
    if (verbose_) {
      io_.out << kRule << '\n'
              << title << "\n"
              << kRule << "\nRequest:\n"
              << toUtf8(request) << "\n\n";
    }
    const Text response = session.send(request);
    if (!verbose_) return response;
    io_.out << "Response status: " << statusText(session.status()) << "\nResponse:\n"
            << toUtf8(response) << (response.empty() || response.back() != u'\n' ? "\n" : "")
            << '\n';
    if (session.status() == RSParsingError) {
      io_.out << "QuickBooks refused the document. What lint finds in it:\n";
      for (const auto& problem : simulator::readRequest(toUtf8(request)).problems) {
        io_.out << "  line " << problem.line << ": " << problem.element << ": " << problem.message
                << '\n';
      }
      io_.out << '\n';
    }
    return response;
  }

  // A record's dump, verbose only.
  void dump(const std::string& label, const std::function<Text()>& printOut) {
    if (!verbose_) return;
    try {
      io_.out << label << ":\n" << toUtf8(printOut()) << "\n\n";
    } catch (const ComError& error) {
      io_.out << label << " raised error " << error.number() << " (" << toUtf8(error.description())
              << ")\n\n";
    }
  }

  // One step in one line, the only way a step reports: its mark (ok, refused as expected,
  // FAILED), what was sent, how QuickBooks answered and, when given, what was read back:
  //   ok      BuildAddAccount "Job Materials 1": RSSuccess (0); read back ListID 8000..
  // The summary counts the marks.
  void step(Outcome outcome, const std::string& sent, const std::string& status,
            const std::string& readBack = {}) {
    ++steps_;
    const char* mark = "ok      ";
    if (outcome == Outcome::RefusedAsExpected) {
      mark = "refused ";
      ++refused_;
    } else if (outcome == Outcome::Unexpected) {
      mark = "FAILED  ";
      ++unexpected_;
    }
    io_.out << mark << sent << ": " << status << (readBack.empty() ? "" : "; ") << readBack
            << (verbose_ ? "\n\n" : "\n");
  }

  // The closing lines: the steps as counted, and the company file the demo used.
  void summary(const std::string& company, bool temporary) {
    io_.out << "\n"
            << steps_ << " steps: " << steps_ - refused_ - unexpected_ << " answered with success, "
            << refused_ << " refused as expected, " << unexpected_
            << " unexpected.\nCompany file: " << company
            << (temporary ? " (temporary, removed)" : " (kept: run again to add more to it)")
            << "\n";
  }
  bool allAsExpected() const { return unexpected_ == 0; }

 private:
  Io io_;
  bool verbose_;
  int steps_ = 0;
  int refused_ = 0;
  int unexpected_ = 0;
};

// The wrapper's ResponseStatus and, unless it is plain success, how QuickBooks put it:
//   RSNoMatch (1) Info: A query request did not find a matching object in QuickBooks
//   RSTaxErrorInvoice (31401), QuickBooks 3140 Error: There is an invalid reference ...
std::string statusLine(Session& session, const Text& response) {
  const QuickBooksStatus quickBooks = quickBooksStatus(response);
  std::string text = statusText(session.status());
  if (quickBooks.code.empty() || quickBooks.code == "0") return text;
  if (quickBooks.code != std::to_string(session.status())) {
    text += ", QuickBooks " + quickBooks.code;
  }
  return text + " " + quickBooks.severity + ": " + quickBooks.message;
}

// A builder query as a step; the response, for what the demo reads of it.
Text query(Report& report, Session& session, const std::string& title, const QueryOptions& options,
           const std::string& retTag) {
  const Text response = report.send(session, title, buildQuery(options));
  const bool ok = session.status() == RSSuccess || session.status() == RSNoMatch;
  report.step(ok ? Outcome::Succeeded : Outcome::Unexpected, title, statusLine(session, response),
              std::to_string(countOf(response, retTag)) + " " + retTag);
  return response;
}

// Sends what `build` writes for one list record (a customer, job, account or item), checks
// the answer with IsSuccessRs and reads the record back from its add response. A request
// the schema is known to refuse counts when QuickBooks refuses it with its parse error.
template <class Record>
void addListRecord(Report& report, Session& session, const std::string& title,
                   const Ref<Record>& record, const std::function<void(DroXmlBuilder&)>& build,
                   bool refusedBySchema = false) {
  DroXmlBuilder& builder = *session.facade().XML();
  build(builder);
  const Text response = report.send(session, title, builder.XML());
  if (refusedBySchema) {
    const bool refused = session.status() == RSParsingError;
    report.step(refused ? Outcome::RefusedAsExpected : Outcome::Unexpected, title,
                statusLine(session, response),
                refused ? firstProblem(builder.XML()) : "meant to be refused by the schema");
    return;
  }
  if (!builder.IsSuccessRs(response, record->RequestID())) {
    report.step(Outcome::Unexpected, title, statusLine(session, response));
    return;
  }
  record->ParseRs(response);
  report.step(Outcome::Succeeded, title, statusLine(session, response),
              "read back " + identity(*record));
  report.dump("Read back with ParseRs, PrintOut", [&] { return record->PrintOut(); });
}

// The account and one item of every kind the builder writes, named after this run.
struct Items {
  Ref<DroItemInventory> tile;
  Ref<DroItemNonInventory> grout;
  Ref<DroItemSubtotal> subtotal;
  Ref<DroItemDiscount> discount;
  Ref<DroItemService> labour;
};

Items addAccountAndItems(Report& report, Session& session, const Text& run) {
  const auto addItem = [&](const std::string& kindName, udItemType kind, const auto& item,
                           bool refused = false) {
    addListRecord(
        report, session, "BuildAddItem " + kindName + " \"" + toUtf8(item->Name()) + "\"", item,
        [&](DroXmlBuilder& b) { b.BuildAddItem(kind, Variant(item)); }, refused);
  };

  auto account = std::make_shared<DroAccount>();
  account->Name(u"Job Materials " + run);
  account->AccountType(u"Expense");
  account->AccountNumber(u"6" + run);
  account->Desc(u"Materials bought for jobs, by job");  // cut to 29 characters
  addListRecord(report, session, "BuildAddAccount \"" + toUtf8(account->Name()) + "\"", account,
                [&](DroXmlBuilder& b) { b.BuildAddAccount(account); });

  Items items;
  auto& tile = items.tile = std::make_shared<DroItemInventory>();
  tile->Name(u"Floor Tile " + run);
  tile->SalesTaxCodeRef()->FullName(u"TAX");
  tile->SalesDesc(u"Porcelain floor tile, per box");
  tile->SalesPrice(u"42.5");
  tile->IncomeAccountRef()->FullName(u"Sales");
  tile->PurchaseCost(u"27");
  tile->COGSAccountRef()->FullName(u"Cost of Goods Sold");
  tile->AssetAccountRef()->FullName(u"Inventory Asset");
  tile->ReorderPoint(u"20");
  addItem("udItemInventory", udItemInventory, tile);

  auto& grout = items.grout = std::make_shared<DroItemNonInventory>();
  grout->Name(u"Grout " + run);
  grout->SalesTaxCodeRef()->FullName(u"TAX");
  grout->SalesOrPurchase()->Desc(u"Sanded grout, 25 lb");
  grout->SalesOrPurchase()->Price(u"18.75");
  grout->SalesOrPurchase()->AccountRef()->FullName(u"Sales");
  addItem("udItemNonInventory", udItemNonInventory, grout);

  auto& subtotal = items.subtotal = std::make_shared<DroItemSubtotal>();
  subtotal->Name(u"Materials Subtotal " + run);
  subtotal->ItemDesc(u"Materials subtotal");
  addItem("udItemSubtotal", udItemSubtotal, subtotal);

  auto& discount = items.discount = std::make_shared<DroItemDiscount>();
  discount->Name(u"Repeat Client " + run);
  discount->ItemDesc(u"Repeat client discount");
  discount->DiscountRatePercent(u"5.0");
  discount->AccountRef()->FullName(account->Name());
  addItem("udItemDiscount", udItemDiscount, discount);

  auto haul = std::make_shared<DroItemOtherCharge>();
  haul->Name(u"Debris Haul " + run);
  haul->SalesTaxCodeRef()->FullName(u"NON");
  haul->SalesAndPurchase()->SalesDesc(u"Debris removal, per load");
  haul->SalesAndPurchase()->SalesPrice(u"150");
  haul->SalesAndPurchase()->IncomeAccountRef()->FullName(u"Sales");
  haul->SalesAndPurchase()->PurchaseCost(u"90");
  haul->SalesAndPurchase()->ExpenseAccountRef()->FullName(u"Job Expenses");
  addItem("udItemOtherCharge", udItemOtherCharge, haul);

  auto& labour = items.labour = std::make_shared<DroItemService>();
  labour->Name(u"Tiling Labour " + run);
  labour->SalesTaxCodeRef()->FullName(u"NON");
  labour->SalesAndPurchase()->SalesDesc(u"Tiling, per hour");
  labour->SalesAndPurchase()->SalesPrice(u"65");
  labour->SalesAndPurchase()->IncomeAccountRef()->FullName(u"Sales");
  labour->SalesAndPurchase()->ExpenseAccountRef()->FullName(u"Job Expenses");
  addItem("udItemService", udItemService, labour);

  auto deposit = std::make_shared<DroItemPayment>();
  deposit->Name(u"Deposit " + run);
  deposit->DepositToAccountRef()->FullName(u"Undeposited Funds");
  addItem("udItemPayment", udItemPayment, deposit);

  auto cityTax = std::make_shared<DroItemSalesTax>();
  cityTax->Name(u"City Tax " + run);
  cityTax->ItemDesc(u"City sales tax");
  cityTax->TaxRate(u"1.25");
  addItem("udItemSalesTax", udItemSalesTax, cityTax);

  // What QuickBooks' schema refuses as the component writes it.
  auto kit = std::make_shared<DroItemGroup>();
  kit->Name(u"Tiling Kit " + run);
  kit->IsPrintItemsInGroup(u"true");
  const auto line = kit->ItemGroupLines()->Add();
  line->ItemRef()->FullName(tile->Name());
  line->Quantity(u"4");
  addItem("udItemGroup", udItemGroup, kit, true);

  auto consultation = std::make_shared<DroItemService>();
  consultation->Name(u"Consultation " + run);
  consultation->SalesOrPurchase()->Price(u"80");
  consultation->SalesOrPurchase()->AccountRef()->FullName(u"Sales");
  addItem("udItemService with SalesOrPurchase", udItemService, consultation, true);

  auto check = std::make_shared<DroItemPayment>();
  check->Name(u"Check " + run);
  check->ItemDesc(u"Payment by check");
  addItem("udItemPayment with a description", udItemPayment, check, true);

  auto taxes = std::make_shared<DroItemSalesTaxGroup>();
  taxes->Name(u"State and City " + run);
  taxes->ItemDesc(u"A group holds no members the component can send");
  addItem("udItemSalesTaxGroup", udItemSalesTaxGroup, taxes, true);
  return items;
}

// An item group QuickBooks accepts, as qbXML written here: the component's group builder
// writes a request the schema refuses.
Text itemGroupRequest(const Text& name, const Items& items) {
  DroXmlBuilder escaper;
  const auto line = [&](const Text& item, const char* quantity) {
    return u"<ItemGroupLine><ItemRef><FullName>" + escaper.XmlEscapeX(item) +
           u"</FullName></ItemRef><Quantity>" + fromUtf8(quantity) + u"</Quantity></ItemGroupLine>";
  };
  return u"<?xml version=\"1.0\"?>\r\n<?qbxml version=\"13.0\"?>\r\n<QBXML><QBXMLMsgsRq "
         u"onError=\"stopOnError\"><ItemGroupAddRq requestID=\"2\"><ItemGroupAdd><Name>" +
         escaper.XmlEscapeX(name) + u"</Name><ItemDesc>Tiling set</ItemDesc>" +
         line(items.tile->Name(), "10") + line(items.grout->Name(), "1") +
         line(items.labour->Name(), "4") +
         u"</ItemGroupAdd></ItemGroupAddRq></QBXMLMsgsRq></QBXML>";
}

// The lines every transaction of the demo holds: tile, grout, a subtotal and a discount,
// then one line group of the tiling set.
template <class Lines, class Groups>
void fillLines(Lines& lines, Groups& groups, const Items& items, const Text& set) {
  const auto tile = lines.Add(items.tile->Name());
  tile->ItemRef()->FullName(items.tile->Name());
  tile->ItemType(udItemInventory);
  tile->Quantity(u"12");
  tile->Rate(u"42.50");
  const auto grout = lines.Add(items.grout->Name());
  grout->ItemRef()->FullName(items.grout->Name());
  grout->ItemType(udItemNonInventory);
  grout->Quantity(u"2");
  const auto subtotal = lines.Add(items.subtotal->Name());
  subtotal->ItemRef()->FullName(items.subtotal->Name());
  subtotal->ItemType(udItemSubtotal);
  const auto discount = lines.Add(items.discount->Name());
  discount->ItemRef()->FullName(items.discount->Name());
  discount->ItemType(udItemDiscount);
  const auto group = groups.Add(set);
  group->ItemGroupRef()->FullName(set);
  group->Quantity(u"1");
}

// What was read back of a transaction QuickBooks added: the record, when its ParseRs found
// the answer; otherwise QuickBooks' own figures and why the record stayed as it was.
std::string txnReadBack(Object& record, const Text& txnIdRead, const Text& response,
                        const std::string& retTag, const std::string& total) {
  if (!txnIdRead.empty()) return "read back " + identity(record);
  // The records look for the add-response tags the component has always looked for.
  return "QuickBooks: TxnID " + firstValue(response, "TxnID") + ", " + total + " " +
         firstValue(response, total) + " (sales tax " + firstValue(response, "SalesTaxTotal") +
         "); ParseRs read nothing: it looks for " + retTag.substr(0, retTag.size() - 3) +
         "AddRet, QuickBooks answers " + retTag;
}

// An inventory item's quantity on hand, from a response listing inventory items.
std::string quantityOnHand(const Text& inventoryItems, const Text& item) {
  const size_t at =
      inventoryItems.find(u"<FullName>" + DroXmlBuilder().XmlEscapeX(item) + u"</FullName>");
  return at == Text::npos ? std::string() : firstValue(inventoryItems.substr(at), "QuantityOnHand");
}

void addEstimateAndInvoice(Report& report, Session& session, const Text& run, const Text& customer,
                           const Items& items) {
  const Text set = u"Tiling Set " + run;
  const Text groupResponse =
      report.send(session, "An item group, as qbXML", itemGroupRequest(set, items));
  report.step(session.status() == RSSuccess ? Outcome::Succeeded : Outcome::Unexpected,
              "Item group \"" + toUtf8(set) + "\" sent as qbXML (not the component's builder)",
              statusLine(session, groupResponse));

  DroXmlBuilder& builder = *session.facade().XML();
  auto estimate = std::make_shared<DroEstimate>();
  estimate->CustomerRef()->FullName(customer);
  estimate->Memo(u"Bathroom floor, estimate " + run);
  fillLines(*estimate->EstimateLines(), *estimate->EstimateLineGroups(), items, set);
  builder.BuildAddEstimate(estimate);
  const std::string estimateTitle = "BuildAddEstimate for \"" + toUtf8(customer) + "\"";
  const Text estimated = report.send(session, estimateTitle, builder.XML());
  const bool estimateOk = builder.IsSuccessRs(estimated, estimate->RequestID());
  estimate->ParseRs(estimated);
  report.step(estimateOk ? Outcome::Succeeded : Outcome::Unexpected, estimateTitle,
              statusLine(session, estimated),
              txnReadBack(*estimate, estimate->TxnID(), estimated, "EstimateRet", "TotalAmount"));
  // An estimate holding a line group cannot be dumped: PrintOut raises 13.
  report.dump("PrintOut", [&] { return estimate->PrintOut(); });

  QueryOptions inventory;
  inventory.kind = udEtItemInv;
  const std::string before = quantityOnHand(
      report.send(session, "Inventory items", buildQuery(inventory)), items.tile->Name());
  auto invoice = std::make_shared<DroInvoice>();
  invoice->CustomerRef()->FullName(customer);
  invoice->PONumber(u"PO-" + run);
  fillLines(*invoice->InvoiceLines(), *invoice->InvoiceLineGroups(), items, set);
  invoice->InvoiceLines()->Item(Variant(items.tile->Name()))->ServiceDate(u"2026-11-20");
  builder.BuildAddInvoice(invoice);
  const std::string invoiceTitle = "BuildAddInvoice for \"" + toUtf8(customer) + "\"";
  const Text invoiced = report.send(session, invoiceTitle, builder.XML());
  const bool invoiceOk = builder.IsSuccessRs(invoiced, invoice->RequestID());
  invoice->ParseRs(invoiced);
  report.step(invoiceOk ? Outcome::Succeeded : Outcome::Unexpected, invoiceTitle,
              statusLine(session, invoiced),
              txnReadBack(*invoice, invoice->TxnID(), invoiced, "InvoiceRet", "BalanceRemaining"));
  report.dump("The line group's PrintOut",
              [&] { return invoice->InvoiceLineGroups()->Item(Variant(1))->PrintOut(); });
  const std::string title = "BuildQueryByAll udEtItemInv after the invoice";
  const Text stock = report.send(session, title, buildQuery(inventory));
  const std::string after = quantityOnHand(stock, items.tile->Name());
  report.step(before != after ? Outcome::Succeeded : Outcome::Unexpected, title,
              statusLine(session, stock),
              "QuantityOnHand of \"" + toUtf8(items.tile->Name()) + "\" " + before + " before, " +
                  after + " after (12 on a line, 10 in the set)");
}

// With sales tax off, QuickBooks refuses a line tax code: the wrapper reports it with its own
// status for each transaction kind.
void taxCodeOutcome(Io io, Report& report, const ConnectionOptions& options) {
  report.out() << "\nA company file with sales tax off: " << options.company << '\n';
  Session session(io, options);
  if (!session.open()) {
    report.step(Outcome::Unexpected, "A session on the company without sales tax", "no session");
    return;
  }
  DroXmlBuilder& builder = *session.facade().XML();
  auto customer = std::make_shared<DroCustomer>();
  customer->Name(u"Tax Free Builders");
  addListRecord(report, session, "BuildAddCustomer \"Tax Free Builders\"", customer,
                [&](DroXmlBuilder& b) { b.BuildAddCustomer(customer); });
  auto labour = std::make_shared<DroItemService>();
  labour->Name(u"Labour");
  labour->SalesAndPurchase()->SalesPrice(u"65");
  labour->SalesAndPurchase()->IncomeAccountRef()->FullName(u"Sales");
  labour->SalesAndPurchase()->ExpenseAccountRef()->FullName(u"Job Expenses");
  addListRecord(report, session, "BuildAddItem udItemService \"Labour\"", labour,
                [&](DroXmlBuilder& b) { b.BuildAddItem(udItemService, Variant(labour)); });

  const auto refusedTaxCode = [&](const std::string& title, int32_t expected) {
    const Text response = report.send(session, title, builder.XML());
    report.step(session.status() == expected ? Outcome::RefusedAsExpected : Outcome::Unexpected,
                title, statusLine(session, response));
  };
  auto estimate = std::make_shared<DroEstimate>();
  estimate->CustomerRef()->FullName(customer->Name());
  const auto estimateLine = estimate->EstimateLines()->Add();
  estimateLine->ItemRef()->FullName(u"Labour");
  estimateLine->SalesTaxCodeRef()->FullName(u"NON");
  builder.BuildAddEstimate(estimate);
  refusedTaxCode("BuildAddEstimate, a line with tax code NON", RSTaxErrorEstimate);
  auto invoice = std::make_shared<DroInvoice>();
  invoice->CustomerRef()->FullName(customer->Name());
  const auto invoiceLine = invoice->InvoiceLines()->Add();
  invoiceLine->ItemRef()->FullName(u"Labour");
  invoiceLine->SalesTaxCodeRef()->FullName(u"NON");
  builder.BuildAddInvoice(invoice);
  refusedTaxCode("BuildAddInvoice, a line with tax code NON", RSTaxErrorInvoice);
  // bTaxable true (it works in reverse of its name) keeps the line tax codes out.
  builder.BuildAddInvoice(invoice, true);
  const Text accepted = report.send(session, "BuildAddInvoice with bTaxable true", builder.XML());
  report.step(session.status() == RSSuccess ? Outcome::Succeeded : Outcome::Unexpected,
              "BuildAddInvoice with bTaxable true (no line tax codes)",
              statusLine(session, accepted));
}

// A folder of this run's own for the company files it makes up, removed with everything in
// it at the end: two demos at once, or one left behind, never share a file.
class TemporaryFolder {
 public:
  TemporaryFolder() {
    // Where the folder cannot be made, creating the company files in it reports why.
    std::random_device random;
    std::error_code error;
    do {
      path_ = std::filesystem::temp_directory_path(error) /
              ("droqbxml-demo-" + std::to_string(random()));
    } while (!error && !std::filesystem::create_directory(path_, error) && !error);
  }
  ~TemporaryFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(path_, ignored);
  }
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;

  const std::filesystem::path& path() const { return path_; }

 private:
  std::filesystem::path path_;
};

}  // namespace

int demoCommand(Io io, const ConnectionOptions& options, bool verbose) {
  ConnectionOptions connection = options;
  const TemporaryFolder temporary;
  const bool temporaryCompany = connection.company.empty();
  if (temporaryCompany) connection.company = (temporary.path() / "demo-company.qbw").string();
  ConnectionOptions noTax = connection;
  noTax.company = (temporary.path() / "no-sales-tax.qbw").string();
  const std::vector<std::string> allowed{connection.appName ? *connection.appName
                                                            : componentAppName()};
  try {
    if (!std::filesystem::exists(connection.company)) {
      simulator::CompanyFile::create(connection.company, {"Demo Company", true, allowed});
      io.out << "Created company file " << connection.company << "\n";
    } else {
      io.out << "Using company file " << connection.company << "\n";
    }
    simulator::CompanyFile::create(noTax.company, {"No Sales Tax Company", false, allowed});
  } catch (const simulator::CompanyFileError& error) {
    io.err << "droqbxml: " << error.what() << '\n';
    return kExitConnection;
  }

  Report report(io, verbose);
  {
    const ProcessorOverride override(connection.processor);
    {
      Session session(io, connection);
      if (!session.open()) return kExitConnection;
      io.out << "Connected as \"" << toUtf8(session.facade().API()->appName()) << "\" ("
             << toUtf8(session.facade().API()->appID()) << "), session on "
             << toUtf8(session.facade().API()->GetCurrentCompanyFileName()) << "\n\n";
      const auto all = [](int32_t kind) {
        QueryOptions options;
        options.kind = kind;
        return options;
      };
      query(report, session, "BuildQueryByAll udEtAccount", all(udEtAccount), "AccountRet");
      query(report, session, "BuildQueryByAll udEtItemInv", all(udEtItemInv), "ItemInventoryRet");
      query(report, session, "BuildQueryByAll udEtItemNonInv", all(udEtItemNonInv),
            "ItemNonInventoryRet");
      query(report, session, "BuildQueryByAll udEtItemOther", all(udEtItemOther),
            "ItemOtherChargeRet");
      const Text run = runLabel(
          query(report, session, "BuildQueryByAll udEtCustomer", all(udEtCustomer), "CustomerRet"));

      auto kim = std::make_shared<DroCustomer>();
      kim->Name(u"Kim Lee " + run);
      kim->CompanyName(u"Lee & Daughters");
      kim->FirstName(u"Kim");
      kim->LastName(u"Lee");
      kim->BillAddress()->Addr1(u"12 Harbour Road");
      kim->BillAddress()->City(u"Portsmouth");
      kim->BillAddress()->State(u"NH");
      kim->BillAddress()->PostalCode(u"03801");
      kim->BillAddress()->Country(u"");  // an empty field makes the address count as filled
      kim->Phone(u"603-555-0142");
      addListRecord(report, session, "BuildAddCustomer \"" + toUtf8(kim->Name()) + "\"", kim,
                    [&](DroXmlBuilder& b) { b.BuildAddCustomer(kim); });
      auto kitchen = std::make_shared<DroCustomer>();
      kitchen->Name(u"Kitchen remodel");
      kitchen->ParentRef()->FullName(kim->Name());
      kitchen->JobStatus(u"InProgress");
      kitchen->JobDesc(u"New cabinets and counters");
      addListRecord(report, session, "BuildAddJob \"Kitchen remodel\"", kitchen,
                    [&](DroXmlBuilder& b) { b.BuildAddJob(kitchen); });

      QueryOptions byName;
      byName.kind = udEtCustomer;
      byName.fullName = toUtf8(kitchen->FullName().empty() ? kim->Name() + u":Kitchen remodel"
                                                           : kitchen->FullName());
      const Text named = report.send(session, "A job by full name", buildQuery(byName));
      DroCustomer found;
      found.ParseRs(named);
      report.step(found.ListID().empty() ? Outcome::Unexpected : Outcome::Succeeded,
                  "BuildQueryByFullName \"" + byName.fullName.value() + "\"",
                  statusLine(session, named), "read " + identity(found));
      report.dump("PrintOut", [&] { return found.PrintOut(); });
      QueryOptions byId;
      byId.kind = udEtCustomer;
      byId.listId = toUtf8(kim->ListID());
      const Text identified = report.send(session, "A customer by list id", buildQuery(byId));
      DroCustomer same;
      same.ParseRs(identified);
      report.step(same.ListID().empty() ? Outcome::Unexpected : Outcome::Succeeded,
                  "BuildQueryByListID " + byId.listId.value(), statusLine(session, identified),
                  "read " + identity(same));
      report.dump("PrintOut", [&] { return same.PrintOut(); });

      const Items items = addAccountAndItems(report, session, run);
      const Text customer = kitchen->FullName().empty() ? kim->Name() : kitchen->FullName();
      addEstimateAndInvoice(report, session, run, customer, items);
    }
    taxCodeOutcome(io, report, noTax);
  }
  io.out << "Sessions ended, connections closed.\n";
  report.summary(connection.company, temporaryCompany);
  return report.allAsExpected() ? kExitSuccess : kExitNotSuccess;
}

}  // namespace droqbxml::cli

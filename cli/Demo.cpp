// droqbxml demo: the main job on a new machine. It creates (or reuses) a company file of
// the embedded stand-in, opens a connection and a session through the facade, sends the
// builder's queries for accounts, items and customers, adds a customer, a job, an account
// and an item of every kind the component builds, reads each back from its add response,
// and prints every exchange. Requests that QuickBooks' schema refuses as the component
// writes them are sent too, and shown with the status and what lint finds in them.
#include <filesystem>
#include <functional>
#include <iostream>
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

// Sends one request and prints it with the answer; where the stand-in's schema check
// refused it, also the lint diagnosis of the request.
Text exchange(Io io, Session& session, const std::string& title, const Text& request) {
  io.out << kRule << '\n' << title << "\n" << kRule << "\nRequest:\n" << toUtf8(request) << "\n\n";
  const Text response = session.send(request);
  io.out << "Response status: " << statusText(session.status()) << "\nResponse:\n"
         << toUtf8(response) << (response.empty() || response.back() != u'\n' ? "\n" : "") << '\n';
  if (session.status() == RSParsingError) {
    io.out << "QuickBooks refused the document. What lint finds in it:\n";
    for (const auto& problem : simulator::readRequest(toUtf8(request)).problems) {
      io.out << "  line " << problem.line << ": " << problem.element << ": " << problem.message
             << '\n';
    }
    io.out << '\n';
  }
  return response;
}

Text exchange(Io io, Session& session, const std::string& title, const QueryOptions& query) {
  return exchange(io, session, title, buildQuery(query));
}

// Adds a customer or job through the builder, checks the answer with IsSuccessRs and reads
// the added record back from the add response.
bool addAndReadBack(Io io, Session& session, const Ref<DroCustomer>& customer, bool job) {
  DroXmlBuilder& builder = *session.facade().XML();
  if (job) {
    builder.BuildAddJob(customer);
  } else {
    builder.BuildAddCustomer(customer);
  }
  const Text response =
      exchange(io, session,
               (job ? "Add a job: BuildAddJob " : "Add a customer: BuildAddCustomer ") +
                   toUtf8(customer->Name()),
               builder.XML());
  if (!builder.IsSuccessRs(response, customer->RequestID())) return false;
  customer->ParseRs(response);
  io.out << "Read back with ParseRs, PrintOut:\n" << toUtf8(customer->PrintOut()) << "\n\n";
  return true;
}

// Adds one account or item through `build`, checks the answer with IsSuccessRs and reads the
// record back from its add response. A request the schema is known to refuse counts as
// shown when QuickBooks refuses it with its parse error.
template <class Record>
bool addListRecord(Io io, Session& session, const std::string& title, const Ref<Record>& record,
                   const std::function<void(DroXmlBuilder&)>& build, bool refusedBySchema = false) {
  DroXmlBuilder& builder = *session.facade().XML();
  build(builder);
  const Text response = exchange(io, session, title, builder.XML());
  if (refusedBySchema) {
    io.out << (session.status() == RSParsingError
                   ? "As expected: QuickBooks' schema refuses this request as the component "
                     "writes it (see the README).\n\n"
                   : "Unexpected: this request was meant to be refused by QuickBooks' schema.\n\n");
    return true;
  }
  if (!builder.IsSuccessRs(response, record->RequestID())) return false;
  record->ParseRs(response);
  io.out << "Read back with ParseRs, PrintOut:\n" << toUtf8(record->PrintOut()) << "\n\n";
  return true;
}

// The account and one item of every kind the builder writes, named after this run.
bool addAccountAndItems(Io io, Session& session, const Text& run) {
  bool added = true;
  const auto addItem = [&](const std::string& title, udItemType kind, const auto& item,
                           bool refused = false) {
    added = addListRecord(
                io, session, "Add an item: BuildAddItem " + title, item,
                [&](DroXmlBuilder& b) { b.BuildAddItem(kind, Variant(item)); }, refused) &&
            added;
  };

  auto account = std::make_shared<DroAccount>();
  account->Name(u"Job Materials " + run);
  account->AccountType(u"Expense");
  account->AccountNumber(u"6" + run);
  account->Desc(u"Materials bought for jobs, by job");  // cut to 29 characters
  added = addListRecord(io, session, "Add an account: BuildAddAccount " + toUtf8(account->Name()),
                        account, [&](DroXmlBuilder& b) { b.BuildAddAccount(account); });

  auto tile = std::make_shared<DroItemInventory>();
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

  auto grout = std::make_shared<DroItemNonInventory>();
  grout->Name(u"Grout " + run);
  grout->SalesTaxCodeRef()->FullName(u"TAX");
  grout->SalesOrPurchase()->Desc(u"Sanded grout, 25 lb");
  grout->SalesOrPurchase()->Price(u"18.75");
  grout->SalesOrPurchase()->AccountRef()->FullName(u"Sales");
  addItem("udItemNonInventory", udItemNonInventory, grout);

  auto subtotal = std::make_shared<DroItemSubtotal>();
  subtotal->Name(u"Materials Subtotal " + run);
  subtotal->ItemDesc(u"Materials subtotal");
  addItem("udItemSubtotal", udItemSubtotal, subtotal);

  auto discount = std::make_shared<DroItemDiscount>();
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

  auto labour = std::make_shared<DroItemService>();
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
  addItem("udItemGroup (refused)", udItemGroup, kit, true);

  auto consultation = std::make_shared<DroItemService>();
  consultation->Name(u"Consultation " + run);
  consultation->SalesOrPurchase()->Price(u"80");
  consultation->SalesOrPurchase()->AccountRef()->FullName(u"Sales");
  addItem("udItemService with SalesOrPurchase (refused)", udItemService, consultation, true);

  auto check = std::make_shared<DroItemPayment>();
  check->Name(u"Check " + run);
  check->ItemDesc(u"Payment by check");
  addItem("udItemPayment with a description (refused)", udItemPayment, check, true);

  auto taxes = std::make_shared<DroItemSalesTaxGroup>();
  taxes->Name(u"State and City " + run);
  taxes->ItemDesc(u"A group holds no members the component can send");
  addItem("udItemSalesTaxGroup (refused)", udItemSalesTaxGroup, taxes, true);
  return added;
}

}  // namespace

int demoCommand(Io io, const ConnectionOptions& options) {
  ConnectionOptions connection = options;
  std::filesystem::path temporary;
  if (connection.company.empty()) {
    temporary = std::filesystem::temp_directory_path() / "droqbxml-demo";
    std::error_code ignored;
    std::filesystem::remove_all(temporary, ignored);
    std::filesystem::create_directories(temporary);
    connection.company = (temporary / "demo-company.qbw").string();
  }
  if (!std::filesystem::exists(connection.company)) {
    try {
      simulator::CompanyFile::create(connection.company, {"Demo Company", true});
      io.out << "Created company file " << connection.company << "\n\n";
    } catch (const simulator::CompanyFileError& error) {
      io.err << "droqbxml: " << error.what() << '\n';
      return kExitConnection;
    }
  } else {
    io.out << "Using company file " << connection.company << "\n\n";
  }

  int code = kExitSuccess;
  {
    const ProcessorOverride override(connection.processor);
    Session session(io, connection);
    if (!session.open()) return kExitConnection;
    io.out << "Connected as \"" << toUtf8(session.facade().API()->appName()) << "\" ("
           << toUtf8(session.facade().API()->appID()) << "), session on "
           << toUtf8(session.facade().API()->GetCurrentCompanyFileName()) << "\n\n";
    QueryOptions accounts;
    accounts.kind = udEtAccount;
    exchange(io, session, "All accounts (BuildQueryByAll udEtAccount)", accounts);
    for (const auto& [kind, title] :
         {std::pair{udEtItemInv, "Inventory items (BuildQueryByAll udEtItemInv)"},
          std::pair{udEtItemNonInv, "Non-inventory items (BuildQueryByAll udEtItemNonInv)"},
          std::pair{udEtItemOther, "Other charges (BuildQueryByAll udEtItemOther)"}}) {
      QueryOptions items;
      items.kind = kind;
      exchange(io, session, title, items);
    }
    QueryOptions customers;
    customers.kind = udEtCustomer;
    const Text existing =
        exchange(io, session, "All customers (BuildQueryByAll udEtCustomer)", customers);

    auto kim = std::make_shared<DroCustomer>();
    kim->Name(u"Kim Lee " + runLabel(existing));
    kim->CompanyName(u"Lee & Daughters");
    kim->FirstName(u"Kim");
    kim->LastName(u"Lee");
    kim->BillAddress()->Addr1(u"12 Harbour Road");
    kim->BillAddress()->City(u"Portsmouth");
    kim->BillAddress()->State(u"NH");
    kim->BillAddress()->PostalCode(u"03801");
    kim->BillAddress()->Country(u"");  // an empty field makes the address count as filled
    kim->Phone(u"603-555-0142");
    bool added = addAndReadBack(io, session, kim, false);
    auto kitchen = std::make_shared<DroCustomer>();
    kitchen->Name(u"Kitchen remodel");
    kitchen->ParentRef()->FullName(kim->Name());
    kitchen->JobStatus(u"InProgress");
    kitchen->JobDesc(u"New cabinets and counters");
    added = addAndReadBack(io, session, kitchen, true) && added;

    QueryOptions byName;
    byName.kind = udEtCustomer;
    byName.fullName = toUtf8(kitchen->FullName().empty() ? kim->Name() + u":Kitchen remodel"
                                                         : kitchen->FullName());
    const Text named = exchange(io, session, "A job by full name (BuildQueryByFullName)", byName);
    DroCustomer found;
    found.ParseRs(named);
    io.out << "PrintOut:\n" << toUtf8(found.PrintOut()) << "\n\n";
    QueryOptions byId;
    byId.kind = udEtCustomer;
    byId.listId = toUtf8(kim->ListID());
    const Text identified =
        exchange(io, session, "A customer by list id (BuildQueryByListID)", byId);
    DroCustomer same;
    same.ParseRs(identified);
    io.out << "PrintOut:\n" << toUtf8(same.PrintOut()) << "\n\n";
    if (session.status() != RSSuccess) added = false;
    added = addAccountAndItems(io, session, runLabel(existing)) && added;
    if (!added) code = kExitNotSuccess;
  }
  io.out << "Session ended, connection closed.\n";
  if (!temporary.empty()) {
    std::error_code ignored;
    std::filesystem::remove_all(temporary, ignored);
  }
  return code;
}

}  // namespace droqbxml::cli

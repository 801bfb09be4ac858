// droqbxml demo: the main job on a new machine. It creates (or reuses) a company file of
// the embedded stand-in, opens a connection and a session through the facade, sends the
// builder's queries for accounts, items and customers, and prints every exchange.
#include <filesystem>
#include <iostream>
#include <string>
#include <system_error>
#include <utility>

#include "cli/Cli.hpp"
#include "cli/Commands.hpp"
#include "droqbxml/records/DroCustomer.hpp"
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
    if (!added || session.status() != RSSuccess) code = kExitNotSuccess;
  }
  io.out << "Session ended, connection closed.\n";
  if (!temporary.empty()) {
    std::error_code ignored;
    std::filesystem::remove_all(temporary, ignored);
  }
  return code;
}

}  // namespace droqbxml::cli

// The droqbxml command's arguments, parsed with CLI11, and the dispatch to the commands.
// The embedded QuickBooks stand-in answers where no platform request processor exists.
#include "cli/Cli.hpp"

#include <CLI/CLI.hpp>
#include <array>
#include <map>
#include <string>

#include "cli/Commands.hpp"
#include "droqbxml/connection/RequestProcessor.hpp"
#include "droqbxml/qbxml/Enumerations.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/Simulator.hpp"

namespace droqbxml::cli {
namespace {

struct Named {
  const char* name;
  int32_t value;
};

constexpr std::array<Named, 9> kEntityKinds{{
    {"customer", udEtCustomer},
    {"job", udEtjob},
    {"estimate", udEtEstimate},
    {"invoice", udEtInvoice},
    {"item", udEtItem},
    {"account", udEtAccount},
    {"item-inventory", udEtItemInv},
    {"item-non-inventory", udEtItemNonInv},
    {"item-other-charge", udEtItemOther},
}};

constexpr std::array<Named, 11> kItemKinds{{
    {"non-inventory", udItemNonInventory},
    {"subtotal", udItemSubtotal},
    {"inventory", udItemInventory},
    {"discount", udItemDiscount},
    {"group", udItemGroup},
    {"other-charge", udItemOtherCharge},
    {"payment", udItemPayment},
    {"sales-tax", udItemSalesTax},
    {"sales-tax-group", udItemSalesTaxGroup},
    {"service", udItemService},
    {"payroll-item-wage", udItemPayrollItemWage},
}};

constexpr std::array<Named, 3> kActiveStates{{
    {"active", udAsActiveOnly},
    {"inactive", udAsInactiveOnly},
    {"all", udAsAll},
}};

template <size_t N>
std::map<std::string, int32_t> choices(const std::array<Named, N>& table) {
  std::map<std::string, int32_t> map;
  for (const auto& entry : table) map.emplace(entry.name, entry.value);
  return map;
}

const std::map<std::string, bool> kOnOff{{"on", true}, {"off", false}};

// The stand-in answers for QuickBooks when asked to through the environment, and wherever
// the platform has no request processor of its own.
void selectDefaultProcessor() {
  if (simulator::installIfRequested()) return;
  if (registeredRequestProcessor(kRequestProcessorProgId)) return;
  try {
    (void)createRequestProcessor(kRequestProcessorProgId);
  } catch (const ComError&) {
    simulator::install();
  }
}

void addConnectionOptions(CLI::App& command, ConnectionOptions& options) {
  command.add_option("--company", options.company, "Company file to open (full path)");
}

void addQueryOptions(CLI::App& command, QueryOptions& options) {
  command.add_option("KIND", options.kind, "What to query")
      ->required()
      ->transform(CLI::CheckedTransformer(choices(kEntityKinds), CLI::ignore_case));
  auto* fullName = command.add_option("--full-name", options.fullName, "One record by full name");
  auto* listId = command.add_option("--list-id", options.listId, "One record by list identifier");
  auto* itemKind =
      command.add_option("--item-kind", options.itemKind, "Item kind, with item --full-name")
          ->transform(CLI::CheckedTransformer(choices(kItemKinds), CLI::ignore_case))
          ->needs(fullName);
  auto* active = command.add_option("--active", options.active, "Filter by active status")
                     ->transform(CLI::CheckedTransformer(choices(kActiveStates), CLI::ignore_case));
  command.add_option("--from", options.from, "Modified on or after this date")->needs(active);
  command.add_option("--to", options.to, "Modified on or before this date")->needs(active);
  fullName->excludes(listId)->excludes(active);
  listId->excludes(active);
  (void)itemKind;
}

}  // namespace

int run(int argc, const char* const* argv, std::istream& in, std::ostream& out, std::ostream& err) {
  CLI::App app{"Exchanges qbXML with a QuickBooks company file through DroQbXml.", "droqbxml"};
  app.require_subcommand(1);
  ConnectionOptions connection;
  app.add_option("--app-name", connection.appName, "Application name shown to QuickBooks");
  app.add_option("--app-id", connection.appId, "Application identifier");
  app.add_option("--processor", connection.processor,
                 "ProgID of the registered request processor to use");

  std::string file;
  auto* send = app.add_subcommand("send", "Send a request document and print the response");
  send->add_option("FILE", file, "Request document, or - for standard input")->required();
  addConnectionOptions(*send, connection);

  QueryOptions query;
  auto* querySub =
      app.add_subcommand("query", "Build a query request, send it, print the response");
  addQueryOptions(*querySub, query);
  addConnectionOptions(*querySub, connection);

  QueryOptions built;
  auto* build = app.add_subcommand("build", "Print a request document instead of sending it");
  build->require_subcommand(1);
  auto* buildQuery = build->add_subcommand("query", "Print a query request document");
  addQueryOptions(*buildQuery, built);

  std::string text;
  auto* escape =
      app.add_subcommand("escape", "Escape text as the component writes it into requests");
  escape->add_option("TEXT", text)->required();
  auto* unescape = app.add_subcommand("unescape", "Unescape text as the component reads responses");
  unescape->add_option("TEXT", text)->required();

  CompanyOptions company;
  auto* companyCommand =
      app.add_subcommand("company", "Create and manage company files of the embedded stand-in");
  companyCommand->require_subcommand(1);
  auto* create = companyCommand->add_subcommand("create", "Create a new company file");
  create->add_option("PATH", company.path, "Company file to create")->required();
  create->add_option("--name", company.name, "Company name");
  create->add_option("--sales-tax", company.salesTax, "Sales tax on or off")
      ->transform(CLI::CheckedTransformer(kOnOff, CLI::ignore_case));
  auto* show = companyCommand->add_subcommand("show", "Summarise a company file");
  show->add_option("PATH", company.path, "Company file")->required();
  auto* allow =
      companyCommand->add_subcommand("allow", "Allow an application to use the company file");
  allow->add_option("PATH", company.path, "Company file")->required();
  allow->add_option("APPNAME", company.appName, "Application name")->required();
  allow->add_option("--auto-login", company.autoLogin, "May log in without a user present")
      ->transform(CLI::CheckedTransformer(kOnOff, CLI::ignore_case));
  auto* deny = companyCommand->add_subcommand("deny", "Refuse an application the company file");
  deny->add_option("PATH", company.path, "Company file")->required();
  deny->add_option("APPNAME", company.appName, "Application name")->required();

  auto* lint = app.add_subcommand(
      "lint", "Check a request document against qbXML 13.0 and name each problem");
  lint->add_option("FILE", file, "Request document, or - for standard input")->required();

  auto* demo = app.add_subcommand(
      "demo",
      "Add customers, items, an estimate and an invoice to a company file of the embedded "
      "stand-in: a line a step (what was sent, the status, the record read back) and a summary");
  addConnectionOptions(*demo, connection);
  demo->get_option("--company")
      ->description(
          "Company file to use, created when missing and kept (default: a temporary one)");
  bool verbose = false;
  demo->add_flag("--verbose,-v", verbose,
                 "Also print every request, response and record dump, and what lint finds in "
                 "each refused request");

  int port = 7371;
  auto* relay = app.add_subcommand(
      "relay", "Serve the request processor to Windows programs under Wine (see com/relay)");
  relay->add_option("--port", port, "Loopback port to listen on")->capture_default_str();

  try {
    app.parse(argc, argv);
    for (const QueryOptions* q : {&query, &built}) {
      if (q->fullName && q->kind == udEtItem && !q->itemKind) {
        throw CLI::ValidationError("--item-kind", "item --full-name needs --item-kind");
      }
    }
  } catch (const CLI::ParseError& error) {
    const int code = app.exit(error, out, err);
    return code == 0 ? kExitSuccess : kExitUsage;
  }

  const Io io{in, out, err};
  selectDefaultProcessor();
  try {
    if (send->parsed()) return sendCommand(io, file, connection);
    if (querySub->parsed()) return queryCommand(io, query, connection);
    if (buildQuery->parsed()) return buildQueryCommand(io, built);
    if (escape->parsed()) return escapeCommand(io, text);
    if (unescape->parsed()) return unescapeCommand(io, text);
    if (create->parsed()) return companyCreateCommand(io, company);
    if (show->parsed()) return companyShowCommand(io, company);
    if (allow->parsed()) return companyAllowCommand(io, company);
    if (deny->parsed()) return companyDenyCommand(io, company);
    if (lint->parsed()) return lintCommand(io, file);
    if (demo->parsed()) return demoCommand(io, connection, verbose);
    if (relay->parsed()) return relayCommand(io, port, connection);
  } catch (const ComError& error) {
    err << "droqbxml: " << error.what() << " (error " << error.number() << ", "
        << toUtf8(error.source()) << ")\n";
    return kExitNotSuccess;
  }
  return kExitUsage;
}

}  // namespace droqbxml::cli

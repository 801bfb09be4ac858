// The droqbxml command's arguments, parsed with CLI11, and the dispatch to the commands.
// The embedded QuickBooks stand-in answers where no platform request processor exists.
#include "cli/Cli.hpp"

#include <CLI/CLI.hpp>
#include <array>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <string>
#include <utility>
#include <vector>

#include "cli/Commands.hpp"
#include "droqbxml/connection/RequestProcessor.hpp"
#include "droqbxml/qbxml/Enumerations.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/Simulator.hpp"
#include "webconnector/WebConnector.hpp"

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

// Makes `option` accept one of the table's names (any case) and store its value; help and
// errors show the names only.
template <size_t N>
CLI::Option* named(CLI::Option* option, const std::array<Named, N>& table) {
  std::vector<std::pair<std::string, int32_t>> pairs;
  std::string names;
  for (const auto& entry : table) {
    pairs.emplace_back(entry.name, entry.value);
    names += names.empty() ? "" : "|";
    names += entry.name;
  }
  const CLI::Validator validator(
      [pairs, names](std::string& text) -> std::string {
        for (const auto& [name, value] : pairs) {
          if (CLI::detail::to_lower(text) == name) {
            text = std::to_string(value);
            return {};
          }
        }
        return "'" + text + "' is not one of " + names;
      },
      "");
  return option->transform(validator)->type_name(names);
}

constexpr std::array<Named, 2> kOnOff{{{"on", 1}, {"off", 0}}};
constexpr std::array<Named, 2> kFormats{{{"xml", 0}, {"json", 1}}};

// A date as qbXML writes it, yyyy-mm-dd, that exists in the calendar.
const CLI::Validator kQbxmlDate(
    [](std::string& text) -> std::string {
      int year = 0;
      unsigned month = 0;
      unsigned day = 0;
      char tail = 0;
      if (text.size() != 10 || text[4] != '-' || text[7] != '-' ||
          std::sscanf(text.c_str(), "%4d-%2u-%2u%c", &year, &month, &day, &tail) != 3) {
        return "not a date of the form yyyy-mm-dd: " + text;
      }
      const std::chrono::year_month_day date{std::chrono::year{year}, std::chrono::month{month},
                                             std::chrono::day{day}};
      if (!date.ok()) return "no such date: " + text;
      return {};
    },
    "yyyy-mm-dd", "qbXML date");

// The relay port of a Web Connector service on this machine: DROQBXML_WEBCONNECTOR_PORT, or
// the service's default.
int webConnectorPort() {
  const char* port = std::getenv("DROQBXML_WEBCONNECTOR_PORT");
  return port != nullptr && std::atoi(port) > 0 ? std::atoi(port) : 7372;
}

// The stand-in answers for QuickBooks when asked to through the environment, and wherever
// the platform has no request processor of its own. "DroQbXml.WebConnector" reaches the
// Web Connector service running on this machine, unless the host installed one itself.
void selectDefaultProcessor(const ConnectionOptions& connection) {
  if (!registeredRequestProcessor(webconnector::kWebConnectorProgId)) {
    const int port = webConnectorPort();
    const std::optional<int> wait = connection.wait;
    registerRequestProcessor(webconnector::kWebConnectorProgId,
                             [port, wait] { return relayClient(port, wait); });
  }
  if (simulator::installIfRequested()) return;
  if (registeredRequestProcessor(kRequestProcessorProgId)) return;
  try {
    (void)createRequestProcessor(kRequestProcessorProgId);
  } catch (const ComError&) {
    simulator::install();
  }
}

void addQueryOptions(CLI::App& command, QueryOptions& options) {
  named(command.add_option("KIND", options.kind, "What to query")->required(), kEntityKinds);
  auto* fullName = command.add_option("--full-name", options.fullName, "One record by full name");
  auto* listId = command.add_option("--list-id", options.listId, "One record by list identifier");
  auto* itemKind =
      named(command.add_option("--item-kind", options.itemKind, "Item kind, with item --full-name"),
            kItemKinds);
  itemKind->needs(fullName);
  auto* active = named(command.add_option("--active", options.active, "Filter by active status"),
                       kActiveStates);
  command.add_option("--from", options.from, "Modified on or after this date")
      ->check(kQbxmlDate)
      ->type_name("DATE")
      ->needs(active);
  command.add_option("--to", options.to, "Modified on or before this date")
      ->check(kQbxmlDate)
      ->type_name("DATE")
      ->needs(active);
  fullName->excludes(listId)->excludes(active);
  listId->excludes(active);
}

}  // namespace

constexpr const char* kExitCodes =
    "Exit codes (every command):\n"
    "  0  done; every response QuickBooks sent has statusSeverity Info\n"
    "  1  a response is a warning or an error; lint found problems\n"
    "  2  usage: bad arguments, an existing file, a request document that is unreadable,\n"
    "     empty, not a regular file, over 100 MB or not UTF-8\n"
    "  3  no request processor, no connection or session, a company file that cannot be\n"
    "     opened, a request QuickBooks could not parse, a response that is not qbXML, or\n"
    "     a failure nothing foresaw\n";

namespace {

int runCommand(int argc, const char* const* argv, std::istream& in, std::ostream& out,
               std::ostream& err) {
  CLI::App app{"Exchanges qbXML with a QuickBooks company file through DroQbXml.", "droqbxml"};
  app.require_subcommand(1);
  // Global options may come before or after the command.
  app.fallthrough();
  app.footer(kExitCodes);
  app.failure_message([](const CLI::App* /*app*/, const CLI::Error& error) {
    return std::string("droqbxml: ") + error.what() + " (see droqbxml --help)\n";
  });
  app.set_version_flag("--version",
                       std::string("droqbxml ") + DROQBXML_VERSION + " (qbXML 13.0 requests)");
  ConnectionOptions connection;
  app.add_option("--app-name", connection.appName, "Application name shown to QuickBooks");
  app.add_option("--app-id", connection.appId, "Application identifier");
  app.add_option("--processor", connection.processor,
                 "ProgID of the registered request processor to use");
  app.add_option("--company", connection.company,
                 "Company file to open; \"C:\\...\" paths map as the component maps them "
                 "(demo: created when missing and kept; default a temporary one)");
  app.add_option("--wait", connection.wait,
                 "Seconds the Web Connector processor waits for QuickBooks (session and "
                 "each request)")
      ->check(CLI::PositiveNumber);
  app.add_option("--trace", connection.traceFile,
                 "Append the component's trace of each exchange to this file");

  int format = 0;
  const auto addFormat = [&](CLI::App& command) {
    named(command.add_option("--format", format, "Output: the response document, or JSON"),
          kFormats);
  };

  std::string file;
  auto* send = app.add_subcommand(
      "send",
      "Send a request document; the response on standard output, a status line per "
      "response on standard error");
  send->add_option("FILE", file, "Request document, or - for standard input")->required();
  addFormat(*send);

  QueryOptions query;
  auto* querySub =
      app.add_subcommand("query", "Build a query request, send it, print the response");
  addQueryOptions(*querySub, query);
  addFormat(*querySub);

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
  int salesTax = 1;
  int autoLogin = 1;
  auto* companyCommand =
      app.add_subcommand("company", "Create and manage company files of the embedded stand-in");
  companyCommand->require_subcommand(1);
  auto* create = companyCommand->add_subcommand("create", "Create a new company file");
  create->add_option("PATH", company.path, "Company file to create")->required();
  create->add_option("--name", company.name, "Company name");
  named(create->add_option("--sales-tax", salesTax, "Sales tax on or off"), kOnOff);
  create->add_option("--allow", company.allow,
                     "An application the file lets in (repeatable; default: the component's own "
                     "application name)");
  auto* show = companyCommand->add_subcommand("show", "Summarise a company file");
  show->add_option("PATH", company.path, "Company file")->required();
  auto* allow =
      companyCommand->add_subcommand("allow", "Allow an application to use the company file");
  allow->add_option("PATH", company.path, "Company file")->required();
  allow->add_option("APPNAME", company.appName, "Application name")->required();
  named(allow->add_option("--auto-login", autoLogin, "May log in without a user present"), kOnOff);
  auto* deny = companyCommand->add_subcommand("deny", "Refuse an application the company file");
  deny->add_option("PATH", company.path, "Company file")->required();
  deny->add_option("APPNAME", company.appName, "Application name")->required();

  auto* lint = app.add_subcommand(
      "lint", "Check a request document against qbXML 13.0 and name each problem");
  lint->add_option("FILE", file, "Request document, or - for standard input")->required();

  auto* paths = app.add_subcommand(
      "paths", "Print the component's installation folder and the logs it writes there");

  auto* demo = app.add_subcommand(
      "demo",
      "Add customers, items, an estimate and an invoice to a company file of the embedded "
      "stand-in: a line a step (what was sent, the status, the record read back) and a summary");
  bool verbose = false;
  demo->add_flag("--verbose,-v", verbose,
                 "Also print every request, response and record dump, and what lint finds in "
                 "each refused request");

  int port = 7371;
  auto* relay = app.add_subcommand(
      "relay", "Serve the request processor to Windows programs under Wine (see com/relay)");
  relay->add_option("--port", port, "Loopback port to listen on")->capture_default_str();

  std::string wcConfig;
  auto* web = app.add_subcommand("webconnector",
                                 "Serve Intuit's Web Connector, and what setting it up needs");
  web->require_subcommand(1);
  auto* serve = web->add_subcommand(
      "serve", "Run the Web Connector service in the foreground until SIGTERM (log on stderr)");
  serve->add_option("--config", wcConfig, "Service configuration file")->required();
  std::string wcUser;
  std::optional<std::string> wcCompany;
  auto* passwd = web->add_subcommand(
      "passwd", "Set a Web Connector user's password (read from standard input) in the file");
  passwd->add_option("--config", wcConfig, "Service configuration file (created when missing)")
      ->required();
  passwd->add_option("USER", wcUser, "User name")->required();
  passwd->add_option("--company", wcCompany, "The company file this user's Web Connector serves");
  std::optional<std::string> appUrl;
  std::optional<std::string> qwcOutput;
  int everyMinutes = 1;
  auto* qwc = web->add_subcommand(
      "qwc", "Write the .qwc file a QuickBooks administrator adds to the Web Connector");
  qwc->add_option("--config", wcConfig, "Service configuration file")->required();
  qwc->add_option("USER", wcUser, "User name the Web Connector logs in as")->required();
  qwc->add_option("--app-url", appUrl, "The service's URL as the Web Connector reaches it");
  qwc->add_option("--every", everyMinutes, "Minutes between scheduled runs (0: none)")
      ->capture_default_str();
  qwc->add_option("--output,-o", qwcOutput, "File to write (default: standard output)");
  PlayOptions play;
  auto* playCommand = web->add_subcommand(
      "play", "Play the Web Connector against a service, relaying to the embedded stand-in");
  playCommand->add_option("--url", play.url, "The service's AppURL")->required();
  playCommand->add_option("--user", play.user, "Web Connector user name")->required();
  playCommand->add_option("--password-file", play.passwordFile,
                          "File whose first line is the password (default: standard input)");
  playCommand->add_option("--company", play.companyFile,
                          "Company file of the stand-in to open when the service names none");
  playCommand->add_option("--ca", play.caFile, "Certificates to trust (PEM)");
  playCommand->add_flag("--insecure", play.insecure, "Do not check the service's certificate");
  playCommand->add_option("--runs", play.runs, "Runs to make (0: until stopped)")
      ->capture_default_str();
  playCommand->add_option("--every", play.every, "Seconds between runs")->capture_default_str();
  playCommand
      ->add_option("--noop-pause", play.noOpPause, "Seconds to pause when the service answers NoOp")
      ->capture_default_str();

  try {
    // A first word that names no command would otherwise be reported as a missing one.
    const auto named = [&](const char* word) {
      for (const CLI::App* command : app.get_subcommands({})) {
        if (command->check_name(word)) return true;
      }
      return false;
    };
    if (argc > 1 && argv[1][0] != '-' && !named(argv[1])) {
      throw CLI::ExtrasError("unknown command '" + std::string(argv[1]) + "'",
                             CLI::ExitCodes::ExtrasError);
    }
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
  company.salesTax = salesTax != 0;
  company.autoLogin = autoLogin != 0;
  const auto output = format == 1 ? OutputFormat::Json : OutputFormat::Xml;

  const Io io{in, out, err};
  selectDefaultProcessor(connection);
  try {
    if (send->parsed()) return sendCommand(io, file, connection, output);
    if (querySub->parsed()) return queryCommand(io, query, connection, output);
    if (buildQuery->parsed()) return buildQueryCommand(io, built);
    if (escape->parsed()) return escapeCommand(io, text);
    if (unescape->parsed()) return unescapeCommand(io, text);
    if (create->parsed()) {
      if (company.allow.empty()) company.allow.push_back(componentAppName());
      return companyCreateCommand(io, company);
    }
    if (show->parsed()) return companyShowCommand(io, company);
    if (allow->parsed()) return companyAllowCommand(io, company);
    if (deny->parsed()) return companyDenyCommand(io, company);
    if (lint->parsed()) return lintCommand(io, file);
    if (paths->parsed()) return pathsCommand(io);
    if (demo->parsed()) return demoCommand(io, connection, verbose);
    if (relay->parsed()) return relayCommand(io, port, connection);
    if (serve->parsed()) return webConnectorServeCommand(io, wcConfig);
    if (playCommand->parsed()) return webConnectorPlayCommand(io, play);
    if (passwd->parsed()) return webConnectorPasswdCommand(io, wcConfig, wcUser, wcCompany);
    if (qwc->parsed()) {
      return webConnectorQwcCommand(io, wcConfig, wcUser, appUrl, everyMinutes, qwcOutput);
    }
  } catch (const ComError& error) {
    err << "droqbxml: " << error.what() << " (error " << error.number() << ", "
        << toUtf8(error.source()) << ")\n";
    // Text the component cannot escape or unescape is bad input; anything else is a failure
    // of the exchange.
    return escape->parsed() || unescape->parsed() ? kExitUsage : kExitConnection;
  }
  return kExitUsage;
}

}  // namespace

int run(int argc, const char* const* argv, std::istream& in, std::ostream& out, std::ostream& err) {
  // The last resort: whatever a command did not expect ends it with one line and a code a
  // script knows, never with the runtime's abort.
  try {
    return runCommand(argc, argv, in, out, err);
  } catch (const std::exception& error) {
    err << "droqbxml: unexpected failure: " << error.what() << '\n';
  } catch (...) {
    err << "droqbxml: unexpected failure\n";
  }
  return kExitConnection;
}

}  // namespace droqbxml::cli

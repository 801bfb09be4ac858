// The droqbxml command: send a request document, build and send queries, print a query
// document, escape and unescape text. It is a host of the library like any other: it uses
// the facade, the builder and the wrapper through their public members.
#include "cli/Cli.hpp"

#include <CLI/CLI.hpp>

#include <array>
#include <fstream>
#include <iostream>
#include <iterator>
#include <optional>
#include <sstream>
#include <string>

#include "droqbxml/component/DroXmlProcessor.hpp"
#include "droqbxml/connection/RequestProcessor.hpp"
#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"

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

constexpr std::array<Named, 11> kStatusNames{{
    {"RSUnknown", RSUnknown},
    {"RSSuccess", RSSuccess},
    {"RSNoMatch", RSNoMatch},
    {"RSNotFound", RSNotFound},
    {"RSRefNotFound", RSRefNotFound},
    {"RSTaxErrorInvoice", RSTaxErrorInvoice},
    {"RSTaxErrorEstimate", RSTaxErrorEstimate},
    {"RSParsingError", RSParsingError},
    {"RSCoNameMismatch", RSCoNameMismatch},
    {"RSCantLogin", RSCantLogin},
    {"RSUnsetCoFile", RSUnsetCoFile},
}};

template <size_t N>
std::map<std::string, int32_t> choices(const std::array<Named, N>& table) {
  std::map<std::string, int32_t> map;
  for (const auto& entry : table) map.emplace(entry.name, entry.value);
  return map;
}

std::string statusText(int32_t status) {
  for (const auto& entry : kStatusNames) {
    if (entry.value == status) return std::string(entry.name) + " (" + std::to_string(status) + ")";
  }
  return "status " + std::to_string(status);
}

struct ConnectionOptions {
  std::string company;
  std::optional<std::string> appName;
  std::optional<std::string> appId;
  std::optional<std::string> processor;
};

struct QueryOptions {
  int32_t kind = udEtCustomer;
  std::optional<std::string> fullName;
  std::optional<std::string> listId;
  std::optional<int32_t> itemKind;
  std::optional<int32_t> active;
  std::string from;
  std::string to;
};

// Makes the processor registered as `name` answer for QuickBooks' ProgID while it lives.
class ProcessorOverride {
 public:
  explicit ProcessorOverride(const std::optional<std::string>& name) {
    if (!name) return;
    const Text progId = fromUtf8(*name);
    if (equalsIgnoreCase(progId, kRequestProcessorProgId)) return;
    active_ = true;
    previous_ = registeredRequestProcessor(kRequestProcessorProgId);
    registerRequestProcessor(kRequestProcessorProgId,
                             [progId] { return createRequestProcessor(progId); });
  }
  ~ProcessorOverride() {
    if (!active_) return;
    if (previous_) {
      registerRequestProcessor(kRequestProcessorProgId, previous_);
    } else {
      unregisterRequestProcessor(kRequestProcessorProgId);
    }
  }
  ProcessorOverride(const ProcessorOverride&) = delete;
  ProcessorOverride& operator=(const ProcessorOverride&) = delete;

 private:
  bool active_ = false;
  RequestProcessorFactory previous_;
};

class Commands {
 public:
  Commands(std::istream& in, std::ostream& out, std::ostream& err) : in_(in), out_(out), err_(err) {}

  int send(const std::string& file, const ConnectionOptions& connection) {
    std::optional<Text> request = readRequest(file);
    if (!request) return kExitUsage;
    if (trimView(*request).empty()) err_ << "droqbxml: the request document is empty\n";
    return exchange(*request, connection);
  }

  int query(const QueryOptions& query, const ConnectionOptions& connection) {
    return exchange(buildQuery(query), connection);
  }

  int buildOnly(const QueryOptions& query) {
    out_ << toUtf8(buildQuery(query)) << '\n';
    return kExitSuccess;
  }

  int escape(const std::string& text) {
    out_ << toUtf8(XMLEscapeText(fromUtf8(text))) << '\n';
    return kExitSuccess;
  }

  int unescape(const std::string& text) {
    out_ << toUtf8(XMLUnEscapeText(fromUtf8(text))) << '\n';
    return kExitSuccess;
  }

 private:
  std::optional<Text> readRequest(const std::string& file) {
    std::string bytes;
    if (file == "-") {
      bytes.assign(std::istreambuf_iterator<char>(in_), std::istreambuf_iterator<char>());
    } else {
      std::ifstream stream(file, std::ios::binary);
      if (!stream) {
        err_ << "droqbxml: cannot read the request document \"" << file << "\"\n";
        return std::nullopt;
      }
      bytes.assign(std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>());
    }
    if (bytes.rfind("\xEF\xBB\xBF", 0) == 0) bytes.erase(0, 3);
    return fromUtf8(bytes);
  }

  static Text buildQuery(const QueryOptions& query) {
    DroXmlBuilder builder;
    const auto entity = static_cast<udEntityType>(query.kind);
    if (query.listId) {
      builder.BuildQueryByListID(entity, fromUtf8(*query.listId));
    } else if (query.fullName) {
      const Variant itemKind = query.itemKind ? Variant(*query.itemKind) : Variant::missing();
      builder.BuildQueryByFullName(entity, fromUtf8(*query.fullName), itemKind);
    } else if (query.active) {
      builder.BuildQueryByActiveOrDate(entity, static_cast<udActiveStatus>(*query.active),
                                       fromUtf8(query.from), fromUtf8(query.to));
    } else {
      builder.BuildQueryByAll(entity);
    }
    return builder.XML();
  }

  int exchange(const Text& request, const ConnectionOptions& connection) {
    const ProcessorOverride override(connection.processor);
    try {
      (void)createRequestProcessor(kRequestProcessorProgId);
    } catch (const ComError& error) {
      err_ << "droqbxml: no request processor is available"
           << (connection.processor ? " under \"" + *connection.processor + "\"" : std::string())
           << " (" << error.what() << ")\n";
      return kExitConnection;
    }
    DroXmlProcessor facade;
    const auto api = facade.API();
    if (connection.appName) api->appName(fromUtf8(*connection.appName));
    if (connection.appId) api->appID(fromUtf8(*connection.appId));
    api->CompanyFilePath(fromUtf8(connection.company));
    try {
      api->ConnectionOpen();
    } catch (const ComError& error) {
      err_ << "droqbxml: cannot open a connection to QuickBooks: " << error.what() << '\n';
      return kExitConnection;
    }
    try {
      api->SessionBegin();
    } catch (const ComError& error) {
      err_ << "droqbxml: cannot begin a session on \"" << connection.company
           << "\": " << error.what() << '\n';
      return kExitConnection;
    }
    const int32_t refused = api->ResponseStatus();
    if (refused == RSUnsetCoFile || refused == RSCoNameMismatch || refused == RSCantLogin) {
      err_ << "droqbxml: cannot begin a session: " << statusText(refused)
           << (refused == RSUnsetCoFile ? "; name the company file with --company" : "") << '\n';
      closeQuietly(*api);
      return kExitConnection;
    }
    const Text response = api->ProcessRequest(request);
    const int32_t status = api->ResponseStatus();
    try {
      api->SessionEnd();
      api->ConnectionClose();
    } catch (const ComError& error) {
      err_ << "droqbxml: cannot end the session: " << error.what() << '\n';
    }
    const std::string text = toUtf8(response);
    out_ << text;
    if (!text.empty() && text.back() != '\n') out_ << '\n';
    out_ << "Response status: " << statusText(status) << '\n';
    return status == RSSuccess ? kExitSuccess : kExitNotSuccess;
  }

  static void closeQuietly(DroXmlSdkWrapper& api) {
    try {
      api.ConnectionClose();
    } catch (const ComError&) {
      // the session was refused; closing is a courtesy
    }
  }

  std::istream& in_;
  std::ostream& out_;
  std::ostream& err_;
};

void addConnectionOptions(CLI::App& command, ConnectionOptions& options) {
  command.add_option("--company", options.company, "Company file to open (full path)");
}

void addQueryOptions(CLI::App& command, QueryOptions& options) {
  command.add_option("KIND", options.kind, "What to query")
      ->required()
      ->transform(CLI::CheckedTransformer(choices(kEntityKinds), CLI::ignore_case));
  auto* fullName = command.add_option("--full-name", options.fullName, "One record by full name");
  auto* listId = command.add_option("--list-id", options.listId, "One record by list identifier");
  auto* itemKind = command.add_option("--item-kind", options.itemKind, "Item kind, with item --full-name")
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
  auto* queryCommand = app.add_subcommand("query", "Build a query request, send it, print the response");
  addQueryOptions(*queryCommand, query);
  addConnectionOptions(*queryCommand, connection);

  QueryOptions built;
  auto* build = app.add_subcommand("build", "Print a request document instead of sending it");
  build->require_subcommand(1);
  auto* buildQuery = build->add_subcommand("query", "Print a query request document");
  addQueryOptions(*buildQuery, built);

  std::string text;
  auto* escape = app.add_subcommand("escape", "Escape text as the component writes it into requests");
  escape->add_option("TEXT", text)->required();
  auto* unescape = app.add_subcommand("unescape", "Unescape text as the component reads responses");
  unescape->add_option("TEXT", text)->required();

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

  Commands commands(in, out, err);
  try {
    if (send->parsed()) return commands.send(file, connection);
    if (queryCommand->parsed()) return commands.query(query, connection);
    if (buildQuery->parsed()) return commands.buildOnly(built);
    if (escape->parsed()) return commands.escape(text);
    if (unescape->parsed()) return commands.unescape(text);
  } catch (const ComError& error) {
    err << "droqbxml: " << error.what() << " (error " << error.number() << ", "
        << toUtf8(error.source()) << ")\n";
    return kExitNotSuccess;
  }
  return kExitUsage;
}

}  // namespace droqbxml::cli

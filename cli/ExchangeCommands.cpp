// send, query, build query, escape and unescape: the commands that talk qbXML through the
// facade, the builder and the wrapper as a host does.
#include <fstream>
#include <iostream>
#include <iterator>

#include "cli/Cli.hpp"
#include "cli/Commands.hpp"
#include "droqbxml/connection/RequestProcessor.hpp"
#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"

namespace droqbxml::cli {
namespace {

struct StatusName {
  const char* name;
  int32_t value;
};

constexpr StatusName kStatusNames[] = {
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
};

void printResponse(Io io, const Text& response, int32_t status) {
  const std::string text = toUtf8(response);
  io.out << text;
  if (!text.empty() && text.back() != '\n') io.out << '\n';
  io.out << "Response status: " << statusText(status) << '\n';
}

int exchangeOne(Io io, const Text& request, const ConnectionOptions& connection) {
  const ProcessorOverride override(connection.processor);
  Session session(io, connection);
  if (!session.open()) return kExitConnection;
  const Text response = session.send(request);
  printResponse(io, response, session.status());
  return session.status() == RSSuccess ? kExitSuccess : kExitNotSuccess;
}

}  // namespace

std::string statusText(int32_t status) {
  for (const auto& entry : kStatusNames) {
    if (entry.value == status) {
      return std::string(entry.name) + " (" + std::to_string(status) + ")";
    }
  }
  return "status " + std::to_string(status);
}

ProcessorOverride::ProcessorOverride(const std::optional<std::string>& name) {
  if (!name) return;
  const Text progId = fromUtf8(*name);
  if (equalsIgnoreCase(progId, kRequestProcessorProgId)) return;
  active_ = true;
  previous_ = registeredRequestProcessor(kRequestProcessorProgId);
  registerRequestProcessor(kRequestProcessorProgId,
                           [progId] { return createRequestProcessor(progId); });
}

ProcessorOverride::~ProcessorOverride() {
  if (!active_) return;
  if (previous_) {
    registerRequestProcessor(kRequestProcessorProgId, previous_);
  } else {
    unregisterRequestProcessor(kRequestProcessorProgId);
  }
}

Session::Session(Io io, const ConnectionOptions& options) : io_(io), options_(options) {}

Session::~Session() {
  if (!facade_) return;
  const auto api = facade_->API();
  try {
    if (inSession_) api->SessionEnd();
    if (connected_) api->ConnectionClose();
  } catch (const ComError& error) {
    io_.err << "droqbxml: cannot end the session: " << error.what() << '\n';
  }
}

bool Session::open() {
  try {
    (void)createRequestProcessor(kRequestProcessorProgId);
  } catch (const ComError& error) {
    io_.err << "droqbxml: no request processor is available"
            << (options_.processor ? " under \"" + *options_.processor + "\"" : std::string())
            << " (" << error.what() << ")\n";
    return false;
  }
  facade_ = std::make_unique<DroXmlProcessor>();
  const auto api = facade_->API();
  if (options_.appName) api->appName(fromUtf8(*options_.appName));
  if (options_.appId) api->appID(fromUtf8(*options_.appId));
  api->CompanyFilePath(fromUtf8(options_.company));
  try {
    api->ConnectionOpen();
    connected_ = true;
  } catch (const ComError& error) {
    io_.err << "droqbxml: cannot open a connection to QuickBooks: " << error.what() << '\n';
    return false;
  }
  try {
    api->SessionBegin();
  } catch (const ComError& error) {
    connected_ = false;  // the wrapper closed it
    io_.err << "droqbxml: cannot begin a session on \"" << options_.company
            << "\": " << error.what() << '\n';
    return false;
  }
  const int32_t refused = api->ResponseStatus();
  if (refused == RSUnsetCoFile || refused == RSCoNameMismatch || refused == RSCantLogin) {
    io_.err << "droqbxml: cannot begin a session: " << statusText(refused)
            << (refused == RSUnsetCoFile ? "; name the company file with --company" : "") << '\n';
    return false;
  }
  inSession_ = true;
  return true;
}

Text Session::send(const Text& request) { return facade_->API()->ProcessRequest(request); }

int32_t Session::status() const { return facade_->API()->ResponseStatus(); }

Text buildQuery(const QueryOptions& query) {
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

std::optional<std::string> readDocument(Io io, const std::string& file) {
  std::string bytes;
  if (file == "-") {
    bytes.assign(std::istreambuf_iterator<char>(io.in), std::istreambuf_iterator<char>());
  } else {
    std::ifstream stream(file, std::ios::binary);
    if (!stream) {
      io.err << "droqbxml: cannot read the request document \"" << file << "\"\n";
      return std::nullopt;
    }
    bytes.assign(std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>());
  }
  if (bytes.rfind("\xEF\xBB\xBF", 0) == 0) bytes.erase(0, 3);
  return bytes;
}

int sendCommand(Io io, const std::string& file, const ConnectionOptions& connection) {
  const auto bytes = readDocument(io, file);
  if (!bytes) return kExitUsage;
  const Text request = fromUtf8(*bytes);
  if (trimView(request).empty()) io.err << "droqbxml: the request document is empty\n";
  return exchangeOne(io, request, connection);
}

int queryCommand(Io io, const QueryOptions& query, const ConnectionOptions& connection) {
  return exchangeOne(io, buildQuery(query), connection);
}

int buildQueryCommand(Io io, const QueryOptions& query) {
  io.out << toUtf8(buildQuery(query)) << '\n';
  return kExitSuccess;
}

int escapeCommand(Io io, const std::string& text) {
  io.out << toUtf8(XMLEscapeText(fromUtf8(text))) << '\n';
  return kExitSuccess;
}

int unescapeCommand(Io io, const std::string& text) {
  io.out << toUtf8(XMLUnEscapeText(fromUtf8(text))) << '\n';
  return kExitSuccess;
}

}  // namespace droqbxml::cli

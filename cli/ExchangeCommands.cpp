// send, query, build query, escape and unescape: the commands that talk qbXML through the
// facade, the builder and the wrapper as a host does.
#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <type_traits>

#include "cli/Cli.hpp"
#include "cli/Commands.hpp"
#include "cli/ResponseDocument.hpp"
#include "droqbxml/connection/DroXmlSdkWrapper.hpp"
#include "droqbxml/connection/RequestProcessor.hpp"
#include "droqbxml/diagnostics/Logs.hpp"
#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/FileSystem.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/CompanyFile.hpp"
#include "simulator/RequestDocument.hpp"

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

std::string hresultText(int32_t number) {
  char text[16];
  std::snprintf(text, sizeof text, "0x%08X", static_cast<uint32_t>(number));
  return text;
}

// Passes every call to the processor it wraps and notes the raw response and any failure.
class RecordingProcessor final : public RequestProcessor {
 public:
  RecordingProcessor(std::shared_ptr<RequestProcessor> inner, std::shared_ptr<Journal> journal)
      : inner_(std::move(inner)), journal_(std::move(journal)) {}

  void OpenConnection(const Text& appID, const Text& appName) override {
    record("OpenConnection", [&] { inner_->OpenConnection(appID, appName); });
  }
  Text BeginSession(const Text& qbFile, QBFileMode mode) override {
    return record("BeginSession", [&] { return inner_->BeginSession(qbFile, mode); });
  }
  Text ProcessRequest(const Text& ticket, const Text& request) override {
    journal_->response.reset();
    Text response =
        record("ProcessRequest", [&] { return inner_->ProcessRequest(ticket, request); });
    journal_->response = toUtf8(response);
    return response;
  }
  void EndSession(const Text& ticket) override {
    record("EndSession", [&] { inner_->EndSession(ticket); });
  }
  void CloseConnection() override {
    record("CloseConnection", [&] { inner_->CloseConnection(); });
  }
  Text GetCurrentCompanyFileName(const Text& ticket) override {
    return inner_->GetCurrentCompanyFileName(ticket);
  }
  int16_t MajorVersion() override { return inner_->MajorVersion(); }
  int16_t MinorVersion() override { return inner_->MinorVersion(); }

 private:
  template <class Call>
  std::invoke_result_t<Call> record(const char* name, Call call) {
    try {
      return call();
    } catch (const ComError& error) {
      journal_->failure = error.record();
      journal_->failedCall = name;
      throw;
    }
  }

  std::shared_ptr<RequestProcessor> inner_;
  std::shared_ptr<Journal> journal_;
};

// Why QuickBooks refused a session on `company`, in words, from its HRESULT and, where one
// code covers several causes, from the file itself.
std::string refusalReason(int32_t number, const std::string& company) {
  switch (static_cast<uint32_t>(number)) {
    case 0x8004041Au:
      return "the company file denies this application";
    case 0x8004041Du:
      return "the application may not log in automatically and nobody is logged in";
    case 0x80040418u:
      return "the company file has not seen this application before and nobody is there to "
             "approve it";
    case 0x8004040Au:
      return "another company file is open";
    default:
      break;
  }
  try {
    simulator::CompanyFile probe(mapPath(fromUtf8(company)));
  } catch (const simulator::CompanyFileError& error) {
    using Kind = simulator::CompanyFileError::Kind;
    switch (error.kind()) {
      case Kind::Missing:
        return "the company file does not exist";
      case Kind::NotACompanyFile:
        return "the file is not a company file";
      case Kind::Damaged:
        return "the company file is damaged";
      case Kind::Busy:
        return "the company file is locked by another process";
      case Kind::ReadOnly:
        return "the company file cannot be written";
      case Kind::Unreadable:
      case Kind::AlreadyExists:
        return "the company file cannot be read";
    }
  } catch (const std::exception&) {
    return "the company file cannot be opened";
  }
  return "QuickBooks refused the session";
}

int reportResponse(Io io, const Session& session, OutputFormat format) {
  const Journal& journal = session.journal();
  if (journal.failure) {
    io.err << "droqbxml: QuickBooks did not process the request: "
           << toUtf8(journal.failure->Description) << " (" << hresultText(journal.failure->Number)
           << ")"
           << (journal.failure->Number == static_cast<int32_t>(0x80040400u)
                   ? "; droqbxml lint names what is wrong"
                   : "")
           << '\n';
    return kExitConnection;
  }
  if (!journal.response) {
    io.err << "droqbxml: no response was recorded (status " << statusText(session.status())
           << ")\n";
    return kExitConnection;
  }
  std::string error;
  const auto document = parseResponse(*journal.response, error, format == OutputFormat::Json);
  if (!document) {
    io.out << *journal.response;
    io.err << "droqbxml: the response is not a qbXML response document: " << error << '\n';
    return kExitConnection;
  }
  if (format == OutputFormat::Json) {
    io.out << responsesAsJson(*document);
  } else {
    io.out << *journal.response;
  }
  int exit = kExitSuccess;
  for (const XmlElement* response : document->responses()) {
    io.err << statusLine(*response) << '\n';
    if (severityOf(*response) != Severity::Info) exit = kExitNotSuccess;
  }
  return exit;
}

int exchangeOne(Io io, const Text& request, const ConnectionOptions& connection,
                OutputFormat format) {
  const ProcessorOverride override(connection.processor);
  Session session(io, connection);
  if (!session.open()) return kExitConnection;
  session.send(request);
  return reportResponse(io, session, format);
}

// At most `limit` bytes of a stream, so that an endless one (a device, a pipe that never
// closes) is not read to the end.
std::string readAtMost(std::istream& in, std::size_t limit) {
  std::string bytes;
  constexpr std::size_t kChunk = 1 << 16;
  while (bytes.size() < limit && in) {
    const std::size_t had = bytes.size();
    bytes.resize(had + std::min(kChunk, limit - had));
    in.read(bytes.data() + had, static_cast<std::streamsize>(bytes.size() - had));
    bytes.resize(had + static_cast<std::size_t>(in.gcount()));
  }
  return bytes;
}

// What a path that is not a regular file is, in words.
std::string kindOf(const std::filesystem::file_status& status) {
  switch (status.type()) {
    case std::filesystem::file_type::directory:
      return "a folder";
    case std::filesystem::file_type::character:
    case std::filesystem::file_type::block:
      return "a device";
    case std::filesystem::file_type::fifo:
      return "a pipe";
    case std::filesystem::file_type::socket:
      return "a socket";
    default:
      return "a special file";
  }
}

void createFolders(const Text& path) {
  std::error_code ignored;
  std::filesystem::create_directories(mapPath(path), ignored);
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
  install([progId] { return createRequestProcessor(progId); });
}

ProcessorOverride::ProcessorOverride(Wrap wrap) {
  // Without a registered processor the platform's own is made, which cannot be wrapped.
  auto inner = registeredRequestProcessor(kRequestProcessorProgId);
  if (!inner) return;
  install([inner, wrap = std::move(wrap)] { return wrap(inner()); });
}

void ProcessorOverride::install(RequestProcessorFactory factory) {
  active_ = true;
  previous_ = registeredRequestProcessor(kRequestProcessorProgId);
  registerRequestProcessor(kRequestProcessorProgId, std::move(factory));
}

ProcessorOverride::~ProcessorOverride() {
  if (!active_) return;
  if (previous_) {
    registerRequestProcessor(kRequestProcessorProgId, previous_);
  } else {
    unregisterRequestProcessor(kRequestProcessorProgId);
  }
}

InstallationPaths installationPaths() {
  const Text folder(kDefaultInstallPath);
  createFolders(folder);
  return {folder, folder + u"\\Logs\\ErrorLog.txt",
          folder + u"\\Logs\\qbXmlErrors\\qbXML-Error.txt"};
}

std::string componentAppName() {
  // The wrapper names the component to QuickBooks only when a processor exists to talk to.
  const DroXmlSdkWrapper wrapper;
  return wrapper.appName().empty() ? "Tessaly" : toUtf8(wrapper.appName());
}

Session::Session(Io io, const ConnectionOptions& options) : io_(io), options_(options) {}

Session::~Session() {
  if (!facade_) return;
  const auto api = facade_->API();
  try {
    if (inSession_) api->SessionEnd();
    if (connected_) api->ConnectionClose();
    trace(u"Session ended, connection closed");
  } catch (const ComError& error) {
    io_.err << "droqbxml: cannot end the session: " << error.what() << '\n';
  }
}

void Session::trace(const Text& line) {
  if (!tracer_) return;
  tracer_->Trace(line, eOutToFile, fromUtf8(*options_.traceFile), eAppend, true);
}

void Session::reportRefusal(const std::string& what) {
  io_.err << "droqbxml: cannot " << what << " on \"" << options_.company << "\": ";
  const auto& failure = journal_->failure;
  if (failure) {
    io_.err << refusalReason(failure->Number, options_.company) << ". QuickBooks: \""
            << toUtf8(failure->Description) << "\" (" << hresultText(failure->Number) << ")\n";
  } else {
    io_.err << statusText(facade_->API()->ResponseStatus()) << '\n';
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
  if (options_.traceFile) tracer_ = std::make_unique<clsTrace>();
  {
    const ProcessorOverride recording(
        [journal = journal_](std::shared_ptr<RequestProcessor> inner) {
          return std::make_shared<RecordingProcessor>(std::move(inner), journal);
        });
    facade_ = std::make_unique<DroXmlProcessor>();
  }
  const auto api = facade_->API();
  facade_->DroPath(installationPaths().folder);
  if (options_.appName) api->appName(fromUtf8(*options_.appName));
  if (options_.appId) api->appID(fromUtf8(*options_.appId));
  api->CompanyFilePath(fromUtf8(options_.company));
  trace(u"Opening a connection as \"" + api->appName() + u"\" (" + api->appID() + u")");
  try {
    api->ConnectionOpen();
    connected_ = true;
  } catch (const ComError& error) {
    io_.err << "droqbxml: cannot open a connection to QuickBooks: " << error.what() << " ("
            << hresultText(error.number()) << ")\n";
    return false;
  }
  trace(u"Beginning a session on \"" + api->CompanyFilePath() + u"\"");
  try {
    api->SessionBegin();
  } catch (const ComError& error) {
    connected_ = false;  // the wrapper closed it
    reportRefusal("begin a session");
    return false;
  }
  const int32_t refused = api->ResponseStatus();
  if (refused == RSUnsetCoFile) {
    io_.err << "droqbxml: cannot begin a session: " << statusText(refused)
            << "; name the company file with --company\n";
    return false;
  }
  if (refused == RSCoNameMismatch || refused == RSCantLogin) {
    reportRefusal("begin a session");
    return false;
  }
  inSession_ = true;
  return true;
}

Text Session::send(const Text& request) {
  // Only with a trace file: a list's response is megabytes to copy.
  if (tracer_) trace(u"Request:\r\n" + request);
  Text response = facade_->API()->ProcessRequest(request);
  if (tracer_) {
    trace(u"Response (" + fromUtf8(statusText(status())) + u"):\r\n" +
          (journal_->response ? fromUtf8(*journal_->response) : response));
  }
  return response;
}

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
  const std::string name = file == "-" ? "on standard input" : "\"" + file + "\"";
  const auto refuse = [&](const std::string& why) -> std::optional<std::string> {
    io.err << "droqbxml: the request document " << name << ' ' << why << '\n';
    return std::nullopt;
  };
  std::string bytes;
  if (file == "-") {
    bytes = readAtMost(io.in, simulator::kMaxRequestBytes + 1);
  } else {
    std::error_code error;
    const auto status = std::filesystem::status(file, error);
    if (std::filesystem::exists(status) && !std::filesystem::is_regular_file(status)) {
      return refuse("is " + kindOf(status) + ", not a regular file (- reads standard input)");
    }
    std::ifstream stream(file, std::ios::binary);
    if (stream) bytes = readAtMost(stream, simulator::kMaxRequestBytes + 1);
    if (!stream.is_open() || stream.bad()) {
      io.err << "droqbxml: cannot read the request document \"" << file << "\"\n";
      return std::nullopt;
    }
  }
  if (bytes.size() > simulator::kMaxRequestBytes) {
    return refuse("has more than " + std::to_string(simulator::kMaxRequestBytes) +
                  " bytes, the most a request may have (100 MB)");
  }
  if (const std::size_t bad = firstInvalidUtf8(bytes); bad != std::string::npos) {
    char byte[8];
    std::snprintf(byte, sizeof byte, "0x%02X", static_cast<unsigned char>(bytes[bad]));
    return refuse("is not UTF-8: byte " + std::string(byte) + " at offset " + std::to_string(bad));
  }
  if (bytes.rfind("\xEF\xBB\xBF", 0) == 0) bytes.erase(0, 3);
  return bytes;
}

std::optional<std::string> knownRefusal(const Text& request) {
  const auto read = simulator::readRequest(toUtf8(request));
  if (read.problems.empty()) return std::nullopt;
  const auto& first = read.problems.front();
  return first.element + ": " + first.message;
}

int sendCommand(Io io, const std::string& file, const ConnectionOptions& connection,
                OutputFormat format) {
  const auto bytes = readDocument(io, file);
  if (!bytes) return kExitUsage;
  const Text request = fromUtf8(*bytes);
  if (bytes->find_first_not_of(" \t\r\n") == std::string::npos) {
    io.err << "droqbxml: the request document "
           << (file == "-" ? "on standard input" : "\"" + file + "\"") << " is empty\n";
    return kExitUsage;
  }
  return exchangeOne(io, request, connection, format);
}

int queryCommand(Io io, const QueryOptions& query, const ConnectionOptions& connection,
                 OutputFormat format) {
  const Text request = buildQuery(query);
  if (const auto refusal = knownRefusal(request)) {
    io.err << "droqbxml: QuickBooks refuses this request: " << *refusal << '\n';
  }
  return exchangeOne(io, request, connection, format);
}

int buildQueryCommand(Io io, const QueryOptions& query) {
  const Text request = buildQuery(query);
  if (const auto refusal = knownRefusal(request)) {
    io.err << "droqbxml: QuickBooks refuses this request: " << *refusal << '\n';
  }
  io.out << toUtf8(request) << '\n';
  return kExitSuccess;
}

int pathsCommand(Io io) {
  const InstallationPaths paths = installationPaths();
  const auto line = [&](const char* label, const Text& path) {
    io.out << label << toUtf8(path) << "  (" << mapPath(path).string() << ")\n";
  };
  line("Installation folder: ", paths.folder);
  line("Error log: ", paths.errorLog);
  line("Failed-exchange log: ", paths.exchangeLog);
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

// The droqbxml commands behind the argument parser: each takes its parsed options and the
// streams, prints what it has to say and returns the exit code (see Cli.hpp).
#ifndef DROQBXML_CLI_COMMANDS_HPP_
#define DROQBXML_CLI_COMMANDS_HPP_

#include <cstdint>
#include <functional>
#include <iosfwd>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "droqbxml/component/DroXmlProcessor.hpp"
#include "droqbxml/connection/RequestProcessor.hpp"
#include "droqbxml/diagnostics/clsTrace.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml::cli {

struct Io {
  std::istream& in;
  std::ostream& out;
  std::ostream& err;
};

struct ConnectionOptions {
  std::string company;
  std::optional<std::string> appName;
  std::optional<std::string> appId;
  std::optional<std::string> processor;
  std::optional<std::string> traceFile;  // the component's trace output, when asked for
  std::optional<int> wait;               // seconds a remote processor waits for QuickBooks
};

enum class OutputFormat { Xml, Json };

struct QueryOptions {
  int32_t kind = 0;  // udEntityType
  std::optional<std::string> fullName;
  std::optional<std::string> listId;
  std::optional<int32_t> itemKind;  // udItemType
  std::optional<int32_t> active;    // udActiveStatus
  std::string from;
  std::string to;
};

// "RSSuccess (0)", or "status N" for a code without a name.
std::string statusText(int32_t status);

// What passed between the command and the request processor, recorded beside the
// component: the last response exactly as the processor returned it, and the last failure
// the processor raised, with the call that raised it.
struct Journal {
  std::optional<std::string> response;
  std::optional<ErrorRecord> failure;
  std::string failedCall;
};

// The installation folder of the component as this command uses it (created when missing),
// and the logs the component writes under it.
struct InstallationPaths {
  Text folder;
  Text errorLog;
  Text exchangeLog;
};
InstallationPaths installationPaths();

// A connection and a session on a company file through the facade, as a host opens them.
// open() reports a failure on the error stream and returns false; the destructor ends the
// session and closes the connection.
class Session {
 public:
  Session(Io io, const ConnectionOptions& options);
  ~Session();
  Session(const Session&) = delete;
  Session& operator=(const Session&) = delete;

  bool open();
  // Sends one request through the wrapper; the response, unescaped once.
  Text send(const Text& request);
  int32_t status() const;
  DroXmlProcessor& facade() { return *facade_; }
  const Journal& journal() const { return *journal_; }

 private:
  void trace(const Text& line);
  void reportRefusal(const std::string& what);

  Io io_;
  const ConnectionOptions& options_;
  std::shared_ptr<Journal> journal_ = std::make_shared<Journal>();
  std::unique_ptr<clsTrace> tracer_;
  std::unique_ptr<DroXmlProcessor> facade_;
  bool connected_ = false;
  bool inSession_ = false;
};

// Changes what answers for QuickBooks' ProgID while it lives: the processor registered as
// `name` (nothing changes without a name), or every processor made passed through `wrap`.
class ProcessorOverride {
 public:
  using Wrap = std::function<std::shared_ptr<RequestProcessor>(std::shared_ptr<RequestProcessor>)>;
  explicit ProcessorOverride(const std::optional<std::string>& name);
  explicit ProcessorOverride(Wrap wrap);
  ~ProcessorOverride();
  ProcessorOverride(const ProcessorOverride&) = delete;
  ProcessorOverride& operator=(const ProcessorOverride&) = delete;

 private:
  void install(RequestProcessorFactory factory);

  bool active_ = false;
  RequestProcessorFactory previous_;
};

Text buildQuery(const QueryOptions& query);
// What QuickBooks is known to refuse in a request the builder wrote (lint's first finding),
// or nothing.
std::optional<std::string> knownRefusal(const Text& request);

int sendCommand(Io io, const std::string& file, const ConnectionOptions& connection,
                OutputFormat format);
int queryCommand(Io io, const QueryOptions& query, const ConnectionOptions& connection,
                 OutputFormat format);
int pathsCommand(Io io);
int buildQueryCommand(Io io, const QueryOptions& query);
int escapeCommand(Io io, const std::string& text);
int unescapeCommand(Io io, const std::string& text);

struct CompanyOptions {
  std::string path;
  std::string name = "My Company";
  bool salesTax = true;
  std::string appName;
  bool autoLogin = true;
  std::vector<std::string> allow;  // company create: the applications let in
};

// The application name the component gives QuickBooks unless the host names another.
std::string componentAppName();

int companyCreateCommand(Io io, const CompanyOptions& options);
int companyShowCommand(Io io, const CompanyOptions& options);
int companyAllowCommand(Io io, const CompanyOptions& options);
int companyDenyCommand(Io io, const CompanyOptions& options);
int lintCommand(Io io, const std::string& file);
// Serves request processor calls relayed from the Windows side on 127.0.0.1:port; runs until
// stopped.
int relayCommand(Io io, int port, const ConnectionOptions& connection);
// The relay's pieces, shared with the Web Connector service: a listener on 127.0.0.1:port
// (-1 when it cannot listen), the loop answering each connection with a processor from
// `factory` (it returns once the listener is shut down), and a host's processor whose calls
// go to a relay on `port`, with the waits it asks the service for.
int listenOnLoopback(int port);
void acceptRelayCalls(int listener, RequestProcessorFactory factory);
std::shared_ptr<RequestProcessor> relayClient(int port, std::optional<int> waitSeconds);

// Runs the Web Connector service of the configuration file until SIGTERM or SIGINT, with
// hosts reaching it through the relay port; events go to the error stream.
int webConnectorServeCommand(Io io, const std::string& configFile);
struct PlayOptions {
  std::string url;
  std::string user;
  std::optional<std::string> passwordFile;  // otherwise the first line of the input stream
  std::string companyFile;
  std::optional<std::string> caFile;
  bool insecure = false;
  int runs = 1;       // 0: until stopped
  int every = 60;     // seconds between runs
  int noOpPause = 5;  // seconds after getLastError "NoOp"
};
// Plays Intuit's Web Connector against a service, relaying each request to the embedded
// stand-in; a line per run on the output stream.
int webConnectorPlayCommand(Io io, const PlayOptions& options);
int demoCommand(Io io, const ConnectionOptions& connection, bool verbose = false);

// Reads a request document from a file, or from the input stream for "-"; reports an
// unreadable file and returns nothing.
std::optional<std::string> readDocument(Io io, const std::string& file);

// Sets `user`'s password (read as one line from the input, without echo on a terminal) and,
// when given, company file in the Web Connector service's configuration file, creating the
// file or the user's section when missing. An empty password, a user name holding white
// space or ']' and a file that cannot be written end with kExitUsage.
int webConnectorPasswdCommand(Io io, const std::string& configFile, const std::string& user,
                              const std::optional<std::string>& company);
// Writes the .qwc file that adds the service to a Web Connector for `user`, who must have a
// section in the configuration file: to `output` (never over an existing file) or to the
// output stream. The AppURL defaults to the address, port and path the service listens on;
// `everyMinutes` 0 leaves the schedule to the Web Connector's user. Refusals end with
// kExitUsage.
int webConnectorQwcCommand(Io io, const std::string& configFile, const std::string& user,
                           const std::optional<std::string>& appUrl, int everyMinutes,
                           const std::optional<std::string>& output);

}  // namespace droqbxml::cli

#endif  // DROQBXML_CLI_COMMANDS_HPP_

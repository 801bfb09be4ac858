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

#include "droqbxml/component/DroXmlProcessor.hpp"
#include "droqbxml/connection/RequestProcessor.hpp"

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
};

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

 private:
  Io io_;
  const ConnectionOptions& options_;
  std::unique_ptr<DroXmlProcessor> facade_;
  bool connected_ = false;
  bool inSession_ = false;
};

// Makes the processor registered as `name` answer for QuickBooks' ProgID while it lives.
class ProcessorOverride {
 public:
  explicit ProcessorOverride(const std::optional<std::string>& name);
  ~ProcessorOverride();
  ProcessorOverride(const ProcessorOverride&) = delete;
  ProcessorOverride& operator=(const ProcessorOverride&) = delete;

 private:
  bool active_ = false;
  std::function<std::shared_ptr<RequestProcessor>()> previous_;
};

Text buildQuery(const QueryOptions& query);

int sendCommand(Io io, const std::string& file, const ConnectionOptions& connection);
int queryCommand(Io io, const QueryOptions& query, const ConnectionOptions& connection);
int buildQueryCommand(Io io, const QueryOptions& query);
int escapeCommand(Io io, const std::string& text);
int unescapeCommand(Io io, const std::string& text);

struct CompanyOptions {
  std::string path;
  std::string name = "My Company";
  bool salesTax = true;
  std::string appName;
  bool autoLogin = true;
};

int companyCreateCommand(Io io, const CompanyOptions& options);
int companyShowCommand(Io io, const CompanyOptions& options);
int companyAllowCommand(Io io, const CompanyOptions& options);
int companyDenyCommand(Io io, const CompanyOptions& options);
int lintCommand(Io io, const std::string& file);
// Serves request processor calls relayed from the Windows side on 127.0.0.1:port; runs until
// stopped.
int relayCommand(Io io, int port, const ConnectionOptions& connection);
int demoCommand(Io io, const ConnectionOptions& connection, bool verbose = false);

// Reads a request document from a file, or from the input stream for "-"; reports an
// unreadable file and returns nothing.
std::optional<std::string> readDocument(Io io, const std::string& file);

}  // namespace droqbxml::cli

#endif  // DROQBXML_CLI_COMMANDS_HPP_

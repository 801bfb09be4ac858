// The meeting point of the two sides of a Web Connector service: hosts, whose calls are
// synchronous (begin a session, process a request, end it), and the Web Connector, which
// polls (authenticate, sendRequestXML, receiveResponseXML, closeConnection). Each company
// file served has a line: the host's requests queue on it, the Web Connector session
// logged in for it takes them one at a time, and its answers go back to the waiting host.
//
// The Web Connector's calls are held for a while (the configured hold) when the host has
// not yet decided its next step, so that a request reaches QuickBooks as soon as it is
// made; a call held too long answers so that the Web Connector comes back ("NoOp" after an
// empty request). Texts are UTF-8. Thread-safe: every call may come from its own thread.
#ifndef DROQBXML_WEBCONNECTOR_BROKER_HPP_
#define DROQBXML_WEBCONNECTOR_BROKER_HPP_

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

#include "webconnector/ServiceConfig.hpp"

namespace droqbxml::webconnector {

// QuickBooks' failures as the processor raises them (HRESULTs), beside QuickBooks' own.
namespace Hresult {
inline constexpr int32_t kUnexpected = static_cast<int32_t>(0x80040402u);
inline constexpr int32_t kCouldNotOpenFile = static_cast<int32_t>(0x80040403u);
inline constexpr int32_t kCouldNotStart = static_cast<int32_t>(0x80040408u);
inline constexpr int32_t kInvalidTicket = static_cast<int32_t>(0x8004040Du);
}  // namespace Hresult

// How long a host's calls wait: for the Web Connector to log in for the company file, and
// for QuickBooks' answer to one request.
struct HostWaits {
  std::chrono::milliseconds session{std::chrono::seconds(90)};
  std::chrono::milliseconds request{std::chrono::seconds(120)};
};

class Broker {
 public:
  using Clock = std::chrono::steady_clock;
  using Log = std::function<void(const std::string&)>;

  explicit Broker(ServiceConfig config, Log log = {});
  ~Broker();
  Broker(const Broker&) = delete;
  Broker& operator=(const Broker&) = delete;

  // The Web Connector's calls; each returns what its SOAP answer carries.
  // [ticket, ""|company file|"none"|"nvu"]: "nvu" for a wrong user or password, "none" when
  // no host waits on the user's company file.
  std::vector<std::string> authenticate(const std::string& user, const std::string& password);
  // The next request for QuickBooks, or "" (then getLastError says why: "NoOp" asks the Web
  // Connector to come back in a moment).
  std::string sendRequestXML(const std::string& ticket, const std::string& companyFile,
                             const std::string& majorVersion, const std::string& minorVersion);
  // The percentage done: 100 when the host is finished, below it when more comes, negative
  // when the answer was an error (QuickBooks' HRESULT), for no request, or for no session.
  int receiveResponseXML(const std::string& ticket, const std::string& response,
                         const std::string& hresult, const std::string& message);
  std::string connectionError(const std::string& ticket, const std::string& hresult,
                              const std::string& message);
  std::string getLastError(const std::string& ticket);
  std::string closeConnection(const std::string& ticket);

  // The host's calls; failures are ComErrors with QuickBooks' HRESULTs.
  std::string beginHostSession(const std::string& companyFile, std::chrono::milliseconds wait);
  std::string process(const std::string& hostTicket, const std::string& request,
                      std::chrono::milliseconds wait);
  void endHostSession(const std::string& hostTicket);
  // The company file QuickBooks opened for the session, and its qbXML version.
  std::string companyFileOf(const std::string& hostTicket);
  std::pair<int16_t, int16_t> versionOf(const std::string& hostTicket);

  // Stops taking requests: queued ones fail at once, the one QuickBooks is working on gets
  // `grace` to be answered, then fails; held Web Connector calls answer.
  void shutdown(std::chrono::milliseconds grace);

 private:
  struct Exchange;
  struct Line;
  struct WebSession {
    Line* line;
    Clock::time_point expires;
    std::string lastError;
  };

  Line& lineFor(const std::string& companyFile);
  Line* lineServing(const std::string& companyFile);
  WebSession* liveSession(const std::string& ticket);
  void endWebSession(const std::string& ticket, const std::string& why);
  void finish(Line& line, const std::string& response, int32_t hresult, const std::string& message);
  // Waits until `done` holds, the Web Connector session of `line` changes, or `until`.
  template <class Done>
  bool holdUntil(std::unique_lock<std::mutex>& lock, Line& line, Clock::time_point until,
                 Done done);
  void log(const std::string& line) const;

  const ServiceConfig config_;
  const Log log_;
  std::mutex mutex_;
  std::condition_variable changed_;
  std::vector<std::unique_ptr<Line>> lines_;
  std::map<std::string, WebSession> webSessions_;
  std::map<std::string, Line*> hostSessions_;
  bool stopping_ = false;
};

// Text from the network as a log line may show it: at most 80 characters, control
// characters (line breaks among them) as '?', so that no one writes lines of their own.
std::string loggable(std::string_view text);

// A fresh ticket: 32 hexadecimal digits from the system's cryptographic random source.
std::string newTicket();

}  // namespace droqbxml::webconnector

#endif  // DROQBXML_WEBCONNECTOR_BROKER_HPP_

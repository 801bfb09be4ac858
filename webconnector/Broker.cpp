// The line of each company file, and how the two sides' calls move requests along it.
#include "webconnector/Broker.hpp"

#include <sodium.h>

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <stdexcept>
#include <utility>

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"

namespace droqbxml::webconnector {

namespace {

constexpr std::string_view kProgId = "DroQbXml.WebConnector";

[[noreturn]] void fail(int32_t hresult, const std::string& message) {
  raiseError(hresult, fromUtf8(kProgId), fromUtf8(message));
}

bool sameFile(std::string_view a, std::string_view b) {
  return a.size() == b.size() && std::equal(a.begin(), a.end(), b.begin(), [](char x, char y) {
           return std::tolower(static_cast<unsigned char>(x)) ==
                  std::tolower(static_cast<unsigned char>(y));
         });
}

// "0x80040400" or a signed decimal; anything else is QuickBooks' unexpected error.
int32_t hresultOf(const std::string& text) {
  char* end = nullptr;
  const bool hex = text.size() > 2 && text[0] == '0' && (text[1] == 'x' || text[1] == 'X');
  const long long value = std::strtoll(text.c_str(), &end, hex ? 16 : 10);
  if (end == text.c_str() || *end != '\0' || value < INT32_MIN || value > UINT32_MAX) {
    return Hresult::kUnexpected;
  }
  return static_cast<int32_t>(static_cast<uint32_t>(value));
}

int16_t versionPart(const std::string& text, int16_t otherwise) {
  char* end = nullptr;
  const long value = std::strtol(text.c_str(), &end, 10);
  return end != text.c_str() && *end == '\0' && value >= 0 && value < 100
             ? static_cast<int16_t>(value)
             : otherwise;
}

}  // namespace

std::string loggable(std::string_view text) {
  std::string shown(text.substr(0, 80));
  for (char& c : shown) {
    if (static_cast<unsigned char>(c) < 0x20 || c == 0x7F) c = '?';
  }
  return text.size() > 80 ? shown + "..." : shown;
}

std::string newTicket() {
  static const bool ready = sodium_init() >= 0;
  if (!ready) throw std::runtime_error("the cryptographic random source is unavailable");
  unsigned char bytes[16];
  randombytes_buf(bytes, sizeof bytes);
  char hex[sizeof bytes * 2 + 1];
  sodium_bin2hex(hex, sizeof hex, bytes, sizeof bytes);
  return hex;
}

// One host request on its way: queued, sent to QuickBooks, then answered or failed.
struct Broker::Exchange {
  enum class State { Queued, Sent, Done };
  std::string request;
  State state = State::Queued;
  std::string response;
  int32_t hresult = 0;
  std::string message;
};

struct Broker::Line {
  std::string companyFile;    // as configured; empty: whatever file QuickBooks has open
  std::string requestedFile;  // the last file a host asked for, for an empty companyFile
  std::string webTicket;      // the Web Connector session logged in for this line
  uint64_t generation = 0;    // changes with every Web Connector session
  bool open = false;          // QuickBooks has the file open in the current session
  std::string openedFile;
  int16_t major = 13;
  int16_t minor = 0;
  bool openFailed = false;  // connectionError: why the company file could not be opened
  int32_t openHresult = 0;
  std::string openMessage;
  std::deque<std::shared_ptr<Exchange>> queue;
  std::shared_ptr<Exchange> sent;  // sent to QuickBooks, not yet answered
  int hosts = 0;
};

Broker::Broker(ServiceConfig config, Log log) : config_(std::move(config)), log_(std::move(log)) {}

Broker::~Broker() = default;

void Broker::log(const std::string& line) const {
  if (log_) log_(line);
}

Broker::Line& Broker::lineFor(const std::string& companyFile) {
  for (const auto& line : lines_) {
    if (sameFile(line->companyFile, companyFile)) return *line;
  }
  lines_.push_back(std::make_unique<Line>());
  lines_.back()->companyFile = companyFile;
  return *lines_.back();
}

// The line of the user who serves `companyFile`, else of a user who serves whatever file
// QuickBooks has open; null when no user serves it.
Broker::Line* Broker::lineServing(const std::string& companyFile) {
  const ServiceUser* any = nullptr;
  for (const ServiceUser& user : config_.users) {
    if (sameFile(user.companyFile, companyFile)) return &lineFor(user.companyFile);
    if (user.companyFile.empty()) any = &user;
  }
  if (any == nullptr) return nullptr;
  Line& line = lineFor({});
  line.requestedFile = companyFile;
  return &line;
}

Broker::WebSession* Broker::liveSession(const std::string& ticket) {
  const auto found = webSessions_.find(ticket);
  if (found == webSessions_.end()) return nullptr;
  if (Clock::now() >= found->second.expires) {
    endWebSession(ticket, "its ticket expired");
    return nullptr;
  }
  return &found->second;
}

void Broker::endWebSession(const std::string& ticket, const std::string& why) {
  const auto found = webSessions_.find(ticket);
  if (found == webSessions_.end()) return;
  Line& line = *found->second.line;
  if (line.sent) {
    finish(line, {}, Hresult::kUnexpected,
           "The Web Connector session ended (" + why +
               ") before QuickBooks answered; the request may have been processed.");
  }
  line.webTicket.clear();
  line.open = false;
  ++line.generation;
  webSessions_.erase(found);
  changed_.notify_all();
}

void Broker::finish(Line& line, const std::string& response, int32_t hresult,
                    const std::string& message) {
  Exchange& exchange = *line.sent;
  exchange.response = response;
  exchange.hresult = hresult;
  exchange.message = message;
  exchange.state = Exchange::State::Done;
  line.sent.reset();
  changed_.notify_all();
}

template <class Done>
bool Broker::holdUntil(std::unique_lock<std::mutex>& lock, Line& line, Clock::time_point until,
                       Done done) {
  const uint64_t generation = line.generation;
  changed_.wait_until(lock, until,
                      [&] { return done() || stopping_ || line.generation != generation; });
  return line.generation == generation;
}

std::vector<std::string> Broker::authenticate(const std::string& user,
                                              const std::string& password) {
  const ServiceUser* known = config_.user(user);
  bool matches = false;
  {
    // One check at a time, outside the broker's lock: each takes a while and much memory on
    // purpose, and a flood of logins must not take the machine's memory with it. An unknown
    // user costs the same as a known one, so that the time does not tell who exists.
    static std::mutex checking;
    const std::lock_guard one(checking);
    const ServiceUser* checked =
        known != nullptr || config_.users.empty() ? known : &config_.users.front();
    matches =
        checked != nullptr && passwordMatches(checked->passwordHash, password) && checked == known;
  }
  if (!matches) {
    log("authenticate: refused user '" + loggable(user) + "'");
    return {newTicket(), "nvu"};
  }
  const std::lock_guard lock(mutex_);
  Line& line = lineFor(known->companyFile);
  if (stopping_ || (line.hosts == 0 && line.queue.empty())) return {newTicket(), "none"};
  if (!line.webTicket.empty()) {
    log("authenticate: user '" + user + "' logged in again; the earlier session ends");
    endWebSession(line.webTicket, "the Web Connector logged in again");
  }
  const std::string ticket = newTicket();
  webSessions_[ticket] = WebSession{&line, Clock::now() + config_.ticketLifetime, {}};
  line.webTicket = ticket;
  line.openFailed = false;
  log("authenticate: user '" + user + "' logged in");
  return {ticket, known->companyFile.empty() ? line.requestedFile : known->companyFile};
}

std::string Broker::sendRequestXML(const std::string& ticket, const std::string& companyFile,
                                   const std::string& majorVersion,
                                   const std::string& minorVersion) {
  std::unique_lock lock(mutex_);
  WebSession* session = liveSession(ticket);
  if (session == nullptr) return {};
  Line& line = *session->line;
  if (!line.open) {
    line.open = true;
    line.openedFile = companyFile;
    line.major = versionPart(majorVersion, 13);
    line.minor = versionPart(minorVersion, 0);
    changed_.notify_all();
  }
  if (line.sent) {
    finish(line, {}, Hresult::kUnexpected,
           "The Web Connector asked for another request before answering this one; the "
           "request may have been processed.");
    session->lastError = "sendRequestXML came before receiveResponseXML answered the request";
    return {};
  }
  const auto until = Clock::now() + config_.hold;
  if (!holdUntil(lock, line, until, [&] { return !line.queue.empty() || line.hosts == 0; })) {
    return {};
  }
  session = liveSession(ticket);
  if (session == nullptr) return {};
  if (!line.queue.empty() && !stopping_) {
    line.sent = std::move(line.queue.front());
    line.queue.pop_front();
    line.sent->state = Exchange::State::Sent;
    return line.sent->request;
  }
  session->lastError = stopping_         ? "The DroQbXml service is stopping."
                       : line.hosts == 0 ? "The host has no more requests."
                                         : "NoOp";
  return {};
}

int Broker::receiveResponseXML(const std::string& ticket, const std::string& response,
                               const std::string& hresult, const std::string& message) {
  std::unique_lock lock(mutex_);
  WebSession* session = liveSession(ticket);
  if (session == nullptr) return -1;
  Line& line = *session->line;
  if (!line.sent) {
    log("receiveResponseXML: a response for no request was dropped");
    session->lastError = "A response came for no request; it was dropped.";
    return -1;
  }
  if (!hresult.empty()) {
    finish(line, {}, hresultOf(hresult), message);
    session->lastError = message;
    return -1;
  }
  finish(line, response, 0, {});
  const auto until = Clock::now() + config_.hold;
  if (!holdUntil(lock, line, until, [&] { return !line.queue.empty() || line.hosts == 0; })) {
    return -1;
  }
  return line.hosts == 0 || stopping_ ? 100 : 50;
}

std::string Broker::connectionError(const std::string& ticket, const std::string& hresult,
                                    const std::string& message) {
  const std::lock_guard lock(mutex_);
  if (WebSession* session = liveSession(ticket)) {
    Line& line = *session->line;
    log("connectionError: " + loggable(hresult) + " " + loggable(message));
    line.openFailed = true;
    line.openHresult = hresultOf(hresult);
    line.openMessage = message;
    endWebSession(ticket, "QuickBooks could not open the company file");
  }
  return "done";
}

std::string Broker::getLastError(const std::string& ticket) {
  const std::lock_guard lock(mutex_);
  const WebSession* session = liveSession(ticket);
  return session == nullptr ? "The ticket is unknown or has expired." : session->lastError;
}

std::string Broker::closeConnection(const std::string& ticket) {
  const std::lock_guard lock(mutex_);
  if (liveSession(ticket) == nullptr) return "The ticket is unknown or has expired.";
  endWebSession(ticket, "the Web Connector closed it");
  return "OK";
}

std::string Broker::beginHostSession(const std::string& companyFile,
                                     std::chrono::milliseconds wait) {
  std::unique_lock lock(mutex_);
  if (stopping_) fail(Hresult::kCouldNotStart, "The DroQbXml Web Connector service is stopping.");
  Line* line = lineServing(companyFile);
  if (line == nullptr) {
    fail(Hresult::kCouldNotOpenFile,
         "No Web Connector user of this service serves the company file \"" + companyFile + "\".");
  }
  ++line->hosts;
  line->openFailed = false;
  changed_.notify_all();
  changed_.wait_for(lock, wait, [&] { return line->open || line->openFailed || stopping_; });
  if (line->open && !stopping_) {
    const std::string ticket = newTicket();
    hostSessions_[ticket] = line;
    return ticket;
  }
  --line->hosts;
  changed_.notify_all();
  if (line->openFailed) fail(line->openHresult, line->openMessage);
  fail(Hresult::kCouldNotStart,
       "Could not start QuickBooks: no Web Connector logged in for the company file \"" +
           companyFile + "\" within " + std::to_string(wait.count() / 1000) + " s.");
}

std::string Broker::process(const std::string& hostTicket, const std::string& request,
                            std::chrono::milliseconds wait) {
  std::unique_lock lock(mutex_);
  const auto found = hostSessions_.find(hostTicket);
  if (found == hostSessions_.end())
    fail(Hresult::kInvalidTicket, "The ticket parameter is invalid.");
  Line& line = *found->second;
  if (stopping_)
    fail(Hresult::kUnexpected, "The DroQbXml service is stopping; the request was not sent.");
  const auto exchange = std::make_shared<Exchange>();
  exchange->request = request;
  line.queue.push_back(exchange);
  changed_.notify_all();
  changed_.wait_for(lock, wait, [&] {
    return exchange->state == Exchange::State::Done ||
           (stopping_ && exchange->state == Exchange::State::Queued);
  });
  if (exchange->state == Exchange::State::Done) {
    if (exchange->hresult != 0) fail(exchange->hresult, exchange->message);
    return std::move(exchange->response);
  }
  if (exchange->state == Exchange::State::Queued) {
    line.queue.erase(std::find(line.queue.begin(), line.queue.end(), exchange));
    fail(Hresult::kUnexpected,
         stopping_ ? "The DroQbXml service is stopping; the request was not sent."
                   : "No Web Connector took the request within " +
                         std::to_string(wait.count() / 1000) + " s; it was not sent.");
  }
  // Sent and not answered: the answer, when it comes, goes nowhere.
  fail(Hresult::kUnexpected, "QuickBooks did not answer within " +
                                 std::to_string(wait.count() / 1000) +
                                 " s; the request may still be processed.");
}

void Broker::endHostSession(const std::string& hostTicket) {
  const std::lock_guard lock(mutex_);
  const auto found = hostSessions_.find(hostTicket);
  if (found == hostSessions_.end())
    fail(Hresult::kInvalidTicket, "The ticket parameter is invalid.");
  --found->second->hosts;
  hostSessions_.erase(found);
  changed_.notify_all();
}

std::string Broker::companyFileOf(const std::string& hostTicket) {
  const std::lock_guard lock(mutex_);
  const auto found = hostSessions_.find(hostTicket);
  if (found == hostSessions_.end())
    fail(Hresult::kInvalidTicket, "The ticket parameter is invalid.");
  return found->second->openedFile;
}

std::pair<int16_t, int16_t> Broker::versionOf(const std::string& hostTicket) {
  const std::lock_guard lock(mutex_);
  const auto found = hostSessions_.find(hostTicket);
  if (found == hostSessions_.end()) return {13, 0};
  return {found->second->major, found->second->minor};
}

void Broker::shutdown(std::chrono::milliseconds grace) {
  std::unique_lock lock(mutex_);
  stopping_ = true;
  changed_.notify_all();
  const auto until = Clock::now() + grace;
  changed_.wait_until(lock, until, [&] {
    return std::none_of(lines_.begin(), lines_.end(),
                        [](const auto& line) { return !!line->sent; });
  });
  for (const auto& line : lines_) {
    if (line->sent) {
      finish(*line, {}, Hresult::kUnexpected,
             "The DroQbXml service stopped before QuickBooks answered; the request may have "
             "been processed.");
    }
  }
}

}  // namespace droqbxml::webconnector

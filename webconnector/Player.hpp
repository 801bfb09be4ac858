// A stand-in for Intuit's Web Connector: it plays the Web Connector's side of a scheduled
// run against a service over HTTP(S), call for call as the Web Connector makes them, and
// hands each request to a request processor (the embedded stand-in, on this machine), so
// that a set-up can be tried end to end without Windows or QuickBooks.
#ifndef DROQBXML_WEBCONNECTOR_PLAYER_HPP_
#define DROQBXML_WEBCONNECTOR_PLAYER_HPP_

#include <chrono>
#include <memory>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "droqbxml/connection/RequestProcessor.hpp"
#include "webconnector/Soap.hpp"

namespace droqbxml::webconnector {

struct PlayerOptions {
  std::string url;  // the AppURL: http(s)://host:port/path
  std::string user;
  std::string password;
  std::string companyFile;           // opened when the service answers "" (the open company file)
  std::string appName = "DroQbXml";  // the application QuickBooks is asked to let in
  std::string caFile;                // certificates to trust for https; empty: the system's
  bool verifyCertificate = true;
  std::chrono::milliseconds noOpPause{std::chrono::seconds(5)};  // after getLastError "NoOp"
  std::chrono::seconds timeout{120};                             // per HTTP call
};

// What one run came to: the authenticate status ("nvu", "none", "busy") when it ended there,
// else "done" after closeConnection, or "connectionError" when QuickBooks could not open the
// company file; and the number of requests relayed.
struct RunResult {
  std::string outcome;
  int requests = 0;
  std::string closeMessage;
};

// An HTTP failure, or an answer that is not the call's SOAP answer.
class PlayerError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

class Player {
 public:
  Player(PlayerOptions options, std::shared_ptr<RequestProcessor> quickBooks);
  ~Player();
  Player(const Player&) = delete;
  Player& operator=(const Player&) = delete;

  // One scheduled run: serverVersion, clientVersion, authenticate and, when there is work,
  // sendRequestXML / receiveResponseXML until the service is done, then closeConnection.
  RunResult run();

  // One call, for driving the service step by step: the answer's SOAP message (a fault is
  // operation "Fault").
  SoapMessage call(std::string_view operation,
                   const std::vector<std::pair<std::string, std::string>>& parameters);
  // The HTTP status of the last call.
  int lastStatus() const { return lastStatus_; }

 private:
  struct Client;
  PlayerOptions options_;
  std::shared_ptr<RequestProcessor> quickBooks_;
  std::unique_ptr<Client> client_;
  int lastStatus_ = 0;
};

}  // namespace droqbxml::webconnector

#endif  // DROQBXML_WEBCONNECTOR_PLAYER_HPP_

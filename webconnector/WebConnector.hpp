// The Web Connector request processor: a SOAP service that Intuit's QuickBooks Web
// Connector polls, and the request processor "DroQbXml.WebConnector" through which the
// component's wrapper, unchanged, reaches the QuickBooks behind it.
//
//   Service service(readServiceConfig("wc.conf"));
//   service.start();                       // serves https://listen:port/qbwc
//   install(service);                      // the component now reaches remote QuickBooks
//
// BeginSession waits (HostWaits::session) for the Web Connector to log in for the company
// file and for QuickBooks to open it; ProcessRequest hands the request to the next
// sendRequestXML and returns the response of the matching receiveResponseXML (or raises
// QuickBooks' HRESULT and message).
#ifndef DROQBXML_WEBCONNECTOR_WEBCONNECTOR_HPP_
#define DROQBXML_WEBCONNECTOR_WEBCONNECTOR_HPP_

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>

#include "droqbxml/connection/RequestProcessor.hpp"
#include "webconnector/Broker.hpp"
#include "webconnector/ServiceConfig.hpp"

namespace droqbxml::webconnector {

inline constexpr TextView kWebConnectorProgId = u"DroQbXml.WebConnector";

// A processor whose waits can be set after it is made (as a relayed host sets them).
class WaitingProcessor : public RequestProcessor {
 public:
  virtual void setWaits(HostWaits waits) = 0;
};

class Service {
 public:
  // `log` receives one line per event worth an administrator's eye (logins, refusals, bad
  // messages); never a password.
  explicit Service(ServiceConfig config, Broker::Log log = {});
  // Stops the service (grace 0).
  ~Service();
  Service(const Service&) = delete;
  Service& operator=(const Service&) = delete;

  // Listens (port 0: any free port) and serves on threads of its own. Throws
  // std::runtime_error when the address cannot be listened on or the certificate or key
  // cannot be loaded.
  void start();
  // Finishes or fails the exchange in flight (waiting up to `grace`), fails the queued ones,
  // answers the Web Connector's held calls and stops listening.
  void stop(std::chrono::milliseconds grace = std::chrono::milliseconds(0));

  uint16_t port() const;
  // http(s)://listen:port/path, what the Web Connector's AppURL names.
  std::string url() const;
  Broker& broker() { return *broker_; }
  const ServiceConfig& config() const { return config_; }

  // A new request processor whose sessions go through this service.
  std::shared_ptr<RequestProcessor> newProcessor(HostWaits waits = {});

 private:
  struct Server;
  ServiceConfig config_;
  Broker::Log log_;
  std::shared_ptr<Broker> broker_;
  std::unique_ptr<Server> server_;
};

// Registers "DroQbXml.WebConnector" (and, with `asQuickBooks`, QuickBooks' own ProgID) as
// processors of `service`; `service` must outlive every processor made.
void install(Service& service, HostWaits waits = {}, bool asQuickBooks = false);

}  // namespace droqbxml::webconnector

#endif  // DROQBXML_WEBCONNECTOR_WEBCONNECTOR_HPP_

// The SOAP service over cpp-httplib (HTTPS through OpenSSL when a certificate is
// configured), the dispatch of the Web Connector's eight calls to the broker, and the
// request processor hosts reach the broker through.
#include <httplib.h>

#include <stdexcept>
#include <thread>
#include <utility>

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "webconnector/Soap.hpp"
#include "webconnector/WebConnector.hpp"

namespace droqbxml::webconnector {

namespace {

constexpr const char* kXml = "text/xml; charset=utf-8";
// Threads serving the Web Connector: held calls and slow clients each take one for a while.
constexpr size_t kServerThreads = 32;

std::string dispatch(Broker& broker, const SoapMessage& call) {
  const auto& op = call.operation;
  const auto p = [&](std::string_view name) -> const std::string& { return call.parameter(name); };
  if (op == "serverVersion") return soapStringResult(op, "DroQbXml " DROQBXML_WEBCONNECTOR_VERSION);
  if (op == "clientVersion") return soapStringResult(op, "");
  if (op == "authenticate") {
    return soapStringsResult(op, broker.authenticate(p("strUserName"), p("strPassword")));
  }
  if (op == "sendRequestXML") {
    return soapStringResult(op, broker.sendRequestXML(p("ticket"), p("strCompanyFileName"),
                                                      p("qbXMLMajorVers"), p("qbXMLMinorVers")));
  }
  if (op == "receiveResponseXML") {
    return soapIntResult(
        op, broker.receiveResponseXML(p("ticket"), p("response"), p("hresult"), p("message")));
  }
  if (op == "connectionError") {
    return soapStringResult(op, broker.connectionError(p("ticket"), p("hresult"), p("message")));
  }
  if (op == "getLastError") return soapStringResult(op, broker.getLastError(p("ticket")));
  if (op == "closeConnection") return soapStringResult(op, broker.closeConnection(p("ticket")));
  throw SoapError("unknown operation '" + op + "'");
}

// The request processor: the component's synchronous calls onto the broker.
class WebConnectorProcessor final : public WaitingProcessor {
 public:
  WebConnectorProcessor(std::shared_ptr<Broker> broker, HostWaits waits)
      : broker_(std::move(broker)), waits_(waits) {}
  ~WebConnectorProcessor() override { endSessions(); }

  void OpenConnection(const Text& /*appID*/, const Text& /*appName*/) override {
    connected_ = true;
  }
  Text BeginSession(const Text& qbFile, QBFileMode /*mode*/) override {
    if (!connected_) {
      raiseError(Hresult::kUnexpected, Text(kWebConnectorProgId),
                 u"The method \"OpenConnection\" has not been called.");
    }
    const std::string ticket = broker_->beginHostSession(toUtf8(qbFile), waits_.session);
    tickets_.push_back(ticket);
    return fromUtf8(ticket);
  }
  Text ProcessRequest(const Text& ticket, const Text& request) override {
    return fromUtf8(broker_->process(toUtf8(ticket), toUtf8(request), waits_.request));
  }
  void EndSession(const Text& ticket) override {
    const std::string key = toUtf8(ticket);
    broker_->endHostSession(key);
    std::erase(tickets_, key);
  }
  void CloseConnection() override {
    endSessions();
    connected_ = false;
  }
  Text GetCurrentCompanyFileName(const Text& ticket) override {
    return fromUtf8(broker_->companyFileOf(toUtf8(ticket)));
  }
  void setWaits(HostWaits waits) override { waits_ = waits; }
  int16_t MajorVersion() override { return version().first; }
  int16_t MinorVersion() override { return version().second; }

 private:
  std::pair<int16_t, int16_t> version() {
    return tickets_.empty() ? std::pair<int16_t, int16_t>{13, 0}
                            : broker_->versionOf(tickets_.back());
  }
  void endSessions() {
    for (const std::string& ticket : tickets_) {
      try {
        broker_->endHostSession(ticket);
      } catch (const ComError&) {
      }
    }
    tickets_.clear();
  }

  std::shared_ptr<Broker> broker_;
  HostWaits waits_;
  bool connected_ = false;
  std::vector<std::string> tickets_;
};

}  // namespace

struct Service::Server {
  std::unique_ptr<httplib::Server> http;
  std::thread thread;
  int port = 0;
};

Service::Service(ServiceConfig config, Broker::Log log)
    : config_(std::move(config)),
      log_(std::move(log)),
      broker_(std::make_shared<Broker>(config_, log_)) {}

Service::~Service() { stop(); }

void Service::start() {
  auto server = std::make_unique<Server>();
  if (config_.secure()) {
    auto secure = std::make_unique<httplib::SSLServer>(config_.certificate.c_str(),
                                                       config_.privateKey.c_str());
    if (!secure->is_valid()) {
      throw std::runtime_error("cannot load the certificate " + config_.certificate +
                               " or its key " + config_.privateKey);
    }
    server->http = std::move(secure);
  } else {
    server->http = std::make_unique<httplib::Server>();
  }
  httplib::Server& http = *server->http;
  http.new_task_queue = [] { return new httplib::ThreadPool(kServerThreads); };
  http.set_payload_max_length(config_.maxBodyBytes);
  http.set_read_timeout(5, 0);
  http.set_write_timeout(5, 0);
  http.set_keep_alive_max_count(1000);
  http.set_tcp_nodelay(true);  // answers are small: no waiting for the peer's acknowledgement
  const auto holdLimit =
      static_cast<time_t>(std::chrono::duration_cast<std::chrono::seconds>(config_.hold).count());
  http.set_keep_alive_timeout(std::max<time_t>(5, holdLimit));
  Broker& broker = *broker_;
  const Broker::Log log = log_;
  http.Post(config_.path,
            [&broker, log](const httplib::Request& request, httplib::Response& response) {
              try {
                response.set_content(dispatch(broker, readSoapMessage(request.body)), kXml);
              } catch (const SoapError& error) {
                if (log)
                  log(std::string("refused a message from ") + request.remote_addr + ": " +
                      loggable(error.what()));
                response.status = 500;
                response.set_content(soapFault("soap:Client", error.what()), kXml);
              }
            });
  server->port = config_.port == 0
                     ? http.bind_to_any_port(config_.listen)
                     : (http.bind_to_port(config_.listen, config_.port) ? config_.port : -1);
  if (server->port <= 0) {
    throw std::runtime_error("cannot listen on " + config_.listen + ":" +
                             std::to_string(config_.port));
  }
  // Connections made before the thread accepts wait in the listen backlog.
  server->thread = std::thread([&http] { http.listen_after_bind(); });
  server_ = std::move(server);
}

void Service::stop(std::chrono::milliseconds grace) {
  broker_->shutdown(grace);
  if (!server_) return;
  server_->http->stop();
  if (server_->thread.joinable()) server_->thread.join();
  server_.reset();
}

uint16_t Service::port() const { return server_ ? static_cast<uint16_t>(server_->port) : 0; }

std::string Service::url() const {
  return std::string(config_.secure() ? "https://" : "http://") + config_.listen + ":" +
         std::to_string(port()) + config_.path;
}

std::shared_ptr<RequestProcessor> Service::newProcessor(HostWaits waits) {
  return std::make_shared<WebConnectorProcessor>(broker_, waits);
}

void install(Service& service, HostWaits waits, bool asQuickBooks) {
  const RequestProcessorFactory factory = [&service, waits] { return service.newProcessor(waits); };
  registerRequestProcessor(kWebConnectorProgId, factory);
  if (asQuickBooks) registerRequestProcessor(kRequestProcessorProgId, factory);
}

}  // namespace droqbxml::webconnector

// The Web Connector's side of a run, over cpp-httplib's client.
#include "webconnector/Player.hpp"

#include <httplib.h>

#include <cstdio>
#include <cstdlib>
#include <thread>

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"

namespace droqbxml::webconnector {

namespace {

constexpr const char* kClientVersion = "2.3.0.215";

// What the Web Connector passes in the first sendRequestXML of a run: QuickBooks' answer to
// its host query.
constexpr const char* kHostResponse =
    "<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n"
    "<HostQueryRs requestID=\"0\" statusCode=\"0\" statusSeverity=\"Info\" "
    "statusMessage=\"Status OK\">\n<HostRet>\n<ProductName>DroQbXml stand-in</ProductName>\n"
    "<MajorVersion>13</MajorVersion>\n<MinorVersion>0</MinorVersion>\n<Country>US</Country>\n"
    "<SupportedQBXMLVersion>13.0</SupportedQBXMLVersion>\n"
    "<IsAutomaticLogin>true</IsAutomaticLogin>\n<QBFileMode>SingleUser</QBFileMode>\n"
    "</HostRet>\n</HostQueryRs>\n</QBXMLMsgsRs>\n</QBXML>\n";

std::string hresultText(int32_t number) {
  char text[16];
  std::snprintf(text, sizeof text, "0x%08X", static_cast<unsigned>(number));
  return text;
}

}  // namespace

struct Player::Client {
  std::unique_ptr<httplib::Client> http;
  std::string path;
};

Player::Player(PlayerOptions options, std::shared_ptr<RequestProcessor> quickBooks)
    : options_(std::move(options)),
      quickBooks_(std::move(quickBooks)),
      client_(std::make_unique<Client>()) {
  const size_t scheme = options_.url.find("://");
  const size_t path = scheme == std::string::npos ? scheme : options_.url.find('/', scheme + 3);
  if (path == std::string::npos) throw PlayerError("not an http(s) URL: " + options_.url);
  client_->http = std::make_unique<httplib::Client>(options_.url.substr(0, path));
  client_->path = options_.url.substr(path);
  client_->http->set_read_timeout(options_.timeout);
  client_->http->set_keep_alive(true);
  client_->http->set_tcp_nodelay(true);
  client_->http->enable_server_certificate_verification(options_.verifyCertificate);
  if (!options_.caFile.empty()) client_->http->set_ca_cert_path(options_.caFile.c_str());
}

Player::~Player() = default;

SoapMessage Player::call(std::string_view operation,
                         const std::vector<std::pair<std::string, std::string>>& parameters) {
  const httplib::Headers headers{
      {"SOAPAction", "\"http://developer.intuit.com/" + std::string(operation) + "\""}};
  const auto answer = client_->http->Post(client_->path, headers, soapCall(operation, parameters),
                                          "text/xml; charset=utf-8");
  if (!answer) {
    lastStatus_ = 0;
    throw PlayerError(std::string(operation) + ": no answer from " + options_.url + " (" +
                      httplib::to_string(answer.error()) + ")");
  }
  lastStatus_ = answer->status;
  try {
    return readSoapMessage(answer->body);
  } catch (const SoapError& error) {
    throw PlayerError(std::string(operation) + ": HTTP " + std::to_string(answer->status) + ", " +
                      error.what());
  }
}

RunResult Player::run() {
  RunResult result;
  call("serverVersion", {});
  call("clientVersion", {{"strVersion", kClientVersion}});
  const SoapMessage login =
      call("authenticate", {{"strUserName", options_.user}, {"strPassword", options_.password}});
  if (login.strings.size() < 2) throw PlayerError("authenticate: no ticket and status");
  const std::string& ticket = login.strings[0];
  const std::string& status = login.strings[1];
  if (status == "nvu" || status == "none" || status == "busy") {
    result.outcome = status;
    return result;
  }
  const std::string companyFile = status.empty() ? options_.companyFile : status;

  Text session;
  try {
    quickBooks_->OpenConnection(u"", fromUtf8(options_.appName));
    session = quickBooks_->BeginSession(fromUtf8(companyFile), qbFileOpenDoNotCare);
  } catch (const ComError& error) {
    call("connectionError", {{"ticket", ticket},
                             {"hresult", hresultText(error.number())},
                             {"message", toUtf8(error.description())}});
    quickBooks_->CloseConnection();
    result.outcome = "connectionError";
    return result;
  }
  const std::string major = std::to_string(quickBooks_->MajorVersion());
  const std::string minor = std::to_string(quickBooks_->MinorVersion());
  for (bool first = true;; first = false) {
    const SoapMessage asked =
        call("sendRequestXML", {{"ticket", ticket},
                                {"strHCPResponse", first ? kHostResponse : ""},
                                {"strCompanyFileName", companyFile},
                                {"qbXMLCountry", "US"},
                                {"qbXMLMajorVers", major},
                                {"qbXMLMinorVers", minor}});
    const std::string& request = asked.parameter("sendRequestXMLResult");
    if (request.empty()) {
      if (call("getLastError", {{"ticket", ticket}}).parameter("getLastErrorResult") == "NoOp") {
        std::this_thread::sleep_for(options_.noOpPause);
        continue;
      }
      break;
    }
    ++result.requests;
    std::vector<std::pair<std::string, std::string>> answer{{"ticket", ticket}};
    try {
      const Text response = quickBooks_->ProcessRequest(session, fromUtf8(request));
      answer.insert(answer.end(),
                    {{"response", toUtf8(response)}, {"hresult", ""}, {"message", ""}});
    } catch (const ComError& error) {
      answer.insert(answer.end(), {{"response", ""},
                                   {"hresult", hresultText(error.number())},
                                   {"message", toUtf8(error.description())}});
    }
    const std::string percent =
        call("receiveResponseXML", answer).parameter("receiveResponseXMLResult");
    const int done = percent.empty() ? -1 : std::atoi(percent.c_str());
    if (done < 0) {
      call("getLastError", {{"ticket", ticket}});
      break;
    }
    if (done >= 100) break;
  }
  result.closeMessage =
      call("closeConnection", {{"ticket", ticket}}).parameter("closeConnectionResult");
  quickBooks_->EndSession(session);
  quickBooks_->CloseConnection();
  result.outcome = "done";
  return result;
}

}  // namespace droqbxml::webconnector

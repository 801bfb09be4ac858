// droqbxml relay: serves a request processor to Windows programs running under Wine on the
// same machine. The COM server com/relay (registered in a Wine prefix as QuickBooks'
// "QBXMLRP.RequestProcessor.1") forwards each call over a loopback TCP connection; here
// each connection gets a processor of its own (the embedded stand-in unless --processor
// names another) and every call is answered in turn. It runs until it is stopped.
//
// A message is a 4-byte little-endian length and that many bytes of UTF-8 fields separated
// by NUL: a call is the member's name and its arguments; the answer is "OK" and the result,
// or "ERR", the error number and its description. Windows paths on drive Z: (Wine's view of
// the Unix root) are handed to the processor as Unix paths, and given back as Z: paths.
//
// The same messages carry a Linux host's calls to a Web Connector service started by
// `droqbxml webconnector serve` (relayClient below), with one more call, "SetWaits", that
// sets how long the service's processor waits for the Web Connector.
#include <arpa/inet.h>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <sys/socket.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <chrono>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "cli/Cli.hpp"
#include "cli/Commands.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "webconnector/WebConnector.hpp"

namespace droqbxml::cli {
namespace {

bool readAll(int socket, char* data, size_t size) {
  while (size > 0) {
    const ssize_t got = ::recv(socket, data, size, 0);
    if (got <= 0) return false;
    data += got;
    size -= static_cast<size_t>(got);
  }
  return true;
}

bool writeAll(int socket, const char* data, size_t size) {
  while (size > 0) {
    const ssize_t sent = ::send(socket, data, size, MSG_NOSIGNAL);
    if (sent <= 0) return false;
    data += sent;
    size -= static_cast<size_t>(sent);
  }
  return true;
}

bool readMessage(int socket, std::vector<std::string>& fields) {
  std::array<unsigned char, 4> header{};
  if (!readAll(socket, reinterpret_cast<char*>(header.data()), header.size())) return false;
  const uint32_t size =
      header[0] | header[1] << 8 | header[2] << 16 | static_cast<uint32_t>(header[3]) << 24;
  std::string body(size, '\0');
  if (!readAll(socket, body.data(), body.size())) return false;
  fields.clear();
  size_t from = 0;
  for (size_t at = body.find('\0'); at != std::string::npos; at = body.find('\0', from)) {
    fields.push_back(body.substr(from, at - from));
    from = at + 1;
  }
  fields.push_back(body.substr(from));
  return true;
}

bool writeMessage(int socket, const std::vector<std::string>& fields) {
  std::string body;
  for (size_t i = 0; i < fields.size(); ++i) body += (i ? std::string(1, '\0') : "") + fields[i];
  const auto size = static_cast<uint32_t>(body.size());
  const std::array<char, 4> header{static_cast<char>(size), static_cast<char>(size >> 8),
                                   static_cast<char>(size >> 16), static_cast<char>(size >> 24)};
  return writeAll(socket, header.data(), header.size()) && writeAll(socket, body.data(), size);
}

// "Z:\srv\books\x.qbw" is "/srv/books/x.qbw"; other paths pass unchanged.
Text unixPath(const Text& path) {
  if (path.size() < 3 || (path[0] != u'Z' && path[0] != u'z') || path[1] != u':') return path;
  Text unix = path.substr(2);
  for (char16_t& c : unix) c = c == u'\\' ? u'/' : c;
  return unix;
}

Text windowsPath(const Text& path) {
  if (path.empty() || path[0] != u'/') return path;
  Text windows = u"Z:" + path;
  for (char16_t& c : windows) c = c == u'/' ? u'\\' : c;
  return windows;
}

// Answers one call on `processor`.
std::vector<std::string> answer(RequestProcessor& processor, const std::vector<std::string>& call) {
  const auto arg = [&](size_t i) { return i < call.size() ? fromUtf8(call[i]) : Text(); };
  const std::string& name = call[0];
  try {
    Text result;
    if (name == "OpenConnection") {
      processor.OpenConnection(arg(1), arg(2));
    } else if (name == "BeginSession") {
      result = processor.BeginSession(unixPath(arg(1)),
                                      static_cast<QBFileMode>(std::stoi("0" + call.at(2))));
    } else if (name == "ProcessRequest") {
      result = processor.ProcessRequest(arg(1), arg(2));
    } else if (name == "EndSession") {
      processor.EndSession(arg(1));
    } else if (name == "CloseConnection") {
      processor.CloseConnection();
    } else if (name == "GetCurrentCompanyFileName") {
      result = windowsPath(processor.GetCurrentCompanyFileName(arg(1)));
    } else if (name == "MajorVersion") {
      result = asciiText(std::to_string(processor.MajorVersion()));
    } else if (name == "MinorVersion") {
      result = asciiText(std::to_string(processor.MinorVersion()));
    } else if (auto* waiting = dynamic_cast<webconnector::WaitingProcessor*>(&processor);
               waiting != nullptr && name == "SetWaits") {
      waiting->setWaits({std::chrono::milliseconds(std::stoll("0" + call.at(1))),
                         std::chrono::milliseconds(std::stoll("0" + call.at(2)))});
    } else {
      return {"ERR", std::to_string(RuntimeError::kMemberNotSupported),
              "Object doesn't support this property or method"};
    }
    return {"OK", toUtf8(result)};
  } catch (const ComError& error) {
    return {"ERR", std::to_string(error.number()), toUtf8(error.description())};
  } catch (const std::exception& error) {
    return {"ERR", std::to_string(RuntimeError::kInvalidProcedureCall), error.what()};
  }
}

void serve(int client, const RequestProcessorFactory& factory) {
  std::shared_ptr<RequestProcessor> processor;
  std::vector<std::string> call;
  while (readMessage(client, call)) {
    std::vector<std::string> reply;
    try {
      if (!processor) processor = factory();
      reply = answer(*processor, call);
    } catch (const ComError& error) {
      reply = {"ERR", std::to_string(error.number()), toUtf8(error.description())};
    }
    if (!writeMessage(client, reply)) break;
  }
  ::close(client);
}

// Calls and answers are small and go header first: no waiting for the peer's acknowledgement.
void sendAtOnce(int socket) {
  const int yes = 1;
  ::setsockopt(socket, IPPROTO_TCP, TCP_NODELAY, &yes, sizeof yes);
}

sockaddr_in loopback(int port) {
  sockaddr_in address{};
  address.sin_family = AF_INET;
  address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
  address.sin_port = htons(static_cast<uint16_t>(port));
  return address;
}

// A host's request processor whose calls go to a relay on 127.0.0.1:port.
class RelayClient final : public RequestProcessor {
 public:
  RelayClient(int port, std::optional<int> waitSeconds) : port_(port), wait_(waitSeconds) {}
  ~RelayClient() override {
    if (socket_ >= 0) ::close(socket_);
  }

  void OpenConnection(const Text& appID, const Text& appName) override {
    if (wait_) {
      const std::string ms = std::to_string(*wait_ * 1000LL);
      call({"SetWaits", ms, ms});
    }
    call({"OpenConnection", toUtf8(appID), toUtf8(appName)});
  }
  Text BeginSession(const Text& qbFile, QBFileMode mode) override {
    return call({"BeginSession", toUtf8(qbFile), std::to_string(mode)});
  }
  Text ProcessRequest(const Text& ticket, const Text& request) override {
    return call({"ProcessRequest", toUtf8(ticket), toUtf8(request)});
  }
  void EndSession(const Text& ticket) override { call({"EndSession", toUtf8(ticket)}); }
  void CloseConnection() override { call({"CloseConnection"}); }
  Text GetCurrentCompanyFileName(const Text& ticket) override {
    return call({"GetCurrentCompanyFileName", toUtf8(ticket)});
  }
  int16_t MajorVersion() override {
    return static_cast<int16_t>(std::stoi("0" + toUtf8(call({"MajorVersion"}))));
  }
  int16_t MinorVersion() override {
    return static_cast<int16_t>(std::stoi("0" + toUtf8(call({"MinorVersion"}))));
  }

 private:
  Text call(const std::vector<std::string>& fields) {
    if (socket_ < 0) {
      socket_ = ::socket(AF_INET, SOCK_STREAM, 0);
      if (socket_ >= 0) sendAtOnce(socket_);
      const sockaddr_in address = loopback(port_);
      if (socket_ < 0 ||
          ::connect(socket_, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0) {
        if (socket_ >= 0) ::close(socket_);
        socket_ = -1;
        raiseError(webconnector::Hresult::kCouldNotStart, Text(webconnector::kWebConnectorProgId),
                   asciiText("Could not start QuickBooks: no DroQbXml Web Connector service "
                             "answers on 127.0.0.1:" +
                             std::to_string(port_) + " (droqbxml webconnector serve)."));
      }
    }
    std::vector<std::string> reply;
    if (!writeMessage(socket_, fields) || !readMessage(socket_, reply) || reply.empty()) {
      ::close(socket_);
      socket_ = -1;
      raiseError(webconnector::Hresult::kUnexpected, Text(webconnector::kWebConnectorProgId),
                 u"The DroQbXml Web Connector service closed the connection.");
    }
    if (reply[0] == "OK") return reply.size() > 1 ? fromUtf8(reply[1]) : Text();
    // HRESULTs travel as signed decimals ("-2147220477" for 0x80040403).
    raiseError(
        static_cast<int32_t>(std::strtoll(reply.size() > 1 ? reply[1].c_str() : "", nullptr, 10)),
        Text(webconnector::kWebConnectorProgId), fromUtf8(reply.size() > 2 ? reply[2] : ""));
  }

  int port_;
  std::optional<int> wait_;
  int socket_ = -1;
};

}  // namespace

int listenOnLoopback(int port) {
  const int listener = ::socket(AF_INET, SOCK_STREAM, 0);
  const int yes = 1;
  ::setsockopt(listener, SOL_SOCKET, SO_REUSEADDR, &yes, sizeof yes);
  const sockaddr_in address = loopback(port);
  if (listener < 0 ||
      ::bind(listener, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0 ||
      ::listen(listener, 8) != 0) {
    if (listener >= 0) ::close(listener);
    return -1;
  }
  return listener;
}

void acceptRelayCalls(int listener, RequestProcessorFactory factory) {
  for (;;) {
    const int client = ::accept(listener, nullptr, nullptr);
    if (client < 0) {
      if (errno == EINTR || errno == ECONNABORTED) continue;
      return;
    }
    sendAtOnce(client);
    std::thread(serve, client, factory).detach();
  }
}

std::shared_ptr<RequestProcessor> relayClient(int port, std::optional<int> waitSeconds) {
  return std::make_shared<RelayClient>(port, waitSeconds);
}

int relayCommand(Io io, int port, const ConnectionOptions& connection) {
  const int listener = listenOnLoopback(port);
  if (listener < 0) {
    io.err << "droqbxml: cannot listen on 127.0.0.1:" << port << '\n';
    return kExitConnection;
  }
  io.out << "relaying request processor calls on 127.0.0.1:" << port << std::endl;
  const ProcessorOverride override(connection.processor);
  acceptRelayCalls(listener, [] { return createRequestProcessor(kRequestProcessorProgId); });
  return kExitConnection;
}

}  // namespace droqbxml::cli

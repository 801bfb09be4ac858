// The Web Connector service's SOAP reader on arbitrary bodies: it returns a message or
// refuses with SoapError, nothing else; and any call the writer makes of plain text reads
// back exactly, parameter for parameter.
#include <fuzzer/FuzzedDataProvider.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "fuzz/FuzzSupport.hpp"
#include "webconnector/Soap.hpp"

namespace {

// Text XML carries as it is written: printable ASCII, tabs, line feeds and returns.
bool plain(const std::string& text) {
  for (const char c : text) {
    const auto unit = static_cast<unsigned char>(c);
    if (unit >= 0x7F || (unit < 0x20 && c != '\t' && c != '\n' && c != '\r')) return false;
  }
  return true;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace droqbxml::webconnector;
  using droqbxml::fuzz::require;
  const std::string body(reinterpret_cast<const char*>(data), size);
  try {
    (void)readSoapMessage(body);
  } catch (const SoapError&) {
  }

  static constexpr std::array<const char*, 4> kOperations{"authenticate", "sendRequestXML",
                                                          "receiveResponseXML", "getLastError"};
  static constexpr std::array<const char*, 4> kNames{"ticket", "strUserName", "response",
                                                     "hresult"};
  FuzzedDataProvider in(data, size);
  const std::string operation = kOperations[in.ConsumeIntegralInRange<size_t>(0, 3)];
  std::vector<std::pair<std::string, std::string>> parameters;
  const size_t count = in.ConsumeIntegralInRange<size_t>(0, 3);
  for (size_t i = 0; i < count; ++i) {
    std::string value = in.ConsumeRandomLengthString(4096);
    if (!plain(value)) return 0;
    parameters.emplace_back(kNames[i], std::move(value));
  }
  const SoapMessage read = readSoapMessage(soapCall(operation, parameters));
  require(read.operation == operation && read.parameters == parameters,
          "a call of plain text reads back exactly");
  return 0;
}

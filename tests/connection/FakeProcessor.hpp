// A scripted request processor for the tests: each call is recorded, and each step's
// answer or failure comes from a function the test sets.
#ifndef DROQBXML_TESTS_CONNECTION_FAKEPROCESSOR_HPP_
#define DROQBXML_TESTS_CONNECTION_FAKEPROCESSOR_HPP_

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "droqbxml/connection/RequestProcessor.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"

namespace droqbxml::test {

inline ComError processorError(int32_t hresult, TextView text) {
  ErrorRecord record;
  record.Number = hresult;
  record.Source = u"QBXMLRP.RequestProcessor.1";
  record.Description = Text(text);
  return ComError(record);
}

class FakeProcessor final : public RequestProcessor {
 public:
  std::vector<std::string> calls;
  std::function<void()> open = [] {};
  std::function<Text(const Text&)> begin = [](const Text&) { return Text(u"ticket-1"); };
  std::function<Text(const Text&)> process = [](const Text&) {
    return Text(u"<QBXML><QBXMLMsgsRs><X statusCode=\"0\" /></QBXMLMsgsRs></QBXML>");
  };
  std::function<void()> end = [] {};

  void OpenConnection(const Text& appID, const Text& appName) override {
    calls.push_back("OpenConnection(" + toUtf8(appID) + "," + toUtf8(appName) + ")");
    open();
  }
  Text BeginSession(const Text& qbFile, QBFileMode mode) override {
    calls.push_back("BeginSession(" + toUtf8(qbFile) + "," + std::to_string(mode) + ")");
    return begin(qbFile);
  }
  Text ProcessRequest(const Text& ticket, const Text& request) override {
    calls.push_back("ProcessRequest(" + toUtf8(ticket) + ")");
    return process(request);
  }
  void EndSession(const Text& ticket) override {
    calls.push_back("EndSession(" + toUtf8(ticket) + ")");
    end();
  }
  void CloseConnection() override { calls.push_back("CloseConnection"); }
  Text GetCurrentCompanyFileName(const Text&) override { return u"C:\\co.qbw"; }
  int16_t MajorVersion() override { return 13; }
  int16_t MinorVersion() override { return 0; }
};

// Registers a fresh FakeProcessor as QuickBooks' request processor while it lives.
class FakeProcessorRegistration {
 public:
  FakeProcessorRegistration() : fake(std::make_shared<FakeProcessor>()) {
    registerRequestProcessor(kRequestProcessorProgId, [f = fake] { return f; });
  }
  ~FakeProcessorRegistration() { unregisterRequestProcessor(kRequestProcessorProgId); }
  FakeProcessorRegistration(const FakeProcessorRegistration&) = delete;
  FakeProcessorRegistration& operator=(const FakeProcessorRegistration&) = delete;

  std::shared_ptr<FakeProcessor> fake;
};

}  // namespace droqbxml::test

#endif  // DROQBXML_TESTS_CONNECTION_FAKEPROCESSOR_HPP_

// The connection wrapper reading what a request processor gives back, through a scripted
// processor: an arbitrary response, an arbitrary failure of ProcessRequest, or of
// BeginSession (once; the wrapper retries a session until it begins, on purpose). The
// wrapper must never raise from ProcessRequest; on a response whose status code reads
// cleanly (and is not the reference error, which the tax messages refine) its status is
// that code and it hands back the response unescaped once; a processor failure is handed
// back as the response with RSParsingError or RSUnknown. SessionBegin raises only ComErrors.
#include <fuzzer/FuzzedDataProvider.h>

#include <cstdint>
#include <cstdlib>
#include <string>

#include "droqbxml/connection/DroXmlSdkWrapper.hpp"
#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "fuzz/FuzzSupport.hpp"
#include "tests/connection/FakeProcessor.hpp"

namespace droqbxml::fuzz {
namespace {

test::FakeProcessor& fake() {
  static test::FakeProcessorRegistration registration;
  return *registration.fake;
}

void readResponse(const Text& response) {
  fake().process = [&](const Text&) { return response; };
  DroXmlSdkWrapper wrapper;
  const Text handed = wrapper.ProcessRequest(u"<QBXML />");
  const Text code = outcomeOf([&] { return number(DroXmlSdkWrapper::ReadStatusCode(response)); });
  const Text unescaped = outcomeOf([&] { return XMLUnEscapeText(response); });
  if (code.starts_with(u"value: ") && code != u"value: 3140" && unescaped.starts_with(u"value: ")) {
    requireSame(code, u"value: " + number(wrapper.ResponseStatus()),
                "the status is the response's status code");
    requireSame(unescaped, u"value: " + handed, "the response is handed back unescaped");
  }
  DroXmlSdkWrapper::IsIncompleteQueryResponse(response);
}

void processorFails(int32_t hresult, const Text& description) {
  fake().process = [&](const Text&) -> Text { throw test::processorError(hresult, description); };
  DroXmlSdkWrapper wrapper;
  const Text handed = wrapper.ProcessRequest(u"<QBXML />");
  require(wrapper.ResponseStatus() == RSParsingError || wrapper.ResponseStatus() == RSUnknown,
          "a processor failure is a parsing error or unknown",
          std::to_string(wrapper.ResponseStatus()));
  require(handed == description, "a processor failure is handed back as the response");
}

void sessionFails(int32_t hresult, const Text& description) {
  bool failed = false;
  fake().begin = [&](const Text&) -> Text {
    if (failed) return u"ticket-1";
    failed = true;
    throw test::processorError(hresult, description);
  };
  DroXmlSdkWrapper wrapper;
  wrapper.CompanyFilePath(u"C:\\co.qbw");
  outcomeOf([&] {
    wrapper.SessionBegin();
    return number(wrapper.ResponseStatus());
  });
  fake().begin = [](const Text&) { return Text(u"ticket-1"); };
}

}  // namespace
}  // namespace droqbxml::fuzz

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  // The failed-exchange log goes to a scratch drive C:.
  ::setenv("DROQBXML_DRIVE_C", droqbxml::fuzz::scratchFolder().c_str(), 1);
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace droqbxml;
  using namespace droqbxml::fuzz;
  FuzzedDataProvider in(data, size);
  const int step = in.ConsumeIntegralInRange<int>(0, 7);
  const auto hresult = in.ConsumeIntegral<int32_t>();
  const Text text = fromUtf8(in.ConsumeRemainingBytesAsString());
  fake().calls.clear();
  if (step < 6) {
    readResponse(text);
  } else if (step == 6) {
    processorFails(hresult, text);
  } else {
    sessionFails(hresult, text);
  }
  return 0;
}

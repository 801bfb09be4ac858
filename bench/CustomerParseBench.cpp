// The first DroCustomer.ParseRs over a batch of customer query responses (one CustomerRet
// each, requestIDs 2, 3, ..., optional elements mostly absent, as QuickBooks writes them),
// against pugixml on the same text (see FirstParse.hpp).
#include <string>

#include "bench/FirstParse.hpp"
#include "droqbxml/records/DroCustomer.hpp"

namespace droqbxml {
namespace {

std::string batchResponse(int customers) {
  std::string text = "<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n";
  for (int i = 0; i < customers; ++i) {
    const std::string n = std::to_string(i);
    text += "<CustomerQueryRs requestID=\"" + std::to_string(i + 2) +
            "\" statusCode=\"0\" statusSeverity=\"Info\" statusMessage=\"Status OK\">\n"
            "<CustomerRet>\n<ListID>8000" +
            n +
            "-1405768916</ListID>\n"
            "<TimeCreated>2014-07-19T07:21:56-05:00</TimeCreated>\n"
            "<TimeModified>2014-07-19T07:21:56-05:00</TimeModified>\n"
            "<EditSequence>1405768916</EditSequence>\n<Name>Customer " +
            n +
            "</Name>\n"
            "<FullName>Customer " +
            n +
            "</FullName>\n<IsActive>true</IsActive>\n"
            "<Sublevel>0</Sublevel>\n";
    if (i % 3 == 0) text += "<CompanyName>Company " + n + "</CompanyName>\n";
    text += "<BillAddress>\n<Addr1>" + n +
            " Main St.</Addr1>\n<City>Mountain View</City>\n"
            "<State>CA</State>\n<PostalCode>94566</PostalCode>\n</BillAddress>\n";
    if (i % 5 == 0) text += "<Phone>555-0100</Phone>\n";
    text +=
        "<Balance>0.00</Balance>\n<TotalBalance>0.00</TotalBalance>\n"
        "<JobStatus>None</JobStatus>\n</CustomerRet>\n</CustomerQueryRs>\n";
  }
  return text + "</QBXMLMsgsRs>\n</QBXML>\n";
}

void BM_CustomerFirstParse(benchmark::State& state) {
  bench::firstParseAgainstPugixml<DroCustomer>(state,
                                               batchResponse(static_cast<int>(state.range(0))));
}

BENCHMARK(BM_CustomerFirstParse)
    ->Arg(1000)
    ->Arg(10000)
    ->Arg(50000)
    ->UseManualTime()
    ->Iterations(15)
    ->Unit(benchmark::kMillisecond);

// The converters on the same ASCII-heavy text: UTF-8 to the component's UTF-16 text, and
// back, each against pugixml's whole parse of the UTF-8 text.
void BM_FromUtf8(benchmark::State& state) {
  const std::string response = batchResponse(static_cast<int>(state.range(0)));
  bench::againstPugixml(state, response, [&](Text&) {
    const Text text = fromUtf8(response);
    return text.size() == response.size();
  });
}

void BM_ToUtf8(benchmark::State& state) {
  const std::string response = batchResponse(static_cast<int>(state.range(0)));
  bench::againstPugixml(state, response, [&](Text& fresh) {
    const std::string bytes = toUtf8(fresh);
    return bytes.size() == response.size();
  });
}

BENCHMARK(BM_FromUtf8)->Arg(10000)->UseManualTime()->Iterations(15)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ToUtf8)->Arg(10000)->UseManualTime()->Iterations(15)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace droqbxml

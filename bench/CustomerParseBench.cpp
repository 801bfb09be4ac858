// Reading a batch of customer query responses (one CustomerRet each, requestIDs 2, 3, ...,
// optional elements mostly absent, as QuickBooks writes them) with DroCustomer.ParseRs, one
// record after another from the returned cursor; and, on the same text in UTF-8, a parse
// with pugixml for scale.
#include <benchmark/benchmark.h>

#include <pugixml.hpp>
#include <string>

#include "droqbxml/records/DroCustomer.hpp"
#include "droqbxml/runtime/Utf.hpp"

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

void BM_CustomerWalk(benchmark::State& state) {
  const auto customers = static_cast<int>(state.range(0));
  const Text response = fromUtf8(batchResponse(customers));
  int read = 0;
  for (auto _ : state) {
    // One record after another until a parse reads nothing. An optional element absent from
    // a record is taken from a later one (the scan is not bounded by its record), so the
    // walk skips the records in between, as hosts have always seen it do.
    read = 0;
    int32_t cursor = 1;
    for (;;) {
      DroCustomer customer;
      cursor = customer.ParseRs(response, cursor);
      if (customer.ListID().empty()) break;
      ++read;
    }
  }
  if (read == 0) state.SkipWithError("no customer was read");
  state.counters["records_read"] = read;
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                          static_cast<int64_t>(response.size() * 2));
}

void BM_PugixmlParse(benchmark::State& state) {
  const std::string response = batchResponse(static_cast<int>(state.range(0)));
  for (auto _ : state) {
    pugi::xml_document document;
    benchmark::DoNotOptimize(document.load_buffer(response.data(), response.size()));
  }
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                          static_cast<int64_t>(response.size()));
}

BENCHMARK(BM_CustomerWalk)->Arg(1000)->Arg(10000)->Arg(50000)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_PugixmlParse)->Arg(1000)->Arg(10000)->Arg(50000)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace droqbxml

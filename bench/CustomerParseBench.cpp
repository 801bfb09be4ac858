// The first DroCustomer.ParseRs over a batch of customer query responses (one CustomerRet
// each, requestIDs 2, 3, ..., optional elements mostly absent, as QuickBooks writes them),
// against pugixml on the same text (see FirstParse.hpp).
#include <string>

#include "bench/FirstParse.hpp"
#include "bench/Responses.hpp"
#include "droqbxml/records/DroCustomer.hpp"

namespace droqbxml {
namespace {

void BM_CustomerFirstParse(benchmark::State& state) {
  bench::firstParseAgainstPugixml<DroCustomer>(
      state, bench::customerBatch(static_cast<int>(state.range(0))));
}

BENCHMARK(BM_CustomerFirstParse)
    ->Arg(1000)
    ->Arg(10000)
    ->Arg(50000)
    ->UseManualTime()
    ->Iterations(15)
    ->Unit(benchmark::kMillisecond);

// One CustomerQueryRs holding every customer.
void BM_CustomerListFirstParse(benchmark::State& state) {
  bench::firstParseAgainstPugixml<DroCustomer>(
      state, bench::customerList(static_cast<int>(state.range(0))));
}

BENCHMARK(BM_CustomerListFirstParse)
    ->Arg(10000)
    ->UseManualTime()
    ->Iterations(15)
    ->Unit(benchmark::kMillisecond);

// The converters on the same ASCII-heavy text: UTF-8 to the component's UTF-16 text, and
// back, each against pugixml's whole parse of the UTF-8 text.
void BM_FromUtf8(benchmark::State& state) {
  const std::string response = bench::customerBatch(static_cast<int>(state.range(0)));
  bench::againstPugixml(state, response, [&](Text&) {
    const Text text = fromUtf8(response);
    return text.size() == response.size();
  });
}

void BM_ToUtf8(benchmark::State& state) {
  const std::string response = bench::customerBatch(static_cast<int>(state.range(0)));
  bench::againstPugixml(state, response, [&](Text& fresh) {
    const std::string bytes = toUtf8(fresh);
    return bytes.size() == response.size();
  });
}

BENCHMARK(BM_FromUtf8)->Arg(10000)->UseManualTime()->Iterations(15)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ToUtf8)->Arg(10000)->UseManualTime()->Iterations(15)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace droqbxml

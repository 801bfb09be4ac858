// The first ParseRs of an inventory item over batch responses of 10,000 and 50,000
// "ItemInventoryQueryRs" and of an account over 10,000 "AccountQueryRs", each response
// holding one record as QuickBooks writes it, against pugixml (see FirstParse.hpp). The
// record reads the first response; elements absent from it are searched to the end of the
// text, which is what makes the figure grow with the batch.
#include <string>

#include "bench/FirstParse.hpp"
#include "bench/Responses.hpp"
#include "droqbxml/records/DroAccount.hpp"
#include "droqbxml/records/DroItemInventory.hpp"

namespace droqbxml {
namespace {

void BM_ItemInventoryFirstParse(benchmark::State& state) {
  bench::firstParseAgainstPugixml<DroItemInventory>(
      state, bench::inventoryBatch(static_cast<int>(state.range(0))));
}

void BM_AccountFirstParse(benchmark::State& state) {
  bench::firstParseAgainstPugixml<DroAccount>(
      state, bench::accountBatch(static_cast<int>(state.range(0))));
}

BENCHMARK(BM_ItemInventoryFirstParse)
    ->Arg(5000)
    ->Arg(50000)
    ->UseManualTime()
    ->Iterations(15)
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_AccountFirstParse)
    ->Arg(10000)
    ->UseManualTime()
    ->Iterations(15)
    ->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace droqbxml

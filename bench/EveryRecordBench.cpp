// Reading every record of a batch response, each from its own response element, against
// pugixml's parse of the whole text (see FirstParse.hpp). Through an IndexedResponse the
// text is indexed once, inside the timing; through the plain text every read proves
// nothing about the next, so each pays for the text again (a smaller batch: that cost
// grows with the square of the batch).
#include <string>
#include <vector>

#include "bench/FirstParse.hpp"
#include "bench/Responses.hpp"
#include "droqbxml/records/DroCustomer.hpp"
#include "droqbxml/records/DroItemInventory.hpp"
#include "droqbxml/records/IndexedResponse.hpp"

namespace droqbxml {
namespace {

// The 1-based positions of each response element `opening` in the text.
std::vector<int32_t> responseStarts(const std::string& response, const std::string& opening) {
  std::vector<int32_t> starts;
  for (size_t at = response.find(opening); at != std::string::npos;
       at = response.find(opening, at + 1)) {
    starts.push_back(static_cast<int32_t>(at + 1));
  }
  return starts;
}

template <class Record, bool kIndexed>
void everyRecord(benchmark::State& state, const std::string& response, const std::string& opening) {
  const std::vector<int32_t> starts = responseStarts(response, opening);
  bench::againstPugixml(state, response, [&](Text& fresh) {
    size_t read = 0;
    const auto readAll = [&](const auto& value) {
      for (const int32_t start : starts) {
        Record record;
        record.ParseRs(value, start);
        read += record.ListID().empty() ? 0 : 1;
      }
    };
    if constexpr (kIndexed) {
      readAll(IndexedResponse(std::move(fresh)));
    } else {
      readAll(fresh);
    }
    return read == starts.size();
  });
  state.counters["us_per_record"] =
      state.counters["ours_ms"] * 1e3 / static_cast<double>(starts.size());
}

void BM_CustomerEveryRecord(benchmark::State& state) {
  everyRecord<DroCustomer, true>(state, bench::customerBatch(static_cast<int>(state.range(0))),
                                 "<CustomerQueryRs ");
}

void BM_CustomerEveryRecordPlainText(benchmark::State& state) {
  everyRecord<DroCustomer, false>(state, bench::customerBatch(static_cast<int>(state.range(0))),
                                  "<CustomerQueryRs ");
}

void BM_ItemInventoryEveryRecord(benchmark::State& state) {
  everyRecord<DroItemInventory, true>(
      state, bench::inventoryBatch(static_cast<int>(state.range(0))), "<ItemInventoryQueryRs ");
}

BENCHMARK(BM_CustomerEveryRecord)
    ->Arg(5000)
    ->Arg(10000)
    ->Arg(50000)
    ->UseManualTime()
    ->Iterations(7)
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ItemInventoryEveryRecord)
    ->Arg(50000)
    ->UseManualTime()
    ->Iterations(7)
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_CustomerEveryRecordPlainText)
    ->Arg(1000)
    ->UseManualTime()
    ->Iterations(7)
    ->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace droqbxml

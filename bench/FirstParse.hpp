// What a host pays for the first ParseRs of a record on a response it has never read,
// against pugixml parsing the same text. Each round reads a fresh copy of the response
// (made outside the timing: whatever a parse needs to learn about a text, it learns inside
// the timed part), and the two peers take turns in the same process, alternating which goes
// first. The benchmark's time is ours; the counters give the medians of both and the
// median of the per-round ratio ours / pugixml.
#ifndef DROQBXML_BENCH_FIRSTPARSE_HPP_
#define DROQBXML_BENCH_FIRSTPARSE_HPP_

#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <pugixml.hpp>
#include <string>
#include <vector>

#include "droqbxml/runtime/Utf.hpp"

namespace droqbxml::bench {

inline double median(std::vector<double> values) {
  if (values.empty()) return 0;
  std::sort(values.begin(), values.end());
  const size_t mid = values.size() / 2;
  return values.size() % 2 ? values[mid] : (values[mid - 1] + values[mid]) / 2;
}

// Record: a record class with ParseRs(text); response: the UTF-8 text; wasRead(record)
// tells whether the record read what it should.
template <class Record, class WasRead>
void firstParseAgainstPugixml(benchmark::State& state, const std::string& response,
                              WasRead wasRead) {
  using Clock = std::chrono::steady_clock;
  const Text text = fromUtf8(response);
  std::vector<double> ours;
  std::vector<double> theirs;
  std::vector<double> ratios;
  bool read = true;
  for (auto _ : state) {
    Text fresh = text;
    double oursSeconds = 0;
    double theirsSeconds = 0;
    const auto runOurs = [&] {
      const auto start = Clock::now();
      Record record;
      benchmark::DoNotOptimize(record.ParseRs(fresh));
      oursSeconds = std::chrono::duration<double>(Clock::now() - start).count();
      read = read && wasRead(record);
    };
    const auto runTheirs = [&] {
      const auto start = Clock::now();
      pugi::xml_document document;
      benchmark::DoNotOptimize(document.load_buffer(response.data(), response.size()));
      theirsSeconds = std::chrono::duration<double>(Clock::now() - start).count();
    };
    if (ours.size() % 2 == 0) {
      runOurs();
      runTheirs();
    } else {
      runTheirs();
      runOurs();
    }
    state.SetIterationTime(oursSeconds);
    ours.push_back(oursSeconds);
    theirs.push_back(theirsSeconds);
    ratios.push_back(oursSeconds / theirsSeconds);
  }
  if (!read) state.SkipWithError("the record was not read");
  state.counters["ours_ms"] = median(ours) * 1e3;
  state.counters["pugixml_ms"] = median(theirs) * 1e3;
  state.counters["ratio"] = median(ratios);
  state.counters["MB"] = static_cast<double>(response.size()) / 1e6;
}

// For list records: read when ListID is set.
template <class Record>
void firstParseAgainstPugixml(benchmark::State& state, const std::string& response) {
  firstParseAgainstPugixml<Record>(state, response,
                                   [](const Record& record) { return !record.ListID().empty(); });
}

}  // namespace droqbxml::bench

#endif  // DROQBXML_BENCH_FIRSTPARSE_HPP_

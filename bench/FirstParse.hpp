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

// `ours(fresh)` against pugixml parsing `response`, round-robin in one process: each round
// gets a fresh UTF-16 copy of the text (made outside the timing) and alternates which peer
// goes first. `ours` tells whether it did its work. The benchmark's time is ours; the
// counters give both medians and the median of the per-round ratio ours / pugixml.
template <class Ours>
void againstPugixml(benchmark::State& state, const std::string& response, Ours ours) {
  using Clock = std::chrono::steady_clock;
  const Text text = fromUtf8(response);
  std::vector<double> oursTimes;
  std::vector<double> theirs;
  std::vector<double> ratios;
  bool done = true;
  for (auto _ : state) {
    Text fresh = text;
    double oursSeconds = 0;
    double theirsSeconds = 0;
    const auto runOurs = [&] {
      const auto start = Clock::now();
      done = ours(fresh) && done;
      oursSeconds = std::chrono::duration<double>(Clock::now() - start).count();
    };
    const auto runTheirs = [&] {
      const auto start = Clock::now();
      pugi::xml_document document;
      benchmark::DoNotOptimize(document.load_buffer(response.data(), response.size()));
      theirsSeconds = std::chrono::duration<double>(Clock::now() - start).count();
    };
    if (oursTimes.size() % 2 == 0) {
      runOurs();
      runTheirs();
    } else {
      runTheirs();
      runOurs();
    }
    state.SetIterationTime(oursSeconds);
    oursTimes.push_back(oursSeconds);
    theirs.push_back(theirsSeconds);
    ratios.push_back(oursSeconds / theirsSeconds);
  }
  if (!done) state.SkipWithError("the work was not done");
  state.counters["ours_ms"] = median(oursTimes) * 1e3;
  state.counters["pugixml_ms"] = median(theirs) * 1e3;
  state.counters["ratio"] = median(ratios);
  state.counters["MB"] = static_cast<double>(response.size()) / 1e6;
}

// Record: a record class with ParseRs(text); response: the UTF-8 text; wasRead(record)
// tells whether the record read what it should.
template <class Record, class WasRead>
void firstParseAgainstPugixml(benchmark::State& state, const std::string& response,
                              WasRead wasRead) {
  againstPugixml(state, response, [&](Text& fresh) {
    Record record;
    benchmark::DoNotOptimize(record.ParseRs(fresh));
    return wasRead(record);
  });
}

// For list records: read when ListID is set.
template <class Record>
void firstParseAgainstPugixml(benchmark::State& state, const std::string& response) {
  firstParseAgainstPugixml<Record>(state, response,
                                   [](const Record& record) { return !record.ListID().empty(); });
}

}  // namespace droqbxml::bench

#endif  // DROQBXML_BENCH_FIRSTPARSE_HPP_

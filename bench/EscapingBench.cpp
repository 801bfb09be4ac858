// Escaping and unescaping throughput on mixed text: ASCII words, characters that become
// entities, accented letters and line ends. Reports bytes per second; the size argument is
// in megabytes of input (10 MB is the reference size).
#include <benchmark/benchmark.h>

#include <cstddef>

#include "droqbxml/qbxml/XmlEscaping.hpp"

namespace droqbxml {
namespace {

Text mixedText(size_t units) {
  const Text pattern =
      u"Smith & Sons <Plumbing> \"Rush\" job's parts: caf\u00e9 cr\u00e8me \u20ac12.50\r\n"
      u"Line two\twith a tab; na\u00efve r\u00e9sum\u00e9 \u00a7 4 > 3 < 5 ";
  Text text;
  text.reserve(units + pattern.size());
  while (text.size() < units) text += pattern;
  text.resize(units);
  return text;
}

void BM_Escape(benchmark::State& state) {
  const Text text = mixedText(static_cast<size_t>(state.range(0)) * 1000000 / 2);
  for (auto _ : state) benchmark::DoNotOptimize(XMLEscapeString(text, false));
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                          static_cast<int64_t>(text.size() * 2));
}

void BM_Unescape(benchmark::State& state) {
  const Text escaped =
      XMLEscapeString(mixedText(static_cast<size_t>(state.range(0)) * 1000000 / 2));
  for (auto _ : state) benchmark::DoNotOptimize(XMLUnEscapeText(escaped, false));
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                          static_cast<int64_t>(escaped.size() * 2));
}

BENCHMARK(BM_Escape)->Arg(1)->Arg(10)->Arg(100)->UseRealTime()->Repetitions(7)->Unit(
    benchmark::kMillisecond);
BENCHMARK(BM_Unescape)
    ->Arg(1)
    ->Arg(10)
    ->Arg(100)
    ->UseRealTime()
    ->Repetitions(7)
    ->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace droqbxml

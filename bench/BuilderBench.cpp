// Building one request document of n elements: a request aggregate per hundred leaf
// elements whose values need escaping. Every write appends to the one document text, so
// the time per element stays flat from 1,000 to 100,000 elements.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <string>

#include "droqbxml/qbxml/DroXmlBuilder.hpp"

namespace droqbxml {
namespace {

void buildDocument(DroXmlBuilder& builder, int64_t elements) {
  builder.Initialize();
  builder.AddHeaders();
  for (int64_t n = 0; n < elements; ++n) {
    if (n % 100 == 0) {
      if (n > 0) builder.AddAggregateEnd();
      builder.AddElementAggregateSimple(u"CustomerAddRq");
    }
    builder.AddElementSimple(u"Name", u"Smith & Sons <Plumbing> caf\u00e9 job 42");
  }
  if (elements > 0) builder.AddAggregateEnd();
  builder.AddFooters();
}

void BM_BuilderDocument(benchmark::State& state) {
  DroXmlBuilder builder;
  for (auto _ : state) {
    buildDocument(builder, state.range(0));
    benchmark::DoNotOptimize(builder.XML().data());
  }
  state.SetItemsProcessed(static_cast<int64_t>(state.iterations()) * state.range(0));
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                          static_cast<int64_t>(builder.XML().size() * sizeof(char16_t)));
  state.counters["chars"] = static_cast<double>(builder.XML().size());
}

BENCHMARK(BM_BuilderDocument)
    ->Arg(1000)
    ->Arg(10000)
    ->Arg(100000)
    ->UseRealTime()
    ->Repetitions(7)
    ->Unit(benchmark::kMicrosecond);

}  // namespace
}  // namespace droqbxml

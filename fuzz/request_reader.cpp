// The stand-in's request reader, which `droqbxml lint` is, on arbitrary documents: it
// never raises, whatever the input (malformed XML, entity tricks, deep nesting, bytes that
// are not UTF-8); it gives a document exactly when every problem is one QuickBooks answers
// per request, and a reason for every document it refuses.
#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <cstdint>
#include <string_view>

#include "fuzz/FuzzSupport.hpp"
#include "simulator/RequestDocument.hpp"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace droqbxml;
  const std::string_view document(reinterpret_cast<const char*>(data), size);
  const simulator::ReadResult read = simulator::readRequest(document);
  const bool perRequestOnly =
      std::all_of(read.problems.begin(), read.problems.end(),
                  [](const simulator::Problem& problem) { return problem.perRequest; });
  fuzz::require(read.document.has_value() == perRequestOnly,
                "a document is given exactly when every problem is answered per request");
  if (read.document) {
    fuzz::require(read.document->refusals.size() == read.problems.size(),
                  "every per-request problem is a refused value");
    for (const auto& request : read.document->root.children) {
      simulator::schemaChildOrder(request.name);
    }
  }
  return 0;
}

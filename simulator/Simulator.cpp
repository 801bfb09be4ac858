// Selecting the stand-in: its factory registered under its own ProgID and, when the host or
// the environment asks for it, under QuickBooks' request processor's ProgID.
#include "simulator/Simulator.hpp"

#include <cstdlib>
#include <string_view>

#include "simulator/internal/SimulatedProcessor.hpp"

namespace droqbxml::simulator {

std::shared_ptr<RequestProcessor> createProcessor() {
  return std::make_shared<internal::SimulatedProcessor>();
}

void install() {
  registerRequestProcessor(kSimulatorProgId, createProcessor);
  registerRequestProcessor(kRequestProcessorProgId, createProcessor);
}

bool installIfRequested() {
  registerRequestProcessor(kSimulatorProgId, createProcessor);
  const char* requested = std::getenv("DROQBXML_REQUEST_PROCESSOR");
  if (requested == nullptr || std::string_view(requested) != "simulator") return false;
  registerRequestProcessor(kRequestProcessorProgId, createProcessor);
  return true;
}

}  // namespace droqbxml::simulator

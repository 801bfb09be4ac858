// The embedded QuickBooks stand-in: a request processor that answers qbXML in-process from
// a SQLite company file the way QuickBooks does. A host selects it with install(), or with
// installIfRequested() and the environment variable DROQBXML_REQUEST_PROCESSOR=simulator;
// the component itself does not change: its wrapper still creates the processor by ProgID.
#ifndef DROQBXML_SIMULATOR_SIMULATOR_HPP_
#define DROQBXML_SIMULATOR_SIMULATOR_HPP_

#include <memory>

#include "droqbxml/connection/RequestProcessor.hpp"

namespace droqbxml::simulator {

// The ProgID under which the stand-in is also registered, whatever else is installed.
inline constexpr TextView kSimulatorProgId = u"DroQbXml.Simulator";

// A new stand-in processor.
std::shared_ptr<RequestProcessor> createProcessor();

// Registers the stand-in as "QBXMLRP.RequestProcessor.1" and as "DroQbXml.Simulator".
void install();

// Registers the stand-in under "DroQbXml.Simulator" and, when the environment variable
// DROQBXML_REQUEST_PROCESSOR is "simulator", also as "QBXMLRP.RequestProcessor.1".
// Returns whether it took QuickBooks' place.
bool installIfRequested();

}  // namespace droqbxml::simulator

#endif  // DROQBXML_SIMULATOR_SIMULATOR_HPP_

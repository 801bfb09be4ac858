// Outside Windows there is no platform request processor: only registered ones exist.
#ifndef _WIN32

#include "droqbxml/connection/internal/PlatformProcessor.hpp"

namespace droqbxml::internal {

std::shared_ptr<RequestProcessor> createPlatformProcessor(TextView) { return nullptr; }

}  // namespace droqbxml::internal

#endif  // _WIN32

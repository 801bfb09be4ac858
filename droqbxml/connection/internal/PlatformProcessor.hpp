// The platform's own way of creating a request processor by ProgID: COM on Windows,
// nothing elsewhere.
#ifndef DROQBXML_CONNECTION_INTERNAL_PLATFORMPROCESSOR_HPP_
#define DROQBXML_CONNECTION_INTERNAL_PLATFORMPROCESSOR_HPP_

#include <memory>

#include "droqbxml/connection/RequestProcessor.hpp"

namespace droqbxml::internal {

// A processor created by the platform for `progId`, or nothing when the platform has none.
// Failures other than "not registered" raise the platform's error.
std::shared_ptr<RequestProcessor> createPlatformProcessor(TextView progId);

}  // namespace droqbxml::internal

#endif  // DROQBXML_CONNECTION_INTERNAL_PLATFORMPROCESSOR_HPP_

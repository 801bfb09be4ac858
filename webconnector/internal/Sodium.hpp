// libsodium made ready once per process, for the password hashes and the .qwc identifiers.
#ifndef DROQBXML_WEBCONNECTOR_INTERNAL_SODIUM_HPP_
#define DROQBXML_WEBCONNECTOR_INTERNAL_SODIUM_HPP_

#include <sodium.h>

#include <stdexcept>

namespace droqbxml::webconnector::internal {

// Initialises libsodium on first use (thread-safe); std::runtime_error when it cannot.
inline void requireSodium() {
  static const bool ready = sodium_init() >= 0;
  if (!ready) throw std::runtime_error("libsodium cannot be initialised");
}

}  // namespace droqbxml::webconnector::internal

#endif  // DROQBXML_WEBCONNECTOR_INTERNAL_SODIUM_HPP_

// The process-wide registry of request processors by ProgID.
#include "droqbxml/connection/RequestProcessor.hpp"

#include <mutex>
#include <utility>

#include "droqbxml/connection/internal/PlatformProcessor.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {
namespace {

struct Registration {
  Text progId;
  RequestProcessorFactory factory;
};

struct Registry {
  std::mutex mutex;
  std::vector<Registration> entries;
};

Registry& registry() {
  static Registry instance;
  return instance;
}

}  // namespace

void registerRequestProcessor(TextView progId, RequestProcessorFactory factory) {
  auto& r = registry();
  const std::lock_guard lock(r.mutex);
  for (auto& entry : r.entries) {
    if (equalsIgnoreCase(entry.progId, progId)) {
      entry.factory = std::move(factory);
      return;
    }
  }
  r.entries.push_back({Text(progId), std::move(factory)});
}

void unregisterRequestProcessor(TextView progId) {
  auto& r = registry();
  const std::lock_guard lock(r.mutex);
  std::erase_if(r.entries, [&](const Registration& e) { return equalsIgnoreCase(e.progId, progId); });
}

RequestProcessorFactory registeredRequestProcessor(TextView progId) {
  auto& r = registry();
  const std::lock_guard lock(r.mutex);
  for (const auto& entry : r.entries) {
    if (equalsIgnoreCase(entry.progId, progId)) return entry.factory;
  }
  return {};
}

std::vector<Text> registeredRequestProcessors() {
  auto& r = registry();
  const std::lock_guard lock(r.mutex);
  std::vector<Text> ids;
  for (const auto& entry : r.entries) ids.push_back(entry.progId);
  return ids;
}

std::shared_ptr<RequestProcessor> createRequestProcessor(TextView progId) {
  const RequestProcessorFactory factory = registeredRequestProcessor(progId);
  std::shared_ptr<RequestProcessor> processor =
      factory ? factory() : internal::createPlatformProcessor(progId);
  if (!processor) raiseRuntimeError(RuntimeError::kCantCreateObject);
  return processor;
}

}  // namespace droqbxml

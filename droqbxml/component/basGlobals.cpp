// The per-thread shared values.
#include "droqbxml/component/basGlobals.hpp"

#include <memory>
#include <utility>

#include "droqbxml/diagnostics/clsMyErr.hpp"

namespace droqbxml::basGlobals {
namespace {

struct SharedValues {
  Ref<Object> itemsCollection;
  Text installationPath;
  Ref<clsMyErr> errorObject;
};

SharedValues& shared() {
  thread_local SharedValues values;
  return values;
}

}  // namespace

Ref<Object> ItemsColAccess(const Variant& value) {
  if (value.isObject()) {
    auto object = value.toObject();
    // Exactly this class name, case included; any other object is ignored.
    if (object && object->className() == u"DroItemsCol") shared().itemsCollection = object;
  }
  return shared().itemsCollection;
}

Text DroPathAccess(const Variant& value) {
  if (!value.isMissing()) shared().installationPath = value.toText();
  return shared().installationPath;
}

Ref<clsMyErr> SharedErrorObject() {
  auto& values = shared();
  if (!values.errorObject) values.errorObject = std::make_shared<clsMyErr>();
  return values.errorObject;
}

void SharedErrorObject(Ref<clsMyErr> replacement) {
  shared().errorObject = std::move(replacement);
}

}  // namespace droqbxml::basGlobals

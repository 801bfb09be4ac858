// clsAppPathAccess over the shared installation path.
#include "droqbxml/diagnostics/clsAppPathAccess.hpp"

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/runtime/Binding.hpp"

namespace droqbxml {

const ClassInfo& clsAppPathAccess::typeInfo() {
  static const ClassInfo info(
      u"clsAppPathAccess",
      Members().property(u"Apppath", &clsAppPathAccess::Apppath, &clsAppPathAccess::Apppath).take());
  return info;
}

Text clsAppPathAccess::Apppath() const { return basGlobals::DroPathAccess(); }

void clsAppPathAccess::Apppath(const Text& value) { basGlobals::DroPathAccess(Variant(value)); }

}  // namespace droqbxml

// clsAppPathAccess: the host's handle on the shared installation path under which the
// logs are written (the same value as the facade's DroPath).
#ifndef DROQBXML_DIAGNOSTICS_CLSAPPPATHACCESS_HPP_
#define DROQBXML_DIAGNOSTICS_CLSAPPPATHACCESS_HPP_

#include "droqbxml/runtime/Object.hpp"

namespace droqbxml {

class clsAppPathAccess final : public Object {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  Text Apppath() const;
  void Apppath(const Text& value);
};

}  // namespace droqbxml

#endif  // DROQBXML_DIAGNOSTICS_CLSAPPPATHACCESS_HPP_

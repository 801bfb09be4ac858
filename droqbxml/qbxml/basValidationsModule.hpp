// basValidationsModule: the value checks of basValidations for late-bound hosts, created as
// "DroQbXml.basValidations". Each check is a method of the same name and arguments.
#ifndef DROQBXML_QBXML_BASVALIDATIONSMODULE_HPP_
#define DROQBXML_QBXML_BASVALIDATIONSMODULE_HPP_

#include "droqbxml/runtime/Object.hpp"

namespace droqbxml {

// Class name "basValidations"; no state. C++ code calls the basValidations functions
// directly.
class basValidationsModule final : public Object {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }
};

}  // namespace droqbxml

#endif  // DROQBXML_QBXML_BASVALIDATIONSMODULE_HPP_

// The payment method's member table.
#include "droqbxml/records/DroPaymentMethod.hpp"

namespace droqbxml {

const ClassInfo& DroPaymentMethod::typeInfo() {
  static const ClassInfo info = [] {
    Members members;
    addFieldMembers(members, kFields);
    return ClassInfo(u"DroPaymentMethod", members.take());
  }();
  return info;
}

}  // namespace droqbxml

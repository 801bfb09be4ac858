// DroPaymentMethod: the plain list record of a payment method: the list header fields only,
// with no parse and no dump.
#ifndef DROQBXML_RECORDS_DROPAYMENTMETHOD_HPP_
#define DROQBXML_RECORDS_DROPAYMENTMETHOD_HPP_

#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

class DroPaymentMethod final : public ListRecordOf<DroPaymentMethod> {
 public:
  static constexpr auto kFields = listfields::kShortHeader;

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROPAYMENTMETHOD_HPP_

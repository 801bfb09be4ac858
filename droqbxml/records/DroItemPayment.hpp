// DroItemPayment: a payment item: where the money goes and how it is paid.
#ifndef DROQBXML_RECORDS_DROITEMPAYMENT_HPP_
#define DROQBXML_RECORDS_DROITEMPAYMENT_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

class DroItemPayment final : public ItemRecordOf<DroItemPayment> {
 public:
  static constexpr auto kFields = listfields::kShortItemFields;

  DroItemPayment() : ItemRecordOf(udItemPayment) {}
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const ObjectProperty<DroAccountRef>& DepositToAccountRef() const {
    return depositToAccountRef_.held();
  }
  void DepositToAccountRef(Ref<DroAccountRef> v) { depositToAccountRef_ = std::move(v); }
  const ObjectProperty<DroPaymentMethodRef>& PaymentMethodRef() const {
    return paymentMethodRef_.held();
  }
  void PaymentMethodRef(Ref<DroPaymentMethodRef> v) { paymentMethodRef_ = std::move(v); }

  // As DroAccount::ParseRs, for "<ItemPaymentRet>".
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, int32_t StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroAccountRef> depositToAccountRef_;
  mutable ObjectProperty<DroPaymentMethodRef> paymentMethodRef_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMPAYMENT_HPP_

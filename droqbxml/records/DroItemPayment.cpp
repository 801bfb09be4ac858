// The payment item.
#include "droqbxml/records/DroItemPayment.hpp"

namespace droqbxml {

const ClassInfo& DroItemPayment::typeInfo() {
  using C = DroItemPayment;
  static const ClassInfo info = [] {
    Members members = itemMembers();
    members.property(u"DepositToAccountRef", &C::DepositToAccountRef, &C::DepositToAccountRef)
        .property(u"PaymentMethodRef", &C::PaymentMethodRef, &C::PaymentMethodRef)
        .method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroItemPayment", members.take());
  }();
  return info;
}

int32_t DroItemPayment::ParseRs(const Text& Value, int32_t StartPoint) {
  return parseList(Value, StartPoint, u"<ItemPaymentRet>",
                   [&](Reader& read, int32_t& s, int32_t& e) {
                     readHeader(read);
                     read.required<u"IsActive">();
                     read.optional<u"ItemDesc">();
                     depositToAccountRef_.ParseRs(u"DepositToAccountRef", Value, s, e);
                     paymentMethodRef_.ParseRs(u"PaymentMethodRef", Value, s, e);
                   });
}

Text DroItemPayment::PrintOut() const {
  DumpWriter dump = dumpHeader(u"ITEM PAYMENT:", false);
  dump.fields<u"IsActive", u"ItemDesc">(*this);
  dump.block(u"DEPOSITTOACCOUNTREF:", depositToAccountRef_->PrintOut(), u"/DEPOSITTOACCOUNTREF");
  dump.block(u"PAYMENTMETHODREF:", paymentMethodRef_->PrintOut(), u"/PAYMENTMETHODREF");
  return dump.take();
}

}  // namespace droqbxml

// The discount item.
#include "droqbxml/records/DroItemDiscount.hpp"

namespace droqbxml {

const ClassInfo& DroItemDiscount::typeInfo() {
  using C = DroItemDiscount;
  static const ClassInfo info = [] {
    Members members = itemMembers();
    members.property(u"ParentRef", &C::ParentRef, &C::ParentRef)
        .property(u"SalesTaxCodeRef", &C::SalesTaxCodeRef, &C::SalesTaxCodeRef)
        .property(u"AccountRef", &C::AccountRef, &C::AccountRef)
        .method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroItemDiscount", members.take());
  }();
  return info;
}

int32_t DroItemDiscount::ParseRs(const Text& Value, const int32_t& StartPoint) {
  return parseList(Value, StartPoint, u"<ItemDiscountRet>",
                   [&](Reader& read, int32_t& s, int32_t& e) {
                     readHeader(read);
                     read.required<u"IsActive">();
                     parentRef_.ParseRs(u"ParentRef", Value, s, e);
                     read.required<u"Sublevel">();
                     read.optional<u"ItemDesc">();
                     salesTaxCodeRef_.ParseRs(u"SalesTaxCodeRef", Value, s, e);
                     read.optional<u"DiscountRate", u"DiscountRatePercent">();
                     accountRef_.ParseRs(u"AccountRef", Value, s, e);
                   });
}

Text DroItemDiscount::PrintOut() const {
  // The parent reference stands before IsActive here, unlike the other kinds.
  DumpWriter dump = dumpHeader(u"ITEMDISCOUNT:", true);
  dump.block(u"PARENTREF:", parentRef_->PrintOut(), u"/PARENTREF");
  dump.fields<u"IsActive", u"ItemDesc">(*this);
  dump.block(u"SALESTAXCODEREF:", salesTaxCodeRef_->PrintOut(), u"/SALESTAXCODEREF");
  dump.fields<u"DiscountRate", u"DiscountRatePercent">(*this);
  dump.block(u"ACCOUNTREF:", accountRef_->PrintOut(), u"/ACCOUNTREF");
  return dump.take();
}

}  // namespace droqbxml

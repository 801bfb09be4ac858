// The sales tax item.
#include "droqbxml/records/DroItemSalesTax.hpp"

namespace droqbxml {

const ClassInfo& DroItemSalesTax::typeInfo() {
  using C = DroItemSalesTax;
  static const ClassInfo info = [] {
    Members members = itemMembers();
    members.property(u"TaxVendorRef", &C::TaxVendorRef, &C::TaxVendorRef)
        .method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroItemSalesTax", members.take());
  }();
  return info;
}

int32_t DroItemSalesTax::ParseRs(const Text& Value, int32_t StartPoint) {
  return parseList(Value, StartPoint, u"<ItemSalesTaxRet>",
                   [&](Reader& read, int32_t& s, int32_t& e) {
                     readHeader(read);
                     read.required<u"IsActive">();
                     read.optional<u"ItemDesc", u"TaxRate">();
                     taxVendorRef_.ParseRs(u"TaxVendorRef", Value, s, e);
                   });
}

Text DroItemSalesTax::PrintOut() const {
  DumpWriter dump = dumpHeader(u"ITEM SALES TAX:", false);
  dump.fields<u"IsActive", u"ItemDesc", u"TaxRate">(*this);
  dump.block(u"TAXVENDORREF:", taxVendorRef_->PrintOut(), u"/TAXVENDORREF");
  return dump.take();
}

}  // namespace droqbxml

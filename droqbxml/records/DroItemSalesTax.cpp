// The sales tax item and the sales tax group.
#include "droqbxml/records/DroItemSalesTax.hpp"

namespace droqbxml {

const ClassInfo& DroItemSalesTax::typeInfo() {
  using C = DroItemSalesTax;
  static const ClassInfo info = [] {
    Members members = itemMembers();
    members.property(u"TaxVendorRef", &C::TaxVendorRef, &C::TaxVendorRef)
        .method(u"ParseRs", &C::ParseRs)
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
                     taxVendorRef_->ParseRs(u"TaxVendorRef", Value, s, e);
                   });
}

Text DroItemSalesTax::PrintOut() const {
  DumpWriter dump = dumpHeader(u"ITEM SALES TAX:", false);
  dump.fields<u"IsActive", u"ItemDesc", u"TaxRate">(*this);
  dump.block(u"TAXVENDORREF:", taxVendorRef_->PrintOut(), u"/TAXVENDORREF");
  return dump.take();
}

const ClassInfo& DroItemSalesTaxGroup::typeInfo() {
  using C = DroItemSalesTaxGroup;
  static const ClassInfo info = [] {
    Members members = itemMembers();
    members.property(u"ItemSalesTaxRefs", &C::ItemSalesTaxRefs, &C::ItemSalesTaxRefs)
        .method(u"ParseRs", &C::ParseRs)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroItemSalesTaxGroup", members.take());
  }();
  return info;
}

int32_t DroItemSalesTaxGroup::ParseRs(const Text& Value, int32_t StartPoint) {
  const int32_t start = StartPoint < 1 ? 1 : StartPoint;
  return parseList(Value, StartPoint, u"<ItemSalesTaxGroupRet>",
                   [&](Reader& read, int32_t&, int32_t&) {
                     readHeader(read);
                     read.required<u"IsActive">();
                     read.optional<u"ItemDesc">();
                     // Each member searches its own "<ItemSalesTaxRet>" from the group's
                     // start, not from where the group's reading stopped.
                     for (const auto& member : itemSalesTaxRefs_->NewEnum()) {
                       Variant(member).toObjectOf<DroItemSalesTax>()->ParseRs(Value, start);
                     }
                   });
}

Text DroItemSalesTaxGroup::PrintOut() const {
  DumpWriter dump = dumpHeader(u"ITEM SALES TAX GROUP:", false);
  dump.fields<u"IsActive", u"ItemDesc">(*this);
  return dump.take();
}

}  // namespace droqbxml

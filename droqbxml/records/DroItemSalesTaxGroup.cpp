// The sales tax group.
#include "droqbxml/records/DroItemSalesTaxGroup.hpp"

#include "droqbxml/records/DroItemSalesTax.hpp"

namespace droqbxml {

const ClassInfo& DroItemSalesTaxGroup::typeInfo() {
  using C = DroItemSalesTaxGroup;
  static const ClassInfo info = [] {
    Members members = itemMembers();
    members.property(u"ItemSalesTaxRefs", &C::ItemSalesTaxRefs, &C::ItemSalesTaxRefs)
        .method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
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

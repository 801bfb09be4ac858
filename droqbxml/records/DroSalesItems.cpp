// The non-inventory, other-charge and service items, instantiated once for each kind.
#include "droqbxml/records/DroSalesItems.hpp"

namespace droqbxml {

template <SalesItemKind Kind>
const ClassInfo& DroSalesItem<Kind>::typeInfo() {
  using C = DroSalesItem<Kind>;
  static const ClassInfo info = [] {
    Members members = C::itemMembers();
    members.property(u"ParentRef", &C::ParentRef, &C::ParentRef)
        .property(u"SalesTaxCodeRef", &C::SalesTaxCodeRef, &C::SalesTaxCodeRef)
        .property(u"SalesOrPurchase", &C::SalesOrPurchase, &C::SalesOrPurchase)
        .property(u"SalesAndPurchase", &C::SalesAndPurchase, &C::SalesAndPurchase)
        .method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(Text(kSpec.className), members.take());
  }();
  return info;
}

template <SalesItemKind Kind>
int32_t DroSalesItem<Kind>::ParseRs(const Text& Value, int32_t StartPoint) {
  using Reader = typename DroSalesItem::Reader;
  return this->parseList(Value, StartPoint, kSpec.returnTag,
                         [&](Reader& read, int32_t& s, int32_t& e) {
                           this->readHeader(read);
                           read.template required<u"IsActive">();
                           parentRef_.ParseRs(u"ParentRef", Value, s, e);
                           if constexpr (kSpec.sublevelRequired) {
                             read.template required<u"Sublevel">();
                           } else {
                             read.template optional<u"Sublevel">();
                           }
                           salesTaxCodeRef_.ParseRs(u"SalesTaxCodeRef", Value, s, e);
                           const Text parent(kSpec.returnTag);
                           salesOrPurchase_->ParseRs(u"SalesOrPurchase", Value, s, e, parent);
                           if (s == 0)
                             salesAndPurchase_->ParseRs(u"SalesAndPurchase", Value, s, e, parent);
                         });
}

template <SalesItemKind Kind>
Text DroSalesItem<Kind>::PrintOut() const {
  DumpWriter dump = this->dumpHeader(kSpec.heading, false);
  dump.template fields<u"IsActive">(*this);
  dump.block(u"PARENTREF:", parentRef_->PrintOut(), u"/PARENTREF");
  dump.template fields<u"Sublevel">(*this);
  dump.block(u"SALESTAXCODEREF:", salesTaxCodeRef_->PrintOut(), u"/SALESTAXCODEREF");
  dump.block(u"SALESORPURCHASE:", salesOrPurchase_->PrintOut(), u"/SALESORPURCHASE");
  dump.block(u"SALESANDPURCHASE:", salesAndPurchase_->PrintOut(), u"/SALESANDPURCHASE");
  return dump.take();
}

template class DroSalesItem<SalesItemKind::NonInventory>;
template class DroSalesItem<SalesItemKind::OtherCharge>;
template class DroSalesItem<SalesItemKind::Service>;

}  // namespace droqbxml

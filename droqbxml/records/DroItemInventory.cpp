// The inventory item: reading an "ItemInventoryRet" and its dump.
#include "droqbxml/records/DroItemInventory.hpp"

namespace droqbxml {

const ClassInfo& DroItemInventory::typeInfo() {
  using C = DroItemInventory;
  static const ClassInfo info = [] {
    Members members = itemMembers();
    members.property(u"ParentRef", &C::ParentRef, &C::ParentRef)
        .property(u"SalesTaxCodeRef", &C::SalesTaxCodeRef, &C::SalesTaxCodeRef)
        .property(u"IncomeAccountRef", &C::IncomeAccountRef, &C::IncomeAccountRef)
        .property(u"COGSAccountRef", &C::COGSAccountRef, &C::COGSAccountRef)
        .property(u"PrefVendorRef", &C::PrefVendorRef, &C::PrefVendorRef)
        .property(u"AssetAccountRef", &C::AssetAccountRef, &C::AssetAccountRef)
        .method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroItemInventory", members.take());
  }();
  return info;
}

int32_t DroItemInventory::ParseRs(const Text& Value, int32_t StartPoint) {
  constexpr TextView tag = u"<ItemInventoryRet>";
  return parseList(Value, StartPoint, tag, [&](Reader& read, int32_t& s, int32_t& e) {
    const Text parent(tag);
    readHeader(read);
    read.required<u"IsActive">();
    parentRef_.ParseRs(u"ParentRef", Value, s, e);
    read.required<u"Sublevel">();
    salesTaxCodeRef_.ParseRs(u"SalesTaxCodeRef", Value, s, e);
    read.optional<u"SalesDesc", u"SalesPrice">();
    incomeAccountRef_.ParseRs(u"IncomeAccountRef", Value, s, e, true, parent);
    read.optional<u"PurchaseDesc", u"PurchaseCost">();
    cogsAccountRef_.ParseRs(u"COGSAccountRef", Value, s, e, true, parent);
    prefVendorRef_.ParseRs(u"PrefVendorRef", Value, s, e);
    assetAccountRef_.ParseRs(u"AssetAccountRef", Value, s, e, true, parent);
    read.optional<u"ReorderPoint", u"QuantityOnHand", u"AverageCost", u"QuantityOnOrder",
                  u"TotalValue", u"InventoryDate">();
  });
}

Text DroItemInventory::PrintOut() const {
  DumpWriter dump = dumpHeader(u"ITEM INVENTORY:", true);
  dump.fields<u"IsActive">(*this);
  dump.block(u"PARENTREF:", parentRef_->PrintOut(), u"/PARENTREF");
  dump.fields<u"Sublevel">(*this);
  dump.block(u"SALESTAXCODEREF:", salesTaxCodeRef_->PrintOut(), u"/SALESTAXCODEREF");
  dump.fields<u"SalesDesc", u"SalesPrice">(*this);
  dump.block(u"INCOMEACCOUNTREF:", incomeAccountRef_->PrintOut(), u"/INCOMEACCOUNTREF");
  dump.fields<u"PurchaseDesc", u"PurchaseCost">(*this);
  dump.block(u"COGSACCOUNTREF:", cogsAccountRef_->PrintOut(), u"/COGSACCOUNTREF");
  dump.block(u"PREFVENDORREF:", prefVendorRef_->PrintOut(), u"/PREFVENDORREF");
  dump.block(u"ASSETACCOUNTREF:", assetAccountRef_->PrintOut(), u"/ASSETACCOUNTREF");
  dump.fields<u"ReorderPoint", u"QuantityOnHand", u"AverageCost", u"QuantityOnOrder", u"TotalValue",
              u"InventoryDate">(*this);
  return dump.take();
}

}  // namespace droqbxml

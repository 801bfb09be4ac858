// DroItemInventory: an inventory part, with its sales and purchase sides, its three
// accounts and its stock figures (read from responses; never sent).
#ifndef DROQBXML_RECORDS_DROITEMINVENTORY_HPP_
#define DROQBXML_RECORDS_DROITEMINVENTORY_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

// The long header, but for a name that is not trimmed: the inventory item's alone.
inline constexpr auto kInventoryHeader = [] {
  auto rows = listfields::kLongHeader;
  for (auto& row : rows) {
    if (row.name == u"Name") row.trim = Trim::None;
  }
  return rows;
}();

class DroItemInventory final : public ItemRecordOf<DroItemInventory> {
 public:
  static constexpr auto kFields = listfields::joined(
      kInventoryHeader, listfields::named(listfields::kDescription, u"SalesDesc"),
      listfields::named(listfields::kPrice, u"SalesPrice"),
      listfields::named(listfields::kDescription, u"PurchaseDesc"),
      listfields::named(listfields::kPrice, u"PurchaseCost"),
      listfields::named(listfields::kQuantity, u"ReorderPoint"),
      listfields::named(listfields::kQuantity, u"QuantityOnHand"),
      listfields::named(listfields::kPrice, u"AverageCost"),
      listfields::named(listfields::kQuantity, u"QuantityOnOrder"),
      FieldSpec{u"TotalValue", Trim::Spaces, Check::Amt},
      FieldSpec{u"InventoryDate", Trim::Spaces, Check::Date});

  DroItemInventory() : ItemRecordOf(udItemInventory) {}
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const ObjectProperty<DroParentRef>& ParentRef() const { return parentRef_.held(); }
  void ParentRef(Ref<DroParentRef> v) { parentRef_ = std::move(v); }
  const ObjectProperty<DroSalesTaxCodeRef>& SalesTaxCodeRef() const {
    return salesTaxCodeRef_.held();
  }
  void SalesTaxCodeRef(Ref<DroSalesTaxCodeRef> v) { salesTaxCodeRef_ = std::move(v); }
  const ObjectProperty<DroIncomeAccountRef>& IncomeAccountRef() const {
    return incomeAccountRef_.held();
  }
  void IncomeAccountRef(Ref<DroIncomeAccountRef> v) { incomeAccountRef_ = std::move(v); }
  const ObjectProperty<DroAccountRef>& COGSAccountRef() const { return cogsAccountRef_.held(); }
  void COGSAccountRef(Ref<DroAccountRef> v) { cogsAccountRef_ = std::move(v); }
  const ObjectProperty<DroPrefVendorRef>& PrefVendorRef() const { return prefVendorRef_.held(); }
  void PrefVendorRef(Ref<DroPrefVendorRef> v) { prefVendorRef_ = std::move(v); }
  const ObjectProperty<DroAccountRef>& AssetAccountRef() const { return assetAccountRef_.held(); }
  void AssetAccountRef(Ref<DroAccountRef> v) { assetAccountRef_ = std::move(v); }

  const Text& SalesDesc() const { return field<u"SalesDesc">(); }
  void SalesDesc(const Text& v) { setField<u"SalesDesc">(v); }
  const Text& SalesPrice() const { return field<u"SalesPrice">(); }
  void SalesPrice(const Text& v) { setField<u"SalesPrice">(v); }
  const Text& PurchaseDesc() const { return field<u"PurchaseDesc">(); }
  void PurchaseDesc(const Text& v) { setField<u"PurchaseDesc">(v); }
  const Text& PurchaseCost() const { return field<u"PurchaseCost">(); }
  void PurchaseCost(const Text& v) { setField<u"PurchaseCost">(v); }
  const Text& ReorderPoint() const { return field<u"ReorderPoint">(); }
  void ReorderPoint(const Text& v) { setField<u"ReorderPoint">(v); }
  const Text& QuantityOnHand() const { return field<u"QuantityOnHand">(); }
  void QuantityOnHand(const Text& v) { setField<u"QuantityOnHand">(v); }
  const Text& AverageCost() const { return field<u"AverageCost">(); }
  void AverageCost(const Text& v) { setField<u"AverageCost">(v); }
  const Text& QuantityOnOrder() const { return field<u"QuantityOnOrder">(); }
  void QuantityOnOrder(const Text& v) { setField<u"QuantityOnOrder">(v); }
  const Text& TotalValue() const { return field<u"TotalValue">(); }
  void TotalValue(const Text& v) { setField<u"TotalValue">(v); }
  const Text& InventoryDate() const { return field<u"InventoryDate">(); }
  void InventoryDate(const Text& v) { setField<u"InventoryDate">(v); }

  // As DroAccount::ParseRs, for "<ItemInventoryRet>".
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, int32_t StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroParentRef> parentRef_;
  mutable ObjectProperty<DroSalesTaxCodeRef> salesTaxCodeRef_;
  mutable ObjectProperty<DroIncomeAccountRef> incomeAccountRef_;
  mutable ObjectProperty<DroAccountRef> cogsAccountRef_;
  mutable ObjectProperty<DroPrefVendorRef> prefVendorRef_;
  mutable ObjectProperty<DroAccountRef> assetAccountRef_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMINVENTORY_HPP_

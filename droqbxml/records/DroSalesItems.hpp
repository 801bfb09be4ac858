// The three item kinds that differ only by data: DroItemNonInventory, DroItemOtherCharge
// and DroItemService. Each has the list header, a parent and a sales tax code reference,
// and either a sales-or-purchase or a sales-and-purchase side; one class template over a
// table of kinds, as the typed references are.
#ifndef DROQBXML_RECORDS_DROSALESITEMS_HPP_
#define DROQBXML_RECORDS_DROSALESITEMS_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroSalesAndPurchase.hpp"
#include "droqbxml/records/DroSalesOrPurchase.hpp"
#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

enum class SalesItemKind : uint8_t { NonInventory, OtherCharge, Service };

struct SalesItemSpec {
  std::u16string_view className;
  udItemType itemType;
  std::u16string_view returnTag;
  std::u16string_view heading;
  bool sublevelRequired;  // not for services
};

inline constexpr std::array<SalesItemSpec, 3> kSalesItemKinds{{
    {u"DroItemNonInventory", udItemNonInventory, u"<ItemNonInventoryRet>", u"ITEM NON INVENTORY:",
     true},
    {u"DroItemOtherCharge", udItemOtherCharge, u"<ItemOtherChargeRet>", u"ITEM OTHER CHARGE:",
     true},
    {u"DroItemService", udItemService, u"<ItemServiceRet>", u"ITEM SERVICE:", false},
}};

template <SalesItemKind Kind>
class DroSalesItem final : public ItemRecordOf<DroSalesItem<Kind>> {
 public:
  static constexpr const SalesItemSpec& kSpec = kSalesItemKinds[static_cast<size_t>(Kind)];
  static constexpr auto kFields = listfields::kLongHeader;

  DroSalesItem() : ItemRecordOf<DroSalesItem<Kind>>(kSpec.itemType) {}
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const ObjectProperty<DroParentRef>& ParentRef() const { return parentRef_.held(); }
  void ParentRef(Ref<DroParentRef> v) { parentRef_ = std::move(v); }
  const ObjectProperty<DroSalesTaxCodeRef>& SalesTaxCodeRef() const {
    return salesTaxCodeRef_.held();
  }
  void SalesTaxCodeRef(Ref<DroSalesTaxCodeRef> v) { salesTaxCodeRef_ = std::move(v); }
  const ObjectProperty<DroSalesOrPurchase>& SalesOrPurchase() const {
    return salesOrPurchase_.held();
  }
  void SalesOrPurchase(Ref<DroSalesOrPurchase> v) { salesOrPurchase_ = std::move(v); }
  const ObjectProperty<DroSalesAndPurchase>& SalesAndPurchase() const {
    return salesAndPurchase_.held();
  }
  void SalesAndPurchase(Ref<DroSalesAndPurchase> v) { salesAndPurchase_ = std::move(v); }

  // As DroAccount::ParseRs, for the kind's return element. The sales-and-purchase side is
  // read only when no "<SalesOrPurchase>" was found.
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, int32_t StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  // The heading, "RequestID" without its TAB, the header, both references and both sides.
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroParentRef> parentRef_;
  mutable ObjectProperty<DroSalesTaxCodeRef> salesTaxCodeRef_;
  mutable ObjectProperty<DroSalesOrPurchase> salesOrPurchase_;
  mutable ObjectProperty<DroSalesAndPurchase> salesAndPurchase_;
};

using DroItemNonInventory = DroSalesItem<SalesItemKind::NonInventory>;
using DroItemOtherCharge = DroSalesItem<SalesItemKind::OtherCharge>;
using DroItemService = DroSalesItem<SalesItemKind::Service>;

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROSALESITEMS_HPP_

// One account and one item of each kind with every element its builder writes set to an
// accepted value, plus a field or two that is never sent. Shared by the builders' goldens
// and the schema-departure list, so both speak of the same requests.
#ifndef DROQBXML_TESTS_QBXML_ITEMSAMPLES_HPP_
#define DROQBXML_TESTS_QBXML_ITEMSAMPLES_HPP_

#include <vector>

#include "droqbxml/droqbxml.hpp"

namespace droqbxml {
namespace test {

inline Ref<DroAccount> accountSample() {
  auto account = std::make_shared<DroAccount>();
  account->Name(u"Tools");
  account->IsActive(u"true");
  account->ParentRef()->FullName(u"Assets");
  account->AccountType(u"FixedAsset");
  account->DetailAccountType(u"MachineryAndEquipment");
  account->AccountNumber(u"1500");
  account->BankNumber(u"BN-7");
  account->Desc(u"Shop tools");
  account->OpenBalance(u"100");  // never sent
  return account;
}

struct ItemSample {
  const char* label;  // also the name of its request golden, spaces and commas as "_"
  udItemType kind;
  Ref<Object> item;
};

// One item of each kind with every element its builder writes set to an accepted value.
inline std::vector<ItemSample> itemSamples() {
  const auto salesItem = [](auto item, bool salesOrPurchase) {
    item->Name(u"Labour");
    item->IsActive(u"true");
    item->ParentRef()->FullName(u"Work");
    item->SalesTaxCodeRef()->FullName(u"Non");
    if (salesOrPurchase) {
      item->SalesOrPurchase()->Desc(u"Per hour");
      item->SalesOrPurchase()->Price(u"45");
      item->SalesOrPurchase()->AccountRef()->ListID(u"40-1");  // sent instead of the name
      item->SalesOrPurchase()->AccountRef()->FullName(u"Sales");
    } else {
      auto& side = *item->SalesAndPurchase();
      side.SalesDesc(u"Haul");
      side.SalesPrice(u"10");
      side.IncomeAccountRef()->FullName(u"Sales");
      side.PurchaseDesc(u"Truck");
      side.PurchaseCost(u"5");
      side.ExpenseAccountRef()->FullName(u"Cost of Goods Sold");
      side.PrefVendorRef()->FullName(u"Haulers");
    }
    return item;
  };
  auto inventory = std::make_shared<DroItemInventory>();
  inventory->Name(u"Tile");
  inventory->IsActive(u"true");
  inventory->ParentRef()->FullName(u"Floors");
  inventory->SalesTaxCodeRef()->FullName(u"Tax");
  inventory->SalesDesc(u"Tile");
  inventory->SalesPrice(u"4");
  inventory->IncomeAccountRef()->FullName(u"Sales");
  inventory->PurchaseDesc(u"Tile");
  inventory->PurchaseCost(u"2");
  inventory->COGSAccountRef()->FullName(u"Cost of Goods Sold");
  inventory->PrefVendorRef()->FullName(u"Tiles Inc");
  inventory->AssetAccountRef()->FullName(u"Inventory Asset");
  inventory->ReorderPoint(u"10");
  inventory->QuantityOnHand(u"99");  // never sent
  auto subtotal = std::make_shared<DroItemSubtotal>();
  subtotal->Name(u"Sub");
  subtotal->IsActive(u"true");
  subtotal->ItemDesc(u"Subtotal");
  auto discount = std::make_shared<DroItemDiscount>();
  discount->Name(u"Disc");
  discount->IsActive(u"true");
  discount->ParentRef()->FullName(u"Discounts");
  discount->ItemDesc(u"Ten off");
  discount->SalesTaxCodeRef()->FullName(u"Non");
  discount->DiscountRate(u"10");
  discount->AccountRef()->FullName(u"Discounts Given");
  auto percentDiscount = std::make_shared<DroItemDiscount>();
  percentDiscount->Name(u"Pct");
  percentDiscount->DiscountRatePercent(u"10");
  percentDiscount->AccountRef()->FullName(u"Discounts Given");
  auto bothRates = std::make_shared<DroItemDiscount>();
  bothRates->Name(u"Both");
  bothRates->DiscountRate(u"10");
  bothRates->DiscountRatePercent(u"10");
  bothRates->AccountRef()->FullName(u"Discounts Given");
  auto group = std::make_shared<DroItemGroup>();
  group->Name(u"Kit");
  group->IsActive(u"true");
  group->ItemDesc(u"Kit");
  group->IsPrintItemsInGroup(u"true");
  group->ItemGroupLines()->Add()->Quantity(u"5");  // no item: left out
  const auto line = group->ItemGroupLines()->Add();
  line->ItemRef()->FullName(u"Tile");
  line->Quantity(u"3");
  auto payment = std::make_shared<DroItemPayment>();
  payment->Name(u"Cash");
  payment->IsActive(u"true");
  payment->ItemDesc(u"Cash");
  payment->DepositToAccountRef()->FullName(u"Undeposited Funds");
  payment->PaymentMethodRef()->FullName(u"Cash");
  auto tax = std::make_shared<DroItemSalesTax>();
  tax->Name(u"State");
  tax->IsActive(u"true");
  tax->ItemDesc(u"State tax");
  tax->TaxRate(u"7.5");
  tax->TaxVendorRef()->FullName(u"Revenue");
  auto taxGroup = std::make_shared<DroItemSalesTaxGroup>();
  taxGroup->Name(u"Both");
  taxGroup->IsActive(u"true");
  taxGroup->ItemDesc(u"State and city");
  return {
      {"inventory", udItemInventory, inventory},
      {"non-inventory, sales or purchase", udItemNonInventory,
       salesItem(std::make_shared<DroItemNonInventory>(), true)},
      {"non-inventory, sales and purchase", udItemNonInventory,
       salesItem(std::make_shared<DroItemNonInventory>(), false)},
      {"subtotal", udItemSubtotal, subtotal},
      {"discount, amount", udItemDiscount, discount},
      {"discount, percentage", udItemDiscount, percentDiscount},
      {"discount, both rates", udItemDiscount, bothRates},
      {"group", udItemGroup, group},
      {"other charge, sales or purchase", udItemOtherCharge,
       salesItem(std::make_shared<DroItemOtherCharge>(), true)},
      {"other charge, sales and purchase", udItemOtherCharge,
       salesItem(std::make_shared<DroItemOtherCharge>(), false)},
      {"payment", udItemPayment, payment},
      {"sales tax", udItemSalesTax, tax},
      {"sales tax group", udItemSalesTaxGroup, taxGroup},
      {"service, sales or purchase", udItemService,
       salesItem(std::make_shared<DroItemService>(), true)},
      {"service, sales and purchase", udItemService,
       salesItem(std::make_shared<DroItemService>(), false)},
  };
}

}  // namespace test
}  // namespace droqbxml

#endif  // DROQBXML_TESTS_QBXML_ITEMSAMPLES_HPP_

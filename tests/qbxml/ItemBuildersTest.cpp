// The account and item add requests: one whole document per builder against its golden
// file, the kinds that build nothing, and the item builders' by-name reach (a host object
// with the members by name, a member it lacks, an object of the wrong class).
#include <gtest/gtest.h>

#include <functional>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/records/DroAccount.hpp"
#include "droqbxml/records/DroItemDiscount.hpp"
#include "droqbxml/records/DroItemGroup.hpp"
#include "droqbxml/records/DroItemInventory.hpp"
#include "droqbxml/records/DroItemPayment.hpp"
#include "droqbxml/records/DroItemSalesTax.hpp"
#include "droqbxml/records/DroItemSalesTaxGroup.hpp"
#include "droqbxml/records/DroItemSubtotal.hpp"
#include "droqbxml/records/DroSalesItems.hpp"
#include "droqbxml/runtime/Binding.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

// A host's own object that has a subtotal's members by name, and no ItemDesc unless asked.
class HostSubtotal final : public Object {
 public:
  explicit HostSubtotal(bool withDesc) : withDesc_(withDesc) {}
  const ClassInfo& classInfo() const override {
    static const ClassInfo with(u"HostSubtotal", members(true));
    static const ClassInfo without(u"HostSubtotal", members(false));
    return withDesc_ ? with : without;
  }
  Text RequestID() const { return id_; }
  void RequestID(const Text& v) { id_ = u"H" + v; }  // what the host keeps is what is sent
  Text Name() const { return u"Host & Co"; }
  Text IsActive() const { return u""; }
  Text ItemDesc() const { return u"by name"; }

 private:
  static std::vector<MemberBinding> members(bool withDesc) {
    using H = HostSubtotal;
    Members m;
    m.property(u"RequestID", &H::RequestID, &H::RequestID)
        .getter(u"Name", &H::Name)
        .getter(u"IsActive", &H::IsActive);
    if (withDesc) m.getter(u"ItemDesc", &H::ItemDesc);
    return m.take();
  }
  bool withDesc_;
  Text id_;
};

Text build(udItemType kind, const Ref<Object>& item) {
  DroXmlBuilder builder;
  builder.BuildAddItem(kind, Variant(item));
  return builder.XML();
}

TEST(ItemBuildersTest, EachBuilderWritesItsDocument) {
  auto account = std::make_shared<DroAccount>();
  account->Name(u"Tools & <Dies>");
  account->IsActive(u"1");
  account->ParentRef()->ListID(u"80-1");
  account->ParentRef()->FullName(u"Assets");
  account->AccountType(u"fixedasset");
  account->AccountNumber(u"1500");
  account->BankNumber(u"BN-7");
  account->Desc(u"Shop tools");
  account->OpenBalance(u"100");  // never sent
  auto plainAccount = std::make_shared<DroAccount>();
  plainAccount->Name(u"Misc");

  auto nonInv = std::make_shared<DroItemNonInventory>();
  nonInv->Name(u"Grout");
  nonInv->SalesTaxCodeRef()->FullName(u"Tax");
  nonInv->SalesOrPurchase()->Price(u"2.5");
  nonInv->SalesOrPurchase()->PricePercent(u"3");
  auto emptyNonInv = std::make_shared<DroItemNonInventory>();
  auto inventory = std::make_shared<DroItemInventory>();
  inventory->Name(u"Tile");
  inventory->SalesPrice(u"4");
  inventory->IncomeAccountRef()->FullName(u"Sales");
  inventory->PrefVendorRef()->ListID(u"V1");
  inventory->ReorderPoint(u"10");
  inventory->QuantityOnHand(u"99");  // never sent
  auto subtotal = std::make_shared<DroItemSubtotal>();
  subtotal->Name(u"Sub");
  subtotal->ItemDesc(u"Subtotal");
  auto discount = std::make_shared<DroItemDiscount>();
  discount->Name(u"Disc");
  discount->DiscountRate(u"5");
  discount->DiscountRatePercent(u"10");
  discount->AccountRef()->FullName(u"Discounts");
  auto group = std::make_shared<DroItemGroup>();
  group->Name(u"Kit");
  group->IsPrintItemsInGroup(u"true");
  group->ItemGroupLines()->Add()->Quantity(u"5");  // no item: left out
  const auto line = group->ItemGroupLines()->Add();
  line->ItemRef()->FullName(u"Tile");
  line->Quantity(u"3");
  auto other = std::make_shared<DroItemOtherCharge>();
  other->Name(u"Haul");
  other->ParentRef()->FullName(u"Charges");
  other->SalesAndPurchase()->PurchaseCost(u"7");
  auto payment = std::make_shared<DroItemPayment>();
  payment->Name(u"Cash");
  payment->ItemDesc(u"Paid in cash");
  payment->DepositToAccountRef()->FullName(u"Undeposited Funds");
  auto tax = std::make_shared<DroItemSalesTax>();
  tax->Name(u"State");
  tax->TaxRate(u"7.50");
  tax->TaxVendorRef()->FullName(u"Revenue");
  auto taxGroup = std::make_shared<DroItemSalesTaxGroup>();
  taxGroup->Name(u"Both");
  taxGroup->ItemDesc(u"State and city");
  auto service = std::make_shared<DroItemService>();
  service->Name(u"Labour");
  service->SalesOrPurchase()->Desc(u"Per hour");
  service->SalesOrPurchase()->AccountRef()->ListID(u"40-1");

  const std::vector<std::pair<std::function<Text()>, std::string>> cases{
      {[&] {
         DroXmlBuilder builder;
         builder.BuildAddAccount(account);
         return builder.XML();
       },
       "account_add.xml"},
      {[&] {
         DroXmlBuilder builder;
         builder.BuildAddAccount(plainAccount);
         return builder.XML();
       },
       "account_add_name_only.xml"},
      {[&] { return build(udItemNonInventory, nonInv); }, "item_non_inventory_add.xml"},
      {[&] { return build(udItemNonInventory, emptyNonInv); }, "item_non_inventory_add_empty.xml"},
      {[&] { return build(udItemInventory, inventory); }, "item_inventory_add.xml"},
      {[&] { return build(udItemSubtotal, subtotal); }, "item_subtotal_add.xml"},
      {[&] { return build(udItemDiscount, discount); }, "item_discount_add.xml"},
      {[&] { return build(udItemGroup, group); }, "item_group_add.xml"},
      {[&] { return build(udItemOtherCharge, other); }, "item_other_charge_add.xml"},
      {[&] { return build(udItemPayment, payment); }, "item_payment_add.xml"},
      {[&] { return build(udItemSalesTax, tax); }, "item_sales_tax_add.xml"},
      {[&] { return build(udItemSalesTaxGroup, taxGroup); }, "item_sales_tax_group_add.xml"},
      {[&] { return build(udItemService, service); }, "item_service_add.xml"},
      {[&] { return build(udItemSubtotal, std::make_shared<HostSubtotal>(true)); },
       "item_subtotal_add_host_object.xml"},
  };
  for (const auto& [document, golden] : cases) {
    EXPECT_TRUE(test::matchesGolden(document(), "requests/" + golden)) << golden;
  }
  EXPECT_EQ(account->RequestID(), u"2");
  EXPECT_EQ(service->RequestID(), u"2");
}

TEST(ItemBuildersTest, WhatBuildsNothingOrStopsHalfway) {
  DroXmlBuilder builder;
  builder.BuildQueryByAll(udEtItem);
  const Text before = builder.XML();
  const auto tax = std::make_shared<DroItemSalesTax>();
  for (const auto kind : {udItemPayrollItemWage, udUnknown, static_cast<udItemType>(42)}) {
    builder.BuildAddItem(kind, Variant(tax));
    EXPECT_EQ(builder.XML(), before);
  }
  // The non-inventory builder checks the class before it writes anything.
  EXPECT_TRUE(test::raisesRuntime([&] { builder.BuildAddItem(udItemNonInventory, Variant(tax)); },
                                  RuntimeError::kTypeMismatch));
  EXPECT_EQ(builder.XML(), before);
  // A sales tax group takes its members as references: an item record is 13 once the
  // opening elements are written.
  const auto group = std::make_shared<DroItemSalesTaxGroup>();
  group->Name(u"Both");
  group->ItemSalesTaxRefs()->Add(Variant(7));
  EXPECT_TRUE(
      test::raisesRuntime([&] { builder.BuildAddItem(udItemSalesTaxGroup, Variant(group)); },
                          RuntimeError::kTypeMismatch));
  EXPECT_NE(builder.XML().find(u"<Name>Both</Name>"), Text::npos);
  EXPECT_EQ(builder.XML().find(u"</QBXML>"), Text::npos);
  // A host object without a member the builder reaches: 438 there, the document incomplete.
  EXPECT_TRUE(test::raisesRuntime(
      [&] { builder.BuildAddItem(udItemSubtotal, Variant(std::make_shared<HostSubtotal>(false))); },
      RuntimeError::kMemberNotSupported));
  EXPECT_NE(builder.XML().find(u"<Name>Host &amp; Co</Name>"), Text::npos);
  EXPECT_EQ(builder.XML().find(u"</QBXML>"), Text::npos);
  // The discount builder takes any object with the members: an inventory item has no rates.
  EXPECT_TRUE(test::raisesRuntime(
      [&] { builder.BuildAddItem(udItemDiscount, Variant(std::make_shared<DroItemInventory>())); },
      RuntimeError::kMemberNotSupported));
}

TEST(ItemBuildersTest, ReachableByName) {
  const auto builder = CreateObject(u"DroQbXml.DroXmlBuilder");
  const auto item = CreateObject(u"DroQbXml.DroItemPayment");
  item->let(u"Name", u"Check");
  builder->call(u"BuildAddItem", {Variant(int32_t{udItemPayment}), Variant(item)});
  EXPECT_NE(builder->get(u"XML").toText().find(u"<ItemPaymentAddRq requestID=\"2\">"), Text::npos);
  EXPECT_EQ(item->get(u"RequestID").toText(), u"2");
  const auto account = CreateObject(u"DroQbXml.DroAccount");
  builder->call(u"BuildAddAccount", {Variant(account)});
  EXPECT_NE(builder->get(u"XML").toText().find(u"<AccountType />"), Text::npos);
}

}  // namespace
}  // namespace droqbxml

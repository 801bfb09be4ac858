// The item records: the real inventory add response, each kind's own reading rules (the
// sales sides, group lines, sales tax group members) and every dump's heading and irregular first
// line, pinned by golden files.
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/records/DroItemDiscount.hpp"
#include "droqbxml/records/DroItemGroup.hpp"
#include "droqbxml/records/DroItemInventory.hpp"
#include "droqbxml/records/DroItemPayrollItemWage.hpp"
#include "droqbxml/records/DroItemSalesTax.hpp"
#include "droqbxml/records/DroItemSalesTaxGroup.hpp"
#include "droqbxml/records/DroItemsCol.hpp"
#include "droqbxml/records/DroSalesItems.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

Text header(bool fullName = true) {
  return Text(
             u"<ListID>80-1</ListID><TimeCreated>t</TimeCreated><TimeModified>t</TimeModified>"
             u"<EditSequence>5</EditSequence><Name>Tile</Name>") +
         (fullName ? u"<FullName>Tile</FullName>" : u"") + u"<IsActive>true</IsActive>";
}
Text rs(const Text& kind, const Text& body, const Text& id = u"2") {
  return u"<" + kind + u"QueryRs requestID=\"" + id + u"\"><" + kind + u"Ret>" + body + u"</" +
         kind + u"Ret></" + kind + u"QueryRs>";
}
const Text kEmptyElement = u"The response returned a an empty '";

TEST(DroItemTest, ReadsTheRealInventoryAddResponse) {
  const Text response = test::sharedResponse("qbxml-gem__item_inventory_add_rs.xml");
  if (response.empty()) GTEST_SKIP() << "shared responses not found";
  DroItemInventory item;
  EXPECT_EQ(item.ParseRs(response), 1);
  EXPECT_EQ(item.ListID(), u"8000085A-1231522945");
  EXPECT_EQ(item.Name(), u"product name here");
  EXPECT_EQ(item.SalesTaxCodeRef()->FullName(), u"Tax");
  EXPECT_EQ(item.SalesPrice(), u"85.00000");
  EXPECT_EQ(item.IncomeAccountRef()->ListID(), u"420000-1128987409");
  EXPECT_EQ(item.COGSAccountRef()->FullName(), u"Cost of Goods Sold");
  EXPECT_EQ(item.AssetAccountRef()->FullName(), u"Inventory Asset");
  EXPECT_TRUE(item.PrefVendorRef()->IsEmpty());
  EXPECT_EQ(item.QuantityOnHand(), u".00000");
  EXPECT_EQ(item.AverageCost(), u".00000");
  EXPECT_TRUE(test::matchesGolden(item.PrintOut(), "records/item_inventory_product.txt"));
}

TEST(DroItemTest, SalesSidesAreReadOneOrTheOther) {
  DroItemNonInventory item;
  item.SalesOrPurchase()->PricePercent(u"7.50");
  const Text both =
      u"<SalesOrPurchase><Desc>Grout</Desc><Price>2.5</Price>"
      u"<PricePercent>9</PricePercent><AccountRef><FullName>Sales</FullName>"
      u"</AccountRef></SalesOrPurchase><SalesAndPurchase><SalesDesc>x</SalesDesc>"
      u"</SalesAndPurchase>";
  item.ParseRs(rs(u"ItemNonInventory", header() + u"<Sublevel>0</Sublevel>" + both));
  EXPECT_EQ(item.SalesOrPurchase()->Price(), u"2.50000");
  EXPECT_EQ(item.SalesOrPurchase()->PricePercent(), u"7.5");  // never read from a response
  EXPECT_EQ(item.SalesOrPurchase()->AccountRef()->FullName(), u"Sales");
  EXPECT_TRUE(item.SalesAndPurchase()->IsEmpty());

  DroItemOtherCharge other;
  other.ParseRs(
      rs(u"ItemOtherCharge", header() + u"<Sublevel>0</Sublevel><SalesAndPurchase><SalesDesc>Haul"
                                        u"</SalesDesc><IncomeAccountRef><ListID>4</ListID>"
                                        u"</IncomeAccountRef><PurchaseCost>3</PurchaseCost>"
                                        u"</SalesAndPurchase>"));
  EXPECT_TRUE(other.SalesOrPurchase()->IsEmpty());
  EXPECT_EQ(other.SalesAndPurchase()->SalesDesc(), u"Haul");
  EXPECT_EQ(other.SalesAndPurchase()->PurchaseCost(), u"3.00000");
  EXPECT_FALSE(other.SalesAndPurchase()->IsEmpty());
  EXPECT_EQ(other.ItemType(), udItemOtherCharge);
}

TEST(DroItemTest, SublevelIsRequiredButForServices) {
  DroItemService service;
  EXPECT_EQ(service.ItemType(), 9);
  EXPECT_EQ(service.ParseRs(rs(u"ItemService", header())), 1);
  EXPECT_EQ(service.IsActive(), u"true");
  DroItemInventory inventory;
  EXPECT_TRUE(test::raises([&] { inventory.ParseRs(rs(u"ItemInventory", header())); }, PARING,
                           u"DroQbXml.basCommonProcs.getElementValue",
                           kEmptyElement + u"<ItemInventoryRet><Sublevel>'.\r\n"
                                           u"This element is not allowed to be empty."));
  // Another kind's response, and a response cut short.
  EXPECT_EQ(inventory.ParseRs(rs(u"ItemService", header())), 0);
  EXPECT_TRUE(test::raises(
      [&] { inventory.ParseRs(rs(u"ItemInventory", header()).substr(0, 120)); }, PARING,
      u"DroQbXml.basCommonProcs.getElementValue",
      kEmptyElement + u"<ItemInventoryRet><TimeModified>'.\r\nThis element is not allowed to be "
                      u"empty."));
  // A value its setter refuses raises from inside the read.
  EXPECT_TRUE(test::raisesRefusal(
      [&] { inventory.ParseRs(rs(u"ItemInventory", header() + u"<Sublevel>7</Sublevel>")); },
      TYPE_INT, u"CheckINTTYPE", u"7", u"INTTYPE"));
}

TEST(DroItemTest, GroupLinesKeepTheFirstOfLooseDuplicates) {
  const Text line1 =
      u"<ItemGroupLine><ItemRef><ListID>A</ListID><FullName>Tile</FullName>"
      u"</ItemRef><Quantity>2</Quantity></ItemGroupLine>";
  const Text line2 =
      u"<ItemGroupLine><ItemRef><ListID>B</ListID><FullName>Grout</FullName>"
      u"</ItemRef><Quantity>2</Quantity></ItemGroupLine>";
  const Text line3 = u"<ItemGroupLine><Quantity>4</Quantity></ItemGroupLine>";
  DroItemGroup group;
  int32_t start = 3;
  group.ParseRs(rs(u"ItemGroup", header(false) + u"<IsPrintItemsInGroup>1</IsPrintItemsInGroup>" +
                                     line1 + line2 + line3),
                start);
  EXPECT_EQ(start, 3);
  const DroItemGroupLineCol& lines = *group.ItemGroupLines();
  ASSERT_EQ(lines.Count(), 2);  // the second shares the first one's quantity
  EXPECT_EQ(lines.Item(Variant(u"KEYTile"))->Quantity(), u"2.00000");
  EXPECT_EQ(lines.Item(Variant(u"KEY4.00000"))->ItemRef()->FullName(), u"");
  EXPECT_EQ(group.IsPrintItemsInGroup(), u"true");
  EXPECT_TRUE(test::matchesGolden(group.PrintOut(), "records/item_group_two_lines.txt"));
  // A line without an item reference or a quantity ends the lines.
  DroItemGroupLine empty;
  EXPECT_TRUE(empty.IsEmpty());
  empty.ItemRef()->ListID(u"X");
  EXPECT_FALSE(empty.IsEmpty());  // worked out again on every read
}

TEST(DroItemTest, SalesTaxGroupMembersReadFromTheGroupsStart) {
  const Text response = rs(u"ItemSalesTaxGroup", header(false) + u"<ItemDesc>Both</ItemDesc>") +
                        rs(u"ItemSalesTax", header(false) + u"<TaxRate>7.50</TaxRate>", u"3");
  DroItemSalesTaxGroup group;
  const auto member = group.ItemSalesTaxRefs()->Add(Variant(u"ItemSalesTax"));
  group.ParseRs(response);
  EXPECT_EQ(group.ItemDesc(), u"Both");
  EXPECT_EQ(std::static_pointer_cast<DroItemSalesTax>(member)->TaxRate(), u"7.5");
  group.ItemSalesTaxRefs()->Add(Variant(9));
  EXPECT_TRUE(test::raisesRuntime([&] { group.ParseRs(response); }, RuntimeError::kTypeMismatch));
}

TEST(DroItemTest, FreshDumps) {
  const struct {
    const char16_t* progId;
    const char* golden;
  } cases[] = {
      {u"DroItemInventory", "records/item_inventory_new.txt"},
      {u"DroItemNonInventory", "records/item_non_inventory_new.txt"},
      {u"DroItemOtherCharge", "records/item_other_charge_new.txt"},
      {u"DroItemService", "records/item_service_new.txt"},
      {u"DroItemDiscount", "records/item_discount_new.txt"},
      {u"DroItemPayment", "records/item_payment_new.txt"},
      {u"DroItemSalesTax", "records/item_sales_tax_new.txt"},
      {u"DroItemSubtotal", "records/item_subtotal_new.txt"},
      {u"DroItemSalesTaxGroup", "records/item_sales_tax_group_new.txt"},
      {u"DroItemGroup", "records/item_group_new.txt"},
      {u"DroItemPayrollItemWage", "records/item_payroll_wage_new.txt"},
      {u"DroSalesAndPurchase", "records/sales_and_purchase_new.txt"},
      {u"DroItemGroupLine", "records/item_group_line_new.txt"},
  };
  for (const auto& c : cases) {
    const auto record = CreateObject(Text(u"DroQbXml.") + c.progId);
    EXPECT_TRUE(test::matchesGolden(record->get(u"PrintOut").toText(), c.golden)) << c.golden;
  }
}

}  // namespace
}  // namespace droqbxml

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

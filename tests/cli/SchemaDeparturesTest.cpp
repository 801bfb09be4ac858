// Where the requests the component writes depart from QuickBooks' qbXML 13.0 schema, as the
// stand-in's checks (the same as `droqbxml lint`) find them. The component keeps these
// requests as they are; this list is what the README tells hosts, and a change to the
// builders that adds or removes a departure shows here.
#include <gtest/gtest.h>

#include "droqbxml/droqbxml.hpp"
#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/RequestDocument.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

std::vector<std::string> problems(const Text& request) {
  std::vector<std::string> found;
  for (const auto& p : simulator::readRequest(toUtf8(request)).problems) {
    found.push_back(std::to_string(p.line) + " " + p.element + ": " + p.message);
  }
  return found;
}

TEST(SchemaDeparturesTest, QueryBuilders) {
  DroXmlBuilder builder;
  for (const auto entity : {udEtCustomer, udEtjob, udEtEstimate, udEtInvoice, udEtItem,
                            udEtItemNonInv, udEtItemOther, udEtAccount, udEtItemInv}) {
    builder.BuildQueryByAll(entity);
    EXPECT_EQ(problems(builder.XML()), std::vector<std::string>{}) << entity;
    builder.BuildQueryByListID(entity, u"80000001-1");
    EXPECT_EQ(problems(builder.XML()), std::vector<std::string>{}) << entity;
  }
  for (const auto entity : {udEtCustomer, udEtAccount, udEtItemInv}) {
    builder.BuildQueryByFullName(entity, u"X");
    EXPECT_EQ(problems(builder.XML()), std::vector<std::string>{}) << entity;
    builder.BuildQueryByActiveOrDate(entity, udAsAll, u"2024-01-01", u"2024-12-31");
    EXPECT_EQ(problems(builder.XML()), std::vector<std::string>{}) << entity;
  }
  // Transactions have no FullName, no ActiveStatus and their dates in a filter aggregate.
  builder.BuildQueryByFullName(udEtInvoice, u"X");
  EXPECT_EQ(problems(builder.XML()),
            std::vector<std::string>{
                "6 QBXML/QBXMLMsgsRq/InvoiceQueryRq/FullName: unknown element 'FullName' in "
                "InvoiceQueryRq"});
  builder.BuildQueryByActiveOrDate(udEtEstimate, udAsAll, u"2024-01-01", u"");
  const auto dated = problems(builder.XML());
  ASSERT_FALSE(dated.empty());
  EXPECT_EQ(dated.front(),
            "6 QBXML/QBXMLMsgsRq/EstimateQueryRq/ActiveStatus: unknown element 'ActiveStatus' in "
            "EstimateQueryRq");
}

TEST(SchemaDeparturesTest, CustomerAddWithEveryFieldTheBuilderWrites) {
  auto customer = std::make_shared<DroCustomer>();
  customer->Name(u"Kim");
  customer->IsActive(u"true");
  customer->ParentRef()->FullName(u"Parent");
  customer->CompanyName(u"Co");
  customer->Salutation(u"Ms");
  customer->FirstName(u"Kim");
  customer->MiddleName(u"J");
  customer->LastName(u"Lee");
  customer->BillAddress()->Addr1(u"1 Main");
  customer->BillAddress()->Addr2(u"");
  customer->Phone(u"1");
  customer->AltPhone(u"2");
  customer->Email(u"k@example.com");
  customer->Contact(u"Kim");
  customer->AltContact(u"Lee");
  customer->CustomerTypeRef()->FullName(u"Retail");
  customer->ShipAddress()->Addr1(u"2 Main");
  customer->ShipAddress()->Addr2(u"");
  customer->SalesRepRef()->FullName(u"KL");
  customer->Balance(u"10");
  customer->SalesTaxCodeRef()->FullName(u"TAX");
  customer->ItemSalesTaxRef()->FullName(u"State Tax");
  customer->ResaleNumber(u"R1");
  customer->AccountNumber(u"A1");
  customer->CreditLimit(u"100");
  customer->JobStatus(u"Pending");
  customer->JobStartDate(u"2024-01-01");
  customer->JobProjectedEndDate(u"2024-02-01");
  customer->JobEndDate(u"2024-03-01");
  customer->JobDesc(u"Desc");
  customer->JobTypeRef()->FullName(u"Remodel");
  DroXmlBuilder builder;
  builder.BuildAddCustomer(customer);
  // ShipAddress comes after the contact fields and CustomerTypeRef, and "Balance" is no
  // element of CustomerAdd (QuickBooks takes OpenBalance there).
  EXPECT_EQ(problems(builder.XML()),
            (std::vector<std::string>{
                "28 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/ShipAddress: expected one of: "
                "TermsRef, SalesRepRef, OpenBalance, OpenBalanceDate, SalesTaxCodeRef, "
                "ItemSalesTaxRef, SalesTaxCountry, ResaleNumber, AccountNumber, CreditLimit, "
                "PreferredPaymentMethodRef, CreditCardInfo and 15 more; found: ShipAddress, which "
                "belongs before CustomerTypeRef",
                "34 QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd/Balance: unknown element "
                "'Balance' in CustomerAdd"}));
  // Without those two the same customer is a valid request.
  customer->ShipAddress(std::make_shared<DroAddress>());
  customer->Balance(u"");
  builder.BuildAddJob(customer);
  EXPECT_EQ(problems(builder.XML()), std::vector<std::string>{});
}

struct ItemSample {
  const char* label;
  udItemType kind;
  Ref<Object> item;
};

// One item of each kind with every element its builder writes set to an accepted value.
std::vector<ItemSample> itemSamples() {
  const auto salesItem = [](auto item, bool salesOrPurchase) {
    item->Name(u"Labour");
    item->IsActive(u"true");
    item->ParentRef()->FullName(u"Work");
    item->SalesTaxCodeRef()->FullName(u"Non");
    if (salesOrPurchase) {
      item->SalesOrPurchase()->Desc(u"Per hour");
      item->SalesOrPurchase()->Price(u"45");
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

TEST(SchemaDeparturesTest, AccountAndItemAdds) {
  auto account = std::make_shared<DroAccount>();
  account->Name(u"Tools");
  account->IsActive(u"true");
  account->ParentRef()->FullName(u"Assets");
  account->AccountType(u"FixedAsset");
  account->DetailAccountType(u"MachineryAndEquipment");
  account->AccountNumber(u"1500");
  account->BankNumber(u"BN-7");
  account->Desc(u"Shop tools");
  DroXmlBuilder builder;
  builder.BuildAddAccount(account);
  std::string found = "account\n";
  for (const auto& problem : problems(builder.XML())) found += "  " + problem + "\n";
  for (const auto& sample : itemSamples()) {
    builder.BuildAddItem(sample.kind, Variant(sample.item));
    found += std::string(sample.label) + "\n";
    for (const auto& problem : problems(builder.XML())) found += "  " + problem + "\n";
  }
  EXPECT_TRUE(test::matchesGolden(fromUtf8(found), "requests/schema_departures_items.txt"));
}

}  // namespace
}  // namespace droqbxml

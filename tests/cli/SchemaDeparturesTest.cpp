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
#include "tests/qbxml/ItemSamples.hpp"
#include "tests/qbxml/TxnSamples.hpp"

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

TEST(SchemaDeparturesTest, AccountAndItemAdds) {
  const auto account = test::accountSample();
  DroXmlBuilder builder;
  builder.BuildAddAccount(account);
  std::string found = "account\n";
  for (const auto& problem : problems(builder.XML())) found += "  " + problem + "\n";
  for (const auto& sample : test::itemSamples()) {
    builder.BuildAddItem(sample.kind, Variant(sample.item));
    found += std::string(sample.label) + "\n";
    for (const auto& problem : problems(builder.XML())) found += "  " + problem + "\n";
  }
  EXPECT_TRUE(test::matchesGolden(fromUtf8(found), "requests/schema_departures_items.txt"));
}

TEST(SchemaDeparturesTest, EstimateAndInvoiceAdds) {
  DroXmlBuilder builder;
  std::string found;
  const auto list = [&](const std::string& label) {
    found += label + "\n";
    for (const auto& problem : problems(builder.XML())) found += "  " + problem + "\n";
  };
  builder.BuildAddEstimate(test::estimateSample());
  list("estimate");
  builder.BuildAddEstimate(std::make_shared<DroEstimate>());
  list("estimate, nothing set");
  builder.BuildAddInvoice(test::invoiceSample());
  list("invoice");
  EXPECT_TRUE(test::matchesGolden(fromUtf8(found), "requests/schema_departures_transactions.txt"));
}

}  // namespace
}  // namespace droqbxml

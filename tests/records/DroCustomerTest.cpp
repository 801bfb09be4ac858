// The customer record: reading real query and add responses, cut and oversized ones, its
// dump, an address set to nothing, and the customer-info exchange of the collection (setter
// rules and more reading: in testdata/records/setters_by_name.txt and parse_by_name.txt).
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/records/DroCustomer.hpp"
#include "droqbxml/records/DroCustomerCol.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::sharedResponse;

Text customerRet(const Text& name, const Text& extra = u"") {
  return u"<CustomerRet><ListID>" + name +
         u"-1</ListID><TimeCreated>2026-01-02T03:04:05-05:00"
         u"</TimeCreated><TimeModified>2026-01-02T03:04:05-05:00</TimeModified><EditSequence>17"
         u"</EditSequence><Name>" +
         name + u"</Name><FullName>" + name +
         u"</FullName><IsActive>"
         u"true</IsActive><Sublevel>0</Sublevel>" +
         extra + u"</CustomerRet>";
}
Text queryResponse(const Text& id, const Text& customers) {
  return u"<CustomerQueryRs requestID=\"" + id +
         u"\" statusCode=\"0\" statusSeverity=\"Info\" "
         u"statusMessage=\"Status OK\">" +
         customers + u"</CustomerQueryRs>";
}

TEST(DroCustomerTest, ReadsARealQueryResponse) {
  const Text response = sharedResponse("qbxml-gem__customer_query_rs.xml");
  if (response.empty()) GTEST_SKIP() << "shared responses not found";
  DroCustomer customer;
  const int32_t cursor = customer.ParseRs(response);
  EXPECT_EQ(customer.ListID(), u"10006-1211236622");
  EXPECT_EQ(customer.EditSequence(), u"1213155356");
  EXPECT_EQ(customer.BillAddress()->PostalCode(), u"06268");
  EXPECT_EQ(customer.Fax(), u"");  // never read
  // The phone stands after the ship address, so reading it moved the cursor past the ship
  // address, whose tag is then searched from there and missed.
  EXPECT_TRUE(customer.ShipAddress()->IsEmpty());
  EXPECT_EQ(customer.SalesTaxCodeRef()->FullName(), u"Non");
  EXPECT_EQ(customer.JobStatus(), u"None");
  EXPECT_TRUE(test::matchesGolden(customer.PrintOut(), "records/customer_query_keith_palmer.txt"));
  EXPECT_EQ(response.substr(static_cast<size_t>(cursor) - 1, 12), u"</JobStatus>");
}

TEST(DroCustomerTest, ReadsRealAddResponses) {
  const Text add = sharedResponse("qbxml-gem__customer_add_rs.xml");
  if (add.empty()) GTEST_SKIP() << "shared responses not found";
  DroCustomer customer;
  customer.RequestID(u"15");
  customer.ParseRs(add);
  EXPECT_EQ(customer.Name(), u"20706 - Eastern XYZ University");
  EXPECT_EQ(customer.BillAddress()->Addr3(), u"123 XYZ Road");
  EXPECT_EQ(customer.Contact(), u"Keith Palmer");
  // Amounts are stored as the "#.00" format writes them: zero has no leading digit.
  EXPECT_EQ(customer.Balance(), u".00");
  // A response without any requestID attribute is never read.
  DroCustomer unread;
  const Text withoutId = sharedResponse("CustomerAddRs__qbwc-gem_test_helper.xml");
  EXPECT_EQ(unread.ParseRs(withoutId, 5), 5);
  EXPECT_EQ(unread.ListID(), u"");
}

TEST(DroCustomerTest, RealWarningsAndErrorsReadNothing) {
  for (const char* name : {"CustomerQueryRs_500_Warn__qbwc-gem_test_helper.xml",
                           "CustomerQueryRs_3120_Error__qbwc-gem_test_helper.xml"}) {
    const Text response = sharedResponse(name);
    if (response.empty()) GTEST_SKIP() << "shared responses not found";
    DroCustomer customer;
    EXPECT_EQ(customer.ParseRs(response, 1), 1) << name;
    EXPECT_EQ(customer.ListID(), u"");
  }
  // The iterator response's attributes stand on lines of their own: still one requestID.
  const Text iterated = sharedResponse("qbxml-gem__customer_query_terator_rs.xml");
  DroCustomer tenth;
  tenth.RequestID(u"1");
  tenth.ParseRs(iterated);
  EXPECT_EQ(tenth.Name(), u"10th Customer");
  EXPECT_EQ(tenth.SalesTaxCodeRef()->FullName(), u"Tax");
}

// Cut inside a required value: the empty-element error. A 10 MB value: kept where nothing
// limits it, refused where a limit does. (Cut inside an optional value, finding the own
// response: testdata/records/parse_by_name.txt.)
TEST(DroCustomerTest, TruncatedAndOversizedInputEndInTheirErrors) {
  const Text full = queryResponse(u"2", customerRet(u"Kim"));
  EXPECT_TRUE(
      test::raises([&] { DroCustomer().ParseRs(full.substr(0, full.find(u"Kim</Name>") + 3)); },
                   PARING, u"DroQbXml.basCommonProcs.getElementValue",
                   u"The response returned a an empty '<CustomerRet><Name>'.\r\n"
                   u"This element is not allowed to be empty."));
  const Text huge(10'000'000, u'x');
  DroCustomer big;
  big.ParseRs(
      queryResponse(u"2", customerRet(u"Big", u"<AccountNumber>" + huge + u"</AccountNumber>")));
  EXPECT_EQ(big.AccountNumber().size(), huge.size());
  DroCustomer refused;
  EXPECT_THROW(refused.ParseRs(
                   queryResponse(u"2", customerRet(u"Big", u"<JobDesc>" + huge + u"</JobDesc>"))),
               ComError);
}

TEST(DroCustomerTest, FreshDump) {
  EXPECT_TRUE(test::matchesGolden(DroCustomer().PrintOut(), "records/customer_new.txt"));
}

// Two large responses of one length read one after the other by name: each call copies the
// text into a temporary, and in an ordinary build the second temporary takes the first one's
// freed buffer. The second read must see the second text.
TEST(DroCustomerTest, EachResponseIsReadAsItIs) {
  Text phones;
  Text mobiles;
  for (int i = 0; i < 200; ++i) {
    phones += customerRet(u"C" + asciiText(std::to_string(1000 + i)), u"<Phone>555-1234</Phone>");
    mobiles += customerRet(u"C" + asciiText(std::to_string(1000 + i)), u"<Mobile>5-1234</Mobile>");
  }
  const Text second = queryResponse(u"2", mobiles);
  ASSERT_GT(second.size(), 32768u);
  ASSERT_EQ(queryResponse(u"2", phones).size(), second.size());
  const auto customer = CreateObject(u"DroQbXml.DroCustomer");
  customer->call(u"ParseRs", {Variant(queryResponse(u"2", phones))});
  EXPECT_EQ(customer->get(u"Phone").toText(), u"555-1234");
  customer->call(u"ParseRs", {Variant(second)});
  EXPECT_EQ(customer->get(u"Mobile").toText(), u"5-1234");
}

// Set cust.BillAddress = Nothing: whatever uses the address raises 91, nothing crashes.
TEST(DroCustomerTest, ObjectPropertySetToNothingIsAnErrorWhereItIsUsed) {
  const auto customer = std::make_shared<DroCustomer>();
  customer->set(u"BillAddress", Variant());
  EXPECT_EQ(customer->BillAddress(), nullptr);
  EXPECT_TRUE(customer->get(u"BillAddress").toObject() == nullptr);
  const auto unset = [](const std::function<void()>& body) {
    return test::raisesRuntime(body, RuntimeError::kObjectNotSet);
  };
  EXPECT_TRUE(unset([&] { customer->PrintOut(); }));
  EXPECT_TRUE(unset([&] { customer->ParseRs(queryResponse(u"2", customerRet(u"Lee"))); }));
  EXPECT_TRUE(unset([&] {
    customer->ParseCustInfo(
        u"<CustomerRet><NonQbFileName>f"
        u"</NonQbFileName></CustomerRet>");
  }));
  DroXmlBuilder builder;
  EXPECT_TRUE(unset([&] { builder.BuildAddCustomer(customer); }));
  const auto col = std::make_shared<DroCustomerCol>();
  col->Add(u"", customer);
  EXPECT_TRUE(unset([&] { col->BuildCustInfoXML(); }));
  customer->ParentRef(nullptr);
  customer->BillAddress(std::make_shared<DroAddress>());
  EXPECT_TRUE(unset([&] { customer->PrintOut(); }));
}

// The customer-info text, with its unclosed "<QBXMLMsgsRs>" and upper-case "INFO", of no
// customer and of one.
TEST(DroCustomerColTest, CustomerInfoText) {
  DroCustomerCol col;
  EXPECT_TRUE(test::matchesGolden(col.BuildCustInfoXML(), "records/customer_info_empty.xml"));
  const auto smith = col.Add();
  smith->NonQbFileName(u"Smith.job");
  smith->LastName(u"Smith");
  smith->BillAddress()->City(u"Storrs");
  EXPECT_TRUE(test::matchesGolden(col.BuildCustInfoXML(), "records/customer_info_one.xml"));
}

TEST(DroCustomerColTest, CustomerInfoRoundTripDropsDuplicateTitles) {
  DroCustomerCol col;
  const auto smith = col.Add();
  smith->NonQbFileName(u"C:\\Jobs\\A\\Smith.job");
  smith->FirstName(u"Ann");
  smith->CompanyName(u"Smith & Sons");
  smith->BillAddress()->City(u"Storrs");
  smith->BillAddress()->State(u"CT");
  smith->BillAddress()->PostalCode(u"06268");
  smith->NonQbJobName(u"Kitchen");
  const auto twin = col.Add();
  twin->NonQbFileName(u"C:\\Jobs\\B\\Smith.job");
  const auto jones = col.Add();
  jones->NonQbFileName(u"Jones.job");
  const Text text = col.BuildCustInfoXML();
  EXPECT_NE(text.find(u"\t\t\t\t<CompanyName>Smith &amp; Sons</CompanyName>\r\n"), Text::npos);

  DroCustomerCol back;
  EXPECT_TRUE(back.ParseCustInfo(text));
  ASSERT_EQ(back.Count(), 2);  // the second Smith.job is dropped without a word
  const auto read = back.Item(Variant(u"KEYSmith.job"));
  EXPECT_EQ(read->NonQbFileName(), u"C:\\Jobs\\A\\Smith.job");
  EXPECT_EQ(read->FirstName(), u"Ann");
  EXPECT_EQ(read->CompanyName(), u"Smith &amp; Sons");  // values keep their escaped form
  EXPECT_EQ(read->NonQbJobName(), u"Kitchen");
  EXPECT_EQ(read->NonQbCityStateZip(), u"Storrs, CT  06268");
  EXPECT_EQ(back.Item(Variant(2))->NonQbFileTitle(), u"Jones.job");
  DroCustomerCol unescaped;
  EXPECT_TRUE(unescaped.ParseCustInfoUnEscaped(text));
  EXPECT_EQ(unescaped.Item(Variant(1))->CompanyName(), u"Smith & Sons");
  EXPECT_FALSE(DroCustomerCol().ParseCustInfo(u"<QBXML></QBXML>"));
}

}  // namespace
}  // namespace droqbxml

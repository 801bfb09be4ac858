// The customer and job add requests, whole documents compared byte for byte with the golden
// files in testdata/requests.
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/records/DroCustomer.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

TEST(CustomerBuildersTest, NameIsAlwaysWrittenAndEverythingElseOnlyWhenSet) {
  DroXmlBuilder builder;
  auto customer = std::make_shared<DroCustomer>();
  builder.BuildAddCustomer(customer);
  EXPECT_TRUE(test::matchesGolden(builder.XML(), "requests/customer_add_empty.xml"));
  customer->Name(u"Kim & Co");
  customer->Notes(u"n");
  customer->Fax(u"555");
  customer->TermsRef()->FullName(u"Net 30");
  customer->Mobile(u"1");
  builder.BuildAddCustomer(customer);
  EXPECT_TRUE(test::matchesGolden(builder.XML(), "requests/customer_add_name_only.xml"));
  EXPECT_EQ(customer->RequestID(), u"2");
  // The same by name.
  const auto byName = CreateObject(u"DroQbXml.DroXmlBuilder");
  const auto named = CreateObject(u"DroQbXml.DroCustomer");
  named->let(u"Name", u"Kim & Co");
  byName->call(u"BuildAddCustomer", {Variant(named)});
  EXPECT_TRUE(
      test::matchesGolden(byName->get(u"XML").toText(), "requests/customer_add_name_only.xml"));
  EXPECT_EQ(named->get(u"RequestID").toText(), u"2");
}

TEST(CustomerBuildersTest, WritesTheBodyInItsOrder) {
  DroXmlBuilder builder;
  auto job = std::make_shared<DroCustomer>();
  job->Name(u"Kitchen");
  job->IsActive(u"true");
  job->ParentRef()->ListID(u"80000001-1");
  job->ParentRef()->FullName(u"Kim");
  job->LastName(u"Lee");
  job->BillAddress()->Addr1(u"1 Main");
  job->BillAddress()->Addr2(u"");  // recomputes the flag: the address is written
  job->SalesTaxCodeRef()->FullName(u"TAX");
  job->JobStatus(u"inprogress");
  job->JobTypeRef()->ListID(u"9");
  builder.BuildAddJob(job);
  EXPECT_TRUE(test::matchesGolden(builder.XML(), "requests/job_add.xml"));
  // A host-filled address whose fields were never set to "" still reads IsEmpty: not written.
  auto other = std::make_shared<DroCustomer>();
  other->Name(u"X");
  other->ShipAddress()->Addr1(u"2 Main");
  builder.BuildAddCustomer(other);
  EXPECT_EQ(builder.XML().find(u"ShipAddress"), Text::npos);
  EXPECT_EQ(other->RequestID(), u"2");  // every build starts a new document
}

}  // namespace
}  // namespace droqbxml

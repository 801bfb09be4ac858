// The customer and job add requests, whole documents compared byte for byte.
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/records/DroCustomer.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

Text document(const Text& body) {
  return u"<?xml version=\"1.0\"?>\r\n<!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.0//EN\" >"
         u"\r\n<QBXML>\r\n\t<QBXMLMsgsRq onError=\"stopOnError\">\r\n\t\t<CustomerAddRq "
         u"requestID=\"2\">\r\n\t\t\t<CustomerAdd>\r\n" +
         body + u"\t\t\t</CustomerAdd>\r\n\t\t</CustomerAddRq>\r\n\t</QBXMLMsgsRq>\r\n</QBXML>";
}

TEST(CustomerBuildersTest, NameIsAlwaysWrittenAndEverythingElseOnlyWhenSet) {
  DroXmlBuilder builder;
  auto customer = std::make_shared<DroCustomer>();
  builder.BuildAddCustomer(customer);
  EXPECT_EQ(builder.XML(), document(u"\t\t\t\t<Name />\r\n"));
  customer->Name(u"Kim & Co");
  customer->Notes(u"n");
  customer->Fax(u"555");
  customer->TermsRef()->FullName(u"Net 30");
  customer->Mobile(u"1");
  builder.BuildAddCustomer(customer);
  EXPECT_EQ(builder.XML(), document(u"\t\t\t\t<Name>Kim &amp; Co</Name>\r\n"));
  EXPECT_EQ(customer->RequestID(), u"2");
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
  EXPECT_EQ(
      builder.XML(),
      document(
          u"\t\t\t\t<Name>Kitchen</Name>\r\n"
          u"\t\t\t\t<IsActive>true</IsActive>\r\n"
          u"\t\t\t\t<ParentRef>\r\n\t\t\t\t\t<ListID>80000001-1</ListID>\r\n\t\t\t\t</"
          u"ParentRef>\r\n"
          u"\t\t\t\t<LastName>Lee</LastName>\r\n"
          u"\t\t\t\t<BillAddress>\r\n\t\t\t\t\t<Addr1>1 Main</Addr1>\r\n\t\t\t\t</BillAddress>\r\n"
          u"\t\t\t\t<SalesTaxCodeRef>\r\n\t\t\t\t\t<FullName>TAX</FullName>\r\n"
          u"\t\t\t\t</SalesTaxCodeRef>\r\n"
          u"\t\t\t\t<JobStatus>InProgress</JobStatus>\r\n"
          u"\t\t\t\t<JobTypeRef>\r\n\t\t\t\t\t<ListID>9</ListID>\r\n\t\t\t\t</JobTypeRef>\r\n"));
  // A host-filled address whose fields were never set to "" still reads IsEmpty: not written.
  auto other = std::make_shared<DroCustomer>();
  other->Name(u"X");
  other->ShipAddress()->Addr1(u"2 Main");
  builder.BuildAddCustomer(other);
  EXPECT_EQ(builder.XML().find(u"ShipAddress"), Text::npos);
  EXPECT_EQ(other->RequestID(), u"2");  // every build starts a new document
}

TEST(CustomerBuildersTest, ReachableByName) {
  const auto builder = CreateObject(u"DroQbXml.DroXmlBuilder");
  const auto customer = CreateObject(u"DroQbXml.DroCustomer");
  customer->let(u"Name", u"Kim");
  builder->call(u"BuildAddCustomer", {Variant(customer)});
  EXPECT_EQ(builder->get(u"XML").toText(), document(u"\t\t\t\t<Name>Kim</Name>\r\n"));
  EXPECT_EQ(customer->get(u"RequestID").toText(), u"2");
}

}  // namespace
}  // namespace droqbxml

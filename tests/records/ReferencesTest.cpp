// The generic reference, the typed reference family and the address record.
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/records/DroAddress.hpp"
#include "droqbxml/records/DroTypedRefs.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

bool raisesTooLong(const std::function<void()>& body, const Text& value) {
  return test::raisesRefusal(body, TYPE_STRING, u"CheckSTRTYPE", value, u"STRTYPE");
}

TEST(DroObjRefTest, EmptinessFollowsEverySet) {
  DroObjRef ref;
  EXPECT_TRUE(ref.IsEmpty());
  EXPECT_EQ(ref.PrintOut(), u"OBJECT REFERENCE\r\nListID\r\n\t\r\nFullName\r\n\t");
  ref.ListID(u"80000001-1");
  EXPECT_FALSE(ref.IsEmpty());
  ref.ListID(u"");
  EXPECT_TRUE(ref.IsEmpty());
  ref.FullName(u" Kim ");  // the generic reference neither trims nor limits
  EXPECT_EQ(ref.FullName(), u" Kim ");
}

TEST(DroObjRefTest, ParseReadsChildrenFromTheCursorNotFromTheTag) {
  const Text text =
      u"<ListID>EARLIER</ListID><ParentRef><FullName>Kim</FullName></ParentRef>"
      u"<CustomerTypeRef><ListID>2</ListID></CustomerTypeRef><FullName>Later</FullName>";
  DroParentRef parent;
  int32_t start = 1;
  int32_t end = 1;
  parent.ParseRs(u"ParentRef", text, start, end);
  EXPECT_EQ(parent.ListID(), u"EARLIER");
  EXPECT_EQ(parent.FullName(), u"Kim");
  // A reference without FullName takes the next one further on.
  DroCustomerTypeRef type;
  type.ParseRs(u"CustomerTypeRef", text, start, end);
  EXPECT_EQ(type.ListID(), u"2");
  EXPECT_EQ(type.FullName(), u"Later");
  // Absent: nothing changes.
  DroTermsRef terms;
  const int32_t before = end;
  terms.ParseRs(u"TermsRef", text, start, end);
  EXPECT_TRUE(terms.IsEmpty());
  EXPECT_EQ(end, before);
}

TEST(DroTypedRefTest, LimitsTrimRulesAndRequiredPerKind) {
  DroSalesRepRef rep;
  rep.FullName(u"  ABCDE  ");
  EXPECT_EQ(rep.FullName(), u"ABCDE");
  EXPECT_TRUE(raisesTooLong([&] { rep.FullName(u"ABCDEF"); }, u"ABCDEF"));
  EXPECT_EQ(rep.FullName(), u"ABCDE");
  rep.ListID(u" 1 ");
  EXPECT_EQ(rep.ListID(), u"1");
  // The income account reference alone keeps the blanks, which count towards the limit.
  DroIncomeAccountRef income;
  income.FullName(u" Sales ");
  EXPECT_EQ(income.FullName(), u" Sales ");
  EXPECT_TRUE(
      raisesTooLong([&] { income.FullName(Text(158, u'a') + u"  "); }, Text(158, u'a') + u"  "));
  DroSalesTaxCodeRef tax;
  EXPECT_TRUE(raisesTooLong([&] { tax.FullName(u"TAXX"); }, u"TAXX"));
  const Text text = u"<ClassRef><ListID></ListID><FullName>A</FullName></ClassRef>";
  int32_t start = 1;
  int32_t end = 1;
  DroItemRef item;
  EXPECT_NO_THROW(item.ParseRs(u"ClassRef", text, start, end, true, u"<InvoiceLineRet>"));
  start = end = 1;
  DroClassRef classRef;
  EXPECT_TRUE(test::raises(
      [&] { classRef.ParseRs(u"ClassRef", text, start, end, true, u"<InvoiceLineRet>"); }, PARING,
      u"DroQbXml.basCommonProcs.getElementValue",
      u"The response returned a an empty '<InvoiceLineRet><ClassRef><ListID>'.\r\n"
      u"This element is not allowed to be empty."));
}

TEST(DroTypedRefTest, EveryKindIsCreatableByItsOwnName) {
  for (const auto name : typedRefClassNames()) {
    const auto ref = CreateObject(u"DroQbXml." + Text(name));
    EXPECT_EQ(ref->className(), name);
    ref->let(u"FullName", u"A");
    EXPECT_FALSE(ref->get(u"IsEmpty").toBoolean());
    EXPECT_EQ(ref->get(u"PrintOut").toText(),
              u"OBJECT REFERENCE\r\nListID\r\n\t\r\nFullName\r\n\tA");
  }
}

TEST(DroAddressTest, FlagIsRecomputedOnlyWhenAFieldIsSetEmpty) {
  DroAddress address;
  EXPECT_TRUE(address.IsEmpty());
  EXPECT_EQ(address.PrintOut(),
            u"ADDRESS:\r\nAddr1\r\n\t\r\nAddr2\r\n\t\r\nAddr3\r\n\t\r\nCity\r\n\t\r\nState\r\n\t"
            u"\r\nPostalCode\r\n\t\r\nCountry\r\n\t");
  address.Addr1(u"1 Main St");
  EXPECT_TRUE(address.IsEmpty());  // deliberately not recomputed for a non-empty value
  address.Addr2(u"");
  EXPECT_FALSE(address.IsEmpty());
  address.PostalCode(u" 06268 ");
  EXPECT_EQ(address.PostalCode(), u"06268");
  EXPECT_TRUE(raisesTooLong([&] { address.PostalCode(Text(14, u'9')); }, Text(14, u'9')));
  address.City(u"A &amp; B");
  EXPECT_EQ(address.City_XmlUnEscaped(), u"A & B");
  auto copy = std::make_shared<DroAddress>();
  copy->CopyAddress(std::make_shared<DroAddress>(address));
  EXPECT_EQ(copy->City(), u"A &amp; B");
  EXPECT_FALSE(copy->IsEmpty());  // the empty Addr3 among the copied fields recomputes it
}

TEST(DroAddressTest, ParseFindsItsTagFromStartPoint) {
  const Text text =
      u"<BillAddress><Addr1>1 Main</Addr1><City>Storrs</City></BillAddress><Phone>1</Phone>";
  DroAddress address;
  int32_t start = 0;
  int32_t end = 1;
  address.ParseRs(u"BillAddress", text, start, end);
  EXPECT_EQ(address.Addr1(), u"1 Main");
  EXPECT_EQ(address.City(), u"Storrs");
  EXPECT_FALSE(address.IsEmpty());
  EXPECT_EQ(end, 47);
  DroAddress ship;
  const int32_t before = end;
  ship.ParseRs(u"ShipAddress", text, start, end);
  EXPECT_EQ(start, 0);
  EXPECT_EQ(end, before);
  EXPECT_TRUE(ship.IsEmpty());
  // With both positions 0 the tag is searched from 1, and the first child read, from a
  // cursor of 0, fails.
  start = end = 0;
  EXPECT_TRUE(test::raisesRuntime([&] { DroAddress().ParseRs(u"BillAddress", text, start, end); },
                                  RuntimeError::kInvalidProcedureCall));
}

}  // namespace
}  // namespace droqbxml

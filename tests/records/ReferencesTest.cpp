// The generic reference, the typed reference family and the address record: reading and
// copying (their setter rules: in testdata/records/setters_by_name.txt).
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/records/DroAddress.hpp"
#include "droqbxml/records/DroTypedRefs.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

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
  // A copy holds its own values (a reference keeps them inside the record).
  DroObjRef original;
  original.FullName(u"Kim");
  DroObjRef copy = original;
  original.FullName(u"Lee");
  copy = DroObjRef(copy);
  EXPECT_EQ(copy.FullName(), u"Kim");
  EXPECT_EQ(original.FullName(), u"Lee");
}

// The list id of a reference is required for every kind but the item reference.
TEST(DroTypedRefTest, RequiredListIdPerKind) {
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

// The empty Addr3 among the copied fields recomputes the copy's flag, which setting City
// alone does not.
TEST(DroAddressTest, CopyRecomputesTheFlag) {
  DroAddress address;
  address.City(u"A &amp; B");
  EXPECT_TRUE(address.IsEmpty());
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

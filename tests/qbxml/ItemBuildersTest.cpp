// The item builders beyond the records of testdata/requests/add_requests_by_name.txt: a
// host's own object with the members by name, a member it lacks, an object of the wrong
// class, and the kinds that build nothing.
#include <gtest/gtest.h>

#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/records/DroItemInventory.hpp"
#include "droqbxml/records/DroItemSalesTax.hpp"
#include "droqbxml/records/DroItemSalesTaxGroup.hpp"
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

TEST(ItemBuildersTest, HostObjectWithTheMembersByName) {
  DroXmlBuilder builder;
  builder.BuildAddItem(udItemSubtotal, Variant(std::make_shared<HostSubtotal>(true)));
  EXPECT_TRUE(test::matchesGolden(builder.XML(), "requests/item_subtotal_host_object_add.xml"));
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

}  // namespace
}  // namespace droqbxml

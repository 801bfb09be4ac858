// DroXmlElement: trimming rules, attribute order, the 16-bit attribute index, and the
// deliberate gap between AttributesUsed and AttributeCount.
#include <gtest/gtest.h>

#include <cstdint>
#include <memory>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/qbxml/DroXmlElement.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raisesRuntime;

TEST(DroXmlElementTest, NamesAreTrimmedOfBlanksAndAttributesKeptInOrder) {
  DroXmlElement elem;
  for (const int16_t index : {int16_t{0}, int16_t{5}, int16_t{-1}}) {
    EXPECT_EQ(elem.AttributeName(index), u"") << index;
    EXPECT_EQ(elem.AttributeValue(index), u"") << index;
  }
  EXPECT_FALSE(elem.AttributesUsed());
  elem.Name(u"  A\t ");
  elem.Value(u"  A  ");
  EXPECT_EQ(elem.Name(), u"A\t");  // blanks only
  EXPECT_EQ(elem.Value(), u"  A  ");
  elem.AttributeAdd(u" requestID ", u" 2 ");
  elem.AttributeAdd(u"b", u"x");
  elem.AttributeAdd(u"b", u"");  // duplicates are kept
  EXPECT_TRUE(elem.AttributesUsed());
  EXPECT_EQ(elem.AttributeCount(), 3);
  EXPECT_EQ(elem.AttributeName(0), u"requestID");
  EXPECT_EQ(elem.AttributeValue(0), u"2");
  EXPECT_EQ(elem.AttributeName(1), u"b");
  EXPECT_EQ(elem.AttributeValue(1), u"x");
  EXPECT_EQ(elem.AttributeName(2), u"b");
  EXPECT_EQ(elem.AttributeValue(2), u"");
  EXPECT_EQ(elem.AttributeName(3), u"");
  // Clearing, and Class_Initialize, drop the attributes but keep name and value.
  elem.AttributesClear();
  EXPECT_FALSE(elem.AttributesUsed());
  EXPECT_EQ(elem.AttributeCount(), 0);
  EXPECT_EQ(elem.AttributeName(0), u"");
  EXPECT_EQ(elem.AttributeName(2), u"");
  elem.AttributeAdd(u"c", u"3");
  EXPECT_EQ(elem.AttributeName(0), u"c");
  elem.Class_Initialize();
  EXPECT_EQ(elem.AttributeCount(), 0);
  EXPECT_EQ(elem.Name(), u"A\t");
  EXPECT_EQ(elem.Value(), u"  A  ");
}

// Deliberate: an empty first name counts no attributes, though they are used and kept.
TEST(DroXmlElementTest, EmptyFirstNameCountsNoAttributesThoughUsed) {
  DroXmlElement elem;
  elem.AttributeAdd(u"   ", u"x");
  elem.AttributeAdd(u"b", u"y");
  EXPECT_TRUE(elem.AttributesUsed());
  EXPECT_EQ(elem.AttributeCount(), 0);
  EXPECT_EQ(elem.AttributeValue(0), u"x");
  EXPECT_EQ(elem.AttributeName(1), u"b");
}

TEST(DroXmlElementTest, AttributeIndexIsSixteenBit) {
  DroXmlElement elem;
  for (int32_t i = 0; i < 32767; ++i) elem.AttributeAdd(u"a", u"v");
  EXPECT_EQ(elem.AttributeCount(), 32767);
  elem.AttributeAdd(u"last", u"v");  // index 32767, the highest there is
  EXPECT_EQ(elem.AttributeName(32767), u"last");
  // 32768 attributes no longer fit the 16-bit count.
  EXPECT_TRUE(raisesRuntime([&] { elem.AttributeCount(); }, RuntimeError::kOverflow));
  EXPECT_TRUE(raisesRuntime([&] { elem.AttributeAdd(u"over", u"v"); }, RuntimeError::kOverflow));
  EXPECT_EQ(elem.AttributeName(32767), u"last");
  elem.AttributesClear();
  EXPECT_EQ(elem.AttributeCount(), 0);
}

TEST(DroXmlElementTest, EveryMemberIsReachableByName) {
  const Ref<Object> elem = CreateObject(u"DroQbXml.DroXmlElement");
  elem->let(u"name", Variant(u" Rq "));
  elem->let(u"Value", Variant(u" v "));
  elem->call(u"AttributeAdd", {Variant(u" requestID "), Variant(u"2")});
  elem->call(u"AttributeAdd", {Variant(u"x"), Variant(u"y")});
  EXPECT_EQ(elem->get(u"Name").toText(), u"Rq");
  EXPECT_EQ(elem->get(u"Value").toText(), u" v ");
  EXPECT_EQ(elem->get(u"AttributeCount").toLong(), 2);
  EXPECT_TRUE(elem->get(u"AttributesUsed").toBoolean());
  EXPECT_EQ(elem->get(u"AttributeName", {Variant(int16_t{1})}).toText(), u"x");
  EXPECT_EQ(elem->get(u"AttributeValue", {Variant(u"0")}).toText(), u"2");
  // The index is 16-bit for late-bound callers too.
  EXPECT_TRUE(raisesRuntime([&] { elem->get(u"AttributeName", {Variant(int32_t{40000})}); },
                            RuntimeError::kOverflow));
  elem->call(u"Class_Initialize");
  EXPECT_FALSE(elem->get(u"AttributesUsed").toBoolean());
}

}  // namespace
}  // namespace droqbxml

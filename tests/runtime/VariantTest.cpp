// Variant kinds, their platform names and conversions.
#include <gtest/gtest.h>

#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/runtime/Variant.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raisesRuntime;

TEST(VariantTest, KindNamesAreThePlatforms) {
  EXPECT_EQ(Variant().typeName(), u"Empty");
  EXPECT_EQ(Variant::missing().typeName(), u"Error");
  EXPECT_EQ(Variant::null().typeName(), u"Null");
  EXPECT_EQ(Variant(true).typeName(), u"Boolean");
  EXPECT_EQ(Variant(int16_t{3}).typeName(), u"Integer");
  EXPECT_EQ(Variant(3).typeName(), u"Long");
  EXPECT_EQ(Variant(3.0).typeName(), u"Double");
  EXPECT_EQ(Variant::currency(30000).typeName(), u"Currency");
  EXPECT_EQ(Variant::date(0).typeName(), u"Date");
  EXPECT_EQ(Variant(u"3").typeName(), u"String");
  EXPECT_EQ(Variant(std::make_shared<clsMyErr>()).typeName(), u"clsMyErr");
  EXPECT_EQ(Variant(Ref<clsMyErr>()).typeName(), u"Nothing");
}

TEST(VariantTest, ConvertsBetweenKinds) {
  EXPECT_EQ(Variant(true).toLong(), -1);
  EXPECT_EQ(Variant(2.5).toLong(), 2);
  EXPECT_EQ(Variant::currency(25000).toLong(), 2);  // 2.5, half to even
  EXPECT_EQ(Variant::currency(35000).toInteger(), 4);
  EXPECT_EQ(Variant(u"12.5").toCurrency(), 125000);
  EXPECT_EQ(Variant(7).toCurrency(), 70000);
  EXPECT_EQ(Variant(7.5).toText(), u"7.5");
  EXPECT_EQ(Variant(false).toText(), u"False");
  EXPECT_EQ(Variant::currency(125000).toText(), u"12.5");
  EXPECT_EQ(Variant::date(46341.5).toText(), u"11/15/2026 12:00:00 PM");
  EXPECT_EQ(Variant().toText(), u"");
  EXPECT_EQ(Variant().toLong(), 0);
  EXPECT_TRUE(Variant(u" true ").toBoolean());
  EXPECT_FALSE(Variant(u"FALSE").toBoolean());
  EXPECT_TRUE(Variant(u"-1").toBoolean());
  EXPECT_FALSE(Variant(u"0").toBoolean());
  EXPECT_TRUE(
      raisesRuntime([] { (void)Variant(u"yes").toBoolean(); }, RuntimeError::kTypeMismatch));
  EXPECT_TRUE(raisesRuntime([] { (void)Variant(40000).toInteger(); }, RuntimeError::kOverflow));
  EXPECT_TRUE(
      raisesRuntime([] { (void)Variant::null().toText(); }, RuntimeError::kInvalidUseOfNull));
  EXPECT_TRUE(
      raisesRuntime([] { (void)Variant::missing().toLong(); }, RuntimeError::kTypeMismatch));
  EXPECT_TRUE(raisesRuntime([] { (void)Variant(std::make_shared<clsMyErr>()).toText(); },
                            RuntimeError::kTypeMismatch));
  auto err = std::make_shared<clsMyErr>();
  EXPECT_EQ(Variant(err).toObjectOf<clsMyErr>(), err);
  EXPECT_EQ(Variant().toObject(), nullptr);
  EXPECT_TRUE(raisesRuntime([] { (void)Variant(3).toObject(); }, RuntimeError::kTypeMismatch));
}

}  // namespace
}  // namespace droqbxml

// Variants holding objects (other kinds: testdata/calls/runtime_conversions.txt).
#include <gtest/gtest.h>

#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/runtime/Variant.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raisesRuntime;

// Kind names and conversions between kinds: testdata/calls/runtime_conversions.txt.
TEST(VariantTest, ObjectsAndTheirNames) {
  auto err = std::make_shared<clsMyErr>();
  EXPECT_EQ(Variant(err).typeName(), u"clsMyErr");
  EXPECT_EQ(Variant(Ref<clsMyErr>()).typeName(), u"Nothing");
  EXPECT_TRUE(raisesRuntime([&] { (void)Variant(err).toText(); }, RuntimeError::kTypeMismatch));
  EXPECT_EQ(Variant(err).toObjectOf<clsMyErr>(), err);
  EXPECT_EQ(Variant().toObject(), nullptr);
  EXPECT_TRUE(raisesRuntime([] { (void)Variant(3).toObject(); }, RuntimeError::kTypeMismatch));
}

}  // namespace
}  // namespace droqbxml

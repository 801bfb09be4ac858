// DroXmlElement: the 16-bit attribute index at its very end (its other rules: in
// testdata/checks/element_and_builder_rules.txt).
#include <gtest/gtest.h>

#include <cstdint>
#include <memory>

#include "droqbxml/qbxml/DroXmlElement.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raisesRuntime;

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

}  // namespace
}  // namespace droqbxml

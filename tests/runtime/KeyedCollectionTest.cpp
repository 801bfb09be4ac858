// The keyed collection behind every ...Col class.
#include "droqbxml/runtime/KeyedCollection.hpp"

#include <gtest/gtest.h>

#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raisesRuntime;

TEST(KeyedCollectionTest, FindsByPositionAndByKeyInAnyCase) {
  KeyedCollection<int> col;
  col.Add(10, u"Ten");
  col.Add(20);
  col.Add(30, u"thirty");
  col.Add(40, u"");  // the empty key is no key
  EXPECT_EQ(col.Count(), 4);
  EXPECT_EQ(col.Item(2), 20);
  EXPECT_EQ(col.Item(u"TEN"), 10);
  EXPECT_EQ(col.Item(u"Thirty"), 30);
  EXPECT_TRUE(col.Contains(u"ten"));
  EXPECT_FALSE(col.Contains(u""));
}

TEST(KeyedCollectionTest, RefusesDuplicatesUnknownKeysAndBadPositions) {
  KeyedCollection<int> col;
  col.Add(1, u"a");
  EXPECT_TRUE(raisesRuntime([&] { col.Add(2, u"A"); }, RuntimeError::kDuplicateKey));
  EXPECT_EQ(col.Count(), 1);
  EXPECT_TRUE(raisesRuntime([&] { col.Item(u"b"); }, RuntimeError::kInvalidProcedureCall));
  EXPECT_TRUE(raisesRuntime([&] { col.Item(u""); }, RuntimeError::kInvalidProcedureCall));
  EXPECT_TRUE(raisesRuntime([&] { col.Item(0); }, RuntimeError::kInvalidProcedureCall));
  EXPECT_TRUE(raisesRuntime([&] { col.Item(2); }, RuntimeError::kInvalidProcedureCall));
  EXPECT_TRUE(raisesRuntime([&] { col.Remove(u"zz"); }, RuntimeError::kInvalidProcedureCall));
}

TEST(KeyedCollectionTest, RemovalKeepsKeysAndPositionsInStep) {
  KeyedCollection<int> col;
  col.Add(1, u"a");
  col.Add(2, u"b");
  col.Add(3, u"c");
  const auto snapshot = col.NewEnum();
  col.Remove(1);
  EXPECT_EQ(col.Item(u"c"), 3);
  EXPECT_EQ(col.Item(1), 2);
  col.Remove(u"B");
  EXPECT_EQ(col.Count(), 1);
  EXPECT_EQ(col.Item(u"c"), 3);
  col.Add(4, u"a");  // a removed key can be used again
  EXPECT_EQ((std::vector<int>(col.begin(), col.end())), (std::vector<int>{3, 4}));
  EXPECT_EQ(snapshot, (std::vector<int>{1, 2, 3}));

  // A copy keeps its own keys: removing from one leaves the other whole.
  KeyedCollection<int> copy = col;
  col.Remove(u"C");
  EXPECT_EQ(copy.Item(u"c"), 3);
  copy.Remove(u"A");
  EXPECT_EQ((std::vector<int>(copy.begin(), copy.end())), (std::vector<int>{3}));
  EXPECT_EQ((std::vector<int>(col.begin(), col.end())), (std::vector<int>{4}));
  EXPECT_EQ(col.Item(u"a"), 4);
}

}  // namespace
}  // namespace droqbxml

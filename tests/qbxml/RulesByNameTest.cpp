// The element's and the builder's own rules reached by name from one table: trimming,
// attribute order and the 16-bit index, OnError's alternatives, and the response success test.
#include <gtest/gtest.h>

#include "tests/ByNameTable.hpp"

namespace droqbxml {
namespace {

TEST(RulesByNameTest, EveryStepOfTheTable) {
  test::runByNameTable("checks/element_and_builder_rules.txt");
}

}  // namespace
}  // namespace droqbxml

// The records' setter rules reached by name from one table: trim rules, checks and limits,
// cut values, setters that ignore their argument, emptiness flags, and the items collection.
#include <gtest/gtest.h>

#include "tests/ByNameTable.hpp"

namespace droqbxml {
namespace {

TEST(SettersByNameTest, EveryStepOfTheTable) {
  test::runByNameTable("records/setters_by_name.txt");
}

}  // namespace
}  // namespace droqbxml

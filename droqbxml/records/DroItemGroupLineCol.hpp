// DroItemGroupLineCol: the member lines of a group item, read from a group response with a
// deliberately loose rule for duplicates.
#ifndef DROQBXML_RECORDS_DROITEMGROUPLINECOL_HPP_
#define DROQBXML_RECORDS_DROITEMGROUPLINECOL_HPP_

#include <cstdint>

#include "droqbxml/records/DroItemGroupLine.hpp"
#include "droqbxml/records/RecordCol.hpp"

namespace droqbxml {

class DroItemGroupLineCol final : public RecordCol<DroItemGroupLine> {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // Reads lines from the cursor until one reads empty; returns 0. A line with the same
  // Quantity, ItemRef.ListID or ItemRef.FullName as one already held (any one of the three)
  // is dropped; others are added under "KEY" + the item's full name, else its list id, else
  // the quantity, else without a key.
  int32_t ParseRs(const Text& Value, int32_t& StartPoint, int32_t& EndPoint);
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMGROUPLINECOL_HPP_

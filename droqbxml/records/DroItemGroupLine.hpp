// DroItemGroupLine: one member line of a group item: an item reference and a quantity.
#ifndef DROQBXML_RECORDS_DROITEMGROUPLINE_HPP_
#define DROQBXML_RECORDS_DROITEMGROUPLINE_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

class DroItemGroupLine final : public RecordOf<DroItemGroupLine> {
 public:
  static constexpr std::array<FieldSpec, 1> kFields{{
      listfields::named(listfields::kQuantity, u"Quantity"),
  }};

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const Text& Quantity() const { return field<u"Quantity">(); }
  void Quantity(const Text& v) { setField<u"Quantity">(v); }
  const ObjectProperty<DroItemRef>& ItemRef() const { return itemRef_.held(); }
  void ItemRef(Ref<DroItemRef> v) { itemRef_ = std::move(v); }

  // True when Quantity is "" and the item reference is empty.
  bool IsEmpty() const;
  // The item reference, then "Quantity", from the cursor (no line tag is searched).
  void ParseRs(const Text& Value, int32_t& StartPoint, int32_t& EndPoint);
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroItemRef> itemRef_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMGROUPLINE_HPP_

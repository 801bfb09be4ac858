// DroItemGroup: a group item, several items sold together, with its member lines
// (DroItemGroupLine: an item reference and a quantity) in a DroItemGroupLineCol.
#ifndef DROQBXML_RECORDS_DROITEMGROUP_HPP_
#define DROQBXML_RECORDS_DROITEMGROUP_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/ListRecord.hpp"
#include "droqbxml/records/RecordCol.hpp"

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
  const ObjectProperty<DroItemRef>& ItemRef() const { return itemRef_; }
  void ItemRef(Ref<DroItemRef> v) { itemRef_ = std::move(v); }

  // True when Quantity is "" and the item reference is empty.
  bool IsEmpty() const;
  // The item reference, then "Quantity", from the cursor (no line tag is searched).
  void ParseRs(const Text& Value, int32_t& StartPoint, int32_t& EndPoint);
  Text PrintOut() const;

 private:
  ObjectProperty<DroItemRef> itemRef_;
};

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

class DroItemGroup final : public ItemRecordOf<DroItemGroup> {
 public:
  static constexpr auto kFields =
      listfields::joined(listfields::kShortHeader, listfields::kItemDesc,
                         FieldSpec{u"IsPrintItemsInGroup", Trim::Spaces, Check::Bool});

  DroItemGroup() : ItemRecordOf(udItemGroup) {}
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const Text& IsPrintItemsInGroup() const { return field<u"IsPrintItemsInGroup">(); }
  void IsPrintItemsInGroup(const Text& v) { setField<u"IsPrintItemsInGroup">(v); }
  const ObjectProperty<DroItemGroupLineCol>& ItemGroupLines() const { return itemGroupLines_; }
  void ItemGroupLines(Ref<DroItemGroupLineCol> v) { itemGroupLines_ = std::move(v); }

  // As DroAccount::ParseRs, for "<ItemGroupRet>" (StartPoint by reference, unchanged); the
  // member lines are read after the header.
  int32_t ParseRs(const Text& Value, const int32_t& StartPoint = 0);
  Text PrintOut() const;

 private:
  ObjectProperty<DroItemGroupLineCol> itemGroupLines_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMGROUP_HPP_

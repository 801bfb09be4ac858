// DroItemGroup: a group item, several items sold together, with its member lines in a
// DroItemGroupLineCol.
#ifndef DROQBXML_RECORDS_DROITEMGROUP_HPP_
#define DROQBXML_RECORDS_DROITEMGROUP_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroItemGroupLineCol.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

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
  const ObjectProperty<DroItemGroupLineCol>& ItemGroupLines() const {
    return itemGroupLines_.held();
  }
  void ItemGroupLines(Ref<DroItemGroupLineCol> v) { itemGroupLines_ = std::move(v); }

  // As DroAccount::ParseRs, for "<ItemGroupRet>" (StartPoint by reference, unchanged); the
  // member lines are read after the header.
  int32_t ParseRs(const Text& Value, const int32_t& StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, const int32_t& StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroItemGroupLineCol> itemGroupLines_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMGROUP_HPP_

// DroItemSalesTaxGroup: sales tax items charged together. Parsing takes its members as
// DroItemSalesTax records; the add request takes them as DroItemSalesTaxRef references.
#ifndef DROQBXML_RECORDS_DROITEMSALESTAXGROUP_HPP_
#define DROQBXML_RECORDS_DROITEMSALESTAXGROUP_HPP_

#include <cstdint>

#include "droqbxml/records/DroItemsCol.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

class DroItemSalesTaxGroup final : public ItemRecordOf<DroItemSalesTaxGroup> {
 public:
  static constexpr auto kFields = listfields::kShortItemFields;

  DroItemSalesTaxGroup() : ItemRecordOf(udItemSalesTaxGroup) {}
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // The group's members. Parsing takes them as DroItemSalesTax records; the add request
  // takes them as DroItemSalesTaxRef references.
  const ObjectProperty<DroItemsCol>& ItemSalesTaxRefs() const { return itemSalesTaxRefs_.held(); }
  void ItemSalesTaxRefs(Ref<DroItemsCol> v) { itemSalesTaxRefs_ = std::move(v); }

  // As DroAccount::ParseRs, for "<ItemSalesTaxGroupRet>"; then every member, in order, runs
  // its own ParseRs on the same text from the group's start (a member of another class is
  // the runtime's 13).
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, int32_t StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroItemsCol> itemSalesTaxRefs_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMSALESTAXGROUP_HPP_

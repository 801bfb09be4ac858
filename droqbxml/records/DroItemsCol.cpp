// The items collection: choosing the record class in Add.
#include "droqbxml/records/DroItemsCol.hpp"

#include <array>
#include <memory>
#include <optional>

#include "droqbxml/qbxml/Enumerations.hpp"
#include "droqbxml/records/DroItemInventory.hpp"
#include "droqbxml/records/DroItemSalesTax.hpp"
#include "droqbxml/records/DroItemSubtotal.hpp"
#include "droqbxml/records/DroSalesItems.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {
namespace {

struct CreatableKind {
  udItemType number;
  TextView name;
  Ref<Object> (*create)();
};

template <class T>
Ref<Object> make() {
  return std::make_shared<T>();
}

// Compared in this order; the first match decides.
constexpr std::array<CreatableKind, 6> kCreatable{{
    {udItemNonInventory, u"ItemNonInventory", &make<DroItemNonInventory>},
    {udItemInventory, u"ItemInventory", &make<DroItemInventory>},
    {udItemSubtotal, u"ItemSubtotal", &make<DroItemSubtotal>},
    {udItemSalesTax, u"ItemSalesTax", &make<DroItemSalesTax>},
    {udItemOtherCharge, u"ItemOtherCharge", &make<DroItemOtherCharge>},
    {udItemService, u"ItemService", &make<DroItemService>},
}};

// The kind as a 32-bit number, when it is a number or numeric text.
std::optional<int32_t> kindNumber(const Variant& kind) {
  try {
    return kind.toLong();
  } catch (const ComError&) {
    return std::nullopt;  // not numeric: compared by name
  }
}

}  // namespace

const ClassInfo& DroItemsCol::typeInfo() {
  static const ClassInfo info = [] {
    Members members;
    members.method(u"Add", &DroItemsCol::Add).optional(1);
    addCommonMembers(members);
    return ClassInfo(u"DroItemsCol", members.take());
  }();
  return info;
}

Ref<Object> DroItemsCol::Add(const Variant& ItemType, const Text& skey) {
  const std::optional<int32_t> number =
      ItemType.isObject() || ItemType.isMissing() ? std::nullopt : kindNumber(ItemType);
  const bool byName = ItemType.kind() == Variant::Kind::String;
  const Text name = byName ? ItemType.toText() : Text();
  for (const CreatableKind& kind : kCreatable) {
    if ((number && *number == kind.number) || (byName && name == kind.name)) {
      Ref<Object> item = kind.create();
      append(item, skey);
      return item;
    }
  }
  return nullptr;
}

}  // namespace droqbxml

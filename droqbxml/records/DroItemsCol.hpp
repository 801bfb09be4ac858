// DroItemsCol: an ordered keyed collection of item records of mixed kinds. Its Add creates
// the member itself from a kind given as a number or a name; only six kinds can be created
// so. Used for a sales tax group's members and as the host's one shared items collection
// (the facade's qbXMLItemsCol).
#ifndef DROQBXML_RECORDS_DROITEMSCOL_HPP_
#define DROQBXML_RECORDS_DROITEMSCOL_HPP_

#include "droqbxml/records/RecordCol.hpp"

namespace droqbxml {

class DroItemsCol final : public CollectionOf<Object> {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // Creates an empty record of the kind ItemType names (0 or "ItemNonInventory", 2 or
  // "ItemInventory", 1 or "ItemSubtotal", 7 or "ItemSalesTax", 5 or "ItemOtherCharge", 9 or
  // "ItemService"; a number, or numeric text, is compared as a 32-bit integer, other text
  // exactly) and appends it under skey when that is not "". Any other kind adds nothing and
  // gives nothing, without an error: only these six are created through the collection.
  // A duplicate key is 457.
  Ref<Object> Add(const Variant& ItemType, const Text& skey = u"");
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMSCOL_HPP_

// What a collection takes for a position.
#include "droqbxml/records/RecordCol.hpp"

namespace droqbxml {

bool isCollectionPosition(const Variant& vntIndexKey) {
  switch (vntIndexKey.kind()) {
    case Variant::Kind::Integer:
    case Variant::Kind::Long:
    case Variant::Kind::Double:
    case Variant::Kind::Currency:
    case Variant::Kind::Boolean:
      return true;
    default:
      return false;
  }
}

}  // namespace droqbxml

// The snapshot enumerator of collections.
#include "droqbxml/runtime/Enumerator.hpp"

#include "droqbxml/runtime/Binding.hpp"

namespace droqbxml {

const ClassInfo& Enumerator::typeInfo() {
  static const ClassInfo info(
      u"Enumerator",
      Members().method(u"Next", &Enumerator::Next).method(u"Reset", &Enumerator::Reset).take());
  return info;
}

Variant Enumerator::Next() { return next_ < items_.size() ? items_[next_++] : Variant(); }

}  // namespace droqbxml

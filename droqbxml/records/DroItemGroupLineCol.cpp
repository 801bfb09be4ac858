// The member lines of a group item.
#include "droqbxml/records/DroItemGroupLineCol.hpp"

#include <memory>

namespace droqbxml {

const ClassInfo& DroItemGroupLineCol::typeInfo() {
  static const ClassInfo info = [] {
    Members members = collectionMembers();
    members.method(u"ParseRs", &DroItemGroupLineCol::ParseRs);
    return ClassInfo(u"DroItemGroupLineCol", members.take());
  }();
  return info;
}

int32_t DroItemGroupLineCol::ParseRs(const Text& Value, int32_t& StartPoint, int32_t& EndPoint) {
  for (;;) {
    auto line = std::make_shared<DroItemGroupLine>();
    line->ParseRs(Value, StartPoint, EndPoint);
    if (line->IsEmpty()) return 0;
    // Deliberately loose: one equal field of the three makes a duplicate, so two members
    // with the same quantity keep only the first.
    bool duplicate = false;
    for (const auto& held : *this) {
      duplicate = duplicate || held->Quantity() == line->Quantity() ||
                  held->ItemRef()->ListID() == line->ItemRef()->ListID() ||
                  held->ItemRef()->FullName() == line->ItemRef()->FullName();
    }
    if (duplicate) continue;
    const DroItemRef& item = *line->ItemRef();
    const Text& key = !item.FullName().empty() ? item.FullName()
                      : !item.ListID().empty() ? item.ListID()
                                               : line->Quantity();
    Add(key.empty() ? Text() : u"KEY" + key, line);
  }
}

}  // namespace droqbxml

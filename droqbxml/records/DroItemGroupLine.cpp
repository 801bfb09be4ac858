// A group item's member line.
#include "droqbxml/records/DroItemGroupLine.hpp"

namespace droqbxml {

const ClassInfo& DroItemGroupLine::typeInfo() {
  using C = DroItemGroupLine;
  static const ClassInfo info = [] {
    Members members;
    addFieldMembers(members, kFields);
    members.property(u"ItemRef", &C::ItemRef, &C::ItemRef)
        .getter(u"IsEmpty", &C::IsEmpty)
        .method(u"ParseRs", &C::ParseRs)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroItemGroupLine", members.take());
  }();
  return info;
}

bool DroItemGroupLine::IsEmpty() const { return Quantity().empty() && itemRef_->IsEmpty(); }

void DroItemGroupLine::ParseRs(const Text& Value, int32_t& StartPoint, int32_t& EndPoint) {
  itemRef_.ParseRs(u"ItemRef", Value, StartPoint, EndPoint);
  FieldReader<DroItemGroupLine>(*this, Value, StartPoint, EndPoint).optional<u"Quantity">();
}

Text DroItemGroupLine::PrintOut() const {
  DumpWriter dump(u"ITEM GROUP LINE:");
  dump.block(u"ITEMREF:", itemRef_->PrintOut(), u"/ITEMREF");
  dump.fields<u"Quantity">(*this);
  return dump.take();
}

}  // namespace droqbxml

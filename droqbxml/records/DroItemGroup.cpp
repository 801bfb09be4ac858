// The group item.
#include "droqbxml/records/DroItemGroup.hpp"

namespace droqbxml {

const ClassInfo& DroItemGroup::typeInfo() {
  using C = DroItemGroup;
  static const ClassInfo info = [] {
    Members members = itemMembers();
    members.property(u"ItemGroupLines", &C::ItemGroupLines, &C::ItemGroupLines)
        .method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroItemGroup", members.take());
  }();
  return info;
}

int32_t DroItemGroup::ParseRs(const Text& Value, const int32_t& StartPoint) {
  return parseList(Value, StartPoint, u"<ItemGroupRet>", [&](Reader& read, int32_t& s, int32_t& e) {
    readHeader(read);
    read.required<u"IsActive">();
    read.optional<u"ItemDesc", u"IsPrintItemsInGroup">();
    itemGroupLines_->ParseRs(Value, s, e);
  });
}

Text DroItemGroup::PrintOut() const {
  DumpWriter dump = dumpHeader(u"ITEM GROUP:", true);
  dump.fields<u"IsActive", u"ItemDesc", u"IsPrintItemsInGroup">(*this);
  for (const auto& line : *itemGroupLines_) {
    dump.block(u"ITEMGROUPLINE:", line->PrintOut(), u"/ITEMGROUPLINE");
  }
  return dump.take();
}

}  // namespace droqbxml

// The subtotal item.
#include "droqbxml/records/DroItemSubtotal.hpp"

namespace droqbxml {

const ClassInfo& DroItemSubtotal::typeInfo() {
  using C = DroItemSubtotal;
  static const ClassInfo info = [] {
    Members members = itemMembers();
    members.method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroItemSubtotal", members.take());
  }();
  return info;
}

int32_t DroItemSubtotal::ParseRs(const Text& Value, int32_t StartPoint) {
  return parseList(Value, StartPoint, u"<ItemSubtotalRet>", [](Reader& read, int32_t&, int32_t&) {
    readHeader(read);
    read.required<u"IsActive">();
    read.optional<u"ItemDesc">();
  });
}

Text DroItemSubtotal::PrintOut() const {
  DumpWriter dump = dumpHeader(u"ITEM SUBTOTAL:", false);
  dump.fields<u"IsActive", u"ItemDesc">(*this);
  return dump.take();
}

}  // namespace droqbxml

// The group item, its member lines and their collection.
#include "droqbxml/records/DroItemGroup.hpp"

#include <memory>

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
  itemRef_->ParseRs(u"ItemRef", Value, StartPoint, EndPoint);
  FieldReader<DroItemGroupLine>(*this, Value, StartPoint, EndPoint).optional<u"Quantity">();
}

Text DroItemGroupLine::PrintOut() const {
  DumpWriter dump(u"ITEM GROUP LINE:");
  dump.block(u"ITEMREF:", itemRef_->PrintOut(), u"/ITEMREF");
  dump.fields<u"Quantity">(*this);
  return dump.take();
}

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

const ClassInfo& DroItemGroup::typeInfo() {
  using C = DroItemGroup;
  static const ClassInfo info = [] {
    Members members = itemMembers();
    members.property(u"ItemGroupLines", &C::ItemGroupLines, &C::ItemGroupLines)
        .method(u"ParseRs", &C::ParseRs)
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

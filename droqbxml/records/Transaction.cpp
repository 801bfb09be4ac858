// Transaction lines, line groups and their collections, instantiated once for estimates
// and once for invoices.
#include "droqbxml/records/Transaction.hpp"

#include <memory>

#include "droqbxml/records/basCommonProcs.hpp"

namespace droqbxml {
namespace {

using basCommonProcs::findInResponse;
using basCommonProcs::getElementValue;

// Reads the text of element `name` from the cursor without moving it.
Text peekElement(const Text& value, TextView name, int32_t& start, int32_t end, bool required,
                 TextView parent) {
  return getElementValue(value, name, start, end, required, parent);
}

// Whether to let errors of a fresh member's add and parse reach the caller.
enum class Fresh : bool { Suppressed, Raises };

// Reads into the member held under key, else into a fresh member added under it (without a
// key when key is ""). Errors of an existing member's parse are swallowed, as the loops have
// always done; those of the fresh member's add and parse as `fresh` says.
template <class T, class Parse>
void parseKeyed(RecordCol<T>& members, const Text& key, Fresh fresh, Parse parse) {
  // Looked up without raising: a missing key is the lookup's only failure.
  if (members.Contains(key)) {
    try {
      parse(*members.Item(Variant(key)));
    } catch (const ComError&) {
    }
    return;
  }
  if (fresh == Fresh::Raises) {
    parse(*members.Add(key));
    return;
  }
  try {
    parse(*members.Add(key));
  } catch (const ComError&) {
  }
}

// Moves a cursor that a loop round left where it was past the tag the round found, so
// every loop ends.
void moveOn(int32_t& end, int32_t before, int32_t tagAt, TextView tag) {
  if (end == before) end = tagAt + static_cast<int32_t>(tag.size());
}

}  // namespace

// ---- lines

template <TxnKind Kind>
const ClassInfo& DroTxnLine<Kind>::typeInfo() {
  using C = DroTxnLine<Kind>;
  static const ClassInfo info = [] {
    Members members;
    members.property(u"ItemRef", &C::ItemRef, &C::ItemRef)
        .property(u"ClassRef", &C::ClassRef, &C::ClassRef)
        .property(u"SalesTaxCodeRef", &C::SalesTaxCodeRef, &C::SalesTaxCodeRef);
    Record::addFieldMembers(members, kFields);
    members.property(u"ItemType", &C::ItemType, &C::ItemType)
        .method(u"ParseRs", &C::ParseRs)
        .getter(u"PrintOut", &C::PrintOut)
        .method(u"Class_Treminate", &C::Class_Treminate);
    return ClassInfo(Text(kSpec.lineClass), members.take());
  }();
  return info;
}

template <TxnKind Kind>
void DroTxnLine<Kind>::ParseRs(const Text& Value, int32_t& StartPoint, int32_t& EndPoint) {
  FieldReader<DroTxnLine> read(*this, Value, StartPoint, EndPoint, kSpec.lineContext);
  read.template required<u"TxnLineID">();
  itemRef_.ParseRs(u"ItemRef", Value, StartPoint, EndPoint);
  read.template optional<u"Desc", u"Quantity", u"Rate", u"RatePercent">();
  classRef_.ParseRs(u"ClassRef", Value, StartPoint, EndPoint);
  read.template optional<u"Amount">();
  salesTaxCodeRef_.ParseRs(u"SalesTaxCodeRef", Value, StartPoint, EndPoint);
  if constexpr (kEstimate) read.template optional<u"MarkupRate", u"MarkupRatePercent">();
}

template <TxnKind Kind>
Text DroTxnLine<Kind>::PrintOut() const {
  DumpWriter dump(kSpec.lineHeading);
  dump.untabbed(u"TxnLineID", TxnLineID());
  dump.block(u"ITEMREF:", itemRef_->PrintOut(), u"/ITEMREF");
  dump.fields<u"Desc", u"Quantity", u"Rate", u"RatePercent">(*this);
  dump.block(u"CLASSREF:", classRef_->PrintOut(), u"/CLASSREF");
  dump.fields<u"Amount">(*this);
  dump.block(u"SALESTAXCODEREF:", salesTaxCodeRef_->PrintOut(), u"/SALESTAXCODEREF");
  if constexpr (kEstimate) dump.fields<u"MarkupRate", u"MarkupRatePercent">(*this);
  return dump.take();
}

template <TxnKind Kind>
void DroTxnLine<Kind>::Class_Treminate() {
  itemRef_ = nullptr;
  classRef_ = nullptr;
  salesTaxCodeRef_ = nullptr;
}

template <TxnKind Kind>
const ClassInfo& DroTxnLineCol<Kind>::typeInfo() {
  static const ClassInfo info = [] {
    Members members = DroTxnLineCol::collectionMembers();
    members.method(u"ParseRs", &DroTxnLineCol::ParseRs);
    return ClassInfo(Text(kTxnKinds[static_cast<size_t>(Kind)].lineColClass), members.take());
  }();
  return info;
}

template <TxnKind Kind>
void DroTxnLineCol<Kind>::ParseRs(const Text& Value, int32_t& StartPoint, int32_t& EndPoint) {
  const internal::SearchScope scope(Value);
  const TextView tag = kTxnKinds[static_cast<size_t>(Kind)].lineTag;
  const auto parse = [&](DroTxnLine<Kind>& line) { line.ParseRs(Value, StartPoint, EndPoint); };
  // Set by the first description that matches a member and never cleared: after it, a
  // description that matches no member adds nothing. Hosts have always had it so.
  bool found = false;
  for (;;) {
    const int32_t lineAt = findInResponse(EndPoint, Value, tag);
    if (lineAt == 0) return;
    const int32_t before = EndPoint;
    // Not bounded by the line: a line without an item takes a later line's item.
    const int32_t itemAt = findInResponse(lineAt, Value, u"<ItemRef>");
    if (itemAt != 0) {
      StartPoint = itemAt;
      // The first full name after the cursor, not after the "<ItemRef>" found.
      const Text key = peekElement(Value, u"FullName", StartPoint, EndPoint, false, {});
      parseKeyed(*this, key, Fresh::Raises, parse);
    } else {
      const Text desc = peekElement(Value, u"Desc", StartPoint, EndPoint, false, {});
      if (StartPoint == 0) {
        parse(*this->Add(desc));
      } else {
        for (const auto& member : *this) {
          if (member->Desc() != desc) continue;
          try {
            parse(*member);
          } catch (const ComError&) {
          }
          found = true;
          break;
        }
        if (!found) parse(*this->Add(desc));
      }
    }
    moveOn(EndPoint, before, lineAt, tag);
  }
}

// ---- groups

template <TxnKind Kind>
const ClassInfo& DroTxnLineGroup<Kind>::typeInfo() {
  using C = DroTxnLineGroup<Kind>;
  static const ClassInfo info = [] {
    Members members;
    members.property(u"ItemGroupRef", &C::ItemGroupRef, &C::ItemGroupRef);
    if constexpr (kEstimate) {
      members.property(u"EstimateLines", &C::EstimateLines, &C::EstimateLines);
    } else {
      members.property(u"InvoiceLines", &C::InvoiceLines, &C::InvoiceLines);
    }
    Record::addFieldMembers(members, kFields);
    members.getter(u"IsEmpty", &C::IsEmpty)
        .method(u"ParseRs", &C::ParseRs)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(Text(kSpec.groupClass), members.take());
  }();
  return info;
}

template <TxnKind Kind>
Variant DroTxnLineGroup<Kind>::IsEmpty() const {
  bool empty = itemGroupRef_->IsEmpty() && lines_->Count() == 0;
  for (size_t i = 0; i < kFields.size(); ++i) empty = empty && this->fieldValue(i).empty();
  isEmpty_ = empty;
  return Variant(isEmpty_);
}

template <TxnKind Kind>
void DroTxnLineGroup<Kind>::ParseRs(const Text& Value, int32_t& StartPoint, int32_t& EndPoint) {
  const internal::SearchScope scope(Value);
  const Text context(kSpec.groupContext);
  itemGroupRef_.ParseRs(u"ItemGroupRef", Value, StartPoint, EndPoint, true, context);
  FieldReader<DroTxnLineGroup> read(*this, Value, StartPoint, EndPoint, context);
  read.template optional<u"Desc", u"Quantity">();
  read.template required<u"IsPrintItemsInGroup">();
  read.template optional<u"TotalAmount">();
  lines_->ParseRs(Value, StartPoint, EndPoint);
}

template <TxnKind Kind>
Text DroTxnLineGroup<Kind>::PrintOut() const {
  DumpWriter dump(kSpec.groupHeading);
  dump.block(u"ITEMGROUPREF:", itemGroupRef_->PrintOut(), u"/ITEMGROUPREF");
  dump.fields<u"Desc", u"Quantity", u"IsPrintItemsInGroup", u"TotalAmount">(*this);
  Text text = dump.take();
  // Each line's block replaces what was built, so only the last one remains: the group
  // dump hosts have always received.
  for (const auto& line : *lines_) {
    text =
        Text(kSpec.linesOpening) + u"\r\n" + line->PrintOut() + u"\r\n" + Text(kSpec.linesClosing);
  }
  return text;
}

template <TxnKind Kind>
const ClassInfo& DroTxnLineGroupCol<Kind>::typeInfo() {
  static const ClassInfo info(Text(kTxnKinds[static_cast<size_t>(Kind)].groupColClass),
                              DroTxnLineGroupCol::collectionMembers().take());
  return info;
}

template <TxnKind Kind>
void readGroups(DroTxnLineGroupCol<Kind>& groups, const Text& Value, int32_t& StartPoint,
                int32_t& EndPoint) {
  const TxnKindSpec& kind = kTxnKinds[static_cast<size_t>(Kind)];
  const auto parse = [&](DroTxnLineGroup<Kind>& group) {
    group.ParseRs(Value, StartPoint, EndPoint);
  };
  for (;;) {
    const int32_t groupAt = findInResponse(EndPoint, Value, kind.groupTag);
    if (groupAt == 0) return;
    const int32_t before = EndPoint;
    // The key read raises as every read does; the rest of the round swallows its errors.
    const Text key = peekElement(Value, u"FullName", StartPoint, EndPoint, kind.groupKeyRequired,
                                 kind.groupContext);
    parseKeyed(groups, key, Fresh::Suppressed, parse);
    moveOn(EndPoint, before, groupAt, kind.groupTag);
  }
}

// Lines and line groups member by member: instantiating the whole class would also
// instantiate the other kind's field accessors, whose constraints clang 14 does not honour
// in an explicit instantiation.
template const ClassInfo& DroTxnLine<TxnKind::Estimate>::typeInfo();
template void DroTxnLine<TxnKind::Estimate>::ParseRs(const Text&, int32_t&, int32_t&);
template Text DroTxnLine<TxnKind::Estimate>::PrintOut() const;
template void DroTxnLine<TxnKind::Estimate>::Class_Treminate();
template const ClassInfo& DroTxnLine<TxnKind::Invoice>::typeInfo();
template void DroTxnLine<TxnKind::Invoice>::ParseRs(const Text&, int32_t&, int32_t&);
template Text DroTxnLine<TxnKind::Invoice>::PrintOut() const;
template void DroTxnLine<TxnKind::Invoice>::Class_Treminate();
template const ClassInfo& DroTxnLineGroup<TxnKind::Estimate>::typeInfo();
template Variant DroTxnLineGroup<TxnKind::Estimate>::IsEmpty() const;
template void DroTxnLineGroup<TxnKind::Estimate>::ParseRs(const Text&, int32_t&, int32_t&);
template Text DroTxnLineGroup<TxnKind::Estimate>::PrintOut() const;
template const ClassInfo& DroTxnLineGroup<TxnKind::Invoice>::typeInfo();
template Variant DroTxnLineGroup<TxnKind::Invoice>::IsEmpty() const;
template void DroTxnLineGroup<TxnKind::Invoice>::ParseRs(const Text&, int32_t&, int32_t&);
template Text DroTxnLineGroup<TxnKind::Invoice>::PrintOut() const;
template class DroTxnLineCol<TxnKind::Estimate>;
template class DroTxnLineCol<TxnKind::Invoice>;
template class DroTxnLineGroupCol<TxnKind::Estimate>;
template class DroTxnLineGroupCol<TxnKind::Invoice>;
template void readGroups(DroTxnLineGroupCol<TxnKind::Estimate>&, const Text&, int32_t&, int32_t&);
template void readGroups(DroTxnLineGroupCol<TxnKind::Invoice>&, const Text&, int32_t&, int32_t&);

}  // namespace droqbxml

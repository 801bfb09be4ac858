// The list records that QuickBooks returns as "...Ret" elements and that are found by their
// request identifier: accounts, the eleven item kinds and the payment method. Here are
// their shared header rows (each defined once; a class lists the rows it has in its own
// table), typed access to those rows, and the frame of their ParseRs and PrintOut.
#ifndef DROQBXML_RECORDS_LISTRECORD_HPP_
#define DROQBXML_RECORDS_LISTRECORD_HPP_

#include <array>
#include <cstddef>
#include <cstdint>

#include "droqbxml/qbxml/Enumerations.hpp"
#include "droqbxml/records/Record.hpp"
#include "droqbxml/records/internal/TextSearch.hpp"

namespace droqbxml {

namespace listfields {
inline constexpr FieldSpec kRequestID{u"RequestID", Trim::None, Check::None};
inline constexpr FieldSpec kListID{u"ListID", Trim::Spaces, Check::Id};
inline constexpr FieldSpec kTimeCreated{u"TimeCreated", Trim::Spaces, Check::DateTime};
inline constexpr FieldSpec kTimeModified{u"TimeModified", Trim::Spaces, Check::DateTime};
inline constexpr FieldSpec kEditSequence{u"EditSequence", Trim::None, Check::IntLength, 16};
inline constexpr FieldSpec kName{u"Name", Trim::Spaces, Check::Str, 31};
inline constexpr FieldSpec kFullName{u"FullName", Trim::Spaces, Check::Str, 159};
inline constexpr FieldSpec kIsActive{u"IsActive", Trim::Spaces, Check::Bool};
inline constexpr FieldSpec kSublevel{u"Sublevel", Trim::Spaces, Check::IntRange, 4};
inline constexpr FieldSpec kItemDesc{u"ItemDesc", Trim::None, Check::Str, 4095};
inline constexpr FieldSpec kDescription{u"", Trim::None, Check::Str, 4095};  // named per use
inline constexpr FieldSpec kPrice{u"", Trim::Spaces, Check::Price};          // named per use
inline constexpr FieldSpec kQuantity{u"", Trim::Spaces, Check::Quan};        // named per use

// A row of a shared shape under its own name.
constexpr FieldSpec named(const FieldSpec& shape, std::u16string_view name) {
  FieldSpec row = shape;
  row.name = name;
  return row;
}

// The header every list record starts its table with, and the longer one of the kinds that
// also have FullName and Sublevel.
inline constexpr std::array<FieldSpec, 7> kShortHeader{
    {kRequestID, kListID, kTimeCreated, kTimeModified, kEditSequence, kName, kIsActive}};
inline constexpr std::array<FieldSpec, 9> kLongHeader{{kRequestID, kListID, kTimeCreated,
                                                       kTimeModified, kEditSequence, kName,
                                                       kFullName, kIsActive, kSublevel}};

// A header followed by the record's own rows.
template <size_t A, size_t B>
constexpr std::array<FieldSpec, A + B> joined(const std::array<FieldSpec, A>& head,
                                              const std::array<FieldSpec, B>& own) {
  std::array<FieldSpec, A + B> rows{};
  for (size_t i = 0; i < A; ++i) rows[i] = head[i];
  for (size_t i = 0; i < B; ++i) rows[A + i] = own[i];
  return rows;
}
template <size_t A, class... Rows>
constexpr auto joined(const std::array<FieldSpec, A>& head, const Rows&... own) {
  return joined(head, std::array<FieldSpec, sizeof...(Rows)>{own...});
}
// The rows of the item kinds that have a description but no FullName and Sublevel.
inline constexpr auto kShortItemFields = joined(kShortHeader, kItemDesc);
}  // namespace listfields

template <class Derived>
class ListRecordOf : public RecordOf<Derived> {
 public:
  // constexpr, not consteval: clang before 15 evaluates a consteval call in a template
  // before Derived, and so its table, is complete.
  static constexpr bool has(std::u16string_view name) {
    for (const auto& row : Derived::kFields) {
      if (row.name == name) return true;
    }
    return false;
  }

  const Text& RequestID() const { return this->template field<u"RequestID">(); }
  void RequestID(const Text& v) { this->template setField<u"RequestID">(v); }
  const Text& ListID() const { return this->template field<u"ListID">(); }
  void ListID(const Text& v) { this->template setField<u"ListID">(v); }
  const Text& TimeCreated() const { return this->template field<u"TimeCreated">(); }
  void TimeCreated(const Text& v) { this->template setField<u"TimeCreated">(v); }
  const Text& TimeModified() const { return this->template field<u"TimeModified">(); }
  void TimeModified(const Text& v) { this->template setField<u"TimeModified">(v); }
  const Text& EditSequence() const { return this->template field<u"EditSequence">(); }
  void EditSequence(const Text& v) { this->template setField<u"EditSequence">(v); }
  const Text& Name() const { return this->template field<u"Name">(); }
  void Name(const Text& v) { this->template setField<u"Name">(v); }
  const Text& IsActive() const { return this->template field<u"IsActive">(); }
  void IsActive(const Text& v) { this->template setField<u"IsActive">(v); }
  const Text& FullName() const requires(has(u"FullName")) {
    return this->template field<u"FullName">();
  }
  void FullName(const Text& v) requires(has(u"FullName")) {
    this->template setField<u"FullName">(v);
  }
  const Text& Sublevel() const requires(has(u"Sublevel")) {
    return this->template field<u"Sublevel">();
  }
  void Sublevel(const Text& v) requires(has(u"Sublevel")) {
    this->template setField<u"Sublevel">(v);
  }
  const Text& ItemDesc() const requires(has(u"ItemDesc")) {
    return this->template field<u"ItemDesc">();
  }
  void ItemDesc(const Text& v) requires(has(u"ItemDesc")) {
    this->template setField<u"ItemDesc">(v);
  }

 protected:
  using Reader = FieldReader<Derived>;

  // Finds the record's own response (findOwnResponse) from StartPoint; when found, reads it
  // with body(reader, start, end), the reader naming returnTag as the parent of required
  // elements, and returns the clamped start; otherwise what findOwnResponse says.
  template <class Body>
  int32_t parseList(const Text& Value, int32_t StartPoint, TextView returnTag, Body body) {
    const internal::SearchScope scope(Value);
    const OwnResponse own = findOwnResponse(Value, StartPoint, returnTag, RequestID());
    if (!own.found) return own.result;
    int32_t start = own.cursor;
    int32_t end = own.cursor;
    Reader read(static_cast<Derived&>(*this), Value, start, end, Text(returnTag));
    body(read, start, end);
    return own.result;
  }

  // "ListID" through "Name", "FullName" where the record has it, each required.
  static void readHeader(Reader& read) {
    read.template required<u"ListID", u"TimeCreated", u"TimeModified", u"EditSequence", u"Name">();
    if constexpr (has(u"FullName")) read.template required<u"FullName">();
  }

  // The heading, "RequestID" (without its TAB where the record prints it so), then "ListID"
  // through "Name" and "FullName" where the record has it.
  DumpWriter dumpHeader(TextView heading, bool requestIdTabbed) const {
    DumpWriter dump(heading);
    const auto& self = static_cast<const Derived&>(*this);
    if (requestIdTabbed) {
      dump.field(u"RequestID", RequestID());
    } else {
      dump.untabbed(u"RequestID", RequestID());
    }
    dump.template fields<u"ListID", u"TimeCreated", u"TimeModified", u"EditSequence", u"Name">(
        self);
    if constexpr (has(u"FullName")) dump.template fields<u"FullName">(self);
    return dump;
  }
};

// An item kind: a list record with its kind in ItemType, set when it is created and free
// for the host to change (nothing checks it).
template <class Derived>
class ItemRecordOf : public ListRecordOf<Derived> {
 public:
  udItemType ItemType() const { return itemType_; }
  void ItemType(udItemType v) { itemType_ = v; }

 protected:
  explicit ItemRecordOf(udItemType type) : itemType_(type) {}
  // The members every item kind starts with: ItemType, then its text fields.
  static Members itemMembers() {
    Members members;
    members.property(u"ItemType", &ItemRecordOf::ItemType, &ItemRecordOf::ItemType);
    Record::addFieldMembers(members, Derived::kFields);
    return members;
  }

 private:
  udItemType itemType_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_LISTRECORD_HPP_

// The record engine. A record class declares its text fields once, as a constexpr table of
// rows in interface order (name, trim rule, check, check argument, whether it has an
// "_XmlUnEscaped" twin, and a named setter rule where the setter does something unusual).
// The engine does the rest: trimming, checking and storing on set, the late-bound members
// (getter, setter, unescaped getter) derived from the table, and the reading and printing
// helpers through which each record writes its own parse and dump orders, naming fields
// by their table names (checked when compiled).
#ifndef DROQBXML_RECORDS_RECORD_HPP_
#define DROQBXML_RECORDS_RECORD_HPP_

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "droqbxml/records/basCommonProcs.hpp"
#include "droqbxml/runtime/Binding.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Object.hpp"
#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

enum class Trim : uint8_t { None, Spaces };

// The value check a setter applies after trimming (see basValidations); arg is the maximum
// length for Str and StrCut (0: none), the mode for Int, the longest text for IntLength and
// the highest value for IntRange (whose lowest is 0).
enum class Check : uint8_t {
  None,
  Str,
  StrCut,  // a longer text is cut to arg characters without an error
  Int,
  IntLength,
  IntRange,
  Bool,
  Date,
  DateTime,
  Amt,
  Price,
  Quan,
  Percent,
  Id,
  JobStatus,
  AccountType,
  WageType
};

// Setters that do something besides trim, check and store. The engine runs the generic
// ones; a record that uses a record-specific rule implements applyRule.
enum class Rule : uint8_t {
  None,
  KeepsStoredValue,  // the argument is discarded: the field keeps what it holds
  Specific,          // the record's own code (applyRule)
};

struct FieldSpec {
  std::u16string_view name;
  Trim trim = Trim::Spaces;
  Check check = Check::None;
  int32_t arg = 0;
  bool unescaped = false;
  Rule rule = Rule::None;
};

// A field name written in code, checked against the record's table when compiled.
template <size_t N>
struct FieldName {
  char16_t chars[N]{};
  constexpr FieldName(const char16_t (&text)[N]) {
    for (size_t i = 0; i < N; ++i) chars[i] = text[i];
  }
  constexpr std::u16string_view view() const { return {chars, N - 1}; }
};

template <size_t K>
consteval size_t fieldIndex(const std::array<FieldSpec, K>& fields, std::u16string_view name) {
  for (size_t i = 0; i < K; ++i) {
    if (fields[i].name == name) return i;
  }
  throw "no field of that name in this record";  // a compile-time error in a consteval call
}

// An object property of a record (a reference, an address, a companion record, a line
// collection): it holds a fresh object from the start, as far as anyone can tell, and the
// host may replace it, "nothing" included (Set rec.BillAddress = Nothing). It hands out
// the reference as it is; whatever uses the sub-record through it (the record's parse and
// dump, the builders) gets the runtime's 91 when it holds nothing, as a call through an
// unset object variable does on the platform.
//
// The fresh object is made when something first uses the property: most of a response's
// references and addresses are absent, and a parse that finds nothing leaves a fresh object
// as it was. Records declare their properties mutable, so that a const getter can make it.
template <class T>
class ObjectProperty : public Ref<T> {
 public:
  ObjectProperty() = default;
  ObjectProperty& operator=(Ref<T> other) {
    Ref<T>::operator=(std::move(other));
    pending_ = false;
    return *this;
  }
  T& operator*() const { return *used(); }
  T* operator->() const { return used(); }
  // The property as the host sees it (what the record's getter returns).
  const ObjectProperty& held() const {
    if (pending_) make();
    return *this;
  }

  // The sub-record's ParseRs, through the property. Where the sub-record's class tells that
  // a parse would find nothing (T::parsesNothing moves the cursors as that parse would), a
  // property whose object is still to be made stays so.
  template <class... Args>
  void ParseRs(Args&&... args) const {
    if (pending_ && T::parsesNothing(args...)) return;
    used()->ParseRs(std::forward<Args>(args)...);
  }

 private:
  void make() const {
    auto& self = const_cast<ObjectProperty&>(*this);  // a mutable member (see above)
    self.Ref<T>::operator=(std::make_shared<T>());
    self.pending_ = false;
  }
  T* used() const {
    if (pending_) make();
    if (!this->get()) raiseRuntimeError(RuntimeError::kObjectNotSet);
    return this->get();
  }

  bool pending_ = true;
};

// Where a list record's own response is, for the records that are found by their return
// element and the first "requestID=" after the start (accounts and items). Either the
// record is to be read from `cursor`, or `result` is what its ParseRs returns at once.
struct OwnResponse {
  bool found = false;
  bool another = false;  // the identifier found is another request's
  int32_t result = 0;    // the clamped start when found
  int32_t cursor = 0;    // the closing quote of the request identifier
};
// From StartPoint (raised to 1): 0 without returnTag; the start without "requestID=" (or
// with its quotes cut short); the closing-quote position (and another) when the identifier
// is another request's and requestId is not ""; otherwise found.
OwnResponse findOwnResponse(const Text& value, int32_t startPoint, TextView returnTag,
                            const Text& requestId);

// "<" + name + ">", in a buffer of the thread's own that its next call reuses.
TextView startTagOf(TextView name);

// The ParseRs that reads a Text, picked from a record's two (the other reads an
// IndexedResponse): the one bound by name.
template <class C, class Start>
constexpr auto textParseRs(int32_t (C::*parse)(const Text&, Start)) {
  return parse;
}

// The base of every record with a field table: values, the set path and the late-bound
// members of the fields.
class Record : public Object {
 public:
  // The stored text of a field; its unescaped form.
  const Text& fieldValue(size_t index) const { return values_[index]; }
  Text fieldValueUnescaped(size_t index) const;
  // Trim, check and store by the field's row; rules and the record's hooks apply.
  void setFieldValue(size_t index, Text value);
  // setFieldValue(index, "") (an absent element read): nothing to trim or check.
  void setFieldEmpty(size_t index) {
    if (fields_[index].rule != Rule::None) return setFieldValue(index, Text());
    values_[index].clear();
    fieldStored(index);
  }

  std::span<const FieldSpec> fieldSpecs() const noexcept { return fields_; }

 protected:
  explicit Record(std::span<const FieldSpec> fields);
  Record(const Record& other);
  Record& operator=(const Record& other);

  // Stores a value as it is, bypassing trim, check and rules.
  void storeField(size_t index, Text value) { values_[index] = std::move(value); }
  // A record-specific setter rule: given the checked value, stores what it must.
  virtual void applyRule(size_t index, const Text& checked);
  // Called after every store through setFieldValue.
  virtual void fieldStored(size_t index);

  // Appends, in table order, each field's late-bound members: "Name_XmlUnEscaped" (get)
  // where the row says so, then "Name" (get, let).
  static void addFieldMembers(Members& members, std::span<const FieldSpec> fields);

 private:
  // The values of a record with few fields (a reference: most of the records a response
  // makes) are kept in the record itself, the others in one block of their own.
  static constexpr size_t kInline = 2;
  std::span<const FieldSpec> fields_;
  std::array<Text, kInline> inline_;
  std::vector<Text> spilled_;
  Text* values_;  // inline_ or spilled_
};

// Typed access to a record's fields by table name: Derived::kFields is its table.
template <class Derived>
class RecordOf : public Record {
 public:
  template <FieldName Name>
  static consteval size_t index() {
    return fieldIndex(Derived::kFields, Name.view());
  }
  template <FieldName Name>
  const Text& field() const {
    return fieldValue(index<Name>());
  }
  template <FieldName Name>
  Text fieldUnescaped() const {
    return fieldValueUnescaped(index<Name>());
  }
  template <FieldName Name>
  void setField(const Text& value) {
    setFieldValue(index<Name>(), value);
  }

 protected:
  RecordOf() : Record(Derived::kFields) {}
};

// Reads a record's fields from response text in the order the record names them, sharing
// one StartPoint/EndPoint pair with its sub-records; each value goes through its setter.
template <class Derived>
class FieldReader {
 public:
  // The parent named by a required element's error is parent + parentTail (views of texts
  // that outlive the reader), put together only for required elements.
  FieldReader(Derived& record, const Text& value, int32_t& startPoint, int32_t& endPoint,
              TextView parent = {}, TextView parentTail = {})
      : record_(record),
        value_(value),
        start_(startPoint),
        end_(endPoint),
        parent_(parent),
        parentTail_(parentTail),
        cursor_(Derived::kFields.data(), Derived::kFields.size(),
                [](size_t i) { return Derived::kFields[i].name; }) {}

  // Each a required element: an empty one raises, naming the parent path.
  template <FieldName... Names>
  void required() {
    (read(Derived::template index<Names>(), true), ...);
  }
  template <FieldName... Names>
  void optional() {
    (read(Derived::template index<Names>(), false), ...);
  }
  // Reads a field under another element name (a host-side field in customer-info text).
  void read(size_t index, bool isRequired);

 private:
  Derived& record_;
  const Text& value_;
  int32_t& start_;
  int32_t& end_;
  TextView parent_;
  TextView parentTail_;
  basCommonProcs::CursorView cursor_;
};

// Builds a text dump: the heading, then label and TAB-indented value lines and framed
// sub-record blocks, CR LF between lines and none at the end.
class DumpWriter {
 public:
  explicit DumpWriter(TextView heading) : text_(heading) {}
  void field(TextView label, const Text& value);
  // A field printed without the TAB before its value.
  void untabbed(TextView label, const Text& value);
  void block(TextView openingLabel, const Text& dump, TextView closingLabel);
  template <FieldName... Names, class Derived>
  void fields(const Derived& record) {
    (field(Names.view(), record.template field<Names>()), ...);
  }
  Text take() { return std::move(text_); }

 private:
  Text text_;
};

}  // namespace droqbxml

namespace droqbxml {

template <class Derived>
void FieldReader<Derived>::read(size_t index, bool isRequired) {
  static_assert(
      std::ranges::all_of(Derived::kFields,
                          [](const FieldSpec& f) { return basCommonProcs::isPlainName(f.name); }),
      "a record's field names are plain XML names");
  const TextView name = Derived::kFields[index].name;
  const auto [shown, startTag] = cursor_.look(value_, index, end_);
  if (startTag != Text::npos) {
    record_.setFieldValue(
        index, basCommonProcs::getElementValueAt(value_, name, startTag, start_, end_, isRequired,
                                                 parent_, parentTail_));
    cursor_.readToEndTag(name.size(), end_);
    return;
  }
  if (shown == basCommonProcs::Shown::Absent && !isRequired) {
    // Most fields are absent from a response: an optional one the index shows absent is
    // stored empty at once (a required one goes on to its error).
    start_ = end_;
    record_.setFieldEmpty(index);
    return;
  }
  record_.setFieldValue(
      index, basCommonProcs::getElementValue(value_, name, start_, end_, isRequired, parent_,
                                             parentTail_, shown));
  cursor_.read(value_, index, end_);
}

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_RECORD_HPP_

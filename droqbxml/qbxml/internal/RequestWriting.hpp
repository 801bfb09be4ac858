// The pieces every add builder writes a record with: a simple element from a record's
// stored value, a reference aggregate, an address aggregate, the opening of an add request
// that hands its identifier to the record and takes it back, and the by-name view of a
// record through which the item builders reach their item's members.
#ifndef DROQBXML_QBXML_INTERNAL_REQUESTWRITING_HPP_
#define DROQBXML_QBXML_INTERNAL_REQUESTWRITING_HPP_

#include <functional>

#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/records/DroAddress.hpp"
#include "droqbxml/runtime/Object.hpp"
#include "droqbxml/runtime/Text.hpp"

namespace droqbxml::internal {

// One element with the value escaped: "<Name />" when it is "".
void writeElement(DroXmlBuilder& builder, TextView name, const Text& value);
// The same, only when the value is not "".
void writeElementIfSet(DroXmlBuilder& builder, TextView name, const Text& value);
// A reference aggregate holding "ListID" when it is set, otherwise "FullName" (never both;
// FullName is read only when it is written). Reference: anything with ListID() and
// FullName().
template <class Reference>
void writeListIdOrFullName(DroXmlBuilder& builder, const Reference& ref) {
  const Text listId = ref.ListID();
  if (!listId.empty()) {
    writeElement(builder, u"ListID", listId);
  } else {
    writeElement(builder, u"FullName", ref.FullName());
  }
}
template <class Reference>
void writeReference(DroXmlBuilder& builder, TextView name, const Reference& ref) {
  builder.AddAggregateBegin(builder.CreateElement(Text(name)));
  writeListIdOrFullName(builder, ref);
  builder.AddAggregateEnd();
}
template <class Reference>
void writeReferenceIfSet(DroXmlBuilder& builder, TextView name, const Reference& ref) {
  if (!ref.IsEmpty()) writeReference(builder, name, ref);
}
// An address aggregate with its non-empty fields, when the address is not IsEmpty.
void writeAddressIfSet(DroXmlBuilder& builder, TextView name, const DroAddress& address);
// Initialize, headers, then "<requestName requestID=...>" opened with the counter's next
// value. The record takes the identifier as text (exchange stores it and gives back what
// the record then holds), and the attribute is written from what it gives back.
void openAddRequest(DroXmlBuilder& builder, TextView requestName,
                    const std::function<Text(const Text&)>& exchange);

// A record reached member by member by name, as the item builders reach their item: any
// object with members of the names used will do; a member it lacks is the runtime's 438 at
// the point of use, and nothing held is the runtime's 91.
class ByName {
 public:
  explicit ByName(Ref<Object> object) : object_(std::move(object)) {}
  Text text(TextView name) const { return self().get(name).toText(); }
  ByName object(TextView name) const { return ByName(self().get(name).toObject()); }
  void let(TextView name, const Text& value) const { self().let(name, Variant(value)); }
  bool IsEmpty() const { return self().get(u"IsEmpty").toBoolean(); }
  Text ListID() const { return text(u"ListID"); }
  Text FullName() const { return text(u"FullName"); }
  // The members of a collection in For Each order (its NewEnum).
  void forEach(const std::function<void(const Variant&)>& body) const;

 private:
  Object& self() const;
  Ref<Object> object_;
};

}  // namespace droqbxml::internal

#endif  // DROQBXML_QBXML_INTERNAL_REQUESTWRITING_HPP_

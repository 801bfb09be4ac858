// The pieces every add builder writes a record with: a simple element from a record's
// stored value, a reference aggregate, an address aggregate, and the opening of an add
// request that hands its identifier back to the record.
#ifndef DROQBXML_QBXML_INTERNAL_REQUESTWRITING_HPP_
#define DROQBXML_QBXML_INTERNAL_REQUESTWRITING_HPP_

#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/records/DroAddress.hpp"
#include "droqbxml/runtime/Text.hpp"

namespace droqbxml::internal {

// One element with the value escaped: "<Name />" when it is "".
void writeElement(DroXmlBuilder& builder, TextView name, const Text& value);
// The same, only when the value is not "".
void writeElementIfSet(DroXmlBuilder& builder, TextView name, const Text& value);
// A reference aggregate holding "ListID" when it is set, otherwise "FullName" (never both).
void writeReference(DroXmlBuilder& builder, TextView name, const Text& listId,
                    const Text& fullName);
template <class Reference>
void writeReferenceIfSet(DroXmlBuilder& builder, TextView name, const Reference& ref) {
  if (!ref.IsEmpty()) writeReference(builder, name, ref.ListID(), ref.FullName());
}
// An address aggregate with its non-empty fields, when the address is not IsEmpty.
void writeAddressIfSet(DroXmlBuilder& builder, TextView name, const DroAddress& address);
// Initialize, headers, then "<requestName requestID=...>" opened with the counter's next
// value, which is also returned as text for the record's RequestID.
Text openAddRequest(DroXmlBuilder& builder, TextView requestName);

}  // namespace droqbxml::internal

#endif  // DROQBXML_QBXML_INTERNAL_REQUESTWRITING_HPP_

// DroCustomerCol: the ordered keyed collection of customers, and the customer-info exchange
// text by which the host hands customers (job files, names, bill address, job name) to and
// from the component.
#ifndef DROQBXML_RECORDS_DROCUSTOMERCOL_HPP_
#define DROQBXML_RECORDS_DROCUSTOMERCOL_HPP_

#include <cstdint>
#include <vector>

#include "droqbxml/records/DroCustomer.hpp"
#include "droqbxml/runtime/KeyedCollection.hpp"
#include "droqbxml/runtime/Object.hpp"

namespace droqbxml {

class DroCustomerCol final : public Object {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // Appends oCustA (a new customer when nothing is given) under skey when not "".
  // A duplicate key is 457.
  Ref<DroCustomer> Add(const Text& skey = u"", Ref<DroCustomer> oCustA = nullptr);
  // By 1-based position (a number) or by key (a text); unknown ones are 5.
  Ref<DroCustomer> Item(const Variant& vntIndexKey) const;
  int32_t Count() const { return items_.Count(); }
  void Remove(const Variant& vntIndexKey);
  // The customers in insertion order, as they are now.
  std::vector<Ref<DroCustomer>> NewEnum() const { return items_.NewEnum(); }

  // Reads every customer of a customer-info text from lStartPoint, adding each under
  // "KEY" + its file title; a second customer with the same title is dropped silently.
  // True when at least one was added.
  bool ParseCustInfoUnEscaped(const Text& sValueA, int32_t lStartPoint = 0);
  bool ParseCustInfo(const Text& sValueA, int32_t lStartPoint = 0);
  // The customer-info text of this collection.
  Text BuildCustInfoXML();

 private:
  KeyedCollection<Ref<DroCustomer>> items_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROCUSTOMERCOL_HPP_

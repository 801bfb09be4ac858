// DroCustomerCol: the ordered keyed collection of customers, and the customer-info exchange
// text by which the host hands customers (job files, names, bill address, job name) to and
// from the component.
#ifndef DROQBXML_RECORDS_DROCUSTOMERCOL_HPP_
#define DROQBXML_RECORDS_DROCUSTOMERCOL_HPP_

#include <cstdint>

#include "droqbxml/records/DroCustomer.hpp"
#include "droqbxml/records/RecordCol.hpp"

namespace droqbxml {

class DroCustomerCol final : public RecordCol<DroCustomer> {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // Reads every customer of a customer-info text from lStartPoint, adding each under
  // "KEY" + its file title; a second customer with the same title is dropped silently.
  // True when at least one was added.
  bool ParseCustInfoUnEscaped(const Text& sValueA, int32_t lStartPoint = 0);
  bool ParseCustInfo(const Text& sValueA, int32_t lStartPoint = 0);
  // The customer-info text of this collection.
  Text BuildCustInfoXML();
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROCUSTOMERCOL_HPP_

// The enumerations shared by the builder, the records and the connection wrapper: which
// list or transaction a query asks for, the kind of an item, the active-status filter of a
// query and the status of an exchange. Members
// keep their published spellings and values (udEtjob in lower case, 4 unused in
// udEntityType); the fixed 32-bit type lets any value a host passes be held and compared.
#ifndef DROQBXML_QBXML_ENUMERATIONS_HPP_
#define DROQBXML_QBXML_ENUMERATIONS_HPP_

#include <cstdint>

namespace droqbxml {

// The list or transaction kind a query request asks for.
enum udEntityType : int32_t {
  udEtCustomer = 0,
  udEtjob = 1,
  udEtEstimate = 2,
  udEtInvoice = 3,
  udEtItem = 5,
  udEtItemNonInv = 6,
  udEtItemOther = 7,
  udEtAccount = 8,
  udEtItemInv = 9,
};

// The kind of an item record and of estimate and invoice lines.
enum udItemType : int32_t {
  udUnknown = -1,
  udItemNonInventory = 0,
  udItemSubtotal = 1,
  udItemInventory = 2,
  udItemDiscount = 3,
  udItemGroup = 4,
  udItemOtherCharge = 5,
  udItemPayment = 6,
  udItemSalesTax = 7,
  udItemSalesTaxGroup = 8,
  udItemService = 9,
  udItemPayrollItemWage = 10,
};

// Which records a query by active status returns.
enum udActiveStatus : int32_t {
  udAsActiveOnly = 0,
  udAsInactiveOnly = 1,
  udAsAll = 2,
};

// The outcome of the latest exchange. 0, 1, 500 and 3140 are QuickBooks status codes read
// from responses (any other code is kept as it is); the others are set by the wrapper.
enum udResponseStatus : int32_t {
  RSUnknown = -10,
  RSSuccess = 0,
  RSNoMatch = 1,
  RSNotFound = 500,
  RSRefNotFound = 3140,
  RSTaxErrorInvoice = 31401,
  RSTaxErrorEstimate = 31403,
  RSParsingError = 20000,
  RSCoNameMismatch = 21000,
  RSCantLogin = 22000,
  RSUnsetCoFile = 23000,
};

}  // namespace droqbxml

#endif  // DROQBXML_QBXML_ENUMERATIONS_HPP_

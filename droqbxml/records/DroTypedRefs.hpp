// The nineteen typed reference classes: one class template over a table of kinds, each
// kind with its own class name, FullName limit, trim rule and Required/Parent pass-through.
// Every typed reference holds one DroObjRef and keeps no data of its own.
#ifndef DROQBXML_RECORDS_DROTYPEDREFS_HPP_
#define DROQBXML_RECORDS_DROTYPEDREFS_HPP_

#include <array>
#include <cstdint>
#include <memory>

#include "droqbxml/records/DroObjRef.hpp"

namespace droqbxml {

enum class RefKind : uint8_t {
  Account,
  Class,
  CustomerMsg,
  Customer,
  CustomerSalesTaxCode,
  CustomerType,
  ExpenseAccount,
  IncomeAccount,
  Item,
  ItemSalesTax,
  JobType,
  Parent,
  PaymentMethod,
  PrefVendor,
  SalesRep,
  SalesTaxCode,
  ShipMethod,
  Terms,
  Vendor,
};

struct RefKindSpec {
  std::u16string_view className;
  int16_t fullNameMaxLength;
  bool trimsFullName;
  bool passesRequired;  // ParseRs hands Required and Parent on (only DroClassRef)
};

inline constexpr std::array<RefKindSpec, 19> kRefKinds{{
    {u"DroAccountRef", 159, true, false},
    {u"DroClassRef", 159, true, true},
    {u"DroCustomerMsgRef", 101, true, false},
    {u"DroCustomerRef", 209, true, false},
    {u"DroCustomerSalesTaxCodeRef", 3, true, false},
    {u"DroCustomerTypeRef", 159, true, false},
    {u"DroExpenseAccountRef", 159, true, false},
    // Passes FullName on untrimmed, unlike every other kind: hosts rely on it.
    {u"DroIncomeAccountRef", 159, false, false},
    {u"DroItemRef", 159, true, false},
    {u"DroItemSalesTaxRef", 31, true, false},
    {u"DroJobTypeRef", 159, true, false},
    {u"DroParentRef", 159, true, false},
    {u"DroPaymentMethodRef", 159, true, false},
    {u"DroPrefVendorRef", 41, true, false},
    {u"DroSalesRepRef", 5, true, false},
    {u"DroSalesTaxCodeRef", 3, true, false},
    {u"DroShipMethodRef", 15, true, false},
    {u"DroTermsRef", 31, true, false},
    {u"DroVendorRef", 159, true, false},
}};

template <RefKind Kind>
class DroTypedRef final : public Object {
 public:
  static constexpr const RefKindSpec& kSpec = kRefKinds[static_cast<size_t>(Kind)];

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const Text& ListID() const { return inner_.ListID(); }
  // Trimmed, then stored in the inner reference.
  void ListID(const Text& value);
  const Text& FullName() const { return inner_.FullName(); }
  // Trimmed (except for DroIncomeAccountRef), refused when longer than the kind's limit.
  void FullName(const Text& value);
  bool IsEmpty() const { return inner_.IsEmpty(); }
  // The inner ParseRs; Required and Parent reach it only for DroClassRef, every other kind
  // passes false and "" so that a missing ListID never raises.
  void ParseRs(TextView RefName, const Text& Value, int32_t& StartPoint, int32_t& EndPoint,
               bool Required = false, TextView Parent = {});
  static bool parsesNothing(TextView RefName, const Text& Value, const int32_t& StartPoint,
                            const int32_t& EndPoint, bool = false, TextView = {}) {
    return DroObjRef::parsesNothing(RefName, Value, StartPoint, EndPoint);
  }
  Text PrintOut() const { return inner_.PrintOut(); }

 private:
  DroObjRef inner_;  // held by value: one allocation a reference, not two
};

using DroAccountRef = DroTypedRef<RefKind::Account>;
using DroClassRef = DroTypedRef<RefKind::Class>;
using DroCustomerMsgRef = DroTypedRef<RefKind::CustomerMsg>;
using DroCustomerRef = DroTypedRef<RefKind::Customer>;
using DroCustomerSalesTaxCodeRef = DroTypedRef<RefKind::CustomerSalesTaxCode>;
using DroCustomerTypeRef = DroTypedRef<RefKind::CustomerType>;
using DroExpenseAccountRef = DroTypedRef<RefKind::ExpenseAccount>;
using DroIncomeAccountRef = DroTypedRef<RefKind::IncomeAccount>;
using DroItemRef = DroTypedRef<RefKind::Item>;
using DroItemSalesTaxRef = DroTypedRef<RefKind::ItemSalesTax>;
using DroJobTypeRef = DroTypedRef<RefKind::JobType>;
using DroParentRef = DroTypedRef<RefKind::Parent>;
using DroPaymentMethodRef = DroTypedRef<RefKind::PaymentMethod>;
using DroPrefVendorRef = DroTypedRef<RefKind::PrefVendor>;
using DroSalesRepRef = DroTypedRef<RefKind::SalesRep>;
using DroSalesTaxCodeRef = DroTypedRef<RefKind::SalesTaxCode>;
using DroShipMethodRef = DroTypedRef<RefKind::ShipMethod>;
using DroTermsRef = DroTypedRef<RefKind::Terms>;
using DroVendorRef = DroTypedRef<RefKind::Vendor>;

// Creates the typed reference of that class name, or nothing; for the class factory.
Ref<Object> createTypedRef(TextView className);
// Every typed reference class name, in table order.
std::array<std::u16string_view, 19> typedRefClassNames();

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROTYPEDREFS_HPP_

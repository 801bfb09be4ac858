// The typed references, instantiated once for every kind of the table.
#include "droqbxml/records/DroTypedRefs.hpp"

#include <utility>

#include "droqbxml/qbxml/basValidations.hpp"

namespace droqbxml {

template <RefKind Kind>
const ClassInfo& DroTypedRef<Kind>::typeInfo() {
  using R = DroTypedRef<Kind>;
  static const ClassInfo info(Text(kSpec.className),
                              Members()
                                  .property(u"ListID", &R::ListID, &R::ListID)
                                  .property(u"FullName", &R::FullName, &R::FullName)
                                  .getter(u"IsEmpty", &R::IsEmpty)
                                  .method(u"ParseRs", &R::ParseRs)
                                  .optional(2)
                                  .getter(u"PrintOut", &R::PrintOut)
                                  .take());
  return info;
}

template <RefKind Kind>
void DroTypedRef<Kind>::ListID(const Text& value) {
  inner_.ListID(trim(value));
}

template <RefKind Kind>
void DroTypedRef<Kind>::FullName(const Text& value) {
  const Text given = kSpec.trimsFullName ? trim(value) : value;
  inner_.FullName(basValidations::CheckSTRTYPE(given, kSpec.fullNameMaxLength, false));
}

template <RefKind Kind>
void DroTypedRef<Kind>::ParseRs(TextView RefName, const Text& Value, int32_t& StartPoint,
                                int32_t& EndPoint, bool Required, TextView Parent) {
  if constexpr (kSpec.passesRequired) {
    inner_.ParseRs(RefName, Value, StartPoint, EndPoint, Required, Parent);
  } else {
    inner_.ParseRs(RefName, Value, StartPoint, EndPoint, false, {});
  }
}

namespace {

template <size_t... I>
Ref<Object> createByIndex(TextView className, std::index_sequence<I...>) {
  Ref<Object> created;
  ((kRefKinds[I].className == className
        ? void(created = std::make_shared<DroTypedRef<static_cast<RefKind>(I)>>())
        : void()),
   ...);
  return created;
}

}  // namespace

Ref<Object> createTypedRef(TextView className) {
  return createByIndex(className, std::make_index_sequence<kRefKinds.size()>{});
}

std::array<std::u16string_view, 19> typedRefClassNames() {
  std::array<std::u16string_view, 19> names{};
  for (size_t i = 0; i < kRefKinds.size(); ++i) names[i] = kRefKinds[i].className;
  return names;
}

// Every kind, so that other files link against the members defined here.
template class DroTypedRef<RefKind::Account>;
template class DroTypedRef<RefKind::Class>;
template class DroTypedRef<RefKind::CustomerMsg>;
template class DroTypedRef<RefKind::Customer>;
template class DroTypedRef<RefKind::CustomerSalesTaxCode>;
template class DroTypedRef<RefKind::CustomerType>;
template class DroTypedRef<RefKind::ExpenseAccount>;
template class DroTypedRef<RefKind::IncomeAccount>;
template class DroTypedRef<RefKind::Item>;
template class DroTypedRef<RefKind::ItemSalesTax>;
template class DroTypedRef<RefKind::JobType>;
template class DroTypedRef<RefKind::Parent>;
template class DroTypedRef<RefKind::PaymentMethod>;
template class DroTypedRef<RefKind::PrefVendor>;
template class DroTypedRef<RefKind::SalesRep>;
template class DroTypedRef<RefKind::SalesTaxCode>;
template class DroTypedRef<RefKind::ShipMethod>;
template class DroTypedRef<RefKind::Terms>;
template class DroTypedRef<RefKind::Vendor>;

}  // namespace droqbxml

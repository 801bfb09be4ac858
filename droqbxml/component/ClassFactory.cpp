// The table of creatable classes.
#include "droqbxml/component/ClassFactory.hpp"

#include <array>
#include <memory>

#include "droqbxml/component/DroXmlProcessor.hpp"
#include "droqbxml/connection/DroXmlSdkWrapper.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/diagnostics/clsAppPathAccess.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/diagnostics/clsTrace.hpp"
#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/qbxml/DroXmlElement.hpp"
#include "droqbxml/qbxml/basValidationsModule.hpp"
#include "droqbxml/qbxml/clsXmlStringEscaping.hpp"
#include "droqbxml/records/DroAccount.hpp"
#include "droqbxml/records/DroAccountCol.hpp"
#include "droqbxml/records/DroAddress.hpp"
#include "droqbxml/records/DroCustomer.hpp"
#include "droqbxml/records/DroCustomerCol.hpp"
#include "droqbxml/records/DroEstimate.hpp"
#include "droqbxml/records/DroEstimateLine.hpp"
#include "droqbxml/records/DroEstimateLineCol.hpp"
#include "droqbxml/records/DroEstimateLineGroup.hpp"
#include "droqbxml/records/DroEstimateLineGroupCol.hpp"
#include "droqbxml/records/DroInvoice.hpp"
#include "droqbxml/records/DroInvoiceLine.hpp"
#include "droqbxml/records/DroInvoiceLineCol.hpp"
#include "droqbxml/records/DroInvoiceLineGroup.hpp"
#include "droqbxml/records/DroInvoiceLineGroupCol.hpp"
#include "droqbxml/records/DroItemDiscount.hpp"
#include "droqbxml/records/DroItemGroup.hpp"
#include "droqbxml/records/DroItemGroupLine.hpp"
#include "droqbxml/records/DroItemGroupLineCol.hpp"
#include "droqbxml/records/DroItemInventory.hpp"
#include "droqbxml/records/DroItemPayment.hpp"
#include "droqbxml/records/DroItemPayrollItemWage.hpp"
#include "droqbxml/records/DroItemSalesTax.hpp"
#include "droqbxml/records/DroItemSalesTaxGroup.hpp"
#include "droqbxml/records/DroItemSubtotal.hpp"
#include "droqbxml/records/DroItemsCol.hpp"
#include "droqbxml/records/DroObjRef.hpp"
#include "droqbxml/records/DroPaymentMethod.hpp"
#include "droqbxml/records/DroSalesAndPurchase.hpp"
#include "droqbxml/records/DroSalesItems.hpp"
#include "droqbxml/records/DroSalesOrPurchase.hpp"
#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {
namespace {

constexpr TextView kLibraryName = u"DroQbXml";

struct CreatableClass {
  TextView name;
  Ref<Object> (*create)();
};

template <class T>
Ref<Object> make() {
  return std::make_shared<T>();
}

constexpr std::array<CreatableClass, 43> kClasses{{
    {u"DroXmlProcessor", &make<DroXmlProcessor>},
    {u"clsMyErr", &make<clsMyErr>},
    {u"clsAppPathAccess", &make<clsAppPathAccess>},
    {u"clsErrorNumbers", &make<clsErrorNumbers>},
    {u"clsTrace", &make<clsTrace>},
    {u"clsXmlStringEscaping", &make<clsXmlStringEscaping>},
    {u"basValidations", &make<basValidationsModule>},
    {u"DroXmlBuilder", &make<DroXmlBuilder>},
    {u"DroXmlSdkWrapper", &make<DroXmlSdkWrapper>},
    {u"DroXmlElement", &make<DroXmlElement>},
    {u"DroObjRef", &make<DroObjRef>},
    {u"DroAddress", &make<DroAddress>},
    {u"DroCustomer", &make<DroCustomer>},
    {u"DroCustomerCol", &make<DroCustomerCol>},
    {u"DroAccount", &make<DroAccount>},
    {u"DroAccountCol", &make<DroAccountCol>},
    {u"DroItemNonInventory", &make<DroItemNonInventory>},
    {u"DroItemSubtotal", &make<DroItemSubtotal>},
    {u"DroItemInventory", &make<DroItemInventory>},
    {u"DroItemDiscount", &make<DroItemDiscount>},
    {u"DroItemGroup", &make<DroItemGroup>},
    {u"DroItemOtherCharge", &make<DroItemOtherCharge>},
    {u"DroItemPayment", &make<DroItemPayment>},
    {u"DroItemSalesTax", &make<DroItemSalesTax>},
    {u"DroItemSalesTaxGroup", &make<DroItemSalesTaxGroup>},
    {u"DroItemService", &make<DroItemService>},
    {u"DroItemPayrollItemWage", &make<DroItemPayrollItemWage>},
    {u"DroSalesOrPurchase", &make<DroSalesOrPurchase>},
    {u"DroSalesAndPurchase", &make<DroSalesAndPurchase>},
    {u"DroItemGroupLine", &make<DroItemGroupLine>},
    {u"DroItemGroupLineCol", &make<DroItemGroupLineCol>},
    {u"DroPaymentMethod", &make<DroPaymentMethod>},
    {u"DroItemsCol", &make<DroItemsCol>},
    {u"DroEstimate", &make<DroEstimate>},
    {u"DroEstimateLine", &make<DroEstimateLine>},
    {u"DroEstimateLineCol", &make<DroEstimateLineCol>},
    {u"DroEstimateLineGroup", &make<DroEstimateLineGroup>},
    {u"DroEstimateLineGroupCol", &make<DroEstimateLineGroupCol>},
    {u"DroInvoice", &make<DroInvoice>},
    {u"DroInvoiceLine", &make<DroInvoiceLine>},
    {u"DroInvoiceLineCol", &make<DroInvoiceLineCol>},
    {u"DroInvoiceLineGroup", &make<DroInvoiceLineGroup>},
    {u"DroInvoiceLineGroupCol", &make<DroInvoiceLineGroupCol>},
}};

}  // namespace

Ref<Object> CreateObject(TextView progId) {
  const auto dot = progId.find(u'.');
  if (dot != TextView::npos && equalsIgnoreCase(progId.substr(0, dot), kLibraryName)) {
    const TextView name = progId.substr(dot + 1);
    for (const auto& entry : kClasses) {
      if (equalsIgnoreCase(entry.name, name)) return entry.create();
    }
    for (const auto typedRef : typedRefClassNames()) {
      if (equalsIgnoreCase(typedRef, name)) return createTypedRef(typedRef);
    }
  }
  raiseRuntimeError(RuntimeError::kCantCreateObject);
}

std::vector<Text> RegisteredProgIds() {
  std::vector<Text> ids;
  for (const auto& entry : kClasses) ids.push_back(Text(kLibraryName) + u"." + Text(entry.name));
  for (const auto typedRef : typedRefClassNames()) {
    ids.push_back(Text(kLibraryName) + u"." + Text(typedRef));
  }
  return ids;
}

}  // namespace droqbxml

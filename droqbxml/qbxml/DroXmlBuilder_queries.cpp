// DroXmlBuilder, the query requests: whole single-request documents for all records of a
// kind, one record by full name or by list id, and records by active status and dates;
// and IsSuccessRs, the success test of a response. Each query builder has its own table of
// request names: they differ on purpose and hosts rely on each as it is.
#include "droqbxml/qbxml/DroXmlBuilder.hpp"

#include <array>
#include <string>

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Numbers.hpp"

namespace droqbxml {
namespace {

constexpr TextView kCustomerQuery = u"CustomerQueryRq";

struct EntityRequest {
  udEntityType entity;
  TextView request;
};

struct ItemKindRequest {
  udItemType kind;
  TextView request;
};

// Every kind not listed asks for customers.
constexpr std::array<EntityRequest, 6> kQueryByAllRequests{{
    {udEtEstimate, u"EstimateQueryRq"},
    {udEtInvoice, u"InvoiceQueryRq"},
    {udEtItemNonInv, u"ItemNonInventoryQueryRq"},
    {udEtItemOther, u"ItemOtherChargeQueryRq"},
    {udEtAccount, u"AccountQueryRq"},
    {udEtItemInv, u"ItemInventoryQueryRq"},
}};

// udEtItem goes by item kind (below); the other item entities ask for customers here,
// unlike in the other builders: deliberate, hosts name items through udEtItem and a kind.
constexpr std::array<EntityRequest, 3> kQueryByFullNameRequests{{
    {udEtEstimate, u"EstimateQueryRq"},
    {udEtInvoice, u"InvoiceQueryRq"},
    {udEtAccount, u"AccountQueryRq"},
}};

// In the order QuickBooks' item kinds have always been tested.
constexpr std::array<ItemKindRequest, 11> kItemKindRequests{{
    {udItemService, u"ItemServiceQueryRq"},
    {udItemSalesTaxGroup, u"ItemSalesTaxGroupQueryRq"},
    {udItemSalesTax, u"ItemSalesTaxQueryRq"},
    {udItemPayrollItemWage, u"PayrollItemWageQueryRq"},
    {udItemPayment, u"ItemPaymentQueryRq"},
    {udItemOtherCharge, u"ItemOtherChargeQueryRq"},
    {udItemNonInventory, u"ItemNonInventoryQueryRq"},
    {udItemInventory, u"ItemInventoryQueryRq"},
    {udItemGroup, u"ItemGroupQueryRq"},
    {udItemDiscount, u"ItemDiscountQueryRq"},
    {udItemSubtotal, u"ItemSubtotalQueryRq"},
}};

// Written into the request as it stands when no item kind matches: deliberate, the
// request then fails in QuickBooks instead of here.
constexpr TextView kUnknownItemRequest = u"UnknownItemSentByDRO";

constexpr std::array<EntityRequest, 6> kQueryByActiveOrDateRequests{{
    {udEtEstimate, u"EstimateQueryRq"},
    {udEtInvoice, u"InvoiceQueryRq"},
    {udEtItemNonInv, u"ItemNonInventoryQueryRq"},
    {udEtItemOther, u"ItemOtherChargeQueryRq"},
    {udEtAccount, u"AccountQueryRq"},
    {udEtItemInv, u"ItemInventoryQueryRq"},
}};

template <size_t N>
TextView requestFor(const std::array<EntityRequest, N>& table, udEntityType entity) {
  for (const auto& row : table) {
    if (row.entity == entity) return row.request;
  }
  return kCustomerQuery;
}

// The item kind as a number: numbers of every kind (Empty counts as 0, as the platform
// compares it) and numeric text; none for a missing value, Null, an object or other text,
// so that these match no kind.
bool itemKindNumber(const Variant& value, double& number) {
  switch (value.kind()) {
    case Variant::Kind::Missing:
    case Variant::Kind::Null:
    case Variant::Kind::Object:
      return false;
    case Variant::Kind::String:
      if (!isNumeric(value.toText())) return false;
      break;
    default:
      break;
  }
  number = value.toDouble();
  return true;
}

TextView itemKindRequest(const Variant& otherParameter) {
  double number = 0.0;
  if (!itemKindNumber(otherParameter, number)) return kUnknownItemRequest;
  for (const auto& row : kItemKindRequests) {
    if (number == static_cast<double>(row.kind)) return row.request;
  }
  return kUnknownItemRequest;
}

TextView activeStatusText(udActiveStatus active) {
  switch (active) {
    case udAsInactiveOnly:
      return u"InactiveOnly";
    case udAsAll:
      return u"All";
    default:
      return u"ActiveOnly";
  }
}

}  // namespace

Ref<DroXmlElement> DroXmlBuilder::openRequest(TextView requestName) {
  Initialize();
  AddHeaders();
  auto request = CreateElement(Text(requestName));
  RequestIDUp();
  const std::string id = std::to_string(RequestID());
  request->AttributeAdd(u"requestID", XmlEscapeX(asciiText(id)));
  return request;
}

void DroXmlBuilder::BuildQueryByAll(udEntityType entity) {
  AddElement(openRequest(requestFor(kQueryByAllRequests, entity)));
  AddFooters();
}

void DroXmlBuilder::BuildQueryByFullName(udEntityType entity, const Text& FullName,
                                         const Variant& OtherParameter) {
  const TextView requestName = entity == udEtItem ? itemKindRequest(OtherParameter)
                                                  : requestFor(kQueryByFullNameRequests, entity);
  if (FullName.empty()) return;
  AddAggregateBegin(openRequest(requestName));
  AddElement(CreateElement(u"FullName", XmlEscapeX(FullName)));
  AddAggregateEnd();
  AddFooters();
}

void DroXmlBuilder::BuildQueryByListID(udEntityType /*entity*/, const Text& ListID) {
  if (ListID.empty()) return;
  // Always a customer query, whatever the entity: deliberate, hosts look up only
  // customers and jobs by list id.
  AddAggregateBegin(openRequest(kCustomerQuery));
  AddElement(CreateElement(u"ListID", XmlEscapeX(trim(ListID))));
  AddAggregateEnd();
  AddFooters();
}

void DroXmlBuilder::BuildQueryByActiveOrDate(udEntityType entity, udActiveStatus active,
                                             const Text& fromDate, const Text& toDate) {
  AddAggregateBegin(openRequest(requestFor(kQueryByActiveOrDateRequests, entity)));
  AddElement(CreateElement(u"ActiveStatus", Text(activeStatusText(active))));
  // Emptiness is tested before trimming: a date of blanks writes an empty element.
  if (!fromDate.empty()) AddElement(CreateElement(u"FromModifiedDate", XmlEscapeX(trim(fromDate))));
  if (!toDate.empty()) AddElement(CreateElement(u"ToModifiedDate", XmlEscapeX(trim(toDate))));
  AddAggregateEnd();
  AddFooters();
}

bool DroXmlBuilder::IsSuccessRs(const Text& SearchIn, const Text& ReqID) const {
  const TextView text(SearchIn);
  // Only the first "requestID=" counts; the quote after "=" is assumed, not checked.
  const size_t idAt = text.find(u"requestID=");
  if (idAt == TextView::npos) return false;
  const size_t idStart = idAt + 11;
  if (idStart > text.size()) return false;
  const size_t idEnd = text.find(u'"', idStart);
  if (idEnd == TextView::npos) return false;
  if (!ReqID.empty() && text.substr(idStart, idEnd - idStart) != ReqID) return false;

  const size_t statusAt = text.find(u"statusCode=", idEnd);
  if (statusAt == TextView::npos) return false;
  const size_t codeStart = statusAt + 12;
  const size_t codeEnd = codeStart > text.size() ? TextView::npos : text.find(u'"', codeStart);
  // A status code without a closing quote has a negative length: the runtime's 5.
  if (codeEnd == TextView::npos) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  return text.substr(codeStart, codeEnd - codeStart) == u"0";
}

}  // namespace droqbxml

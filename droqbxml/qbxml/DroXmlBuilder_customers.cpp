// DroXmlBuilder, customers: the customer-info exchange text and the customer and job add
// requests.
#include "droqbxml/qbxml/DroXmlBuilder.hpp"

#include <string>

#include "droqbxml/qbxml/internal/RequestWriting.hpp"
#include "droqbxml/records/DroCustomer.hpp"
#include "droqbxml/records/DroCustomerCol.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {
namespace {

using internal::writeAddressIfSet;
using internal::writeElement;
using internal::writeElementIfSet;
using internal::writeReference;
using internal::writeReferenceIfSet;

// The body of "CustomerAdd", the same for customers and jobs but for how the ParentRef
// condition is tested.
template <class ParentTest>
void writeCustomerAdd(DroXmlBuilder& builder, DroCustomer& cust, ParentTest writesParent) {
  internal::openAddRequest(builder, u"CustomerAddRq", [&](const Text& id) {
    cust.RequestID(id);
    return cust.RequestID();
  });
  builder.AddAggregateBegin(builder.CreateElement(u"CustomerAdd"));
  writeElement(builder, u"Name", cust.Name());  // always, even when empty
  writeElementIfSet(builder, u"IsActive", cust.IsActive());
  const DroParentRef& parent = *cust.ParentRef();
  if (writesParent(parent)) writeReference(builder, u"ParentRef", parent);
  writeElementIfSet(builder, u"CompanyName", cust.CompanyName());
  writeElementIfSet(builder, u"Salutation", cust.Salutation());
  writeElementIfSet(builder, u"FirstName", cust.FirstName());
  writeElementIfSet(builder, u"MiddleName", cust.MiddleName());
  writeElementIfSet(builder, u"LastName", cust.LastName());
  writeAddressIfSet(builder, u"BillAddress", *cust.BillAddress());
  writeElementIfSet(builder, u"Phone", cust.Phone());
  writeElementIfSet(builder, u"AltPhone", cust.AltPhone());
  writeElementIfSet(builder, u"Email", cust.Email());
  writeElementIfSet(builder, u"Contact", cust.Contact());
  writeElementIfSet(builder, u"AltContact", cust.AltContact());
  writeReferenceIfSet(builder, u"CustomerTypeRef", *cust.CustomerTypeRef());
  writeAddressIfSet(builder, u"ShipAddress", *cust.ShipAddress());
  writeReferenceIfSet(builder, u"SalesRepRef", *cust.SalesRepRef());
  writeElementIfSet(builder, u"Balance", cust.Balance());
  writeReferenceIfSet(builder, u"SalesTaxCodeRef", *cust.SalesTaxCodeRef());
  writeReferenceIfSet(builder, u"ItemSalesTaxRef", *cust.ItemSalesTaxRef());
  writeElementIfSet(builder, u"ResaleNumber", cust.ResaleNumber());
  writeElementIfSet(builder, u"AccountNumber", cust.AccountNumber());
  writeElementIfSet(builder, u"CreditLimit", cust.CreditLimit());
  writeElementIfSet(builder, u"JobStatus", cust.JobStatus());
  writeElementIfSet(builder, u"JobStartDate", cust.JobStartDate());
  writeElementIfSet(builder, u"JobProjectedEndDate", cust.JobProjectedEndDate());
  writeElementIfSet(builder, u"JobEndDate", cust.JobEndDate());
  writeElementIfSet(builder, u"JobDesc", cust.JobDesc());
  writeReferenceIfSet(builder, u"JobTypeRef", *cust.JobTypeRef());
  builder.AddAggregateEnd();
  builder.AddAggregateEnd();
  builder.AddFooters();
}

DroCustomer& required(const Ref<DroCustomer>& customer) {
  if (!customer) raiseRuntimeError(RuntimeError::kObjectNotSet);
  return *customer;
}

}  // namespace

void DroXmlBuilder::BuildAddCustomer(const Ref<DroCustomer>& cust) {
  writeCustomerAdd(*this, required(cust),
                   [](const DroParentRef& parent) { return !parent.IsEmpty(); });
}

void DroXmlBuilder::BuildAddJob(const Ref<DroCustomer>& Job) {
  writeCustomerAdd(*this, required(Job), [](const DroParentRef& parent) {
    return !parent.ListID().empty() || !parent.FullName().empty();
  });
}

void DroXmlBuilder::BuildRetCustomerInfo(const Ref<DroCustomerCol>& oCustColA) {
  if (!oCustColA) raiseRuntimeError(RuntimeError::kObjectNotSet);
  BuildRetCustomerInfo(*oCustColA);
}

void DroXmlBuilder::BuildRetCustomerInfo(const DroCustomerCol& oCustColA) {
  Initialize();
  AddHeaders();
  // The request message-set start tag becomes a bare response one.
  document_.resize(document_.find(u"<QBXMLMsgsRq onError"));
  document_ += u"<QBXMLMsgsRs>\r\n";
  auto response = CreateElement(u"CustomerQueryRs");
  RequestIDUp();
  response->AttributeAdd(u"requestID", XmlEscapeX(asciiText(std::to_string(RequestID()))));
  response->AttributeAdd(u"statusCode", XmlEscapeX(u"0"));
  response->AttributeAdd(u"statusSeverity", XmlEscapeX(u"INFO"));
  response->AttributeAdd(u"statusMessage", XmlEscapeX(u"Status OK"));
  AddAggregateBegin(response);
  for (const auto& customer : oCustColA.NewEnum()) {
    AddElementAggregateSimple(u"CustomerRet");
    AddElementSimple(u"NonQbFileName", customer->NonQbFileName());
    AddElementSimple(u"FirstName", customer->FirstName());
    AddElementSimple(u"MiddleName", customer->MiddleName());
    AddElementSimple(u"LastName", customer->LastName());
    AddElementSimple(u"CompanyName", customer->CompanyName());
    const DroAddress& bill = *customer->BillAddress();
    AddElementAggregateSimple(u"BillAddress");
    AddElementSimple(u"Addr1", bill.Addr1());
    AddElementSimple(u"Addr2", bill.Addr2());
    AddElementSimple(u"Addr3", bill.Addr3());
    AddElementSimple(u"City", bill.City());
    AddElementSimple(u"State", bill.State());
    AddElementSimple(u"PostalCode", bill.PostalCode());
    AddElementSimple(u"Country", bill.Country());
    AddAggregateEnd();
    AddElementSimple(u"NonQbJobName", customer->NonQbJobName());
    AddAggregateEnd();
  }
  AddAggregateEnd();
  AddFooters();
  // Every "/QBXMLMsgsRq" loses its slash: the end tag comes out as a second start tag.
  for (size_t at = document_.find(u"/QBXMLMsgsRq"); at != Text::npos;
       at = document_.find(u"/QBXMLMsgsRq", at)) {
    document_.replace(at, 12, u"QBXMLMsgsRs");
  }
}

}  // namespace droqbxml

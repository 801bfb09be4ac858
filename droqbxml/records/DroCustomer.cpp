// The customer record: its setter rules, reading a "CustomerRet" or customer-info text, and
// its dump.
#include "droqbxml/records/DroCustomer.hpp"

#include "droqbxml/records/DroCustomerCol.hpp"
#include "droqbxml/records/basCommonProcs.hpp"
#include "droqbxml/records/internal/TextSearch.hpp"

namespace droqbxml {

DroCustomer::DroCustomer() = default;

const ClassInfo& DroCustomer::typeInfo() {
  using C = DroCustomer;
  static const ClassInfo info = [] {
    Members members;
    members.property(u"ParentRef", &C::ParentRef, &C::ParentRef)
        .property(u"BillAddress", &C::BillAddress, &C::BillAddress)
        .property(u"CustomerTypeRef", &C::CustomerTypeRef, &C::CustomerTypeRef)
        .property(u"ShipAddress", &C::ShipAddress, &C::ShipAddress)
        .property(u"TermsRef", &C::TermsRef, &C::TermsRef)
        .property(u"SalesRepRef", &C::SalesRepRef, &C::SalesRepRef)
        .property(u"SalesTaxCodeRef", &C::SalesTaxCodeRef, &C::SalesTaxCodeRef)
        .property(u"ItemSalesTaxRef", &C::ItemSalesTaxRef, &C::ItemSalesTaxRef)
        .property(u"JobTypeRef", &C::JobTypeRef, &C::JobTypeRef)
        .property(u"DroCustomerCol", &C::DroCustomerCol, &C::DroCustomerCol);
    addFieldMembers(members, kFields);
    members.method(u"ParseCustInfo", &C::ParseCustInfo)
        .optional(1)
        .method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroCustomer", members.take());
  }();
  return info;
}

Ref<droqbxml::DroCustomerCol> DroCustomer::DroCustomerCol() const {
  if (!collection_) collection_ = std::make_shared<droqbxml::DroCustomerCol>();
  return collection_;
}

void DroCustomer::applyRule(size_t index, const Text& checked) {
  if (index == RecordOf::index<u"NonQbCityStateZip">()) {
    const TextView trimmed = trimView(checked);
    storeField(index, trimmed.empty() || trimmed == u"," ? Text() : checked);
  } else if (index == RecordOf::index<u"NonQbFileName">()) {
    storeField(index, checked);
    // The title is the file name after the last backslash of the trimmed path.
    const TextView trimmed = trimView(checked);
    if (!trimmed.empty()) {
      const auto slash = trimmed.rfind(u'\\');
      storeField(RecordOf::index<u"NonQbFileTitle">(),
                 Text(slash == TextView::npos ? trimmed : trimmed.substr(slash + 1)));
    }
  } else {
    Record::applyRule(index, checked);
  }
}

int32_t DroCustomer::ParseRs(const Text& Value, int32_t StartPoint) {
  const internal::SearchScope scope(Value);
  int32_t pos = StartPoint < 1 ? 1 : StartPoint;
  int32_t q1 = 0;
  for (;;) {
    if (basCommonProcs::findInResponse(pos, Value, u"<CustomerRet>") == 0) return pos;
    const int32_t r = basCommonProcs::findInResponse(pos, Value, u"requestID=");
    if (r == 0) return pos;  // a response without a requestID is never read
    q1 = basCommonProcs::findInResponse(r, Value, u"\"");
    const int32_t q2 = q1 == 0 ? 0 : basCommonProcs::findInResponse(q1 + 1, Value, u"\"");
    if (q2 == 0) return pos;  // an attribute cut short: nothing to match
    pos = q2;
    const TextView id =
        TextView(Value).substr(static_cast<size_t>(q1), static_cast<size_t>(q2 - q1 - 1));
    if (RequestID().empty() || id == RequestID()) break;
  }
  int32_t start = q1;
  int32_t end = pos;
  FieldReader<DroCustomer> read(*this, Value, start, end, u"<CustomerRet>");
  read.required<u"ListID", u"TimeCreated", u"TimeModified", u"EditSequence", u"Name", u"FullName",
                u"IsActive">();
  parentRef_.ParseRs(u"ParentRef", Value, start, end);
  read.required<u"Sublevel">();
  read.optional<u"CompanyName", u"Salutation", u"FirstName", u"MiddleName", u"LastName",
                u"Suffix">();
  billAddress_.ParseRs(u"BillAddress", Value, start, end);
  // "Fax" and "IsStatementWithParent" are not read.
  read.optional<u"PrintAs", u"Phone", u"Mobile", u"Pager", u"AltPhone", u"Email", u"Contact",
                u"AltContact">();
  customerTypeRef_.ParseRs(u"CustomerTypeRef", Value, start, end);
  shipAddress_.ParseRs(u"ShipAddress", Value, start, end);
  termsRef_.ParseRs(u"TermsRef", Value, start, end);
  salesRepRef_.ParseRs(u"SalesRepRef", Value, start, end);
  read.optional<u"Balance", u"OpenBalance", u"OpenBalanceDate", u"TotalBalance">();
  salesTaxCodeRef_.ParseRs(u"SalesTaxCodeRef", Value, start, end);
  itemSalesTaxRef_.ParseRs(u"ItemSalesTaxRef", Value, start, end);
  read.optional<u"ResaleNumber", u"AccountNumber", u"CreditLimit", u"JobStatus", u"JobStartDate",
                u"JobProjectedEndDate", u"JobEndDate", u"JobDesc">();
  jobTypeRef_.ParseRs(u"JobTypeRef", Value, start, end);
  read.optional<u"Notes", u"DeliveryMethod">();
  return end;
}

int32_t DroCustomer::ParseCustInfo(const Text& sValueA, int32_t lStartPointA) {
  const internal::SearchScope scope(sValueA);
  const int32_t pos = lStartPointA < 1 ? 1 : lStartPointA;
  if (basCommonProcs::findInResponse(pos, sValueA, u"<CustomerRet>") == 0) return 0;
  // Reading starts at the given position, not at the "<CustomerRet>" found.
  int32_t start = pos;
  int32_t end = pos;
  FieldReader<DroCustomer> read(*this, sValueA, start, end);
  read.required<u"NonQbFileName">();
  read.optional<u"FirstName", u"MiddleName", u"LastName", u"CompanyName">();
  billAddress_.ParseRs(u"BillAddress", sValueA, start, end);
  read.optional<u"NonQbJobName">();
  NonQbCityStateZip(billAddress_->City() + u", " + billAddress_->State() + u"  " +
                    billAddress_->PostalCode());
  return end;
}

Text DroCustomer::PrintOut() const {
  DumpWriter dump(u"CUSTOMER:");
  dump.untabbed(u"RequestID", RequestID());  // the one field printed without a TAB
  dump.fields<u"ListID", u"TimeCreated", u"TimeModified", u"EditSequence", u"Name", u"FullName",
              u"IsActive">(*this);
  dump.block(u"PARENTREF:", parentRef_->PrintOut(), u"/PARENTREF");
  dump.fields<u"Sublevel", u"CompanyName", u"Salutation", u"FirstName", u"MiddleName", u"LastName",
              u"Suffix">(*this);
  dump.block(u"BILLADDRESS:", billAddress_->PrintOut(), u"/BILLADDRESS");
  dump.fields<u"PrintAs", u"Phone", u"Mobile", u"Pager", u"AltPhone", u"Fax", u"Email", u"Contact",
              u"AltContact">(*this);
  dump.block(u"CUSTOMERTYPEREF:", customerTypeRef_->PrintOut(), u"/CUSTOMERTYPEREF");
  // The closing label is cut short; hosts match the text as it always was.
  dump.block(u"SHIPADDRESS:", shipAddress_->PrintOut(), u"/SHIPADDRES");
  dump.block(u"TERMSREF:", termsRef_->PrintOut(), u"/TERMSREF");
  dump.block(u"SALESREPREF:", salesRepRef_->PrintOut(), u"/SALESREPREF");
  dump.fields<u"Balance", u"OpenBalance", u"OpenBalanceDate", u"TotalBalance">(*this);
  dump.block(u"SALESTAXCODEREF:", salesTaxCodeRef_->PrintOut(), u"/SALESTAXCODEREF");
  dump.block(u"ITEMSALESTAXREF:", itemSalesTaxRef_->PrintOut(), u"/ITEMSALESTAXREF");
  dump.fields<u"ResaleNumber", u"AccountNumber", u"CreditLimit", u"JobStatus", u"JobStartDate",
              u"JobProjectedEndDate", u"JobEndDate", u"JobDesc">(*this);
  dump.block(u"JOBTYPEREF:", jobTypeRef_->PrintOut(), u"/JOBTYPEREF");
  dump.fields<u"Notes", u"IsStatementWithParent", u"DeliveryMethod">(*this);
  return dump.take();
}

}  // namespace droqbxml

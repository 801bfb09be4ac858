// The invoice header: reading an "InvoiceAddRet".
#include "droqbxml/records/DroInvoice.hpp"

namespace droqbxml {

const ClassInfo& DroInvoice::typeInfo() {
  using C = DroInvoice;
  static const ClassInfo info = [] {
    Members members;
    members.property(u"CustomerRef", &C::CustomerRef, &C::CustomerRef)
        .property(u"ClassRef", &C::ClassRef, &C::ClassRef)
        .property(u"ARAccountRef", &C::ARAccountRef, &C::ARAccountRef)
        .property(u"BillAddress", &C::BillAddress, &C::BillAddress)
        .property(u"ShipAddress", &C::ShipAddress, &C::ShipAddress)
        .property(u"TermsRef", &C::TermsRef, &C::TermsRef)
        .property(u"SalesRepRef", &C::SalesRepRef, &C::SalesRepRef)
        .property(u"ShipMethodRef", &C::ShipMethodRef, &C::ShipMethodRef)
        .property(u"ItemSalesTaxRef", &C::ItemSalesTaxRef, &C::ItemSalesTaxRef)
        .property(u"CustomerMsgRef", &C::CustomerMsgRef, &C::CustomerMsgRef)
        .property(u"CustomerSalesTaxCodeRef", &C::CustomerSalesTaxCodeRef,
                  &C::CustomerSalesTaxCodeRef)
        .property(u"InvoiceLines", &C::InvoiceLines, &C::InvoiceLines)
        .property(u"InvoiceLineGroups", &C::InvoiceLineGroups, &C::InvoiceLineGroups);
    addFieldMembers(members, kFields);
    members.method(u"ParseRs", textParseRs(&C::ParseRs)).optional(1);
    return ClassInfo(u"DroInvoice", members.take());
  }();
  return info;
}

int32_t DroInvoice::ParseRs(const Text& Value, int32_t StartPoint) {
  return parseTxn(Value, StartPoint, [&](Reader& read, int32_t& s, int32_t& e) {
    read.required<u"TxnID", u"TimeCreated", u"TimeModified", u"EditSequence", u"TxnNumber">();
    customerRef_.ParseRs(u"CustomerRef", Value, s, e, true, u"<InvoiceAddRet>");
    classRef_.ParseRs(u"ClassRef", Value, s, e);
    arAccountRef_.ParseRs(u"ARAccountRef", Value, s, e);
    read.required<u"TxnDate">();
    read.optional<u"RefNumber">();
    billAddress_.ParseRs(u"BillAddress", Value, s, e);
    shipAddress_.ParseRs(u"ShipAddress", Value, s, e);
    read.optional<u"IsPending", u"IsFinanceCharge", u"PONumber">();
    termsRef_.ParseRs(u"TermsRef", Value, s, e);
    read.optional<u"DueDate">();
    salesRepRef_.ParseRs(u"SalesRepRef", Value, s, e);
    read.optional<u"FOB", u"ShipDate">();
    shipMethodRef_.ParseRs(u"ShipMethodRef", Value, s, e);
    read.optional<u"Subtotal">();
    itemSalesTaxRef_.ParseRs(u"ItemSalesTaxRef", Value, s, e);
    read.optional<u"SalesTaxPercentage", u"SalesTaxTotal", u"AppliedAmount", u"BalanceRemaining",
                  u"Memo">();
    customerMsgRef_.ParseRs(u"CustomerMsgRef", Value, s, e);
    read.optional<u"IsToBePrinted">();
    customerSalesTaxCodeRef_.ParseRs(u"CustomerSalesTaxCodeRef", Value, s, e);
    read.optional<u"SuggestedDiscountAmount", u"SuggestedDiscountDate">();
  });
}

}  // namespace droqbxml

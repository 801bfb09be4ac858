// The estimate header: reading an "EstimateAddRet" and its dump.
#include "droqbxml/records/DroEstimate.hpp"

namespace droqbxml {

const ClassInfo& DroEstimate::typeInfo() {
  using C = DroEstimate;
  static const ClassInfo info = [] {
    Members members;
    members.property(u"CustomerRef", &C::CustomerRef, &C::CustomerRef)
        .property(u"ClassRef", &C::ClassRef, &C::ClassRef)
        .property(u"BillAddress", &C::BillAddress, &C::BillAddress)
        .property(u"TermsRef", &C::TermsRef, &C::TermsRef)
        .property(u"SalesRepRef", &C::SalesRepRef, &C::SalesRepRef)
        .property(u"ItemSalesTaxRef", &C::ItemSalesTaxRef, &C::ItemSalesTaxRef)
        .property(u"CustomerMsgRef", &C::CustomerMsgRef, &C::CustomerMsgRef)
        .property(u"CustomerSalesTaxCodeRef", &C::CustomerSalesTaxCodeRef,
                  &C::CustomerSalesTaxCodeRef)
        .property(u"EstimateLines", &C::EstimateLines, &C::EstimateLines)
        .property(u"EstimateLineGroups", &C::EstimateLineGroups, &C::EstimateLineGroups);
    addFieldMembers(members, kFields);
    members.method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroEstimate", members.take());
  }();
  return info;
}

int32_t DroEstimate::ParseRs(const Text& Value, int32_t StartPoint) {
  return parseTxn(Value, StartPoint, [&](Reader& read, int32_t& s, int32_t& e) {
    read.required<u"TxnID", u"TimeCreated", u"TimeModified", u"EditSequence", u"TxnNumber">();
    customerRef_.ParseRs(u"CustomerRef", Value, s, e, true, u"<EstimateAddRet>");
    classRef_.ParseRs(u"ClassRef", Value, s, e);
    read.required<u"TxnDate">();
    read.optional<u"RefNumber">();
    billAddress_.ParseRs(u"BillAddress", Value, s, e);
    read.optional<u"PONumber">();
    termsRef_.ParseRs(u"TermsRef", Value, s, e);
    read.optional<u"DueDate">();
    salesRepRef_.ParseRs(u"SalesRepRef", Value, s, e);
    read.optional<u"FOB", u"Subtotal">();
    itemSalesTaxRef_.ParseRs(u"ItemSalesTaxRef", Value, s, e);
    read.optional<u"SalesTaxPercentage", u"SalesTaxTotal", u"TotalAmount", u"Memo">();
    customerMsgRef_.ParseRs(u"CustomerMsgRef", Value, s, e);
    read.optional<u"IsToBePrinted">();
    customerSalesTaxCodeRef_.ParseRs(u"CustomerSalesTaxCodeRef", Value, s, e);
  });
}

Text DroEstimate::PrintOut() const {
  DumpWriter dump(u"ESTIMATE:");
  dump.untabbed(u"RequestID", RequestID());
  dump.fields<u"TxnID", u"TimeCreated", u"TimeModified", u"EditSequence", u"TxnNumber">(*this);
  dump.block(u"CUSTOMERREF:", customerRef_->PrintOut(), u"/CUSTOMERREF");
  dump.block(u"CLASSREF:", classRef_->PrintOut(), u"/CLASSREF");
  dump.fields<u"TxnDate", u"RefNumber">(*this);
  dump.block(u"BILLADDRESS:", billAddress_->PrintOut(), u"/BILLADDRESS");
  dump.fields<u"PONumber">(*this);
  dump.block(u"TERMSREF:", termsRef_->PrintOut(), u"/TERMSREF");
  dump.fields<u"DueDate">(*this);
  dump.block(u"SALESREPREF:", salesRepRef_->PrintOut(), u"/SALESREPREF");
  dump.fields<u"FOB", u"Subtotal">(*this);
  dump.block(u"ITEMSALESTAXREF:", itemSalesTaxRef_->PrintOut(), u"/ITEMSALESTAXREF");
  dump.fields<u"SalesTaxPercentage", u"SalesTaxTotal", u"TotalAmount", u"Memo">(*this);
  dump.block(u"CUSTOMERMSGREF:", customerMsgRef_->PrintOut(), u"/CUSTOMERMSGREF");
  dump.fields<u"IsToBePrinted">(*this);
  dump.block(u"CUSTOMERSALESTAXCODEREF:", customerSalesTaxCodeRef_->PrintOut(),
             u"/CUSTOMERSALESTAXCODEREF");
  for (const auto& line : *lines_) {
    dump.block(u"ESTIMATELINES:", line->PrintOut(), u"/ESTIMATELINES");
  }
  // The groups are walked as estimate lines: the first one is a type mismatch.
  if (groups_->Count() > 0) raiseRuntimeError(RuntimeError::kTypeMismatch);
  return dump.take();
}

}  // namespace droqbxml

// DroInvoice: a billing transaction. The host fills it for an "InvoiceAddRq"
// (DroXmlBuilder::BuildAddInvoice, which stores the request's identifier in RequestID);
// ParseRs fills it from the matching "InvoiceAddRet" with its lines and line groups. The
// class has no dump of its own.
#ifndef DROQBXML_RECORDS_DROINVOICE_HPP_
#define DROQBXML_RECORDS_DROINVOICE_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroAddress.hpp"
#include "droqbxml/records/DroInvoiceLine.hpp"
#include "droqbxml/records/DroInvoiceLineCol.hpp"
#include "droqbxml/records/DroInvoiceLineGroup.hpp"
#include "droqbxml/records/DroInvoiceLineGroupCol.hpp"
#include "droqbxml/records/Transaction.hpp"

namespace droqbxml {

class DroInvoice final : public TxnRecordOf<DroInvoice, TxnKind::Invoice> {
 public:
  static constexpr std::array kFields{
      txnText(u"TxnID"),
      txnText(u"TimeCreated"),
      txnText(u"TimeModified"),
      txnText(u"EditSequence"),
      txnText(u"TxnNumber"),
      txnText(u"TxnDate"),
      txnText(u"RefNumber"),
      txnText(u"IsPending"),
      txnText(u"IsFinanceCharge"),
      txnText(u"PONumber"),
      txnText(u"DueDate"),
      txnText(u"FOB"),
      txnText(u"ShipDate"),
      txnText(u"Subtotal"),
      txnText(u"SalesTaxPercentage"),
      txnText(u"SalesTaxTotal"),
      txnText(u"AppliedAmount"),
      txnText(u"BalanceRemaining"),
      txnText(u"Memo"),
      txnText(u"IsToBePrinted"),
      txnText(u"SuggestedDiscountAmount"),
      txnText(u"SuggestedDiscountDate"),
      txnText(u"RequestID"),
  };

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const ObjectProperty<DroCustomerRef>& CustomerRef() const { return customerRef_; }
  void CustomerRef(Ref<DroCustomerRef> v) { customerRef_ = std::move(v); }
  const ObjectProperty<DroClassRef>& ClassRef() const { return classRef_; }
  void ClassRef(Ref<DroClassRef> v) { classRef_ = std::move(v); }
  const ObjectProperty<DroAccountRef>& ARAccountRef() const { return arAccountRef_; }
  void ARAccountRef(Ref<DroAccountRef> v) { arAccountRef_ = std::move(v); }
  const ObjectProperty<DroAddress>& BillAddress() const { return billAddress_; }
  void BillAddress(Ref<DroAddress> v) { billAddress_ = std::move(v); }
  const ObjectProperty<DroAddress>& ShipAddress() const { return shipAddress_; }
  void ShipAddress(Ref<DroAddress> v) { shipAddress_ = std::move(v); }
  const ObjectProperty<DroTermsRef>& TermsRef() const { return termsRef_; }
  void TermsRef(Ref<DroTermsRef> v) { termsRef_ = std::move(v); }
  const ObjectProperty<DroSalesRepRef>& SalesRepRef() const { return salesRepRef_; }
  void SalesRepRef(Ref<DroSalesRepRef> v) { salesRepRef_ = std::move(v); }
  const ObjectProperty<DroShipMethodRef>& ShipMethodRef() const { return shipMethodRef_; }
  void ShipMethodRef(Ref<DroShipMethodRef> v) { shipMethodRef_ = std::move(v); }
  const ObjectProperty<DroItemSalesTaxRef>& ItemSalesTaxRef() const { return itemSalesTaxRef_; }
  void ItemSalesTaxRef(Ref<DroItemSalesTaxRef> v) { itemSalesTaxRef_ = std::move(v); }
  const ObjectProperty<DroCustomerMsgRef>& CustomerMsgRef() const { return customerMsgRef_; }
  void CustomerMsgRef(Ref<DroCustomerMsgRef> v) { customerMsgRef_ = std::move(v); }
  const ObjectProperty<DroCustomerSalesTaxCodeRef>& CustomerSalesTaxCodeRef() const {
    return customerSalesTaxCodeRef_;
  }
  void CustomerSalesTaxCodeRef(Ref<DroCustomerSalesTaxCodeRef> v) {
    customerSalesTaxCodeRef_ = std::move(v);
  }
  const ObjectProperty<DroInvoiceLineCol>& InvoiceLines() const { return lines_; }
  void InvoiceLines(Ref<DroInvoiceLineCol> v) { lines_ = std::move(v); }
  const ObjectProperty<DroInvoiceLineGroupCol>& InvoiceLineGroups() const { return groups_; }
  void InvoiceLineGroups(Ref<DroInvoiceLineGroupCol> v) { groups_ = std::move(v); }

  const Text& TxnID() const { return field<u"TxnID">(); }
  void TxnID(const Text& v) { setField<u"TxnID">(v); }
  const Text& TimeCreated() const { return field<u"TimeCreated">(); }
  void TimeCreated(const Text& v) { setField<u"TimeCreated">(v); }
  const Text& TimeModified() const { return field<u"TimeModified">(); }
  void TimeModified(const Text& v) { setField<u"TimeModified">(v); }
  const Text& EditSequence() const { return field<u"EditSequence">(); }
  void EditSequence(const Text& v) { setField<u"EditSequence">(v); }
  const Text& TxnNumber() const { return field<u"TxnNumber">(); }
  void TxnNumber(const Text& v) { setField<u"TxnNumber">(v); }
  const Text& TxnDate() const { return field<u"TxnDate">(); }
  void TxnDate(const Text& v) { setField<u"TxnDate">(v); }
  const Text& RefNumber() const { return field<u"RefNumber">(); }
  void RefNumber(const Text& v) { setField<u"RefNumber">(v); }
  const Text& IsPending() const { return field<u"IsPending">(); }
  void IsPending(const Text& v) { setField<u"IsPending">(v); }
  const Text& IsFinanceCharge() const { return field<u"IsFinanceCharge">(); }
  void IsFinanceCharge(const Text& v) { setField<u"IsFinanceCharge">(v); }
  const Text& PONumber() const { return field<u"PONumber">(); }
  void PONumber(const Text& v) { setField<u"PONumber">(v); }
  const Text& DueDate() const { return field<u"DueDate">(); }
  void DueDate(const Text& v) { setField<u"DueDate">(v); }
  const Text& FOB() const { return field<u"FOB">(); }
  void FOB(const Text& v) { setField<u"FOB">(v); }
  const Text& ShipDate() const { return field<u"ShipDate">(); }
  void ShipDate(const Text& v) { setField<u"ShipDate">(v); }
  const Text& Subtotal() const { return field<u"Subtotal">(); }
  void Subtotal(const Text& v) { setField<u"Subtotal">(v); }
  const Text& SalesTaxPercentage() const { return field<u"SalesTaxPercentage">(); }
  void SalesTaxPercentage(const Text& v) { setField<u"SalesTaxPercentage">(v); }
  const Text& SalesTaxTotal() const { return field<u"SalesTaxTotal">(); }
  void SalesTaxTotal(const Text& v) { setField<u"SalesTaxTotal">(v); }
  const Text& AppliedAmount() const { return field<u"AppliedAmount">(); }
  void AppliedAmount(const Text& v) { setField<u"AppliedAmount">(v); }
  const Text& BalanceRemaining() const { return field<u"BalanceRemaining">(); }
  void BalanceRemaining(const Text& v) { setField<u"BalanceRemaining">(v); }
  const Text& Memo() const { return field<u"Memo">(); }
  void Memo(const Text& v) { setField<u"Memo">(v); }
  const Text& IsToBePrinted() const { return field<u"IsToBePrinted">(); }
  void IsToBePrinted(const Text& v) { setField<u"IsToBePrinted">(v); }
  const Text& SuggestedDiscountAmount() const { return field<u"SuggestedDiscountAmount">(); }
  void SuggestedDiscountAmount(const Text& v) { setField<u"SuggestedDiscountAmount">(v); }
  const Text& SuggestedDiscountDate() const { return field<u"SuggestedDiscountDate">(); }
  void SuggestedDiscountDate(const Text& v) { setField<u"SuggestedDiscountDate">(v); }

  // As DroEstimate::ParseRs, for the "InvoiceAddRet" and its header order; a group's key
  // may be missing without an error.
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);

 private:
  ObjectProperty<DroCustomerRef> customerRef_;
  ObjectProperty<DroClassRef> classRef_;
  ObjectProperty<DroAccountRef> arAccountRef_;
  ObjectProperty<DroAddress> billAddress_;
  ObjectProperty<DroAddress> shipAddress_;
  ObjectProperty<DroTermsRef> termsRef_;
  ObjectProperty<DroSalesRepRef> salesRepRef_;
  ObjectProperty<DroShipMethodRef> shipMethodRef_;
  ObjectProperty<DroItemSalesTaxRef> itemSalesTaxRef_;
  ObjectProperty<DroCustomerMsgRef> customerMsgRef_;
  ObjectProperty<DroCustomerSalesTaxCodeRef> customerSalesTaxCodeRef_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROINVOICE_HPP_

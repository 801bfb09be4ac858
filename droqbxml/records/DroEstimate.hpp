// DroEstimate: a customer quotation. The host fills it for an "EstimateAddRq"
// (DroXmlBuilder::BuildAddEstimate, which stores the request's identifier in RequestID);
// ParseRs fills it from the matching "EstimateAddRet" with its lines and line groups;
// PrintOut dumps the header and the plain lines.
#ifndef DROQBXML_RECORDS_DROESTIMATE_HPP_
#define DROQBXML_RECORDS_DROESTIMATE_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroAddress.hpp"
#include "droqbxml/records/DroEstimateLine.hpp"
#include "droqbxml/records/DroEstimateLineCol.hpp"
#include "droqbxml/records/DroEstimateLineGroup.hpp"
#include "droqbxml/records/DroEstimateLineGroupCol.hpp"
#include "droqbxml/records/Transaction.hpp"

namespace droqbxml {

class DroEstimate final : public TxnRecordOf<DroEstimate, TxnKind::Estimate> {
 public:
  static constexpr std::array kFields{
      txnText(u"TxnID"),         txnText(u"TimeCreated"), txnText(u"TimeModified"),
      txnText(u"EditSequence"),  txnText(u"TxnNumber"),   txnText(u"TxnDate"),
      txnText(u"RefNumber"),     txnText(u"PONumber"),    txnText(u"DueDate"),
      txnText(u"FOB"),           txnText(u"Subtotal"),    txnText(u"SalesTaxPercentage"),
      txnText(u"SalesTaxTotal"), txnText(u"TotalAmount"), txnText(u"Memo"),
      txnText(u"IsToBePrinted"), txnText(u"RequestID"),
  };

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const ObjectProperty<DroCustomerRef>& CustomerRef() const { return customerRef_; }
  void CustomerRef(Ref<DroCustomerRef> v) { customerRef_ = std::move(v); }
  const ObjectProperty<DroClassRef>& ClassRef() const { return classRef_; }
  void ClassRef(Ref<DroClassRef> v) { classRef_ = std::move(v); }
  const ObjectProperty<DroAddress>& BillAddress() const { return billAddress_; }
  void BillAddress(Ref<DroAddress> v) { billAddress_ = std::move(v); }
  const ObjectProperty<DroTermsRef>& TermsRef() const { return termsRef_; }
  void TermsRef(Ref<DroTermsRef> v) { termsRef_ = std::move(v); }
  const ObjectProperty<DroSalesRepRef>& SalesRepRef() const { return salesRepRef_; }
  void SalesRepRef(Ref<DroSalesRepRef> v) { salesRepRef_ = std::move(v); }
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
  const ObjectProperty<DroEstimateLineCol>& EstimateLines() const { return lines_; }
  void EstimateLines(Ref<DroEstimateLineCol> v) { lines_ = std::move(v); }
  const ObjectProperty<DroEstimateLineGroupCol>& EstimateLineGroups() const { return groups_; }
  void EstimateLineGroups(Ref<DroEstimateLineGroupCol> v) { groups_ = std::move(v); }

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
  const Text& PONumber() const { return field<u"PONumber">(); }
  void PONumber(const Text& v) { setField<u"PONumber">(v); }
  const Text& DueDate() const { return field<u"DueDate">(); }
  void DueDate(const Text& v) { setField<u"DueDate">(v); }
  const Text& FOB() const { return field<u"FOB">(); }
  void FOB(const Text& v) { setField<u"FOB">(v); }
  const Text& Subtotal() const { return field<u"Subtotal">(); }
  void Subtotal(const Text& v) { setField<u"Subtotal">(v); }
  const Text& SalesTaxPercentage() const { return field<u"SalesTaxPercentage">(); }
  void SalesTaxPercentage(const Text& v) { setField<u"SalesTaxPercentage">(v); }
  const Text& SalesTaxTotal() const { return field<u"SalesTaxTotal">(); }
  void SalesTaxTotal(const Text& v) { setField<u"SalesTaxTotal">(v); }
  const Text& TotalAmount() const { return field<u"TotalAmount">(); }
  void TotalAmount(const Text& v) { setField<u"TotalAmount">(v); }
  const Text& Memo() const { return field<u"Memo">(); }
  void Memo(const Text& v) { setField<u"Memo">(v); }
  const Text& IsToBePrinted() const { return field<u"IsToBePrinted">(); }
  void IsToBePrinted(const Text& v) { setField<u"IsToBePrinted">(v); }

  // Finds the "EstimateAddRet" whose add response carries RequestID (any, when it is "")
  // from StartPoint and reads it: the header in response order ("TxnID" through "TxnNumber"
  // and "TxnDate" required), the lines, the groups. Returns where reading stopped, or the
  // position reached when there is nothing to read.
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The header and one block per plain line. An estimate holding a line group is the
  // runtime's 13: the dump walks the groups as lines, and hosts have always had it so.
  Text PrintOut() const;

 private:
  ObjectProperty<DroCustomerRef> customerRef_;
  ObjectProperty<DroClassRef> classRef_;
  ObjectProperty<DroAddress> billAddress_;
  ObjectProperty<DroTermsRef> termsRef_;
  ObjectProperty<DroSalesRepRef> salesRepRef_;
  ObjectProperty<DroItemSalesTaxRef> itemSalesTaxRef_;
  ObjectProperty<DroCustomerMsgRef> customerMsgRef_;
  ObjectProperty<DroCustomerSalesTaxCodeRef> customerSalesTaxCodeRef_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROESTIMATE_HPP_

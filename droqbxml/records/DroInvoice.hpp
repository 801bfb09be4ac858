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
#include "droqbxml/records/IndexedResponse.hpp"
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

  const ObjectProperty<DroAccountRef>& ARAccountRef() const { return arAccountRef_.held(); }
  void ARAccountRef(Ref<DroAccountRef> v) { arAccountRef_ = std::move(v); }
  const ObjectProperty<DroAddress>& ShipAddress() const { return shipAddress_.held(); }
  void ShipAddress(Ref<DroAddress> v) { shipAddress_ = std::move(v); }
  const ObjectProperty<DroShipMethodRef>& ShipMethodRef() const { return shipMethodRef_.held(); }
  void ShipMethodRef(Ref<DroShipMethodRef> v) { shipMethodRef_ = std::move(v); }
  const ObjectProperty<DroInvoiceLineCol>& InvoiceLines() const { return lines_.held(); }
  void InvoiceLines(Ref<DroInvoiceLineCol> v) { lines_ = std::move(v); }
  const ObjectProperty<DroInvoiceLineGroupCol>& InvoiceLineGroups() const { return groups_.held(); }
  void InvoiceLineGroups(Ref<DroInvoiceLineGroupCol> v) { groups_ = std::move(v); }

  const Text& IsPending() const { return field<u"IsPending">(); }
  void IsPending(const Text& v) { setField<u"IsPending">(v); }
  const Text& IsFinanceCharge() const { return field<u"IsFinanceCharge">(); }
  void IsFinanceCharge(const Text& v) { setField<u"IsFinanceCharge">(v); }
  const Text& ShipDate() const { return field<u"ShipDate">(); }
  void ShipDate(const Text& v) { setField<u"ShipDate">(v); }
  const Text& AppliedAmount() const { return field<u"AppliedAmount">(); }
  void AppliedAmount(const Text& v) { setField<u"AppliedAmount">(v); }
  const Text& BalanceRemaining() const { return field<u"BalanceRemaining">(); }
  void BalanceRemaining(const Text& v) { setField<u"BalanceRemaining">(v); }
  const Text& SuggestedDiscountAmount() const { return field<u"SuggestedDiscountAmount">(); }
  void SuggestedDiscountAmount(const Text& v) { setField<u"SuggestedDiscountAmount">(v); }
  const Text& SuggestedDiscountDate() const { return field<u"SuggestedDiscountDate">(); }
  void SuggestedDiscountDate(const Text& v) { setField<u"SuggestedDiscountDate">(v); }

  // As DroEstimate::ParseRs, for the "InvoiceAddRet" and its header order; a group's key
  // may be missing without an error.
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, int32_t StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }

 private:
  mutable ObjectProperty<DroAccountRef> arAccountRef_;
  mutable ObjectProperty<DroAddress> shipAddress_;
  mutable ObjectProperty<DroShipMethodRef> shipMethodRef_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROINVOICE_HPP_

// The engine of the transaction records (estimates and invoices): one class template per
// part of a transaction (line, line collection, line group, group collection) over a table
// of the two kinds, and the base of the two header records, which finds its own add
// response and reads header, lines and groups in one forward pass.
//
// Lines and groups are kept in keyed collections: a line under the full name of its item
// (or, without an item, its description), a group under its item group's full name, so a
// second line of the same item, or a second group of the same item group, is read into the
// member the first one filled. The reading loops search their tags without bounds, as the
// element reads do: lines nested in a group are read as the transaction's own lines too.
#ifndef DROQBXML_RECORDS_TRANSACTION_HPP_
#define DROQBXML_RECORDS_TRANSACTION_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/qbxml/Enumerations.hpp"
#include "droqbxml/records/DroAddress.hpp"
#include "droqbxml/records/DroObjRef.hpp"
#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/Record.hpp"
#include "droqbxml/records/RecordCol.hpp"
#include "droqbxml/records/internal/TextSearch.hpp"

namespace droqbxml {

enum class TxnKind : uint8_t { Estimate, Invoice };

struct TxnKindSpec {
  std::u16string_view lineClass;
  std::u16string_view lineColClass;
  std::u16string_view groupClass;
  std::u16string_view groupColClass;
  std::u16string_view linesProperty;  // a group's lines: "EstimateLines"
  std::u16string_view returnTag;
  std::u16string_view lineTag;
  std::u16string_view groupTag;
  std::u16string_view lineContext;   // names required line elements in the empty-element error
  std::u16string_view groupContext;  // the same for groups, and for an estimate group's key
  bool groupKeyRequired;
  std::u16string_view lineHeading;
  std::u16string_view groupHeading;
  std::u16string_view linesOpening;  // a group dump's line block
  std::u16string_view linesClosing;
};

inline constexpr std::array<TxnKindSpec, 2> kTxnKinds{{
    {u"DroEstimateLine", u"DroEstimateLineCol", u"DroEstimateLineGroup", u"DroEstimateLineGroupCol",
     u"EstimateLines", u"<EstimateAddRet>", u"<EstimateLineRet>", u"<EstimateLineGroupRet>",
     u"<EstimateAddRet><EstimateLineRet>", u"<EstimateAddRet><EstimateLineGroupRet>", true,
     u"ESTIMATE LINE:", u"ESTIMATE LINE GROUP:", u"ESTIMATELINES:", u"/ESTIMATELINES"},
    // The invoice group context lacks its closing ">" and the headings mix cases: both are
    // in the texts hosts have always received.
    {u"DroInvoiceLine", u"DroInvoiceLineCol", u"DroInvoiceLineGroup", u"DroInvoiceLineGroupCol",
     u"InvoiceLines", u"<InvoiceAddRet>", u"<InvoiceLineRet>", u"<InvoiceLineGroupRet>",
     u"<InvoiceAddRet><InvoiceLineRet>", u"<InvoiceAddRet><InvoiceLineGroupRet", false,
     u"Invoice LINE:", u"Invoice LINE GROUP:", u"InvoiceLINES:", u"/InvoiceLINES"},
}};

// Transaction texts are stored as given or read: no trimming, no checks.
constexpr FieldSpec txnText(std::u16string_view name) { return {name, Trim::None, Check::None}; }

template <TxnKind Kind>
consteval auto txnLineFields() {
  if constexpr (Kind == TxnKind::Estimate) {
    return std::array{txnText(u"TxnLineID"),         txnText(u"Desc"),    txnText(u"Rate"),
                      txnText(u"RatePercent"),       txnText(u"Amount"),  txnText(u"MarkupRate"),
                      txnText(u"MarkupRatePercent"), txnText(u"Quantity")};
  } else {
    return std::array{txnText(u"TxnLineID"),   txnText(u"Desc"),   txnText(u"Rate"),
                      txnText(u"RatePercent"), txnText(u"Amount"), txnText(u"ServiceDate"),
                      txnText(u"Quantity")};
  }
}

template <TxnKind Kind>
consteval auto txnGroupFields() {
  if constexpr (Kind == TxnKind::Estimate) {
    return std::array{txnText(u"Desc"), txnText(u"Quantity"), txnText(u"IsPrintItemsInGroup"),
                      txnText(u"TotalAmount")};
  } else {
    return std::array{txnText(u"Desc"), txnText(u"Quantity"), txnText(u"IsPrintItemsInGroup"),
                      txnText(u"TotalAmount"), txnText(u"ServiceDate")};
  }
}

// One line: an item, a class and a tax code reference and the line's texts. ItemType is
// the host's note of the item's kind for the add request; nothing reads or prints it.
template <TxnKind Kind>
class DroTxnLine final : public RecordOf<DroTxnLine<Kind>> {
 public:
  static constexpr const TxnKindSpec& kSpec = kTxnKinds[static_cast<size_t>(Kind)];
  static constexpr auto kFields = txnLineFields<Kind>();
  static constexpr bool kEstimate = Kind == TxnKind::Estimate;

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const ObjectProperty<DroItemRef>& ItemRef() const { return itemRef_.held(); }
  void ItemRef(Ref<DroItemRef> v) { itemRef_ = std::move(v); }
  const ObjectProperty<DroClassRef>& ClassRef() const { return classRef_.held(); }
  void ClassRef(Ref<DroClassRef> v) { classRef_ = std::move(v); }
  const ObjectProperty<DroSalesTaxCodeRef>& SalesTaxCodeRef() const {
    return salesTaxCodeRef_.held();
  }
  void SalesTaxCodeRef(Ref<DroSalesTaxCodeRef> v) { salesTaxCodeRef_ = std::move(v); }

  const Text& TxnLineID() const { return this->template field<u"TxnLineID">(); }
  void TxnLineID(const Text& v) { this->template setField<u"TxnLineID">(v); }
  const Text& Desc() const { return this->template field<u"Desc">(); }
  void Desc(const Text& v) { this->template setField<u"Desc">(v); }
  const Text& Rate() const { return this->template field<u"Rate">(); }
  void Rate(const Text& v) { this->template setField<u"Rate">(v); }
  const Text& RatePercent() const { return this->template field<u"RatePercent">(); }
  void RatePercent(const Text& v) { this->template setField<u"RatePercent">(v); }
  const Text& Amount() const { return this->template field<u"Amount">(); }
  void Amount(const Text& v) { this->template setField<u"Amount">(v); }
  const Text& Quantity() const { return this->template field<u"Quantity">(); }
  void Quantity(const Text& v) { this->template setField<u"Quantity">(v); }
  const Text& MarkupRate() const requires kEstimate {
    return this->template field<u"MarkupRate">();
  }
  void MarkupRate(const Text& v) requires kEstimate { this->template setField<u"MarkupRate">(v); }
  const Text& MarkupRatePercent() const requires kEstimate {
    return this->template field<u"MarkupRatePercent">();
  }
  void MarkupRatePercent(const Text& v) requires kEstimate {
    this->template setField<u"MarkupRatePercent">(v);
  }
  // Sent with the line, never read back from a response nor printed.
  const Text& ServiceDate() const requires(!kEstimate) {
    return this->template field<u"ServiceDate">();
  }
  void ServiceDate(const Text& v) requires(!kEstimate) {
    this->template setField<u"ServiceDate">(v);
  }
  udItemType ItemType() const { return itemType_; }
  void ItemType(udItemType v) { itemType_ = v; }

  // The line's elements from the cursor (no line tag is searched): "TxnLineID" required,
  // then the item reference, the texts and the other two references in response order.
  void ParseRs(const Text& Value, int32_t& StartPoint, int32_t& EndPoint);
  Text PrintOut() const;
  // The line's terminate operation, published with this spelling; it releases the three
  // references. The platform never runs it by itself (the name is not its terminate hook).
  void Class_Treminate();

 private:
  mutable ObjectProperty<DroItemRef> itemRef_;
  mutable ObjectProperty<DroClassRef> classRef_;
  mutable ObjectProperty<DroSalesTaxCodeRef> salesTaxCodeRef_;
  udItemType itemType_ = udUnknown;
};

template <TxnKind Kind>
class DroTxnLineCol final : public RecordCol<DroTxnLine<Kind>> {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // Reads every line tag from EndPoint on. A line with an "<ItemRef>" anywhere after its
  // tag is read into the member keyed by the first "FullName" after the cursor (added when
  // there is none); a line without one into the first member with its description, or a
  // member added under it. Once one description has matched a member, a later description
  // that matches none adds nothing. A round that leaves the cursor where it was goes on
  // from just after the tag it found.
  void ParseRs(const Text& Value, int32_t& StartPoint, int32_t& EndPoint);
};

// A line that expands an item group: its item group reference, texts and own lines.
template <TxnKind Kind>
class DroTxnLineGroup final : public RecordOf<DroTxnLineGroup<Kind>> {
 public:
  static constexpr const TxnKindSpec& kSpec = kTxnKinds[static_cast<size_t>(Kind)];
  static constexpr auto kFields = txnGroupFields<Kind>();
  static constexpr bool kEstimate = Kind == TxnKind::Estimate;

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const ObjectProperty<DroObjRef>& ItemGroupRef() const { return itemGroupRef_.held(); }
  void ItemGroupRef(Ref<DroObjRef> v) { itemGroupRef_ = std::move(v); }
  const ObjectProperty<DroTxnLineCol<Kind>>& EstimateLines() const requires kEstimate {
    return lines_.held();
  }
  void EstimateLines(Ref<DroTxnLineCol<Kind>> v) requires kEstimate { lines_ = std::move(v); }
  const ObjectProperty<DroTxnLineCol<Kind>>& InvoiceLines() const requires(!kEstimate) {
    return lines_.held();
  }
  void InvoiceLines(Ref<DroTxnLineCol<Kind>> v) requires(!kEstimate) { lines_ = std::move(v); }

  const Text& Desc() const { return this->template field<u"Desc">(); }
  void Desc(const Text& v) { this->template setField<u"Desc">(v); }
  const Text& Quantity() const { return this->template field<u"Quantity">(); }
  void Quantity(const Text& v) { this->template setField<u"Quantity">(v); }
  const Text& IsPrintItemsInGroup() const { return this->template field<u"IsPrintItemsInGroup">(); }
  void IsPrintItemsInGroup(const Text& v) { this->template setField<u"IsPrintItemsInGroup">(v); }
  const Text& TotalAmount() const { return this->template field<u"TotalAmount">(); }
  void TotalAmount(const Text& v) { this->template setField<u"TotalAmount">(v); }
  const Text& ServiceDate() const requires(!kEstimate) {
    return this->template field<u"ServiceDate">();
  }
  void ServiceDate(const Text& v) requires(!kEstimate) {
    this->template setField<u"ServiceDate">(v);
  }

  // Worked out afresh on every call: no text set, an empty item group reference and no
  // lines. A boolean in a value of any kind, as hosts have always received it.
  Variant IsEmpty() const;
  // "ItemGroupRef" (required), the texts ("IsPrintItemsInGroup" required), then the lines.
  void ParseRs(const Text& Value, int32_t& StartPoint, int32_t& EndPoint);
  // With lines, only the last line's block: each block replaces the text built before it.
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroObjRef> itemGroupRef_;
  mutable ObjectProperty<DroTxnLineCol<Kind>> lines_;
  mutable bool isEmpty_ = true;
};

template <TxnKind Kind>
class DroTxnLineGroupCol final : public RecordCol<DroTxnLineGroup<Kind>> {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }
};

// The group loop of a header record: every group tag from EndPoint on, keyed by the first
// "FullName" after the cursor.
template <TxnKind Kind>
void readGroups(DroTxnLineGroupCol<Kind>& groups, const Text& Value, int32_t& StartPoint,
                int32_t& EndPoint);

// What the two header records share: the references, addresses and texts both have, their
// line and group collections and the reading of an add response (Derived::kFields holds
// the shared texts' names).
template <class Derived, TxnKind Kind>
class TxnRecordOf : public RecordOf<Derived> {
 public:
  static constexpr const TxnKindSpec& kSpec = kTxnKinds[static_cast<size_t>(Kind)];
  using Reader = FieldReader<Derived>;

  const ObjectProperty<DroCustomerRef>& CustomerRef() const { return customerRef_.held(); }
  void CustomerRef(Ref<DroCustomerRef> v) { customerRef_ = std::move(v); }
  const ObjectProperty<DroClassRef>& ClassRef() const { return classRef_.held(); }
  void ClassRef(Ref<DroClassRef> v) { classRef_ = std::move(v); }
  const ObjectProperty<DroAddress>& BillAddress() const { return billAddress_.held(); }
  void BillAddress(Ref<DroAddress> v) { billAddress_ = std::move(v); }
  const ObjectProperty<DroTermsRef>& TermsRef() const { return termsRef_.held(); }
  void TermsRef(Ref<DroTermsRef> v) { termsRef_ = std::move(v); }
  const ObjectProperty<DroSalesRepRef>& SalesRepRef() const { return salesRepRef_.held(); }
  void SalesRepRef(Ref<DroSalesRepRef> v) { salesRepRef_ = std::move(v); }
  const ObjectProperty<DroItemSalesTaxRef>& ItemSalesTaxRef() const {
    return itemSalesTaxRef_.held();
  }
  void ItemSalesTaxRef(Ref<DroItemSalesTaxRef> v) { itemSalesTaxRef_ = std::move(v); }
  const ObjectProperty<DroCustomerMsgRef>& CustomerMsgRef() const { return customerMsgRef_.held(); }
  void CustomerMsgRef(Ref<DroCustomerMsgRef> v) { customerMsgRef_ = std::move(v); }
  const ObjectProperty<DroCustomerSalesTaxCodeRef>& CustomerSalesTaxCodeRef() const {
    return customerSalesTaxCodeRef_.held();
  }
  void CustomerSalesTaxCodeRef(Ref<DroCustomerSalesTaxCodeRef> v) {
    customerSalesTaxCodeRef_ = std::move(v);
  }
  const Text& TxnID() const { return this->template field<u"TxnID">(); }
  void TxnID(const Text& v) { this->template setField<u"TxnID">(v); }
  const Text& TimeCreated() const { return this->template field<u"TimeCreated">(); }
  void TimeCreated(const Text& v) { this->template setField<u"TimeCreated">(v); }
  const Text& TimeModified() const { return this->template field<u"TimeModified">(); }
  void TimeModified(const Text& v) { this->template setField<u"TimeModified">(v); }
  const Text& EditSequence() const { return this->template field<u"EditSequence">(); }
  void EditSequence(const Text& v) { this->template setField<u"EditSequence">(v); }
  const Text& TxnNumber() const { return this->template field<u"TxnNumber">(); }
  void TxnNumber(const Text& v) { this->template setField<u"TxnNumber">(v); }
  const Text& TxnDate() const { return this->template field<u"TxnDate">(); }
  void TxnDate(const Text& v) { this->template setField<u"TxnDate">(v); }
  const Text& RefNumber() const { return this->template field<u"RefNumber">(); }
  void RefNumber(const Text& v) { this->template setField<u"RefNumber">(v); }
  const Text& PONumber() const { return this->template field<u"PONumber">(); }
  void PONumber(const Text& v) { this->template setField<u"PONumber">(v); }
  const Text& DueDate() const { return this->template field<u"DueDate">(); }
  void DueDate(const Text& v) { this->template setField<u"DueDate">(v); }
  const Text& FOB() const { return this->template field<u"FOB">(); }
  void FOB(const Text& v) { this->template setField<u"FOB">(v); }
  const Text& Subtotal() const { return this->template field<u"Subtotal">(); }
  void Subtotal(const Text& v) { this->template setField<u"Subtotal">(v); }
  const Text& SalesTaxPercentage() const { return this->template field<u"SalesTaxPercentage">(); }
  void SalesTaxPercentage(const Text& v) { this->template setField<u"SalesTaxPercentage">(v); }
  const Text& SalesTaxTotal() const { return this->template field<u"SalesTaxTotal">(); }
  void SalesTaxTotal(const Text& v) { this->template setField<u"SalesTaxTotal">(v); }
  const Text& Memo() const { return this->template field<u"Memo">(); }
  void Memo(const Text& v) { this->template setField<u"Memo">(v); }
  const Text& IsToBePrinted() const { return this->template field<u"IsToBePrinted">(); }
  void IsToBePrinted(const Text& v) { this->template setField<u"IsToBePrinted">(v); }
  const Text& RequestID() const { return this->template field<u"RequestID">(); }
  void RequestID(const Text& v) { this->template setField<u"RequestID">(v); }

 protected:
  // From StartPoint (raised to 1), finds the return tag and the first "requestID=" after
  // the position; another request's identifier moves the position to its closing quote and
  // the search starts again. An empty RequestID takes the first. Found: reads the header
  // with readHeader(reader, start, end) from the closing quote, then the lines, then the
  // groups from where the lines ended, and returns the end position. Not found: nothing is
  // read and the position reached is returned.
  template <class Header>
  int32_t parseTxn(const Text& Value, int32_t StartPoint, Header readHeader);

  mutable ObjectProperty<DroCustomerRef> customerRef_;
  mutable ObjectProperty<DroClassRef> classRef_;
  mutable ObjectProperty<DroAddress> billAddress_;
  mutable ObjectProperty<DroTermsRef> termsRef_;
  mutable ObjectProperty<DroSalesRepRef> salesRepRef_;
  mutable ObjectProperty<DroItemSalesTaxRef> itemSalesTaxRef_;
  mutable ObjectProperty<DroCustomerMsgRef> customerMsgRef_;
  mutable ObjectProperty<DroCustomerSalesTaxCodeRef> customerSalesTaxCodeRef_;
  mutable ObjectProperty<DroTxnLineCol<Kind>> lines_;
  mutable ObjectProperty<DroTxnLineGroupCol<Kind>> groups_;
};

template <class Derived, TxnKind Kind>
template <class Header>
int32_t TxnRecordOf<Derived, Kind>::parseTxn(const Text& Value, int32_t StartPoint,
                                             Header readHeader) {
  const internal::SearchScope scope(Value);
  int32_t position = StartPoint > 0 ? StartPoint : 1;
  for (;;) {
    const OwnResponse own = findOwnResponse(Value, position, kSpec.returnTag, RequestID());
    if (own.another) {
      position = own.result;
      continue;
    }
    if (!own.found) return position;
    int32_t start = own.cursor;
    int32_t end = own.cursor;
    Reader read(static_cast<Derived&>(*this), Value, start, end, kSpec.returnTag);
    readHeader(read, start, end);
    lines_->ParseRs(Value, start, end);
    readGroups(*groups_, Value, start, end);
    return end;
  }
}

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_TRANSACTION_HPP_

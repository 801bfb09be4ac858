// DroXmlBuilder, transactions: the estimate and invoice add requests. Both write the header
// in their own order, then every plain line, then every group (whatever order the host
// built them in), with the values escaped and unchecked.
#include "droqbxml/qbxml/DroXmlBuilder.hpp"

#include "droqbxml/qbxml/internal/RequestWriting.hpp"
#include "droqbxml/records/DroEstimate.hpp"
#include "droqbxml/records/DroInvoice.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {
namespace {

using internal::writeAddressIfSet;
using internal::writeElementIfSet;
using internal::writeReference;
using internal::writeReferenceIfSet;

// One "...LineAdd" aggregate. The rates and markups send one of their pair, the plain one
// when it is set. The amount is left out when quantity and rate are both given (QuickBooks
// works it out) and for subtotal items, which also never carry a tax code. bTaxable works
// in reverse of its name: true keeps every line's tax code out.
template <TxnKind Kind>
void writeLine(DroXmlBuilder& builder, TextView name, const DroTxnLine<Kind>& line, bool bTaxable) {
  const bool subtotal = line.ItemType() == udItemSubtotal;
  builder.AddAggregateBegin(builder.CreateElement(Text(name)));
  writeReferenceIfSet(builder, u"ItemRef", *line.ItemRef());
  writeElementIfSet(builder, u"Desc", line.Desc());
  writeElementIfSet(builder, u"Quantity", line.Quantity());
  if (!line.Rate().empty()) {
    writeElementIfSet(builder, u"Rate", line.Rate());
  } else {
    writeElementIfSet(builder, u"RatePercent", line.RatePercent());
  }
  writeReferenceIfSet(builder, u"ClassRef", *line.ClassRef());
  if (!(!line.Quantity().empty() && !line.Rate().empty()) && !subtotal) {
    writeElementIfSet(builder, u"Amount", line.Amount());
  }
  if constexpr (Kind == TxnKind::Invoice)
    writeElementIfSet(builder, u"ServiceDate", line.ServiceDate());
  if (!bTaxable && !subtotal)
    writeReferenceIfSet(builder, u"SalesTaxCodeRef", *line.SalesTaxCodeRef());
  if constexpr (Kind == TxnKind::Estimate) {
    if (!line.MarkupRate().empty()) {
      writeElementIfSet(builder, u"MarkupRate", line.MarkupRate());
    } else {
      writeElementIfSet(builder, u"MarkupRatePercent", line.MarkupRatePercent());
    }
  }
  // The item kind's enumeration name and the item's full name have always been looked up
  // here as well; neither was ever written, so nothing is done with them.
  builder.AddAggregateEnd();
}

// Every line, then every group ("ItemGroupRef" always; the group's lines, print flag and
// total stay home: QuickBooks expands the item group itself).
template <TxnKind Kind>
void writeLinesAndGroups(DroXmlBuilder& builder, const DroTxnLineCol<Kind>& lines,
                         const DroTxnLineGroupCol<Kind>& groups, bool bTaxable) {
  constexpr bool kEstimate = Kind == TxnKind::Estimate;
  for (const auto& line : lines) {
    writeLine(builder, kEstimate ? u"EstimateLineAdd" : u"InvoiceLineAdd", *line, bTaxable);
  }
  for (const auto& group : groups) {
    builder.AddAggregateBegin(
        builder.CreateElement(kEstimate ? u"EstimateLineGroupAdd" : u"InvoiceLineGroupAdd"));
    writeReference(builder, u"ItemGroupRef", *group->ItemGroupRef());
    writeElementIfSet(builder, u"Desc", group->Desc());
    writeElementIfSet(builder, u"Quantity", group->Quantity());
    if constexpr (!kEstimate) writeElementIfSet(builder, u"ServiceDate", group->ServiceDate());
    builder.AddAggregateEnd();
  }
}

// The request's frame around body(): the record takes the request's identifier.
template <class Txn, class Body>
void writeTxnAdd(DroXmlBuilder& builder, const Ref<Txn>& txn, TextView request, TextView add,
                 Body body) {
  if (!txn) raiseRuntimeError(RuntimeError::kObjectNotSet);
  internal::openAddRequest(builder, request, [&](const Text& id) {
    txn->RequestID(id);
    return txn->RequestID();
  });
  builder.AddAggregateBegin(builder.CreateElement(Text(add)));
  body(*txn);
  builder.AddAggregateEnd();
  builder.AddAggregateEnd();
  builder.AddFooters();
}

}  // namespace

void DroXmlBuilder::BuildAddEstimate(const Ref<DroEstimate>& Estimate, bool bTaxable) {
  writeTxnAdd(*this, Estimate, u"EstimateAddRq", u"EstimateAdd", [&](const DroEstimate& est) {
    // Always, an empty one too. TermsRef and the response's own fields are never sent.
    writeReference(*this, u"CustomerRef", *est.CustomerRef());
    writeReferenceIfSet(*this, u"ClassRef", *est.ClassRef());
    writeElementIfSet(*this, u"TxnDate", est.TxnDate());
    writeElementIfSet(*this, u"RefNumber", est.RefNumber());
    writeAddressIfSet(*this, u"BillAddress", *est.BillAddress());
    writeElementIfSet(*this, u"PONumber", est.PONumber());
    writeElementIfSet(*this, u"DueDate", est.DueDate());
    writeReferenceIfSet(*this, u"SalesRepRef", *est.SalesRepRef());
    writeElementIfSet(*this, u"FOB", est.FOB());
    writeReferenceIfSet(*this, u"ItemSalesTaxRef", *est.ItemSalesTaxRef());
    writeElementIfSet(*this, u"Memo", est.Memo());
    writeReferenceIfSet(*this, u"CustomerMsgRef", *est.CustomerMsgRef());
    writeElementIfSet(*this, u"IsToBePrinted", est.IsToBePrinted());
    writeReferenceIfSet(*this, u"CustomerSalesTaxCodeRef", *est.CustomerSalesTaxCodeRef());
    writeLinesAndGroups(*this, *est.EstimateLines(), *est.EstimateLineGroups(), bTaxable);
  });
}

void DroXmlBuilder::BuildAddInvoice(const Ref<DroInvoice>& Invoice, bool bTaxable) {
  writeTxnAdd(*this, Invoice, u"InvoiceAddRq", u"InvoiceAdd", [&](const DroInvoice& inv) {
    // As for estimates; IsFinanceCharge is not sent either.
    writeReference(*this, u"CustomerRef", *inv.CustomerRef());
    writeReferenceIfSet(*this, u"ClassRef", *inv.ClassRef());
    writeReferenceIfSet(*this, u"ARAccountRef", *inv.ARAccountRef());
    writeElementIfSet(*this, u"TxnDate", inv.TxnDate());
    writeElementIfSet(*this, u"RefNumber", inv.RefNumber());
    writeAddressIfSet(*this, u"BillAddress", *inv.BillAddress());
    writeAddressIfSet(*this, u"ShipAddress", *inv.ShipAddress());
    writeElementIfSet(*this, u"IsPending", inv.IsPending());
    writeElementIfSet(*this, u"PONumber", inv.PONumber());
    writeElementIfSet(*this, u"DueDate", inv.DueDate());
    writeReferenceIfSet(*this, u"SalesRepRef", *inv.SalesRepRef());
    writeElementIfSet(*this, u"FOB", inv.FOB());
    writeElementIfSet(*this, u"ShipDate", inv.ShipDate());
    writeReferenceIfSet(*this, u"ShipMethodRef", *inv.ShipMethodRef());
    writeReferenceIfSet(*this, u"ItemSalesTaxRef", *inv.ItemSalesTaxRef());
    writeElementIfSet(*this, u"Memo", inv.Memo());
    writeReferenceIfSet(*this, u"CustomerMsgRef", *inv.CustomerMsgRef());
    writeElementIfSet(*this, u"IsToBePrinted", inv.IsToBePrinted());
    writeReferenceIfSet(*this, u"CustomerSalesTaxCodeRef", *inv.CustomerSalesTaxCodeRef());
    writeLinesAndGroups(*this, *inv.InvoiceLines(), *inv.InvoiceLineGroups(), bTaxable);
  });
}

}  // namespace droqbxml

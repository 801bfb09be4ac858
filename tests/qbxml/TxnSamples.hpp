// An estimate and an invoice with every element their builders write set (ListID and
// FullName both where the ListID wins, both of each rate pair, markup-characters to escape),
// the response's own fields and the terms set (never sent), a line group added before the
// lines, and lines that exercise the rate, amount and tax code rules. Shared by the
// builders' goldens and the schema-departure list.
#ifndef DROQBXML_TESTS_QBXML_TXNSAMPLES_HPP_
#define DROQBXML_TESTS_QBXML_TXNSAMPLES_HPP_

#include "droqbxml/droqbxml.hpp"

namespace droqbxml {
namespace test {

template <class Txn>
void fillHeader(Txn& txn) {
  txn.CustomerRef()->FullName(u"Lee & Daughters:Kitchen");
  txn.ClassRef()->ListID(u"C-1");  // sent instead of the name
  txn.ClassRef()->FullName(u"Remodel");
  txn.TermsRef()->FullName(u"Net 30");  // never sent
  txn.TxnID(u"T-9");                    // never sent
  txn.TxnDate(u"2026-11-25");
  txn.RefNumber(u"<R-1>");
  txn.BillAddress()->Addr1(u"12 Harbour Road");
  txn.BillAddress()->City(u"Portsmouth");
  txn.BillAddress()->Country(u"");  // an address counts as set once a field is set to ""
  txn.PONumber(u"PO 7");
  txn.DueDate(u"2026-12-25");
  txn.SalesRepRef()->FullName(u"KL");
  txn.FOB(u"Dock");
  txn.ItemSalesTaxRef()->FullName(u"State");
  txn.Memo(u"It's \"final\"");
  txn.CustomerMsgRef()->FullName(u"Thanks");
  txn.IsToBePrinted(u"false");
  txn.CustomerSalesTaxCodeRef()->FullName(u"Tax");
  txn.SalesTaxTotal(u"1.00");  // never sent
}

inline DroEstimateLineCol& groupLines(DroEstimateLineGroup& group) {
  return *group.EstimateLines();
}
inline DroInvoiceLineCol& groupLines(DroInvoiceLineGroup& group) { return *group.InvoiceLines(); }

// The group first, then the lines: the request has the lines first.
template <class Lines, class Groups>
void fillLines(Lines& lines, Groups& groups) {
  const auto group = groups.Add(u"Kit");
  group->ItemGroupRef()->FullName(u"Kit");
  group->Desc(u"Tile kit");
  group->Quantity(u"2");
  group->IsPrintItemsInGroup(u"true");  // not sent, nor the total and the group's lines
  group->TotalAmount(u"80.00");
  const auto tile = lines.Add(u"Tile");
  tile->ItemRef()->FullName(u"Tile");
  tile->ItemType(udItemInventory);
  tile->Desc(u"Tile");
  tile->Quantity(u"2");
  tile->Rate(u"10");
  tile->RatePercent(u"5");  // Rate wins
  tile->Amount(u"20");      // left out: quantity and rate are given
  tile->ClassRef()->FullName(u"Remodel");
  tile->SalesTaxCodeRef()->FullName(u"Tax");
  groupLines(*group).Add(u"Tile", tile);
  const auto labour = lines.Add(u"Labour");
  labour->ItemRef()->FullName(u"Labour");
  labour->Quantity(u"2");
  labour->RatePercent(u"15");
  labour->Amount(u"30");  // sent: no rate
  labour->SalesTaxCodeRef()->FullName(u"Non");
  const auto subtotal = lines.Add(u"Sub");
  subtotal->ItemRef()->FullName(u"Sub");
  subtotal->ItemType(udItemSubtotal);
  subtotal->Amount(u"50");  // neither amount nor tax code for a subtotal
  subtotal->SalesTaxCodeRef()->FullName(u"Tax");
  const auto note = lines.Add();
  note->Desc(u"Clean-up included");
  note->ItemType(static_cast<udItemType>(42));  // no such kind: nothing changes
}

inline Ref<DroEstimate> estimateSample() {
  auto estimate = std::make_shared<DroEstimate>();
  fillHeader(*estimate);
  fillLines(*estimate->EstimateLines(), *estimate->EstimateLineGroups());
  const auto tile = estimate->EstimateLines()->Item(Variant(u"Tile"));
  tile->MarkupRate(u"3");
  tile->MarkupRatePercent(u"4");  // MarkupRate wins
  estimate->EstimateLines()->Item(Variant(u"Labour"))->MarkupRatePercent(u"4");
  return estimate;
}

inline Ref<DroInvoice> invoiceSample() {
  auto invoice = std::make_shared<DroInvoice>();
  fillHeader(*invoice);
  invoice->ARAccountRef()->FullName(u"Accounts Receivable");
  invoice->ShipAddress()->Addr1(u"1 Quay");
  invoice->ShipAddress()->Addr2(u"");
  invoice->IsPending(u"false");
  invoice->IsFinanceCharge(u"false");  // never sent
  invoice->ShipDate(u"2026-11-26");
  invoice->ShipMethodRef()->FullName(u"UPS");
  fillLines(*invoice->InvoiceLines(), *invoice->InvoiceLineGroups());
  invoice->InvoiceLines()->Item(Variant(u"Tile"))->ServiceDate(u"2026-11-20");
  invoice->InvoiceLineGroups()->Item(Variant(u"Kit"))->ServiceDate(u"2026-11-21");
  return invoice;
}

}  // namespace test
}  // namespace droqbxml

#endif  // DROQBXML_TESTS_QBXML_TXNSAMPLES_HPP_

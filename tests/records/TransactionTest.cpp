// Estimates and invoices read from add responses: a swallowed error, cut responses and the
// dumps (finding the own response and the keyed line and group loops with their quirks:
// testdata/records/parse_by_name.txt).
#include <gtest/gtest.h>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/records/DroEstimate.hpp"
#include "droqbxml/records/DroInvoice.hpp"
#include "droqbxml/runtime/Binding.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

// <Tag>value</Tag>, or nothing for "".
Text el(const Text& tag, const Text& value) {
  return value.empty() ? Text() : u"<" + tag + u">" + value + u"</" + tag + u">";
}
Text ref(const Text& tag, const Text& fullName) {
  return fullName.empty() ? Text() : el(tag, el(u"ListID", u"ID") + el(u"FullName", fullName));
}
// One line in the kind's tags ("Estimate" or "Invoice"); no TxnLineID when id is "".
Text line(const Text& kind, const Text& id, const Text& item, const Text& desc,
          const Text& rest = {}) {
  return u"<" + kind + u"LineRet>" + el(u"TxnLineID", id) + ref(u"ItemRef", item) +
         el(u"Desc", desc) + rest + u"</" + kind + u"LineRet>";
}
Text group(const Text& kind, const Text& item, const Text& desc, const Text& lines = {}) {
  return u"<" + kind + u"LineGroupRet><TxnLineID>G</TxnLineID>" + ref(u"ItemGroupRef", item) +
         el(u"Desc", desc) + u"<IsPrintItemsInGroup>false</IsPrintItemsInGroup>" + lines + u"</" +
         kind + u"LineGroupRet>";
}
// An add response with the required header and `body` after the customer reference.
Text response(const Text& kind, const Text& id, const Text& txnId, const Text& body) {
  return u"<" + kind + u"AddRs requestID=\"" + id + u"\" statusCode=\"0\"><" + kind +
         u"AddRet><TxnID>" + txnId +
         u"</TxnID><TimeCreated>2026-11-25T08:00:00</TimeCreated>"
         u"<TimeModified>2026-11-25T08:00:00</TimeModified><EditSequence>1</EditSequence>"
         u"<TxnNumber>7</TxnNumber><CustomerRef><ListID>80-1</ListID><FullName>Kim Lee</FullName>"
         u"</CustomerRef><TxnDate>2026-11-25</TxnDate>" +
         body + u"</" + kind + u"AddRet></" + kind + u"AddRs>";
}
Text document(const Text& responses) {
  return u"<?xml version=\"1.0\" ?><QBXML><QBXMLMsgsRs>" + responses + u"</QBXMLMsgsRs></QBXML>";
}

// An invoice group's failed read is swallowed (an estimate's raises: the line and group loops
// are in testdata/records/parse_by_name.txt); the error object keeps its message, with the
// invoice's cut context.
TEST(TransactionTest, InvoiceGroupReadFailureIsSwallowedAndRecorded) {
  DroInvoice invoice;
  Text unprinted = group(u"Invoice", u"Kit", u"K");
  unprinted.replace(unprinted.find(u"false"), 5, u"");
  EXPECT_NO_THROW(invoice.ParseRs(document(response(u"Invoice", u"2", u"I", unprinted))));
  EXPECT_EQ(invoice.InvoiceLineGroups()->Item(Variant(u"Kit"))->Desc(), u"K");
  EXPECT_EQ(basGlobals::SharedErrorObject()->Description(),
            u"The response returned a an empty '<InvoiceAddRet><InvoiceLineGroupRet"
            u"<IsPrintItemsInGroup>'.\r\nThis element is not allowed to be empty.");
}

// Every cut of a response that has lines, groups, nested lines and both kinds in it is
// either read or refused with an error: no crash, no endless loop.
TEST(TransactionTest, CutResponsesEndInAnAnswerOrAnError) {
  const Text text = document(
      response(u"Estimate", u"2", u"E",
               line(u"Estimate", u"L1", u"", u"Note") + line(u"Estimate", u"L2", u"Tile", u"T") +
                   group(u"Estimate", u"Kit", u"K", line(u"Estimate", u"N", u"Tile", u"T")) +
                   group(u"Estimate", u"Kit", u"K")) +
      response(u"Invoice", u"3", u"I",
               line(u"Invoice", u"", u"", u"Note") + group(u"Invoice", u"", u"") +
                   line(u"Invoice", u"L", u"Tile", u"T")));
  for (size_t size = 0; size <= text.size(); ++size) {
    const Text cut = text.substr(0, size);
    DroEstimate estimate;
    DroInvoice invoice;
    try {
      estimate.ParseRs(cut);
    } catch (const ComError&) {
    }
    try {
      invoice.ParseRs(cut);
    } catch (const ComError&) {
    }
  }
}

TEST(TransactionTest, Dumps) {
  DroEstimate estimate;
  estimate.RequestID(u"2");
  estimate.ParseRs(
      document(response(u"Estimate", u"2", u"E",
                        el(u"TotalAmount", u"12.00") +
                            line(u"Estimate", u"L1", u"Tile", u"Tile & grout",
                                 el(u"Quantity", u"3") + el(u"Rate", u"4.00") +
                                     el(u"Amount", u"12.00") + el(u"MarkupRate", u"5")) +
                            line(u"Estimate", u"L2", u"Grout", u""))));
  const auto lines = estimate.EstimateLines()->NewEnum();
  DroInvoiceLineGroup invoiceGroup;
  invoiceGroup.ItemGroupRef()->FullName(u"Kit");
  invoiceGroup.Desc(u"Kit");
  invoiceGroup.ServiceDate(u"2026-11-25");  // not printed
  DroInvoiceLine invoiceLine;
  invoiceLine.TxnLineID(u"N1");
  invoiceLine.ServiceDate(u"2026-11-25");
  const Text sep = u"\r\n----\r\n";
  EXPECT_TRUE(test::matchesGolden(
      estimate.PrintOut() + sep + invoiceGroup.PrintOut() + sep + invoiceLine.PrintOut(),
      "records/transaction_dumps.txt"));

  // A group with lines dumps only its last line's block.
  DroEstimateLineGroup withLines;
  withLines.Desc(u"lost");
  withLines.EstimateLines()->Add(u"a", lines[0]);
  withLines.EstimateLines()->Add(u"b", lines[1]);
  EXPECT_EQ(withLines.PrintOut(),
            u"ESTIMATELINES:\r\n" + lines[1]->PrintOut() + u"\r\n/ESTIMATELINES");
  // Once the estimate holds a group, its dump is the runtime's 13.
  estimate.EstimateLineGroups()->Add();
  EXPECT_TRUE(test::raisesRuntime([&] { (void)estimate.PrintOut(); }, RuntimeError::kTypeMismatch));
}

}  // namespace
}  // namespace droqbxml

// Estimates and invoices read from add responses: finding the own response, the keyed line
// and group loops with their long-standing quirks (merging, the never-cleared description
// mark, unbounded searches, swallowed errors) and the dumps.
#include <gtest/gtest.h>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
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

std::vector<Text> keysOf(const DroEstimateLineCol& lines) {
  std::vector<Text> found;
  for (const auto& l : lines) found.push_back(l->TxnLineID() + u":" + l->Desc());
  return found;
}

TEST(TransactionTest, EachRecordFindsItsOwnResponse) {
  const Text text = document(
      response(u"Estimate", u"1", u"E-1", {}) +
      response(u"Estimate", u"2", u"E-2",
               el(u"Subtotal", u"12.00") + el(u"Memo", u"Second") +
                   line(u"Estimate", u"L1", u"Tile", u"Tile", el(u"Quantity", u"3")) +
                   line(u"Estimate", u"L2", u"Grout", u"Grout") +
                   line(u"Estimate", u"L3", u"Tile", u"Tile again") +
                   group(u"Estimate", u"Kit", u"A") + group(u"Estimate", u"Kit", u"B")) +
      response(u"Invoice", u"3", u"I-3",
               line(u"Invoice", u"N1", u"Tile", u"Tile", el(u"ServiceDate", u"2026-11-01")) +
                   group(u"Invoice", u"Kit", u"C")));
  DroEstimate second;
  second.RequestID(u"2");
  EXPECT_GT(second.ParseRs(text), 0);
  EXPECT_EQ(second.TxnID(), u"E-2");
  EXPECT_EQ(second.Memo(), u"Second");
  EXPECT_EQ(second.CustomerRef()->FullName(), u"Kim Lee");
  // Two lines of one item make one member, holding the later line.
  EXPECT_EQ(keysOf(*second.EstimateLines()), (std::vector<Text>{u"L3:Tile again", u"L2:Grout"}));
  EXPECT_EQ(second.EstimateLines()->Item(Variant(u"Grout"))->TxnLineID(), u"L2");
  ASSERT_EQ(second.EstimateLineGroups()->Count(), 1);
  EXPECT_EQ(second.EstimateLineGroups()->Item(Variant(u"Kit"))->Desc(), u"B");

  DroEstimate any;    // no RequestID: the first response, whose line search runs on into
  any.ParseRs(text);  // the next one
  EXPECT_EQ(any.TxnID(), u"E-1");
  EXPECT_EQ(any.EstimateLines()->Count(), 2);

  // Another identifier: nothing is read, and the position is the last identifier's quote,
  // the invoice's: the search resumes after each identifier, whatever response it is on.
  DroEstimate other;
  other.RequestID(u"9");
  const auto quote = static_cast<int32_t>(text.find(u"\"3\"") + 3);
  EXPECT_EQ(other.ParseRs(text), quote);
  EXPECT_EQ(other.TxnID(), u"");
  EXPECT_EQ(other.ParseRs(u"<QBXML/>", 5), 5);

  DroInvoice invoice;
  invoice.RequestID(u"3");
  const auto line = invoice.InvoiceLines()->Add(u"Tile");
  line->ServiceDate(u"2026-12-24");  // never read back
  invoice.ParseRs(text);
  EXPECT_EQ(invoice.TxnID(), u"I-3");
  EXPECT_EQ(line->TxnLineID(), u"N1");
  EXPECT_EQ(line->ServiceDate(), u"2026-12-24");
  EXPECT_EQ(invoice.InvoiceLineGroups()->Item(Variant(u"Kit"))->Desc(), u"C");
}

TEST(TransactionTest, LineLoopQuirks) {
  // A line without an item is keyed and read with the next line's item, reading on into
  // that line, which the loop then no longer finds.
  DroEstimate borrowed;
  borrowed.ParseRs(document(response(
      u"Estimate", u"2", u"E",
      line(u"Estimate", u"L1", u"", u"Labour") + line(u"Estimate", u"L2", u"Tile", u"Tile"))));
  EXPECT_EQ(keysOf(*borrowed.EstimateLines()), std::vector<Text>{u"L1:Tile"});
  EXPECT_EQ(borrowed.EstimateLines()->Item(Variant(u"Tile"))->ItemRef()->FullName(), u"Tile");

  // Lines without any item after them go by description. Once one description has matched
  // a member, a later unmatched one is neither added nor read.
  DroEstimate described;
  described.ParseRs(document(response(
      u"Estimate", u"2", u"E",
      line(u"Estimate", u"L1", u"", u"Note") + line(u"Estimate", u"L2", u"", u"Other") +
          line(u"Estimate", u"L3", u"", u"Note") + line(u"Estimate", u"L4", u"", u"Late"))));
  EXPECT_EQ(keysOf(*described.EstimateLines()), (std::vector<Text>{u"L3:Note", u"L2:Other"}));

  // A fresh line's required element raises; an existing member's failed read is swallowed.
  DroEstimate fresh;
  EXPECT_TRUE(test::raises(
      [&] {
        fresh.ParseRs(
            document(response(u"Estimate", u"2", u"E", line(u"Estimate", u"", u"Tile", u"T"))));
      },
      PARING, u"DroQbXml.basCommonProcs.getElementValue",
      u"The response returned a an empty '<EstimateAddRet><EstimateLineRet><TxnLineID>'.\r\nThis "
      u"element is not allowed to be empty."));
  EXPECT_EQ(fresh.TxnID(), u"E");
  DroEstimate held;
  held.EstimateLines()->Add(u"Tile");
  EXPECT_NO_THROW(held.ParseRs(
      document(response(u"Estimate", u"2", u"E", line(u"Estimate", u"", u"Tile", u"T")))));
  EXPECT_EQ(held.EstimateLines()->Count(), 1);
}

TEST(TransactionTest, GroupLoopQuirks) {
  // Lines nested in a group are read as the estimate's own lines, the first from the cursor
  // (keyed by the group's full name, reading the group's own elements), and the group loop
  // starts after them: that group is passed over.
  DroEstimate nested;
  nested.ParseRs(document(
      response(u"Estimate", u"2", u"E",
               group(u"Estimate", u"Kit", u"K", line(u"Estimate", u"N1", u"Tile", u"Tile")))));
  EXPECT_EQ(keysOf(*nested.EstimateLines()), (std::vector<Text>{u"G:K", u"N1:Tile"}));
  EXPECT_EQ(nested.EstimateLines()->Item(Variant(u"Kit"))->ItemRef()->FullName(), u"Kit");
  EXPECT_EQ(nested.EstimateLineGroups()->Count(), 0);

  // A group's key is required for estimates only. An invoice group's failed read is
  // swallowed; the error object keeps its message, with the invoice's cut context.
  const Text keyless = group(u"Estimate", u"", u"K");
  DroEstimate estimate;
  EXPECT_TRUE(test::raises(
      [&] { estimate.ParseRs(document(response(u"Estimate", u"2", u"E", keyless))); }, PARING,
      u"DroQbXml.basCommonProcs.getElementValue",
      u"The response returned a an empty '<EstimateAddRet><EstimateLineGroupRet><FullName>'.\r\n"
      u"This element is not allowed to be empty."));
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

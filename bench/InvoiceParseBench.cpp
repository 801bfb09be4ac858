// DroInvoice.ParseRs on an add response holding one invoice of 500 and 5,000 lines, as
// QuickBooks writes them but in the tags the records read ("InvoiceAddRet"), against
// pugixml (see FirstParse.hpp). Lines carry no RatePercent, ClassRef or ServiceDate, so
// every line searches those to the end of the text: the figure must still grow with the
// lines, not with their square.
#include <string>

#include "bench/FirstParse.hpp"
#include "droqbxml/records/DroInvoice.hpp"

namespace droqbxml {
namespace {

std::string invoiceResponse(int lines) {
  std::string text =
      "<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n"
      "<InvoiceAddRs requestID=\"2\" statusCode=\"0\" statusSeverity=\"Info\" "
      "statusMessage=\"Status OK\">\n<InvoiceAddRet>\n<TxnID>1F-1231522945</TxnID>\n"
      "<TimeCreated>2009-01-09T12:42:25-05:00</TimeCreated>\n"
      "<TimeModified>2009-01-09T12:42:25-05:00</TimeModified>\n"
      "<EditSequence>1231522945</EditSequence>\n<TxnNumber>31</TxnNumber>\n"
      "<CustomerRef>\n<ListID>80000001-1231522900</ListID>\n<FullName>Kim Lee</FullName>\n"
      "</CustomerRef>\n<ARAccountRef>\n<ListID>40000-1128987409</ListID>\n"
      "<FullName>Accounts Receivable</FullName>\n</ARAccountRef>\n"
      "<TxnDate>2009-01-09</TxnDate>\n<RefNumber>1042</RefNumber>\n"
      "<IsPending>false</IsPending>\n<IsFinanceCharge>false</IsFinanceCharge>\n"
      "<DueDate>2009-02-08</DueDate>\n<Subtotal>0.00</Subtotal>\n"
      "<SalesTaxPercentage>0.00</SalesTaxPercentage>\n<SalesTaxTotal>0.00</SalesTaxTotal>\n"
      "<AppliedAmount>0.00</AppliedAmount>\n<BalanceRemaining>0.00</BalanceRemaining>\n"
      "<IsToBePrinted>false</IsToBePrinted>\n";
  for (int i = 0; i < lines; ++i) {
    const std::string n = std::to_string(i);
    text += "<InvoiceLineRet>\n<TxnLineID>" + std::to_string(1000 + i) +
            "-1231522945</TxnLineID>\n<ItemRef>\n<ListID>8000" + n +
            "-1231522945</ListID>\n<FullName>Part " + n + "</FullName>\n</ItemRef>\n<Desc>Part " +
            n + " as ordered</Desc>\n<Quantity>" + std::to_string(1 + i % 9) +
            "</Quantity>\n<Rate>85.00</Rate>\n<Amount>" + std::to_string(85 * (1 + i % 9)) +
            ".00</Amount>\n<SalesTaxCodeRef>\n<ListID>10000-1128983215</ListID>\n"
            "<FullName>Tax</FullName>\n</SalesTaxCodeRef>\n</InvoiceLineRet>\n";
  }
  return text + "</InvoiceAddRet>\n</InvoiceAddRs>\n</QBXMLMsgsRs>\n</QBXML>\n";
}

void BM_InvoiceParse(benchmark::State& state) {
  const auto lines = static_cast<int32_t>(state.range(0));
  bench::firstParseAgainstPugixml<DroInvoice>(
      state, invoiceResponse(lines),
      [lines](const DroInvoice& invoice) { return invoice.InvoiceLines()->Count() == lines; });
}

BENCHMARK(BM_InvoiceParse)
    ->Arg(500)
    ->Arg(5000)
    ->UseManualTime()
    ->Iterations(15)
    ->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace droqbxml

// The large responses the reading benchmarks use, as QuickBooks writes them: batches of
// one query response per record (requestIDs 2, 3, ...), optional elements mostly absent,
// and one customer query response holding every customer.
#ifndef DROQBXML_BENCH_RESPONSES_HPP_
#define DROQBXML_BENCH_RESPONSES_HPP_

#include <string>

namespace droqbxml::bench {

// One CustomerRet: the customer's elements for number n.
inline std::string customerRet(int i) {
  const std::string n = std::to_string(i);
  std::string text = "<CustomerRet>\n<ListID>8000" + n +
                     "-1405768916</ListID>\n"
                     "<TimeCreated>2014-07-19T07:21:56-05:00</TimeCreated>\n"
                     "<TimeModified>2014-07-19T07:21:56-05:00</TimeModified>\n"
                     "<EditSequence>1405768916</EditSequence>\n<Name>Customer " +
                     n + "</Name>\n<FullName>Customer " + n +
                     "</FullName>\n<IsActive>true</IsActive>\n<Sublevel>0</Sublevel>\n";
  if (i % 3 == 0) text += "<CompanyName>Company " + n + "</CompanyName>\n";
  text += "<BillAddress>\n<Addr1>" + n +
          " Main St.</Addr1>\n<City>Mountain View</City>\n"
          "<State>CA</State>\n<PostalCode>94566</PostalCode>\n</BillAddress>\n";
  if (i % 5 == 0) text += "<Phone>555-0100</Phone>\n";
  return text +
         "<Balance>0.00</Balance>\n<TotalBalance>0.00</TotalBalance>\n"
         "<JobStatus>None</JobStatus>\n</CustomerRet>\n";
}

inline std::string customerBatch(int customers) {
  std::string text = "<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n";
  for (int i = 0; i < customers; ++i) {
    text += "<CustomerQueryRs requestID=\"" + std::to_string(i + 2) +
            "\" statusCode=\"0\" statusSeverity=\"Info\" statusMessage=\"Status OK\">\n" +
            customerRet(i) + "</CustomerQueryRs>\n";
  }
  return text + "</QBXMLMsgsRs>\n</QBXML>\n";
}

// One CustomerQueryRs holding every customer.
inline std::string customerList(int customers) {
  std::string text =
      "<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n"
      "<CustomerQueryRs requestID=\"2\" statusCode=\"0\" statusSeverity=\"Info\" "
      "statusMessage=\"Status OK\">\n";
  for (int i = 0; i < customers; ++i) text += customerRet(i);
  return text + "</CustomerQueryRs>\n</QBXMLMsgsRs>\n</QBXML>\n";
}

inline std::string inventoryBatch(int items) {
  std::string text = "<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n";
  for (int i = 0; i < items; ++i) {
    const std::string n = std::to_string(i);
    text += "<ItemInventoryQueryRs requestID=\"" + std::to_string(i + 2) +
            "\" statusCode=\"0\" statusSeverity=\"Info\" statusMessage=\"Status OK\">\n"
            "<ItemInventoryRet>\n<ListID>8000" +
            n +
            "-1231522945</ListID>\n"
            "<TimeCreated>2009-01-09T12:42:25-05:00</TimeCreated>\n"
            "<TimeModified>2009-01-09T12:42:25-05:00</TimeModified>\n"
            "<EditSequence>1231522945</EditSequence>\n<Name>Part " +
            n +
            "</Name>\n"
            "<FullName>Part " +
            n +
            "</FullName>\n<IsActive>true</IsActive>\n"
            "<Sublevel>0</Sublevel>\n"
            "<SalesTaxCodeRef>\n<ListID>10000-1128983215</ListID>\n<FullName>Tax</FullName>\n"
            "</SalesTaxCodeRef>\n<SalesDesc>Part " +
            n +
            " for sale</SalesDesc>\n"
            "<SalesPrice>85.00</SalesPrice>\n"
            "<IncomeAccountRef>\n<ListID>420000-1128987409</ListID>\n<FullName>Sales</FullName>\n"
            "</IncomeAccountRef>\n";
    if (i % 4 == 0) text += "<PurchaseDesc>Part " + n + " bought</PurchaseDesc>\n";
    text +=
        "<PurchaseCost>40.00</PurchaseCost>\n"
        "<COGSAccountRef>\n<ListID>50001-1129079237</ListID>\n"
        "<FullName>Cost of Goods Sold</FullName>\n</COGSAccountRef>\n"
        "<AssetAccountRef>\n<ListID>A20000-1155155306</ListID>\n"
        "<FullName>Inventory Asset</FullName>\n</AssetAccountRef>\n";
    if (i % 3 == 0) text += "<ReorderPoint>5</ReorderPoint>\n";
    text += "<QuantityOnHand>" + std::to_string(i % 50) +
            "</QuantityOnHand>\n<AverageCost>40.00</AverageCost>\n"
            "<QuantityOnOrder>0</QuantityOnOrder>\n<QuantityOnSalesOrder>0</QuantityOnSalesOrder>\n"
            "</ItemInventoryRet>\n</ItemInventoryQueryRs>\n";
  }
  return text + "</QBXMLMsgsRs>\n</QBXML>\n";
}

inline std::string accountBatch(int accounts) {
  static const char* const kTypes[] = {"Bank", "AccountsReceivable", "Income", "Expense",
                                       "OtherCurrentAsset"};
  std::string text = "<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n";
  for (int i = 0; i < accounts; ++i) {
    const std::string n = std::to_string(i);
    text += "<AccountQueryRs requestID=\"" + std::to_string(i + 2) +
            "\" statusCode=\"0\" statusSeverity=\"Info\" statusMessage=\"Status OK\">\n"
            "<AccountRet>\n<ListID>8000" +
            n +
            "-1209525941</ListID>\n"
            "<TimeCreated>2008-04-29T23:25:41-05:00</TimeCreated>\n"
            "<TimeModified>2008-04-29T23:25:41-05:00</TimeModified>\n"
            "<EditSequence>1209525941</EditSequence>\n<Name>Account " +
            n +
            "</Name>\n"
            "<FullName>Account " +
            n +
            "</FullName>\n<IsActive>true</IsActive>\n"
            "<Sublevel>0</Sublevel>\n<AccountType>" +
            kTypes[i % 5] + "</AccountType>\n";
    if (i % 2 == 0)
      text += "<AccountNumber>" + std::to_string(10000 + i % 90000) + "</AccountNumber>\n";
    text += "<Desc>Account number " + n +
            "</Desc>\n<Balance>951.65</Balance>\n"
            "<TotalBalance>951.65</TotalBalance>\n"
            "<TaxLineInfoRet>\n<TaxLineID>1864</TaxLineID>\n<TaxLineName>B/S-Assets: Cash"
            "</TaxLineName>\n</TaxLineInfoRet>\n"
            "<CashFlowClassification>NotApplicable</CashFlowClassification>\n"
            "</AccountRet>\n</AccountQueryRs>\n";
  }
  return text + "</QBXMLMsgsRs>\n</QBXML>\n";
}

}  // namespace droqbxml::bench

#endif  // DROQBXML_BENCH_RESPONSES_HPP_

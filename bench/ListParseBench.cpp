// The first ParseRs of an inventory item over batch responses of 10,000 and 50,000
// "ItemInventoryQueryRs" and of an account over 10,000 "AccountQueryRs", each response
// holding one record as QuickBooks writes it, against pugixml (see FirstParse.hpp). The
// record reads the first response; elements absent from it are searched to the end of the
// text, which is what makes the figure grow with the batch.
#include <string>

#include "bench/FirstParse.hpp"
#include "droqbxml/records/DroAccount.hpp"
#include "droqbxml/records/DroItemInventory.hpp"

namespace droqbxml {
namespace {

std::string inventoryBatch(int items) {
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

std::string accountBatch(int accounts) {
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

void BM_ItemInventoryFirstParse(benchmark::State& state) {
  bench::firstParseAgainstPugixml<DroItemInventory>(
      state, inventoryBatch(static_cast<int>(state.range(0))));
}

void BM_AccountFirstParse(benchmark::State& state) {
  bench::firstParseAgainstPugixml<DroAccount>(state,
                                              accountBatch(static_cast<int>(state.range(0))));
}

BENCHMARK(BM_ItemInventoryFirstParse)
    ->Arg(10000)
    ->Arg(50000)
    ->UseManualTime()
    ->Iterations(15)
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_AccountFirstParse)
    ->Arg(10000)
    ->UseManualTime()
    ->Iterations(15)
    ->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace droqbxml

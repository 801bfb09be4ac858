// droqbxml demo end to end against the embedded stand-in, in a temporary folder (the other
// commands are in the table of CliCommandsTest).
#include <gtest/gtest.h>

#include <filesystem>
#include <sstream>

#include "cli/Cli.hpp"
#include "droqbxml/connection/RequestProcessor.hpp"
#include "simulator/Simulator.hpp"
#include "tests/TestSupport.hpp"
#include "tests/cli/CliRunner.hpp"

namespace droqbxml {
namespace {

using Result = test::CliResult;

class CliStandInTest : public ::testing::Test {
 protected:
  void SetUp() override {
    unregisterRequestProcessor(kRequestProcessorProgId);
    basFolder_ = drive_.path("work");
    std::filesystem::create_directories(basFolder_);
    company_ = (basFolder_ / "acme.qbw").string();
  }
  void TearDown() override {
    unregisterRequestProcessor(kRequestProcessorProgId);
    unregisterRequestProcessor(simulator::kSimulatorProgId);
  }

  Result run(const std::vector<std::string>& args, const std::string& input = "") {
    return test::runCli(args, input);
  }

  test::TemporaryDrive drive_;
  std::filesystem::path basFolder_;
  std::string company_;
};

size_t countOf(const std::string& text, const std::string& what) {
  size_t count = 0;
  for (size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + 1)) ++count;
  return count;
}

TEST_F(CliStandInTest, DemoRunsOnAFreshCompanyAndAgain) {
  const Result first = run({"demo", "--company", company_});
  EXPECT_EQ(first.code, cli::kExitSuccess) << first.err;
  EXPECT_NE(first.out.find("Created company file"), std::string::npos);
  // A line a step: what was sent, the status, what was read back; then the summary.
  for (const char* step :
       {"ok      BuildAddAccount \"Job Materials 1\": RSSuccess (0); read back ListID 8",
        "ok      BuildAddItem udItemSalesTax \"City Tax 1\": RSSuccess (0); read back ListID",
        "refused BuildAddItem udItemPayment with a description \"Check 1\": RSParsingError "
        "(20000); lint, line 8: unknown element 'IremDesc' in ItemPaymentAdd\n",
        "TotalAmount 1296.16 (sales tax 72.29); ParseRs read nothing: it looks for "
        "EstimateAddRet, QuickBooks answers EstimateRet\n",
        "QuantityOnHand of \"Floor Tile 1\" 0 before, -22 after",
        "refused BuildAddInvoice, a line with tax code NON: RSTaxErrorInvoice (31401), QuickBooks "
        "3140 Error: There is an invalid reference to QuickBooks InvoiceLineItem SalesTaxCode "
        "\"NON\" in the Invoice line.  QuickBooks error message: You can't set taxable if Sales "
        "tax is turned off or the item is not a taxable item type.\n",
        "31 steps: 25 answered with success, 6 refused as expected, 0 unexpected.\n"}) {
    EXPECT_NE(first.out.find(step), std::string::npos) << step;
  }
  EXPECT_NE(first.out.find("Company file: " + company_ + " (kept"), std::string::npos);
  EXPECT_EQ(countOf(first.out, "\nrefused "), 6u);
  EXPECT_EQ(first.out.find("<AccountQueryRq"), std::string::npos);
  // Verbose, on the same file: the exchanges and dumps too.
  const Result second = run({"demo", "--company", company_, "--verbose"});
  EXPECT_EQ(second.code, cli::kExitSuccess) << second.err;
  EXPECT_NE(second.out.find("Using company file"), std::string::npos);
  for (const char* shown :
       {"<AccountQueryRq requestID=\"2\" />", "ITEM INVENTORY:", "<EstimateAddRq requestID=\"2\">",
        "PrintOut raised error 13", "Invoice LINE GROUP:",
        "ok      BuildAddCustomer \"Kim Lee 2\": RSSuccess (0); read back ListID",
        "31 steps: 25 answered with success, 6 refused as expected, 0 unexpected.\n"}) {
    EXPECT_NE(second.out.find(shown), std::string::npos) << shown;
  }
}

}  // namespace
}  // namespace droqbxml

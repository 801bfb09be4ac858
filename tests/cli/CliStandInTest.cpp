// The droqbxml command end to end against the embedded stand-in: company files, lint, queries
// and the demo, with company files in a temporary folder.
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

TEST_F(CliStandInTest, CreatesShowsAndManagesCompanyFiles) {
  const Result created =
      run({"company", "create", company_, "--name", "Acme Builders", "--sales-tax", "off"});
  EXPECT_EQ(created.code, cli::kExitSuccess) << created.err;
  EXPECT_EQ(run({"company", "create", company_}).code, cli::kExitUsage);  // exists already
  const Result shown = run({"company", "show", company_});
  EXPECT_EQ(shown.code, cli::kExitSuccess);
  EXPECT_NE(shown.out.find("Acme Builders"), std::string::npos);
  EXPECT_EQ(run({"company", "deny", company_, "Tessaly"}).code, cli::kExitSuccess);
  const Result refused = run({"query", "account", "--company", company_});
  EXPECT_EQ(refused.code, cli::kExitConnection);
  EXPECT_NE(refused.err.find("RSCantLogin (22000)"), std::string::npos);
  EXPECT_EQ(run({"company", "allow", company_, "Tessaly"}).code, cli::kExitSuccess);
  EXPECT_EQ(run({"query", "account", "--company", company_}).code, cli::kExitSuccess);
  EXPECT_EQ(run({"company", "show", (basFolder_ / "none.qbw").string()}).code,
            cli::kExitConnection);
}

TEST_F(CliStandInTest, QueriesAndSendsThroughTheStandIn) {
  ASSERT_EQ(run({"company", "create", company_}).code, cli::kExitSuccess);
  const Result accounts = run({"query", "account", "--company", company_});
  EXPECT_EQ(accounts.code, cli::kExitSuccess) << accounts.err;
  EXPECT_NE(accounts.out.find("<AccountRet>"), std::string::npos);
  EXPECT_NE(accounts.out.find("Response status: RSSuccess (0)"), std::string::npos);
  const Result none = run({"query", "customer", "--full-name", "Nobody", "--company", company_});
  EXPECT_EQ(none.code, cli::kExitNotSuccess);
  EXPECT_NE(none.out.find("Response status: RSNotFound (500)"), std::string::npos);
  const Result broken = run({"send", "-", "--company", company_}, "<QBXML><oops></QBXML>");
  EXPECT_EQ(broken.code, cli::kExitNotSuccess);
  EXPECT_NE(broken.out.find("RSParsingError (20000)"), std::string::npos);
}

TEST_F(CliStandInTest, LintNamesEachProblem) {
  const Result built =
      run({"build", "query", "customer", "--active", "all", "--from", "2026-01-01"});
  ASSERT_EQ(built.code, cli::kExitSuccess);
  EXPECT_EQ(run({"lint", "-"}, built.out).code, cli::kExitSuccess);
  const std::string misordered =
      "<?xml version=\"1.0\"?>\n<?qbxml version=\"13.0\"?>\n<QBXML>\n"
      "<QBXMLMsgsRq onError=\"stopOnError\">\n<CustomerAddRq>\n<CustomerAdd>\n"
      "<CompanyName>Acme</CompanyName>\n<Name>Kim</Name>\n</CustomerAdd>\n</CustomerAddRq>\n"
      "</QBXMLMsgsRq>\n</QBXML>\n";
  const Result lint = run({"lint", "-"}, misordered);
  EXPECT_EQ(lint.code, cli::kExitNotSuccess);
  EXPECT_NE(lint.out.find("<stdin>:7: QBXML/QBXMLMsgsRq/CustomerAddRq/CustomerAdd"),
            std::string::npos)
      << lint.out;
}

TEST_F(CliStandInTest, DemoRunsOnAFreshCompanyAndAgain) {
  const Result first = run({"demo", "--company", company_});
  EXPECT_EQ(first.code, cli::kExitSuccess) << first.err;
  EXPECT_NE(first.out.find("Created company file"), std::string::npos);
  EXPECT_NE(first.out.find("<AccountQueryRq requestID=\"2\" />"), std::string::npos);
  EXPECT_NE(first.out.find("Session ended"), std::string::npos);
  // Every accepted kind is read back from its add response; the refused ones are shown.
  for (const char* dump : {"False\r\nRequestID\r\n\t2", "ITEM INVENTORY:", "ITEM NON INVENTORY:",
                           "ITEM SUBTOTAL:", "ITEMDISCOUNT:", "ITEM OTHER CHARGE:", "ITEM SERVICE:",
                           "ITEM PAYMENT:", "ITEM SALES TAX:"}) {
    EXPECT_NE(first.out.find(dump), std::string::npos) << dump;
  }
  size_t refused = 0;
  for (size_t at = first.out.find("As expected: QuickBooks' schema refuses");
       at != std::string::npos; at = first.out.find("As expected", at + 1)) {
    ++refused;
  }
  EXPECT_EQ(refused, 4u);
  const Result second = run({"demo", "--company", company_});
  EXPECT_EQ(second.code, cli::kExitSuccess) << second.err;
  EXPECT_NE(second.out.find("Using company file"), std::string::npos);
}

}  // namespace
}  // namespace droqbxml

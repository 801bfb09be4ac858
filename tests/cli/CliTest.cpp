// The droqbxml command run in-process against a fake processor registered under a ProgID of
// its own: what it sends and prints for the processor's answers and refusals (the rest of
// the command is in the table of CliCommandsTest).
#include <gtest/gtest.h>

#include <sstream>
#include <stdexcept>

#include "cli/Cli.hpp"
#include "droqbxml/connection/RequestProcessor.hpp"
#include "tests/TestSupport.hpp"
#include "tests/cli/CliRunner.hpp"
#include "tests/connection/FakeProcessor.hpp"

namespace droqbxml {
namespace {

constexpr TextView kFakeProgId = u"Test.FakeProcessor";
const std::filesystem::path kData = std::filesystem::path(DROQBXML_TESTDATA_DIR) / "cli";

using Result = test::CliResult;

class CliTest : public ::testing::Test {
 protected:
  void SetUp() override {
    registerRequestProcessor(kFakeProgId, [f = fake_] { return f; });
    unregisterRequestProcessor(kRequestProcessorProgId);
  }
  void TearDown() override {
    unregisterRequestProcessor(kFakeProgId);
    // The command installs the embedded stand-in where nothing answers for QuickBooks.
    unregisterRequestProcessor(kRequestProcessorProgId);
  }

  Result run(const std::vector<std::string>& args, const std::string& input = "") {
    return test::runCli(args, input);
  }
  Result send(const std::vector<std::string>& extra, const std::string& input = "<request/>") {
    std::vector<std::string> args{"--processor", "Test.FakeProcessor", "send",
                                  "-",           "--company",          "C:\\co.qbw"};
    args.insert(args.end(), extra.begin(), extra.end());
    return run(args, input);
  }

  test::TemporaryDrive drive_;
  std::shared_ptr<test::FakeProcessor> fake_ = std::make_shared<test::FakeProcessor>();
};

TEST_F(CliTest, PrintsTheResponseAsReturnedAndSummarisesEachStatus) {
  const std::string response = test::readFile(kData / "invoice_query_rs.xml");
  fake_->process = [&](const Text&) { return fromUtf8(response); };
  const Result xml = send({}, "\xEF\xBB\xBF<request/>");
  EXPECT_EQ(xml.code, cli::kExitSuccess) << xml.err;
  EXPECT_EQ(xml.out, response);
  EXPECT_EQ(xml.err,
            "InvoiceQueryRs requestID=7 statusCode=0 statusSeverity=Info statusMessage=Status OK\n"
            "X statusCode=1 statusSeverity=Info statusMessage=none\n");
  EXPECT_EQ(fake_->calls,
            (std::vector<std::string>{"OpenConnection(4093-27-,Tessaly)",
                                      "BeginSession(C:\\co.qbw,2)", "ProcessRequest(ticket-1)",
                                      "EndSession(ticket-1)", "CloseConnection"}));
  // Repeated elements become arrays; values stay text.
  EXPECT_EQ(send({"--format", "JSON"}).out, test::readFile(kData / "invoice_query_rs.json"));

  // Any response that is not Info makes the exit code 1, wherever it stands.
  fake_->process = [](const Text&) {
    return Text(
        u"<QBXML><QBXMLMsgsRs><A statusCode=\"0\" statusSeverity=\"Info\" statusMessage=\"\"/>"
        u"<B statusCode=\"3100\" statusSeverity=\"Error\" statusMessage=\"x\"/>"
        u"<C statusCode=\"0\" statusSeverity=\"Info\" statusMessage=\"\"/></QBXMLMsgsRs></QBXML>");
  };
  EXPECT_EQ(send({}).code, cli::kExitNotSuccess);

  // A response that is not qbXML is passed through and is a failure of the exchange.
  fake_->process = [](const Text&) { return Text(u"<Rs statusCode=\"0\"/>"); };
  const Result odd = send({});
  EXPECT_EQ(odd.code, cli::kExitConnection);
  EXPECT_EQ(odd.out, "<Rs statusCode=\"0\"/>");
  EXPECT_EQ(odd.err,
            "droqbxml: the response is not a qbXML response document: no QBXML/QBXMLMsgsRs "
            "element\n");
}

TEST_F(CliTest, QueriesThroughTheBuilderWithTheHostsIdentity) {
  Text sent;
  fake_->process = [&](const Text& request) {
    sent = request;
    return Text(u"<QBXML><QBXMLMsgsRs/></QBXML>");
  };
  const Result result =
      run({"query", "customer", "--full-name", "A&B", "--company", "C:\\co.qbw", "--processor",
           "Test.FakeProcessor", "--app-name", "Job Costing", "--app-id", "1111-22-"});
  EXPECT_EQ(result.code, cli::kExitSuccess) << result.err;
  EXPECT_EQ(fake_->calls.front(), "OpenConnection(1111-22-,Job Costing)");
  EXPECT_NE(sent.find(u"<FullName>A&amp;B</FullName>"), Text::npos);
}

TEST_F(CliTest, ConnectionAndSessionFailuresExitWith3) {
  // Without a processor of the platform the embedded stand-in answers, and it has no such
  // company file.
  const Result standIn = run({"send", "-", "--company", "C:\\none\\co.qbw"}, "<r/>");
  EXPECT_EQ(standIn.code, cli::kExitConnection);
  EXPECT_NE(standIn.err.find("Could not open the specified QuickBooks company data file."),
            std::string::npos);
  const Result noProcessor = run({"--processor", "No.Such", "send", "-"}, "<r/>");
  EXPECT_EQ(noProcessor.code, cli::kExitConnection);
  EXPECT_NE(noProcessor.err.find("no request processor is available under \"No.Such\""),
            std::string::npos);

  const Result noCompany = run({"--processor", "Test.FakeProcessor", "send", "-"}, "<r/>");
  EXPECT_EQ(noCompany.code, cli::kExitConnection);
  EXPECT_NE(noCompany.err.find("RSUnsetCoFile (23000)"), std::string::npos);

  fake_->begin = [](const Text&) -> Text {
    throw test::processorError(static_cast<int32_t>(0x80040403),
                               u"Could not open the specified QuickBooks company data file.");
  };
  const Result missing = send({});
  EXPECT_EQ(missing.code, cli::kExitConnection);
  EXPECT_NE(missing.err.find("Could not open the specified QuickBooks company data file."),
            std::string::npos);

  fake_->begin = [](const Text&) -> Text {
    throw test::processorError(static_cast<int32_t>(0x8004040A),
                               u"There is already a company data file open and it is different "
                               u"from the requested one.");
  };
  EXPECT_EQ(send({}).err,
            "droqbxml: cannot begin a session on \"C:\\co.qbw\": another company file is open. "
            "QuickBooks: \"There is already a company data file open and it is different from "
            "the requested one.\" (0x8004040A)\n");

  fake_->open = [] {
    throw test::processorError(static_cast<int32_t>(0x80040401), u"Could not access QuickBooks.");
  };
  const Result closed = send({});
  EXPECT_EQ(closed.code, cli::kExitConnection);
  EXPECT_EQ(closed.err,
            "droqbxml: cannot open a connection to QuickBooks: Could not access QuickBooks. "
            "(0x80040401)\n");
}

TEST_F(CliTest, UnreadableOrOversizedRequestFileIsAUsageError) {
  const Result result = run({"--processor", "Test.FakeProcessor", "send",
                             drive_.path("none.xml").string(), "--company", "C:\\co.qbw"});
  EXPECT_EQ(result.code, cli::kExitUsage);
  EXPECT_NE(result.err.find("cannot read the request document"), std::string::npos);
  // One byte more than a request may have (a sparse file): refused, read no further.
  const auto large = drive_.path("large.xml");
  test::writeFile(large, "");
  std::filesystem::resize_file(large, 100 * 1024 * 1024 + 1);
  const Result lint = run({"lint", large.string()});
  EXPECT_EQ(lint.code, cli::kExitUsage);
  EXPECT_EQ(lint.err,
            "droqbxml: the request document \"" + large.string() +
                "\" has more than 104857600 bytes, the most a request may have (100 MB)\n");
  EXPECT_TRUE(fake_->calls.empty());
}

// A failure nothing foresaw still ends the command with one line and a documented code.
TEST_F(CliTest, AnUnexpectedFailureIsOneLineAndExitCode3) {
  fake_->process = [](const Text&) -> Text { throw std::runtime_error("the disk is on fire"); };
  const Result result = send({});
  EXPECT_EQ(result.code, cli::kExitConnection);
  EXPECT_EQ(result.err, "droqbxml: unexpected failure: the disk is on fire\n");
}

}  // namespace
}  // namespace droqbxml

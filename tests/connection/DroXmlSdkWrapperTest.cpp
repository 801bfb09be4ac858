// The session wrapper against a scripted processor: status rules, message matching,
// error recording and the failed-exchange log.
#include <gtest/gtest.h>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/connection/DroXmlSdkWrapper.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/runtime/Clock.hpp"
#include "tests/TestSupport.hpp"
#include "tests/connection/FakeProcessor.hpp"

namespace droqbxml {
namespace {

using test::processorError;
using test::raises;

constexpr TextView kMismatch =
    u"There is already a company data file open and it is different from the requested one.";

// A processor step that fails with this HRESULT and message.
std::function<Text(const Text&)> refuses(uint32_t hresult, TextView message) {
  return [=, text = Text(message)](const Text&) -> Text {
    throw processorError(static_cast<int32_t>(hresult), text);
  };
}
std::function<void()> fails(uint32_t hresult, TextView message) {
  return [=, text = Text(message)] { throw processorError(static_cast<int32_t>(hresult), text); };
}
int32_t hr(uint32_t hresult) { return static_cast<int32_t>(hresult); }

Text responseWith(TextView statusAndMessage) {
  return u"<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n<CustomerQueryRs requestID=\"2\" " +
         Text(statusAndMessage) + u" />\n</QBXMLMsgsRs>\n</QBXML>\n";
}

class DroXmlSdkWrapperTest : public ::testing::Test {
 protected:
  void SetUp() override {
    basGlobals::DroPathAccess(Variant(u"C:\\Tessaly"));
    std::filesystem::create_directories(drive_.path("Tessaly"));
    basGlobals::SharedErrorObject()->Clear();
  }
  void TearDown() override { basGlobals::DroPathAccess(Variant(u"")); }

  std::string log() const {
    return test::readFile(drive_.path("Tessaly/Logs/qbXmlErrors/qbXML-Error.txt"));
  }
  // Sends one request whose response the fake gives, returning the wrapper's answer.
  Text exchange(DroXmlSdkWrapper& wrapper, Text response) {
    registration_.fake->process = [response](const Text&) { return response; };
    return wrapper.ProcessRequest(u"<request/>");
  }

  test::TemporaryDrive drive_;
  test::FakeProcessorRegistration registration_;
};

TEST_F(DroXmlSdkWrapperTest, CreationWithAProcessorSetsTheIdentity) {
  DroXmlSdkWrapper wrapper;
  EXPECT_EQ(wrapper.appID(), u"4093-27-");
  EXPECT_EQ(wrapper.appName(), u"Tessaly");
  EXPECT_EQ(wrapper.ResponseStatus(), RSUnknown);
  EXPECT_EQ(wrapper.CoFilePathDefault(), u"");
  wrapper.appName(u"  Host  ");
  wrapper.appID(u" 1234-56- ");
  wrapper.CompanyFilePath(u"  C:\\co.qbw ");
  EXPECT_EQ(wrapper.appName(), u"Host");
  EXPECT_EQ(wrapper.appID(), u"1234-56-");
  EXPECT_EQ(wrapper.CompanyFilePath(), u"C:\\co.qbw");
  wrapper.ConnectionOpen();
  EXPECT_EQ(registration_.fake->calls.back(), "OpenConnection(1234-56-,Host)");
  EXPECT_EQ(wrapper.QbxmlMajorVerion(), 13);
}

TEST_F(DroXmlSdkWrapperTest, StatusCodesDecideTheLog) {
  DroXmlSdkWrapper wrapper;
  exchange(wrapper, responseWith(u"statusCode=\"0\" statusSeverity=\"Info\""));
  EXPECT_EQ(wrapper.ResponseStatus(), RSSuccess);
  exchange(wrapper, responseWith(u"statusCode=\"500\" statusSeverity=\"Warn\""));
  EXPECT_EQ(wrapper.ResponseStatus(), RSNotFound);
  EXPECT_FALSE(std::filesystem::exists(drive_.path("Tessaly/Logs")));
  exchange(wrapper, responseWith(u"statusCode=\"1\" statusSeverity=\"Info\""));
  EXPECT_EQ(wrapper.ResponseStatus(), RSNoMatch);
  EXPECT_NE(log().find("RECEIVING"), std::string::npos);
  exchange(wrapper, u"<QBXML/>");
  EXPECT_EQ(wrapper.ResponseStatus(), RSUnknown);
  exchange(wrapper, responseWith(u"statusCode=\"3180\""));
  EXPECT_EQ(wrapper.ResponseStatus(), 3180);  // any other code is kept as it is
  const auto entries = log();
  size_t count = 0;
  for (auto at = entries.find("SENDING"); at != std::string::npos;
       at = entries.find("SENDING", at + 1)) {
    ++count;
  }
  EXPECT_EQ(count, 3u);
}

TEST_F(DroXmlSdkWrapperTest, FailedExchangeIsLoggedWithTheResponseAsReturned) {
  DroXmlSdkWrapper wrapper;
  const ScopedClock clock({2026, 11, 15, 9, 0, 1});
  const Text answer = exchange(wrapper, u"<Rs statusCode=\"1\" statusMessage=\"A &amp;lt; B\"/>");
  EXPECT_EQ(answer, u"<Rs statusCode=\"1\" statusMessage=\"A &lt; B\"/>");  // unescaped once
  EXPECT_EQ(log(),
            "SENDING: 2026-11-15 09:00:01\r\n\r\n<request/>\r\n\r\n\r\nRECEIVING: 2026-11-15 "
            "09:00:01\trequest response status <> success\r\n\r\n\t<Rs statusCode=\"1\" "
            "statusMessage=\"A &lt; B\"/>\r\n");
}

TEST_F(DroXmlSdkWrapperTest, BlankRequestSkipsTheProcessorButNotTheLogTest) {
  DroXmlSdkWrapper wrapper;
  EXPECT_EQ(wrapper.ProcessRequest(u"   "), u"");
  EXPECT_TRUE(registration_.fake->calls.empty());
  // The status is still the initial -10, so even this exchange is logged, with zero dates.
  EXPECT_EQ(log(),
            "SENDING: 1899-12-30 00:00:00\r\n\r\n   \r\n\r\n\r\nRECEIVING: 1899-12-30 "
            "00:00:00\trequest response status <> success\r\n\r\n\t\r\n");
}

TEST_F(DroXmlSdkWrapperTest, TaxMessagesRefineStatus3140) {
  DroXmlSdkWrapper wrapper;
  const Text invoiceShort =
      u"there is an invalid reference to quickbooks invoicelineitem salestaxcode &quot;non&quot; "
      u"in the invoice line.";
  exchange(wrapper, responseWith(u"statusCode=\"3140\" statusMessage=\"" + invoiceShort + u"\""));
  EXPECT_EQ(wrapper.ResponseStatus(), RSTaxErrorInvoice);
  const Text estimateMisspelt =
      u"There is an invalid reference to QuickBooks EstimateLineItem SalesTaxCode &quot;NON&quot; "
      u"in the Estimate line.  QuickBooks error message: You can't set taxable if Sales tax is "
      u"turned of or the item is not a taxable item type.";
  exchange(wrapper, responseWith(u"statusCode=\"3140\" a=\"" + invoiceShort + u"\" b=\"" +
                                 estimateMisspelt + u"\""));
  EXPECT_EQ(wrapper.ResponseStatus(), RSTaxErrorEstimate);
  exchange(wrapper, responseWith(u"statusCode=\"3140\" statusMessage=\"There is an invalid "
                                 u"reference to QuickBooks Customer &quot;X&quot;\""));
  EXPECT_EQ(wrapper.ResponseStatus(), RSRefNotFound);
  exchange(wrapper, responseWith(u"statusCode=\"1\" m=\"" + invoiceShort + u"\""));
  EXPECT_EQ(wrapper.ResponseStatus(), RSNoMatch);  // only 3140 is refined
}

TEST_F(DroXmlSdkWrapperTest, ProcessorFailuresBecomeTheResponse) {
  DroXmlSdkWrapper wrapper;
  auto shared = basGlobals::SharedErrorObject();
  registration_.fake->process =
      refuses(0x80040400, u"QuickBooks found an error when parsing the provided XML text stream.");
  EXPECT_EQ(wrapper.ProcessRequest(u"<bad"),
            u"QuickBooks found an error when parsing the provided XML text stream.");
  EXPECT_EQ(wrapper.ResponseStatus(), RSParsingError);
  EXPECT_EQ(shared->Number(), 0);  // nothing recorded

  registration_.fake->process = refuses(0x8004040D, u"The ticket parameter is invalid.");
  EXPECT_EQ(wrapper.ProcessRequest(u"<x/>"), u"The ticket parameter is invalid.");
  EXPECT_EQ(wrapper.ResponseStatus(), RSUnknown);
  EXPECT_EQ(shared->Number(), hr(0x8004040D));
  EXPECT_EQ(shared->Source(), u"DroXmlSdkWrapper.ProcessRequest");

  // A status code without its closing quote fails inside the exchange: the raw response
  // comes back with RSUnknown and the runtime's 5 recorded.
  shared->Clear();
  EXPECT_EQ(exchange(wrapper, u"<Rs statusCode=\"0 &amp;"), u"<Rs statusCode=\"0 &amp;");
  EXPECT_EQ(wrapper.ResponseStatus(), RSUnknown);
  EXPECT_EQ(shared->Number(), RuntimeError::kInvalidProcedureCall);
}

TEST_F(DroXmlSdkWrapperTest, SessionBeginMapsRefusalsAndRaisesOtherFailures) {
  DroXmlSdkWrapper wrapper;
  wrapper.SessionBegin();
  EXPECT_EQ(wrapper.ResponseStatus(), RSUnsetCoFile);
  EXPECT_TRUE(registration_.fake->calls.empty());

  wrapper.CompanyFilePath(u"C:\\co.qbw");
  wrapper.SessionBegin();
  EXPECT_EQ(wrapper.SessionTicket(), u"ticket-1");
  EXPECT_EQ(registration_.fake->calls.back(), "BeginSession(C:\\co.qbw,2)");
  EXPECT_EQ(wrapper.ResponseStatus(), RSUnsetCoFile);  // success leaves the status alone

  registration_.fake->begin = refuses(0x8004040A, kMismatch);
  wrapper.SessionBegin();
  EXPECT_EQ(wrapper.ResponseStatus(), RSCoNameMismatch);
  // The mismatch message is compared whole: with anything added it is an ordinary failure,
  // raised after closing the connection.
  const Text longer = Text(kMismatch) + u" ";
  registration_.fake->begin = refuses(0x8004040A, longer);
  EXPECT_TRUE(raises([&] { wrapper.SessionBegin(); }, hr(0x8004040A),
                     u"DroXmlSdkWrapper.SessionBegin", longer));
  EXPECT_EQ(registration_.fake->calls.back(), "CloseConnection");
  EXPECT_EQ(wrapper.ResponseStatus(), RSCoNameMismatch);  // left as the last refusal set it

  for (const TextView refusal :
       {TextView(u"This application is not allowed to log into this QuickBooks company data "
                 u"file automatically. The QuickBooks administrator can grant permission for "
                 u"automatic login through the Integrated Application preferences."),
        TextView(u"Unexpected error. Check the qbsdk.log file for possible, additional "
                 u"information.")}) {
    DroXmlSdkWrapper fresh;
    fresh.CompanyFilePath(u"C:\\co.qbw");
    registration_.fake->begin = refuses(0x8004041D, refusal);
    fresh.SessionBegin();
    EXPECT_EQ(fresh.ResponseStatus(), RSCantLogin);
  }
}

TEST_F(DroXmlSdkWrapperTest, SessionBeginOpensTheConnectionWhenAskedTo) {
  DroXmlSdkWrapper wrapper;
  wrapper.CompanyFilePath(u"C:\\co.qbw");
  bool opened = false;
  registration_.fake->open = [&] { opened = true; };
  registration_.fake->begin = [&](const Text&) -> Text {
    if (!opened) {
      throw processorError(hr(0x80040402), u"The method \"OpenConnection\" has not been called.");
    }
    return u"ticket-2";
  };
  wrapper.SessionBegin();
  EXPECT_EQ(wrapper.SessionTicket(), u"ticket-2");
  EXPECT_EQ(registration_.fake->calls, (std::vector<std::string>{"BeginSession(C:\\co.qbw,2)",
                                                                 "OpenConnection(4093-27-,Tessaly)",
                                                                 "BeginSession(C:\\co.qbw,2)"}));

  // Against an OpenConnection that fails, the retry ends with its error.
  opened = false;
  registration_.fake->open = fails(0x80040401, u"Could not access QuickBooks.");
  EXPECT_TRUE(raises([&] { wrapper.SessionBegin(); }, hr(0x80040401),
                     u"DroXmlSdkWrapper.ConnectionOpen", u"Could not access QuickBooks."));
}

TEST_F(DroXmlSdkWrapperTest, SessionEndRecordsOnlyTheBeginSessionMessage) {
  DroXmlSdkWrapper wrapper;
  wrapper.CompanyFilePath(u"C:\\co.qbw");
  wrapper.SessionBegin();
  wrapper.SessionEnd();
  EXPECT_EQ(wrapper.SessionTicket(), u"");
  registration_.fake->end =
      fails(0x80040402, u"The \"BeginSession\" method has not been called or did not succeed.");
  EXPECT_TRUE(raises([&] { wrapper.SessionEnd(); }, hr(0x80040402), u"DroXmlSdkWrapper.SessionEnd",
                     u"The \"BeginSession\" method has not been called or did not succeed."));
  basGlobals::SharedErrorObject()->Clear();
  registration_.fake->end = fails(0x8004040D, u"The ticket parameter is invalid.");
  EXPECT_TRUE(raises([&] { wrapper.SessionEnd(); }, hr(0x8004040D), u"QBXMLRP.RequestProcessor.1",
                     u"The ticket parameter is invalid."));
  EXPECT_EQ(basGlobals::SharedErrorObject()->Number(), 0);  // passed through, not recorded
}

TEST_F(DroXmlSdkWrapperTest, TestForSdkComms) {
  DroXmlSdkWrapper wrapper;
  EXPECT_TRUE(wrapper.TestForSdkComms(u" C:\\co.qbw "));
  EXPECT_EQ(wrapper.CompanyFilePath(), u"C:\\co.qbw");
  EXPECT_EQ(
      registration_.fake->calls,
      (std::vector<std::string>{"OpenConnection(4093-27-,Tessaly)", "BeginSession(C:\\co.qbw,2)",
                                "EndSession(ticket-1)", "CloseConnection"}));
  registration_.fake->calls.clear();
  registration_.fake->begin = refuses(0x8004040A, kMismatch);
  DroXmlSdkWrapper other;
  EXPECT_FALSE(other.TestForSdkComms(u"C:\\other.qbw"));
  EXPECT_EQ(other.ResponseStatus(), RSCoNameMismatch);
  // Deliberately left open: no CloseConnection.
  EXPECT_EQ(registration_.fake->calls.back(), "BeginSession(C:\\other.qbw,2)");
  EXPECT_FALSE(other.TestForSdkComms(u""));
  EXPECT_EQ(other.ResponseStatus(), RSUnsetCoFile);
}

TEST_F(DroXmlSdkWrapperTest, ReachableByName) {
  auto wrapper = std::make_shared<DroXmlSdkWrapper>();
  wrapper->let(u"CompanyFilePath", u" C:\\co.qbw ");
  wrapper->call(u"ConnectionOpen");
  wrapper->call(u"SessionBegin");
  EXPECT_EQ(wrapper->get(u"SessionTicket").toText(), u"ticket-1");
  const Text response = wrapper->call(u"ProcessRequest", {u"<x/>"}).toText();
  EXPECT_NE(response.find(u"statusCode=\"0\""), Text::npos);
  EXPECT_EQ(wrapper->get(u"ResponseStatus").toLong(), RSSuccess);
  EXPECT_EQ(wrapper->get(u"QbxmlMajorVerion").toLong(), 13);
  wrapper->call(u"class_termintate");
  EXPECT_TRUE(test::raisesRuntime([&] { wrapper->get(u"QbxmlMinorVersion"); },
                                  RuntimeError::kObjectNotSet));
}

class WrapperWithoutProcessorTest : public DroXmlSdkWrapperTest {
 protected:
  void SetUp() override {
    DroXmlSdkWrapperTest::SetUp();
    unregisterRequestProcessor(kRequestProcessorProgId);
  }
};

TEST_F(WrapperWithoutProcessorTest, TreatsTheUnsetObjectLikeAProcessorError) {
  DroXmlSdkWrapper wrapper;
  EXPECT_EQ(wrapper.appID(), u"");
  EXPECT_EQ(wrapper.appName(), u"");
  EXPECT_EQ(wrapper.ResponseStatus(), RSSuccess);
  const Text notSet = runtimeErrorDescription(RuntimeError::kObjectNotSet);
  EXPECT_TRUE(raises([&] { wrapper.ConnectionOpen(); }, RuntimeError::kObjectNotSet,
                     u"DroXmlSdkWrapper.ConnectionOpen", notSet));
  EXPECT_EQ(wrapper.ProcessRequest(u"<x/>"), notSet);
  EXPECT_EQ(wrapper.ResponseStatus(), RSUnknown);
  EXPECT_NE(log().find("\t" + toUtf8(notSet)), std::string::npos);
  EXPECT_TRUE(test::raisesRuntime([&] { wrapper.SessionEnd(); }, RuntimeError::kObjectNotSet));
  EXPECT_TRUE(test::raisesRuntime([&] { wrapper.ConnectionClose(); }, RuntimeError::kObjectNotSet));
}

TEST_F(WrapperWithoutProcessorTest, OtherCreationFailuresAreRaised) {
  registerRequestProcessor(kRequestProcessorProgId, []() -> std::shared_ptr<RequestProcessor> {
    throw processorError(hr(0x80040408), u"Could not start QuickBooks.");
  });
  EXPECT_TRUE(raises([] { DroXmlSdkWrapper wrapper; }, hr(0x80040408),
                     u"DroXmlSdkWrapper.Class_Initialize.CreateQbXmlObject",
                     u"Could not start QuickBooks."));
}

}  // namespace
}  // namespace droqbxml

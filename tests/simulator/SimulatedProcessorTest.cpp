// The stand-in's request processor: connection and session order, tickets, company-file
// failures, one company file per process, application access, requests, and the messages
// as the session wrapper reads them.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdlib>
#include <memory>
#include <string>

#include "droqbxml/connection/DroXmlSdkWrapper.hpp"
#include "droqbxml/runtime/FileSystem.hpp"
#include "simulator/CompanyFile.hpp"
#include "simulator/Simulator.hpp"
#include "simulator/internal/SimulatedProcessor.hpp"
#include "tests/TestSupport.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator {
namespace {

using internal::SimulatedProcessor;
namespace Hresult = internal::ProcessorHresult;

constexpr TextView kSource = u"QBXMLRP.RequestProcessor.1";
constexpr TextView kOpenConnectionNotCalled = u"The method \"OpenConnection\" has not been called.";
constexpr TextView kBeginSessionNotCalled =
    u"The \"BeginSession\" method has not been called or did not succeed.";
constexpr TextView kCouldNotOpen = u"Could not open the specified QuickBooks company data file.";
constexpr TextView kUnexpected =
    u"Unexpected error. Check the qbsdk.log file for possible, additional information.";
constexpr TextView kOtherFileOpen =
    u"There is already a company data file open and it is different from the requested one.";
constexpr TextView kAccessDenied =
    u"Access denied. This application does not have permission to access this QuickBooks "
    u"company data file. If access is required, the QuickBooks administrator can grant "
    u"permission through Integrated Application preferences.";
constexpr TextView kNoAutoLogin =
    u"This application is not allowed to log into this QuickBooks company data file "
    u"automatically. The QuickBooks administrator can grant permission for automatic login "
    u"through the Integrated Application preferences.";

const Text kQuery =
    u"<?xml version=\"1.0\" ?>\n<?qbxml version=\"13.0\"?>\n<QBXML>\n"
    u"<QBXMLMsgsRq onError=\"stopOnError\">\n<CustomerQueryRq requestID=\"7\">\n"
    u"<FullName>Nobody Here</FullName>\n</CustomerQueryRq>\n</QBXMLMsgsRq>\n</QBXML>\n";

::testing::AssertionResult raises(const std::function<void()>& body, int32_t hresult,
                                  TextView text) {
  return test::raises(body, hresult, kSource, text);
}

Text textOf(const std::filesystem::path& path) { return fromUtf8(path.string()); }

class SimulatedProcessorTest : public ::testing::Test {
 protected:
  void SetUp() override {
    CompanyFile::create(folder_ / "a.qbw", {"Company A", true});
    CompanyFile::create(folder_ / "b.qbw", {"Company B", false});
  }
  Text file(const std::string& name) const { return textOf(folder_ / name); }
  // A processor whose connection is open for the application `appName`.
  static std::unique_ptr<SimulatedProcessor> connected(const Text& appName = u"Tessaly") {
    auto processor = std::make_unique<SimulatedProcessor>();
    processor->OpenConnection(u"4093-27-", appName);
    return processor;
  }

  test::TemporaryFolder folder_;
};

TEST_F(SimulatedProcessorTest, StepsOutOfOrderRaiseTheVersionOneMessages) {
  SimulatedProcessor processor;
  EXPECT_EQ(processor.MajorVersion(), 13);
  EXPECT_EQ(processor.MinorVersion(), 0);
  EXPECT_TRUE(raises([&] { processor.BeginSession(file("a.qbw"), qbFileOpenDoNotCare); },
                     Hresult::kUnexpected, kOpenConnectionNotCalled));
  EXPECT_TRUE(raises([&] { processor.ProcessRequest(u"", kQuery); }, Hresult::kUnexpected,
                     kOpenConnectionNotCalled));
  EXPECT_TRUE(
      raises([&] { processor.EndSession(u""); }, Hresult::kUnexpected, kBeginSessionNotCalled));

  processor.OpenConnection(u"4093-27-", u"Tessaly");
  EXPECT_TRUE(raises([&] { processor.ProcessRequest(u"", kQuery); }, Hresult::kUnexpected,
                     kBeginSessionNotCalled));
  EXPECT_TRUE(
      raises([&] { processor.ProcessRequest(u"{00000000-0000-0000-0000-000000000000}", kQuery); },
             Hresult::kUnexpected, kBeginSessionNotCalled));

  const Text ticket = processor.BeginSession(file("a.qbw"), qbFileOpenDoNotCare);
  EXPECT_EQ(ticket.size(), 38u);
  EXPECT_EQ(processor.GetCurrentCompanyFileName(ticket), file("a.qbw"));
  EXPECT_NE(processor.ProcessRequest(ticket, kQuery).find(u"<CustomerQueryRs requestID=\"7\""),
            Text::npos);
  processor.EndSession(ticket);

  // An ended ticket is "BeginSession has not been called", for every step that takes one.
  EXPECT_TRUE(raises([&] { processor.ProcessRequest(ticket, kQuery); }, Hresult::kUnexpected,
                     kBeginSessionNotCalled));
  EXPECT_TRUE(
      raises([&] { processor.EndSession(ticket); }, Hresult::kUnexpected, kBeginSessionNotCalled));
  EXPECT_TRUE(raises([&] { processor.GetCurrentCompanyFileName(ticket); }, Hresult::kUnexpected,
                     kBeginSessionNotCalled));

  // Closing the connection ends its sessions; their tickets are then spent.
  const Text second = processor.BeginSession(file("a.qbw"), qbFileOpenSingleUser);
  EXPECT_NE(second, ticket);
  processor.CloseConnection();
  EXPECT_TRUE(raises([&] { processor.ProcessRequest(second, kQuery); }, Hresult::kUnexpected,
                     kOpenConnectionNotCalled));
  EXPECT_TRUE(
      raises([&] { processor.EndSession(second); }, Hresult::kUnexpected, kBeginSessionNotCalled));
}

TEST_F(SimulatedProcessorTest, ATicketItNeverGaveIsInvalidBesideOpenSessions) {
  const auto processor = connected();
  const Text ticket = processor->BeginSession(file("a.qbw"), qbFileOpenDoNotCare);
  const Text unknown = u"{11111111-2222-3333-4444-555555555555}";
  const Text invalid = u"The ticket parameter is invalid.";
  EXPECT_TRUE(raises([&] { processor->ProcessRequest(unknown, kQuery); }, Hresult::kInvalidTicket,
                     invalid));
  EXPECT_TRUE(
      raises([&] { processor->ProcessRequest(u"", kQuery); }, Hresult::kInvalidTicket, invalid));
  EXPECT_TRUE(raises([&] { processor->EndSession(unknown); }, Hresult::kInvalidTicket, invalid));
  EXPECT_TRUE(raises([&] { processor->GetCurrentCompanyFileName(unknown); },
                     Hresult::kInvalidTicket, invalid));

  // Another processor's ticket is not this one's.
  const auto other = connected();
  EXPECT_TRUE(raises([&] { other->ProcessRequest(ticket, kQuery); }, Hresult::kUnexpected,
                     kBeginSessionNotCalled));
  const Text own = other->BeginSession(file("a.qbw"), qbFileOpenDoNotCare);
  EXPECT_TRUE(
      raises([&] { other->ProcessRequest(ticket, kQuery); }, Hresult::kInvalidTicket, invalid));
  other->EndSession(own);

  // An ended ticket stays "BeginSession has not been called" while other sessions are open.
  const Text ended = processor->BeginSession(file("a.qbw"), qbFileOpenDoNotCare);
  processor->EndSession(ended);
  EXPECT_TRUE(raises([&] { processor->ProcessRequest(ended, kQuery); }, Hresult::kUnexpected,
                     kBeginSessionNotCalled));
  processor->EndSession(ticket);
}

TEST_F(SimulatedProcessorTest, CompanyFilesThatCannotBeUsed) {
  test::writeFile(folder_ / "letter.qbw", "Not a company file.\n");
  sqlite3* other = nullptr;
  ASSERT_EQ(sqlite3_open((folder_ / "other.db").c_str(), &other), SQLITE_OK);
  test::sql(other, "CREATE TABLE t (x)");
  sqlite3_close(other);

  const auto processor = connected();
  const auto begin = [&](const Text& path) { processor->BeginSession(path, qbFileOpenDoNotCare); };
  EXPECT_TRUE(
      raises([&] { begin(file("missing.qbw")); }, Hresult::kCouldNotOpenFile, kCouldNotOpen));
  EXPECT_TRUE(
      raises([&] { begin(textOf(folder_.root())); }, Hresult::kCouldNotOpenFile, kCouldNotOpen));
  EXPECT_TRUE(raises([&] { begin(u""); }, Hresult::kCouldNotOpenFile, kCouldNotOpen));
  EXPECT_TRUE(raises([&] { begin(file("letter.qbw")); }, Hresult::kUnexpected, kUnexpected));
  EXPECT_TRUE(raises([&] { begin(file("other.db")); }, Hresult::kUnexpected, kUnexpected));

  // None of the failures left its file open for the process.
  const Text ticket = processor->BeginSession(file("b.qbw"), qbFileOpenDoNotCare);
  processor->EndSession(ticket);

  // A file this user may not write cannot be opened.
  std::filesystem::permissions(folder_ / "a.qbw", std::filesystem::perms::owner_read |
                                                      std::filesystem::perms::group_read |
                                                      std::filesystem::perms::others_read);
  const int refused = test::runUnprivileged([&] {
    SimulatedProcessor unprivileged;
    unprivileged.OpenConnection(u"", u"Tessaly");
    return raises([&] { unprivileged.BeginSession(file("a.qbw"), qbFileOpenDoNotCare); },
                  Hresult::kCouldNotOpenFile, kCouldNotOpen)
               ? 0
               : 1;
  });
  if (refused != test::kCannotDropRights) {
    EXPECT_EQ(refused, 0);
  }
}

TEST_F(SimulatedProcessorTest, OneCompanyFileIsOpenInAProcessAtATime) {
  const auto first = connected(u"First");
  const auto second = connected(u"Second");
  const Text onA = first->BeginSession(file("a.qbw"), qbFileOpenDoNotCare);
  EXPECT_TRUE(raises([&] { second->BeginSession(file("b.qbw"), qbFileOpenDoNotCare); },
                     Hresult::kOtherFileOpen, kOtherFileOpen));
  // The same file, however it is spelt, and the open file by an empty path.
  const Text alsoOnA =
      second->BeginSession(textOf(folder_.root() / "." / "a.qbw"), qbFileOpenDoNotCare);
  const Text openOne = second->BeginSession(u"", qbFileOpenDoNotCare);
  EXPECT_EQ(second->GetCurrentCompanyFileName(openOne), file("a.qbw"));
  EXPECT_NE(second->ProcessRequest(openOne, kQuery).find(u"CustomerQueryRs"), Text::npos);

  first->EndSession(onA);
  second->EndSession(alsoOnA);
  EXPECT_TRUE(raises([&] { first->BeginSession(file("b.qbw"), qbFileOpenDoNotCare); },
                     Hresult::kOtherFileOpen, kOtherFileOpen));
  second->EndSession(openOne);

  // With every session on A ended, B can be opened; a processor dropped with a session
  // open frees its file as well.
  auto dropped = connected();
  dropped->BeginSession(file("b.qbw"), qbFileOpenDoNotCare);
  dropped.reset();
  const Text onB = first->BeginSession(file("b.qbw"), qbFileOpenDoNotCare);
  EXPECT_EQ(first->GetCurrentCompanyFileName(onB), file("b.qbw"));
  first->CloseConnection();
  const Text againOnA = second->BeginSession(file("a.qbw"), qbFileOpenDoNotCare);
  second->EndSession(againOnA);
}

TEST_F(SimulatedProcessorTest, PlatformPathsAreMappedAsTheComponentMapsThem) {
  test::TemporaryDrive drive;
  std::filesystem::create_directories(drive.path("Company Files"));
  CompanyFile::create(drive.path("Company Files/Orvanne.qbw"), {});
  const auto processor = connected();
  const Text path = u"C:\\Company Files\\Orvanne.qbw";
  const Text ticket = processor->BeginSession(path, qbFileOpenDoNotCare);
  EXPECT_EQ(processor->GetCurrentCompanyFileName(ticket), path);
  // The same file by its file-system path is the file already open.
  const Text again =
      processor->BeginSession(textOf(drive.path("Company Files/Orvanne.qbw")), qbFileOpenDoNotCare);
  EXPECT_TRUE(raises([&] { processor->BeginSession(file("a.qbw"), qbFileOpenDoNotCare); },
                     Hresult::kOtherFileOpen, kOtherFileOpen));
  processor->EndSession(again);
  processor->EndSession(ticket);
}

TEST_F(SimulatedProcessorTest, ApplicationsAreLetInAsTheCompanyFileSays) {
  {
    CompanyFile company(folder_ / "a.qbw");
    company.setApplication("Refused", {false, true});
    company.setApplication("Attended", {true, false});
  }
  const auto newcomer = connected(u"Newcomer");
  newcomer->EndSession(newcomer->BeginSession(file("a.qbw"), qbFileOpenDoNotCare));
  {
    CompanyFile company(folder_ / "a.qbw");
    const auto added = company.application("Newcomer");
    ASSERT_TRUE(added.has_value());
    EXPECT_TRUE(added->allowed && added->autoLogin);
  }
  EXPECT_TRUE(
      raises([&] { connected(u"Refused")->BeginSession(file("a.qbw"), qbFileOpenDoNotCare); },
             Hresult::kAccessDenied, kAccessDenied));
  EXPECT_TRUE(
      raises([&] { connected(u"Attended")->BeginSession(file("a.qbw"), qbFileOpenDoNotCare); },
             Hresult::kNoAutoLogin, kNoAutoLogin));
  // A refused application does not keep the file open.
  const auto other = connected(u"Refused");
  other->EndSession(other->BeginSession(file("b.qbw"), qbFileOpenDoNotCare));
  CompanyFile company(folder_ / "a.qbw");
  EXPECT_FALSE(company.application("Refused")->allowed);
}

TEST_F(SimulatedProcessorTest, RequestsAreCheckedThenAnsweredFromTheCompanyFile) {
  const auto processor = connected();
  const Text ticket = processor->BeginSession(file("a.qbw"), qbFileOpenDoNotCare);
  EXPECT_TRUE(raises([&] { processor->ProcessRequest(ticket, u"<QBXML><QBXMLMsgsRq>"); },
                     Hresult::kParseError,
                     u"QuickBooks found an error when parsing the provided XML text stream."));
  EXPECT_FALSE(processor->lastProblems().empty());

  const Text add =
      u"<?xml version=\"1.0\" ?>\n<?qbxml version=\"13.0\"?>\n<QBXML>\n"
      u"<QBXMLMsgsRq onError=\"stopOnError\">\n<CustomerAddRq requestID=\"2\">\n<CustomerAdd>\n"
      u"<Name>Caf\u00e9 Zo\u00eb</Name>\n</CustomerAdd>\n</CustomerAddRq>\n</QBXMLMsgsRq>\n"
      u"</QBXML>\n";
  const Text response = processor->ProcessRequest(ticket, add);
  EXPECT_TRUE(processor->lastProblems().empty());
  EXPECT_EQ(response.rfind(u"<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n", 0), 0u);
  EXPECT_NE(response.find(u"<CustomerAddRs requestID=\"2\" statusCode=\"0\""), Text::npos)
      << toUtf8(response);
  EXPECT_NE(response.find(u"<Name>Caf\u00e9 Zo\u00eb</Name>"), Text::npos) << toUtf8(response);

  // A company file that fails under a request is QuickBooks' unexpected error.
  sqlite3* other = nullptr;
  ASSERT_EQ(sqlite3_open((folder_ / "a.qbw").c_str(), &other), SQLITE_OK);
  test::sql(other, "DROP TABLE customers");
  sqlite3_close(other);
  EXPECT_TRUE(raises([&] { processor->ProcessRequest(ticket, kQuery); }, Hresult::kUnexpected,
                     kUnexpected));
  processor->EndSession(ticket);
}

// Restores the processor registrations a test changes.
class RegistrationGuard {
 public:
  RegistrationGuard()
      : processor_(registeredRequestProcessor(kRequestProcessorProgId)),
        simulator_(registeredRequestProcessor(kSimulatorProgId)) {}
  ~RegistrationGuard() {
    restore(kRequestProcessorProgId, processor_);
    restore(kSimulatorProgId, simulator_);
  }
  RegistrationGuard(const RegistrationGuard&) = delete;
  RegistrationGuard& operator=(const RegistrationGuard&) = delete;

 private:
  static void restore(TextView progId, const RequestProcessorFactory& factory) {
    if (factory) {
      registerRequestProcessor(progId, factory);
    } else {
      unregisterRequestProcessor(progId);
    }
  }
  RequestProcessorFactory processor_;
  RequestProcessorFactory simulator_;
};

bool isSimulated(const std::shared_ptr<RequestProcessor>& processor) {
  return dynamic_cast<SimulatedProcessor*>(processor.get()) != nullptr;
}

TEST_F(SimulatedProcessorTest, InstallationTakesQuickBooksPlaceOnlyWhenAsked) {
  const RegistrationGuard guard;
  unregisterRequestProcessor(kRequestProcessorProgId);
  unregisterRequestProcessor(kSimulatorProgId);
  const char* previous = std::getenv("DROQBXML_REQUEST_PROCESSOR");
  const std::string saved = previous ? previous : "";

  ::setenv("DROQBXML_REQUEST_PROCESSOR", "quickbooks", 1);
  EXPECT_FALSE(installIfRequested());
  EXPECT_TRUE(isSimulated(createRequestProcessor(kSimulatorProgId)));
  EXPECT_FALSE(registeredRequestProcessor(kRequestProcessorProgId));
  ::setenv("DROQBXML_REQUEST_PROCESSOR", "simulator", 1);
  EXPECT_TRUE(installIfRequested());
  EXPECT_TRUE(isSimulated(createRequestProcessor(kRequestProcessorProgId)));

  unregisterRequestProcessor(kRequestProcessorProgId);
  install();
  EXPECT_TRUE(isSimulated(createRequestProcessor(kRequestProcessorProgId)));
  EXPECT_NE(createProcessor(), createProcessor());

  if (previous) {
    ::setenv("DROQBXML_REQUEST_PROCESSOR", saved.c_str(), 1);
  } else {
    ::unsetenv("DROQBXML_REQUEST_PROCESSOR");
  }
}

TEST_F(SimulatedProcessorTest, TheSessionWrapperUnderstandsItsMessages) {
  const RegistrationGuard guard;
  install();
  {
    CompanyFile company(folder_ / "b.qbw");
    company.setApplication("Tessaly", {true, false});
  }
  DroXmlSdkWrapper wrapper;
  // Without ConnectionOpen: the wrapper reads "OpenConnection has not been called" and
  // opens the connection itself.
  wrapper.CompanyFilePath(file("a.qbw"));
  wrapper.SessionBegin();
  EXPECT_EQ(wrapper.ResponseStatus(), RSUnknown);
  EXPECT_EQ(wrapper.GetCurrentCompanyFileName(), file("a.qbw"));

  DroXmlSdkWrapper other;
  other.CompanyFilePath(file("b.qbw"));
  other.SessionBegin();
  EXPECT_EQ(other.ResponseStatus(), RSCoNameMismatch);
  wrapper.SessionEnd();
  wrapper.ConnectionClose();
  other.SessionBegin();
  EXPECT_EQ(other.ResponseStatus(), RSCantLogin);
  other.ConnectionClose();

  EXPECT_TRUE(DroXmlSdkWrapper().TestForSdkComms(file("a.qbw")));
}

}  // namespace
}  // namespace droqbxml::simulator

// The stand-in's request processor: connection and session order, tickets, company-file
// failures, one company file per process, application access, requests, and the messages
// as the session wrapper reads them.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "droqbxml/component/basGlobals.hpp"
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

// A failure as QuickBooks raises it: its HRESULT and its text.
struct Refusal {
  int32_t hresult;
  TextView text;
};
constexpr Refusal kNoConnection{Hresult::kUnexpected,
                                u"The method \"OpenConnection\" has not been called."};
constexpr Refusal kNoSession{
    Hresult::kUnexpected, u"The \"BeginSession\" method has not been called or did not succeed."};
constexpr Refusal kBadTicket{Hresult::kInvalidTicket, u"The ticket parameter is invalid."};
constexpr Refusal kCannotOpen{Hresult::kCouldNotOpenFile,
                              u"Could not open the specified QuickBooks company data file."};
constexpr Refusal kUnexpected{
    Hresult::kUnexpected,
    u"Unexpected error. Check the qbsdk.log file for possible, additional information."};
constexpr Refusal kOtherFileOpen{
    Hresult::kOtherFileOpen,
    u"There is already a company data file open and it is different from the requested one."};
constexpr Refusal kAccessDenied{
    Hresult::kAccessDenied,
    u"Access denied. This application does not have permission to access this QuickBooks "
    u"company data file. If access is required, the QuickBooks administrator can grant "
    u"permission through Integrated Application preferences."};
constexpr Refusal kNoAutoLogin{
    Hresult::kNoAutoLogin,
    u"This application is not allowed to log into this QuickBooks company data file "
    u"automatically. The QuickBooks administrator can grant permission for automatic login "
    u"through the Integrated Application preferences."};
constexpr Refusal kNotYetAccessed{
    Hresult::kNotYetAccessed,
    u"This application has not accessed this QuickBooks company data file before.  Only the "
    u"QuickBooks administrator can grant permission for an application to access a "
    u"QuickBooks company data file for the first time."};

// Asserts that `body` raises `refusal` from the request processor.
::testing::AssertionResult raises(const std::function<void()>& body, const Refusal& refusal) {
  return test::raises(body, refusal.hresult, kRequestProcessorProgId, refusal.text);
}
#define EXPECT_REFUSED(call, refusal) EXPECT_TRUE(raises([&] { call; }, refusal))

const Text kQuery =
    u"<?xml version=\"1.0\" ?>\n<?qbxml version=\"13.0\"?>\n<QBXML>\n"
    u"<QBXMLMsgsRq onError=\"stopOnError\">\n<CustomerQueryRq requestID=\"7\">\n"
    u"<FullName>Nobody Here</FullName>\n</CustomerQueryRq>\n</QBXMLMsgsRq>\n</QBXML>\n";
constexpr auto kAny = qbFileOpenDoNotCare;

Text textOf(const std::filesystem::path& path) { return fromUtf8(path.string()); }

class SimulatedProcessorTest : public ::testing::Test {
 protected:
  void SetUp() override {
    CompanyFile::create(folder_ / "a.qbw", {"Company A", true, {"Tessaly", "First", "Second"}});
    CompanyFile::create(folder_ / "b.qbw",
                        {"Company B", false, {"Tessaly", "First", "Second", "Refused"}});
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

TEST_F(SimulatedProcessorTest, SessionStepsOutOfOrderAndForeignTicketsAreRefused) {
  SimulatedProcessor processor;
  EXPECT_EQ(processor.MajorVersion(), 13);
  EXPECT_EQ(processor.MinorVersion(), 0);
  EXPECT_REFUSED(processor.BeginSession(file("a.qbw"), kAny), kNoConnection);
  EXPECT_REFUSED(processor.ProcessRequest(u"", kQuery), kNoConnection);
  EXPECT_REFUSED(processor.EndSession(u""), kNoSession);

  // While no session is open, any ticket is "BeginSession has not been called".
  const Text unknown = u"{11111111-2222-3333-4444-555555555555}";
  processor.OpenConnection(u"4093-27-", u"Tessaly");
  EXPECT_REFUSED(processor.ProcessRequest(u"", kQuery), kNoSession);
  EXPECT_REFUSED(processor.ProcessRequest(unknown, kQuery), kNoSession);

  const Text ticket = processor.BeginSession(file("a.qbw"), kAny);
  EXPECT_EQ(ticket.size(), 38u);
  EXPECT_EQ(processor.GetCurrentCompanyFileName(ticket), file("a.qbw"));
  EXPECT_NE(processor.ProcessRequest(ticket, kQuery).find(u"<CustomerQueryRs requestID=\"7\""),
            Text::npos);
  // Beside open sessions, a ticket it never gave is invalid, another processor's too.
  EXPECT_REFUSED(processor.ProcessRequest(unknown, kQuery), kBadTicket);
  EXPECT_REFUSED(processor.ProcessRequest(u"", kQuery), kBadTicket);
  EXPECT_REFUSED(processor.EndSession(unknown), kBadTicket);
  EXPECT_REFUSED(processor.GetCurrentCompanyFileName(unknown), kBadTicket);
  const auto other = connected();
  EXPECT_REFUSED(other->ProcessRequest(ticket, kQuery), kNoSession);
  const Text own = other->BeginSession(file("a.qbw"), kAny);
  EXPECT_REFUSED(other->ProcessRequest(ticket, kQuery), kBadTicket);
  other->EndSession(own);

  // An ended ticket stays "BeginSession has not been called" for every step that takes one,
  // also while other sessions are open.
  const Text second = processor.BeginSession(file("a.qbw"), qbFileOpenSingleUser);
  EXPECT_NE(second, ticket);
  processor.EndSession(ticket);
  EXPECT_REFUSED(processor.ProcessRequest(ticket, kQuery), kNoSession);
  EXPECT_REFUSED(processor.EndSession(ticket), kNoSession);
  EXPECT_REFUSED(processor.GetCurrentCompanyFileName(ticket), kNoSession);

  // Closing the connection ends its sessions; their tickets are then spent.
  processor.CloseConnection();
  EXPECT_REFUSED(processor.ProcessRequest(second, kQuery), kNoConnection);
  EXPECT_REFUSED(processor.EndSession(second), kNoSession);
}

TEST_F(SimulatedProcessorTest, CompanyFilesThatCannotBeUsed) {
  test::writeFile(folder_ / "letter.qbw", "Not a company file.\n");
  sqlite3* other = nullptr;
  ASSERT_EQ(sqlite3_open((folder_ / "other.db").c_str(), &other), SQLITE_OK);
  test::sql(other, "CREATE TABLE t (x)");
  sqlite3_close(other);

  const auto processor = connected();
  for (const auto& [path, refusal] :
       std::vector<std::pair<Text, Refusal>>{{file("missing.qbw"), kCannotOpen},
                                             {textOf(folder_.root()), kCannotOpen},
                                             {u"", kCannotOpen},
                                             {file("letter.qbw"), kUnexpected},
                                             {file("other.db"), kUnexpected}}) {
    EXPECT_REFUSED(processor->BeginSession(path, kAny), refusal) << toUtf8(path);
  }
  // None of the failures left its file open for the process.
  processor->EndSession(processor->BeginSession(file("b.qbw"), kAny));

  // A file this user may not write cannot be opened.
  std::filesystem::permissions(folder_ / "a.qbw", std::filesystem::perms::owner_read |
                                                      std::filesystem::perms::group_read |
                                                      std::filesystem::perms::others_read);
  const int refused = test::runUnprivileged([&] {
    SimulatedProcessor unprivileged;
    unprivileged.OpenConnection(u"", u"Tessaly");
    return raises([&] { unprivileged.BeginSession(file("a.qbw"), kAny); }, kCannotOpen) ? 0 : 1;
  });
  if (refused != test::kCannotDropRights) {
    EXPECT_EQ(refused, 0);
  }
}

TEST_F(SimulatedProcessorTest, OneCompanyFileIsOpenInAProcessAtATime) {
  const auto first = connected(u"First");
  const auto second = connected(u"Second");
  const Text onA = first->BeginSession(file("a.qbw"), kAny);
  EXPECT_REFUSED(second->BeginSession(file("b.qbw"), kAny), kOtherFileOpen);
  // The same file, however it is spelt, and the open file by an empty path.
  const Text alsoOnA = second->BeginSession(textOf(folder_.root() / "." / "a.qbw"), kAny);
  const Text openOne = second->BeginSession(u"", kAny);
  EXPECT_EQ(second->GetCurrentCompanyFileName(openOne), file("a.qbw"));
  EXPECT_NE(second->ProcessRequest(openOne, kQuery).find(u"CustomerQueryRs"), Text::npos);

  first->EndSession(onA);
  second->EndSession(alsoOnA);
  EXPECT_REFUSED(first->BeginSession(file("b.qbw"), kAny), kOtherFileOpen);
  second->EndSession(openOne);

  // With every session on A ended, B can be opened; a processor dropped with a session
  // open frees its file as well, and so does a closed connection.
  auto dropped = connected();
  dropped->BeginSession(file("b.qbw"), kAny);
  dropped.reset();
  const Text onB = first->BeginSession(file("b.qbw"), kAny);
  EXPECT_EQ(first->GetCurrentCompanyFileName(onB), file("b.qbw"));
  first->CloseConnection();
  second->EndSession(second->BeginSession(file("a.qbw"), kAny));
}

TEST_F(SimulatedProcessorTest, PlatformPathsAreMappedAsTheComponentMapsThem) {
  test::TemporaryDrive drive;
  std::filesystem::create_directories(drive.path("Company Files"));
  CompanyFile::create(drive.path("Company Files/Orvanne.qbw"), {"My Company", true, {"Tessaly"}});
  const auto processor = connected();
  const Text path = u"C:\\Company Files\\Orvanne.qbw";
  const Text ticket = processor->BeginSession(path, kAny);
  EXPECT_EQ(processor->GetCurrentCompanyFileName(ticket), path);
  // The same file by its file-system path is the file already open.
  const Text again = processor->BeginSession(textOf(drive.path("Company Files/Orvanne.qbw")), kAny);
  EXPECT_REFUSED(processor->BeginSession(file("a.qbw"), kAny), kOtherFileOpen);
  processor->EndSession(again);
  processor->EndSession(ticket);
}

TEST_F(SimulatedProcessorTest, ApplicationsAreLetInAsTheCompanyFileSays) {
  {
    CompanyFile company(folder_ / "a.qbw");
    company.setApplication("Refused", {false, true});
    company.setApplication("Attended", {true, false});
  }
  // Nobody is at the keyboard to approve an application the file has not seen.
  EXPECT_REFUSED(connected(u"Newcomer")->BeginSession(file("a.qbw"), kAny), kNotYetAccessed);
  EXPECT_REFUSED(connected(u"Refused")->BeginSession(file("a.qbw"), kAny), kAccessDenied);
  EXPECT_REFUSED(connected(u"Attended")->BeginSession(file("a.qbw"), kAny), kNoAutoLogin);
  // A refused application does not keep the file open.
  const auto other = connected(u"Refused");
  other->EndSession(other->BeginSession(file("b.qbw"), kAny));
  // Refusals change nothing in the file.
  CompanyFile company(folder_ / "a.qbw");
  EXPECT_FALSE(company.application("Newcomer").has_value());
  EXPECT_FALSE(company.application("Refused")->allowed);
}

TEST_F(SimulatedProcessorTest, RequestsAreCheckedThenAnsweredFromTheCompanyFile) {
  const auto processor = connected();
  const Text ticket = processor->BeginSession(file("a.qbw"), kAny);
  EXPECT_REFUSED(processor->ProcessRequest(ticket, u"<QBXML><QBXMLMsgsRq>"),
                 (Refusal{Hresult::kParseError,
                          u"QuickBooks found an error when parsing the "
                          u"provided XML text stream."}));
  EXPECT_FALSE(processor->lastProblems().empty());

  const Text response = processor->ProcessRequest(
      ticket,
      u"<?xml version=\"1.0\" ?>\n<?qbxml version=\"13.0\"?>\n<QBXML>\n<QBXMLMsgsRq "
      u"onError=\"stopOnError\">\n<CustomerAddRq requestID=\"2\">\n<CustomerAdd>\n<Name>Caf\u00e9 "
      u"Zo\u00eb</Name>\n</CustomerAdd>\n</CustomerAddRq>\n</QBXMLMsgsRq>\n</QBXML>\n");
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
  EXPECT_REFUSED(processor->ProcessRequest(ticket, kQuery), kUnexpected);
  processor->EndSession(ticket);
}

// Restores the processor registrations and the processor choice a test changes.
struct RegistrationGuard {
  RequestProcessorFactory processor = registeredRequestProcessor(kRequestProcessorProgId);
  RequestProcessorFactory simulator = registeredRequestProcessor(kSimulatorProgId);
  test::ScopedVariable choice{"DROQBXML_REQUEST_PROCESSOR"};
  ~RegistrationGuard() {
    for (const auto& [progId, factory] :
         {std::pair{kRequestProcessorProgId, processor}, std::pair{kSimulatorProgId, simulator}}) {
      factory ? registerRequestProcessor(progId, factory) : unregisterRequestProcessor(progId);
    }
  }
};

bool isSimulated(const std::shared_ptr<RequestProcessor>& processor) {
  return dynamic_cast<SimulatedProcessor*>(processor.get()) != nullptr;
}

TEST_F(SimulatedProcessorTest, InstallationTakesQuickBooksPlaceOnlyWhenAsked) {
  const RegistrationGuard guard;
  unregisterRequestProcessor(kRequestProcessorProgId);
  unregisterRequestProcessor(kSimulatorProgId);
  guard.choice.set("quickbooks");
  EXPECT_FALSE(installIfRequested());
  EXPECT_TRUE(isSimulated(createRequestProcessor(kSimulatorProgId)));
  EXPECT_FALSE(registeredRequestProcessor(kRequestProcessorProgId));
  guard.choice.set("simulator");
  EXPECT_TRUE(installIfRequested());
  EXPECT_TRUE(isSimulated(createRequestProcessor(kRequestProcessorProgId)));

  unregisterRequestProcessor(kRequestProcessorProgId);
  install();
  EXPECT_TRUE(isSimulated(createRequestProcessor(kRequestProcessorProgId)));
  EXPECT_NE(createProcessor(), createProcessor());
}

TEST_F(SimulatedProcessorTest, TheSessionWrapperUnderstandsItsMessages) {
  const RegistrationGuard guard;
  install();
  CompanyFile(folder_ / "b.qbw").setApplication("Tessaly", {true, false});
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

// On a company file without sales tax, a line's tax code is refused with the message the
// wrapper tells apart for invoices and estimates.
TEST_F(SimulatedProcessorTest, TheSessionWrapperTellsTaxCodeRefusalsApart) {
  const RegistrationGuard guard;
  install();
  test::TemporaryDrive drive;  // for the wrapper's log of failed exchanges
  basGlobals::DroPathAccess(Variant(u"C:\\Tessaly"));
  const auto document = [](const Text& requests) {
    return u"<?xml version=\"1.0\" ?>\n<?qbxml version=\"13.0\"?>\n<QBXML>\n<QBXMLMsgsRq "
           u"onError=\"stopOnError\">\n" +
           requests + u"</QBXMLMsgsRq>\n</QBXML>\n";
  };
  const auto add = [&](const Text& kind) {
    return document(u"<" + kind + u"AddRq><" + kind +
                    u"Add><CustomerRef><FullName>Acme</FullName></CustomerRef><" + kind +
                    u"LineAdd><ItemRef><FullName>Labor</FullName></ItemRef><Quantity>1</Quantity>"
                    u"<SalesTaxCodeRef><FullName>NON</FullName></SalesTaxCodeRef></" +
                    kind + u"LineAdd></" + kind + u"Add></" + kind + u"AddRq>\n");
  };
  DroXmlSdkWrapper wrapper;
  wrapper.CompanyFilePath(file("b.qbw"));
  wrapper.SessionBegin();
  wrapper.ProcessRequest(document(
      u"<CustomerAddRq><CustomerAdd><Name>Acme</Name></CustomerAdd></CustomerAddRq>\n"
      u"<ItemServiceAddRq><ItemServiceAdd><Name>Labor</Name><SalesOrPurchase><Price>85</Price>"
      u"<AccountRef><FullName>Sales</FullName></AccountRef></SalesOrPurchase></ItemServiceAdd>"
      u"</ItemServiceAddRq>\n"));
  EXPECT_EQ(wrapper.ResponseStatus(), RSSuccess);
  wrapper.ProcessRequest(add(u"Invoice"));
  EXPECT_EQ(wrapper.ResponseStatus(), RSTaxErrorInvoice);
  wrapper.ProcessRequest(add(u"Estimate"));
  EXPECT_EQ(wrapper.ResponseStatus(), RSTaxErrorEstimate);
  wrapper.SessionEnd();
  wrapper.ConnectionClose();
  basGlobals::DroPathAccess(Variant(u""));
}

}  // namespace
}  // namespace droqbxml::simulator

// The error log and the failed-exchange log, byte for byte.
#include <gtest/gtest.h>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/Logs.hpp"
#include "droqbxml/diagnostics/clsAppPathAccess.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/runtime/FileSystem.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::readFile;

class LogsTest : public ::testing::Test {
 protected:
  void SetUp() override { basGlobals::DroPathAccess(Variant(u"")); }
  void TearDown() override { basGlobals::DroPathAccess(Variant(u"")); }

  test::TemporaryDrive drive_;
  ScopedClock clock_{{2026, 11, 15, 0, 24, 51}};
};

constexpr char kFirstRecord[] =
    "Error Date: Sun Nov 15, 2026  12:24:51 AM\r\n"
    "\terror number: -2147201502\r\n"
    "\terror source: DroXmlProcessor.AddHeaders\r\n"
    "\terror description: \r\n"
    "\tnot initialised\r\n"
    "\r\n\r\n";

TEST_F(LogsTest, ErrorLogUsesTheDefaultPathWhenNoneIsSet) {
  clsMyErr err;
  err.SetErrorInfo(DRO_XML_PROCESSOR_IMPROPERLY_INITIONALIZED, u"DroXmlProcessor.AddHeaders",
                   u"not initialised");
  err.LogError();
  EXPECT_EQ(readFile(drive_.path("Program Files/Orvanne/Tessaly/Logs/ErrorLog.txt")), kFirstRecord);
  EXPECT_EQ(basGlobals::DroPathAccess(), u"");  // the default served this call only
}

TEST_F(LogsTest, ErrorLogAppendsAndCopiesAGivenRecord) {
  basGlobals::DroPathAccess(Variant(u"C:\\Apps"));
  createFolder(u"C:\\Apps");
  clsMyErr err;
  err.SetErrorInfo(DRO_XML_PROCESSOR_IMPROPERLY_INITIONALIZED, u"DroXmlProcessor.AddHeaders",
                   u"not initialised");
  err.LogError();
  ErrorRecord record;
  record.Number = 53;
  record.Source = u"Host";
  record.Description = u"caf\u00e9";
  err.LogError(record);
  EXPECT_EQ(err.Source(), u"Host");
  EXPECT_EQ(readFile(drive_.path("Apps/Logs/ErrorLog.txt")),
            std::string(kFirstRecord) +
                "Error Date: Sun Nov 15, 2026  12:24:51 AM\r\n\terror number: 53\r\n"
                "\terror source: Host\r\n\terror description: \r\n\tcaf\xC3\xA9\r\n\r\n\r\n");
}

TEST_F(LogsTest, ErrorLogThatCannotBeOpenedRaisesTheFileError) {
  basGlobals::DroPathAccess(Variant(u"C:\\Apps"));
  std::filesystem::create_directories(drive_.path("Apps/Logs/ErrorLog.txt"));
  clsMyErr err;
  EXPECT_TRUE(test::raisesRuntime([&] { err.LogError(); }, RuntimeError::kPathFileAccessError));
  basGlobals::DroPathAccess(Variant(u"C:\\Missing\\Deeper"));
  EXPECT_TRUE(test::raisesRuntime([&] { err.LogError(); }, RuntimeError::kPathNotFound));
}

constexpr char kFirstExchange[] =
    "SENDING: 2026-11-15 09:00:01\r\n\r\n<req/>\r\n"
    "\r\n\r\nRECEIVING: 2026-11-15 09:00:02\trequest response status <> success\r\n\r\n"
    "\t<rs statusCode=\"3140\"/>\r\n";

TEST_F(LogsTest, FailedExchangeLogAppendsWithASeparator) {
  clsAppPathAccess().Apppath(u"C:\\Tessaly");
  createFolder(u"C:\\Tessaly");
  const LocalTime sent{2026, 11, 15, 9, 0, 1};
  const LocalTime received{2026, 11, 15, 9, 0, 2};
  LogFailedExchange(u"<req/>", u"<rs statusCode=\"3140\"/>", sent, received);
  const auto log = drive_.path("Tessaly/Logs/qbXmlErrors/qbXML-Error.txt");
  EXPECT_EQ(readFile(log), kFirstExchange);
  LogFailedExchange(u"", u"", kZeroDate, kZeroDate);
  EXPECT_EQ(readFile(log), std::string(kFirstExchange) + "\r\n\r\n\r\n\r\n\r\n" +
                               "SENDING: 1899-12-30 00:00:00\r\n\r\n\r\n\r\n\r\nRECEIVING: "
                               "1899-12-30 00:00:00\trequest response status <> success"
                               "\r\n\r\n\t\r\n");
}

TEST_F(LogsTest, FailedExchangeLogStartsAgainPastTheLimitAndNeverRaises) {
  basGlobals::DroPathAccess(Variant(u"C:\\T"));
  std::filesystem::create_directories(drive_.path("T/Logs/qbXmlErrors"));
  const auto log = drive_.path("T/Logs/qbXmlErrors/qbXML-Error.txt");
  const LocalTime sent{2026, 11, 15, 9, 0, 1};
  const LocalTime received{2026, 11, 15, 9, 0, 2};
  test::writeFile(log, std::string(512000, 'x'));
  LogFailedExchange(u"<req/>", u"<rs statusCode=\"3140\"/>", sent, received);
  EXPECT_EQ(readFile(log).substr(512000, 11), "\r\n\r\n\r\n\r\n\r\nS");  // at the limit: kept
  test::writeFile(log, std::string(600000, 'x'));
  LogFailedExchange(u"<req/>", u"<rs statusCode=\"3140\"/>", sent, received);
  EXPECT_EQ(readFile(log), kFirstExchange);

  // A log folder that cannot be created: nothing written, nothing raised.
  basGlobals::DroPathAccess(Variant(u"C:\\Blocked"));
  test::writeFile(drive_.path("Blocked"), "a file where the folder should be");
  EXPECT_NO_THROW(LogFailedExchange(u"a", u"b", sent, received));
}

TEST_F(LogsTest, FailedExchangeLogNeedsAFreeFileNumber) {
  basGlobals::DroPathAccess(Variant(u"C:\\T"));
  std::vector<FileNumber> held;
  for (int i = 0; i < 511; ++i) held.push_back(FileNumber::take());
  LogFailedExchange(u"a", u"b", kZeroDate, kZeroDate);
  EXPECT_FALSE(std::filesystem::exists(drive_.path("T/Logs")));
}

}  // namespace
}  // namespace droqbxml

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

Text logText(const std::filesystem::path& path) { return fromUtf8(readFile(path)); }

// Without a path set the default installation path serves the one call; with one, records
// are appended, a given record copied in first.
TEST_F(LogsTest, ErrorLogAppendsUnderTheDefaultOrTheGivenPath) {
  clsMyErr err;
  err.SetErrorInfo(DRO_XML_PROCESSOR_IMPROPERLY_INITIONALIZED, u"DroXmlProcessor.AddHeaders",
                   u"not initialised");
  err.LogError();
  EXPECT_TRUE(
      test::matchesGolden(logText(drive_.path("Program Files/Orvanne/Tessaly/Logs/ErrorLog.txt")),
                          "logs/error_log_one.txt"));
  EXPECT_EQ(basGlobals::DroPathAccess(), u"");

  basGlobals::DroPathAccess(Variant(u"C:\\Apps"));
  createFolder(u"C:\\Apps");
  err.LogError();
  ErrorRecord record;
  record.Number = 53;
  record.Source = u"Host";
  record.Description = u"caf\u00e9";
  err.LogError(record);
  EXPECT_EQ(err.Source(), u"Host");
  EXPECT_TRUE(test::matchesGolden(logText(drive_.path("Apps/Logs/ErrorLog.txt")),
                                  "logs/error_log_two.txt"));
}

TEST_F(LogsTest, ErrorLogThatCannotBeOpenedRaisesTheFileError) {
  basGlobals::DroPathAccess(Variant(u"C:\\Apps"));
  std::filesystem::create_directories(drive_.path("Apps/Logs/ErrorLog.txt"));
  clsMyErr err;
  EXPECT_TRUE(test::raisesRuntime([&] { err.LogError(); }, RuntimeError::kPathFileAccessError));
  basGlobals::DroPathAccess(Variant(u"C:\\Missing\\Deeper"));
  EXPECT_TRUE(test::raisesRuntime([&] { err.LogError(); }, RuntimeError::kPathNotFound));
}

TEST_F(LogsTest, FailedExchangeLogAppendsUpToItsLimitAndNeverRaises) {
  clsAppPathAccess().Apppath(u"C:\\Tessaly");
  createFolder(u"C:\\Tessaly");
  const LocalTime sent{2026, 11, 15, 9, 0, 1};
  const LocalTime received{2026, 11, 15, 9, 0, 2};
  const auto log = drive_.path("Tessaly/Logs/qbXmlErrors/qbXML-Error.txt");
  LogFailedExchange(u"<req/>", u"<rs statusCode=\"3140\"/>", sent, received);
  EXPECT_TRUE(test::matchesGolden(logText(log), "logs/exchange_log_one.txt"));
  LogFailedExchange(u"", u"", kZeroDate, kZeroDate);
  EXPECT_TRUE(test::matchesGolden(logText(log), "logs/exchange_log_two.txt"));
  // At exactly 512000 bytes the log is appended to; one byte more and it starts again.
  test::writeFile(log, std::string(512000, 'x'));
  LogFailedExchange(u"<req/>", u"<rs statusCode=\"3140\"/>", sent, received);
  EXPECT_EQ(readFile(log).substr(512000, 11), "\r\n\r\n\r\n\r\n\r\nS");
  test::writeFile(log, std::string(512001, 'x'));
  LogFailedExchange(u"<req/>", u"<rs statusCode=\"3140\"/>", sent, received);
  EXPECT_TRUE(test::matchesGolden(logText(log), "logs/exchange_log_one.txt"));

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

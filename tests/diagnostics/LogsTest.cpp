// The error log and the failed-exchange log, byte for byte, and whole when processes write
// them at once.
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <string>

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

// One exchange keeps at most 50000 characters of its request and of its response, each cut
// with a note of what was left out; a surrogate pair at the cut stays whole.
TEST_F(LogsTest, FailedExchangeKeepsTheStartOfALongRequestAndResponse) {
  clsAppPathAccess().Apppath(u"C:\\T");
  createFolder(u"C:\\T");
  LogFailedExchange(Text(49999, u'q') + u"\U0001F600" + Text(150000, u'q'), Text(1000000, u'r'),
                    kZeroDate, kZeroDate);
  const std::string log = readFile(drive_.path("T/Logs/qbXmlErrors/qbXML-Error.txt"));
  EXPECT_LT(log.size(), 110000u);
  EXPECT_NE(log.find(std::string(49999, 'q') + "... [150002 characters left out]\r\n"), log.npos);
  EXPECT_NE(log.find(std::string(50000, 'r') + "... [950000 characters left out]\r\n"), log.npos);
}

// Entry `seq` of writer `writer`: "#writer-seq:" and up to 32 KB of one letter, so that a torn
// or mixed entry cannot pass for a whole one; an exchange sends and receives it.
Text entryText(int writer, int seq) {
  const size_t letters =
      (static_cast<size_t>(writer) * 7919 + static_cast<size_t>(seq) * 104729) % 32758;
  return fromUtf8("#" + std::to_string(writer) + "-" + std::to_string(seq) + ":" +
                  std::string(letters, static_cast<char>('a' + (writer + seq) % 26)));
}

// Eight processes logging at once in eight bursts, entries of 10 bytes to 64 KB: each log is
// made of entries exactly as one process alone writes them (the failed-exchange log, started
// again on the way, checked after each burst). DROQBXML_LOG_ROUNDS sets the entries per
// process and burst (6; more for a long run).
TEST_F(LogsTest, EntriesOfProcessesWritingAtOnceStayWhole) {
  const char* configured = std::getenv("DROQBXML_LOG_ROUNDS");
  const int rounds = configured ? std::atoi(configured) : 6;
  const auto write = [](const Text& text) {
    appendErrorLog(0, u"writer", text);
    LogFailedExchange(text, text, kZeroDate, kZeroDate);
  };
  const std::string logs[] = {"/Logs/ErrorLog.txt", "/Logs/qbXmlErrors/qbXML-Error.txt"};
  const std::string kFive = "\r\n\r\n\r\n\r\n\r\n";
  clsAppPathAccess().Apppath(u"C:\\Alone");
  createFolder(u"C:\\Alone");
  write(u"@");  // the logs as one process alone writes an entry of "@"
  const std::string alone[] = {readFile(drive_.path("Alone" + logs[0])),
                               readFile(drive_.path("Alone" + logs[1])) + kFive};
  clsAppPathAccess().Apppath(u"C:\\Shared");
  createFolder(u"C:\\Shared");
  for (int burst = 0; burst < 8; ++burst) {
    int start[2];  // the writers start together when it closes
    ASSERT_EQ(::pipe(start), 0);
    for (int writer = 0; writer < 8; ++writer) {
      if (::fork() != 0) continue;
      ::close(start[1]);
      if (char none = 0; ::read(start[0], &none, 1) != 0) ::_exit(1);
      for (int seq = burst * rounds; seq < (burst + 1) * rounds; ++seq) {
        write(entryText(writer, seq));
      }
      ::_exit(0);
    }
    ::close(start[1]);
    ::close(start[0]);
    for (int status = 0; ::wait(&status) > 0;) EXPECT_EQ(status, 0);
    for (size_t log = burst < 7 ? 1 : 0; log < 2; ++log) {
      const std::string text = readFile(drive_.path("Shared" + logs[log])) + (log ? kFive : "");
      for (size_t at = 0, next = 0; at < text.size(); at = next) {
        next = text.find(log ? "SENDING" : "Error", at + 1);
        const std::string piece = text.substr(at, next - at);
        int writer = -1;
        int seq = -1;
        std::sscanf(piece.c_str() + std::min(piece.find('#'), piece.size()), "#%d-%d", &writer,
                    &seq);
        std::string expected = alone[log];
        for (size_t found = 0; (found = expected.find('@')) != std::string::npos;) {
          expected.replace(found, 1, toUtf8(entryText(writer, seq)));
        }
        ASSERT_TRUE(piece == expected) << logs[log] << ": " << piece.substr(0, 60);
      }
    }
  }
}

}  // namespace
}  // namespace droqbxml

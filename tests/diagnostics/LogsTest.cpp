// The error log and the failed-exchange log, byte for byte, and whole when processes write
// them at once.
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

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
  basGlobals::DroPathAccess(Variant(u"C:\\T"));
  createFolder(u"C:\\T");
  const Text request = Text(49999, u'q') + u"\U0001F600" + Text(150000, u'q');
  LogFailedExchange(request, Text(1000000, u'r'), kZeroDate, kZeroDate);
  LogFailedExchange(Text(50000, u's'), u"", kZeroDate, kZeroDate);
  const std::string log = readFile(drive_.path("T/Logs/qbXmlErrors/qbXML-Error.txt"));
  EXPECT_LT(log.size(), 160000u);
  EXPECT_NE(log.find("\r\n\r\n" + std::string(49999, 'q') + "... [150002 characters left out]\r\n"),
            std::string::npos);
  EXPECT_NE(log.find("\t" + std::string(50000, 'r') + "... [950000 characters left out]\r\n"),
            std::string::npos);
  EXPECT_NE(log.find("\r\n\r\n" + std::string(50000, 's') + "\r\n"), std::string::npos);
}

// Entry `seq` of writer `writer`, 10 bytes to 64 KB over `parts` texts: it names both and is
// one letter after that, so that a torn or mixed entry cannot pass for a whole one.
std::string entryText(int writer, int seq, size_t parts) {
  const size_t size = 10 + (static_cast<size_t>(writer) * 7919 + seq * 104729) % (65536 - 10);
  const std::string tag = std::to_string(writer) + "-" + std::to_string(seq) + ":";
  return tag + std::string(std::max(size / parts, tag.size()) - tag.size(),
                           static_cast<char>('a' + (writer + seq) % 26));
}

// Reads `expected` at `at` and moves past it.
bool take(std::string_view text, size_t& at, std::string_view expected) {
  if (text.substr(at, expected.size()) != expected) return false;
  at += expected.size();
  return true;
}

// The text from `at` to `marker`, moving past the marker; nothing when there is none.
std::optional<std::string> upTo(std::string_view text, size_t& at, std::string_view marker) {
  const size_t end = text.find(marker, at);
  if (end == std::string_view::npos) return std::nullopt;
  std::string found(text.substr(at, end - at));
  at = end + marker.size();
  return found;
}

// Processes logging at once, entries from 10 bytes to 64 KB: each log holds every entry
// whole, and the failed-exchange log, started again on the way, lost only entries older than
// those it holds (checked after each of several bursts, since it keeps only its last few
// hundred KB). DROQBXML_LOG_ROUNDS sets the entries per process and burst (4; more for a
// long run).
TEST_F(LogsTest, EntriesOfProcessesWritingAtOnceStayWhole) {
  constexpr int kWriters = 8;
  constexpr int kBursts = 8;
  const char* configured = std::getenv("DROQBXML_LOG_ROUNDS");
  const int rounds = configured ? std::atoi(configured) : 4;
  basGlobals::DroPathAccess(Variant(u"C:\\Shared"));
  createFolder(u"C:\\Shared");
  for (int burst = 1; burst <= kBursts; ++burst) {
    const int last = burst * rounds - 1;
    std::vector<pid_t> children;
    for (int writer = 0; writer < kWriters; ++writer) {
      const pid_t child = ::fork();
      ASSERT_GE(child, 0);
      if (child == 0) {
        int failed = 0;
        try {
          for (int seq = last + 1 - rounds; seq <= last; ++seq) {
            appendErrorLog(seq, asciiText("writer" + std::to_string(writer)),
                           fromUtf8(entryText(writer, seq, 1)));
            const Text half = fromUtf8(entryText(writer, seq, 2));
            LogFailedExchange(half, half, kZeroDate, kZeroDate);
          }
        } catch (...) {
          failed = 1;
        }
        ::_exit(failed);
      }
      children.push_back(child);
    }
    for (const pid_t child : children) {
      int status = 0;
      ::waitpid(child, &status, 0);
      EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
    }

    const std::string exchanges = readFile(drive_.path("Shared/Logs/qbXmlErrors/qbXML-Error.txt"));
    std::vector<std::vector<int>> kept(kWriters);
    for (size_t at = 0; at < exchanges.size();) {
      std::optional<std::string> request, response;
      const bool whole = (at == 0 || take(exchanges, at, "\r\n\r\n\r\n\r\n\r\n")) &&
                         take(exchanges, at, "SENDING: ") && upTo(exchanges, at, "\r\n\r\n") &&
                         (request = upTo(exchanges, at, "\r\n\r\n\r\nRECEIVING: ")) &&
                         upTo(exchanges, at, "\trequest response status <> success\r\n\r\n\t") &&
                         (response = upTo(exchanges, at, "\r\n"));
      ASSERT_TRUE(whole) << "failed-exchange log, burst " << burst << ", byte " << at;
      const int writer = std::stoi(*request);
      const int seq = std::stoi(request->substr(request->find('-') + 1));
      ASSERT_TRUE(*request == entryText(writer, seq, 2) && *response == *request)
          << "failed-exchange log, entry " << writer << "-" << seq;
      kept[static_cast<size_t>(writer)].push_back(seq);
    }
    // Each writer's entries since the log last started again, every one of them.
    for (const auto& seqs : kept) {
      for (size_t i = 0; i < seqs.size(); ++i) {
        EXPECT_EQ(seqs[i], last + 1 - static_cast<int>(seqs.size() - i));
      }
    }
  }

  const std::string errors = readFile(drive_.path("Shared/Logs/ErrorLog.txt"));
  std::set<std::pair<std::string, std::string>> seen;
  for (size_t at = 0; at < errors.size();) {
    std::optional<std::string> number, source, description;
    const bool whole =
        take(errors, at, "Error Date: ") && upTo(errors, at, "\r\n") &&
        take(errors, at, "\terror number: ") && (number = upTo(errors, at, "\r\n")) &&
        take(errors, at, "\terror source: ") && (source = upTo(errors, at, "\r\n")) &&
        take(errors, at, "\terror description: \r\n\t") &&
        (description = upTo(errors, at, "\r\n")) && take(errors, at, "\r\n\r\n");
    ASSERT_TRUE(whole) << "error log, byte " << at;
    ASSERT_TRUE(*description == entryText(std::stoi(source->substr(6)), std::stoi(*number), 1))
        << "error log, entry of " << *source << ", " << *number;
    EXPECT_TRUE(seen.emplace(*source, *number).second);
  }
  EXPECT_EQ(seen.size(), static_cast<size_t>(kWriters * kBursts * rounds));
}

}  // namespace
}  // namespace droqbxml

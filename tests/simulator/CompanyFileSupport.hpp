// Helpers for the stand-in's suites: a temporary folder per test, an environment variable set
// for a test, direct SQL on a company file, child processes (for crashes, concurrent writers
// and runs without root's right to write anywhere), xmllint's verdicts against the qbXML
// validator schema, and lines compared with a golden file.
#ifndef DROQBXML_TESTS_SIMULATOR_COMPANYFILESUPPORT_HPP_
#define DROQBXML_TESTS_SIMULATOR_COMPANYFILESUPPORT_HPP_

#include <grp.h>
#include <gtest/gtest.h>
#include <sqlite3.h>
#include <sys/wait.h>
#include <unistd.h>

#include <atomic>
#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <map>
#include <optional>
#include <sstream>
#include <string>
#include <string_view>
#include <system_error>
#include <vector>

#include "tests/TestSupport.hpp"

namespace droqbxml::test {

// A fresh folder under the system's temporary folder, removed with everything in it.
class TemporaryFolder {
 public:
  TemporaryFolder() {
    static std::atomic<int> serial{0};
    const auto* info = ::testing::UnitTest::GetInstance()->current_test_info();
    root_ = std::filesystem::temp_directory_path() /
            ("droqbxml-company-" + std::to_string(::getpid()) + "-" +
             (info ? std::string(info->name()) : "x") + "-" + std::to_string(++serial));
    std::filesystem::remove_all(root_);
    std::filesystem::create_directories(root_);
  }
  ~TemporaryFolder() {
    std::error_code ignored;
    std::filesystem::permissions(root_, std::filesystem::perms::owner_all,
                                 std::filesystem::perm_options::add, ignored);
    std::filesystem::remove_all(root_, ignored);
  }
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;

  const std::filesystem::path& root() const { return root_; }
  std::filesystem::path operator/(const std::string& name) const { return root_ / name; }

 private:
  std::filesystem::path root_;
};

// An environment variable set (or left as it is when `value` is null) for the life of the
// object, then restored.
class ScopedVariable {
 public:
  explicit ScopedVariable(const char* name, const char* value = nullptr) : name_(name) {
    if (const char* old = std::getenv(name)) previous_ = old;
    if (value) set(value);
  }
  ~ScopedVariable() { previous_ ? ::setenv(name_, previous_->c_str(), 1) : ::unsetenv(name_); }
  ScopedVariable(const ScopedVariable&) = delete;
  ScopedVariable& operator=(const ScopedVariable&) = delete;

  void set(const char* value) const { ::setenv(name_, value, 1); }

 private:
  const char* name_;
  std::optional<std::string> previous_;
};

// Runs statements on `db`; a failure fails the test with SQLite's message.
inline void sql(sqlite3* db, const std::string& statements) {
  char* message = nullptr;
  const int result = sqlite3_exec(db, statements.c_str(), nullptr, nullptr, &message);
  EXPECT_EQ(result, SQLITE_OK) << statements << ": " << (message ? message : "");
  sqlite3_free(message);
}

// The first column of the first row of `query` as an integer (-1 when there is no row).
inline int64_t sqlInteger(sqlite3* db, const std::string& query) {
  sqlite3_stmt* statement = nullptr;
  EXPECT_EQ(sqlite3_prepare_v2(db, query.c_str(), -1, &statement, nullptr), SQLITE_OK)
      << query << ": " << sqlite3_errmsg(db);
  const int64_t value =
      sqlite3_step(statement) == SQLITE_ROW ? sqlite3_column_int64(statement, 0) : -1;
  sqlite3_finalize(statement);
  return value;
}

// The first column of the first row of `query` as text.
inline std::string sqlText(sqlite3* db, const std::string& query) {
  sqlite3_stmt* statement = nullptr;
  EXPECT_EQ(sqlite3_prepare_v2(db, query.c_str(), -1, &statement, nullptr), SQLITE_OK)
      << query << ": " << sqlite3_errmsg(db);
  std::string value;
  if (sqlite3_step(statement) == SQLITE_ROW) {
    const auto* text = sqlite3_column_text(statement, 0);
    if (text) value = reinterpret_cast<const char*>(text);
  }
  sqlite3_finalize(statement);
  return value;
}

// Exit code of a child that could not give up root's rights.
inline constexpr int kCannotDropRights = 99;

// Forks a child that runs `body` and leaves with its result through _exit, so that nothing
// of the test program runs twice. Returns the child's process id.
inline pid_t startChild(const std::function<int()>& body) {
  const pid_t child = ::fork();
  if (child == 0) {
    int code = 120;
    try {
      code = body();
    } catch (...) {
      code = 121;
    }
    ::_exit(code);
  }
  return child;
}

// Waits for a child: its exit code, or -1 when a signal ended it.
inline int finishChild(pid_t child) {
  int status = 0;
  if (::waitpid(child, &status, 0) != child) return -2;
  return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

// Runs `body` in a child process as an ordinary user ("nobody" when the tests run as
// root), where file permissions apply; returns its exit code.
inline int runUnprivileged(const std::function<int()>& body) {
  return finishChild(startChild([&] {
    if (::geteuid() == 0) {
      constexpr uid_t kNobody = 65534;
      if (::setgroups(0, nullptr) != 0 || ::setgid(kNobody) != 0 || ::setuid(kNobody) != 0) {
        return kCannotDropRights;
      }
    }
    return body();
  }));
}

// xmllint's verdict on each of `files` (all in one folder), keyed by its name without the
// extension, by one run against the qbXML 13.0 validator schema; its output is left in
// `folder`/xmllint.txt. Nothing when xmllint or the schema is not available.
inline std::optional<std::map<std::string, bool>> xmllintVerdicts(
    const std::vector<std::filesystem::path>& files, const std::filesystem::path& folder) {
  const auto schema = std::filesystem::path(DROQBXML_SHARED_DIR) / "qbxml/xsd/qbxmlops130.xsd";
  if (!std::filesystem::exists(schema) || std::system("xmllint --version >/dev/null 2>&1") != 0) {
    return std::nullopt;
  }
  if (files.empty()) return std::map<std::string, bool>{};
  std::string command = "cd '" + files.front().parent_path().string() +
                        "' && xmllint --noout --schema '" + schema.string() + "'";
  for (const auto& file : files) command += " " + file.filename().string();
  command += " > '" + (folder / "xmllint.txt").string() + "' 2>&1";
  std::system(command.c_str());
  std::map<std::string, bool> verdicts;
  std::istringstream lines(readFile(folder / "xmllint.txt"));
  for (std::string line; std::getline(lines, line);) {
    for (const auto& [ending, valid] :
         {std::pair<std::string_view, bool>{" validates", true}, {" fails to validate", false}}) {
      if (!line.ends_with(ending)) continue;
      verdicts[std::filesystem::path(line.substr(0, line.size() - ending.size())).stem().string()] =
          valid;
    }
  }
  return verdicts;
}

// Compares `lines`, each ended by a line feed, with the golden file
// tests/testdata/simulator/`name`.
inline ::testing::AssertionResult linesMatchGolden(const std::vector<std::string>& lines,
                                                   const std::string& name) {
  std::string text;
  for (const std::string& line : lines) text += line + "\n";
  return matchesGolden(fromUtf8(text), "simulator/" + name);
}

}  // namespace droqbxml::test

#endif  // DROQBXML_TESTS_SIMULATOR_COMPANYFILESUPPORT_HPP_

// The company file: creation, the open checks (missing, not a company file, damaged,
// read-only), settings, counters, integrated applications, the summary, transactions, and
// what a killed process and two writing processes leave in the file.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <csignal>
#include <fstream>
#include <stdexcept>
#include <string>

#include "simulator/CompanyFile.hpp"
#include "tests/TestSupport.hpp"
#include "tests/cli/CliRunner.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator {
namespace {

using Kind = CompanyFileError::Kind;
using test::sql;
using test::sqlInteger;
using test::sqlText;

// The kind of error `body` raises, or nothing.
std::optional<Kind> failure(const std::function<void()>& body) {
  try {
    body();
  } catch (const CompanyFileError& error) {
    return error.kind();
  }
  return std::nullopt;
}
std::optional<Kind> openFailure(const std::filesystem::path& path) {
  return failure([&] { CompanyFile company(path); });
}

// A new company file with a test table, so that rows written by a test can be counted apart
// from the company's; `rows` rows of `bytes` bytes each are put in it.
void createWithProbeTable(const std::filesystem::path& path, int rows = 0, int bytes = 0) {
  CompanyFile::create(path, {});
  CompanyFile company(path);
  sql(company.db(),
      "CREATE TABLE probe_rows (id INTEGER PRIMARY KEY, value INTEGER, payload TEXT);"
      "WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < " +
          std::to_string(rows) + ") INSERT INTO probe_rows (value, payload) SELECT i, printf('%." +
          std::to_string(bytes) + "c', 'x') FROM n WHERE " + std::to_string(rows) + " > 0");
}

TEST(CompanyFileTest, CreateKeepsTheSettingsAndRefusesAnExistingPath) {
  test::TemporaryFolder folder;
  const auto path = folder / "orvanne.qbw";
  CompanyFile::create(path, {"Orvanne Builders", false, {}});
  CompanyFile::create(folder / "taxed.qbw", {"Taxed", true, {}});
  EXPECT_TRUE(CompanyFile(folder / "taxed.qbw").settings().salesTax);
  {
    CompanyFile company(path);
    EXPECT_EQ(company.path(), path);
    EXPECT_EQ(company.settings().companyName, "Orvanne Builders");
    EXPECT_FALSE(company.settings().salesTax);
    EXPECT_EQ(sqlInteger(company.db(), "PRAGMA foreign_keys"), 1);
    EXPECT_EQ(sqlInteger(company.db(), "PRAGMA synchronous"), 2);  // FULL
    EXPECT_EQ(sqlText(company.db(), "PRAGMA journal_mode"), "delete");
  }
  EXPECT_EQ(failure([&] { CompanyFile::create(path, {}); }), Kind::AlreadyExists);
  EXPECT_EQ(CompanyFile(path).settings().companyName, "Orvanne Builders");
  test::writeFile(folder / "notes.txt", "notes");
  EXPECT_EQ(failure([&] { CompanyFile::create(folder / "notes.txt", {}); }), Kind::AlreadyExists);
  EXPECT_EQ(test::readFile(folder / "notes.txt"), "notes");
  EXPECT_EQ(failure([&] { CompanyFile::create(folder / "no-such-folder" / "a.qbw", {}); }),
            Kind::Missing);

  // A half-made file is removed: here a folder where SQLite's journal of the file being built
  // must go makes the creating transaction fail.
  const auto building = folder / (".half.qbw." + std::to_string(::getpid()) + "-0.building");
  std::filesystem::create_directory(building.string() + "-journal");
  EXPECT_THROW(CompanyFile::create(folder / "half.qbw", {}), std::runtime_error);
  EXPECT_FALSE(std::filesystem::exists(folder / "half.qbw"));
  EXPECT_FALSE(std::filesystem::exists(building));
  EXPECT_TRUE(std::filesystem::is_directory(building.string() + "-journal"));
}

// A process killed while it creates a company file (here as soon as the name appears) leaves
// the whole file or none of that name, which can then be created afresh.
TEST(CompanyFileTest, ACreationKilledHalfwayLeavesTheWholeFileOrNone) {
  test::TemporaryFolder folder;
  for (int round = 0; round < 5; ++round) {
    const auto path = folder / ("killed" + std::to_string(round) + ".qbw");
    const pid_t child = test::startChild([&] { return CompanyFile::create(path, {}), 0; });
    bool running = true;
    while (!std::filesystem::exists(path) && (running = ::waitpid(child, nullptr, WNOHANG) == 0)) {
    }
    if (running && ::kill(child, SIGKILL) == 0) test::finishChild(child);
    EXPECT_FALSE(std::filesystem::exists(path) ? openFailure(path)
                                               : failure([&] { CompanyFile::create(path, {}); }));
  }
}

TEST(CompanyFileTest, OpenTellsMissingForeignAndDamagedFilesApart) {
  test::TemporaryFolder folder;
  test::writeFile(folder / "letter.qbw", "Dear customer,\nthis is not a database at all.\n");
  test::writeFile(folder / "empty.qbw", "");
  // Another program's database, even one with a settings table of the same shape.
  sqlite3* other = nullptr;
  ASSERT_EQ(sqlite3_open((folder / "other.db").c_str(), &other), SQLITE_OK);
  sql(other,
      "CREATE TABLE settings (key TEXT PRIMARY KEY, value TEXT);"
      "INSERT INTO settings VALUES ('format', 'DroQbXml company file 1');");
  sqlite3_close(other);
  // A company file whose middle was overwritten.
  const auto damaged = folder / "damaged.qbw";
  createWithProbeTable(damaged, 4000, 200);
  const auto size = std::filesystem::file_size(damaged);
  {
    std::fstream file(damaged, std::ios::in | std::ios::out | std::ios::binary);
    file.seekp(static_cast<std::streamoff>(size / 3));
    const std::string garbage(size / 3, '\xA5');
    file.write(garbage.data(), static_cast<std::streamsize>(garbage.size()));
  }
  ASSERT_EQ(std::filesystem::file_size(damaged), size);

  const std::pair<std::filesystem::path, Kind> cases[] = {
      {folder / "missing.qbw", Kind::Missing},        {folder.root(), Kind::Unreadable},
      {folder / "letter.qbw", Kind::NotACompanyFile}, {folder / "empty.qbw", Kind::NotACompanyFile},
      {folder / "other.db", Kind::NotACompanyFile},   {damaged, Kind::Damaged},
  };
  for (const auto& [path, kind] : cases) EXPECT_EQ(openFailure(path), kind) << path;
}

// A file this user may not change is refused for changes, and read alone it can be shown.
TEST(CompanyFileTest, OpenRefusesAFileThatCannotBeWritten) {
  test::TemporaryFolder folder;
  const auto path = folder / "locked.qbw";
  CompanyFile::create(path, {});
  using std::filesystem::perms;
  constexpr perms kReadable = perms::owner_read | perms::group_read | perms::others_read;
  constexpr perms kListable =
      kReadable | perms::owner_exec | perms::group_exec | perms::others_exec;
  constexpr int kOpens = 100;
  const struct {
    perms folder;
    perms file;
    int expected;
    int shown;
  } cases[] = {
      {perms::all, perms::all, kOpens, cli::kExitSuccess},
      {perms::all, kReadable, static_cast<int>(Kind::ReadOnly), cli::kExitSuccess},
      {kListable, perms::all, static_cast<int>(Kind::ReadOnly), cli::kExitSuccess},
      {perms::all, perms::none, static_cast<int>(Kind::Unreadable), cli::kExitConnection},
  };
  for (const auto& c : cases) {
    std::filesystem::permissions(folder.root(), c.folder);
    std::filesystem::permissions(path, c.file);
    const int result = test::runUnprivileged([&] {
      const auto failed = openFailure(path);
      return failed ? static_cast<int>(*failed) : kOpens;
    });
    if (result == test::kCannotDropRights) GTEST_SKIP() << "cannot run as an ordinary user";
    EXPECT_EQ(result, c.expected);
    EXPECT_EQ(test::runUnprivileged([&] {
                return test::runCli({"company", "show", path.string()}).code;
              }),
              c.shown);
  }
}

TEST(CompanyFileTest, IntegratedApplicationsAndSummary) {
  test::TemporaryFolder folder;
  const auto path = folder / "apps.qbw";
  CompanyFile::create(path, {"Tessaly & Sons", false, {}});
  const std::string counts =
      "Company: Tessaly & Sons\nSales tax: off\nCustomers and jobs: 0\nAccounts: 7\nItems: 0\n"
      "Sales tax codes: 2\nEstimates: 0\nInvoices: 0\n";
  {
    CompanyFile company(path);
    EXPECT_EQ(company.summary(), counts + "Integrated applications: none\n");
    EXPECT_FALSE(company.application("Tessaly").has_value());
    company.setApplication("Tessaly", {});
    company.setApplication("Zeta", {true, false});
    company.setApplication("Alpha", {true, true});
    company.setApplication("Alpha", {false, true});  // changes the entry, adds none
  }
  CompanyFile company(path);
  const auto tessaly = company.application("Tessaly");
  ASSERT_TRUE(tessaly.has_value());
  EXPECT_TRUE(tessaly->allowed && tessaly->autoLogin);
  EXPECT_FALSE(company.application("Alpha")->allowed);
  EXPECT_FALSE(company.application("Zeta")->autoLogin);
  EXPECT_FALSE(company.application("tessaly").has_value());  // names are exact
  const std::string applications =
      "Integrated applications:\n  Alpha: denied\n  Tessaly: allowed, automatic login\n"
      "  Zeta: allowed, no automatic login\n";
  EXPECT_EQ(company.summary(), counts + applications);

  // A kind whose table the file lacks is left out.
  sql(company.db(), "DROP TABLE invoice_lines; DROP TABLE invoices;");
  EXPECT_EQ(company.summary(), counts.substr(0, counts.find("Invoices: 0\n")) + applications);
}

TEST(CompanyFileTest, CountersAndTransactions) {
  test::TemporaryFolder folder;
  const auto path = folder / "counters.qbw";
  createWithProbeTable(path);
  const auto values = [](CompanyFile& company) {
    return sqlText(company.db(),
                   "SELECT group_concat(value) FROM (SELECT value FROM probe_rows ORDER BY value)");
  };
  int64_t first = 0;
  {
    CompanyFile company(path);
    first = company.nextCounter("probe");
    EXPECT_EQ(company.nextCounter("probe"), first + 1);
    EXPECT_EQ(company.nextCounter("other probe"), 1);

    // A failed piece of work leaves nothing behind, counters included, and is rethrown.
    EXPECT_THROW(company.inTransaction([&] {
      company.nextCounter("probe");
      sql(company.db(), "INSERT INTO probe_rows (value) VALUES (10)");
      throw std::logic_error("stop");
    }),
                 std::logic_error);
    EXPECT_EQ(values(company), "");
    EXPECT_EQ(company.nextCounter("probe"), first + 2);

    // Nested work that fails undoes itself only.
    company.inTransaction([&] {
      sql(company.db(), "INSERT INTO probe_rows (value) VALUES (20)");
      EXPECT_THROW(company.inTransaction([&] {
        sql(company.db(), "INSERT INTO probe_rows (value) VALUES (21)");
        throw std::logic_error("inner");
      }),
                   std::logic_error);
      company.inTransaction(
          [&] { sql(company.db(), "INSERT INTO probe_rows (value) VALUES (22)"); });
    });
    EXPECT_EQ(values(company), "20,22");
  }
  EXPECT_EQ(CompanyFile(path).nextCounter("probe"), first + 3);  // kept in the file
}

TEST(CompanyFileTest, AProcessKilledInsideATransactionLeavesNoTrace) {
  test::TemporaryFolder folder;
  const auto path = folder / "crash.qbw";
  createWithProbeTable(path);
  int ready[2];
  ASSERT_EQ(::pipe(ready), 0);
  const pid_t child = test::startChild([&] {
    ::close(ready[0]);
    CompanyFile company(path);
    company.inTransaction([&] {
      // More than SQLite's page cache holds, so that pages reach the file itself.
      sql(company.db(),
          "WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < 20000) "
          "INSERT INTO probe_rows (value, payload) SELECT i, printf('%.300c', 'x') FROM n");
      const char byte = 1;
      if (::write(ready[1], &byte, 1) != 1) ::_exit(3);
      for (;;) ::pause();
    });
    return 4;
  });
  ::close(ready[1]);
  char byte = 0;
  const auto got = ::read(ready[0], &byte, 1);
  ::close(ready[0]);
  ::kill(child, SIGKILL);
  EXPECT_EQ(test::finishChild(child), -1);
  ASSERT_EQ(got, 1) << "the child did not reach the middle of its transaction";
  EXPECT_TRUE(std::filesystem::exists(folder / "crash.qbw-journal"));
  EXPECT_GT(std::filesystem::file_size(path), 1'000'000u);  // unfinished pages reached it

  CompanyFile company(path);
  EXPECT_EQ(sqlText(company.db(), "PRAGMA integrity_check"), "ok");
  EXPECT_EQ(sqlInteger(company.db(), "SELECT count(*) FROM probe_rows"), 0);
  EXPECT_EQ(company.settings().companyName, "My Company");
}

TEST(CompanyFileTest, TwoProcessesWritingAtOnceLoseNothing) {
  test::TemporaryFolder folder;
  const auto path = folder / "shared.qbw";
  createWithProbeTable(path);
  constexpr int kTransactions = 150;
  int start[2];
  ASSERT_EQ(::pipe(start), 0);
  const auto writer = [&](int id) {
    return test::startChild([&, id] {
      ::close(start[1]);
      char byte = 0;
      (void)::read(start[0], &byte, 1);  // both begin when the parent closes the pipe
      CompanyFile company(path);
      for (int i = 0; i < kTransactions; ++i) {
        // Read, then write what was read: only a transaction that holds the write lock
        // from its start keeps the other process from slipping in between.
        company.inTransaction([&] {
          const int64_t value =
              sqlInteger(company.db(), "SELECT coalesce(max(value), 0) + 1 FROM probe_rows");
          sql(company.db(), "INSERT INTO probe_rows (value, payload) VALUES (" +
                                std::to_string(value) + ", 'writer " + std::to_string(id) + "')");
          company.nextCounter("probe");
        });
      }
      return 0;
    });
  };
  const pid_t first = writer(1);
  const pid_t second = writer(2);
  ::close(start[0]);
  ::close(start[1]);
  EXPECT_EQ(test::finishChild(first), 0);
  EXPECT_EQ(test::finishChild(second), 0);

  // Every value once, half of them from each writer.
  CompanyFile company(path);
  EXPECT_EQ(sqlText(company.db(),
                    "SELECT count(*) || ' ' || count(DISTINCT value) || ' ' || max(value) || ' ' "
                    "|| sum(payload = 'writer 2') FROM probe_rows"),
            "300 300 300 150");
  EXPECT_EQ(company.nextCounter("probe"), 2 * kTransactions + 1);
}

}  // namespace
}  // namespace droqbxml::simulator

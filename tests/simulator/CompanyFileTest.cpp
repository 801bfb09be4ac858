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
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator {
namespace {

using Kind = CompanyFileError::Kind;
using test::sql;
using test::sqlInteger;
using test::sqlText;

// The kind of error opening `path` raises, or nothing when it opens.
std::optional<Kind> openFailure(const std::filesystem::path& path) {
  try {
    CompanyFile company(path);
  } catch (const CompanyFileError& error) {
    return error.kind();
  }
  return std::nullopt;
}

std::optional<Kind> createFailure(const std::filesystem::path& path) {
  try {
    CompanyFile::create(path, {});
  } catch (const CompanyFileError& error) {
    return error.kind();
  }
  return std::nullopt;
}

// A test table, so that rows written by a test can be counted apart from the company's.
void addProbeTable(CompanyFile& company) {
  sql(company.db(),
      "CREATE TABLE probe_rows (id INTEGER PRIMARY KEY, value INTEGER, payload TEXT)");
}

TEST(CompanyFileTest, CreateKeepsTheSettingsAndRefusesAnExistingPath) {
  test::TemporaryFolder folder;
  const auto path = folder / "orvanne.qbw";
  CompanyFile::create(path, {"Orvanne Builders", false});
  {
    CompanyFile company(path);
    EXPECT_EQ(company.path(), path);
    EXPECT_EQ(company.settings().companyName, "Orvanne Builders");
    EXPECT_FALSE(company.settings().salesTax);
    EXPECT_EQ(sqlInteger(company.db(), "PRAGMA foreign_keys"), 1);
    EXPECT_EQ(sqlInteger(company.db(), "PRAGMA synchronous"), 2);  // FULL
    EXPECT_EQ(sqlText(company.db(), "PRAGMA journal_mode"), "delete");
  }
  CompanyFile::create(folder / "taxed.qbw", {"Taxed", true});
  EXPECT_TRUE(CompanyFile(folder / "taxed.qbw").settings().salesTax);

  EXPECT_EQ(createFailure(path), Kind::AlreadyExists);
  EXPECT_EQ(CompanyFile(path).settings().companyName, "Orvanne Builders");
  test::writeFile(folder / "notes.txt", "notes");
  EXPECT_EQ(createFailure(folder / "notes.txt"), Kind::AlreadyExists);
  EXPECT_EQ(test::readFile(folder / "notes.txt"), "notes");
  EXPECT_EQ(createFailure(folder / "no-such-folder" / "a.qbw"), Kind::Missing);
}

TEST(CompanyFileTest, CreateRemovesAHalfMadeFile) {
  test::TemporaryFolder folder;
  const auto path = folder / "half.qbw";
  // A folder where SQLite's journal must go makes the creating transaction fail.
  std::filesystem::create_directory(folder / "half.qbw-journal");
  EXPECT_THROW(CompanyFile::create(path, {}), std::runtime_error);
  EXPECT_FALSE(std::filesystem::exists(path));
  EXPECT_TRUE(std::filesystem::is_directory(folder / "half.qbw-journal"));
}

TEST(CompanyFileTest, OpenTellsMissingForeignAndDamagedFilesApart) {
  test::TemporaryFolder folder;
  EXPECT_EQ(openFailure(folder / "missing.qbw"), Kind::Missing);
  EXPECT_EQ(openFailure(folder.root()), Kind::Unreadable);

  test::writeFile(folder / "letter.qbw", "Dear customer,\nthis is not a database at all.\n");
  EXPECT_EQ(openFailure(folder / "letter.qbw"), Kind::NotACompanyFile);
  test::writeFile(folder / "empty.qbw", "");
  EXPECT_EQ(openFailure(folder / "empty.qbw"), Kind::NotACompanyFile);

  // Another program's database, even one with a settings table of the same shape.
  sqlite3* other = nullptr;
  ASSERT_EQ(sqlite3_open((folder / "other.db").c_str(), &other), SQLITE_OK);
  sql(other,
      "CREATE TABLE settings (key TEXT PRIMARY KEY, value TEXT);"
      "INSERT INTO settings VALUES ('format', 'DroQbXml company file 1');");
  sqlite3_close(other);
  EXPECT_EQ(openFailure(folder / "other.db"), Kind::NotACompanyFile);

  // A company file whose middle was overwritten.
  const auto damaged = folder / "damaged.qbw";
  CompanyFile::create(damaged, {});
  {
    CompanyFile company(damaged);
    addProbeTable(company);
    sql(company.db(),
        "WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < 4000)"
        " INSERT INTO probe_rows (value, payload) SELECT i, printf('%.200c', 'x') FROM n");
  }
  const auto size = std::filesystem::file_size(damaged);
  {
    std::fstream file(damaged, std::ios::in | std::ios::out | std::ios::binary);
    file.seekp(static_cast<std::streamoff>(size / 3));
    const std::string garbage(size / 3, '\xA5');
    file.write(garbage.data(), static_cast<std::streamsize>(garbage.size()));
  }
  EXPECT_EQ(std::filesystem::file_size(damaged), size);
  EXPECT_EQ(openFailure(damaged), Kind::Damaged);
}

TEST(CompanyFileTest, OpenRefusesAFileThatCannotBeWritten) {
  test::TemporaryFolder folder;
  const auto path = folder / "locked.qbw";
  CompanyFile::create(path, {});
  using std::filesystem::perms;
  const auto openAsUser = [&] {
    return test::runUnprivileged([&] {
      const auto failure = openFailure(path);
      return failure ? static_cast<int>(*failure) : 100;
    });
  };

  std::filesystem::permissions(folder.root(), perms::all);
  std::filesystem::permissions(path, perms::all);
  const int writable = openAsUser();
  if (writable == test::kCannotDropRights) GTEST_SKIP() << "cannot run as an ordinary user";
  EXPECT_EQ(writable, 100);

  std::filesystem::permissions(path, perms::owner_read | perms::group_read | perms::others_read);
  EXPECT_EQ(openAsUser(), static_cast<int>(Kind::ReadOnly));

  std::filesystem::permissions(path, perms::all);
  std::filesystem::permissions(folder.root(), perms::owner_read | perms::owner_exec |
                                                  perms::group_read | perms::group_exec |
                                                  perms::others_read | perms::others_exec);
  EXPECT_EQ(openAsUser(), static_cast<int>(Kind::ReadOnly));

  std::filesystem::permissions(folder.root(), perms::all);
  std::filesystem::permissions(path, perms::none);
  EXPECT_EQ(openAsUser(), static_cast<int>(Kind::Unreadable));
}

TEST(CompanyFileTest, IntegratedApplicationsAndSummary) {
  test::TemporaryFolder folder;
  const auto path = folder / "apps.qbw";
  CompanyFile::create(path, {"Tessaly & Sons", false});
  {
    CompanyFile company(path);
    EXPECT_NE(company.summary().find("\nIntegrated applications: none\n"), std::string::npos);

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

  // A new company has a chart of accounts and no customers yet.
  const int64_t accounts = sqlInteger(company.db(), "SELECT count(*) FROM accounts");
  EXPECT_GT(accounts, 0);
  const std::string applications =
      "Integrated applications:\n  Alpha: denied\n  Tessaly: allowed, automatic login\n"
      "  Zeta: allowed, no automatic login\n";
  std::string summary = company.summary();
  EXPECT_EQ(summary.rfind("Company: Tessaly & Sons\nSales tax: off\nCustomers and jobs: 0\n"
                          "Accounts: " +
                              std::to_string(accounts) + "\n",
                          0),
            0u)
      << summary;
  EXPECT_NE(summary.find("\nInvoices: 0\n"), std::string::npos) << summary;
  ASSERT_GE(summary.size(), applications.size());
  EXPECT_EQ(summary.substr(summary.size() - applications.size()), applications) << summary;

  // A kind whose table the file lacks is left out.
  sql(company.db(), "DROP TABLE invoice_lines; DROP TABLE invoices;");
  summary = company.summary();
  EXPECT_EQ(summary.find("Invoices"), std::string::npos) << summary;
  EXPECT_NE(summary.find("\nAccounts: "), std::string::npos) << summary;
}

TEST(CompanyFileTest, CountersAndTransactions) {
  test::TemporaryFolder folder;
  const auto path = folder / "counters.qbw";
  CompanyFile::create(path, {});
  int64_t first = 0;
  {
    CompanyFile company(path);
    addProbeTable(company);
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
    EXPECT_EQ(sqlInteger(company.db(), "SELECT count(*) FROM probe_rows"), 0);
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
    EXPECT_EQ(sqlText(company.db(),
                      "SELECT group_concat(value) FROM (SELECT value FROM "
                      "probe_rows ORDER BY value)"),
              "20,22");
  }
  EXPECT_EQ(CompanyFile(path).nextCounter("probe"), first + 3);  // kept in the file
}

TEST(CompanyFileTest, AProcessKilledInsideATransactionLeavesNoTrace) {
  test::TemporaryFolder folder;
  const auto path = folder / "crash.qbw";
  CompanyFile::create(path, {});
  {
    CompanyFile company(path);
    addProbeTable(company);
  }
  int ready[2];
  ASSERT_EQ(::pipe(ready), 0);
  const pid_t child = test::startChild([&] {
    ::close(ready[0]);
    CompanyFile company(path);
    company.inTransaction([&] {
      // More than SQLite's page cache holds, so that pages reach the file itself.
      sql(company.db(),
          "WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n "
          "WHERE i < 20000) INSERT INTO probe_rows (value, payload) "
          "SELECT i, printf('%.300c', 'x') FROM n");
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
  CompanyFile::create(path, {});
  {
    CompanyFile company(path);
    addProbeTable(company);
  }
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

  CompanyFile company(path);
  EXPECT_EQ(sqlInteger(company.db(), "SELECT count(*) FROM probe_rows"), 2 * kTransactions);
  EXPECT_EQ(sqlInteger(company.db(), "SELECT count(DISTINCT value) FROM probe_rows"),
            2 * kTransactions);
  EXPECT_EQ(sqlInteger(company.db(), "SELECT max(value) FROM probe_rows"), 2 * kTransactions);
  EXPECT_EQ(sqlInteger(company.db(), "SELECT count(*) FROM probe_rows WHERE payload = 'writer 2'"),
            kTransactions);
  EXPECT_EQ(company.nextCounter("probe"), 2 * kTransactions + 1);
}

}  // namespace
}  // namespace droqbxml::simulator

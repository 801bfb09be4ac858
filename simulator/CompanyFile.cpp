// The company file on SQLite: the stand-in's own tables (settings, counters, integrated
// applications) beside the lists and transactions the request handlers keep. Opening checks,
// in this order, that the file exists and can be read, is SQLite, carries the company-file
// marker, passes SQLite's quick check of its structure (pages, records, free list; not the
// slower comparison of every index with its table, which costs most of an open on a large
// file), and, unless it is opened for reading alone, can be written.
#include "simulator/CompanyFile.hpp"

#include <fcntl.h>
#include <sqlite3.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <memory>
#include <system_error>
#include <utility>

#include "simulator/RequestHandlers.hpp"

namespace droqbxml::simulator {
namespace {

using Kind = CompanyFileError::Kind;

// Kept in the database header (PRAGMA application_id) and in the settings table, so that no
// other SQLite database is taken for a company file.
constexpr int32_t kApplicationId = 0x44515842;  // "DQXB"
constexpr std::string_view kFormatMarker = "DroQbXml company file";
constexpr int32_t kFormatVersion = 1;
// How long a step waits for another process's transaction on the same file.
constexpr int kBusyTimeoutMilliseconds = 10000;

struct DatabaseCloser {
  void operator()(sqlite3* db) const noexcept { sqlite3_close_v2(db); }
};
using Database = std::unique_ptr<sqlite3, DatabaseCloser>;

std::string describe(const std::filesystem::path& path, std::string_view what) {
  return "company file \"" + path.string() + "\": " + std::string(what);
}

[[noreturn]] void fail(Kind kind, const std::filesystem::path& path, std::string_view what) {
  throw CompanyFileError(kind, describe(path, what));
}

// What a failed SQLite step means for the file: a CompanyFileError for the results that
// say something about the file (locked, damaged, not writable), a runtime_error otherwise.
[[noreturn]] void failSqlite(sqlite3* db, int result, std::string_view step) {
  const char* message = db != nullptr ? sqlite3_errmsg(db) : sqlite3_errstr(result);
  const std::string what = std::string(step) + ": " + message;
  const char* file = db != nullptr ? sqlite3_db_filename(db, "main") : nullptr;
  const std::filesystem::path path = file != nullptr ? file : "";
  switch (result & 0xff) {
    case SQLITE_BUSY:
    case SQLITE_LOCKED:
      fail(Kind::Busy, path, what);
    case SQLITE_CORRUPT:
      fail(Kind::Damaged, path, what);
    case SQLITE_NOTADB:
      fail(Kind::NotACompanyFile, path, what);
    case SQLITE_READONLY:
    case SQLITE_PERM:
    case SQLITE_CANTOPEN:  // the main file is open already: a journal could not be created
      fail(Kind::ReadOnly, path, what);
    default:
      throw std::runtime_error(describe(path, what));
  }
}

void execute(sqlite3* db, const char* sql) {
  const int result = sqlite3_exec(db, sql, nullptr, nullptr, nullptr);
  if (result != SQLITE_OK) failSqlite(db, result, sql);
}

// One prepared statement; text is bound and read as UTF-8.
class Statement {
 public:
  Statement(sqlite3* db, std::string_view sql) : db_(db) {
    const int result =
        sqlite3_prepare_v2(db, sql.data(), static_cast<int>(sql.size()), &statement_, nullptr);
    if (result != SQLITE_OK) failSqlite(db, result, sql);
  }
  ~Statement() { sqlite3_finalize(statement_); }
  Statement(const Statement&) = delete;
  Statement& operator=(const Statement&) = delete;

  Statement& bind(int index, std::string_view text) {
    check(sqlite3_bind_text(statement_, index, text.data(), static_cast<int>(text.size()),
                            SQLITE_TRANSIENT));
    return *this;
  }
  Statement& bind(int index, int64_t value) {
    check(sqlite3_bind_int64(statement_, index, value));
    return *this;
  }
  // Runs to the next row: true when there is one, false when the statement is done.
  bool step() {
    const int result = sqlite3_step(statement_);
    if (result == SQLITE_ROW) return true;
    if (result == SQLITE_DONE) return false;
    failSqlite(db_, result, sqlite3_sql(statement_));
  }
  std::string text(int column) const {
    const auto* bytes = sqlite3_column_text(statement_, column);
    return bytes != nullptr
               ? std::string(reinterpret_cast<const char*>(bytes),
                             static_cast<size_t>(sqlite3_column_bytes(statement_, column)))
               : std::string();
  }
  int64_t integer(int column) const { return sqlite3_column_int64(statement_, column); }

 private:
  void check(int result) const {
    if (result != SQLITE_OK) failSqlite(db_, result, sqlite3_sql(statement_));
  }

  sqlite3* db_;
  sqlite3_stmt* statement_ = nullptr;
};

// Settings are kept as text under these keys.
constexpr std::string_view kFormatKey = "format";
constexpr std::string_view kCompanyNameKey = "company_name";
constexpr std::string_view kSalesTaxKey = "sales_tax";

std::string formatMarker() {
  return std::string(kFormatMarker) + " " + std::to_string(kFormatVersion);
}

void writeOwnTables(sqlite3* db, const CompanySettings& settings) {
  execute(db, ("PRAGMA application_id = " + std::to_string(kApplicationId)).c_str());
  execute(db, ("PRAGMA user_version = " + std::to_string(kFormatVersion)).c_str());
  execute(db,
          "CREATE TABLE settings (key TEXT PRIMARY KEY NOT NULL, value TEXT NOT NULL);"
          "CREATE TABLE counters (name TEXT PRIMARY KEY NOT NULL, value INTEGER NOT NULL);"
          "CREATE TABLE integrated_applications (name TEXT PRIMARY KEY NOT NULL,"
          " allowed INTEGER NOT NULL, auto_login INTEGER NOT NULL);");
  const std::array<std::pair<std::string_view, std::string>, 3> rows{{
      {kFormatKey, formatMarker()},
      {kCompanyNameKey, settings.companyName},
      {kSalesTaxKey, settings.salesTax ? "1" : "0"},
  }};
  for (const auto& [key, value] : rows) {
    Statement(db, "INSERT INTO settings (key, value) VALUES (?, ?)")
        .bind(1, key)
        .bind(2, value)
        .step();
  }
  for (const auto& name : settings.allowedApplications) {
    Statement(db,
              "INSERT OR REPLACE INTO integrated_applications (name, allowed, auto_login) "
              "VALUES (?, 1, 1)")
        .bind(1, name)
        .step();
  }
}

// Settings every connection of the stand-in runs with.
void configure(sqlite3* db) {
  sqlite3_busy_timeout(db, kBusyTimeoutMilliseconds);
  execute(db, "PRAGMA foreign_keys = ON; PRAGMA synchronous = FULL;");
}

// Removes a half-made company file and any journal SQLite left beside it, which a later
// file of the same name would otherwise take for its own.
void removeCompanyFile(const std::filesystem::path& path) noexcept {
  std::error_code ignored;
  std::filesystem::remove(path, ignored);
  for (const char* suffix : {"-journal", "-wal", "-shm"}) {
    const std::filesystem::path side = path.string() + suffix;
    if (std::filesystem::is_regular_file(std::filesystem::symlink_status(side, ignored))) {
      std::filesystem::remove(side, ignored);
    }
  }
}

// Creates an empty file beside `path`, under a name no other process uses
// (".NAME.PID-N.building"), for the company file to be built in; failures name `path`.
std::filesystem::path claimBuildingName(const std::filesystem::path& path) {
  for (int attempt = 0;; ++attempt) {
    const std::filesystem::path building =
        path.parent_path() / ("." + path.filename().string() + "." + std::to_string(::getpid()) +
                              "-" + std::to_string(attempt) + ".building");
    const int descriptor = ::open(building.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
    if (descriptor >= 0) {
      ::close(descriptor);
      return building;
    }
    const int error = errno;
    if (error == EEXIST && attempt < 100) continue;  // left by a process killed while building
    const std::string reason = std::generic_category().message(error);
    if (error == ENOENT || error == ENOTDIR) fail(Kind::Missing, path, reason);
    if (error == EACCES || error == EPERM || error == EROFS) fail(Kind::ReadOnly, path, reason);
    fail(Kind::Unreadable, path, reason);
  }
}

// Whether this process may create files in the folder holding `path` (SQLite's journal).
bool folderWritable(const std::filesystem::path& path) {
  std::filesystem::path folder = path.parent_path();
  if (folder.empty()) folder = ".";
  return ::faccessat(AT_FDCWD, folder.c_str(), W_OK | X_OK, AT_EACCESS) == 0;
}

// The lists and transactions the summary counts, by the tables the request handlers keep
// them in. A file without one of the tables (made before the kind existed) leaves it out.
struct CountedKind {
  std::string_view label;
  std::string_view table;
};
constexpr std::array<CountedKind, 6> kCountedKinds{{
    {"Customers and jobs", "customers"},
    {"Accounts", "accounts"},
    {"Items", "items"},
    {"Sales tax codes", "sales_tax_codes"},
    {"Estimates", "estimates"},
    {"Invoices", "invoices"},
}};

bool hasTable(sqlite3* db, std::string_view table) {
  Statement found(db, "SELECT 1 FROM sqlite_schema WHERE type = 'table' AND name = ?");
  found.bind(1, table);
  return found.step();
}

// Rewinds a kept statement when it goes out of scope, however its use ends.
using Rewind = std::unique_ptr<sqlite3_stmt, int (*)(sqlite3_stmt*)>;

// The statements a company file keeps prepared (CompanyFile::kept_), by their place.
enum Kept : size_t { kBegin, kCommit, kCountOn, kCountFrom, kCounterValue };
constexpr std::array<std::string_view, 5> kKeptSql{{
    "BEGIN IMMEDIATE",
    "COMMIT",
    "UPDATE counters SET value = value + ?2 WHERE name = ?1",
    "INSERT INTO counters (name, value) VALUES (?1, ?2)",
    "SELECT value FROM counters WHERE name = ?1",
}};

// Runs a statement without rows to its end.
void run(sqlite3* db, sqlite3_stmt* statement) {
  const int result = sqlite3_step(statement);
  if (result != SQLITE_DONE) failSqlite(db, result, sqlite3_sql(statement));
}

CompanySettings readSettings(sqlite3* db) {
  CompanySettings settings;
  Statement rows(db, "SELECT key, value FROM settings");
  while (rows.step()) {
    const std::string key = rows.text(0);
    if (key == kCompanyNameKey) settings.companyName = rows.text(1);
    if (key == kSalesTaxKey) settings.salesTax = rows.text(1) == "1";
  }
  return settings;
}

}  // namespace

void CompanyFile::create(const std::filesystem::path& path, const CompanySettings& settings) {
  // The file is built under a name of its own in the same folder and given its name only
  // when whole, by a link that refuses an existing file, even one another process creates at
  // the same moment: a process killed on the way leaves no file of that name.
  std::error_code ignored;
  if (std::filesystem::exists(std::filesystem::symlink_status(path, ignored))) {
    fail(Kind::AlreadyExists, path, "the file exists already");
  }
  const std::filesystem::path building = claimBuildingName(path);
  try {
    {
      sqlite3* raw = nullptr;
      const int opened = sqlite3_open_v2(building.c_str(), &raw, SQLITE_OPEN_READWRITE, nullptr);
      const Database db(raw);
      if (opened != SQLITE_OK) failSqlite(db.get(), opened, "open");
      configure(db.get());
      execute(db.get(), "PRAGMA journal_mode = DELETE");
      execute(db.get(), "BEGIN IMMEDIATE");
      writeOwnTables(db.get(), settings);
      initializeCompanyData(db.get(), settings);
      execute(db.get(), "COMMIT");
    }
    if (::link(building.c_str(), path.c_str()) != 0) {
      const int error = errno;
      if (error == EEXIST) fail(Kind::AlreadyExists, path, "the file exists already");
      fail(Kind::Unreadable, path, std::generic_category().message(error));
    }
  } catch (...) {
    removeCompanyFile(building);
    throw;
  }
  removeCompanyFile(building);
}

CompanyFile::CompanyFile(const std::filesystem::path& path, Mode mode) : path_(path) {
  std::error_code error;
  const auto status = std::filesystem::status(path, error);
  if (status.type() == std::filesystem::file_type::not_found) {
    fail(Kind::Missing, path, "no such file");
  }
  if (error) fail(Kind::Unreadable, path, error.message());
  if (!std::filesystem::is_regular_file(status)) fail(Kind::Unreadable, path, "not a file");

  sqlite3* raw = nullptr;
  const int opened = sqlite3_open_v2(
      path.c_str(), &raw, mode == Mode::ReadOnly ? SQLITE_OPEN_READONLY : SQLITE_OPEN_READWRITE,
      nullptr);
  Database db(raw);
  if (opened != SQLITE_OK) {
    if ((opened & 0xff) == SQLITE_CANTOPEN) fail(Kind::Unreadable, path, sqlite3_errmsg(raw));
    failSqlite(db.get(), opened, "open");
  }
  sqlite3_busy_timeout(db.get(), kBusyTimeoutMilliseconds);

  {
    // The first read of the header: a file that is not SQLite fails here.
    Statement marker(db.get(), "PRAGMA application_id");
    if (!marker.step() || marker.integer(0) != kApplicationId) {
      fail(Kind::NotACompanyFile, path, "not a company file");
    }
  }
  try {
    Statement format(db.get(), "SELECT value FROM settings WHERE key = ?");
    format.bind(1, kFormatKey);
    if (!format.step() || format.text(0) != formatMarker()) {
      fail(Kind::NotACompanyFile, path, "not a company file of this format");
    }
  } catch (const CompanyFileError&) {
    throw;
  } catch (const std::runtime_error&) {  // the settings table is not there
    fail(Kind::NotACompanyFile, path, "not a company file");
  }
  {
    Statement integrity(db.get(), "PRAGMA quick_check(10)");
    std::string findings;
    while (integrity.step()) {
      const std::string line = integrity.text(0);
      if (line != "ok") findings += (findings.empty() ? "" : "; ") + line;
    }
    if (!findings.empty()) fail(Kind::Damaged, path, findings);
  }
  if (mode == Mode::ReadWrite) {
    if (sqlite3_db_readonly(db.get(), "main") != 0) {
      fail(Kind::ReadOnly, path, "the file cannot be written");
    }
    if (!folderWritable(path)) fail(Kind::ReadOnly, path, "its folder cannot be written");
  }

  configure(db.get());
  settings_ = readSettings(db.get());
  db_ = db.release();
}

CompanyFile::~CompanyFile() {
  for (sqlite3_stmt* statement : kept_) sqlite3_finalize(statement);
  sqlite3_close_v2(db_);
}

sqlite3_stmt* CompanyFile::kept(size_t which) {
  static_assert(std::tuple_size_v<decltype(kept_)> == kKeptSql.size());
  sqlite3_stmt*& slot = kept_[which];
  if (slot == nullptr) {
    const std::string_view sql = kKeptSql[which];
    const int prepared = sqlite3_prepare_v3(db_, sql.data(), static_cast<int>(sql.size()),
                                            SQLITE_PREPARE_PERSISTENT, &slot, nullptr);
    if (prepared != SQLITE_OK) failSqlite(db_, prepared, sql);
  }
  return slot;
}

void CompanyFile::inTransaction(const std::function<void()>& work) {
  // Inside a transaction already: a savepoint, so that the inner work alone is undone.
  const bool nested = sqlite3_get_autocommit(db_) == 0;
  if (nested) {
    execute(db_, "SAVEPOINT inner_work");
  } else {
    run(db_, Rewind(kept(kBegin), sqlite3_reset).get());
  }
  try {
    work();
    if (nested) {
      execute(db_, "RELEASE inner_work");
    } else {
      run(db_, Rewind(kept(kCommit), sqlite3_reset).get());
    }
  } catch (...) {
    // SQLite may have rolled back on its own (a full disk, an I/O error).
    if (sqlite3_get_autocommit(db_) == 0) {
      sqlite3_exec(db_, nested ? "ROLLBACK TO inner_work; RELEASE inner_work" : "ROLLBACK", nullptr,
                   nullptr, nullptr);
    }
    throw;
  }
}

int64_t CompanyFile::nextCounter(std::string_view counter, int64_t count) {
  // Each statement rewound however its use ends, so that none holds anything between calls.
  const auto bound = [&](Kept which) {
    Rewind statement(kept(which), sqlite3_reset);
    sqlite3_bind_text(statement.get(), 1, counter.data(), static_cast<int>(counter.size()),
                      SQLITE_TRANSIENT);
    if (sqlite3_bind_parameter_count(statement.get()) > 1) {
      sqlite3_bind_int64(statement.get(), 2, count);
    }
    return statement;
  };
  // Counted on, or started when the file has no such counter yet.
  run(db_, bound(kCountOn).get());
  if (sqlite3_changes(db_) == 0) run(db_, bound(kCountFrom).get());
  const Rewind value = bound(kCounterValue);
  const int result = sqlite3_step(value.get());
  if (result == SQLITE_DONE) failSqlite(db_, SQLITE_ERROR, "nextCounter");
  if (result != SQLITE_ROW) failSqlite(db_, result, kKeptSql[kCounterValue]);
  return sqlite3_column_int64(value.get(), 0) - count + 1;
}

std::optional<ApplicationAccess> CompanyFile::application(std::string_view appName) const {
  Statement row(db_, "SELECT allowed, auto_login FROM integrated_applications WHERE name = ?");
  row.bind(1, appName);
  if (!row.step()) return std::nullopt;
  return ApplicationAccess{row.integer(0) != 0, row.integer(1) != 0};
}

void CompanyFile::setApplication(std::string_view appName, const ApplicationAccess& access) {
  inTransaction([&] {
    Statement(db_,
              "INSERT INTO integrated_applications (name, allowed, auto_login) VALUES (?, ?, ?) "
              "ON CONFLICT (name) DO UPDATE SET allowed = excluded.allowed, "
              "auto_login = excluded.auto_login")
        .bind(1, appName)
        .bind(2, int64_t{access.allowed})
        .bind(3, int64_t{access.autoLogin})
        .step();
  });
}

std::string CompanyFile::summary() const {
  const CompanySettings current = settings();
  std::string text = "Company: " + current.companyName + "\n";
  text += std::string("Sales tax: ") + (current.salesTax ? "on" : "off") + "\n";
  for (const auto& kind : kCountedKinds) {
    if (!hasTable(db_, kind.table)) continue;
    Statement count(db_, "SELECT count(*) FROM " + std::string(kind.table));
    text +=
        std::string(kind.label) + ": " + std::to_string(count.step() ? count.integer(0) : 0) + "\n";
  }
  text += "Integrated applications:";
  Statement applications(
      db_, "SELECT name, allowed, auto_login FROM integrated_applications ORDER BY name");
  bool any = false;
  while (applications.step()) {
    any = true;
    text += "\n  " + applications.text(0) + ": " +
            (applications.integer(1) == 0   ? "denied"
             : applications.integer(2) == 0 ? "allowed, no automatic login"
                                            : "allowed, automatic login");
  }
  text += any ? "\n" : " none\n";
  return text;
}

}  // namespace droqbxml::simulator

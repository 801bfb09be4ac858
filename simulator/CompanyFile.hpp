// A company file of the stand-in: one SQLite database holding a QuickBooks company's lists,
// transactions, settings and integrated-application list. Every change happens inside one
// SQLite transaction, so a request lands whole or not at all, a process killed mid-request
// leaves the file consistent, and two processes on one file do not corrupt it.
#ifndef DROQBXML_SIMULATOR_COMPANYFILE_HPP_
#define DROQBXML_SIMULATOR_COMPANYFILE_HPP_

#include <array>
#include <cstdint>
#include <filesystem>
#include <functional>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

struct sqlite3;
struct sqlite3_stmt;

namespace droqbxml::simulator {

struct CompanySettings {
  std::string companyName = "My Company";
  bool salesTax = true;
  // Applications the new file lets in, logging in automatically. Any other application is
  // refused until the file allows it: nobody is at the keyboard to approve it.
  std::vector<std::string> allowedApplications;
};

struct ApplicationAccess {
  bool allowed = true;
  bool autoLogin = true;
};

// Why a company file could not be created, opened or written. Unreadable: the path exists
// but cannot be read (a folder, no read permission). Busy: another process held the file
// for longer than the wait allowed.
class CompanyFileError : public std::runtime_error {
 public:
  enum class Kind { Missing, NotACompanyFile, Damaged, ReadOnly, Busy, AlreadyExists, Unreadable };
  CompanyFileError(Kind kind, const std::string& what) : std::runtime_error(what), kind_(kind) {}
  Kind kind() const noexcept { return kind_; }

 private:
  Kind kind_;
};

class CompanyFile {
 public:
  // Creates a new company file with what a new QuickBooks company holds, all in one
  // transaction, built under another name in the same folder and given its name when whole:
  // the file exists whole or not at all, also when the process is killed on the way. Refuses
  // a path that exists (AlreadyExists), a missing folder (Missing) and a folder that cannot
  // be written (ReadOnly); after any later failure the half-made file is removed and the
  // failure rethrown.
  static void create(const std::filesystem::path& path, const CompanySettings& settings);

  // What an open is for: changes (sessions, company allow and deny), or reading alone
  // (company show).
  enum class Mode { ReadWrite, ReadOnly };

  // Opens an existing company file. Throws CompanyFileError: Missing, Unreadable,
  // NotACompanyFile (not SQLite, or SQLite without the company-file marker), Damaged (SQLite's
  // quick check fails), ReadOnly (the file or its folder cannot be written: the stand-in
  // must refuse at session begin what it could not change later; never for Mode::ReadOnly,
  // which opens a file that cannot be written and refuses every change), Busy.
  explicit CompanyFile(const std::filesystem::path& path, Mode mode = Mode::ReadWrite);
  ~CompanyFile();
  CompanyFile(const CompanyFile&) = delete;
  CompanyFile& operator=(const CompanyFile&) = delete;

  const std::filesystem::path& path() const noexcept { return path_; }
  sqlite3* db() const noexcept { return db_; }
  // The company's name and sales tax setting, as the file was created with them (read when it
  // was opened: nothing changes them).
  CompanySettings settings() const { return settings_; }

  // Runs `work` inside one write transaction (BEGIN IMMEDIATE ... COMMIT, waiting up to 10 s
  // for another process's transaction to end); rolls back and rethrows when `work` throws.
  // Called inside a transaction, it runs `work` in a savepoint that alone is undone on
  // failure. SQLite failures are CompanyFileErrors (Busy, Damaged, ReadOnly) or
  // std::runtime_errors.
  void inTransaction(const std::function<void()>& work);

  // The next value of a named counter kept in the file (1, 2, ...), for list and
  // transaction identifiers and numbers; with `count`, the first of that many consecutive
  // values, all taken. Call it inside a transaction.
  int64_t nextCounter(std::string_view counter, int64_t count = 1);

  // The integrated-application list, by exact application name: nothing for an application
  // the file has not seen. setApplication adds or changes an entry in its own transaction.
  std::optional<ApplicationAccess> application(std::string_view appName) const;
  void setApplication(std::string_view appName, const ApplicationAccess& access);

  // A few lines describing the file: company name, sales tax, the number of rows of every
  // list and transaction table, integrated applications.
  std::string summary() const;

 private:
  // The statement kept in kept_[which], prepared when first used.
  sqlite3_stmt* kept(size_t which);

  std::filesystem::path path_;
  sqlite3* db_ = nullptr;
  CompanySettings settings_;
  std::array<sqlite3_stmt*, 5> kept_{};  // a transaction's and nextCounter's statements
};

}  // namespace droqbxml::simulator

#endif  // DROQBXML_SIMULATOR_COMPANYFILE_HPP_

// The lists and transactions of a company file in SQLite: one table per list (customers and
// jobs, accounts, items of every kind, sales tax codes), one per transaction kind and one for
// each kind's lines. Columns hold what queries select and sort on; everything else of a record
// is one blob of encoded fields. A Store lives for one answered document and keeps the identities
// of the list entries it has looked up; its prepared statements may outlive it.
#ifndef DROQBXML_SIMULATOR_HANDLERS_STORE_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_STORE_HPP_

#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "simulator/handlers/Fields.hpp"

struct sqlite3;
struct sqlite3_stmt;

namespace droqbxml::simulator::handlers {

// One prepared statement. Failures raise CompanyFileError for what says something about the
// file (damaged, read-only, busy) and std::runtime_error otherwise.
class Statement {
 public:
  // Prepared as a statement that is kept and used again and again.
  Statement(sqlite3* db, std::string_view sql);
  ~Statement();
  Statement(const Statement&) = delete;
  Statement& operator=(const Statement&) = delete;

  // Clears the bindings and rewinds; returns *this for binding.
  Statement& reset();
  Statement& bind(int index, int64_t value);
  Statement& bind(int index, std::string_view text);
  Statement& bind(int index, const std::optional<int64_t>& value);
  Statement& bindBlob(int index, std::string_view bytes);
  // Runs to the next row: true when there is one, false when the statement is done.
  bool step();

  bool isNull(int column) const;
  int64_t integer(int column) const;
  std::string text(int column) const;
  std::string_view blob(int column) const;

 private:
  void check(int result) const;

  sqlite3* db_;
  sqlite3_stmt* statement_ = nullptr;
};

// Prepared statements by their SQL text, each prepared once and rewound for every use. A session
// keeps one for the life of its connection, so that its requests do not prepare the same statements
// again.
class StatementCache {
 public:
  explicit StatementCache(sqlite3* db);
  ~StatementCache();
  StatementCache(const StatementCache&) = delete;
  StatementCache& operator=(const StatementCache&) = delete;

  sqlite3* db() const noexcept { return db_; }
  // The statement for `sql`, rewound with its bindings cleared.
  Statement& statement(const std::string& sql);
  // Rewinds every statement, so that none holds the file between requests.
  void resetAll();

 private:
  sqlite3* db_;
  std::unordered_map<std::string, std::unique_ptr<Statement>> statements_;
};

// Creates the tables and indexes of lists and transactions.
void createTables(sqlite3* db);

// A list entry: its ListID number (the row), kind (the item kind or the account type's rank,
// 0 in the other lists), place in the hierarchy, times and fields.
struct ListRecord {
  int64_t id = 0;
  int kind = 0;
  std::string fullName;
  std::optional<int64_t> parent;
  int sublevel = 0;
  bool active = true;
  int64_t created = 0;
  int64_t modified = 0;
  int64_t openingBalance = 0;  // in hundred-thousandths, customers and accounts only
  std::vector<Field> fields;
};

struct ListIdentity {
  std::string listId;
  std::string fullName;
};

// The transaction kinds a company file keeps.
enum class TxnTable : uint8_t { Estimates = 1, Invoices = 2 };

enum class LineKind : uint8_t { Line = 0, Group = 1, GroupMember = 2 };

struct TxnLine {
  int64_t id = 0;  // the TxnLineID number
  LineKind kind = LineKind::Line;
  std::vector<Field> fields;
};

struct TxnRecord {
  int64_t id = 0;  // the TxnID number
  int64_t number = 0;
  int64_t customer = 0;
  std::string refNumber;
  std::string txnDate;
  int64_t created = 0;
  int64_t modified = 0;
  int64_t subtotal = 0;  // these three in hundred-thousandths, whole cents
  int64_t salesTax = 0;
  int64_t balance = 0;
  std::optional<int64_t> arAccount;
  std::vector<Field> fields;
  std::vector<TxnLine> lines;
};

// "80000001-1234567890" and "1A-1234567890".
std::string listIdText(int64_t id, int64_t created);
std::string txnIdText(int64_t id, int64_t created);
// The row number a ListID or TxnID text stands for, and the creation time it carries.
std::optional<std::pair<int64_t, int64_t>> parseListId(std::string_view text);
std::optional<std::pair<int64_t, int64_t>> parseTxnId(std::string_view text);

class Store {
 public:
  // A store on `db` using the statements of `kept` (made for `db`, outliving the store), or
  // without them statements of its own, prepared as they are first used. Leaving, it rewinds
  // every statement it used.
  explicit Store(sqlite3* db, StatementCache* kept = nullptr);
  ~Store();
  Store(const Store&) = delete;
  Store& operator=(const Store&) = delete;

  sqlite3* db() const noexcept { return statements_.db(); }
  // The statement for `sql`, prepared on first use and reset for this one.
  Statement& statement(const std::string& sql);
  // After a request: rewinds every statement, so that none holds the file, and forgets the
  // entries read (another process may change them before the next request).
  void endRequest();

  static std::string_view tableName(ListTable table);
  static std::string_view tableName(TxnTable table);
  static std::string_view lineTableName(TxnTable table);

  // The columns to select for listRecord(), in its order.
  static constexpr std::string_view kListColumns =
      "id, kind, full_name, parent, sublevel, is_active, created, modified, opening_balance, "
      "fields";
  // The record of the current row of a statement that selected kListColumns first, its fields
  // with room for the kRetRoom that a Ret aggregate adds to them.
  static ListRecord listRecord(const Statement& row);
  static constexpr size_t kRetRoom = 14;

  // The entry, read from the file once per request (until the request changes it).
  std::optional<ListRecord> list(ListTable table, int64_t id);
  // Adds the entry under the next ListID number, which it sets in `record` and returns.
  int64_t insertList(ListTable table, ListRecord& record);
  // Replaces the fields of an entry (its times and EditSequence stay).
  void updateFields(ListTable table, int64_t id, const std::vector<Field>& fields);
  std::optional<int64_t> findByListId(ListTable table, std::string_view listId);
  std::optional<int64_t> findByFullName(ListTable table, std::string_view fullName);
  // The ListID and FullName of an entry, looked up once per Store.
  const ListIdentity& identity(ListTable table, int64_t id);
  // Drops what was looked up, after a request whose changes were rolled back.
  void forgetLookups();

  static constexpr std::string_view kTxnColumns =
      "id, txn_number, customer, ref_number, txn_date, created, modified, subtotal, sales_tax, "
      "balance, ar_account, fields";
  static TxnRecord txnRecord(const Statement& row);
  void insertTxn(TxnTable table, const TxnRecord& record);
  std::optional<int64_t> findByTxnId(TxnTable table, std::string_view txnId);
  // Fills `record.lines` from the table of lines.
  void loadLines(TxnTable table, TxnRecord& record);

 private:
  std::unique_ptr<StatementCache> own_;
  StatementCache& statements_;
  std::map<std::pair<ListTable, int64_t>, ListIdentity> identities_;
  std::map<std::pair<ListTable, int64_t>, std::optional<ListRecord>> entries_;  // this request's
};

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_STORE_HPP_

// SQLite statements, the tables of lists and transactions, and identifiers. Money columns
// hold whole cents; ListID and TxnID numbers are the rows' own keys, so the identifiers cost
// nothing to keep.
#include "simulator/handlers/Store.hpp"

#include <sqlite3.h>

#include <algorithm>
#include <charconv>
#include <stdexcept>

#include "simulator/CompanyFile.hpp"
#include "simulator/handlers/Values.hpp"

namespace droqbxml::simulator::handlers {
namespace {

[[noreturn]] void failSqlite(sqlite3* db, int result) {
  const std::string what = std::string("company file: ") + sqlite3_errmsg(db);
  switch (result & 0xff) {
    case SQLITE_BUSY:
    case SQLITE_LOCKED:
      throw CompanyFileError(CompanyFileError::Kind::Busy, what);
    case SQLITE_CORRUPT:
    case SQLITE_NOTADB:
      throw CompanyFileError(CompanyFileError::Kind::Damaged, what);
    case SQLITE_READONLY:
      throw CompanyFileError(CompanyFileError::Kind::ReadOnly, what);
    default:
      throw std::runtime_error(what);
  }
}

void execute(sqlite3* db, const std::string& sql) {
  const int result = sqlite3_exec(db, sql.c_str(), nullptr, nullptr, nullptr);
  if (result != SQLITE_OK) failSqlite(db, result);
}

std::optional<int64_t> centsOrNull(int64_t value) {
  return value == 0 ? std::nullopt : std::optional<int64_t>(value / kCent);
}

std::optional<std::pair<int64_t, int64_t>> parseIdentifier(std::string_view text) {
  const size_t dash = text.find('-');
  if (dash == std::string_view::npos || dash == 0 || dash > 16 || dash + 1 == text.size() ||
      text.size() - dash - 1 > 18) {
    return std::nullopt;
  }
  int64_t number = 0;
  for (const char c : text.substr(0, dash)) {
    int digit = 0;
    if (c >= '0' && c <= '9') {
      digit = c - '0';
    } else if (c >= 'A' && c <= 'F') {
      digit = c - 'A' + 10;
    } else if (c >= 'a' && c <= 'f') {
      digit = c - 'a' + 10;
    } else {
      return std::nullopt;
    }
    if (number > (INT64_MAX >> 4)) return std::nullopt;
    number = number * 16 + digit;
  }
  int64_t created = 0;
  for (const char c : text.substr(dash + 1)) {
    if (c < '0' || c > '9') return std::nullopt;
    created = created * 10 + (c - '0');
  }
  return std::make_pair(number, created);
}

constexpr int64_t kListIdBase = 0x80000000;

}  // namespace

Statement::Statement(sqlite3* db, std::string_view sql) : db_(db) {
  const int result = sqlite3_prepare_v3(db, sql.data(), static_cast<int>(sql.size()),
                                        SQLITE_PREPARE_PERSISTENT, &statement_, nullptr);
  if (result != SQLITE_OK) failSqlite(db, result);
}

Statement::~Statement() { sqlite3_finalize(statement_); }

Statement& Statement::reset() {
  sqlite3_reset(statement_);
  sqlite3_clear_bindings(statement_);
  return *this;
}

Statement& Statement::bind(int index, int64_t value) {
  check(sqlite3_bind_int64(statement_, index, value));
  return *this;
}

Statement& Statement::bind(int index, std::string_view text) {
  check(sqlite3_bind_text(statement_, index, text.data(), static_cast<int>(text.size()),
                          SQLITE_TRANSIENT));
  return *this;
}

Statement& Statement::bind(int index, const std::optional<int64_t>& value) {
  check(value ? sqlite3_bind_int64(statement_, index, *value)
              : sqlite3_bind_null(statement_, index));
  return *this;
}

Statement& Statement::bindBlob(int index, std::string_view bytes) {
  check(sqlite3_bind_blob(statement_, index, bytes.data(), static_cast<int>(bytes.size()),
                          SQLITE_TRANSIENT));
  return *this;
}

bool Statement::step() {
  const int result = sqlite3_step(statement_);
  if (result == SQLITE_ROW) return true;
  if (result == SQLITE_DONE) return false;
  failSqlite(db_, result);
}

bool Statement::isNull(int column) const {
  return sqlite3_column_type(statement_, column) == SQLITE_NULL;
}

int64_t Statement::integer(int column) const { return sqlite3_column_int64(statement_, column); }

std::string Statement::text(int column) const {
  const auto* bytes = sqlite3_column_text(statement_, column);
  return bytes == nullptr
             ? std::string()
             : std::string(reinterpret_cast<const char*>(bytes),
                           static_cast<size_t>(sqlite3_column_bytes(statement_, column)));
}

std::string_view Statement::blob(int column) const {
  const void* bytes = sqlite3_column_blob(statement_, column);
  return bytes == nullptr
             ? std::string_view()
             : std::string_view(static_cast<const char*>(bytes),
                                static_cast<size_t>(sqlite3_column_bytes(statement_, column)));
}

void Statement::check(int result) const {
  if (result != SQLITE_OK) failSqlite(db_, result);
}

void createTables(sqlite3* db) {
  for (const ListTable table :
       {ListTable::Customers, ListTable::Accounts, ListTable::Items, ListTable::SalesTaxCodes}) {
    const std::string name(Store::tableName(table));
    execute(db, "CREATE TABLE " + name +
                    " (id INTEGER PRIMARY KEY, kind INTEGER NOT NULL,"
                    " full_name TEXT NOT NULL COLLATE NOCASE,"
                    " parent INTEGER REFERENCES " +
                    name +
                    " (id),"
                    " sublevel INTEGER NOT NULL, is_active INTEGER NOT NULL,"
                    " created INTEGER NOT NULL, modified INTEGER NOT NULL,"
                    " opening_balance INTEGER, fields BLOB NOT NULL);"
                    "CREATE UNIQUE INDEX " +
                    name + "_full_name ON " + name + " (full_name);");
  }
  for (const TxnTable table : {TxnTable::Estimates, TxnTable::Invoices}) {
    const std::string name(Store::tableName(table));
    const std::string lines(Store::lineTableName(table));
    execute(db, "CREATE TABLE " + name +
                    " (id INTEGER PRIMARY KEY, txn_number INTEGER NOT NULL,"
                    " customer INTEGER NOT NULL REFERENCES customers (id),"
                    " ref_number TEXT COLLATE NOCASE, txn_date TEXT NOT NULL,"
                    " created INTEGER NOT NULL, modified INTEGER NOT NULL,"
                    " subtotal INTEGER, sales_tax INTEGER, balance INTEGER,"
                    " ar_account INTEGER REFERENCES accounts (id), fields BLOB NOT NULL);"
                    "CREATE INDEX " +
                    name + "_modified ON " + name +
                    " (modified);"
                    "CREATE INDEX " +
                    name + "_ref_number ON " + name +
                    " (ref_number);"
                    "CREATE INDEX " +
                    name + "_customer ON " + name +
                    " (customer);"
                    "CREATE TABLE " +
                    lines + " (txn INTEGER NOT NULL REFERENCES " + name +
                    " (id), id INTEGER NOT NULL, kind INTEGER NOT NULL, fields BLOB NOT NULL,"
                    " PRIMARY KEY (txn, id)) WITHOUT ROWID;");
  }
}

std::string txnIdText(int64_t id, int64_t created) {
  // "%llX-%lld", written without the formatting machinery: a query writes one per record.
  char text[48];
  char* end = std::to_chars(text, text + 20, static_cast<unsigned long long>(id), 16).ptr;
  std::transform(text, end, text, [](char c) { return c >= 'a' ? static_cast<char>(c - 32) : c; });
  *end++ = '-';
  end = std::to_chars(end, text + sizeof text, static_cast<long long>(created)).ptr;
  return std::string(text, end);
}

std::string listIdText(int64_t id, int64_t created) { return txnIdText(kListIdBase + id, created); }

std::optional<std::pair<int64_t, int64_t>> parseListId(std::string_view text) {
  auto parsed = parseIdentifier(text);
  if (!parsed || parsed->first <= kListIdBase) return std::nullopt;
  parsed->first -= kListIdBase;
  return parsed;
}

std::optional<std::pair<int64_t, int64_t>> parseTxnId(std::string_view text) {
  return parseIdentifier(text);
}

StatementCache::StatementCache(sqlite3* db) : db_(db) {}

StatementCache::~StatementCache() = default;

Statement& StatementCache::statement(const std::string& sql) {
  auto found = statements_.find(sql);
  // Kept only once prepared: SQL that fails to prepare leaves no entry behind.
  if (found == statements_.end()) {
    found = statements_.emplace(sql, std::make_unique<Statement>(db_, sql)).first;
  }
  return found->second->reset();
}

void StatementCache::resetAll() {
  for (auto& [sql, statement] : statements_) statement->reset();
}

Store::Store(sqlite3* db, StatementCache* kept)
    : own_(kept != nullptr ? nullptr : std::make_unique<StatementCache>(db)),
      statements_(kept != nullptr ? *kept : *own_) {}

Store::~Store() { statements_.resetAll(); }

Statement& Store::statement(const std::string& sql) { return statements_.statement(sql); }

void Store::endRequest() {
  statements_.resetAll();
  entries_.clear();
}

std::string_view Store::tableName(ListTable table) {
  switch (table) {
    case ListTable::Customers:
      return "customers";
    case ListTable::Accounts:
      return "accounts";
    case ListTable::Items:
      return "items";
    case ListTable::SalesTaxCodes:
      return "sales_tax_codes";
  }
  throw std::logic_error("unknown list table");
}

std::string_view Store::tableName(TxnTable table) {
  return table == TxnTable::Estimates ? "estimates" : "invoices";
}

std::string_view Store::lineTableName(TxnTable table) {
  return table == TxnTable::Estimates ? "estimate_lines" : "invoice_lines";
}

ListRecord Store::listRecord(const Statement& row) {
  ListRecord record;
  record.id = row.integer(0);
  record.kind = static_cast<int>(row.integer(1));
  record.fullName = row.text(2);
  if (!row.isNull(3)) record.parent = row.integer(3);
  record.sublevel = static_cast<int>(row.integer(4));
  record.active = row.integer(5) != 0;
  record.created = row.integer(6);
  record.modified = row.integer(7);
  record.openingBalance = row.integer(8) * kCent;
  record.fields = decodeFields(row.blob(9), kRetRoom);
  return record;
}

std::optional<ListRecord> Store::list(ListTable table, int64_t id) {
  const auto key = std::make_pair(table, id);
  const auto found = entries_.find(key);
  if (found != entries_.end()) return found->second;
  Statement& row = statement("SELECT " + std::string(kListColumns) + " FROM " +
                             std::string(tableName(table)) + " WHERE id = ?");
  row.bind(1, id);
  std::optional<ListRecord> record;
  if (row.step()) record = listRecord(row);
  return entries_.emplace(key, std::move(record)).first->second;
}

int64_t Store::insertList(ListTable table, ListRecord& record) {
  Statement& insert = statement(
      "INSERT INTO " + std::string(tableName(table)) +
      " (kind, full_name, parent, sublevel, is_active, created, modified, opening_balance,"
      " fields) VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?)");
  insert.bind(1, int64_t{record.kind})
      .bind(2, record.fullName)
      .bind(3, record.parent)
      .bind(4, int64_t{record.sublevel})
      .bind(5, int64_t{record.active})
      .bind(6, record.created)
      .bind(7, record.modified)
      .bind(8, centsOrNull(record.openingBalance))
      .bindBlob(9, encodeFields(record.fields));
  insert.step();
  record.id = sqlite3_last_insert_rowid(db());
  entries_.erase(std::make_pair(table, record.id));
  return record.id;
}

void Store::updateFields(ListTable table, int64_t id, const std::vector<Field>& fields) {
  Statement& update =
      statement("UPDATE " + std::string(tableName(table)) + " SET fields = ? WHERE id = ?");
  update.bindBlob(1, encodeFields(fields)).bind(2, id);
  update.step();
  entries_.erase(std::make_pair(table, id));
}

std::optional<int64_t> Store::findByListId(ListTable table, std::string_view listId) {
  const auto parsed = parseListId(listId);
  if (!parsed) return std::nullopt;
  Statement& row = statement("SELECT id FROM " + std::string(tableName(table)) +
                             " WHERE id = ? AND created = ?");
  row.bind(1, parsed->first).bind(2, parsed->second);
  if (!row.step()) return std::nullopt;
  return row.integer(0);
}

std::optional<int64_t> Store::findByFullName(ListTable table, std::string_view fullName) {
  Statement& row =
      statement("SELECT id FROM " + std::string(tableName(table)) + " WHERE full_name = ?");
  row.bind(1, fullName);
  if (!row.step()) return std::nullopt;
  return row.integer(0);
}

const ListIdentity& Store::identity(ListTable table, int64_t id) {
  const auto key = std::make_pair(table, id);
  const auto found = identities_.find(key);
  if (found != identities_.end()) return found->second;
  Statement& row = statement("SELECT created, full_name FROM " + std::string(tableName(table)) +
                             " WHERE id = ?");
  row.bind(1, id);
  if (!row.step()) throw std::runtime_error("company file: a reference points at no record");
  return identities_.emplace(key, ListIdentity{listIdText(id, row.integer(0)), row.text(1)})
      .first->second;
}

void Store::forgetLookups() {
  identities_.clear();
  entries_.clear();
}

TxnRecord Store::txnRecord(const Statement& row) {
  TxnRecord record;
  record.id = row.integer(0);
  record.number = row.integer(1);
  record.customer = row.integer(2);
  record.refNumber = row.text(3);
  record.txnDate = row.text(4);
  record.created = row.integer(5);
  record.modified = row.integer(6);
  record.subtotal = row.integer(7) * kCent;
  record.salesTax = row.integer(8) * kCent;
  record.balance = row.integer(9) * kCent;
  if (!row.isNull(10)) record.arAccount = row.integer(10);
  record.fields = decodeFields(row.blob(11));
  return record;
}

void Store::insertTxn(TxnTable table, const TxnRecord& record) {
  Statement& insert =
      statement("INSERT INTO " + std::string(tableName(table)) + " (" + std::string(kTxnColumns) +
                ") VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?)");
  insert.bind(1, record.id)
      .bind(2, record.number)
      .bind(3, record.customer)
      .bind(5, record.txnDate)
      .bind(6, record.created)
      .bind(7, record.modified)
      .bind(8, centsOrNull(record.subtotal))
      .bind(9, centsOrNull(record.salesTax))
      .bind(10, centsOrNull(record.balance))
      .bind(11, record.arAccount)
      .bindBlob(12, encodeFields(record.fields));
  if (!record.refNumber.empty()) insert.bind(4, record.refNumber);
  insert.step();
  Statement& line = statement("INSERT INTO " + std::string(lineTableName(table)) +
                              " (txn, id, kind, fields) VALUES (?, ?, ?, ?)");
  for (const TxnLine& each : record.lines) {
    line.reset()
        .bind(1, record.id)
        .bind(2, each.id)
        .bind(3, int64_t{static_cast<int>(each.kind)})
        .bindBlob(4, encodeFields(each.fields));
    line.step();
  }
}

std::optional<int64_t> Store::findByTxnId(TxnTable table, std::string_view txnId) {
  const auto parsed = parseTxnId(txnId);
  if (!parsed) return std::nullopt;
  Statement& row = statement("SELECT id FROM " + std::string(tableName(table)) +
                             " WHERE id = ? AND created = ?");
  row.bind(1, parsed->first).bind(2, parsed->second);
  if (!row.step()) return std::nullopt;
  return row.integer(0);
}

void Store::loadLines(TxnTable table, TxnRecord& record) {
  Statement& rows = statement("SELECT id, kind, fields FROM " + std::string(lineTableName(table)) +
                              " WHERE txn = ? ORDER BY id");
  rows.bind(1, record.id);
  record.lines.clear();
  while (rows.step()) {
    record.lines.push_back(TxnLine{rows.integer(0), static_cast<LineKind>(rows.integer(1)),
                                   decodeFields(rows.blob(2))});
  }
}

}  // namespace droqbxml::simulator::handlers

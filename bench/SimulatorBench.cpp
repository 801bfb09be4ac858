// The embedded stand-in under load, each against what SQLite alone does: adding invoices of
// 10 lines one request document at a time (a plain SQLite loop writing the same rows, one
// transaction per invoice, at the same durability, is the peer), answering a customer query
// over 10,000 customers (reading those rows is the peer), and the same query sent by the
// droqbxml command, spawn included (the command printing its version is the peer). Peers
// take turns in one process, alternating which goes first; the counters give the medians.
#include <benchmark/benchmark.h>
#include <fcntl.h>
#include <spawn.h>
#include <sqlite3.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include "bench/FirstParse.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/CompanyFile.hpp"
#include "simulator/Simulator.hpp"

extern char** environ;

namespace droqbxml {
namespace {

namespace fs = std::filesystem;
using Clock = std::chrono::steady_clock;
using bench::median;

constexpr const char* kHeader =
    "<?xml version=\"1.0\"?>\r\n<?qbxml version=\"13.0\"?>\r\n<QBXML>\r\n"
    "<QBXMLMsgsRq onError=\"stopOnError\">\r\n";
constexpr const char* kFooter = "</QBXMLMsgsRq>\r\n</QBXML>";

double secondsSince(Clock::time_point start) {
  return std::chrono::duration<double>(Clock::now() - start).count();
}

class Company {
 public:
  explicit Company(const std::string& name)
      : folder_(fs::temp_directory_path() /
                ("droqbxml-bench-" + std::to_string(::getpid()) + "-" + name)) {
    fs::remove_all(folder_);
    fs::create_directories(folder_);
    simulator::CompanyFile::create(path(), {"Bench Company", true, {"Bench"}});
    processor_ = simulator::createProcessor();
    processor_->OpenConnection(u"", u"Bench");
    ticket_ = processor_->BeginSession(fromUtf8(path().string()), qbFileOpenDoNotCare);
  }
  ~Company() {
    processor_->EndSession(ticket_);
    processor_->CloseConnection();
    fs::remove_all(folder_);
  }
  const fs::path& folder() const { return folder_; }
  fs::path path() const { return folder_ / "bench.qbw"; }
  int64_t size() const { return static_cast<int64_t>(fs::file_size(path())); }
  std::string send(const std::string& body) {
    return toUtf8(processor_->ProcessRequest(ticket_, fromUtf8(kHeader + body + kFooter)));
  }

 private:
  fs::path folder_;
  std::shared_ptr<RequestProcessor> processor_;
  Text ticket_;
};

// A connection of the peers' own, set up as the stand-in sets up its connections.
class Database {
 public:
  explicit Database(const fs::path& path) {
    sqlite3_open_v2(path.c_str(), &db_, SQLITE_OPEN_READWRITE, nullptr);
    sqlite3_busy_timeout(db_, 10000);
    run("PRAGMA foreign_keys = ON; PRAGMA synchronous = FULL;");
  }
  ~Database() {
    for (sqlite3_stmt* statement : statements_) sqlite3_finalize(statement);
    sqlite3_close_v2(db_);
  }
  Database(const Database&) = delete;
  Database& operator=(const Database&) = delete;

  void run(const char* sql) { sqlite3_exec(db_, sql, nullptr, nullptr, nullptr); }
  sqlite3_stmt* prepare(const std::string& sql) {
    sqlite3_stmt* statement = nullptr;
    sqlite3_prepare_v2(db_, sql.c_str(), -1, &statement, nullptr);
    statements_.push_back(statement);
    return statement;
  }
  // The pragma's value as text.
  std::string pragma(const std::string& name) {
    sqlite3_stmt* statement = prepare("PRAGMA " + name);
    sqlite3_step(statement);
    const auto* text = sqlite3_column_text(statement, 0);
    std::string value = text != nullptr ? reinterpret_cast<const char*>(text) : "";
    sqlite3_reset(statement);
    return value;
  }

 private:
  sqlite3* db_ = nullptr;
  std::vector<sqlite3_stmt*> statements_;
};

std::string customerAdds(int from, int count) {
  std::string body;
  for (int i = from; i < from + count; ++i) {
    body += "<CustomerAddRq requestID=\"" + std::to_string(i) + "\"><CustomerAdd><Name>Customer " +
            std::to_string(i) + "</Name><CompanyName>Company " + std::to_string(i) +
            "</CompanyName><BillAddress><Addr1>" + std::to_string(i) +
            " Main Street</Addr1><City>Springfield</City><State>IL</State><PostalCode>62701"
            "</PostalCode></BillAddress><Phone>555-0100</Phone></CustomerAdd></CustomerAddRq>\r\n";
  }
  return body;
}

void addCustomers(Company& company, int customers) {
  for (int i = 0; i < customers; i += 500) company.send(customerAdds(i + 1, 500));
}

constexpr const char* kCustomerQuery = "<CustomerQueryRq requestID=\"1\" />\r\n";

// One round per iteration: ours answers the query, the peer reads every column of the same
// rows in the order the answer lists them.
void BM_CustomerQuery(benchmark::State& state) {
  const auto customers = static_cast<int>(state.range(0));
  Company company("query");
  const int64_t before = company.size();
  addCustomers(company, customers);
  state.counters["bytes_per_customer"] = static_cast<double>(company.size() - before) / customers;
  Database peer(company.path());
  sqlite3_stmt* rows = peer.prepare(
      "SELECT id, kind, full_name, parent, sublevel, is_active, created, modified, "
      "opening_balance, fields FROM customers WHERE is_active = 1 "
      "ORDER BY replace(full_name, ':', char(1)) COLLATE NOCASE, id");
  size_t responseBytes = 0;
  std::vector<double> ours;
  std::vector<double> read;
  for (auto _ : state) {
    const auto runOurs = [&] {
      const auto start = Clock::now();
      const std::string response = company.send(kCustomerQuery);
      ours.push_back(secondsSince(start));
      responseBytes = response.size();
    };
    const auto runPeer = [&] {
      const auto start = Clock::now();
      size_t bytes = 0;
      while (sqlite3_step(rows) == SQLITE_ROW) {
        bytes += static_cast<size_t>(sqlite3_column_bytes(rows, 2) + sqlite3_column_bytes(rows, 9));
      }
      sqlite3_reset(rows);
      benchmark::DoNotOptimize(bytes);
      read.push_back(secondsSince(start));
    };
    if (ours.size() % 2 == 0) {
      runOurs();
      runPeer();
    } else {
      runPeer();
      runOurs();
    }
    state.SetIterationTime(ours.back());
  }
  state.counters["ms"] = median(ours) * 1e3;
  state.counters["read_ms"] = median(read) * 1e3;
  state.counters["response_MB"] = static_cast<double>(responseBytes) / 1e6;
}

std::string invoiceAdd(int number) {
  std::string body =
      "<InvoiceAddRq requestID=\"1\"><InvoiceAdd><CustomerRef><FullName>Customer 1"
      "</FullName></CustomerRef><RefNumber>" +
      std::to_string(number) + "</RefNumber>";
  for (int line = 1; line <= 10; ++line) {
    body += "<InvoiceLineAdd><ItemRef><FullName>Labor</FullName></ItemRef><Desc>Line " +
            std::to_string(line) + "</Desc><Quantity>" + std::to_string(line) +
            "</Quantity><Rate>85.00</Rate></InvoiceLineAdd>";
  }
  return body + "</InvoiceAdd></InvoiceAddRq>\r\n";
}

// The plain SQLite loop: the rows the stand-in wrote for its first invoice, written again
// under new identifiers, one transaction per invoice, on a copy of the same company file.
class PlainInvoices {
 public:
  PlainInvoices(const fs::path& source, const fs::path& copy) {
    fs::copy_file(source, copy);
    db_ = std::make_unique<Database>(copy);
    sqlite3_stmt* invoice = db_->prepare(
        "SELECT id, txn_number, customer, ref_number, txn_date, created, modified, subtotal, "
        "sales_tax, balance, ar_account, fields FROM invoices ORDER BY id LIMIT 1");
    sqlite3_step(invoice);
    nextId_ = sqlite3_column_int64(invoice, 0) + 1000000;
    for (int column = 2; column < 12; ++column) invoice_.push_back(copyOf(invoice, column));
    sqlite3_stmt* lines = db_->prepare("SELECT kind, fields FROM invoice_lines ORDER BY txn, id");
    for (int i = 0; i < 10 && sqlite3_step(lines) == SQLITE_ROW; ++i) {
      lines_.push_back({sqlite3_column_int64(lines, 0), copyOf(lines, 1)});
    }
    sqlite3_reset(invoice);
    sqlite3_reset(lines);
    insertInvoice_ = db_->prepare(
        "INSERT INTO invoices (id, txn_number, customer, ref_number, txn_date, created, "
        "modified, subtotal, sales_tax, balance, ar_account, fields) "
        "VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?)");
    insertLine_ =
        db_->prepare("INSERT INTO invoice_lines (txn, id, kind, fields) VALUES (?, ?, ?, ?)");
  }
  ~PlainInvoices() {
    for (sqlite3_value* value : invoice_) sqlite3_value_free(value);
    for (const auto& line : lines_) sqlite3_value_free(line.second);
  }
  PlainInvoices(const PlainInvoices&) = delete;
  PlainInvoices& operator=(const PlainInvoices&) = delete;

  Database& database() { return *db_; }

  void add() {
    db_->run("BEGIN IMMEDIATE");
    const int64_t txn = nextId_++;
    sqlite3_bind_int64(insertInvoice_, 1, txn);
    sqlite3_bind_int64(insertInvoice_, 2, txn);
    for (size_t i = 0; i < invoice_.size(); ++i) {
      sqlite3_bind_value(insertInvoice_, static_cast<int>(i) + 3, invoice_[i]);
    }
    sqlite3_step(insertInvoice_);
    sqlite3_reset(insertInvoice_);
    for (const auto& [kind, fields] : lines_) {
      sqlite3_bind_int64(insertLine_, 1, txn);
      sqlite3_bind_int64(insertLine_, 2, nextId_++);
      sqlite3_bind_int64(insertLine_, 3, kind);
      sqlite3_bind_value(insertLine_, 4, fields);
      sqlite3_step(insertLine_);
      sqlite3_reset(insertLine_);
    }
    db_->run("COMMIT");
  }

 private:
  static sqlite3_value* copyOf(sqlite3_stmt* statement, int column) {
    return sqlite3_value_dup(sqlite3_column_value(statement, column));
  }

  std::unique_ptr<Database> db_;
  std::vector<sqlite3_value*> invoice_;  // the columns from customer on
  std::vector<std::pair<int64_t, sqlite3_value*>> lines_;
  int64_t nextId_ = 0;
  sqlite3_stmt* insertInvoice_ = nullptr;
  sqlite3_stmt* insertLine_ = nullptr;
};

// One round per iteration: ours adds state.range(0) invoices through the request processor,
// the plain loop as many; time per invoice on the wall clock, as both wait on the disk.
void BM_AddInvoices(benchmark::State& state) {
  const auto invoices = static_cast<int>(state.range(0));
  Company company("invoices");
  company.send(customerAdds(1, 1));
  company.send(
      "<ItemServiceAddRq><ItemServiceAdd><Name>Labor</Name><SalesOrPurchase><Price>85.00"
      "</Price><AccountRef><FullName>Sales</FullName></AccountRef>"
      "</SalesOrPurchase></ItemServiceAdd></ItemServiceAddRq>\r\n");
  company.send(invoiceAdd(0));
  PlainInvoices plain(company.path(), company.folder() / "plain.qbw");
  // Both at the durability the stand-in keeps: a rollback journal, every commit synced.
  Database inspect(company.path());
  if (plain.database().pragma("journal_mode") != "delete" ||
      inspect.pragma("journal_mode") != "delete" || plain.database().pragma("synchronous") != "2") {
    state.SkipWithError("not a rollback journal with every commit synced");
    return;
  }
  int next = 1;
  int64_t oursLines = 0;
  int64_t growth = 0;
  std::vector<double> ours;
  std::vector<double> theirs;
  std::vector<double> ratios;
  for (auto _ : state) {
    double oursSeconds = 0;
    double theirsSeconds = 0;
    const auto runOurs = [&] {
      const int64_t before = company.size();
      const auto start = Clock::now();
      for (int i = 0; i < invoices; ++i) {
        const std::string response = company.send(invoiceAdd(next++));
        if (response.find("statusCode=\"0\"") == std::string::npos) {
          state.SkipWithError(("invoice refused: " + response.substr(0, 400)).c_str());
          return;
        }
      }
      oursSeconds = secondsSince(start) / invoices;
      oursLines += 10LL * invoices;
      growth += company.size() - before;
    };
    const auto runPlain = [&] {
      const auto start = Clock::now();
      for (int i = 0; i < invoices; ++i) plain.add();
      theirsSeconds = secondsSince(start) / invoices;
    };
    if (ours.size() % 2 == 0) {
      runOurs();
      runPlain();
    } else {
      runPlain();
      runOurs();
    }
    state.SetIterationTime(oursSeconds * invoices);
    ours.push_back(oursSeconds);
    theirs.push_back(theirsSeconds);
    ratios.push_back(oursSeconds / theirsSeconds);
  }
  state.counters["ours_per_s"] = 1 / median(ours);
  state.counters["sqlite_per_s"] = 1 / median(theirs);
  state.counters["ratio"] = median(ratios);
  state.counters["bytes_per_line"] =
      static_cast<double>(growth) / static_cast<double>(std::max<int64_t>(oursLines, 1));
}

// Runs the built droqbxml command with `arguments`, its output to /dev/null; the exit code.
int runCommand(const std::vector<std::string>& arguments) {
  std::vector<std::string> words{DROQBXML_COMMAND};
  words.insert(words.end(), arguments.begin(), arguments.end());
  std::vector<char*> argv;
  for (std::string& word : words) argv.push_back(word.data());
  argv.push_back(nullptr);
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_addopen(&actions, 1, "/dev/null", O_WRONLY, 0);
  posix_spawn_file_actions_addopen(&actions, 2, "/dev/null", O_WRONLY, 0);
  pid_t child = 0;
  const int spawned = posix_spawn(&child, argv[0], &actions, nullptr, argv.data(), environ);
  posix_spawn_file_actions_destroy(&actions);
  if (spawned != 0) return -1;
  int status = 0;
  ::waitpid(child, &status, 0);
  return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

// One round per iteration: `droqbxml send` of the customer query on a company file of
// state.range(0) customers, and the command printing its version (what starting it costs).
void BM_CommandQuery(benchmark::State& state) {
  Company company("command");
  addCustomers(company, static_cast<int>(state.range(0)));
  const fs::path request = company.folder() / "query.xml";
  std::ofstream(request, std::ios::binary) << kHeader << kCustomerQuery << kFooter;
  ::setenv("DROQBXML_DRIVE_C", company.folder().c_str(), 1);
  const std::vector<std::string> send{
      "--app-name", "Bench", "--company", company.path().string(), "send", request.string()};
  std::vector<double> ours;
  std::vector<double> started;
  for (auto _ : state) {
    const auto runOurs = [&] {
      const auto start = Clock::now();
      if (runCommand(send) != 0) state.SkipWithError("droqbxml send failed");
      ours.push_back(secondsSince(start));
    };
    const auto runStart = [&] {
      const auto start = Clock::now();
      if (runCommand({"--version"}) != 0) state.SkipWithError("droqbxml --version failed");
      started.push_back(secondsSince(start));
    };
    if (ours.size() % 2 == 0) {
      runOurs();
      runStart();
    } else {
      runStart();
      runOurs();
    }
    state.SetIterationTime(ours.back());
  }
  state.counters["ms"] = median(ours) * 1e3;
  state.counters["start_ms"] = median(started) * 1e3;
}

BENCHMARK(BM_CustomerQuery)
    ->Arg(10000)
    ->Unit(benchmark::kMillisecond)
    ->UseManualTime()
    ->Iterations(9);
BENCHMARK(BM_AddInvoices)->Arg(100)->Unit(benchmark::kMillisecond)->UseManualTime()->Iterations(9);
BENCHMARK(BM_CommandQuery)
    ->Arg(10000)
    ->Unit(benchmark::kMillisecond)
    ->UseManualTime()
    ->Iterations(9);

}  // namespace
}  // namespace droqbxml

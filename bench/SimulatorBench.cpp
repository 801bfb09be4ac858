// The embedded stand-in under load: answering a customer query over 10,000 customers, and
// adding invoices of 10 lines one request document at a time, as a host sends them. Also
// reports how large the company file grows per customer and per invoice line.
#include <benchmark/benchmark.h>
#include <unistd.h>

#include <filesystem>
#include <string>

#include "droqbxml/runtime/Utf.hpp"
#include "simulator/CompanyFile.hpp"
#include "simulator/Simulator.hpp"

namespace droqbxml {
namespace {

namespace fs = std::filesystem;

constexpr const char* kHeader =
    "<?xml version=\"1.0\"?>\r\n<?qbxml version=\"13.0\"?>\r\n<QBXML>\r\n"
    "<QBXMLMsgsRq onError=\"stopOnError\">\r\n";
constexpr const char* kFooter = "</QBXMLMsgsRq>\r\n</QBXML>";

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

void BM_CustomerQuery(benchmark::State& state) {
  const auto customers = static_cast<int>(state.range(0));
  Company company("query");
  const int64_t before = company.size();
  for (int i = 0; i < customers; i += 500) company.send(customerAdds(i + 1, 500));
  state.counters["bytes_per_customer"] = static_cast<double>(company.size() - before) / customers;
  size_t responseBytes = 0;
  for (auto _ : state) {
    const std::string response = company.send("<CustomerQueryRq requestID=\"1\" />\r\n");
    responseBytes = response.size();
    benchmark::DoNotOptimize(response);
  }
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

void BM_AddInvoices(benchmark::State& state) {
  const auto invoices = static_cast<int>(state.range(0));
  int64_t lines = 0;
  int64_t growth = 0;
  for (auto _ : state) {
    state.PauseTiming();
    auto company = std::make_unique<Company>("invoices");
    company->send(customerAdds(1, 1));
    company->send(
        "<ItemServiceAddRq><ItemServiceAdd><Name>Labor</Name><SalesOrPurchase><Price>85.00"
        "</Price><AccountRef><FullName>Sales</FullName></AccountRef>"
        "</SalesOrPurchase></ItemServiceAdd></ItemServiceAddRq>\r\n");
    const int64_t before = company->size();
    state.ResumeTiming();
    for (int i = 1; i <= invoices; ++i) {
      const std::string response = company->send(invoiceAdd(i));
      if (response.find("statusCode=\"0\"") == std::string::npos) {
        state.SkipWithError(("invoice refused: " + response.substr(0, 400)).c_str());
        return;
      }
    }
    state.PauseTiming();
    lines += 10LL * invoices;
    growth += company->size() - before;
    company.reset();
    state.ResumeTiming();
  }
  state.SetItemsProcessed(static_cast<int64_t>(state.iterations()) * invoices);
  state.counters["bytes_per_line"] = static_cast<double>(growth) / static_cast<double>(lines);
}

BENCHMARK(BM_CustomerQuery)->Arg(10000)->Unit(benchmark::kMillisecond)->Iterations(3);
BENCHMARK(BM_AddInvoices)->Arg(1000)->Unit(benchmark::kMillisecond)->Iterations(1);

}  // namespace
}  // namespace droqbxml

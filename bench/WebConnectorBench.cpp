// The Web Connector service on loopback: one host sending customer queries through
// "DroQbXml.WebConnector", one player relaying them into the embedded stand-in, against the
// same query sent to the stand-in directly (the peer; they take turns). Counters: round trips
// per second through the service, and the latency it adds per exchange, medians of rounds.
#include <benchmark/benchmark.h>
#include <unistd.h>

#include <atomic>
#include <chrono>
#include <filesystem>
#include <thread>
#include <vector>

#include "bench/FirstParse.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/CompanyFile.hpp"
#include "simulator/Simulator.hpp"
#include "webconnector/Player.hpp"
#include "webconnector/WebConnector.hpp"

namespace droqbxml {
namespace {

namespace fs = std::filesystem;
using Clock = std::chrono::steady_clock;

constexpr const char* kQuery =
    "<?xml version=\"1.0\"?>\r\n<?qbxml version=\"13.0\"?>\r\n<QBXML>\r\n<QBXMLMsgsRq "
    "onError=\"stopOnError\">\r\n<CustomerQueryRq requestID=\"1\">\r\n<FullName>Customer "
    "7</FullName>\r\n</CustomerQueryRq>\r\n</QBXMLMsgsRq>\r\n</QBXML>";

void BM_WebConnectorRoundTrip(benchmark::State& state) {
  const fs::path folder =
      fs::temp_directory_path() / ("droqbxml-bench-wc-" + std::to_string(::getpid()));
  fs::create_directories(folder);
  const std::string company = (folder / "company.qbw").string();
  simulator::CompanyFile::create(company, {"Bench Company", true, {"Bench"}});

  webconnector::ServiceConfig config;
  config.port = 0;
  config.users.push_back(
      {"bench", webconnector::hashPassword("bench", webconnector::HashCost::Cheap), company});
  webconnector::Service service(config);
  service.start();
  std::atomic<bool> stop = false;
  std::thread player([&] {
    webconnector::PlayerOptions options;
    options.url = service.url();
    options.user = options.password = "bench";
    options.appName = "Bench";
    options.noOpPause = std::chrono::milliseconds(1);
    webconnector::Player web(options, simulator::createProcessor());
    while (!stop) web.run();
  });

  const auto remote = service.newProcessor();
  remote->OpenConnection(u"", u"Bench");
  const Text remoteTicket = remote->BeginSession(fromUtf8(company), qbFileOpenDoNotCare);
  const auto local = simulator::createProcessor();
  local->OpenConnection(u"", u"Bench");
  const Text localTicket = local->BeginSession(fromUtf8(company), qbFileOpenDoNotCare);
  const Text query = fromUtf8(kQuery);

  std::vector<double> through;
  std::vector<double> added;
  for (auto _ : state) {
    auto start = Clock::now();
    benchmark::DoNotOptimize(local->ProcessRequest(localTicket, query));
    const double direct = std::chrono::duration<double>(Clock::now() - start).count();
    start = Clock::now();
    benchmark::DoNotOptimize(remote->ProcessRequest(remoteTicket, query));
    const double relayed = std::chrono::duration<double>(Clock::now() - start).count();
    through.push_back(relayed);
    added.push_back(relayed - direct);
  }
  state.counters["round_trips_per_s"] = 1.0 / bench::median(through);
  state.counters["added_ms"] = bench::median(added) * 1e3;

  remote->EndSession(remoteTicket);
  stop = true;
  player.join();
  local->EndSession(localTicket);
  service.stop();
  fs::remove_all(folder);
}
BENCHMARK(BM_WebConnectorRoundTrip)->Iterations(2000)->UseRealTime();

}  // namespace
}  // namespace droqbxml

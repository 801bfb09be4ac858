// droqbxml webconnector serve and play: the Web Connector service in the foreground, and a
// stand-in for Intuit's Web Connector that relays to the embedded stand-in.
#include <pthread.h>
#include <sys/socket.h>
#include <unistd.h>

#include <csignal>
#include <ctime>
#include <fstream>
#include <mutex>
#include <thread>

#include "cli/Cli.hpp"
#include "cli/Commands.hpp"
#include "simulator/Simulator.hpp"
#include "webconnector/Player.hpp"
#include "webconnector/WebConnector.hpp"

namespace droqbxml::cli {

namespace {

std::string timestamp() {
  const std::time_t now = std::time(nullptr);
  std::tm utc{};
  gmtime_r(&now, &utc);
  char text[32];
  std::strftime(text, sizeof text, "%Y-%m-%dT%H:%M:%SZ", &utc);
  return text;
}

}  // namespace

int webConnectorServeCommand(Io io, const std::string& configFile) {
  webconnector::ServiceConfig config;
  try {
    config = webconnector::readServiceConfig(configFile);
  } catch (const webconnector::ConfigError& error) {
    io.err << "droqbxml: " << error.what() << '\n';
    return kExitUsage;
  }
  // The signals are taken by this thread alone, with sigwait: every thread started from here
  // on inherits the mask.
  sigset_t stopSignals;
  sigemptyset(&stopSignals);
  sigaddset(&stopSignals, SIGTERM);
  sigaddset(&stopSignals, SIGINT);
  pthread_sigmask(SIG_BLOCK, &stopSignals, nullptr);

  std::mutex logLock;
  const auto log = [&](const std::string& line) {
    const std::lock_guard lock(logLock);
    io.err << timestamp() << ' ' << line << std::endl;
  };
  webconnector::Service service(config, log);
  const int listener = listenOnLoopback(config.relayPort);
  try {
    if (listener < 0) {
      throw std::runtime_error("cannot listen on 127.0.0.1:" + std::to_string(config.relayPort));
    }
    service.start();
  } catch (const std::exception& error) {
    if (listener >= 0) ::close(listener);
    io.err << "droqbxml: " << error.what() << '\n';
    return kExitConnection;
  }
  log("serving the Web Connector at " + service.url() +
      "; hosts on 127.0.0.1:" + std::to_string(config.relayPort));
  std::thread hosts(acceptRelayCalls, listener, [&service] { return service.newProcessor(); });

  int signal = 0;
  sigwait(&stopSignals, &signal);
  log(std::string("stopping on ") + (signal == SIGTERM ? "SIGTERM" : "SIGINT"));
  ::shutdown(listener, SHUT_RDWR);
  hosts.join();
  ::close(listener);
  service.stop(config.hold);
  log("stopped");
  pthread_sigmask(SIG_UNBLOCK, &stopSignals, nullptr);
  return kExitSuccess;
}

int webConnectorPlayCommand(Io io, const PlayOptions& options) {
  webconnector::PlayerOptions player;
  player.url = options.url;
  player.user = options.user;
  std::string password;
  if (options.passwordFile) {
    std::ifstream file(*options.passwordFile);
    if (!file) {
      io.err << "droqbxml: cannot read " << *options.passwordFile << '\n';
      return kExitUsage;
    }
    std::getline(file, password);
  } else {
    std::getline(io.in, password);
  }
  if (!password.empty() && password.back() == '\r') password.pop_back();
  player.password = password;
  player.companyFile = options.companyFile;
  player.appName = componentAppName();
  player.caFile = options.caFile.value_or("");
  player.verifyCertificate = !options.insecure;
  player.noOpPause = std::chrono::seconds(options.noOpPause);
  try {
    webconnector::Player web(player, simulator::createProcessor());
    for (int run = 1; options.runs == 0 || run <= options.runs; ++run) {
      if (run > 1) std::this_thread::sleep_for(std::chrono::seconds(options.every));
      webconnector::RunResult result;
      try {
        result = web.run();
      } catch (const webconnector::PlayerError& error) {
        // As the Web Connector does, a run that fails is reported and the next one is made.
        io.err << timestamp() << " run " << run << ": " << error.what() << std::endl;
        if (options.runs != 0 && run == options.runs) return kExitConnection;
        continue;
      }
      io.out << timestamp() << " run " << run << ": " << result.outcome << ", " << result.requests
             << " request(s)" << (result.closeMessage.empty() ? "" : ", " + result.closeMessage)
             << std::endl;
      if (result.outcome == "nvu") return kExitConnection;
    }
  } catch (const std::exception& error) {
    io.err << "droqbxml: " << error.what() << '\n';
    return kExitConnection;
  }
  return kExitSuccess;
}

}  // namespace droqbxml::cli

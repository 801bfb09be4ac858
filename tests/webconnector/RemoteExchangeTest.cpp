// The whole remote exchange over real HTTP on loopback: hosts use the component through
// "DroQbXml.WebConnector", a player plays Intuit's Web Connector and relays each request
// into the embedded stand-in, and misbehaving clients get the protocol's answers.
#include <arpa/inet.h>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <httplib.h>
#include <spawn.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

#include <atomic>
#include <csignal>
#include <cstdlib>
#include <future>
#include <optional>
#include <sstream>
#include <thread>

#include "cli/Cli.hpp"
#include "cli/Commands.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/CompanyFile.hpp"
#include "simulator/Simulator.hpp"
#include "tests/TestSupport.hpp"
#include "webconnector/Player.hpp"
#include "webconnector/WebConnector.hpp"

extern char** environ;

namespace droqbxml::webconnector {
namespace {

using namespace std::chrono_literals;
using Params = std::vector<std::pair<std::string, std::string>>;

constexpr const char* kQuery =
    "<?xml version=\"1.0\" ?>\r\n<?qbxml version=\"13.0\"?>\r\n<QBXML><QBXMLMsgsRq "
    "onError=\"stopOnError\"><CustomerQueryRq requestID=\"1\"><FullName>Nobody</FullName>"
    "</CustomerQueryRq></QBXMLMsgsRq></QBXML>";

class RemoteExchangeTest : public ::testing::Test {
 protected:
  RemoteExchangeTest() {
    // alice's Web Connector serves her company file, bob's whichever file a host asks for.
    simulator::CompanyFile::create(company("alice"), {"Alice", true, {cli::componentAppName()}});
    config_.users.push_back({"alice", hashPassword("alice", HashCost::Cheap), company("alice")});
    config_.users.push_back({"bob", hashPassword("bob", HashCost::Cheap), ""});
    config_.port = 0;
    config_.hold = 300ms;
    config_.maxBodyBytes = 1 << 20;
    service_.emplace(config_);
    service_->start();
    install(*service_, {3s, 3s});
  }
  ~RemoteExchangeTest() override { unregisterRequestProcessor(kWebConnectorProgId); }

  PlayerOptions options(const std::string& user, const std::string& password) {
    PlayerOptions options;
    options.url = service_->url();
    options.companyFile = company("alice");
    options.appName = cli::componentAppName();
    options.user = user;
    options.password = password;
    options.noOpPause = 10ms;
    return options;
  }
  // A Web Connector for `user` that runs every few milliseconds until the test ends.
  void keepPlaying(const std::string& user) {
    players_.emplace_back([this, user] {
      Player player(options(user, user), simulator::createProcessor());
      while (!stop_) {
        try {
          player.run();
        } catch (const PlayerError&) {  // the service is gone: try again at the next run
        }
        std::this_thread::sleep_for(5ms);
      }
    });
  }
  // The same in a process of its own, as `droqbxml webconnector play`: the stand-in opens
  // one company file per process, as QuickBooks does per machine.
  void keepPlayingElsewhere(const std::string& user) {
    const std::string passwordFile = drive_.path(user + ".password").string();
    test::writeFile(passwordFile, user + "\n");
    const std::string url = service_->url();
    std::vector<std::string> args{DROQBXML_COMMAND,
                                  "webconnector",
                                  "play",
                                  "--url",
                                  url,
                                  "--user",
                                  user,
                                  "--password-file",
                                  passwordFile,
                                  "--runs",
                                  "0",
                                  "--every",
                                  "0",
                                  "--noop-pause",
                                  "0"};
    std::vector<char*> argv;
    for (auto& arg : args) argv.push_back(arg.data());
    argv.push_back(nullptr);
    posix_spawn_file_actions_t quiet;
    posix_spawn_file_actions_init(&quiet);
    posix_spawn_file_actions_addopen(&quiet, 1, "/dev/null", O_WRONLY, 0);
    pid_t child = 0;
    ASSERT_EQ(::posix_spawn(&child, argv[0], &quiet, nullptr, argv.data(), environ), 0);
    posix_spawn_file_actions_destroy(&quiet);
    children_.push_back(child);
  }
  std::string company(const std::string& user) { return drive_.path(user + ".qbw").string(); }
  void TearDown() override {
    stop_ = true;
    for (auto& player : players_) player.join();
    for (const pid_t child : children_) {
      ::kill(child, SIGKILL);
      ::waitpid(child, nullptr, 0);
    }
  }

  test::TemporaryDrive drive_;
  ServiceConfig config_;
  std::optional<Service> service_;
  std::atomic<bool> stop_ = false;
  std::vector<std::thread> players_;
  std::vector<pid_t> children_;
};

TEST_F(RemoteExchangeTest, TheDemoRunsOnTwoRemoteCompanyFiles) {
  keepPlaying("alice");
  keepPlayingElsewhere("bob");
  std::istringstream in;
  std::ostringstream out;
  std::ostringstream err;
  const std::string path = company("alice");
  const char* argv[] = {"droqbxml",  "--processor", "DroQbXml.WebConnector",
                        "--company", path.c_str(),  "demo"};
  EXPECT_EQ(cli::run(6, argv, in, out, err), cli::kExitSuccess) << out.str() << err.str();
  EXPECT_NE(out.str().find(" 0 unexpected."), std::string::npos) << out.str();
}

TEST_F(RemoteExchangeTest, LoginsAnsweredAsTheWebConnectorExpects) {
  Player wrong(options("alice", "bob"), simulator::createProcessor());
  EXPECT_EQ(wrong.run().outcome, "nvu");
  Player nobody(options("carol", "carol"), simulator::createProcessor());
  EXPECT_EQ(nobody.run().outcome, "nvu");
  Player idle(options("alice", "alice"), simulator::createProcessor());
  EXPECT_EQ(idle.run().outcome, "none");  // no host waits on her company file
}

TEST_F(RemoteExchangeTest, HostCallsFailCleanlyWithoutAWebConnector) {
  const auto processor = service_->newProcessor({200ms, 200ms});
  EXPECT_TRUE(test::raises(
      [&] { processor->BeginSession(fromUtf8(company("alice")), qbFileOpenDoNotCare); },
      Hresult::kUnexpected, kWebConnectorProgId,
      u"The method \"OpenConnection\" has not been called."));
  processor->OpenConnection(u"", u"Host");
  const Text message =
      u"Could not start QuickBooks: no Web Connector logged in for the company "
      u"file \"" +
      fromUtf8(company("alice")) + u"\" within 0 s.";
  EXPECT_TRUE(test::raises(
      [&] { processor->BeginSession(fromUtf8(company("alice")), qbFileOpenDoNotCare); },
      Hresult::kCouldNotStart, kWebConnectorProgId, message));
  // QuickBooks cannot open the file: the Web Connector's connectionError is the host's error.
  keepPlaying("bob");
  const auto patient = service_->newProcessor({5s, 5s});
  patient->OpenConnection(u"", u"Host");
  EXPECT_TRUE(test::raises(
      [&] { patient->BeginSession(fromUtf8(company("missing")), qbFileOpenDoNotCare); },
      static_cast<int32_t>(0x80040403u), kWebConnectorProgId,
      u"Could not open the specified QuickBooks company data file."));
}

// Drives the service call by call, as a Web Connector that misbehaves would.
TEST_F(RemoteExchangeTest, ProtocolMisstepsReachNothing) {
  const auto host = service_->newProcessor({5s, 5s});
  host->OpenConnection(u"", u"Host");
  auto session = std::async(std::launch::async, [&] {
    return host->BeginSession(fromUtf8(company("alice")), qbFileOpenDoNotCare);
  });
  Player web(options("alice", "alice"), simulator::createProcessor());
  const auto call = [&](const char* op, const Params& params) {
    return web.call(op, params).parameter(std::string(op) + "Result");
  };
  std::string ticket;
  while (ticket.empty()) {  // until the host's BeginSession is waiting
    const SoapMessage login =
        web.call("authenticate", {{"strUserName", "alice"}, {"strPassword", "alice"}});
    if (login.strings.at(1) != "none") ticket = login.strings.at(0);
  }
  EXPECT_EQ(call("receiveResponseXML", {{"ticket", ticket}, {"response", "<QBXML/>"}}), "-1");
  EXPECT_EQ(call("getLastError", {{"ticket", ticket}}),
            "A response came for no request; it was dropped.");
  EXPECT_EQ(call("sendRequestXML", {{"ticket", "0123456789abcdef0123456789abcdef"}}), "");
  EXPECT_EQ(call("getLastError", {{"ticket", "forged"}}), "The ticket is unknown or has expired.");
  // QuickBooks opens the file: the session begins; no request yet, so the Web Connector pauses.
  EXPECT_EQ(call("sendRequestXML", {{"ticket", ticket}, {"strCompanyFileName", company("alice")}}),
            "");
  EXPECT_EQ(call("getLastError", {{"ticket", ticket}}), "NoOp");
  const Text hostTicket = session.get();
  EXPECT_EQ(toUtf8(host->GetCurrentCompanyFileName(hostTicket)), company("alice"));

  // The Web Connector takes a request and disappears; when it logs in again the request
  // fails (it may have reached QuickBooks) and the next one goes through the new session.
  auto lost = std::async(std::launch::async,
                         [&] { return host->ProcessRequest(hostTicket, fromUtf8(kQuery)); });
  EXPECT_EQ(call("sendRequestXML", {{"ticket", ticket}}), kQuery);
  const SoapMessage again =
      web.call("authenticate", {{"strUserName", "alice"}, {"strPassword", "alice"}});
  EXPECT_TRUE(test::raises([&] { lost.get(); }, Hresult::kUnexpected, kWebConnectorProgId,
                           u"The Web Connector session ended (the Web Connector logged in again) "
                           u"before QuickBooks answered; the request may have been processed."));
  EXPECT_EQ(call("closeConnection", {{"ticket", ticket}}), "The ticket is unknown or has expired.");
  auto next = std::async(std::launch::async,
                         [&] { return host->ProcessRequest(hostTicket, fromUtf8(kQuery)); });
  const std::string fresh = again.strings.at(0);
  EXPECT_EQ(call("sendRequestXML", {{"ticket", fresh}, {"strCompanyFileName", company("alice")}}),
            kQuery);
  // Asked for another request before answering this one: the one sent fails.
  EXPECT_EQ(call("sendRequestXML", {{"ticket", fresh}}), "");
  EXPECT_TRUE(test::raises([&] { next.get(); }, Hresult::kUnexpected, kWebConnectorProgId,
                           u"The Web Connector asked for another request before answering this "
                           u"one; the request may have been processed."));
  // QuickBooks' own failure comes back as the processor's error; the Web Connector is told.
  auto refused =
      std::async(std::launch::async, [&] { return host->ProcessRequest(hostTicket, u"<QBXML>"); });
  EXPECT_EQ(call("sendRequestXML", {{"ticket", fresh}}), "<QBXML>");
  EXPECT_EQ(
      call("receiveResponseXML",
           {{"ticket", fresh},
            {"hresult", "0x80040400"},
            {"message", "QuickBooks found an error when parsing the provided XML text stream."}}),
      "-1");
  EXPECT_TRUE(
      test::raises([&] { refused.get(); }, static_cast<int32_t>(0x80040400u), kWebConnectorProgId,
                   u"QuickBooks found an error when parsing the provided XML text stream."));
  EXPECT_EQ(call("closeConnection", {{"ticket", fresh}}), "OK");
  EXPECT_EQ(call("sendRequestXML", {{"ticket", fresh}}), "");  // a replayed ticket
  host->EndSession(hostTicket);
}

TEST_F(RemoteExchangeTest, BadMessagesGetFaultsAndSlowClientsHoldNobodyUp) {
  // A client that sends half a request and waits.
  const int slow = ::socket(AF_INET, SOCK_STREAM, 0);
  sockaddr_in address{};
  address.sin_family = AF_INET;
  address.sin_port = htons(service_->port());
  address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
  ASSERT_EQ(::connect(slow, reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
  const std::string half = "POST /qbwc HTTP/1.1\r\nHost: x\r\nContent-Length: 100\r\n\r\n<soap";
  ASSERT_GT(::send(slow, half.data(), half.size(), 0), 0);

  httplib::Client client("127.0.0.1", service_->port());
  const auto post = [&](const std::string& body) { return client.Post("/qbwc", body, "text/xml"); };
  const auto malformed = post("<soap:Envelope");
  ASSERT_TRUE(malformed);
  EXPECT_EQ(malformed->status, 500);
  EXPECT_NE(malformed->body.find("<faultcode>soap:Client</faultcode>"), std::string::npos);
  const auto entity = post("<!DOCTYPE x [<!ENTITY a \"b\">]><x>&a;</x>");
  EXPECT_EQ(entity->status, 500);
  const auto huge = post(std::string(config_.maxBodyBytes + 1, 'x'));
  ASSERT_TRUE(huge);
  EXPECT_EQ(huge->status, 413);
  const auto version = post(soapCall("serverVersion", {}));
  EXPECT_EQ(version->status, 200);
  EXPECT_NE(version->body.find("<serverVersionResult>DroQbXml "), std::string::npos);
  ::close(slow);
}

TEST_F(RemoteExchangeTest, StoppingFailsWhatWasNotSent) {
  keepPlaying("alice");
  const auto host = service_->newProcessor({5s, 5s});
  host->OpenConnection(u"", u"Host");
  const Text ticket = host->BeginSession(fromUtf8(company("alice")), qbFileOpenDoNotCare);
  EXPECT_NE(host->ProcessRequest(ticket, fromUtf8(kQuery)).find(u"CustomerQueryRs"), Text::npos);
  service_->stop(1s);
  EXPECT_TRUE(test::raises([&] { host->ProcessRequest(ticket, fromUtf8(kQuery)); },
                           Hresult::kUnexpected, kWebConnectorProgId,
                           u"The DroQbXml service is stopping; the request was not sent."));
}

TEST(WebConnectorBrokerTest, LogsShowNetworkTextOnOneLine) {
  EXPECT_EQ(loggable("eve\n2026-11-25 authenticate: user 'root' logged in"),
            "eve?2026-11-25 authenticate: user 'root' logged in");
  EXPECT_EQ(loggable(std::string(100, 'x')), std::string(80, 'x') + "...");
}

TEST(WebConnectorBrokerTest, TicketsExpire) {
  ServiceConfig config;
  config.ticketLifetime = std::chrono::seconds(1);
  config.users.push_back({"erin", hashPassword("erin", HashCost::Cheap), "e.qbw"});
  Broker broker(config);
  auto host = std::async(std::launch::async, [&] {
    try {
      broker.beginHostSession("e.qbw", 1200ms);
    } catch (const ComError&) {
    }
  });
  std::vector<std::string> login{"", "none"};
  while (login[1] == "none") login = broker.authenticate("erin", "erin");
  std::this_thread::sleep_for(1100ms);
  EXPECT_EQ(broker.sendRequestXML(login[0], "e.qbw", "13", "0"), "");
  EXPECT_EQ(broker.getLastError(login[0]), "The ticket is unknown or has expired.");
}

// Over HTTPS with a certificate the player trusts; a client that does not trust it gets no
// answer at all.
TEST(WebConnectorHttpsTest, ServesOverTls) {
  const test::TemporaryDrive drive;
  const std::string key = drive.path("server.key").string();
  const std::string certificate = drive.path("server.pem").string();
  const std::string make =
      "openssl req -x509 -newkey rsa:2048 -nodes -days 1 -subj /CN=127.0.0.1 "
      "-addext subjectAltName=IP:127.0.0.1 -keyout " +
      key + " -out " + certificate + " 2>/dev/null";
  ASSERT_EQ(std::system(make.c_str()), 0);
  ServiceConfig config;
  config.port = 0;
  config.certificate = certificate;
  config.privateKey = key;
  config.users.push_back({"dave", hashPassword("dave", HashCost::Cheap), "d.qbw"});
  Service service(config);
  service.start();
  ASSERT_EQ(service.url().rfind("https://127.0.0.1:", 0), 0u);
  PlayerOptions trusting;
  trusting.url = service.url();
  trusting.user = trusting.password = "dave";
  trusting.caFile = certificate;
  EXPECT_EQ(Player(trusting, simulator::createProcessor()).run().outcome, "none");
  PlayerOptions wary = trusting;
  wary.caFile.clear();
  EXPECT_THROW(Player(wary, simulator::createProcessor()).run(), PlayerError);
}

// droqbxml webconnector serve in a process of its own: a host reaches it with --processor
// DroQbXml.WebConnector, a player in another process relays, SIGTERM stops it cleanly.
TEST(WebConnectorServeTest, ServesHostsUntilSigterm) {
  const test::TemporaryDrive drive;
  const std::string company = drive.path("served.qbw").string();
  simulator::CompanyFile::create(company, {"Served", true, {cli::componentAppName()}});
  const int port = 20000 + ::getpid() % 20000;
  const std::string relayPort = std::to_string(port + 1);
  const std::string config = drive.path("wc.conf").string();
  test::writeFile(config, "port = " + std::to_string(port) + "\nrelay-port = " + relayPort +
                              "\nhold-seconds = 1\n[user carol]\npassword = " +
                              hashPassword("carol", HashCost::Cheap) + "\ncompany = " + company +
                              "\n");
  test::writeFile(drive.path("carol.password"), "carol\n");
  const auto spawn = [](std::vector<std::string> args, const std::string& log) {
    std::vector<char*> argv{const_cast<char*>(DROQBXML_COMMAND)};
    for (auto& arg : args) argv.push_back(arg.data());
    argv.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, 1, "/dev/null", O_WRONLY, 0);
    posix_spawn_file_actions_addopen(&actions, 2, log.c_str(), O_WRONLY | O_CREAT, 0600);
    pid_t child = 0;
    EXPECT_EQ(::posix_spawn(&child, argv[0], &actions, nullptr, argv.data(), environ), 0);
    posix_spawn_file_actions_destroy(&actions);
    return child;
  };
  const std::string serveLog = drive.path("serve.log").string();
  const pid_t serve = spawn({"webconnector", "serve", "--config", config}, serveLog);
  const std::string url = "http://127.0.0.1:" + std::to_string(port) + "/qbwc";
  const pid_t player =
      spawn({"webconnector", "play", "--url", url, "--user", "carol", "--password-file",
             drive.path("carol.password").string(), "--runs", "0", "--every", "0"},
            drive.path("play.log").string());

  ::setenv("DROQBXML_WEBCONNECTOR_PORT", relayPort.c_str(), 1);
  std::istringstream in;
  std::ostringstream out;
  std::ostringstream err;
  const char* argv[] = {"droqbxml",      "--processor", "DroQbXml.WebConnector",
                        "--wait",        "20",          "--company",
                        company.c_str(), "query",       "customer"};
  int status = -1;
  for (int attempt = 0; attempt < 50 && status != cli::kExitSuccess; ++attempt) {
    status = cli::run(9, argv, in, out, err);  // until the service listens
    if (status != cli::kExitSuccess) std::this_thread::sleep_for(100ms);
  }
  EXPECT_EQ(status, cli::kExitSuccess) << err.str();
  EXPECT_NE(out.str().find("<CustomerQueryRs"), std::string::npos);
  // A company file no user serves: refused at once, QuickBooks' HRESULT intact.
  std::ostringstream refused;
  argv[6] = "C:\\other.qbw";
  EXPECT_EQ(cli::run(9, argv, in, out, refused), cli::kExitConnection);
  EXPECT_NE(refused.str().find("(0x80040403)"), std::string::npos) << refused.str();
  ::unsetenv("DROQBXML_WEBCONNECTOR_PORT");

  ::kill(serve, SIGTERM);
  int exit = -1;
  ::waitpid(serve, &exit, 0);
  EXPECT_TRUE(WIFEXITED(exit) && WEXITSTATUS(exit) == 0);
  const std::string log = test::readFile(serveLog);
  EXPECT_NE(log.find("authenticate: user 'carol' logged in"), std::string::npos) << log;
  EXPECT_NE(log.find("stopping on SIGTERM"), std::string::npos) << log;
  EXPECT_EQ(log.find("carol\n"), std::string::npos);  // the password is never logged
  ::kill(player, SIGKILL);
  ::waitpid(player, nullptr, 0);
}

}  // namespace
}  // namespace droqbxml::webconnector

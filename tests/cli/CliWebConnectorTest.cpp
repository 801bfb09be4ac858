// webconnector passwd and webconnector qwc run in-process: the password read from the input
// into a configuration file, and the .qwc file written for one of its users.
#include <gtest/gtest.h>

#include <sstream>

#include "cli/Cli.hpp"
#include "cli/Commands.hpp"
#include "tests/TestSupport.hpp"
#include "tests/cli/CliRunner.hpp"
#include "webconnector/ServiceConfig.hpp"

namespace droqbxml {
namespace {

template <class Command>
test::CliResult runCommand(const std::string& input, Command command) {
  std::istringstream in(input);
  std::ostringstream out;
  std::ostringstream err;
  const int code = command(cli::Io{in, out, err});
  return {code, out.str(), err.str()};
}

TEST(CliWebConnectorTest, PasswdSetsTheHashAndRefusesBadInput) {
  const test::TemporaryDrive folder;
  const std::string file = folder.path("wc.conf").string();
  const auto passwd = [&](const std::string& input, const std::string& user) {
    return runCommand(input, [&](cli::Io io) {
      return cli::webConnectorPasswdCommand(io, file, user, std::string("C:\\Books\\Main.qbw"));
    });
  };

  const auto set = passwd("pa ss\r\nignored\n", "alice");
  EXPECT_EQ(set.code, cli::kExitSuccess);
  EXPECT_EQ(set.out, "password set for alice in " + file + "\n");
  EXPECT_EQ(set.err, "");
  const auto config = webconnector::readServiceConfig(file);
  EXPECT_TRUE(webconnector::passwordMatches(config.user("alice")->passwordHash, "pa ss"));
  EXPECT_EQ(config.user("alice")->companyFile, "C:\\Books\\Main.qbw");

  const struct {
    std::string input;
    std::string user;
    std::string err;
  } refusals[] = {
      {"\r\n", "bob", "droqbxml: the password cannot be empty\n"},
      {"", "bob", "droqbxml: the password cannot be empty\n"},
      {"x\n", "bob smith", "droqbxml: a user name cannot be empty or hold white space or ']'\n"},
      {"x\n", "bob]", "droqbxml: a user name cannot be empty or hold white space or ']'\n"},
  };
  for (const auto& r : refusals) {
    const auto refused = passwd(r.input, r.user);
    EXPECT_EQ(refused.code, cli::kExitUsage) << r.user;
    EXPECT_EQ(refused.err, r.err) << r.user;
  }
  EXPECT_EQ(webconnector::readServiceConfig(file).users.size(), 1u);
}

TEST(CliWebConnectorTest, QwcWritesForAKnownUserOnly) {
  const test::TemporaryDrive folder;
  const std::string file = folder.path("wc.conf").string();
  test::writeFile(file, "port = 8090\npath = /wc\napp-name = Jobs\n[user alice]\n");
  const auto qwc = [&](const std::string& user, std::optional<std::string> output) {
    return runCommand("", [&](cli::Io io) {
      return cli::webConnectorQwcCommand(io, file, user, std::nullopt, 5, output);
    });
  };

  const auto shown = qwc("alice", std::nullopt);
  EXPECT_EQ(shown.code, cli::kExitSuccess);
  for (const char* line :
       {"<AppName>Jobs</AppName>\r\n", "<AppURL>http://127.0.0.1:8090/wc</AppURL>",
        "<UserName>alice</UserName>", "<RunEveryNMinutes>5<"}) {
    EXPECT_NE(shown.out.find(line), std::string::npos) << line;
  }

  const auto unknown = qwc("bob", std::nullopt);
  EXPECT_EQ(unknown.code, cli::kExitUsage);
  EXPECT_EQ(unknown.err, "droqbxml: " + file + " has no user 'bob'\n");

  const std::string output = folder.path("alice.qwc").string();
  const auto written = qwc("alice", output);
  EXPECT_EQ(written.code, cli::kExitSuccess);
  EXPECT_EQ(written.out, "wrote " + output + " for alice\n");
  EXPECT_EQ(test::readFile(output).rfind("<?xml version=\"1.0\"?>\r\n<QBWCXML>", 0), 0u);
  const auto again = qwc("alice", output);
  EXPECT_EQ(again.code, cli::kExitUsage);
  EXPECT_EQ(again.err, "droqbxml: " + output + ": already exists\n");

  const auto plain = runCommand("", [&](cli::Io io) {
    return cli::webConnectorQwcCommand(io, file, "alice", std::string("http://books.example.com/"),
                                       1, std::nullopt);
  });
  EXPECT_EQ(plain.code, cli::kExitUsage);
  EXPECT_EQ(plain.err,
            "droqbxml: the Web Connector takes http:// only for localhost; use https:// in "
            "'http://books.example.com/'\n");

  const auto noFile = runCommand("", [&](cli::Io io) {
    return cli::webConnectorQwcCommand(io, folder.path("none.conf").string(), "alice",
                                       std::string("http://example.com/"), 1, std::nullopt);
  });
  EXPECT_EQ(noFile.code, cli::kExitUsage);
  EXPECT_EQ(noFile.err.rfind("droqbxml: " + folder.path("none.conf").string() + ": cannot read", 0),
            0u);
}

}  // namespace
}  // namespace droqbxml

// The Web Connector service's configuration file: every setting read, every mistake named
// with its line, a password set without disturbing the rest of the file, and the hashes.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <string>

#include "tests/TestSupport.hpp"
#include "webconnector/ServiceConfig.hpp"

namespace droqbxml::webconnector {
namespace {

TEST(ServiceConfigTest, ReadsEverySetting) {
  const auto config = parseServiceConfig(
      "# the service\r\n\r\nlisten=0.0.0.0\r\n  port =  8443 \r\ncertificate = tls/server.pem\r\n"
      "key = /keys/server.key\r\npath = /wc\r\nrelay-port = 7400\r\nticket-minutes = 5\r\n"
      "hold-seconds = 3\r\nmax-body-kb = 64\r\napp-name = Job Costing\r\n"
      "[user alice]\r\npassword = $argon2id$h\r\ncompany = C:\\Companies\\Job Costing.qbw\r\n"
      "[ user  bob ]\r\n# no password yet\r\n",
      "wc.conf", "/etc/droqbxml");
  EXPECT_EQ(config.listen, "0.0.0.0");
  EXPECT_EQ(config.port, 8443);
  EXPECT_EQ(config.certificate, "/etc/droqbxml/tls/server.pem");
  EXPECT_EQ(config.privateKey, "/keys/server.key");
  EXPECT_EQ(config.path, "/wc");
  EXPECT_EQ(config.relayPort, 7400);
  EXPECT_EQ(config.ticketLifetime, std::chrono::minutes(5));
  EXPECT_EQ(config.hold, std::chrono::seconds(3));
  EXPECT_EQ(config.maxBodyBytes, 64u * 1024);
  EXPECT_EQ(config.appName, "Job Costing");
  ASSERT_EQ(config.users.size(), 2u);
  EXPECT_EQ(config.user("alice")->passwordHash, "$argon2id$h");
  EXPECT_EQ(config.user("alice")->companyFile, "C:\\Companies\\Job Costing.qbw");
  EXPECT_EQ(config.user("bob")->passwordHash, "");
  EXPECT_EQ(config.user("carol"), nullptr);
}

TEST(ServiceConfigTest, NamesEachMistakeWithItsLine) {
  const struct {
    std::string text;
    std::string message;
  } cases[] = {
      {"prot = 1", "wc.conf:1: unknown setting 'prot'"},
      {"# x\nport", "wc.conf:2: expected 'setting = value', not 'port'"},
      {"port = 0", "wc.conf:1: port must be a number from 1 to 65535, not '0'"},
      {"relay-port = 65536", "wc.conf:1: relay-port must be a number from 1 to 65535, not '65536'"},
      {"port = 80x", "wc.conf:1: port must be a number from 1 to 65535, not '80x'"},
      {"ticket-minutes = 0",
       "wc.conf:1: ticket-minutes must be a whole number from 1 to 1000000, not '0'"},
      {"hold-seconds = -5",
       "wc.conf:1: hold-seconds must be a whole number from 1 to 1000000, not '-5'"},
      {"max-body-kb = 99999999999999999999999",
       "wc.conf:1: max-body-kb must be a whole number from 1 to 1000000, not "
       "'99999999999999999999999'"},
      {"listen =", "wc.conf:1: listen needs a value"},
      {"path = qbwc", "wc.conf:1: path must start with '/', not 'qbwc'"},
      {"port = 1\nport = 2", "wc.conf:2: 'port' is set twice"},
      {"[user a]\n[user b]\n[user a]", "wc.conf:3: user 'a' appears twice"},
      {"[users a]", "wc.conf:1: expected a section [user NAME], not '[users a]'"},
      {"[user a b]", "wc.conf:1: expected a section [user NAME], not '[user a b]'"},
      {"[user a]\nport = 1", "wc.conf:2: 'port' belongs before the first [user NAME] section"},
      {"password = x", "wc.conf:1: 'password' belongs in a [user NAME] section"},
      {"[user a]\nshell = sh", "wc.conf:2: unknown setting 'shell'"},
      {"listen = ::1\ncertificate = c.pem", "wc.conf:2: a certificate needs a key as well"},
      {"key = k.pem", "wc.conf:1: a key needs a certificate as well"},
      {"\nlisten = 10.0.0.5",
       "wc.conf:2: plain HTTP is refused on 10.0.0.5: the Web Connector requires HTTPS except on "
       "localhost; set certificate and key"},
      {"listen = 127.evil.example",
       "wc.conf:1: plain HTTP is refused on 127.evil.example: the Web Connector requires HTTPS "
       "except on localhost; set certificate and key"},
  };
  for (const auto& c : cases) {
    try {
      parseServiceConfig(c.text, "wc.conf", "/etc");
      ADD_FAILURE() << "accepted " << c.text;
    } catch (const ConfigError& error) {
      EXPECT_EQ(error.what(), c.message);
    }
  }
  for (const char* loopback : {"127.0.0.1", "127.1.2.3", "::1", "localhost"}) {
    EXPECT_NO_THROW(parseServiceConfig(std::string("listen = ") + loopback, "wc.conf", "/"));
  }
  EXPECT_THROW(readServiceConfig("/nonexistent/wc.conf"), ConfigError);
}

TEST(ServiceConfigTest, SetUserPasswordKeepsEveryOtherLine) {
  const test::TemporaryDrive folder;
  const auto file = folder.path("wc.conf");
  const std::string before =
      "# Web Connector service\nport = 8080\n\n[user bob]\ncompany = C:\\B.qbw\n\n"
      "[user alice]\n# Alice's books\npassword = old\ncompany = C:\\A.qbw\n";
  test::writeFile(file, before);
  ::chmod(file.c_str(), 0644);

  setUserPassword(file, "bob", "s3cret", "C:\\Books\\Bob 2.qbw");
  setUserPassword(file, "alice", "w0rd", std::nullopt);
  setUserPassword(file, "carol", "pass", std::nullopt);

  const auto config = readServiceConfig(file);
  const auto hash = [&](const char* user) { return config.user(user)->passwordHash; };
  EXPECT_EQ(test::readFile(file),
            "# Web Connector service\nport = 8080\n\n[user bob]\n"
            "company = C:\\Books\\Bob 2.qbw\npassword = " +
                hash("bob") + "\n\n[user alice]\n# Alice's books\npassword = " + hash("alice") +
                "\ncompany = C:\\A.qbw\n\n[user carol]\npassword = " + hash("carol") + "\n");
  EXPECT_TRUE(passwordMatches(hash("bob"), "s3cret"));
  EXPECT_FALSE(passwordMatches(hash("bob"), "w0rd"));
  EXPECT_TRUE(passwordMatches(hash("alice"), "w0rd"));

  struct stat status {};
  ASSERT_EQ(::stat(file.c_str(), &status), 0);
  EXPECT_EQ(status.st_mode & 0777, 0600u);
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder.path("")),
                          std::filesystem::directory_iterator()),
            1);  // no temporary file left behind

  EXPECT_THROW(setUserPassword(file, "eve]", "x", std::nullopt), ConfigError);
  EXPECT_THROW(setUserPassword(folder.path("none/wc.conf"), "eve", "x", std::nullopt), ConfigError);
}

TEST(ServiceConfigTest, PasswordHashesVerifyOnlyTheirPassword) {
  const std::string hash = hashPassword("correct horse", HashCost::Cheap);
  EXPECT_EQ(hash.rfind("$argon2id$", 0), 0u);
  EXPECT_NE(hash, hashPassword("correct horse", HashCost::Cheap));  // salted
  EXPECT_TRUE(passwordMatches(hash, "correct horse"));
  for (const char* wrong : {"correct horse ", "", "Correct horse"}) {
    EXPECT_FALSE(passwordMatches(hash, wrong)) << wrong;
  }
  for (const std::string& malformed :
       {std::string(), std::string("correct horse"), hash.substr(0, hash.size() - 4),
        std::string("$argon2id$v=19$m=x,t=1,p=1$AAAA$AAAA"), std::string(500, '$')}) {
    EXPECT_FALSE(passwordMatches(malformed, "correct horse")) << malformed;
  }
}

}  // namespace
}  // namespace droqbxml::webconnector

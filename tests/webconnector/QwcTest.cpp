// The .qwc file the Web Connector imports: its whole text, the URLs it derives, the
// AppURLs it refuses, and fresh GUIDs.
#include <gtest/gtest.h>

#include <regex>
#include <stdexcept>
#include <string>

#include "webconnector/Qwc.hpp"

namespace droqbxml::webconnector {
namespace {

QwcOptions options(const std::string& url) {
  QwcOptions result;
  result.appName = "R&D <Jobs>";
  result.appUrl = url;
  result.userName = "alice";
  result.ownerId = "{57F3B9B1-86F1-4FCC-B1EE-566DE1813D20}";
  result.fileId = "{90A44FB5-33D9-4815-AC85-BC87A7E7D1EB}";
  return result;
}

TEST(QwcTest, WritesTheWholeFile) {
  EXPECT_EQ(qwcText(options("https://books.example.com:8443/qbwc")),
            "<?xml version=\"1.0\"?>\r\n"
            "<QBWCXML>\r\n"
            "  <AppName>R&amp;D &lt;Jobs&gt;</AppName>\r\n"
            "  <AppID></AppID>\r\n"
            "  <AppURL>https://books.example.com:8443/qbwc</AppURL>\r\n"
            "  <AppDescription>DroQbXml job costing</AppDescription>\r\n"
            "  <AppSupport>https://books.example.com:8443/</AppSupport>\r\n"
            "  <CertURL>https://books.example.com:8443</CertURL>\r\n"
            "  <UserName>alice</UserName>\r\n"
            "  <OwnerID>{57F3B9B1-86F1-4FCC-B1EE-566DE1813D20}</OwnerID>\r\n"
            "  <FileID>{90A44FB5-33D9-4815-AC85-BC87A7E7D1EB}</FileID>\r\n"
            "  <QBType>QBFS</QBType>\r\n"
            "  <Scheduler>\r\n"
            "    <RunEveryNMinutes>1</RunEveryNMinutes>\r\n"
            "  </Scheduler>\r\n"
            "  <IsReadOnly>false</IsReadOnly>\r\n"
            "</QBWCXML>\r\n");

  // Plain HTTP on localhost: no CertURL; no schedule when none is asked for.
  auto local = options("http://localhost/qbwc");
  local.everyMinutes = 0;
  local.supportUrl = "http://localhost/help";
  const std::string text = qwcText(local);
  EXPECT_NE(text.find("  <AppSupport>http://localhost/help</AppSupport>\r\n"
                      "  <UserName>alice</UserName>\r\n"),
            std::string::npos);
  EXPECT_EQ(text.find("Scheduler"), std::string::npos);

  auto certified = options("HTTPS://[::1]:9443");
  certified.certUrl = "https://certs.example.com";
  EXPECT_NE(qwcText(certified).find("<AppSupport>HTTPS://[::1]:9443/</AppSupport>\r\n"
                                    "  <CertURL>https://certs.example.com</CertURL>"),
            std::string::npos);
}

TEST(QwcTest, RefusesWhatTheWebConnectorWouldRefuse) {
  const struct {
    std::string url;
    std::string user;
    int minutes;
    std::string message;
  } cases[] = {
      {"ftp://host/qbwc", "alice", 1,
       "the AppURL must start with https:// (or http:// for localhost): 'ftp://host/qbwc'"},
      {"http://books.example.com/qbwc", "alice", 1,
       "the Web Connector takes http:// only for localhost; use https:// in "
       "'http://books.example.com/qbwc'"},
      {"http://localhost.evil.example/", "alice", 1,
       "the Web Connector takes http:// only for localhost; use https:// in "
       "'http://localhost.evil.example/'"},
      {"https://[::1/qbwc", "alice", 1, "the AppURL names no host: 'https://[::1/qbwc'"},
      {"https://localhost/qbwc", "", 1, "the .qwc file needs a user name"},
      {"https://localhost/qbwc", "alice", -1, "the Web Connector cannot run every -1 minutes"},
  };
  for (const auto& c : cases) {
    auto refused = options(c.url);
    refused.userName = c.user;
    refused.everyMinutes = c.minutes;
    try {
      qwcText(refused);
      ADD_FAILURE() << "accepted " << c.url;
    } catch (const std::invalid_argument& error) {
      EXPECT_EQ(error.what(), c.message);
    }
  }
  EXPECT_NO_THROW(qwcText(options("http://127.0.0.1:8080/qbwc")));
}

TEST(QwcTest, FreshGuidsAreVersionFour) {
  const std::regex layout(
      "\\{[0-9A-F]{8}-[0-9A-F]{4}-4[0-9A-F]{3}-[89AB][0-9A-F]{3}-[0-9A-F]{12}\\}");
  const std::string first = newGuid();
  EXPECT_TRUE(std::regex_match(first, layout)) << first;
  EXPECT_NE(first, newGuid());
  auto fresh = options("https://localhost/qbwc");
  fresh.ownerId.clear();
  const std::string text = qwcText(fresh);
  const auto owner = text.find("<OwnerID>") + 9;
  EXPECT_TRUE(std::regex_match(text.substr(owner, 38), layout));
}

}  // namespace
}  // namespace droqbxml::webconnector

// webconnector passwd and qwc beyond what the command table shows: the stored hash verifies
// the password as typed (line end stripped), and the .qwc file carries the file's settings.
#include <gtest/gtest.h>

#include "tests/TestSupport.hpp"
#include "tests/cli/CliRunner.hpp"
#include "webconnector/ServiceConfig.hpp"

namespace droqbxml {
namespace {

TEST(CliWebConnectorTest, PasswdStoresAHashOfThePasswordAndQwcUsesTheFile) {
  const test::TemporaryDrive folder;
  const std::string file = folder.path("wc.conf").string();
  test::writeFile(file, "port = 8090\npath = /wc\napp-name = Jobs\n");
  ASSERT_EQ(
      test::runCli({"webconnector", "passwd", "--config", file, "alice"}, "pa ss\r\nx\n").code, 0);
  const auto config = webconnector::readServiceConfig(file);
  EXPECT_TRUE(webconnector::passwordMatches(config.user("alice")->passwordHash, "pa ss"));

  const auto qwc =
      test::runCli({"webconnector", "qwc", "--config", file, "alice", "--every", "5"}, "");
  for (const char* line :
       {"<AppName>Jobs</AppName>\r\n", "<AppURL>http://127.0.0.1:8090/wc</AppURL>",
        "<UserName>alice</UserName>", "<RunEveryNMinutes>5<"}) {
    EXPECT_NE(qwc.out.find(line), std::string::npos) << line;
  }
}

}  // namespace
}  // namespace droqbxml

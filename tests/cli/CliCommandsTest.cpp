// The droqbxml command end to end against the embedded stand-in, as a table of commands with
// their exit codes and both output streams (testdata/cli/commands.txt). The cases run in
// order in one temporary drive C:, so a company file made by one case serves the next; the
// stand-in's clock is fixed so that its answers are the same on every run.
//
// Table: "## title", then "$ args" (double quotes group words; "@cat FILE" prints a file;
// {drive}, {testdata} and {shared} stand for the folders),
// "< line" of standard input, "= code", "> line" of standard output, "! line" of standard
// error, "~ text" for output that need only contain the text. DROQBXML_WRITE_GOLDENS=1
// rewrites the outputs from what the command printed.
#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <optional>
#include <sstream>

#include "cli/Cli.hpp"
#include "droqbxml/connection/RequestProcessor.hpp"
#include "simulator/Simulator.hpp"
#include "tests/TestSupport.hpp"
#include "tests/cli/CliRunner.hpp"

namespace droqbxml {
namespace {

constexpr const char* kNoLineEnd = "\\ no final line end";

struct Case {
  std::string title;
  std::string command;
  std::string input;
  int code = 0;
  std::string out;
  std::string err;
  std::vector<std::string> contains;
};

std::vector<std::string> words(const std::string& line) {
  std::vector<std::string> result;
  std::string word;
  bool quoted = false;
  bool any = false;
  for (const char c : line) {
    if (c == '"') {
      quoted = !quoted;
      any = true;
    } else if (c == ' ' && !quoted) {
      if (any) result.push_back(word);
      word.clear();
      any = false;
    } else {
      word += c;
      any = true;
    }
  }
  if (any) result.push_back(word);
  return result;
}

std::vector<Case> readCases(const std::string& table) {
  std::vector<Case> cases;
  std::istringstream lines(table);
  std::string line;
  while (std::getline(lines, line)) {
    if (line.rfind("## ", 0) == 0) {
      cases.emplace_back();
      cases.back().title = line.substr(3);
      continue;
    }
    if (line.size() < 2 || cases.empty()) continue;
    Case& current = cases.back();
    const std::string rest = line.substr(2);
    if (rest == kNoLineEnd) {
      std::string& text = line[0] == '>' ? current.out : current.err;
      if (!text.empty()) text.pop_back();
      continue;
    }
    switch (line[0]) {
      case '$':
        current.command = rest;
        break;
      case '<':
        current.input += rest + "\n";
        break;
      case '=':
        current.code = std::stoi(rest);
        break;
      case '>':
        current.out += rest + "\n";
        break;
      case '!':
        current.err += rest + "\n";
        break;
      case '~':
        current.contains.push_back(rest);
        break;
      default:
        break;
    }
  }
  return cases;
}

std::string prefixed(const std::string& text, const std::string& prefix) {
  std::string result;
  std::istringstream lines(text);
  std::string line;
  while (std::getline(lines, line)) result += prefix + line + "\n";
  if (!text.empty() && text.back() != '\n') result += prefix + kNoLineEnd + "\n";
  return result;
}

std::string replaced(std::string text, const std::string& from, const std::string& to) {
  for (size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size())) {
    text.replace(at, from.size(), to);
  }
  return text;
}

// xmllint's verdict on a document, or nothing when xmllint is missing.
std::optional<bool> wellFormed(const std::string& document) {
  if (std::system("xmllint --version > /dev/null 2>&1") != 0) return std::nullopt;
  const auto file = std::filesystem::temp_directory_path() /
                    ("droqbxml-cli-" + std::to_string(::getpid()) + ".xml");
  test::writeFile(file, document);
  const int status = std::system(("xmllint --noout '" + file.string() + "' 2>/dev/null").c_str());
  std::filesystem::remove(file);
  return status == 0;
}

class CliCommandsTest : public ::testing::Test {
 protected:
  void SetUp() override {
    unregisterRequestProcessor(kRequestProcessorProgId);
    ::setenv("DROQBXML_SIMULATOR_NOW", "2026-03-02T10:40:23-05:00", 1);
  }
  void TearDown() override {
    ::unsetenv("DROQBXML_SIMULATOR_NOW");
    unregisterRequestProcessor(kRequestProcessorProgId);
    unregisterRequestProcessor(simulator::kSimulatorProgId);
  }

  // The drive folder and the shared facts folder stand as {drive} and {shared}.
  std::string expand(const std::string& text) const {
    return replaced(replaced(replaced(text, "{drive}", root()), "{shared}", DROQBXML_SHARED_DIR),
                    "{testdata}", DROQBXML_TESTDATA_DIR);
  }
  std::string unexpand(const std::string& text) const {
    return replaced(replaced(text, root(), "{drive}"), DROQBXML_TESTDATA_DIR, "{testdata}");
  }
  std::string root() const { return drive_.path("x").parent_path().string(); }

  test::CliResult run(const Case& c) {
    std::vector<std::string> args = words(expand(c.command));
    if (!args.empty() && args[0] == "@cat") {
      return {0, test::readFile(args.at(1)), ""};
    }
    return test::runCli(args, expand(c.input));
  }

  test::TemporaryDrive drive_;
};

TEST_F(CliCommandsTest, EveryCommandOfTheTable) {
  const std::string path = std::string(DROQBXML_TESTDATA_DIR) + "/cli/commands.txt";
  std::vector<Case> cases = readCases(test::readFile(path));
  ASSERT_GT(cases.size(), 10u);
  const char* write = std::getenv("DROQBXML_WRITE_GOLDENS");
  std::string rewritten;
  for (Case& c : cases) {
    const test::CliResult result = run(c);
    const std::string out = unexpand(result.out);
    const std::string err = unexpand(result.err);
    if (write != nullptr && *write == '1') {
      rewritten += "## " + c.title + "\n$ " + c.command + "\n" + prefixed(c.input, "< ") + "= " +
                   std::to_string(result.code) + "\n";
      for (const auto& text : c.contains) rewritten += "~ " + text + "\n";
      if (c.contains.empty()) rewritten += prefixed(out, "> ");
      rewritten += prefixed(err, "! ") + "\n";
      continue;
    }
    SCOPED_TRACE(c.title + ": " + c.command);
    EXPECT_EQ(result.code, c.code) << err;
    EXPECT_EQ(err, c.err);
    if (c.contains.empty()) {
      EXPECT_EQ(out, c.out);
    } else {
      for (const auto& text : c.contains) EXPECT_NE(out.find(text), std::string::npos) << text;
    }
    // What send and query print is a well-formed document, entities intact.
    if (!c.command.starts_with("@cat") && result.out.find("<QBXMLMsgsRs>") != std::string::npos &&
        wellFormed(result.out) == false) {
      ADD_FAILURE() << "xmllint refuses the output";
    }
  }
  if (write != nullptr && *write == '1') test::writeFile(path, rewritten);
}

}  // namespace
}  // namespace droqbxml

// Runs the droqbxml command in-process with given arguments and input, keeping its exit
// code and both output streams.
#ifndef DROQBXML_TESTS_CLI_CLIRUNNER_HPP_
#define DROQBXML_TESTS_CLI_CLIRUNNER_HPP_

#include <sstream>
#include <string>
#include <vector>

#include "cli/Cli.hpp"

namespace droqbxml::test {

struct CliResult {
  int code;
  std::string out;
  std::string err;
};

inline CliResult runCli(std::vector<std::string> args, const std::string& input = "") {
  args.insert(args.begin(), "droqbxml");
  std::vector<const char*> argv;
  for (const auto& a : args) argv.push_back(a.c_str());
  std::istringstream in(input);
  std::ostringstream out;
  std::ostringstream err;
  const int code = cli::run(static_cast<int>(argv.size()), argv.data(), in, out, err);
  return {code, out.str(), err.str()};
}

}  // namespace droqbxml::test

#endif  // DROQBXML_TESTS_CLI_CLIRUNNER_HPP_

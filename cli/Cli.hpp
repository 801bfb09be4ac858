// The droqbxml command as a function, so that tests can run it in-process against a
// processor they register. main() only forwards to it.
#ifndef DROQBXML_CLI_CLI_HPP_
#define DROQBXML_CLI_CLI_HPP_

#include <iosfwd>

namespace droqbxml::cli {

// Exit codes a script can test.
inline constexpr int kExitSuccess = 0;
inline constexpr int kExitNotSuccess = 1;  // QuickBooks answered with another status
inline constexpr int kExitUsage = 2;
inline constexpr int kExitConnection = 3;  // no processor, connection or session failure

// Runs one command line; returns one of the exit codes above, whatever happens (a failure
// nothing expected is reported in one line and ends with kExitConnection).
int run(int argc, const char* const* argv, std::istream& in, std::ostream& out, std::ostream& err);

}  // namespace droqbxml::cli

#endif  // DROQBXML_CLI_CLI_HPP_

// webconnector passwd and webconnector qwc: the commands that set a Web Connector user's
// password in the service's configuration file and write the .qwc file a QuickBooks
// administrator imports into the Web Connector.
#include <fcntl.h>
#include <termios.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <cstring>
#include <iostream>
#include <stdexcept>

#include "cli/Cli.hpp"
#include "cli/Commands.hpp"
#include "webconnector/Qwc.hpp"
#include "webconnector/ServiceConfig.hpp"

namespace droqbxml::cli {
namespace {

using webconnector::ConfigError;

// Turns off the terminal's echo while it lives, when the input is the terminal itself.
class HiddenInput {
 public:
  explicit HiddenInput(const Io& io) {
    if (&io.in != &std::cin || !::isatty(STDIN_FILENO)) return;
    if (::tcgetattr(STDIN_FILENO, &saved_) != 0) return;
    termios quiet = saved_;
    quiet.c_lflag &= ~static_cast<tcflag_t>(ECHO);
    active_ = ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &quiet) == 0;
  }
  ~HiddenInput() {
    if (active_) ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &saved_);
  }
  HiddenInput(const HiddenInput&) = delete;
  HiddenInput& operator=(const HiddenInput&) = delete;

  bool active() const { return active_; }

 private:
  termios saved_{};
  bool active_ = false;
};

bool validUserName(const std::string& user) {
  return !user.empty() && std::none_of(user.begin(), user.end(),
                                       [](unsigned char c) { return c == ']' || std::isspace(c); });
}

std::string readPassword(Io io, const std::string& user) {
  std::string password;
  const HiddenInput hidden(io);
  if (hidden.active()) io.err << "Password for " << user << ": " << std::flush;
  std::getline(io.in, password);
  if (hidden.active()) io.err << '\n';
  while (!password.empty() && (password.back() == '\r' || password.back() == '\n')) {
    password.pop_back();
  }
  return password;
}

// The host part of the default AppURL: the listen address, the machine's name for an
// address that listens everywhere, and localhost for plain HTTP, which the Web Connector
// takes only there (the configuration allows plain HTTP on loopback addresses alone).
std::string urlHost(const webconnector::ServiceConfig& config) {
  if (!config.secure()) return config.listen == "127.0.0.1" ? config.listen : "localhost";
  if (config.listen == "0.0.0.0" || config.listen == "::") {
    char name[256] = {};
    if (::gethostname(name, sizeof name - 1) == 0 && name[0] != '\0') return name;
    return "localhost";
  }
  if (config.listen.find(':') != std::string::npos) return "[" + config.listen + "]";
  return config.listen;
}

bool writeNewFile(const std::string& file, const std::string& text, std::string& problem) {
  const int fd = ::open(file.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0644);
  if (fd < 0) {
    problem = errno == EEXIST ? "already exists" : std::strerror(errno);
    return false;
  }
  size_t done = 0;
  while (done < text.size()) {
    const ssize_t count = ::write(fd, text.data() + done, text.size() - done);
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) break;
    done += static_cast<size_t>(count);
  }
  const bool complete = done == text.size();
  if (!complete) problem = std::strerror(errno);
  if (::close(fd) != 0 && complete) {
    problem = std::strerror(errno);
    return false;
  }
  return complete;
}

}  // namespace

int webConnectorPasswdCommand(Io io, const std::string& configFile, const std::string& user,
                              const std::optional<std::string>& company) {
  if (!validUserName(user)) {
    io.err << "droqbxml: a user name cannot be empty or hold white space or ']'\n";
    return kExitUsage;
  }
  const std::string password = readPassword(io, user);
  if (password.empty()) {
    io.err << "droqbxml: the password cannot be empty\n";
    return kExitUsage;
  }
  try {
    webconnector::setUserPassword(configFile, user, password, company);
  } catch (const ConfigError& error) {
    io.err << "droqbxml: " << error.what() << '\n';
    return kExitUsage;
  }
  io.out << "password set for " << user << " in " << configFile << '\n';
  return kExitSuccess;
}

int webConnectorQwcCommand(Io io, const std::string& configFile, const std::string& user,
                           const std::optional<std::string>& appUrl, int everyMinutes,
                           const std::optional<std::string>& output) {
  std::string text;
  try {
    const auto config = webconnector::readServiceConfig(configFile);
    if (!config.user(user)) {
      io.err << "droqbxml: " << configFile << " has no user '" << user << "'\n";
      return kExitUsage;
    }
    webconnector::QwcOptions options;
    options.appName = config.appName;
    options.appUrl = appUrl.value_or((config.secure() ? "https://" : "http://") + urlHost(config) +
                                     ":" + std::to_string(config.port) + config.path);
    options.userName = user;
    options.everyMinutes = everyMinutes;
    text = webconnector::qwcText(options);
  } catch (const ConfigError& error) {
    io.err << "droqbxml: " << error.what() << '\n';
    return kExitUsage;
  } catch (const std::invalid_argument& error) {
    io.err << "droqbxml: " << error.what() << '\n';
    return kExitUsage;
  }
  if (!output) {
    io.out << text;
    return kExitSuccess;
  }
  std::string problem;
  if (!writeNewFile(*output, text, problem)) {
    io.err << "droqbxml: " << *output << ": " << problem << '\n';
    return kExitUsage;
  }
  io.out << "wrote " << *output << " for " << user << '\n';
  return kExitSuccess;
}

}  // namespace droqbxml::cli

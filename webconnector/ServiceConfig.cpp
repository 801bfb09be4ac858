// The Web Connector service's configuration file: parsing it line by line into a
// ServiceConfig, rewriting one user's password in place, and the Argon2id password hashes.
#include "webconnector/ServiceConfig.hpp"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cstring>
#include <fstream>
#include <iterator>

#include "webconnector/internal/Sodium.hpp"

namespace droqbxml::webconnector {
namespace {

constexpr uint64_t kMostUnits = 1000000;  // minutes, seconds or kilobytes

std::string_view trim(std::string_view text) {
  const size_t first = text.find_first_not_of(" \t");
  if (first == std::string_view::npos) return {};
  return text.substr(first, text.find_last_not_of(" \t") - first + 1);
}

// The file's lines without their line ends (LF or CR LF).
std::vector<std::string_view> splitLines(std::string_view text) {
  std::vector<std::string_view> lines;
  while (!text.empty()) {
    const size_t end = text.find('\n');
    std::string_view line = text.substr(0, end);
    if (!line.empty() && line.back() == '\r') line.remove_suffix(1);
    lines.push_back(line);
    if (end == std::string_view::npos) break;
    text.remove_prefix(end + 1);
  }
  return lines;
}

bool validUserName(std::string_view name) {
  return !name.empty() && std::none_of(name.begin(), name.end(), [](char c) {
    return c == ']' || c == ' ' || c == '\t' || c == '\r' || c == '\n' || c == '\v' || c == '\f';
  });
}

// The user a trimmed line opens a section for, "" for a line starting with '[' that is not
// a well-formed [user NAME], nothing for any other line.
std::optional<std::string> sectionUser(std::string_view line) {
  if (line.empty() || line.front() != '[') return std::nullopt;
  if (line.back() != ']') return std::string();
  const std::string_view inner = trim(line.substr(1, line.size() - 2));
  if (inner.substr(0, 4) != "user" || inner.size() < 6 || (inner[4] != ' ' && inner[4] != '\t')) {
    return std::string();
  }
  const std::string_view name = trim(inner.substr(5));
  return validUserName(name) ? std::string(name) : std::string();
}

// The key of a "key = value" line, trimmed; nothing when the line has no '='.
std::optional<std::string_view> keyOf(std::string_view line) {
  const size_t equals = line.find('=');
  if (equals == std::string_view::npos) return std::nullopt;
  return trim(line.substr(0, equals));
}

bool isLoopback(const std::string& address) {
  if (address == "localhost") return true;
  in_addr v4{};
  if (::inet_pton(AF_INET, address.c_str(), &v4) == 1) {
    return (ntohl(v4.s_addr) >> 24) == 127;
  }
  in6_addr v6{};
  return ::inet_pton(AF_INET6, address.c_str(), &v6) == 1 && IN6_IS_ADDR_LOOPBACK(&v6);
}

class Parser {
 public:
  Parser(std::string_view origin, const std::filesystem::path& folder)
      : origin_(origin), folder_(folder) {}

  ServiceConfig parse(std::string_view text) {
    const auto lines = splitLines(text);
    for (size_t index = 0; index < lines.size(); ++index) {
      line_ = index + 1;
      const std::string_view line = trim(lines[index]);
      if (line.empty() || line.front() == '#') continue;
      if (const auto user = sectionUser(line)) {
        startUser(line, *user);
        continue;
      }
      const auto key = keyOf(line);
      if (!key) fail("expected 'setting = value', not '" + std::string(line) + "'");
      const std::string_view value = trim(line.substr(line.find('=') + 1));
      if (inUser_) {
        setUserValue(*key, value);
      } else {
        setValue(*key, value);
      }
    }
    finish();
    return std::move(config_);
  }

 private:
  [[noreturn]] void fail(const std::string& message, size_t line = 0) const {
    throw ConfigError(origin_ + ":" + std::to_string(line ? line : line_) + ": " + message);
  }

  void startUser(std::string_view line, const std::string& name) {
    if (name.empty()) fail("expected a section [user NAME], not '" + std::string(line) + "'");
    if (config_.user(name)) fail("user '" + name + "' appears twice");
    config_.users.push_back({name, {}, {}});
    inUser_ = true;
    userKeys_.clear();
  }

  void once(std::vector<std::string>& seen, std::string_view key) {
    if (std::find(seen.begin(), seen.end(), key) != seen.end()) {
      fail("'" + std::string(key) + "' is set twice");
    }
    seen.emplace_back(key);
  }

  void setUserValue(std::string_view key, std::string_view value) {
    ServiceUser& user = config_.users.back();
    if (key == "password") {
      user.passwordHash = value;
    } else if (key == "company") {
      user.companyFile = value;
    } else if (isGlobalKey(key)) {
      fail("'" + std::string(key) + "' belongs before the first [user NAME] section");
    } else {
      fail("unknown setting '" + std::string(key) + "'");
    }
    once(userKeys_, key);
  }

  static bool isGlobalKey(std::string_view key) {
    static constexpr std::string_view kKeys[] = {
        "listen",     "port",           "certificate",  "key",         "path",
        "relay-port", "ticket-minutes", "hold-seconds", "max-body-kb", "app-name"};
    return std::find(std::begin(kKeys), std::end(kKeys), key) != std::end(kKeys);
  }

  void setValue(std::string_view key, std::string_view value) {
    if (key == "password" || key == "company") {
      fail("'" + std::string(key) + "' belongs in a [user NAME] section");
    }
    if (!isGlobalKey(key)) fail("unknown setting '" + std::string(key) + "'");
    once(globalKeys_, key);
    if (value.empty()) fail(std::string(key) + " needs a value");
    if (key == "listen") {
      config_.listen = value;
      listenLine_ = line_;
    } else if (key == "port") {
      config_.port = port(key, value);
    } else if (key == "relay-port") {
      config_.relayPort = port(key, value);
    } else if (key == "certificate") {
      config_.certificate = anchored(value);
      certificateLine_ = line_;
    } else if (key == "key") {
      config_.privateKey = anchored(value);
      keyLine_ = line_;
    } else if (key == "path") {
      if (value.front() != '/') fail("path must start with '/', not '" + std::string(value) + "'");
      config_.path = value;
    } else if (key == "ticket-minutes") {
      config_.ticketLifetime = std::chrono::minutes(units(key, value));
    } else if (key == "hold-seconds") {
      config_.hold = std::chrono::seconds(units(key, value));
    } else if (key == "max-body-kb") {
      config_.maxBodyBytes = static_cast<size_t>(units(key, value)) * 1024;
    } else {
      config_.appName = value;
    }
  }

  uint64_t number(std::string_view value, uint64_t least, uint64_t most,
                  const std::string& complaint) const {
    uint64_t result = 0;
    const auto [end, error] = std::from_chars(value.data(), value.data() + value.size(), result);
    if (error != std::errc() || end != value.data() + value.size() || result < least ||
        result > most) {
      fail(complaint + ", not '" + std::string(value) + "'");
    }
    return result;
  }

  uint16_t port(std::string_view key, std::string_view value) const {
    return static_cast<uint16_t>(
        number(value, 1, 65535, std::string(key) + " must be a number from 1 to 65535"));
  }

  uint64_t units(std::string_view key, std::string_view value) const {
    return number(
        value, 1, kMostUnits,
        std::string(key) + " must be a whole number from 1 to " + std::to_string(kMostUnits));
  }

  std::string anchored(std::string_view value) const {
    return std::filesystem::absolute(folder_ / std::filesystem::path(value))
        .lexically_normal()
        .string();
  }

  void finish() const {
    if (certificateLine_ && !keyLine_) fail("a certificate needs a key as well", certificateLine_);
    if (keyLine_ && !certificateLine_) fail("a key needs a certificate as well", keyLine_);
    if (!config_.secure() && !isLoopback(config_.listen)) {
      fail("plain HTTP is refused on " + config_.listen +
               ": the Web Connector requires HTTPS except on localhost; set certificate and key",
           listenLine_);
    }
  }

  std::string origin_;
  std::filesystem::path folder_;
  ServiceConfig config_;
  size_t line_ = 0;
  size_t listenLine_ = 0;
  size_t certificateLine_ = 0;
  size_t keyLine_ = 0;
  bool inUser_ = false;
  std::vector<std::string> globalKeys_;
  std::vector<std::string> userKeys_;
};

std::string readWhole(const std::filesystem::path& file) {
  std::ifstream in(file, std::ios::binary);
  if (!in) throw ConfigError(file.string() + ": cannot read: " + std::strerror(errno));
  return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

// Replaces `file` with `text`: written to a temporary file beside it with owner-only
// permissions, then renamed over it, so that a reader sees the old file or the new one.
void replaceFile(const std::filesystem::path& file, const std::string& text) {
  const std::filesystem::path folder =
      file.has_parent_path() ? file.parent_path() : std::filesystem::path(".");
  std::string temporary = (folder / ("." + file.filename().string() + ".XXXXXX")).string();
  const auto failure = [&](const char* what) {
    return ConfigError(file.string() + ": cannot " + what + ": " + std::strerror(errno));
  };
  const int fd = ::mkstemp(temporary.data());
  if (fd < 0) throw failure("write");
  bool written = ::fchmod(fd, S_IRUSR | S_IWUSR) == 0;
  for (size_t done = 0; written && done < text.size();) {
    const ssize_t count = ::write(fd, text.data() + done, text.size() - done);
    if (count < 0 && errno == EINTR) continue;
    written = count > 0;
    if (written) done += static_cast<size_t>(count);
  }
  written = written && ::fsync(fd) == 0;
  written = ::close(fd) == 0 && written;
  if (!written || ::rename(temporary.c_str(), file.c_str()) != 0) {
    const ConfigError error = failure("write");
    ::unlink(temporary.c_str());
    throw error;
  }
}

}  // namespace

const ServiceUser* ServiceConfig::user(std::string_view name) const {
  const auto found = std::find_if(users.begin(), users.end(),
                                  [&](const ServiceUser& user) { return user.name == name; });
  return found == users.end() ? nullptr : &*found;
}

ServiceConfig parseServiceConfig(std::string_view text, std::string_view origin,
                                 const std::filesystem::path& folder) {
  return Parser(origin, folder).parse(text);
}

ServiceConfig readServiceConfig(const std::filesystem::path& file) {
  return parseServiceConfig(readWhole(file), file.string(), file.parent_path());
}

void setUserPassword(const std::filesystem::path& file, std::string_view user,
                     std::string_view password, const std::optional<std::string>& companyFile) {
  if (!validUserName(user)) {
    throw ConfigError(file.string() + ": a user name cannot be empty or hold white space or ']'");
  }
  if (companyFile && companyFile->find_first_of("\r\n") != std::string::npos) {
    throw ConfigError(file.string() + ": a company file path cannot hold a line end");
  }
  std::error_code missing;
  const std::string old = std::filesystem::exists(file, missing) ? readWhole(file) : std::string();
  const std::string lineEnd = old.find("\r\n") != std::string::npos ? "\r\n" : "\n";

  std::vector<std::string> lines;
  for (const auto line : splitLines(old)) lines.emplace_back(line);

  std::vector<std::pair<std::string, std::string>> wanted{{"password", hashPassword(password)}};
  if (companyFile) wanted.emplace_back("company", *companyFile);

  const auto header = std::find_if(lines.begin(), lines.end(), [&](const std::string& line) {
    return sectionUser(trim(line)) == std::string(user);
  });
  if (header == lines.end()) {
    if (!lines.empty() && !trim(lines.back()).empty()) lines.emplace_back();
    lines.push_back("[user " + std::string(user) + "]");
    for (const auto& [key, value] : wanted) lines.push_back(key + " = " + value);
  } else {
    const size_t first = static_cast<size_t>(header - lines.begin()) + 1;
    size_t end = first;
    while (end < lines.size() && !sectionUser(trim(lines[end]))) ++end;
    size_t last = first;  // after the section's last line that is not blank
    for (size_t at = first; at < end; ++at) {
      if (!trim(lines[at]).empty()) last = at + 1;
    }
    for (const auto& setting : wanted) {
      const std::string& key = setting.first;
      const std::string line = key + " = " + setting.second;
      const auto found = std::find_if(lines.begin() + static_cast<std::ptrdiff_t>(first),
                                      lines.begin() + static_cast<std::ptrdiff_t>(end),
                                      [&](const std::string& l) { return keyOf(trim(l)) == key; });
      if (found != lines.begin() + static_cast<std::ptrdiff_t>(end)) {
        *found = line;
      } else {
        lines.insert(lines.begin() + static_cast<std::ptrdiff_t>(last++), line);
        ++end;
      }
    }
  }
  std::string text;
  for (const auto& line : lines) text += line + lineEnd;
  replaceFile(file, text);
}

std::string hashPassword(std::string_view password, HashCost cost) {
  internal::requireSodium();
  const bool cheap = cost == HashCost::Cheap;
  char hash[crypto_pwhash_STRBYTES];
  if (crypto_pwhash_str(hash, password.data(), password.size(),
                        cheap ? crypto_pwhash_OPSLIMIT_MIN : crypto_pwhash_OPSLIMIT_INTERACTIVE,
                        cheap ? crypto_pwhash_MEMLIMIT_MIN : crypto_pwhash_MEMLIMIT_INTERACTIVE) !=
      0) {
    throw std::runtime_error("the password cannot be hashed: out of memory");
  }
  return hash;
}

bool passwordMatches(std::string_view hash, std::string_view password) {
  if (hash.empty() || hash.size() >= crypto_pwhash_STRBYTES) return false;
  internal::requireSodium();
  const std::string terminated(hash);
  return crypto_pwhash_str_verify(terminated.c_str(), password.data(), password.size()) == 0;
}

}  // namespace droqbxml::webconnector

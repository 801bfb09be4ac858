// The Web Connector service's configuration file: where it listens, its certificate, its
// limits, and its users, each with a password hash and the company file the user's Web
// Connector serves. Passwords are kept only as Argon2id hashes (libsodium).
//
//   # comment
//   listen = 127.0.0.1          address to listen on (HTTP without a certificate is
//   port = 8080                 refused anywhere but loopback)
//   certificate = server.pem    both or neither; relative paths are from the file's folder
//   key = server.key
//   path = /qbwc                the URL path the Web Connector posts to
//   relay-port = 7372           loopback port where hosts reach the service
//   ticket-minutes = 30         a ticket's life from authenticate
//   hold-seconds = 10           how long a Web Connector call waits for the host's next step
//   max-body-kb = 102400        the largest request body accepted (a response from
//                               QuickBooks to a large query comes as one)
//   app-name = DroQbXml         the name written into .qwc files
//
//   [user alice]
//   password = $argon2id$v=19$m=...
//   company = C:\Companies\Job Costing.qbw
#ifndef DROQBXML_WEBCONNECTOR_SERVICECONFIG_HPP_
#define DROQBXML_WEBCONNECTOR_SERVICECONFIG_HPP_

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace droqbxml::webconnector {

struct ServiceUser {
  std::string name;
  std::string passwordHash;  // empty: the user cannot log in yet
  std::string companyFile;   // empty: the company file open in QuickBooks
};

struct ServiceConfig {
  std::string listen = "127.0.0.1";
  uint16_t port = 8080;
  std::string certificate;  // absolute once read
  std::string privateKey;
  std::string path = "/qbwc";
  uint16_t relayPort = 7372;
  std::chrono::seconds ticketLifetime{30 * 60};
  std::chrono::milliseconds hold{std::chrono::seconds(10)};
  size_t maxBodyBytes = 100 * 1024 * 1024;
  std::string appName = "DroQbXml";
  std::vector<ServiceUser> users;

  const ServiceUser* user(std::string_view name) const;
  bool secure() const { return !certificate.empty(); }
};

// A file that cannot be read, or a line that is not understood: the message names the file
// and the line ("wc.conf:7: unknown setting 'prot'").
class ConfigError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

// `origin` names the text in messages; `folder` anchors relative certificate paths.
ServiceConfig parseServiceConfig(std::string_view text, std::string_view origin,
                                 const std::filesystem::path& folder);
ServiceConfig readServiceConfig(const std::filesystem::path& file);

// Sets `user`'s password (and company file, when given) in the file, adding the user's
// section, or the file, when missing; every other line stays as it was. The file is
// replaced whole, with owner-only permissions.
void setUserPassword(const std::filesystem::path& file, std::string_view user,
                     std::string_view password, const std::optional<std::string>& companyFile);

// Cheap is for tests only: the hash of a stored password uses the interactive cost.
enum class HashCost { Interactive, Cheap };
std::string hashPassword(std::string_view password, HashCost cost = HashCost::Interactive);
// False for a wrong password and for a hash that is not one.
bool passwordMatches(std::string_view hash, std::string_view password);

}  // namespace droqbxml::webconnector

#endif  // DROQBXML_WEBCONNECTOR_SERVICECONFIG_HPP_

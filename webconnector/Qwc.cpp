// The .qwc file: the QBWCXML document that tells the Web Connector where this service is,
// which user it logs in as and how often to run, with fresh random identifiers.
#include "webconnector/Qwc.hpp"

#include <array>
#include <cstdint>
#include <cstdio>
#include <stdexcept>
#include <string_view>

#include "webconnector/Soap.hpp"
#include "webconnector/internal/Sodium.hpp"

namespace droqbxml::webconnector {
namespace {

constexpr std::string_view kLineEnd = "\r\n";

std::string lower(std::string_view text) {
  std::string out(text);
  for (char& c : out) {
    if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
  }
  return out;
}

// The AppURL's "scheme://host[:port]"; std::invalid_argument for one the Web Connector
// would refuse.
std::string origin(const std::string& url) {
  const std::string folded = lower(url);
  const bool secure = folded.rfind("https://", 0) == 0;
  if (!secure && folded.rfind("http://", 0) != 0) {
    throw std::invalid_argument(
        "the AppURL must start with https:// (or http:// for localhost): '" + url + "'");
  }
  const size_t hostStart = url.find("://") + 3;
  const size_t hostEnd = url.find_first_of("/?#", hostStart);
  const std::string authority = url.substr(hostStart, hostEnd - hostStart);
  std::string host = lower(authority);
  // "[::1]:8080" keeps its brackets; a bracket never closed leaves no host.
  host =
      host.rfind('[', 0) == 0 ? host.substr(0, host.find(']') + 1) : host.substr(0, host.find(':'));
  if (host.empty() || authority.find('@') != std::string::npos) {
    throw std::invalid_argument("the AppURL names no host: '" + url + "'");
  }
  if (!secure && host != "localhost" && host != "127.0.0.1") {
    throw std::invalid_argument(
        "the Web Connector takes http:// only for localhost; use https:// in '" + url + "'");
  }
  return url.substr(0, hostEnd);
}

void element(std::string& out, int indent, std::string_view name, std::string_view text) {
  out.append(static_cast<size_t>(indent), ' ');
  appendXmlElement(out, name, text);
  out += kLineEnd;
}

void line(std::string& out, int indent, std::string_view text) {
  out.append(static_cast<size_t>(indent), ' ');
  out += text;
  out += kLineEnd;
}

}  // namespace

std::string newGuid() {
  internal::requireSodium();
  std::array<unsigned char, 16> bytes{};
  randombytes_buf(bytes.data(), bytes.size());
  bytes[6] = static_cast<unsigned char>((bytes[6] & 0x0F) | 0x40);  // version 4
  bytes[8] = static_cast<unsigned char>((bytes[8] & 0x3F) | 0x80);  // RFC 4122 variant
  std::string guid = "{";
  for (size_t i = 0; i < bytes.size(); ++i) {
    if (i == 4 || i == 6 || i == 8 || i == 10) guid += '-';
    char pair[3];
    std::snprintf(pair, sizeof pair, "%02X", bytes[i]);
    guid += pair;
  }
  return guid + "}";
}

std::string qwcText(const QwcOptions& options) {
  const std::string base = origin(options.appUrl);
  if (options.userName.empty()) throw std::invalid_argument("the .qwc file needs a user name");
  if (options.everyMinutes < 0) {
    throw std::invalid_argument("the Web Connector cannot run every " +
                                std::to_string(options.everyMinutes) + " minutes");
  }
  const bool secure = lower(base).rfind("https://", 0) == 0;
  std::string out;
  line(out, 0, "<?xml version=\"1.0\"?>");
  line(out, 0, "<QBWCXML>");
  element(out, 2, "AppName", options.appName);
  element(out, 2, "AppID", "");
  element(out, 2, "AppURL", options.appUrl);
  element(out, 2, "AppDescription", options.description);
  element(out, 2, "AppSupport", options.supportUrl.empty() ? base + "/" : options.supportUrl);
  if (secure) element(out, 2, "CertURL", options.certUrl.empty() ? base : options.certUrl);
  element(out, 2, "UserName", options.userName);
  element(out, 2, "OwnerID", options.ownerId.empty() ? newGuid() : options.ownerId);
  element(out, 2, "FileID", options.fileId.empty() ? newGuid() : options.fileId);
  element(out, 2, "QBType", options.qbType);
  if (options.everyMinutes > 0) {
    line(out, 2, "<Scheduler>");
    element(out, 4, "RunEveryNMinutes", std::to_string(options.everyMinutes));
    line(out, 2, "</Scheduler>");
  }
  element(out, 2, "IsReadOnly", "false");
  line(out, 0, "</QBWCXML>");
  return out;
}

}  // namespace droqbxml::webconnector

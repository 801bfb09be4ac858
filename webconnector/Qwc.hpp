// The .qwc file a QuickBooks administrator imports into the Web Connector to add this
// service, and the fresh identifiers it needs.
#ifndef DROQBXML_WEBCONNECTOR_QWC_HPP_
#define DROQBXML_WEBCONNECTOR_QWC_HPP_

#include <string>

namespace droqbxml::webconnector {

struct QwcOptions {
  std::string appName = "DroQbXml";
  std::string appUrl;   // https://host:port/qbwc (http only for localhost)
  std::string certUrl;  // empty: the AppURL's scheme, host and port
  std::string description = "DroQbXml job costing";
  std::string supportUrl;  // empty: the AppURL's scheme, host and port
  std::string userName;
  std::string ownerId;  // empty: a fresh GUID
  std::string fileId;   // empty: a fresh GUID
  std::string qbType = "QBFS";
  int everyMinutes = 1;  // 0: no scheduler element
};

// A GUID from the system's cryptographic random source: "{XXXXXXXX-XXXX-4XXX-YXXX-...}".
std::string newGuid();

// The file's text (UTF-8, CR LF line ends as the Web Connector writes its own).
std::string qwcText(const QwcOptions& options);

}  // namespace droqbxml::webconnector

#endif  // DROQBXML_WEBCONNECTOR_QWC_HPP_

// The Web Connector's SOAP 1.1 messages (document/literal, namespace
// "http://developer.intuit.com/"): reading a call or an answer safely (no DTD, no entity
// of any kind but XML's five and character references, bounded depth) and writing both.
// Texts are UTF-8.
#ifndef DROQBXML_WEBCONNECTOR_SOAP_HPP_
#define DROQBXML_WEBCONNECTOR_SOAP_HPP_

#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace droqbxml::webconnector {

inline constexpr std::string_view kIntuitNamespace = "http://developer.intuit.com/";

// What a SOAP body carries: the local name of the body's one element in Intuit's namespace
// ("authenticate", "sendRequestXMLResponse"), the text of each of its child elements by
// local name in document order, and the texts of the <string> elements inside a child (an
// ArrayOfString result), in order.
struct SoapMessage {
  std::string operation;
  std::vector<std::pair<std::string, std::string>> parameters;
  std::vector<std::string> strings;

  // The text of the child named `name`, or an empty text when it is absent.
  const std::string& parameter(std::string_view name) const;
  bool has(std::string_view name) const;
};

// A body that is not a SOAP 1.1 envelope with one operation in Intuit's namespace, is not
// well formed, declares a DTD or an entity, nests deeper than 32, or is not UTF-8.
class SoapError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

SoapMessage readSoapMessage(std::string_view body);

// A call envelope as the Web Connector sends it: <operation xmlns="..."> with one child
// element per parameter, texts escaped.
std::string soapCall(std::string_view operation,
                     const std::vector<std::pair<std::string, std::string>>& parameters);
// The answer envelope: <operationResponse><operationResult>text</operationResult>...
std::string soapStringResult(std::string_view operation, std::string_view value);
std::string soapIntResult(std::string_view operation, int value);
// ...<operationResult><string>a</string><string>b</string></operationResult>...
std::string soapStringsResult(std::string_view operation, const std::vector<std::string>& values);
// Text for an element's content: & < > escaped, and CR as a character reference, since a
// literal one reaches a reader as a line feed.
std::string xmlEscaped(std::string_view text);
// Appends <name>text</name>, the text escaped.
void appendXmlElement(std::string& out, std::string_view name, std::string_view text);

// A SOAP 1.1 fault: faultcode "soap:Client" or "soap:Server" and the message.
std::string soapFault(std::string_view faultCode, std::string_view message);

}  // namespace droqbxml::webconnector

#endif  // DROQBXML_WEBCONNECTOR_SOAP_HPP_

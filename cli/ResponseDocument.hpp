// A qbXML response document as the command reads it beside the component: the text the
// request processor returned, parsed with Expat into a small tree, so that the command can
// summarise each response's status, choose its exit code and print the records as JSON.
#ifndef DROQBXML_CLI_RESPONSEDOCUMENT_HPP_
#define DROQBXML_CLI_RESPONSEDOCUMENT_HPP_

#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace droqbxml::cli {

struct XmlElement {
  std::string name;
  std::vector<std::pair<std::string, std::string>> attributes;
  std::string text;  // character data directly inside the element
  std::vector<XmlElement> children;

  // The attribute's value, or nothing when the element has none of that name.
  std::optional<std::string_view> attribute(std::string_view key) const;
};

struct ResponseDocument {
  XmlElement root;
  // The ...Rs elements under QBXML/QBXMLMsgsRs, in document order.
  std::vector<const XmlElement*> responses() const;
};

// Parses a response document. On failure `error` says where and why and nothing is
// returned. Without `records` the tree stops at the response elements (the whole text is
// still checked), which is all the status lines need.
std::optional<ResponseDocument> parseResponse(std::string_view xml, std::string& error,
                                              bool records = true);

enum class Severity { Info, Warn, Error };

// A response's statusSeverity; anything but "Info" and "Warn" counts as an error.
Severity severityOf(const XmlElement& response);

// One line: the response's name, then requestID=, statusCode=, statusSeverity= and
// statusMessage= with their values as QuickBooks wrote them (requestID only when the
// response has one; the message, last, runs to the end of the line).
std::string statusLine(const XmlElement& response);

// The responses as a JSON array: per response its name, its status attributes and its
// records, each record an object of its element name; inside a record element names are
// keys, repeated elements arrays and values text.
std::string responsesAsJson(const ResponseDocument& document);

}  // namespace droqbxml::cli

#endif  // DROQBXML_CLI_RESPONSEDOCUMENT_HPP_

// A qbXML request document as the stand-in reads it: the prolog read by hand (QuickBooks
// accepts a DOCTYPE without a system literal, which a strict XML parser refuses), the rest
// parsed by Expat into a small tree, and the whole checked against the qbXML 13.0 schema
// rules (child order, required children, unknown elements, enum values, date, date-time,
// boolean and integer formats) for every request the stand-in supports. Every problem is
// kept with its line and element so that `droqbxml lint` can name it.
#ifndef DROQBXML_SIMULATOR_REQUESTDOCUMENT_HPP_
#define DROQBXML_SIMULATOR_REQUESTDOCUMENT_HPP_

#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace droqbxml::simulator {

// One element; all text is UTF-8 with entities and character references decoded.
struct XmlNode {
  std::string name;
  std::vector<std::pair<std::string, std::string>> attributes;
  std::string text;  // the element's own character data, concatenated
  std::vector<XmlNode> children;
  int line = 0;  // 1-based line of the start tag in the document

  // The first child of that name, or nullptr.
  const XmlNode* child(std::string_view childName) const;
  // Every child of that name, in document order.
  std::vector<const XmlNode*> childrenNamed(std::string_view childName) const;
  std::optional<std::string> attribute(std::string_view attributeName) const;
};

// One broken rule: where, which element (its path from QBXML, "/"-separated), and what
// was expected, in words a user can act on.
struct Problem {
  int line = 0;
  std::string element;
  std::string message;
};

struct RequestDocument {
  std::string qbxmlVersion;  // from <?qbxml version="N.N"?>, or "1.0" from the DOCTYPE
  XmlNode root;              // the QBXML element
};

struct ReadResult {
  std::optional<RequestDocument> document;  // present only when there is no problem
  std::vector<Problem> problems;
};

// Reads and checks a whole request document. Never throws for any input: malformed XML,
// unknown requests, entity tricks (no DTD is ever expanded), deep nesting and oversized
// documents all come back as problems.
ReadResult readRequest(std::string_view utf8Document);

// The children an aggregate may hold, in qbXML 13.0 order (groups flattened, the branches
// of a choice in the order the schema lists them), for writing Ret aggregates in schema
// order. Empty for a name the tables do not know.
std::vector<std::string_view> schemaChildOrder(std::string_view aggregate);

}  // namespace droqbxml::simulator

#endif  // DROQBXML_SIMULATOR_REQUESTDOCUMENT_HPP_

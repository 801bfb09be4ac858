// A qbXML request document as the stand-in reads it: the prolog read by hand (QuickBooks
// accepts a DOCTYPE without a system literal, which a strict XML parser refuses), the rest
// parsed by Expat into a small tree, and the whole checked against the qbXML 13.0 schema
// rules (child order, required children, unknown elements, enum values, value formats,
// maximum lengths, the elements of the declared qbXML version) for every request type of
// qbXML 13.0, and against what QuickBooks Desktop refuses although the schema allows it.
// Every problem is kept with its line and element so that `droqbxml lint` can name it.
#ifndef DROQBXML_SIMULATOR_REQUESTDOCUMENT_HPP_
#define DROQBXML_SIMULATOR_REQUESTDOCUMENT_HPP_

#include <cstddef>
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
  // QuickBooks reads the document and refuses only the request holding this value, with
  // a status (see ValueRefusal); false: it refuses the whole document.
  bool perRequest = false;
};

// A value the schema refuses that QuickBooks takes into the request and then answers with
// an error status: a text longer than its field allows (3070), a number with more digits
// or decimals than its type has (3040).
struct ValueRefusal {
  std::size_t request = 0;  // index of the request among the QBXMLMsgsRq children
  std::string field;        // the element's name
  std::string value;
  std::string_view kind;  // "text", or the number's kind: amount, price, quantity, percentage
};

struct RequestDocument {
  std::string qbxmlVersion;            // from <?qbxml version="N.N"?>, or "1.0" from the DOCTYPE
  XmlNode root;                        // the QBXML element
  std::vector<ValueRefusal> refusals;  // in document order
};

struct ReadResult {
  // Present when every problem is a per-request one (then also listed in refusals).
  std::optional<RequestDocument> document;
  std::vector<Problem> problems;
};

// The largest request document QuickBooks is given to read: 100 MB.
inline constexpr std::size_t kMaxRequestBytes = 100 * 1024 * 1024;

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

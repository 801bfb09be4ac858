// The response document as QuickBooks writes it: `<?xml version="1.0" ?>`, QBXML and
// QBXMLMsgsRs, one response element per answered request, one element per line, no
// indentation, LF line ends; `"` written &quot; in attributes, `&` and `<` escaped in text.
// Records are written from fields put in the order of their schema aggregate.
#ifndef DROQBXML_SIMULATOR_HANDLERS_RESPONSE_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_RESPONSE_HPP_

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "simulator/handlers/Fields.hpp"
#include "simulator/handlers/Status.hpp"
#include "simulator/handlers/Store.hpp"

namespace droqbxml::simulator::handlers {

// The qbXML version a request document was written for ("13.0" is 13, 0).
struct QbxmlVersion {
  int major = 13;
  int minor = 0;

  static QbxmlVersion parse(std::string_view text);
  bool atLeast(int wantedMajor, int wantedMinor) const {
    return major > wantedMajor || (major == wantedMajor && minor >= wantedMinor);
  }
};

// One answered request: the response element's name, the request's requestID if it had one,
// its status and the records it returns.
struct Answer {
  std::string name;
  std::optional<std::string> requestId;
  Status status;
  std::vector<Field> records;
};

// `fields` in the child order of the schema aggregate `aggregate` (a Ret aggregate or one of
// its line aggregates). Fields the aggregate does not hold are left out, and so are the
// elements QuickBooks did not yet write in the request's qbXML version.
std::vector<Field> inSchemaOrder(std::string_view aggregate, std::vector<Field> fields,
                                 const QbxmlVersion& version);

// The text of one response element (LF-ended lines); references are written with the ListID
// and FullName the store finds for them.
std::string writeAnswer(const Answer& answer, Store& store);

// The whole response document around the response elements' texts.
std::string responseDocument(const std::string& answers);

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_RESPONSE_HPP_

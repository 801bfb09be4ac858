// The response document as QuickBooks writes it: `<?xml version="1.0" ?>`, QBXML and
// QBXMLMsgsRs, one response element per answered request, one element per line, no
// indentation, LF line ends; `"` written &quot; in attributes, `&` and `<` escaped in text.
// Records are written from fields put in the order of their schema aggregate.
#ifndef DROQBXML_SIMULATOR_HANDLERS_RESPONSE_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_RESPONSE_HPP_

#include <functional>
#include <map>
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
// its status and how many records it returns. The records are written into the response as
// they are found (Context::add), so that a long list is never held whole.
struct Answer {
  std::string name;
  std::optional<std::string> requestId;
  Status status;
  size_t count = 0;
};

// Puts the fields of records in the child order of their schema aggregate (a Ret aggregate or
// one of its line aggregates), for the answers to one document. The order found for a list of
// field names is used again for the next record of that aggregate with the same names, as the
// records of one list mostly have.
class SchemaOrder {
 public:
  explicit SchemaOrder(QbxmlVersion version) : version_(version) {}

  // `fields` in the order of `aggregate`. Fields the aggregate does not hold are left out, and
  // so are the elements QuickBooks did not yet write in the document's qbXML version.
  std::vector<Field> arrange(std::string_view aggregate, std::vector<Field> fields);
  // The places among `fields` of the fields arrange() keeps, in the order it puts them.
  const std::vector<size_t>& places(std::string_view aggregate, const std::vector<Field>& fields);

 private:
  struct Arrangement {
    std::vector<std::string> names;  // of the fields last arranged, as they came
    std::vector<size_t> order;       // the places among them of the fields kept, in order
  };

  QbxmlVersion version_;
  std::map<std::string, Arrangement, std::less<>> last_;  // by aggregate
};

// Appends the text of one record (LF-ended lines); references are written with the ListID and
// FullName the store finds for them.
void writeRecord(std::string& out, const Field& record, Store& store);
// The same for the record `aggregate` holding fields[at] for each `at` of `places`, in that order.
void writeRecord(std::string& out, std::string_view aggregate, const std::vector<Field>& fields,
                 const std::vector<size_t>& places, Store& store);

// Completes the response element of `answer`, whose records `out` holds from `start` on: its
// start tag, which carries the status, goes in front of them.
void finishAnswer(std::string& out, size_t start, const Answer& answer);

// What the whole response document holds before and after the response elements' texts.
inline constexpr std::string_view kResponseStart =
    "<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n";
inline constexpr std::string_view kResponseEnd = "</QBXMLMsgsRs>\n</QBXML>\n";

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_RESPONSE_HPP_

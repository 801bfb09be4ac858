// Writing response elements: escaping, one element per line, references expanded, and the
// schema order (from the request reader's tables) with the elements newer than the request's
// qbXML version removed.
#include "simulator/handlers/Response.hpp"

#include <algorithm>
#include <array>
#include <tuple>

#include "simulator/RequestDocument.hpp"

namespace droqbxml::simulator::handlers {
namespace {

// Elements the stand-in writes on its own (not echoed from a request) that QuickBooks added
// to a Ret aggregate after qbXML 1.0: a document of an older version does not get them.
struct Introduced {
  std::string_view aggregate;
  std::string_view element;
  int major;
  int minor;
};
constexpr std::array<Introduced, 9> kIntroduced{{
    {"AccountRet", "SpecialAccountType", 2, 1},
    {"AccountRet", "CashFlowClassification", 2, 1},
    {"EstimateRet", "IsActive", 3, 0},
    {"EstimateRet", "IsToBeEmailed", 6, 0},
    {"EstimateRet", "ShipAddress", 7, 0},
    {"InvoiceRet", "IsToBeEmailed", 6, 0},
    {"InvoiceRet", "IsPaid", 2, 0},
    {"EstimateLineGroupRet", "TxnLineID", 3, 0},
    {"InvoiceLineGroupRet", "TxnLineID", 2, 1},
}};

bool writtenInVersion(std::string_view aggregate, std::string_view element,
                      const QbxmlVersion& version) {
  for (const Introduced& each : kIntroduced) {
    if (each.aggregate == aggregate && each.element == element) {
      return version.atLeast(each.major, each.minor);
    }
  }
  return true;
}

// Ret children that are branches of one repeated choice: they keep their order among each
// other (lines and line groups of a transaction interleave as the request had them).
std::string_view choiceRepresentative(std::string_view element) {
  if (element == "EstimateLineGroupRet") return "EstimateLineRet";
  if (element == "InvoiceLineGroupRet") return "InvoiceLineRet";
  return element;
}

void appendEscaped(std::string& out, std::string_view text, bool attribute) {
  for (const char c : text) {
    switch (c) {
      case '&':
        out += "&amp;";
        break;
      case '<':
        out += "&lt;";
        break;
      case '"':
        out += attribute ? "&quot;" : "\"";
        break;
      default:
        out += c;
    }
  }
}

void appendElement(std::string& out, std::string_view name, std::string_view text) {
  out += '<';
  out += name;
  out += '>';
  appendEscaped(out, text, false);
  out += "</";
  out += name;
  out += ">\n";
}

bool hasContent(const Field& field) {
  switch (field.kind) {
    case Field::Kind::Value:
      return !field.text.empty();
    case Field::Kind::Aggregate:
      return std::any_of(field.children.begin(), field.children.end(), hasContent);
    case Field::Kind::Reference:
      return true;
  }
  return false;
}

void appendField(std::string& out, const Field& field, Store& store) {
  if (!hasContent(field)) return;
  switch (field.kind) {
    case Field::Kind::Value:
      appendElement(out, field.name, field.text);
      return;
    case Field::Kind::Aggregate:
      out += "<" + field.name + ">\n";
      for (const Field& child : field.children) appendField(out, child, store);
      out += "</" + field.name + ">\n";
      return;
    case Field::Kind::Reference: {
      const ListIdentity& identity = store.identity(field.table, field.row);
      out += "<" + field.name + ">\n";
      appendElement(out, "ListID", identity.listId);
      appendElement(out, "FullName", identity.fullName);
      out += "</" + field.name + ">\n";
      return;
    }
  }
}

}  // namespace

QbxmlVersion QbxmlVersion::parse(std::string_view text) {
  // Held below 10000 so that no run of digits overflows; every known version is far below.
  constexpr int kCeiling = 10000;
  QbxmlVersion version{0, 0};
  size_t i = 0;
  for (; i < text.size() && text[i] >= '0' && text[i] <= '9'; ++i) {
    version.major = std::min(version.major * 10 + (text[i] - '0'), kCeiling);
  }
  if (i < text.size() && text[i] == '.') {
    for (++i; i < text.size() && text[i] >= '0' && text[i] <= '9'; ++i) {
      version.minor = std::min(version.minor * 10 + (text[i] - '0'), kCeiling);
    }
  }
  return version.major == 0 ? QbxmlVersion{} : version;
}

std::vector<Field> inSchemaOrder(std::string_view aggregate, std::vector<Field> fields,
                                 const QbxmlVersion& version) {
  const std::vector<std::string_view> order = schemaChildOrder(aggregate);
  std::vector<std::pair<size_t, Field>> ranked;
  ranked.reserve(fields.size());
  for (Field& field : fields) {
    const auto at = std::find(order.begin(), order.end(), choiceRepresentative(field.name));
    if (at == order.end() || !writtenInVersion(aggregate, field.name, version)) continue;
    ranked.emplace_back(static_cast<size_t>(at - order.begin()), std::move(field));
  }
  std::stable_sort(ranked.begin(), ranked.end(),
                   [](const auto& left, const auto& right) { return left.first < right.first; });
  std::vector<Field> result;
  result.reserve(ranked.size());
  for (auto& [rank, field] : ranked) result.push_back(std::move(field));
  return result;
}

std::string writeAnswer(const Answer& answer, Store& store) {
  std::string out = "<" + answer.name;
  if (answer.requestId) {
    out += " requestID=\"";
    appendEscaped(out, *answer.requestId, true);
    out += '"';
  }
  out += " statusCode=\"" + std::to_string(answer.status.code) + "\"";
  out += " statusSeverity=\"" + std::string(answer.status.severity) + "\"";
  out += " statusMessage=\"";
  appendEscaped(out, answer.status.message, true);
  out += '"';
  if (answer.records.empty()) {
    out += " />\n";
    return out;
  }
  out += ">\n";
  for (const Field& record : answer.records) appendField(out, record, store);
  out += "</" + answer.name + ">\n";
  return out;
}

std::string responseDocument(const std::string& answers) {
  return "<?xml version=\"1.0\" ?>\n<QBXML>\n<QBXMLMsgsRs>\n" + answers +
         "</QBXMLMsgsRs>\n</QBXML>\n";
}

}  // namespace droqbxml::simulator::handlers

// Writing response elements: escaping, one element per line, references expanded, and the
// schema order (from the request reader's tables) with the elements newer than the request's
// qbXML version removed.
#include "simulator/handlers/Response.hpp"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>
#include <tuple>

#include "simulator/internal/SchemaModel.hpp"

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

// What a character of text becomes in a response: itself (0), "&amp;" (1), "&lt;" (2), and in an
// attribute value "&quot;" (3).
constexpr std::array<uint8_t, 256> kEscapes = [] {
  std::array<uint8_t, 256> escapes{};
  escapes['&'] = 1;
  escapes['<'] = 2;
  escapes['"'] = 3;
  return escapes;
}();

// Whether any of the eight characters in `word` may need escaping: a zero byte in `word` xor
// a character repeated eight times is that character.
bool mayEscape(uint64_t word) {
  constexpr uint64_t kOnes = 0x0101010101010101;
  constexpr uint64_t kHighs = 0x8080808080808080;
  uint64_t found = 0;
  for (const uint64_t special : {kOnes * '&', kOnes * '<', kOnes * '"'}) {
    const uint64_t x = word ^ special;
    found |= (x - kOnes) & ~x & kHighs;
  }
  return found != 0;
}

void appendEscaped(std::string& out, std::string_view text, bool attribute) {
  // Values mostly need no escaping: look at eight characters at a time up to the first that may.
  size_t at = 0;
  for (uint64_t word = 0; at + 8 <= text.size(); at += 8) {
    std::memcpy(&word, text.data() + at, 8);
    if (mayEscape(word)) break;
  }
  const uint8_t last = attribute ? 3 : 2;
  size_t run = 0;  // the start of the characters not yet written
  for (; at < text.size(); ++at) {
    const uint8_t escape = kEscapes[static_cast<unsigned char>(text[at])];
    if (escape == 0 || escape > last) continue;
    out.append(text, run, at - run);
    out += escape == 1 ? "&amp;" : escape == 2 ? "&lt;" : "&quot;";
    run = at + 1;
  }
  out.append(text, run);
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

void appendTag(std::string& out, std::string_view opening, std::string_view name) {
  out += opening;
  out += name;
  out += ">\n";
}

void appendField(std::string& out, const Field& field, Store& store) {
  if (!hasContent(field)) return;
  switch (field.kind) {
    case Field::Kind::Value:
      appendElement(out, field.name, field.text);
      return;
    case Field::Kind::Aggregate:
      appendTag(out, "<", field.name);
      for (const Field& child : field.children) appendField(out, child, store);
      appendTag(out, "</", field.name);
      return;
    case Field::Kind::Reference: {
      const ListIdentity& identity = store.identity(field.table, field.row);
      appendTag(out, "<", field.name);
      appendElement(out, "ListID", identity.listId);
      appendElement(out, "FullName", identity.fullName);
      appendTag(out, "</", field.name);
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

const std::vector<size_t>& SchemaOrder::places(std::string_view aggregate,
                                               const std::vector<Field>& fields) {
  auto found = last_.find(aggregate);
  if (found == last_.end()) found = last_.emplace(std::string(aggregate), Arrangement{}).first;
  Arrangement& last = found->second;
  const bool same =
      std::equal(fields.begin(), fields.end(), last.names.begin(), last.names.end(),
                 [](const Field& field, const std::string& name) { return field.name == name; });
  if (same) return last.order;
  last.names.clear();
  last.order.clear();
  const int index = internal::findAggregate(aggregate);
  // Each kept field's place in the schema order, then its place among the fields, so that
  // fields of one place keep theirs.
  std::vector<std::pair<int, size_t>> ranked;
  for (size_t at = 0; at < fields.size(); ++at) {
    last.names.push_back(fields[at].name);
    const int rank =
        index < 0 ? -1 : internal::automatonOf(index).rankOf(choiceRepresentative(fields[at].name));
    if (rank < 0 || !writtenInVersion(aggregate, fields[at].name, version_)) continue;
    ranked.emplace_back(rank, at);
  }
  std::sort(ranked.begin(), ranked.end());
  for (const auto& [rank, at] : ranked) last.order.push_back(at);
  return last.order;
}

std::vector<Field> SchemaOrder::arrange(std::string_view aggregate, std::vector<Field> fields) {
  const std::vector<size_t>& kept = places(aggregate, fields);
  std::vector<Field> result;
  result.reserve(kept.size());
  for (const size_t at : kept) result.push_back(std::move(fields[at]));
  return result;
}

void writeRecord(std::string& out, const Field& record, Store& store) {
  appendField(out, record, store);
}

void writeRecord(std::string& out, std::string_view aggregate, const std::vector<Field>& fields,
                 const std::vector<size_t>& places, Store& store) {
  // As appendField writes the aggregate of these fields: nothing when none has content.
  if (std::none_of(places.begin(), places.end(),
                   [&](size_t at) { return hasContent(fields[at]); })) {
    return;
  }
  appendTag(out, "<", aggregate);
  for (const size_t at : places) appendField(out, fields[at], store);
  appendTag(out, "</", aggregate);
}

void finishAnswer(std::string& out, size_t start, const Answer& answer) {
  std::string tag = "<" + answer.name;
  if (answer.requestId) {
    tag += " requestID=\"";
    appendEscaped(tag, *answer.requestId, true);
    tag += '"';
  }
  tag += " statusCode=\"" + std::to_string(answer.status.code) + "\" statusSeverity=\"";
  tag += answer.status.severity;
  tag += "\" statusMessage=\"";
  appendEscaped(tag, answer.status.message, true);
  tag += answer.count == 0 ? "\" />\n" : "\">\n";
  out.insert(start, tag);
  if (answer.count != 0) appendTag(out, "</", answer.name);
}

}  // namespace droqbxml::simulator::handlers

// Functions without a by-name surface, called from tables under tests/testdata/calls/: one
// call a line, then " => " and what it gives: "text" (bytes outside printable ASCII as \xHH,
// and \t \r \n \" \\), a number, true, false, none, U+XXXX for one character, a list of
// texts, or error NUMBER SOURCE: DESCRIPTION. Arguments are quoted texts with the same
// escapes or bare words and numbers. DROQBXML_WRITE_GOLDENS=1 rewrites the outcomes.
#include <gtest/gtest.h>

#include <charconv>
#include <concepts>
#include <cstdio>
#include <functional>
#include <map>
#include <optional>
#include <sstream>
#include <string>
#include <vector>

#include "droqbxml/connection/DroXmlSdkWrapper.hpp"
#include "droqbxml/runtime/Clock.hpp"
#include "droqbxml/runtime/Codepage.hpp"
#include "droqbxml/runtime/Numbers.hpp"
#include "droqbxml/runtime/Text.hpp"
#include "droqbxml/runtime/Variant.hpp"
#include "simulator/RequestDocument.hpp"
#include "simulator/handlers/Clock.hpp"
#include "simulator/handlers/Values.hpp"
#include "simulator/internal/SchemaCheck.hpp"
#include "tests/TableSupport.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml {
namespace {

using Args = std::vector<std::string>;
using simulator::handlers::NumberKind;
using simulator::internal::ValueType;

std::string shown(const std::string& bytes) { return test::quoted(bytes, true); }
std::string shown(const Text& text) { return shown(toUtf8(text)); }
std::string shown(bool value) { return value ? "true" : "false"; }
template <std::integral T>
std::string shown(T value) {
  return std::to_string(value);
}
std::string shown(char16_t c) {
  char out[8];
  std::snprintf(out, sizeof out, "U+%04X", static_cast<unsigned>(c));
  return out;
}
std::string shown(double value) {
  char out[32];
  return std::string(out, std::to_chars(out, out + sizeof out, value).ptr);
}
template <typename T>
std::string shown(const std::optional<T>& value) {
  return value ? shown(*value) : "none";
}
std::string shown(const std::vector<std::string>& list) {
  std::string out;
  for (const std::string& each : list) out += (out.empty() ? "" : ", ") + shown(each);
  return out.empty() ? "none" : out;
}

Text text(const std::string& arg) { return fromUtf8(arg); }
int64_t whole(const std::string& arg) { return std::stoll(arg); }
int32_t number(const std::string& arg) { return std::stoi(arg); }
double real(const std::string& arg) { return std::stod(arg); }
char16_t unit(const std::string& arg) {
  return static_cast<char16_t>(std::stoi(arg.substr(2), nullptr, 16));
}

LocalTime time(const Args& a) {
  return {number(a[0]), number(a[1]), number(a[2]), number(a[3]), number(a[4]), number(a[5])};
}

// A Variant of the kind a[0] holding a[1].
Variant variant(const Args& a) {
  const std::string& kind = a[0];
  if (kind == "Boolean") return Variant(a[1] == "true");
  if (kind == "Integer") return Variant(static_cast<int16_t>(number(a[1])));
  if (kind == "Long") return Variant(number(a[1]));
  if (kind == "Double") return Variant(real(a[1]));
  if (kind == "Currency") return Variant::currency(whole(a[1]));
  if (kind == "Date") return Variant::date(real(a[1]));
  if (kind == "String") return Variant(text(a[1]));
  return kind == "Null" ? Variant::null() : kind == "Missing" ? Variant::missing() : Variant();
}

NumberKind kind(const std::string& word) {
  const std::map<std::string, NumberKind> kinds{{"Amount", NumberKind::Amount},
                                                {"Price", NumberKind::Price},
                                                {"Quantity", NumberKind::Quantity},
                                                {"Percent", NumberKind::Percent}};
  return kinds.at(word);
}

ValueType valueType(const std::string& word) {
  const std::map<std::string, ValueType> types{
      {"STR", ValueType::kStr},           {"ID", ValueType::kId},
      {"BOOL", ValueType::kBool},         {"DATE", ValueType::kDate},
      {"DATETIME", ValueType::kDateTime}, {"INT", ValueType::kInt},
      {"AMT", ValueType::kAmt},           {"PRICE", ValueType::kPrice},
      {"QUAN", ValueType::kQuan},         {"PERCENT", ValueType::kPercent},
      {"FLOAT", ValueType::kFloat},       {"GUID", ValueType::kGuid}};
  return types.at(word);
}

// A document as the component's builder writes it: XML declaration, the DOCTYPE without a
// system literal, CR LF line ends, TAB indentation; `lines` from line 5.
std::string builderDocument(const std::string& onError, const Args& lines) {
  std::string text =
      "<?xml version=\"1.0\"?>\r\n<!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.0//EN\" "
      ">\r\n<QBXML>\r\n\t<QBXMLMsgsRq onError=\"" +
      onError + "\">\r\n";
  for (const std::string& line : lines) text += "\t\t" + line + "\r\n";
  return text + "\t</QBXMLMsgsRq>\r\n</QBXML>";
}

std::vector<std::string> problems(const simulator::ReadResult& result) {
  std::vector<std::string> lines;
  for (const simulator::Problem& problem : result.problems) {
    lines.push_back(std::to_string(problem.line) + " " + problem.element + ": " + problem.message);
  }
  return lines;
}

std::vector<std::string> problems(const std::string& document) {
  return problems(simulator::readRequest(document));
}

// The elements of a document read without problems (else the problems), one entry each:
// "LINE PATH", its attributes as " NAME=VALUE", and a leaf's text after " = "; the version
// first.
void elements(const simulator::XmlNode& node, const std::string& parent, Args& out) {
  std::string entry = std::to_string(node.line) + " " + parent + node.name;
  for (const auto& [name, value] : node.attributes) entry += " " + name + "=" + value;
  out.push_back(node.children.empty() ? entry + " = " + node.text : entry);
  for (const auto& child : node.children) elements(child, parent + node.name + "/", out);
}

Args elements(const std::string& document) {
  const simulator::ReadResult read = simulator::readRequest(document);
  if (!read.document || !read.problems.empty()) return problems(read);
  Args out{"version " + read.document->qbxmlVersion};
  elements(read.document->root, "", out);
  return out;
}

std::optional<std::string> version(const std::string& document) {
  const simulator::ReadResult read = simulator::readRequest(document);
  if (read.document && read.problems.empty()) return read.document->qbxmlVersion;
  return std::nullopt;
}

// Each function the tables call: NAME(expression of the arguments a[0], a[1]...).
// clang-format off
#define CALL(name, ...) {#name, [](const Args& a) { return shown(__VA_ARGS__); }}
// clang-format on

const std::map<std::string, std::function<std::string(const Args&)>>& functions() {
  using namespace simulator::handlers;
  static const std::map<std::string, std::function<std::string(const Args&)>> all{
      // The runtime's numbers, code page and text.
      CALL(isNumeric, isNumeric(text(a[0]))),
      CALL(textToDouble, textToDouble(text(a[0]))),
      CALL(textToLong, textToLong(text(a[0]))),
      CALL(textToInteger, textToInteger(text(a[0]))),
      CALL(textToCurrency, textToCurrency(text(a[0]))),
      CALL(doubleToLong, doubleToLong(real(a[0]))),
      CALL(doubleToInteger, doubleToInteger(real(a[0]))),
      CALL(doubleToText, doubleToText(real(a[0]))),
      CALL(currencyToText, currencyToText(whole(a[0]))),
      CALL(formatFixed, formatFixed(text(a[0]), number(a[1]))),
      CALL(ansiCode, ansiCode(unit(a[0]))),
      CALL(ansiChar, ansiChar(number(a[0]))),
      CALL(unicodeChar, unicodeChar(number(a[0]))),
      CALL(fromUtf8, fromUtf8(a[0])),
      CALL(trim, trim(text(a[0]))),
      CALL(upperAscii, upperAscii(TextView(text(a[0])))),
      CALL(equalsIgnoreCase, equalsIgnoreCase(text(a[0]), text(a[1]))),
      CALL(inStr, inStr(number(a[0]), text(a[1]), text(a[2]))),
      // Variants given as kind and value.
      CALL(typeName, variant(a).typeName()),
      CALL(toLong, variant(a).toLong()),
      CALL(toInteger, variant(a).toInteger()),
      CALL(toCurrency, variant(a).toCurrency()),
      CALL(toText, variant(a).toText()),
      CALL(toBoolean, variant(a).toBoolean()),
      // Dates: times given as year, month, day, hour, minute, second.
      CALL(formatLongDateTime, formatLongDateTime(time(a))),
      CALL(formatIsoDateTime, formatIsoDateTime(time(a))),
      CALL(fromOleDate, formatIsoDateTime(fromOleDate(real(a[0])))),
      CALL(toOleDate, toOleDate(time(a))),
      // The session wrapper reading responses.
      CALL(ReadStatusCode, DroXmlSdkWrapper::ReadStatusCode(text(a[0]))),
      CALL(IsIncompleteQueryResponse, DroXmlSdkWrapper::IsIncompleteQueryResponse(text(a[0]))),
      // The stand-in's numbers and text.
      CALL(parseNumber, parseNumber(a[0], kind(a[1]))),
      CALL(formatNumber, formatNumber(whole(a[0]), kind(a[1]))),
      CALL(roundToCents, roundToCents(whole(a[0]))),
      CALL(multiply, multiply(whole(a[0]), whole(a[1]))),
      CALL(divide, divide(whole(a[0]), whole(a[1]))),
      CALL(percentOf, percentOf(whole(a[0]), whole(a[1]))),
      CALL(latin1Text, latin1Text(a[0])),
      CALL(booleanText, booleanText(a[0])),
      // The stand-in's clock, its present fixed to a[0] by DROQBXML_SIMULATOR_NOW.
      CALL(standInNow, (::setenv("DROQBXML_SIMULATOR_NOW", a[0].c_str(), 1), currentTime())),
      CALL(formatDateTime, formatDateTime(whole(a[0]))),
      CALL(formatDate, formatDate(whole(a[0]))),
      CALL(parseDateTime, parseDateTime(a[0], a[1] == "endOfDay")),
      // The stand-in reading requests: a leaf's value; the problems of a document, of the
      // builder's document with onError a[0] and the lines after it, or of text after it;
      // the version or the elements of a document read without problems.
      CALL(valueProblem, simulator::internal::valueProblem(valueType(a[0]), a[1])),
      CALL(problems, problems(a[0])),
      CALL(builderRequest, problems(builderDocument(a[0], Args(a.begin() + 1, a.end())))),
      CALL(builderRequestThen, problems(builderDocument("stopOnError", {}) + a[0])),
      CALL(version, version(a[0])),
      CALL(elements, elements(a[0])),
      CALL(builderElements, elements(builderDocument(a[0], Args(a.begin() + 1, a.end())))),
  };
  return all;
}
#undef CALL

std::string outcome(const std::string& call) {
  const size_t open = call.find('(');
  Args args;
  for (size_t at = open + 1; at < call.size() && call[at] != ')';) {
    const size_t from = call.find_first_not_of(' ', at);
    const size_t end =
        call[from] == '"' ? test::afterQuoted(call, from) : call.find_first_of(",)", from);
    args.push_back(test::unquoted(call.substr(from, end - from)));
    at = call[end] == ',' ? end + 1 : end;
  }
  try {
    return functions().at(call.substr(0, open))(args);
  } catch (const ComError& error) {
    return test::errorOutcome(error, true);
  }
}

// Calls every line of testdata/calls/<name> and checks what each gives.
void runTable(const std::string& name) { test::runTable("calls/" + name, outcome); }

// Numeric text read and written as the platform does, Variant conversions, the code page,
// trimming and search, dates, and the session wrapper's status codes.
TEST(CallTablesTest, RuntimeConversions) { runTable("runtime_conversions.txt"); }

// QuickBooks' number conversion, formats and rounding, text reduced to ISO-8859-1, and the
// stand-in's clock with its fixed present.
TEST(CallTablesTest, StandInValues) {
  const test::ScopedVariable now("DROQBXML_SIMULATOR_NOW");
  runTable("stand_in_values.txt");
}

// Leaf values, prologs, versions, attributes and malformed documents as the stand-in reads
// them, each with its problems.
TEST(CallTablesTest, StandInReading) { runTable("stand_in_reading.txt"); }

}  // namespace
}  // namespace droqbxml

// Reading and writing the Web Connector's SOAP envelopes. The reader is an Expat parser that
// sees names with their namespaces and refuses every DTD, entity declaration and external
// reference before any of it is acted on; the writers produce the one-line envelopes a .NET
// SOAP service writes.
#include "webconnector/Soap.hpp"

#include <expat.h>

#include <algorithm>
#include <climits>
#include <cstring>
#include <memory>
#include <optional>

namespace droqbxml::webconnector {
namespace {

constexpr std::string_view kEnvelopeNamespace = "http://schemas.xmlsoap.org/soap/envelope/";
constexpr char kNameSeparator = '\x01';
constexpr int kMaxDepth = 32;
constexpr size_t kChunk = 1 << 20;

// An Expat name: namespace and local name ("" namespace when the element has none).
struct Name {
  std::string_view space;
  std::string_view local;
};

Name splitName(const XML_Char* name) {
  const std::string_view whole(name);
  const size_t at = whole.find(kNameSeparator);
  if (at == std::string_view::npos) return {{}, whole};
  return {whole.substr(0, at), whole.substr(at + 1)};
}

bool equalsIgnoringCase(std::string_view a, std::string_view b) {
  return a.size() == b.size() && std::equal(a.begin(), a.end(), b.begin(), [](char x, char y) {
           const auto lower = [](char c) { return c >= 'A' && c <= 'Z' ? char(c - 'A' + 'a') : c; };
           return lower(x) == lower(y);
         });
}

// The walk through one envelope. Depth 1 is the Envelope, 2 its Header or Body, 3 the
// operation, 4 a parameter, 5 a <string> of an array parameter.
class Reader {
 public:
  explicit Reader(XML_Parser parser) : parser_(parser) {}

  void start(const XML_Char* rawName) {
    ++depth_;
    if (depth_ > kMaxDepth) return fail("the SOAP message nests deeper than 32 elements");
    const Name name = splitName(rawName);
    switch (depth_) {
      case 1:
        if (name.space != kEnvelopeNamespace || name.local != "Envelope") {
          return fail("the body is not a SOAP 1.1 envelope");
        }
        break;
      case 2:
        if (name.space == kEnvelopeNamespace && name.local == "Header" && !seenBody_ &&
            !seenHeader_) {
          seenHeader_ = true;
          inHeader_ = true;
        } else if (name.space == kEnvelopeNamespace && name.local == "Body" && !seenBody_) {
          seenBody_ = true;
        } else {
          return fail("unexpected element '" + std::string(name.local) + "' in the SOAP envelope");
        }
        break;
      case 3:
        if (inHeader_) break;
        if (!message_.operation.empty()) return fail("the SOAP body holds more than one operation");
        if (name.space == kEnvelopeNamespace && name.local == "Fault") {
          message_.operation = "Fault";
        } else if (name.space == kIntuitNamespace) {
          message_.operation = name.local;
        } else {
          return fail("the operation '" + std::string(name.local) + "' is not in the namespace " +
                      std::string(kIntuitNamespace));
        }
        break;
      case 4:
        if (inHeader_) break;
        message_.parameters.emplace_back(std::string(name.local), std::string());
        break;
      case 5:
        if (!inHeader_ && name.local == "string") {
          message_.strings.emplace_back();
          inString_ = true;
        }
        break;
      default:
        break;
    }
  }

  void end() {
    if (depth_ == 5) inString_ = false;
    if (depth_ == 2) inHeader_ = false;
    --depth_;
  }

  void text(const XML_Char* data, int length) {
    if (inHeader_ || depth_ < 4) return;
    const std::string_view piece(data, static_cast<size_t>(length));
    message_.parameters.back().second += piece;
    if (inString_) message_.strings.back() += piece;
  }

  // Stops the parser; the first reason given is the one reported.
  void fail(std::string reason) {
    if (!error_) error_ = std::move(reason);
    XML_StopParser(parser_, XML_FALSE);
  }

  const std::optional<std::string>& error() const { return error_; }

  SoapMessage finish() {
    if (!seenBody_) throw SoapError("the SOAP envelope has no Body");
    if (message_.operation.empty()) throw SoapError("the SOAP body holds no operation");
    return std::move(message_);
  }

 private:
  XML_Parser parser_;
  SoapMessage message_;
  std::optional<std::string> error_;
  int depth_ = 0;
  bool seenHeader_ = false;
  bool seenBody_ = false;
  bool inHeader_ = false;
  bool inString_ = false;
};

Reader& readerOf(void* data) { return *static_cast<Reader*>(data); }

void installHandlers(XML_Parser parser) {
  XML_SetElementHandler(
      parser,
      [](void* data, const XML_Char* name, const XML_Char**) { readerOf(data).start(name); },
      [](void* data, const XML_Char*) { readerOf(data).end(); });
  XML_SetCharacterDataHandler(parser, [](void* data, const XML_Char* text, int length) {
    readerOf(data).text(text, length);
  });
  XML_SetXmlDeclHandler(parser, [](void* data, const XML_Char*, const XML_Char* encoding, int) {
    if (encoding && !equalsIgnoringCase(encoding, "UTF-8")) {
      readerOf(data).fail("the SOAP message must be UTF-8, not " + std::string(encoding));
    }
  });
  XML_SetStartDoctypeDeclHandler(
      parser, [](void* data, const XML_Char*, const XML_Char*, const XML_Char*, int) {
        readerOf(data).fail("a SOAP message may not declare a DOCTYPE");
      });
  XML_SetEntityDeclHandler(
      parser, [](void* data, const XML_Char*, int, const XML_Char*, int, const XML_Char*,
                 const XML_Char*, const XML_Char*, const XML_Char*) {
        readerOf(data).fail("a SOAP message may not declare entities");
      });
  XML_SetParamEntityParsing(parser, XML_PARAM_ENTITY_PARSING_NEVER);
}

std::string envelope(std::string_view body) {
  std::string out =
      "<?xml version=\"1.0\" encoding=\"utf-8\"?><soap:Envelope "
      "xmlns:soap=\"http://schemas.xmlsoap.org/soap/envelope/\" "
      "xmlns:xsi=\"http://www.w3.org/2001/XMLSchema-instance\" "
      "xmlns:xsd=\"http://www.w3.org/2001/XMLSchema\"><soap:Body>";
  out += body;
  out += "</soap:Body></soap:Envelope>";
  return out;
}

// <name xmlns="http://developer.intuit.com/">inner</name>
std::string operationElement(std::string_view name, std::string_view inner) {
  std::string out = "<";
  out += name;
  out += " xmlns=\"";
  out += kIntuitNamespace;
  out += "\">";
  out += inner;
  out += "</";
  out += name;
  out += '>';
  return out;
}

std::string result(std::string_view operation, std::string_view escapedValue) {
  const std::string response = std::string(operation) + "Response";
  const std::string resultName = std::string(operation) + "Result";
  return envelope(operationElement(
      response, "<" + resultName + ">" + std::string(escapedValue) + "</" + resultName + ">"));
}

}  // namespace

std::string xmlEscaped(std::string_view text) {
  std::string out;
  out.reserve(text.size());
  for (const char c : text) {
    switch (c) {
      case '&':
        out += "&amp;";
        break;
      case '<':
        out += "&lt;";
        break;
      case '>':
        out += "&gt;";
        break;
      case '\r':  // a literal CR would reach the reader as a line feed
        out += "&#xD;";
        break;
      default:
        out += c;
    }
  }
  return out;
}

void appendXmlElement(std::string& out, std::string_view name, std::string_view text) {
  out += '<';
  out += name;
  out += '>';
  out += xmlEscaped(text);
  out += "</";
  out += name;
  out += '>';
}

const std::string& SoapMessage::parameter(std::string_view name) const {
  static const std::string kNone;
  for (const auto& [key, value] : parameters) {
    if (key == name) return value;
  }
  return kNone;
}

bool SoapMessage::has(std::string_view name) const {
  return std::any_of(parameters.begin(), parameters.end(),
                     [&](const auto& entry) { return entry.first == name; });
}

SoapMessage readSoapMessage(std::string_view body) {
  const std::unique_ptr<std::remove_pointer_t<XML_Parser>, decltype(&XML_ParserFree)> parser(
      XML_ParserCreateNS("UTF-8", kNameSeparator), &XML_ParserFree);
  if (!parser) throw std::bad_alloc();
  Reader reader(parser.get());
  XML_SetUserData(parser.get(), &reader);
  installHandlers(parser.get());
  do {
    const size_t size = std::min(body.size(), kChunk);
    const bool last = size == body.size();
    if (XML_Parse(parser.get(), body.data(), static_cast<int>(size), last) != XML_STATUS_OK) {
      if (reader.error()) throw SoapError(*reader.error());
      throw SoapError("the SOAP message is not well formed XML (line " +
                      std::to_string(XML_GetCurrentLineNumber(parser.get())) +
                      "): " + XML_ErrorString(XML_GetErrorCode(parser.get())));
    }
    body.remove_prefix(size);
  } while (!body.empty());
  return reader.finish();
}

std::string soapCall(std::string_view operation,
                     const std::vector<std::pair<std::string, std::string>>& parameters) {
  std::string inner;
  for (const auto& [name, value] : parameters) appendXmlElement(inner, name, value);
  return envelope(operationElement(operation, inner));
}

std::string soapStringResult(std::string_view operation, std::string_view value) {
  return result(operation, xmlEscaped(value));
}

std::string soapIntResult(std::string_view operation, int value) {
  return result(operation, std::to_string(value));
}

std::string soapStringsResult(std::string_view operation, const std::vector<std::string>& values) {
  std::string inner;
  for (const auto& value : values) appendXmlElement(inner, "string", value);
  return result(operation, inner);
}

std::string soapFault(std::string_view faultCode, std::string_view message) {
  std::string fault = "<soap:Fault>";
  appendXmlElement(fault, "faultcode", faultCode);
  appendXmlElement(fault, "faultstring", message);
  fault += "</soap:Fault>";
  return envelope(fault);
}

}  // namespace droqbxml::webconnector

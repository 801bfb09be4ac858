// Reading a qbXML response with Expat and writing it out again as status lines and JSON.
#include "cli/ResponseDocument.hpp"

#include <expat.h>

#include <algorithm>
#include <cstdint>
#include <memory>
#include <nlohmann/json.hpp>

namespace droqbxml::cli {
namespace {

using Json = nlohmann::ordered_json;

// The response elements' depth: QBXML, QBXMLMsgsRs, then the responses.
constexpr size_t kResponseDepth = 3;

struct Builder {
  XmlElement root;
  std::vector<XmlElement*> open;
  bool haveRoot = false;
  size_t keptDepth = SIZE_MAX;  // elements deeper than this are only counted
  size_t skipped = 0;           // how many such elements are open
};

void XMLCALL startElement(void* data, const XML_Char* name, const XML_Char** attributes) {
  auto& builder = *static_cast<Builder*>(data);
  if (builder.skipped > 0 || builder.open.size() == builder.keptDepth) {
    ++builder.skipped;
    return;
  }
  XmlElement* element = nullptr;
  if (builder.open.empty()) {
    element = &builder.root;
    builder.haveRoot = true;
  } else {
    element = &builder.open.back()->children.emplace_back();
  }
  element->name = name;
  for (int i = 0; attributes[i] != nullptr; i += 2) {
    element->attributes.emplace_back(attributes[i], attributes[i + 1]);
  }
  builder.open.push_back(element);
}

void XMLCALL endElement(void* data, const XML_Char* /*name*/) {
  auto& builder = *static_cast<Builder*>(data);
  if (builder.skipped > 0) {
    --builder.skipped;
  } else {
    builder.open.pop_back();
  }
}

void XMLCALL characters(void* data, const XML_Char* text, int length) {
  auto& builder = *static_cast<Builder*>(data);
  if (!builder.open.empty() && builder.skipped == 0) {
    builder.open.back()->text.append(text, static_cast<size_t>(length));
  }
}

const XmlElement* childNamed(const XmlElement& element, std::string_view name) {
  for (const auto& child : element.children) {
    if (child.name == name) return &child;
  }
  return nullptr;
}

bool isStatusAttribute(std::string_view name) {
  return name == "requestID" || name == "statusCode" || name == "statusSeverity" ||
         name == "statusMessage";
}

// An element inside a record: text when it holds nothing else, otherwise an object whose
// keys are its attributes ("@name") and its children's names.
Json recordValue(const XmlElement& element) {
  if (element.children.empty() && element.attributes.empty()) return element.text;
  Json object = Json::object();
  for (const auto& [key, value] : element.attributes) object["@" + key] = value;
  if (element.children.empty()) object["#text"] = element.text;
  for (const auto& child : element.children) {
    Json value = recordValue(child);
    auto found = object.find(child.name);
    if (found == object.end()) {
      object[child.name] = std::move(value);
    } else {
      // recordValue never makes an array, so an array here is a repeated name.
      if (!found->is_array()) *found = Json::array({std::move(*found)});
      found->push_back(std::move(value));
    }
  }
  return object;
}

}  // namespace

std::optional<std::string_view> XmlElement::attribute(std::string_view key) const {
  for (const auto& [name, value] : attributes) {
    if (name == key) return value;
  }
  return std::nullopt;
}

std::vector<const XmlElement*> ResponseDocument::responses() const {
  std::vector<const XmlElement*> found;
  const XmlElement* messages = childNamed(root, "QBXMLMsgsRs");
  if (root.name != "QBXML" || messages == nullptr) return found;
  for (const auto& child : messages->children) found.push_back(&child);
  return found;
}

std::optional<ResponseDocument> parseResponse(std::string_view xml, std::string& error,
                                              bool records) {
  const std::unique_ptr<XML_ParserStruct, decltype(&XML_ParserFree)> parser(
      XML_ParserCreate("UTF-8"), &XML_ParserFree);
  Builder builder;
  if (!records) builder.keptDepth = kResponseDepth;
  XML_SetUserData(parser.get(), &builder);
  XML_SetElementHandler(parser.get(), startElement, endElement);
  XML_SetCharacterDataHandler(parser.get(), characters);
  // In pieces: Expat copies what it is given, and a whole list's response is megabytes.
  constexpr size_t kPiece = 1 << 16;
  for (size_t at = 0;; at += kPiece) {
    const std::string_view piece = xml.substr(std::min(at, xml.size()), kPiece);
    const bool last = at + kPiece >= xml.size();
    if (XML_Parse(parser.get(), piece.data(), static_cast<int>(piece.size()),
                  last ? XML_TRUE : XML_FALSE) != XML_STATUS_OK) {
      error = "line " + std::to_string(XML_GetCurrentLineNumber(parser.get())) + ": " +
              XML_ErrorString(XML_GetErrorCode(parser.get()));
      return std::nullopt;
    }
    if (last) break;
  }
  ResponseDocument document{std::move(builder.root)};
  if (document.root.name != "QBXML" || childNamed(document.root, "QBXMLMsgsRs") == nullptr) {
    error = "no QBXML/QBXMLMsgsRs element";
    return std::nullopt;
  }
  return document;
}

Severity severityOf(const XmlElement& response) {
  const auto severity = response.attribute("statusSeverity");
  if (severity == "Info") return Severity::Info;
  if (severity == "Warn") return Severity::Warn;
  return Severity::Error;
}

std::string statusLine(const XmlElement& response) {
  std::string line = response.name;
  if (const auto id = response.attribute("requestID")) line += " requestID=" + std::string(*id);
  line += " statusCode=" + std::string(response.attribute("statusCode").value_or(""));
  line += " statusSeverity=" + std::string(response.attribute("statusSeverity").value_or(""));
  // Last, so that the message runs to the end of the line as QuickBooks wrote it.
  line += " statusMessage=" + std::string(response.attribute("statusMessage").value_or(""));
  return line;
}

std::string responsesAsJson(const ResponseDocument& document) {
  Json all = Json::array();
  for (const XmlElement* response : document.responses()) {
    Json entry = Json::object();
    entry["response"] = response->name;
    for (const char* key : {"requestID", "statusCode", "statusSeverity", "statusMessage"}) {
      if (const auto value = response->attribute(key)) entry[key] = *value;
    }
    for (const auto& [key, value] : response->attributes) {
      if (!isStatusAttribute(key)) entry[key] = value;
    }
    Json records = Json::array();
    for (const auto& record : response->children) {
      records.push_back(Json::object({{record.name, recordValue(record)}}));
    }
    entry["records"] = std::move(records);
    all.push_back(std::move(entry));
  }
  return all.dump(2) + "\n";
}

}  // namespace droqbxml::cli

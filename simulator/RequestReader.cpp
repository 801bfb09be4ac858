// Reads a request document as QuickBooks does: the prolog by hand (the QBXML DOCTYPE
// without a system literal, the <?qbxml version?>), then Expat for the rest, with the
// DOCTYPE replaced by blanks so that line numbers stay right and no DTD ever reaches the
// parser; then the qbXML 13.0 checks, in the version the document declares. Size, nesting
// and element count are bounded.
#include <expat.h>

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "droqbxml/runtime/Utf.hpp"
#include "simulator/RequestDocument.hpp"
#include "simulator/internal/SchemaCheck.hpp"

namespace droqbxml::simulator {

const XmlNode* XmlNode::child(std::string_view childName) const {
  const auto found = std::find_if(children.begin(), children.end(),
                                  [&](const XmlNode& node) { return node.name == childName; });
  return found == children.end() ? nullptr : &*found;
}

std::vector<const XmlNode*> XmlNode::childrenNamed(std::string_view childName) const {
  std::vector<const XmlNode*> found;
  for (const XmlNode& node : children) {
    if (node.name == childName) found.push_back(&node);
  }
  return found;
}

std::optional<std::string> XmlNode::attribute(std::string_view attributeName) const {
  for (const auto& [name, value] : attributes) {
    if (name == attributeName) return value;
  }
  return std::nullopt;
}

namespace internal {

bool isKnownVersion(std::string_view version) {
  // The qbXML versions QuickBooks Desktop answers, up to the 13.0 of the stand-in's tables.
  static constexpr std::string_view kKnownVersions[] = {"1.0",  "1.1",  "2.0",  "2.1", "3.0", "4.0",
                                                        "4.1",  "5.0",  "6.0",  "7.0", "8.0", "9.0",
                                                        "10.0", "11.0", "12.0", "13.0"};
  return std::find(std::begin(kKnownVersions), std::end(kKnownVersions), version) !=
         std::end(kKnownVersions);
}

}  // namespace internal

namespace {

using internal::ProblemList;

constexpr int kMaxDepth = 200;
constexpr std::size_t kMaxElements = 1'000'000;

bool isSpace(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r'; }

// The 1-based line of a byte offset, counting CR LF, CR and LF as one line end each (as
// Expat does).
int lineAt(std::string_view text, std::size_t offset) {
  int line = 1;
  for (std::size_t i = 0; i < offset && i < text.size(); ++i) {
    if (text[i] == '\n' || (text[i] == '\r' && (i + 1 >= text.size() || text[i + 1] != '\n'))) {
      ++line;
    }
  }
  return line;
}

std::string notUtf8(std::string_view text, std::size_t offset) {
  static constexpr char kHex[] = "0123456789ABCDEF";
  const auto byte = static_cast<unsigned char>(text[offset]);
  return std::string("text is not valid UTF-8 (byte 0x") + kHex[byte >> 4] + kHex[byte & 0x0F] +
         ")";
}

bool isVersion(std::string_view version) {
  const std::size_t point = version.find('.');
  const auto digits = [](std::string_view part) {
    return !part.empty() &&
           std::all_of(part.begin(), part.end(), [](char c) { return c >= '0' && c <= '9'; });
  };
  return point != std::string_view::npos && digits(version.substr(0, point)) &&
         digits(version.substr(point + 1));
}

// What the hand-read prolog found.
struct Prolog {
  std::string version;        // from <?qbxml version?>, else from the DOCTYPE's public identifier
  std::size_t versionAt = 0;  // where it was declared
  bool versionFromDoctype = false;
  std::size_t doctypeBegin = 0;
  std::size_t doctypeEnd = 0;   // equal to doctypeBegin when there is no DOCTYPE
  bool versionRefused = false;  // a <?qbxml?> without a usable version was reported
  bool fatal = false;           // a problem that stops reading here
};

// Reads the XML declaration, comments, processing instructions and the DOCTYPE before the
// root element. Only the DOCTYPE is taken away from what Expat sees; the rest Expat reads
// again, and anything unusual is left for Expat to report.
class PrologReader {
 public:
  // `text` is the document, `end` where its well-formed UTF-8 stops.
  PrologReader(std::string_view text, std::size_t end, ProblemList& problems)
      : text_(text), input_(text.substr(0, end)), problems_(problems) {}

  Prolog read() {
    if (input_.starts_with("\xEF\xBB\xBF")) pos_ = 3;
    std::string doctypeVersion;
    bool sawDoctype = false;
    while (!prolog_.fatal) {
      while (pos_ < input_.size() && isSpace(input_[pos_])) ++pos_;
      const std::string_view rest = input_.substr(pos_);
      if (rest.starts_with("<?")) {
        const std::size_t close = rest.find("?>");
        if (close == std::string_view::npos) break;
        instruction(rest.substr(2, close - 2));
        pos_ += close + 2;
      } else if (rest.starts_with("<!--")) {
        const std::size_t close = rest.find("-->", 4);
        if (close == std::string_view::npos) break;
        pos_ += close + 3;
      } else if (rest.starts_with("<!DOCTYPE")) {
        if (sawDoctype) {
          fail(pos_, "more than one DOCTYPE");
          break;
        }
        sawDoctype = true;
        prolog_.doctypeBegin = pos_;
        doctypeVersion = doctype();
        prolog_.doctypeEnd = pos_;
      } else {
        break;
      }
    }
    if (prolog_.version.empty() && !doctypeVersion.empty()) {
      prolog_.version = doctypeVersion;
      prolog_.versionAt = prolog_.doctypeBegin;
      prolog_.versionFromDoctype = true;
    }
    return prolog_;
  }

 private:
  void fail(std::size_t at, std::string message) {
    problems_.add(lineAt(text_, at), "", std::move(message));
    prolog_.fatal = true;
  }

  // A construct that began at `start` did not end well: either the input stopped at bytes
  // that are not UTF-8, or the construct itself is wrong.
  void ranOut(std::size_t start, std::string message) {
    if (input_.size() < text_.size()) {
      fail(input_.size(), notUtf8(text_, input_.size()));
    } else {
      fail(start, std::move(message));
    }
  }

  void instruction(std::string_view body) {
    const std::size_t targetEnd = std::min(body.find_first_of(" \t\r\n"), body.size());
    if (body.substr(0, targetEnd) != "qbxml" || !prolog_.version.empty()) return;
    std::string_view rest = body.substr(targetEnd);
    const std::size_t at = rest.find("version");
    std::string version;
    bool found = false;
    if (at != std::string_view::npos) {
      rest.remove_prefix(at + 7);
      while (!rest.empty() && isSpace(rest.front())) rest.remove_prefix(1);
      if (rest.starts_with('=')) {
        rest.remove_prefix(1);
        while (!rest.empty() && isSpace(rest.front())) rest.remove_prefix(1);
        if (!rest.empty() && (rest.front() == '"' || rest.front() == '\'')) {
          const std::size_t close = rest.find(rest.front(), 1);
          if (close != std::string_view::npos) {
            version = rest.substr(1, close - 1);
            found = true;
          }
        }
      }
    }
    prolog_.versionRefused = !found || !isVersion(version);
    if (!found) {
      problems_.add(lineAt(text_, pos_), "",
                    "the qbxml processing instruction has no version=\"N.N\"");
    } else if (!isVersion(version)) {
      problems_.add(lineAt(text_, pos_), "",
                    "qbXML version " + internal::quoted(version) + " is not of the form N.N");
    } else {
      prolog_.version = version;
      prolog_.versionAt = pos_;
    }
  }

  bool skipSpace() {
    const std::size_t start = pos_;
    while (pos_ < input_.size() && isSpace(input_[pos_])) ++pos_;
    return pos_ > start;
  }

  bool literal(std::string* value) {
    if (pos_ >= input_.size() || (input_[pos_] != '"' && input_[pos_] != '\'')) return false;
    const std::size_t close = input_.find(input_[pos_], pos_ + 1);
    if (close == std::string_view::npos) return false;
    if (value) *value = input_.substr(pos_ + 1, close - pos_ - 1);
    pos_ = close + 1;
    return true;
  }

  // <!DOCTYPE Name (PUBLIC "id" ["system"] | SYSTEM "system")? S? '>': the system literal
  // may be missing (QuickBooks accepts that); an internal subset is refused. Returns the
  // version named by a public identifier such as "-//INTUIT//DTD QBXML QBD 1.0//EN".
  std::string doctype() {
    static constexpr std::string_view kMalformed =
        "malformed DOCTYPE: expected <!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.0//EN\" >";
    const std::size_t start = pos_;
    pos_ += 9;
    if (!skipSpace()) {
      ranOut(start, std::string(kMalformed));
      return {};
    }
    const std::size_t nameStart = pos_;
    while (pos_ < input_.size() && !isSpace(input_[pos_]) && input_[pos_] != '>' &&
           input_[pos_] != '[') {
      ++pos_;
    }
    const std::string_view name = input_.substr(nameStart, pos_ - nameStart);
    skipSpace();
    std::string publicId;
    bool ok = !name.empty();
    if (ok && input_.substr(pos_).starts_with("PUBLIC")) {
      pos_ += 6;
      ok = skipSpace() && literal(&publicId);
      skipSpace();
      if (ok && literal(nullptr)) skipSpace();
    } else if (ok && input_.substr(pos_).starts_with("SYSTEM")) {
      pos_ += 6;
      ok = skipSpace() && literal(nullptr);
      skipSpace();
    }
    if (ok && pos_ < input_.size() && input_[pos_] == '[') {
      fail(pos_,
           "a DOCTYPE with an internal subset is not accepted: a request may not declare "
           "entities or other markup");
      return {};
    }
    if (!ok || pos_ >= input_.size() || input_[pos_] != '>') {
      ranOut(start, std::string(kMalformed));
      return {};
    }
    ++pos_;
    if (name != "QBXML") {
      problems_.add(lineAt(text_, start), "",
                    "the DOCTYPE names " + internal::quoted(name) + "; a request's root is QBXML");
    }
    // The version is the last "N.N" in the public identifier.
    std::string version;
    std::size_t run = 0;
    for (std::size_t i = 0; i <= publicId.size(); ++i) {
      if (i < publicId.size() &&
          ((publicId[i] >= '0' && publicId[i] <= '9') || publicId[i] == '.')) {
        continue;
      }
      if (isVersion(std::string_view(publicId).substr(run, i - run))) {
        version = publicId.substr(run, i - run);
      }
      run = i + 1;
    }
    return version;
  }

  std::string_view text_;
  std::string_view input_;
  ProblemList& problems_;
  std::size_t pos_ = 0;
  Prolog prolog_;
};

// Builds the XmlNode tree with Expat. No DTD reaches it, entity declarations and DOCTYPEs
// stop it, parameter entities are never parsed, and depth and element count are bounded.
class TreeBuilder {
 public:
  explicit TreeBuilder(ProblemList& problems)
      : problems_(problems), parser_(XML_ParserCreate("UTF-8")) {}
  ~TreeBuilder() {
    if (parser_) XML_ParserFree(parser_);
  }
  TreeBuilder(const TreeBuilder&) = delete;
  TreeBuilder& operator=(const TreeBuilder&) = delete;

  // Parses the document with the DOCTYPE blanked out, up to `end` (where well-formed UTF-8
  // stops). The tree, or nothing after a reported problem.
  std::optional<XmlNode> parse(std::string_view text, const Prolog& prolog, std::size_t end) {
    if (!parser_) {
      problems_.add(1, "", "the XML parser could not be created");
      return std::nullopt;
    }
    XML_SetUserData(parser_, this);
    XML_SetParamEntityParsing(parser_, XML_PARAM_ENTITY_PARSING_NEVER);
    XML_SetElementHandler(parser_, &TreeBuilder::onStart, &TreeBuilder::onEnd);
    XML_SetCharacterDataHandler(parser_, &TreeBuilder::onText);
    XML_SetStartDoctypeDeclHandler(parser_, &TreeBuilder::onDoctype);
    XML_SetEntityDeclHandler(parser_, &TreeBuilder::onEntity);

    std::string blank(text.substr(prolog.doctypeBegin, prolog.doctypeEnd - prolog.doctypeBegin));
    std::replace_if(
        blank.begin(), blank.end(), [](char c) { return c != '\r' && c != '\n'; }, ' ');
    const std::size_t stop = std::min(end, text.size());
    const std::string_view pieces[] = {text.substr(0, prolog.doctypeBegin), blank,
                                       text.substr(prolog.doctypeEnd, stop - prolog.doctypeEnd)};
    for (std::string_view piece : pieces) {
      if (!feed(piece, false)) return std::nullopt;
    }
    if (stop < text.size()) {
      problems_.add(lineAt(text, stop), path(), notUtf8(text, stop));
      return std::nullopt;
    }
    if (!feed({}, true)) return std::nullopt;
    return std::move(root_);
  }

 private:
  bool feed(std::string_view piece, bool final) {
    if (stopped_) return false;
    if (XML_Parse(parser_, piece.data(), static_cast<int>(piece.size()),
                  final ? XML_TRUE : XML_FALSE) == XML_STATUS_OK) {
      return true;
    }
    if (!stopped_) {
      std::string reason = XML_ErrorString(XML_GetErrorCode(parser_));
      // Expat words some errors "not well-formed (invalid token)": keep the part in brackets.
      if (reason.starts_with("not well-formed (") && reason.ends_with(')')) {
        reason = reason.substr(17, reason.size() - 18);
      }
      problems_.add(currentLine(), path(), "not well-formed XML: " + reason);
      stopped_ = true;
    }
    return false;
  }

  int currentLine() const { return static_cast<int>(XML_GetCurrentLineNumber(parser_)); }

  std::string path() const {
    std::string joined;
    for (const XmlNode* node : open_) {
      if (!joined.empty()) joined += '/';
      joined += node->name;
    }
    return joined;
  }

  // The path of a child of the innermost open element.
  std::string pathTo(std::string_view name) const {
    std::string joined = path();
    if (!joined.empty()) joined += '/';
    joined += name;
    return joined;
  }

  void stop(std::string element, std::string message) {
    problems_.add(currentLine(), std::move(element), std::move(message));
    stopped_ = true;
    XML_StopParser(parser_, XML_FALSE);
  }

  static void onStart(void* data, const XML_Char* name, const XML_Char** attributes) {
    auto& self = *static_cast<TreeBuilder*>(data);
    if (self.stopped_) return;
    if (static_cast<int>(self.open_.size()) >= kMaxDepth) {
      self.stop(self.pathTo(name),
                "elements nested deeper than " + std::to_string(kMaxDepth) + " levels");
      return;
    }
    if (++self.elements_ > kMaxElements) {
      self.stop(self.pathTo(name),
                "more than " + std::to_string(kMaxElements) + " elements in one document");
      return;
    }
    XmlNode node;
    node.name = name;
    node.line = self.currentLine();
    for (const XML_Char** attribute = attributes; *attribute; attribute += 2) {
      node.attributes.emplace_back(attribute[0], attribute[1]);
    }
    if (self.open_.empty()) {
      self.root_ = std::move(node);
      self.open_.push_back(&*self.root_);
    } else {
      // Only the innermost open element gains children, so the pointers to its ancestors
      // stay valid while its own vector grows.
      auto& siblings = self.open_.back()->children;
      siblings.push_back(std::move(node));
      self.open_.push_back(&siblings.back());
    }
  }

  static void onEnd(void* data, const XML_Char* /*name*/) {
    auto& self = *static_cast<TreeBuilder*>(data);
    if (!self.stopped_ && !self.open_.empty()) self.open_.pop_back();
  }

  static void onText(void* data, const XML_Char* text, int length) {
    auto& self = *static_cast<TreeBuilder*>(data);
    if (!self.stopped_ && !self.open_.empty()) {
      self.open_.back()->text.append(text, static_cast<std::size_t>(length));
    }
  }

  static void onDoctype(void* data, const XML_Char* /*name*/, const XML_Char* /*systemId*/,
                        const XML_Char* /*publicId*/, int /*hasInternalSubset*/) {
    auto& self = *static_cast<TreeBuilder*>(data);
    if (!self.stopped_) self.stop(self.path(), "a DOCTYPE is not accepted here");
  }

  static void onEntity(void* data, const XML_Char* entityName, int /*isParameterEntity*/,
                       const XML_Char* /*value*/, int /*valueLength*/, const XML_Char* /*base*/,
                       const XML_Char* /*systemId*/, const XML_Char* /*publicId*/,
                       const XML_Char* /*notationName*/) {
    auto& self = *static_cast<TreeBuilder*>(data);
    if (!self.stopped_) {
      self.stop(self.path(),
                "entity declarations are not accepted ('" + std::string(entityName) + "')");
    }
  }

  ProblemList& problems_;
  XML_Parser parser_;
  std::optional<XmlNode> root_;
  std::vector<XmlNode*> open_;
  std::size_t elements_ = 0;
  bool stopped_ = false;
};

}  // namespace

ReadResult readRequest(std::string_view utf8Document) {
  ReadResult result;
  ProblemList problems(result.problems);
  if (utf8Document.size() > kMaxRequestBytes) {
    problems.add(1, "",
                 "the document has " + std::to_string(utf8Document.size()) +
                     " bytes; a request may have at most " + std::to_string(kMaxRequestBytes) +
                     " (100 MB)");
    return result;
  }
  const std::size_t end = std::min(firstInvalidUtf8(utf8Document), utf8Document.size());
  const Prolog prolog = PrologReader(utf8Document, end, problems).read();
  if (prolog.fatal) return result;
  std::optional<XmlNode> root = TreeBuilder(problems).parse(utf8Document, prolog, end);
  if (!root) return result;
  if (prolog.version.empty() && !prolog.versionRefused) {
    problems.add(1, "",
                 "no qbXML version: a request starts with <?qbxml version=\"N.N\"?> or the "
                 "QBXML DOCTYPE");
  }
  internal::DeclaredVersion version;
  if (!prolog.version.empty()) {
    if (!internal::isKnownVersion(prolog.version)) {
      problems.add(lineAt(utf8Document, prolog.versionAt), "",
                   "qbXML version " + internal::quoted(prolog.version) +
                       " is not one QuickBooks Desktop knows (1.0, 1.1, 2.0, 2.1, 3.0, 4.0, 4.1, "
                       "5.0 and every N.0 up to 13.0)");
    } else {
      const std::size_t point = prolog.version.find('.');
      version = {std::stoi(prolog.version.substr(0, point)) * 10 +
                     std::stoi(prolog.version.substr(point + 1)),
                 prolog.version, prolog.versionFromDoctype};
    }
  }
  std::vector<ValueRefusal> refusals;
  internal::checkRequestTree(*root, version, problems, refusals);
  const bool readable = std::all_of(result.problems.begin(), result.problems.end(),
                                    [](const Problem& problem) { return problem.perRequest; });
  if (readable) {
    result.document = RequestDocument{prolog.version, std::move(*root), std::move(refusals)};
  }
  return result;
}

}  // namespace droqbxml::simulator

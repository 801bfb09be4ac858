// Checks a request tree against the qbXML 13.0 tables: children matched against each
// aggregate's content automaton (order, required children, unknown elements, cardinality,
// choices, the declared qbXML version), attributes, the lexical form of every leaf value,
// and what QuickBooks Desktop refuses although the schema allows it.
#include "simulator/internal/SchemaCheck.hpp"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace droqbxml::simulator::internal {
namespace {

bool isSpace(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r'; }
bool isDigit(char c) { return c >= '0' && c <= '9'; }
bool isHex(char c) { return isDigit(c) || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F'); }

std::string_view trimmed(std::string_view text) {
  while (!text.empty() && isSpace(text.front())) text.remove_prefix(1);
  while (!text.empty() && isSpace(text.back())) text.remove_suffix(1);
  return text;
}

std::string_view withoutSign(std::string_view text) {
  if (!text.empty() && (text.front() == '+' || text.front() == '-')) text.remove_prefix(1);
  return text;
}

bool isInteger(std::string_view text) {
  const std::string_view digits = withoutSign(text);
  return !digits.empty() && std::all_of(digits.begin(), digits.end(), isDigit);
}

// Digits with an optional fraction: "12", "12.", "12.345", ".5", each with an optional sign.
bool isDecimal(std::string_view text) {
  const std::string_view body = withoutSign(text);
  const std::size_t point = body.find('.');
  const std::string_view whole = body.substr(0, point);
  const std::string_view fraction =
      point == std::string_view::npos ? std::string_view() : body.substr(point + 1);
  return (!whole.empty() || !fraction.empty()) &&
         std::all_of(whole.begin(), whole.end(), isDigit) &&
         std::all_of(fraction.begin(), fraction.end(), isDigit);
}

// The value of an INTTYPE text, held within +-10^12 so that long texts cannot overflow.
long long clampedInteger(std::string_view text) {
  long long value = 0;
  for (char c : withoutSign(text)) value = std::min(value * 10 + (c - '0'), 1'000'000'000'000LL);
  return !text.empty() && text.front() == '-' ? -value : value;
}

int number(std::string_view digits) {
  int value = 0;
  for (char c : digits) value = value * 10 + (c - '0');
  return value;
}

bool fixedDigits(std::string_view text, std::size_t at, std::size_t count) {
  return at + count <= text.size() &&
         std::all_of(text.begin() + static_cast<std::ptrdiff_t>(at),
                     text.begin() + static_cast<std::ptrdiff_t>(at + count), isDigit);
}

// yyyy-mm-dd naming a day of the Gregorian calendar (years 0001 to 9999).
bool isDate(std::string_view text) {
  if (text.size() != 10 || !fixedDigits(text, 0, 4) || text[4] != '-' || !fixedDigits(text, 5, 2) ||
      text[7] != '-' || !fixedDigits(text, 8, 2)) {
    return false;
  }
  const int year = number(text.substr(0, 4));
  const int month = number(text.substr(5, 2));
  const int day = number(text.substr(8, 2));
  if (year < 1 || month < 1 || month > 12 || day < 1) return false;
  static constexpr std::array<int, 12> kDays{31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
  const bool leap = (year % 4 == 0 && year % 100 != 0) || year % 400 == 0;
  return day <= kDays[static_cast<std::size_t>(month - 1)] + (month == 2 && leap ? 1 : 0);
}

// hh:mm or hh:mm:ss at the start of `text`, within a day.
bool isClock(std::string_view text, bool withSeconds) {
  const std::size_t size = withSeconds ? 8 : 5;
  if (text.size() != size || !fixedDigits(text, 0, 2) || text[2] != ':' ||
      !fixedDigits(text, 3, 2) || number(text.substr(0, 2)) > 23 ||
      number(text.substr(3, 2)) > 59) {
    return false;
  }
  return !withSeconds ||
         (text[5] == ':' && fixedDigits(text, 6, 2) && number(text.substr(6)) <= 59);
}

// A date, optionally "T" and hh:mm:ss, and after the time optionally +hh:mm or -hh:mm.
bool isDateTime(std::string_view text) {
  if (!isDate(text.substr(0, 10))) return false;
  if (text.size() == 10) return true;
  if (text.size() < 19 || text[10] != 'T' || !isClock(text.substr(11, 8), true)) return false;
  if (text.size() == 19) return true;
  return (text[19] == '+' || text[19] == '-') && isClock(text.substr(20), false);
}

// [+-]PT, then hours, minutes and seconds, each optional ("PT1H30M"), at least one of them.
bool isTimeInterval(std::string_view text) {
  text = withoutSign(text);
  if (!text.starts_with("PT") || text.size() == 2) return false;
  std::string_view units = "HMS";
  for (std::size_t at = 2; at < text.size();) {
    std::size_t end = at;
    while (end < text.size() && isDigit(text[end])) ++end;
    if (end == at || end == text.size()) return false;
    const std::size_t unit = units.find(text[end]);
    if (unit == std::string_view::npos) return false;
    units.remove_prefix(unit + 1);
    at = end + 1;
  }
  return true;
}

bool isGuid(std::string_view text) {
  if (text == "0") return true;
  static constexpr std::string_view kShape = "{xxxxxxxx-xxxx-xxxx-xxxx-xxxxxxxxxxxx}";
  if (text.size() != kShape.size()) return false;
  for (std::size_t i = 0; i < kShape.size(); ++i) {
    if (kShape[i] == 'x' ? !isHex(text[i]) : text[i] != kShape[i]) return false;
  }
  return true;
}

std::size_t characterCount(std::string_view utf8) {
  return static_cast<std::size_t>(std::count_if(utf8.begin(), utf8.end(), [](char c) {
    return (static_cast<unsigned char>(c) & 0xC0) != 0x80;
  }));
}

std::string joined(const std::vector<std::string_view>& names, std::string_view separator) {
  std::string text;
  for (std::size_t i = 0; i < names.size(); ++i) {
    if (i > 0) text += separator;
    text += names[i];
  }
  return text;
}

// "'A'", "'A' or 'B'", "'A', 'B' or 'C'".
std::string alternatives(const std::vector<std::string_view>& names) {
  std::string text;
  for (std::size_t i = 0; i < names.size(); ++i) {
    if (i > 0) text += i + 1 == names.size() ? " or " : ", ";
    text += "'" + std::string(names[i]) + "'";
  }
  return text;
}

// At most `limit` names, then how many more there are.
std::string listed(const std::vector<std::string_view>& names, std::size_t limit) {
  if (names.size() <= limit) return joined(names, ", ");
  const std::vector<std::string_view> shown(names.begin(),
                                            names.begin() + static_cast<std::ptrdiff_t>(limit));
  return joined(shown, ", ") + " and " + std::to_string(names.size() - limit) + " more";
}

std::vector<std::string_view> valuesOf(std::uint16_t first, std::uint16_t count) {
  const auto values = enumValues(first, count);
  return {values.begin(), values.end()};
}

// "13.0" from 130.
std::string versionText(int tenths) {
  return std::to_string(tenths / 10) + "." + std::to_string(tenths % 10);
}

class TreeChecker {
 public:
  TreeChecker(const DeclaredVersion& version, ProblemList& problems,
              std::vector<ValueRefusal>& refusals)
      : version_(version), problems_(problems), refusals_(refusals) {}

  void checkRoot(XmlNode& root) {
    path_ = root.name;
    if (root.name != "QBXML") {
      report(root.line, "expected root element QBXML; found: " + root.name);
      return;
    }
    checkAggregate(root, findAggregate("QBXML"));
    checkDesktopEnvelope(root);
  }

 private:
  // Appends "/name" to the element path for the life of the object.
  class Step {
   public:
    Step(std::string& path, std::string_view name) : path_(path), size_(path.size()) {
      path_ += '/';
      path_ += name;
    }
    ~Step() { path_.resize(size_); }
    Step(const Step&) = delete;
    Step& operator=(const Step&) = delete;

   private:
    std::string& path_;
    std::size_t size_;
  };

  void report(int line, std::string message) { problems_.add(line, path_, std::move(message)); }

  // What the schema allows in the envelope and QuickBooks Desktop's request processor
  // refuses with its parse error: sign-on messages (QuickBooks Online Edition's),
  // subscriptions (they go through ProcessSubscription), a document with no QBXMLMsgsRq,
  // and onError="rollbackOnError".
  void checkDesktopEnvelope(const XmlNode& root) {
    bool messages = false;
    for (const XmlNode& child : root.children) {
      const Step step(path_, child.name);
      if (child.name == "SignonMsgsRq") {
        report(child.line,
               "QuickBooks Desktop refuses SignonMsgsRq: sign-on messages are for QuickBooks "
               "Online Edition");
      } else if (child.name == "QBXMLSubscriptionMsgsRq") {
        report(child.line,
               "QuickBooks Desktop refuses QBXMLSubscriptionMsgsRq in a request: subscriptions "
               "go through ProcessSubscription, not ProcessRequest");
      } else if (child.name == "QBXMLMsgsRq") {
        messages = true;
        if (child.attribute("onError") == "rollbackOnError") {
          report(child.line,
                 "QuickBooks Desktop refuses onError 'rollbackOnError' although the schema "
                 "lists it: use stopOnError or continueOnError");
        }
      }
    }
    if (!messages && root.children.empty()) {
      report(root.line,
             "QuickBooks Desktop refuses a QBXML without QBXMLMsgsRq: it has no "
             "request to answer");
    }
  }

  void checkElement(XmlNode& node, const Particle& particle) {
    if (particle.content == ContentKind::kValue) {
      checkLeaf(node, particle);
    } else if (particle.content == ContentKind::kAggregate) {
      checkAggregate(node, particle.aggregate);
    }
  }

  void checkLeaf(XmlNode& node, const Particle& leaf) {
    for (const auto& [name, value] : node.attributes) {
      if (name == "useMacro" && leaf.has(Particle::kTakesMacro)) continue;
      report(node.line, "unknown attribute '" + name + "' on " + node.name);
    }
    for (const XmlNode& child : node.children) {
      const Step step(path_, child.name);
      report(child.line, "unexpected element '" + child.name + "' in " + node.name +
                             ", which holds a value, not other elements");
    }
    if (auto problem = leafProblem(leaf, node.text)) {
      report(node.line, std::move(*problem));
    } else if (auto refused = refusedValue(leaf, node.text)) {
      problems_.add(node.line, path_, std::move(refused->message), true);
      if (request_ >= 0) {
        refusals_.push_back(
            {static_cast<std::size_t>(request_), node.name, node.text, refused->kind});
      }
    } else if (node.text.empty() && node.children.empty()) {
      node.text = leaf.defaultValue;
    }
  }

  // An element the declared qbXML version does not have yet.
  void checkVersion(const XmlNode& child, const XmlNode& parent, const Particle& particle) {
    if (particle.since <= version_.tenths) return;
    std::string message = "'" + child.name + "' in " + parent.name + " came with qbXML " +
                          versionText(particle.since) + "; this document is qbXML " + version_.text;
    if (version_.fromDoctype) {
      message +=
          " (QuickBooks takes the version from the DOCTYPE when there is no "
          "<?qbxml version?>)";
    }
    report(child.line, std::move(message));
  }

  void checkAggregate(XmlNode& node, int index) {
    const AggregateRule& rule = aggregates()[static_cast<std::size_t>(index)];
    checkAttributes(node, rule);
    const std::string_view text = trimmed(node.text);
    if (!text.empty()) {
      report(node.line, "unexpected text " + quoted(text) + " in " + node.name);
    }
    checkChildren(node, automatonOf(index));
  }

  void checkAttributes(const XmlNode& node, const AggregateRule& rule) {
    const auto rules = attributesOf(rule);
    for (const auto& attribute : node.attributes) {
      const std::string& name = attribute.first;
      const std::string& value = attribute.second;
      const auto found = std::find_if(rules.begin(), rules.end(),
                                      [&](const AttributeRule& r) { return r.name == name; });
      if (found == rules.end()) {
        report(node.line, "unknown attribute '" + name + "' on " + node.name);
        continue;
      }
      const auto values = valuesOf(found->firstEnum, found->enumCount);
      if (!values.empty() && std::find(values.begin(), values.end(), value) == values.end()) {
        report(node.line, quoted(value) + " is not a value of attribute '" + name + "' (" +
                              joined(values, ", ") + ")");
      }
    }
    for (const AttributeRule& r : rules) {
      if (r.required && !node.attribute(r.name)) {
        report(node.line,
               "missing required attribute '" + std::string(r.name) + "' on " + node.name);
      }
    }
  }

  static std::vector<int> next(const ContentAutomaton& automaton, const std::vector<int>& state) {
    if (state.empty()) return automaton.first;
    std::vector<int> candidates;
    for (int position : state) {
      for (int following : automaton.follow[static_cast<std::size_t>(position)]) {
        if (std::find(candidates.begin(), candidates.end(), following) == candidates.end()) {
          candidates.push_back(following);
        }
      }
    }
    std::sort(candidates.begin(), candidates.end());
    return candidates;
  }

  // named(next(state), name), without listing every position that may come next.
  static std::vector<int> nextNamed(const ContentAutomaton& automaton,
                                    const std::vector<int>& state, std::string_view name) {
    if (state.empty()) return named(automaton, automaton.first, name);
    std::vector<int> result;
    for (int position : state) {
      for (int following : automaton.follow[static_cast<std::size_t>(position)]) {
        if (automaton.nameAt(following) == name &&
            std::find(result.begin(), result.end(), following) == result.end()) {
          result.push_back(following);
        }
      }
    }
    std::sort(result.begin(), result.end());
    return result;
  }

  static std::vector<int> named(const ContentAutomaton& automaton,
                                const std::vector<int>& positions, std::string_view name) {
    std::vector<int> result;
    for (int position : positions) {
      if (automaton.nameAt(position) == name) result.push_back(position);
    }
    return result;
  }

  void checkChildren(XmlNode& node, const ContentAutomaton& automaton) {
    std::vector<int> state;  // empty: before the first child
    int run = 0;             // how many times in a row the current position matched
    const bool requests = path_ == "QBXML/QBXMLMsgsRq";
    for (XmlNode& child : node.children) {
      if (problems_.full()) return;
      if (requests) request_ = static_cast<int>(&child - node.children.data());
      const Step step(path_, child.name);
      std::vector<int> matched = nextNamed(automaton, state, child.name);
      if (!matched.empty()) {
        run = (!state.empty() && matched == state) ? run + 1 : 1;
        const Particle& particle = automaton.particleAt(matched.front());
        if (particle.maxOccurs > 1 && particle.maxOccurs != kUnbounded &&
            run > particle.maxOccurs) {
          report(child.line, tooMany(child.name, node.name, particle.maxOccurs));
        }
        if (run == 1) checkVersion(child, node, particle);
        state = std::move(matched);
        checkElement(child, particle);
        continue;
      }
      std::vector<int> all(automaton.positions.size());
      for (std::size_t i = 0; i < all.size(); ++i) all[i] = static_cast<int>(i);
      std::vector<int> elsewhere = named(automaton, all, child.name);
      if (elsewhere.empty()) {
        report(child.line, unknown(child.name, node.name));
        continue;
      }
      if (!named(automaton, state, child.name).empty()) {
        report(child.line,
               tooMany(child.name, node.name, automaton.particleAt(state.front()).maxOccurs));
      } else {
        report(child.line, misplaced(automaton, next(automaton, state), state, elsewhere,
                                     child.name, node.name));
      }
      state = std::move(elsewhere);
      run = 1;
      checkElement(child, automaton.particleAt(state.front()));
    }
    if (requests) request_ = -1;
    if (problems_.full()) return;
    const bool complete = state.empty()
                              ? automaton.acceptsEmpty
                              : std::any_of(state.begin(), state.end(), [&](int position) {
                                  return automaton.accepting[static_cast<std::size_t>(position)];
                                });
    if (!complete) {
      const auto& missing = state.empty()
                                ? automaton.missingAtStart
                                : automaton.missingAfter[static_cast<std::size_t>(state.front())];
      report(node.line, "missing required element " + alternatives(missing) + " in " + node.name);
    }
  }

  static std::string tooMany(const std::string& name, const std::string& parent, int most) {
    return "too many '" + name + "' elements in " + parent + " (at most " + std::to_string(most) +
           ")";
  }

  static std::string unknown(const std::string& name, const std::string& parent) {
    return "unknown element '" + name + "' in " + parent;
  }

  static std::string misplaced(const ContentAutomaton& automaton,
                               const std::vector<int>& candidates, const std::vector<int>& state,
                               const std::vector<int>& elsewhere, const std::string& name,
                               const std::string& parent) {
    std::vector<std::string_view> expected;
    for (int position : candidates) {
      const std::string_view candidate = automaton.nameAt(position);
      if (std::find(expected.begin(), expected.end(), candidate) == expected.end()) {
        expected.push_back(candidate);
      }
    }
    std::string message = expected.empty() ? "expected the end of " + parent
                                           : "expected one of: " + listed(expected, 12);
    message += "; found: " + name;
    if (!state.empty() && leadsTo(automaton, elsewhere, state)) {
      message += ", which belongs before " + std::string(automaton.nameAt(state.front()));
    }
    return message;
  }

  // Whether content may go on from one of `from` to one of `to` (so that an element found
  // too late would have fitted before the earlier one).
  static bool leadsTo(const ContentAutomaton& automaton, const std::vector<int>& from,
                      const std::vector<int>& to) {
    std::vector<bool> seen(automaton.positions.size(), false);
    std::vector<int> pending = from;
    while (!pending.empty()) {
      const int position = pending.back();
      pending.pop_back();
      for (int following : automaton.follow[static_cast<std::size_t>(position)]) {
        if (std::find(to.begin(), to.end(), following) != to.end()) return true;
        if (!seen[static_cast<std::size_t>(following)]) {
          seen[static_cast<std::size_t>(following)] = true;
          pending.push_back(following);
        }
      }
    }
    return false;
  }

  const DeclaredVersion& version_;
  ProblemList& problems_;
  std::vector<ValueRefusal>& refusals_;
  std::string path_;
  int request_ = -1;  // index of the request being checked among the QBXMLMsgsRq children
};

}  // namespace

void ProblemList::add(int line, std::string element, std::string message, bool perRequest) {
  if (full_) return;
  if (problems_.size() == kLimit) {
    problems_.push_back(
        {line, std::move(element),
         "more problems follow; only the first " + std::to_string(kLimit) + " are listed"});
    full_ = true;
    return;
  }
  problems_.push_back({line, std::move(element), std::move(message), perRequest});
}

std::string quoted(std::string_view text) {
  constexpr std::size_t kShown = 60;
  if (text.size() <= kShown) return "'" + std::string(text) + "'";
  std::size_t cut = kShown;
  while (cut > 0 && (static_cast<unsigned char>(text[cut]) & 0xC0) == 0x80) --cut;
  return "'" + std::string(text.substr(0, cut)) + "...'";
}

std::optional<std::string> valueProblem(ValueType type, std::string_view text) {
  const std::string_view collapsed = trimmed(text);
  switch (type) {
    case ValueType::kStr:
    case ValueType::kEnum:
      return std::nullopt;
    case ValueType::kId:
      if (characterCount(text) <= 36) return std::nullopt;
      return quoted(text) + " is longer than the 36 characters of an IDTYPE value";
    case ValueType::kBool:
      if (collapsed.empty() || collapsed == "true" || collapsed == "false" || collapsed == "1" ||
          collapsed == "0") {
        return std::nullopt;
      }
      return quoted(text) + " is not a BOOLTYPE value (true, false, 1, 0)";
    case ValueType::kDate:
      if (collapsed.empty() || isDate(collapsed)) return std::nullopt;
      return quoted(text) + " is not a DATETYPE value (a valid date yyyy-mm-dd)";
    case ValueType::kDateTime:
      if (collapsed.empty() || isDateTime(text)) return std::nullopt;
      return quoted(text) +
             " is not a DATETIMETYPE value (a valid date yyyy-mm-dd, optionally followed by "
             "Thh:mm:ss and then by +hh:mm or -hh:mm)";
    case ValueType::kInt:
      if (isInteger(collapsed)) return std::nullopt;
      return quoted(text) + " is not an INTTYPE value (a whole number)";
    case ValueType::kFloat:
      if (collapsed.empty() || isDecimal(collapsed)) return std::nullopt;
      return quoted(text) + " is not a FLOATTYPE value (a decimal number)";
    case ValueType::kTimeInterval:
      if (collapsed.empty() || isTimeInterval(collapsed)) return std::nullopt;
      return quoted(text) + " is not a TIMEINTERVALTYPE value (PTnHnMnS, e.g. PT1H30M)";
    case ValueType::kGuid:
      if (isGuid(text)) return std::nullopt;
      return quoted(text) +
             " is not a GUIDTYPE value ({XXXXXXXX-XXXX-XXXX-XXXX-XXXXXXXXXXXX} or 0)";
    case ValueType::kAmt:
    case ValueType::kPrice:
    case ValueType::kQuan:
    case ValueType::kPercent: {
      // Decimals are not counted here: QuickBooks takes "246.9" as a request and answers
      // it with a conversion error, so only text that is no number at all is refused.
      if (text.empty() || isDecimal(text)) return std::nullopt;
      constexpr std::string_view kNames[] = {"an AMTTYPE", "a PRICETYPE", "a QUANTYPE",
                                             "a PERCENTTYPE"};
      const auto which =
          static_cast<std::size_t>(static_cast<int>(type) - static_cast<int>(ValueType::kAmt));
      return quoted(text) + " is not " + std::string(kNames[which]) + " value (a number)";
    }
  }
  return std::nullopt;
}

std::optional<std::string> leafProblem(const Particle& leaf, std::string_view text) {
  if (text.empty() && !leaf.defaultValue.empty()) text = leaf.defaultValue;
  if (leaf.type == ValueType::kEnum) {
    const auto values = valuesOf(leaf.firstEnum, leaf.enumCount);
    if (std::find(values.begin(), values.end(), text) != values.end()) return std::nullopt;
    return quoted(text) + " is not one of: " + listed(values, 16);
  }
  if (auto problem = valueProblem(leaf.type, text)) return problem;
  if (leaf.has(Particle::kHasMinimum) && clampedInteger(trimmed(text)) < leaf.minimum) {
    return quoted(text) + " is less than " + std::to_string(leaf.minimum) + ", the least " +
           std::string(leaf.name) + " may be";
  }
  if (leaf.has(Particle::kHasMaximum) && clampedInteger(trimmed(text)) > leaf.maximum) {
    return quoted(text) + " is more than " + std::to_string(leaf.maximum) + ", the most " +
           std::string(leaf.name) + " may be";
  }
  return std::nullopt;
}

std::optional<ValueRefusalProblem> refusedValue(const Particle& leaf, std::string_view text) {
  if (leaf.type == ValueType::kStr) {
    if (leaf.maxLength == 0 || characterCount(text) <= leaf.maxLength) return std::nullopt;
    return ValueRefusalProblem{
        "text", quoted(text) + " has " + std::to_string(characterCount(text)) + " characters; " +
                    std::string(leaf.name) + " may have at most " + std::to_string(leaf.maxLength) +
                    " (QuickBooks answers the request with 3070)"};
  }
  struct NumberRule {
    ValueType type;
    std::string_view kind;
    std::string_view typeName;
    std::size_t digits;
    std::size_t leastDecimals;
    std::size_t mostDecimals;
    std::string_view form;
  };
  static constexpr std::array<NumberRule, 4> kRules{{
      {ValueType::kAmt, "amount", "AMTTYPE", 13, 2, 2, "1 to 13 digits, then none or 2 decimals"},
      {ValueType::kPrice, "price", "PRICETYPE", 10, 1, 5, "1 to 10 digits, then 1 to 5 decimals"},
      {ValueType::kQuan, "quantity", "QUANTYPE", 10, 1, 5, "1 to 10 digits, then 1 to 5 decimals"},
      {ValueType::kPercent, "percentage", "PERCENTTYPE", 10, 1, 5,
       "1 to 10 digits, then 1 to 5 decimals"},
  }};
  const auto rule = std::find_if(kRules.begin(), kRules.end(),
                                 [&](const NumberRule& r) { return r.type == leaf.type; });
  if (rule == kRules.end() || text.empty()) return std::nullopt;
  const std::string_view body = withoutSign(text);
  const std::size_t point = body.find('.');
  const std::size_t whole = std::min(point, body.size());
  const std::size_t decimals = point == std::string_view::npos ? 0 : body.size() - point - 1;
  const bool fits = whole >= 1 && whole <= rule->digits &&
                    (point == std::string_view::npos ||
                     (decimals >= rule->leastDecimals && decimals <= rule->mostDecimals));
  if (fits) return std::nullopt;
  return ValueRefusalProblem{
      rule->kind, quoted(text) + " does not fit " + std::string(rule->typeName) + " (" +
                      std::string(rule->form) + "; QuickBooks answers the request with 3040)"};
}

void checkRequestTree(XmlNode& root, const DeclaredVersion& version, ProblemList& problems,
                      std::vector<ValueRefusal>& refusals) {
  TreeChecker(version, problems, refusals).checkRoot(root);
}

}  // namespace droqbxml::simulator::internal

// Runs a table of steps through the by-name surface, as a host's script would, and compares
// every step's outcome with the one the table gives. One step a line:
//   new DroCustomer                 a fresh object of that ProgID, which the steps below use
//   BillAddress.City = "Storrs"     let, then the property read back
//   AttributeName(1)                a get (or a call where the member is a method)
// each followed by "=> " and the outcome: "text", a number, true, false, Empty, Null,
// Nothing, object CLASS, or error NUMBER SOURCE: DESCRIPTION. Texts use \t \r \n \" \\.
// DROQBXML_WRITE_GOLDENS=1 rewrites the outcomes.
#ifndef DROQBXML_TESTS_BYNAMETABLE_HPP_
#define DROQBXML_TESTS_BYNAMETABLE_HPP_

#include <gtest/gtest.h>

#include <cstdio>
#include <sstream>
#include <string>
#include <vector>

#include "droqbxml/component/ClassFactory.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace test {

inline std::string quoted(const Text& text) {
  std::string out = "\"";
  for (const char c : toUtf8(text)) {
    const char* escape = c == '\t'   ? "\\t"
                         : c == '\r' ? "\\r"
                         : c == '\n' ? "\\n"
                         : c == '"'  ? "\\\""
                         : c == '\\' ? "\\\\"
                                     : nullptr;
    out += escape ? std::string(escape) : std::string(1, c);
  }
  return out + "\"";
}

inline std::string shown(const Variant& value) {
  switch (value.kind()) {
    case Variant::Kind::String:
      return quoted(value.toText());
    case Variant::Kind::Boolean:
      return value.toBoolean() ? "true" : "false";
    case Variant::Kind::Empty:
      return "Empty";
    case Variant::Kind::Null:
      return "Null";
    case Variant::Kind::Object:
      return value.toObject() ? "object " + toUtf8(value.toObject()->className()) : "Nothing";
    default:
      return toUtf8(value.toText());
  }
}

// One token of a step: a quoted text (escapes undone), a number, or a word.
inline Variant argument(const std::string& token) {
  if (token.front() == '"') {
    std::string value;
    for (size_t i = 1; i + 1 < token.size(); ++i) {
      char c = token[i];
      if (c == '\\') {
        c = token[++i];
        c = c == 't' ? '\t' : c == 'r' ? '\r' : c == 'n' ? '\n' : c;
      }
      value += c;
    }
    return Variant(fromUtf8(value));
  }
  if (token == "true" || token == "false") return Variant(token == "true");
  if (token == "Empty") return Variant();
  if (token == "Null") return Variant::null();
  if (token.find('.') != std::string::npos) return Variant(std::stod(token));
  return Variant(static_cast<int32_t>(std::stol(token)));
}

// Where the quoted text opening at `at` ends (one past its closing quote).
inline size_t afterQuoted(const std::string& text, size_t at) {
  for (++at; text[at] != '"'; ++at) at += text[at] == '\\' ? 1 : 0;
  return at + 1;
}

// The outcome of one step on `object`.
inline std::string outcome(Ref<Object>& object, const std::string& step) {
  try {
    if (step.starts_with("new ")) {
      object = CreateObject(u"DroQbXml." + fromUtf8(step.substr(4)));
      return "";
    }
    Ref<Object> target = object;
    Variant result;
    for (size_t at = 0; at < step.size();) {
      const size_t end = step.find_first_of(".( ", at);
      const Text name = fromUtf8(step.substr(at, end - at));
      std::vector<Variant> args;
      at = end;
      if (at < step.size() && step[at] == '(') {
        while (step[at] != ')') {
          const size_t from = at + 1 + (step[at + 1] == ' ');
          at = step[from] == '"' ? afterQuoted(step, from) : step.find_first_of(",)", from);
          args.push_back(argument(step.substr(from, at - from)));
        }
        ++at;
      }
      if (at < step.size() && step[at] == ' ') {  // " = value"
        target->let(name, argument(step.substr(at + 3)));
        return shown(target->get(name));
      }
      const int32_t id = target->memberId(name);
      const bool method = target->classInfo().hasKind(id, MemberKind::Method);
      result = target->invoke(id, method ? MemberKind::Method : MemberKind::Get, args);
      if (at < step.size()) target = result.toObject(), ++at;
    }
    return shown(result);
  } catch (const ComError& error) {
    char number[16];
    std::snprintf(number, sizeof number, error.number() < 0 ? "0x%08X" : "%d", error.number());
    return std::string("error ") + number + " " + toUtf8(error.source()) + ": " +
           quoted(error.description()).substr(1, quoted(error.description()).size() - 2);
  }
}

// Runs testdata/<name> step by step and checks each outcome.
inline void runByNameTable(const std::string& name) {
  const std::string path = std::string(DROQBXML_TESTDATA_DIR) + "/" + name;
  std::istringstream lines(readFile(path));
  std::string table;
  std::string line;
  Ref<Object> object;
  for (int number = 1; std::getline(lines, line); ++number) {
    if (line.empty() || line.starts_with("#")) {
      table += line + "\n";
      continue;
    }
    size_t arrow = 0;
    while (arrow < line.size() && line.compare(arrow, 3, " =>") != 0) {
      arrow = line[arrow] == '"' ? afterQuoted(line, arrow) : arrow + 1;
    }
    const std::string step = line.substr(0, arrow);
    const std::string got = outcome(object, step);
    const std::string written = got.empty() ? step : step + " => " + got;
    EXPECT_EQ(line, written) << name << ":" << number;
    table += written + "\n";
  }
  if (const char* write = std::getenv("DROQBXML_WRITE_GOLDENS"); write && *write == '1') {
    writeFile(path, table);
  }
}

}  // namespace test
}  // namespace droqbxml

#endif  // DROQBXML_TESTS_BYNAMETABLE_HPP_

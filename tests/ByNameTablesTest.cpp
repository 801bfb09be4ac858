// Tables of steps run through the by-name surface, as a host's script would, each step's
// outcome compared with the one the table gives. One step a line:
//   new DroCustomer                 a fresh object of that ProgID for the steps below
//   BillAddress.City = "Storrs"     let, then the property read back
//   ParseRs("<A/>", 5)              a call (a get where the member is a property)
//   build BuildAddItem(2, it) FILE  the call on a new DroXmlBuilder, "it" the object; its
//                                   document compared with the golden requests/FILE
// then "=> " and the outcome: "text", a number, true, false, Empty, Nothing, object CLASS,
// or error NUMBER SOURCE: DESCRIPTION; a build gives the stand-in's problems with the
// document, or none. Texts use \t \r \n \" \\.
// DROQBXML_WRITE_GOLDENS=1 rewrites the outcomes.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <sstream>
#include <string>
#include <vector>

#include "droqbxml/component/ClassFactory.hpp"
#include "simulator/RequestDocument.hpp"
#include "tests/TableSupport.hpp"

namespace droqbxml {
namespace {

std::string shown(const Variant& value) {
  switch (value.kind()) {
    case Variant::Kind::String:
      return test::quoted(toUtf8(value.toText()), false);
    case Variant::Kind::Boolean:
      return value.toBoolean() ? "true" : "false";
    case Variant::Kind::Empty:
      return "Empty";
    case Variant::Kind::Object:
      return value.toObject() ? "object " + toUtf8(value.toObject()->className()) : "Nothing";
    default:
      return toUtf8(value.toText());
  }
}

// A quoted text (escapes undone), true, false, Empty, Null, a currency (in 1/10000, ending
// in @), a number with a point, a whole number, or "it" for the object `it`.
Variant argument(const std::string& token, const Ref<Object>& it) {
  if (token == "it") return Variant(it);
  if (token == "true" || token == "false") return Variant(token == "true");
  if (token == "Empty" || token == "Null") return token == "Null" ? Variant::null() : Variant();
  if (token.ends_with('@')) return Variant::currency(std::stoll(token));  // in 1/10000
  if (token.front() != '"') {
    if (token.find('.') != std::string::npos) return Variant(std::stod(token));
    return Variant(static_cast<int32_t>(std::stol(token)));
  }
  return Variant(fromUtf8(test::unquoted(token)));
}

std::string outcome(Ref<Object>& object, const std::string& step, const Ref<Object>& it);

// "build CALL [FILE]": CALL on a new builder, its document compared with requests/FILE.
std::string build(const Ref<Object>& it, const std::string& step) {
  Ref<Object> builder = CreateObject(u"DroQbXml.DroXmlBuilder");
  const size_t end = step.rfind(')') + 1;
  const std::string called = outcome(builder, step.substr(6, end - 6), it);
  if (called.starts_with("error ")) return called;
  const Text xml = builder->get(u"XML").toText();
  if (end < step.size()) {
    EXPECT_TRUE(test::matchesGolden(xml, "requests/" + step.substr(end + 1)));
  }
  std::string problems;
  for (const simulator::Problem& p : simulator::readRequest(toUtf8(xml)).problems) {
    const std::string problem = std::to_string(p.line) + " " + p.element + ": " + p.message;
    problems += (problems.empty() ? "" : ", ") + test::quoted(problem, false);
  }
  return problems.empty() ? "none" : problems;
}

std::string outcome(Ref<Object>& object, const std::string& step, const Ref<Object>& it) {
  try {
    if (step.starts_with("build ")) return build(object, step);
    if (step.starts_with("new ")) {
      object = CreateObject(u"DroQbXml." + fromUtf8(step.substr(4)));
      return toUtf8(object->className()) == step.substr(4) ? "" : shown(Variant(object));
    }
    Ref<Object> target = object;
    Variant result;
    for (size_t at = 0; at < step.size(); ++at) {
      if (at != 0) target = result.toObject();
      const size_t end = step.find_first_of(".( ", at);
      const Text name = fromUtf8(step.substr(at, end - at));
      std::vector<Variant> args;
      for (at = std::min(end, step.size());
           at < step.size() && step[at] != '.' && step[at] != ' ';) {
        const size_t from = step.find_first_not_of(' ', at + 1);
        at = step[from] == '"' ? test::afterQuoted(step, from) : step.find_first_of(",)", from);
        if (from != at) args.push_back(argument(step.substr(from, at - from), it));
        at += step[at] == ')' ? 1 : 0;
      }
      if (at < step.size() && step[at] == ' ') {  // " = value"
        target->let(name, argument(step.substr(at + 3), it));
        return shown(target->get(name));
      }
      const int32_t id = target->memberId(name);
      const bool method = target->classInfo().hasKind(id, MemberKind::Method);
      result = target->invoke(id, method ? MemberKind::Method : MemberKind::Get, args);
    }
    return shown(result);
  } catch (const ComError& error) {
    return test::errorOutcome(error, false);
  }
}

// Runs testdata/<name> step by step, "new" lines starting on a fresh object.
void runTable(const std::string& name) {
  Ref<Object> object;
  test::runTable(name, [&](const std::string& step) { return outcome(object, step, object); });
}

// Record setters: trim rules, checks and limits, cut values, setters that ignore their
// argument, emptiness flags, and the items collection.
TEST(ByNameTablesTest, RecordSetters) { runTable("records/setters_by_name.txt"); }

// Records read from responses: finding the own response, required elements, the sales
// sides, sales tax group members, the order of the contact fields; transaction lines.
TEST(ByNameTablesTest, RecordReading) { runTable("records/parse_by_name.txt"); }

// The element's trimming and attribute index, OnError's alternatives, the success test.
TEST(ByNameTablesTest, ElementAndBuilderRules) { runTable("checks/element_and_builder_rules.txt"); }

// Every published value check: closed lists, amounts, integers, strings, dates, prices,
// quantities and percents, their refusals and the runtime's failures they let through.
TEST(ByNameTablesTest, ValueChecks) { runTable("checks/value_checks.txt"); }

// Account, item, customer, job, estimate and invoice add requests of records set by name,
// against their golden files, with where they depart from the qbXML schema.
TEST(ByNameTablesTest, AddRequests) { runTable("requests/add_requests_by_name.txt"); }

}  // namespace
}  // namespace droqbxml

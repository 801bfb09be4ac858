// Checks a parsed request tree against the qbXML 13.0 tables: the QBXML envelope, every
// request type, and recursively every aggregate and leaf value below them, with the
// elements of the declared qbXML version and what QuickBooks Desktop refuses beyond the
// schema. Problems go to a capped list; nothing here throws for any tree.
#ifndef DROQBXML_SIMULATOR_INTERNAL_SCHEMACHECK_HPP_
#define DROQBXML_SIMULATOR_INTERNAL_SCHEMACHECK_HPP_

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "simulator/RequestDocument.hpp"
#include "simulator/internal/SchemaModel.hpp"

namespace droqbxml::simulator::internal {

// Collects problems up to a limit. The problem after the last one kept is replaced by a
// single note that more were found; from then on full() is true and callers stop.
class ProblemList {
 public:
  static constexpr std::size_t kLimit = 100;

  explicit ProblemList(std::vector<Problem>& problems) : problems_(problems) {}

  void add(int line, std::string element, std::string message, bool perRequest = false);
  bool full() const { return full_; }
  bool empty() const { return problems_.empty(); }

 private:
  std::vector<Problem>& problems_;
  bool full_ = false;
};

// Why `text` is not a value of `type`, or nothing when it is one. Follows the validator
// schema's lexical rules: BOOLTYPE, DATETYPE, INTTYPE and FLOATTYPE ignore surrounding
// XML white space; amounts, prices, quantities and percentages need a plain decimal number
// but any number of decimals (QuickBooks answers those per request, see refusedValue); an
// empty value is accepted where the schema accepts one. STRTYPE lengths are left to
// refusedValue; IDTYPE allows 36 characters. ENUMTYPE values are checked by leafProblem.
std::optional<std::string> valueProblem(ValueType type, std::string_view text);

// valueProblem, plus the leaf's enum values and bounds. An empty text stands for the
// leaf's default value, when it has one.
std::optional<std::string> leafProblem(const Particle& leaf, std::string_view text);

// What the schema refuses in a value that leafProblem lets through and QuickBooks answers
// in the request's status: a STRTYPE longer than the leaf's maximum length, a number with
// more digits or decimals than its type allows. `kind` as in ValueRefusal.
struct ValueRefusalProblem {
  std::string_view kind;
  std::string message;
};
std::optional<ValueRefusalProblem> refusedValue(const Particle& leaf, std::string_view text);

// Whether QuickBooks Desktop answers documents of this qbXML version ("1.0" ... "13.0",
// spelt exactly so).
bool isKnownVersion(std::string_view version);

// The qbXML version a document is read as, times ten (130 for 13.0), and how it was
// declared (for messages).
struct DeclaredVersion {
  int tenths = 130;
  std::string text = "13.0";
  bool fromDoctype = false;
};

// Checks a whole request tree whose root element is `root` (expected: QBXML). An empty
// leaf that has a default value in the schema (ActiveStatus, PaidStatus, ...) is given
// that value, as a validating parser does, so the handlers see what QuickBooks would use.
// Values QuickBooks refuses per request go to `refusals` as well as to `problems`.
void checkRequestTree(XmlNode& root, const DeclaredVersion& version, ProblemList& problems,
                      std::vector<ValueRefusal>& refusals);

// A value as quoted in a message: at most 60 bytes, cut at a character boundary.
std::string quoted(std::string_view text);

}  // namespace droqbxml::simulator::internal

#endif  // DROQBXML_SIMULATOR_INTERNAL_SCHEMACHECK_HPP_

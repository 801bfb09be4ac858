// The qbXML 13.0 rules the stand-in reads requests with: every aggregate of a request
// document (and the Ret aggregates the stand-in writes) as a tree of particles (elements,
// sequences, choices, each with its cardinality), leaf value types with their lengths,
// bounds and enum values, and attributes, compiled in from
// simulator/schema/SchemaTables.inc, and for each aggregate the automaton that matches a
// list of children against its content.
#ifndef DROQBXML_SIMULATOR_INTERNAL_SCHEMAMODEL_HPP_
#define DROQBXML_SIMULATOR_INTERNAL_SCHEMAMODEL_HPP_

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

namespace droqbxml::simulator::internal {

enum class ParticleKind : std::uint8_t { kElement, kSequence, kChoice };

// What an element holds: a value of a leaf type or another aggregate (kUnchecked marks
// sequences and choices, which hold no content of their own).
enum class ContentKind : std::uint8_t { kValue, kAggregate, kUnchecked };

// The qbXML leaf types (STRTYPE, IDTYPE, BOOLTYPE, ...).
enum class ValueType : std::uint8_t {
  kStr,
  kId,
  kBool,
  kDate,
  kDateTime,
  kInt,
  kAmt,
  kPrice,
  kQuan,
  kPercent,
  kFloat,
  kGuid,
  kEnum,
  kTimeInterval,
};

inline constexpr std::uint16_t kUnbounded = 0xFFFF;

// One row of an aggregate's content tree, stored in preorder: the particles of a sequence
// or choice follow it up to `end`, each child's subtree ending where the next begins.
struct Particle {
  ParticleKind kind;
  std::uint16_t minOccurs;
  std::uint16_t maxOccurs;  // kUnbounded for "any number"
  std::uint16_t end;        // index one past this particle's subtree
  std::string_view name;    // elements only
  ContentKind content;      // elements only
  std::int16_t aggregate;   // kAggregate: index of the aggregate in aggregates()
  ValueType type;           // kValue
  std::uint16_t maxLength;  // STRTYPE(n) in characters; 0 when unbounded
  std::uint16_t firstEnum;  // ENUMTYPE values: a range of enumValues()
  std::uint16_t enumCount;
  std::int32_t minimum;  // INTTYPE bounds, when the flags say so
  std::int32_t maximum;
  std::uint8_t flags;             // kHasMinimum, kHasMaximum, kTakesMacro
  std::uint8_t since;             // qbXML version that added it, times ten (21: 2.1); 0: all
  std::string_view defaultValue;  // what an empty element stands for; empty when none

  static constexpr std::uint8_t kHasMinimum = 1;
  static constexpr std::uint8_t kHasMaximum = 2;
  static constexpr std::uint8_t kTakesMacro = 4;  // a leaf that may carry a useMacro attribute
  bool has(std::uint8_t flag) const { return (flags & flag) != 0; }
};

struct AttributeRule {
  std::string_view name;
  bool required;
  std::uint16_t firstEnum;  // allowed values (a range of enumValues()); none = any text
  std::uint16_t enumCount;
};

struct AggregateRule {
  std::string_view name;
  std::uint16_t rootParticle;  // a sequence holding the content
  std::uint16_t firstAttribute;
  std::uint16_t attributeCount;
};

std::span<const Particle> particles();
std::span<const AggregateRule> aggregates();

// The aggregate of that name (the first, should two definitions share it), or -1.
int findAggregate(std::string_view name);

std::span<const std::string_view> enumValues(std::uint16_t first, std::uint16_t count);
std::span<const AttributeRule> attributesOf(const AggregateRule& aggregate);

// Matches children against one aggregate's content, one child name at a time. Positions
// are the element particles of the content in schema order. A state is the set of
// positions the children so far may have ended at; the empty state is the start.
struct ContentAutomaton {
  std::vector<std::uint16_t> positions;  // particle index of each position
  std::vector<int> first;                // positions a first child may take
  std::vector<std::vector<int>> follow;  // positions that may come after each position
  bool acceptsEmpty = false;             // no children at all is complete
  std::vector<bool> accepting;           // content may end after this position
  // The names of the first required particle that must still come, at the start and
  // after each position: empty exactly where the content may end.
  std::vector<std::string_view> missingAtStart;
  std::vector<std::vector<std::string_view>> missingAfter;

  // Every name the content mentions, in schema order, each once, and the same names sorted
  // with their places in that order.
  std::vector<std::string_view> order;
  std::vector<std::pair<std::string_view, int>> ranks;

  std::string_view nameAt(int position) const;
  const Particle& particleAt(int position) const;
  // The place of `name` in `order`, or -1 when the content does not mention it.
  int rankOf(std::string_view name) const;
};

// The automaton of aggregate `index` (built once, when first asked for).
const ContentAutomaton& automatonOf(int index);

}  // namespace droqbxml::simulator::internal

#endif  // DROQBXML_SIMULATOR_INTERNAL_SCHEMAMODEL_HPP_

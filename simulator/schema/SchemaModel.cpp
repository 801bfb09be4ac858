// The compiled-in qbXML 13.0 tables, lookups by name, the content automata built from them
// (one position per element particle; first, follow and end sets as for a regular
// expression), and schemaChildOrder, which the response writers use for Ret aggregates.
#include "simulator/internal/SchemaModel.hpp"

#include <algorithm>
#include <array>
#include <cstddef>
#include <mutex>
#include <string_view>
#include <vector>

#include "simulator/RequestDocument.hpp"

namespace droqbxml::simulator::internal {
namespace {

using P = ParticleKind;
using C = ContentKind;
using V = ValueType;

#include "simulator/schema/SchemaTables.inc"

// What one particle's subtree contributes to the automaton.
struct Fragment {
  bool nullable = true;
  std::vector<int> first;
  std::vector<int> last;
};

// Adds the positions of `from` (which holds none twice) that `to` lacks, in their order.
void addAll(std::vector<int>& to, const std::vector<int>& from) {
  if (to.empty()) {  // the usual case, which a long repeated choice makes quadratic otherwise
    to = from;
    return;
  }
  for (int position : from) {
    if (std::find(to.begin(), to.end(), position) == to.end()) to.push_back(position);
  }
}

class AutomatonBuilder {
 public:
  AutomatonBuilder(ContentAutomaton& automaton, int root)
      : automaton_(automaton),
        root_(root),
        fragments_(kParticles[static_cast<std::size_t>(root)].end - root),
        parents_(fragments_.size(), -1) {}

  void build() {
    const Fragment whole = fragment(root_);
    automaton_.first = whole.first;
    automaton_.acceptsEmpty = whole.nullable;
    automaton_.accepting.assign(automaton_.positions.size(), false);
    for (int position : whole.last) automaton_.accepting[static_cast<std::size_t>(position)] = true;
    automaton_.missingAtStart =
        whole.nullable ? std::vector<std::string_view>{} : requiredFirstIn(root_);
    for (std::uint16_t particle : automaton_.positions) {
      automaton_.missingAfter.push_back(requiredAfter(particle));
    }
    automaton_.order = namesOf(allPositions());
    for (std::size_t rank = 0; rank < automaton_.order.size(); ++rank) {
      automaton_.ranks.emplace_back(automaton_.order[rank], static_cast<int>(rank));
    }
    std::sort(automaton_.ranks.begin(), automaton_.ranks.end());
  }

 private:
  const Particle& at(int index) const { return kParticles[static_cast<std::size_t>(index)]; }
  Fragment& fragmentAt(int index) { return fragments_[static_cast<std::size_t>(index - root_)]; }

  Fragment fragment(int index) {
    const Particle& particle = at(index);
    Fragment result;
    if (particle.kind == P::kElement) {
      const int position = static_cast<int>(automaton_.positions.size());
      automaton_.positions.push_back(static_cast<std::uint16_t>(index));
      automaton_.follow.emplace_back();
      if (particle.maxOccurs > 1) automaton_.follow.back().push_back(position);
      result = {particle.minOccurs == 0, {position}, {position}};
      fragmentAt(index) = result;
      return result;
    }
    std::vector<Fragment> parts;
    for (int child = index + 1; child < particle.end; child = at(child).end) {
      parents_[static_cast<std::size_t>(child - root_)] = index;
      parts.push_back(fragment(child));
    }
    if (particle.kind == P::kSequence) {
      for (const Fragment& part : parts) {
        if (result.nullable) addAll(result.first, part.first);
        result.nullable = result.nullable && part.nullable;
      }
      bool tailNullable = true;
      for (auto part = parts.rbegin(); part != parts.rend() && tailNullable; ++part) {
        addAll(result.last, part->last);
        tailNullable = part->nullable;
      }
      for (std::size_t i = 0; i < parts.size(); ++i) {
        for (std::size_t j = i + 1; j < parts.size(); ++j) {
          for (int position : parts[i].last) {
            addAll(automaton_.follow[static_cast<std::size_t>(position)], parts[j].first);
          }
          if (!parts[j].nullable) break;
        }
      }
    } else {
      result.nullable = parts.empty();
      for (const Fragment& part : parts) {
        addAll(result.first, part.first);
        addAll(result.last, part.last);
        result.nullable = result.nullable || part.nullable;
      }
    }
    if (particle.maxOccurs > 1) {
      for (int position : result.last) {
        addAll(automaton_.follow[static_cast<std::size_t>(position)], result.first);
      }
    }
    if (particle.minOccurs == 0) result.nullable = true;
    fragmentAt(index) = result;
    return result;
  }

  std::vector<int> allPositions() const {
    std::vector<int> positions(automaton_.positions.size());
    for (std::size_t i = 0; i < positions.size(); ++i) positions[i] = static_cast<int>(i);
    return positions;
  }

  std::vector<std::string_view> namesOf(const std::vector<int>& positions) const {
    std::vector<std::string_view> names;
    for (int position : positions) {
      const std::string_view name =
          at(automaton_.positions[static_cast<std::size_t>(position)]).name;
      if (std::find(names.begin(), names.end(), name) == names.end()) names.push_back(name);
    }
    return names;
  }

  // The names that start the first non-optional child of a sequence.
  std::vector<std::string_view> requiredFirstIn(int sequence) {
    for (int child = sequence + 1; child < at(sequence).end; child = at(child).end) {
      if (!fragmentAt(child).nullable) return namesOf(fragmentAt(child).first);
    }
    return {};
  }

  // After a child at `index`, walk out through the enclosing particles: the first
  // non-optional particle that follows in a sequence is what must still come.
  std::vector<std::string_view> requiredAfter(int index) {
    int node = index;
    while (node != root_) {
      const int parent = parents_[static_cast<std::size_t>(node - root_)];
      if (at(parent).kind == P::kSequence) {
        for (int next = at(node).end; next < at(parent).end; next = at(next).end) {
          if (!fragmentAt(next).nullable) return namesOf(fragmentAt(next).first);
        }
      }
      node = parent;
    }
    return {};
  }

  ContentAutomaton& automaton_;
  int root_;
  std::vector<Fragment> fragments_;
  std::vector<int> parents_;
};

}  // namespace

std::span<const Particle> particles() { return kParticles; }
std::span<const AggregateRule> aggregates() { return kAggregates; }

int findAggregate(std::string_view name) {
  const auto found = std::lower_bound(
      kAggregates.begin(), kAggregates.end(), name,
      [](const AggregateRule& rule, std::string_view wanted) { return rule.name < wanted; });
  if (found == kAggregates.end() || found->name != name) return -1;
  return static_cast<int>(found - kAggregates.begin());
}

std::span<const std::string_view> enumValues(std::uint16_t first, std::uint16_t count) {
  return std::span<const std::string_view>(kEnumValues).subspan(first, count);
}

std::span<const AttributeRule> attributesOf(const AggregateRule& aggregate) {
  return std::span<const AttributeRule>(kAttributes)
      .subspan(aggregate.firstAttribute, aggregate.attributeCount);
}

std::string_view ContentAutomaton::nameAt(int position) const { return particleAt(position).name; }

const Particle& ContentAutomaton::particleAt(int position) const {
  return kParticles[positions[static_cast<std::size_t>(position)]];
}

int ContentAutomaton::rankOf(std::string_view name) const {
  const auto found = std::lower_bound(ranks.begin(), ranks.end(), name,
                                      [](const std::pair<std::string_view, int>& entry,
                                         std::string_view wanted) { return entry.first < wanted; });
  return found != ranks.end() && found->first == name ? found->second : -1;
}

const ContentAutomaton& automatonOf(int index) {
  // Each built when first asked for: a document touches a handful of the aggregates.
  static std::vector<ContentAutomaton> automata(kAggregates.size());
  static std::vector<std::once_flag> built(kAggregates.size());
  const auto at = static_cast<std::size_t>(index);
  std::call_once(built[at],
                 [&] { AutomatonBuilder(automata[at], kAggregates[at].rootParticle).build(); });
  return automata[at];
}

}  // namespace droqbxml::simulator::internal

namespace droqbxml::simulator {

std::vector<std::string_view> schemaChildOrder(std::string_view aggregate) {
  const int index = internal::findAggregate(aggregate);
  if (index < 0) return {};
  return internal::automatonOf(index).order;
}

}  // namespace droqbxml::simulator

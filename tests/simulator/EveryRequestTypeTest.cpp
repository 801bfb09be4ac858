// Every request type of qbXML 13.0, generated from the tables: a minimal document of each
// and a few broken variants (a required child missing, two children swapped, a value that is
// no enum value, a text one character too long), checked by the reader and, where xmllint
// runs, by Intuit's validator schema; and the stand-in answering every valid one.
#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <map>
#include <string>
#include <string_view>
#include <vector>

#include "simulator/CompanyFile.hpp"
#include "simulator/RequestDocument.hpp"
#include "simulator/RequestHandlers.hpp"
#include "simulator/internal/SchemaModel.hpp"
#include "tests/TestSupport.hpp"
#include "tests/simulator/CompanyFileSupport.hpp"

namespace droqbxml::simulator {
namespace {

using internal::Particle;
using internal::ParticleKind;
using internal::ValueType;

// An element of a generated request: a value or children, and its leaf rule when a leaf.
struct Node {
  std::string name;
  std::string value;
  std::vector<std::pair<std::string, std::string>> attributes;
  std::vector<Node> children;
  const Particle* leaf = nullptr;
};

std::string sampleValue(const Particle& leaf) {
  switch (leaf.type) {
    case ValueType::kEnum:
      return std::string(internal::enumValues(leaf.firstEnum, leaf.enumCount).front());
    case ValueType::kBool:
      return "true";
    case ValueType::kDate:
    case ValueType::kDateTime:
      return "2024-01-31";
    case ValueType::kInt:
      return leaf.has(Particle::kHasMinimum) ? std::to_string(leaf.minimum) : "1";
    case ValueType::kAmt:
    case ValueType::kPrice:
      return "1.00";
    case ValueType::kGuid:
      return "0";
    case ValueType::kTimeInterval:
      return "PT1H";
    default:
      return "1";
  }
}

void fill(std::vector<Node>& into, std::uint16_t index);

// An element particle as a node with the least content its rule allows.
Node minimal(const Particle& particle) {
  Node node{std::string(particle.name), {}, {}, {}, nullptr};
  if (particle.content == internal::ContentKind::kValue) {
    node.leaf = &particle;
    node.value = sampleValue(particle);
    return node;
  }
  const auto& rule = internal::aggregates()[static_cast<std::size_t>(particle.aggregate)];
  for (const auto& attribute : internal::attributesOf(rule)) {
    if (!attribute.required) continue;
    const auto values = internal::enumValues(attribute.firstEnum, attribute.enumCount);
    node.attributes.emplace_back(attribute.name, values.empty() ? "1" : values.front());
  }
  fill(node.children, rule.rootParticle);
  return node;
}

// The required part of a sequence or choice (a choice takes its first branch).
void fill(std::vector<Node>& into, std::uint16_t index) {
  const auto all = internal::particles();
  const Particle& particle = all[index];
  if (particle.kind == ParticleKind::kElement) {
    if (particle.minOccurs > 0) into.push_back(minimal(particle));
    return;
  }
  if (particle.minOccurs == 0) return;
  for (std::uint16_t child = index + 1; child < particle.end; child = all[child].end) {
    if (particle.kind == ParticleKind::kChoice) {
      // A branch that is a lone optional element would add nothing: take it anyway.
      if (all[child].kind == ParticleKind::kElement) {
        into.push_back(minimal(all[child]));
      } else {
        fill(into, child);
      }
      return;
    }
    fill(into, child);
  }
}

void write(std::string& out, const Node& node) {
  out += "<" + node.name;
  for (const auto& [name, value] : node.attributes) out += " " + name + "=\"" + value + "\"";
  out += ">" + node.value;
  for (const Node& child : node.children) write(out, child);
  out += "</" + node.name + ">\n";
}

// The first node, depth first, for which `change` did something.
template <class Change>
bool changeFirst(Node& node, const Change& change) {
  if (change(node)) return true;
  for (Node& child : node.children) {
    if (changeFirst(child, change)) return true;
  }
  return false;
}

struct Sample {
  std::string name;
  std::string document;
};

// The minimal request and its broken variants, in the message set `set`.
std::vector<Sample> samplesOf(const Particle& request, std::string_view set) {
  const auto document = [&](const Node& node) {
    std::string text = "<?xml version=\"1.0\"?>\n<?qbxml version=\"13.0\"?>\n<QBXML>\n<" +
                       std::string(set) + (set == "QBXMLMsgsRq" ? " onError=\"stopOnError\"" : "") +
                       ">\n";
    write(text, node);
    return text + "</" + std::string(set) + ">\n</QBXML>\n";
  };
  const Node valid = minimal(request);
  std::vector<Sample> samples{{valid.name, document(valid)}};
  Node variant = valid;
  if (changeFirst(variant, [](Node& node) {
        if (node.leaf || node.children.empty()) return false;
        node.children.erase(node.children.begin());
        return true;
      })) {
    samples.push_back({valid.name + "-missing", document(variant)});
  }
  variant = valid;
  if (changeFirst(variant, [](Node& node) {
        if (node.children.size() < 2 || node.children[0].name == node.children[1].name) {
          return false;
        }
        std::swap(node.children[0], node.children[1]);
        return true;
      })) {
    samples.push_back({valid.name + "-order", document(variant)});
  }
  variant = valid;
  if (changeFirst(variant, [](Node& node) {
        if (!node.leaf || node.leaf->type != ValueType::kEnum) return false;
        node.value = "NoSuchValue";
        return true;
      })) {
    samples.push_back({valid.name + "-enum", document(variant)});
  }
  variant = valid;
  if (changeFirst(variant, [](Node& node) {
        if (!node.leaf || node.leaf->type != ValueType::kStr || node.leaf->maxLength == 0) {
          return false;
        }
        node.value = std::string(node.leaf->maxLength + 1u, 'x');
        return true;
      })) {
    samples.push_back({valid.name + "-long", document(variant)});
  }
  return samples;
}

// Every request of every message set of a request document.
std::vector<std::pair<const Particle*, std::string_view>> requestTypes() {
  std::vector<std::pair<const Particle*, std::string_view>> types;
  for (std::string_view set : {"QBXMLMsgsRq", "QBXMLSubscriptionMsgsRq", "SignonMsgsRq"}) {
    const internal::ContentAutomaton& automaton =
        internal::automatonOf(internal::findAggregate(set));
    for (int position = 0; position < static_cast<int>(automaton.positions.size()); ++position) {
      types.emplace_back(&automaton.particleAt(position), set);
    }
  }
  return types;
}

// A problem of the schema's own (not one of QuickBooks Desktop's refusals beyond it).
bool schemaProblem(const Problem& problem) {
  return !problem.message.starts_with("QuickBooks Desktop refuses");
}

TEST(EveryRequestTypeTest, ReaderAgreesWithTheValidatorSchema) {
  const test::TemporaryFolder folder;
  std::vector<Sample> samples;
  for (const auto& [request, set] : requestTypes()) {
    for (Sample& sample : samplesOf(*request, set)) samples.push_back(std::move(sample));
  }
  ASSERT_GT(samples.size(), 600u);
  std::vector<std::filesystem::path> files;
  for (const Sample& sample : samples) {
    files.push_back(folder / (sample.name + ".xml"));
    test::writeFile(files.back(), sample.document);
  }
  const std::map<std::string, bool> verdicts =
      test::xmllintVerdicts(files, folder.root()).value_or(std::map<std::string, bool>{});
  int compared = 0;
  int refused = 0;
  for (const Sample& sample : samples) {
    const ReadResult read = readRequest(sample.document);
    bool accepted = true;
    std::string first;
    for (const Problem& problem : read.problems) {
      if (schemaProblem(problem) && accepted) {
        accepted = false;
        first = problem.element + ": " + problem.message;
      }
    }
    // Without xmllint: every minimal request is valid, and no required child may go missing.
    const bool broken = sample.name.find('-') != std::string::npos;
    if (!broken || sample.name.ends_with("-missing") || sample.name.ends_with("-long")) {
      EXPECT_EQ(accepted, !broken) << sample.name << " " << first;
    }
    const auto verdict = verdicts.find(sample.name);
    if (verdict == verdicts.end()) continue;
    EXPECT_EQ(accepted, verdict->second) << sample.name << " " << first;
    ++compared;
    refused += verdict->second ? 0 : 1;
  }
  if (verdicts.empty()) GTEST_SKIP() << "xmllint or the validator schema is not available";
  EXPECT_EQ(compared, static_cast<int>(samples.size()));
  EXPECT_GT(refused, 300);
}

TEST(EveryRequestTypeTest, StandInAnswersEveryValidRequest) {
  const test::TemporaryFolder folder;
  const auto path = folder / "company.qbw";
  CompanyFile::create(path, CompanySettings{});
  CompanyFile company(path);
  std::string requests;
  std::vector<std::string> names;
  for (const auto& [request, set] : requestTypes()) {
    if (set != "QBXMLMsgsRq") continue;
    write(requests, minimal(*request));
    names.push_back(std::string(request->name));
  }
  const std::string text = "<?qbxml version=\"13.0\"?>\n<QBXML>\n<QBXMLMsgsRq onError=\"" +
                           std::string("continueOnError") + "\">\n" + requests +
                           "</QBXMLMsgsRq>\n</QBXML>\n";
  const ReadResult read = readRequest(text);
  ASSERT_TRUE(read.document);
  const std::string response = answerRequests(company, *read.document);
  // One answer a request, in order; those the stand-in does not model get QuickBooks' 1030.
  std::size_t at = 0;
  int unsupported = 0;
  for (const std::string& name : names) {
    const std::string rs = "<" + name.substr(0, name.size() - 2) + "Rs ";
    at = response.find(rs, at);
    ASSERT_NE(at, std::string::npos) << name;
    const std::string line = response.substr(at, response.find('\n', at) - at);
    if (line.find("statusCode=\"1030\"") != std::string::npos) {
      EXPECT_NE(line.find("statusSeverity=\"Error\" statusMessage=\"This request is not "
                          "supported by this implementation.\""),
                std::string::npos)
          << line;
      ++unsupported;
    }
  }
  EXPECT_GT(unsupported, 150);
  EXPECT_EQ(response.find("<CustomerQueryRs statusCode=\"1030\""), std::string::npos);
}

}  // namespace
}  // namespace droqbxml::simulator

// The tag index behind findForward: one pass over the text records the position of every
// "<...>" token without blanks (a "<" up to the next ">" with no "<" or blank between) by
// its exact text. A whole-tag
// pattern occurs exactly where such a token equals it, so a binary search among that
// token's positions gives the first occurrence at or after any cursor.
#include "droqbxml/records/internal/TextSearch.hpp"

#include <algorithm>
#include <array>
#include <cstdint>
#include <functional>
#include <memory>
#include <unordered_map>
#include <vector>

namespace droqbxml::internal {
namespace {

// Below this size a plain search is as fast as maintaining an index.
constexpr size_t kIndexThreshold = 32 * 1024;
constexpr size_t kCachedTexts = 4;

// Tags are short: FNV-1a over their code units is cheaper than the general string hash.
struct ViewHash {
  using is_transparent = void;
  size_t operator()(TextView view) const noexcept {
    uint64_t hash = 1469598103934665603ull;
    for (const char16_t c : view) hash = (hash ^ c) * 1099511628211ull;
    return static_cast<size_t>(hash);
  }
};

struct TagIndex {
  const char16_t* data = nullptr;
  size_t size = 0;
  uint64_t fingerprint = 0;
  uint64_t lastUse = 0;
  // Keyed by the token's own copy: the index never reads a text it was not given.
  std::unordered_map<Text, std::vector<uint32_t>, ViewHash, std::equal_to<>> positions;
};

// The text's size and its first and last code units: enough to notice another text placed
// at the same address, and cheap enough to check at every search. A text changed in place
// between the ends keeps its fingerprint; a search whose indexed answer no longer holds
// falls back to a plain search (see findForward).
uint64_t fingerprintOf(const Text& text) {
  uint64_t hash = 1469598103934665603ull ^ text.size();
  const size_t ends = std::min<size_t>(8, text.size());
  for (size_t i = 0; i < ends; ++i) hash = (hash ^ text[i]) * 1099511628211ull;
  for (size_t i = text.size() - ends; i < text.size(); ++i)
    hash = (hash ^ text[i]) * 1099511628211ull;
  return hash;
}

void build(TagIndex& index, const Text& text) {
  index.positions.clear();
  const TextView view(text);
  size_t at = view.find(u'<');
  while (at != TextView::npos) {
    const size_t close = view.find_first_of(u"<> ", at + 1);
    if (close == TextView::npos) break;
    if (view[close] == u' ') {
      // A tag with attributes: no element-name pattern can be it.
      at = view.find(u'<', close + 1);
    } else if (view[close] == u'>') {
      const TextView token = view.substr(at, close - at + 1);
      auto found = index.positions.find(token);
      if (found == index.positions.end()) found = index.positions.emplace(Text(token), 0).first;
      found->second.push_back(static_cast<uint32_t>(at));
      at = view.find(u'<', close + 1);
    } else {
      at = close;
    }
  }
}

struct IndexCache {
  std::array<std::unique_ptr<TagIndex>, kCachedTexts> entries;
  uint64_t clock = 0;

  TagIndex& indexFor(const Text& text) {
    const uint64_t fingerprint = fingerprintOf(text);
    TagIndex* oldest = nullptr;
    for (auto& entry : entries) {
      if (!entry) entry = std::make_unique<TagIndex>();
      if (entry->data == text.data() && entry->size == text.size() &&
          entry->fingerprint == fingerprint) {
        entry->lastUse = ++clock;
        return *entry;
      }
      if (!oldest || entry->lastUse < oldest->lastUse) oldest = entry.get();
    }
    oldest->data = text.data();
    oldest->size = text.size();
    oldest->fingerprint = fingerprint;
    oldest->lastUse = ++clock;
    build(*oldest, text);
    return *oldest;
  }
};

// "<Name>" or "</Name>": no blank, no other angle bracket.
bool isWholeTag(TextView pattern) {
  return pattern.size() >= 2 && pattern.front() == u'<' && pattern.back() == u'>' &&
         pattern.substr(1, pattern.size() - 2).find_first_of(u"<> ") == TextView::npos;
}

}  // namespace

size_t findForward(const Text& text, TextView pattern, size_t from) {
  if (text.size() < kIndexThreshold || !isWholeTag(pattern) || from >= text.size() ||
      text.size() > UINT32_MAX) {
    return text.find(pattern, from);
  }
  thread_local IndexCache cache;
  TagIndex& index = cache.indexFor(text);
  const auto found = index.positions.find(pattern);
  if (found == index.positions.end()) return Text::npos;
  const auto& positions = found->second;
  const auto next = std::lower_bound(positions.begin(), positions.end(), from);
  if (next == positions.end()) return Text::npos;
  // A text changed in place since it was indexed: search it plainly.
  if (TextView(text).substr(*next, pattern.size()) != pattern) return text.find(pattern, from);
  return *next;
}

}  // namespace droqbxml::internal

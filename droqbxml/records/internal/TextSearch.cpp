// The literal forward search. A tag search is mostly a search for a pair of code units
// ("<" and the first letter of the name) followed by a comparison; with SSE2 the pair is
// looked for eight positions at a time, which keeps a search that runs to the end of a
// large response (an element absent from the record) cheap.
#include "droqbxml/records/internal/TextSearch.hpp"

#include <algorithm>
#include <cstdint>
#include <deque>

#include "droqbxml/records/internal/TagIndex.hpp"

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace droqbxml::internal {
namespace {

// The first position at or after `at` where the pair (first, second) starts, or npos;
// `last` is the last position where a pair may start.
size_t findPair(const char16_t* data, size_t at, size_t last, char16_t first, char16_t second) {
#if defined(__SSE2__)
  const __m128i wantFirst = _mm_set1_epi16(static_cast<int16_t>(first));
  const __m128i wantSecond = _mm_set1_epi16(static_cast<int16_t>(second));
  // Eight candidate starts a round: positions at .. at + 7 and their successors, all
  // at most last + 1.
  while (at + 8 <= last + 1) {
    const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(data + at));
    const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i*>(data + at + 1));
    const __m128i both =
        _mm_and_si128(_mm_cmpeq_epi16(a, wantFirst), _mm_cmpeq_epi16(b, wantSecond));
    const int mask = _mm_movemask_epi8(both);
    if (mask != 0) return at + static_cast<size_t>(__builtin_ctz(static_cast<unsigned>(mask))) / 2;
    at += 8;
  }
#endif
  for (; at <= last; ++at) {
    if (data[at] == first && data[at + 1] == second) return at;
  }
  return TextView::npos;
}

}  // namespace

size_t findTagNear(TextView text, size_t from, size_t window, TextView name, bool closing) {
  const size_t end = std::min(text.size(), from + window);
  const char16_t* data = text.data();
  size_t at = from;
#if defined(__SSE2__)
  // Each '<' of eight units at a time.
  const __m128i open = _mm_set1_epi16(static_cast<int16_t>(u'<'));
  for (; at + 8 <= end; at += 8) {
    const __m128i units = _mm_loadu_si128(reinterpret_cast<const __m128i*>(data + at));
    for (auto mask = static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpeq_epi16(units, open)));
         mask != 0; mask &= mask - 1) {
      const size_t candidate = at + static_cast<size_t>(__builtin_ctz(mask)) / 2;
      mask &= mask - 1;  // the pair of bits of one unit
      if (tagAt(text, candidate, name, closing)) return candidate;
    }
  }
#endif
  for (; at < end; ++at) {
    if (tagAt(text, at, name, closing)) return at;
  }
  return TextView::npos;
}

size_t findForward(TextView text, TextView pattern, size_t from) {
  if (pattern.size() < 2 || from > text.size() || text.size() - from < pattern.size()) {
    return text.find(pattern, from);
  }
  const size_t last = text.size() - pattern.size();
  const TextView rest = pattern.substr(2);
  for (size_t at = from; at <= last; ++at) {
    at = findPair(text.data(), at, last, pattern[0], pattern[1]);
    if (at == TextView::npos) return TextView::npos;
    if (sameUnits(text.data() + at + 2, rest.data(), rest.size())) return at;
  }
  return TextView::npos;
}

namespace {

thread_local SearchScope* openScope = nullptr;

// The groups of record tables' names in the indexes read lately on this thread. Entries
// are only added while a read is open (so the spans handed out stay valid) and cleared
// between reads once there are many.
struct TableGroups {
  uint64_t index = 0;
  const void* table = nullptr;
  std::vector<uint32_t> groups;
};
thread_local std::deque<TableGroups> tableGroups;
constexpr size_t kKeptTableGroups = 64;

// Most searches of a read end close to where they start: this many code units from the
// start are searched directly, before the memory or the index is consulted.
constexpr size_t kNear = 64;
// Shorter texts are never indexed: searching them to the end costs less. A tag not found
// within this many code units of where its search starts has the text indexed.
constexpr size_t kIndexedSize = 8192;

}  // namespace

SearchScope::SearchScope(const Text& text, const TagIndex* index) {
  if (openScope != nullptr) return;
  if (tableGroups.size() > kKeptTableGroups) tableGroups.clear();
  text_ = &text;
  index_ = index;
  openScope = this;
}

SearchScope::~SearchScope() {
  if (openScope == this) openScope = nullptr;
}

size_t SearchScope::find(const Text& text, TextView pattern, size_t from) {
  SearchScope* scope = openScope;
  if (scope == nullptr || scope->text_ != &text || from > text.size()) {
    return findForward(text, pattern, from);
  }
  return scope->search(pattern, from);
}

const TagIndex* SearchScope::indexOf(const Text& text) {
  const SearchScope* scope = openScope;
  return scope != nullptr && scope->text_ == &text ? scope->index_ : nullptr;
}

bool SearchScope::lacksStartTag(const Text& text, TextView name) {
  const TagIndex* index = indexOf(text);
  return index != nullptr && index->lacks(name);
}

std::span<const uint32_t> SearchScope::groupsOf(const TagIndex& index, const void* table,
                                                size_t count, TextView (*nameAt)(size_t)) {
  for (const TableGroups& known : tableGroups) {
    if (known.index == index.serial() && known.table == table) return known.groups;
  }
  TableGroups& made = tableGroups.emplace_back(TableGroups{index.serial(), table, {}});
  made.groups.resize(count);
  for (size_t i = 0; i < count; ++i) made.groups[i] = index.plainGroup(nameAt(i));
  return made.groups;
}

void SearchScope::forget(const TagIndex& index) {
  if (openScope != nullptr) return;
  std::erase_if(tableGroups,
                [&](const TableGroups& known) { return known.index == index.serial(); });
}

size_t SearchScope::search(TextView pattern, size_t from) {
  const TextView text = *text_;
  size_t at = TextView::npos;
  // "/>" is looked for before every element read and seldom found: the index answers at once.
  const bool selfClose = pattern == TagIndex::kSelfClose;
  if (index_ != nullptr && selfClose) return index_->findSelfClose(from);
  // End tags are not indexed: only a start tag's pattern is worth looking up.
  const bool shaped = pattern.size() >= 3 && pattern.front() == u'<' && pattern.back() == u'>' &&
                      pattern[1] != u'/';
  // Most elements a record asks for are absent from the whole response: the index says so
  // without a look at the text. A name the index holds is one it covers; only the others
  // need the check.
  uint32_t group = TagIndex::kNone;
  if (index_ != nullptr && shaped) {
    group = index_->tagGroup(pattern);
    if (group == TagIndex::kNone && TagIndex::covers(pattern)) return TextView::npos;
  }
  if (pattern == last_ && lastAnswer_.covers(from, at)) return at;
  size_t end = std::min(text.size(), from + kNear);
  at = findForward(text.substr(0, end), pattern, from);
  if (at != TextView::npos || end == text.size()) return at;
  if (group != TagIndex::kNone) return index_->findIn(group, from, &hints_);
  if (index_ == nullptr && (selfClose || (shaped && TagIndex::covers(pattern))) &&
      text.size() >= kIndexedSize && text.size() <= UINT32_MAX) {
    // Not found nearby: a little further, else (it is far or absent) index the text for
    // this search and the rest of the read. The first read of a response gets here with
    // "/>", which a response seldom holds: the index's one pass finds that it is absent
    // and serves every later tag as well.
    end = std::min(text.size(), from + kIndexedSize);
    at = findForward(text.substr(0, end), pattern, from);
    if (at != TextView::npos || end == text.size()) return at;
    ownIndex_ = std::make_unique<TagIndex>(text);
    index_ = ownIndex_.get();
    return selfClose ? index_->findSelfClose(from) : index_->find(pattern, from, &hints_);
  }
  if (!answers_.empty() && remembered(pattern, from, at)) return at;
  at = findForward(text, pattern, from);
  remember(pattern, from, at);
  return at;
}

bool SearchScope::Answer::covers(size_t start, size_t& found) const {
  // Nothing from `from` on means nothing later either; a match from `from` is the first
  // match from any start up to it.
  if (start < from || (at != TextView::npos && start > at)) return false;
  found = at;
  return true;
}

bool SearchScope::remembered(TextView pattern, size_t from, size_t& at) {
  const auto known = answers_.find(pattern);
  if (known == answers_.end() || !known->second.covers(from, at)) return false;
  last_ = pattern;
  lastAnswer_ = known->second;
  return true;
}

void SearchScope::remember(TextView pattern, size_t from, size_t at) {
  auto known = answers_.find(pattern);
  if (known == answers_.end()) known = answers_.emplace(Text(pattern), Answer{}).first;
  known->second = Answer{from, at};
  last_ = pattern;
  lastAnswer_ = known->second;
}

}  // namespace droqbxml::internal

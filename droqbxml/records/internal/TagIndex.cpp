// The start-tag index: one scan for the start tags, each given its name's group as its '>'
// is found, then the positions sorted by group (a counting sort, so each group
// keeps the text's order).
#include "droqbxml/records/internal/TagIndex.hpp"

#include <algorithm>
#include <atomic>
#include <cstring>

#include "droqbxml/records/internal/TextSearch.hpp"

#if defined(__SSE2__)
#include <emmintrin.h>
#endif
// The wide scan: x86-64 Linux with GCC or clang, chosen when the processor runs.
#if defined(__x86_64__) && defined(__linux__) && defined(__GNUC__)
#define DROQBXML_TAG_SCAN_AVX2 1
#include <immintrin.h>
#else
#define DROQBXML_TAG_SCAN_AVX2 0
#endif

namespace droqbxml::internal {
namespace {

bool startsName(char16_t first) { return first != u'/' && first != u'?' && first != u'!'; }
// A name ending so is an attribute's value or a self-closed tag's slash.
bool endsName(char16_t last) { return last != u'"' && last != u'\'' && last != u'/'; }

// The scan's block loop, once for each instruction set (TagScanLoop.inc): `Units` gives
// that set's vector of code units, how to load and compare one, and the mask of a bit a
// unit of two comparisons.
#if defined(__SSE2__)
namespace sse2 {
struct Units {
  using Vector = __m128i;
  static constexpr size_t kCount = 8;
  static Vector load(const char16_t* at) {
    return _mm_loadu_si128(reinterpret_cast<const __m128i*>(at));
  }
  static Vector equal(Vector units, char16_t c) {
    return _mm_cmpeq_epi16(units, _mm_set1_epi16(static_cast<int16_t>(c)));
  }
  static Vector both(Vector a, Vector b) { return _mm_and_si128(a, b); }
  static unsigned mask(Vector low, Vector high) {
    return static_cast<unsigned>(_mm_movemask_epi8(_mm_packs_epi16(low, high)));
  }
};
#include "droqbxml/records/internal/TagScanLoop.inc"
}  // namespace sse2
#endif

// With AVX2 (when the processor has it) thirty-two units a block.
#if DROQBXML_TAG_SCAN_AVX2
#if defined(__clang__)
#pragma clang attribute push(__attribute__((target("avx2"))), apply_to = function)
#else
#pragma GCC push_options
#pragma GCC target("avx2")
#endif
namespace avx2 {
struct Units {
  using Vector = __m256i;
  static constexpr size_t kCount = 16;
  static Vector load(const char16_t* at) {
    return _mm256_loadu_si256(reinterpret_cast<const __m256i*>(at));
  }
  static Vector equal(Vector units, char16_t c) {
    return _mm256_cmpeq_epi16(units, _mm256_set1_epi16(static_cast<int16_t>(c)));
  }
  static Vector both(Vector a, Vector b) { return _mm256_and_si256(a, b); }
  static unsigned mask(Vector low, Vector high) {
    // The pack interleaves the halves' 128-bit lanes; the permutation puts them in order.
    return static_cast<unsigned>(
        _mm256_movemask_epi8(_mm256_permute4x64_epi64(_mm256_packs_epi16(low, high), 0xD8)));
  }
};
#include "droqbxml/records/internal/TagScanLoop.inc"
}  // namespace avx2
#if defined(__clang__)
#pragma clang attribute pop
#else
#pragma GCC pop_options
#endif
#endif

// Calls tag(p, g) for each '<' at p that may start a covered tag: the next code unit is
// not '/', '?' or '!', and the first '<' or '>' after it is the '>' at g (a covered name
// holds neither). Calls selfClose(q) for each "/>" at q. Both in the text's order. `wide`
// lets the scan use AVX2 where the processor has it.
template <class Tag, class SelfClose>
void forEachTag(TextView text, bool wide, Tag tag, SelfClose selfClose) {
  const char16_t* data = text.data();
  const size_t n = text.size();
  size_t open = SIZE_MAX;  // a '<' whose closing bracket is still to be found
  size_t at = 0;
#if DROQBXML_TAG_SCAN_AVX2
  if (wide && __builtin_cpu_supports("avx2")) {
    at = avx2::scanBlocks(data, n, open, tag, selfClose);
  } else
#endif
  {
#if defined(__SSE2__)
    at = sse2::scanBlocks(data, n, open, tag, selfClose);
#endif
  }
  static_cast<void>(wide);
  for (; at < n; ++at) {
    const char16_t c = data[at];
    if (c == u'/' && at + 1 < n && data[at + 1] == u'>') selfClose(at);
    if (c == u'<') {
      open = at + 1 < n && startsName(data[at + 1]) ? at : SIZE_MAX;
    } else if (c == u'>' && open != SIZE_MAX) {
      tag(open, at);
      open = SIZE_MAX;
    }
  }
}

}  // namespace

bool TagIndex::covers(TextView pattern) {
  if (pattern.size() < 3 || pattern.front() != u'<' || pattern.back() != u'>') return false;
  return coversName(pattern.substr(1, pattern.size() - 2));
}

bool TagIndex::coversName(TextView name) {
  if (name.empty() || !startsName(name.front()) || !endsName(name.back())) return false;
  // '<' and '>' are the only units that give '>' with bit 1 set. Eight units at a time
  // (the last eight overlapping the others) where there are that many, else four a word, a
  // unit of the word that is then zero found by the usual borrow test.
  const char16_t* at = name.data();
  size_t n = name.size();
#if defined(__SSE2__)
  if (n >= 8) {
    const __m128i two = _mm_set1_epi16(2);
    const __m128i close = _mm_set1_epi16(static_cast<int16_t>(u'>'));
    for (size_t i = 0;; i += 8) {
      i = std::min(i, n - 8);
      const __m128i units =
          _mm_or_si128(_mm_loadu_si128(reinterpret_cast<const __m128i*>(at + i)), two);
      if (_mm_movemask_epi8(_mm_cmpeq_epi16(units, close)) != 0) return false;
      if (i + 8 == n) return true;
    }
  }
#endif
  for (; n >= 4; n -= 4, at += 4) {
    uint64_t word;
    std::memcpy(&word, at, 8);
    const uint64_t x = (word | 0x0002000200020002ull) ^ 0x003E003E003E003Eull;
    if (((x - 0x0001000100010001ull) & ~x & 0x8000800080008000ull) != 0) return false;
  }
  for (; n > 0; --n, ++at) {
    if ((*at | 2) == u'>') return false;
  }
  return true;
}

size_t TagIndex::slotOf(size_t length, char16_t first, char16_t last) const {
  const uint32_t mixed = static_cast<uint32_t>(length) * 0x9E3779B1u +
                         static_cast<uint32_t>(first) * 0x85EBCA77u +
                         static_cast<uint32_t>(last) * 0xC2B2AE3Du;
  return mixed >> (32 - slotBits_);
}

uint32_t TagIndex::groupOf(size_t at, size_t length) {
  Slot& slot = slots_[slotOf(length, text_[at], text_[at + length - 1])];
  const TextView name = text_.substr(at, length);
  if (slot.first == UINT32_MAX) {
    slot = Slot{static_cast<uint32_t>(at), static_cast<uint32_t>(length), groups_};
    return groups_++;
  }
  if (slot.length == length && sameUnits(text_.data() + slot.first, name.data(), length)) {
    return slot.group;
  }
  const auto [known, added] = others_.try_emplace(name, groups_);
  if (added) ++groups_;
  return known->second;
}

uint32_t TagIndex::findGroup(TextView name) const {
  const Slot& slot = slots_[slotOf(name.size(), name.front(), name.back())];
  if (slot.first == UINT32_MAX) return UINT32_MAX;
  if (slot.length == name.size() &&
      sameUnits(text_.data() + slot.first, name.data(), name.size())) {
    return slot.group;
  }
  const auto known = others_.find(name);
  return known == others_.end() ? UINT32_MAX : known->second;
}

TagIndex::TagIndex(TextView text, bool wide) : text_(text) {
  static std::atomic<uint64_t> made{0};
  serial_ = ++made;
  slotBits_ = text.size() < 16384 ? 8 : 12;
  slots_.resize(size_t{1} << slotBits_);
  struct Tag {
    uint32_t at;
    uint32_t group;
  };
  std::vector<Tag> tags;
  tags.reserve(text.size() / 6);  // more than XML can hold; room never used costs nothing
  const char16_t* data = text.data();
  forEachTag(
      text, wide,
      [&](size_t p, size_t g) {
        if (g - p >= 2 && endsName(data[g - 1])) {
          tags.push_back({static_cast<uint32_t>(p), groupOf(p + 1, g - p - 1)});
        }
      },
      [&](size_t q) { selfCloses_.push_back(static_cast<uint32_t>(q)); });
  starts_.assign(size_t{groups_} + 1, 0);
  for (const Tag& tag : tags) ++starts_[tag.group + 1];
  for (size_t g = 1; g < starts_.size(); ++g) starts_[g] += starts_[g - 1];
  at_.resize(tags.size());
  std::vector<uint32_t> next(starts_.begin(), starts_.end() - 1);
  for (const Tag& tag : tags) at_[next[tag.group]++] = tag.at;
}

namespace {

using Positions = std::vector<uint32_t>::const_iterator;

// The first of the sorted [begin, end) not below `from`, looked for from `at` in steps that
// double, then by a binary search within the last step.
Positions gallop(Positions begin, Positions end, Positions at, size_t from) {
  if (at != end && *at < from) {
    auto low = at + 1;
    auto high = low;
    for (ptrdiff_t step = 1; high != end && *high < from; step *= 2) {
      low = high + 1;
      high = end - low > step ? low + step : end;
    }
    return std::lower_bound(low, high, from);
  }
  auto high = at;  // the answer is here or before
  for (ptrdiff_t step = 1; high != begin && *(high - 1) >= from; step *= 2) {
    const auto low = high - begin > step ? high - step : begin;
    if (*low < from) return std::lower_bound(low + 1, high, from);
    high = low;
  }
  return high;
}

}  // namespace

TagIndex::~TagIndex() { SearchScope::forget(*this); }

size_t TagIndex::findIn(uint32_t group, size_t from, std::vector<uint32_t>* hints) const {
  if (group == kNone) return TextView::npos;
  uint32_t* hint = nullptr;
  if (hints != nullptr) {
    if (hints->size() < groups_) hints->resize(groups_, UINT32_MAX);
    hint = &(*hints)[group];
  }
  const auto begin = at_.begin() + starts_[group];
  const auto end = at_.begin() + starts_[group + 1];
  auto at = begin;
  if (hint != nullptr && *hint >= starts_[group] && *hint <= starts_[group + 1]) {
    at = at_.begin() + *hint;  // where the read's last search for the name ended
  } else {
    // Else a guess: the tags of one name mostly spread evenly over a response.
    const auto count = static_cast<size_t>(end - begin);
    at += static_cast<ptrdiff_t>(
        std::min(count, count * std::min(from, text_.size()) / std::max<size_t>(text_.size(), 1)));
  }
  const auto found = gallop(begin, end, at, from);
  if (hint != nullptr) *hint = static_cast<uint32_t>(found - at_.begin());
  return found == end ? TextView::npos : *found;
}

}  // namespace droqbxml::internal

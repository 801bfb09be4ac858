// The start-tag index: one scan for '<' and '>', each start tag given its name's group as
// its '>' is reached, then the positions sorted by group (a counting sort, so each group
// keeps the text's order).
#include "droqbxml/records/internal/TagIndex.hpp"

#include <algorithm>
#include <cstring>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace droqbxml::internal {
namespace {

bool startsName(char16_t first) { return first != u'/' && first != u'?' && first != u'!'; }
// A name ending so is an attribute's value or a self-closed tag's slash.
bool endsName(char16_t last) { return last != u'"' && last != u'\'' && last != u'/'; }

// Whether the n code units at a and b are the same, compared eight bytes at a time (names
// are short: a call to memcmp would cost more than the comparison).
bool sameUnits(const char16_t* a, const char16_t* b, size_t n) {
  for (; n >= 4; n -= 4, a += 4, b += 4) {
    uint64_t x;
    uint64_t y;
    std::memcpy(&x, a, 8);
    std::memcpy(&y, b, 8);
    if (x != y) return false;
  }
  for (; n > 0; --n) {
    if (*a++ != *b++) return false;
  }
  return true;
}

// Calls lt(p) for each '<' and gt(p) for each '>' of text, in the text's order.
template <class Lt, class Gt>
void forEachBracket(TextView text, Lt lt, Gt gt) {
  const char16_t* data = text.data();
  size_t at = 0;
#if defined(__SSE2__)
  const __m128i open = _mm_set1_epi16(u'<');
  const __m128i close = _mm_set1_epi16(u'>');
  for (; at + 8 <= text.size(); at += 8) {
    const __m128i units = _mm_loadu_si128(reinterpret_cast<const __m128i*>(data + at));
    const auto opens = static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpeq_epi16(units, open)));
    const auto closes = static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpeq_epi16(units, close)));
    // Two mask bits a code unit; the lower one of each pair is enough.
    for (unsigned both = (opens | closes) & 0x5555u; both != 0; both &= both - 1) {
      const auto bit = static_cast<unsigned>(__builtin_ctz(both));
      if ((opens >> bit) & 1u) {
        lt(at + bit / 2);
      } else {
        gt(at + bit / 2);
      }
    }
  }
#endif
  for (; at < text.size(); ++at) {
    if (data[at] == u'<') lt(at);
    if (data[at] == u'>') gt(at);
  }
}

}  // namespace

bool TagIndex::covers(TextView pattern) {
  if (pattern.size() < 3 || pattern.front() != u'<' || pattern.back() != u'>') return false;
  const TextView name = pattern.substr(1, pattern.size() - 2);
  if (!startsName(name.front()) || !endsName(name.back())) return false;
  for (const char16_t c : name) {
    if (c == u'<' || c == u'>') return false;
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
  if (slot.length == name.size() && text_.substr(slot.first, name.size()) == name) {
    return slot.group;
  }
  const auto known = others_.find(name);
  return known == others_.end() ? UINT32_MAX : known->second;
}

TagIndex::TagIndex(TextView text) : text_(text) {
  slotBits_ = text.size() < 16384 ? 8 : 12;
  slots_.resize(size_t{1} << slotBits_);
  // A start tag's name ends at the first '>' after its '<', so its group is known when that
  // '>' is reached; '<'s still waiting for theirs are pending (more than one only in text
  // that is not XML).
  struct Tag {
    uint32_t at;
    uint32_t group;
  };
  std::vector<Tag> tags;
  tags.reserve(text.size() / 6);  // more than XML can hold; room never used costs nothing
  uint32_t pending = UINT32_MAX;  // the '<' waiting for its '>'
  std::vector<uint32_t> morePending;
  const char16_t* data = text.data();
  const auto close = [&](size_t p, size_t g) {
    if (g - p >= 2 && endsName(data[g - 1])) {
      tags.push_back({static_cast<uint32_t>(p), groupOf(p + 1, g - p - 1)});
    }
  };
  forEachBracket(
      text,
      [&](size_t p) {
        if (p + 1 < text.size() && startsName(data[p + 1])) {
          if (pending != UINT32_MAX) morePending.push_back(pending);
          pending = static_cast<uint32_t>(p);
        }
      },
      [&](size_t g) {
        if (g > 0 && data[g - 1] == u'/') selfCloses_.push_back(static_cast<uint32_t>(g - 1));
        for (const uint32_t p : morePending) close(p, g);
        morePending.clear();
        if (pending != UINT32_MAX) close(pending, g);
        pending = UINT32_MAX;
      });
  starts_.assign(size_t{groups_} + 1, 0);
  for (const Tag& tag : tags) ++starts_[tag.group + 1];
  for (size_t g = 1; g < starts_.size(); ++g) starts_[g] += starts_[g - 1];
  at_.resize(tags.size());
  std::vector<uint32_t> next(starts_.begin(), starts_.end() - 1);
  for (const Tag& tag : tags) at_[next[tag.group]++] = tag.at;
}

size_t TagIndex::find(TextView pattern, size_t from) const {
  const uint32_t group = findGroup(pattern.substr(1, pattern.size() - 2));
  if (group == UINT32_MAX) return TextView::npos;
  const auto end = at_.begin() + starts_[group + 1];
  const auto found = std::lower_bound(at_.begin() + starts_[group], end, from);
  return found == end ? TextView::npos : *found;
}

size_t TagIndex::findSelfClose(size_t from) const {
  const auto found = std::lower_bound(selfCloses_.begin(), selfCloses_.end(), from);
  return found == selfCloses_.end() ? TextView::npos : *found;
}

}  // namespace droqbxml::internal

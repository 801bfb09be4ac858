// The start-tag index: one scan for '<' and '>', each start tag given its name's group as
// its '>' is reached, then the positions sorted by group (a counting sort, so each group
// keeps the text's order).
#include "droqbxml/records/internal/TagIndex.hpp"

#include <algorithm>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace droqbxml::internal {
namespace {

bool startsName(char16_t first) { return first != u'/' && first != u'?' && first != u'!'; }
// A name ending so is an attribute's value or a self-closed tag's slash.
bool endsName(char16_t last) { return last != u'"' && last != u'\'' && last != u'/'; }

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
  return startsName(name.front()) && endsName(name.back()) &&
         name.find_first_of(u"<>") == TextView::npos;
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
  if (slot.length == length && text_.substr(slot.first, length) == name) return slot.group;
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
  std::vector<uint32_t> positions;
  std::vector<uint32_t> groups;
  std::vector<uint32_t> pending;
  positions.reserve(text.size() / 32);
  groups.reserve(text.size() / 32);
  const char16_t* data = text.data();
  forEachBracket(
      text,
      [&](size_t p) {
        if (p + 1 < text.size() && startsName(data[p + 1])) {
          pending.push_back(static_cast<uint32_t>(p));
        }
      },
      [&](size_t g) {
        for (const uint32_t p : pending) {
          if (g - p < 2 || !endsName(data[g - 1])) continue;
          positions.push_back(p);
          groups.push_back(groupOf(p + 1, g - p - 1));
        }
        pending.clear();
      });
  starts_.assign(size_t{groups_} + 1, 0);
  for (const uint32_t group : groups) ++starts_[group + 1];
  for (size_t g = 1; g < starts_.size(); ++g) starts_[g] += starts_[g - 1];
  at_.resize(positions.size());
  std::vector<uint32_t> next(starts_.begin(), starts_.end() - 1);
  for (size_t i = 0; i < positions.size(); ++i) at_[next[groups[i]]++] = positions[i];
}

size_t TagIndex::find(TextView pattern, size_t from) const {
  const uint32_t group = findGroup(pattern.substr(1, pattern.size() - 2));
  if (group == UINT32_MAX) return TextView::npos;
  const auto end = at_.begin() + starts_[group + 1];
  const auto found = std::lower_bound(at_.begin() + starts_[group], end, from);
  return found == end ? TextView::npos : *found;
}

}  // namespace droqbxml::internal

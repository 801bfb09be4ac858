// Where each start tag of a response text stands, grouped by the tag's exact text, so that
// searching a long response for "<Name>" is a lookup and a binary search. Built in one pass
// over the text, sixteen code units at a time, in which each start tag joins its group by
// a short key (its length and the code units at its ends) checked against the group's
// first tag; tags whose keys collide are told apart by their whole text. Start tags with
// attributes or self-closed are left out: searches for them, like any other search, go
// over the text.
#ifndef DROQBXML_RECORDS_INTERNAL_TAGINDEX_HPP_
#define DROQBXML_RECORDS_INTERNAL_TAGINDEX_HPP_

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <unordered_map>
#include <vector>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml::internal {

class TagIndex {
 public:
  // Indexes `text` (at most UINT32_MAX code units), which must outlive the index and not
  // change: the index answers for that text only. Without `wide` the scan keeps to SSE2
  // even where the processor has AVX2 (the tests compare both).
  explicit TagIndex(TextView text, bool wide = true);
  ~TagIndex();
  TagIndex(const TagIndex&) = delete;
  TagIndex& operator=(const TagIndex&) = delete;

  // Whether the index answers searches for `pattern`: "<" + name + ">" where the name is
  // not empty, holds no '<' or '>', does not start with '/', '?' or '!' and does not end
  // with a quote or '/'.
  static bool covers(TextView pattern);
  // The same of a name: whether the index answers for "<" + name + ">".
  static bool coversName(TextView name);

  // For a covered pattern: exactly text.find(pattern, from) of the indexed text. `hints`, when
  // given, are the caller's notes of where its last search for each tag ended (empty at first; the
  // search keeps them): a search from further on then costs what the distance does, not the tag's
  // count.
  size_t find(TextView pattern, size_t from, std::vector<uint32_t>* hints = nullptr) const {
    return findIn(tagGroup(pattern), from, hints);
  }

  // The same in two steps, for a caller that asks about a pattern before it searches: the
  // group of a pattern "<" + name + ">" (kNone when the text holds no such start tag; the
  // pattern is then covered or not), and the search in that group.
  static constexpr uint32_t kNone = UINT32_MAX;
  uint32_t tagGroup(TextView pattern) const {
    return findGroup(pattern.substr(1, pattern.size() - 2));
  }
  // Whether the index answers for "<" + name + ">" and the text holds it nowhere.
  bool lacks(TextView name) const {
    return !name.empty() && findGroup(name) == kNone && coversName(name);
  }
  // The group of a name the index is known to answer for (see basCommonProcs::isPlainName):
  // kNone when the text holds no "<" + name + ">".
  uint32_t plainGroup(TextView name) const { return findGroup(name); }
  // This index among all made in the process: no two have the same.
  uint64_t serial() const { return serial_; }
  size_t findIn(uint32_t group, size_t from, std::vector<uint32_t>* hints = nullptr) const;

  // The "/>" that closes self-closed tags, also indexed: text.find(kSelfClose, from).
  static constexpr TextView kSelfClose = u"/>";
  size_t findSelfClose(size_t from) const {
    // Responses seldom hold one: most reads end at the first test.
    if (selfCloses_.empty() || selfCloses_.back() < from) return TextView::npos;
    return *std::lower_bound(selfCloses_.begin(), selfCloses_.end(), from);
  }

 private:
  struct Slot {
    uint32_t first = UINT32_MAX;  // the name's position in the text of the group's first tag
    uint32_t length = 0;
    uint32_t group = 0;
  };

  size_t slotOf(size_t length, char16_t first, char16_t last) const;
  // The group of the name at `at` (`length` code units), made when new.
  uint32_t groupOf(size_t at, size_t length);
  // The group of `name`, or UINT32_MAX.
  uint32_t findGroup(TextView name) const;

  TextView text_;
  uint64_t serial_ = 0;
  std::vector<Slot> slots_;
  unsigned slotBits_ = 0;
  // Names whose key's slot belongs to another name.
  std::unordered_map<TextView, uint32_t> others_;
  uint32_t groups_ = 0;
  std::vector<uint32_t> starts_;      // starts_[g] .. starts_[g + 1]: group g's range of at_
  std::vector<uint32_t> at_;          // tag positions, grouped, ascending in a group
  std::vector<uint32_t> selfCloses_;  // positions of "/>", ascending
};

}  // namespace droqbxml::internal

#endif  // DROQBXML_RECORDS_INTERNAL_TAGINDEX_HPP_

// Forward search in response text. Records read a response by searching literal tags
// forward from a moving cursor; every search answers exactly what a literal search of the
// text passed gives, and nothing is kept from one host call to the next: a host may reuse
// a string's buffer for a new response of the same length, or change a response in place,
// and the next search still sees exactly the text it is given.
//
// Within one read (a SearchScope, open while one top-level ParseRs runs on one text that
// nothing can change meanwhile) more is allowed: a search that runs far is remembered per
// pattern, so an element absent from the rest of the text is searched to the end once, not
// once per line of a long transaction; and the first start tag (or "/>") searched for far
// into a long text has the read index the text's start tags (TagIndex) and look tags up
// there, a tag the text never holds at once and the others from where the read's last
// search for them ended. A read over an IndexedResponse uses the response's own index from
// the start.
#ifndef DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_
#define DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <functional>
#include <memory>
#include <span>
#include <unordered_map>
#include <vector>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml::internal {

class TagIndex;

// Whether the n code units at a and b are the same, compared eight bytes at a time (tags
// are short: a call to memcmp, or a loop a unit at a time, would cost more).
inline bool sameUnits(const char16_t* a, const char16_t* b, size_t n) {
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

// Whether "<" + name + ">" (or "</" + name + ">" when `closing`) starts at `at` in `text`.
inline bool tagAt(TextView text, size_t at, TextView name, bool closing) {
  const size_t n = name.size();
  const size_t length = n + (closing ? 3 : 2);
  if (at + length > text.size() || text[at] != u'<' || text[at + length - 1] != u'>') return false;
  if (closing && text[at + 1] != u'/') return false;
  return sameUnits(text.data() + at + length - 1 - n, name.data(), n);
}

// The first position (0-based) at or after `from` where `pattern` occurs in `text`, or
// Text::npos: exactly what text.find(pattern, from) gives.
size_t findForward(TextView text, TextView pattern, size_t from);

// The first tag "<" + name + ">" (or "</" + name + ">" when `closing`) that starts within
// `window` code units of `from`: what a search for it from `from` finds, when found. npos
// tells only that none starts that near.
size_t findTagNear(TextView text, size_t from, size_t window, TextView name, bool closing);

// Speeds up the searches over `text` made on this thread while it is open. The first scope
// opened on a thread is the one that counts; scopes opened inside it do nothing, and
// searches of any other text are plain searches. `index`, when given, must be an index of
// exactly `text`, which must outlive the scope.
class SearchScope {
 public:
  explicit SearchScope(const Text& text, const TagIndex* index = nullptr);
  ~SearchScope();
  SearchScope(const SearchScope&) = delete;
  SearchScope& operator=(const SearchScope&) = delete;

  // findForward(text, pattern, from), from the open scope's memory when it is over text.
  static size_t find(const Text& text, TextView pattern, size_t from);
  // The index the open scope reads `text` with, when it has one by now: an index of
  // exactly that text.
  static const TagIndex* indexOf(const Text& text);
  // Whether that index shows that `text` holds "<" + name + ">" nowhere (false without one).
  static bool lacksStartTag(const Text& text, TextView name);
  // The groups in `index` of a record table's plain names nameAt(0) .. nameAt(count - 1);
  // `table` tells the table (the same table, the same names). Looked up once on each thread
  // for each index and table, and valid until the thread's next read opens a scope.
  static std::span<const uint32_t> groupsOf(const TagIndex& index, const void* table, size_t count,
                                            TextView (*nameAt)(size_t));
  // Drops what this thread keeps of an index that goes, when no read is open on it (small
  // blocks kept past a large response's end would hold the heap's top in place).
  static void forget(const TagIndex& index);

 private:
  size_t search(TextView pattern, size_t from);
  bool remembered(TextView pattern, size_t from, size_t& at);
  void remember(TextView pattern, size_t from, size_t at);

  struct Answer {
    size_t from = 0;  // the search started here
    size_t at = 0;    // and found the pattern here (npos: nowhere after from)
    // Whether this answers a search from `start` too, and with what.
    bool covers(size_t start, size_t& found) const;
  };
  struct Hash {
    using is_transparent = void;
    size_t operator()(TextView key) const noexcept { return std::hash<TextView>{}(key); }
  };
  const Text* text_ = nullptr;
  const TagIndex* index_ = nullptr;
  std::unique_ptr<TagIndex> ownIndex_;
  std::unordered_map<Text, Answer, Hash, std::equal_to<>> answers_;
  std::vector<uint32_t> hints_;  // the index's notes of this read's searches
  Text last_;  // the pattern of the answer last remembered or recalled, checked first
  Answer lastAnswer_{TextView::npos, 0};  // answers nothing
};

}  // namespace droqbxml::internal

#endif  // DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_

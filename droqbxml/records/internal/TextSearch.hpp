// Forward search in response text. Records read a response by searching literal tags
// forward from a moving cursor; every search answers exactly what a literal search of the
// text passed gives, and nothing is kept from one host call to the next: a host may reuse
// a string's buffer for a new response of the same length, or change a response in place,
// and the next search still sees exactly the text it is given.
//
// Within one read (a SearchScope, open while one top-level ParseRs runs on one text that
// nothing can change meanwhile) the answers are remembered per pattern: an element absent
// from the rest of the text is searched to the end once, not once per line of a long
// transaction.
#ifndef DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_
#define DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_

#include <cstddef>
#include <functional>
#include <unordered_map>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml::internal {

// The first position (0-based) at or after `from` where `pattern` occurs in `text`, or
// Text::npos: exactly what text.find(pattern, from) gives.
size_t findForward(TextView text, TextView pattern, size_t from);

// Remembers the searches over `text` made on this thread while it is open. The first scope
// opened on a thread is the one that counts; scopes opened inside it do nothing, and
// searches of any other text are not remembered.
class SearchScope {
 public:
  explicit SearchScope(const Text& text);
  ~SearchScope();
  SearchScope(const SearchScope&) = delete;
  SearchScope& operator=(const SearchScope&) = delete;

  // findForward(text, pattern, from), from the open scope's memory when it is over text.
  static size_t find(const Text& text, TextView pattern, size_t from);

 private:
  struct Answer {
    size_t from;  // the search started here
    size_t at;    // and found the pattern here (npos: nowhere after from)
  };
  struct Hash {
    using is_transparent = void;
    size_t operator()(TextView key) const noexcept { return std::hash<TextView>{}(key); }
  };
  const Text* text_ = nullptr;
  std::unordered_map<Text, Answer, Hash, std::equal_to<>> answers_;
};

}  // namespace droqbxml::internal

#endif  // DROQBXML_RECORDS_INTERNAL_TEXTSEARCH_HPP_

// A response text that cannot change, with the index of its start tags made once. A host
// that reads many records from one large response (a batch of queries, a long list) gives
// this to each record's ParseRs instead of the text: every read then finds its tags in the
// shared index rather than going over the text again, with exactly the results ParseRs
// gives on the text itself. Copies share the text and the index; any thread may read.
#ifndef DROQBXML_RECORDS_INDEXEDRESPONSE_HPP_
#define DROQBXML_RECORDS_INDEXEDRESPONSE_HPP_

#include <cstdint>
#include <functional>
#include <memory>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

class IndexedResponse {
 public:
  // Takes the text and indexes it (linear in its length).
  explicit IndexedResponse(Text text);

  const Text& text() const noexcept;

  // read(text()) with the searches over the text answered from the index; the records'
  // ParseRs overloads for an IndexedResponse are this.
  int32_t read(const std::function<int32_t(const Text&)>& read) const;

 private:
  struct State;

  std::shared_ptr<const State> state_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_INDEXEDRESPONSE_HPP_

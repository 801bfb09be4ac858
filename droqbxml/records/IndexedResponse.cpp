// The response text and its index, made together and never changed.
#include "droqbxml/records/IndexedResponse.hpp"

#include <cstdint>
#include <optional>

#include "droqbxml/records/internal/TagIndex.hpp"
#include "droqbxml/records/internal/TextSearch.hpp"

namespace droqbxml {

struct IndexedResponse::State {
  explicit State(Text value) : text(std::move(value)) {
    // Positions in the index are 32-bit; a longer text is searched directly.
    if (text.size() <= UINT32_MAX) index.emplace(text);
  }
  const Text text;
  std::optional<internal::TagIndex> index;
};

IndexedResponse::IndexedResponse(Text text)
    : state_(std::make_shared<const State>(std::move(text))) {}

const Text& IndexedResponse::text() const noexcept { return state_->text; }

int32_t IndexedResponse::read(const std::function<int32_t(const Text&)>& read) const {
  const internal::SearchScope scope(state_->text, state_->index ? &*state_->index : nullptr);
  return read(state_->text);
}

}  // namespace droqbxml

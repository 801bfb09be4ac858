// The ordered keyed collection behind every ...Col class: 1-based positions, optional
// text keys compared without regard to ASCII case, iteration in insertion order.
// A duplicate key is 457; an unknown key or a position out of range is 5.
#ifndef DROQBXML_RUNTIME_KEYEDCOLLECTION_HPP_
#define DROQBXML_RUNTIME_KEYEDCOLLECTION_HPP_

#include <cstdint>
#include <optional>
#include <unordered_map>
#include <utility>
#include <vector>

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

template <class T>
class KeyedCollection {
 public:
  using const_iterator = typename std::vector<T>::const_iterator;

  // Appends an item, under a key when one is given; the empty text counts as no key.
  void Add(T item, std::optional<TextView> key = std::nullopt) {
    Text folded;
    if (key && !key->empty()) {
      folded = upperAscii(*key);
      if (positions_.contains(folded)) raiseRuntimeError(RuntimeError::kDuplicateKey);
    }
    items_.push_back(std::move(item));
    keys_.push_back(folded);
    if (!folded.empty()) positions_.emplace(std::move(folded), items_.size() - 1);
  }

  const T& Item(int32_t position) const { return items_[index(position)]; }
  const T& Item(TextView key) const { return items_[index(key)]; }
  bool Contains(TextView key) const { return !key.empty() && positions_.contains(upperAscii(key)); }

  int32_t Count() const noexcept { return static_cast<int32_t>(items_.size()); }

  void Remove(int32_t position) { removeAt(index(position)); }
  void Remove(TextView key) { removeAt(index(key)); }
  void Clear() noexcept {
    items_.clear();
    keys_.clear();
    positions_.clear();
  }

  // A snapshot of the items in order: later changes to the collection do not affect it.
  std::vector<T> NewEnum() const { return items_; }
  const_iterator begin() const noexcept { return items_.begin(); }
  const_iterator end() const noexcept { return items_.end(); }

 private:
  size_t index(int32_t position) const {
    if (position < 1 || position > Count()) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
    return static_cast<size_t>(position - 1);
  }

  size_t index(TextView key) const {
    if (key.empty()) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
    const auto found = positions_.find(upperAscii(key));
    if (found == positions_.end()) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
    return found->second;
  }

  void removeAt(size_t at) {
    if (!keys_[at].empty()) positions_.erase(keys_[at]);
    items_.erase(items_.begin() + static_cast<std::ptrdiff_t>(at));
    keys_.erase(keys_.begin() + static_cast<std::ptrdiff_t>(at));
    for (auto& entry : positions_) {
      if (entry.second > at) --entry.second;
    }
  }

  std::vector<T> items_;
  std::vector<Text> keys_;                    // folded key of each item, "" when none
  std::unordered_map<Text, size_t> positions_;  // folded key to 0-based position
};

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_KEYEDCOLLECTION_HPP_

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

// Keys compared and hashed with ASCII letters folded to upper case, as they are given:
// looking a key up folds nothing into a new text.
struct FoldedKeyHash {
  using is_transparent = void;
  size_t operator()(TextView key) const noexcept {
    uint64_t hash = 14695981039346656037ull;
    for (const char16_t c : key) hash = (hash ^ upperAscii(c)) * 1099511628211ull;
    return static_cast<size_t>(hash);
  }
};
struct FoldedKeyEqual {
  using is_transparent = void;
  bool operator()(TextView a, TextView b) const { return equalsIgnoreCase(a, b); }
};

template <class T>
class KeyedCollection {
 public:
  using const_iterator = typename std::vector<T>::const_iterator;

  KeyedCollection() = default;
  KeyedCollection(const KeyedCollection& other)
      : items_(other.items_), positions_(other.positions_) {
    relink();
  }
  KeyedCollection& operator=(const KeyedCollection& other) {
    if (this != &other) {
      items_ = other.items_;
      positions_ = other.positions_;
      relink();
    }
    return *this;
  }

  // Appends an item, under a key when one is given; the empty text counts as no key.
  void Add(T item, std::optional<TextView> key = std::nullopt) {
    const Text* stored = nullptr;
    if (key && !key->empty()) {
      const auto [at, added] = positions_.try_emplace(Text(*key), items_.size());
      if (!added) raiseRuntimeError(RuntimeError::kDuplicateKey);
      stored = &at->first;
    }
    items_.push_back(std::move(item));
    keys_.push_back(stored);
  }

  const T& Item(int32_t position) const { return items_[index(position)]; }
  const T& Item(TextView key) const { return items_[index(key)]; }
  bool Contains(TextView key) const { return !key.empty() && positions_.contains(key); }

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
    const auto found = positions_.find(key);
    if (found == positions_.end()) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
    return found->second;
  }

  void removeAt(size_t at) {
    if (keys_[at] != nullptr) positions_.erase(positions_.find(*keys_[at]));
    items_.erase(items_.begin() + static_cast<std::ptrdiff_t>(at));
    keys_.erase(keys_.begin() + static_cast<std::ptrdiff_t>(at));
    for (auto& entry : positions_) {
      if (entry.second > at) --entry.second;
    }
  }

  // keys_ from positions_, after a copy.
  void relink() {
    keys_.assign(items_.size(), nullptr);
    for (const auto& [key, at] : positions_) keys_[at] = &key;
  }

  std::vector<T> items_;
  std::vector<const Text*> keys_;  // each item's key in positions_, null when it has none
  std::unordered_map<Text, size_t, FoldedKeyHash, FoldedKeyEqual> positions_;  // 0-based
};

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_KEYEDCOLLECTION_HPP_

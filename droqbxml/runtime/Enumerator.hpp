// The late-bound form of a collection's NewEnum: an enumerator over a snapshot of the
// items, as automation hosts iterate a collection (For Each): Next gives the next item, or
// Empty after the last; Reset starts again.
#ifndef DROQBXML_RUNTIME_ENUMERATOR_HPP_
#define DROQBXML_RUNTIME_ENUMERATOR_HPP_

#include <cstddef>
#include <vector>

#include "droqbxml/runtime/Object.hpp"
#include "droqbxml/runtime/Variant.hpp"

namespace droqbxml {

class Enumerator final : public Object {
 public:
  explicit Enumerator(std::vector<Variant> items) : items_(std::move(items)) {}

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  Variant Next();
  void Reset() { next_ = 0; }

  // An enumerator over a snapshot of typed object references.
  template <class T>
  static Ref<Enumerator> over(const std::vector<Ref<T>>& items) {
    std::vector<Variant> values;
    values.reserve(items.size());
    for (const auto& item : items) values.emplace_back(item);
    return std::make_shared<Enumerator>(std::move(values));
  }

 private:
  std::vector<Variant> items_;
  size_t next_ = 0;
};

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_ENUMERATOR_HPP_

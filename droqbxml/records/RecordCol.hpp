// The ordered keyed collections of records (customers, accounts, item group lines, the
// mixed items collection): Item by 1-based position or key, Count, Remove and NewEnum over
// one KeyedCollection, bound once for every collection class; RecordCol adds the Add that
// takes a record, or creates one when none is given.
#ifndef DROQBXML_RECORDS_RECORDCOL_HPP_
#define DROQBXML_RECORDS_RECORDCOL_HPP_

#include <cstdint>
#include <memory>
#include <vector>

#include "droqbxml/runtime/Binding.hpp"
#include "droqbxml/runtime/Enumerator.hpp"
#include "droqbxml/runtime/KeyedCollection.hpp"
#include "droqbxml/runtime/Object.hpp"

namespace droqbxml {

// A number (or a boolean) is a position; anything else is read as a key.
bool isCollectionPosition(const Variant& vntIndexKey);

template <class T>
class CollectionOf : public Object {
 public:
  // By 1-based position (a number) or by key (a text); unknown ones are 5.
  Ref<T> Item(const Variant& vntIndexKey) const {
    if (isCollectionPosition(vntIndexKey)) return items_.Item(vntIndexKey.toLong());
    return items_.Item(vntIndexKey.toText());
  }
  int32_t Count() const { return items_.Count(); }
  // Whether Item(key) finds a member (keys are compared ignoring ASCII case).
  bool Contains(const Text& key) const { return items_.Contains(key); }
  void Remove(const Variant& vntIndexKey) {
    if (isCollectionPosition(vntIndexKey)) {
      items_.Remove(vntIndexKey.toLong());
    } else {
      items_.Remove(vntIndexKey.toText());
    }
  }
  // The members in insertion order, as they are now.
  std::vector<Ref<T>> NewEnum() const { return items_.NewEnum(); }
  auto begin() const { return items_.begin(); }
  auto end() const { return items_.end(); }

 protected:
  // Appends under skey when it is not ""; a duplicate key is 457 and changes nothing.
  void append(Ref<T> member, const Text& skey) {
    if (skey.empty()) {
      items_.Add(std::move(member));
    } else {
      items_.Add(std::move(member), skey);
    }
  }
  // Item, Count, Remove and NewEnum, in that order.
  static void addCommonMembers(Members& members) {
    using C = CollectionOf<T>;
    members.method(u"Item", &C::Item)
        .getter(u"Count", &C::Count)
        .method(u"Remove", &C::Remove)
        .custom(u"NewEnum", MemberKind::Method,
                [](Object& self, Arguments) {
                  return Variant(Enumerator::over(static_cast<const C&>(self).NewEnum()));
                },
                {ValueType::Unknown, {}});
  }

 private:
  KeyedCollection<Ref<T>> items_;
};

template <class T>
class RecordCol : public CollectionOf<T> {
 public:
  // Appends Item (a new empty record when nothing is given) under skey when it is not "",
  // and returns it. A duplicate key is 457 and adds nothing.
  Ref<T> Add(const Text& skey = u"", Ref<T> Item = nullptr) {
    if (!Item) Item = std::make_shared<T>();
    this->append(Item, skey);
    return Item;
  }

 protected:
  // Add, Item, Count, Remove, NewEnum.
  static Members collectionMembers() {
    Members members;
    members.method(u"Add", &RecordCol<T>::Add).optional(2);
    CollectionOf<T>::addCommonMembers(members);
    return members;
  }
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_RECORDCOL_HPP_

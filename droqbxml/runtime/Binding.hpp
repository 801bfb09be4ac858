// Member tables from typed C++ members: property(u"Name", &C::Name, &C::Name) binds the
// const getter and the one-argument setter of an overloaded name; method(u"Op", &C::Op)
// binds an operation. Arguments convert from Variant (a left-out argument takes its
// type's empty value: "", 0, false, nothing, or Variant::missing() for a Variant);
// results convert to Variant; `int32_t&` and other non-const references are in/out.
#ifndef DROQBXML_RUNTIME_BINDING_HPP_
#define DROQBXML_RUNTIME_BINDING_HPP_

#include <algorithm>
#include <cstddef>
#include <tuple>
#include <type_traits>
#include <utility>

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Object.hpp"
#include "droqbxml/runtime/Variant.hpp"

namespace droqbxml {
namespace binding {

template <class T>
struct IsRef : std::false_type {};
template <class T>
struct IsRef<Ref<T>> : std::true_type {
  using Element = T;
};

// What an argument of type T is held in while a late-bound call runs: a text parameter
// taken as a view is given a text of its own.
template <class T>
using Held = std::conditional_t<std::is_same_v<std::remove_cvref_t<T>, TextView>, Text,
                                std::remove_cvref_t<T>>;

template <class T>
T fromVariant(const Variant& v) {
  if constexpr (std::is_same_v<T, Variant>) {
    return v;
  } else {
    if (v.isMissing()) return T{};
    if constexpr (std::is_same_v<T, Text>) {
      return v.toText();
    } else if constexpr (std::is_same_v<T, bool>) {
      return v.toBoolean();
    } else if constexpr (std::is_same_v<T, int16_t>) {
      return v.toInteger();
    } else if constexpr (std::is_same_v<T, int32_t>) {
      return v.toLong();
    } else if constexpr (std::is_same_v<T, double>) {
      return v.toDouble();
    } else if constexpr (std::is_enum_v<T>) {
      return static_cast<T>(v.toLong());
    } else if constexpr (IsRef<T>::value) {
      return v.toObjectOf<typename IsRef<T>::Element>();
    } else {
      static_assert(sizeof(T) == 0, "no late-bound conversion for this argument type");
    }
  }
}

template <class T>
Variant toVariant(T&& value) {
  using U = std::remove_cvref_t<T>;
  if constexpr (std::is_enum_v<U>) {
    return Variant(static_cast<int32_t>(value));
  } else {
    return Variant(std::forward<T>(value));
  }
}

template <class T>
constexpr ValueType valueTypeOf() {
  using U = std::remove_cvref_t<T>;
  if constexpr (std::is_void_v<U>) {
    return ValueType::None;
  } else if constexpr (std::is_same_v<U, Text> || std::is_same_v<U, TextView>) {
    return ValueType::Text;
  } else if constexpr (std::is_same_v<U, bool>) {
    return ValueType::Boolean;
  } else if constexpr (std::is_same_v<U, int16_t>) {
    return ValueType::Short;
  } else if constexpr (std::is_same_v<U, int32_t> || std::is_enum_v<U>) {
    return ValueType::Long;
  } else if constexpr (std::is_same_v<U, double>) {
    return ValueType::Double;
  } else if constexpr (std::is_convertible_v<U, Ref<Object>>) {
    return ValueType::Object;
  } else {
    return ValueType::Any;
  }
}

template <class R, class... A>
Shape shapeOf() {
  return Shape{
      valueTypeOf<R>(),
      {ParamShape{valueTypeOf<A>(),
                  std::is_lvalue_reference_v<A> && !std::is_const_v<std::remove_reference_t<A>>,
                  false}...}};
}

[[noreturn]] inline void wrongArgumentCount() {
  raiseError(450, u"DroQbXml", u"Wrong number of arguments or invalid property assignment");
}

// Converts the arguments, calls, writes in/out arguments back and converts the result.
template <class R, class... A, class F, size_t... I>
Variant callWith(F&& f, Arguments args, std::index_sequence<I...>) {
  if (args.size() > sizeof...(A)) wrongArgumentCount();
  std::tuple<Held<A>...> locals{
      fromVariant<Held<A>>(I < args.size() ? args[I] : Variant::missing())...};
  auto writeBack = [&] {
    (
        [&] {
          using Arg = A;
          if constexpr (std::is_lvalue_reference_v<Arg> &&
                        !std::is_const_v<std::remove_reference_t<Arg>>) {
            if (I < args.size()) args[I] = toVariant(std::get<I>(locals));
          }
        }(),
        ...);
  };
  if constexpr (std::is_void_v<R>) {
    f(std::get<I>(locals)...);
    writeBack();
    return Variant();
  } else {
    Variant result = toVariant(f(std::get<I>(locals)...));
    writeBack();
    return result;
  }
}

}  // namespace binding

namespace binding {

template <class C, class R, class... A>
MemberBinding bindMethod(Text name, MemberKind kind, R (C::*fn)(A...)) {
  return {std::move(name), kind,
          [fn](Object& self, Arguments args) {
            auto& object = static_cast<C&>(self);
            return callWith<R, A...>([&](auto&&... a) -> R { return (object.*fn)(a...); }, args,
                                     std::index_sequence_for<A...>{});
          },
          shapeOf<R, A...>()};
}

template <class C, class R, class... A>
MemberBinding bindMethod(Text name, MemberKind kind, R (C::*fn)(A...) const) {
  return {std::move(name), kind,
          [fn](Object& self, Arguments args) {
            const auto& object = static_cast<const C&>(self);
            return callWith<R, A...>([&](auto&&... a) -> R { return (object.*fn)(a...); }, args,
                                     std::index_sequence_for<A...>{});
          },
          shapeOf<R, A...>()};
}

template <class V>
constexpr MemberKind setterKind() {
  return IsRef<std::remove_cvref_t<V>>::value ? MemberKind::Set : MemberKind::Let;
}

}  // namespace binding

// A class's member list in interface order, written once next to the class:
//   Members().property(u"Name", &C::Name, &C::Name).method(u"Clear", &C::Clear)
class Members {
 public:
  // A read-write property whose const getter and one-argument setter share the name.
  template <class C, class R, class V>
  Members& property(const Text& name, R (C::*get)() const, void (C::*set)(V)) {
    list_.push_back(binding::bindMethod(name, MemberKind::Get, get));
    list_.push_back(binding::bindMethod(name, binding::setterKind<V>(), set));
    return *this;
  }
  // A read-only property, indexed when the getter takes arguments.
  template <class C, class R, class... I>
  Members& getter(const Text& name, R (C::*get)(I...) const) {
    list_.push_back(binding::bindMethod(name, MemberKind::Get, get));
    return *this;
  }
  template <class C, class V>
  Members& setter(const Text& name, void (C::*set)(V)) {
    list_.push_back(binding::bindMethod(name, binding::setterKind<V>(), set));
    return *this;
  }
  template <class F>
  Members& method(const Text& name, F fn) {
    list_.push_back(binding::bindMethod(name, MemberKind::Method, fn));
    return *this;
  }
  // A member whose late-bound form needs code of its own, and the shape of its call.
  Members& custom(const Text& name, MemberKind kind, MemberCall call, Shape shape = {}) {
    list_.push_back({name, kind, std::move(call), std::move(shape)});
    return *this;
  }
  // Marks the last `count` arguments of the member just added as optional: those the C++
  // declaration gives defaults (a left-out argument takes its type's empty value).
  Members& optional(size_t count) {
    auto& params = list_.back().shape.params;
    for (size_t i = params.size() - std::min(count, params.size()); i < params.size(); ++i) {
      params[i].optional = true;
    }
    return *this;
  }

  std::vector<MemberBinding> take() { return std::move(list_); }

 private:
  std::vector<MemberBinding> list_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_BINDING_HPP_

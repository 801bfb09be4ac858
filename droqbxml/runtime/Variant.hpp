// A value of any kind, as the automation platform passes it: the type of optional
// arguments whose absence matters and of every argument and result of late-bound calls.
// Conversions follow the numeric rules of Numbers.hpp and raise the runtime's errors.
#ifndef DROQBXML_RUNTIME_VARIANT_HPP_
#define DROQBXML_RUNTIME_VARIANT_HPP_

#include <concepts>
#include <cstdint>
#include <memory>

#include "droqbxml/runtime/Ref.hpp"
#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

class Variant {
 public:
  enum class Kind : uint8_t {
    Missing,
    Empty,
    Null,
    Boolean,
    Integer,
    Long,
    Double,
    Currency,
    Date,
    String,
    Object,
  };

  Variant() noexcept = default;  // Empty
  Variant(bool value) noexcept : kind_(Kind::Boolean), integer_(value ? -1 : 0) {}
  Variant(int16_t value) noexcept : kind_(Kind::Integer), integer_(value) {}
  Variant(int32_t value) noexcept : kind_(Kind::Long), integer_(value) {}
  Variant(double value) noexcept : kind_(Kind::Double), real_(value) {}
  Variant(Text value) noexcept : kind_(Kind::String), text_(std::move(value)) {}
  Variant(TextView value) : kind_(Kind::String), text_(value) {}
  Variant(const char16_t* value) : kind_(Kind::String), text_(value) {}
  Variant(const char* value) = delete;  // would silently become a Boolean
  template <class T>
    requires std::derived_from<T, Object>
  Variant(Ref<T> object) noexcept : kind_(Kind::Object), object_(std::move(object)) {}

  // An optional argument that was left out.
  static Variant missing() noexcept;
  static Variant null() noexcept;
  static Variant currency(int64_t units) noexcept;
  // A date as the platform keeps it: days since 1899-12-30, the time as the fraction.
  static Variant date(double oleDate) noexcept;

  Kind kind() const noexcept { return kind_; }
  bool isMissing() const noexcept { return kind_ == Kind::Missing; }
  bool isEmpty() const noexcept { return kind_ == Kind::Empty; }
  bool isNull() const noexcept { return kind_ == Kind::Null; }
  bool isObject() const noexcept { return kind_ == Kind::Object; }

  // The platform's name of the kind: "Integer", "Long", "String", ..., the class name of
  // an object ("Nothing" for an empty reference) and "Error" for a missing argument.
  Text typeName() const;

  int32_t toLong() const;
  int16_t toInteger() const;
  double toDouble() const;
  int64_t toCurrency() const;  // units of 1/10000
  Text toText() const;
  bool toBoolean() const;
  // The object held; Empty gives an empty Ref; any other kind is a type mismatch (13).
  Ref<Object> toObject() const;
  // The object held as class T; an object of another class is a type mismatch (13).
  template <class T>
  Ref<T> toObjectOf() const {
    auto object = toObject();
    if (!object) return nullptr;
    auto typed = std::dynamic_pointer_cast<T>(object);
    if (!typed) throwTypeMismatch();
    return typed;
  }

 private:
  [[noreturn]] static void throwTypeMismatch();

  Kind kind_ = Kind::Empty;
  int64_t integer_ = 0;  // Boolean, Integer, Long, Currency
  double real_ = 0.0;    // Double, Date
  Text text_;
  Ref<Object> object_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_VARIANT_HPP_

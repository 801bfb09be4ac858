// Conversions between the kinds of a Variant, with the platform's rules and errors.
#include "droqbxml/runtime/Variant.hpp"

#include <cmath>
#include <limits>

#include "droqbxml/runtime/Clock.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Numbers.hpp"
#include "droqbxml/runtime/Object.hpp"

namespace droqbxml {
namespace {

bool isTrueText(TextView text) { return equalsIgnoreCase(trimView(text), u"True"); }
bool isFalseText(TextView text) { return equalsIgnoreCase(trimView(text), u"False"); }

}  // namespace

Variant Variant::missing() noexcept {
  Variant v;
  v.kind_ = Kind::Missing;
  return v;
}

Variant Variant::null() noexcept {
  Variant v;
  v.kind_ = Kind::Null;
  return v;
}

Variant Variant::currency(int64_t units) noexcept {
  Variant v;
  v.kind_ = Kind::Currency;
  v.integer_ = units;
  return v;
}

Variant Variant::date(double oleDate) noexcept {
  Variant v;
  v.kind_ = Kind::Date;
  v.real_ = oleDate;
  return v;
}

void Variant::throwTypeMismatch() { raiseRuntimeError(RuntimeError::kTypeMismatch); }

Text Variant::typeName() const {
  switch (kind_) {
    case Kind::Missing:
      return u"Error";
    case Kind::Empty:
      return u"Empty";
    case Kind::Null:
      return u"Null";
    case Kind::Boolean:
      return u"Boolean";
    case Kind::Integer:
      return u"Integer";
    case Kind::Long:
      return u"Long";
    case Kind::Double:
      return u"Double";
    case Kind::Currency:
      return u"Currency";
    case Kind::Date:
      return u"Date";
    case Kind::String:
      return u"String";
    case Kind::Object:
      return object_ ? object_->className() : Text(u"Nothing");
  }
  return u"Empty";
}

double Variant::toDouble() const {
  switch (kind_) {
    case Kind::Empty:
      return 0.0;
    case Kind::Boolean:
    case Kind::Integer:
    case Kind::Long:
      return static_cast<double>(integer_);
    case Kind::Currency:
      return static_cast<double>(integer_) / static_cast<double>(kCurrencyScale);
    case Kind::Double:
    case Kind::Date:
      return real_;
    case Kind::String:
      return textToDouble(text_);
    case Kind::Null:
      raiseRuntimeError(RuntimeError::kInvalidUseOfNull);
    case Kind::Missing:
    case Kind::Object:
      break;
  }
  throwTypeMismatch();
}

int32_t Variant::toLong() const {
  switch (kind_) {
    case Kind::Empty:
      return 0;
    case Kind::Boolean:
    case Kind::Integer:
    case Kind::Long:
      return static_cast<int32_t>(integer_);
    case Kind::String:
      return textToLong(text_);
    case Kind::Currency: {
      // Half to even on the exact four decimals.
      return textToLong(currencyToText(integer_));
    }
    default:
      return doubleToLong(toDouble());
  }
}

int16_t Variant::toInteger() const {
  switch (kind_) {
    case Kind::String:
      return textToInteger(text_);
    case Kind::Double:
    case Kind::Date:
      return doubleToInteger(real_);
    default: {
      const int32_t value = toLong();
      if (value < std::numeric_limits<int16_t>::min() ||
          value > std::numeric_limits<int16_t>::max()) {
        raiseRuntimeError(RuntimeError::kOverflow);
      }
      return static_cast<int16_t>(value);
    }
  }
}

int64_t Variant::toCurrency() const {
  switch (kind_) {
    case Kind::Empty:
      return 0;
    case Kind::Boolean:
    case Kind::Integer:
    case Kind::Long:
      return integer_ * kCurrencyScale;
    case Kind::Currency:
      return integer_;
    case Kind::String:
      return textToCurrency(text_);
    default:
      return doubleToCurrency(toDouble());
  }
}

Text Variant::toText() const {
  switch (kind_) {
    case Kind::Empty:
      return {};
    case Kind::Boolean:
      return integer_ != 0 ? u"True" : u"False";
    case Kind::Integer:
    case Kind::Long:
      return asciiText(std::to_string(integer_));
    case Kind::Double:
      return doubleToText(real_);
    case Kind::Currency:
      return currencyToText(integer_);
    case Kind::Date:
      return formatShortDateTime(fromOleDate(real_));
    case Kind::String:
      return text_;
    case Kind::Null:
      raiseRuntimeError(RuntimeError::kInvalidUseOfNull);
    case Kind::Missing:
    case Kind::Object:
      break;
  }
  throwTypeMismatch();
}

bool Variant::toBoolean() const {
  switch (kind_) {
    case Kind::String:
      if (isTrueText(text_)) return true;
      if (isFalseText(text_)) return false;
      return textToDouble(text_) != 0.0;
    case Kind::Boolean:
    case Kind::Integer:
    case Kind::Long:
    case Kind::Currency:
      return integer_ != 0;
    default:
      return toDouble() != 0.0;
  }
}

Ref<Object> Variant::toObject() const {
  if (kind_ == Kind::Object) return object_;
  if (kind_ == Kind::Empty) return nullptr;
  throwTypeMismatch();
}

}  // namespace droqbxml

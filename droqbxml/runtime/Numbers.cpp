// Numeric text is read into an exact decimal (sign, digits, power of ten) so that
// rounding to integers and to currency is exact; doubles go through std::from_chars and
// std::to_chars, which do not depend on the process locale.
#include "droqbxml/runtime/Numbers.hpp"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <limits>
#include <optional>
#include <string>

#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {
namespace {

// value = (negative ? -1 : 1) * digits * 10^exponent; digits has no leading zeros and is
// empty for zero.
struct Decimal {
  bool negative = false;
  std::string digits;
  int64_t exponent = 0;
};

constexpr int64_t kExponentClamp = 1'000'000;

void normalise(Decimal& d) {
  const auto first = d.digits.find_first_not_of('0');
  if (first == std::string::npos) {
    d.digits.clear();
    d.exponent = 0;
    return;
  }
  d.digits.erase(0, first);
  const auto last = d.digits.find_last_not_of('0');
  d.exponent += static_cast<int64_t>(d.digits.size() - 1 - last);
  d.digits.resize(last + 1);
}

bool isDigit(char16_t c) { return c >= u'0' && c <= u'9'; }

std::optional<Decimal> parseRadix(TextView body, int radix) {
  // "&H" allows up to eight hex digits, "&O" up to eleven octal digits; a literal that
  // fits in 16 bits is an Integer and so is read as a signed 16-bit value.
  if (body.empty()) return std::nullopt;
  uint64_t value = 0;
  for (char16_t c : body) {
    int digit = -1;
    if (isDigit(c)) digit = c - u'0';
    if (radix == 16 && c >= u'a' && c <= u'f') digit = c - u'a' + 10;
    if (radix == 16 && c >= u'A' && c <= u'F') digit = c - u'A' + 10;
    if (digit < 0 || digit >= radix) return std::nullopt;
    value = value * static_cast<uint64_t>(radix) + static_cast<uint64_t>(digit);
    if (value > 0xFFFFFFFFull) raiseRuntimeError(RuntimeError::kOverflow);
  }
  int64_t signedValue = 0;
  if (value <= 0xFFFF) {
    signedValue = static_cast<int16_t>(static_cast<uint16_t>(value));
  } else {
    signedValue = static_cast<int32_t>(static_cast<uint32_t>(value));
  }
  Decimal d;
  d.negative = signedValue < 0;
  d.digits = std::to_string(signedValue < 0 ? -signedValue : signedValue);
  normalise(d);
  return d;
}

std::optional<Decimal> parseDecimal(TextView text) {
  size_t i = 0;
  const size_t n = text.size();
  while (i < n && text[i] == u' ') ++i;
  size_t end = n;
  while (end > i && text[end - 1] == u' ') --end;
  if (i == end) return std::nullopt;
  if (end - i >= 2 && text[i] == u'&') {
    const char16_t kind = upperAscii(text[i + 1]);
    if (kind == u'H') return parseRadix(text.substr(i + 2, end - i - 2), 16);
    if (kind == u'O') return parseRadix(text.substr(i + 2, end - i - 2), 8);
    return std::nullopt;
  }
  Decimal d;
  if (text[i] == u'+' || text[i] == u'-') {
    d.negative = text[i] == u'-';
    ++i;
  }
  size_t digitCount = 0;
  while (i < end && (isDigit(text[i]) || (text[i] == u',' && digitCount > 0))) {
    if (text[i] != u',') {
      d.digits.push_back(static_cast<char>(text[i]));
      ++digitCount;
    }
    ++i;
  }
  int64_t fractionDigits = 0;
  if (i < end && text[i] == u'.') {
    ++i;
    while (i < end && isDigit(text[i])) {
      d.digits.push_back(static_cast<char>(text[i]));
      ++fractionDigits;
      ++i;
    }
  }
  if (d.digits.empty()) return std::nullopt;
  int64_t exponent = 0;
  if (i < end && (upperAscii(text[i]) == u'E' || upperAscii(text[i]) == u'D')) {
    ++i;
    bool negativeExponent = false;
    if (i < end && (text[i] == u'+' || text[i] == u'-')) {
      negativeExponent = text[i] == u'-';
      ++i;
    }
    if (i == end || !isDigit(text[i])) return std::nullopt;
    while (i < end && isDigit(text[i])) {
      if (exponent < kExponentClamp) exponent = exponent * 10 + (text[i] - u'0');
      ++i;
    }
    if (negativeExponent) exponent = -exponent;
  }
  if (i != end) return std::nullopt;
  d.exponent = exponent - fractionDigits;
  normalise(d);
  return d;
}

Decimal parseOrMismatch(TextView text) {
  auto d = parseDecimal(text);
  if (!d) raiseRuntimeError(RuntimeError::kTypeMismatch);
  return *d;
}

// round(|d| * 10^scale) half to even, as an unsigned value; nullopt past 2^64 - 1.
std::optional<uint64_t> scaledMagnitude(const Decimal& d, int scale) {
  if (d.digits.empty()) return 0;
  const int64_t shift = d.exponent + scale;
  const auto len = static_cast<int64_t>(d.digits.size());
  if (shift >= 0) {
    if (len + shift > 20) return std::nullopt;
    uint64_t value = 0;
    for (int64_t k = 0; k < len + shift; ++k) {
      const uint64_t digit = k < len ? static_cast<uint64_t>(d.digits[k] - '0') : 0;
      if (value > (std::numeric_limits<uint64_t>::max() - digit) / 10) return std::nullopt;
      value = value * 10 + digit;
    }
    return value;
  }
  const int64_t integerDigits = len + shift;  // digits before the rounding point
  if (integerDigits > 20) return std::nullopt;
  uint64_t value = 0;
  for (int64_t k = 0; k < integerDigits; ++k) {
    const auto digit = static_cast<uint64_t>(d.digits[k] - '0');
    if (value > (std::numeric_limits<uint64_t>::max() - digit) / 10) return std::nullopt;
    value = value * 10 + digit;
  }
  // The dropped part compared with one half: its first digit, then whether any follows.
  const char firstDropped = integerDigits >= 0 ? d.digits[integerDigits] : '0';
  const bool moreDropped = integerDigits + 1 < len;  // digits end in a non-zero digit
  bool roundUp = false;
  if (integerDigits < 0) {
    roundUp = false;  // below one half of a unit
  } else if (firstDropped > '5' || (firstDropped == '5' && moreDropped)) {
    roundUp = true;
  } else if (firstDropped == '5') {
    roundUp = (value % 2) == 1;
  }
  if (roundUp) {
    if (value == std::numeric_limits<uint64_t>::max()) return std::nullopt;
    ++value;
  }
  return value;
}

int64_t scaledInRange(const Decimal& d, int scale, int64_t low, int64_t high) {
  const auto magnitude = scaledMagnitude(d, scale);
  if (!magnitude) raiseRuntimeError(RuntimeError::kOverflow);
  if (d.negative) {
    if (*magnitude > static_cast<uint64_t>(-(low + 1)) + 1) {
      raiseRuntimeError(RuntimeError::kOverflow);
    }
    return *magnitude == 0 ? 0 : -static_cast<int64_t>(*magnitude - 1) - 1;
  }
  if (*magnitude > static_cast<uint64_t>(high)) raiseRuntimeError(RuntimeError::kOverflow);
  return static_cast<int64_t>(*magnitude);
}

double decimalToDouble(const Decimal& d) {
  if (d.digits.empty()) return 0.0;
  std::string ascii = d.digits + "e" + std::to_string(d.exponent);
  double value = 0.0;
  const auto result = std::from_chars(ascii.data(), ascii.data() + ascii.size(), value);
  if (result.ec == std::errc::result_out_of_range) {
    if (d.exponent + static_cast<int64_t>(d.digits.size()) > 0) {
      raiseRuntimeError(RuntimeError::kOverflow);
    }
    value = 0.0;  // below the smallest double: the platform gives zero
  }
  return d.negative ? -value : value;
}

// The 15-significant-digit decimal form of a finite double.
Decimal fifteenDigits(double value) {
  std::array<char, 64> buffer{};
  const auto result = std::to_chars(buffer.data(), buffer.data() + buffer.size(), std::fabs(value),
                                    std::chars_format::scientific, 14);
  const std::string text(buffer.data(), result.ptr);
  Decimal d;
  d.negative = value < 0;
  const auto e = text.find('e');
  for (size_t k = 0; k < e; ++k) {
    if (text[k] != '.') d.digits.push_back(text[k]);
  }
  d.exponent = std::stoll(text.substr(e + 1)) - 14;
  normalise(d);
  return d;
}

Text formatDecimal(const Decimal& d, int decimals) {
  // Round half away from zero at `decimals` places.
  std::string digits = d.digits;
  int64_t exponent = d.exponent;
  const int64_t keep = static_cast<int64_t>(digits.size()) + exponent + decimals;
  if (exponent < -decimals) {
    if (keep < 0) {
      digits.clear();
    } else {
      const bool up = keep < static_cast<int64_t>(digits.size()) && digits[keep] >= '5';
      digits.resize(static_cast<size_t>(keep));
      exponent = -decimals;
      if (up) {
        int64_t k = keep - 1;
        while (k >= 0 && digits[k] == '9') digits[k--] = '0';
        if (k >= 0) {
          ++digits[k];
        } else {
          digits.insert(digits.begin(), '1');
        }
      }
    }
  }
  // Now the value is digits * 10^exponent with exponent >= -decimals (or zero).
  std::string integerPart;
  std::string fraction(static_cast<size_t>(decimals), '0');
  if (!digits.empty()) {
    std::string all = digits + std::string(static_cast<size_t>(exponent + decimals), '0');
    const auto split = static_cast<int64_t>(all.size()) - decimals;
    if (split > 0) {
      integerPart = all.substr(0, static_cast<size_t>(split));
      fraction = all.substr(static_cast<size_t>(split));
    } else {
      fraction = std::string(static_cast<size_t>(-split), '0') + all;
    }
    const auto firstNonZero = integerPart.find_first_not_of('0');
    integerPart = firstNonZero == std::string::npos ? "" : integerPart.substr(firstNonZero);
  }
  const bool zero = integerPart.empty() && fraction.find_first_not_of('0') == std::string::npos;
  std::string out = (d.negative && !zero) ? "-" : "";
  out += integerPart;
  out += '.';
  out += fraction;
  return asciiText(out);
}

}  // namespace

bool isNumeric(TextView text) {
  try {
    return parseDecimal(text).has_value();
  } catch (const ComError&) {
    return false;  // a hexadecimal literal too large for 32 bits
  }
}

double textToDouble(TextView text) { return decimalToDouble(parseOrMismatch(text)); }

int32_t textToLong(TextView text) {
  // Plain digits within the range are the number they spell.
  if (!text.empty() && text.size() <= 10 &&
      std::all_of(text.begin(), text.end(), [](char16_t c) { return c >= u'0' && c <= u'9'; })) {
    int64_t number = 0;
    for (const char16_t c : text) number = number * 10 + (c - u'0');
    if (number <= std::numeric_limits<int32_t>::max()) return static_cast<int32_t>(number);
  }
  return static_cast<int32_t>(scaledInRange(parseOrMismatch(text), 0,
                                            std::numeric_limits<int32_t>::min(),
                                            std::numeric_limits<int32_t>::max()));
}

int16_t textToInteger(TextView text) {
  return static_cast<int16_t>(scaledInRange(parseOrMismatch(text), 0,
                                            std::numeric_limits<int16_t>::min(),
                                            std::numeric_limits<int16_t>::max()));
}

int64_t textToCurrency(TextView text) {
  return scaledInRange(parseOrMismatch(text), 4, std::numeric_limits<int64_t>::min(),
                       std::numeric_limits<int64_t>::max());
}

int32_t doubleToLong(double value) {
  const double rounded = std::nearbyint(value);
  if (!(rounded >= -2147483648.0 && rounded <= 2147483647.0)) {
    raiseRuntimeError(RuntimeError::kOverflow);
  }
  return static_cast<int32_t>(rounded);
}

int16_t doubleToInteger(double value) {
  const double rounded = std::nearbyint(value);
  if (!(rounded >= -32768.0 && rounded <= 32767.0)) raiseRuntimeError(RuntimeError::kOverflow);
  return static_cast<int16_t>(rounded);
}

int64_t doubleToCurrency(double value) {
  const double scaled = std::nearbyint(value * static_cast<double>(kCurrencyScale));
  // 2^63 is exactly representable; anything at or beyond it does not fit.
  if (!(scaled >= -9223372036854775808.0 && scaled < 9223372036854775808.0)) {
    raiseRuntimeError(RuntimeError::kOverflow);
  }
  return static_cast<int64_t>(scaled);
}

Text doubleToText(double value) {
  if (std::isnan(value)) return u"NaN";
  if (std::isinf(value)) return value > 0 ? u"Infinity" : u"-Infinity";
  std::array<char, 64> buffer{};
  const auto result = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value,
                                    std::chars_format::general, 15);
  std::string text(buffer.data(), result.ptr);
  for (auto& c : text) {
    if (c == 'e') c = 'E';
  }
  if (text == "-0") text = "0";
  return asciiText(text);
}

Text currencyToText(int64_t units) {
  const bool negative = units < 0;
  // Work in unsigned to take the magnitude of the smallest value safely.
  const uint64_t magnitude =
      negative ? static_cast<uint64_t>(-(units + 1)) + 1 : static_cast<uint64_t>(units);
  std::string text = std::to_string(magnitude / kCurrencyScale);
  std::string fraction = std::to_string(magnitude % kCurrencyScale);
  fraction.insert(0, 4 - fraction.size(), '0');
  while (!fraction.empty() && fraction.back() == '0') fraction.pop_back();
  if (!fraction.empty()) text += "." + fraction;
  return asciiText(negative ? "-" + text : text);
}

namespace {

// The end of the plain integer digits of `text` when it is plain for `decimals` (see
// isPlainFixed), else npos.
size_t plainIntegerEnd(TextView text, int decimals) {
  const auto isDigit = [](char16_t c) { return c >= u'0' && c <= u'9'; };
  const size_t point =
      static_cast<size_t>(std::find_if_not(text.begin(), text.end(), isDigit) - text.begin());
  if (point == 0 || decimals <= 0) return TextView::npos;
  if (point == text.size()) return point <= 15 ? point : TextView::npos;
  const size_t fraction = text.size() - point - 1;
  const bool plain =
      text[point] == u'.' && fraction >= 1 && fraction <= static_cast<size_t>(decimals) &&
      text.size() - 1 <= 15 &&
      std::all_of(text.begin() + static_cast<ptrdiff_t>(point) + 1, text.end(), isDigit);
  return plain ? point : TextView::npos;
}

}  // namespace

bool isPlainFixed(TextView text, int decimals) {
  return plainIntegerEnd(text, decimals) != TextView::npos;
}

size_t plainIntegerDigits(TextView text) {
  const size_t point = std::min(text.find(u'.'), text.size());
  const size_t zeros = text.substr(0, point).find_first_not_of(u'0');
  return zeros == TextView::npos ? 1 : point - zeros;
}

Text formatFixed(TextView text, int decimals) {
  // Most texts are already digits with at most the pattern's decimals (amounts and prices
  // as QuickBooks writes them): with at most fifteen digits the number's fifteen-digit form
  // is those digits, so the pattern is the text without the integer part's leading zeros,
  // its decimals filled up with zeros.
  if (const size_t point = plainIntegerEnd(text, decimals); point != TextView::npos) {
    const size_t zeros = text.substr(0, point).find_first_not_of(u'0');
    const size_t fraction = point == text.size() ? 0 : text.size() - point - 1;
    Text fixed(text.substr(zeros == TextView::npos ? point : zeros));
    if (fraction == 0) fixed += u'.';
    fixed.append(static_cast<size_t>(decimals) - fraction, u'0');
    return fixed;
  }
  const auto d = parseDecimal(text);
  if (!d) return Text(text);
  return formatFixed(decimalToDouble(*d), decimals);
}

Text formatFixed(double value, int decimals) {
  if (!std::isfinite(value)) return doubleToText(value);
  return formatDecimal(fifteenDigits(value), decimals);
}

}  // namespace droqbxml

// The platform's numeric text conversions, fixed to the invariant en-US form.
//
// Numeric text: optional spaces, optional sign, digits with optional "," group separators,
// an optional "." fraction, an optional exponent (E or D, optional sign, digits), optional
// spaces; also "&H" hexadecimal and "&O" octal integers. Anything else is a type mismatch
// (13). Rounding to an integer is half to even; a value out of range is an overflow (6).
#ifndef DROQBXML_RUNTIME_NUMBERS_HPP_
#define DROQBXML_RUNTIME_NUMBERS_HPP_

#include <cstdint>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

// Currency: a fixed-point number in units of 1/10000.
inline constexpr int64_t kCurrencyScale = 10000;

bool isNumeric(TextView text);

double textToDouble(TextView text);
int32_t textToLong(TextView text);
int16_t textToInteger(TextView text);
int64_t textToCurrency(TextView text);

int32_t doubleToLong(double value);
int16_t doubleToInteger(double value);
int64_t doubleToCurrency(double value);

// Text of a Double: at most 15 significant digits, no trailing zeros, "." as separator,
// and the platform's exponent form ("1E+15", "1E-05") outside 1E-4 .. 1E15.
Text doubleToText(double value);
// Text of a Currency: the same, with at most four decimals.
Text currencyToText(int64_t units);

// The patterns "#.00" (decimals 2) and "#.00000" (decimals 5): an optional "-", the
// integer digits without leading zeros (none when the integer part is 0), ".", and exactly
// `decimals` decimals, rounded half away from zero on the number's 15-significant-digit
// decimal form. Text that is not numeric is returned unchanged.
Text formatFixed(TextView text, int decimals);
Text formatFixed(double value, int decimals);
// Whether `text` is already in the form formatFixed reads directly: digits, then "." and
// one to `decimals` decimals or nothing, at most fifteen digits in all. Its pattern is
// then the text without the integer part's leading zeros and with its decimals filled up,
// and formatting that text's number again gives it back.
bool isPlainFixed(TextView text, int decimals);
// The integer digits of a plain text's number as the runtime writes it: those without
// leading zeros, or the one "0".
size_t plainIntegerDigits(TextView text);

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_NUMBERS_HPP_

// Values as QuickBooks converts and writes them: amounts, prices, quantities and percentages
// as exact decimal numbers, text reduced to the characters a company file can hold, and
// booleans in their written form.
#ifndef DROQBXML_SIMULATOR_HANDLERS_VALUES_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_VALUES_HPP_

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace droqbxml::simulator::handlers {

// Numbers are kept as integers counting hundred-thousandths: five decimals, the most any
// qbXML number type carries.
inline constexpr int64_t kScale = 100000;
inline constexpr int64_t kCent = kScale / 100;

// The number types of qbXML: AMTTYPE (written with two decimals), PRICETYPE (at least two,
// at most five), QUANTYPE (as few as needed) and PERCENTTYPE (as prices).
enum class NumberKind { Amount, Price, Quantity, Percent };

// The number type of an element of that name, or none for elements that are not numbers.
std::optional<NumberKind> numberKindOf(std::string_view element);

// The value of `text` as QuickBooks converts it: an amount has no decimals or exactly two,
// the other kinds at most five; none when QuickBooks could not convert it.
std::optional<int64_t> parseNumber(std::string_view text, NumberKind kind);

// `value` written as QuickBooks writes numbers of that kind.
std::string formatNumber(int64_t value, NumberKind kind);

// The largest amount QuickBooks holds, 9999999999999.99 (an AMTTYPE's thirteen digits).
inline constexpr int64_t kLargestAmount = 999999999999999 * kCent;

// The product of two numbers, rounded half away from zero to five decimals. These three
// give a value past kLargestAmount, not a wrapped one, when the result would not fit.
int64_t multiply(int64_t left, int64_t right);
// `value` divided by `divisor`, rounded half away from zero to five decimals.
int64_t divide(int64_t value, int64_t divisor);
// `percent` per cent of `value`, rounded half away from zero to five decimals.
int64_t percentOf(int64_t value, int64_t percent);
// `value` rounded half away from zero to whole cents.
int64_t roundToCents(int64_t value);

// The word QuickBooks' conversion message uses for a number of that kind.
std::string_view numberKindWord(NumberKind kind);

// `utf8` with every character outside ISO-8859-1 (and every byte that is not UTF-8) replaced
// by "?", as QuickBooks stores text.
std::string latin1Text(std::string_view utf8);

// A BOOLTYPE value ("1", "0", "true", "false") in the form QuickBooks writes it.
std::string booleanText(std::string_view value);
bool isTrue(std::string_view value);

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_VALUES_HPP_

// Number conversion and formatting on scaled integers (no floating point anywhere, so totals
// come out to the cent as QuickBooks computes them), and the text and boolean forms.
#include "simulator/handlers/Values.hpp"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <utility>

namespace droqbxml::simulator::handlers {
namespace {

// The number elements of the requests and records the stand-in handles, by type.
constexpr std::array<std::pair<std::string_view, NumberKind>, 33> kNumberElements{{
    {"Amount", NumberKind::Amount},
    {"AppliedAmount", NumberKind::Amount},
    {"Balance", NumberKind::Amount},
    {"BalanceRemaining", NumberKind::Amount},
    {"CreditLimit", NumberKind::Amount},
    {"OpenBalance", NumberKind::Amount},
    {"SalesTaxTotal", NumberKind::Amount},
    {"Subtotal", NumberKind::Amount},
    {"TaxAmount", NumberKind::Amount},
    {"TotalAmount", NumberKind::Amount},
    {"TotalBalance", NumberKind::Amount},
    {"TotalValue", NumberKind::Amount},
    {"AverageCost", NumberKind::Price},
    {"DiscountRate", NumberKind::Price},
    {"MarkupRate", NumberKind::Price},
    {"Price", NumberKind::Price},
    {"PurchaseCost", NumberKind::Price},
    {"Rate", NumberKind::Price},
    {"SalesPrice", NumberKind::Price},
    {"Max", NumberKind::Quantity},
    {"Quantity", NumberKind::Quantity},
    {"QuantityOnHand", NumberKind::Quantity},
    {"QuantityOnOrder", NumberKind::Quantity},
    {"QuantityOnSalesOrder", NumberKind::Quantity},
    {"ReorderPoint", NumberKind::Quantity},
    {"DiscountRatePercent", NumberKind::Percent},
    {"MarkupRatePercent", NumberKind::Percent},
    {"PricePercent", NumberKind::Percent},
    {"RatePercent", NumberKind::Percent},
    {"SalesTaxPercentage", NumberKind::Percent},
    {"TaxRate", NumberKind::Percent},
    {"SuggestedDiscountAmount", NumberKind::Amount},
    {"BalanceRemainingInHomeCurrency", NumberKind::Amount},
}};

// Digits allowed before the point: thirteen for amounts, ten for the other types.
int maximumIntegerDigits(NumberKind kind) { return kind == NumberKind::Amount ? 13 : 10; }

// Products of two five-decimal numbers need more than 64 bits before they are scaled back.
__extension__ typedef __int128 Wide;

Wide roundedQuotient(Wide value, Wide divisor) {
  const bool negative = (value < 0) != (divisor < 0);
  const Wide magnitude = value < 0 ? -value : value;
  const Wide positiveDivisor = divisor < 0 ? -divisor : divisor;
  const Wide quotient = (magnitude + positiveDivisor / 2) / positiveDivisor;
  return negative ? -quotient : quotient;
}

void appendUtf8(std::string& out, char32_t c) {
  if (c < 0x80) {
    out += static_cast<char>(c);
  } else {
    out += static_cast<char>(0xC0 | (c >> 6));
    out += static_cast<char>(0x80 | (c & 0x3F));
  }
}

}  // namespace

std::optional<NumberKind> numberKindOf(std::string_view element) {
  for (const auto& [name, kind] : kNumberElements) {
    if (name == element) return kind;
  }
  return std::nullopt;
}

std::optional<int64_t> parseNumber(std::string_view text, NumberKind kind) {
  while (!text.empty() && text.front() == ' ') text.remove_prefix(1);
  while (!text.empty() && text.back() == ' ') text.remove_suffix(1);
  bool negative = false;
  if (!text.empty() && (text.front() == '+' || text.front() == '-')) {
    negative = text.front() == '-';
    text.remove_prefix(1);
  }
  const size_t point = text.find('.');
  const std::string_view whole = text.substr(0, point);
  const std::string_view decimals =
      point == std::string_view::npos ? std::string_view() : text.substr(point + 1);
  if (whole.empty() || static_cast<int>(whole.size()) > maximumIntegerDigits(kind)) {
    return std::nullopt;
  }
  if (point != std::string_view::npos &&
      (kind == NumberKind::Amount ? decimals.size() != 2
                                  : decimals.empty() || decimals.size() > 5)) {
    return std::nullopt;
  }
  int64_t value = 0;
  for (const char c : whole) {
    if (c < '0' || c > '9') return std::nullopt;
    value = value * 10 + (c - '0');
  }
  int64_t fraction = 0;
  int64_t unit = kScale;
  for (const char c : decimals) {
    if (c < '0' || c > '9') return std::nullopt;
    unit /= 10;
    fraction += (c - '0') * unit;
  }
  value = value * kScale + fraction;
  return negative ? -value : value;
}

std::string formatNumber(int64_t value, NumberKind kind) {
  if (kind == NumberKind::Amount) value = roundToCents(value);
  const bool negative = value < 0;
  const uint64_t magnitude =
      negative ? static_cast<uint64_t>(-(value + 1)) + 1 : static_cast<uint64_t>(value);
  std::string decimals = std::to_string(magnitude % kScale);
  decimals.insert(0, 5 - decimals.size(), '0');
  const size_t minimum = kind == NumberKind::Quantity ? 0 : 2;
  const size_t kept = kind == NumberKind::Amount ? 2 : 5;
  decimals.resize(kept);
  while (decimals.size() > minimum && decimals.back() == '0') decimals.pop_back();
  std::string text = negative && magnitude != 0 ? "-" : "";
  text += std::to_string(magnitude / kScale);
  if (!decimals.empty()) text += "." + decimals;
  return text;
}

// A wide result as a number, held just past the largest amount when it would not fit.
int64_t narrowed(Wide value) {
  constexpr Wide kPast = static_cast<Wide>(kLargestAmount) + kScale;
  return static_cast<int64_t>(std::clamp(value, -kPast, kPast));
}

int64_t multiply(int64_t left, int64_t right) {
  return narrowed(roundedQuotient(static_cast<Wide>(left) * right, kScale));
}

int64_t divide(int64_t value, int64_t divisor) {
  if (divisor == 0) return 0;
  return narrowed(roundedQuotient(static_cast<Wide>(value) * kScale, divisor));
}

int64_t percentOf(int64_t value, int64_t percent) {
  return narrowed(
      roundedQuotient(static_cast<Wide>(value) * percent, static_cast<Wide>(kScale) * 100));
}

int64_t roundToCents(int64_t value) {
  return static_cast<int64_t>(roundedQuotient(value, kCent)) * kCent;
}

std::string_view numberKindWord(NumberKind kind) {
  switch (kind) {
    case NumberKind::Amount:
      return "amount";
    case NumberKind::Price:
      return "price";
    case NumberKind::Quantity:
      return "quantity";
    case NumberKind::Percent:
      return "percentage";
  }
  return "amount";
}

std::string latin1Text(std::string_view utf8) {
  std::string out;
  out.reserve(utf8.size());
  size_t i = 0;
  while (i < utf8.size()) {
    const auto lead = static_cast<unsigned char>(utf8[i]);
    if (lead < 0x80) {
      out += static_cast<char>(lead);
      ++i;
      continue;
    }
    const size_t length = lead >= 0xF0 ? 4 : lead >= 0xE0 ? 3 : lead >= 0xC0 ? 2 : 1;
    char32_t c = length == 4 ? lead & 0x07 : length == 3 ? lead & 0x0F : lead & 0x1F;
    bool valid = length > 1 && i + length <= utf8.size();
    for (size_t k = 1; valid && k < length; ++k) {
      const auto next = static_cast<unsigned char>(utf8[i + k]);
      valid = (next & 0xC0) == 0x80;
      c = (c << 6) | (next & 0x3F);
    }
    if (valid && c >= 0x80 && c <= 0xFF && length == 2) {
      appendUtf8(out, c);
    } else {
      out += '?';
    }
    i += valid ? length : 1;
  }
  return out;
}

std::string booleanText(std::string_view value) { return isTrue(value) ? "true" : "false"; }

bool isTrue(std::string_view value) { return value == "true" || value == "1"; }

}  // namespace droqbxml::simulator::handlers

// The value checks: closed lists as tables of upper-case keys, number checks over the
// runtime's conversions and fixed formats, and the one place that words and raises a
// refusal.
#include "droqbxml/qbxml/basValidations.hpp"

#include <algorithm>
#include <array>
#include <optional>
#include <span>
#include <string>
#include <utility>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Numbers.hpp"

namespace droqbxml::basValidations {
namespace {

// How a check refuses a value: the check's name (its source is the module's source and
// the name), its number and the type words of its message.
struct Refusal {
  TextView check;
  ERROR_NUMBER number;
  TextView typeWords;
};

constexpr TextView kSourcePrefix = u"DroQbXml.basValidations.";
constexpr TextView kMessageStart = u"The value '";
constexpr TextView kMessageMiddle = u"' is not an allowable ";
// The published refusal text, pointing users to Intuit's qbXML documents; two blanks before
// "Please": hosts show and compare the message as it always was.
constexpr TextView kMessageEnd = u" value.  Please refer to the qbXML specifications.";

constexpr Refusal kWageRefusal{u"CheckWageType", TYPE_WAGE, u"Wage Type"};
constexpr Refusal kJobStatusRefusal{u"CheckJobStatus", JOB_STATUS, u"job status"};
constexpr Refusal kAccountRefusal{u"CheckAccountType", TYPE_ACCOUNT, u"account type"};
constexpr Refusal kAmountRefusal{u"CheckAMTTYPE", TYPE_AMOUNT, u"AMTTYPE"};
constexpr Refusal kBoolRefusal{u"CheckBOOLTYPE", TYPE_BOOL, u"BOOLTYPE"};
constexpr Refusal kDateRefusal{u"CheckDATETYPE", TYPE_DATE, u"DATETYPE"};
constexpr Refusal kIntRefusal{u"CheckINTTYPE", TYPE_INT, u"INTTYPE"};
constexpr Refusal kPriceRefusal{u"CheckPRICETYPE", TYPE_PRICE, u"PRICETYPE"};
constexpr Refusal kQuantityRefusal{u"CheckQUANTYPE", TYPE_QUNANTITY, u"QUANTYPE"};
constexpr Refusal kStringRefusal{u"CheckSTRTYPE", TYPE_STRING, u"STRTYPE"};

Text sourceOf(const Refusal& refusal) { return Text(kSourcePrefix) + Text(refusal.check); }

[[noreturn]] void refuse(const Refusal& refusal, TextView shown) {
  Text description(kMessageStart);
  description += shown;
  description += kMessageMiddle;
  description += refusal.typeWords;
  description += kMessageEnd;
  raiseComponentError(refusal.number, sourceOf(refusal), std::move(description));
}

// Runs a conversion of a check that handles its own conversion failures: a type mismatch
// gives nothing, so the check goes on to refuse the value; any other failure (an
// overflow) is stored in the shared error object under the check's source and raised
// from there, so the host sees the runtime's number and text under the check's name.
template <class Convert>
auto convertOrNothing(const Refusal& refusal, Convert convert)
    -> std::optional<decltype(convert())> {
  try {
    return convert();
  } catch (const ComError& error) {
    if (error.number() == RuntimeError::kTypeMismatch) return std::nullopt;
    const auto shared = basGlobals::SharedErrorObject();
    shared->SetError(error.record(), sourceOf(refusal));
    shared->Raise();
    // Raise returns only for number 0, which no runtime error has.
    throw;
  }
}

struct ListEntry {
  TextView key;  // upper case
  TextView result;
};

constexpr auto kWageTypes = std::to_array<ListEntry>({
    {u"HOURLY", u"Hourly"},
    {u"SALARY", u"Salary"},
});

constexpr auto kJobStatuses = std::to_array<ListEntry>({
    {u"PENDING", u"Pending"},
    {u"AWARDED", u"Awarded"},
    {u"INPROGRESS", u"InProgress"},
    {u"CLOSED", u"Closed"},
    {u"NOTAWARDED", u"NotAwarded"},
    {u"NONE", u"None"},
});

constexpr auto kAccountTypes = std::to_array<ListEntry>({
    {u"ACCOUNTSPAYABLE", u"AccountsPayable"},
    {u"ACCOUNTSRECEIVABLE", u"AccountsReceivable"},
    {u"BANK", u"Bank"},
    {u"COSTOFGOODSSOLD", u"CostOfGoodsSold"},
    {u"CREDITCARD", u"CreditCard"},
    {u"EQUITY", u"Equity"},
    {u"EXPENSE", u"Expense"},
    {u"FIXEDASSET", u"FixedAsset"},
    {u"INCOME", u"Income"},
    {u"LONGTERMLIABILITY", u"LongTermLiability"},
    {u"OTHERASSET", u"OtherAsset"},
    {u"OTHERCURRENTASSET", u"OtherCurrentAsset"},
    {u"OTHERCURRENTLIABILITY", u"OtherCurrentLiability"},
    {u"OTHEREXPENSE", u"OtherExpense"},
    {u"OTHERINCOME", u"OtherIncome"},
    // Hyphenated with a lower-case "p": the spelling hosts have always stored.
    {u"NON-POSTING", u"Non-posting"},
});

constexpr auto kBooleans = std::to_array<ListEntry>({
    {u"1", u"true"},
    {u"TRUE", u"true"},
    {u"0", u"false"},
    {u"FALSE", u"false"},
});

// The value in upper case compared exactly (not trimmed: a blank makes it unmatched).
Text matchClosedList(const Text& value, std::span<const ListEntry> list, const Refusal& refusal) {
  if (value.empty()) return {};
  const Text upper = upperAscii(value);
  const auto found =
      std::find_if(list.begin(), list.end(), [&](const ListEntry& e) { return e.key == upper; });
  if (found == list.end()) refuse(refusal, value);
  return Text(found->result);
}

bool startsWithSign(TextView text) {
  return !text.empty() && (text.front() == u'+' || text.front() == u'-');
}

// Whether at most `maxDigits` characters stand before the first "." (the whole text when
// it has none), one more when the text starts with a sign.
bool integerPartWithin(TextView text, size_t maxDigits) {
  const size_t point = std::min(text.find(u'.'), text.size());
  return point <= maxDigits + (startsWithSign(text) ? 1 : 0);
}

// Characters first .. first + count - 1 (1-based) of the text, as many as it has.
TextView mid(TextView text, size_t first, size_t count) {
  if (first > text.size()) return {};
  return text.substr(first - 1, count);
}

constexpr double kAmountLimit = 99999999.99;
constexpr size_t kAmountTextLimit = 13;  // a "#.00" text this long is refused unread
constexpr size_t kAmountIntegerDigits = 8;
constexpr size_t kAmountDecimals = 2;
constexpr size_t kPriceIntegerDigits = 10;
constexpr double kQuantityLimit = 9999999.99999;
constexpr size_t kQuantityIntegerDigits = 7;
constexpr int32_t kIntLengthMode = 1;
constexpr int32_t kIntRangeMode = 2;

}  // namespace

Text CheckWageType(const Text& value) { return matchClosedList(value, kWageTypes, kWageRefusal); }

Text CheckJobStatus(const Text& value) {
  return matchClosedList(value, kJobStatuses, kJobStatusRefusal);
}

Text CheckAccountType(const Text& value) {
  return matchClosedList(value, kAccountTypes, kAccountRefusal);
}

Text CheckBOOLTYPE(const Text& value) { return matchClosedList(value, kBooleans, kBoolRefusal); }

Text CheckAMTTYPE(const Text& value) {
  if (value.empty()) return {};
  // A plain amount within the integer digits (and so within the limit) is its "#.00" text.
  if (isPlainFixed(value, 2) && plainIntegerDigits(value) <= kAmountIntegerDigits) {
    return formatFixed(value, 2);
  }
  // Every refusal shows this "#.00" text, not the value given: hosts have always seen it so.
  const Text text =
      convertOrNothing(kAmountRefusal, [&] { return formatFixed(value, 2); }).value_or(value);
  if (text.size() >= kAmountTextLimit) refuse(kAmountRefusal, text);
  const auto amount = convertOrNothing(kAmountRefusal, [&] { return textToDouble(text); });
  if (!amount || *amount < -kAmountLimit || *amount > kAmountLimit) {
    refuse(kAmountRefusal, text);
  }
  const size_t point = text.find(u'.');
  if (point != Text::npos && (text.size() - point - 1 > kAmountDecimals ||
                              !integerPartWithin(text, kAmountIntegerDigits) ||
                              text.find(u'.', point + 1) != Text::npos)) {
    refuse(kAmountRefusal, text);
  }
  return formatFixed(*amount, 2);
}

Text CheckDATETYPE(const Text& value) {
  if (value.empty()) return {};
  // The year is only converted (13 when it is not numeric); any year passes.
  static_cast<void>(textToDouble(mid(value, 1, 4)));
  if (mid(value, 5, 1) != u"-") refuse(kDateRefusal, value);
  const TextView monthText = mid(value, 6, 2);
  const double month = textToDouble(monthText);
  if (month < 1 || month > 12) refuse(kDateRefusal, value);
  if (mid(value, 8, 1) != u"-") refuse(kDateRefusal, value);
  const double day = textToDouble(mid(value, 9, 2));
  // No leap-year rule: February allows the 29th in every year, as hosts have always had it.
  const double lastDay = monthText == u"02" ? 29 : 31;
  if (day < 1 || day > lastDay) refuse(kDateRefusal, value);
  return Text(mid(value, 1, 10));
}

Text CheckDATETIMETYPE(Text value) { return value; }

Text CheckINTTYPE(const Text& value, const int32_t& mode, const int32_t& upper,
                  const int32_t& lower) {
  if (value.empty()) return {};
  const int32_t number = textToLong(value);
  const bool refused = (mode == kIntLengthMode && static_cast<int64_t>(value.size()) > upper) ||
                       (mode == kIntRangeMode && (number < lower || number > upper));
  if (refused) refuse(kIntRefusal, value);
  // Digits without a leading zero are the number's own text.
  const bool digits =
      std::all_of(value.begin(), value.end(), [](char16_t c) { return c >= u'0' && c <= u'9'; });
  if (digits && (value.size() == 1 || value[0] != u'0')) return value;
  return asciiText(std::to_string(number));
}

Text CheckPRICETYPE(const Text& value) {
  if (value.empty()) return {};
  // Plain digits with at most four decimals are their Currency exactly.
  if (isPlainFixed(value, 4) && plainIntegerDigits(value) <= kPriceIntegerDigits) {
    return formatFixed(value, 5);
  }
  const Text text = currencyToText(textToCurrency(value));
  if (!integerPartWithin(text, kPriceIntegerDigits)) refuse(kPriceRefusal, value);
  return formatFixed(text, 5);
}

Text CheckQUANTYPE(const Text& value) {
  if (value.empty()) return {};
  // Plain digits within the integer digits (and so within the limit) are read as they stand.
  if (isPlainFixed(value, 5) && plainIntegerDigits(value) <= kQuantityIntegerDigits) {
    return formatFixed(value, 5);
  }
  const auto quantity = convertOrNothing(kQuantityRefusal, [&] { return textToDouble(value); });
  if (!quantity || *quantity < -kQuantityLimit || *quantity > kQuantityLimit ||
      !integerPartWithin(doubleToText(*quantity), kQuantityIntegerDigits)) {
    refuse(kQuantityRefusal, value);
  }
  return formatFixed(*quantity, 5);
}

Text CheckSTRTYPE(Text value, const int16_t& maxLen, const bool& truncate) {
  if (value.empty()) return {};
  if (maxLen >= 1 && value.size() > static_cast<size_t>(maxLen)) {
    if (!truncate) refuse(kStringRefusal, value);
    value.resize(static_cast<size_t>(maxLen));
    return value;
  }
  return value;
}

Text CheckIDTYPE(Text value) {
  bool truncate = false;
  return CheckSTRTYPE(std::move(value), 0, truncate);
}

Text CheckPERCENTTYPE(const Text& value) {
  if (value.empty()) return {};
  return doubleToText(textToDouble(value));
}

}  // namespace droqbxml::basValidations

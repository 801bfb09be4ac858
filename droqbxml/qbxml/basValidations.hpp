// basValidations: one check per qbXML value type and per closed list of values. Record
// setters pass every value through its check before storing it, so a record holds only
// values QuickBooks accepts, in the spelling the check returns.
#ifndef DROQBXML_QBXML_BASVALIDATIONS_HPP_
#define DROQBXML_QBXML_BASVALIDATIONS_HPP_

#include <cstdint>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml::basValidations {

// Common to every check: the empty text passes and gives "". A refused value raises the
// check's ERROR_NUMBER through the shared error object, with source
// "DroQbXml.basValidations.<check>" and the one refusal message of the module (built in
// the .cpp from the value and the check's type words), where the value is the text the
// check received. Conversion failures of the runtime (13 type
// mismatch, 6 overflow) reach the caller unchanged unless a check says otherwise.

// "Hourly" or "Salary", matched in any ASCII case and without trimming; TYPE_WAGE.
Text CheckWageType(const Text& value);

// "Pending", "Awarded", "InProgress", "Closed", "NotAwarded" or "None", matched in any
// ASCII case and without trimming; JOB_STATUS.
Text CheckJobStatus(const Text& value);

// One of the sixteen account types in QuickBooks' spelling ("Bank", "CostOfGoodsSold",
// ..., "Non-posting"), matched in any ASCII case and without trimming; TYPE_ACCOUNT.
Text CheckAccountType(const Text& value);

// An amount within -99999999.99 .. 99999999.99 written with the pattern "#.00" (".50"
// for 0.5). TYPE_AMOUNT, whose message shows the "#.00" text rather than the value given;
// non-numeric text is refused the same way. Any other conversion failure (an overflow) is
// stored in the shared error object under this check's source and raised from there.
Text CheckAMTTYPE(const Text& value);

// "1" or "TRUE" give "true", "0" or "FALSE" give "false" (any ASCII case, no trimming);
// TYPE_BOOL.
Text CheckBOOLTYPE(const Text& value);

// A "yyyy-mm-dd" date, tested in order: a numeric year (any value), "-", a numeric month
// 1 to 12, "-", a numeric day 1 to 31 (1 to 29 when the month is written "02", in every
// year). Gives the first ten characters, so a date-time is cut to its date. A year, month
// or day that is not numeric is the runtime's 13; any other failed test is TYPE_DATE.
Text CheckDATETYPE(const Text& value);

// Accepts every value unchanged.
Text CheckDATETIMETYPE(Text value);

// A 32-bit integer in decimal ("007" gives "7"); text that does not convert is the
// runtime's 13, or 6 beyond the 32-bit range. Mode 1 refuses a value text longer than
// `upper` characters, mode 2 a number outside `lower` .. `upper`; other modes check nothing
// more. TYPE_INT.
Text CheckINTTYPE(const Text& value, const int32_t& mode, const int32_t& upper,
                  const int32_t& lower);

// A price: converted to currency (four decimals kept, half to even; 13 for non-numeric
// text, 6 beyond the currency range), at most 10 digits before the decimal point, a
// leading sign not counted, so within +-9999999999.9999. Written with five decimals, as
// "#.00000" writes them ("12.5" gives "12.50000"). TYPE_PRICE.
Text CheckPRICETYPE(const Text& value);

// A quantity within -9999999.99999 .. 9999999.99999, at most 7 digits before the decimal
// point, written with the pattern "#.00000". Non-numeric text is refused (TYPE_QUNANTITY);
// any other conversion failure (an overflow) is stored in the shared error object under
// this check's source and raised from there.
Text CheckQUANTYPE(const Text& value);

// A text of at most `maxLen` characters (no limit when maxLen < 1). A longer value is cut
// to maxLen characters when `truncate` is true and refused (TYPE_STRING) when it is false.
Text CheckSTRTYPE(Text value, const int16_t& maxLen, const bool& truncate);

// Accepts every value unchanged (a text without length limit).
Text CheckIDTYPE(Text value);

// The number re-written in its shortest decimal form ("7.50" gives "7.5"); the runtime's
// 13 for non-numeric text, 6 beyond the range of a double.
Text CheckPERCENTTYPE(const Text& value);

}  // namespace droqbxml::basValidations

#endif  // DROQBXML_QBXML_BASVALIDATIONS_HPP_

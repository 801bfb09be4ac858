// DroAccount: one QuickBooks chart-of-accounts entry. The host fills it for an
// "AccountAddRq" (DroXmlBuilder::BuildAddAccount); ParseRs fills it from an "AccountRet";
// PrintOut dumps it. The length limits are the host's own, tighter than QuickBooks' (a
// description of 29, cut rather than refused; an account number of 7).
#ifndef DROQBXML_RECORDS_DROACCOUNT_HPP_
#define DROQBXML_RECORDS_DROACCOUNT_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

class DroAccount final : public ListRecordOf<DroAccount> {
 public:
  static constexpr std::array<FieldSpec, 19> kFields{{
      {u"ListID", Trim::Spaces, Check::Id},
      {u"TimeCreated", Trim::None, Check::DateTime},
      {u"TimeModified", Trim::None, Check::DateTime},
      listfields::kEditSequence,
      {u"Name", Trim::None, Check::Str, 31},
      listfields::kFullName,
      listfields::kIsActive,
      {u"Sublevel", Trim::None, Check::IntRange, 4},
      {u"AccountType", Trim::Spaces, Check::AccountType},
      {u"DetailAccountType", Trim::Spaces, Check::None},
      {u"AccountNumber", Trim::Spaces, Check::Str, 7},
      {u"LastCheckNumber", Trim::Spaces, Check::Str, 0},
      {u"BankNumber", Trim::Spaces, Check::Str, 25},
      // Cut to 29 characters without an error: the one field that is not refused.
      {u"Desc", Trim::None, Check::StrCut, 29},
      {u"Balance", Trim::Spaces, Check::Amt},
      {u"TotalBalance", Trim::Spaces, Check::Amt},
      {u"OpenBalance", Trim::Spaces, Check::Amt},
      {u"OpenBalanceDate", Trim::Spaces, Check::Date},
      listfields::kRequestID,
  }};

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // The parent account, created with the record and replaceable.
  const ObjectProperty<DroParentRef>& ParentRef() const { return parentRef_.held(); }
  void ParentRef(Ref<DroParentRef> v) { parentRef_ = std::move(v); }

  const Text& AccountType() const { return field<u"AccountType">(); }
  void AccountType(const Text& v) { setField<u"AccountType">(v); }
  const Text& DetailAccountType() const { return field<u"DetailAccountType">(); }
  void DetailAccountType(const Text& v) { setField<u"DetailAccountType">(v); }
  const Text& AccountNumber() const { return field<u"AccountNumber">(); }
  void AccountNumber(const Text& v) { setField<u"AccountNumber">(v); }
  const Text& LastCheckNumber() const { return field<u"LastCheckNumber">(); }
  void LastCheckNumber(const Text& v) { setField<u"LastCheckNumber">(v); }
  const Text& BankNumber() const { return field<u"BankNumber">(); }
  void BankNumber(const Text& v) { setField<u"BankNumber">(v); }
  const Text& Desc() const { return field<u"Desc">(); }
  void Desc(const Text& v) { setField<u"Desc">(v); }
  const Text& Balance() const { return field<u"Balance">(); }
  void Balance(const Text& v) { setField<u"Balance">(v); }
  const Text& TotalBalance() const { return field<u"TotalBalance">(); }
  void TotalBalance(const Text& v) { setField<u"TotalBalance">(v); }
  const Text& OpenBalance() const { return field<u"OpenBalance">(); }
  void OpenBalance(const Text& v) { setField<u"OpenBalance">(v); }
  const Text& OpenBalanceDate() const { return field<u"OpenBalanceDate">(); }
  void OpenBalanceDate(const Text& v) { setField<u"OpenBalanceDate">(v); }

  // From StartPoint (raised to 1): 0 without "<AccountRet>"; the start without
  // "requestID="; the closing quote of another request's identifier (when RequestID is not
  // ""); otherwise reads the account and returns the start. BankNumber is never read.
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, int32_t StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  // Opens with "False" and never writes "ACCOUNT:" (see the .cpp).
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroParentRef> parentRef_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROACCOUNT_HPP_

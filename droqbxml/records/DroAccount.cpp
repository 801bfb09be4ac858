// The account record: reading an "AccountRet" and its dump.
#include "droqbxml/records/DroAccount.hpp"

namespace droqbxml {

const ClassInfo& DroAccount::typeInfo() {
  using C = DroAccount;
  static const ClassInfo info = [] {
    Members members;
    members.property(u"ParentRef", &C::ParentRef, &C::ParentRef);
    addFieldMembers(members, kFields);
    members.method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroAccount", members.take());
  }();
  return info;
}

int32_t DroAccount::ParseRs(const Text& Value, int32_t StartPoint) {
  return parseList(Value, StartPoint, u"<AccountRet>", [&](Reader& read, int32_t& s, int32_t& e) {
    readHeader(read);
    read.required<u"IsActive">();
    parentRef_.ParseRs(u"ParentRef", Value, s, e);
    read.required<u"Sublevel">();
    read.optional<u"AccountType", u"DetailAccountType", u"AccountNumber", u"LastCheckNumber",
                  u"Desc", u"Balance", u"TotalBalance", u"OpenBalance", u"OpenBalanceDate">();
  });
}

Text DroAccount::PrintOut() const {
  // The dump starts as the outcome of comparing the empty dump with "ACCOUNT:", written as
  // text; hosts have always received "False" where the heading would be.
  DumpWriter dump(u"False");
  dump.fields<u"RequestID", u"ListID", u"TimeCreated", u"TimeModified", u"EditSequence", u"Name",
              u"FullName">(*this);
  dump.block(u"PARENTREF:", parentRef_->PrintOut(), u"/PARENTREF");
  dump.fields<u"IsActive", u"Sublevel", u"AccountType", u"DetailAccountType", u"AccountNumber",
              u"LastCheckNumber", u"BankNumber", u"Desc", u"Balance", u"TotalBalance",
              u"OpenBalance", u"OpenBalanceDate">(*this);
  return dump.take();
}

}  // namespace droqbxml

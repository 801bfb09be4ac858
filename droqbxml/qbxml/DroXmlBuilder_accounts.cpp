// DroXmlBuilder, accounts: the account add request.
#include "droqbxml/qbxml/DroXmlBuilder.hpp"

#include "droqbxml/qbxml/internal/RequestWriting.hpp"
#include "droqbxml/records/DroAccount.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {

void DroXmlBuilder::BuildAddAccount(const Ref<DroAccount>& Account) {
  using namespace internal;
  if (!Account) raiseRuntimeError(RuntimeError::kObjectNotSet);
  DroAccount& account = *Account;
  openAddRequest(*this, u"AccountAddRq", [&](const Text& id) {
    account.RequestID(id);
    return account.RequestID();
  });
  AddAggregateBegin(CreateElement(u"AccountAdd"));
  writeElement(*this, u"Name", account.Name());  // always, even when empty
  writeElementIfSet(*this, u"IsActive", account.IsActive());
  writeReferenceIfSet(*this, u"ParentRef", *account.ParentRef());
  writeElement(*this, u"AccountType", account.AccountType());  // always, even when empty
  writeElementIfSet(*this, u"DetailAccountType", account.DetailAccountType());
  writeElementIfSet(*this, u"AccountNumber", account.AccountNumber());
  writeElementIfSet(*this, u"BankNumber", account.BankNumber());
  writeElementIfSet(*this, u"Desc", account.Desc());
  AddAggregateEnd();
  AddAggregateEnd();
  AddFooters();
}

}  // namespace droqbxml

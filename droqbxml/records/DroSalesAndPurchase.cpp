// The sales-and-purchase companion record.
#include "droqbxml/records/DroSalesAndPurchase.hpp"

#include "droqbxml/records/basCommonProcs.hpp"

namespace droqbxml {

const ClassInfo& DroSalesAndPurchase::typeInfo() {
  using C = DroSalesAndPurchase;
  static const ClassInfo info = [] {
    Members members;
    addFieldMembers(members, kFields);
    members.property(u"IncomeAccountRef", &C::IncomeAccountRef, &C::IncomeAccountRef)
        .property(u"ExpenseAccountRef", &C::ExpenseAccountRef, &C::ExpenseAccountRef)
        .property(u"PrefVendorRef", &C::PrefVendorRef, &C::PrefVendorRef)
        .getter(u"IsEmpty", &C::IsEmpty)
        .method(u"ParseRs", &C::ParseRs)
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroSalesAndPurchase", members.take());
  }();
  return info;
}

bool DroSalesAndPurchase::IsEmpty() const {
  return SalesDesc().empty() && SalesPrice().empty() && PurchaseDesc().empty() &&
         PurchaseCost().empty() && incomeAccountRef_->IsEmpty() && expenseAccountRef_->IsEmpty() &&
         prefVendorRef_->IsEmpty();
}

void DroSalesAndPurchase::ParseRs(const Text&, const Text& Value, int32_t& StartPoint,
                                  int32_t& EndPoint, const Text& Parent) {
  StartPoint = basCommonProcs::findInResponse(EndPoint, Value, u"<SalesAndPurchase>");
  if (StartPoint == 0) return;
  const Text path = Parent + u"<SalesAndPurchase>";
  FieldReader<DroSalesAndPurchase> read(*this, Value, StartPoint, EndPoint, path);
  read.optional<u"SalesDesc", u"SalesPrice">();
  incomeAccountRef_.ParseRs(u"IncomeAccountRef", Value, StartPoint, EndPoint, true, path);
  read.optional<u"PurchaseDesc", u"PurchaseCost">();
  expenseAccountRef_.ParseRs(u"ExpenseAccountRef", Value, StartPoint, EndPoint, true, path);
  prefVendorRef_.ParseRs(u"PrefVendorRef", Value, StartPoint, EndPoint);
}

Text DroSalesAndPurchase::PrintOut() const {
  DumpWriter dump(u"SALES AND PURCHASE:");
  dump.untabbed(u"SalesDesc", SalesDesc());
  dump.fields<u"SalesPrice">(*this);
  dump.block(u"INCOMEACCOUNTREF:", incomeAccountRef_->PrintOut(), u"/INCOMEACCOUNTREF");
  dump.fields<u"PurchaseDesc", u"PurchaseCost">(*this);
  dump.block(u"EXPENSEACCOUNTREF:", expenseAccountRef_->PrintOut(), u"/EXPENSEACCOUNTREF");
  dump.block(u"PREFVENDORREF:", prefVendorRef_->PrintOut(), u"/PREFVENDORREF");
  return dump.take();
}

}  // namespace droqbxml

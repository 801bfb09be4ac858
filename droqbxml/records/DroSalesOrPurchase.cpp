// The sales-or-purchase companion record.
#include "droqbxml/records/DroSalesOrPurchase.hpp"

#include "droqbxml/records/basCommonProcs.hpp"

namespace droqbxml {

const ClassInfo& DroSalesOrPurchase::typeInfo() {
  using C = DroSalesOrPurchase;
  static const ClassInfo info = [] {
    Members members;
    addFieldMembers(members, kFields);
    members.property(u"AccountRef", &C::AccountRef, &C::AccountRef)
        .getter(u"IsEmpty", &C::IsEmpty)
        .method(u"ParseRs", &C::ParseRs)
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroSalesOrPurchase", members.take());
  }();
  return info;
}

bool DroSalesOrPurchase::IsEmpty() const {
  return Desc().empty() && Price().empty() && PricePercent().empty() && accountRef_->IsEmpty();
}

void DroSalesOrPurchase::ParseRs(const Text&, const Text& Value, int32_t& StartPoint,
                                 int32_t& EndPoint, const Text& Parent) {
  StartPoint = basCommonProcs::findInResponse(EndPoint, Value, u"<SalesOrPurchase>");
  if (StartPoint == 0) return;
  const Text path = Parent + u"<SalesOrPurchase>";
  FieldReader<DroSalesOrPurchase> read(*this, Value, StartPoint, EndPoint, path);
  read.optional<u"Desc", u"Price">();
  // Reached only when the price search leaves StartPoint at 0, which a cursor of 1 or more
  // never does: a response's percentage is not read. "PricePrecent" is spelt as it always
  // was.
  if (StartPoint == 0) {
    PricePercent(
        basCommonProcs::getElementValue(Value, u"PricePrecent", StartPoint, EndPoint, true, path));
  }
  accountRef_.ParseRs(u"AccountRef", Value, StartPoint, EndPoint, true, path);
}

Text DroSalesOrPurchase::PrintOut() const {
  DumpWriter dump(u"SALES OR PURCHASE:");
  dump.untabbed(u"Desc", Desc());
  dump.fields<u"Price", u"PricePercent">(*this);
  dump.block(u"ACCOUNTREF:", accountRef_->PrintOut(), u"/ACCOUNTREF");
  return dump.take();
}

}  // namespace droqbxml

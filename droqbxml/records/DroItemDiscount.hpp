// DroItemDiscount: a discount item, by amount or by percentage, with its account.
#ifndef DROQBXML_RECORDS_DROITEMDISCOUNT_HPP_
#define DROQBXML_RECORDS_DROITEMDISCOUNT_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

class DroItemDiscount final : public ItemRecordOf<DroItemDiscount> {
 public:
  static constexpr auto kFields =
      listfields::joined(listfields::kLongHeader, listfields::kItemDesc,
                         listfields::named(listfields::kPrice, u"DiscountRate"),
                         FieldSpec{u"DiscountRatePercent", Trim::Spaces, Check::Percent});

  DroItemDiscount() : ItemRecordOf(udItemDiscount) {}
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const Text& DiscountRate() const { return field<u"DiscountRate">(); }
  void DiscountRate(const Text& v) { setField<u"DiscountRate">(v); }
  const Text& DiscountRatePercent() const { return field<u"DiscountRatePercent">(); }
  void DiscountRatePercent(const Text& v) { setField<u"DiscountRatePercent">(v); }
  const ObjectProperty<DroParentRef>& ParentRef() const { return parentRef_.held(); }
  void ParentRef(Ref<DroParentRef> v) { parentRef_ = std::move(v); }
  const ObjectProperty<DroSalesTaxCodeRef>& SalesTaxCodeRef() const {
    return salesTaxCodeRef_.held();
  }
  void SalesTaxCodeRef(Ref<DroSalesTaxCodeRef> v) { salesTaxCodeRef_ = std::move(v); }
  const ObjectProperty<DroAccountRef>& AccountRef() const { return accountRef_.held(); }
  void AccountRef(Ref<DroAccountRef> v) { accountRef_ = std::move(v); }

  // As DroAccount::ParseRs, for "<ItemDiscountRet>" (StartPoint by reference, unchanged).
  int32_t ParseRs(const Text& Value, const int32_t& StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, const int32_t& StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroParentRef> parentRef_;
  mutable ObjectProperty<DroSalesTaxCodeRef> salesTaxCodeRef_;
  mutable ObjectProperty<DroAccountRef> accountRef_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMDISCOUNT_HPP_

// DroSalesAndPurchase: the companion record of the item kinds that are both sold and bought:
// separate sales and purchase sides and the preferred vendor. Its IsEmpty is worked out
// from the current values each time it is read.
#ifndef DROQBXML_RECORDS_DROSALESANDPURCHASE_HPP_
#define DROQBXML_RECORDS_DROSALESANDPURCHASE_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

class DroSalesAndPurchase final : public RecordOf<DroSalesAndPurchase> {
 public:
  static constexpr std::array<FieldSpec, 4> kFields{{
      listfields::named(listfields::kDescription, u"SalesDesc"),
      listfields::named(listfields::kPrice, u"SalesPrice"),
      listfields::named(listfields::kDescription, u"PurchaseDesc"),
      listfields::named(listfields::kPrice, u"PurchaseCost"),
  }};

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const Text& SalesDesc() const { return field<u"SalesDesc">(); }
  void SalesDesc(const Text& v) { setField<u"SalesDesc">(v); }
  const Text& SalesPrice() const { return field<u"SalesPrice">(); }
  void SalesPrice(const Text& v) { setField<u"SalesPrice">(v); }
  const Text& PurchaseDesc() const { return field<u"PurchaseDesc">(); }
  void PurchaseDesc(const Text& v) { setField<u"PurchaseDesc">(v); }
  const Text& PurchaseCost() const { return field<u"PurchaseCost">(); }
  void PurchaseCost(const Text& v) { setField<u"PurchaseCost">(v); }
  const ObjectProperty<DroIncomeAccountRef>& IncomeAccountRef() const {
    return incomeAccountRef_.held();
  }
  void IncomeAccountRef(Ref<DroIncomeAccountRef> v) { incomeAccountRef_ = std::move(v); }
  const ObjectProperty<DroExpenseAccountRef>& ExpenseAccountRef() const {
    return expenseAccountRef_.held();
  }
  void ExpenseAccountRef(Ref<DroExpenseAccountRef> v) { expenseAccountRef_ = std::move(v); }
  const ObjectProperty<DroPrefVendorRef>& PrefVendorRef() const { return prefVendorRef_.held(); }
  void PrefVendorRef(Ref<DroPrefVendorRef> v) { prefVendorRef_ = std::move(v); }

  // True when the four texts are "" and the three references are empty.
  bool IsEmpty() const;
  // StartPoint := the first "<SalesAndPurchase>" at or after the cursor; when found, reads
  // both sides and the preferred vendor. RefName is accepted and not used.
  void ParseRs(const Text& RefName, const Text& Value, int32_t& StartPoint, int32_t& EndPoint,
               const Text& Parent = u"");
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroIncomeAccountRef> incomeAccountRef_;
  mutable ObjectProperty<DroExpenseAccountRef> expenseAccountRef_;
  mutable ObjectProperty<DroPrefVendorRef> prefVendorRef_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROSALESANDPURCHASE_HPP_

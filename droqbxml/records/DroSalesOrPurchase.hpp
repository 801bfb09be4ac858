// DroSalesOrPurchase: the companion record of the item kinds that are either sold or
// bought: one description, price and account. Its IsEmpty is worked out from the current
// values each time it is read.
#ifndef DROQBXML_RECORDS_DROSALESORPURCHASE_HPP_
#define DROQBXML_RECORDS_DROSALESORPURCHASE_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

class DroSalesOrPurchase final : public RecordOf<DroSalesOrPurchase> {
 public:
  static constexpr std::array<FieldSpec, 3> kFields{{
      listfields::named(listfields::kDescription, u"Desc"),
      {u"Price", Trim::None, Check::Price},
      {u"PricePercent", Trim::None, Check::Percent},
  }};

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const Text& Desc() const { return field<u"Desc">(); }
  void Desc(const Text& v) { setField<u"Desc">(v); }
  const Text& Price() const { return field<u"Price">(); }
  void Price(const Text& v) { setField<u"Price">(v); }
  const Text& PricePercent() const { return field<u"PricePercent">(); }
  void PricePercent(const Text& v) { setField<u"PricePercent">(v); }
  const ObjectProperty<DroAccountRef>& AccountRef() const { return accountRef_.held(); }
  void AccountRef(Ref<DroAccountRef> v) { accountRef_ = std::move(v); }

  // True when the three texts are "" and the account reference is empty.
  bool IsEmpty() const;
  // StartPoint := the first "<SalesOrPurchase>" at or after the cursor EndPoint (0 when
  // none, and nothing more happens); then "Desc", "Price" and the account reference.
  // RefName is accepted and not used.
  void ParseRs(const Text& RefName, const Text& Value, int32_t& StartPoint, int32_t& EndPoint,
               const Text& Parent = u"");
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroAccountRef> accountRef_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROSALESORPURCHASE_HPP_

// DroItemSalesTax: a sales tax item: its rate and the agency it is paid to.
#ifndef DROQBXML_RECORDS_DROITEMSALESTAX_HPP_
#define DROQBXML_RECORDS_DROITEMSALESTAX_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

class DroItemSalesTax final : public ItemRecordOf<DroItemSalesTax> {
 public:
  static constexpr auto kFields =
      listfields::joined(listfields::kShortHeader, listfields::kItemDesc,
                         FieldSpec{u"TaxRate", Trim::Spaces, Check::Percent});

  DroItemSalesTax() : ItemRecordOf(udItemSalesTax) {}
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const Text& TaxRate() const { return field<u"TaxRate">(); }
  void TaxRate(const Text& v) { setField<u"TaxRate">(v); }
  const ObjectProperty<DroVendorRef>& TaxVendorRef() const { return taxVendorRef_.held(); }
  void TaxVendorRef(Ref<DroVendorRef> v) { taxVendorRef_ = std::move(v); }

  // As DroAccount::ParseRs, for "<ItemSalesTaxRet>".
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, int32_t StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  Text PrintOut() const;

 private:
  mutable ObjectProperty<DroVendorRef> taxVendorRef_;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMSALESTAX_HPP_

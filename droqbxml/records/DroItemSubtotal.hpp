// DroItemSubtotal: a subtotal line item (a name and a description).
#ifndef DROQBXML_RECORDS_DROITEMSUBTOTAL_HPP_
#define DROQBXML_RECORDS_DROITEMSUBTOTAL_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

class DroItemSubtotal final : public ItemRecordOf<DroItemSubtotal> {
 public:
  static constexpr auto kFields = listfields::kShortItemFields;

  DroItemSubtotal() : ItemRecordOf(udItemSubtotal) {}
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // As DroAccount::ParseRs, for "<ItemSubtotalRet>".
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, int32_t StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  Text PrintOut() const;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMSUBTOTAL_HPP_

// DroItemPayrollItemWage: a payroll wage item, hourly or salary. Read from responses; the
// component builds no add request for it.
#ifndef DROQBXML_RECORDS_DROITEMPAYROLLITEMWAGE_HPP_
#define DROQBXML_RECORDS_DROITEMPAYROLLITEMWAGE_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/ListRecord.hpp"

namespace droqbxml {

class DroItemPayrollItemWage final : public ItemRecordOf<DroItemPayrollItemWage> {
 public:
  static constexpr auto kFields = listfields::joined(
      listfields::kShortHeader, FieldSpec{u"WageType", Trim::Spaces, Check::WageType});

  DroItemPayrollItemWage() : ItemRecordOf(udItemPayrollItemWage) {}
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const Text& WageType() const { return field<u"WageType">(); }
  void WageType(const Text& v) { setField<u"WageType">(v); }

  // As DroAccount::ParseRs, for "<PayrollItemWageRet>".
  int32_t ParseRs(const Text& Value, int32_t StartPoint = 0);
  // The same read of the response's text, its searches answered from the response's index.
  int32_t ParseRs(const IndexedResponse& Value, int32_t StartPoint = 0) {
    return Value.read([&](const Text& text) { return ParseRs(text, StartPoint); });
  }
  Text PrintOut() const;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROITEMPAYROLLITEMWAGE_HPP_

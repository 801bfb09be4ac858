// The payroll wage item.
#include "droqbxml/records/DroItemPayrollItemWage.hpp"

namespace droqbxml {

const ClassInfo& DroItemPayrollItemWage::typeInfo() {
  using C = DroItemPayrollItemWage;
  static const ClassInfo info = [] {
    Members members = itemMembers();
    members.method(u"ParseRs", textParseRs(&C::ParseRs))
        .optional(1)
        .getter(u"PrintOut", &C::PrintOut);
    return ClassInfo(u"DroItemPayrollItemWage", members.take());
  }();
  return info;
}

int32_t DroItemPayrollItemWage::ParseRs(const Text& Value, int32_t StartPoint) {
  return parseList(Value, StartPoint, u"<PayrollItemWageRet>",
                   [](Reader& read, int32_t&, int32_t&) {
                     readHeader(read);
                     read.required<u"IsActive">();
                     read.optional<u"WageType">();
                   });
}

Text DroItemPayrollItemWage::PrintOut() const {
  DumpWriter dump = dumpHeader(u"PAYROLL ITEM WAGE:", false);
  dump.fields<u"IsActive", u"WageType">(*this);
  return dump.take();
}

}  // namespace droqbxml

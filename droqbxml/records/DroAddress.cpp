// The address record.
#include "droqbxml/records/DroAddress.hpp"

#include "droqbxml/records/basCommonProcs.hpp"
#include "droqbxml/records/internal/TextSearch.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {

const ClassInfo& DroAddress::typeInfo() {
  static const ClassInfo info = [] {
    Members members;
    members.getter(u"IsEmpty", &DroAddress::IsEmpty);
    addFieldMembers(members, kFields);
    members.method(u"CopyAddress", &DroAddress::CopyAddress)
        .method(u"ParseRs", &DroAddress::ParseRs)
        .getter(u"PrintOut", &DroAddress::PrintOut);
    return ClassInfo(u"DroAddress", members.take());
  }();
  return info;
}

void DroAddress::fieldStored(size_t index) {
  // Only an empty value recomputes the flag (deliberate, see the class comment).
  if (!fieldValue(index).empty()) return;
  hasData_ = false;
  for (size_t i = 0; i < kFields.size(); ++i) hasData_ = hasData_ || !fieldValue(i).empty();
}

void DroAddress::CopyAddress(const Ref<DroAddress>& oAddress) {
  if (!oAddress) raiseRuntimeError(RuntimeError::kObjectNotSet);
  Addr1(oAddress->Addr1());
  Addr2(oAddress->Addr2());
  Addr3(oAddress->Addr3());
  City(oAddress->City());
  Country(oAddress->Country());
  PostalCode(oAddress->PostalCode());
  State(oAddress->State());
}

bool DroAddress::parsesNothing(TextView AddressName, const Text& Value, int32_t& StartPoint,
                               const int32_t& EndPoint) {
  const int32_t from = StartPoint != 0 ? StartPoint : EndPoint == 0 ? 1 : EndPoint;
  const bool lacks = from >= 1 && internal::SearchScope::lacksStartTag(Value, AddressName);
  if (!lacks && basCommonProcs::findInResponse(from, Value, startTagOf(AddressName)) != 0) {
    return false;
  }
  StartPoint = 0;
  return true;
}

void DroAddress::ParseRs(TextView AddressName, const Text& Value, int32_t& StartPoint,
                         int32_t& EndPoint) {
  if (StartPoint == 0) StartPoint = EndPoint == 0 ? 1 : EndPoint;
  StartPoint = basCommonProcs::findInResponse(StartPoint, Value, startTagOf(AddressName));
  if (StartPoint == 0) return;
  FieldReader<DroAddress>(*this, Value, StartPoint, EndPoint)
      .optional<u"Addr1", u"Addr2", u"Addr3", u"City", u"State", u"PostalCode", u"Country">();
  if (StartPoint == 0) StartPoint = EndPoint;
}

Text DroAddress::PrintOut() const {
  DumpWriter dump(u"ADDRESS:");
  dump.fields<u"Addr1", u"Addr2", u"Addr3", u"City", u"State", u"PostalCode", u"Country">(*this);
  return dump.take();
}

}  // namespace droqbxml

// The generic reference record.
#include "droqbxml/records/DroObjRef.hpp"

#include "droqbxml/records/basCommonProcs.hpp"
#include "droqbxml/records/internal/TextSearch.hpp"

namespace droqbxml {

const ClassInfo& DroObjRef::typeInfo() {
  static const ClassInfo info = [] {
    Members members;
    members.getter(u"IsEmpty", &DroObjRef::IsEmpty);
    addFieldMembers(members, kFields);
    members.method(u"ParseRs", &DroObjRef::ParseRs)
        .optional(2)
        .getter(u"PrintOut", &DroObjRef::PrintOut);
    return ClassInfo(u"DroObjRef", members.take());
  }();
  return info;
}

void DroObjRef::fieldStored(size_t) { hasData_ = !ListID().empty() || !FullName().empty(); }

void DroObjRef::ParseRs(TextView RefName, const Text& Value, int32_t& StartPoint, int32_t& EndPoint,
                        bool Required, TextView Parent) {
  const TextView tag = startTagOf(RefName);
  if (basCommonProcs::findInResponse(EndPoint, Value, tag) == 0) return;
  FieldReader<DroObjRef> reader(*this, Value, StartPoint, EndPoint, Parent, tag);
  reader.read(index<u"ListID">(), Required);
  reader.read(index<u"FullName">(), Required);
}

bool DroObjRef::parsesNothing(TextView RefName, const Text& Value, const int32_t&,
                              const int32_t& EndPoint, bool, TextView) {
  if (EndPoint >= 1 && internal::SearchScope::lacksStartTag(Value, RefName)) return true;
  return basCommonProcs::findInResponse(EndPoint, Value, startTagOf(RefName)) == 0;
}

Text DroObjRef::PrintOut() const {
  DumpWriter dump(u"OBJECT REFERENCE");
  dump.fields<u"ListID", u"FullName">(*this);
  return dump.take();
}

}  // namespace droqbxml

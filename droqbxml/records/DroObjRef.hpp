// DroObjRef: a reference to a QuickBooks list entry (ListID and FullName), read from
// aggregates such as "CustomerRef" and written by the add builders when not IsEmpty.
#ifndef DROQBXML_RECORDS_DROOBJREF_HPP_
#define DROQBXML_RECORDS_DROOBJREF_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/Record.hpp"

namespace droqbxml {

class DroObjRef final : public RecordOf<DroObjRef> {
 public:
  static constexpr std::array<FieldSpec, 2> kFields{{
      {u"ListID", Trim::None, Check::Str, 0},
      {u"FullName", Trim::None, Check::Str, 0},
  }};

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // True until ListID or FullName holds a text; recomputed on every set.
  bool IsEmpty() const { return !hasData_; }
  const Text& ListID() const { return field<u"ListID">(); }
  void ListID(const Text& value) { setField<u"ListID">(value); }
  const Text& FullName() const { return field<u"FullName">(); }
  void FullName(const Text& value) { setField<u"FullName">(value); }

  // When "<RefName>" occurs at or after the cursor, reads "ListID" and then "FullName"
  // from the cursor (not from that tag; the end tag is never looked for, so a reference
  // without FullName takes the next one in the text). Otherwise nothing changes.
  void ParseRs(TextView RefName, const Text& Value, int32_t& StartPoint, int32_t& EndPoint,
               bool Required = false, TextView Parent = {});
  // Whether that ParseRs would find no "<RefName>" (and so change nothing).
  static bool parsesNothing(TextView RefName, const Text& Value, const int32_t& StartPoint,
                            const int32_t& EndPoint, bool Required = false, TextView Parent = {});
  Text PrintOut() const;

 private:
  void fieldStored(size_t index) override;

  bool hasData_ = false;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROOBJREF_HPP_

// DroAddress: one postal address as qbXML writes it in "BillAddress" and "ShipAddress".
// Its IsEmpty flag is recomputed only when a field is set to "": hosts rely on an address
// whose fields were all set to texts still reporting IsEmpty (and so not being written).
#ifndef DROQBXML_RECORDS_DROADDRESS_HPP_
#define DROQBXML_RECORDS_DROADDRESS_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/records/Record.hpp"

namespace droqbxml {

class DroAddress final : public RecordOf<DroAddress> {
 public:
  static constexpr std::array<FieldSpec, 7> kFields{{
      {u"Addr1", Trim::Spaces, Check::Str, 41, true},
      {u"Addr2", Trim::Spaces, Check::Str, 41, true},
      {u"Addr3", Trim::Spaces, Check::Str, 41, true},
      {u"City", Trim::Spaces, Check::Str, 31, true},
      {u"State", Trim::Spaces, Check::Str, 21, true},
      {u"PostalCode", Trim::Spaces, Check::Str, 13, true},
      {u"Country", Trim::Spaces, Check::Str, 31, true},
  }};

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  bool IsEmpty() const { return !hasData_; }
  const Text& Addr1() const { return field<u"Addr1">(); }
  void Addr1(const Text& v) { setField<u"Addr1">(v); }
  const Text& Addr2() const { return field<u"Addr2">(); }
  void Addr2(const Text& v) { setField<u"Addr2">(v); }
  const Text& Addr3() const { return field<u"Addr3">(); }
  void Addr3(const Text& v) { setField<u"Addr3">(v); }
  const Text& City() const { return field<u"City">(); }
  void City(const Text& v) { setField<u"City">(v); }
  const Text& State() const { return field<u"State">(); }
  void State(const Text& v) { setField<u"State">(v); }
  const Text& PostalCode() const { return field<u"PostalCode">(); }
  void PostalCode(const Text& v) { setField<u"PostalCode">(v); }
  const Text& Country() const { return field<u"Country">(); }
  void Country(const Text& v) { setField<u"Country">(v); }

  Text Addr1_XmlUnEscaped() const { return fieldUnescaped<u"Addr1">(); }
  Text Addr2_XmlUnEscaped() const { return fieldUnescaped<u"Addr2">(); }
  Text Addr3_XmlUnEscaped() const { return fieldUnescaped<u"Addr3">(); }
  Text City_XmlUnEscaped() const { return fieldUnescaped<u"City">(); }
  Text State_XmlUnEscaped() const { return fieldUnescaped<u"State">(); }
  Text PostalCode_XmlUnEscaped() const { return fieldUnescaped<u"PostalCode">(); }
  Text Country_XmlUnEscaped() const { return fieldUnescaped<u"Country">(); }

  // Copies the other address's stored fields through this address's setters, in the order
  // Addr1, Addr2, Addr3, City, Country, PostalCode, State. An empty reference is 91.
  void CopyAddress(const Ref<DroAddress>& oAddress);
  // Finds "<AddressName>" from StartPoint (0 is read as EndPoint, then 1); when present,
  // reads the seven fields from the cursor EndPoint. Absent: StartPoint becomes 0.
  void ParseRs(TextView AddressName, const Text& Value, int32_t& StartPoint, int32_t& EndPoint);
  // When that ParseRs would find no "<AddressName>": true, with StartPoint moved as it would
  // be. Otherwise false, and nothing moves.
  static bool parsesNothing(TextView AddressName, const Text& Value, int32_t& StartPoint,
                            const int32_t& EndPoint);
  Text PrintOut() const;

 private:
  void fieldStored(size_t index) override;

  bool hasData_ = false;
};

}  // namespace droqbxml

#endif  // DROQBXML_RECORDS_DROADDRESS_HPP_

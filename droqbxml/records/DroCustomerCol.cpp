// The customer collection and the customer-info exchange.
#include "droqbxml/records/DroCustomerCol.hpp"

#include <memory>

#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Enumerator.hpp"

namespace droqbxml {
namespace {

bool isPosition(const Variant& v) {
  switch (v.kind()) {
    case Variant::Kind::Integer:
    case Variant::Kind::Long:
    case Variant::Kind::Double:
    case Variant::Kind::Currency:
    case Variant::Kind::Boolean:
      return true;
    default:
      return false;
  }
}

}  // namespace

const ClassInfo& DroCustomerCol::typeInfo() {
  using C = DroCustomerCol;
  static const ClassInfo info(
      u"DroCustomerCol",
      Members()
          .method(u"Add", &C::Add)
          .method(u"Item", &C::Item)
          .getter(u"Count", &C::Count)
          .method(u"Remove", &C::Remove)
          .custom(u"NewEnum", MemberKind::Method,
                  [](Object& self, Arguments) {
                    return Variant(Enumerator::over(static_cast<const C&>(self).NewEnum()));
                  })
          .method(u"ParseCustInfoUnEscaped", &C::ParseCustInfoUnEscaped)
          .method(u"ParseCustInfo", &C::ParseCustInfo)
          .method(u"BuildCustInfoXML", &C::BuildCustInfoXML)
          .take());
  return info;
}

Ref<DroCustomer> DroCustomerCol::Add(const Text& skey, Ref<DroCustomer> oCustA) {
  if (!oCustA) oCustA = std::make_shared<DroCustomer>();
  if (skey.empty()) {
    items_.Add(oCustA);
  } else {
    items_.Add(oCustA, skey);
  }
  return oCustA;
}

Ref<DroCustomer> DroCustomerCol::Item(const Variant& vntIndexKey) const {
  if (isPosition(vntIndexKey)) return items_.Item(vntIndexKey.toLong());
  return items_.Item(vntIndexKey.toText());
}

void DroCustomerCol::Remove(const Variant& vntIndexKey) {
  if (isPosition(vntIndexKey)) {
    items_.Remove(vntIndexKey.toLong());
  } else {
    items_.Remove(vntIndexKey.toText());
  }
}

bool DroCustomerCol::ParseCustInfoUnEscaped(const Text& sValueA, int32_t lStartPoint) {
  return ParseCustInfo(XMLUnEscapeText(sValueA, false), lStartPoint);
}

bool DroCustomerCol::ParseCustInfo(const Text& sValueA, int32_t lStartPoint) {
  int32_t pos = lStartPoint < 1 ? 1 : lStartPoint;
  bool found = false;
  for (;;) {
    auto customer = std::make_shared<DroCustomer>();
    const int32_t next = customer->ParseCustInfo(sValueA, pos);
    pos = next;
    if (next == 0) break;
    try {
      Add(u"KEY" + customer->NonQbFileTitle_XmlUnEscaped(), customer);
    } catch (const ComError&) {
      // a second customer with the same file title is dropped without a word
    }
    found = true;
  }
  return found;
}

Text DroCustomerCol::BuildCustInfoXML() {
  DroXmlBuilder builder;
  builder.BuildRetCustomerInfo(*this);
  return builder.XML();
}

}  // namespace droqbxml

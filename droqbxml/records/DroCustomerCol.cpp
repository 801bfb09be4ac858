// The customer collection and the customer-info exchange.
#include "droqbxml/records/DroCustomerCol.hpp"

#include <memory>

#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {

const ClassInfo& DroCustomerCol::typeInfo() {
  using C = DroCustomerCol;
  static const ClassInfo info = [] {
    Members members = collectionMembers();
    members.method(u"ParseCustInfoUnEscaped", &C::ParseCustInfoUnEscaped)
        .optional(1)
        .method(u"ParseCustInfo", &C::ParseCustInfo)
        .optional(1)
        .method(u"BuildCustInfoXML", &C::BuildCustInfoXML);
    return ClassInfo(u"DroCustomerCol", members.take());
  }();
  return info;
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

// clsXmlStringEscaping: the host's handle on the component's escaper and unescaper, with
// the system's character codes (Windows-1252).
#ifndef DROQBXML_QBXML_CLSXMLSTRINGESCAPING_HPP_
#define DROQBXML_QBXML_CLSXMLSTRINGESCAPING_HPP_

#include "droqbxml/runtime/Object.hpp"
#include "droqbxml/runtime/Variant.hpp"

namespace droqbxml {

class clsXmlStringEscaping final : public Object {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // XMLEscapeText(sValueA, lMaxLenA): a limit of a non-integer kind gives "".
  Text XMLEscape(const Text& sValueA, const Variant& lMaxLenA = Variant::missing()) const;
  Text XMLUnEscape(const Text& sValueA) const;
};

}  // namespace droqbxml

#endif  // DROQBXML_QBXML_CLSXMLSTRINGESCAPING_HPP_

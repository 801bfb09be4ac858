// clsXmlStringEscaping over the shared escaping procedures.
#include "droqbxml/qbxml/clsXmlStringEscaping.hpp"

#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/runtime/Binding.hpp"

namespace droqbxml {

const ClassInfo& clsXmlStringEscaping::typeInfo() {
  static const ClassInfo info(u"clsXmlStringEscaping",
                              Members()
                                  .method(u"XMLEscape", &clsXmlStringEscaping::XMLEscape)
                                  .optional(1)
                                  .method(u"XMLUnEscape", &clsXmlStringEscaping::XMLUnEscape)
                                  .take());
  return info;
}

Text clsXmlStringEscaping::XMLEscape(const Text& sValueA, const Variant& lMaxLenA) const {
  return XMLEscapeText(sValueA, lMaxLenA, false);
}

Text clsXmlStringEscaping::XMLUnEscape(const Text& sValueA) const {
  return XMLUnEscapeText(sValueA, false);
}

}  // namespace droqbxml

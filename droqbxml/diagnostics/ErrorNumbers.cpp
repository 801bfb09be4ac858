// The late-bound table of clsErrorNumbers, derived from the one list of members.
#include "droqbxml/diagnostics/ErrorNumbers.hpp"

#include "droqbxml/runtime/Binding.hpp"

namespace droqbxml {

const ClassInfo& clsErrorNumbers::typeInfo() {
  static const ClassInfo info = [] {
    Members members;
    for (const auto& entry : kErrorNumberNames) {
      const int32_t value = entry.value;
      members.custom(entry.name, MemberKind::Get,
                     [value](Object&, Arguments) { return Variant(value); }, {ValueType::Long, {}});
    }
    return ClassInfo(u"clsErrorNumbers", members.take());
  }();
  return info;
}

}  // namespace droqbxml

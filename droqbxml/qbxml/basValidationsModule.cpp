// The member table of basValidationsModule, bound straight to the basValidations
// functions.
#include "droqbxml/qbxml/basValidationsModule.hpp"

#include <utility>

#include "droqbxml/qbxml/basValidations.hpp"
#include "droqbxml/runtime/Binding.hpp"

namespace droqbxml {
namespace {

// A free function as a method: arguments converted as for member functions.
template <class R, class... A>
void addFree(Members& members, const Text& name, R (*fn)(A...)) {
  members.custom(
      name, MemberKind::Method,
      [fn](Object&, Arguments args) {
        return binding::callWith<R, A...>([fn](auto&&... a) -> R { return fn(a...); }, args,
                                          std::index_sequence_for<A...>{});
      },
      binding::shapeOf<R, A...>());
}

}  // namespace

const ClassInfo& basValidationsModule::typeInfo() {
  namespace checks = basValidations;
  static const ClassInfo info = [] {
    Members members;
    addFree(members, u"CheckWageType", &checks::CheckWageType);
    addFree(members, u"CheckJobStatus", &checks::CheckJobStatus);
    addFree(members, u"CheckAccountType", &checks::CheckAccountType);
    addFree(members, u"CheckAMTTYPE", &checks::CheckAMTTYPE);
    addFree(members, u"CheckBOOLTYPE", &checks::CheckBOOLTYPE);
    addFree(members, u"CheckDATETYPE", &checks::CheckDATETYPE);
    addFree(members, u"CheckDATETIMETYPE", &checks::CheckDATETIMETYPE);
    addFree(members, u"CheckINTTYPE", &checks::CheckINTTYPE);
    addFree(members, u"CheckPRICETYPE", &checks::CheckPRICETYPE);
    addFree(members, u"CheckQUANTYPE", &checks::CheckQUANTYPE);
    addFree(members, u"CheckSTRTYPE", &checks::CheckSTRTYPE);
    addFree(members, u"CheckIDTYPE", &checks::CheckIDTYPE);
    addFree(members, u"CheckPERCENTTYPE", &checks::CheckPERCENTTYPE);
    return ClassInfo(u"basValidations", members.take());
  }();
  return info;
}

}  // namespace droqbxml

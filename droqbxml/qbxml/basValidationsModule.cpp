// The member table of basValidationsModule, bound straight to the basValidations
// functions.
#include "droqbxml/qbxml/basValidationsModule.hpp"

#include <utility>

#include "droqbxml/qbxml/basValidations.hpp"
#include "droqbxml/runtime/Binding.hpp"

namespace droqbxml {
namespace {

// A late-bound call of a free function: arguments converted as for member functions.
template <class R, class... A>
MemberCall callFree(R (*fn)(A...)) {
  return [fn](Object&, Arguments args) {
    return binding::callWith<R, A...>([fn](auto&&... a) -> R { return fn(a...); }, args,
                                      std::index_sequence_for<A...>{});
  };
}

}  // namespace

const ClassInfo& basValidationsModule::typeInfo() {
  namespace checks = basValidations;
  static const ClassInfo info(
      u"basValidations",
      Members()
          .custom(u"CheckWageType", MemberKind::Method, callFree(&checks::CheckWageType))
          .custom(u"CheckJobStatus", MemberKind::Method, callFree(&checks::CheckJobStatus))
          .custom(u"CheckAccountType", MemberKind::Method, callFree(&checks::CheckAccountType))
          .custom(u"CheckAMTTYPE", MemberKind::Method, callFree(&checks::CheckAMTTYPE))
          .custom(u"CheckBOOLTYPE", MemberKind::Method, callFree(&checks::CheckBOOLTYPE))
          .custom(u"CheckDATETYPE", MemberKind::Method, callFree(&checks::CheckDATETYPE))
          .custom(u"CheckDATETIMETYPE", MemberKind::Method, callFree(&checks::CheckDATETIMETYPE))
          .custom(u"CheckINTTYPE", MemberKind::Method, callFree(&checks::CheckINTTYPE))
          .custom(u"CheckPRICETYPE", MemberKind::Method, callFree(&checks::CheckPRICETYPE))
          .custom(u"CheckQUANTYPE", MemberKind::Method, callFree(&checks::CheckQUANTYPE))
          .custom(u"CheckSTRTYPE", MemberKind::Method, callFree(&checks::CheckSTRTYPE))
          .custom(u"CheckIDTYPE", MemberKind::Method, callFree(&checks::CheckIDTYPE))
          .custom(u"CheckPERCENTTYPE", MemberKind::Method, callFree(&checks::CheckPERCENTTYPE))
          .take());
  return info;
}

}  // namespace droqbxml

// The error object: storing, raising and logging errors.
#include "droqbxml/diagnostics/clsMyErr.hpp"

#include <optional>
#include <string>
#include <utility>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/Logs.hpp"
#include "droqbxml/runtime/Binding.hpp"

namespace droqbxml {
namespace {

// An error record argument: nothing, or an error object whose values it copies.
std::optional<ErrorRecord> recordOf(const Variant& oErr) {
  if (oErr.isMissing()) return std::nullopt;
  auto object = oErr.toObjectOf<clsMyErr>();
  if (!object) return std::nullopt;
  return object->record();
}

Variant argument(Arguments args, size_t at) {
  return at < args.size() ? args[at] : Variant::missing();
}

template <class Store>
void storeQuietly(const Variant& value, Store store) {
  if (value.isMissing()) return;
  try {
    store(value);
  } catch (const ComError&) {
    // a value that does not convert stays cleared
  }
}

}  // namespace

const ClassInfo& clsMyErr::typeInfo() {
  static const ClassInfo info(
      u"clsMyErr",
      Members()
          .property(u"Description", &clsMyErr::Description, &clsMyErr::Description)
          .property(u"HelpContext", &clsMyErr::HelpContext, &clsMyErr::HelpContext)
          .property(u"HelpFile", &clsMyErr::HelpFile, &clsMyErr::HelpFile)
          .property(u"LastDllError", &clsMyErr::LastDllError, &clsMyErr::LastDllError)
          .property(u"Number", &clsMyErr::Number, &clsMyErr::Number)
          .property(u"Source", &clsMyErr::Source, &clsMyErr::Source)
          .method(u"Clear", &clsMyErr::Clear)
          .custom(u"Raise", MemberKind::Method,
                  [](Object& self, Arguments args) {
                    static_cast<clsMyErr&>(self).Raise(
                        argument(args, 0), argument(args, 1), argument(args, 2), argument(args, 3),
                        argument(args, 4), argument(args, 5), argument(args, 6));
                    return Variant();
                  },
                  {ValueType::None, std::vector<ParamShape>(7, {ValueType::Any, false, true})})
          .method(u"SetErrorInfo", &clsMyErr::SetErrorInfo)
          .optional(5)
          .custom(u"SetError", MemberKind::Method,
                  [](Object& self, Arguments args) {
                    const auto record = recordOf(argument(args, 0));
                    static_cast<clsMyErr&>(self).SetError(record.value_or(ErrorRecord{}),
                                                          argument(args, 1).toText());
                    return Variant();
                  },
                  {ValueType::None, {{ValueType::Any}, {ValueType::Text}}})
          .custom(u"LogError", MemberKind::Method,
                  [](Object& self, Arguments args) {
                    static_cast<clsMyErr&>(self).LogError(argument(args, 0));
                    return Variant();
                  },
                  {ValueType::None, {{ValueType::Any, false, true}}})
          .take());
  return info;
}

void clsMyErr::Clear() {
  description_.clear();
  helpContext_.clear();
  helpFile_.clear();
  lastDllError_ = 0;
  number_ = 0;
  source_.clear();
}

void clsMyErr::Raise(const ErrorRecord& oErr) {
  // The record's description is passed as the source: hosts have always seen it so.
  SetError(oErr, oErr.Description);
  if (number_ != 0) raiseError(number_, source_, description_);
}

void clsMyErr::Raise(const Variant& oErr, const Variant& lNumber, const Variant& sSource,
                     const Variant& sDescription, const Variant& sHelpFile,
                     const Variant& sHelpContext, const Variant& lLastDllError) {
  if (const auto record = recordOf(oErr)) {
    Raise(*record);
    return;
  }
  if (!lNumber.isMissing()) {
    // Not cleared first: a value left out keeps the previous error's.
    number_ = lNumber.toLong();
    if (!sSource.isMissing()) source_ = sSource.toText();
    if (!sDescription.isMissing()) description_ = sDescription.toText();
    if (!sHelpFile.isMissing()) helpFile_ = sHelpFile.toText();
    if (!sHelpContext.isMissing()) helpContext_ = sHelpContext.toText();
    if (!lLastDllError.isMissing()) lastDllError_ = lLastDllError.toLong();
  }
  if (number_ != 0) raiseError(number_, source_, description_);
}

void clsMyErr::SetErrorInfo(const Variant& lErrorNumber, const Variant& sSource,
                            const Variant& sDescription, const Variant& sHelpFile,
                            const Variant& sHelpContext) {
  Clear();
  storeQuietly(lErrorNumber, [&](const Variant& v) { number_ = v.toLong(); });
  storeQuietly(sSource, [&](const Variant& v) { source_ = v.toText(); });
  storeQuietly(sDescription, [&](const Variant& v) { description_ = v.toText(); });
  storeQuietly(sHelpFile, [&](const Variant& v) { helpFile_ = v.toText(); });
  storeQuietly(sHelpContext, [&](const Variant& v) { helpContext_ = v.toText(); });
}

void clsMyErr::SetError(const ErrorRecord& ErrObj, const Text& Source) {
  Clear();
  description_ = ErrObj.Description;
  helpContext_ = asciiText(std::to_string(ErrObj.HelpContext));
  helpFile_ = ErrObj.HelpFile;
  lastDllError_ = ErrObj.LastDllError;
  number_ = ErrObj.Number;
  source_ = Source;
}

void clsMyErr::LogError(const ErrorRecord& oErr) {
  SetError(oErr, oErr.Source);
  appendErrorLog(number_, source_, description_);
}

void clsMyErr::LogError(const Variant& oErr) {
  if (const auto record = recordOf(oErr)) {
    LogError(*record);
    return;
  }
  appendErrorLog(number_, source_, description_);
}

ErrorRecord clsMyErr::record() const {
  ErrorRecord out;
  out.Number = number_;
  out.Source = source_;
  out.Description = description_;
  out.HelpFile = helpFile_;
  // The help context is kept as text; a text that is no number reads as 0.
  try {
    out.HelpContext = helpContext_.empty() ? 0 : Variant(helpContext_).toLong();
  } catch (const ComError&) {
    out.HelpContext = 0;
  }
  out.LastDllError = lastDllError_;
  return out;
}

void raiseComponentError(ERROR_NUMBER number, Text source, Text description) {
  basGlobals::SharedErrorObject()->Raise(Variant::missing(), Variant(static_cast<int32_t>(number)),
                                         Variant(std::move(source)),
                                         Variant(std::move(description)));
  // Raise returns only for number 0, which no ERROR_NUMBER member has.
  raiseError(number, u"", u"");
}

}  // namespace droqbxml

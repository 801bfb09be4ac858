// The record engine: the set path, the late-bound field members, the dump writer.
#include "droqbxml/records/Record.hpp"

#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/qbxml/basValidations.hpp"
#include "droqbxml/records/basCommonProcs.hpp"

namespace droqbxml {
namespace {

Text checked(const FieldSpec& row, Text value) {
  using namespace basValidations;
  switch (row.check) {
    case Check::None:
      return value;
    case Check::Str:
      return CheckSTRTYPE(std::move(value), static_cast<int16_t>(row.arg), false);
    case Check::StrCut:
      return CheckSTRTYPE(std::move(value), static_cast<int16_t>(row.arg), true);
    case Check::Int:
      return CheckINTTYPE(value, row.arg, 0, 0);
    case Check::IntLength:
      return CheckINTTYPE(value, 1, row.arg, 0);
    case Check::IntRange:
      return CheckINTTYPE(value, 2, row.arg, 0);
    case Check::Bool:
      return CheckBOOLTYPE(value);
    case Check::Date:
      return CheckDATETYPE(value);
    case Check::DateTime:
      return CheckDATETIMETYPE(std::move(value));
    case Check::Amt:
      return CheckAMTTYPE(value);
    case Check::Price:
      return CheckPRICETYPE(value);
    case Check::Quan:
      return CheckQUANTYPE(value);
    case Check::Percent:
      return CheckPERCENTTYPE(value);
    case Check::Id:
      return CheckIDTYPE(std::move(value));
    case Check::JobStatus:
      return CheckJobStatus(value);
    case Check::AccountType:
      return CheckAccountType(value);
    case Check::WageType:
      return CheckWageType(value);
  }
  return value;
}

}  // namespace

OwnResponse findOwnResponse(const Text& value, int32_t startPoint, TextView returnTag,
                            const Text& requestId) {
  using basCommonProcs::findInResponse;
  const int32_t start = startPoint < 1 ? 1 : startPoint;
  if (findInResponse(start, value, returnTag) == 0) return {false, false, 0, 0};
  const int32_t attribute = findInResponse(start, value, u"requestID=");
  const int32_t open = attribute == 0 ? 0 : findInResponse(attribute, value, u"\"");
  const int32_t close = open == 0 ? 0 : findInResponse(open + 1, value, u"\"");
  if (close == 0) return {false, false, start, 0};
  const TextView id =
      TextView(value).substr(static_cast<size_t>(open), static_cast<size_t>(close - open - 1));
  if (!requestId.empty() && id != requestId) return {false, true, close, 0};
  return {true, false, start, close};
}

TextView startTagOf(TextView name) {
  thread_local Text tag;  // made without allocating on most calls
  tag.assign(u"<").append(name).push_back(u'>');
  return tag;
}

Record::Record(std::span<const FieldSpec> fields)
    : fields_(fields),
      spilled_(fields.size() > kInline ? fields.size() : 0),
      values_(fields.size() > kInline ? spilled_.data() : inline_.data()) {}

// values_ points into the record itself: a copy points into its own.
Record::Record(const Record& other)
    : Object(other),
      fields_(other.fields_),
      inline_(other.inline_),
      spilled_(other.spilled_),
      values_(fields_.size() > kInline ? spilled_.data() : inline_.data()) {}

Record& Record::operator=(const Record& other) {
  if (this != &other) {
    Object::operator=(other);
    fields_ = other.fields_;
    inline_ = other.inline_;
    spilled_ = other.spilled_;
    values_ = fields_.size() > kInline ? spilled_.data() : inline_.data();
  }
  return *this;
}

Text Record::fieldValueUnescaped(size_t index) const {
  return XMLUnEscapeText(values_[index], false);
}

void Record::setFieldValue(size_t index, Text value) {
  const FieldSpec& row = fields_[index];
  if (row.rule == Rule::KeepsStoredValue) {
    fieldStored(index);
    return;
  }
  if (row.trim == Trim::Spaces && !value.empty()) {
    const TextView kept = trimView(value);
    if (kept.size() != value.size()) value = Text(kept);
  }
  // The checks that can only give the value back are skipped: most fields read from a
  // response are absent (every check gives "" for "") or texts within their length.
  const bool unchanged = value.empty() || row.check == Check::None ||
                         row.check == Check::DateTime || row.check == Check::Id ||
                         ((row.check == Check::Str || row.check == Check::StrCut) &&
                          (row.arg < 1 || value.size() <= static_cast<size_t>(row.arg)));
  if (!unchanged) value = checked(row, std::move(value));
  if (row.rule == Rule::Specific) {
    applyRule(index, value);
  } else {
    values_[index] = std::move(value);
  }
  fieldStored(index);
}

void Record::applyRule(size_t index, const Text& checkedValue) { values_[index] = checkedValue; }

void Record::fieldStored(size_t) {}

void Record::addFieldMembers(Members& members, std::span<const FieldSpec> fields) {
  for (size_t i = 0; i < fields.size(); ++i) {
    const Text name(fields[i].name);
    if (fields[i].unescaped) {
      members.custom(name + u"_XmlUnEscaped", MemberKind::Get,
                     [i](Object& self, Arguments) {
                       return Variant(static_cast<Record&>(self).fieldValueUnescaped(i));
                     },
                     {ValueType::Text, {}});
    }
    members.custom(
        name, MemberKind::Get,
        [i](Object& self, Arguments) { return Variant(static_cast<Record&>(self).fieldValue(i)); },
        {ValueType::Text, {}});
    members.custom(name, MemberKind::Let,
                   [i](Object& self, Arguments args) {
                     if (args.size() != 1) binding::wrongArgumentCount();
                     static_cast<Record&>(self).setFieldValue(i, args[0].toText());
                     return Variant();
                   },
                   {ValueType::None, {{ValueType::Text}}});
  }
}

void DumpWriter::field(TextView label, const Text& value) {
  text_ += u"\r\n";
  text_ += label;
  text_ += u"\r\n\t";
  text_ += value;
}

void DumpWriter::untabbed(TextView label, const Text& value) {
  text_ += u"\r\n";
  text_ += label;
  text_ += u"\r\n";
  text_ += value;
}

void DumpWriter::block(TextView openingLabel, const Text& dump, TextView closingLabel) {
  text_ += u"\r\n";
  text_ += openingLabel;
  text_ += u"\r\n";
  text_ += dump;
  text_ += u"\r\n";
  text_ += closingLabel;
}

}  // namespace droqbxml

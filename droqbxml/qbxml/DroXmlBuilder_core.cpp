// DroXmlBuilder, the core: the document frame, element and aggregate writing, indentation,
// the request counter and the stack of open aggregates. Every write appends to the one
// document text, so a document of n lines costs time linear in its length.
#include "droqbxml/qbxml/DroXmlBuilder.hpp"

#include <cstdint>
#include <limits>
#include <memory>
#include <utility>

#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/qbxml/internal/EscapeInto.hpp"
#include "droqbxml/records/DroAccount.hpp"
#include "droqbxml/records/DroCustomer.hpp"
#include "droqbxml/records/DroCustomerCol.hpp"
#include "droqbxml/records/DroEstimate.hpp"
#include "droqbxml/records/DroInvoice.hpp"
#include "droqbxml/runtime/Binding.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {
namespace {

constexpr int16_t kMaxInt16 = std::numeric_limits<int16_t>::max();
constexpr TextView kLineEnd = u"\r\n";
constexpr TextView kStopOnError = u"stopOnError";
constexpr size_t kAggregateStackStep = 10;

// The blank before the DOCTYPE's closing ">" is deliberate: QuickBooks has always been
// sent it so.
constexpr TextView kHeader =
    u"<?xml version=\"1.0\"?>\r\n"
    u"<!DOCTYPE QBXML PUBLIC \"-//INTUIT//DTD QBXML QBD 1.0//EN\" >\r\n"
    u"<QBXML>\r\n";

void requireElement(const Ref<DroXmlElement>& elem) {
  if (!elem) raiseRuntimeError(RuntimeError::kObjectNotSet);
}

// "<Name" and the attributes, as AddElement and AddAggregateBegin both start.
void appendOpening(Text& out, const DroXmlElement& elem) {
  out += u'<';
  out += elem.Name();
  // The count is read before AttributesUsed: an element whose first name is empty has
  // count 0 and writes no attribute at all.
  const int16_t count = elem.AttributeCount();
  if (!elem.AttributesUsed()) return;
  for (int16_t i = 0; i < count; ++i) {
    out += u' ';
    out += elem.AttributeName(i);
    out += u"=\"";
    out += elem.AttributeValue(i);
    out += u'"';
  }
}

// After "<Name" and the attributes: " />" for an empty value, else ">", the value,
// "</Name>"; then the line end.
template <class WriteValue>
void appendElementRest(Text& out, TextView name, bool empty, WriteValue writeValue) {
  if (empty) {
    out += u" />";
  } else {
    out += u'>';
    writeValue(out);
    out += u"</";
    out += name;
    out += u'>';
  }
  out += kLineEnd;
}

}  // namespace

const ClassInfo& DroXmlBuilder::typeInfo() {
  using B = DroXmlBuilder;
  // Members in interface order.
  static const ClassInfo info = [] {
    Members members;
    members.method(u"Class_Initialize", &B::Class_Initialize)
        .method(u"Initialize", &B::Initialize)
        .property(u"OnError", &B::OnError, &B::OnError)
        .getter(u"XML", &B::XML)
        .method(u"AddHeaders", &B::AddHeaders)
        .method(u"AddFooters", &B::AddFooters)
        .method(u"AddElementAggregateSimple", &B::AddElementAggregateSimple)
        .method(u"AddElementSimple", &B::AddElementSimple)
        .method(u"AddElement", &B::AddElement)
        .method(u"AddAggregateBegin", &B::AddAggregateBegin)
        .method(u"AddAggregateEnd", &B::AddAggregateEnd)
        .getter(u"RequestID", &B::RequestID)
        .method(u"RequestIDUp", &B::RequestIDUp)
        .method(u"CreateElement", &B::CreateElement)
        .optional(2)
        .method(u"BuildRetCustomerInfo",
                static_cast<void (B::*)(const Ref<DroCustomerCol>&)>(&B::BuildRetCustomerInfo))
        .method(u"BuildAddCustomer", &B::BuildAddCustomer)
        .method(u"BuildAddJob", &B::BuildAddJob)
        .method(u"BuildAddAccount", &B::BuildAddAccount)
        .method(u"BuildAddItem", &B::BuildAddItem)
        .method(u"BuildQueryByAll", &B::BuildQueryByAll)
        .method(u"BuildQueryByFullName", &B::BuildQueryByFullName)
        .optional(1)
        .method(u"BuildQueryByListID", &B::BuildQueryByListID)
        .method(u"BuildQueryByActiveOrDate", &B::BuildQueryByActiveOrDate)
        .optional(2)
        .method(u"BuildAddEstimate", &B::BuildAddEstimate)
        .optional(1)
        .method(u"BuildAddInvoice", &B::BuildAddInvoice)
        .optional(1)
        .method(u"IsSuccessRs", &B::IsSuccessRs)
        .method(u"XmlEscapeX", &B::XmlEscapeX);
    return ClassInfo(u"DroXmlBuilder", members.take());
  }();
  return info;
}

DroXmlBuilder::DroXmlBuilder() { Class_Initialize(); }

void DroXmlBuilder::Class_Initialize() { Initialize(); }

void DroXmlBuilder::Initialize() {
  indentLevel_ = 1;
  OnError(Text(kStopOnError));
  requestId_ = 1;
  document_.clear();
  aggregateStackReset();
}

void DroXmlBuilder::OnError(const Text& value) {
  const TextView trimmed = trimView(value);
  onError_ = (trimmed == u"continueOnError" || trimmed == u"rollbackOnError") ? Text(trimmed)
                                                                              : Text(kStopOnError);
}

void DroXmlBuilder::AddHeaders() {
  if (indentLevel_ != 1) {
    // Raised directly under the facade's name, not through the shared error object.
    raiseError(DRO_XML_PROCESSOR_IMPROPERLY_INITIONALIZED, u"DroXmlProcessor.AddHeaders",
               u"Could not assign XML header information because the DroXmlProcessor object "
               u"has not been initialized properly prior to attempted use.");
  }
  // Written over the last document, whose room the new one reuses.
  document_.assign(kHeader);
  document_.append(static_cast<size_t>(indentLevel_), u'\t');
  document_ += u"<QBXMLMsgsRq onError=\"";
  document_ += onError_;
  document_ += u"\">";
  document_ += kLineEnd;
  indentUp();
}

void DroXmlBuilder::AddFooters() {
  indentLevel_ = 1;
  appendIndent();
  document_ += u"</QBXMLMsgsRq>\r\n</QBXML>";
  indentDown();
}

void DroXmlBuilder::AddElementAggregateSimple(const Text& sNameA) {
  AddAggregateBegin(CreateElement(sNameA));
}

void DroXmlBuilder::AddElementSimple(const Text& sNameA, const Text& sValueA) {
  // What AddElement(CreateElement(sNameA, XmlEscapeX(sValueA))) writes (the name trimmed,
  // no attributes), with the value escaped straight into the document.
  const TextView name = trimView(sNameA);
  appendIndent();
  document_ += u'<';
  document_ += name;
  appendElementRest(document_, name, sValueA.empty(),
                    [&](Text& out) { internal::escapeInto(out, sValueA, false); });
}

void DroXmlBuilder::AddElement(const Ref<DroXmlElement>& Elem) {
  requireElement(Elem);
  appendIndent();
  appendOpening(document_, *Elem);
  appendElementRest(document_, Elem->Name(), Elem->Value().empty(),
                    [&](Text& out) { out += Elem->Value(); });
}

void DroXmlBuilder::AddAggregateBegin(const Ref<DroXmlElement>& Elem) {
  requireElement(Elem);
  appendIndent();
  appendOpening(document_, *Elem);
  document_ += u'>';
  document_ += kLineEnd;
  indentUp();
  aggregateStackPush(Elem->Name());
}

void DroXmlBuilder::AddAggregateEnd() {
  indentDown();
  appendIndent();
  document_ += u"</";
  document_ += aggregateStackPop();
  document_ += u'>';
  document_ += kLineEnd;
}

void DroXmlBuilder::RequestIDUp() {
  if (requestId_ == kMaxInt16) raiseRuntimeError(RuntimeError::kOverflow);
  ++requestId_;
}

Ref<DroXmlElement> DroXmlBuilder::CreateElement(const Text& Name, const Text& Value) const {
  auto elem = std::make_shared<DroXmlElement>();
  if (!Name.empty()) elem->Name(Name);
  if (!Value.empty()) elem->Value(Value);
  return elem;
}

Text DroXmlBuilder::XmlEscapeX(const Text& Value) const {
  return XMLEscapeText(Value, Variant::missing(), false);
}

void DroXmlBuilder::appendIndent() {
  if (indentLevel_ > 0) document_.append(static_cast<size_t>(indentLevel_), u'\t');
}

void DroXmlBuilder::indentUp() {
  if (indentLevel_ == kMaxInt16) raiseRuntimeError(RuntimeError::kOverflow);
  ++indentLevel_;
}

void DroXmlBuilder::indentDown() { indentLevel_ = indentLevel_ < 1 ? 0 : indentLevel_ - 1; }

void DroXmlBuilder::aggregateStackReset() {
  aggregateStack_.assign(1, Text());
  aggregateCount_ = 0;
}

void DroXmlBuilder::aggregateStackPush(const Text& name) {
  const auto at = static_cast<size_t>(aggregateCount_);
  if (at >= aggregateStack_.size())
    aggregateStack_.resize(aggregateStack_.size() + kAggregateStackStep);
  aggregateStack_[at] = trim(name);
  if (aggregateCount_ == kMaxInt16) raiseRuntimeError(RuntimeError::kOverflow);
  ++aggregateCount_;
}

Text DroXmlBuilder::aggregateStackPop() {
  if (aggregateCount_ <= 0) return {};
  --aggregateCount_;
  return std::exchange(aggregateStack_[static_cast<size_t>(aggregateCount_)], Text());
}

}  // namespace droqbxml

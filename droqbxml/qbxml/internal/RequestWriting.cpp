// Element, reference and address writing shared by the add builders.
#include "droqbxml/qbxml/internal/RequestWriting.hpp"

#include <string>

#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml::internal {

void writeElement(DroXmlBuilder& builder, TextView name, const Text& value) {
  builder.AddElement(builder.CreateElement(Text(name), builder.XmlEscapeX(value)));
}

void writeElementIfSet(DroXmlBuilder& builder, TextView name, const Text& value) {
  if (!value.empty()) writeElement(builder, name, value);
}

void writeAddressIfSet(DroXmlBuilder& builder, TextView name, const DroAddress& address) {
  if (address.IsEmpty()) return;
  builder.AddAggregateBegin(builder.CreateElement(Text(name)));
  writeElementIfSet(builder, u"Addr1", address.Addr1());
  writeElementIfSet(builder, u"Addr2", address.Addr2());
  writeElementIfSet(builder, u"Addr3", address.Addr3());
  writeElementIfSet(builder, u"City", address.City());
  writeElementIfSet(builder, u"State", address.State());
  writeElementIfSet(builder, u"PostalCode", address.PostalCode());
  writeElementIfSet(builder, u"Country", address.Country());
  builder.AddAggregateEnd();
}

void openAddRequest(DroXmlBuilder& builder, TextView requestName,
                    const std::function<Text(const Text&)>& exchange) {
  builder.Initialize();
  builder.AddHeaders();
  auto request = builder.CreateElement(Text(requestName));
  builder.RequestIDUp();
  const Text held = exchange(asciiText(std::to_string(builder.RequestID())));
  request->AttributeAdd(u"requestID", builder.XmlEscapeX(held));
  builder.AddAggregateBegin(request);
}

void ByName::forEach(const std::function<void(const Variant&)>& body) const {
  const auto members = self().call(u"NewEnum").toObject();
  if (!members) raiseRuntimeError(RuntimeError::kObjectNotSet);
  for (Variant member = members->call(u"Next"); !member.isEmpty();
       member = members->call(u"Next")) {
    body(member);
  }
}

Object& ByName::self() const {
  if (!object_) raiseRuntimeError(RuntimeError::kObjectNotSet);
  return *object_;
}

}  // namespace droqbxml::internal

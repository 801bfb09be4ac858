// Element, reference and address writing shared by the add builders.
#include "droqbxml/qbxml/internal/RequestWriting.hpp"

#include <string>

namespace droqbxml::internal {

void writeElement(DroXmlBuilder& builder, TextView name, const Text& value) {
  builder.AddElement(builder.CreateElement(Text(name), builder.XmlEscapeX(value)));
}

void writeElementIfSet(DroXmlBuilder& builder, TextView name, const Text& value) {
  if (!value.empty()) writeElement(builder, name, value);
}

void writeReference(DroXmlBuilder& builder, TextView name, const Text& listId,
                    const Text& fullName) {
  builder.AddAggregateBegin(builder.CreateElement(Text(name)));
  if (!listId.empty()) {
    writeElement(builder, u"ListID", listId);
  } else {
    writeElement(builder, u"FullName", fullName);
  }
  builder.AddAggregateEnd();
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

Text openAddRequest(DroXmlBuilder& builder, TextView requestName) {
  builder.Initialize();
  builder.AddHeaders();
  auto request = builder.CreateElement(Text(requestName));
  builder.RequestIDUp();
  const Text id = asciiText(std::to_string(builder.RequestID()));
  request->AttributeAdd(u"requestID", builder.XmlEscapeX(id));
  builder.AddAggregateBegin(request);
  return id;
}

}  // namespace droqbxml::internal

// DroXmlElement: one element of a request on its way into DroXmlBuilder: a name, a value
// and the attributes in the order added. It neither escapes nor checks anything; callers
// put escaped text into it and the builder writes it as it stands.
#ifndef DROQBXML_QBXML_DROXMLELEMENT_HPP_
#define DROQBXML_QBXML_DROXMLELEMENT_HPP_

#include <cstdint>
#include <vector>

#include "droqbxml/runtime/Object.hpp"
#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

class DroXmlElement final : public Object {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // A new element: empty name and value, no attributes.
  DroXmlElement();

  // Clears the attributes (name and value are kept); also runs at creation.
  void Class_Initialize();

  // Appends an attribute; name and value are stored trimmed. Duplicate names are kept.
  // Attribute indices are 16-bit: adding one past index 32767 is the runtime's 6 and
  // leaves the element unchanged.
  void AttributeAdd(const Text& Name, const Text& Value);
  // Back to no attributes: one empty slot at index 0, AttributesUsed false.
  void AttributesClear();
  // True once an attribute has been added, whatever its name.
  bool AttributesUsed() const { return attributesUsed_; }
  // The name or value at a 0-based index; "" for any index out of range.
  Text AttributeName(int16_t Index) const;
  Text AttributeValue(int16_t Index) const;

  // The element name, stored trimmed.
  const Text& Name() const { return name_; }
  void Name(const Text& value);
  // The element text, stored exactly as given (surrounding blanks are written).
  const Text& Value() const { return value_; }
  void Value(const Text& value) { value_ = value; }

  // The number of attributes, but 0 whenever the first attribute's name is empty, even
  // though AttributesUsed is true: deliberate, the builder then writes no attributes.
  // 32768 attributes do not fit the 16-bit count: the runtime's 6.
  int16_t AttributeCount() const;

 private:
  // Store at an existing index; any other index is ignored.
  void attributeNameSet(int16_t index, const Text& value);
  void attributeValueSet(int16_t index, const Text& value);

  Text name_;
  Text value_;
  std::vector<Text> attributeNames_;   // never empty: index 0 always exists
  std::vector<Text> attributeValues_;  // same size as attributeNames_
  bool attributesUsed_ = false;
};

}  // namespace droqbxml

#endif  // DROQBXML_QBXML_DROXMLELEMENT_HPP_

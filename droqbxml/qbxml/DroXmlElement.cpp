// DroXmlElement: the attribute arrays keep the platform's shape (one empty slot when there
// is none, a 16-bit highest index) so that AttributeCount and AttributesUsed read exactly
// as hosts have always seen them.
#include "droqbxml/qbxml/DroXmlElement.hpp"

#include <cstddef>
#include <limits>

#include "droqbxml/runtime/Binding.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {
namespace {

constexpr size_t kMaxIndex = static_cast<size_t>(std::numeric_limits<int16_t>::max());

}  // namespace

const ClassInfo& DroXmlElement::typeInfo() {
  static const ClassInfo info(u"DroXmlElement",
                              Members()
                                  .method(u"Class_Initialize", &DroXmlElement::Class_Initialize)
                                  .method(u"AttributeAdd", &DroXmlElement::AttributeAdd)
                                  .method(u"AttributesClear", &DroXmlElement::AttributesClear)
                                  .getter(u"AttributesUsed", &DroXmlElement::AttributesUsed)
                                  .getter(u"AttributeName", &DroXmlElement::AttributeName)
                                  .getter(u"AttributeValue", &DroXmlElement::AttributeValue)
                                  .property(u"Name", &DroXmlElement::Name, &DroXmlElement::Name)
                                  .property(u"Value", &DroXmlElement::Value, &DroXmlElement::Value)
                                  .getter(u"AttributeCount", &DroXmlElement::AttributeCount)
                                  .take());
  return info;
}

DroXmlElement::DroXmlElement() { Class_Initialize(); }

void DroXmlElement::Class_Initialize() { AttributesClear(); }

void DroXmlElement::AttributeAdd(const Text& Name, const Text& Value) {
  if (!attributesUsed_) {
    attributeNameSet(0, Name);
    attributeValueSet(0, Value);
    attributesUsed_ = true;
    return;
  }
  const size_t index = attributeNames_.size();
  if (index > kMaxIndex) raiseRuntimeError(RuntimeError::kOverflow);
  attributeNames_.resize(index + 1);
  attributeNameSet(static_cast<int16_t>(index), Name);
  attributeValues_.resize(index + 1);
  attributeValueSet(static_cast<int16_t>(index), Value);
}

void DroXmlElement::AttributesClear() {
  attributeNames_.assign(1, Text());
  attributeValues_.assign(1, Text());
  attributesUsed_ = false;
}

Text DroXmlElement::AttributeName(int16_t Index) const {
  if (Index < 0 || static_cast<size_t>(Index) >= attributeNames_.size()) return {};
  return attributeNames_[static_cast<size_t>(Index)];
}

Text DroXmlElement::AttributeValue(int16_t Index) const {
  if (Index < 0 || static_cast<size_t>(Index) >= attributeValues_.size()) return {};
  return attributeValues_[static_cast<size_t>(Index)];
}

void DroXmlElement::Name(const Text& value) { name_ = trim(value); }

int16_t DroXmlElement::AttributeCount() const {
  if (attributeNames_.front().empty()) return 0;
  const size_t count = attributeNames_.size();
  if (count > kMaxIndex) raiseRuntimeError(RuntimeError::kOverflow);
  return static_cast<int16_t>(count);
}

void DroXmlElement::attributeNameSet(int16_t index, const Text& value) {
  if (index >= 0 && static_cast<size_t>(index) < attributeNames_.size()) {
    attributeNames_[static_cast<size_t>(index)] = trim(value);
  }
}

void DroXmlElement::attributeValueSet(int16_t index, const Text& value) {
  if (index >= 0 && static_cast<size_t>(index) < attributeValues_.size()) {
    attributeValues_[static_cast<size_t>(index)] = trim(value);
  }
}

}  // namespace droqbxml

// XMLElement: a name with ordered, uniquely named attributes.
#include "XMLElement.h"

#include <new>

namespace QZXML_800 {

XMLElement::XMLElement(const std::string& name) : name_(name) {}

XMLElement::XMLElement(const XMLElement&) = default;

XMLElement::~XMLElement() = default;

XMLElement* XMLElement::Create(const std::string& name) {
  try {
    return new XMLElement(name);
  } catch (...) {
    return nullptr;
  }
}

void XMLElement::AddAttribute(const std::string& name, const std::string& value) {
  for (Attribute& attribute : attributes_) {
    if (attribute.first == name) {
      attribute.second = value;
      return;
    }
  }
  attributes_.emplace_back(name, value);
}

const std::string* XMLElement::GetAttribute(const std::string& name) const noexcept {
  for (const Attribute& attribute : attributes_) {
    if (attribute.first == name) return &attribute.second;
  }
  return nullptr;
}

XMLElement* XMLElement::Clone() const {
  try {
    return new XMLElement(*this);
  } catch (...) {
    return nullptr;
  }
}

}  // namespace QZXML_800

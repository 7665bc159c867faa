#include "PluginDom.h"

#include <xercesc/dom/DOMAttr.hpp>
#include <xercesc/util/XMLString.hpp>

#include "Value.h"

namespace QZPlugin_800 {

namespace {

const XMLCh* LocalName(const xercesc::DOMNode* node) noexcept {
  const XMLCh* name = node->getLocalName();
  return name != nullptr ? name : node->getNodeName();
}

bool Matches(const xercesc::DOMNode* node, const char16_t* name) noexcept {
  if (node->getNodeType() != xercesc::DOMNode::ELEMENT_NODE) return false;
  return name == nullptr || xercesc::XMLString::equals(LocalName(node), name);
}

std::string Where(const DomReader& reader, const xercesc::DOMElement* element,
                  const char16_t* attribute) {
  return reader.Name(element) + " attribute '" + reader.Text(attribute) + "'";
}

}  // namespace

bool IsElement(const xercesc::DOMElement* element, const char16_t* name) noexcept {
  return element != nullptr && xercesc::XMLString::equals(LocalName(element), name);
}

const xercesc::DOMElement* FirstChildElement(const xercesc::DOMNode* parent,
                                             const char16_t* name) noexcept {
  if (parent == nullptr) return nullptr;
  for (const xercesc::DOMNode* n = parent->getFirstChild(); n != nullptr;
       n = n->getNextSibling()) {
    if (Matches(n, name)) return static_cast<const xercesc::DOMElement*>(n);
  }
  return nullptr;
}

const xercesc::DOMElement* NextSiblingElement(const xercesc::DOMElement* element,
                                              const char16_t* name) noexcept {
  if (element == nullptr) return nullptr;
  for (const xercesc::DOMNode* n = element->getNextSibling(); n != nullptr;
       n = n->getNextSibling()) {
    if (Matches(n, name)) return static_cast<const xercesc::DOMElement*>(n);
  }
  return nullptr;
}

std::vector<const xercesc::DOMElement*> ChildElements(const xercesc::DOMNode* parent,
                                                      const char16_t* name) {
  std::vector<const xercesc::DOMElement*> children;
  for (const xercesc::DOMElement* e = FirstChildElement(parent, name); e != nullptr;
       e = NextSiblingElement(e, name)) {
    children.push_back(e);
  }
  return children;
}

DomReader::DomReader(const std::string& encoding) { parser_.CreateTranscoder(encoding); }

std::string DomReader::Text(const XMLCh* text) const { return parser_.ToString(text); }

std::string DomReader::Name(const xercesc::DOMElement* element) const {
  return element == nullptr ? std::string() : Text(LocalName(element));
}

bool DomReader::Has(const xercesc::DOMElement* element, const char16_t* attribute) noexcept {
  return element != nullptr && element->getAttributeNode(attribute) != nullptr;
}

std::string DomReader::Attr(const xercesc::DOMElement* element, const char16_t* attribute,
                            const std::string& fallback) const {
  const xercesc::DOMAttr* node =
      element == nullptr ? nullptr : element->getAttributeNode(attribute);
  return node == nullptr ? fallback : Text(node->getValue());
}

std::string DomReader::Required(const xercesc::DOMElement* element,
                                const char16_t* attribute) const {
  if (!Has(element, attribute)) throw CompileError(Where(*this, element, attribute) + " is missing");
  return Attr(element, attribute);
}

bool DomReader::ParseNumber(const std::string& text, double& out) {
  if (QZScoring_800::ScoringBaseParser::ParseDouble(text, out)) return true;
  if (text == "INF" || text == "-INF" || text == "inf" || text == "-inf") {
    out = QZCommon_800::Value::TextToReal(text);
    return true;
  }
  return false;
}

double DomReader::Number(const xercesc::DOMElement* element, const char16_t* attribute,
                         double fallback) const {
  if (!Has(element, attribute)) return fallback;
  const std::string text = Attr(element, attribute);
  double value = 0.0;
  if (!ParseNumber(text, value)) {
    throw CompileError(Where(*this, element, attribute) + " is not a number: '" + text + "'");
  }
  return value;
}

double DomReader::RequiredNumber(const xercesc::DOMElement* element,
                                 const char16_t* attribute) const {
  Required(element, attribute);
  return Number(element, attribute, 0.0);
}

}  // namespace QZPlugin_800

// Reading a PMML DOM tree for the reference plug-ins: element navigation by local name,
// attribute texts in UTF-8 (or the document's configured encoding) and strict numbers.
// Everything here is used while a model is compiled, never while it scores.
#ifndef QZPLUGIN_CORE_PLUGINDOM_H_
#define QZPLUGIN_CORE_PLUGINDOM_H_

#include <stdexcept>
#include <string>
#include <vector>

#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/dom/DOMNode.hpp>

#include "ScoringBaseParser.h"

namespace QZPlugin_800 {

// Thrown while a document is compiled when the plug-in refuses it: a construct it does
// not support, or one that is malformed. The message says what and where; the plug-in
// boundary turns it into a null scorer and a diagnostic line.
class CompileError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

// True when the element's local name (its node name when the tree was parsed without
// namespaces) equals `name`. False for a null element.
bool IsElement(const xercesc::DOMElement* element, const char16_t* name) noexcept;

// The first child element of `parent` named `name` (any element when `name` is null);
// null when none. Text, comments and other nodes are skipped.
const xercesc::DOMElement* FirstChildElement(const xercesc::DOMNode* parent,
                                             const char16_t* name = nullptr) noexcept;
// The next sibling element after `element` named `name` (any when null); null when none.
const xercesc::DOMElement* NextSiblingElement(const xercesc::DOMElement* element,
                                              const char16_t* name = nullptr) noexcept;
// Every child element of `parent` named `name` (all when null), in document order.
std::vector<const xercesc::DOMElement*> ChildElements(const xercesc::DOMNode* parent,
                                                      const char16_t* name = nullptr);

// Attribute and name texts as narrow strings through one transcoder. Not copyable; one
// thread at a time (the transcoder is not shared). Needs Xerces-C++ initialised.
class DomReader {
 public:
  // `encoding` is the narrow encoding of every text ("" means "UTF-8").
  explicit DomReader(const std::string& encoding);
  DomReader(const DomReader&) = delete;
  DomReader& operator=(const DomReader&) = delete;

  // The text converted; "" for null.
  std::string Text(const XMLCh* text) const;
  // The element's local name (node name without namespaces).
  std::string Name(const xercesc::DOMElement* element) const;
  // Whether the attribute is present (an empty value counts).
  static bool Has(const xercesc::DOMElement* element, const char16_t* attribute) noexcept;
  // The attribute's text, `fallback` when absent.
  std::string Attr(const xercesc::DOMElement* element, const char16_t* attribute,
                   const std::string& fallback = std::string()) const;
  // The attribute's text; throws CompileError naming the element when it is absent.
  std::string Required(const xercesc::DOMElement* element, const char16_t* attribute) const;
  // The attribute as a number, `fallback` when absent. A plain decimal or "INF"/"-INF"
  // is accepted; anything else throws CompileError.
  double Number(const xercesc::DOMElement* element, const char16_t* attribute,
                double fallback) const;
  // As Number, but an absent attribute throws CompileError too.
  double RequiredNumber(const xercesc::DOMElement* element, const char16_t* attribute) const;
  // A text as a number by the same rule; false when it is none.
  static bool ParseNumber(const std::string& text, double& out);

 private:
  QZScoring_800::ScoringBaseParser parser_;
};

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_PLUGINDOM_H_

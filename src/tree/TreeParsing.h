// Shared pieces of the predicate and split parsers: the PMML names they compare, made
// UTF-16 at compile time so that parsing large trees never converts a constant name
// again, the DOM lookups on those names, and the trace entry of a caught exception.
#ifndef QZSCORING_TREE_TREEPARSING_H_
#define QZSCORING_TREE_TREEPARSING_H_

#include <cstddef>
#include <string>

#include <xercesc/dom/DOMAttr.hpp>
#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/dom/DOMNode.hpp>
#include <xercesc/util/XMLString.hpp>

#include "TraceLog.h"

namespace QZScoring_800 {
namespace tree_parsing {

// A narrow ASCII name of the PMML vocabulary as a UTF-16 constant.
template <std::size_t N>
struct WideText {
  XMLCh text[N];
  constexpr explicit WideText(const char (&name)[N]) : text{} {
    for (std::size_t i = 0; i < N; ++i) text[i] = static_cast<XMLCh>(name[i]);
  }
  constexpr const XMLCh* c_str() const { return text; }
};

// True when both texts are equal; a null text is never equal to a non-empty constant.
inline bool Equals(const XMLCh* text, const XMLCh* name) {
  return text != nullptr && xercesc::XMLString::equals(text, name);
}

// True when node is an element whose node name is name.
inline bool IsElementNamed(const xercesc::DOMNode* node, const XMLCh* name) {
  return node != nullptr && node->getNodeType() == xercesc::DOMNode::ELEMENT_NODE &&
         xercesc::XMLString::equals(node->getNodeName(), name);
}

// The value of the attribute `name` of node (owned by the DOM); null when node is no
// element or has no such attribute, an empty text when the attribute is empty.
inline const XMLCh* Attribute(const xercesc::DOMNode* node, const XMLCh* name) {
  if (node == nullptr || node->getNodeType() != xercesc::DOMNode::ELEMENT_NODE) return nullptr;
  const xercesc::DOMAttr* attribute =
      static_cast<const xercesc::DOMElement*>(node)->getAttributeNode(name);
  return attribute != nullptr ? attribute->getValue() : nullptr;
}

// Writes the level-2 entry for an exception that the handler at `line` of the
// qualified operation `function` caught before passing it on.
inline void TraceParseException(const char* function, int line) {
  TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s", function,
           std::to_string(line).c_str());
}

}  // namespace tree_parsing
}  // namespace QZScoring_800

#endif  // QZSCORING_TREE_TREEPARSING_H_

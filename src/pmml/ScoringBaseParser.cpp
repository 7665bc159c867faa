#include "ScoringBaseParser.h"

#include <cerrno>
#include <climits>
#include <cstdlib>

#include <xercesc/dom/DOMAttr.hpp>
#include <xercesc/dom/DOMNamedNodeMap.hpp>
#include <xercesc/util/XMLString.hpp>

#include "ScoringException.h"
#include "Value.h"
#include "WideName.h"

XERCES_CPP_NAMESPACE_USE

namespace QZScoring_800 {

namespace {

const char kInvalidInteger[] = "Invalid integer string -- ";
const char kInvalidDouble[] = "Invalid double string -- ";

bool IsElement(const DOMNode* node) {
  return node != nullptr && node->getNodeType() == DOMNode::ELEMENT_NODE;
}

// Xerces-C++ exposes no const-correct DOM: navigation from a const node yields
// non-const nodes, and so do these helpers.
DOMElement* ToElement(const DOMNode* node) {
  return static_cast<DOMElement*>(const_cast<DOMNode*>(node));
}

bool HasName(const DOMNode* node, const WideName& name) {
  return IsElement(node) && XMLString::equals(node->getNodeName(), name.c_str());
}

// The first of `node` and its following siblings that is an element named `name`.
DOMElement* FindFromHere(const DOMNode* node, const WideName& name) {
  for (; node != nullptr; node = node->getNextSibling()) {
    if (HasName(node, name)) return ToElement(node);
  }
  return nullptr;
}

DOMElement* FirstElementFromHere(const DOMNode* node) {
  for (; node != nullptr; node = node->getNextSibling()) {
    if (IsElement(node)) return ToElement(node);
  }
  return nullptr;
}

// Number texts hold ASCII only, so UTF-16 text narrows unit by unit; any other unit
// makes the text invalid (it could only become a character the grammars reject).
bool NarrowAscii(const XMLCh* text, std::string& out) {
  if (text == nullptr) return false;
  for (; *text != 0; ++text) {
    if (*text >= 0x80) return false;
    out.push_back(static_cast<char>(*text));
  }
  return true;
}

// UTF-16 text in the local code page through Xerces-C++'s default transcoder.
std::string DefaultTranscode(const XMLCh* text) {
  if (text == nullptr) return std::string();
  try {
    std::unique_ptr<char[], void (*)(char*)> narrow(XMLString::transcode(text), [](char* p) {
      XMLString::release(&p);
    });
    return narrow ? std::string(narrow.get()) : std::string();
  } catch (...) {
    return std::string();  // text the local code page cannot hold
  }
}

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

}  // namespace

ScoringBaseParser::ScoringBaseParser() = default;

ScoringBaseParser::~ScoringBaseParser() = default;

DOMElement* ScoringBaseParser::GetFirstChildElement(const DOMNode* node, const std::string& tag) {
  if (node == nullptr) return nullptr;
  const WideName name(tag);
  return FindFromHere(node->getFirstChild(), name);
}

DOMElement* ScoringBaseParser::GetNextSiblingElement(const DOMNode* node,
                                                     const std::string& tag) {
  if (node == nullptr) return nullptr;
  const WideName name(tag);
  return FindFromHere(node->getNextSibling(), name);
}

DOMElement* ScoringBaseParser::GetFirstChildElement(const DOMNode* node) {
  return node != nullptr ? FirstElementFromHere(node->getFirstChild()) : nullptr;
}

DOMElement* ScoringBaseParser::GetNextSiblingElement(const DOMNode* node) {
  return node != nullptr ? FirstElementFromHere(node->getNextSibling()) : nullptr;
}

DOMElement* ScoringBaseParser::AsElement(const DOMNode* node, const std::string& tag) {
  if (!IsElement(node)) return nullptr;
  const WideName name(tag);
  return HasName(node, name) ? ToElement(node) : nullptr;
}

DOMElement* ScoringBaseParser::AsElement(const DOMNode* node) {
  return IsElement(node) ? ToElement(node) : nullptr;
}

bool ScoringBaseParser::TagNameEquals(const DOMElement* element, const std::string& tag) {
  if (element == nullptr) return false;
  const WideName name(tag);
  return XMLString::equals(element->getNodeName(), name.c_str());
}

DOMNodeList* ScoringBaseParser::GetElementsByTagName(const DOMElement* element,
                                                     const std::string& tag) {
  if (element == nullptr) return nullptr;
  const WideName name(tag);
  return element->getElementsByTagName(name.c_str());
}

DOMNodeList* ScoringBaseParser::GetElementsByTagName(const DOMDocument* document,
                                                     const std::string& tag) {
  if (document == nullptr) return nullptr;
  const WideName name(tag);
  return document->getElementsByTagName(name.c_str());
}

const XMLCh* ScoringBaseParser::GetAttribute(const DOMElement* element,
                                             const std::string& name) {
  if (element == nullptr) return nullptr;
  const WideName wide(name);
  // getAttribute cannot tell an absent attribute from an empty one; the node can.
  const DOMAttr* attribute = element->getAttributeNode(wide.c_str());
  return attribute != nullptr ? attribute->getValue() : nullptr;
}

const XMLCh* ScoringBaseParser::GetAttribute(const DOMNode* node, const std::string& name) {
  return IsElement(node) ? GetAttribute(static_cast<const DOMElement*>(node), name) : nullptr;
}

int ScoringBaseParser::GetIntAttribute(const DOMElement* element, const std::string& name,
                                       int& out) {
  const XMLCh* text = GetAttribute(element, name);
  if (text == nullptr) return -1;
  return ParseInt(text, out) ? 0 : 1;
}

int ScoringBaseParser::GetDoubleAttribute(const DOMElement* element, const std::string& name,
                                          double& out) {
  const XMLCh* text = GetAttribute(element, name);
  if (text == nullptr) return -1;
  return ParseDouble(text, out) ? 0 : 1;
}

bool ScoringBaseParser::IsEqual(const XMLCh* text, const std::string& s) {
  const WideName wide(s);
  return XMLString::equals(text, wide.c_str());
}

bool ScoringBaseParser::IsEqualEx(const XMLCh* text, const std::string& s) const {
  if (!fTranscoder) return IsEqual(text, s);
  return fTranscoder->TranscodeTo(text) == s;
}

std::string ScoringBaseParser::ToString(const XMLCh* text) const {
  if (text == nullptr) return std::string();
  if (fTranscoder) return fTranscoder->TranscodeTo(text);
  return DefaultTranscode(text);
}

void ScoringBaseParser::CreateTranscoder(const std::string& encoding) {
  fTranscoder.reset();
  fTranscoder = std::make_unique<ScoringTranscoder>(encoding.c_str());
}

void ScoringBaseParser::FreeTranscoder() { fTranscoder.reset(); }

const ScoringTranscoder* ScoringBaseParser::GetTranscoder() const { return fTranscoder.get(); }

bool ScoringBaseParser::ParseInt(const XMLCh* text, int& out) {
  std::string narrow;
  return NarrowAscii(text, narrow) && ParseInt(narrow, out);
}

bool ScoringBaseParser::ParseInt(const std::string& text, int& out) {
  const size_t n = text.size();
  if (n == 0) return false;
  for (size_t i = 0; i < n; ++i) {
    const char c = text[i];
    if (c == '-' || c == '+') {
      if (i != 0 || n == 1) return false;  // a sign only starts the number
    } else if (!IsDigit(c)) {
      return false;
    }
  }
  // Text beyond the int range is refused rather than clamped or wrapped.
  errno = 0;
  const long long value = std::strtoll(text.c_str(), nullptr, 10);
  if (errno == ERANGE || value < INT_MIN || value > INT_MAX) return false;
  out = static_cast<int>(value);
  return true;
}

int ScoringBaseParser::VerifyInt(const XMLCh* text) {
  int value = 0;
  if (!ParseInt(text, value)) {
    throw ScoringException(ScoringException::SCORING_EXC_INVALID_VALUE,
                           kInvalidInteger + DefaultTranscode(text));
  }
  return value;
}

int ScoringBaseParser::VerifyInt(const std::string& text) {
  int value = 0;
  if (!ParseInt(text, value)) {
    throw ScoringException(ScoringException::SCORING_EXC_INVALID_VALUE, kInvalidInteger + text);
  }
  return value;
}

bool ScoringBaseParser::ParseDouble(const XMLCh* text, double& out) {
  std::string narrow;
  return NarrowAscii(text, narrow) && ParseDouble(narrow, out);
}

bool ScoringBaseParser::ParseDouble(const std::string& text, double& out) {
  const size_t n = text.size();
  if (n == 0) return false;
  size_t exponent = std::string::npos;  // position of the one exponent letter
  size_t point = std::string::npos;
  bool mantissaDigit = false;
  for (size_t i = 0; i < n; ++i) {
    const char c = text[i];
    if (c == 'e' || c == 'E') {
      if (i == 0 || i == n - 1 || exponent != std::string::npos) return false;
      exponent = i;
    } else if (c == '-' || c == '+') {
      // A sign starts the mantissa or the exponent (so each carries one at most) and
      // never ends the text.
      const bool startsPart = i == 0 || (exponent != std::string::npos && i == exponent + 1);
      if (!startsPart || i == n - 1) return false;
    } else if (c == '.') {
      if (point != std::string::npos || i == n - 1 || exponent != std::string::npos) {
        return false;
      }
      point = i;
    } else if (IsDigit(c)) {
      if (exponent == std::string::npos) mantissaDigit = true;
    } else {
      return false;
    }
  }
  // "1.e5": the point may not stand directly before the exponent letter.
  if (exponent != std::string::npos && point != std::string::npos && point + 1 == exponent) {
    return false;
  }
  // "-e5": a mantissa without digits is no number.
  if (!mantissaDigit) return false;
  out = QZCommon_800::Value(text).GetReal();
  return true;
}

double ScoringBaseParser::VerifyDouble(const XMLCh* text) {
  double value = 0.0;
  if (!ParseDouble(text, value)) {
    throw ScoringException(ScoringException::SCORING_EXC_INVALID_VALUE,
                           kInvalidDouble + DefaultTranscode(text));
  }
  return value;
}

double ScoringBaseParser::VerifyDouble(const std::string& text) {
  double value = 0.0;
  if (!ParseDouble(text, value)) {
    throw ScoringException(ScoringException::SCORING_EXC_INVALID_VALUE, kInvalidDouble + text);
  }
  return value;
}

}  // namespace QZScoring_800

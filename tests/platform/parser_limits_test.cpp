// The attribute limits of the safe parsers: an element with too many attributes, or an
// attribute value too long, is refused by the DOM parser and the SAX2 reader alike
// (the DOM adds attributes in time that grows with the square of their number); up to
// the limits everything is read.
#include "QZSafeParser.h"

#include <chrono>
#include <memory>
#include <sstream>
#include <string>

#include <gtest/gtest.h>
#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/dom/DOMNamedNodeMap.hpp>
#include <xercesc/sax2/SAX2XMLReader.hpp>

#include "QZXInputSource.h"
#include "XercesTestEnvironment.h"

namespace {

using QZXML_800::kQZMaxAttributeLength;
using QZXML_800::kQZMaxAttributes;
using QZXML_800::QZSafeDOMParser;
using QZXML_800::QZSafeSAX2Handler;

std::string Element(size_t attributes, size_t valueLength = 1) {
  std::string text = "<root><e";
  for (size_t i = 0; i < attributes; ++i) {
    text += " a" + std::to_string(i) + "=\"" + std::string(valueLength, 'v') + "\"";
  }
  return text + "/></root>";
}

// The DOM parse's error, or "" when a document came back (with `attributes` on <e>).
std::string DomError(const std::string& text, size_t attributes) {
  QZSafeDOMParser parser;
  std::istringstream in(text);
  std::string error;
  xercesc::DOMDocument* document = QZSafeDOMParser::ParseSafely(parser, in, &error);
  if (document == nullptr) return error.empty() ? "failed" : error;
  const auto* e = document->getDocumentElement()->getFirstElementChild();
  EXPECT_EQ(e->getAttributes()->getLength(), attributes);
  return std::string();
}

// The SAX2 parse's error, or "" when it read the whole document.
std::string SaxError(const std::string& text) {
  QZSafeSAX2Handler handler;
  std::unique_ptr<xercesc::SAX2XMLReader> reader = QZXML_800::CreateSafeSAX2Reader(handler);
  std::istringstream in(text);
  QZXML_800::QZXInputSource source(in);
  try {
    reader->parse(source);
  } catch (...) {
    std::string message;
    return QZXML_800::DescribeXMLException(std::current_exception(), &message) ? message
                                                                                : "other";
  }
  return std::string();
}

TEST(ParserLimits, AttributeCount) {
  EXPECT_EQ(DomError(Element(kQZMaxAttributes), kQZMaxAttributes), "");
  EXPECT_EQ(SaxError(Element(kQZMaxAttributes)), "");
  const std::string over = Element(kQZMaxAttributes + 1);
  EXPECT_NE(DomError(over, 0).find("more than 100 attributes"), std::string::npos);
  EXPECT_NE(SaxError(over).find("more than 100 attributes"), std::string::npos);

  // 100,000 attributes took the DOM parser minutes; refused at once now.
  const std::string huge = Element(100000);
  const auto start = std::chrono::steady_clock::now();
  EXPECT_NE(DomError(huge, 0), "");
  EXPECT_NE(SaxError(huge), "");
  EXPECT_LT(std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count(), 5.0);
}

TEST(ParserLimits, AttributeLength) {
  EXPECT_EQ(DomError(Element(2, kQZMaxAttributeLength), 2), "");
  EXPECT_EQ(SaxError(Element(2, kQZMaxAttributeLength)), "");
  const std::string over = Element(2, kQZMaxAttributeLength + 1);
  EXPECT_NE(DomError(over, 0).find("attribute value longer than"), std::string::npos);
  EXPECT_NE(SaxError(over).find("attribute value longer than"), std::string::npos);
  // Long element text is no attribute: read.
  const std::string text = "<root>" + std::string(2 * kQZMaxAttributeLength, 't') + "</root>";
  QZSafeDOMParser parser;
  std::istringstream in(text);
  EXPECT_NE(QZSafeDOMParser::ParseSafely(parser, in, nullptr), nullptr);
  EXPECT_EQ(SaxError(text), "");
}

}  // namespace

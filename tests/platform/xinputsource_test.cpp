// QZXInputSource: a Xerces-C++ input source over a std::istream.
#include "QZXInputSource.h"

#include <sstream>
#include <stdexcept>
#include <string>

#include <gtest/gtest.h>
#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>

#include "QZSafeParser.h"
#include "XercesTestEnvironment.h"

namespace {

using QZXML_800::QZSafeDOMParser;
using QZXML_800::QZXInputSource;
using QZXML_800::TranscodeToUTF8;

std::string RootName(xercesc::DOMDocument* doc) {
  return doc == nullptr ? "<none>" : TranscodeToUTF8(doc->getDocumentElement()->getTagName());
}

// A stream buffer that hands out its text and then fails with an exception.
class ThrowingBuf : public std::streambuf {
 public:
  explicit ThrowingBuf(std::string text) : text_(std::move(text)) {
    setg(&text_[0], &text_[0], &text_[0] + text_.size());
  }

 protected:
  int_type underflow() override { throw std::runtime_error("device failure"); }

 private:
  std::string text_;
};

// The source reads from wherever the stream stands, not from its beginning.
TEST(QZXInputSource, ReadsFromTheCurrentPosition) {
  std::istringstream in("not xml at all<model a=\"1\"><x/></model>");
  in.seekg(14);
  QZSafeDOMParser parser;
  std::string error;
  xercesc::DOMDocument* doc = QZSafeDOMParser::ParseSafely(parser, in, &error);
  ASSERT_NE(doc, nullptr) << error;
  EXPECT_EQ(RootName(doc), "model");

  // The source used directly with a parser, as the library's own code will.
  std::istringstream again("  <other/>");
  again.get();
  QZXInputSource source(again);
  parser.parse(source);
  EXPECT_EQ(RootName(parser.getDocument()), "other");
}

// Documents larger than one read, and streams that throw at their end or on failure.
TEST(QZXInputSource, LargeDocumentsAndThrowingStreams) {
  std::string big = "<r>";
  for (int i = 0; i < 20000; ++i) big += "<v i=\"" + std::to_string(i) + "\"/>";
  big += "</r>";
  std::istringstream in(big);
  QZSafeDOMParser parser;
  std::string error;
  xercesc::DOMDocument* doc = QZSafeDOMParser::ParseSafely(parser, in, &error);
  ASSERT_NE(doc, nullptr) << error;
  EXPECT_EQ(doc->getDocumentElement()->getChildElementCount(), 20000u);

  // A stream with exceptions enabled throws at its end; the bytes before still count.
  std::istringstream strict("<r><v/></r>");
  strict.exceptions(std::ios::failbit | std::ios::badbit | std::ios::eofbit);
  doc = QZSafeDOMParser::ParseSafely(parser, strict, &error);
  ASSERT_NE(doc, nullptr) << error;
  EXPECT_EQ(RootName(doc), "r");

  // A device failure mid-document ends the input: an error, not a crash or a tree.
  ThrowingBuf buf("<r><v/><v");
  std::istream failing(&buf);
  failing.exceptions(std::ios::badbit);
  error.clear();
  EXPECT_EQ(QZSafeDOMParser::ParseSafely(parser, failing, &error), nullptr);
  EXPECT_FALSE(error.empty());

  // A stream already failed before the parse reads as an empty document.
  std::istringstream failed("<r/>");
  failed.setstate(std::ios::failbit);
  error.clear();
  EXPECT_EQ(QZSafeDOMParser::ParseSafely(parser, failed, &error), nullptr);
  EXPECT_FALSE(error.empty());
}

}  // namespace

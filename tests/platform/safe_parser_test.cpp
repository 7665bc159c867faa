// The safe DOM parser and SAX2 reader: hostile documents are refused quickly, broken
// documents give an error instead of a truncated tree, ordinary documents parse.
#include "QZSafeParser.h"

#include <chrono>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <string>

#include <gtest/gtest.h>
#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/sax/SAXParseException.hpp>
#include <xercesc/util/XMLException.hpp>

#include "QZXInputSource.h"
#include "XercesTestEnvironment.h"

namespace {

using QZXML_800::QZSafeDOMParser;
using QZXML_800::QZSafeSAX2Handler;
using QZXML_800::QZXInputSource;
using QZXML_800::TranscodeToUTF8;

const char kBillionLaughs[] =
    "<?xml version=\"1.0\"?>\n<!DOCTYPE lolz [\n <!ENTITY lol \"lol\">\n"
    " <!ENTITY lol1 \"&lol;&lol;&lol;&lol;&lol;&lol;&lol;&lol;&lol;&lol;\">\n"
    " <!ENTITY lol2 \"&lol1;&lol1;&lol1;&lol1;&lol1;&lol1;&lol1;&lol1;&lol1;&lol1;\">\n"
    " <!ENTITY lol3 \"&lol2;&lol2;&lol2;&lol2;&lol2;&lol2;&lol2;&lol2;&lol2;&lol2;\">\n"
    " <!ENTITY lol4 \"&lol3;&lol3;&lol3;&lol3;&lol3;&lol3;&lol3;&lol3;&lol3;&lol3;\">\n"
    " <!ENTITY lol5 \"&lol4;&lol4;&lol4;&lol4;&lol4;&lol4;&lol4;&lol4;&lol4;&lol4;\">\n"
    " <!ENTITY lol6 \"&lol5;&lol5;&lol5;&lol5;&lol5;&lol5;&lol5;&lol5;&lol5;&lol5;\">\n"
    " <!ENTITY lol7 \"&lol6;&lol6;&lol6;&lol6;&lol6;&lol6;&lol6;&lol6;&lol6;&lol6;\">\n"
    " <!ENTITY lol8 \"&lol7;&lol7;&lol7;&lol7;&lol7;&lol7;&lol7;&lol7;&lol7;&lol7;\">\n"
    " <!ENTITY lol9 \"&lol8;&lol8;&lol8;&lol8;&lol8;&lol8;&lol8;&lol8;&lol8;&lol8;\">\n"
    "]>\n<lolz>&lol9;</lolz>";
const char kExternalEntity[] =
    "<?xml version=\"1.0\"?>\n<!DOCTYPE r [ <!ENTITY x SYSTEM \"file:///etc/hostname\"> ]>\n"
    "<r>&x;</r>";
const char kExternalDTD[] =
    "<?xml version=\"1.0\"?>\n<!DOCTYPE r SYSTEM \"file:///etc/hostname\">\n<r/>";

std::string Nested(int depth, bool empty_siblings = false) {
  std::string s;
  for (int i = 0; i < depth; ++i) s += "<e>";
  if (empty_siblings) s += "<leaf/>";
  for (int i = 0; i < depth; ++i) s += "</e>";
  return s;
}

// Parses with a fresh safe DOM parser; returns whether a document came back.
bool DomParses(const std::string& text, std::string* error, unsigned depth = 1000) {
  QZSafeDOMParser parser(depth);
  std::istringstream in(text);
  return QZSafeDOMParser::ParseSafely(parser, in, error) != nullptr;
}

double SecondsSince(std::chrono::steady_clock::time_point start) {
  return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

// Every attack is refused with a message, in well under a second, without touching the
// file it names.
TEST(QZSafeDOMParser, RefusesHostileDocumentsQuickly) {
  const auto start = std::chrono::steady_clock::now();
  for (const char* attack : {kBillionLaughs, kExternalEntity, kExternalDTD}) {
    std::string error;
    EXPECT_FALSE(DomParses(attack, &error)) << attack;
    EXPECT_NE(error.find("line 2"), std::string::npos) << error;
  }
  std::string error;
  EXPECT_FALSE(DomParses(Nested(100000), &error));
  EXPECT_NE(error.find("elements nested deeper than 1000 levels"), std::string::npos) << error;
  EXPECT_LT(SecondsSince(start), 2.0);
}

// The depth limit counts nesting, not elements: empty elements close themselves.
TEST(QZSafeDOMParser, DepthLimitCountsNestingOnly) {
  std::string error;
  EXPECT_TRUE(DomParses(Nested(1000), &error)) << error;
  EXPECT_FALSE(DomParses(Nested(1001), &error));
  EXPECT_TRUE(DomParses(Nested(9, true), &error, 10)) << error;
  EXPECT_FALSE(DomParses(Nested(10, true), &error, 10));

  std::string wide = "<r>";
  for (int i = 0; i < 5000; ++i) wide += "<a/><b></b>";
  wide += "</r>";
  EXPECT_TRUE(DomParses(wide, &error, 3)) << error;

  // A parser reused after a refusal starts counting afresh.
  QZSafeDOMParser parser(5);
  std::istringstream deep(Nested(6)), flat(Nested(5));
  EXPECT_EQ(QZSafeDOMParser::ParseSafely(parser, deep, &error), nullptr);
  EXPECT_NE(QZSafeDOMParser::ParseSafely(parser, flat, &error), nullptr) << error;
}

// Broken documents give an error with a position, never a truncated tree; parse()
// itself throws Xerces-C++ exceptions, which DescribeXMLException turns into text.
TEST(QZSafeDOMParser, MalformedDocumentsAreErrors) {
  std::string error;
  EXPECT_FALSE(DomParses("<a>\n<b></a>", &error));
  EXPECT_EQ(error.rfind("line 2, column", 0), 0u) << error;
  EXPECT_FALSE(DomParses("<a><b><c>text", &error));  // truncated
  EXPECT_FALSE(DomParses("", &error));
  EXPECT_FALSE(DomParses("<?xml version=\"1.!0\"?><a/>", &error));
  EXPECT_FALSE(DomParses("<a x=\"1\" x=\"2\"/>", &error));
  EXPECT_FALSE(DomParses("<p:a/>", &error));  // undeclared prefix

  QZSafeDOMParser parser;
  std::istringstream in("<a><b></a>");
  QZXInputSource source(in);
  try {
    parser.parse(source);
    ADD_FAILURE() << "parse returned normally";
  } catch (...) {
    std::string message;
    EXPECT_TRUE(QZXML_800::DescribeXMLException(std::current_exception(), &message));
    EXPECT_NE(message.find("line 1"), std::string::npos) << message;
  }
  std::string untouched = "kept";
  EXPECT_FALSE(QZXML_800::DescribeXMLException(
      std::make_exception_ptr(std::runtime_error("x")), &untouched));
  EXPECT_EQ(untouched, "kept");
}

// A caller that turned a safe setting off through the base class gets it back.
TEST(QZSafeDOMParser, ParseSafelyRestoresSafeSettings) {
  QZSafeDOMParser parser;
  parser.setLoadExternalDTD(true);
  parser.setDisableDefaultEntityResolution(false);
  parser.setErrorHandler(nullptr);
  std::istringstream in(kExternalEntity), broken("<a><b>");
  std::string error;
  EXPECT_EQ(QZSafeDOMParser::ParseSafely(parser, in, &error), nullptr);
  EXPECT_EQ(QZSafeDOMParser::ParseSafely(parser, broken, &error), nullptr);
  EXPECT_EQ(TranscodeToUTF8(u"gr\u00fc\u00df"), "gr\xc3\xbc\xc3\x9f");
}

// A scanning handler built on the safe base: records element names and text.
class RecordingHandler : public QZSafeSAX2Handler {
 public:
  using QZSafeSAX2Handler::QZSafeSAX2Handler;
  void startElement(const XMLCh* const uri, const XMLCh* const localname,
                    const XMLCh* const qname, const xercesc::Attributes& attrs) override {
    QZSafeSAX2Handler::startElement(uri, localname, qname, attrs);
    seen += TranscodeToUTF8(localname) + ";";
  }
  void characters(const XMLCh* const chars, const XMLSize_t length) override {
    text += TranscodeToUTF8(std::u16string(chars, length).c_str());
  }
  std::string seen, text;
};

// Runs a SAX2 parse; returns the message of the exception it threw, or "" when none.
std::string SaxParse(const std::string& document, RecordingHandler& handler) {
  std::unique_ptr<xercesc::SAX2XMLReader> reader = QZXML_800::CreateSafeSAX2Reader(handler);
  std::istringstream in(document);
  QZXInputSource source(in);
  try {
    reader->parse(source);
    return "";
  } catch (...) {
    std::string message = "unknown exception";
    QZXML_800::DescribeXMLException(std::current_exception(), &message);
    return message;
  }
}

// The SAX2 reader refuses every attack, never fetches a schema, and counts depth.
TEST(QZSafeSAX2Handler, RefusesHostileDocumentsQuickly) {
  const auto start = std::chrono::steady_clock::now();
  for (const char* attack : {kBillionLaughs, kExternalEntity, kExternalDTD}) {
    RecordingHandler handler;
    EXPECT_EQ(SaxParse(attack, handler).rfind("line 2, column", 0), 0u) << attack;
    EXPECT_EQ(handler.text.find("lol"), std::string::npos);
  }
  RecordingHandler deep;
  EXPECT_NE(SaxParse(Nested(100000), deep).find("elements nested deeper than 1000 levels"),
            std::string::npos);
  EXPECT_LT(SecondsSince(start), 2.0);

  // A schema location is never loaded: a schema the document breaks and one that does
  // not exist are both ignored.
  {
    std::ofstream xsd("strict.xsd");
    xsd << "<xs:schema xmlns:xs=\"http://www.w3.org/2001/XMLSchema\">"
           "<xs:element name=\"r\" type=\"xs:int\"/></xs:schema>";
  }
  for (const char* location : {"strict.xsd", "http://127.0.0.1:9/none.xsd"}) {
    RecordingHandler handler;
    const std::string doc =
        std::string("<r xmlns:xsi=\"http://www.w3.org/2001/XMLSchema-instance\" "
                    "xsi:noNamespaceSchemaLocation=\"") + location + "\">not a number</r>";
    EXPECT_EQ(SaxParse(doc, handler), "") << location;
    EXPECT_EQ(handler.text, "not a number");
  }
}

// Depth counting through a derived handler, and errors with positions.
TEST(QZSafeSAX2Handler, DepthAndErrors) {
  RecordingHandler handler(3);
  EXPECT_EQ(SaxParse("<a><b><c/><c/></b><b/></a>", handler), "");
  EXPECT_EQ(handler.seen, "a;b;c;c;b;");
  EXPECT_EQ(handler.GetElementDepth(), 0u);
  EXPECT_NE(SaxParse("<a><b><c><d/></c></b></a>", handler).find("deeper than 3"),
            std::string::npos);
  EXPECT_EQ(SaxParse("<a/>", handler), "");  // depth starts afresh

  EXPECT_EQ(SaxParse("<a>\n\n<b></a>", handler).rfind("line 3", 0), 0u);
  EXPECT_NE(SaxParse("<a>", handler), "");

  // The entity refusal itself, should a scanner ever ask.
  RecordingHandler fresh;
  EXPECT_THROW(fresh.resolveEntity(nullptr, u"file:///etc/hostname"),
               xercesc::SAXParseException);
}

}  // namespace

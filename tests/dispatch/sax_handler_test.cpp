// The SAX2 handler base that plug-ins derive from: attribute lookups by name, name
// comparisons with and without a transcoder, texts in the handler's encoding, the
// escaped echo of what it reads, and errors ending a parse.
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <xercesc/framework/MemBufInputSource.hpp>
#include <xercesc/sax2/Attributes.hpp>
#include <xercesc/util/PlatformUtils.hpp>

#include "XercesTestEnvironment.h"
#include "QZSafeParser.h"
#include "ScoringSAX2Handler.h"
#include "ScoringTranscoder.h"

using QZScoring_800::ScoringSAX2Handler;

namespace {

// Echoes every element and its text, and notes the "name" attribute of each element.
class Echo : public ScoringSAX2Handler {
 public:
  explicit Echo(const std::string& encoding) : ScoringSAX2Handler(encoding) {}
  void startElement(const XMLCh* const uri, const XMLCh* const localname,
                    const XMLCh* const qname, const xercesc::Attributes& attrs) override {
    ScoringSAX2Handler::startElement(uri, localname, qname, attrs);
    const XMLCh* name = GetAttribute(attrs, std::string("name"));
    names.push_back(name == nullptr ? "(none)" : ToString(name));
    EXPECT_EQ(name, GetAttribute(attrs, u"name"));
    EXPECT_EQ(nullptr, GetAttribute(attrs, static_cast<const XMLCh*>(nullptr)));
    if (IsEqual(qname, "Stop")) throw SCAN_DONE;
    EchoStartTag(qname, attrs);
  }
  void endElement(const XMLCh* const uri, const XMLCh* const localname,
                  const XMLCh* const qname) override {
    EchoEndTag(qname);
    ScoringSAX2Handler::endElement(uri, localname, qname);
  }
  void writeChars(const XMLByte* const bytes, const XMLSize_t count,
                  xercesc::XMLFormatter* const) override {
    echo.append(reinterpret_cast<const char*>(bytes), count);
  }
  std::string echo;
  std::vector<std::string> names;
};

// Parses the document with the handler; the value the handler threw, or -1.
int Parse(Echo& handler, const std::string& xml) {
  std::unique_ptr<xercesc::SAX2XMLReader> reader = QZXML_800::CreateSafeSAX2Reader(handler);
  xercesc::MemBufInputSource source(reinterpret_cast<const XMLByte*>(xml.data()), xml.size(),
                                    "test");
  try {
    reader->parse(source);
  } catch (ScoringSAX2Handler::HandlerState state) {
    return state;
  }
  return -1;
}

}  // namespace

TEST(SAXHandler, EchoesWithEscapesAndReadsAttributes) {
  Echo handler("");
  EXPECT_EQ(-1, Parse(handler,
                      "<?xml version='1.0' encoding='UTF-8'?><?note ignored?>"
                      "<A name='x &amp; y' other='&quot;q&quot;'> 1 &lt; 2 &amp;&gt; "
                      "<B/>caf\xC3\xA9</A>"));
  EXPECT_EQ("<A name=\"x &amp; y\" other=\"&quot;q&quot;\"> 1 &lt; 2 &amp;&gt; <B></B>caf\xC3\xA9"
            "</A>",
            handler.echo);
  EXPECT_EQ((std::vector<std::string>{"x & y", "(none)"}), handler.names);
  EXPECT_EQ(ScoringSAX2Handler::STATE_START, handler.GetState());

  // A handler may end the parse early on success.
  Echo early("");
  EXPECT_EQ(ScoringSAX2Handler::SCAN_DONE, Parse(early, "<A><Stop/><C/></A>"));
  EXPECT_EQ("<A>", early.echo);
  // A malformed document ends in a fatal error.
  Echo broken("");
  EXPECT_EQ(ScoringSAX2Handler::XML_FATAL_ERROR, Parse(broken, "<A><B></A>"));
}

// Texts come back in the handler's encoding; names compare exactly, or after
// transcoding when a transcoder is given.
TEST(SAXHandler, EncodingsAndNameComparison) {
  Echo latin("ISO-8859-1");
  EXPECT_EQ(-1, Parse(latin, "<A name='caf\xC3\xA9'/>"));
  EXPECT_EQ((std::vector<std::string>{"caf\xE9"}), latin.names);
  Echo fallback("no-such-encoding");
  EXPECT_EQ(-1, Parse(fallback, "<A name='caf\xC3\xA9'/>"));
  EXPECT_EQ((std::vector<std::string>{"caf\xC3\xA9"}), fallback.names);

  EXPECT_TRUE(ScoringSAX2Handler::IsEqual(u"Tree", "Tree"));
  EXPECT_FALSE(ScoringSAX2Handler::IsEqual(u"Tree", "tree"));
  EXPECT_TRUE(ScoringSAX2Handler::IsEqual(nullptr, ""));
  EXPECT_FALSE(ScoringSAX2Handler::IsEqual(nullptr, "x"));
  EXPECT_TRUE(ScoringSAX2Handler::IsEqual(u"caf\u00e9", "caf\xC3\xA9"));
  QZScoring_800::ScoringTranscoder latin1("ISO-8859-1");
  EXPECT_TRUE(ScoringSAX2Handler::IsEqual(&latin1, u"caf\u00e9", "caf\xE9"));
  EXPECT_FALSE(ScoringSAX2Handler::IsEqual(&latin1, u"caf\u00e9", "caf\xC3\xA9"));
  EXPECT_TRUE(ScoringSAX2Handler::IsEqual(nullptr, u"caf\u00e9", "caf\xC3\xA9"));
}

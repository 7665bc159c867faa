#include <climits>
#include <sstream>
#include <string>

#include <gtest/gtest.h>
#include <xercesc/dom/DOMDocument.hpp>

#include "QZSafeParser.h"
#include "ScoringBaseParser.h"
#include "ScoringException.h"
#include "ScoringStr.h"
#include "XercesTestEnvironment.h"

using QZScoring_800::ScoringBaseParser;
using QZScoring_800::ScoringException;
using QZScoring_800::ScoringStr;
using xercesc::DOMElement;

namespace {

// ParseInt: an optional leading sign and digits only, within the int range. The
// UTF-16 overload agrees, and a rejected text leaves the output alone.
TEST(BaseParserTest, ParseIntGrammar) {
  const struct {
    const char* text;
    bool ok;
    int value;
  } cases[] = {{"12", true, 12},          {"-12", true, -12},     {"+7", true, 7},
               {"007", true, 7},          {"2147483647", true, INT_MAX},
               {"-2147483648", true, INT_MIN},
               {"", false, 0},            {"-", false, 0},        {"+", false, 0},
               {"1-2", false, 0},         {"--1", false, 0},      {"+-1", false, 0},
               {"1.0", false, 0},         {" 1", false, 0},       {"1 ", false, 0},
               {"1e3", false, 0},         {"2147483648", false, 0}};
  for (const auto& c : cases) {
    int narrow = 99;
    int wide = 99;
    EXPECT_EQ(ScoringBaseParser::ParseInt(std::string(c.text), narrow), c.ok) << c.text;
    EXPECT_EQ(ScoringBaseParser::ParseInt(ScoringStr(c.text).xc_str(), wide), c.ok) << c.text;
    EXPECT_EQ(narrow, c.ok ? c.value : 99) << c.text;
    EXPECT_EQ(wide, narrow) << c.text;
  }
  int out = 99;
  EXPECT_FALSE(ScoringBaseParser::ParseInt(static_cast<const XMLCh*>(nullptr), out));
}

// ParseDouble: one optional sign per mantissa and exponent, one point before the
// exponent letter, digits in the mantissa; no blanks, words or hexadecimal.
TEST(BaseParserTest, ParseDoubleGrammar) {
  const struct {
    const char* text;
    bool ok;
    double value;
  } cases[] = {{"1", true, 1},         {"-1.5", true, -1.5},  {".5", true, 0.5},
               {"1e5", true, 1e5},     {"1E-5", true, 1e-5},  {"-2.5e+3", true, -2500},
               {"+.5", true, 0.5},     {"-0.25E2", true, -25},
               {"1.", false, 0},       {"e5", false, 0},      {"1e", false, 0},
               {"1e5e", false, 0},     {"1e5E2", false, 0},   {"1.e5", false, 0},
               {"1e5.0", false, 0},    {"1..2", false, 0},    {"-", false, 0},
               {"1-", false, 0},       {"inf", false, 0},     {"nan", false, 0},
               {"-e5", false, 0},      {"1-2e-5", false, 0},  {"+-1", false, 0},
               {"1e+-5", false, 0},    {" 1", false, 0},      {"0x10", false, 0},
               {"", false, 0}};
  for (const auto& c : cases) {
    double narrow = 99;
    double wide = 99;
    EXPECT_EQ(ScoringBaseParser::ParseDouble(std::string(c.text), narrow), c.ok) << c.text;
    EXPECT_EQ(ScoringBaseParser::ParseDouble(ScoringStr(c.text).xc_str(), wide), c.ok)
        << c.text;
    EXPECT_DOUBLE_EQ(narrow, c.ok ? c.value : 99) << c.text;
    EXPECT_EQ(wide, narrow) << c.text;
  }
  // A non-ASCII digit (Arabic-Indic one) is no digit here.
  const XMLCh arabicOne[] = {u'1', 0x0661, 0};
  double out = 0;
  EXPECT_FALSE(ScoringBaseParser::ParseDouble(arabicOne, out));
}

// Verify*: the value, or ScoringException code 3 naming the rejected text.
TEST(BaseParserTest, VerifyThrowsCodeThreeWithText) {
  EXPECT_EQ(ScoringBaseParser::VerifyInt(std::string("-4")), -4);
  EXPECT_DOUBLE_EQ(ScoringBaseParser::VerifyDouble(ScoringStr("2.5").xc_str()), 2.5);
  const auto expectThrow = [](auto call, const std::string& message) {
    try {
      call();
      ADD_FAILURE() << "no exception for " << message;
    } catch (const ScoringException& e) {
      EXPECT_EQ(e.GetErrorCode(), 3);
      EXPECT_EQ(e.GetErrorMessage(), message);
    }
  };
  expectThrow([] { ScoringBaseParser::VerifyDouble(std::string("x1")); },
              "Invalid double string -- x1");
  expectThrow([] { ScoringBaseParser::VerifyDouble(ScoringStr("1.").xc_str()); },
              "Invalid double string -- 1.");
  expectThrow([] { ScoringBaseParser::VerifyInt(ScoringStr("1.0").xc_str()); },
              "Invalid integer string -- 1.0");
}

class BaseParserDomTest : public ::testing::Test {
 protected:
  void SetUp() override {
    std::istringstream in(
        "<r a='1' empty='' bad='abc' d='2.5'>text<!--c--><x/>text<y k='v'/>"
        "<x id='2'><x/></x><p:y xmlns:p='urn:p'/></r>");
    std::string error;
    doc_ = QZXML_800::QZSafeDOMParser::ParseSafely(parser_, in, &error);
    ASSERT_NE(doc_, nullptr) << error;
    root_ = doc_->getDocumentElement();
  }
  std::string Text(const XMLCh* text) { return ScoringStr(text).toUTF8(); }

  QZXML_800::QZSafeDOMParser parser_;
  xercesc::DOMDocument* doc_ = nullptr;
  DOMElement* root_ = nullptr;
};

// Navigation skips text and comment nodes and other tags; tag comparison is exact on
// the node name, prefix included; null nodes give null.
TEST_F(BaseParserDomTest, NavigationByTag) {
  DOMElement* y = ScoringBaseParser::GetFirstChildElement(root_, "y");
  ASSERT_NE(y, nullptr);
  EXPECT_EQ(Text(ScoringBaseParser::GetAttribute(y, "k")), "v");
  DOMElement* x2 = ScoringBaseParser::GetNextSiblingElement(y, "x");
  ASSERT_NE(x2, nullptr);
  EXPECT_EQ(Text(ScoringBaseParser::GetAttribute(x2, "id")), "2");
  EXPECT_EQ(ScoringBaseParser::GetNextSiblingElement(x2, "x"), nullptr);
  EXPECT_NE(ScoringBaseParser::GetNextSiblingElement(x2, "p:y"), nullptr);

  DOMElement* first = ScoringBaseParser::GetFirstChildElement(root_);
  ASSERT_NE(first, nullptr);
  EXPECT_TRUE(ScoringBaseParser::TagNameEquals(first, "x"));
  EXPECT_EQ(ScoringBaseParser::GetNextSiblingElement(first), y);
  EXPECT_EQ(ScoringBaseParser::GetFirstChildElement(y), nullptr);

  EXPECT_FALSE(ScoringBaseParser::TagNameEquals(y, "Y"));
  EXPECT_FALSE(ScoringBaseParser::TagNameEquals(y, "y "));
  EXPECT_FALSE(ScoringBaseParser::TagNameEquals(nullptr, "y"));
  EXPECT_EQ(ScoringBaseParser::AsElement(root_->getFirstChild()), nullptr);  // text
  EXPECT_EQ(ScoringBaseParser::AsElement(y, "y"), y);
  EXPECT_EQ(ScoringBaseParser::AsElement(y, "x"), nullptr);
  EXPECT_EQ(ScoringBaseParser::GetFirstChildElement(nullptr, "y"), nullptr);
  EXPECT_EQ(ScoringBaseParser::GetNextSiblingElement(nullptr), nullptr);

  ASSERT_NE(ScoringBaseParser::GetElementsByTagName(doc_, "x"), nullptr);
  EXPECT_EQ(ScoringBaseParser::GetElementsByTagName(doc_, "x")->getLength(), 3u);
  EXPECT_EQ(ScoringBaseParser::GetElementsByTagName(x2, "x")->getLength(), 1u);
  EXPECT_EQ(ScoringBaseParser::GetElementsByTagName(static_cast<DOMElement*>(nullptr), "x"),
            nullptr);
}

// Attributes: absent is null, empty is "", and the numeric readers answer -1/0/1.
TEST_F(BaseParserDomTest, Attributes) {
  EXPECT_EQ(ScoringBaseParser::GetAttribute(root_, "none"), nullptr);
  const XMLCh* empty = ScoringBaseParser::GetAttribute(root_, "empty");
  ASSERT_NE(empty, nullptr);
  EXPECT_EQ(*empty, 0);
  EXPECT_EQ(ScoringBaseParser::GetAttribute(root_->getFirstChild(), "a"), nullptr);
  EXPECT_EQ(ScoringBaseParser::GetAttribute(static_cast<xercesc::DOMNode*>(root_), "a"),
            ScoringBaseParser::GetAttribute(root_, "a"));

  int i = 7;
  EXPECT_EQ(ScoringBaseParser::GetIntAttribute(root_, "none", i), -1);
  EXPECT_EQ(ScoringBaseParser::GetIntAttribute(root_, "bad", i), 1);
  EXPECT_EQ(ScoringBaseParser::GetIntAttribute(root_, "d", i), 1);
  EXPECT_EQ(i, 7);
  EXPECT_EQ(ScoringBaseParser::GetIntAttribute(root_, "a", i), 0);
  EXPECT_EQ(i, 1);
  double d = 7;
  EXPECT_EQ(ScoringBaseParser::GetDoubleAttribute(root_, "none", d), -1);
  EXPECT_EQ(ScoringBaseParser::GetDoubleAttribute(root_, "empty", d), 1);
  EXPECT_EQ(d, 7);
  EXPECT_EQ(ScoringBaseParser::GetDoubleAttribute(root_, "d", d), 0);
  EXPECT_EQ(d, 2.5);
  EXPECT_EQ(ScoringBaseParser::GetIntAttribute(nullptr, "a", i), -1);
}

// Conversion: the default transcoding, a configured code page, a refused encoding.
TEST(BaseParserTest, TextConversionAndTranscoder) {
  ScoringBaseParser parser;
  EXPECT_EQ(parser.ToString(nullptr), "");
  EXPECT_EQ(parser.ToString(ScoringStr("abc").xc_str()), "abc");
  EXPECT_TRUE(ScoringBaseParser::IsEqual(ScoringStr("DataField").xc_str(), "DataField"));
  EXPECT_FALSE(ScoringBaseParser::IsEqual(ScoringStr("DataField").xc_str(), "datafield"));
  EXPECT_FALSE(ScoringBaseParser::IsEqual(nullptr, "x"));

  const XMLCh eAcute[] = {0x00E9, 0};
  parser.CreateTranscoder("ISO-8859-1");
  ASSERT_NE(parser.GetTranscoder(), nullptr);
  EXPECT_EQ(parser.ToString(eAcute), "\xE9");
  EXPECT_TRUE(parser.IsEqualEx(eAcute, "\xE9"));
  parser.CreateTranscoder("");  // UTF-8
  EXPECT_EQ(parser.ToString(eAcute), "\xC3\xA9");
  EXPECT_FALSE(parser.IsEqualEx(eAcute, "\xE9"));
  parser.CreateTranscoder("no-such-encoding");
  ASSERT_NE(parser.GetTranscoder(), nullptr);
  EXPECT_EQ(parser.ToString(eAcute), "");
  parser.FreeTranscoder();
  EXPECT_EQ(parser.GetTranscoder(), nullptr);
  EXPECT_TRUE(parser.IsEqualEx(ScoringStr("abc").xc_str(), "abc"));
}

}  // namespace

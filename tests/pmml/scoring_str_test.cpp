// ScoringStr: null versus empty, editing, number conversion and UTF-8 round trips.
#include "ScoringStr.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

#include "XercesTestEnvironment.h"

namespace QZScoring_800 {
namespace {

std::u16string Text(const ScoringStr& s) {
  return s.xc_str() != nullptr ? std::u16string(s.xc_str()) : u"<null>";
}

// Null content and an empty buffer look alike to empty/length/equals but not to
// xc_str and operator==.
TEST(ScoringStrTest, NullAndEmptyAreDistinctStates) {
  const ScoringStr null;
  const ScoringStr empty(u"");
  EXPECT_EQ(null.xc_str(), nullptr);
  ASSERT_NE(empty.xc_str(), nullptr);
  EXPECT_TRUE(null.empty());
  EXPECT_TRUE(empty.empty());
  EXPECT_EQ(null.length(), 0u);
  EXPECT_EQ(empty.length(), 0u);
  EXPECT_TRUE(empty.equals(nullptr));
  EXPECT_TRUE(null.equals(u""));
  EXPECT_FALSE(null == empty);
  EXPECT_TRUE(empty == ScoringStr(u""));
  EXPECT_TRUE(ScoringStr(u"abc") == ScoringStr(u"abc"));
  EXPECT_FALSE(ScoringStr(u"abc") == ScoringStr(u"abd"));

  EXPECT_EQ(ScoringStr(static_cast<const XMLCh*>(nullptr)).xc_str(), nullptr);
  EXPECT_EQ(ScoringStr(static_cast<const char*>(nullptr)).xc_str(), nullptr);
  EXPECT_EQ(Text(ScoringStr(std::string())), u"");  // never null
  EXPECT_EQ(Text(ScoringStr("narrow")), u"narrow");
  EXPECT_NE(ScoringStr(std::string("\xFF\xFE")).xc_str(), nullptr);  // no valid text
}

// Copies are independent, self-assignment (also from the own buffer) keeps the text,
// and every assignment replaces the content.
TEST(ScoringStrTest, CopiesAndAssignmentsAreIndependent) {
  ScoringStr original(u"abc");
  ScoringStr copy(original);
  original.append(u"d");
  EXPECT_EQ(Text(copy), u"abc");

  ScoringStr& same = copy;
  copy = same;  // self-assignment
  EXPECT_EQ(Text(copy), u"abc");
  copy = copy.xc_str();
  EXPECT_EQ(Text(copy), u"abc");
  copy = ScoringStr();
  EXPECT_EQ(copy.xc_str(), nullptr);
  copy = "xyz";
  EXPECT_EQ(Text(copy), u"xyz");
  copy = static_cast<const char*>(nullptr);
  EXPECT_EQ(copy.xc_str(), nullptr);

  copy.assign(u'q');
  EXPECT_EQ(Text(copy), u"q");
  copy.assign(0);
  EXPECT_EQ(Text(copy), u"");
}

// Appending to null copies the argument; null, empty and zero arguments change nothing.
TEST(ScoringStrTest, AppendHandlesNullEmptyAndItself) {
  ScoringStr s;
  s.append(static_cast<const XMLCh*>(nullptr));
  s.append(u"");
  s.append(XMLCh(0));
  s.append(static_cast<const char*>(nullptr));
  s.append("");
  s.append(ScoringStr());
  EXPECT_EQ(s.xc_str(), nullptr);

  s.append(u"ab");
  s.append(u'c');
  s.append("de");
  EXPECT_EQ(Text(s), u"abcde");
  s.append(s);
  EXPECT_EQ(Text(s), u"abcdeabcde");
  s.append(s.xc_str() + 8);
  EXPECT_EQ(Text(s), u"abcdeabcdede");
}

// Search and replace: leftmost, non-overlapping, and the empty result is null.
TEST(ScoringStrTest, ContainsAndReplaceSubstring) {
  EXPECT_FALSE(ScoringStr(u"ab").ContainsString(u"abc"));
  EXPECT_TRUE(ScoringStr(u"abc").ContainsString(u"bc"));
  EXPECT_TRUE(ScoringStr(u"abc").ContainsString(u""));
  EXPECT_FALSE(ScoringStr(u"abc").ContainsString(nullptr));
  EXPECT_FALSE(ScoringStr().ContainsString(u""));

  ScoringStr s(u"abcdabc");
  EXPECT_EQ(s.replaceSubstring(u"abc", u"X"), 2u);
  EXPECT_EQ(Text(s), u"XdX");

  s = u"aaaa";
  EXPECT_EQ(s.replaceSubstring(u"aa", u"b"), 2u);
  EXPECT_EQ(Text(s), u"bb");

  s = u"aaa";
  EXPECT_EQ(s.replaceSubstring(u"aa", u"aaaa"), 1u);
  EXPECT_EQ(Text(s), u"aaaaa");

  s = u"xyz";
  EXPECT_EQ(s.replaceSubstring(u"q", u"r"), 0u);
  EXPECT_EQ(s.replaceSubstring(u"", u"r"), 0u);
  EXPECT_EQ(s.replaceSubstring(nullptr, u"r"), 0u);
  EXPECT_EQ(Text(s), u"xyz");

  s = u"a-b-c";
  EXPECT_EQ(s.replaceSubstring(u"-", u""), 2u);
  EXPECT_EQ(Text(s), u"abc");
  EXPECT_EQ(s.replaceSubstring(u"abc", nullptr), 1u);
  EXPECT_EQ(s.xc_str(), nullptr);
}

// truncateString removes units from the end; convertToInteger reads plain digits only.
TEST(ScoringStrTest, TruncateAndConvertToInteger) {
  ScoringStr s(u"hello");
  s.truncateString(2);
  EXPECT_EQ(Text(s), u"hel");
  EXPECT_EQ(s.length(), 3u);
  s.truncateString(0);
  EXPECT_EQ(Text(s), u"hel");
  s.truncateString(10);
  EXPECT_EQ(Text(s), u"");
  ScoringStr null;
  null.truncateString(1);
  EXPECT_EQ(null.xc_str(), nullptr);

  EXPECT_EQ(ScoringStr(u"0042").convertToInteger(), 42u);
  EXPECT_EQ(ScoringStr(u"-5").convertToInteger(), 0u);
  EXPECT_EQ(ScoringStr(u"4 2").convertToInteger(), 0u);
  EXPECT_EQ(ScoringStr(u"4294967295").convertToInteger(), UINT32_MAX);
  EXPECT_EQ(ScoringStr(u"4294967296").convertToInteger(), 0u);
  EXPECT_EQ(ScoringStr(u"\x0663").convertToInteger(), 0u);  // Arabic-Indic three
  EXPECT_EQ(ScoringStr(u"").convertToInteger(), 0u);
  EXPECT_EQ(ScoringStr().convertToInteger(), 0u);
}

// UTF-8 both ways, including surrogate pairs and texts longer than one step.
TEST(ScoringStrTest, Utf8RoundTrips) {
  EXPECT_EQ(ScoringStr(u"\u00e9").toUTF8(), "\xC3\xA9");
  EXPECT_EQ(ScoringStr().toUTF8(), "");

  ScoringStr s;
  s.assignUTF8("\xC3\xA9");
  EXPECT_EQ(Text(s), u"\u00e9");
  s.assignUTF8("");
  EXPECT_EQ(s.xc_str(), nullptr);

  // An odd prefix puts step boundaries inside multi-byte characters and pairs.
  std::u16string wide = u"a";
  for (int i = 0; i < 700; ++i) wide += u"\u00e9\u20ac\U0001F600x";
  const std::string utf8 = ScoringStr(wide.c_str()).toUTF8();
  ASSERT_EQ(utf8.size(), 1u + 700u * (2 + 3 + 4 + 1));
  EXPECT_EQ(utf8.substr(0, 11), "a\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80x");
  s.assignUTF8(utf8);
  EXPECT_EQ(Text(s), wide);
}

// Malformed input ends a conversion exactly before the first bad character, wherever
// the conversion steps fall; it never crashes or loops.
TEST(ScoringStrTest, MalformedInputStopsBeforeTheFirstBadCharacter) {
  const std::string valid(2500, 'v');
  const char* const badTails[] = {"\xFF", "\xC3", "\xE2\x82", "\xC3(", "\xED\xA0\x80",
                                  "\xF8\x88\x80\x80\x80", "\xC0\xAF", "\x80"};
  for (const char* tail : badTails) {
    SCOPED_TRACE(tail);
    ScoringStr s;
    s.assignUTF8(valid + tail + "after");
    EXPECT_EQ(Text(s), std::u16string(valid.begin(), valid.end()));
  }

  ScoringStr s;
  s.assignUTF8("\xFF");
  EXPECT_EQ(s.xc_str(), nullptr);  // nothing decoded
  s.assignUTF8("\xF0\x9F\x98");  // a lone incomplete sequence
  EXPECT_EQ(s.xc_str(), nullptr);
  s.assignUTF8("ab\xF0\x9F\x98");
  EXPECT_EQ(Text(s), u"ab");
  s.assignUTF8(std::string("ab\0cd", 5));
  EXPECT_EQ(Text(s), u"ab");

  // Unpaired surrogates are not encoded (not even as invalid UTF-8).
  const XMLCh loneHigh[] = {u'a', u'b', 0xD800, 0};
  const XMLCh highBeforeText[] = {u'a', 0xD83D, u'b', 0};
  const XMLCh loneLow[] = {u'a', 0xDC00, u'b', 0};
  const XMLCh reversed[] = {u'a', 0xDE00, 0xD83D, u'b', 0};
  EXPECT_EQ(ScoringStr(loneHigh).toUTF8(), "ab");
  EXPECT_EQ(ScoringStr(highBeforeText).toUTF8(), "a");
  EXPECT_EQ(ScoringStr(loneLow).toUTF8(), "a");
  EXPECT_EQ(ScoringStr(reversed).toUTF8(), "a");
  std::u16string longText(1500, u'\u00e9');
  longText += static_cast<char16_t>(0xDC00);
  longText += u"tail";
  std::string expected;
  for (int i = 0; i < 1500; ++i) expected += "\xC3\xA9";
  EXPECT_EQ(ScoringStr(longText.c_str()).toUTF8(), expected);
}

}  // namespace
}  // namespace QZScoring_800

// ScoringTranscoder: encodings found and refused, and conversion across steps.
#include "ScoringTranscoder.h"

#include <gtest/gtest.h>

#include <string>

#include "XercesTestEnvironment.h"

namespace QZScoring_800 {
namespace {

// The default, a null and an empty name all give UTF-8; null text converts to "".
TEST(ScoringTranscoderTest, DefaultAndEmptyNamesMeanUtf8) {
  const ScoringTranscoder byDefault;
  const ScoringTranscoder fromNull(nullptr);
  const ScoringTranscoder fromEmpty("");
  for (const ScoringTranscoder* t : {&byDefault, &fromNull, &fromEmpty}) {
    ASSERT_TRUE(t->IsValid());
    EXPECT_EQ(t->TranscodeTo(u"a\u00e9\U0001F600"), "a\xC3\xA9\xF0\x9F\x98\x80");
    EXPECT_EQ(t->TranscodeTo(nullptr), "");
    EXPECT_EQ(t->TranscodeTo(u""), "");
  }
}

// An unknown encoding leaves the transcoder invalid and every result empty.
TEST(ScoringTranscoderTest, UnknownEncodingIsInvalid) {
  const ScoringTranscoder unknown("QZ-NO-SUCH-ENCODING");
  EXPECT_FALSE(unknown.IsValid());
  EXPECT_EQ(unknown.TranscodeTo(u"abc"), "");
}

// A single-byte code page converts what it can and stops at the first character it
// cannot represent; long texts convert completely across steps.
TEST(ScoringTranscoderTest, ConvertsInStepsAndStopsAtUnrepresentable) {
  const ScoringTranscoder latin1("ISO-8859-1");
  ASSERT_TRUE(latin1.IsValid());
  EXPECT_EQ(latin1.TranscodeTo(u"a\u00e9b"), "a\xE9" "b");
  EXPECT_EQ(latin1.TranscodeTo(u"ab\u20acc"), "ab");

  std::u16string longText(3001, u'\u00e9');
  EXPECT_EQ(latin1.TranscodeTo(longText.c_str()), std::string(3001, '\xE9'));
  EXPECT_EQ(latin1.TranscodeTo((longText + u"\u20ac").c_str()), std::string(3001, '\xE9'));
  std::string expectedUtf8;
  for (int i = 0; i < 3001; ++i) expectedUtf8 += "\xC3\xA9";
  EXPECT_EQ(ScoringTranscoder().TranscodeTo(longText.c_str()), expectedUtf8);
}

}  // namespace
}  // namespace QZScoring_800

// Regressions for faults the fuzz harnesses found in the PMML text services.
#include <gtest/gtest.h>

#include <string>

#include "ScoringStr.h"
#include "XercesTestEnvironment.h"

namespace QZScoring_800 {
namespace {

// A sequence led by 0xF5, 0xF6 or 0xF7 (a value beyond U+10FFFF) after more than 32
// decoded characters was skipped and decoding went on behind it, so the text kept
// characters that follow malformed input. Decoding must end there, wherever it is.
TEST(FuzzFindings, StringsUtf8BeyondU10FFFFEndsDecoding) {
  for (const char* invalid : {"\xF5\x80\x80\x80", "\xF6\x90\x80\x80", "\xF7\xBF\xBF\xBF"}) {
    for (size_t before : {0u, 10u, 33u, 40u, 999u, 1000u, 1001u, 2500u}) {
      const std::string prefix(before, 'a');
      ScoringStr text;
      text.assignUTF8(prefix + invalid + "after");
      EXPECT_EQ(text.length(), before) << before;
      EXPECT_EQ(text.toUTF8(), prefix) << before;
    }
  }
  // After characters of four bytes (two units each) as well.
  std::string pairs;
  for (int i = 0; i < 20; ++i) pairs += "\xF0\x90\x80\x80";
  ScoringStr text;
  text.assignUTF8(pairs + "\xF6\x90\x80\x80" + "z");
  EXPECT_EQ(text.length(), 40u);
  EXPECT_EQ(text.toUTF8(), pairs);
}

}  // namespace
}  // namespace QZScoring_800

// The replacement text of the replace function: the references to the text around the
// match ($` and $'), one- and two-digit group numbers, and a '$' that is no reference.
#include "XercesTestEnvironment.h"
#include "QZTransformation.h"

#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "Value.h"
#include "ValueRecord.h"

namespace {

using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;

// replace(text, pattern, replacement), all three constants.
Value Replace(const std::string& text, const std::string& pattern,
              const std::string& replacement) {
  QZTransformation t;
  std::istringstream in(
      "<PMML version=\"4.4\"><TransformationDictionary><DerivedField name=\"r\">"
      "<Apply function=\"replace\"><Constant>" + text + "</Constant><Constant>" + pattern +
      "</Constant><Constant>" + replacement + "</Constant></Apply></DerivedField>"
      "</TransformationDictionary></PMML>");
  const QZStatus loaded = t.AddPMML(in, false);
  EXPECT_TRUE(loaded.IsOK()) << t.GetLastError();
  ValueRecord record;
  const QZStatus status = t.Transform(record);
  EXPECT_TRUE(status.IsOK()) << t.GetLastError();
  return record.Get("r");
}

TEST(RegexReplacement, TextAroundTheMatch) {
  EXPECT_EQ(Replace("abc", "b", "[$`]"), Value("a[a]c"));
  EXPECT_EQ(Replace("abc", "b", "[$&apos;]"), Value("a[c]c"));
  // Each match sees the whole text, not what earlier replacements made of it.
  EXPECT_EQ(Replace("a-b-c", "-", "($`)"), Value("a(a)b(a-b)c"));
  EXPECT_EQ(Replace("xy", "$", "[$`]"), Value("xy[xy]"));
}

TEST(RegexReplacement, GroupNumbers) {
  const std::string eleven = "(a)(b)(c)(d)(e)(f)(g)(h)(i)(j)(k)";
  EXPECT_EQ(Replace("abcdefghijk", eleven, "$11$10$1"), Value("kja"));
  // With fewer groups, the second digit is text: $12 is group 1, then "2".
  EXPECT_EQ(Replace("ab", "(a)", "$12"), Value("a2b"));
  // A group that does not exist, or $0, stays as written; so does a '$' before another
  // character or at the end.
  EXPECT_EQ(Replace("ab", "(a)", "$2"), Value("$2b"));
  EXPECT_EQ(Replace("ab", "(a)", "$0"), Value("$0b"));
  EXPECT_EQ(Replace("ab", "a", "$x$"), Value("$x$b"));
  // A group that took no part in the match gives nothing.
  EXPECT_EQ(Replace("b", "(a)?b", "[$1]"), Value("[]"));
}

}  // namespace

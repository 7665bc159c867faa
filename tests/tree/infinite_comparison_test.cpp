// Comparisons with numbers too large for a double. "1e400" reads as infinity, and the
// ranges of a split have open infinite ends, so x < 1e400 used to become a split that
// held for missing input only: false for every number, silently. Such comparisons are
// refused now, as infinity words are; large finite numbers still compare as written.
#include <memory>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "QZSettings.h"
#include "QZVarList.h"
#include "ScoringPMMLParser.h"
#include "ScoringPredicate.h"
#include "ScoringScorerFactory.h"
#include "ValueRecord.h"
#include "XercesTestEnvironment.h"

namespace {

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringPredicate;
using QZScoring_800::ScoringScorerFactory;

class InfiniteComparison : public ::testing::Test {
 protected:
  void SetUp() override {
    std::istringstream dictionary(
        R"(<DataDictionary><DataField name="x" optype="continuous" dataType="double"/>
           </DataDictionary>)");
    QZScoring_800::ScoringPMMLParser parser;
    ASSERT_TRUE(parser.FillVarList(vars_, dictionary).IsOK());
  }

  std::unique_ptr<ScoringPredicate> Get(const std::string& op, const std::string& value) {
    std::istringstream in("<SimplePredicate field=\"x\" operator=\"" + op + "\" value=\"" + value +
                          "\"/>");
    QZXML_800::QZSettings settings;
    return std::unique_ptr<ScoringPredicate>(
        ScoringScorerFactory::GetPredicate(settings, vars_, in));
  }

  QZXML_800::QZVarList vars_;
};

TEST_F(InfiniteComparison, RefusedForEveryOperator) {
  for (const char* op : {"lessThan", "lessOrEqual", "greaterThan", "greaterOrEqual", "equal"}) {
    for (const char* value : {"1e400", "-1e400", "1E+999", "-123456789e9999"}) {
      EXPECT_EQ(Get(op, value), nullptr) << op << " " << value;
    }
  }
}

TEST_F(InfiniteComparison, FiniteExtremesCompareAsWritten) {
  ValueRecord record;
  record.Add("x", 0.0);
  const auto below = Get("lessThan", "1e308");
  ASSERT_NE(below, nullptr);
  EXPECT_EQ(below->Evaluate(record), ScoringPredicate::PREDICATE_TRUE);
  const auto above = Get("greaterThan", "-1.7e308");
  ASSERT_NE(above, nullptr);
  EXPECT_EQ(above->Evaluate(record), ScoringPredicate::PREDICATE_TRUE);
  // Underflow is zero: 0 < 1e-400 is false, 0 <= 1e-400 true.
  const auto tiny = Get("lessThan", "1e-400");
  ASSERT_NE(tiny, nullptr);
  EXPECT_EQ(tiny->Evaluate(record), ScoringPredicate::PREDICATE_FALSE);
  const auto tinyOrEqual = Get("lessOrEqual", "1e-400");
  ASSERT_NE(tinyOrEqual, nullptr);
  EXPECT_EQ(tinyOrEqual->Evaluate(record), ScoringPredicate::PREDICATE_TRUE);
  record[0] = Value(1e300);
  EXPECT_EQ(below->Evaluate(record), ScoringPredicate::PREDICATE_TRUE);
}

}  // namespace

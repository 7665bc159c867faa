// The scorer base as a plug-in would use it, and the neutral progress reporter.

#include <gtest/gtest.h>

#include "QZMV.h"
#include "ScoringBaseScorer.h"
#include "ScoringReporter.h"
#include "ScoringStatusCodes.h"
#include "ValueRecord.h"

using QZCommon_800::QZStatus;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringBaseScorer;

namespace {

// A plug-in-style scorer that overrides only what it must and delegates to the base.
class DelegatingScorer : public ScoringBaseScorer {
 public:
  using ScoringBaseScorer::ScoringBaseScorer;
  QZStatus Score(const ValueRecord& input, ValueRecord& output) override {
    return ScoringBaseScorer::Score(input, output);
  }
  QZStatus Scorable(ValueRecord& record) override { return ScoringBaseScorer::Scorable(record); }
};

}  // namespace

TEST(ScoringBaseScorer, DefaultsAndSharedSettings) {
  QZXML_800::QZSettings modelSettings;
  QZXML_800::QZVarList variables;
  variables.AddContVar("x", "x", QZXML_800::ROLE_INPUT);
  DelegatingScorer scorer(modelSettings, variables);
  EXPECT_FALSE(scorer.IsReady());
  EXPECT_EQ(scorer.GetType(), "UNKNOWN");

  ValueRecord input, output;
  input["x"] = 1.0;
  EXPECT_EQ(scorer.Score(input, output).GetErrorCode(), QZScoring_800::SCORING_NOT_SUPPORTED);
  EXPECT_EQ(scorer.Scorable(output).GetErrorCode(), 260016);
  EXPECT_EQ(output.Size(), 0u);

  // SetSettings writes into the object given at construction, which a copy shares; the
  // variable list is the scorer's own copy.
  QZXML_800::QZSettings replacement;
  replacement.AddSetting("k", "v", true);
  DelegatingScorer copy(scorer);
  copy.SetSettings(replacement);
  std::string text;
  EXPECT_TRUE(modelSettings.GetSettingValByName("k", text));
  EXPECT_EQ(&scorer.GetSettings(), &modelSettings);
  variables.AddContVar("y", "y", QZXML_800::ROLE_INPUT);
  EXPECT_EQ(scorer.GetVarList().Size(), 1);
  copy.SetVarList(variables);
  EXPECT_EQ(copy.GetVarList().Size(), 2);
  EXPECT_EQ(scorer.GetVarList().Size(), 1);
}

TEST(ScoringReporter, NeutralAnswers) {
  QZScoring_800::ScoringReporter reporter;
  EXPECT_EQ(reporter.GetCurrentStepNum(), 0);
  reporter.SetCurrentStepNum(5);
  EXPECT_EQ(reporter.GetCurrentStepNum(), 5);
  QZCommon_800::ProgressReport& report = reporter;
  EXPECT_EQ(report.DiscreteMeasure("anything"), 1);
  EXPECT_TRUE(QZCommon_800::QZMV::IsMissing(report.ScaleMeasure("x")));
}

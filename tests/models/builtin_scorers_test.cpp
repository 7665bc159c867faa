// The library's own scorers for transformations-only and time-series XML documents.

#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "ScoringHRZXMLScorer.h"
#include "ScoringModelAttr.h"
#include "ScoringStatusCodes.h"
#include "ScoringTransformationsScorer.h"
#include "XercesTestEnvironment.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringHRZXMLScorer;
using QZScoring_800::ScoringModelAttr;
using QZScoring_800::ScoringTransformationsScorer;
using QZXML_800::QZSettings;
using QZXML_800::QZVarList;

namespace {

// "transformations" holds one empty entry per derived field; Score is not supported.
TEST(BuiltinScorers, TransformationsScorer) {
  QZSettings settings;
  QZVarList variables;
  ScoringTransformationsScorer scorer(&settings, &variables, {"a", "b"});
  ValueRecord record;
  ASSERT_TRUE(scorer.Scorable(record).IsOK());
  ASSERT_EQ(record.Size(), 1u);
  EXPECT_EQ(record.GetName(0), "transformations");
  EXPECT_EQ(record[0].GetEntryNames(), (std::vector<std::string>{"a", "b"}));

  ScoringTransformationsScorer empty(&settings, &variables, {});
  ValueRecord alone;
  ASSERT_TRUE(empty.Scorable(alone).IsOK());
  EXPECT_EQ(alone.Names(), std::vector<std::string>{"transformations"});
  EXPECT_TRUE(alone[0].IsNull());

  ValueRecord out;
  EXPECT_EQ(scorer.Score(record, out).GetErrorCode(), QZScoring_800::SCORING_NOT_SUPPORTED);
  EXPECT_EQ(out.Size(), 0u);
}

// What the constructor records from each document, and the fields every scorer
// declares whatever it read.
TEST(BuiltinScorers, HRZXMLScorer) {
  struct Case {
    const char* document;
    const char* appName;
    const char* appVersion;
    const char* variable;  // null: no variable added
  } cases[] = {
      {"<HRZXML><Header><Application name=\"Forecaster\" version=\"2.1\"/></Header>"
       "<Models><ARIMAModel variableID=\"sales\"/></Models></HRZXML>",
       "Forecaster", "2.1", "sales"},
      // ExpSmoothingModel wins over an earlier ARIMAModel.
      {"<HRZXML><ARIMAModel variableID=\"b\"/><ExpSmoothingModel variableID=\"a\"/></HRZXML>",
       "", "", "a"},
      {"<HRZXML><Header><Application name=\"\" version=\"\"/></Header>"
       "<CrostonModel variableID=\"\"/></HRZXML>",
       "", "", nullptr},
      {"<PMML><Header><Application name=\"x\"/></Header><ARIMAModel variableID=\"s\"/></PMML>",
       "", "", nullptr},
      {"this is not XML", "", "", nullptr},
      {"<!DOCTYPE HRZXML [<!ENTITY n \"evil\">]><HRZXML><Header>"
       "<Application name=\"&n;\"/></Header></HRZXML>",
       "", "", nullptr},
  };
  for (const Case& c : cases) {
    QZSettings settings;
    QZVarList variables;
    ScoringModelAttr record;
    std::stringstream stream(c.document);
    ScoringHRZXMLScorer scorer(&settings, &variables, "", stream, &record);
    EXPECT_EQ(record.GetAppName(), c.appName) << c.document;
    EXPECT_EQ(record.GetAppVersion(), c.appVersion) << c.document;
    if (c.variable == nullptr) {
      EXPECT_EQ(variables.Size(), 0) << c.document;
    } else {
      ASSERT_EQ(variables.Size(), 1) << c.document;
      EXPECT_EQ(variables.GetVarAt(0)->GetName(), c.variable);
      EXPECT_EQ(variables.GetVarAt(0)->GetMeasureLevel(), QZXML_800::ML_CONTINUOUS);
      EXPECT_EQ(variables.GetVarAt(0)->GetRole(), QZXML_800::ROLE_TARGET);
    }
    ValueRecord layout;
    ASSERT_TRUE(scorer.Scorable(layout).IsOK());
    EXPECT_EQ(layout.Names(),
              (std::vector<std::string>{"prediction", "timeseries-lowerconfidence",
                                        "timeseries-upperconfidence",
                                        "timeseries-noiseresiduals"}));
    EXPECT_EQ(scorer.Score(layout, layout).GetErrorCode(), QZScoring_800::SCORING_NOT_SUPPORTED);
  }
}

}  // namespace

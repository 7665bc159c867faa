// Regressions for faults the fuzz harnesses found in whole-pipeline scoring (a document
// through the factory and the reference plug-ins).

#include <memory>
#include <string>

#include <gtest/gtest.h>

#include "ScoringModel.h"
#include "Value.h"
#include "ValueRecord.h"
#include "ReferencePlugins.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace {

// A binary flag target (true value Y) with an adjusted-propensity network, whose tree
// predicts "N" for few visits: a text that is no category of the target, so no
// propensity can be computed for such a record.
const char kFlagTree[] = R"(<PMML version="4.1">
  <DataDictionary>
    <DataField name="visits" optype="continuous" dataType="integer"/>
    <DataField name="respond" optype="categorical" dataType="string">
      <Extension name="measure" value="flag"/>
      <Extension name="flagTypeTrueValue" value="Y"/>
      <Value value="2"/><Value value="Y"/>
    </DataField>
  </DataDictionary>
  <TreeModel modelName="response" functionName="classification">
    <Extension extender="qzscoring" name="adjustedPropensity">
      <AdjustedPropensityByNN description="standalone">
        <HiddenLayer><Matrix><Array n="1" type="real">2.0</Array></Matrix>
          <Array n="1" type="real">-1.0</Array></HiddenLayer>
        <OutputLayer><Matrix><Array n="1" type="real">0.4</Array></Matrix>
          <Array n="1" type="real">0.5</Array></OutputLayer>
      </AdjustedPropensityByNN>
    </Extension>
    <MiningSchema>
      <MiningField name="visits"/>
      <MiningField name="respond" usageType="predicted"/>
    </MiningSchema>
    <Node score="Y">
      <True/>
      <ScoreDistribution value="N" recordCount="20"/>
      <ScoreDistribution value="Y" recordCount="80"/>
      <Node score="N">
        <SimplePredicate field="visits" operator="lessThan" value="3"/>
        <ScoreDistribution value="N" recordCount="70"/>
        <ScoreDistribution value="Y" recordCount="30"/>
      </Node>
      <Node score="Y"><True/>
        <ScoreDistribution value="N" recordCount="20"/>
        <ScoreDistribution value="Y" recordCount="80"/>
      </Node>
    </Node>
  </TreeModel>
</PMML>)";

// A record whose propensity cannot be computed got the raw and adjusted propensity of
// the record scored before it, while scoring reported success.
TEST(FuzzFindings, PipelinePropensityNotCarriedOverFromPreviousRecord) {
  std::unique_ptr<QZScoring_800::ScoringModel> model = qztest::CreateModel(kFlagTree);
  ASSERT_NE(model, nullptr);
  ValueRecord output;
  ASSERT_TRUE(model->Scorable(output).IsOK());
  ASSERT_TRUE(output.Contains("rawpropensity"));
  ASSERT_TRUE(output.Contains("adjustedpropensity"));

  ValueRecord many, few;
  many.Add("visits", Value(7));
  few.Add("visits", Value(1));
  ASSERT_TRUE(model->Score(many, output).IsOK());
  EXPECT_EQ(output.Get("prediction").GetString(), "Y");
  EXPECT_NEAR(output.Get("rawpropensity").GetReal(), 0.8, 1e-12);
  EXPECT_FALSE(output.Get("adjustedpropensity").IsMissing());

  // "N" is no category of the target: both propensities are missing for this record.
  ASSERT_TRUE(model->Score(few, output).IsOK());
  EXPECT_EQ(output.Get("prediction").GetString(), "N");
  EXPECT_TRUE(output.Get("rawpropensity").IsMissing());
  EXPECT_TRUE(output.Get("adjustedpropensity").IsMissing());

  // And the first record scores as before.
  ASSERT_TRUE(model->Score(many, output).IsOK());
  EXPECT_NEAR(output.Get("rawpropensity").GetReal(), 0.8, 1e-12);
}

}  // namespace

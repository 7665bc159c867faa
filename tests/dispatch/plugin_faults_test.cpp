// Faulty plug-ins seen through the models a host scores with: a scorer that throws,
// returns codes of its own, writes fields it never declared or is not ready, and score
// parsers that throw. Every fault becomes a status; nothing escapes to the host.
// The faulty plug-in (QZTestFaults) is steered by the model settings "test_fault" and
// "test_parser_fault"; its scorer predicts "Y" with probability x / 10.

#include <cmath>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "ScoringFactory.h"
#include "ScoringModel.h"
#include "ScoringScorerFactory.h"
#include "ScoringSoloModel.h"
#include "ScoringStatusCodes.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringFactory;
using QZScoring_800::ScoringModel;
using QZXML_800::QZSettings;
using QZXML_800::QZVecValue;
using Names = std::vector<std::string>;
using Streams = std::vector<std::stringstream*>;

namespace {

constexpr long kScorerException = QZScoring_800::SCORING_SCORER_EXCEPTION;

// A tree (scored by the faulty plug-in) with a binary flag target "label" (true value
// "Y") and a one-unit propensity network: adjusted = 0.5 + tanh(2 * raw).
std::string FlagTree() {
  return R"(<PMML version="4.1"><DataDictionary>
 <DataField name="x" optype="continuous" dataType="double"/>
 <DataField name="label" optype="categorical" dataType="string">
  <Extension name="flagTypeTrueValue" value="Y"/><Value value="N"/><Value value="Y"/>
 </DataField></DataDictionary>
 <TreeModel functionName="classification">
  <Extension extender="qzscoring" name="adjustedPropensity">
   <AdjustedPropensityByNN description="standalone">
    <HiddenLayer><Matrix><Array>2</Array></Matrix><Array>0</Array></HiddenLayer>
    <OutputLayer><Matrix><Array>1</Array></Matrix><Array>0.5</Array></OutputLayer>
   </AdjustedPropensityByNN>
  </Extension>
  <MiningSchema><MiningField name="x"/><MiningField name="label" usageType="predicted"/>
  </MiningSchema><Node/></TreeModel></PMML>)";
}

// A regression (scored by the well-behaved echo plug-in: "prediction" is the target's
// name, "probability" echoes x).
std::string EchoRegression() {
  return R"(<PMML version="4.1"><DataDictionary>
 <DataField name="x" optype="continuous" dataType="double"/>
 <DataField name="echoed" optype="continuous" dataType="double"/></DataDictionary>
 <RegressionModel functionName="regression"><MiningSchema><MiningField name="x"/>
  <MiningField name="echoed" usageType="predicted"/></MiningSchema></RegressionModel></PMML>)";
}

QZSettings Registry(const std::string& treePlugin = "QZTestFaults", const std::string& fault = "",
                    const std::string& parserFault = "") {
  QZSettings scoring, models, settings;
  scoring.AddSetting("TreeModel", treePlugin, false);
  scoring.AddSetting("RegressionModel", "QZTestEcho", false);
  models.AddSetting("TreeModel", "", false);
  models.AddSetting("RegressionModel", "", false);
  settings.AddSetting("scoringDll", scoring, true);
  settings.AddSetting("modelDll", models, true);
  if (!fault.empty()) settings.AddSetting("test_fault", fault, true);
  if (!parserFault.empty()) settings.AddSetting("test_parser_fault", parserFault, true);
  return settings;
}

std::unique_ptr<ScoringModel> Create(QZSettings settings, const std::string& document,
                                     long* status = nullptr) {
  ScoringFactory factory;
  std::istringstream pmml(document);
  std::unique_ptr<ScoringModel> model(factory.CreateScoringModel(settings, pmml));
  if (status != nullptr) *status = factory.GetStatus().GetErrorCode();
  factory.Detach();
  return model;
}

void SetFault(ScoringModel& model, const std::string& fault) {
  model.GetSettings().AddSetting("test_fault", fault, true);
}

double Adjusted(double raw) { return 0.5 + std::tanh(2 * raw); }

const Names kLaidOut = {"prediction", "probability", "rawpropensity", "adjustedpropensity"};

}  // namespace

// A scorer that throws, from Score or Scorable, with a standard exception or anything
// else, gives 260029 and the model keeps working; its own codes pass through unchanged;
// a failed Scorable adds no propensity field and a failed Score computes none.
TEST(PluginFaults, ScorerFailuresBecomeStatuses) {
  auto model = Create(Registry(), FlagTree());
  ASSERT_NE(model, nullptr);
  EXPECT_EQ(model->GetModelType(), "FAULTY");
  ValueRecord input, output;
  input["x"] = 3.0;
  ASSERT_TRUE(model->Scorable(output).IsOK());
  ASSERT_EQ(output.Names(), kLaidOut);

  for (const char* fault : {"score-throws", "score-throws-other"}) {
    SCOPED_TRACE(fault);
    SetFault(*model, fault);
    output.ClearValues();
    EXPECT_EQ(model->Score(input, output).GetErrorCode(), kScorerException);
    EXPECT_EQ(output.Names(), kLaidOut);
    EXPECT_TRUE(output.Get("rawpropensity").IsNull());
    EXPECT_TRUE(output.Get("adjustedpropensity").IsNull());
  }

  SetFault(*model, "scorable-throws");
  ValueRecord partial;
  EXPECT_EQ(model->Scorable(partial).GetErrorCode(), kScorerException);
  EXPECT_EQ(partial.Names(), Names{"prediction"});  // what it added before throwing

  SetFault(*model, "status");
  ValueRecord refused;
  EXPECT_EQ(model->Scorable(refused).GetErrorCode(), 261777);
  EXPECT_EQ(refused.Names(), (Names{"prediction", "probability"}));
  output.ClearValues();
  EXPECT_EQ(model->Score(input, output).GetErrorCode(), 261778);
  EXPECT_TRUE(output.Get("rawpropensity").IsNull());

  // The same model, the fault gone: scoring works again.
  SetFault(*model, "");
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_EQ(output.Get("prediction").GetString(), "Y");
  EXPECT_DOUBLE_EQ(output.Get("rawpropensity").GetReal(), 0.3);
  EXPECT_DOUBLE_EQ(output.Get("adjustedpropensity").GetReal(), Adjusted(0.3));
}

// Fields a scorer writes without declaring them are appended after the declared ones;
// the declared fields keep their places, the propensities are still computed, and the
// layout is stable from the second record on. A combined model gathers them too.
TEST(PluginFaults, UndeclaredFieldsAreAppendedAndPropensitiesStillWork) {
  auto model = Create(Registry("QZTestFaults", "undeclared"), FlagTree());
  ASSERT_NE(model, nullptr);
  ValueRecord input, output;
  ASSERT_TRUE(model->Scorable(output).IsOK());
  ASSERT_EQ(output.Names(), kLaidOut);
  Names grown = kLaidOut;
  grown.insert(grown.end(), {"extra", "note"});
  for (double x : {3.0, 6.0, 1.0}) {
    SCOPED_TRACE(x);
    input["x"] = x;
    output.ClearValues();
    ASSERT_TRUE(model->Score(input, output).IsOK());
    EXPECT_EQ(output.Names(), grown);
    EXPECT_DOUBLE_EQ(output[1].GetReal(), x / 10);
    EXPECT_DOUBLE_EQ(output[2].GetReal(), x / 10);
    EXPECT_DOUBLE_EQ(output[3].GetReal(), Adjusted(x / 10));
    EXPECT_DOUBLE_EQ(output.Get("extra").GetReal(), x + 1);
    EXPECT_EQ(output.Get("note").GetString(), "undeclared");
  }

  // A host that scores into a record it never laid out gets every field too.
  ValueRecord bare;
  ASSERT_TRUE(model->Score(input, bare).IsOK());
  EXPECT_EQ(bare.Names(), (Names{"prediction", "probability", "extra", "note"}));

  // Side by side with a well-behaved document: each sub-model's entries, the undeclared
  // ones included, under its ID.
  std::stringstream tree(FlagTree()), echo(EchoRegression());
  QZSettings settings = Registry("QZTestFaults", "undeclared");
  settings.AddSetting("scoring_modelIDs", Names{"F", "E"}, true);
  ScoringFactory factory;
  ScoringModel* multi = factory.CreateScoringModel(settings, Streams{&tree, &echo});
  ASSERT_NE(multi, nullptr) << factory.GetStatus().GetErrorCode();
  ValueRecord combined;
  ASSERT_TRUE(multi->Scorable(combined).IsOK());
  input["x"] = 4.0;
  ASSERT_TRUE(multi->Score(input, combined).IsOK());
  EXPECT_EQ(combined.Get("extra").GetEntryNames(), Names{"F"});
  EXPECT_DOUBLE_EQ(combined["extra"]["F"].GetReal(), 5.0);
  EXPECT_DOUBLE_EQ(combined["adjustedpropensity"]["F"].GetReal(), Adjusted(0.4));
  EXPECT_EQ(combined["prediction"]["E"].GetString(), "echoed");
}

// The library never asks IsReady: a scorer that is not ready still gets a model and is
// scored; the answer is there for the host through the solo model's scorer.
TEST(PluginFaults, NotReadyScorerIsScoredLikeAnyOther) {
  long status = -1;
  auto model = Create(Registry("QZTestFaults", "not-ready"), FlagTree(), &status);
  ASSERT_NE(model, nullptr);
  EXPECT_EQ(status, 0);
  const auto* solo = dynamic_cast<QZScoring_800::ScoringSoloModel*>(model.get());
  ASSERT_NE(solo, nullptr);
  EXPECT_FALSE(solo->GetScorer()->IsReady());
  ValueRecord input, output;
  input["x"] = 5.0;
  ASSERT_TRUE(model->Scorable(output).IsOK());
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_DOUBLE_EQ(output.Get("rawpropensity").GetReal(), 0.5);
}

// Combined models: a throwing sub-model drops out of a multi model's record (which
// still succeeds); a split model returns 260029 for the records routed to it, and the
// other sub-models keep scoring.
TEST(PluginFaults, CombinedModelsContainAThrowingScorer) {
  ValueRecord input;
  input["x"] = 2.0;
  {
    std::stringstream tree(FlagTree()), echo(EchoRegression());
    QZSettings settings = Registry("QZTestFaults", "score-throws");
    settings.AddSetting("scoring_modelIDs", Names{"F", "E"}, true);
    ScoringFactory factory;
    ScoringModel* multi = factory.CreateScoringModel(settings, Streams{&tree, &echo});
    ASSERT_NE(multi, nullptr);
    ValueRecord output;
    ASSERT_TRUE(multi->Scorable(output).IsOK());
    ASSERT_TRUE(multi->Score(input, output).IsOK());
    EXPECT_TRUE(output["prediction"]["F"].IsNull());
    EXPECT_EQ(output["prediction"]["E"].GetString(), "echoed");
    EXPECT_DOUBLE_EQ(output["probability"]["E"].GetReal(), 2.0);
  }
  std::stringstream tree(FlagTree()), echo(EchoRegression());
  QZSettings split;
  split.AddSetting("scoring_splitFields", Names{"k"}, true);
  split.AddSetting("scoring_splitModelIDs", Names{"F", "E"}, true);
  split.AddSetting("F", new QZVecValue<Value>({Value("f")}), true);
  split.AddSetting("E", new QZVecValue<Value>({Value("e")}), true);
  QZSettings settings = Registry("QZTestFaults", "score-throws");
  settings.AddSetting("scoring_splitModel", split, true);
  ScoringFactory factory;
  ScoringModel* model = factory.CreateScoringModel(settings, Streams{&tree, &echo});
  ASSERT_NE(model, nullptr) << factory.GetStatus().GetErrorCode();
  ValueRecord output;
  // The first sub-model (smallest key, "e") lays out the record.
  ASSERT_TRUE(model->Scorable(output).IsOK());
  input["k"] = "f";
  EXPECT_EQ(model->Score(input, output).GetErrorCode(), kScorerException);
  input["k"] = "e";
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_EQ(output.Get("prediction").GetString(), "echoed");
}

// A score parser that throws counts as one that gave null: after a throwing stream
// attempt the element attempt still runs; when that throws too, or the entry point
// throws, there is no scorer (260010) and nothing escapes.
TEST(PluginFaults, ThrowingParsersCountAsNull) {
  long status = -1;
  auto model = Create(Registry("QZTestFaults", "", "stream-throws"), FlagTree(), &status);
  ASSERT_NE(model, nullptr) << status;
  EXPECT_EQ(model->GetModelType(), "element:TreeModel");
  ValueRecord input, output;
  input["x"] = 1.0;
  ASSERT_TRUE(model->Scorable(output).IsOK());
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_DOUBLE_EQ(output.Get("probability").GetReal(), 0.1);

  EXPECT_EQ(Create(Registry("QZTestFaults", "", "both-throw"), FlagTree(), &status), nullptr);
  EXPECT_EQ(status, QZScoring_800::SCORING_SCORER_UNAVAILABLE);
  EXPECT_EQ(Create(Registry("QZTestEntryThrows"), FlagTree(), &status), nullptr);
  EXPECT_EQ(status, QZScoring_800::SCORING_SCORER_UNAVAILABLE);

  // One attempt through the stream alone gives null, not an exception.
  QZSettings settings = Registry("QZTestFaults", "", "stream-throws");
  QZXML_800::QZVarList variables;
  std::istringstream pmml(FlagTree());
  EXPECT_EQ(QZScoring_800::ScoringScorerFactory::GetScorer("QZTestFaults", settings, variables,
                                                           pmml),
            nullptr);
}

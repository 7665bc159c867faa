// The scoring factory end to end: a PMML document, a real plug-in from the registry,
// the model's transformations and propensities, the status codes and ownership.

#include <chrono>
#include <cmath>
#include <cstdio>
#include <fstream>
#include <memory>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "ScoringFactory.h"
#include "ScoringModel.h"
#include "ScoringOutputField.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringFactory;
using QZScoring_800::ScoringModel;
using QZXML_800::QZSettings;

namespace {

// A binary flag target (true value "Y") with a one-unit propensity network: hidden
// weight 2, hidden bias 0, output weight 1, output bias 0.5.
std::string FlagDocument(const std::string& network = "<Array>2</Array>") {
  return R"(<?xml version="1.0"?>
<PMML version="4.1">
 <Header><Application name="qztest" version="1.2"/></Header>
 <DataDictionary numberOfFields="2">
  <DataField name="x" optype="continuous" dataType="double"/>
  <DataField name="label" optype="categorical" dataType="string">
   <Extension name="flagTypeTrueValue" value="Y"/>
   <Value value="N"/><Value value="Y"/>
  </DataField>
 </DataDictionary>
 <TransformationDictionary>
  <DerivedField name="x2" optype="continuous" dataType="double"><FieldRef field="x"/></DerivedField>
 </TransformationDictionary>
 <TreeModel modelName="flagtree" functionName="classification" algorithmName="test">
  <Extension extender="qzscoring" name="adjustedPropensity">
   <AdjustedPropensityByNN description="standalone">
    <HiddenLayer><Matrix>)" + network + R"(</Matrix><Array>0</Array></HiddenLayer>
    <OutputLayer><Matrix><Array>1</Array></Matrix><Array>0.5</Array></OutputLayer>
   </AdjustedPropensityByNN>
  </Extension>
  <MiningSchema>
   <Extension extender="qzscoring" name="DerivedFields"><MiningField name="x2"/></Extension>
   <MiningField name="x"/>
   <MiningField name="label" usageType="predicted"/>
  </MiningSchema>
  <Output><OutputField name="p" feature="probability" value="Y"/></Output>
  <Node/>
 </TreeModel>
</PMML>)";
}

QZSettings Registry(const char* treePlugin = "QZTestSettings") {
  QZSettings scoring, models, settings;
  scoring.AddSetting("TreeModel", treePlugin, false);
  models.AddSetting("TreeModel", "", false);
  models.AddSetting("RegressionModel", "", false);
  settings.AddSetting("scoringDll", scoring, true);
  settings.AddSetting("modelDll", models, true);
  return settings;
}

long CreateStatus(const std::string& document, QZSettings settings = Registry()) {
  ScoringFactory factory;
  std::istringstream pmml(document);
  ScoringModel* model = factory.CreateScoringModel(settings, pmml);
  EXPECT_EQ(model == nullptr, factory.GetStatus().IsError());
  return factory.GetStatus().GetErrorCode();
}

}  // namespace

// A flag target gets "rawpropensity" and "adjustedpropensity" after the scorer's own
// fields; the derived inputs are added to the input record once and computed.
TEST(ScoringFactory, ScoresWithTransformationsAndPropensities) {
  ScoringFactory factory;
  QZSettings settings = Registry();
  std::istringstream pmml(FlagDocument());
  ScoringModel* model = factory.CreateScoringModel(settings, pmml);
  ASSERT_NE(model, nullptr) << factory.GetStatus().GetErrorCode();

  std::string text;
  ASSERT_TRUE(settings.GetSettingValByName("scoring_version", text));
  EXPECT_EQ(text, "4.1");
  ASSERT_TRUE(settings.GetSettingValByName("scoring_modelType", text));
  EXPECT_EQ(text, "TreeModel");
  EXPECT_EQ(model->GetModelName(), "flagtree");
  EXPECT_EQ(model->GetAlgName(), "test");
  EXPECT_EQ(model->GetAppName(), "qztest");
  EXPECT_EQ(model->GetType(), 13);
  EXPECT_EQ(model->GetModelType(), "SETTINGS");
  EXPECT_EQ(model->GetSubType(), "TreeModel");
  ASSERT_NE(model->GetOutputField("probability", "Y"), nullptr);
  EXPECT_EQ(model->GetOutputField("probability", "Y")->GetName(), "p");
  EXPECT_NE(model->GetVarList().FindVariable("x2"), -1);

  ValueRecord input, output;
  input["x"] = 3.0;
  ASSERT_TRUE(model->Scorable(output).IsOK());
  ASSERT_EQ(output.Names(), (std::vector<std::string>{"prediction", "probability",
                                                      "rawpropensity", "adjustedpropensity"}));

  model->GetSettings().AddSetting("test_prediction", "Y", true);
  model->GetSettings().AddSetting("test_probability", "0.8", true);
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_DOUBLE_EQ(input.Get("x2").GetReal(), 3.0);
  EXPECT_DOUBLE_EQ(output.Get("rawpropensity").GetReal(), 0.8);
  EXPECT_DOUBLE_EQ(output.Get("adjustedpropensity").GetReal(), 0.5 + std::tanh(1.6));

  model->GetSettings().AddSetting("test_prediction", "N", true);
  input["x"] = 4.0;
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_EQ(input.Size(), 2u);  // x2 was added on the first call only
  EXPECT_DOUBLE_EQ(input.Get("x2").GetReal(), 4.0);
  EXPECT_DOUBLE_EQ(output.Get("rawpropensity").GetReal(), 0.2);
  EXPECT_DOUBLE_EQ(output.Get("adjustedpropensity").GetReal(), 0.5 + std::tanh(0.4));
}

// A network whose weights do not match its units leaves the model without an adjusted
// propensity at all; a document without the extension gets the raw propensity alone.
TEST(ScoringFactory, PropensityFieldsFollowTheNetwork) {
  for (const auto& [network, fields] :
       {std::pair<std::string, size_t>{"<Array>2 3</Array>", 2},
        std::pair<std::string, size_t>{"<Array>2</Array>", 4}}) {
    ScoringFactory factory;
    QZSettings settings = Registry();
    std::istringstream pmml(FlagDocument(network));
    ScoringModel* model = factory.CreateScoringModel(settings, pmml);
    ASSERT_NE(model, nullptr);
    ValueRecord output;
    model->Scorable(output);
    EXPECT_EQ(output.Size(), fields) << network;
  }
  std::string withoutNetwork = FlagDocument();
  const size_t from = withoutNetwork.find("  <Extension extender=\"qzscoring\" name=\"adjustedPropensity\">");
  const size_t to = withoutNetwork.find("  <MiningSchema>");
  withoutNetwork.erase(from, to - from);
  ScoringFactory factory;
  QZSettings settings = Registry();
  std::istringstream pmml(withoutNetwork);
  ScoringModel* model = factory.CreateScoringModel(settings, pmml);
  ASSERT_NE(model, nullptr);
  ValueRecord output;
  model->Scorable(output);
  EXPECT_EQ(output.Names(),
            (std::vector<std::string>{"prediction", "probability", "rawpropensity"}));
}

// Every failure of the stream form is a status and a null model; nothing is held.
TEST(ScoringFactory, FailuresAreStatusCodes) {
  EXPECT_EQ(CreateStatus(FlagDocument(), Registry("QZTestNoEntry")), 260010);
  EXPECT_EQ(CreateStatus(FlagDocument(), Registry("")), 260010);
  QZSettings noScoringDll, noModelDll;
  noModelDll.AddSetting("scoringDll", QZSettings(), true);
  EXPECT_EQ(CreateStatus(FlagDocument(), noScoringDll), 260006);
  EXPECT_EQ(CreateStatus(FlagDocument(), noModelDll), 260005);

  const std::string document = FlagDocument();
  EXPECT_EQ(CreateStatus(document.substr(0, document.size() / 2)), 260007);
  EXPECT_EQ(CreateStatus("not xml"), 260007);
  EXPECT_EQ(CreateStatus("<Other/>"), 260007);
  std::string badField = document;
  badField.replace(badField.find("optype=\"continuous\""), 19, "");
  EXPECT_EQ(CreateStatus(badField), 108);

  ScoringFactory factory;
  QZSettings settings = Registry();
  EXPECT_EQ(factory.CreateScoringModel(settings, "/no/such/file.pmml"), nullptr);
  EXPECT_EQ(factory.GetStatus().GetErrorCode(), 260004);
}

// Hostile documents end in the scan's failure status, quickly.
TEST(ScoringFactory, HostileDocumentsAreRefused) {
  std::string laughs = "<?xml version=\"1.0\"?><!DOCTYPE PMML [<!ENTITY a \"aaaaaaaaaa\">";
  for (int i = 1; i < 10; ++i) {
    laughs += "<!ENTITY " + std::string(1, 'a' + i) + " \"";
    for (int j = 0; j < 10; ++j) laughs += "&" + std::string(1, 'a' + i - 1) + ";";
    laughs += "\">";
  }
  laughs += "]><PMML version=\"4.1\"><Header>&j;</Header></PMML>";
  std::string external =
      "<?xml version=\"1.0\"?><!DOCTYPE PMML [<!ENTITY x SYSTEM \"file:///etc/hostname\">]>"
      "<PMML version=\"4.1\"><DataDictionary><DataField name=\"&x;\" optype=\"continuous\"/>"
      "</DataDictionary></PMML>";
  std::string deep = "<PMML version=\"4.1\">";
  for (int i = 0; i < 200000; ++i) deep += "<a>";
  for (const std::string* document : {&laughs, &external, &deep}) {
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(CreateStatus(*document), 260007);
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(1));
  }
}

// The factory holds one model: a second creation is refused and leaves the first one;
// Attach replaces it, Detach hands it over.
TEST(ScoringFactory, HoldsOneModelUntilDetached) {
  const std::string path = ::testing::TempDir() + "qz_factory_test.pmml";
  std::ofstream(path) << FlagDocument();

  auto factory = std::make_unique<ScoringFactory>();
  QZSettings settings = Registry();
  ScoringModel* first = factory->CreateScoringModel(settings, path);
  ASSERT_NE(first, nullptr);
  std::istringstream again(FlagDocument());
  EXPECT_EQ(factory->CreateScoringModel(settings, again), nullptr);
  EXPECT_EQ(factory->GetStatus().GetErrorCode(), 260002);
  EXPECT_EQ(factory->Detach(), first);
  EXPECT_TRUE(factory->GetStatus().IsOK());
  EXPECT_EQ(factory->Detach(), nullptr);

  std::unique_ptr<ScoringModel> taken(first);
  factory->Attach(taken.release());
  factory->Attach(nullptr);  // deletes the attached model
  std::istringstream third(FlagDocument());
  ASSERT_NE(factory->CreateScoringModel(settings, third), nullptr);
  factory.reset();  // deletes the held model with the factory
  std::remove(path.c_str());
}

// Documents without a plug-in of their own: transformations only, and time series.
TEST(ScoringFactory, BuiltInScorersForTransformationsAndTimeSeries) {
  ScoringFactory factory;
  QZSettings settings = Registry();
  std::istringstream transformations(R"(<PMML version="4.1">
    <DataDictionary><DataField name="x" optype="continuous" dataType="double"/></DataDictionary>
    <TransformationDictionary>
     <DerivedField name="a" optype="continuous" dataType="double"><FieldRef field="x"/></DerivedField>
     <DerivedField name="b" optype="categorical" dataType="string"><Constant>k</Constant></DerivedField>
    </TransformationDictionary></PMML>)");
  ScoringModel* model = factory.CreateScoringModel(settings, transformations);
  ASSERT_NE(model, nullptr) << factory.GetStatus().GetErrorCode();
  EXPECT_EQ(model->GetType(), 16);
  EXPECT_EQ(model->GetModelType(), "TRANSFORMATION");
  ValueRecord output;
  model->Scorable(output);
  ASSERT_EQ(output.Size(), 1u);
  EXPECT_EQ(output.Get("transformations").GetEntryNames(), (std::vector<std::string>{"a", "b"}));
  std::unique_ptr<ScoringModel> detached(factory.Detach());

  std::istringstream series(R"(<HRZXML><Header><Application name="fc" version="2"/></Header>
    <ARIMAModel variableID="sales"/></HRZXML>)");
  model = factory.CreateScoringModel(settings, series);
  ASSERT_NE(model, nullptr) << factory.GetStatus().GetErrorCode();
  EXPECT_EQ(model->GetType(), 17);
  EXPECT_EQ(model->GetModelType(), "HRZ_XML");
  EXPECT_EQ(model->GetAppName(), "fc");
  EXPECT_EQ(model->GetVarList().FindVariable("sales"), 0);
  ValueRecord input;
  EXPECT_EQ(model->Score(input, output).GetErrorCode(), 260016);
}

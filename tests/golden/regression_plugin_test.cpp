// The RegressionModel plug-in through the scoring factory: every normalization method
// against values worked out from its formula, the output layout, the documents it
// refuses, and scorers that share nothing across threads.

#include <iostream>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "QZDisplay.h"
#include "ScoringModel.h"
#include "Value.h"
#include "ValueRecord.h"
#include "ReferencePlugins.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringModel;
using QZXML_800::QZSettings;

namespace {

// x (continuous) predicts y: continuous for regression, categories A, B, C or N, Y for
// classification. `body` is the inside of the RegressionModel after its MiningSchema.
std::string Document(const std::string& function, const std::string& method,
                     const std::string& categories, const std::string& body,
                     const std::string& version = "4.1") {
  std::string values;
  for (char c : categories) values += std::string("<Value value=\"") + c + "\"/>";
  const std::string target = categories.empty()
                                 ? R"(<DataField name="y" optype="continuous" dataType="double"/>)"
                                 : R"(<DataField name="y" optype="categorical" dataType="string">)" +
                                       values + "</DataField>";
  return R"(<?xml version="1.0"?><PMML version=")" + version + R"("><DataDictionary>
    <DataField name="x" optype="continuous" dataType="double"/>)" + target +
         R"(</DataDictionary><RegressionModel functionName=")" + function +
         R"(" normalizationMethod=")" + method + R"("><MiningSchema>
    <MiningField name="y" usageType="predicted"/><MiningField name="x"/></MiningSchema>)" + body +
         "</RegressionModel></PMML>";
}

// Three tables giving yA = 1 + x, yB = 0.5, yC = 0.
const char kThreeTables[] = R"(
  <RegressionTable intercept="1" targetCategory="A"><NumericPredictor name="x" coefficient="1"/></RegressionTable>
  <RegressionTable intercept="0.5" targetCategory="B"/>
  <RegressionTable intercept="0" targetCategory="C"/>)";
// A binary target: yY = x, the second table empty.
const char kTwoTables[] = R"(
  <RegressionTable intercept="0" targetCategory="Y"><NumericPredictor name="x" coefficient="1"/></RegressionTable>
  <RegressionTable intercept="0" targetCategory="N"/>)";
const char kOneTable[] = R"(
  <RegressionTable intercept="0.5"><NumericPredictor name="x" coefficient="2"/></RegressionTable>)";

ValueRecord Score(ScoringModel& model, double x, long* status = nullptr) {
  ValueRecord input, output;
  input.Add("x", x);
  EXPECT_TRUE(model.Scorable(output).IsOK());
  const long code = model.Score(input, output).GetErrorCode();
  if (status != nullptr) *status = code;
  return output;
}

}  // namespace

// Each normalization method of a regression: y = 0.5 + 2 * 0.25 = 1.
TEST(RegressionPlugin, RegressionNormalizations) {
  const struct {
    const char* method;
    double expected;
  } cases[] = {{"none", 1.0},           {"softmax", 0.7310585786300049},
               {"logit", 0.7310585786300049}, {"exp", 2.718281828459045},
               {"probit", 0.8413447460685429}, {"cloglog", 0.9340119641546875},
               {"loglog", 0.6922006275553464}, {"cauchit", 0.75}};
  for (const auto& c : cases) {
    auto model = qztest::CreateModel(Document("regression", c.method, "", kOneTable));
    ASSERT_NE(model, nullptr) << c.method;
    EXPECT_EQ(model->GetModelType(), "RegressionModel");
    EXPECT_NEAR(Score(*model, 0.25).Get("prediction").GetReal(), c.expected, 1e-12) << c.method;
  }
}

// Each method over three categories (yA = 2, yB = 0.5, yC = 0 at x = 1), and over a
// binary target, where the first table's category gets f(y) and the other 1 - f(y)
// (y = 0.3).
TEST(RegressionPlugin, ClassificationNormalizations) {
  const struct {
    const char* method;
    const char* predicted;
    double a, b, c;
  } multi[] = {
      {"softmax", "A", 0.7361247243125939, 0.16425162762508783, 0.09962364806231833},
      {"simplemax", "A", 0.8, 0.2, 0.0},
      {"none", "A", 2.0, 0.5, 0.0},
      {"logit", "A", 0.8807970779778823, 0.6224593312018546, 0.5},
      {"probit", "A", 0.9772498680518208, 0.6914624612740131, 0.5},
      {"cloglog", "A", 0.9993820210106689, 0.807704354452035, 0.6321205588285577},
      {"loglog", "A", 0.8734230184931167, 0.545239211892605, 0.36787944117144233},
      {"cauchit", "A", 0.8524163823495667, 0.6475836176504333, 0.5},
      {"exp", "A", 7.38905609893065, 1.6487212707001282, 1.0},
  };
  for (const auto& m : multi) {
    auto model =
        qztest::CreateModel(Document("classification", m.method, "ABC", kThreeTables));
    ASSERT_NE(model, nullptr) << m.method;
    const ValueRecord out = Score(*model, 1.0);
    EXPECT_EQ(out.Get("prediction").GetString(), m.predicted) << m.method;
    EXPECT_NEAR(out.Get("probability(A)").GetReal(), m.a, 1e-12) << m.method;
    EXPECT_NEAR(out.Get("probability(B)").GetReal(), m.b, 1e-12) << m.method;
    EXPECT_NEAR(out.Get("probability(C)").GetReal(), m.c, 1e-12) << m.method;
    EXPECT_NEAR(out.Get("probability").GetReal(), m.a, 1e-12) << m.method;
  }

  const struct {
    const char* method;
    const char* predicted;
    double y;  // probability of Y; N gets 1 - y
  } binary[] = {
      {"softmax", "Y", 0.574442516811659},  {"logit", "Y", 0.574442516811659},
      {"none", "N", 0.3},                   {"probit", "Y", 0.6179114221889526},
      {"cloglog", "Y", 0.7407231340091724}, {"loglog", "N", 0.4767236907145941},
      {"cauchit", "Y", 0.5927735790777423}, {"exp", "Y", 1.3498588075760032},
  };
  for (const auto& b : binary) {
    for (const char* tables : {kTwoTables, R"(<RegressionTable intercept="0" targetCategory="Y">
          <NumericPredictor name="x" coefficient="1"/></RegressionTable>)"}) {
      auto model = qztest::CreateModel(Document("classification", b.method, "NY", tables));
      ASSERT_NE(model, nullptr) << b.method;
      const ValueRecord out = Score(*model, 0.3);
      EXPECT_EQ(out.Get("prediction").GetString(), b.predicted) << b.method;
      EXPECT_NEAR(out.Get("probability(Y)").GetReal(), b.y, 1e-12) << b.method;
      EXPECT_NEAR(out.Get("probability(N)").GetReal(), 1.0 - b.y, 1e-12) << b.method;
    }
  }
}

// The output record: "prediction", "probability", one "probability(CAT)" per category in
// dictionary order, then the OutputFields as named; a host record that lacks them gets
// them appended by Score. A missing input gives null fields and success.
TEST(RegressionPlugin, OutputLayout) {
  auto model = qztest::CreateModel(
      Document("classification", "softmax", "CAB",
               kThreeTables + std::string(R"(<Output><OutputField name="best" feature="predictedValue"/>
         <OutputField name="pB" feature="probability" value="B"/></Output>)")));
  ASSERT_NE(model, nullptr);
  ValueRecord layout;
  ASSERT_TRUE(model->Scorable(layout).IsOK());
  EXPECT_EQ(layout.Names(), (std::vector<std::string>{"prediction", "probability",
                                                      "probability(C)", "probability(A)",
                                                      "probability(B)", "best", "pB"}));

  ValueRecord input, bare;
  input.Add("x", 1.0);
  ASSERT_TRUE(model->Score(input, bare).IsOK());
  EXPECT_EQ(bare.Get("best").GetString(), "A");
  EXPECT_NEAR(bare.Get("pB").GetReal(), 0.16425162762508783, 1e-12);

  input["x"] = Value();
  ASSERT_TRUE(model->Score(input, bare).IsOK());
  for (const char* field : {"prediction", "probability", "probability(A)", "best", "pB"}) {
    EXPECT_TRUE(bare.Get(field).IsNull()) << field;
  }
}

// Documents the plug-ins refuse at creation: the factory gets no scorer (260010) and the
// plug-in writes one diagnostic line per attempt saying what it refused.
TEST(RegressionPlugin, RefusesUnsupportedDocuments) {
  const std::string reg = "regression";
  const std::string table = R"(<RegressionTable intercept="0"/>)";
  const struct {
    const char* message;
    std::string pmml;
  } cases[] = {
      {"QZRegression: refused: RegressionModel normalizationMethod 'sigmoid' is not supported",
       Document(reg, "sigmoid", "", kOneTable)},
      {"'simplemax' does not apply to regression", Document(reg, "simplemax", "", kOneTable)},
      {"a regression RegressionModel needs one RegressionTable",
       Document(reg, "none", "", table + table)},
      {"RegressionModel has no RegressionTable", Document(reg, "none", "", "")},
      {"RegressionTable element 'SplinePredictor' is not supported",
       Document(reg, "none", "", R"(<RegressionTable intercept="0">
          <SplinePredictor name="x"/></RegressionTable>)")},
      {"NumericPredictor attribute 'coefficient' is not a number: 'abc'",
       Document(reg, "none", "", R"(<RegressionTable intercept="0">
          <NumericPredictor name="x" coefficient="abc"/></RegressionTable>)")},
      {"OutputField 'r': feature 'reasonCode' is not supported",
       Document(reg, "none", "", kOneTable + std::string(
          R"(<Output><OutputField name="r" feature="reasonCode"/></Output>)"))},
      {"functionName 'clustering' is not supported", Document("clustering", "none", "", kOneTable)},
      {"two RegressionTables for category 'A'",
       Document("classification", "softmax", "ABC",
                kThreeTables + std::string(R"(<RegressionTable targetCategory="A"/>)"))},
      {"one RegressionTable needs a binary target",
       Document("classification", "logit", "ABC", R"(<RegressionTable targetCategory="A"/>)")},
      {"MiningField attribute 'lowValue' is missing", R"(<PMML version="4.1"><DataDictionary>
          <DataField name="x" optype="continuous" dataType="double"/></DataDictionary>
          <RegressionModel functionName="regression"><MiningSchema>
          <MiningField name="x" outliers="asExtremeValues"/></MiningSchema>
          <RegressionTable intercept="0"/></RegressionModel></PMML>)"},
  };
  for (const auto& c : cases) qztest::ExpectRefused(c.pmml, c.message);
}

// Scorers of one document share nothing: two models scored at once from two threads
// give the results each gives alone.
TEST(RegressionPlugin, ModelsScoreIndependentlyInThreads) {
  const std::string pmml = Document("classification", "softmax", "ABC", kThreeTables);
  auto first = qztest::CreateModel(pmml);
  auto second = qztest::CreateModel(pmml);
  ASSERT_NE(first, nullptr);
  ASSERT_NE(second, nullptr);
  auto run = [](ScoringModel* model, std::vector<double>* out) {
    ValueRecord input, output;
    input.Add("x", 0.0);
    model->Scorable(output);
    for (int i = 0; i < 2000; ++i) {
      input["x"] = (i % 100) / 10.0;
      model->Score(input, output);
      out->push_back(output.Get("probability(B)").GetReal());
    }
  };
  std::vector<double> alone, a, b;
  run(first.get(), &alone);
  std::thread ta(run, first.get(), &a);
  std::thread tb(run, second.get(), &b);
  ta.join();
  tb.join();
  EXPECT_EQ(a, alone);
  EXPECT_EQ(b, alone);
}

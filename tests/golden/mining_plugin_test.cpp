// The MiningModel plug-in through the scoring factory: what it does with segments that
// predict nothing, the selectAll result, the documents it refuses, and scorers that
// share nothing across threads. Every method's arithmetic is checked by the
// hand-written golden cases (tests/golden/cases/mining_*).

#include <cmath>
#include <iostream>
#include <limits>
#include <memory>
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

// y = intercept + coefficient * field.
std::string Linear(const std::string& field, double intercept, double coefficient) {
  return R"(<RegressionModel functionName="regression"><MiningSchema><MiningField name=")" +
         field + R"("/></MiningSchema><RegressionTable intercept=")" + std::to_string(intercept) +
         R"("><NumericPredictor name=")" + field + R"(" coefficient=")" +
         std::to_string(coefficient) + R"("/></RegressionTable></RegressionModel>)";
}

std::string Segment(const std::string& id, const std::string& model,
                    const std::string& predicate = "<True/>") {
  return "<Segment id=\"" + id + "\">" + predicate + model + "</Segment>";
}

// A regression MiningModel over x and z (continuous) and c (categories P and Q).
// `segmentation` holds the attributes of the Segmentation, `segments` its content.
std::string Document(const std::string& segmentation, const std::string& segments,
                     const std::string& output = "",
                     const std::string& function = "regression") {
  return R"(<PMML version="4.4"><DataDictionary>
    <DataField name="x" optype="continuous" dataType="double"/>
    <DataField name="z" optype="continuous" dataType="double"/>
    <DataField name="c" optype="categorical" dataType="string">
      <Value value="P"/><Value value="Q"/></DataField>
    <DataField name="y" optype="continuous" dataType="double"/></DataDictionary>
    <MiningModel functionName=")" + function + R"("><MiningSchema>
    <MiningField name="y" usageType="predicted"/><MiningField name="x"/>
    <MiningField name="z"/><MiningField name="c"/></MiningSchema>)" +
         output + "<Segmentation " + segmentation + ">" + segments +
         "</Segmentation></MiningModel></PMML>";
}

// Three segments for x = 1: S2 (10 + z) comes first, then S1 (x) and S3 (2x).
const std::string kThree =
    Segment("S2", Linear("z", 10, 1)) + Segment("S1", Linear("x", 0, 1)) +
    Segment("S3", Linear("x", 0, 2));

ValueRecord Score(ScoringModel& model, double x, double z, long* status = nullptr) {
  ValueRecord input, output;
  input.Add("x", x);
  input.Add("z", z);
  input.Add("c", "P");
  EXPECT_TRUE(model.Scorable(output).IsOK());
  const long code = model.Score(input, output).GetErrorCode();
  if (status != nullptr) *status = code;
  return output;
}

constexpr double kMissing = std::numeric_limits<double>::quiet_NaN();

}  // namespace

// A segment that predicts nothing (S2 while z is missing) under each
// missingPredictionTreatment: continue makes a numeric combination missing and ends
// selectFirst with the missing result; skipSegment leaves it out; returnMissing makes
// the result missing; missingThreshold bounds the missing share of the weight.
TEST(MiningPlugin, MissingSegmentPredictions) {
  const struct {
    const char* segmentation;
    double expected;  // NaN: no prediction
  } cases[] = {
      {R"(multipleModelMethod="average")", kMissing},
      {R"(multipleModelMethod="average" missingPredictionTreatment="skipSegment")", 1.5},
      {R"(multipleModelMethod="sum" missingPredictionTreatment="returnMissing")", kMissing},
      {R"(multipleModelMethod="sum" missingPredictionTreatment="skipSegment"
          missingThreshold="0.3")", kMissing},
      {R"(multipleModelMethod="sum" x-missingPredictionTreatment="skipSegment"
          missingThreshold="0.4")", 3.0},
      {R"(multipleModelMethod="selectFirst")", kMissing},
      {R"(multipleModelMethod="selectFirst" missingPredictionTreatment="skipSegment")", 1.0},
      {R"(multipleModelMethod="modelChain")", 2.0},
      {R"(multipleModelMethod="modelChain" missingPredictionTreatment="returnMissing")", kMissing},
  };
  for (const auto& c : cases) {
    auto model = qztest::CreateModel(Document(c.segmentation, kThree));
    ASSERT_NE(model, nullptr) << c.segmentation;
    EXPECT_EQ(model->GetModelType(), "MiningModel");
    long status = -1;
    const Value prediction = Score(*model, 1.0, kMissing, &status).Get("prediction");
    EXPECT_EQ(status, 0) << c.segmentation;
    if (std::isnan(c.expected)) {
      EXPECT_TRUE(prediction.IsNull()) << c.segmentation << ": " << prediction;
    } else {
      EXPECT_DOUBLE_EQ(prediction.GetReal(), c.expected) << c.segmentation;
    }
    // With z present every segment predicts: 15, 1, 2.
    EXPECT_FALSE(Score(*model, 1.0, 5.0).Get("prediction").IsNull()) << c.segmentation;
  }
}

// Trees of one ensemble share the category codes of a record's values; a segment that
// replaces a missing category sees its own value, and a value changed in place between
// records is never answered from the record before.
TEST(MiningPlugin, TreesOnOneCategoricalFieldAgreeRecordByRecord) {
  const auto tree = [](const std::string& replacement, int p, int q) {
    return R"(<TreeModel functionName="regression" noTrueChildStrategy="returnLastPrediction">
      <MiningSchema><MiningField name="c")" + replacement + R"(/></MiningSchema>
      <Node score="0"><True/>
        <Node score=")" + std::to_string(p) + R"("><SimplePredicate field="c" operator="equal" value="P"/></Node>
        <Node score=")" + std::to_string(q) + R"("><SimpleSetPredicate field="c" booleanOperator="isIn">
          <Array n="1" type="string">Q</Array></SimpleSetPredicate></Node>
      </Node></TreeModel>)";
  };
  auto model = qztest::CreateModel(Document(
      R"(multipleModelMethod="sum")",
      Segment("plain", tree("", 1, 2)) +
          Segment("replacing", tree(R"( missingValueReplacement="Q")", 10, 20)) +
          Segment("again", tree("", 100, 200))));
  ASSERT_NE(model, nullptr);
  ValueRecord input, output;
  input.Add("x", 0.0);
  input.Add("z", 0.0);
  input.Add("c", "P");
  ASSERT_TRUE(model->Scorable(output).IsOK());
  const struct {
    const char* c;  // null: missing
    double sum;
  } records[] = {{"P", 111}, {"Q", 222}, {nullptr, 20}, {"Q", 222}, {"P", 111}, {"P", 111}};
  for (const auto& r : records) {
    input[2] = r.c != nullptr ? Value(std::string(r.c)) : Value::NULL_VALUE;
    ASSERT_TRUE(model->Score(input, output).IsOK());
    EXPECT_DOUBLE_EQ(output.Get("prediction").GetReal(), r.sum) << (r.c ? r.c : "missing");
  }
}

// selectAll: the first used segment that predicts decides, and the entityId output is
// a structured value with every segment's prediction by id (null when the segment was
// not used or predicted nothing).
TEST(MiningPlugin, SelectAllListsEverySegment) {
  auto model = qztest::CreateModel(Document(
      R"(multipleModelMethod="selectAll")",
      Segment("first", Linear("x", 0, 1),
              R"(<SimplePredicate field="x" operator="greaterThan" value="5"/>)") + kThree,
      R"(<Output><OutputField name="all" feature="entityId"/></Output>)"));
  ASSERT_NE(model, nullptr);
  const ValueRecord out = Score(*model, 1.0, kMissing);
  EXPECT_DOUBLE_EQ(out.Get("prediction").GetReal(), 1.0);  // S2 predicts nothing: S1
  const Value all = out.Get("all");
  ASSERT_TRUE(all.IsStruct()) << all;
  EXPECT_EQ(all.GetEntryNames(), (std::vector<std::string>{"first", "S2", "S1", "S3"}));
  EXPECT_TRUE(all.Find("first")->IsNull());
  EXPECT_TRUE(all.Find("S2")->IsNull());
  EXPECT_DOUBLE_EQ(all.Find("S3")->GetReal(), 2.0);
}

// Documents the plug-in refuses at creation: no scorer (260010) and one diagnostic line
// saying what was refused, with the path of segments to it.
TEST(MiningPlugin, RefusesUnsupportedDocuments) {
  const std::string avg = R"(multipleModelMethod="average")";
  const std::string one = Segment("S1", Linear("x", 0, 1));
  const std::string tree = R"(<TreeModel functionName="classification"><MiningSchema>
      <MiningField name="x"/></MiningSchema><Node score="P"><True/></Node></TreeModel>)";
  const struct {
    const char* message;
    std::string pmml;
  } cases[] = {
      {"QZMining: refused: Segmentation multipleModelMethod 'vote' is not supported",
       Document(R"(multipleModelMethod="vote")", one)},
      {"multipleModelMethod 'majorityVote' does not apply to regression",
       Document(R"(multipleModelMethod="majorityVote")", one)},
      {"MiningModel without Segmentation (model composition) is not supported",
       R"(<PMML version="4.4"><DataDictionary>
       <DataField name="x" optype="continuous" dataType="double"/></DataDictionary>
       <MiningModel functionName="regression"><MiningSchema><MiningField name="x"/>
       </MiningSchema></MiningModel></PMML>)"},
      {"Segmentation has no Segment", Document(avg, "")},
      {"Segment 'S2': Segment 'n': model element 'NeuralNetwork' is not supported",
       Document(avg, one + Segment("S2", R"(<MiningModel functionName="regression"><MiningSchema/>
          <Segmentation multipleModelMethod="sum">)" + Segment("n", R"(<NeuralNetwork
          functionName="regression"/>)") + "</Segmentation></MiningModel>"))},
      {"Segment 'T' does not predict the value of 'y' (TreeModel classification)",
       Document(avg, one + Segment("T", tree))},
      {"Segment 'S1': predicate refused: w: Invalid Split Variable!",
       Document(avg, Segment("S1", Linear("x", 0, 1),
                             R"(<SimplePredicate field="w" operator="equal" value="1"/>)"))},
      {"Segment 'S1': SimpleSetPredicate on field 'x', which is not categorical",
       Document(avg, Segment("S1", Linear("x", 0, 1), R"(<SimpleSetPredicate field="x"
          booleanOperator="isIn"><Array n="1" type="real">1</Array></SimpleSetPredicate>)"))},
      {"missingPredictionTreatment 'ignore' is not supported",
       Document(avg + R"( missingPredictionTreatment="ignore")", one)},
      {"Segment 'S1': element 'VariableWeight' is not supported",
       Document(avg, R"(<Segment id="S1"><True/>)" + Linear("x", 0, 1) +
                         R"(<VariableWeight field="z"/></Segment>)")},
      {"Segment id 'S1' appears twice", Document(R"(multipleModelMethod="selectAll")", one + one)},
      {"multipleModelMethod 'sum' does not apply to classification",
       Document(R"(multipleModelMethod="sum")", Segment("T", tree), "", "classification")},
  };
  for (const auto& c : cases) qztest::ExpectRefused(c.pmml, c.message);
}

// Two models of one ensemble document scored at once from two threads give the results
// each gives alone: the ensemble's scratch and its segments belong to one model.
TEST(MiningPlugin, ModelsScoreIndependentlyInThreads) {
  const std::string pmml = Document(R"(multipleModelMethod="weightedMedian")", kThree);
  auto first = qztest::CreateModel(pmml);
  auto second = qztest::CreateModel(pmml);
  ASSERT_NE(first, nullptr);
  ASSERT_NE(second, nullptr);
  auto run = [](ScoringModel* model, std::vector<double>* out) {
    for (int i = 0; i < 2000; ++i) {
      out->push_back(Score(*model, (i % 100) / 10.0, i % 7).Get("prediction").GetReal());
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

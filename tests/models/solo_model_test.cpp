// The solo model around a scorer: transformations before scoring, the propensity
// fields after it, and the adjusted propensity's network read from its extension.

#include <memory>
#include <sstream>
#include <stdexcept>
#include <string>

#include <gtest/gtest.h>

#include "QZTransformation.h"
#include "ScoringAdjustedPropensity.h"
#include "ScoringSoloModel.h"
#include "ScoringStatusCodes.h"
#include "XercesTestEnvironment.h"

using QZCommon_800::IQZScore;
using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringAdjustedPropensity;
using QZScoring_800::ScoringModel;
using QZScoring_800::ScoringSoloModel;
using QZXML_800::QZSettings;
using QZXML_800::QZVarList;

namespace {

// Writes the prediction and probability it was built with; keeps the input it saw.
class FixedScorer : public IQZScore {
 public:
  FixedScorer(Value prediction, double probability, long code = 0, bool throws = false)
      : prediction_(prediction), probability_(probability), code_(code), throws_(throws) {}
  bool IsReady() const override { return true; }
  QZStatus Score(const ValueRecord& input, ValueRecord& output) override {
    if (throws_) throw std::runtime_error("scorer failed");
    seen = input;
    output["prediction"] = prediction_;
    output["probability"] = probability_;
    return QZStatus(code_, false);
  }
  QZStatus Scorable(ValueRecord& record) override {
    record.Add("prediction", Value());
    record.Add("probability", Value());
    return QZStatus(code_, false);
  }
  std::string GetType() const override { return "FIXED"; }
  ValueRecord seen;

 private:
  Value prediction_;
  double probability_;
  long code_;
  bool throws_;
};

const std::vector<std::string> kNoYes = {"no", "yes"};

// A target "flag" with categories no, yes; yes (index 1) is the true category.
QZVarList FlagTarget() {
  QZVarList variables;
  variables.AddContVar("x", "x", QZXML_800::ROLE_INPUT);
  variables.AddCatVar("flag", "flag", kNoYes, QZXML_800::ROLE_TARGET);
  dynamic_cast<QZXML_800::QZCatVar*>(variables.GetVariable("flag"))->SetBinaryFlag(true, 1);
  return variables;
}

// An extension with one network: hidden weights and biases as texts, output weights
// (one "Array" each) and the output bias.
std::string Network(const std::string& description, const std::string& weights,
                    const std::string& biases, std::initializer_list<const char*> outputs,
                    const char* bias, const char* root = "Extension") {
  std::string text = std::string("<") + root + " name=\"adjustedPropensity\">" +
                     "<AdjustedPropensityByNN description=\"" + description + "\">" +
                     "<HiddenLayer><Matrix><Array n=\"2\" type=\"real\">" + weights +
                     "</Array></Matrix><Array>" + biases + "</Array></HiddenLayer>" +
                     "<OutputLayer><Matrix>";
  for (const char* w : outputs) text += std::string("<Array>") + w + "</Array>";
  return text + "</Matrix><Array>" + bias + "</Array></OutputLayer>" +
         "</AdjustedPropensityByNN></" + root + ">";
}

const char kDictionary[] =
    "<TransformationDictionary>"
    "<DerivedField name=\"d1\" optype=\"continuous\" dataType=\"double\">"
    "<FieldRef field=\"x\"/></DerivedField>"
    "<DerivedField name=\"d2\" optype=\"continuous\" dataType=\"double\">"
    "<Constant dataType=\"double\">7</Constant></DerivedField>"
    "</TransformationDictionary>";

// x / 0: an invalid result, which fails Transform.
const char kFailingDictionary[] =
    "<TransformationDictionary><DerivedField name=\"d\" optype=\"continuous\" "
    "dataType=\"double\"><Apply function=\"/\"><FieldRef field=\"x\"/>"
    "<Constant dataType=\"double\">0</Constant></Apply></DerivedField>"
    "</TransformationDictionary>";

QZTransformNS_8_0_0::QZTransformation* Engine(const char* dictionary = kDictionary) {
  auto* engine = new QZTransformNS_8_0_0::QZTransformation();
  std::istringstream in(dictionary);
  EXPECT_TRUE(engine->AddTransformationDictionary(in).IsOK());
  return engine;
}

// A model over the scorer, with a transformation engine when asked.
std::unique_ptr<ScoringSoloModel> Solo(IQZScore* scorer, const QZVarList& variables = {},
                                       bool withEngine = false) {
  auto model = std::make_unique<ScoringSoloModel>(QZSettings(), variables);
  model->SetScorer(scorer);
  if (withEngine) model->SetTransformation(Engine());
  return model;
}

// An adjusted propensity whose network was not read.
ScoringAdjustedPropensity* Unread(ScoringSoloModel& model) {
  return new ScoringAdjustedPropensity(&model.GetSettings(), &model.GetVarList());
}

ValueRecord Record(std::initializer_list<std::pair<const char*, Value>> fields) {
  ValueRecord record;
  for (const auto& f : fields) record.Add(f.first, f.second);
  return record;
}

// Without a scorer nothing happens; a scorer is taken once; its failures pass through
// unchanged and add no propensity field; a scorer that throws gives 260029.
TEST(SoloModel, ScorerAndItsFailures) {
  ScoringSoloModel model{QZSettings(), QZVarList()};
  ValueRecord in = Record({{"x", 1.0}}), out;
  EXPECT_EQ(model.Score(in, out).GetErrorCode(), QZScoring_800::SCORING_NO_SCORER);
  EXPECT_EQ(model.Scorable(out).GetErrorCode(), QZScoring_800::SCORING_NO_SCORER);
  EXPECT_EQ(in.Size(), 1u);
  EXPECT_EQ(out.Size(), 0u);
  EXPECT_EQ(model.GetModelType(), "UNKNOWN");

  EXPECT_TRUE(model.SetScorer(new FixedScorer("yes", 0.8)));
  FixedScorer second("no", 0.1);
  EXPECT_FALSE(model.SetScorer(&second));
  EXPECT_EQ(model.GetModelType(), "FIXED");
  EXPECT_EQ(model.GetScoringModelType(), ScoringModel::SCORING_SOLO_MODEL);
  EXPECT_EQ(model.Clone(), nullptr);

  auto failing = Solo(new FixedScorer("yes", 0.8, 4711), FlagTarget());
  failing->SetAdjustedPropensity(Unread(*failing));
  EXPECT_EQ(failing->Scorable(out).GetErrorCode(), 4711);
  EXPECT_EQ(out.Size(), 2u);
  EXPECT_EQ(failing->Score(in, out).GetErrorCode(), 4711);
  // A scorer that throws: the exception becomes a status, never reaches the host.
  EXPECT_EQ(Solo(new FixedScorer("yes", 0.8, 0, true))->Score(in, out).GetErrorCode(),
            QZScoring_800::SCORING_SCORER_EXCEPTION);
}

// Derived-field names are appended to the input once; Transform runs on every call.
TEST(SoloModel, TransformationPaths) {
  auto* scorer = new FixedScorer("yes", 0.8);
  auto listed = Solo(scorer, {}, true);
  listed->SetDerivedFields({"d2"});
  ValueRecord in = Record({{"x", 3.0}}), out;
  ASSERT_TRUE(listed->Score(in, out).IsOK());
  in["x"] = 5.0;
  ASSERT_TRUE(listed->Score(in, out).IsOK());
  // d2 from the list first, then the engine appends d1.
  EXPECT_EQ(in.Names(), (std::vector<std::string>{"x", "d2", "d1"}));
  EXPECT_EQ(scorer->seen.Get("d1").GetReal(), 5.0);
  EXPECT_EQ(scorer->seen.Get("d2").GetReal(), 7.0);

  auto engineLaysOut = Solo(new FixedScorer("yes", 0.8), {}, true);
  engineLaysOut->SetNeedDerivedPredictor(true);
  in = Record({{"x", 2.0}});
  ASSERT_TRUE(engineLaysOut->Score(in, out).IsOK());
  ASSERT_TRUE(engineLaysOut->Score(in, out).IsOK());
  EXPECT_EQ(in.Names(), (std::vector<std::string>{"x", "d1", "d2"}));
  EXPECT_EQ(in.Get("d1").GetReal(), 2.0);

  // Neither derived fields nor the flag: the engine is not applied.
  in = Record({{"x", 2.0}});
  ASSERT_TRUE(Solo(new FixedScorer("yes", 0.8), {}, true)->Score(in, out).IsOK());
  EXPECT_EQ(in.Size(), 1u);

  // A failing Transform: its code is returned and the scorer is not called.
  scorer = new FixedScorer("yes", 0.8);
  auto failing = Solo(scorer);
  failing->SetTransformation(Engine(kFailingDictionary));
  failing->SetNeedDerivedPredictor(true);
  EXPECT_EQ(failing->Score(in, out).GetErrorCode(),
            QZTransformNS_8_0_0::QZTransformation::TRANSFORM_INVALID_RESULT);
  EXPECT_EQ(scorer->seen.Size(), 0u);
}

// Scorable widens the layout after prediction and probability; Score fills the fields
// (raw 0.8; adjusted 0.5 + tanh(2 * 0.8 + 0) = 1.4216685544).
TEST(SoloModel, PropensityFields) {
  auto model = Solo(new FixedScorer("yes", 0.8), FlagTarget());
  ScoringAdjustedPropensity* propensity = Unread(*model);
  model->SetAdjustedPropensity(propensity);
  std::stringstream network(Network("standalone", "2", "0", {"1"}, "0.5"));
  ASSERT_TRUE(propensity->ParseNetwork(&network));

  ValueRecord in = Record({{"x", 1.0}}), out;
  ASSERT_TRUE(model->Scorable(out).IsOK());
  EXPECT_EQ(out.Names(), (std::vector<std::string>{"prediction", "probability",
                                                   "rawpropensity", "adjustedpropensity"}));
  ASSERT_TRUE(model->Score(in, out).IsOK());
  EXPECT_DOUBLE_EQ(out.Get("rawpropensity").GetReal(), 0.8);
  EXPECT_NEAR(out.Get("adjustedpropensity").GetReal(), 1.4216685544, 1e-9);

  // Only "rawpropensity" in the layout: only the raw propensity is computed.
  ValueRecord rawOnly = Record({{"rawpropensity", Value()}});
  ASSERT_TRUE(model->Score(in, rawOnly).IsOK());
  EXPECT_DOUBLE_EQ(rawOnly.Get("rawpropensity").GetReal(), 0.8);
  EXPECT_FALSE(rawOnly.Contains("adjustedpropensity"));

  // An unread network: the layout gets "rawpropensity" alone, and a host record with
  // "adjustedpropensity" gets the raw propensity and a missing adjusted one (never what
  // the field held before) while Score succeeds.
  auto unread = Solo(new FixedScorer("no", 0.8), FlagTarget());
  unread->SetAdjustedPropensity(Unread(*unread));
  out = ValueRecord();
  ASSERT_TRUE(unread->Scorable(out).IsOK());
  EXPECT_EQ(out.Size(), 3u);
  ValueRecord both = Record({{"rawpropensity", -1.0}, {"adjustedpropensity", -1.0}});
  ASSERT_TRUE(unread->Score(in, both).IsOK());
  EXPECT_DOUBLE_EQ(both.Get("rawpropensity").GetReal(), 0.2);
  EXPECT_TRUE(both.Get("adjustedpropensity").IsMissing());
}

// Raw propensity: p for the true category, 1 - p otherwise; 260017 whenever the
// record or the target does not allow it.
TEST(AdjustedPropensity, RawPropensity) {
  QZVarList flag = FlagTarget(), none, notFlag;
  notFlag.AddCatVar("flag", "flag", kNoYes, QZXML_800::ROLE_TARGET);
  QZSettings settings;
  struct Case {
    const QZVarList* variables;
    ValueRecord output;
    long code;
    double raw;
  } cases[] = {
      {&flag, Record({{"prediction", "yes"}, {"probability", 0.8}}), 0, 0.8},
      {&flag, Record({{"prediction", "no"}, {"probability", 0.8}}), 0, 0.2},
      {&flag, Record({{"prediction", "yes"}}), 260017, 0},
      {&flag, Record({{"prediction", "maybe"}, {"probability", 0.8}}), 260017, 0},
      {&flag, Record({{"prediction", "yes"}, {"probability", Value()}}), 260017, 0},
      {&none, Record({{"prediction", "yes"}, {"probability", 0.8}}), 260017, 0},
      {&notFlag, Record({{"prediction", "yes"}, {"probability", 0.8}}), 260017, 0},
  };
  for (Case& c : cases) {
    ScoringAdjustedPropensity propensity(&settings, c.variables);
    size_t before = c.output.Size();
    EXPECT_EQ(propensity.ComputeRawPropensity(c.output).GetErrorCode(), c.code);
    if (c.code == 0) {
      EXPECT_NEAR(c.output.Get("rawpropensity").GetReal(), c.raw, 1e-12);
    } else {
      EXPECT_EQ(c.output.Size(), before);
    }
  }
}

// Reading the network: which documents give a network, and what it computes for
// x = 0.5 (prediction "yes", probability 0.5) and x = 0 ("no", probability 1). Figures:
//   one unit: 0.5 + tanh(2x) gives 1.2615941560 and 0.5;
//   two units: 0.1 + tanh(2x) + 0.5 * tanh(-x + 0.5) gives 0.8615941560 and
//   0.1 + 0.5 * tanh(0.5) = 0.3310585786.
TEST(AdjustedPropensity, ParseNetwork) {
  const std::string oneUnit = Network("standalone", "2", "0", {"1"}, "0.5");
  std::string deep = "<Extension>";
  for (int i = 0; i < 1500; ++i) deep += "<a>";
  struct Case {
    std::string document;
    const char* method;  // the "scoring_multipleModelMethod" setting; null: absent
    bool ready;
    double atHalf, atZero;
  } cases[] = {
      {oneUnit, nullptr, true, 1.2615941560, 0.5},
      {Network("standalone", "2 -1", "0 0.5", {"1", "0.5"}, "0.1"), nullptr, true,
       0.8615941560, 0.3310585786},
      {"<Extension/>", nullptr, true, 0, 0},
      {Network("weightedAverage", "2", "0", {"1"}, "0.5"), "weightedAverage", true,
       1.2615941560, 0.5},
      {Network("weightedAverage", "2", "0", {"1"}, "0.5"), nullptr, true, 0, 0},
      {Network("standalone", "2  -1", "0 0.5", {"1", "0.5"}, "0.1"), nullptr, false, 0, 0},
      {Network("standalone", "2\\x", "0", {"1"}, "0.5"), nullptr, false, 0, 0},
      {Network("standalone", "2", "0", {"1"}, "0.5", "Network"), nullptr, false, 0, 0},
      {"not xml at all", nullptr, false, 0, 0},
      {"<!DOCTYPE Extension [<!ENTITY e \"2\">]>" + oneUnit, nullptr, false, 0, 0},
      {deep, nullptr, false, 0, 0},
  };
  QZVarList flag = FlagTarget();
  for (const Case& c : cases) {
    QZSettings settings;
    if (c.method != nullptr) settings.AddSetting("scoring_multipleModelMethod", c.method, true);
    ScoringAdjustedPropensity propensity(&settings, &flag);
    std::stringstream stream(c.document);
    EXPECT_EQ(propensity.ParseNetwork(&stream), c.ready) << c.document;
    EXPECT_EQ(propensity.IsReady(), c.ready);
    ValueRecord out = Record({{"prediction", "yes"}, {"probability", 0.5}});
    ValueRecord zero = Record({{"prediction", "no"}, {"probability", 1.0}});
    QZStatus status = propensity.ComputeAdjustedPropensity(out);
    if (c.ready) {
      ASSERT_TRUE(status.IsOK()) << c.document;
      ASSERT_TRUE(propensity.ComputeAdjustedPropensity(zero).IsOK());
      EXPECT_NEAR(out.Get("adjustedpropensity").GetReal(), c.atHalf, 1e-9) << c.document;
      EXPECT_NEAR(zero.Get("adjustedpropensity").GetReal(), c.atZero, 1e-9) << c.document;
    } else {
      EXPECT_EQ(status.GetErrorCode(), QZScoring_800::SCORING_NOT_SUPPORTED);
      EXPECT_FALSE(out.Contains("rawpropensity"));
    }
  }
  ScoringAdjustedPropensity unread(nullptr, &flag);
  EXPECT_FALSE(unread.ParseNetwork(nullptr));
}

}  // namespace

// The TreeModel plug-in through the scoring factory: the documents it refuses (with the
// diagnostic saying why) and scorers that share nothing across threads. What it scores
// is checked by the golden cases (tests/golden/cases/tree_*). Also the library's fast
// placing of numbers by simple predicates, which the plug-in's speed rests on.

#include <iostream>
#include <limits>
#include <memory>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "QZDisplay.h"
#include "QZMV.h"
#include "QZVarList.h"
#include "ScoringModel.h"
#include "ScoringDiscreteSplit.h"
#include "ScoringRange.h"
#include "ScoringScaleSplit.h"
#include "ScoringSetPredicate.h"
#include "ScoringSimplePredicate.h"
#include "Value.h"
#include "ValueRecord.h"
#include "ReferencePlugins.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringDiscreteSplit;
using QZScoring_800::ScoringModel;
using QZScoring_800::ScoringPredicate;
using QZScoring_800::ScoringRange;
using QZScoring_800::ScoringScaleSplit;
using QZScoring_800::ScoringSetPredicate;
using QZScoring_800::ScoringSimplePredicate;
using QZXML_800::QZSettings;

namespace {

// x (continuous) and c (r, g, b) predict y: A or B for classification, a number for
// regression. `attributes` go on the TreeModel, `nodes` is everything after its
// MiningSchema.
std::string Document(const std::string& function, const std::string& attributes,
                     const std::string& nodes) {
  const std::string target = function == "classification"
                                 ? R"(<DataField name="y" optype="categorical" dataType="string">
                                      <Value value="A"/><Value value="B"/></DataField>)"
                                 : R"(<DataField name="y" optype="continuous" dataType="double"/>)";
  return R"(<?xml version="1.0"?><PMML version="4.1"><DataDictionary>
    <DataField name="x" optype="continuous" dataType="double"/>
    <DataField name="c" optype="categorical" dataType="string">
      <Value value="r"/><Value value="g"/><Value value="b"/></DataField>)" +
         target + R"(</DataDictionary><TreeModel functionName=")" + function + "\" " +
         attributes + R"(><MiningSchema><MiningField name="y" usageType="predicted"/>
    <MiningField name="x"/><MiningField name="c"/></MiningSchema>)" + nodes +
         "</TreeModel></PMML>";
}

// A root with two leaves: x < 5 gives A (counts 3/1), else B (counts 1/3).
const char kTwoLeaves[] = R"(<Node id="0" score="A" recordCount="8" defaultChild="1"><True/>
  <Node id="1" score="A" recordCount="4">
    <SimplePredicate field="x" operator="lessThan" value="5"/>
    <ScoreDistribution value="A" recordCount="3"/><ScoreDistribution value="B" recordCount="1"/>
  </Node>
  <Node id="2" score="B" recordCount="4">
    <SimplePredicate field="x" operator="greaterOrEqual" value="5"/>
    <ScoreDistribution value="A" recordCount="1"/><ScoreDistribution value="B" recordCount="3"/>
  </Node>
</Node>)";

// A range of a class of its own: its splits place values through IsInRange, the way
// every range was placed before splits kept their ranges as numbers.
class PlainRange : public ScoringRange {
 public:
  using ScoringRange::ScoringRange;
  PlainRange* Clone() const override { return new PlainRange(*this); }
};

// For every value, the plain forms the predicate gives (NumericTest, CategoryTest)
// answer as Evaluate does wherever they decide. Returns how many answers they gave.
int ExpectPlainFormsAgree(const ScoringPredicate& predicate, const QZXML_800::IQZVariable* variable,
                          const std::vector<Value>& values) {
  ValueRecord record;
  record.Add(variable->GetName(), Value());
  ScoringSimplePredicate::NumericTest numeric{};
  ScoringPredicate::CategoryTest category{};
  const auto* simple = dynamic_cast<const ScoringSimplePredicate*>(&predicate);
  const auto* set = dynamic_cast<const ScoringSetPredicate*>(&predicate);
  const bool hasNumeric = simple != nullptr && simple->GetNumericTest(numeric);
  const bool hasCategory = (simple != nullptr && simple->GetCategoryTest(category)) ||
                           (set != nullptr && set->GetCategoryTest(category));
  int answers = 0;
  for (const Value& value : values) {
    record[0] = value;
    const ScoringPredicate::PredicateResult expected = predicate.Evaluate(record);
    ScoringPredicate::PredicateResult result;
    if (hasNumeric && ScoringSimplePredicate::EvaluateNumericTest(numeric, value, result)) {
      EXPECT_EQ(result, expected) << "numeric test, value " << value;
      ++answers;
    }
    const int code = ScoringPredicate::CategoryCode(variable, value);
    if (hasCategory && ScoringPredicate::EvaluateCategoryTest(category, code, result)) {
      EXPECT_EQ(result, expected) << "category test, value '" << value << "' code " << code;
      ++answers;
    }
  }
  return answers;
}

// A root whose only child has the given predicate.
std::string OneChild(const std::string& predicate, const std::string& rootAttributes = "") {
  return R"(<Node score="1" )" + rootAttributes + R"(><True/><Node id="c" score="2">)" +
         predicate + "</Node></Node>";
}

}  // namespace

// Documents the tree plug-in refuses at creation: the factory gets no scorer (260010)
// and the plug-in writes one diagnostic line saying what it refused.
TEST(TreePlugin, RefusesUnsupportedDocuments) {
  const std::string reg = "regression";
  const std::string cls = "classification";
  const struct {
    const char* message;
    std::string pmml;
  } cases[] = {
      {"QZTree: refused: TreeModel missingValueStrategy 'sometimes' is not supported",
       Document(cls, R"(missingValueStrategy="sometimes")", kTwoLeaves)},
      {"TreeModel noTrueChildStrategy 'returnAll' is not supported",
       Document(cls, R"(noTrueChildStrategy="returnAll")", kTwoLeaves)},
      {"TreeModel missingValuePenalty must lie between 0 and 1",
       Document(cls, R"(missingValuePenalty="1.5")", kTwoLeaves)},
      {"TreeModel splitCharacteristic 'ternarySplit' is not supported",
       Document(cls, R"(splitCharacteristic="ternarySplit")", kTwoLeaves)},
      {"TreeModel has no Node", Document(reg, "", "")},
      {"TreeModel has more than one root Node",
       Document(reg, "", R"(<Node score="1"><True/></Node><Node score="2"><True/></Node>)")},
      {"Node predicate element 'Predicate' is not supported",
       Document(reg, "", OneChild(R"(<Predicate field="x" operator="lessThan" value="1"/>)"))},
      {"Node without predicate", Document(reg, "", R"(<Node score="1"/>)")},
      {"predicate element 'Unknown' is not supported",
       Document(reg, "", OneChild(R"(<CompoundPredicate booleanOperator="or"><True/>
          <Unknown/></CompoundPredicate>)"))},
      {"SimplePredicate operator 'between' is not supported",
       Document(reg, "", OneChild(R"(<SimplePredicate field="c" operator="between" value="r"/>)"))},
      {"SimpleSetPredicate on field 'x', which is not categorical, is not supported",
       Document(reg, "", OneChild(R"(<CompoundPredicate booleanOperator="surrogate">
          <SimpleSetPredicate field="x" booleanOperator="isIn"><Array n="1" type="real">1
          </Array></SimpleSetPredicate><True/></CompoundPredicate>)"))},
      {"SimplePredicate refused (code 8): z: Invalid Split Variable!",
       Document(reg, "", OneChild(R"(<SimplePredicate field="z" operator="equal" value="1"/>)"))},
      {"CompoundPredicate refused (code 11): AND: Invalid Boolean Operator",
       Document(reg, "", OneChild(R"(<CompoundPredicate booleanOperator="AND"><True/>
          <False/></CompoundPredicate>)"))},
      {"Node score 'high' is not a number",
       Document(reg, "", R"(<Node score="high"><True/></Node>)")},
      {"Node defaultChild '9' names none of its children",
       Document(reg, R"(missingValueStrategy="defaultChild")",
                OneChild("<True/>", R"(defaultChild="9")"))},
      {"Node element 'Regression' is not supported",
       Document(reg, "", OneChild(R"(<True/><Regression functionName="regression"/>)"))},
  };
  for (const auto& c : cases) qztest::ExpectRefused(c.pmml, c.message);
}

// Scorers of one document share nothing: two models scored at once from two threads
// (weightedConfidence, which keeps per-record scratch, on inputs with and without
// missing values) give the results each gives alone.
TEST(TreePlugin, ModelsScoreIndependentlyInThreads) {
  const std::string pmml =
      Document("classification", R"(missingValueStrategy="weightedConfidence")", kTwoLeaves);
  auto first = qztest::CreateModel(pmml);
  auto second = qztest::CreateModel(pmml);
  ASSERT_NE(first, nullptr);
  ASSERT_NE(second, nullptr);
  auto run = [](ScoringModel* model, std::vector<double>* out) {
    ValueRecord input, output;
    input.Add("x", 0.0);
    input.Add("c", "r");
    model->Scorable(output);
    for (int i = 0; i < 3000; ++i) {
      input["x"] = i % 3 == 0 ? Value() : Value((i % 100) / 10.0);
      model->Score(input, output);
      out->push_back(output.Get("probability(B)").GetReal());
    }
  };
  std::vector<double> alone, a, b;
  run(first.get(), &alone);
  EXPECT_DOUBLE_EQ(alone[0], 0.5);   // x missing: half of each leaf
  EXPECT_DOUBLE_EQ(alone[1], 0.25);  // x = 0.1: the first leaf
  std::thread ta(run, first.get(), &a);
  std::thread tb(run, second.get(), &b);
  ta.join();
  tb.join();
  EXPECT_EQ(a, alone);
  EXPECT_EQ(b, alone);
}


// A simple predicate on a continuous field places a real by number, in Evaluate and in
// its NumericTest; both must answer as the ranges' own IsInRange does for every
// closure, infinite bounds, values on the bounds, infinities, missing and
// declared-missing values, texts, and copies of the predicate.
TEST(TreePlugin, NumericPlacingAgreesWithRanges) {
  const double inf = std::numeric_limits<double>::infinity();
  QZXML_800::QZVarList variables;
  variables.AddContVar("x", "", QZXML_800::ROLE_INPUT);
  const QZXML_800::IQZVariable* x = variables.GetVariable("x");
  variables.GetVariable("x")->GetEncoder()->AddMissingValue(-7.0, "");
  const double bounds[][2] = {{-inf, 0}, {0, inf}, {-1, 2.5}, {2.5, 2.5}, {-inf, inf}};
  const std::vector<Value> values = {
      Value(-inf), Value(-1.0),  Value(-0.5),  Value(0.0), Value(2.5),
      Value(3.0),  Value(inf),   Value(QZCommon_800::QZMV::Missing()),
      Value(-7.0), Value("2.5"), Value("abc"), Value()};
  ValueRecord record;
  record.Add("x", Value());
  for (const auto& bound : bounds) {
    for (int ends = 0; ends < 4; ++ends) {
      for (int map : {-1, 0}) {
        const bool low = (ends & 1) != 0, high = (ends & 2) != 0;
        auto numeric = std::make_unique<ScoringScaleSplit>(x);
        numeric->PutSplit(new ScoringRange(bound[0], bound[1], low, high), 0);
        numeric->SetMissvalMap(map);
        auto plain = std::make_unique<ScoringScaleSplit>(x);
        plain->PutSplit(new PlainRange(bound[0], bound[1], low, high), 0);
        plain->SetMissvalMap(map);
        const ScoringSimplePredicate fast(numeric.release());
        const ScoringSimplePredicate reference(plain.release());
        const std::unique_ptr<ScoringSimplePredicate> copy(fast.Clone());
        for (const Value& value : values) {
          record[0] = value;
          const auto expected = reference.Evaluate(record);
          EXPECT_EQ(fast.Evaluate(record), expected)
              << bound[0] << ".." << bound[1] << " ends " << ends << " map " << map << " value "
              << value;
          EXPECT_EQ(copy->Evaluate(record), expected);
        }
        EXPECT_EQ(ExpectPlainFormsAgree(fast, x, values), 10);  // every value but the texts
      }
    }
  }
  // The missing tests, and spot checks that the reference places as a comparison should.
  for (auto test : {ScoringSimplePredicate::MISSING_TEST_IS_MISSING,
                    ScoringSimplePredicate::MISSING_TEST_IS_NOT_MISSING}) {
    ScoringSimplePredicate missing(new ScoringScaleSplit(x));
    missing.SetMissingTest(test);
    EXPECT_EQ(ExpectPlainFormsAgree(missing, x, values), 10);
  }
  auto* split = new ScoringScaleSplit(x);
  split->PutSplit(new ScoringRange(-inf, 5.0, false, false), 0);
  const ScoringSimplePredicate below(split);
  for (const auto& c : {std::make_pair(Value(4.9), ScoringPredicate::PREDICATE_TRUE),
                        std::make_pair(Value(5.0), ScoringPredicate::PREDICATE_FALSE),
                        std::make_pair(Value(-7.0), ScoringPredicate::PREDICATE_UNKNOWN)}) {
    record[0] = c.first;
    EXPECT_EQ(below.Evaluate(record), c.second) << c.first;
  }
}

// Simple and set predicates on categorical fields: their CategoryTest, with the value's
// CategoryCode, answers as Evaluate does for categories, values that are no category,
// declared missing values, null, and kinds of value the test leaves to Evaluate.
TEST(TreePlugin, CategoryTestsAgreeWithEvaluate) {
  QZXML_800::QZVarList variables;
  variables.AddCatVar("c", "", std::vector<std::string>{"r", "g", "b"}, QZXML_800::ROLE_INPUT);
  variables.AddCatVar("n", "", std::vector<double>{1, 2, 3}, QZXML_800::ROLE_INPUT);
  variables.GetVariable("c")->GetEncoder()->AddMissingValue("?", "");
  const QZXML_800::IQZVariable* c = variables.GetVariable("c");
  const QZXML_800::IQZVariable* n = variables.GetVariable("n");
  auto split = [](const QZXML_800::IQZVariable* variable, std::vector<Value> entries, int map) {
    auto* made = new ScoringDiscreteSplit(variable);
    for (const Value& entry : entries) made->PutSplit(new Value(entry), 0);
    made->SetMissvalMap(map);
    return made;
  };
  const std::vector<Value> texts = {Value("r"), Value("g"),  Value("b"), Value("zz"),
                                    Value("?"), Value(""),   Value(),    Value(1.0),
                                    Value(QZCommon_800::QZMV::Missing())};
  const std::vector<Value> numbers = {Value(1.0), Value(2.0), Value(3.0), Value(5.0),
                                      Value("2"), Value("2.0"), Value()};
  // Simple: equal g, not equal g, empty equal (missing-value map 0), the two missing
  // tests; set: isIn g b, a set naming no category with map 0; then on n.
  using Case = std::pair<std::unique_ptr<ScoringPredicate>, const QZXML_800::IQZVariable*>;
  std::vector<Case> cases;
  auto simple = [&](const QZXML_800::IQZVariable* on, std::vector<Value> entries, int map) {
    cases.emplace_back(std::make_unique<ScoringSimplePredicate>(split(on, entries, map)), on);
  };
  auto set = [&](const QZXML_800::IQZVariable* on, std::vector<Value> entries, int map) {
    cases.emplace_back(std::make_unique<ScoringSetPredicate>(split(on, entries, map)), on);
  };
  simple(c, {Value("g")}, -1);
  simple(c, {Value("r"), Value("b")}, -1);
  simple(c, {}, 0);
  for (auto test : {ScoringSimplePredicate::MISSING_TEST_IS_MISSING,
                    ScoringSimplePredicate::MISSING_TEST_IS_NOT_MISSING}) {
    auto missing = std::make_unique<ScoringSimplePredicate>(split(c, {}, 0));
    missing->SetMissingTest(test);
    cases.emplace_back(std::move(missing), c);
  }
  set(c, {Value("g"), Value("b")}, -1);
  set(c, {Value("g"), Value("zz")}, 0);
  simple(n, {Value(2.0)}, -1);
  set(n, {Value("2"), Value("3")}, -1);
  for (const Case& entry : cases) {
    // Texts on c: all but the number 1.0; numbers on n: all but the two texts.
    const bool text = entry.second == c;
    EXPECT_EQ(ExpectPlainFormsAgree(*entry.first, entry.second, text ? texts : numbers),
              text ? 8 : 5);
  }
  EXPECT_EQ(ScoringPredicate::CategoryCode(c, Value("b")), 2);
  EXPECT_EQ(ScoringPredicate::CategoryCode(c, Value("zz")), ScoringPredicate::CATEGORY_NONE);
  EXPECT_EQ(ScoringPredicate::CategoryCode(c, Value("?")), ScoringPredicate::CATEGORY_MISSING);
  EXPECT_EQ(ScoringPredicate::CategoryCode(n, Value("2")), ScoringPredicate::CATEGORY_UNDECIDED);
}

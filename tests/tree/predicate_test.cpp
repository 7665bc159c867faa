// Predicates: three-valued evaluation, short-circuiting, missing and invalid inputs,
// the missing tests, copies, and the per-layout field cache.

#include <memory>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "QZVarList.h"
#include "ScoringCompoundPredicate.h"
#include "ScoringDiscreteSplit.h"
#include "ScoringFalsePredicate.h"
#include "ScoringRange.h"
#include "ScoringScaleSplit.h"
#include "ScoringSetPredicate.h"
#include "ScoringSimplePredicate.h"
#include "ScoringTruePredicate.h"
#include "Value.h"
#include "ValueRecord.h"

using namespace QZScoring_800;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZXML_800::QZVarList;

namespace {

using P = ScoringPredicate;
constexpr P::PredicateResult T = P::PREDICATE_TRUE;
constexpr P::PredicateResult F = P::PREDICATE_FALSE;
constexpr P::PredicateResult U = P::PREDICATE_UNKNOWN;

// A child with a fixed result that counts its evaluations.
class Probe : public ScoringPredicate {
 public:
  Probe(PredicateResult result, int* runs) : result_(result), runs_(runs) {}
  Probe* Clone() const override { return new Probe(*this); }
  PredicateResult Evaluate(const ValueRecord&) const override {
    ++*runs_;
    return result_;
  }
  PredicateType GetPredType() const override { return TRUE_PREDICATE; }
  bool IsDerivedPredictor() const override { return derived_; }
  void SetSplit(const ScoringSplitVar*) override {}
  const ScoringSplitVar* GetSplit() const override { return nullptr; }
  void Display(std::ostream&) const override {}
  bool derived_ = false;

 private:
  PredicateResult result_;
  int* runs_;
};

// x continuous with missing value -99; color nominal A, B, C with missing "?";
// grade ordinal with number categories 1, 2, 3.
struct Fields {
  Fields() {
    vars.AddContVar("x", "", QZXML_800::ROLE_INPUT);
    vars.GetEncoderAt(0)->AddMissingValue(-99.0, "");
    vars.AddCatVar("color", "", std::vector<std::string>{"A", "B", "C"}, QZXML_800::ROLE_INPUT);
    vars.GetEncoderAt(1)->AddMissingValue("?", "");
    vars.AddCatVar("grade", "", std::vector<double>{1, 2, 3}, QZXML_800::ROLE_INPUT);
    dynamic_cast<QZXML_800::QZCatVar*>(vars.GetVarAt(2))->SetOrdinalFlag(true);
  }
  const QZXML_800::IQZVariable* Var(const char* name) const { return vars.GetVariable(name); }
  QZVarList vars;
};

ValueRecord RecordOf(const std::string& name, const Value& value) {
  ValueRecord record;
  record.Add("other", Value(1));
  record.Add(name, value);
  return record;
}

// x < 5 (map as given).
ScoringScaleSplit* LessThanFive(const Fields& f, int map) {
  auto* split = new ScoringScaleSplit(f.Var("x"));
  split->PutSplit(new ScoringRange(nullptr, new Value(5.0), false, false), 0);
  split->SetMissvalMap(map);
  return split;
}

// A discrete split over the given categories (map as given).
template <class V>
ScoringDiscreteSplit* Categories(const QZXML_800::IQZVariable* var, std::vector<V> values,
                                 int map) {
  auto* split = new ScoringDiscreteSplit(var);
  for (const V& v : values) split->PutSplit(new Value(v), 0);
  split->SetMissvalMap(map);
  return split;
}

}  // namespace

// Two children under each operator: the result and whether the second child ran.
TEST(CompoundPredicate, TruthTablesAndShortCircuit) {
  struct Row {
    P::CompoundBoolOperator op;
    P::PredicateResult first, second, expected;
    bool secondRuns;
  };
  const Row rows[] = {
      {P::BOOL_OR, T, F, T, false},        {P::BOOL_OR, F, T, T, true},
      {P::BOOL_OR, F, F, F, true},         {P::BOOL_OR, F, U, U, true},
      {P::BOOL_OR, U, T, T, true},         {P::BOOL_OR, U, F, U, true},
      {P::BOOL_AND, T, T, T, true},        {P::BOOL_AND, T, F, F, true},
      {P::BOOL_AND, T, U, U, true},        {P::BOOL_AND, F, T, F, false},
      {P::BOOL_AND, U, F, F, true},        {P::BOOL_AND, U, T, U, true},
      {P::BOOL_XOR, T, T, F, true},        {P::BOOL_XOR, T, F, T, true},
      {P::BOOL_XOR, F, F, F, true},        {P::BOOL_XOR, F, U, U, true},
      {P::BOOL_XOR, U, T, U, false},       {P::BOOL_SURROGATE, T, F, T, false},
      {P::BOOL_SURROGATE, F, T, F, false}, {P::BOOL_SURROGATE, U, T, T, true},
      {P::BOOL_SURROGATE, U, F, F, true},  {P::BOOL_SURROGATE, U, U, U, true},
  };
  const ValueRecord record;
  for (const Row& row : rows) {
    int firstRuns = 0, secondRuns = 0;
    ScoringCompoundPredicate compound(row.op);
    compound.AddPredicate(new Probe(row.first, &firstRuns));
    compound.AddPredicate(new Probe(row.second, &secondRuns));
    SCOPED_TRACE(testing::Message() << "op " << row.op << " first " << row.first << " second "
                                    << row.second);
    EXPECT_EQ(row.expected, compound.Evaluate(record));
    EXPECT_EQ(1, firstRuns);
    EXPECT_EQ(row.secondRuns ? 1 : 0, secondRuns);
  }
}

// Empty lists, odd and even true counts under xor, and an unknown operator value.
TEST(CompoundPredicate, EmptyListsXorParityAndUnknownOperator) {
  const ValueRecord record;
  EXPECT_EQ(F, ScoringCompoundPredicate(P::BOOL_OR).Evaluate(record));
  EXPECT_EQ(T, ScoringCompoundPredicate(P::BOOL_AND).Evaluate(record));
  EXPECT_EQ(F, ScoringCompoundPredicate(P::BOOL_XOR).Evaluate(record));
  EXPECT_EQ(U, ScoringCompoundPredicate().Evaluate(record));

  int runs = 0;
  ScoringCompoundPredicate xor3(P::BOOL_XOR);
  for (int i = 0; i < 3; ++i) xor3.AddPredicate(new Probe(T, &runs));
  EXPECT_EQ(T, xor3.Evaluate(record));

  xor3.SetBoolOperator(static_cast<P::CompoundBoolOperator>(7));
  runs = 0;
  EXPECT_EQ(U, xor3.Evaluate(record));
  EXPECT_EQ(0, runs);
  EXPECT_EQ(7, static_cast<int>(xor3.GetBoolOperator()));
}

// Children are owned: copies clone them, assignment appends clones, RemovePredicate
// hands a child back without deleting it.
TEST(CompoundPredicate, OwnershipCopiesAndRemoval) {
  int runs = 0;
  ScoringCompoundPredicate source(P::BOOL_AND);
  auto* probe = new Probe(T, &runs);
  probe->derived_ = true;
  source.AddPredicate(new ScoringTruePredicate());
  source.AddPredicate(probe);
  source.AddPredicate(nullptr);
  EXPECT_TRUE(source.IsDerivedPredictor());
  EXPECT_FALSE(ScoringCompoundPredicate().IsDerivedPredictor());

  const ScoringCompoundPredicate copy(source);
  ASSERT_EQ(2, copy.GetCount());
  EXPECT_EQ(P::BOOL_AND, copy.GetBoolOperator());
  EXPECT_NE(probe, copy.GetPredicates()[1]);

  ScoringCompoundPredicate target(P::BOOL_OR);
  target.AddPredicate(new ScoringFalsePredicate());
  target = source;
  ScoringCompoundPredicate& same = target;
  target = same;  // self-assignment
  EXPECT_EQ(3, target.GetCount());
  EXPECT_EQ(P::BOOL_AND, target.GetBoolOperator());

  ScoringTruePredicate stranger;
  EXPECT_FALSE(source.RemovePredicate(&stranger));
  ASSERT_TRUE(source.RemovePredicate(probe));
  std::unique_ptr<ScoringPredicate> returned(probe);  // ours again; still usable
  EXPECT_EQ(T, returned->Evaluate(ValueRecord()));
  EXPECT_EQ(1, source.GetCount());
}

// Fixed display texts, types and the split slots of every predicate kind.
TEST(Predicates, DisplayTypesAndSplitSlots) {
  struct Row {
    std::unique_ptr<ScoringPredicate> predicate;
    const char* text;
    P::PredicateType type;
  };
  Row rows[5] = {{std::make_unique<ScoringSimplePredicate>(), "Simple Predicate: \n",
                  P::SIMPLE_PREDICATE},
                 {std::make_unique<ScoringSetPredicate>(), "Set Predicate: \n", P::SET_PREDICATE},
                 {std::make_unique<ScoringCompoundPredicate>(), "Compound Predicate: \n",
                  P::COMPOUND_PREDICATE},
                 {std::make_unique<ScoringTruePredicate>(), "Constant TRUE\n", P::TRUE_PREDICATE},
                 {std::make_unique<ScoringFalsePredicate>(), "Constant FALSE\n",
                  P::FALSE_PREDICATE}};
  for (Row& row : rows) {
    std::ostringstream out;
    std::unique_ptr<ScoringPredicate>(row.predicate->Clone())->Display(out);
    EXPECT_EQ(row.text, out.str());
    EXPECT_EQ(row.type, row.predicate->GetPredType());
  }
  // Without a split, simple and set predicates cannot decide.
  const P::PredicateResult results[] = {U, U, U, T, F};
  for (int i = 0; i < 5; ++i) EXPECT_EQ(results[i], rows[i].predicate->Evaluate(ValueRecord()));

  Fields f;
  const ScoringSplitVar* split = LessThanFive(f, -1);
  rows[0].predicate->SetSplit(split);
  rows[0].predicate->SetSplit(split);  // the same split again is kept, not deleted
  EXPECT_EQ(split, rows[0].predicate->GetSplit());
  rows[0].predicate->SetSplit(LessThanFive(f, 0));  // the first one is deleted
  EXPECT_EQ(T, rows[0].predicate->Evaluate(RecordOf("y", Value(1)))) << "no field, map 0";
  EXPECT_EQ(T, rows[0].predicate->Evaluate(RecordOf("x", Value(1))));
}

// Simple predicates: a missing value (null, system-missing, declared missing, or on a
// categorical field any value that is not a category) is true with a missing-value map
// and unknown without; otherwise the split decides (an unmatched value takes the map).
TEST(SimplePredicate, MissingInvalidAndValidInputs) {
  Fields f;
  struct Row {
    const char* field;
    Value input;
    P::PredicateResult noMap, withMap;
  };
  const Row rows[] = {
      {"x", Value(3.0), T, T},          {"x", Value(7.0), F, T},
      {"x", Value("4"), T, T},          {"x", Value("12"), F, T},  // numeric text
      {"x", Value(), U, T},             {"x", Value(QZCommon_800::QZMV::Missing()), U, T},
      {"x", Value(-99.0), U, T},        {"x", Value("abc"), U, T},
      {"color", Value("B"), T, T},      {"color", Value("A"), F, T},
      {"color", Value("Z"), U, T},      {"color", Value("?"), U, T},
      {"color", Value(), U, T},         {"grade", Value(2.0), T, T},
      {"grade", Value("3"), T, T},      {"grade", Value(1.0), F, T},
      {"grade", Value(7.0), U, T},      {"grade", Value("two"), U, T},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(testing::Message() << row.field << " = " << row.input);
    for (int map : {-1, 0}) {
      std::unique_ptr<ScoringSplitVar> split;
      const std::string field = row.field;
      if (field == "x") split.reset(LessThanFive(f, map));
      if (field == "color") split.reset(Categories<std::string>(f.Var("color"), {"B", "C"}, map));
      if (field == "grade") split.reset(Categories<double>(f.Var("grade"), {2, 3}, map));
      ScoringSimplePredicate predicate(split.release());
      EXPECT_EQ(map == -1 ? row.noMap : row.withMap,
                predicate.Evaluate(RecordOf(row.field, row.input)));
      EXPECT_EQ(row.input, predicate.GetScoreValue(f.Var(row.field),
                                                  RecordOf(row.field, row.input)));
    }
  }
}

// "isMissing" / "isNotMissing" are never unknown: they answer exactly whether the input
// is missing; an unknown category is present.
TEST(SimplePredicate, MissingTestsAreNeverUnknown) {
  Fields f;
  struct Row {
    const char* field;
    Value input;
    bool missing;
  };
  const Row rows[] = {
      {"x", Value(3.0), false},    {"x", Value(), true},        {"x", Value(-99.0), true},
      {"color", Value("Z"), false}, {"color", Value("?"), true}, {"color", Value("A"), false},
      {"grade", Value(9.0), false}, {"grade", Value(), true},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(testing::Message() << row.field << " = " << row.input);
    const QZXML_800::IQZVariable* var = f.Var(row.field);
    // The splits the parser builds: no values and map 0, or a range over all numbers.
    auto* split = new ScoringDiscreteSplit(var);
    split->SetMissvalMap(0);
    ScoringSimplePredicate isMissing(split);
    isMissing.SetMissingTest(ScoringSimplePredicate::MISSING_TEST_IS_MISSING);
    ScoringSimplePredicate isNotMissing(isMissing);
    isNotMissing.SetMissingTest(ScoringSimplePredicate::MISSING_TEST_IS_NOT_MISSING);
    const ValueRecord record = RecordOf(row.field, row.input);
    EXPECT_EQ(row.missing ? T : F, isMissing.Evaluate(record));
    EXPECT_EQ(row.missing ? F : T, isNotMissing.Evaluate(record));
    std::unique_ptr<ScoringPredicate> clone(isNotMissing.Clone());
    EXPECT_EQ(ScoringSimplePredicate::MISSING_TEST_IS_NOT_MISSING,
              dynamic_cast<ScoringSimplePredicate&>(*clone).GetMissingTest());
  }
  ScoringSimplePredicate noSplit;
  noSplit.SetMissingTest(ScoringSimplePredicate::MISSING_TEST_IS_MISSING);
  EXPECT_EQ(U, noSplit.Evaluate(ValueRecord()));
}

// Set predicates never turn missing or invalid input into true, whatever the map; a
// number input matches a text entry of a numeric field (PMML arrays give texts).
TEST(SetPredicate, MissingInvalidAndValidInputs) {
  Fields f;
  struct Row {
    const char* field;
    Value input;
    P::PredicateResult expected;
  };
  const Row rows[] = {
      {"color", Value("B"), T}, {"color", Value("A"), F},  {"color", Value("Z"), U},
      {"color", Value("?"), U}, {"color", Value(), U},     {"grade", Value(2.0), T},
      {"grade", Value("3"), T}, {"grade", Value(1.0), F},  {"grade", Value(8.0), U},
      {"x", Value(-99.0), U},   {"x", Value(), U},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(testing::Message() << row.field << " = " << row.input);
    const std::string field = row.field;
    // Unusable input stays unknown even under a missing-value map.
    for (int map : {-1, 0}) {
      if (map == 0 && row.expected != U) continue;
      ScoringSplitVar* split = field == "color"
                                   ? Categories<std::string>(f.Var("color"), {"B", "C"}, map)
                                   : Categories<std::string>(f.Var(row.field), {"2", "3"}, map);
      const ScoringSetPredicate predicate(split);
      const ScoringSetPredicate copy(predicate);
      EXPECT_EQ(row.expected, copy.Evaluate(RecordOf(row.field, row.input)));
    }
  }
}

// The field's position is cached per record layout: records of other layouts, records
// that gain the field later, and concurrent threads all read the right field.
TEST(SimplePredicate, FieldCacheFollowsLayouts) {
  Fields f;
  ScoringSimplePredicate predicate(LessThanFive(f, -1));
  ValueRecord first;
  first.Add("x", Value(1));
  ValueRecord second;
  second.Add("a", Value(100));
  second.Add("b", Value(100));
  second.Add("x", Value(9));
  ValueRecord growing;
  growing.Add("a", Value(1));
  for (int round = 0; round < 2; ++round) {
    EXPECT_EQ(T, predicate.Evaluate(first));
    EXPECT_EQ(F, predicate.Evaluate(second));
    EXPECT_EQ(U, predicate.Evaluate(growing));
  }
  growing.Add("x", Value(2));  // same layout id, new field
  EXPECT_EQ(T, predicate.Evaluate(growing));
  ValueRecord copy(second);
  copy.Add("y", Value(0));  // a copy that grows gets a layout of its own
  copy["x"] = Value(0);
  EXPECT_EQ(T, predicate.Evaluate(copy));
  EXPECT_EQ(F, predicate.Evaluate(second));

  // Two threads alternate between layouts on one predicate.
  auto run = [&](const ValueRecord& a, const ValueRecord& b, int* wrong) {
    for (int i = 0; i < 20000; ++i) {
      if (predicate.Evaluate(a) != T || predicate.Evaluate(b) != F) ++*wrong;
    }
  };
  int wrong1 = 0, wrong2 = 0;
  std::thread t1(run, std::cref(first), std::cref(second), &wrong1);
  std::thread t2(run, std::cref(copy), std::cref(second), &wrong2);
  t1.join();
  t2.join();
  EXPECT_EQ(0, wrong1 + wrong2);
}

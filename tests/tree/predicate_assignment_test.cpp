// Assigning simple and set predicates and replacing their splits: the target owns a
// deep copy, judges by its new split's field (not a position it cached for the old
// one), and the source stays usable.

#include <memory>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "QZVarList.h"
#include "ScoringDiscreteSplit.h"
#include "ScoringRange.h"
#include "ScoringScaleSplit.h"
#include "ScoringSetPredicate.h"
#include "ScoringSimplePredicate.h"
#include "Value.h"
#include "ValueRecord.h"

using namespace QZScoring_800;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace {

using P = ScoringPredicate;

// x and y continuous (y with missing value -1), color nominal A, B, C.
struct Fields {
  Fields() {
    vars.AddContVar("x", "", QZXML_800::ROLE_INPUT);
    vars.AddContVar("y", "", QZXML_800::ROLE_INPUT);
    vars.GetEncoderAt(1)->AddMissingValue(-1.0, "");
    vars.AddCatVar("color", "", std::vector<std::string>{"A", "B", "C"}, QZXML_800::ROLE_INPUT);
  }
  const QZXML_800::IQZVariable* Var(const char* name) const { return vars.GetVariable(name); }
  QZXML_800::QZVarList vars;
};

// field < limit.
ScoringScaleSplit* Below(const Fields& f, const char* field, double limit) {
  auto* split = new ScoringScaleSplit(f.Var(field));
  split->PutSplit(new ScoringRange(nullptr, new Value(limit), false, false), 0);
  return split;
}

ScoringDiscreteSplit* OneOf(const Fields& f, std::vector<std::string> categories) {
  auto* split = new ScoringDiscreteSplit(f.Var("color"));
  for (const std::string& c : categories) split->PutSplit(new Value(c), 0);
  return split;
}

// x first, then y, then color: one layout for every record here.
ValueRecord Record(double x, double y, const char* color) {
  ValueRecord record;
  record.Add("x", Value(x));
  record.Add("y", Value(y));
  record.Add("color", Value(color));
  return record;
}

}  // namespace

TEST(PredicateAssignment, SimplePredicates) {
  Fields f;
  ScoringSimplePredicate onX(Below(f, "x", 5));
  auto source = std::make_unique<ScoringSimplePredicate>(Below(f, "y", 5));
  source->SetMissingTest(ScoringSimplePredicate::MISSING_TEST_IS_NOT_MISSING);

  // onX caches the position of x; after the assignment it must read y instead.
  EXPECT_EQ(P::PREDICATE_TRUE, onX.Evaluate(Record(1, 9, "A")));
  onX = *source;
  EXPECT_NE(source->GetSplit(), onX.GetSplit());  // a copy, not the same split
  EXPECT_EQ(ScoringSimplePredicate::MISSING_TEST_IS_NOT_MISSING, onX.GetMissingTest());
  EXPECT_EQ(P::PREDICATE_TRUE, onX.Evaluate(Record(1, 9, "A")));   // y present
  EXPECT_EQ(P::PREDICATE_FALSE, onX.Evaluate(Record(1, -1, "A")));  // y declared missing

  // Without the missing test, the copied split compares y.
  ScoringSimplePredicate plain(Below(f, "x", 5));
  EXPECT_EQ(P::PREDICATE_FALSE, plain.Evaluate(Record(9, 1, "A")));
  plain = ScoringSimplePredicate(Below(f, "y", 5));
  EXPECT_EQ(P::PREDICATE_TRUE, plain.Evaluate(Record(9, 1, "A")));
  EXPECT_EQ(P::PREDICATE_UNKNOWN, plain.Evaluate(Record(9, -1, "A")));

  // The target outlives its source; assigning to itself changes nothing.
  source.reset();
  EXPECT_EQ(P::PREDICATE_TRUE, onX.Evaluate(Record(1, 9, "A")));
  ScoringSimplePredicate& same = onX;
  onX = same;
  EXPECT_EQ(P::PREDICATE_FALSE, onX.Evaluate(Record(1, -1, "A")));

  // An empty predicate assigned over one with a split cannot decide any more.
  onX = ScoringSimplePredicate();
  EXPECT_EQ(nullptr, onX.GetSplit());
  EXPECT_EQ(P::PREDICATE_UNKNOWN, onX.Evaluate(Record(1, 9, "A")));
}

TEST(PredicateAssignment, SetPredicates) {
  Fields f;
  ScoringSetPredicate set(OneOf(f, {"A"}));
  const ValueRecord b = Record(0, 0, "B");
  EXPECT_EQ(P::PREDICATE_FALSE, set.Evaluate(b));
  EXPECT_EQ(Value("B"), set.GetScoreValue(f.Var("color"), b));
  EXPECT_EQ(Value(), set.GetScoreValue(nullptr, b));

  // A new split replaces the old one; the same split again is kept.
  const ScoringSplitVar* bc = OneOf(f, {"B", "C"});
  set.SetSplit(bc);
  set.SetSplit(bc);
  EXPECT_EQ(bc, set.GetSplit());
  EXPECT_EQ(P::PREDICATE_TRUE, set.Evaluate(b));

  auto source = std::make_unique<ScoringSetPredicate>(OneOf(f, {"C"}));
  set = *source;
  EXPECT_NE(source->GetSplit(), set.GetSplit());
  source.reset();
  EXPECT_EQ(P::PREDICATE_FALSE, set.Evaluate(b));
  EXPECT_EQ(P::PREDICATE_TRUE, set.Evaluate(Record(0, 0, "C")));
  ScoringSetPredicate& same = set;
  set = same;
  EXPECT_EQ(P::PREDICATE_TRUE, set.Evaluate(Record(0, 0, "C")));
}

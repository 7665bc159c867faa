// Split variables and value ranges: child indexes, the missing-value map, open and
// closed ends, infinite bounds, copies and display texts.

#include <limits>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "QZMV.h"
#include "QZVarList.h"
#include "ScoringDiscreteSplit.h"
#include "ScoringRange.h"
#include "ScoringScaleSplit.h"
#include "Value.h"

using namespace QZScoring_800;
using QZCommon_800::QZMV;
using QZCommon_800::Value;

namespace {

const Value kInf = Value::GetInfinity();
const Value kMinusInf = -Value::GetInfinity();

std::string Shown(const ScoringSplitVar& split) {
  std::ostringstream out;
  split.Display(out);
  return out.str();
}

std::vector<std::string> Texts(const std::vector<const Value*>& values) {
  std::vector<std::string> texts;
  for (const Value* v : values) texts.push_back(v->GetString());
  return texts;
}

}  // namespace

// Construction rules for bounds: null and system-missing minimum, shared object, single
// point, and which ends hold which values.
TEST(ScoringRange, BoundsAndEnds) {
  ScoringRange open(nullptr, nullptr, false, false);
  EXPECT_EQ(kMinusInf, *open.GetMin());
  EXPECT_EQ(kInf, *open.GetMax());
  EXPECT_FALSE(open.GetLowEnd());
  EXPECT_FALSE(open.GetHighEnd());
  EXPECT_FALSE(open.IsInRange(nullptr));
  const Value big(1e300);
  EXPECT_TRUE(open.IsInRange(&big));

  ScoringRange missing(new Value(QZMV::Missing()), new Value(QZMV::Missing()), true, true);
  EXPECT_EQ(kMinusInf, *missing.GetMin());
  EXPECT_TRUE(missing.GetMax()->IsSystemMissingValue());
  EXPECT_EQ(kMinusInf, *ScoringRange(QZMV::Missing(), 3.0, true, false).GetMin());

  auto* shared = new Value(QZMV::Missing());
  ScoringRange same(shared, shared, true, true);  // one object, two owned bounds
  EXPECT_NE(same.GetMin(), same.GetMax());
  EXPECT_EQ(kMinusInf, *same.GetMax());

  ScoringRange point(new Value(4.0));
  EXPECT_EQ(Value(4.0), *point.GetMax());
  EXPECT_TRUE(point.GetLowEnd() && point.GetHighEnd());
  EXPECT_EQ(kInf, *ScoringRange(static_cast<Value*>(nullptr)).GetMax());

  // In-range tables of [1, 1] and of 0..10 under each pair of end flags.
  const Value one(1.0), zero(0.0), ten(10.0), five(5.0);
  EXPECT_TRUE(ScoringRange(1.0, 1.0, true, true).IsInRange(&one));
  EXPECT_FALSE(ScoringRange(1.0, 1.0, false, true).IsInRange(&one));
  EXPECT_FALSE(ScoringRange(1.0, 1.0, true, false).IsInRange(&one));
  struct Row {
    bool low, high, zeroIn, tenIn;
  };
  for (const Row& row : {Row{true, true, true, true}, Row{true, false, true, false},
                         Row{false, true, false, true}, Row{false, false, false, false}}) {
    ScoringRange range(0.0, 10.0, row.low, row.high);
    EXPECT_EQ(row.zeroIn, range.IsInRange(&zero));
    EXPECT_EQ(row.tenIn, range.IsInRange(&ten));
    EXPECT_TRUE(range.IsInRange(&five));
  }
}

// Copies, equality, the setters and the display text.
TEST(ScoringRange, CopiesSettersAndDisplay) {
  ScoringRange range(2.5, 10.0, true, false);
  std::unique_ptr<ScoringValueRange> clone(range.Clone());
  EXPECT_TRUE(range == *clone);
  EXPECT_NE(range.GetMin(), clone->GetMin());
  EXPECT_FALSE(range == ScoringRange(2.5, 10.0, false, false));
  EXPECT_FALSE(range == ScoringRange(2.5, 11.0, true, false));

  ScoringRange assigned(0.0, 1.0, false, true);
  assigned = range;
  ScoringRange& same = assigned;
  assigned = same;  // self-assignment
  EXPECT_TRUE(assigned == range);

  range.SetMin(nullptr);
  range.SetMax(nullptr);
  EXPECT_EQ(Value(2.5), *range.GetMin());
  range.SetMin(new Value(QZMV::Missing()));
  range.SetMax(new Value(QZMV::Missing()));
  EXPECT_EQ(kMinusInf, *range.GetMin());
  EXPECT_TRUE(range.GetMax()->IsSystemMissingValue());

  std::ostringstream out;
  ScoringRange(nullptr, new Value(5.0), false, true).Display(out);
  EXPECT_EQ(
      "  Start Range Display   \nMinValue: -inf;  MaxValue: 5; High End included; lower End "
      "not included\n End of Range Display\n\n",
      out.str());
}

// Discrete splits: the first equal entry wins, unmatched and null values take the
// map, values by child index, copies clone and assignment appends.
TEST(DiscreteSplit, ChildIndexesValuesAndCopies) {
  QZXML_800::QZVarList vars;
  vars.AddCatVar("c", "", std::vector<std::string>{"a", "b", "c"}, QZXML_800::ROLE_INPUT);
  vars.AddCatVar("n", "", std::vector<double>{1, 2}, QZXML_800::ROLE_INPUT);
  ScoringDiscreteSplit split(vars.GetVariable("c"));
  EXPECT_EQ(-1, split.GetSplitChildIndex(nullptr));
  const Value a("a"), b("b"), c("c"), z("z");
  EXPECT_EQ(-1, split.GetSplitChildIndex(&a));
  split.SetMissvalMap(3);
  EXPECT_EQ(3, split.GetSplitChildIndex(&a));

  split.PutSplit(new Value("a"), 0);
  split.PutSplit(new Value("b"), 0);
  split.PutSplit(new Value("c"), 1);
  split.PutSplit(new Value("a"), 2);
  split.PutSplit(nullptr, 5);
  EXPECT_EQ(0, split.GetSplitChildIndex(&a));
  EXPECT_EQ(1, split.GetSplitChildIndex(&c));
  EXPECT_EQ(3, split.GetSplitChildIndex(&z));
  EXPECT_EQ(3, split.GetSplitChildIndex(nullptr));
  EXPECT_EQ((std::vector<std::string>{"a", "b", "c", "a"}), Texts(split.GetSplitValues()));
  EXPECT_EQ((std::vector<std::string>{"a", "b"}), Texts(split.GetSplitValuesForIndex(0)));
  EXPECT_EQ((std::vector<std::string>{"a"}), Texts(split.GetSplitValuesFirst()));
  EXPECT_TRUE(ScoringDiscreteSplit(nullptr).GetSplitValuesFirst().empty());
  EXPECT_EQ(-1, split.GetSplitType());

  std::unique_ptr<ScoringDiscreteSplit> clone(split.Clone());
  EXPECT_EQ(4u, clone->GetSplitValues().size());
  EXPECT_NE(split.GetSplitValues()[0], clone->GetSplitValues()[0]);
  EXPECT_EQ(3, clone->GetMissvalMap());
  ScoringDiscreteSplit target(vars.GetVariable("n"));
  target.PutSplit(new Value("x"), 9);
  target = split;
  EXPECT_EQ(5u, target.GetSplitValues().size());
  EXPECT_EQ("c", target.GetSplitName());

}

// Matching across value kinds, the first match winning, with and without the hash index
// that large splits keep (the first seven entries alone are scanned): numbers and their
// texts match on a numeric field by number, on a text field by text.
TEST(DiscreteSplit, IndexedAndScannedLookupsAgree) {
  QZXML_800::QZVarList vars;
  vars.AddCatVar("n", "", std::vector<double>{1, 2}, QZXML_800::ROLE_INPUT);
  vars.AddCatVar("c", "", std::vector<std::string>{"a"}, QZXML_800::ROLE_INPUT);
  const Value entries[] = {Value("a"), Value(2.0),  Value("2"),  Value("3"),
                           Value(3.0), Value("a"),  Value(-0.0), Value("07"),
                           Value(QZMV::Missing())};
  struct Row {
    Value probe;
    int numeric, text;  // expected child index on each field; 99 is the map
  };
  const Row rows[] = {
      {Value("a"), 0, 0},   {Value(2.0), 1, 1},   {Value("2"), 1, 1},    {Value("3"), 3, 3},
      {Value(3.0), 3, 3},   {Value(0.0), 6, 6},   {Value("7"), 99, 99},  {Value(7.0), 7, 99},
      {Value("07"), 7, 7},  {Value("2.0"), 1, 99}, {Value(QZMV::Missing()), 8, 8},
      {Value("zz"), 99, 99}, {Value(), 99, 99},
  };
  for (const char* field : {"n", "c"}) {
    ScoringDiscreteSplit large(vars.GetVariable(field)), small(vars.GetVariable(field));
    for (int i = 0; i < 9; ++i) {
      large.PutSplit(entries[i].Clone(), i);
      if (i < 7) small.PutSplit(entries[i].Clone(), i);
    }
    large.SetMissvalMap(99);
    small.SetMissvalMap(99);
    const ScoringDiscreteSplit copy(large);
    for (const Row& row : rows) {
      SCOPED_TRACE(testing::Message() << field << ": " << row.probe);
      const int expected = std::string(field) == "n" ? row.numeric : row.text;
      EXPECT_EQ(expected, large.GetSplitChildIndex(&row.probe));
      EXPECT_EQ(expected, copy.GetSplitChildIndex(&row.probe));
      EXPECT_EQ(expected < 7 ? expected : 99, small.GetSplitChildIndex(&row.probe));
    }
  }
}

// Display of a discrete split, nominal with start and end and ordinal without.
TEST(DiscreteSplit, Display) {
  QZXML_800::QZVarList vars;
  vars.AddCatVar("c", "", std::vector<std::string>{"a", "b"}, QZXML_800::ROLE_INPUT);
  ScoringDiscreteSplit split(vars.GetVariable("c"));
  split.PutSplit(new Value("a"), 0);
  split.PutSplit(new Value(2.5), 1);
  split.SetStartAndEndIndex(0, 1);
  int start = -5, end = -5;
  split.GetStartAndEndIndex(start, end);
  EXPECT_EQ(0, start);
  EXPECT_EQ(1, end);
  EXPECT_EQ(
      "SplitVarName = c; Var type: Categorical\nMissing Value index: -1\n"
      "Split value index starts from  0 to 1\nValue = a; Index = 0\nValue = 2.5; Index = 1\n\n",
      Shown(split));
  dynamic_cast<QZXML_800::QZCatVar*>(vars.GetVarAt(0))->SetOrdinalFlag(true);
  split.SetStartAndEndIndex(-1, 1);
  split.SetMissvalMap(0);
  EXPECT_EQ(
      "SplitVarName = c; Var type: Ordinal\nMissing Value index: 0\n"
      "Value = a; Index = 0\nValue = 2.5; Index = 1\n\n",
      Shown(split));
}

// Scale splits: insertion order resolves overlaps, missing input takes the map without
// asking a range, numeric texts are placed by their number; copies and display.
TEST(ScaleSplit, ChildIndexesCopiesAndDisplay) {
  QZXML_800::QZVarList vars;
  vars.AddContVar("x", "", QZXML_800::ROLE_INPUT);
  vars.GetEncoderAt(0)->AddMissingValue(7.5, "");
  ScoringScaleSplit split(vars.GetVariable("x"));
  split.PutSplit(new ScoringRange(0.0, 10.0, true, true), 1);
  split.PutSplit(new ScoringRange(5.0, 20.0, true, true), 2);
  split.PutSplit(nullptr, 3);
  split.SetMissvalMap(9);
  const Value seven(7.0), fifteen(15.0), fifteenText("15"), missing(7.5), none, far(30.0);
  EXPECT_EQ(1, split.GetSplitChildIndex(&seven));
  EXPECT_EQ(2, split.GetSplitChildIndex(&fifteen));
  EXPECT_EQ(2, split.GetSplitChildIndex(&fifteenText));
  EXPECT_EQ(9, split.GetSplitChildIndex(&missing));
  EXPECT_EQ(9, split.GetSplitChildIndex(&none));
  EXPECT_EQ(9, split.GetSplitChildIndex(nullptr));
  EXPECT_EQ(9, split.GetSplitChildIndex(&far));
  EXPECT_EQ(nullptr, ScoringScaleSplit(nullptr).GetSplitValueRangeFirst());
  EXPECT_EQ(Value(5.0), *split.GetSplitValueRangeForIndex(2)->GetMin());
  EXPECT_EQ(nullptr, split.GetSplitValueRangeForIndex(4));

  std::unique_ptr<ScoringScaleSplit> clone(split.Clone());
  EXPECT_NE(split.GetSplitValueRangeFirst(), clone->GetSplitValueRangeFirst());
  ScoringScaleSplit appended(nullptr);
  appended.PutSplit(new ScoringRange(nullptr, nullptr, false, false), 0);
  appended = split;
  EXPECT_EQ(0, appended.GetSplitChildIndex(&far)) << "own range first";
  EXPECT_EQ(9, appended.GetMissvalMap());

  ScoringScaleSplit shown(vars.GetVariable("x"));
  shown.PutSplit(new ScoringRange(new Value(1.0)), 0);
  EXPECT_EQ(
      "SplitVarName = x\nMissing Value index: -1\nIndex = 0\n"
      "  Start Range Display   \nMinValue: 1;  MaxValue: 1; High End included; lower End "
      "included\n End of Range Display\n\n\n",
      Shown(shown));
}

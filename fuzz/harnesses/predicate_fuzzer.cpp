// GetPredicate against a fixed variable list (categorical texts and numbers, an
// ordinal, a continuous field, a field without categories), then evaluation on a few
// records. A clone must evaluate as the original, and the plain-data forms of simple
// and set predicates (category and numeric tests) must agree with Evaluate wherever
// they decide.
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "FuzzSupport.h"
#include "QZSettings.h"
#include "QZVarList.h"
#include "ScoringPMMLParser.h"
#include "ScoringPredicate.h"
#include "ScoringScorerFactory.h"
#include "ScoringSetPredicate.h"
#include "ScoringSimplePredicate.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using namespace QZScoring_800;

namespace {

const char kDictionary[] = R"(<DataDictionary>
  <DataField name="x" optype="categorical" dataType="string">
    <Value value="A"/><Value value="B"/><Value value="C"/><Value value="?" property="missing"/>
  </DataField>
  <DataField name="o" optype="ordinal" dataType="string">
    <Value value="low"/><Value value="mid"/><Value value="high"/></DataField>
  <DataField name="n" optype="categorical" dataType="integer">
    <Value value="1"/><Value value="2"/><Value value="3"/><Value value="-1" property="missing"/>
  </DataField>
  <DataField name="c" optype="continuous" dataType="double">
    <Interval closure="closedClosed" leftMargin="-100" rightMargin="100"/>
    <Value value="-999" property="missing"/></DataField>
  <DataField name="i" optype="continuous" dataType="integer"/>
  <DataField name="e" optype="categorical" dataType="string"/>
</DataDictionary>)";

QZXML_800::QZVarList& Variables() {
  static QZXML_800::QZVarList* vars = [] {
    auto* list = new QZXML_800::QZVarList;
    ScoringPMMLParser parser;
    std::istringstream in(kDictionary);
    if (!parser.FillVarList(*list, in).IsOK()) qzfuzz::Fail("the fixed dictionary is refused");
    return list;
  }();
  return *vars;
}

std::vector<ValueRecord> Records() {
  struct Row {
    Value x, o, n, c, i, e;
  };
  const Row rows[] = {
      {"A", "low", 1, 2.5, 3, "A"},
      {"C", "high", 3, -100.0, -7, "z"},
      {"?", "mid", -1, -999.0, 0, ""},
      {"D", "none", 4, 1e300, 2147483647, "1"},
      {Value(), Value(), Value(), Value(), Value(), Value()},
      {1.0, 2.0, "2", "12", "x", 0.5},
      {"B", "mid", 2.0, 100.0, 1, Value()},
  };
  std::vector<ValueRecord> records;
  for (const Row& row : rows) {
    ValueRecord record;
    record.Add("x", row.x);
    record.Add("o", row.o);
    record.Add("n", row.n);
    record.Add("c", row.c);
    record.Add("i", row.i);
    record.Add("e", row.e);
    records.push_back(record);
  }
  ValueRecord partial;  // fields absent altogether
  partial.Add("c", 1.0);
  records.push_back(partial);
  return records;
}

// The value of the predicate's field in the record, as the fast tests read it.
Value FieldValue(const ScoringPredicate& predicate, const ValueRecord& record) {
  const ScoringSplitVar* split = predicate.GetSplit();
  if (split == nullptr || split->GetSplitVar() == nullptr) return Value();
  return record.Get(split->GetSplitVar()->GetName());
}

void CheckFastTests(const ScoringPredicate& predicate, const ValueRecord& record,
                    ScoringPredicate::PredicateResult expected) {
  const ScoringSplitVar* split = predicate.GetSplit();
  if (split == nullptr || split->GetSplitVar() == nullptr) return;
  const Value value = FieldValue(predicate, record);
  ScoringPredicate::CategoryTest category{};
  bool hasCategoryTest = false;
  if (const auto* simple = dynamic_cast<const ScoringSimplePredicate*>(&predicate)) {
    hasCategoryTest = simple->GetCategoryTest(category);
    ScoringSimplePredicate::NumericTest numeric{};
    ScoringPredicate::PredicateResult result;
    if (simple->GetNumericTest(numeric) &&
        ScoringSimplePredicate::EvaluateNumericTest(numeric, value, result) &&
        result != expected) {
      qzfuzz::Fail("the numeric test disagrees with Evaluate", value.GetString());
    }
  } else if (const auto* set = dynamic_cast<const ScoringSetPredicate*>(&predicate)) {
    hasCategoryTest = set->GetCategoryTest(category);
  }
  if (hasCategoryTest) {
    const int code = ScoringPredicate::CategoryCode(split->GetSplitVar(), value);
    ScoringPredicate::PredicateResult result;
    if (ScoringPredicate::EvaluateCategoryTest(category, code, result) && result != expected) {
      qzfuzz::Fail("the category test disagrees with Evaluate",
                   split->GetSplitVar()->GetName() + " = " + value.GetString());
    }
  }
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  qzfuzz::InitProcess();
  Variables();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const std::vector<ValueRecord> records = Records();
  if (size < 1) return 0;
  QZXML_800::QZSettings settings;
  if (data[0] & 1) settings.AddSetting("encoding", "ISO-8859-1", true);
  std::istringstream pmml(std::string(reinterpret_cast<const char*>(data) + 1, size - 1));
  std::unique_ptr<ScoringPredicate> predicate(
      ScoringScorerFactory::GetPredicate(settings, Variables(), pmml));
  if (!predicate) return 0;

  std::unique_ptr<ScoringPredicate> clone(predicate->Clone());
  std::ostringstream display;
  predicate->Display(display);
  (void)predicate->IsDerivedPredictor();
  for (const ValueRecord& record : records) {
    const ScoringPredicate::PredicateResult result = predicate->Evaluate(record);
    if (result != ScoringPredicate::PREDICATE_TRUE && result != ScoringPredicate::PREDICATE_FALSE &&
        result != ScoringPredicate::PREDICATE_UNKNOWN) {
      qzfuzz::Fail("Evaluate gave no three-valued result");
    }
    if (clone->Evaluate(record) != result) qzfuzz::Fail("a clone evaluates differently");
    CheckFastTests(*predicate, record, result);
  }
  return 0;
}

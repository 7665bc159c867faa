// The predicate of a PMML SimplePredicate: a field compared through a split variable.
#ifndef QZSCORING_SCORINGSIMPLEPREDICATE_H_
#define QZSCORING_SCORINGSIMPLEPREDICATE_H_

#include <atomic>
#include <cstdint>
#include <memory>
#include <ostream>

#include "QZScoringExport.h"
#include "QZVarList.h"
#include "ScoringPredicate.h"
#include "ScoringSplitVar.h"
#include "Value.h"
#include "ValueRecord.h"

namespace QZScoring_800 {

class ScoringScaleSplit;

// Holds one split variable (owned). True when the record's value leads to a child of
// the split, false when it leads nowhere; a missing or invalid value is true when the
// split has a missing-value map, else unknown. A missing test ("isMissing",
// "isNotMissing") is never unknown. The field's position in the record is cached per
// record layout (lock-free), so evaluation is safe from several threads at once.
class QZSCORING_API ScoringSimplePredicate : public ScoringPredicate {
 public:
  // What the predicate tests when it is a PMML missing test.
  enum MissingTest {
    MISSING_TEST_NONE = 0,        // compare the value through the split
    MISSING_TEST_IS_MISSING = 1,  // true exactly when the value is missing
    MISSING_TEST_IS_NOT_MISSING = 2  // true exactly when it is not
  };

  // No split: evaluates to unknown.
  ScoringSimplePredicate();
  // Takes ownership of the split (may be null).
  explicit ScoringSimplePredicate(const ScoringSplitVar* split);
  // The copy holds a clone of the source's split (or none) and its missing test.
  ScoringSimplePredicate(const ScoringSimplePredicate& other);
  // Deletes the held split and holds a clone of the other's (or none) and its missing
  // test. Self-assignment changes nothing.
  ScoringSimplePredicate& operator=(const ScoringSimplePredicate& other);
  ~ScoringSimplePredicate() override;

  ScoringSimplePredicate* Clone() const override;
  PredicateResult Evaluate(const QZCommon_800::ValueRecord& record) const override;
  // SIMPLE_PREDICATE.
  PredicateType GetPredType() const override;
  // False.
  bool IsDerivedPredictor() const override;
  void SetSplit(const ScoringSplitVar* split) override;
  const ScoringSplitVar* GetSplit() const override;
  // "Simple Predicate: \n".
  void Display(std::ostream& out) const override;

  // Marks the predicate as a missing test: with a test set, Evaluate answers true or
  // false by whether the value is missing (null, system-missing, or a missing value of
  // the variable) and never unknown, except without a split.
  void SetMissingTest(MissingTest test);
  MissingTest GetMissingTest() const;

  // A copy of the record's value of the variable's name; null when the record lacks
  // the field or the variable is null.
  QZCommon_800::Value GetScoreValue(const QZXML_800::IQZVariable* variable,
                                    const QZCommon_800::ValueRecord& record) const;

  // The predicate as plain data, for callers that keep many predicates in arrays of
  // their own and read the field (GetSplit()->GetSplitName()) themselves: a comparison
  // of a continuous field with one range of numbers, or a missing test on such a field.
  // It stays valid while the predicate lives unchanged; it uses the field's encoder.
  // Small (32 bytes) so that callers can keep it beside their own node data.
  struct NumericTest {
    double low;
    double high;
    const QZXML_800::IQZEncoder* encoder;  // says which numbers are declared missing
    bool lowIncluded;
    bool highIncluded;
    uint8_t missing;     // the PredicateResult for a missing value
    uint8_t inRange;     // for a number the range holds
    uint8_t outOfRange;  // for any other number
  };
  // Fills `test` and returns true when the predicate can be given as a NumericTest: its
  // split is exactly a ScoringScaleSplit with at most one range of real bounds, on a
  // variable of the platform's own that is not categorical. Else returns false and
  // leaves `test` unchanged. Never throws.
  bool GetNumericTest(NumericTest& test) const noexcept;
  // Fills `test` and returns true when the predicate is on a field of the platform's
  // own with 1 to 64 categories: its result for every category is worked out here
  // once. Else returns false and leaves `test` unchanged. Never throws.
  bool GetCategoryTest(CategoryTest& test) const noexcept;
  // Evaluate's result for a record whose field holds `value`, when the value is a real
  // (system-missing included) or null: stores it in `result` and returns true. For any
  // other kind of value (a text) returns false: the caller asks Evaluate.
  static bool EvaluateNumericTest(const NumericTest& test, const QZCommon_800::Value& value,
                                  PredicateResult& result) noexcept {
    if (value.IsNumericValue()) {
      const double x = value.GetReal();
      if (value.IsSystemMissingValue() || test.encoder->IsMissingNumber(x)) {
        result = static_cast<PredicateResult>(test.missing);
      } else {
        const bool above = test.lowIncluded ? x >= test.low : x > test.low;
        const bool below = test.highIncluded ? x <= test.high : x < test.high;
        result = static_cast<PredicateResult>(above && below ? test.inRange : test.outOfRange);
      }
      return true;
    }
    if (value.IsNull()) {
      result = static_cast<PredicateResult>(test.missing);
      return true;
    }
    return false;
  }

 private:
  std::unique_ptr<const ScoringSplitVar> fSplit;
  // fSplit when it is exactly a ScoringScaleSplit, whose missing test Evaluate has
  // already made; else null.
  const ScoringScaleSplit* fScaleSplit;
  // fScaleSplit's variable when the predicate took the split, if it is not categorical
  // (a variable's measure level never changes): while the split still holds it, a real
  // value is judged and placed by number without asking the variable its level.
  const QZXML_800::IQZVariable* fContinuousVariable;
  // The number encoder that judges fContinuousVariable's missing values when the
  // variable is one of the platform's own, whose encoder never changes; else null.
  const QZXML_800::IQZEncoder* fNumberEncoder;
  MissingTest fMissingTest;
  // The field's position by record layout: (layout id << 24) | index; 0 when unknown.
  mutable std::atomic<uint64_t> fFieldSlot;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGSIMPLEPREDICATE_H_

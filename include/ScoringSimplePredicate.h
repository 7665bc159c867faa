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

 private:
  std::unique_ptr<const ScoringSplitVar> fSplit;
  // fSplit when it is exactly a ScoringScaleSplit, whose missing test Evaluate has
  // already made; else null.
  const ScoringScaleSplit* fScaleSplit;
  MissingTest fMissingTest;
  // The field's position by record layout: (layout id << 24) | index; 0 when unknown.
  mutable std::atomic<uint64_t> fFieldSlot;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGSIMPLEPREDICATE_H_

// The predicate of a PMML SimpleSetPredicate: a categorical field tested against a set
// of categories.
#ifndef QZSCORING_SCORINGSETPREDICATE_H_
#define QZSCORING_SCORINGSETPREDICATE_H_

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

// Holds one split variable (owned; a ScoringDiscreteSplit when parsed from PMML). True
// when the record's value is one of the split's values, false when it is not, unknown
// when it is missing or not a valid category (the missing-value map is not consulted).
// The field's position in the record is cached per record layout (lock-free), so
// evaluation is safe from several threads at once.
class QZSCORING_API ScoringSetPredicate : public ScoringPredicate {
 public:
  // No split: evaluates to unknown.
  ScoringSetPredicate();
  // Takes ownership of the split (may be null).
  explicit ScoringSetPredicate(const ScoringSplitVar* split);
  // The copy holds a clone of the source's split, or none.
  ScoringSetPredicate(const ScoringSetPredicate& other);
  // Deletes the held split and holds a clone of the other's, or none. Self-assignment
  // changes nothing.
  ScoringSetPredicate& operator=(const ScoringSetPredicate& other);
  ~ScoringSetPredicate() override;

  ScoringSetPredicate* Clone() const override;
  PredicateResult Evaluate(const QZCommon_800::ValueRecord& record) const override;
  // SET_PREDICATE.
  PredicateType GetPredType() const override;
  // False.
  bool IsDerivedPredictor() const override;
  void SetSplit(const ScoringSplitVar* split) override;
  const ScoringSplitVar* GetSplit() const override;
  // "Set Predicate: \n".
  void Display(std::ostream& out) const override;

  // A copy of the record's value of the variable's name; null when the record lacks
  // the field or the variable is null.
  QZCommon_800::Value GetScoreValue(const QZXML_800::IQZVariable* variable,
                                    const QZCommon_800::ValueRecord& record) const;

  // Fills `test` and returns true when the predicate is on a field of the platform's
  // own with 1 to 64 categories: its result for every category is worked out here
  // once. Else returns false and leaves `test` unchanged. Never throws.
  bool GetCategoryTest(CategoryTest& test) const noexcept;

 private:
  std::unique_ptr<const ScoringSplitVar> fSplit;
  // The field's position by record layout: (layout id << 24) | index; 0 when unknown.
  mutable std::atomic<uint64_t> fFieldSlot;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGSETPREDICATE_H_

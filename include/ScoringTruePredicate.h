// The predicate of a PMML True element.
#ifndef QZSCORING_SCORINGTRUEPREDICATE_H_
#define QZSCORING_SCORINGTRUEPREDICATE_H_

#include <ostream>

#include "QZScoringExport.h"
#include "ScoringPredicate.h"
#include "ValueRecord.h"

namespace QZScoring_800 {

// Always true. Holds no data; copies are trivial.
class QZSCORING_API ScoringTruePredicate : public ScoringPredicate {
 public:
  ScoringTruePredicate();
  ScoringTruePredicate(const ScoringTruePredicate& other);
  ScoringTruePredicate& operator=(const ScoringTruePredicate& other);
  ~ScoringTruePredicate() override;

  ScoringTruePredicate* Clone() const override;
  // PREDICATE_TRUE.
  PredicateResult Evaluate(const QZCommon_800::ValueRecord& record) const override;
  // TRUE_PREDICATE.
  PredicateType GetPredType() const override;
  // False.
  bool IsDerivedPredictor() const override;
  // Does nothing (the split is not taken over).
  void SetSplit(const ScoringSplitVar* split) override;
  // Null.
  const ScoringSplitVar* GetSplit() const override;
  // "Constant TRUE\n".
  void Display(std::ostream& out) const override;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGTRUEPREDICATE_H_

// The predicate of a PMML False element.
#ifndef QZSCORING_SCORINGFALSEPREDICATE_H_
#define QZSCORING_SCORINGFALSEPREDICATE_H_

#include <ostream>

#include "QZScoringExport.h"
#include "ScoringPredicate.h"
#include "ValueRecord.h"

namespace QZScoring_800 {

// Always false. Holds no data; copies are trivial.
class QZSCORING_API ScoringFalsePredicate : public ScoringPredicate {
 public:
  ScoringFalsePredicate();
  ScoringFalsePredicate(const ScoringFalsePredicate& other);
  ScoringFalsePredicate& operator=(const ScoringFalsePredicate& other);
  ~ScoringFalsePredicate() override;

  ScoringFalsePredicate* Clone() const override;
  // PREDICATE_FALSE.
  PredicateResult Evaluate(const QZCommon_800::ValueRecord& record) const override;
  // FALSE_PREDICATE.
  PredicateType GetPredType() const override;
  // False.
  bool IsDerivedPredictor() const override;
  // Does nothing (the split is not taken over).
  void SetSplit(const ScoringSplitVar* split) override;
  // Null.
  const ScoringSplitVar* GetSplit() const override;
  // "Constant FALSE\n".
  void Display(std::ostream& out) const override;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGFALSEPREDICATE_H_

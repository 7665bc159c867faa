// The predicate of a PMML CompoundPredicate: children combined by a boolean operator.
#ifndef QZSCORING_SCORINGCOMPOUNDPREDICATE_H_
#define QZSCORING_SCORINGCOMPOUNDPREDICATE_H_

#include <ostream>
#include <vector>

#include "QZScoringExport.h"
#include "ScoringPredicate.h"
#include "ValueRecord.h"

namespace QZScoring_800 {

// Children (owned, never null) evaluated in order, each at most once, stopping as soon
// as the operator's three-valued result is settled: "or", "and", "xor" and "surrogate"
// (the first child that is not unknown). Any other operator value gives unknown
// without evaluating a child.
class QZSCORING_API ScoringCompoundPredicate : public ScoringPredicate {
 public:
  // No children; BOOL_SURROGATE.
  ScoringCompoundPredicate();
  // No children; the given operator.
  explicit ScoringCompoundPredicate(CompoundBoolOperator op);
  // Clones every child of the source, in order, and copies the operator.
  ScoringCompoundPredicate(const ScoringCompoundPredicate& other);
  // Keeps the children held, appends clones of the other's after them and takes the
  // other's operator. Self-assignment changes nothing.
  ScoringCompoundPredicate& operator=(const ScoringCompoundPredicate& other);
  // Deletes every child.
  ~ScoringCompoundPredicate() override;

  ScoringCompoundPredicate* Clone() const override;
  PredicateResult Evaluate(const QZCommon_800::ValueRecord& record) const override;
  // COMPOUND_PREDICATE.
  PredicateType GetPredType() const override;
  // True when any child's IsDerivedPredictor is true; false without children.
  bool IsDerivedPredictor() const override;
  // Does nothing: a compound holds no split.
  void SetSplit(const ScoringSplitVar* split) override;
  // Null.
  const ScoringSplitVar* GetSplit() const override;
  // "Compound Predicate: \n".
  void Display(std::ostream& out) const override;

  // Appends the child and takes ownership. A null child is ignored. Throws
  // std::bad_alloc only when memory runs out, having deleted the child.
  void AddPredicate(ScoringPredicate* predicate);
  // Removes the first child that is this very object and hands its ownership back to
  // the caller (it is not deleted). False when it is not a child.
  bool RemovePredicate(ScoringPredicate* predicate);
  // The number of children.
  int GetCount() const;
  // The children, owned by the compound. Whoever changes the list through the
  // non-const form keeps it free of null entries and owned by the compound.
  const std::vector<ScoringPredicate*>& GetPredicates() const;
  std::vector<ScoringPredicate*>& GetPredicates();
  // Any int is accepted; values other than the four operators evaluate to unknown.
  void SetBoolOperator(CompoundBoolOperator op);
  CompoundBoolOperator GetBoolOperator() const;

 private:
  // Evaluate without the guard against a throwing child.
  PredicateResult Combine(const QZCommon_800::ValueRecord& record) const;

  std::vector<ScoringPredicate*> fPredicates;
  int fBoolOperator;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGCOMPOUNDPREDICATE_H_

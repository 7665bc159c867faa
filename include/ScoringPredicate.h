// The predicate of a tree node: decides with three-valued logic whether a record
// belongs to the node.
#ifndef QZSCORING_SCORINGPREDICATE_H_
#define QZSCORING_SCORINGPREDICATE_H_

#include <ostream>

#include "QZScoringExport.h"
#include "ScoringSplitVar.h"
#include "ValueRecord.h"

namespace QZScoring_800 {

// The abstract predicate. Evaluation only reads the predicate: one predicate may be
// evaluated from several threads at once, each with its own record. Building it
// (SetSplit, AddPredicate, assignment) must not overlap with use.
class QZSCORING_API ScoringPredicate {
 public:
  // Results of Evaluate.
  enum PredicateResult { PREDICATE_TRUE = 0, PREDICATE_FALSE = 1, PREDICATE_UNKNOWN = 2 };
  // The concrete class, as GetPredType reports it.
  enum PredicateType {
    COMPOUND_PREDICATE = 0,
    SIMPLE_PREDICATE = 1,
    SET_PREDICATE = 2,
    TRUE_PREDICATE = 3,
    FALSE_PREDICATE = 4
  };
  // PMML's booleanOperator of a compound predicate.
  enum CompoundBoolOperator { BOOL_OR = 0, BOOL_AND = 1, BOOL_XOR = 2, BOOL_SURROGATE = 3 };

  ScoringPredicate() = default;
  virtual ~ScoringPredicate();

  // A deep copy owned by the caller (split variables and children cloned).
  virtual ScoringPredicate* Clone() const = 0;
  // True, false or unknown for the record. Never throws: what cannot be decided is
  // PREDICATE_UNKNOWN.
  virtual PredicateResult Evaluate(const QZCommon_800::ValueRecord& record) const = 0;
  virtual PredicateType GetPredType() const = 0;
  // Whether the predicate depends on a derived (computed) field.
  virtual bool IsDerivedPredictor() const = 0;
  // Simple and set predicates take ownership of the split (the one held before is
  // deleted); the others ignore it.
  virtual void SetSplit(const ScoringSplitVar* split) = 0;
  // The held split (owned by the predicate), null when none.
  virtual const ScoringSplitVar* GetSplit() const = 0;
  // Writes one fixed line naming the kind of predicate.
  virtual void Display(std::ostream& out) const = 0;

 protected:
  ScoringPredicate(const ScoringPredicate&) = default;
  ScoringPredicate& operator=(const ScoringPredicate&) = default;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGPREDICATE_H_

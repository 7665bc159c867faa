// The predicate of a tree node: decides with three-valued logic whether a record
// belongs to the node.
#ifndef QZSCORING_SCORINGPREDICATE_H_
#define QZSCORING_SCORINGPREDICATE_H_

#include <cstdint>
#include <ostream>

#include "QZScoringExport.h"
#include "QZVarList.h"
#include "ScoringSplitVar.h"
#include "Value.h"
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
  // PMML's booleanOperator of a compound predicate. Based on int so that any int
  // converts to it (a compound predicate accepts any value; see SetBoolOperator).
  enum CompoundBoolOperator : int { BOOL_OR = 0, BOOL_AND = 1, BOOL_XOR = 2, BOOL_SURROGATE = 3 };

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

  // A predicate on a categorical field as plain data, for callers that keep many
  // predicates in arrays of their own (GetCategoryTest of the simple and set
  // predicates): the result for each of the field's first `count` categories, and for a
  // missing value and a value that is no category. It stays valid while the predicate
  // lives unchanged.
  // Small (16 bytes) so that callers can keep it beside their own node data.
  struct CategoryTest {
    uint64_t members;    // bit i set: the predicate holds for category i
    int32_t count;       // the categories covered, at most 64
    uint8_t missing;     // the PredicateResult for a missing value
    uint8_t noCategory;  // for a value that is no category of the field
  };
  // CategoryCode's answers besides a category's index.
  enum CategoryCodeKind { CATEGORY_MISSING = -1, CATEGORY_NONE = -2, CATEGORY_UNDECIDED = -3 };
  // What a categorical field's value is for a CategoryTest: the index of its category in
  // the variable's encoder; CATEGORY_MISSING for a missing value (null, system-missing
  // or declared missing); CATEGORY_NONE for a value that is no category;
  // CATEGORY_UNDECIDED when the tests do not judge it (a field that is not categorical
  // or has no categories, a number on a field of text categories, a text on one of
  // number categories), for which the caller asks Evaluate. Never throws.
  static int CategoryCode(const QZXML_800::IQZVariable* variable,
                          const QZCommon_800::Value& value) noexcept;
  // Evaluate's result for a record whose field has the CategoryCode `code`: stores it in
  // `result` and returns true, or returns false (an undecided code, a category beyond
  // the test's count) and the caller asks Evaluate.
  static bool EvaluateCategoryTest(const CategoryTest& test, int code,
                                   PredicateResult& result) noexcept {
    if (code >= 0) {
      if (code >= test.count) return false;
      result = ((test.members >> code) & 1U) != 0 ? PREDICATE_TRUE : PREDICATE_FALSE;
      return true;
    }
    if (code == CATEGORY_MISSING) {
      result = static_cast<PredicateResult>(test.missing);
      return true;
    }
    if (code == CATEGORY_NONE) {
      result = static_cast<PredicateResult>(test.noCategory);
      return true;
    }
    return false;
  }

 protected:
  ScoringPredicate(const ScoringPredicate&) = default;
  ScoringPredicate& operator=(const ScoringPredicate&) = default;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGPREDICATE_H_

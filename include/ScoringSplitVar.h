// A split variable: maps one field's value to the child index of a tree node.
#ifndef QZSCORING_SCORINGSPLITVAR_H_
#define QZSCORING_SCORINGSPLITVAR_H_

#include <ostream>
#include <string>

#include "QZScoringExport.h"
#include "QZVarList.h"
#include "Value.h"

namespace QZScoring_800 {

// The base of the split variables: the field (an IQZVariable of the caller's variable
// list, never owned) and the missing-value map, the child index that missing and
// unmatched values go to (-1 when there is none). Filled once, then only read: the
// const operations may run concurrently on one object; the setters must not overlap
// with use. The variable must outlive the split.
class QZSCORING_API ScoringSplitVar {
 public:
  // No variable; missing-value map -1.
  ScoringSplitVar();
  // The given variable (not owned, may be null); missing-value map -1.
  explicit ScoringSplitVar(const QZXML_800::IQZVariable* variable);
  // Copy the variable pointer and the missing-value map.
  ScoringSplitVar(const ScoringSplitVar& other);
  ScoringSplitVar& operator=(const ScoringSplitVar& other);
  virtual ~ScoringSplitVar();

  // A deep copy owned by the caller; the variable is shared, not copied.
  virtual ScoringSplitVar* Clone() const = 0;
  // Replaces the variable (not owned).
  virtual void SetSplitVar(const QZXML_800::IQZVariable* variable);
  // Sets the child index of missing and unmatched values (-1: none).
  virtual void SetMissvalMap(int index);
  // The variable, or null when none is set.
  virtual const QZXML_800::IQZVariable* GetSplitVar() const;
  // The variable's name and label; empty without a variable.
  virtual std::string GetSplitName() const;
  virtual std::string GetSplitLabel() const;
  // Always -1.
  virtual int GetSplitType() const;
  // The variable's measure level (2 and 3 are categorical); 0 without a variable.
  virtual int GetSplitMLevel() const;
  // The child index of missing and unmatched values, -1 when none.
  virtual int GetMissvalMap() const;
  // The child index the value leads to; the missing-value map for a null value and for
  // a value no entry matches. Never throws.
  virtual int GetSplitChildIndex(const QZCommon_800::Value* value) const = 0;
  // Writes a readable description of the split to the stream.
  virtual void Display(std::ostream& out) const = 0;

 private:
  // Reads the two members in place when it evaluates a split of a known class.
  friend class ScoringSimplePredicate;

  const QZXML_800::IQZVariable* fVariable;
  int fMissvalMap;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGSPLITVAR_H_

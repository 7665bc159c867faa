// The interface of a value range: an interval of values with open or closed ends.
#ifndef QZSCORING_SCORINGVALUERANGE_H_
#define QZSCORING_SCORINGVALUERANGE_H_

#include <ostream>

#include "QZScoringExport.h"
#include "Value.h"

namespace QZScoring_800 {

// An interval [min, max] whose ends may each be open. Implementations own their bounds.
// Const operations may run concurrently; the setters must not overlap with use.
class QZSCORING_API ScoringValueRange {
 public:
  ScoringValueRange() = default;
  ScoringValueRange(const ScoringValueRange&) = default;
  ScoringValueRange& operator=(const ScoringValueRange&) = default;
  virtual ~ScoringValueRange();

  // True when both bounds and both end flags are equal.
  virtual bool operator==(const ScoringValueRange& other) const = 0;
  // A deep copy owned by the caller.
  virtual ScoringValueRange* Clone() const = 0;
  // Take ownership of a new bound; a null argument changes nothing.
  virtual void SetMin(QZCommon_800::Value* min) = 0;
  virtual void SetMax(QZCommon_800::Value* max) = 0;
  // True when the value lies inside the range; false for a null pointer.
  virtual bool IsInRange(const QZCommon_800::Value* value) const = 0;
  // The bounds, owned by the range and never null.
  virtual const QZCommon_800::Value* GetMin() const = 0;
  virtual const QZCommon_800::Value* GetMax() const = 0;
  // Whether the high / low end is included.
  virtual bool GetHighEnd() const = 0;
  virtual bool GetLowEnd() const = 0;
  // Writes a readable description of the range to the stream.
  virtual void Display(std::ostream& out) const = 0;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGVALUERANGE_H_

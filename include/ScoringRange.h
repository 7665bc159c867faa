// A value range with owned bounds that may be infinite.
#ifndef QZSCORING_SCORINGRANGE_H_
#define QZSCORING_SCORINGRANGE_H_

#include <memory>
#include <ostream>

#include "QZScoringExport.h"
#include "ScoringValueRange.h"
#include "Value.h"

namespace QZScoring_800 {

// An interval between two owned values (never null after construction); infinity is
// Value::GetInfinity() and minus infinity its negation. A minimum given as
// system-missing becomes minus infinity; a maximum is stored as given. Values compare
// with Value's own order. Copies are deep. Const operations may run concurrently.
class QZSCORING_API ScoringRange : public ScoringValueRange {
 public:
  // Takes ownership of both bounds, also when construction fails. A null minimum is
  // minus infinity, a null maximum infinity; when min and max are the same object the
  // maximum becomes a clone of the (adjusted) minimum.
  ScoringRange(QZCommon_800::Value* min, QZCommon_800::Value* max, bool lowEnd, bool highEnd);
  // Bounds made from the doubles; a system-missing minimum is minus infinity.
  ScoringRange(double min, double max, bool lowEnd, bool highEnd);
  // The single value [point, point] (owned); a null point spans minus infinity to
  // infinity. Both ends included.
  explicit ScoringRange(QZCommon_800::Value* point);
  // Deep copies; self-assignment changes nothing.
  ScoringRange(const ScoringRange& other);
  ScoringRange& operator=(const ScoringRange& other);
  ~ScoringRange() override;

  bool operator==(const ScoringValueRange& other) const override;
  ScoringRange* Clone() const override;
  // Takes ownership of the new minimum (system-missing becomes minus infinity) and
  // deletes the old one; null changes nothing.
  void SetMin(QZCommon_800::Value* min) override;
  // Takes ownership of the new maximum (unadjusted) and deletes the old one; null
  // changes nothing.
  void SetMax(QZCommon_800::Value* max) override;
  // The minimum is compared first; when it fails the maximum is not looked at.
  bool IsInRange(const QZCommon_800::Value* value) const override;
  const QZCommon_800::Value* GetMin() const override;
  const QZCommon_800::Value* GetMax() const override;
  bool GetHighEnd() const override;
  bool GetLowEnd() const override;
  // "  Start Range Display   \nMinValue: ...;  MaxValue: ...; High End ...; lower End
  // ...\n End of Range Display\n\n".
  void Display(std::ostream& out) const override;

 private:
  std::unique_ptr<QZCommon_800::Value> fMin;
  std::unique_ptr<QZCommon_800::Value> fMax;
  bool fHighEnd;
  bool fLowEnd;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGRANGE_H_

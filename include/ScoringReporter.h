// A progress reporter with nothing to report, for operations that require one.
#ifndef QZSCORING_SCORING_REPORTER_H_
#define QZSCORING_SCORING_REPORTER_H_

#include <string>

#include "ProgressReport.h"
#include "QZScoringExport.h"

namespace QZScoring_800 {

// Answers every discrete measure with 1 and every scale measure with the
// system-missing number, and remembers a step number its user sets (0 at first).
class QZSCORING_API ScoringReporter : public QZCommon_800::ProgressReport {
 public:
  ScoringReporter();
  ~ScoringReporter() override;

  int DiscreteMeasure(const std::string& name) override;
  double ScaleMeasure(const std::string& name) override;

  void SetCurrentStepNum(int step);
  int GetCurrentStepNum() const;

 private:
  int step_ = 0;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_REPORTER_H_

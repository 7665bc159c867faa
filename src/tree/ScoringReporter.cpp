// The neutral progress reporter.

#include "ScoringReporter.h"

#include "QZMV.h"

namespace QZScoring_800 {

ScoringReporter::ScoringReporter() = default;

ScoringReporter::~ScoringReporter() = default;

int ScoringReporter::DiscreteMeasure(const std::string&) { return 1; }

double ScoringReporter::ScaleMeasure(const std::string&) { return QZCommon_800::QZMV::Missing(); }

void ScoringReporter::SetCurrentStepNum(int step) { step_ = step; }

int ScoringReporter::GetCurrentStepNum() const { return step_; }

}  // namespace QZScoring_800

// The scorer base's default answers.

#include "ScoringBaseScorer.h"

#include "ScoringStatusCodes.h"

using QZCommon_800::QZStatus;
using QZCommon_800::ValueRecord;

namespace QZScoring_800 {

ScoringBaseScorer::ScoringBaseScorer(QZXML_800::QZSettings& settings,
                                     const QZXML_800::QZVarList& variables)
    : settings_(&settings), variables_(variables) {}

ScoringBaseScorer::ScoringBaseScorer(const ScoringBaseScorer& other)
    : QZCommon_800::IQZScore(other), settings_(other.settings_), variables_(other.variables_) {}

ScoringBaseScorer::~ScoringBaseScorer() = default;

bool ScoringBaseScorer::IsReady() const { return false; }

QZStatus ScoringBaseScorer::Score(const ValueRecord&, ValueRecord&) {
  return QZStatus(SCORING_NOT_SUPPORTED, false);
}

QZStatus ScoringBaseScorer::Scorable(ValueRecord&) {
  return QZStatus(SCORING_NOT_SUPPORTED, false);
}

std::string ScoringBaseScorer::GetType() const { return "UNKNOWN"; }

QZXML_800::QZSettings& ScoringBaseScorer::GetSettings() { return *settings_; }

const QZXML_800::QZSettings& ScoringBaseScorer::GetSettings() const { return *settings_; }

void ScoringBaseScorer::SetSettings(const QZXML_800::QZSettings& settings) {
  *settings_ = settings;
}

QZXML_800::QZVarList& ScoringBaseScorer::GetVarList() { return variables_; }

const QZXML_800::QZVarList& ScoringBaseScorer::GetVarList() const { return variables_; }

void ScoringBaseScorer::SetVarList(const QZXML_800::QZVarList& variables) {
  variables_ = variables;
}

}  // namespace QZScoring_800

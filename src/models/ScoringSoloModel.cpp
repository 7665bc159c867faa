#include "ScoringSoloModel.h"

#include "HostGuard.h"
#include "ModelFieldNames.h"
#include "QZTransformation.h"
#include "ScoringAdjustedPropensity.h"
#include "ScoringStatusCodes.h"
#include "Value.h"

namespace QZScoring_800 {

using QZCommon_800::IQZScore;
using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;
namespace fields = model_fields;

ScoringSoloModel::ScoringSoloModel(const QZXML_800::QZSettings& settings,
                                   const QZXML_800::QZVarList& variables)
    : ScoringAbsModel(settings, variables), fDerivedFieldsPrepared(false) {}

ScoringSoloModel::~ScoringSoloModel() { fScorer.reset(); }

bool ScoringSoloModel::SetScorer(IQZScore* scorer) {
  if (scorer == nullptr || fScorer) return false;
  fScorer.reset(scorer);
  return true;
}

const IQZScore* ScoringSoloModel::GetScorer() const { return fScorer.get(); }

ScoringModel* ScoringSoloModel::Clone() const { return nullptr; }

QZStatus ScoringSoloModel::Score(ValueRecord& input, ValueRecord& output) {
  return GuardStatus("QZScoring_800::ScoringSoloModel::Score",
                          [&] { return ScoreUnguarded(input, output); });
}

QZStatus ScoringSoloModel::ScoreUnguarded(ValueRecord& input, ValueRecord& output) {
  if (!fScorer) return QZStatus(SCORING_NO_SCORER, false);
  QZStatus status;

  QZTransformation* transformation = GetRunnableTransformation();
  if (transformation != nullptr) {
    if (NeedDerivedPredictor()) {
      if (!fDerivedFieldsPrepared) {
        transformation->GetDerivedVariableInfo(input, false);
        fDerivedFieldsPrepared = true;
      }
      status = transformation->Transform(input);
    } else if (!GetDerivedFields().empty()) {
      if (!fDerivedFieldsPrepared) {
        for (const std::string& name : GetDerivedFields()) input.Add(name, Value::NULL_VALUE);
        fDerivedFieldsPrepared = true;
      }
      status = transformation->Transform(input);
    }
  }

  // The scorer is a plug-in's code: its exception is told apart from the library's.
  if (status.IsOK()) {
    status = GuardScorerCall("QZScoring_800::ScoringSoloModel::Score",
                             [&] { return fScorer->Score(input, output); });
  }

  // A propensity that cannot be computed for this record is missing, never the one of
  // the record before; scoring itself succeeded, so its status stands.
  const ScoringAdjustedPropensity* propensity = GetAdjustedPropensity();
  if (status.IsOK() && propensity != nullptr) {
    for (const std::string* name : {&fields::kRawPropensity, &fields::kAdjustedPropensity}) {
      const int index = output.IndexOf(*name);
      if (index >= 0) output[static_cast<size_t>(index)] = Value::NULL_VALUE;
    }
    // The raw propensity does not need the network: it is computed even when the
    // adjusted one cannot be.
    const bool adjusted = output.Contains(fields::kAdjustedPropensity) &&
                          propensity->ComputeAdjustedPropensity(output).IsOK();
    if (!adjusted && output.Contains(fields::kRawPropensity)) {
      propensity->ComputeRawPropensity(output);
    }
  }
  return status;
}

QZStatus ScoringSoloModel::Scorable(ValueRecord& record) {
  return GuardStatus("QZScoring_800::ScoringSoloModel::Scorable",
                          [&] { return ScorableUnguarded(record); });
}

QZStatus ScoringSoloModel::ScorableUnguarded(ValueRecord& record) {
  if (!fScorer) return QZStatus(SCORING_NO_SCORER, false);
  const QZStatus status = GuardScorerCall("QZScoring_800::ScoringSoloModel::Scorable",
                                          [&] { return fScorer->Scorable(record); });
  const ScoringAdjustedPropensity* propensity = GetAdjustedPropensity();
  if (status.IsOK() && propensity != nullptr && record.Contains(fields::kPrediction) &&
      record.Contains(fields::kProbability)) {
    record.Add(fields::kRawPropensity, Value::NULL_VALUE);
    if (propensity->IsReady()) record.Add(fields::kAdjustedPropensity, Value::NULL_VALUE);
  }
  return status;
}

std::string ScoringSoloModel::GetModelType() const {
  if (fScorer) {
    try {
      return fScorer->GetType();
    } catch (...) {
      // A scorer that cannot name its type counts as none.
    }
  }
  return ScoringAbsModel::GetModelType();
}

ScoringModel::ScoringModelType ScoringSoloModel::GetScoringModelType() const {
  return SCORING_SOLO_MODEL;
}

}  // namespace QZScoring_800

// The scoring model over one scorer: one PMML document.
#ifndef QZSCORING_SCORING_SOLO_MODEL_H_
#define QZSCORING_SCORING_SOLO_MODEL_H_

#include <memory>
#include <string>

#include "IQZScore.h"
#include "QZScoringExport.h"
#include "ScoringAbsModel.h"

namespace QZScoring_800 {

// Wraps the scorer of one document: applies the document's transformations to the
// input record before scoring, widens the scorer's output layout with
// "rawpropensity" (and "adjustedpropensity" when the network was read) and computes
// them after scoring. Owns its scorer. Not copyable (Clone gives null). One thread at
// a time: the first Score prepares the input record it is given, so every call must
// pass an input record of that same layout.
class QZSCORING_API ScoringSoloModel : public ScoringAbsModel {
 public:
  // Copies of the settings and the variable list; no scorer yet.
  ScoringSoloModel(const QZXML_800::QZSettings& settings,
                   const QZXML_800::QZVarList& variables);
  ScoringSoloModel(const ScoringSoloModel&) = delete;
  ScoringSoloModel& operator=(const ScoringSoloModel&) = delete;
  // Destroys the scorer, then the rest of the model.
  ~ScoringSoloModel() override;

  // Takes ownership of the scorer when the model has none and returns true; otherwise
  // returns false and the caller keeps the scorer. A null scorer is refused.
  bool SetScorer(QZCommon_800::IQZScore* scorer);
  // The scorer (owned by the model), null when none.
  const QZCommon_800::IQZScore* GetScorer() const;

  // Null: a solo model cannot be copied.
  ScoringModel* Clone() const override;
  // Transforms the input record (when the model has a transformation and derived
  // fields or NeedDerivedPredictor), scores it into output, then computes the
  // propensity fields that output contains (their failures are not reported).
  // 260009 without a scorer (records untouched); otherwise the engine's code when the
  // transformation fails (the scorer is not called), or the scorer's status unchanged.
  // A field the scorer writes without having declared it in Scorable is appended to
  // output after the declared ones; the propensity fields are found by name, so they
  // are still computed. 260029 when the scorer throws (output may hold what it wrote
  // before), 260099 when the engine or the library itself throws. Never throws.
  QZCommon_800::QZStatus Score(QZCommon_800::ValueRecord& input,
                               QZCommon_800::ValueRecord& output) override;
  // The scorer's Scorable; when it succeeds, the record has "prediction" and
  // "probability" and the model has an adjusted propensity, appends "rawpropensity"
  // and, when the network was read, "adjustedpropensity". 260009 without a scorer;
  // 260029 when the scorer throws (no propensity field is added). Never throws.
  // The model never asks the scorer's IsReady: that answer is for the host (through
  // GetScorer); a scorer that is not ready is called like any other.
  QZCommon_800::QZStatus Scorable(QZCommon_800::ValueRecord& record) override;
  // The scorer's type text; "UNKNOWN" without a scorer (or when the scorer throws).
  std::string GetModelType() const override;
  // SCORING_SOLO_MODEL.
  ScoringModelType GetScoringModelType() const override;

 private:
  QZCommon_800::QZStatus ScoreUnguarded(QZCommon_800::ValueRecord& input,
                                        QZCommon_800::ValueRecord& output);
  QZCommon_800::QZStatus ScorableUnguarded(QZCommon_800::ValueRecord& record);

  std::unique_ptr<QZCommon_800::IQZScore> fScorer;
  bool fDerivedFieldsPrepared;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_SOLO_MODEL_H_

// Several scoring models side by side, each named by a model ID.
#ifndef QZSCORING_SCORING_MULTI_MODEL_H_
#define QZSCORING_SCORING_MULTI_MODEL_H_

#include <memory>
#include <string>
#include <vector>

#include "QZScoringExport.h"
#include "ScoringAbsModel.h"

namespace QZScoring_800 {

// Scores one input record with every sub-model and gathers the results: output field N
// becomes a structured value whose entry M holds what the sub-model named M wrote to N.
// No arithmetic is done on the results. Owns its sub-models. Descriptive attributes
// (settings, variable list, types) are the first sub-model's. Not copyable (Clone gives
// null). One thread at a time.
class QZSCORING_API ScoringMultiModel : public ScoringAbsModel {
 public:
  // No sub-model; empty settings and variable list.
  ScoringMultiModel();
  ScoringMultiModel(const ScoringMultiModel&) = delete;
  ScoringMultiModel& operator=(const ScoringMultiModel&) = delete;
  // Destroys the sub-models in insertion order, then the rest of the model.
  ~ScoringMultiModel() override;

  // Appends the model under the name and takes ownership of it. A repeated name is
  // allowed (the later sub-model's entries overwrite the earlier one's). A null model is
  // ignored; when memory runs out the model is deleted and not added. Never throws.
  void AddModel(const std::string& name, ScoringModel* model);

  // Null: a multi model cannot be copied.
  ScoringModel* Clone() const override;
  // Scores the input record with every sub-model in insertion order (each into a record
  // with the output record's fields) and sets output[N][M] for every field N the
  // sub-model named M wrote. A failing sub-model (its scorer may even have thrown)
  // contributes nothing and its status is dropped. 260009 without sub-models; success
  // otherwise. Never throws.
  QZCommon_800::QZStatus Score(QZCommon_800::ValueRecord& input,
                               QZCommon_800::ValueRecord& output) override;
  // Lays out record[N][M] for every field N that the sub-model named M produces.
  // 260009 without sub-models; success otherwise. Never throws.
  QZCommon_800::QZStatus Scorable(QZCommon_800::ValueRecord& record) override;

  // The first sub-model's settings and variable list; the model's own (empty) ones
  // without sub-models.
  QZXML_800::QZSettings& GetSettings() override;
  const QZXML_800::QZSettings& GetSettings() const override;
  QZXML_800::QZVarList& GetVarList() override;
  const QZXML_800::QZVarList& GetVarList() const override;
  // The first sub-model's; without sub-models "UNKNOWN", the base model's type and the
  // model's own sub type.
  std::string GetModelType() const override;
  QZScoringConst::ModelType GetType() const override;
  std::string GetSubType() const override;
  // SCORING_MULTI_MODEL.
  ScoringModelType GetScoringModelType() const override;

 private:
  std::vector<std::string> fModelNames;
  std::vector<std::unique_ptr<ScoringModel>> fModels;  // parallel to fModelNames
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_MULTI_MODEL_H_

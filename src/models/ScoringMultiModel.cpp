#include "ScoringMultiModel.h"

#include <utility>

#include "HostGuard.h"
#include "ScoringStatusCodes.h"
#include "Value.h"

namespace QZScoring_800 {

using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace {

// Copies every field of the sub-model's record into the entry `model` of the combined
// record's field of the same name.
void Gather(const ValueRecord& part, const std::string& model, ValueRecord& combined) {
  for (size_t i = 0; i < part.Size(); ++i) combined[part.GetName(i)][model] = part[i];
}

}  // namespace

ScoringMultiModel::ScoringMultiModel() = default;

ScoringMultiModel::~ScoringMultiModel() {
  for (auto& model : fModels) model.reset();
  fModels.clear();
  fModelNames.clear();
}

void ScoringMultiModel::AddModel(const std::string& name, ScoringModel* model) {
  std::unique_ptr<ScoringModel> owned(model);
  if (!owned) return;
  try {
    // Room first, so the two lists stay parallel whatever fails.
    fModelNames.reserve(fModelNames.size() + 1);
    fModels.reserve(fModels.size() + 1);
    fModelNames.push_back(name);
  } catch (...) {
    return;  // the model is deleted with `owned`
  }
  fModels.push_back(std::move(owned));
}

ScoringModel* ScoringMultiModel::Clone() const { return nullptr; }

QZStatus ScoringMultiModel::Score(ValueRecord& input, ValueRecord& output) {
  return GuardStatus("QZScoring_800::ScoringMultiModel::Score", [&] {
    if (fModels.empty()) return QZStatus(SCORING_NO_SCORER, false);
    // Each sub-model scores into a record of the output's fields, all null; copies of
    // one template share its layout, so this costs one value per field.
    ValueRecord layout(output.Size());
    for (size_t i = 0; i < output.Size(); ++i) layout.Add(output.GetName(i), Value::NULL_VALUE);
    for (size_t m = 0; m < fModels.size(); ++m) {
      ValueRecord part(layout);
      if (fModels[m]->Score(input, part).IsOK()) Gather(part, fModelNames[m], output);
    }
    return QZStatus();
  });
}

QZStatus ScoringMultiModel::Scorable(ValueRecord& record) {
  return GuardStatus("QZScoring_800::ScoringMultiModel::Scorable", [&] {
    if (fModels.empty()) return QZStatus(SCORING_NO_SCORER, false);
    for (size_t m = 0; m < fModels.size(); ++m) {
      ValueRecord part;
      fModels[m]->Scorable(part);  // a sub-model that cannot lay out adds what it added
      Gather(part, fModelNames[m], record);
    }
    return QZStatus();
  });
}

QZXML_800::QZSettings& ScoringMultiModel::GetSettings() {
  return fModels.empty() ? ScoringAbsModel::GetSettings() : fModels.front()->GetSettings();
}

const QZXML_800::QZSettings& ScoringMultiModel::GetSettings() const {
  return fModels.empty() ? ScoringAbsModel::GetSettings() : fModels.front()->GetSettings();
}

QZXML_800::QZVarList& ScoringMultiModel::GetVarList() {
  return fModels.empty() ? ScoringAbsModel::GetVarList() : fModels.front()->GetVarList();
}

const QZXML_800::QZVarList& ScoringMultiModel::GetVarList() const {
  return fModels.empty() ? ScoringAbsModel::GetVarList() : fModels.front()->GetVarList();
}

std::string ScoringMultiModel::GetModelType() const {
  return fModels.empty() ? ScoringAbsModel::GetModelType() : fModels.front()->GetModelType();
}

QZScoringConst::ModelType ScoringMultiModel::GetType() const {
  return fModels.empty() ? ScoringAbsModel::GetType() : fModels.front()->GetType();
}

std::string ScoringMultiModel::GetSubType() const {
  return fModels.empty() ? ScoringAbsModel::GetSubType() : fModels.front()->GetSubType();
}

ScoringModel::ScoringModelType ScoringMultiModel::GetScoringModelType() const {
  return SCORING_MULTI_MODEL;
}

}  // namespace QZScoring_800

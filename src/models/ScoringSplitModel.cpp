#include "ScoringSplitModel.h"

#include <functional>
#include <string_view>
#include <utility>

#include "HostGuard.h"
#include "ScoringStatusCodes.h"

namespace QZScoring_800 {

using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZXML_800::IQZEncoder;
using QZXML_800::IQZVariable;
using QZXML_800::QZVarList;

namespace {

bool IsCategorical(int level) {
  return level == QZXML_800::ML_NUMERIC_CATEGORICAL || level == QZXML_800::ML_STRING_CATEGORICAL;
}

// Folds one later sub-model's variables into the merged list.
void MergeInto(QZVarList& merged, const QZVarList& theirs) {
  for (int i = 0; i < theirs.Size(); ++i) {
    const IQZVariable* variable = theirs.GetVarAt(i);
    if (variable == nullptr) continue;
    const int at = merged.FindVariable(variable->GetName());
    if (at < 0) {
      const int level = variable->GetMeasureLevel();
      if (IsCategorical(level)) {
        // A copy keeps the categories and their labels: the field's values stay
        // known to whoever reads the merged list.
        merged.AddVariable(variable->Clone());
      } else if (level == QZXML_800::ML_CONTINUOUS) {
        merged.AddContVar(variable->GetName(), variable->GetLabel(), variable->GetRole());
      }
      continue;
    }
    IQZVariable* present = merged.GetVarAt(at);
    const int level = present->GetMeasureLevel();
    IQZEncoder* to = present->GetEncoder();
    const IQZEncoder* from = variable->GetEncoder();
    if (IsCategorical(level) && to != nullptr && from != nullptr) {
      for (int c = 0; c < from->GetCount(); ++c) {
        if (level == QZXML_800::ML_STRING_CATEGORICAL) {
          to->AddCategory(from->GetStringAt(c));
        } else {
          to->AddCategory(from->GetNumberAt(c));
        }
      }
    }
    if (variable->GetRole() == QZXML_800::ROLE_INPUT) {
      merged.SetVariableRole(at, QZXML_800::ROLE_INPUT);
    }
  }
}

}  // namespace

ScoringSplitModel::ScoringSplitModel() = default;

ScoringSplitModel::~ScoringSplitModel() {
  for (auto& entry : fModels) delete entry.second;
  fModels.clear();
  fIndex.clear();
  fTargets.clear();
  fSplitFields.clear();
  fSplitPositions.clear();
}

size_t ScoringSplitModel::KeyHash::operator()(const std::vector<Value>& key) const noexcept {
  size_t hash = key.size();
  for (const Value& value : key) {
    size_t h = value.GetType();
    if (value.IsNumericValue()) {
      const double real = value.GetReal();
      h = std::hash<double>()(real == 0.0 ? 0.0 : real);  // 0 and -0 are one key
    } else if (value.IsString()) {
      h = std::hash<std::string_view>()(value.GetText());
    }
    hash ^= h + 0x9e3779b97f4a7c15ULL + (hash << 6) + (hash >> 2);
  }
  return hash;
}

bool ScoringSplitModel::KeyEqual::operator()(const std::vector<Value>& a,
                                             const std::vector<Value>& b) const noexcept {
  if (a.size() != b.size()) return false;
  for (size_t i = 0; i < a.size(); ++i) {
    if (a[i].Compare(b[i]) != 0) return false;
  }
  return true;
}

bool ScoringSplitModel::AddModel(const std::vector<Value>& key, ScoringModel* model) {
  if (model == nullptr) return false;
  try {
    const auto added = fModels.emplace(key, model);
    if (!added.second) return false;
    try {
      fIndex.emplace(key, model);
    } catch (...) {
      fModels.erase(added.first);  // both containers or neither
      return false;
    }
    return true;
  } catch (...) {
    return false;  // nothing was stored: the model stays the caller's
  }
}

void ScoringSplitModel::SetModel(const ModelMap& models) {
  if (!fModels.empty() || &models == &fModels) return;
  try {
    ModelMap copy;
    ModelIndex index;
    for (const auto& entry : models) {
      if (entry.second != nullptr) {
        copy.emplace(entry.first, entry.second);
        index.emplace(entry.first, entry.second);
      }
    }
    fModels.swap(copy);
    fIndex.swap(index);
  } catch (...) {
    // Out of memory before anything was taken: the sub-models stay the caller's.
  }
}

const ScoringSplitModel::ModelMap& ScoringSplitModel::GetModel() const { return fModels; }

void ScoringSplitModel::SetSplitFields(const std::vector<std::string>& fields) {
  fSplitFields = fields;
  fSplitPositions.clear();
  fPositionsReady = false;
}

std::vector<std::string> ScoringSplitModel::GetSplitFields() const { return fSplitFields; }

ScoringModel* ScoringSplitModel::Clone() const { return nullptr; }

QZStatus ScoringSplitModel::Score(ValueRecord& input, ValueRecord& output) {
  return GuardStatus("QZScoring_800::ScoringSplitModel::Score",
                     [&] { return ScoreUnguarded(input, output); });
}

bool ScoringSplitModel::FindSplitPositions(const ValueRecord& input) {
  fPositionsReady = false;
  fSplitPositions.assign(fSplitFields.size(), -1);
  for (size_t j = 0; j < fSplitFields.size(); ++j) {
    fSplitPositions[j] = input.IndexOf(fSplitFields[j]);
    if (fSplitPositions[j] < 0) {
      fSplitPositions.clear();
      return false;
    }
  }
  fKey.resize(fSplitPositions.size());
  fLayoutId = input.GetLayoutId();
  fLayoutSize = input.Size();
  fPositionsReady = true;
  return true;
}

QZStatus ScoringSplitModel::ScoreUnguarded(ValueRecord& input, ValueRecord& output) {
  output.ClearValues();
  if (fModels.empty()) return QZStatus(SCORING_NO_SCORER, false);
  // The positions are kept while the record's layout stays the same; a sub-model that
  // appends derived fields to the input record changes it once.
  if (!fPositionsReady || input.GetLayoutId() != fLayoutId || input.Size() != fLayoutSize) {
    if (!FindSplitPositions(input)) return QZStatus(SCORING_SPLIT_FIELD_MISSING, false);
  }
  for (size_t j = 0; j < fSplitPositions.size(); ++j) {
    fKey[j] = input[static_cast<size_t>(fSplitPositions[j])];
  }
  const auto found = fIndex.find(fKey);
  if (found == fIndex.end()) return QZStatus(SCORING_NO_SCORER, false);
  ScoringModel* model = found->second;

  const QZStatus status = model->Score(input, output);
  if (!fMultiTargetSeen) return status;
  const auto info = fTargets.find(model);
  if (info != fTargets.end() && info->second.singleTarget && info->second.hasName) {
    const std::string& target = info->second.name;
    for (size_t i = 0; i < output.Size(); ++i) {
      Value& field = output[i];
      if (field.IsNull()) continue;
      Value value = std::move(field);
      field[target] = std::move(value);
    }
  }
  return status;
}

QZStatus ScoringSplitModel::Scorable(ValueRecord& record) {
  return GuardStatus("QZScoring_800::ScoringSplitModel::Scorable",
                     [&] { return ScorableUnguarded(record); });
}

QZStatus ScoringSplitModel::ScorableUnguarded(ValueRecord& record) {
  QZStatus status(SCORING_NO_SCORER, false);
  if (!fModels.empty()) status = First()->Scorable(record);
  fTargets.clear();
  for (const auto& entry : fModels) {
    const QZVarList& variables = entry.second->GetVarList();
    const size_t targets = variables.GetTargetIndices().size();
    TargetInfo info;
    info.singleTarget = targets <= 1;
    if (targets >= 2) {
      fMultiTargetSeen = true;
    } else if (const IQZVariable* target = variables.GetTargetRespVariable()) {
      info.hasName = true;
      info.name = target->GetName();
    }
    fTargets[entry.second] = std::move(info);
  }
  return status;
}

ScoringModel* ScoringSplitModel::First() const {
  return fModels.empty() ? nullptr : fModels.begin()->second;
}

QZXML_800::QZSettings& ScoringSplitModel::GetSettings() {
  return fModels.empty() ? ScoringAbsModel::GetSettings() : First()->GetSettings();
}

const QZXML_800::QZSettings& ScoringSplitModel::GetSettings() const {
  return fModels.empty() ? ScoringAbsModel::GetSettings() : First()->GetSettings();
}

QZVarList& ScoringSplitModel::GetVarList() {
  if (!fModels.empty() && ScoringAbsModel::GetVarList().Size() == 0) MergeVarList();
  return ScoringAbsModel::GetVarList();
}

const QZVarList& ScoringSplitModel::GetVarList() const {
  // The merged list is a cache filled on first use; models are created non-const.
  return const_cast<ScoringSplitModel*>(this)->GetVarList();
}

void ScoringSplitModel::MergeVarList() {
  try {
    auto model = fModels.begin();
    QZVarList merged(model->second->GetVarList());
    for (++model; model != fModels.end(); ++model) {
      MergeInto(merged, model->second->GetVarList());
    }
    ScoringAbsModel::GetVarList() = std::move(merged);
  } catch (...) {
    // Out of memory: the own list stays empty and the next call merges again.
  }
}

std::string ScoringSplitModel::GetModelType() const {
  return fModels.empty() ? ScoringAbsModel::GetModelType() : First()->GetModelType();
}

QZScoringConst::ModelType ScoringSplitModel::GetType() const {
  return fModels.empty() ? ScoringAbsModel::GetType() : First()->GetType();
}

std::string ScoringSplitModel::GetSubType() const {
  return fModels.empty() ? ScoringAbsModel::GetSubType() : First()->GetSubType();
}

std::string ScoringSplitModel::GetAppName() const {
  return fModels.empty() ? ScoringAbsModel::GetAppName() : First()->GetAppName();
}

std::string ScoringSplitModel::GetAppVersion() const {
  return fModels.empty() ? ScoringAbsModel::GetAppVersion() : First()->GetAppVersion();
}

const std::vector<std::string>& ScoringSplitModel::GetDerivedFields() const {
  // The merged list is a cache filled on first use; models are created non-const.
  const_cast<ScoringSplitModel*>(this)->MergeDerivedFields();
  return ScoringAbsModel::GetDerivedFields();
}

void ScoringSplitModel::MergeDerivedFields() {
  if (fModels.empty() || !ScoringAbsModel::GetDerivedFields().empty()) return;
  try {
    std::vector<std::string> merged;
    for (const auto& entry : fModels) {
      const std::vector<std::string>& fields = entry.second->GetDerivedFields();
      merged.insert(merged.end(), fields.begin(), fields.end());
    }
    ScoringAbsModel::SetDerivedFields(merged);
  } catch (...) {
    // Out of memory: the own list stays empty and the next call merges again.
  }
}

void ScoringSplitModel::Display(std::ostream&) const {}

ScoringModel::ScoringModelType ScoringSplitModel::GetScoringModelType() const {
  return SCORING_SPLIT_MODEL;
}

}  // namespace QZScoring_800

#include "ScoringAbsModel.h"

#include <utility>

#include "QZTransformation.h"
#include "ScoringAdjustedPropensity.h"
#include "ScoringModelAttr.h"
#include "ScoringOutputField.h"

namespace QZScoring_800 {

using QZCommon_800::QZStatus;
using QZTransformNS_8_0_0::QZTransformation;
using QZXML_800::QZSettings;
using QZXML_800::QZVarList;

namespace {

// "UNKNOWN": the model type text of a model without a scorer.
const char kUnknownModelType[] = "UNKNOWN";

// New copies of the fields (null entries stay null), owned by the caller. Either all
// copies are made or none is left behind.
std::vector<ScoringOutputField*> CopyFields(const std::vector<ScoringOutputField*>& fields) {
  std::vector<std::unique_ptr<ScoringOutputField>> copies;
  copies.reserve(fields.size());
  for (const ScoringOutputField* field : fields) {
    copies.emplace_back(field != nullptr ? new ScoringOutputField(*field) : nullptr);
  }
  std::vector<ScoringOutputField*> result;
  result.reserve(copies.size());
  for (auto& copy : copies) result.push_back(copy.release());
  return result;
}

void DeleteFields(std::vector<ScoringOutputField*>& fields) noexcept {
  for (ScoringOutputField* field : fields) delete field;
  fields.clear();
}

}  // namespace

// ---- ScoringModel ----

ScoringModel::ScoringModel() = default;
ScoringModel::ScoringModel(const ScoringModel&) = default;
ScoringModel& ScoringModel::operator=(const ScoringModel&) = default;
ScoringModel::~ScoringModel() = default;

// ---- ScoringAbsModel ----

ScoringAbsModel::ScoringAbsModel() : fNeedDerivedPredictor(false) {}

ScoringAbsModel::ScoringAbsModel(const QZSettings& settings, const QZVarList& variables)
    : fSettings(settings), fVarList(variables), fNeedDerivedPredictor(false) {}

ScoringAbsModel::ScoringAbsModel(const ScoringAbsModel& other)
    : ScoringModel(other),
      fSettings(other.fSettings),
      fVarList(other.fVarList),
      fSubType(other.fSubType),
      fDerivedFields(other.fDerivedFields),
      fNeedDerivedPredictor(other.fNeedDerivedPredictor),
      fOutputFields(CopyFields(other.fOutputFields)),
      fStatus(other.fStatus) {}

ScoringAbsModel& ScoringAbsModel::operator=(const ScoringAbsModel& other) {
  if (this == &other) return *this;
  // Copy everything first, so that a failing copy leaves this model as it was.
  QZSettings settings(other.fSettings);
  QZVarList variables(other.fVarList);
  std::string subType(other.fSubType);
  std::vector<std::string> derivedFields(other.fDerivedFields);
  std::vector<ScoringOutputField*> fields = CopyFields(other.fOutputFields);

  ScoringModel::operator=(other);
  fTransformation.reset();
  fAdjustedPropensity.reset();
  fRecord.reset();
  fSettings = std::move(settings);
  fVarList = std::move(variables);
  fSubType.swap(subType);
  fDerivedFields.swap(derivedFields);
  fNeedDerivedPredictor = other.fNeedDerivedPredictor;
  DeleteFields(fOutputFields);
  fOutputFields.swap(fields);
  fStatus = other.fStatus;
  return *this;
}

ScoringAbsModel::~ScoringAbsModel() {
  // The adjusted propensity reads this model's settings and variable list, so it goes
  // before them; the order of the three owned objects is the documented one.
  fTransformation.reset();
  fAdjustedPropensity.reset();
  fRecord.reset();
  DeleteFields(fOutputFields);
}

QZSettings& ScoringAbsModel::GetSettings() { return fSettings; }
const QZSettings& ScoringAbsModel::GetSettings() const { return fSettings; }
QZVarList& ScoringAbsModel::GetVarList() { return fVarList; }
const QZVarList& ScoringAbsModel::GetVarList() const { return fVarList; }

std::string ScoringAbsModel::GetModelType() const { return kUnknownModelType; }

QZScoringConst::ModelType ScoringAbsModel::GetType() const {
  // The record computes the type from its model element on first use and caches it.
  return fRecord ? fRecord->GetModelType() : QZScoringConst::MODEL_UNKNOWN;
}

void ScoringAbsModel::SetType(QZScoringConst::ModelType type) {
  if (fRecord) fRecord->SetModelType(type);
}

std::string ScoringAbsModel::GetSubType() const { return fSubType; }
void ScoringAbsModel::SetSubType(const std::string& subType) { fSubType = subType; }

std::string ScoringAbsModel::GetAlgName() const {
  return fRecord ? fRecord->GetAlgorithmName() : std::string();
}
void ScoringAbsModel::SetAlgName(const std::string& name) {
  if (fRecord && !name.empty()) fRecord->SetAlgorithmName(name);
}

std::string ScoringAbsModel::GetModelName() const {
  return fRecord ? fRecord->GetModelName() : std::string();
}
void ScoringAbsModel::SetModelName(const std::string& name) {
  if (fRecord && !name.empty()) fRecord->SetModelName(name);
}

std::string ScoringAbsModel::GetVersion() const {
  return fRecord ? fRecord->GetVersion() : std::string();
}
void ScoringAbsModel::SetVersion(const std::string& version) {
  if (fRecord && !version.empty()) fRecord->SetVersion(version);
}

const QZTransformation* ScoringAbsModel::GetTransformation() const {
  return fTransformation.get();
}

QZTransformation* ScoringAbsModel::GetRunnableTransformation() {
  return fTransformation.get();
}

void ScoringAbsModel::SetTransformation(QZTransformation* transformation) {
  // Holding the same engine again must not destroy it.
  if (transformation != fTransformation.get()) fTransformation.reset(transformation);
}

const std::vector<std::string>& ScoringAbsModel::GetDerivedFields() const {
  return fDerivedFields;
}

void ScoringAbsModel::SetDerivedFields(const std::vector<std::string>& fields) {
  if (!fields.empty() && &fields != &fDerivedFields) fDerivedFields = fields;
}

void ScoringAbsModel::SetNeedDerivedPredictor(bool need) { fNeedDerivedPredictor = need; }
bool ScoringAbsModel::NeedDerivedPredictor() const { return fNeedDerivedPredictor; }

ScoringAdjustedPropensity* ScoringAbsModel::GetAdjustedPropensity() const {
  return fAdjustedPropensity.get();
}

void ScoringAbsModel::SetAdjustedPropensity(ScoringAdjustedPropensity* propensity) {
  if (propensity != fAdjustedPropensity.get()) fAdjustedPropensity.reset(propensity);
}

std::string ScoringAbsModel::GetModelID() const {
  return fRecord ? fRecord->GetModelID() : std::string();
}
void ScoringAbsModel::SetModelID(const std::string& id) {
  if (fRecord && !id.empty()) fRecord->SetModelID(id);
}

std::string ScoringAbsModel::GetAppName() const {
  return fRecord ? fRecord->GetAppName() : std::string();
}
void ScoringAbsModel::SetAppName(const std::string& name) {
  if (fRecord && !name.empty()) fRecord->SetAppName(name);
}

std::string ScoringAbsModel::GetAppVersion() const {
  return fRecord ? fRecord->GetAppVersion() : std::string();
}
void ScoringAbsModel::SetAppVersion(const std::string& version) {
  if (fRecord && !version.empty()) fRecord->SetAppVersion(version);
}

void ScoringAbsModel::SetScoreModelAtts(ScoringModelAttr* record) {
  if (record != nullptr && record != fRecord.get()) fRecord.reset(record);
}

ScoringModelAttr* ScoringAbsModel::GetScoreModelAtts() const { return fRecord.get(); }

const std::vector<ScoringOutputField*>& ScoringAbsModel::GetOutputFields() const {
  return fRecord ? fRecord->GetOutputFields() : fOutputFields;
}

const ScoringOutputField* ScoringAbsModel::GetOutputField(const std::string& feature,
                                                          const std::string& value) const {
  if (!fRecord || feature.empty()) return nullptr;
  for (const ScoringOutputField* field : fRecord->GetOutputFields()) {
    if (field == nullptr || field->GetFeature() != feature) continue;
    if (value.empty() || field->GetValue() == value) return field;
  }
  return nullptr;
}

QZStatus ScoringAbsModel::GetStatus() const { return fStatus; }

void ScoringAbsModel::Display(std::ostream&) const {}

ScoringModel::ScoringModelType ScoringAbsModel::GetScoringModelType() const {
  return SCORING_ABS_MODEL;
}

}  // namespace QZScoring_800

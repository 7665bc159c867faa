// The scoring factory: one PMML document in, one scoring model out.

#include "ScoringFactory.h"

#include <fstream>
#include <map>
#include <utility>
#include <vector>

#include <xercesc/util/PlatformUtils.hpp>

#include "HostGuard.h"
#include "QZTransformation.h"
#include "ScoringAdjustedPropensity.h"
#include "ScoringHRZXMLScorer.h"
#include "ScoringModelAttr.h"
#include "ScoringMutexContainer.h"
#include "ScoringMutexLock.h"
#include "ScoringScorerFactory.h"
#include "ScoringSoloModel.h"
#include "ScoringTransformationsScorer.h"
#include "TraceLog.h"

using QZCommon_800::IQZScore;
using QZCommon_800::QZStatus;
using QZXML_800::QZSettings;

namespace QZScoring_800 {

namespace {

const char kCreateName[] = "QZScoring_800::ScoringFactory::CreateScoringModel";

// True when the model's target is a categorical variable marked as a binary flag: only
// such models get an adjusted propensity.
bool HasBinaryFlagTarget(const QZXML_800::QZVarList& variables) {
  const auto* target = dynamic_cast<const QZXML_800::QZCatVar*>(
      variables.GetTargetRespVariable());
  if (target == nullptr) return false;
  const int level = target->GetMeasureLevel();
  return (level == QZXML_800::ML_NUMERIC_CATEGORICAL || level == QZXML_800::ML_STRING_CATEGORICAL) &&
         target->GetBinaryFlag();
}

}  // namespace

ScoringFactory::ScoringFactory() { status_ = InitXerces(); }

ScoringFactory::~ScoringFactory() {
  model_.reset();
  TermXerces();
}

QZStatus ScoringFactory::InitXerces() {
  if (!xercesInitialised_) {
    ScoringMutexLock lock(ScoringMutexContainer::GetMutex());
    try {
      xercesc::XMLPlatformUtils::Initialize();
      xercesInitialised_ = true;
    } catch (...) {
      status_ = QZStatus(SCORING_XERCES_INIT_FAILED, false);
    }
  }
  return status_;
}

void ScoringFactory::TermXerces() {
  if (!xercesInitialised_) return;
  ScoringMutexLock lock(ScoringMutexContainer::GetMutex());
  try {
    xercesc::XMLPlatformUtils::Terminate();
  } catch (...) {
    // Termination has nothing to report to anyone; the destructor must not throw.
  }
}

ScoringModel* ScoringFactory::CreateScoringModel(QZSettings& settings,
                                                 const std::string& fileName) {
  TraceLog("scoring.log", 2, "Enter:%s", kCreateName);
  std::ifstream file(fileName, std::ios::in | std::ios::binary);
  if (!file.is_open()) {
    status_ = QZStatus(SCORING_FILE_OPEN_FAILED, false);
    return nullptr;
  }
  ScoringModel* model = CreateScoringModel(settings, file);
  TraceLog("scoring.log", 2, "Exit :%s", kCreateName);
  return model;
}

ScoringModel* ScoringFactory::CreateScoringModel(QZSettings& settings, std::istream& pmml) {
  TraceLog("scoring.log", 2, "Enter:%s", kCreateName);
  if (model_) {
    status_ = QZStatus(SCORING_MODEL_ALREADY_HELD, false);
    return nullptr;
  }
  status_ = GuardStatus(kCreateName, [&]() {
    CreateFromStream(settings, pmml);
    return status_;
  });
  if (status_.IsError()) model_.reset();
  TraceLog("scoring.log", 2, "Exit :%s", kCreateName);
  return model_.get();
}

// The body of the stream form: leaves the new model in model_ on success, or nothing
// held and the reason in status_.
ScoringModel* ScoringFactory::CreateFromStream(QZSettings& settings, std::istream& pmml) {
  status_ = QZStatus();
  std::map<std::string, std::string> scoringNames;
  std::vector<std::string> modelNames;
  status_ = ScoringScorerFactory::GetScoringNames(scoringNames, settings);
  if (status_.IsOK()) status_ = ScoringScorerFactory::GetModelNames(modelNames, settings);
  if (status_.IsError()) return nullptr;

  std::string encoding;
  if (!settings.GetSettingValByName("encoding", encoding)) encoding = "UTF-8";
  auto record = std::make_unique<ScoringModelAttr>();
  record->SetEncoding(encoding);
  ScoringModelAttr* scanned = record.get();
  status_ = ScoringScorerFactory::GetModelAttr(pmml, modelNames, scanned, encoding);

  QZXML_800::QZVarList variables;
  QZScoringConst::ModelType type = QZScoringConst::MODEL_UNKNOWN;
  if (status_.IsOK()) {
    type = record->GetModelType();
    if (type != QZScoringConst::MODEL_UNKNOWN && type != QZScoringConst::MODEL_SEQUENCE &&
        type != QZScoringConst::MODEL_HRZXML) {
      status_ = ScoringScorerFactory::ParseVarList(variables, scanned);
    }
  }
  if (status_.IsError()) return nullptr;

  settings.AddSetting("scoring_version", record->GetVersion(), true);
  settings.AddSetting("scoring_modelType", record->GetModelElement(), true);
  settings.AddSetting("scoring_multipleModelMethod", record->GetMultipleModelMethod(), true);

  auto model = std::make_unique<ScoringSoloModel>(settings, variables);
  std::unique_ptr<IQZScore> scorer;
  if (type == QZScoringConst::MODEL_TRANSFORMATIONS) {
    scorer = std::make_unique<ScoringTransformationsScorer>(
        &model->GetSettings(), &model->GetVarList(), record->GetDerivedFields());
  } else if (type == QZScoringConst::MODEL_HRZXML) {
    scorer = std::make_unique<ScoringHRZXMLScorer>(&model->GetSettings(), &model->GetVarList(),
                                                   record->GetModelElement(), pmml,
                                                   record.get());
  } else {
    scorer.reset(ScoringScorerFactory::GetScorer(model->GetSettings(), model->GetVarList(), pmml));
  }
  if (!scorer) {
    status_ = QZStatus(SCORING_SCORER_UNAVAILABLE, false);
    return nullptr;
  }

  model->SetScorer(scorer.release());  // a fresh model always takes it
  const bool hasTransformations = record->HasTransformationDictionary();
  std::stringstream* propensityText = record->GetAdjustedPropensityStream();
  ScoringModelAttr* owned = record.release();
  model->SetScoreModelAtts(owned);
  std::string subType;
  model->GetSettings().GetSettingValByName("scoring_modelType", subType);
  model->SetSubType(subType);

  if (hasTransformations) {
    model->SetTransformation(ScoringScorerFactory::GetTransformation(owned));
    model->SetDerivedFields(owned->GetDerivedInputs());
    bool needDerived = false;
    if (model->GetSettings().GetSettingValByName("scoring_needDerivedPredictor", needDerived)) {
      model->SetNeedDerivedPredictor(needDerived);
    }
  }
  if (HasBinaryFlagTarget(model->GetVarList())) {
    auto propensity =
        std::make_unique<ScoringAdjustedPropensity>(&model->GetSettings(), &model->GetVarList());
    const bool usable = propensityText == nullptr || propensity->ParseNetwork(propensityText);
    if (usable) model->SetAdjustedPropensity(propensity.release());
    if (propensityText != nullptr) {
      propensityText->clear();
      propensityText->str(std::string());
    }
  }
  model_ = std::move(model);
  return model_.get();
}

void ScoringFactory::Attach(ScoringModel* model) {
  if (model != model_.get()) model_.reset(model);
}

ScoringModel* ScoringFactory::Detach() {
  status_ = QZStatus();
  return model_.release();
}

QZStatus ScoringFactory::GetStatus() const { return status_; }

}  // namespace QZScoring_800

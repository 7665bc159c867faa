#include "ScoringModelAttr.h"

#include <utility>

#include "ModelTypeNames.h"

namespace QZScoring_800 {

ScoringModelAttr::ScoringModelAttr()
    : modelType_(QZScoringConst::MODEL_UNKNOWN),
      encoding_("UTF-8"),
      hasTransformationDictionary_(false) {}

ScoringModelAttr::~ScoringModelAttr() { ClearOutputFields(); }

std::string ScoringModelAttr::GetAppName() const { return appName_; }
void ScoringModelAttr::SetAppName(const std::string& name) { appName_ = name; }
std::string ScoringModelAttr::GetAppVersion() const { return appVersion_; }
void ScoringModelAttr::SetAppVersion(const std::string& version) { appVersion_ = version; }

const std::vector<ScoringOutputField*>& ScoringModelAttr::GetOutputFields() const {
  return outputFields_;
}

bool ScoringModelAttr::AddOutputField(ScoringOutputField* field) {
  if (field == nullptr) return false;
  for (const ScoringOutputField* held : outputFields_) {
    if (held->GetName() == field->GetName()) return false;
  }
  outputFields_.push_back(field);
  return true;
}

void ScoringModelAttr::CopyOutputFields(const std::vector<ScoringOutputField*>& fields) {
  // Copy first, so that copying the record's own list (or a failed allocation) never
  // leaves the record holding deleted fields.
  std::vector<std::unique_ptr<ScoringOutputField>> copies;
  copies.reserve(fields.size());
  for (const ScoringOutputField* field : fields) {
    if (field != nullptr) copies.push_back(std::make_unique<ScoringOutputField>(*field));
  }
  ClearOutputFields();
  outputFields_.reserve(copies.size());
  for (auto& copy : copies) outputFields_.push_back(copy.release());
}

void ScoringModelAttr::ClearOutputFields() {
  for (ScoringOutputField* field : outputFields_) delete field;
  outputFields_.clear();
}

QZScoringConst::ModelType ScoringModelAttr::GetModelType() const {
  if (modelType_ == QZScoringConst::MODEL_UNKNOWN) {
    if (!modelElement_.empty()) {
      modelType_ = ModelTypeOfElement(modelElement_);
    } else if (hasTransformationDictionary_) {
      modelType_ = QZScoringConst::MODEL_TRANSFORMATIONS;
    }
  }
  return modelType_;
}

void ScoringModelAttr::SetModelType(QZScoringConst::ModelType type) { modelType_ = type; }

std::string ScoringModelAttr::GetEncoding() const { return encoding_; }
void ScoringModelAttr::SetEncoding(const std::string& encoding) { encoding_ = encoding; }
std::string ScoringModelAttr::GetVersion() const { return version_; }
void ScoringModelAttr::SetVersion(const std::string& version) { version_ = version; }
std::string ScoringModelAttr::GetModelElement() const { return modelElement_; }
void ScoringModelAttr::SetModelElement(const std::string& element) { modelElement_ = element; }
std::string ScoringModelAttr::GetModelName() const { return modelName_; }
void ScoringModelAttr::SetModelName(const std::string& name) { modelName_ = name; }
std::string ScoringModelAttr::GetFunctionName() const { return functionName_; }
void ScoringModelAttr::SetFunctionName(const std::string& name) { functionName_ = name; }
std::string ScoringModelAttr::GetAlgorithmName() const { return algorithmName_; }
void ScoringModelAttr::SetAlgorithmName(const std::string& name) { algorithmName_ = name; }
std::string ScoringModelAttr::GetMultipleModelMethod() const { return multipleModelMethod_; }
void ScoringModelAttr::SetMultipleModelMethod(const std::string& method) {
  multipleModelMethod_ = method;
}
std::string ScoringModelAttr::GetModelID() const { return modelID_; }
void ScoringModelAttr::SetModelID(const std::string& id) { modelID_ = id; }

const std::vector<std::string>& ScoringModelAttr::GetTargetFields() const {
  return targetFields_;
}
std::vector<std::string>& ScoringModelAttr::GetTargetFields() { return targetFields_; }
const std::vector<std::string>& ScoringModelAttr::GetActiveFields() const {
  return activeFields_;
}
std::vector<std::string>& ScoringModelAttr::GetActiveFields() { return activeFields_; }
const std::vector<std::string>& ScoringModelAttr::GetDerivedInputs() const {
  return derivedInputs_;
}
std::vector<std::string>& ScoringModelAttr::GetDerivedInputs() { return derivedInputs_; }
const std::vector<std::string>& ScoringModelAttr::GetDataFields() const { return dataFields_; }
std::vector<std::string>& ScoringModelAttr::GetDataFields() { return dataFields_; }
const std::vector<std::string>& ScoringModelAttr::GetDerivedFields() const {
  return derivedFields_;
}
std::vector<std::string>& ScoringModelAttr::GetDerivedFields() { return derivedFields_; }

std::stringstream& ScoringModelAttr::GetSkeletonStream() { return skeleton_; }

bool ScoringModelAttr::HasTransformationDictionary() const {
  return hasTransformationDictionary_;
}
void ScoringModelAttr::SetHasTransformationDictionary(bool has) {
  hasTransformationDictionary_ = has;
}

std::stringstream* ScoringModelAttr::GetAdjustedPropensityStream() const {
  return adjustedPropensity_.get();
}

void ScoringModelAttr::SetAdjustedPropensityStream(std::stringstream* stream) {
  // Setting the stream already held must not delete it.
  if (stream != adjustedPropensity_.get()) adjustedPropensity_.reset(stream);
}

QZScoringConst::ModelType ModelTypeOfElement(const std::string& elementName) {
  static const std::pair<const char*, QZScoringConst::ModelType> kTypes[] = {
      {"AssociationModel", QZScoringConst::MODEL_ASSOCIATION},
      {"ClusteringModel", QZScoringConst::MODEL_CLUSTERING},
      {"GeneralRegressionModel", QZScoringConst::MODEL_GENERAL_REGRESSION},
      {"MiningModel", QZScoringConst::MODEL_MINING},
      {"NaiveBayesModel", QZScoringConst::MODEL_NAIVE_BAYES},
      {"NeuralNetwork", QZScoringConst::MODEL_NEURAL_NETWORK},
      {"RegressionModel", QZScoringConst::MODEL_REGRESSION},
      {"RuleSetModel", QZScoringConst::MODEL_RULE_SET},
      {"SequenceModel", QZScoringConst::MODEL_SEQUENCE},
      {"SupportVectorMachineModel", QZScoringConst::MODEL_SUPPORT_VECTOR_MACHINE},
      {"TextModel", QZScoringConst::MODEL_TEXT},
      {"TimeSeriesModel", QZScoringConst::MODEL_TIME_SERIES},
      {"TreeModel", QZScoringConst::MODEL_TREE},
      {"BayesNetModel", QZScoringConst::MODEL_BAYES_NET},
      {"NearestNeighborModel", QZScoringConst::MODEL_NEAREST_NEIGHBOR},
  };
  for (const auto& type : kTypes) {
    if (elementName == type.first) return type.second;
  }
  return QZScoringConst::MODEL_UNKNOWN;
}

}  // namespace QZScoring_800

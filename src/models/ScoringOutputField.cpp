#include "ScoringOutputField.h"

namespace QZScoring_800 {

namespace {

// Stores value into field unless it is empty: a setter never clears a field.
void StoreIfNotEmpty(std::string& field, const std::string& value) {
  if (!value.empty()) field = value;
}

}  // namespace

ScoringOutputField::ScoringOutputField()
    : ruleFeature_("consequent"),
      algorithm_("exclusiveRecommendation"),
      rank_(1),
      rankBasis_("confidence"),
      rankOrder_("descending"),
      multiValued_(false) {}

ScoringOutputField::ScoringOutputField(const ScoringOutputField& other) = default;

ScoringOutputField& ScoringOutputField::operator=(const ScoringOutputField& other) = default;

ScoringOutputField::~ScoringOutputField() = default;

void ScoringOutputField::Display(std::ostream& /*out*/) const {}

const std::string& ScoringOutputField::GetName() const { return name_; }
void ScoringOutputField::SetName(const std::string& name) { StoreIfNotEmpty(name_, name); }

const std::string& ScoringOutputField::GetDisplayName() const { return displayName_; }
void ScoringOutputField::SetDisplayName(const std::string& displayName) {
  StoreIfNotEmpty(displayName_, displayName);
}

const std::string& ScoringOutputField::GetOPType() const { return opType_; }
void ScoringOutputField::SetOPType(const std::string& opType) {
  StoreIfNotEmpty(opType_, opType);
}

const std::string& ScoringOutputField::GetDataType() const { return dataType_; }
void ScoringOutputField::SetDataType(const std::string& dataType) {
  StoreIfNotEmpty(dataType_, dataType);
}

const std::string& ScoringOutputField::GetTargetField() const { return targetField_; }
void ScoringOutputField::SetTargetField(const std::string& targetField) {
  StoreIfNotEmpty(targetField_, targetField);
}

const std::string& ScoringOutputField::GetFeature() const { return feature_; }
void ScoringOutputField::SetFeature(const std::string& feature) {
  StoreIfNotEmpty(feature_, feature);
}

const std::string& ScoringOutputField::GetValue() const { return value_; }
void ScoringOutputField::SetValue(const std::string& value) { StoreIfNotEmpty(value_, value); }

const std::string& ScoringOutputField::GetRuleFeature() const { return ruleFeature_; }
void ScoringOutputField::SetRuleFeature(const std::string& ruleFeature) {
  StoreIfNotEmpty(ruleFeature_, ruleFeature);
}

const std::string& ScoringOutputField::GetAlgorithm() const { return algorithm_; }
void ScoringOutputField::SetAlgorithm(const std::string& algorithm) {
  StoreIfNotEmpty(algorithm_, algorithm);
}

int ScoringOutputField::GetRank() const { return rank_; }
void ScoringOutputField::SetRank(int rank) { rank_ = rank; }

const std::string& ScoringOutputField::GetRankBasis() const { return rankBasis_; }
void ScoringOutputField::SetRankBasis(const std::string& rankBasis) {
  StoreIfNotEmpty(rankBasis_, rankBasis);
}

const std::string& ScoringOutputField::GetRankOrder() const { return rankOrder_; }
void ScoringOutputField::SetRankOrder(const std::string& rankOrder) {
  StoreIfNotEmpty(rankOrder_, rankOrder);
}

bool ScoringOutputField::IsMultiValued() const { return multiValued_; }
void ScoringOutputField::SetMultiValued(bool multiValued) { multiValued_ = multiValued; }

}  // namespace QZScoring_800

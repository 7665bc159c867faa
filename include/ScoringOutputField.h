// One PMML "OutputField" of a model: the name of a result field and what it holds.
#ifndef QZSCORING_SCORING_OUTPUT_FIELD_H_
#define QZSCORING_SCORING_OUTPUT_FIELD_H_

#include <ostream>
#include <string>

#include "QZScoringExport.h"

namespace QZScoring_800 {

// A plain value describing one output field. String setters store only a non-empty
// argument, so no setter can clear a field once it is set; SetRank and SetMultiValued
// always store. Copyable. One thread at a time per object.
class QZSCORING_API ScoringOutputField {
 public:
  // Empty name, display name, optype, data type, target field, feature and value; rule
  // feature "consequent", algorithm "exclusiveRecommendation", rank 1, rank basis
  // "confidence", rank order "descending", not multi-valued.
  ScoringOutputField();
  // Field-by-field copies of all thirteen fields; self-assignment changes nothing.
  ScoringOutputField(const ScoringOutputField& other);
  ScoringOutputField& operator=(const ScoringOutputField& other);
  virtual ~ScoringOutputField();

  // Writes nothing: an output field has no display form of its own.
  virtual void Display(std::ostream& out) const;

  // The PMML "name".
  const std::string& GetName() const;
  void SetName(const std::string& name);
  // The PMML "displayName".
  const std::string& GetDisplayName() const;
  void SetDisplayName(const std::string& displayName);
  // The PMML "optype".
  const std::string& GetOPType() const;
  void SetOPType(const std::string& opType);
  // The PMML "dataType".
  const std::string& GetDataType() const;
  void SetDataType(const std::string& dataType);
  // The PMML "targetField".
  const std::string& GetTargetField() const;
  void SetTargetField(const std::string& targetField);
  // The PMML "feature" (for example "predictedValue", "probability").
  const std::string& GetFeature() const;
  void SetFeature(const std::string& feature);
  // The PMML "value" (for example the category of a probability).
  const std::string& GetValue() const;
  void SetValue(const std::string& value);
  // The PMML "ruleFeature".
  const std::string& GetRuleFeature() const;
  void SetRuleFeature(const std::string& ruleFeature);
  // The PMML "algorithm".
  const std::string& GetAlgorithm() const;
  void SetAlgorithm(const std::string& algorithm);
  // The PMML "rank"; always stored.
  int GetRank() const;
  void SetRank(int rank);
  // The PMML "rankBasis".
  const std::string& GetRankBasis() const;
  void SetRankBasis(const std::string& rankBasis);
  // The PMML "rankOrder".
  const std::string& GetRankOrder() const;
  void SetRankOrder(const std::string& rankOrder);
  // The PMML "isMultiValued"; always stored.
  bool IsMultiValued() const;
  void SetMultiValued(bool multiValued);

 private:
  std::string name_;
  std::string displayName_;
  std::string opType_;
  std::string dataType_;
  std::string targetField_;
  std::string feature_;
  std::string value_;
  std::string ruleFeature_;
  std::string algorithm_;
  int rank_;
  std::string rankBasis_;
  std::string rankOrder_;
  bool multiValued_;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_OUTPUT_FIELD_H_

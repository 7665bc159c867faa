// The attribute record of one model document: what the model-attribute scan learns
// about the document, and the skeleton document it writes.
#ifndef QZSCORING_SCORING_MODEL_ATTR_H_
#define QZSCORING_SCORING_MODEL_ATTR_H_

#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "QZScoringConst.h"
#include "QZScoringExport.h"
#include "ScoringOutputField.h"

namespace QZScoring_800 {

// Filled by ScoringScorerFactory::GetModelAttr, then owned by the scoring model built
// from the document. Setters are plain stores. Owns its output fields and its
// adjusted-propensity stream. Not copyable. One thread at a time.
class QZSCORING_API ScoringModelAttr {
 public:
  // Encoding "UTF-8"; every other text and list empty, model type 0, no transformation
  // dictionary, no adjusted-propensity stream, no output fields.
  ScoringModelAttr();
  // Deletes the output fields and the adjusted-propensity stream.
  virtual ~ScoringModelAttr();
  ScoringModelAttr(const ScoringModelAttr&) = delete;
  ScoringModelAttr& operator=(const ScoringModelAttr&) = delete;

  // The "Application" element's "name" and "version" attributes.
  virtual std::string GetAppName() const;
  virtual void SetAppName(const std::string& name);
  virtual std::string GetAppVersion() const;
  virtual void SetAppVersion(const std::string& version);

  // The output fields in document order; owned by the record.
  virtual const std::vector<ScoringOutputField*>& GetOutputFields() const;
  // Takes ownership of field and appends it; false (field not taken, the caller keeps
  // it) for null or when a field of the same name is already held.
  virtual bool AddOutputField(ScoringOutputField* field);
  // Replaces the held fields by copies of fields, in order; fields stay the caller's.
  virtual void CopyOutputFields(const std::vector<ScoringOutputField*>& fields);
  // Deletes every held field.
  virtual void ClearOutputFields();

  // The model type: when none was set, computed on first call from the model element
  // (GetModelType), or MODEL_TRANSFORMATIONS when there is no model element but a
  // transformation dictionary, and cached once it is not MODEL_UNKNOWN.
  QZScoringConst::ModelType GetModelType() const;
  void SetModelType(QZScoringConst::ModelType type);
  // The character encoding document text is transcoded to.
  std::string GetEncoding() const;
  void SetEncoding(const std::string& encoding);
  // The PMML root's "version".
  std::string GetVersion() const;
  void SetVersion(const std::string& version);
  // The model element's name (empty when the document holds none of the listed ones).
  std::string GetModelElement() const;
  void SetModelElement(const std::string& element);
  // The model's "modelName", or its element name when that is absent or empty.
  std::string GetModelName() const;
  void SetModelName(const std::string& name);
  // The model's "functionName" and "algorithmName".
  std::string GetFunctionName() const;
  void SetFunctionName(const std::string& name);
  std::string GetAlgorithmName() const;
  void SetAlgorithmName(const std::string& name);
  // The "multipleModelMethod" of the model's segmentation; empty when there is none.
  std::string GetMultipleModelMethod() const;
  void SetMultipleModelMethod(const std::string& method);
  // The model ID from the model's "modelID" extension.
  std::string GetModelID() const;
  void SetModelID(const std::string& id);

  // Mining fields used as targets ("predicted"), as inputs, and inputs listed in the
  // mining schema's derived-fields extension; data-field and derived-field names of the
  // dictionaries. All in document order.
  const std::vector<std::string>& GetTargetFields() const;
  std::vector<std::string>& GetTargetFields();
  const std::vector<std::string>& GetActiveFields() const;
  std::vector<std::string>& GetActiveFields();
  const std::vector<std::string>& GetDerivedInputs() const;
  std::vector<std::string>& GetDerivedInputs();
  const std::vector<std::string>& GetDataFields() const;
  std::vector<std::string>& GetDataFields();
  const std::vector<std::string>& GetDerivedFields() const;
  std::vector<std::string>& GetDerivedFields();

  // The skeleton document: the PMML start tag with its version, the mining build task,
  // data dictionary and transformation dictionary verbatim, and the PMML end tag.
  std::stringstream& GetSkeletonStream();

  // Whether the document has a "TransformationDictionary".
  bool HasTransformationDictionary() const;
  void SetHasTransformationDictionary(bool has);

  // The captured adjusted-propensity extension; owned by the record, null when none.
  std::stringstream* GetAdjustedPropensityStream() const;
  // Takes ownership of stream (null allowed) and deletes the one held before.
  void SetAdjustedPropensityStream(std::stringstream* stream);

 private:
  mutable QZScoringConst::ModelType modelType_;
  std::string encoding_;
  std::string version_;
  std::string modelElement_;
  std::string modelName_;
  std::string functionName_;
  std::string algorithmName_;
  std::vector<std::string> targetFields_;
  std::vector<std::string> activeFields_;
  std::vector<std::string> derivedInputs_;
  std::vector<std::string> dataFields_;
  std::vector<std::string> derivedFields_;
  std::stringstream skeleton_;
  bool hasTransformationDictionary_;
  std::unique_ptr<std::stringstream> adjustedPropensity_;
  std::string multipleModelMethod_;
  std::string modelID_;
  std::string appName_;
  std::string appVersion_;
  std::vector<ScoringOutputField*> outputFields_;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_MODEL_ATTR_H_

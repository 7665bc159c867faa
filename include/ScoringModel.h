// The scoring model a host scores records with and reads a model's attributes from.
#ifndef QZSCORING_SCORING_MODEL_H_
#define QZSCORING_SCORING_MODEL_H_

#include <ostream>
#include <string>
#include <vector>

#include "QZScoringConst.h"
#include "QZScoringExport.h"
#include "QZSettings.h"
#include "QZStatus.h"
#include "QZVarList.h"
#include "ValueRecord.h"

namespace QZTransformNS_8_0_0 {
class QZTransformation;
}

namespace QZScoring_800 {

class ScoringAdjustedPropensity;
class ScoringModelAttr;
class ScoringOutputField;

// A pure interface; ScoringAbsModel is the base of every model of the library. The
// order of the virtual operations is part of the binary interface. A model is used by
// one thread at a time. Copying copies nothing (the interface holds no data).
class QZSCORING_API ScoringModel {
 public:
  // The kind of a model object (GetScoringModelType).
  enum ScoringModelType {
    SCORING_ABS_MODEL = 0,
    SCORING_SOLO_MODEL = 1,
    SCORING_MULTI_MODEL = 2,
    SCORING_SPLIT_MODEL = 3
  };

  ScoringModel();
  ScoringModel(const ScoringModel& other);
  ScoringModel& operator=(const ScoringModel& other);
  // Destroys the model and everything it owns.
  virtual ~ScoringModel();

  // A copy owned by the caller; null when the model cannot be copied (every model of
  // this library).
  virtual ScoringModel* Clone() const = 0;
  // Scores one input record into the output record. The first call may append fields
  // to the input record, so pass records of one fixed layout. Never throws.
  virtual QZCommon_800::QZStatus Score(QZCommon_800::ValueRecord& input,
                                       QZCommon_800::ValueRecord& output) = 0;
  // Adds to the record the fields Score writes, so a host can lay out its output
  // record before scoring. Never throws.
  virtual QZCommon_800::QZStatus Scorable(QZCommon_800::ValueRecord& record) = 0;

  // The model's own settings and variable list.
  virtual QZXML_800::QZSettings& GetSettings() = 0;
  virtual const QZXML_800::QZSettings& GetSettings() const = 0;
  virtual QZXML_800::QZVarList& GetVarList() = 0;
  virtual const QZXML_800::QZVarList& GetVarList() const = 0;

  // The scorer's type text; "UNKNOWN" when there is none.
  virtual std::string GetModelType() const = 0;
  // The model type of the document (computed on first use).
  virtual QZScoringConst::ModelType GetType() const = 0;
  virtual void SetType(QZScoringConst::ModelType type) = 0;
  // The model's sub type (the model element name the factory read from the settings).
  virtual std::string GetSubType() const = 0;
  virtual void SetSubType(const std::string& subType) = 0;
  // Descriptive attributes of the document; empty when unknown.
  virtual std::string GetAlgName() const = 0;
  virtual void SetAlgName(const std::string& name) = 0;
  virtual std::string GetModelName() const = 0;
  virtual void SetModelName(const std::string& name) = 0;
  virtual std::string GetVersion() const = 0;
  virtual void SetVersion(const std::string& version) = 0;

  // The transformation engine applied before scoring; owned by the model, null when
  // none. SetTransformation takes ownership and destroys the engine held before.
  virtual const QZTransformNS_8_0_0::QZTransformation* GetTransformation() const = 0;
  virtual void SetTransformation(QZTransformNS_8_0_0::QZTransformation* transformation) = 0;
  // Names of the derived fields the transformation adds to the input record.
  virtual const std::vector<std::string>& GetDerivedFields() const = 0;
  virtual void SetDerivedFields(const std::vector<std::string>& fields) = 0;
  // Whether the engine itself lays out the derived fields of the input record.
  virtual void SetNeedDerivedPredictor(bool need) = 0;
  virtual bool NeedDerivedPredictor() const = 0;
  // The adjusted propensity; owned by the model, null when none. The setter takes
  // ownership and destroys the one held before.
  virtual ScoringAdjustedPropensity* GetAdjustedPropensity() const = 0;
  virtual void SetAdjustedPropensity(ScoringAdjustedPropensity* propensity) = 0;

  virtual std::string GetModelID() const = 0;
  virtual void SetModelID(const std::string& id) = 0;
  virtual std::string GetAppName() const = 0;
  virtual void SetAppName(const std::string& name) = 0;
  virtual std::string GetAppVersion() const = 0;
  virtual void SetAppVersion(const std::string& version) = 0;

  // Takes ownership of the document's attribute record; null keeps the one held.
  virtual void SetScoreModelAtts(ScoringModelAttr* record) = 0;
  // The output fields the document declares; owned by the model's record.
  virtual const std::vector<ScoringOutputField*>& GetOutputFields() const = 0;
  // The first output field with that feature (and that value, when value is not
  // empty); null when none. Owned by the model.
  virtual const ScoringOutputField* GetOutputField(const std::string& feature,
                                                   const std::string& value) const = 0;
  // The model's status.
  virtual QZCommon_800::QZStatus GetStatus() const = 0;
  // Writes a description of the model (nothing, for every model of this library).
  virtual void Display(std::ostream& out) const = 0;
  // The kind of this model object.
  virtual ScoringModelType GetScoringModelType() const = 0;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_MODEL_H_

// The common base of the library's scoring models.
#ifndef QZSCORING_SCORING_ABS_MODEL_H_
#define QZSCORING_SCORING_ABS_MODEL_H_

#include <memory>
#include <ostream>
#include <string>
#include <vector>

#include "QZScoringExport.h"
#include "ScoringModel.h"

namespace QZScoring_800 {

// Keeps a model's settings, variable list, transformation engine, adjusted propensity
// and attribute record, and answers every ScoringModel operation except Clone, Score
// and Scorable. Most descriptive attributes live in the attribute record: without one,
// their getters give empty results and their setters do nothing; with one, a setter
// stores only a non-empty argument. The model owns its transformation, adjusted
// propensity and record. One thread at a time (GetType caches into the record).
class QZSCORING_API ScoringAbsModel : public ScoringModel {
 public:
  // Copies settings, variable list, sub type, derived fields, the need-derived-
  // predictor flag, the own output-field list (as new copies) and the status. The
  // transformation, adjusted propensity and record are never shared: the copy holds
  // none of them. Assignment makes the target equal to such a copy (what it held of
  // those three is destroyed).
  ScoringAbsModel(const ScoringAbsModel& other);
  ScoringAbsModel& operator=(const ScoringAbsModel& other);
  // Destroys the transformation, the adjusted propensity, the record, then the rest.
  ~ScoringAbsModel() override;

  QZXML_800::QZSettings& GetSettings() override;
  const QZXML_800::QZSettings& GetSettings() const override;
  QZXML_800::QZVarList& GetVarList() override;
  const QZXML_800::QZVarList& GetVarList() const override;

  // "UNKNOWN"; the concrete models override it.
  std::string GetModelType() const override;
  // The record's model type, computed from its model element on first use (16 for a
  // record with a transformation dictionary and no model element); 0 without record.
  QZScoringConst::ModelType GetType() const override;
  // Stores the type into the record; nothing without one.
  void SetType(QZScoringConst::ModelType type) override;
  // The model's own sub type; an empty argument is stored too.
  std::string GetSubType() const override;
  void SetSubType(const std::string& subType) override;
  // The record's algorithm name, model name, PMML version, model ID and application
  // name and version.
  std::string GetAlgName() const override;
  void SetAlgName(const std::string& name) override;
  std::string GetModelName() const override;
  void SetModelName(const std::string& name) override;
  std::string GetVersion() const override;
  void SetVersion(const std::string& version) override;

  const QZTransformNS_8_0_0::QZTransformation* GetTransformation() const override;
  // Destroys the engine held so far (unless it is the one given) and holds the new one,
  // which may be null.
  void SetTransformation(QZTransformNS_8_0_0::QZTransformation* transformation) override;
  const std::vector<std::string>& GetDerivedFields() const override;
  // A non-empty list replaces the model's list by a copy; an empty one changes nothing.
  void SetDerivedFields(const std::vector<std::string>& fields) override;
  void SetNeedDerivedPredictor(bool need) override;
  bool NeedDerivedPredictor() const override;
  ScoringAdjustedPropensity* GetAdjustedPropensity() const override;
  // Destroys the adjusted propensity held so far (unless it is the one given) and
  // holds the new one, which may be null.
  void SetAdjustedPropensity(ScoringAdjustedPropensity* propensity) override;

  std::string GetModelID() const override;
  void SetModelID(const std::string& id) override;
  std::string GetAppName() const override;
  void SetAppName(const std::string& name) override;
  std::string GetAppVersion() const override;
  void SetAppVersion(const std::string& version) override;

  // Takes ownership of the record and destroys the one held so far; null (or the
  // record already held) changes nothing.
  void SetScoreModelAtts(ScoringModelAttr* record) override;
  // The record's output fields; without a record the model's own (empty) list.
  const std::vector<ScoringOutputField*>& GetOutputFields() const override;
  // The first of the record's output fields whose feature equals feature and, when
  // value is not empty, whose value equals value (exact comparison); null without a
  // record, for an empty feature, or when none matches.
  const ScoringOutputField* GetOutputField(const std::string& feature,
                                           const std::string& value) const override;
  // Success: no operation changes it.
  QZCommon_800::QZStatus GetStatus() const override;
  // Writes nothing.
  void Display(std::ostream& out) const override;
  // SCORING_ABS_MODEL.
  ScoringModelType GetScoringModelType() const override;

 protected:
  // Empty settings and variable list; no transformation, adjusted propensity or record.
  ScoringAbsModel();
  // Copies of the settings and the variable list; otherwise as the default.
  ScoringAbsModel(const QZXML_800::QZSettings& settings,
                  const QZXML_800::QZVarList& variables);

  // The attribute record, null when none; owned by the model.
  ScoringModelAttr* GetScoreModelAtts() const;
  // The transformation engine for running it (GetTransformation gives it read-only);
  // owned by the model, null when none.
  QZTransformNS_8_0_0::QZTransformation* GetRunnableTransformation();

 private:
  QZXML_800::QZSettings fSettings;
  QZXML_800::QZVarList fVarList;
  std::string fSubType;
  std::unique_ptr<QZTransformNS_8_0_0::QZTransformation> fTransformation;
  std::vector<std::string> fDerivedFields;
  bool fNeedDerivedPredictor;
  std::unique_ptr<ScoringAdjustedPropensity> fAdjustedPropensity;
  std::vector<ScoringOutputField*> fOutputFields;  // owned; filled only by copying
  std::unique_ptr<ScoringModelAttr> fRecord;
  QZCommon_800::QZStatus fStatus;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_ABS_MODEL_H_

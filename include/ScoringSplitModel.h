// Sub-models chosen per record by the values of split fields.
#ifndef QZSCORING_SCORING_SPLIT_MODEL_H_
#define QZSCORING_SCORING_SPLIT_MODEL_H_

#include <cstdint>
#include <map>
#include <ostream>
#include <string>
#include <unordered_map>
#include <vector>

#include "QZScoringExport.h"
#include "ScoringAbsModel.h"
#include "Value.h"

namespace QZScoring_800 {

// Holds one sub-model per key (a list of values, ordered element by element with
// Value::operator<, a proper prefix first) and scores each record with the sub-model
// whose key equals the record's values of the split fields. Presents the sub-models as
// one model: a merged variable list and derived-field list (computed once, on first
// use) and the descriptive attributes of the first sub-model (the smallest key). Owns
// its sub-models. Not copyable (Clone gives null). One thread at a time: Score, Scorable,
// GetVarList and GetDerivedFields update caches inside the model.
class QZSCORING_API ScoringSplitModel : public ScoringAbsModel {
 public:
  // The map from keys to sub-models (the split model owns the sub-models in it).
  using ModelMap = std::map<std::vector<QZCommon_800::Value>, ScoringModel*>;

  // No sub-model and no split field; empty settings and variable list.
  ScoringSplitModel();
  ScoringSplitModel(const ScoringSplitModel&) = delete;
  ScoringSplitModel& operator=(const ScoringSplitModel&) = delete;
  // Destroys the sub-models in key order, then the rest of the model.
  ~ScoringSplitModel() override;

  // Stores the model under the key and takes ownership: true. False when the model is
  // null, the key is already present or memory runs out: then the caller keeps the
  // model and the map is unchanged. Never throws.
  bool AddModel(const std::vector<QZCommon_800::Value>& key, ScoringModel* model);
  // Only while the model holds no sub-model: takes a copy of the map and ownership of
  // the sub-models in it (null entries are left out). Otherwise, or when models is this
  // model's own map, nothing happens.
  void SetModel(const ModelMap& models);
  // The map of keys to sub-models; the sub-models stay owned by the split model.
  const ModelMap& GetModel() const;
  // The names of the input fields whose values form a record's key, in key order.
  // Replacing them makes the next Score look their positions up again.
  void SetSplitFields(const std::vector<std::string>& fields);
  std::vector<std::string> GetSplitFields() const;

  // Null: a split model cannot be copied.
  ScoringModel* Clone() const override;
  // Clears the output record's values, then scores the input record with the sub-model
  // whose key equals the record's split-field values and returns its status (260029
  // when that sub-model's scorer threw). The split-field positions are looked up on
  // the first call and again whenever the input record's layout changes. After
  // Scorable has seen a sub-model with several targets, the output of a sub-model with
  // one target T is nested: each non-null field N becomes a structured value whose
  // entry T holds N's value. 260009 without sub-models or when no key matches; 260027
  // when a split field is not a field of the input record. Never throws.
  QZCommon_800::QZStatus Score(QZCommon_800::ValueRecord& input,
                               QZCommon_800::ValueRecord& output) override;
  // Lays out the first sub-model's output fields and records, for every sub-model,
  // whether it has at most one target and its target's name. 260009 without
  // sub-models, else the first sub-model's status. Never throws.
  QZCommon_800::QZStatus Scorable(QZCommon_800::ValueRecord& record) override;

  // The first sub-model's settings; the model's own without sub-models.
  QZXML_800::QZSettings& GetSettings() override;
  const QZXML_800::QZSettings& GetSettings() const override;
  // The variables of all sub-models merged into the model's own list (once, on first
  // use): the first sub-model's variables, then every variable only a later sub-model
  // has (categorical ones with their categories and labels); a categorical variable
  // present in several sub-models gets the categories of all of them, and a variable
  // that is an input of any sub-model is an input.
  QZXML_800::QZVarList& GetVarList() override;
  const QZXML_800::QZVarList& GetVarList() const override;
  // The first sub-model's; without sub-models those of ScoringAbsModel.
  std::string GetModelType() const override;
  QZScoringConst::ModelType GetType() const override;
  std::string GetSubType() const override;
  std::string GetAppName() const override;
  std::string GetAppVersion() const override;
  // The derived fields of every sub-model in key order (merged once, on first use; a
  // name is listed once per sub-model that carries it).
  const std::vector<std::string>& GetDerivedFields() const override;
  // Writes nothing.
  void Display(std::ostream& out) const override;
  // SCORING_SPLIT_MODEL.
  ScoringModelType GetScoringModelType() const override;

 private:
  // Hashing and equality of keys that agree with the map's order: two keys are equal
  // when neither is less than the other.
  struct KeyHash {
    size_t operator()(const std::vector<QZCommon_800::Value>& key) const noexcept;
  };
  struct KeyEqual {
    bool operator()(const std::vector<QZCommon_800::Value>& a,
                    const std::vector<QZCommon_800::Value>& b) const noexcept;
  };
  using ModelIndex =
      std::unordered_map<std::vector<QZCommon_800::Value>, ScoringModel*, KeyHash, KeyEqual>;

  struct TargetInfo {
    bool singleTarget = false;  // at most one target variable
    bool hasName = false;       // single target with a target variable
    std::string name;
  };

  QZCommon_800::QZStatus ScoreUnguarded(QZCommon_800::ValueRecord& input,
                                        QZCommon_800::ValueRecord& output);
  QZCommon_800::QZStatus ScorableUnguarded(QZCommon_800::ValueRecord& record);
  // Looks the split fields up in the input record; false (positions emptied) when one
  // is missing.
  bool FindSplitPositions(const QZCommon_800::ValueRecord& input);
  void MergeDerivedFields();
  void MergeVarList();
  // The sub-model with the smallest key, null without sub-models.
  ScoringModel* First() const;

  std::vector<std::string> fSplitFields;
  std::vector<int> fSplitPositions;
  ModelMap fModels;  // owns the sub-models; never holds null
  ModelIndex fIndex;  // the same entries, for the lookup per record
  std::map<const ScoringModel*, TargetInfo> fTargets;
  bool fMultiTargetSeen = false;

  // Lookup caches: whether fSplitPositions fit the input layout below, and the key of
  // the current record, reused from record to record.
  bool fPositionsReady = false;
  uint64_t fLayoutId = 0;
  size_t fLayoutSize = 0;
  std::vector<QZCommon_800::Value> fKey;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_SPLIT_MODEL_H_

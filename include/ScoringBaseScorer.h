// A convenience base for scorers: keeps the scorer's settings and variable list.
#ifndef QZSCORING_SCORING_BASE_SCORER_H_
#define QZSCORING_SCORING_BASE_SCORER_H_

#include <string>

#include "IQZScore.h"
#include "QZScoringExport.h"
#include "QZSettings.h"
#include "QZVarList.h"

namespace QZScoring_800 {

// Refers to settings that the caller keeps alive for the scorer's whole life (the
// factory passes the model's own settings) and holds its own copy of the variable
// list. Score and Scorable are pure: a scorer overrides both, and may call the base
// bodies, which return 260016 (not supported) and leave the records untouched.
class QZSCORING_API ScoringBaseScorer : public QZCommon_800::IQZScore {
 public:
  ScoringBaseScorer(QZXML_800::QZSettings& settings, const QZXML_800::QZVarList& variables);
  // The copy refers to the same settings object and copies the variable list.
  ScoringBaseScorer(const ScoringBaseScorer& other);
  ScoringBaseScorer& operator=(const ScoringBaseScorer&) = delete;
  ~ScoringBaseScorer() override;

  // False unless a derived scorer says otherwise.
  bool IsReady() const override;
  QZCommon_800::QZStatus Score(const QZCommon_800::ValueRecord& input,
                               QZCommon_800::ValueRecord& output) override = 0;
  QZCommon_800::QZStatus Scorable(QZCommon_800::ValueRecord& record) override = 0;
  // "UNKNOWN" unless a derived scorer says otherwise.
  std::string GetType() const override;

  virtual QZXML_800::QZSettings& GetSettings();
  virtual const QZXML_800::QZSettings& GetSettings() const;
  // Assigns settings into the referenced settings object (the reference stays).
  virtual void SetSettings(const QZXML_800::QZSettings& settings);
  virtual QZXML_800::QZVarList& GetVarList();
  virtual const QZXML_800::QZVarList& GetVarList() const;
  virtual void SetVarList(const QZXML_800::QZVarList& variables);

 private:
  QZXML_800::QZSettings* settings_;
  QZXML_800::QZVarList variables_;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_BASE_SCORER_H_

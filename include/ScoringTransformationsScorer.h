// The built-in scorer of a document that holds only a transformation dictionary.
#ifndef QZSCORING_SCORING_TRANSFORMATIONS_SCORER_H_
#define QZSCORING_SCORING_TRANSFORMATIONS_SCORER_H_

#include <string>
#include <vector>

#include "IQZScore.h"
#include "QZScoringExport.h"
#include "QZSettings.h"
#include "QZStatus.h"
#include "QZVarList.h"
#include "ValueRecord.h"

namespace QZScoring_800 {

// Computes no score: the solo model's transformation step writes the derived fields
// into the input record. It only declares the output field "transformations", whose
// value has one entry per derived field. Keeps pointers to the model's settings and
// variable list (not owned; they must outlive the scorer). Not copyable. One thread at
// a time.
class QZSCORING_API ScoringTransformationsScorer : public QZCommon_800::IQZScore {
 public:
  // Keeps the pointers to the model's settings and variable list (not owned) and a
  // copy of names: the transformation dictionary's derived-field names, in document
  // order.
  ScoringTransformationsScorer(const QZXML_800::QZSettings* settings,
                               const QZXML_800::QZVarList* variables,
                               const std::vector<std::string>& names);
  ScoringTransformationsScorer(const ScoringTransformationsScorer&) = delete;
  ScoringTransformationsScorer& operator=(const ScoringTransformationsScorer&) = delete;
  ~ScoringTransformationsScorer() override;

  // Always true.
  bool IsReady() const override;
  // Always 260016; both records untouched.
  QZCommon_800::QZStatus Score(const QZCommon_800::ValueRecord& input,
                               QZCommon_800::ValueRecord& output) override;
  // Appends "transformations" (null) and creates in its value an empty entry per
  // derived-field name. Success; 260009 only when memory runs out. Never throws.
  QZCommon_800::QZStatus Scorable(QZCommon_800::ValueRecord& record) override;
  // "TRANSFORMATION".
  std::string GetType() const override;

 private:
  // Kept as given for the object's binary layout; scoring reads neither.
  [[maybe_unused]] const QZXML_800::QZSettings* fSettings;
  [[maybe_unused]] const QZXML_800::QZVarList* fVarList;
  std::vector<std::string> fNames;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_TRANSFORMATIONS_SCORER_H_

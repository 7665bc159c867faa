// The built-in scorer of a time-series XML document (root "HRZXML").
#ifndef QZSCORING_SCORING_HRZXML_SCORER_H_
#define QZSCORING_SCORING_HRZXML_SCORER_H_

#include <istream>
#include <string>

#include "IQZScore.h"
#include "QZScoringExport.h"
#include "QZSettings.h"
#include "QZStatus.h"
#include "QZVarList.h"
#include "ValueRecord.h"

namespace QZScoring_800 {

class ScoringModelAttr;

// Computes no forecast (that lies outside the library): it declares the time-series
// output fields, and its constructor records the document's application name and
// version and its forecast variable. Keeps pointers to the model's settings and
// variable list (not owned; they must outlive the scorer). Not copyable. One thread at
// a time.
class QZSCORING_API ScoringHRZXMLScorer : public QZCommon_800::IQZScore {
 public:
  // Keeps the pointers to the model's settings and variable list (not owned) and reads
  // the document (rewound first unless its bad bit is set): the non-empty "name" and
  // "version" of Header/Application go to the record (not owned), and the "variableID"
  // of the first of "ExpSmoothingModel", "ARIMAModel", "CrostonModel" found is added to
  // the variable list as a continuous target. A null record or list is skipped. Never
  // fails: an unreadable, refused or foreign document records nothing. Needs
  // Xerces-C++ initialised.
  ScoringHRZXMLScorer(const QZXML_800::QZSettings* settings, QZXML_800::QZVarList* variables,
                      const std::string& modelType, std::istream& stream,
                      ScoringModelAttr* record);
  ScoringHRZXMLScorer(const ScoringHRZXMLScorer&) = delete;
  ScoringHRZXMLScorer& operator=(const ScoringHRZXMLScorer&) = delete;
  ~ScoringHRZXMLScorer() override;

  // Always true.
  bool IsReady() const override;
  // Always 260016; both records untouched.
  QZCommon_800::QZStatus Score(const QZCommon_800::ValueRecord& input,
                               QZCommon_800::ValueRecord& output) override;
  // Appends "prediction", "timeseries-lowerconfidence", "timeseries-upperconfidence"
  // and "timeseries-noiseresiduals", each null. Success; 260009 only when memory runs
  // out. Never throws.
  QZCommon_800::QZStatus Scorable(QZCommon_800::ValueRecord& record) override;
  // "HRZ_XML".
  std::string GetType() const override;

 private:
  // Kept as given for the object's binary layout; scoring reads neither.
  [[maybe_unused]] const QZXML_800::QZSettings* fSettings;
  [[maybe_unused]] QZXML_800::QZVarList* fVarList;
  std::string fModelType;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_HRZXML_SCORER_H_

// The raw and adjusted propensity of a model with a binary flag target.
#ifndef QZSCORING_SCORING_ADJUSTED_PROPENSITY_H_
#define QZSCORING_SCORING_ADJUSTED_PROPENSITY_H_

#include <istream>
#include <string>
#include <vector>

#include "QZScoringExport.h"
#include "QZSettings.h"
#include "QZStatus.h"
#include "QZVarList.h"
#include "ValueRecord.h"

namespace QZScoring_800 {

// The raw propensity is the probability that the target flag is true; the adjusted
// propensity passes it through a one-input network with one tanh hidden layer and a
// linear output unit, read from the document's adjusted-propensity extension. Reads
// the settings and variable list of the model that owns it, which must outlive it.
// Not copyable. One thread at a time; after ParseNetwork it is only read.
class QZSCORING_API ScoringAdjustedPropensity {
 public:
  // Keeps the pointers to the model's settings and variable list (not owned); no
  // network yet. A null pointer reads as empty settings / a list without target.
  ScoringAdjustedPropensity(const QZXML_800::QZSettings* settings,
                            const QZXML_800::QZVarList* variables);
  ScoringAdjustedPropensity(const ScoringAdjustedPropensity&) = delete;
  ScoringAdjustedPropensity& operator=(const ScoringAdjustedPropensity&) = delete;
  virtual ~ScoringAdjustedPropensity();

  // Reads the network from an "Extension" document (rewound first unless its bad bit
  // is set), replacing any network read before. Uses the "AdjustedPropensityByNN"
  // elements whose "description" is "standalone" or the setting
  // "scoring_multipleModelMethod" (default "standalone"). True when the weight and
  // bias lists have equal lengths; false for a null stream, a document that does not
  // parse or is refused (DOCTYPE, too deep), or another root. The result is also
  // IsReady's. Never throws.
  bool ParseNetwork(std::istream* stream);
  // True after a successful ParseNetwork.
  bool IsReady() const;

  // Writes "rawpropensity" into output: "probability" when "prediction" is the target
  // flag's true category, else 1 minus it. 260017 (output unchanged) when output lacks
  // "prediction" or "probability", the target is absent, not categorical or not a
  // binary flag, the prediction is not one of its categories, or the probability is
  // missing. Never throws.
  QZCommon_800::QZStatus ComputeRawPropensity(QZCommon_800::ValueRecord& output) const;
  // Writes "rawpropensity" and "adjustedpropensity". 260016 when no network was read;
  // the codes of ComputeRawPropensity; 260023 when the network's lists differ in
  // length. Never throws.
  QZCommon_800::QZStatus ComputeAdjustedPropensity(QZCommon_800::ValueRecord& output) const;

 private:
  // Reads the used "AdjustedPropensityByNN" elements below the root; may throw.
  bool ReadNetwork(std::istream& stream);

  const QZXML_800::QZSettings* fSettings;
  const QZXML_800::QZVarList* fVarList;
  std::vector<double> fHiddenWeights;
  std::vector<double> fHiddenBiases;
  std::vector<double> fOutputWeights;
  double fOutputBias;
  bool fReady;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_ADJUSTED_PROPENSITY_H_

// What one model computes for one record, in a form every model kind fills and every
// consumer (Targets, Output, the host-facing scorer, an ensemble) reads.
#ifndef QZPLUGIN_CORE_MODELRESULT_H_
#define QZPLUGIN_CORE_MODELRESULT_H_

#include <algorithm>
#include <limits>
#include <vector>

#include "Value.h"

namespace QZPlugin_800 {

// The result of scoring one record. Its vectors keep their capacity between records, so
// resetting and filling it allocates nothing once the first record has been scored.
struct ModelResult {
  enum State {
    kValue,    // a prediction was computed
    kMissing,  // no prediction (missing inputs, no true child, ...): fields become null
    kInvalid   // an input was invalid under returnInvalid: the record is refused
  };

  State state = kMissing;
  // Regression: the predicted number (after Targets).
  double value = std::numeric_limits<double>::quiet_NaN();
  // Classification: the predicted category's index in the target's CategoryTable; -1
  // when none.
  int category = -1;
  // Classification: one probability per target category (index as above), valid when
  // hasProbabilities.
  std::vector<double> probabilities;
  bool hasProbabilities = false;
  // Per-category confidences where a model kind gives them (tree ScoreDistributions).
  std::vector<double> confidences;
  bool hasConfidences = false;
  // The entity that decided (a tree node id); owned by the compiled model, null when
  // none.
  const QZCommon_800::Value* entityId = nullptr;
  // The prediction's standard error; NaN when the kind gives none.
  double standardError = std::numeric_limits<double>::quiet_NaN();
  // kInvalid: the status code to report for the record.
  long error = 0;

  // Back to "no prediction" with `categories` probabilities and confidences at zero.
  void Reset(int categories) {
    state = kMissing;
    value = std::numeric_limits<double>::quiet_NaN();
    category = -1;
    // Same size as last time (every record after the first): zero in place.
    const size_t n = static_cast<size_t>(categories);
    if (probabilities.size() != n) probabilities.resize(n);
    std::fill(probabilities.begin(), probabilities.end(), 0.0);
    hasProbabilities = false;
    if (confidences.size() != n) confidences.resize(n);
    std::fill(confidences.begin(), confidences.end(), 0.0);
    hasConfidences = false;
    entityId = nullptr;
    standardError = std::numeric_limits<double>::quiet_NaN();
    error = 0;
  }

  // Classification: the category with the highest probability (the first of equals)
  // becomes the prediction; state kValue. No categories leaves the state unchanged.
  void PickMostProbable() {
    int best = -1;
    for (size_t i = 0; i < probabilities.size(); ++i) {
      if (best < 0 || probabilities[i] > probabilities[static_cast<size_t>(best)]) {
        best = static_cast<int>(i);
      }
    }
    if (best < 0) return;
    category = best;
    hasProbabilities = true;
    state = kValue;
  }
};

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_MODELRESULT_H_

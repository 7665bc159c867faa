// The registry that sends every model element to the reference plug-ins (as qzscore's
// built-in one does). Free of the test framework, so fuzz harnesses and the robustness
// program use it too.
#ifndef QZ_TESTS_REFERENCE_REGISTRY_H_
#define QZ_TESTS_REFERENCE_REGISTRY_H_

#include "QZSettings.h"

namespace qztest {

inline QZXML_800::QZSettings ReferenceRegistry() {
  QZXML_800::QZSettings scoring, models, settings;
  scoring.AddSetting("TreeModel", "QZTree", false);
  scoring.AddSetting("RegressionModel", "QZRegression", false);
  scoring.AddSetting("MiningModel", "QZMining", false);
  scoring.AddSetting("Veritor", "QZMining", false);
  models.AddSetting("MiningModel", "", false);
  models.AddSetting("TreeModel", "", false);
  models.AddSetting("RegressionModel", "", false);
  settings.AddSetting("scoringDll", scoring, true);
  settings.AddSetting("modelDll", models, true);
  return settings;
}

}  // namespace qztest

#endif  // QZ_TESTS_REFERENCE_REGISTRY_H_

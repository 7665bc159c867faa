// QZMining800r.dll: scores MiningModel documents and every model kind the reference
// plug-ins know, so that it can stand as the registry's "Veritor" entry for documents
// of any PMML version.

#include "PluginScorer.h"
#include "RegressionModel.h"

QZSCORING_PLUGIN_EXPORT QZScoring_800::ScoringScoreParser* GetScoreParser() {
  return QZPlugin_800::NewScoreParser("QZMining", {&QZPlugin_800::RegisterRegressionModel});
}

// QZMining800r.dll: scores MiningModel documents and every model kind the reference
// plug-ins know, so that it can stand as the registry's "Veritor" entry for documents
// of any PMML version.

#include "MiningModel.h"
#include "PluginScorer.h"
#include "RegressionModel.h"
#include "TreeModel.h"

QZSCORING_PLUGIN_EXPORT QZScoring_800::ScoringScoreParser* GetScoreParser() {
  return QZPlugin_800::NewScoreParser("QZMining", {
      &QZPlugin_800::RegisterRegressionModel,
      &QZPlugin_800::RegisterTreeModel,
      &QZPlugin_800::RegisterMiningModel,
  });
}

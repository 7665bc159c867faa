// QZRegression800r.dll: scores RegressionModel documents.

#include "PluginScorer.h"
#include "RegressionModel.h"

QZSCORING_PLUGIN_EXPORT QZScoring_800::ScoringScoreParser* GetScoreParser() {
  return QZPlugin_800::NewScoreParser("QZRegression", {&QZPlugin_800::RegisterRegressionModel});
}

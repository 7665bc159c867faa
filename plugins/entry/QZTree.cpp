// QZTree800r.dll: scores TreeModel documents. No tree kind is registered yet, so it
// declines every document (with a diagnostic line) until the tree kind joins it.

#include "PluginScorer.h"

QZSCORING_PLUGIN_EXPORT QZScoring_800::ScoringScoreParser* GetScoreParser() {
  return QZPlugin_800::NewScoreParser("QZTree", {});
}

// QZTree800r.dll: scores TreeModel documents.

#include "PluginScorer.h"
#include "TreeModel.h"

QZSCORING_PLUGIN_EXPORT QZScoring_800::ScoringScoreParser* GetScoreParser() {
  return QZPlugin_800::NewScoreParser("QZTree", {&QZPlugin_800::RegisterTreeModel});
}

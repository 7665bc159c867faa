// The TreeModel kind of the reference plug-ins.
#ifndef QZPLUGIN_TREE_TREEMODEL_H_
#define QZPLUGIN_TREE_TREEMODEL_H_

#include "CompiledModel.h"

namespace QZPlugin_800 {

// Adds "TreeModel" to the registry: regression and classification trees with binary or
// multi splits, node predicates parsed by the library (SimplePredicate,
// CompoundPredicate, SimpleSetPredicate on categorical fields, True, False), every
// missingValueStrategy of PMML 4.4 (none, lastPrediction, nullPrediction, defaultChild,
// weightedConfidence, aggregateNodes), noTrueChildStrategy, missingValuePenalty,
// ScoreDistributions (probabilities from `probability` or from record counts,
// confidences) and node ids as the entity id. Anything else in a tree (an unknown
// predicate or operator, an embedded model, a strategy outside the list) refuses the
// model at compile time.
void RegisterTreeModel(KindRegistry& registry);

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_TREE_TREEMODEL_H_

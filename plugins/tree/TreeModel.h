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
// model at compile time (CompileError).
//
// The tree is compiled into a flat array of nodes, children consecutive, each holding
// the plain form of its predicate the library gives (NumericTest, CategoryTest) where
// it has one, so that scoring tests numbers and category codes decoded once per record
// (a FieldRow) and calls a predicate object only for what those forms leave open. A
// tree in an ensemble reads the ensemble's row; a shallow one is also compiled as a
// StepTree, which the ensemble walks side by side with the others for records whose
// fields are all plain. Its evaluator keeps per-record scratch: one thread at a time,
// like the compiled model that owns it.
void RegisterTreeModel(KindRegistry& registry);

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_TREE_TREEMODEL_H_

// The MiningModel kind of the reference plug-ins: a Segmentation of models of any kind
// the registry knows, combined by its multipleModelMethod.
#ifndef QZPLUGIN_MINING_MININGMODEL_H_
#define QZPLUGIN_MINING_MININGMODEL_H_

#include "CompiledModel.h"

namespace QZPlugin_800 {

// Adds "MiningModel" to the registry. Segments are compiled through the registry, so
// they may be of any registered kind, MiningModel included; a segment of another kind,
// a method outside the list below, or a method that does not apply to the model's
// function is refused at creation. A segment is used when its predicate (True, False,
// SimplePredicate, CompoundPredicate or SimpleSetPredicate, evaluated on the record
// the mining model prepared) is true; `weight` defaults to 1. The segments combined
// (for modelChain, the last one) must have the mining model's function and target.
// Ties between categories go to the first in the target's order.
//
// Regression: average, weightedAverage, median, weightedMedian, max, sum, weightedSum.
// Classification: majorityVote and weightedMajorityVote (probability of a category =
// its share of the votes, or of the weights), average and weightedAverage (of the
// probabilities), median and weightedMedian (per category; the highest predicts),
// max (the category of the highest probability any segment gives; the probabilities
// are the mean of the segments that give it). A segment without probabilities counts
// as probability 1 for its category. A weighted median is the first value at which
// the cumulative weight reaches half the total, or the mean of it and the next value
// when it reaches exactly half (equal weights give the ordinary median).
// Both functions: selectFirst (the first used segment decides), modelChain (each used
// segment writes its OutputFields into the record the later segments and predicates
// read; the last used segment decides), selectAll (the first used segment that
// predicts decides; the result's entityId, which an OutputField of feature entityId
// gives, is a structured value with one entry per segment in document order, named by
// its id or 1-based position: its prediction, or null when it was not used or
// predicted nothing).
//
// Missing segment predictions follow missingPredictionTreatment (also read as
// x-missingPredictionTreatment): returnMissing makes the result missing; skipSegment
// leaves the segment out; continue (the default) counts a missing vote in the total of
// the votes, makes a numeric combination missing, ends selectFirst with the missing
// result and lets a chain go on. Beyond missingThreshold (the share of the used
// segments' weight that is missing, default 1) the result is missing.
void RegisterMiningModel(KindRegistry& registry);

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_MINING_MININGMODEL_H_

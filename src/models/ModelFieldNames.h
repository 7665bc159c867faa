// Names of the output fields the models write or read. Internal to the library.
#ifndef QZSCORING_MODELS_MODELFIELDNAMES_H_
#define QZSCORING_MODELS_MODELFIELDNAMES_H_

#include <string>

#include "ScoringPMMLTags.h"

namespace QZScoring_800 {
namespace model_fields {

// Kept as strings so that looking a field up per record builds no temporary text.
inline const std::string kPrediction = ScoringPMMLTags::PMML_OUT_PREDICTION;
inline const std::string kProbability = ScoringPMMLTags::PMML_OUT_PROBABILITY;
inline const std::string kRawPropensity = ScoringPMMLTags::PMML_OUT_RAWPROPENSITY;
inline const std::string kAdjustedPropensity = ScoringPMMLTags::PMML_OUT_ADJUSTEDPROPENSITY;
inline const std::string kTransformations = ScoringPMMLTags::PMML_EXT_TRANSFORMATIONS;
inline const std::string kLowerConfidence =
    ScoringPMMLTags::PMML_OUT_TIMESERIES_LOWERCONFIDENCE;
inline const std::string kUpperConfidence =
    ScoringPMMLTags::PMML_OUT_TIMESERIES_UPPERCONFIDENCE;
inline const std::string kNoiseResiduals =
    ScoringPMMLTags::PMML_OUT_TIMESERIES_NOISERESIDUALS;

}  // namespace model_fields

}  // namespace QZScoring_800

#endif  // QZSCORING_MODELS_MODELFIELDNAMES_H_

// The model element names of PMML and the model types they stand for.
#ifndef QZSCORING_SRC_MODELS_MODEL_TYPE_NAMES_H_
#define QZSCORING_SRC_MODELS_MODEL_TYPE_NAMES_H_

#include <string>

#include "QZScoringConst.h"

namespace QZScoring_800 {

// The type of a model element name: exact, case-sensitive; MODEL_UNKNOWN otherwise.
QZScoringConst::ModelType ModelTypeOfElement(const std::string& elementName);

}  // namespace QZScoring_800

#endif  // QZSCORING_SRC_MODELS_MODEL_TYPE_NAMES_H_

// The RegressionModel kind of the reference plug-ins.
#ifndef QZPLUGIN_REGRESSION_REGRESSIONMODEL_H_
#define QZPLUGIN_REGRESSION_REGRESSIONMODEL_H_

#include "CompiledModel.h"

namespace QZPlugin_800 {

// Adds "RegressionModel" to the registry: regression (one RegressionTable) and
// classification (one table per target category, or one table for a binary target);
// NumericPredictor (with exponent), CategoricalPredictor and PredictorTerm; every
// normalizationMethod of PMML 4.4. Regression: none, softmax/logit (1/(1+e^-y)), exp,
// probit, cloglog, loglog, cauchit (simplemax is refused). Classification: softmax and
// simplemax over the tables; none, logit, probit, cloglog, loglog, cauchit and exp map
// each table's y on its own, except for a binary target, where the first table's
// category gets f(y) and the other 1 - f(y). A missing predictor value makes the
// prediction missing (Targets may then supply one); a categorical value that no
// CategoricalPredictor names contributes nothing.
void RegisterRegressionModel(KindRegistry& registry);

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_REGRESSION_REGRESSIONMODEL_H_

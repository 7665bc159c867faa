// A model's Targets element: what is done with a prediction after the model computed it
// (regression rescaling and rounding) and what stands in when it computed none
// (default value, prior probabilities).
#ifndef QZPLUGIN_CORE_TARGETS_H_
#define QZPLUGIN_CORE_TARGETS_H_

#include <string>
#include <vector>

#include <xercesc/dom/DOMElement.hpp>

#include "Categories.h"
#include "ModelResult.h"
#include "PluginDom.h"

namespace QZPlugin_800 {

// The Target that applies to one model: the one naming the model's target field, or
// the one without a field. Regression: the prediction is clipped to min and max, then
// multiplied by rescaleFactor, then rescaleConstant is added, then castInteger rounds
// it; a model that computed no prediction gives the defaultValue instead (not
// rescaled). Classification: a model that computed no prediction gives the categories'
// priorProbability values, and the most probable of them is predicted.
class TargetStage {
 public:
  // Reads the Targets element (null: nothing to do). For classification the
  // TargetValue categories are interned into `categories`, which must outlive the
  // stage. Throws CompileError for an unknown castInteger or a malformed number.
  void Compile(const xercesc::DOMElement* targets, const DomReader& reader,
               const std::string& targetField, bool classification,
               CategoryTable* categories);

  // Applies the target's treatment to a result (see the class comment). Without one
  // (the usual case) only the identity rescaling's effect remains: x * 1 + 0 is x except
  // that -0 becomes +0.
  void Finish(ModelResult& result) const {
    if (active_) {
      Apply(result);
    } else if (!classification_ && result.state == ModelResult::kValue) {
      result.value += 0.0;
    }
  }

  // Whether some treatment changes results (beyond making -0 +0).
  bool Active() const { return active_; }

  // The displayValue of a category's TargetValue, null when it declares none.
  const std::string* DisplayValue(int category) const;

 private:
  enum class Cast { kNone, kRound, kCeiling, kFloor };

  void Apply(ModelResult& result) const;

  bool active_ = false;  // some treatment changes results (set by Compile)

  bool classification_ = false;
  bool hasMin_ = false, hasMax_ = false;
  double min_ = 0.0, max_ = 0.0;
  double factor_ = 1.0, constant_ = 0.0;
  Cast cast_ = Cast::kNone;
  bool hasDefault_ = false;
  double default_ = 0.0;
  std::vector<double> priors_;  // by category index; empty when none are declared
  std::vector<std::string> display_;
  std::vector<bool> hasDisplay_;
};

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_TARGETS_H_

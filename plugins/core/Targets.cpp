#include "Targets.h"

#include <cmath>

namespace QZPlugin_800 {

void TargetStage::Compile(const xercesc::DOMElement* targets, const DomReader& reader,
                          const std::string& targetField, bool classification,
                          CategoryTable* categories) {
  classification_ = classification;
  if (targets == nullptr) return;
  const xercesc::DOMElement* chosen = nullptr;
  for (const xercesc::DOMElement* target : ChildElements(targets, u"Target")) {
    const std::string field = reader.Attr(target, u"field");
    if (field.empty() || field == targetField) {
      chosen = target;
      if (!field.empty()) break;  // a Target naming the field wins over one without
    }
  }
  if (chosen == nullptr) return;

  hasMin_ = DomReader::Has(chosen, u"min");
  min_ = reader.Number(chosen, u"min", 0.0);
  hasMax_ = DomReader::Has(chosen, u"max");
  max_ = reader.Number(chosen, u"max", 0.0);
  factor_ = reader.Number(chosen, u"rescaleFactor", 1.0);
  constant_ = reader.Number(chosen, u"rescaleConstant", 0.0);
  const std::string cast = reader.Attr(chosen, u"castInteger");
  if (cast.empty()) {
    cast_ = Cast::kNone;
  } else if (cast == "round") {
    cast_ = Cast::kRound;
  } else if (cast == "ceiling") {
    cast_ = Cast::kCeiling;
  } else if (cast == "floor") {
    cast_ = Cast::kFloor;
  } else {
    throw CompileError("Target castInteger '" + cast + "' is not supported");
  }

  for (const xercesc::DOMElement* value : ChildElements(chosen, u"TargetValue")) {
    if (!classification) {
      if (DomReader::Has(value, u"defaultValue")) {
        hasDefault_ = true;
        default_ = reader.Number(value, u"defaultValue", 0.0);
      }
      continue;
    }
    if (categories == nullptr || !DomReader::Has(value, u"value")) continue;
    const std::string text = reader.Attr(value, u"value");
    int index = categories->Find(text);
    if (index < 0) index = categories->Intern(text);
    const size_t i = static_cast<size_t>(index);
    if (DomReader::Has(value, u"priorProbability")) {
      if (priors_.size() <= i) priors_.resize(i + 1, 0.0);
      priors_[i] = reader.Number(value, u"priorProbability", 0.0);
    }
    if (DomReader::Has(value, u"displayValue")) {
      if (display_.size() <= i) {
        display_.resize(i + 1);
        hasDisplay_.resize(i + 1, false);
      }
      display_[i] = reader.Attr(value, u"displayValue");
      hasDisplay_[i] = true;
    }
  }
  active_ = classification ? !priors_.empty()
                           : hasDefault_ || hasMin_ || hasMax_ || factor_ != 1.0 ||
                                 constant_ != 0.0 || cast_ != Cast::kNone;
}

void TargetStage::Apply(ModelResult& result) const {
  if (classification_) {
    if (result.state == ModelResult::kMissing && !priors_.empty()) {
      for (size_t i = 0; i < result.probabilities.size(); ++i) {
        result.probabilities[i] = i < priors_.size() ? priors_[i] : 0.0;
      }
      result.PickMostProbable();
    }
    return;
  }
  if (result.state == ModelResult::kMissing) {
    if (hasDefault_) {
      result.value = default_;
      result.state = ModelResult::kValue;
    }
    return;
  }
  if (result.state != ModelResult::kValue) return;
  double value = result.value;
  if (hasMin_ && value < min_) value = min_;
  if (hasMax_ && value > max_) value = max_;
  value = value * factor_ + constant_;
  switch (cast_) {
    case Cast::kNone:
      break;
    case Cast::kRound:
      value = std::round(value);
      break;
    case Cast::kCeiling:
      value = std::ceil(value);
      break;
    case Cast::kFloor:
      value = std::floor(value);
      break;
  }
  result.value = value;
}

const std::string* TargetStage::DisplayValue(int category) const {
  const size_t i = static_cast<size_t>(category);
  return category >= 0 && i < hasDisplay_.size() && hasDisplay_[i] ? &display_[i] : nullptr;
}

}  // namespace QZPlugin_800

// Value and category helpers of ScoringPMMLParser: questions about the variables of a
// filled variable list, and the bins of a Discretize transformation.

#include <limits>
#include <string>
#include <utility>
#include <vector>

#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/dom/DOMNamedNodeMap.hpp>
#include <xercesc/dom/DOMNode.hpp>

#include "QZMV.h"
#include "ScoringPMMLParser.h"
#include "ScoringPMMLTags.h"

using QZCommon_800::QZMV;
using QZCommon_800::Value;
using QZXML_800::IQZEncoder;
using QZXML_800::IQZVariable;
using QZXML_800::QZVarList;
using xercesc::DOMElement;
using xercesc::DOMNode;

namespace QZScoring_800 {

namespace {

using Tags = ScoringPMMLTags;

constexpr int kNumberCategories = QZXML_800::ML_NUMERIC_CATEGORICAL;  // level 2
constexpr int kTextCategories = QZXML_800::ML_STRING_CATEGORICAL;     // level 3
// IQZEncoder::GetValueType of an encoder whose categories are texts.
constexpr int kTextValues = 3;

bool IsCategorical(int level) { return level == kNumberCategories || level == kTextCategories; }

// The encoder of a categorical variable, or null for a null or non-categorical variable
// or one without encoder.
const IQZEncoder* CategoricalEncoder(const IQZVariable* variable) {
  if (variable == nullptr || !IsCategorical(variable->GetMeasureLevel())) return nullptr;
  return variable->GetEncoder();
}

// The category at i as a Value: a number for level 2, a text for level 3.
Value CategoryAt(const IQZEncoder& encoder, int level, int i) {
  if (level == kNumberCategories) return Value(encoder.GetNumberAt(i));
  return Value(encoder.GetStringAt(i));
}

// Whether some category matches the value, by number (level 2) or by text (level 3),
// scanning in index order.
bool HasCategory(const IQZVariable* variable, const Value& value) {
  const IQZEncoder* encoder = CategoricalEncoder(variable);
  if (encoder == nullptr) return false;
  const int count = encoder->GetCount();
  if (variable->GetMeasureLevel() == kNumberCategories) {
    const Value number(value.GetReal());
    for (int i = 0; i < count; ++i) {
      if (Value(encoder->GetNumberAt(i)) == number) return true;
    }
    return false;
  }
  const std::string text = value.GetString();
  for (int i = 0; i < count; ++i) {
    if (encoder->GetStringAt(i) == text) return true;
  }
  return false;
}

// A double read by ParseDouble, or `fallback` when the attribute is absent or no number.
double MarginOr(const DOMElement* interval, const char* name, double fallback) {
  double margin = fallback;
  return ScoringBaseParser::GetDoubleAttribute(interval, name, margin) == 0 ? margin
                                                                           : fallback;
}

}  // namespace

std::vector<const IQZVariable*> ScoringPMMLParser::GetTargetVars(const QZVarList& vars) {
  std::vector<const IQZVariable*> targets;
  try {
    const std::vector<int> indices = vars.GetTargetIndices();
    for (int index : indices) {
      const IQZVariable* variable = vars.GetVarAt(index);
      if (variable != nullptr) targets.push_back(variable);
    }
  } catch (...) {
    targets.clear();  // out of memory: no partial answer
  }
  return targets;
}

std::vector<Value> ScoringPMMLParser::GetValues(const IQZVariable* variable) {
  std::vector<Value> values;
  const IQZEncoder* encoder = CategoricalEncoder(variable);
  if (encoder == nullptr) return values;
  try {
    const int level = variable->GetMeasureLevel();
    const int count = encoder->GetCount();
    values.reserve(count > 0 ? static_cast<size_t>(count) : 0);
    for (int i = 0; i < count; ++i) values.push_back(CategoryAt(*encoder, level, i));
  } catch (...) {
    values.clear();
  }
  return values;
}

std::vector<std::pair<Value, std::string>> ScoringPMMLParser::GetValueLabels(
    const IQZVariable* variable) {
  std::vector<std::pair<Value, std::string>> pairs;
  const IQZEncoder* encoder = CategoricalEncoder(variable);
  if (encoder == nullptr) return pairs;
  try {
    const int level = variable->GetMeasureLevel();
    const int count = encoder->GetCount();
    // Labels are by category index: they only fit when the encoder holds exactly the
    // variable's categories.
    const std::vector<std::string>& labels = encoder->GetLabels();
    const size_t usable = count == variable->GetNumCategories() ? labels.size() : 0;
    for (int i = 0; i < count; ++i) {
      const size_t at = static_cast<size_t>(i);
      std::string label =
          at < usable && !labels[at].empty() ? labels[at] : encoder->GetStringAt(i);
      pairs.emplace_back(CategoryAt(*encoder, level, i), std::move(label));
    }
  } catch (...) {
    pairs.clear();
  }
  return pairs;
}

bool ScoringPMMLParser::IsValidCatValue(const IQZVariable* variable, const Value& value) {
  try {
    return HasCategory(variable, value);
  } catch (...) {
    return false;
  }
}

bool ScoringPMMLParser::IsValidValue(const IQZVariable* variable, const std::string& text) {
  try {
    return HasCategory(variable, Value(text));
  } catch (...) {
    return false;
  }
}

bool ScoringPMMLParser::IsMissingValue(const IQZVariable* variable, const Value& value) {
  if (variable == nullptr || value.IsNull()) return true;
  const int level = variable->GetMeasureLevel();
  if (level != kTextCategories && QZMV::IsMissing(value.GetReal())) return true;
  const IQZEncoder* encoder = variable->GetEncoder();
  if (encoder == nullptr) return false;
  if (encoder->GetValueType() != kTextValues) return encoder->IsMissingNumber(value.GetReal());
  try {
    // A text value is looked up in place; only a number needs its text made.
    return value.IsString() ? encoder->IsMissingString(value.GetText())
                            : encoder->IsMissingString(value.GetString());
  } catch (...) {
    return false;  // out of memory while writing a number's text
  }
}

bool ScoringPMMLParser::IsValidValue(const IQZVariable* variable, const Value& value) {
  if (IsMissingValue(variable, value)) return false;
  const int level = variable->GetMeasureLevel();
  const IQZEncoder* encoder = variable->GetEncoder();
  if (encoder != nullptr && encoder->GetCount() > 0 && IsCategorical(level)) {
    if (level == kNumberCategories) return encoder->IndexOfNumber(value.GetReal()) != -1.0;
    try {
      return value.IsString() ? encoder->IndexOfString(value.GetText()) != -1.0
                              : encoder->IndexOfString(value.GetString()) != -1.0;
    } catch (...) {
      return false;
    }
  }
  if (level == kTextCategories) return true;
  return value.GetType() == Value::REAL_TYPE;
}

bool ScoringPMMLParser::IsFlagVariable(const IQZVariable* variable) {
  return variable != nullptr && IsCategorical(variable->GetMeasureLevel()) &&
         variable->GetNumCategories() == 2;
}

bool ScoringPMMLParser::SetBinsFrTransDict(DOMElement* dictionary, const std::string& field,
                                           std::vector<double>& bounds,
                                           std::vector<std::string>& binValues) const {
  bounds.clear();
  binValues.clear();
  if (dictionary == nullptr) return false;
  try {
    for (DOMNode* child = dictionary->getFirstChild(); child != nullptr;
         child = child->getNextSibling()) {
      const DOMElement* derived = AsElement(child, Tags::PMML_ELE_DERIVED_FIELD);
      const DOMElement* discretize = GetFirstChildElement(derived, Tags::PMML_ELE_DISCRETIZE);
      if (discretize == nullptr) continue;
      const xercesc::DOMNamedNodeMap* attributes = discretize->getAttributes();
      if (attributes == nullptr || attributes->getLength() == 0) continue;
      if (!IsEqual(GetAttribute(discretize, Tags::PMML_ATT_FIELD), field)) continue;

      bounds.push_back(0.0);  // the first interval's lower margin, set below
      bool first = true;
      for (const DOMElement* bin = GetFirstChildElement(discretize, Tags::PMML_ELE_DISCRETIZE_BIN);
           bin != nullptr; bin = GetNextSiblingElement(bin, Tags::PMML_ELE_DISCRETIZE_BIN)) {
        const XMLCh* binValue = GetAttribute(bin, Tags::PMML_ATT_BIN_VALUE);
        if (binValue != nullptr) binValues.push_back(ToString(binValue));
        for (const DOMElement* interval = GetFirstChildElement(bin, Tags::PMML_ELE_INTERVAL);
             interval != nullptr;
             interval = GetNextSiblingElement(interval, Tags::PMML_ELE_INTERVAL)) {
          bounds.push_back(MarginOr(interval, Tags::PMML_ATT_RIGHT_MARGIN,
                                    std::numeric_limits<double>::max()));
          if (first) {
            bounds.front() = MarginOr(interval, Tags::PMML_ATT_LEFT_MARGIN,
                                      std::numeric_limits<double>::lowest());
            first = false;
          }
        }
      }
      return true;
    }
  } catch (...) {
    // Out of memory or a DOM failure: no partial answer.
    bounds.clear();
    binValues.clear();
  }
  return false;
}

}  // namespace QZScoring_800

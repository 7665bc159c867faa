#include "OutputFields.h"

#include <cmath>

#include <xercesc/dom/DOMDocument.hpp>

#include "CompiledModel.h"
#include "PluginDom.h"
#include "QZMV.h"

namespace QZPlugin_800 {

using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace {

// Releases an element made for the engine, which reads it and keeps nothing.
struct ReleaseElement {
  void operator()(xercesc::DOMElement* element) const { element->release(); }
};

void CopyAttribute(const xercesc::DOMElement* from, xercesc::DOMElement* to,
                   const char16_t* name) {
  if (DomReader::Has(from, name)) to->setAttribute(name, from->getAttribute(name));
}

}  // namespace

OutputStage::OutputStage() = default;
OutputStage::~OutputStage() = default;

void OutputStage::Compile(const xercesc::DOMElement* output, DocumentContext& document,
                          const std::string& targetField, bool classification,
                          const CategoryTable* categories, const TargetStage& targets) {
  classification_ = classification;
  categories_ = categories;
  targets_ = &targets;
  if (output == nullptr) return;
  const DomReader& reader = document.Reader();

  std::unique_ptr<xercesc::DOMElement, ReleaseElement> expressions;
  for (const xercesc::DOMElement* e : ChildElements(output, u"OutputField")) {
    const std::string name = reader.Required(e, u"name");
    const std::string where = "OutputField '" + name + "'";
    const std::string feature = reader.Attr(e, u"feature", "predictedValue");
    const std::string target = reader.Attr(e, u"targetField");
    if (!target.empty() && !targetField.empty() && target != targetField) {
      throw CompileError(where + " names target '" + target + "', not the model's target");
    }
    if (DomReader::Has(e, u"segmentId")) throw CompileError(where + ": segmentId is not supported");

    Field field;
    if (feature == "predictedValue") {
      field.feature = Feature::kPredictedValue;
    } else if (feature == "predictedDisplayValue") {
      field.feature = Feature::kPredictedDisplayValue;
    } else if (feature == "probability" || feature == "confidence") {
      field.feature = feature == "probability" ? Feature::kProbability : Feature::kConfidence;
      if (DomReader::Has(e, u"value")) {
        const std::string value = reader.Attr(e, u"value");
        field.category = categories == nullptr ? -1 : categories->Find(value);
        field.foreignValue = field.category < 0;
      }
    } else if (feature == "entityId" || feature == "nodeId") {
      field.feature = Feature::kEntityId;
    } else if (feature == "standardError") {
      field.feature = Feature::kStandardError;
    } else if (feature == "transformedValue") {
      field.feature = Feature::kTransformedValue;
      const xercesc::DOMElement* expression = nullptr;
      for (const xercesc::DOMElement* child : ChildElements(e)) {
        if (!IsElement(child, u"Extension") && !IsElement(child, u"Decisions")) {
          expression = child;
          break;
        }
      }
      if (expression == nullptr) throw CompileError(where + " has no expression");
      xercesc::DOMDocument* dom = e->getOwnerDocument();
      if (!expressions) expressions.reset(dom->createElement(u"LocalTransformations"));
      xercesc::DOMElement* derived = dom->createElement(u"DerivedField");
      derived->setAttribute(u"name", e->getAttribute(u"name"));
      CopyAttribute(e, derived, u"optype");
      CopyAttribute(e, derived, u"dataType");
      derived->appendChild(expression->cloneNode(true));
      expressions->appendChild(derived);
    } else {
      throw CompileError(where + ": feature '" + feature + "' is not supported");
    }

    const std::string type = reader.Attr(e, u"dataType");
    if (type == "double" || type == "float" || type == "integer") {
      field.kind = Kind::kReal;
    } else if (type == "string") {
      field.kind = Kind::kText;
    }
    if (writer_.Add(name) != static_cast<int>(fields_.size())) {
      throw CompileError(where + " is declared twice");
    }
    fields_.push_back(field);
  }

  if (expressions) {
    engine_ = std::make_unique<QZTransformNS_8_0_0::QZTransformation>();
    QZStatus status;
    if (document.TransformationDictionary() != nullptr && document.HasDefineFunctions()) {
      status = engine_->AddTransformationDictionary(document.TransformationDictionary());
    }
    if (status.IsOK()) status = engine_->AddTransformationDictionary(expressions.get());
    if (status.IsError()) {
      throw CompileError("Output: transformedValue refused by the transformation engine: " +
                         engine_->GetLastError());
    }
  }
}

void OutputStage::Assign(Value& out, const Field& field, const ModelResult& result) const {
  if (result.state != ModelResult::kValue) {
    out = Value();
    return;
  }
  switch (field.feature) {
    case Feature::kPredictedValue:
      if (classification_) {
        if (result.category >= 0 && categories_ != nullptr) {
          out = categories_->AsValue(result.category);
        } else {
          out = Value();
        }
      } else {
        out = result.value;
      }
      break;
    case Feature::kPredictedDisplayValue:
      if (classification_) {
        const std::string* display = targets_->DisplayValue(result.category);
        if (display != nullptr) {
          out = *display;
        } else if (result.category >= 0 && categories_ != nullptr) {
          out = categories_->Text(result.category);
        } else {
          out = Value();
        }
      } else {
        out = Value::RealToText(result.value);
      }
      break;
    case Feature::kProbability:
    case Feature::kConfidence: {
      const bool probability = field.feature == Feature::kProbability;
      const bool has = probability ? result.hasProbabilities : result.hasConfidences;
      const std::vector<double>& values = probability ? result.probabilities : result.confidences;
      const int category = field.category >= 0 ? field.category : result.category;
      if (!classification_ || !has) {
        out = Value();
      } else if (field.foreignValue) {
        out = 0.0;
      } else if (category >= 0 && static_cast<size_t>(category) < values.size()) {
        out = values[static_cast<size_t>(category)];
      } else {
        out = Value();
      }
      break;
    }
    case Feature::kEntityId:
      if (result.entityId != nullptr) {
        out = *result.entityId;
      } else {
        out = Value();
      }
      break;
    case Feature::kStandardError:
      if (std::isnan(result.standardError)) {
        out = Value();
      } else {
        out = result.standardError;
      }
      break;
    case Feature::kTransformedValue:
      out = Value();  // computed afterwards, from the other fields
      return;
  }
  if (field.kind == Kind::kReal && out.IsString()) {
    out = out.GetReal();
  } else if (field.kind == Kind::kText && out.IsNumericValue() && !out.IsMissing()) {
    out = out.GetString();
  }
}

QZStatus OutputStage::Write(const ModelResult& result, const ValueRecord& prepared,
                            ValueRecord& out) {
  writer_.Bind(out);
  for (size_t i = 0; i < fields_.size(); ++i) {
    Assign(writer_.At(out, static_cast<int>(i)), fields_[i], result);
  }
  if (engine_ && result.state == ModelResult::kValue) return WriteTransformed(prepared, out);
  return QZStatus();
}

QZStatus OutputStage::WriteTransformed(const ValueRecord& prepared, ValueRecord& out) {
  if (prepared.GetLayoutId() != scratchFor_ || prepared.Size() != scratchSize_) {
    scratch_ = ValueRecord(prepared.Size() + fields_.size());
    for (size_t i = 0; i < prepared.Size(); ++i) scratch_.Add(prepared.GetName(i), Value());
    for (size_t i = 0; i < fields_.size(); ++i) {
      if (fields_[i].feature != Feature::kTransformedValue) {
        scratch_.Add(writer_.Name(static_cast<int>(i)), Value());
      }
    }
    engine_->GetDerivedVariableInfo(scratch_, true);
    scratchOut_.clear();
    for (size_t i = 0; i < fields_.size(); ++i) {
      scratchOut_.push_back(scratch_.IndexOf(writer_.Name(static_cast<int>(i))));
    }
    scratchFor_ = prepared.GetLayoutId();
    scratchSize_ = prepared.Size();
  }
  for (size_t i = 0; i < prepared.Size(); ++i) scratch_[i] = prepared[i];
  for (size_t i = 0; i < fields_.size(); ++i) {
    if (fields_[i].feature != Feature::kTransformedValue) {
      scratch_[static_cast<size_t>(scratchOut_[i])] = writer_.At(out, static_cast<int>(i));
    }
  }
  const QZStatus status = engine_->Transform(scratch_);
  for (size_t i = 0; i < fields_.size(); ++i) {
    if (fields_[i].feature == Feature::kTransformedValue) {
      writer_.At(out, static_cast<int>(i)) = scratch_[static_cast<size_t>(scratchOut_[i])];
    }
  }
  return status;
}

}  // namespace QZPlugin_800

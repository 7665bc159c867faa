#include "MiningSchema.h"

#include <cmath>
#include <limits>

#include "CompiledModel.h"
#include "PluginDom.h"
#include "QZMV.h"
#include "ScoringPMMLParser.h"

namespace QZPlugin_800 {

using QZCommon_800::QZMV;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace {

MiningSchema::Usage ParseUsage(const std::string& text) {
  using Usage = MiningSchema::Usage;
  if (text.empty() || text == "active") return Usage::kActive;
  if (text == "predicted" || text == "target") return Usage::kTarget;
  if (text == "supplementary") return Usage::kSupplementary;
  if (text == "group") return Usage::kGroup;
  if (text == "order") return Usage::kOrder;
  if (text == "frequencyWeight") return Usage::kFrequencyWeight;
  if (text == "analysisWeight") return Usage::kAnalysisWeight;
  throw CompileError("MiningField usageType '" + text + "' is not supported");
}

// A treatment's value as the field stores it: a number for a numeric field.
Value FieldValue(const std::string& text, bool numeric) {
  double number = 0.0;
  if (numeric && DomReader::ParseNumber(text, number)) return Value(number);
  return Value(text);
}

// The values a DataField declares invalid (the variable list keeps them as missing).
std::vector<std::string> DeclaredInvalid(const DocumentContext& document,
                                         const std::string& field) {
  std::vector<std::string> values;
  for (const xercesc::DOMElement* v : ChildElements(document.DataField(field), u"Value")) {
    if (document.Reader().Attr(v, u"property") == "invalid" && DomReader::Has(v, u"value")) {
      values.push_back(document.Reader().Attr(v, u"value"));
    }
  }
  return values;
}

}  // namespace

// Every Interval of the field's DataField (the variable list keeps only the last one).
std::vector<MiningSchema::Interval> MiningSchema::ReadIntervals(const DocumentContext& document,
                                                                const std::string& field) {
  std::vector<Interval> intervals;
  const DomReader& reader = document.Reader();
  for (const xercesc::DOMElement* e : ChildElements(document.DataField(field), u"Interval")) {
    const std::string closure = reader.Attr(e, u"closure", "closedClosed");
    if (closure != "openClosed" && closure != "openOpen" && closure != "closedOpen" &&
        closure != "closedClosed") {
      throw CompileError("Interval closure '" + closure + "' of '" + field + "' is not supported");
    }
    intervals.push_back({reader.Number(e, u"leftMargin", -std::numeric_limits<double>::infinity()),
                         reader.Number(e, u"rightMargin", std::numeric_limits<double>::infinity()),
                         closure.compare(0, 4, "open") == 0,
                         closure == "openOpen" || closure == "closedOpen"});
  }
  return intervals;
}

void MiningSchema::Compile(const xercesc::DOMElement* schema, DocumentContext& document,
                           const QZXML_800::QZVarList& scope, FieldBinder& binder,
                           const MiningSchema* parent) {
  if (schema == nullptr) throw CompileError("the model has no MiningSchema");
  const DomReader& reader = document.Reader();
  for (const xercesc::DOMElement* e : ChildElements(schema, u"MiningField")) {
    const std::string name = reader.Required(e, u"name");
    const Usage usage = ParseUsage(reader.Attr(e, u"usageType"));
    if (usage == Usage::kTarget && target_.empty()) target_ = name;
    if (usage != Usage::kActive) continue;

    Field field;
    field.name = name;
    field.variable = scope.GetVariable(name);
    const std::string where = "MiningField '" + name + "'";
    if (field.variable != nullptr) {
      const QZXML_800::MeasureLevel level = field.variable->GetMeasureLevel();
      field.numeric = level == QZXML_800::ML_CONTINUOUS;
      if (field.numeric) {
        field.intervals = ReadIntervals(document, name);
      } else {
        const std::vector<std::string> valid = document.DeclaredCategories(name, field.variable);
        if (!valid.empty()) {
          field.categories = std::make_unique<CategoryTable>();
          for (const std::string& category : valid) field.categories->Intern(category);
        }
      }
      const std::vector<std::string> invalid = DeclaredInvalid(document, name);
      if (!invalid.empty()) {
        field.invalidValues = std::make_unique<CategoryTable>();
        for (const std::string& value : invalid) field.invalidValues->Intern(value);
      }
      field.declaredMissing = document.DeclaresMissingValues(name);
    }
    const bool numericStorage =
        field.numeric || (field.variable != nullptr &&
                          field.variable->GetMeasureLevel() == QZXML_800::ML_NUMERIC_CATEGORICAL);

    if (DomReader::Has(e, u"missingValueReplacement")) {
      field.hasReplacement = true;
      field.replacement = FieldValue(reader.Attr(e, u"missingValueReplacement"), numericStorage);
    }
    const std::string missingTreatment = reader.Attr(e, u"missingValueTreatment");
    field.missingReturnsInvalid = missingTreatment == "returnInvalid";

    const std::string invalid = reader.Attr(e, u"invalidValueTreatment", "returnInvalid");
    if (invalid == "returnInvalid") {
      field.invalid = Invalid::kReturnInvalid;
    } else if (invalid == "asIs") {
      field.invalid = Invalid::kAsIs;
    } else if (invalid == "asMissing") {
      field.invalid = Invalid::kAsMissing;
    } else if (invalid == "asValue") {
      field.invalid = Invalid::kAsValue;
      field.invalidReplacement =
          FieldValue(reader.Required(e, u"invalidValueReplacement"), numericStorage);
    } else {
      throw CompileError(where + ": invalidValueTreatment '" + invalid + "' is not supported");
    }

    const std::string outliers = reader.Attr(e, u"outliers", "asIs");
    if (outliers == "asIs") {
      field.outliers = Outliers::kAsIs;
    } else if (outliers == "asMissingValues" || outliers == "asExtremeValues") {
      field.outliers =
          outliers == "asMissingValues" ? Outliers::kAsMissingValues : Outliers::kAsExtremeValues;
      field.lowValue = reader.RequiredNumber(e, u"lowValue");
      field.highValue = reader.RequiredNumber(e, u"highValue");
    } else {
      throw CompileError(where + ": outliers '" + outliers + "' is not supported");
    }

    active_.push_back(name);
    const bool defaults = !field.hasReplacement && !field.missingReturnsInvalid &&
                          field.invalid == Invalid::kReturnInvalid &&
                          field.outliers == Outliers::kAsIs;
    if (field.invalid != Invalid::kAsIs) guaranteed_.push_back(name);
    if (defaults && parent != nullptr && parent->Guarantees(name)) {
      binder.Add(name);
      continue;  // the enclosing model already refuses what this check would refuse
    }
    // Any number passes a numeric field without Intervals, and any value passes a
    // categorical one without declared categories; neither case can refuse a record.
    field.noOpWithoutCopy =
        defaults && field.invalidValues == nullptr &&
        (field.numeric ? field.intervals.empty() && parent != nullptr &&
                             parent->ComputesNumber(name)
                       : field.categories == nullptr);
    changesValues_ = changesValues_ || field.hasReplacement ||
                     field.invalid == Invalid::kAsMissing || field.invalid == Invalid::kAsValue ||
                     field.outliers != Outliers::kAsIs;
    field.slot = binder.Add(name);
    fields_.push_back(std::move(field));
  }
}

bool MiningSchema::Guarantees(const std::string& field) const {
  for (const std::string& name : guaranteed_) {
    if (name == field) return true;
  }
  return false;
}

bool MiningSchema::ComputesNumber(const std::string& field) const {
  for (const std::string& name : computedNumbers_) {
    if (name == field) return true;
  }
  return false;
}

void MiningSchema::Finish(bool working) {
  if (working) return;
  std::vector<Field> kept;
  kept.reserve(fields_.size());
  for (Field& field : fields_) {
    if (!field.noOpWithoutCopy) kept.push_back(std::move(field));
  }
  fields_ = std::move(kept);
}

bool MiningSchema::IsMissing(const Field& field, const Value& value) const {
  if (value.IsMissing()) return true;
  if (value.IsString() && value.GetText().empty()) return true;
  if (field.invalidValues != nullptr && field.invalidValues->Match(value) >= 0) return false;
  return field.declaredMissing &&
         QZScoring_800::ScoringPMMLParser::IsMissingValue(field.variable, value);
}

bool MiningSchema::IsValid(const Field& field, const Value& value) const {
  if (field.invalidValues != nullptr && field.invalidValues->Match(value) >= 0) return false;
  if (field.numeric) {
    const double number = value.GetReal();
    if (QZMV::IsMissing(number)) return false;
    if (field.intervals.empty()) return true;
    for (const Interval& i : field.intervals) {
      const bool aboveLow = i.lowOpen ? number > i.low : number >= i.low;
      const bool belowHigh = i.highOpen ? number < i.high : number <= i.high;
      if (aboveLow && belowHigh) return true;
    }
    return false;
  }
  return field.categories == nullptr || field.categories->Match(value) >= 0;
}

bool MiningSchema::Apply(const ValueRecord& record, ValueRecord* working,
                         const FieldBinder& binder) const {
  for (const Field& field : fields_) {
    const Value& value = binder.Get(record, field.slot);
    bool missing = IsMissing(field, value);
    const Value* replace = nullptr;
    if (!missing) {
      if (!IsValid(field, value)) {
        switch (field.invalid) {
          case Invalid::kReturnInvalid:
            return false;
          case Invalid::kAsIs:
            break;
          case Invalid::kAsMissing:
            missing = true;
            break;
          case Invalid::kAsValue:
            replace = &field.invalidReplacement;
            break;
        }
      } else if (field.outliers != Outliers::kAsIs && field.numeric) {
        const double number = value.GetReal();
        if (number < field.lowValue || number > field.highValue) {
          if (field.outliers == Outliers::kAsMissingValues) {
            missing = true;
          } else if (working != nullptr) {
            (*working)[static_cast<size_t>(binder.Position(field.slot))] =
                number < field.lowValue ? field.lowValue : field.highValue;
          }
        }
      }
    }
    if (missing) {
      if (field.hasReplacement) {
        replace = &field.replacement;
      } else if (field.missingReturnsInvalid) {
        return false;
      } else if (working != nullptr && binder.Position(field.slot) >= 0) {
        (*working)[static_cast<size_t>(binder.Position(field.slot))] = Value();
      }
    }
    if (replace != nullptr && working != nullptr && binder.Position(field.slot) >= 0) {
      (*working)[static_cast<size_t>(binder.Position(field.slot))] = *replace;
    }
  }
  return true;
}

}  // namespace QZPlugin_800

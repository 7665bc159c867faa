// qzscore inspect: what the library's attribute scan and data dictionary make of a
// document. The description is built once as JSON and printed either as it is or as
// aligned text.

#include <algorithm>
#include <iostream>
#include <map>
#include <nlohmann/json.hpp>
#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>

#include "Commands.h"
#include "Output.h"
#include "QZSafeParser.h"
#include "ScoringOutputField.h"

using Json = nlohmann::ordered_json;
using QZScoring_800::ScoringModelAttr;

namespace qzscore {

namespace {

struct MissingValues {
  std::vector<std::string> values;
  std::string rangeLow;
  std::string rangeHigh;
};

std::string Attribute(const xercesc::DOMElement* element, const char16_t* name) {
  return QZXML_800::TranscodeToUTF8(element->getAttribute(name));
}

std::string Tag(const xercesc::DOMElement* element) {
  return QZXML_800::TranscodeToUTF8(element->getTagName());
}

// A Value that is not valid ("missing" or "invalid") lists a missing value.
void AddMissingValue(const xercesc::DOMElement* value, MissingValues& missing) {
  const std::string property = Attribute(value, u"property");
  if (property.empty() || property == "valid" || !value->hasAttribute(u"value")) return;
  missing.values.push_back(Attribute(value, u"value"));
}

// The values each field of the skeleton document declares as missing, which the
// variable list answers for but does not list.
std::map<std::string, MissingValues> ReadMissingValues(ScoringModelAttr& attr) {
  std::map<std::string, MissingValues> result;
  std::stringstream& skeleton = attr.GetSkeletonStream();
  skeleton.clear();
  skeleton.seekg(0);
  QZXML_800::QZSafeDOMParser parser;
  const xercesc::DOMDocument* document =
      QZXML_800::QZSafeDOMParser::ParseSafely(parser, skeleton, nullptr);
  if (document == nullptr || document->getDocumentElement() == nullptr) return result;
  for (const xercesc::DOMElement* dictionary =
           document->getDocumentElement()->getFirstElementChild();
       dictionary != nullptr; dictionary = dictionary->getNextElementSibling()) {
    for (const xercesc::DOMElement* field = dictionary->getFirstElementChild(); field != nullptr;
         field = field->getNextElementSibling()) {
      if (Tag(field) != "DataField" && Tag(field) != "DerivedField") continue;
      MissingValues& missing = result[Attribute(field, u"name")];
      for (const xercesc::DOMElement* child = field->getFirstElementChild(); child != nullptr;
           child = child->getNextElementSibling()) {
        const std::string tag = Tag(child);
        const std::string name = Attribute(child, u"name");
        if (tag == "Value") {
          AddMissingValue(child, missing);
        } else if (tag == "Extension" && name == "MissingValue") {
          for (const xercesc::DOMElement* value = child->getFirstElementChild(); value != nullptr;
               value = value->getNextElementSibling()) {
            if (Tag(value) == "Value") AddMissingValue(value, missing);
          }
        } else if (tag == "Extension" && name == "invalidRangeLower") {
          missing.rangeLow = Attribute(child, u"value");
        } else if (tag == "Extension" && name == "invalidRangeUpper") {
          missing.rangeHigh = Attribute(child, u"value");
        }
      }
    }
  }
  return result;
}

const char* RoleName(int role) {
  return role == QZXML_800::ROLE_TARGET  ? "target"
         : role == QZXML_800::ROLE_INPUT ? "input"
                                         : "none";
}

const char* StorageName(int storage) {
  static const char* const kNames[] = {"unknown",
                                       "integer",
                                       "real",
                                       "string",
                                       "days since epoch",
                                       "seconds of day",
                                       "seconds since epoch"};
  return storage >= 0 && storage <= 6 ? kNames[storage] : "unknown";
}

Json DescribeVariable(const QZXML_800::IQZVariable& variable, const MissingValues* missing) {
  Json j;
  j["name"] = variable.GetName();
  if (variable.GetLabel() != variable.GetName()) j["label"] = variable.GetLabel();
  j["role"] = RoleName(variable.GetRole());
  const int level = variable.GetMeasureLevel();
  const auto* categorical = dynamic_cast<const QZXML_800::QZCatVar*>(&variable);
  const bool ordinal = categorical != nullptr && categorical->GetOrdinalFlag();
  j["measure"] = level == QZXML_800::ML_CONTINUOUS ? "continuous"
                 : level == QZXML_800::ML_UNKNOWN  ? "unknown"
                 : ordinal                         ? "ordinal"
                                                   : "categorical";
  j["storage"] = StorageName(variable.GetStorageType());
  const QZXML_800::IQZEncoder* encoder = variable.GetEncoder();
  if (encoder != nullptr && encoder->GetCount() > 0) {
    Json categories = Json::array();
    for (int i = 0; i < encoder->GetCount(); ++i) categories.push_back(encoder->GetStringAt(i));
    j["categories"] = categories;
    const std::vector<std::string>& labels = encoder->GetLabels();
    if (std::any_of(labels.begin(), labels.end(),
                    [](const std::string& l) { return !l.empty(); })) {
      j["categoryLabels"] = labels;
    }
  }
  if (missing != nullptr && !missing->values.empty()) j["missingValues"] = missing->values;
  if (missing != nullptr && (!missing->rangeLow.empty() || !missing->rangeHigh.empty())) {
    j["missingRange"] = {missing->rangeLow, missing->rangeHigh};
  }
  if (variable.GetFlagMeasure()) j["flagMeasure"] = true;
  if (categorical != nullptr && categorical->GetBinaryFlag()) {
    j["binaryFlag"] = true;
    if (encoder != nullptr)
      j["trueCategory"] = encoder->GetStringAt(categorical->GetBinaryFlagTrueIndex());
  }
  return j;
}

Json DescribePlugin(const ScoringModelAttr& attr, const Registry& registry) {
  Json j;
  const int type = attr.GetModelType();
  if (type == QZScoring_800::QZScoringConst::MODEL_TRANSFORMATIONS ||
      type == QZScoring_800::QZScoringConst::MODEL_HRZXML) {
    j["builtIn"] =
        type == QZScoring_800::QZScoringConst::MODEL_HRZXML ? "time series" : "transformations";
    return j;
  }
  const std::string entry = registry.EntryFor(attr.GetModelElement(), attr.GetVersion());
  if (entry.empty()) {
    j["problem"] = "no registry entry for " + attr.GetModelElement() + " and no \"Veritor\" entry";
    return j;
  }
  const std::string plugin = registry.PluginOf(entry);
  j["entry"] = entry;
  j["name"] = plugin;
  j["library"] = Registry::LibraryFile(plugin);
  const std::string problem = Registry::CheckPlugin(plugin);
  j["loads"] = problem.empty();
  if (!problem.empty()) j["problem"] = problem;
  return j;
}

Json Describe(const Document& document, const Registry& registry) {
  ScoringModelAttr& attr = *document.attr;
  Json j;
  j["file"] = document.file;
  j["version"] = attr.GetVersion();
  j["modelElement"] = attr.GetModelElement();
  j["modelType"] = static_cast<int>(attr.GetModelType());
  j["modelName"] = attr.GetModelName();
  j["functionName"] = attr.GetFunctionName();
  j["algorithmName"] = attr.GetAlgorithmName();
  j["application"] = {{"name", attr.GetAppName()}, {"version", attr.GetAppVersion()}};
  j["modelID"] = attr.GetModelID();
  j["multipleModelMethod"] = attr.GetMultipleModelMethod();
  j["plugin"] = DescribePlugin(attr, registry);
  j["targets"] = attr.GetTargetFields();
  j["activeFields"] = attr.GetActiveFields();
  j["derivedInputs"] = attr.GetDerivedInputs();
  j["transformationDictionary"] = attr.HasTransformationDictionary();
  j["derivedFields"] = attr.GetDerivedFields();
  j["adjustedPropensity"] = attr.GetAdjustedPropensityStream() != nullptr;
  const std::map<std::string, MissingValues> missing = ReadMissingValues(attr);
  Json variables = Json::array();
  for (int i = 0; i < document.variables.Size(); ++i) {
    const QZXML_800::IQZVariable& variable = *document.variables.GetVarAt(i);
    const auto found = missing.find(variable.GetName());
    variables.push_back(
        DescribeVariable(variable, found == missing.end() ? nullptr : &found->second));
  }
  j["variables"] = variables;
  Json outputs = Json::array();
  for (const QZScoring_800::ScoringOutputField* field : attr.GetOutputFields()) {
    outputs.push_back({{"name", field->GetName()},
                       {"feature", field->GetFeature()},
                       {"value", field->GetValue()},
                       {"targetField", field->GetTargetField()}});
  }
  j["outputFields"] = outputs;
  return j;
}

std::string List(const Json& list, size_t limit = 12) {
  std::string text;
  size_t shown = 0;
  for (const Json& item : list) {
    if (shown == limit) return text + ", ... (" + std::to_string(list.size()) + " in all)";
    text += (shown++ == 0 ? "" : ", ") + item.get<std::string>();
  }
  return text.empty() ? "-" : text;
}

std::string Or(const std::string& text) { return text.empty() ? "-" : text; }

std::string PluginText(const Json& plugin) {
  if (plugin.contains("builtIn")) {
    return plugin["builtIn"] == "transformations"
               ? "none needed: the library computes the transformations itself"
               : "none: the library reads time-series documents but does not forecast (260016)";
  }
  if (!plugin.contains("name")) return plugin["problem"].get<std::string>();
  std::string text = plugin["name"].get<std::string>() + " (registry entry " +
                     plugin["entry"].get<std::string>() + ", " +
                     plugin["library"].get<std::string>();
  return text + (plugin["loads"].get<bool>()
                     ? ", loads)"
                     : "): cannot be loaded: " + plugin["problem"].get<std::string>());
}

void PrintTable(const std::vector<std::vector<std::string>>& rows) {
  std::vector<size_t> widths;
  for (const auto& row : rows) {
    widths.resize(std::max(widths.size(), row.size()));
    for (size_t c = 0; c < row.size(); ++c) widths[c] = std::max(widths[c], row[c].size());
  }
  for (const auto& row : rows) {
    std::string line = "  ";
    for (size_t c = 0; c < row.size(); ++c) {
      line += "  " + row[c];
      if (c + 1 < row.size()) line.append(widths[c] - row[c].size(), ' ');
    }
    std::cout << line << "\n";
  }
}

void PrintText(const Json& j) {
  auto line = [](const std::string& label, const std::string& value) {
    std::cout << "  " << label << std::string(label.size() < 26 ? 27 - label.size() : 1, ' ')
              << value << "\n";
  };
  std::cout << j["file"].get<std::string>() << "\n";
  line("PMML version", Or(j["version"]));
  const std::string element = j["modelElement"];
  line("model element", element.empty() ? "- (model type " + j["modelType"].dump() + ")"
                                        : element + " (model type " + j["modelType"].dump() + ")");
  line("model name", Or(j["modelName"]));
  line("function", Or(j["functionName"]));
  line("algorithm", Or(j["algorithmName"]));
  const std::string application = j["application"]["name"].get<std::string>() + " " +
                                  j["application"]["version"].get<std::string>();
  line("application", application == " " ? "-" : application);
  line("model ID", Or(j["modelID"]));
  line("multiple-model method", Or(j["multipleModelMethod"]));
  line("plug-in", PluginText(j["plugin"]));
  line("targets", List(j["targets"]));
  line("active fields", List(j["activeFields"]));
  line("derived inputs", List(j["derivedInputs"]));
  line("transformation dictionary", j["transformationDictionary"].get<bool>()
                                        ? "yes, derived fields: " + List(j["derivedFields"])
                                        : "no");
  line("adjusted propensity", j["adjustedPropensity"].get<bool>() ? "yes" : "no");

  std::cout << "  variables (" << j["variables"].size() << ")\n";
  std::vector<std::vector<std::string>> rows = {{"name", "role", "measure", "storage", "details"}};
  for (const Json& v : j["variables"]) {
    std::string details;
    auto add = [&details](const std::string& part) {
      details += (details.empty() ? "" : "; ") + part;
    };
    if (v.contains("categories")) add("categories " + List(v["categories"], 8));
    if (v.contains("missingValues")) add("missing " + List(v["missingValues"], 8));
    if (v.contains("missingRange")) {
      add("missing range " + Or(v["missingRange"][0]) + " to " + Or(v["missingRange"][1]));
    }
    if (v.contains("binaryFlag"))
      add("binary flag, true category " + v.value("trueCategory", std::string("-")));
    if (v.contains("flagMeasure")) add("flag measure");
    if (v.contains("label")) add("label \"" + v["label"].get<std::string>() + "\"");
    rows.push_back({v["name"], v["role"], v["measure"], v["storage"], Or(details)});
  }
  PrintTable(rows);
  std::cout << "  output fields (" << j["outputFields"].size() << ")\n";
  if (!j["outputFields"].empty()) {
    rows = {{"name", "feature", "value", "target"}};
    for (const Json& f : j["outputFields"]) {
      rows.push_back({f["name"], Or(f["feature"]), Or(f["value"]), Or(f["targetField"])});
    }
    PrintTable(rows);
  }
  std::cout.flush();
}

}  // namespace

int RunInspect(const std::vector<std::string>& files, const ModelCommandOptions& options,
               bool json) {
  Registry registry;
  std::string error;
  if (!MakeRegistry(options, registry, error)) {
    Report(error);
    return kExitUsage;
  }
  Json all = Json::array();
  for (const std::string& file : files) {
    ModelOptions single;
    single.file = file;
    ModelSource source;  // reads, scans and keeps the XML parser initialised
    if (!source.Open(single, registry, error)) {
      Report(error);
      return kExitUsage;
    }
    all.push_back(Describe(source.Documents().front(), registry));
  }
  if (json) {
    std::cout << (all.size() == 1 ? all.front() : all).dump(2) << "\n";
  } else {
    for (size_t i = 0; i < all.size(); ++i) {
      if (i != 0) std::cout << "\n";
      PrintText(all[i]);
    }
  }
  std::cout.flush();
  return std::cout ? kExitOk : kExitUsage;
}

}  // namespace qzscore

#include "Models.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fstream>
#include <iterator>
#include <sstream>

#include "Csv.h"
#include "QZSettings.h"
#include "ScoringScorerFactory.h"
#include "StatusText.h"

using QZCommon_800::Value;
using QZScoring_800::ScoringFactory;
using QZScoring_800::ScoringModel;
using QZScoring_800::ScoringModelAttr;
using QZScoring_800::ScoringScorerFactory;

namespace qzscore {

namespace {

bool ReadWholeFile(const std::string& path, std::string& text, std::string& error) {
  std::ifstream in(path, std::ios::binary);
  if (!in) {
    error = path + ": cannot open the model file: " + std::strerror(errno);
    return false;
  }
  text.assign(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
  if (in.bad()) {
    error = path + ": cannot read the model file";
    return false;
  }
  return true;
}

bool HoldsTransformationsOnly(const Document& document) {
  return document.type == QZScoring_800::QZScoringConst::MODEL_TRANSFORMATIONS;
}

}  // namespace

bool ScanDocument(Document& document, std::string& error) {
  std::istringstream in(document.text);
  document.attr = std::make_unique<ScoringModelAttr>();
  ScoringModelAttr* record = document.attr.get();
  QZCommon_800::QZStatus status =
      ScoringScorerFactory::GetModelAttr(in, Registry::ModelElements(), record, "UTF-8");
  const int type = document.type = record->GetModelType();
  if (status.IsOK() && type != 0 && type != 9 && type != 17) {
    status = ScoringScorerFactory::ParseVarList(document.variables, record);
  }
  if (status.IsError()) {
    error = document.file + ": " + DescribeStatus(status.GetErrorCode());
    return false;
  }
  return true;
}

ModelSource::ModelSource() = default;
ModelSource::~ModelSource() = default;

bool ModelSource::Open(const ModelOptions& options, const Registry& registry, std::string& error) {
  xml_ = std::make_unique<ScoringFactory>();
  if (xml_->GetStatus().IsError()) {
    error = "cannot start the XML parser: " + DescribeStatus(xml_->GetStatus().GetErrorCode());
    return false;
  }
  registry_ = registry;
  splitFields_ = options.splitFields;
  multi_ = options.file.empty() && splitFields_.empty();
  if (!options.file.empty()) {
    documents_.emplace_back();
    documents_.back().file = options.file;
  }
  for (const std::string& assignment : options.assignments) {
    const size_t at = assignment.find('=');
    Document document;
    document.id = assignment.substr(0, at == std::string::npos ? 0 : at);
    document.file = at == std::string::npos ? std::string() : assignment.substr(at + 1);
    const std::string what = splitFields_.empty() ? "ID=FILE" : "KEY=FILE";
    if (document.id.empty() || document.file.empty()) {
      error = "--model " + assignment + ": expected " + what;
      return false;
    }
    for (const Document& other : documents_) {
      if (other.id == document.id) {
        error = "--model " + assignment + ": " + what.substr(0, what.find('=')) + " '" +
                document.id + "' is given twice";
        return false;
      }
    }
    documents_.push_back(std::move(document));
  }
  if (documents_.empty()) {
    error = splitFields_.empty() ? "no model: give MODEL.pmml, or --model ID=FILE for each model"
                                 : "--split-field needs --model KEY=FILE for each sub-model";
    return false;
  }
  for (Document& document : documents_) {
    if (!ReadWholeFile(document.file, document.text, error) || !ScanDocument(document, error)) {
      return false;
    }
    const QZXML_800::QZVarList& variables = document.variables;
    for (int i = 0; i < variables.Size(); ++i) {
      const QZXML_800::IQZVariable* variable = variables.GetVarAt(i);
      kinds_.emplace(variable->GetName(), IsNumericStorage(variable->GetStorageType()));
    }
    const ScoringModelAttr& attr = *document.attr;
    const std::vector<std::string>& inputs =
        HoldsTransformationsOnly(document) ? attr.GetDataFields() : attr.GetActiveFields();
    for (const std::string& name : inputs) {
      if (std::find(inputs_.begin(), inputs_.end(), name) == inputs_.end()) inputs_.push_back(name);
    }
  }
  for (const std::string& field : splitFields_) kinds_.emplace(field, false);
  for (Document& document : documents_) {
    if (splitFields_.empty()) continue;
    std::vector<std::string> texts;
    if (!SplitCsvText(document.id, texts) || texts.size() != splitFields_.size()) {
      error = "--model " + document.id + "=" + document.file + ": the key must have " +
              std::to_string(splitFields_.size()) +
              " value(s), one per --split-field, separated by commas";
      return false;
    }
    for (size_t j = 0; j < texts.size(); ++j) {
      Value value;
      if (!ConvertCell(texts[j], kinds_[splitFields_[j]], {}, value)) {
        error = "--model " + document.id + "=" + document.file + ": split field '" +
                splitFields_[j] + "' is numeric, but '" + texts[j] + "' is not a number";
        return false;
      }
      document.key.push_back(value);
    }
    for (const Document& other : documents_) {
      if (&other != &document && !other.key.empty() && other.key == document.key) {
        error = "--model " + document.id + "=" + document.file + ": the key of " + other.file +
                " is the same";
        return false;
      }
    }
  }
  transformationsOnly_ = documents_.size() == 1 && HoldsTransformationsOnly(documents_.front());
  return true;
}

ScoringModel* ModelSource::Build(ScoringFactory& factory, long& code) const {
  QZXML_800::QZSettings settings = registry_.ToSettings();
  bool allTransformations = true;
  std::vector<std::unique_ptr<std::stringstream>> owned;
  std::vector<std::stringstream*> streams;
  std::vector<std::string> ids;
  for (const Document& document : documents_) {
    allTransformations = allTransformations && HoldsTransformationsOnly(document);
    owned.push_back(std::make_unique<std::stringstream>(document.text));
    streams.push_back(owned.back().get());
    ids.push_back(splitFields_.empty() ? document.id : "model" + std::to_string(ids.size() + 1));
  }
  // Without it a document of transformations only would compute nothing.
  if (allTransformations) settings.AddSetting("scoring_needDerivedPredictor", true, true);
  if (!splitFields_.empty()) {
    QZXML_800::QZSettings split;
    split.AddSetting("scoring_splitFields", splitFields_, true);
    split.AddSetting("scoring_splitModelIDs", ids, true);
    for (size_t i = 0; i < documents_.size(); ++i) {
      split.AddSetting(ids[i], new QZXML_800::QZVecValue<Value>(documents_[i].key), true);
    }
    settings.AddSetting("scoring_splitModel", split, true);
  } else if (multi_) {
    settings.AddSetting("scoring_modelIDs", ids, true);
  }
  ScoringModel* model = factory.CreateScoringModel(settings, streams);
  code = factory.GetStatus().GetErrorCode();
  return model;
}

std::unique_ptr<ModelInstance> ModelSource::Create(std::string& error) const {
  auto factory = std::make_unique<ScoringFactory>();
  long code = factory->GetStatus().GetErrorCode();
  ScoringModel* model = code == 0 ? Build(*factory, code) : nullptr;
  if (model != nullptr) return std::make_unique<ModelInstance>(std::move(factory), model);
  if (documents_.size() == 1) {
    error = Explain(documents_.front(), code);
    return nullptr;
  }
  // Which document failed: each on its own.
  for (const Document& document : documents_) {
    ScoringFactory single;
    QZXML_800::QZSettings settings = registry_.ToSettings();
    std::istringstream in(document.text);
    if (single.CreateScoringModel(settings, in) == nullptr) {
      error = Explain(document, single.GetStatus().GetErrorCode());
      return nullptr;
    }
  }
  error = "cannot create the model of " + Describe() + ": " + DescribeStatus(code);
  return nullptr;
}

std::string ModelSource::Explain(const Document& document, long code) const {
  std::string text = document.file + ": cannot create the model: " + DescribeStatus(code);
  if (code != 260010) return text;
  const std::string element = document.attr->GetModelElement();
  const std::string version = document.attr->GetVersion();
  if (element.empty()) return text + " (the document holds no model element the library knows)";
  const std::string entry = registry_.EntryFor(element, version);
  if (entry.empty()) return text + " (is a plug-in registered for " + element + "?)";
  const std::string plugin = registry_.PluginOf(entry);
  std::string route;
  if (entry != element) {
    route = "PMML " + version + " documents go to the \"Veritor\" entry; ";
  }
  const std::string problem = Registry::CheckPlugin(plugin);
  if (!problem.empty()) {
    return text + " (" + route + "plug-in " + plugin + " cannot be loaded: " + problem + ")";
  }
  return text + " (" + route + "plug-in " + plugin + " did not take this " + element + ")";
}

std::string ModelSource::Describe() const {
  if (documents_.size() == 1) return documents_.front().file;
  return std::to_string(documents_.size()) + " documents";
}

}  // namespace qzscore

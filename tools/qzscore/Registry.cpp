#include "Registry.h"

#include <algorithm>
#include <fstream>

#include "ScoringDynamicLoadedLibrary.h"

namespace qzscore {

namespace {

const char kFallbackEntry[] = "Veritor";

std::string Trim(const std::string& text) {
  const size_t begin = text.find_first_not_of(" \t\r");
  if (begin == std::string::npos) return std::string();
  const size_t end = text.find_last_not_of(" \t\r");
  return text.substr(begin, end - begin + 1);
}

// Splits "NAME = VALUE" at the first '='; false when either side is empty.
bool SplitAssignment(const std::string& text, std::string& name, std::string& value) {
  const size_t at = text.find('=');
  if (at == std::string::npos) return false;
  name = Trim(text.substr(0, at));
  value = Trim(text.substr(at + 1));
  return !name.empty() && !value.empty();
}

}  // namespace

Registry Registry::BuiltIn() {
  Registry registry;
  registry.entries_ = {{"TreeModel", "QZTree"},
                       {"RegressionModel", "QZRegression"},
                       {"MiningModel", "QZMining"},
                       {kFallbackEntry, "QZMining"}};
  return registry;
}

const std::vector<std::string>& Registry::ModelElements() {
  static const std::vector<std::string> kElements = {
      "MiningModel",     "TreeModel",        "RegressionModel",     "GeneralRegressionModel",
      "NaiveBayesModel", "NeuralNetwork",    "RuleSetModel",        "SupportVectorMachineModel",
      "ClusteringModel", "AssociationModel", "SequenceModel",       "TextModel",
      "TimeSeriesModel", "BayesNetModel",    "NearestNeighborModel"};
  return kElements;
}

bool Registry::Set(const std::string& element, const std::string& plugin, std::string& error) {
  const std::vector<std::string>& known = ModelElements();
  if (element != kFallbackEntry && std::find(known.begin(), known.end(), element) == known.end()) {
    error = "'" + element + "' is not a PMML model element the library knows (nor \"Veritor\")";
    return false;
  }
  const std::string problem = CheckPlugin(plugin);
  if (!problem.empty()) {
    error = "plug-in " + plugin + " cannot be loaded: " + problem;
    return false;
  }
  for (auto& entry : entries_) {
    if (entry.first == element) {
      entry.second = plugin;
      return true;
    }
  }
  entries_.emplace_back(element, plugin);
  return true;
}

bool Registry::SetEntry(const std::string& assignment, std::string& error) {
  std::string element, plugin;
  if (!SplitAssignment(assignment, element, plugin)) {
    error = "--plugin " + assignment + ": expected ELEMENT=PLUGIN, such as TreeModel=QZTree";
    return false;
  }
  if (!Set(element, plugin, error)) {
    error = "--plugin " + assignment + ": " + error;
    return false;
  }
  return true;
}

bool Registry::LoadFile(const std::string& path, std::string& error) {
  std::ifstream in(path);
  if (!in) {
    error = path + ": cannot open the registry file";
    return false;
  }
  Registry loaded;
  std::string line;
  for (int number = 1; std::getline(in, line); ++number) {
    const std::string text = Trim(line.substr(0, line.find('#')));
    if (text.empty()) continue;
    const std::string where = path + ":" + std::to_string(number) + ": ";
    std::string name, value;
    if (!SplitAssignment(text, name, value)) {
      error = where + "expected ELEMENT = PLUGIN, such as TreeModel = QZTree; got '" + text + "'";
      return false;
    }
    if (name == "versionSupported") {
      loaded.versionSupported_ = value;
    } else if (!loaded.Set(name, value, error)) {
      error = where + error;
      return false;
    }
  }
  *this = std::move(loaded);
  return true;
}

QZXML_800::QZSettings Registry::ToSettings() const {
  QZXML_800::QZSettings scoring, models, settings;
  for (const auto& [element, plugin] : entries_) scoring.AddSetting(element, plugin, false);
  for (const std::string& element : ModelElements()) models.AddSetting(element, "", false);
  settings.AddSetting("scoringDll", scoring, true);
  settings.AddSetting("modelDll", models, true);
  if (!versionSupported_.empty()) settings.AddSetting("versionSupported", versionSupported_, true);
  return settings;
}

std::string Registry::PluginOf(const std::string& entry) const {
  for (const auto& [element, plugin] : entries_) {
    if (element == entry) return plugin;
  }
  return std::string();
}

std::string Registry::EntryFor(const std::string& element, const std::string& version) const {
  const std::string supported = versionSupported_.empty() ? "4.0" : versionSupported_;
  const bool taken = version == supported || version == "4.1";
  if (taken && !PluginOf(element).empty()) return element;
  return PluginOf(kFallbackEntry).empty() ? std::string() : kFallbackEntry;
}

std::string Registry::LibraryFile(const std::string& plugin) {
  return QZScoring_800::ScoringDynamicLoadedLibrary::QZDecorateDynamicPathName(plugin + "800r");
}

std::string Registry::CheckPlugin(const std::string& plugin) {
  QZScoring_800::ScoringDynamicLoadedLibrary library(LibraryFile(plugin), 0);
  if (library.GetSymbolAddress("GetScoreParser") != nullptr) return std::string();
  const std::string reason = library.GetErrorString();
  return reason.empty() ? LibraryFile(plugin) + ": no entry point GetScoreParser" : reason;
}

}  // namespace qzscore

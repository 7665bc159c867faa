// Scorer registry and dispatch: from registry settings and a PMML document to a scorer
// of the plug-in registered for the document's model element.

#include "ScoringScorerFactory.h"

#include <exception>
#include <memory>
#include <utility>

#include <xercesc/dom/DOMNode.hpp>
#include <xercesc/dom/DOMNodeList.hpp>
#include <xercesc/util/XMLString.hpp>

#include "ModelTypeNames.h"
#include "QZSafeParser.h"
#include "QZXInputSource.h"
#include "ScoringDynamicLoadedLibrary.h"
#include "ScoringScoreParser.h"
#include "ScoringStatusCodes.h"
#include "ScoringStr.h"
#include "TraceLog.h"
#include "Value.h"

using QZCommon_800::IQZScore;
using QZCommon_800::QZStatus;
using QZXML_800::QZSettings;
using QZXML_800::QZVarList;

namespace QZScoring_800 {

namespace {

const char kScoringDll[] = "scoringDll";
const char kModelDll[] = "modelDll";
const char kFallbackEntry[] = "Veritor";
const char kEntryPoint[] = "GetScoreParser";

// The plug-in file name of a base name: base + platform version + "r", decorated.
std::string PluginFileName(const std::string& baseName) {
  static const std::string version = QZCommon_800::Value(800).GetString();
  return ScoringDynamicLoadedLibrary::QZDecorateDynamicPathName(baseName + version + "r");
}

std::string TextSetting(const QZSettings& settings, const char* name, const char* fallback) {
  std::string text;
  return settings.GetSettingValByName(name, text) ? text : std::string(fallback);
}

// Loads the plug-in, asks it for a score parser and lets create() turn the parser into
// a scorer. The parser is deleted right after use; the plug-in stays loaded for the
// life of the process. A plug-in's exception counts as "no scorer": nothing thrown by a
// plug-in reaches the caller.
template <class Create>
IQZScore* AttemptWithPlugin(const std::string& baseName, Create create) {
  if (baseName.empty()) return nullptr;
  ScoringDynamicLoadedLibrary library(PluginFileName(baseName), 1);
  if (library.LoadLibraryNow() != 0) return nullptr;
  auto entry = reinterpret_cast<GetScoreParserFunction>(library.GetSymbolAddress(kEntryPoint));
  if (entry == nullptr) return nullptr;
  try {
    std::unique_ptr<ScoringScoreParser> parser(entry());
    if (!parser) return nullptr;
    return create(*parser);
  } catch (const std::exception& e) {
    TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s",
             "QZScoring_800::ScoringScorerFactory::GetScorer", e.what());
  } catch (...) {
    TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s",
             "QZScoring_800::ScoringScorerFactory::GetScorer", "unknown");
  }
  return nullptr;
}

}  // namespace

QZStatus ScoringScorerFactory::GetScoringNames(std::map<std::string, std::string>& names,
                                               const QZSettings& settings) {
  static const char kName[] = "QZScoring_800::ScoringScorerFactory::GetScoringNames";
  TraceLog("scoring.log", 2, "Enter:%s", kName);
  names.clear();
  QZStatus status;
  QZSettings registry;
  if (!settings.GetSettingValByName(kScoringDll, registry)) {
    status = QZStatus(SCORING_NO_SCORING_DLL_SETTINGS, false);
  } else {
    for (const std::string& entry : registry.GetSettingNames()) {
      std::string baseName;
      registry.GetSettingValByName(entry, baseName);
      names[entry] = baseName;
    }
  }
  TraceLog("scoring.log", 2, "Exit :%s. Ret: %ld", kName, status.GetErrorCode());
  return status;
}

QZStatus ScoringScorerFactory::GetModelNames(std::vector<std::string>& names,
                                             const QZSettings& settings) {
  static const char kName[] = "QZScoring_800::ScoringScorerFactory::GetModelNames";
  TraceLog("scoring.log", 2, "Enter:%s", kName);
  names.clear();
  QZStatus status;
  QZSettings models;
  if (!settings.GetSettingValByName(kModelDll, models)) {
    status = QZStatus(SCORING_NO_MODEL_DLL_SETTINGS, false);
  } else {
    names = models.GetSettingNames();
  }
  TraceLog("scoring.log", 2, "Exit :%s. Ret: %ld", kName, status.GetErrorCode());
  return status;
}

QZScoringConst::ModelType ScoringScorerFactory::GetModelType(const std::string& elementName) {
  return ModelTypeOfElement(elementName);
}

IQZScore* ScoringScorerFactory::GetScorer(QZSettings& settings, QZVarList& variables,
                                          std::istream& pmml) {
  std::map<std::string, std::string> scoringNames;
  std::vector<std::string> modelNames;
  if (GetScoringNames(scoringNames, settings).IsError() ||
      GetModelNames(modelNames, settings).IsError()) {
    return nullptr;
  }

  const std::string version = TextSetting(settings, "scoring_version", "");
  const std::string modelType = TextSetting(settings, "scoring_modelType", "");
  const std::string supported = TextSetting(settings, "versionSupported", "4.0");
  const bool accepted = version == supported || version == "4.1";
  const std::string key =
      accepted && scoringNames.count(modelType) != 0 ? modelType : kFallbackEntry;
  const auto entry = scoringNames.find(key);
  const std::string baseName = entry == scoringNames.end() ? std::string() : entry->second;

  IQZScore* scorer = GetScorer(baseName, settings, variables, pmml);
  if (scorer != nullptr || baseName.empty()) return scorer;

  // Second attempt: the plug-in may only read parsed documents.
  try {
    QZXML_800::QZSafeDOMParser parser;
    xercesc::DOMDocument* document = nullptr;
    xercesc::DOMElement* element = nullptr;
    if (GetDOMDocument(modelNames, pmml, &parser, document, element).IsOK()) {
      scorer = GetScorer(baseName, settings, variables, document, element);
    }
  } catch (...) {
    // Creating the parser can fail only when memory runs out: no scorer then.
  }
  return scorer;
}

IQZScore* ScoringScorerFactory::GetScorer(const std::string& baseName, QZSettings& settings,
                                          QZVarList& variables, std::istream& pmml) {
  return AttemptWithPlugin(baseName, [&](ScoringScoreParser& parser) {
    return parser.CreateFromStream(settings, variables, pmml);
  });
}

IQZScore* ScoringScorerFactory::GetScorer(const std::string& baseName, QZSettings& settings,
                                          QZVarList& variables, xercesc::DOMDocument* document,
                                          xercesc::DOMElement* element) {
  return AttemptWithPlugin(baseName, [&](ScoringScoreParser& parser) {
    return parser.CreateFromElement(settings, variables, document, element);
  });
}

QZStatus ScoringScorerFactory::GetDOMDocument(const std::vector<std::string>& modelNames,
                                              std::istream& pmml,
                                              xercesc::XercesDOMParser* parser,
                                              xercesc::DOMDocument*& document,
                                              xercesc::DOMElement*& element) {
  document = nullptr;
  element = nullptr;
  if (parser == nullptr) return QZStatus(SCORING_SCORER_UNAVAILABLE, false);

  if (!pmml.bad()) {
    pmml.clear();
    pmml.seekg(0);
  }
  try {
    QZXML_800::QZXInputSource source(pmml);
    parser->parse(source);
    // A parser without an error handler reports a fatal error only through its count
    // and leaves a truncated tree: never trust one.
    if (parser->getErrorCount() == 0) document = parser->getDocument();
  } catch (...) {
    document = nullptr;
  }

  const xercesc::DOMElement* root = document ? document->getDocumentElement() : nullptr;
  if (root != nullptr && xercesc::XMLString::equals(root->getTagName(), u"PMML")) {
    for (const std::string& name : modelNames) {
      ScoringStr tag;
      tag.assignUTF8(name);
      if (tag.empty()) continue;
      xercesc::DOMNodeList* found = document->getElementsByTagName(tag.xc_str());
      if (found == nullptr || found->getLength() == 0) continue;
      xercesc::DOMNode* first = found->item(0);
      if (first->getNodeType() == xercesc::DOMNode::ELEMENT_NODE &&
          xercesc::XMLString::equals(first->getNodeName(), tag.xc_str())) {
        element = static_cast<xercesc::DOMElement*>(first);
      }
      break;
    }
  }
  if (element == nullptr) {
    document = nullptr;
    return QZStatus(SCORING_SCORER_UNAVAILABLE, false);
  }
  return QZStatus();
}

}  // namespace QZScoring_800

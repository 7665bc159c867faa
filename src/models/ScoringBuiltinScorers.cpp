// The library's own scorers for documents that have no scorer plug-in: a document of
// transformations only, and a time-series XML document.
#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/dom/DOMNodeList.hpp>

#include "HostGuard.h"
#include "ModelFieldNames.h"
#include "QZSafeParser.h"
#include "QZScoringTags.h"
#include "QZXInputSource.h"
#include "ScoringBaseParser.h"
#include "ScoringHRZXMLScorer.h"
#include "ScoringModelAttr.h"
#include "ScoringPMMLTags.h"
#include "ScoringStatusCodes.h"
#include "ScoringTransformationsScorer.h"
#include "TraceLog.h"
#include "Value.h"

namespace QZScoring_800 {

using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using xercesc::DOMElement;
namespace fields = model_fields;

namespace {

const char kTransformationType[] = "TRANSFORMATION";
const char kHRZXMLType[] = "HRZ_XML";
const char kHRZXMLRoot[] = "HRZXML";
// The forecast model elements, in the order in which one is preferred to the next.
const char* const kForecastModels[] = {"ExpSmoothingModel", "ARIMAModel", "CrostonModel"};
const char kVariableID[] = "variableID";

QZStatus NotSupported() { return QZStatus(SCORING_NOT_SUPPORTED, false); }

// The first descendant of element named tag, null when none.
const DOMElement* FirstDescendant(const DOMElement* element, const std::string& tag) {
  const xercesc::DOMNodeList* list = ScoringBaseParser::GetElementsByTagName(element, tag);
  if (list == nullptr || list->getLength() == 0) return nullptr;
  return ScoringBaseParser::AsElement(list->item(0), tag);
}

// Reads what a time-series document tells about its model into the record and the
// variable list. May throw (Xerces-C++ DOM exceptions, memory).
void ReadTimeSeriesDocument(std::istream& stream, const QZXML_800::QZSettings* settings,
                            QZXML_800::QZVarList* variables, ScoringModelAttr* record) {
  QZXML_800::QZSafeDOMParser parser;
  if (!stream.bad()) {
    stream.clear();
    stream.seekg(0);
  }
  QZXML_800::QZXInputSource source(stream);
  std::string error;
  xercesc::DOMDocument* document = QZXML_800::QZSafeDOMParser::ParseSafely(parser, source, &error);
  if (document == nullptr) {
    TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s",
             "QZScoring_800::ScoringHRZXMLScorer::ScoringHRZXMLScorer", error.c_str());
    return;
  }
  const DOMElement* root = document->getDocumentElement();
  if (!ScoringBaseParser::TagNameEquals(root, kHRZXMLRoot)) return;

  std::string encoding = "UTF-8";
  if (settings != nullptr) {
    settings->GetSettingValByName(QZScoringTags::SCORING_ATT_ENCODING, encoding);
  }
  ScoringBaseParser text;
  text.CreateTranscoder(encoding);

  const DOMElement* model = nullptr;
  for (const char* name : kForecastModels) {
    model = FirstDescendant(root, name);
    if (model != nullptr) break;
  }

  const DOMElement* header = FirstDescendant(root, ScoringPMMLTags::PMML_ELE_HEADER);
  const DOMElement* application =
      header != nullptr ? FirstDescendant(header, ScoringPMMLTags::PMML_ELE_APPLICATION) : nullptr;
  if (application != nullptr && record != nullptr) {
    std::string name =
        text.ToString(ScoringBaseParser::GetAttribute(application, ScoringPMMLTags::PMML_ATT_NAME));
    if (!name.empty()) record->SetAppName(name);
    std::string version = text.ToString(
        ScoringBaseParser::GetAttribute(application, ScoringPMMLTags::PMML_ATT_VERSION));
    if (!version.empty()) record->SetAppVersion(version);
  }

  if (model != nullptr && variables != nullptr) {
    std::string variable = text.ToString(ScoringBaseParser::GetAttribute(model, kVariableID));
    if (!variable.empty()) variables->AddContVar(variable, variable, QZXML_800::ROLE_TARGET);
  }
}

}  // namespace

// ---- ScoringTransformationsScorer ----

ScoringTransformationsScorer::ScoringTransformationsScorer(
    const QZXML_800::QZSettings* settings, const QZXML_800::QZVarList* variables,
    const std::vector<std::string>& names)
    : fSettings(settings), fVarList(variables), fNames(names) {}

ScoringTransformationsScorer::~ScoringTransformationsScorer() = default;

bool ScoringTransformationsScorer::IsReady() const { return true; }

QZStatus ScoringTransformationsScorer::Score(const ValueRecord&, ValueRecord&) {
  return NotSupported();
}

QZStatus ScoringTransformationsScorer::Scorable(ValueRecord& record) {
  return GuardStatus("QZScoring_800::ScoringTransformationsScorer::Scorable", [&] {
                            record.Add(fields::kTransformations, Value::NULL_VALUE);
                            Value& entries = record[fields::kTransformations];
                            for (const std::string& name : fNames) (void)entries[name];
                            return QZStatus();
                          });
}

std::string ScoringTransformationsScorer::GetType() const { return kTransformationType; }

// ---- ScoringHRZXMLScorer ----

ScoringHRZXMLScorer::ScoringHRZXMLScorer(const QZXML_800::QZSettings* settings,
                                         QZXML_800::QZVarList* variables,
                                         const std::string& modelType, std::istream& stream,
                                         ScoringModelAttr* record)
    : fSettings(settings), fVarList(variables), fModelType(modelType) {
  try {
    ReadTimeSeriesDocument(stream, settings, variables, record);
  } catch (...) {
    // The scorer is usable without what the document would have told.
    TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s",
             "QZScoring_800::ScoringHRZXMLScorer::ScoringHRZXMLScorer", "reading the document");
  }
}

ScoringHRZXMLScorer::~ScoringHRZXMLScorer() = default;

bool ScoringHRZXMLScorer::IsReady() const { return true; }

QZStatus ScoringHRZXMLScorer::Score(const ValueRecord&, ValueRecord&) { return NotSupported(); }

QZStatus ScoringHRZXMLScorer::Scorable(ValueRecord& record) {
  return GuardStatus("QZScoring_800::ScoringHRZXMLScorer::Scorable",
                          [&] {
                            record.Add(fields::kPrediction, Value::NULL_VALUE);
                            record.Add(fields::kLowerConfidence, Value::NULL_VALUE);
                            record.Add(fields::kUpperConfidence, Value::NULL_VALUE);
                            record.Add(fields::kNoiseResiduals, Value::NULL_VALUE);
                            return QZStatus();
                          });
}

std::string ScoringHRZXMLScorer::GetType() const { return kHRZXMLType; }

}  // namespace QZScoring_800

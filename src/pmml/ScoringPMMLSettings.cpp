// A model's parameters as settings: the Parameter children of one element.

#include <memory>
#include <string>
#include <vector>

#include "QZSettings.h"
#include "ScoringPMMLParser.h"
#include "ScoringPMMLTags.h"
#include "ScoringStatusCodes.h"
#include "TraceLog.h"

using QZCommon_800::QZStatus;
using xercesc::DOMElement;

namespace QZScoring_800 {

QZStatus ScoringPMMLParser::FillSettings(QZXML_800::QZSettings& settings,
                                         DOMElement* element) {
  QZStatus status = GetStatus();
  if (status.IsError() || element == nullptr) return status;
  try {
    for (const DOMElement* parameter = GetFirstChildElement(element, ScoringPMMLTags::PMML_ELE_PARAMETER);
         parameter != nullptr && status.IsOK();
         parameter = GetNextSiblingElement(parameter, ScoringPMMLTags::PMML_ELE_PARAMETER)) {
      const XMLCh* name = GetAttribute(parameter, ScoringPMMLTags::PMML_ATT_NAME);
      if (name == nullptr) {
        status = QZStatus(SCORING_PMML_MISSING_ATTRIBUTE, false);
        break;
      }
      const XMLCh* value = GetAttribute(parameter, ScoringPMMLTags::PMML_ATT_VALUE);
      if (value != nullptr) {
        settings.AddSetting(ToString(name), ToString(value), false);
        continue;
      }
      const DOMElement* list = GetFirstChildElement(parameter, "ListValue");
      if (list == nullptr) continue;
      std::vector<std::string> texts;
      for (const DOMElement* entry = GetFirstChildElement(list, ScoringPMMLTags::PMML_ELE_VALUE);
           entry != nullptr; entry = GetNextSiblingElement(entry, ScoringPMMLTags::PMML_ELE_VALUE)) {
        const XMLCh* text = GetAttribute(entry, ScoringPMMLTags::PMML_ATT_VALUE);
        if (text != nullptr) texts.push_back(ToString(text));
      }
      settings.AddSetting(ToString(name),
                          new QZXML_800::QZVecValue<std::string>(std::move(texts)), false);
    }
  } catch (...) {
    // Only memory exhaustion can get here; a plug-in gets a status, never an exception.
    TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s",
             "QZScoring_800::ScoringPMMLParser::FillSettings", std::to_string(__LINE__).c_str());
    status = QZStatus(SCORING_INTERNAL_ERROR, false);
  }
  return status;
}

}  // namespace QZScoring_800

// From the skeleton document of an attribute record to what a model needs besides its
// scorer: the variable list with the mining schema's roles, and the transformations.

#include <memory>

#include "HostGuard.h"
#include "QZTransformation.h"
#include "ScoringModelAttr.h"
#include "ScoringPMMLParser.h"
#include "ScoringScorerFactory.h"

using QZCommon_800::QZStatus;
using QZTransformNS_8_0_0::QZTransformation;
using QZXML_800::QZVarList;

namespace QZScoring_800 {

namespace {

void GiveRole(QZVarList& variables, const std::vector<std::string>& names,
              QZXML_800::VariableRole role) {
  for (const std::string& name : names) {
    const int index = variables.FindVariable(name);
    if (index >= 0) variables.SetVariableRole(index, role);
  }
}

}  // namespace

QZStatus ScoringScorerFactory::ParseVarList(QZVarList& variables, ScoringModelAttr*& record) {
  return GuardStatus("QZScoring_800::ScoringScorerFactory::ParseVarList", [&]() {
    if (record == nullptr) return QZStatus();
    std::stringstream& skeleton = record->GetSkeletonStream();
    if (!skeleton.good()) return QZStatus();
    skeleton.seekg(0);

    ScoringPMMLParser parser(record->GetEncoding());
    const QZStatus filled = parser.FillVarList(variables, skeleton);

    GiveRole(variables, record->GetTargetFields(), QZXML_800::ROLE_TARGET);
    GiveRole(variables,
             record->GetModelType() == QZScoringConst::MODEL_TRANSFORMATIONS
                 ? record->GetDataFields()
                 : record->GetActiveFields(),
             QZXML_800::ROLE_INPUT);
    GiveRole(variables, record->GetDerivedInputs(), QZXML_800::ROLE_INPUT);

    return filled.IsError() ? QZStatus(filled.GetErrorCode(), true) : QZStatus();
  });
}

QZTransformation* ScoringScorerFactory::GetTransformation(ScoringModelAttr*& record) {
  if (record == nullptr) return nullptr;
  try {
    std::stringstream& skeleton = record->GetSkeletonStream();
    skeleton.clear();
    skeleton.seekg(0);
    auto engine = std::make_unique<QZTransformation>();
    if (engine->AddPMML(skeleton, false).IsError()) return nullptr;
    return engine.release();
  } catch (...) {
    return nullptr;  // out of memory: the model goes without transformations
  }
}

}  // namespace QZScoring_800

// Uses the installed library through its umbrella header only.
#include <QZScoring.h>

#include <iostream>

int main() {
  using namespace QZScoring_800;
  QZCommon_800::ValueRecord record;
  record["x"] = 2.5;
  QZXML_800::QZSettings settings;
  std::map<std::string, std::string> names;
  const QZCommon_800::QZStatus status = ScoringScorerFactory::GetScoringNames(names, settings);
  const bool ok = status.GetErrorCode() == 260006 && record.Get("x").GetReal() == 2.5 &&
                  ScoringScorerFactory::GetModelType("TreeModel") == QZScoringConst::MODEL_TREE &&
                  ScoringDynamicLoadedLibrary::QZDecorateDynamicPathName("a") == "a.dll";
  std::cout << (ok ? "consumer ok" : "consumer FAILED") << std::endl;
  return ok ? 0 : 1;
}

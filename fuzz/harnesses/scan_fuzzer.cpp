// The model-attribute scan on arbitrary bytes: GetModelAttr fills a record and writes
// the skeleton document; the variable list and the transformation engine are then
// built from that skeleton, as the factory does. A scan that succeeds must leave a
// skeleton that is itself a well-formed document.
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "FuzzSupport.h"
#include "QZSafeParser.h"
#include "QZTransformation.h"
#include "QZVarList.h"
#include "ScoringModelAttr.h"
#include "ScoringScorerFactory.h"

using QZScoring_800::ScoringModelAttr;
using QZScoring_800::ScoringScorerFactory;

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  qzfuzz::InitProcess();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const std::vector<std::string> kNames = {"TreeModel", "MiningModel", "RegressionModel",
                                                  "NeuralNetwork", "Scorecard"};
  std::istringstream pmml(std::string(reinterpret_cast<const char*>(data), size));
  auto record = std::make_unique<ScoringModelAttr>();
  ScoringModelAttr* pointer = record.get();
  const bool ok = ScoringScorerFactory::GetModelAttr(pmml, kNames, pointer, "UTF-8").IsOK();

  // Read back everything the record holds, so that the sanitizers see each string.
  size_t total = record->GetModelName().size() + record->GetVersion().size() +
                 record->GetModelElement().size() + record->GetAppName().size() +
                 record->GetMultipleModelMethod().size() + record->GetModelID().size();
  for (const auto* list : {&record->GetTargetFields(), &record->GetActiveFields(),
                           &record->GetDerivedInputs(), &record->GetDataFields(),
                           &record->GetDerivedFields()}) {
    for (const std::string& name : *list) total += name.size();
  }
  for (const auto* field : record->GetOutputFields()) {
    total += field->GetName().size() + field->GetFeature().size() + field->GetValue().size();
  }
  (void)record->GetModelType();
  if (record->GetAdjustedPropensityStream() != nullptr) {
    total += record->GetAdjustedPropensityStream()->str().size();
  }
  const std::string skeleton = record->GetSkeletonStream().str();

  if (ok) {
    QZXML_800::QZSafeDOMParser parser;
    std::istringstream in(skeleton);
    std::string error;
    if (QZXML_800::QZSafeDOMParser::ParseSafely(parser, in, &error) == nullptr) {
      qzfuzz::Fail("a successful scan wrote a skeleton that does not parse",
                   error + "\n" + skeleton);
    }
  }

  QZXML_800::QZVarList variables;
  (void)ScoringScorerFactory::ParseVarList(variables, pointer);
  std::unique_ptr<QZTransformNS_8_0_0::QZTransformation> transformation(
      ScoringScorerFactory::GetTransformation(pointer));
  return total == static_cast<size_t>(-1);  // never: keeps total alive
}

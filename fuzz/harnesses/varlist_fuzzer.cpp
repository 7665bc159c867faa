// FillVarList on a stream: the data dictionary (and transformation dictionary) read
// into a variable list, then every question a plug-in asks about its variables. Each
// category the list reports must be a valid category of its variable, and a copy of
// the list must hold the same variables.
#include <sstream>
#include <string>
#include <vector>

#include "FuzzSupport.h"
#include "QZVarList.h"
#include "ScoringPMMLParser.h"
#include "Value.h"

using QZCommon_800::Value;
using QZScoring_800::ScoringPMMLParser;

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  qzfuzz::InitProcess();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size < 1) return 0;
  // The first byte picks how texts are converted: the local code page, UTF-8, Latin-1.
  const uint8_t mode = data[0] % 3;
  std::istringstream pmml(std::string(reinterpret_cast<const char*>(data) + 1, size - 1));
  std::unique_ptr<ScoringPMMLParser> parser;
  if (mode == 0) parser = std::make_unique<ScoringPMMLParser>();
  if (mode == 1) parser = std::make_unique<ScoringPMMLParser>("UTF-8");
  if (mode == 2) parser = std::make_unique<ScoringPMMLParser>("ISO-8859-1");
  QZXML_800::QZVarList vars;
  (void)parser->FillVarList(vars, pmml);

  for (int i = 0; i < vars.Size(); ++i) {
    const QZXML_800::IQZVariable* variable = vars.GetVarAt(i);
    if (variable == nullptr) qzfuzz::Fail("null variable inside the list");
    if (vars.FindVariable(variable->GetName()) != i) {
      qzfuzz::Fail("a variable is not found under its own name", variable->GetName());
    }
    (void)ScoringPMMLParser::IsFlagVariable(variable);
    (void)ScoringPMMLParser::IsValidValue(variable, std::string("1"));
    (void)ScoringPMMLParser::IsValidValue(variable, Value(2.5));
    (void)ScoringPMMLParser::IsMissingValue(variable, Value("NA"));
    (void)ScoringPMMLParser::IsMissingValue(variable, Value(-1));
    for (const auto& label : ScoringPMMLParser::GetValueLabels(variable)) {
      (void)label.first.GetString();
    }
    for (const Value& value : ScoringPMMLParser::GetValues(variable)) {
      if (!ScoringPMMLParser::IsValidCatValue(variable, value) &&
          !ScoringPMMLParser::IsMissingValue(variable, value)) {
        qzfuzz::Fail("a listed category is not a valid category of its variable",
                     variable->GetName() + " = " + value.GetString());
      }
    }
  }
  (void)ScoringPMMLParser::GetTargetVars(vars);

  const QZXML_800::QZVarList copy(vars);
  if (copy.Size() != vars.Size()) qzfuzz::Fail("a copied list differs in size");
  for (int i = 0; i < copy.Size(); ++i) {
    if (copy.GetVarAt(i)->GetName() != vars.GetVarAt(i)->GetName() ||
        copy.GetVarAt(i)->GetNumCategories() != vars.GetVarAt(i)->GetNumCategories()) {
      qzfuzz::Fail("a copied list differs", vars.GetVarAt(i)->GetName());
    }
  }
  return 0;
}

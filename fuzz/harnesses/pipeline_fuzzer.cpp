// The whole pipeline: ScoringFactory::CreateScoringModel from a stream with the
// registry sending every model element to the reference plug-ins of the build tree,
// then Scorable, then Score on a few records built from the model's variables
// (categories, numbers, texts, missing values); everything is destroyed again. Scoring
// the first record once more at the end must give the same output as the first time
// (results are reset in place between records).
#include <dlfcn.h>

#include <cstdlib>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "FuzzSupport.h"
#include "QZSettings.h"
#include "QZVarList.h"
#include "ReferenceRegistry.h"
#include "ScoringFactory.h"
#include "ScoringModel.h"
#include "ValueRecord.h"

#ifndef QZ_FUZZ_LIB_DIR
#error QZ_FUZZ_LIB_DIR names the folder of the reference plug-ins
#endif

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace {

// A value for the variable in record r: its categories in turn, numbers, or missing.
Value ValueFor(const QZXML_800::IQZVariable* variable, size_t r, size_t salt) {
  static const double kNumbers[] = {0.0, 1.5, -2.0, 37.0, 1e9, 0.001};
  const size_t pick = r * 7 + salt;
  if (r == 3) return Value();
  const QZXML_800::IQZEncoder* encoder = variable->GetEncoder();
  const int count = encoder != nullptr ? encoder->GetCount() : 0;
  if (count > 0 && r != 2) {
    const int k = static_cast<int>(pick % static_cast<size_t>(count));
    if (variable->GetMeasureLevel() == QZXML_800::ML_NUMERIC_CATEGORICAL) {
      return Value(encoder->GetNumberAt(k));
    }
    return Value(encoder->GetStringAt(k));
  }
  if (r == 2 && pick % 3 == 0) return Value("not a category");
  return Value(kNumbers[pick % (sizeof(kNumbers) / sizeof(kNumbers[0]))]);
}

std::string Describe(const ValueRecord& record) {
  std::string out;
  for (size_t i = 0; i < record.Size(); ++i) {
    out += record.GetName(i) + "=" + record[i].GetString() + ";";
  }
  return out;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  qzfuzz::InitProcess();
  // Keep the plug-ins loaded for the whole run: the library loads and unloads them per
  // model, and the fuzzer's coverage counters must stay registered once.
  const char* dir = std::getenv("QZ_FUZZ_LIB_DIR");
  const std::string folder = dir != nullptr ? dir : QZ_FUZZ_LIB_DIR;
  for (const char* plugin : {"QZTree800r.dll", "QZRegression800r.dll", "QZMining800r.dll"}) {
    if (dlopen((folder + "/" + plugin).c_str(), RTLD_NOW) == nullptr) {
      qzfuzz::Fail("cannot load a reference plug-in", dlerror());
    }
  }
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  QZXML_800::QZSettings settings = qztest::ReferenceRegistry();
  QZScoring_800::ScoringFactory factory;
  std::istringstream pmml(std::string(reinterpret_cast<const char*>(data), size));
  std::unique_ptr<QZScoring_800::ScoringModel> model(factory.CreateScoringModel(settings, pmml));
  (void)factory.GetStatus();
  factory.Detach();
  if (!model) return 0;

  ValueRecord output;
  (void)model->Scorable(output);
  const QZXML_800::QZVarList& vars = model->GetVarList();
  std::vector<ValueRecord> inputs;
  for (size_t r = 0; r < 4; ++r) {
    ValueRecord input;
    for (int i = 0; i < vars.Size(); ++i) {
      const QZXML_800::IQZVariable* variable = vars.GetVarAt(i);
      if (variable->GetRole() == QZXML_800::ROLE_TARGET) continue;
      input.Add(variable->GetName(), ValueFor(variable, r, static_cast<size_t>(i) + size));
    }
    inputs.push_back(input);
  }
  std::string first;
  long firstCode = 0;
  for (size_t r = 0; r < inputs.size(); ++r) {
    const long code = model->Score(inputs[r], output).GetErrorCode();
    if (r == 0) {
      first = Describe(output);
      firstCode = code;
    }
  }
  if (!inputs.empty()) {
    const long code = model->Score(inputs[0], output).GetErrorCode();
    const std::string again = Describe(output);
    // A failed record leaves the output as it was, so only successes are compared.
    if (code != firstCode || (code == 0 && again != first)) {
      qzfuzz::Fail("scoring a record again gives another output", first + "\n" + again);
    }
  }
  return 0;
}

// The adjusted-propensity network reader: ParseNetwork on arbitrary bytes, then the
// raw and adjusted propensity of a few outputs of a model with a binary flag target.
// A network that was read computes for every record; one that was not is refused.
#include <cmath>
#include <sstream>
#include <string>
#include <vector>

#include "FuzzSupport.h"
#include "QZSettings.h"
#include "QZVarList.h"
#include "ScoringAdjustedPropensity.h"
#include "ScoringStatusCodes.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringAdjustedPropensity;

namespace {

// A target "flag" with categories no, yes; yes is the true category.
const QZXML_800::QZVarList& FlagTarget() {
  static const QZXML_800::QZVarList* vars = [] {
    auto* list = new QZXML_800::QZVarList;
    list->AddContVar("x", "x", QZXML_800::ROLE_INPUT);
    list->AddCatVar("flag", "flag", std::vector<std::string>{"no", "yes"},
                    QZXML_800::ROLE_TARGET);
    dynamic_cast<QZXML_800::QZCatVar*>(list->GetVariable("flag"))->SetBinaryFlag(true, 1);
    return list;
  }();
  return *vars;
}

ValueRecord Output(const Value& prediction, const Value& probability) {
  ValueRecord record;
  record.Add("prediction", prediction);
  record.Add("probability", probability);
  return record;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  qzfuzz::InitProcess();
  FlagTarget();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size < 1) return 0;
  // The first byte picks the multiple-model method the networks are chosen by.
  static const char* const kMethods[] = {nullptr, "standalone", "weightedAverage", "modelChain"};
  QZXML_800::QZSettings settings;
  if (const char* method = kMethods[data[0] % 4]) {
    settings.AddSetting("scoring_multipleModelMethod", method, true);
  }
  std::stringstream stream(std::string(reinterpret_cast<const char*>(data) + 1, size - 1));
  ScoringAdjustedPropensity propensity(&settings, &FlagTarget());
  const bool ready = propensity.ParseNetwork(&stream);
  if (ready != propensity.IsReady()) qzfuzz::Fail("ParseNetwork and IsReady disagree");
  // Reading twice replaces the first network.
  if (data[0] & 4) {
    stream.clear();
    if (propensity.ParseNetwork(&stream) != ready) qzfuzz::Fail("a second read differs");
  }

  const ValueRecord outputs[] = {
      Output("yes", 0.5), Output("no", 1.0), Output("yes", 0.0),
      Output("yes", 1e308), Output("maybe", 0.5), Output("yes", Value()),
  };
  for (const ValueRecord& output : outputs) {
    ValueRecord raw = output, adjusted = output;
    (void)propensity.ComputeRawPropensity(raw);
    const long code = propensity.ComputeAdjustedPropensity(adjusted).GetErrorCode();
    if (!ready && code == 0) qzfuzz::Fail("a network that was not read computed");
    if (code == 0) (void)adjusted.Get("adjustedpropensity").GetReal();
  }
  return 0;
}

// The transformation engine: a whole document (AddPMML) or a stand-alone
// TransformationDictionary / LocalTransformations (AddTransformationDictionary), then
// Transform on a few records whose fields are the names the document mentions, with
// numbers, texts and missing values. A second Transform on the same layout must give
// the same results (the engine caches field positions per layout).
#include <sstream>
#include <string>
#include <vector>

#include "FuzzSupport.h"
#include "QZTransformation.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  qzfuzz::InitProcess();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size < 1) return 0;
  const uint8_t mode = data[0];
  const std::string text(reinterpret_cast<const char*>(data) + 1, size - 1);
  QZTransformation engine;
  std::istringstream in(text);
  const bool loaded = (mode & 1) ? engine.AddTransformationDictionary(in).IsOK()
                                 : engine.AddPMML(in, false).IsOK();
  (void)engine.GetLastError();
  if (!loaded) return 0;
  const std::vector<std::string> derived = engine.GetDerivedFieldNames();

  // Values of the records: numbers of several kinds, texts, missing.
  static const Value kValues[] = {Value(1.5),   Value(0),      Value(-3),   Value("A"),
                                  Value("2.5"), Value(),       Value(1e300), Value(""),
                                  Value("x y"), Value(100.0),  Value(-0.25), Value("2020-01-31")};
  constexpr size_t kCount = sizeof(kValues) / sizeof(kValues[0]);
  const std::vector<std::string> names = qzfuzz::NamesIn(text);
  for (size_t r = 0; r < 4; ++r) {
    ValueRecord record;
    for (size_t i = 0; i < names.size(); ++i) {
      record.Add(names[i], kValues[(i * 5 + r * 3 + mode / 2) % kCount]);
    }
    if (mode & 2) (void)engine.GetDerivedVariableInfo(record, r % 2 == 0);
    ValueRecord first = record;
    const long code = engine.Transform(first).GetErrorCode();
    ValueRecord second = record;
    if (mode & 2) {
      // The cached path: the same layout once more.
      const long again = engine.Transform(second).GetErrorCode();
      if (again != code) qzfuzz::Fail("a second Transform gave another status");
      if (first.Size() != second.Size()) qzfuzz::Fail("a second Transform gave another layout");
      for (size_t i = 0; i < first.Size(); ++i) {
        const Value& a = first[i];
        const Value& b = second[i];
        if (a.Compare(b) != 0 && !(a.IsMissing() && b.IsMissing())) {
          qzfuzz::Fail("a second Transform gave another value", first.GetName(i));
        }
      }
    }
    for (size_t i = 0; i < first.Size(); ++i) (void)first[i].GetString();
  }
  return 0;
}

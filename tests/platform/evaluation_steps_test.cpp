// The bound on the work one record costs the transformation engine. A DefineFunction that
// calls the one before it twice doubles the work per level: 60 such functions (a few
// kilobytes) made Transform run for 2^60 steps. Such documents are refused at load;
// ordinary use of functions is not affected.
#include "QZTransformation.h"

#include <chrono>
#include <cmath>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "HostileTransformations.h"
#include "Value.h"
#include "ValueRecord.h"
#include "XercesTestEnvironment.h"

namespace {

using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;
using qztest::DoublingFunctions;

std::string Field(const std::string& name, const std::string& function) {
  return "<DerivedField name=\"" + name + "\" optype=\"continuous\" dataType=\"double\">" +
         "<Apply function=\"" + function + "\"><FieldRef field=\"x\"/></Apply></DerivedField>";
}

QZCommon_800::QZStatus Load(QZTransformation& engine, const std::string& dictionary) {
  std::istringstream in("<TransformationDictionary>" + dictionary + "</TransformationDictionary>");
  return engine.AddTransformationDictionary(in);
}

TEST(EvaluationSteps, DoublingFunctionsRefusedAtLoad) {
  QZTransformation engine;
  const auto start = std::chrono::steady_clock::now();
  const QZCommon_800::QZStatus status = Load(engine, DoublingFunctions(60) + Field("d", "f60"));
  EXPECT_EQ(status.GetErrorCode(), QZTransformation::TRANSFORM_MALFORMED);
  EXPECT_NE(engine.GetLastError().find("steps"), std::string::npos) << engine.GetLastError();
  EXPECT_LT(std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count(), 2.0);
  // Nothing was loaded.
  EXPECT_TRUE(engine.GetDerivedFieldNames().empty());
}

TEST(EvaluationSteps, ModerateCallsComputed) {
  // f12 visits about 2^14 nodes: well within the bound, and computed in full.
  QZTransformation engine;
  ASSERT_TRUE(Load(engine, DoublingFunctions(12) + Field("d", "f12")).IsOK())
      << engine.GetLastError();
  ValueRecord record;
  record.Add("x", 1.0);
  ASSERT_TRUE(engine.Transform(record).IsOK());
  EXPECT_EQ(record.Get("d").GetReal(), std::ldexp(2.0, 12));
}

TEST(EvaluationSteps, BoundCountsAllFields) {
  // A call of f20 visits about 8.4 million nodes: one field calling it is within the
  // bound, a second one is not, also when it comes in a later load.
  QZTransformation engine;
  ASSERT_TRUE(Load(engine, DoublingFunctions(20) + Field("d", "f20")).IsOK())
      << engine.GetLastError();
  EXPECT_EQ(Load(engine, Field("e", "f20")).GetErrorCode(), QZTransformation::TRANSFORM_MALFORMED);
  EXPECT_NE(engine.GetLastError().find("with the fields before it"), std::string::npos)
      << engine.GetLastError();
  EXPECT_EQ(engine.GetDerivedFieldNames().size(), 1u);
  // A field calling f17 (1 million) still fits beside it.
  EXPECT_TRUE(Load(engine, Field("e", "f17")).IsOK()) << engine.GetLastError();
  ValueRecord record;
  record.Add("x", 1.0);
  ASSERT_TRUE(engine.Transform(record).IsOK());
  EXPECT_EQ(record.Get("d").GetReal(), std::ldexp(2.0, 20));
  EXPECT_EQ(record.Get("e").GetReal(), std::ldexp(2.0, 17));
}

}  // namespace

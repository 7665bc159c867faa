// Calls of user-defined functions (DefineFunction): many arguments, and what the call's
// Apply options make of an invalid or missing argument.
#include "XercesTestEnvironment.h"
#include "QZTransformation.h"

#include <initializer_list>
#include <sstream>
#include <string>
#include <utility>

#include <gtest/gtest.h>

#include "QZMV.h"
#include "Value.h"
#include "ValueRecord.h"

namespace {

using QZCommon_800::QZMV;
using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;

const Value kSysMissing(QZMV::Missing());

struct Result {
  long code;
  std::string error;
  Value value;
};

// Loads the functions and one derived field "r", then computes r for the inputs.
Result Compute(const std::string& functions, const std::string& expression,
               std::initializer_list<std::pair<const char*, Value>> inputs,
               const std::string& attrs = "") {
  QZTransformation t;
  std::istringstream in("<PMML version=\"4.4\"><TransformationDictionary>" + functions +
                        "<DerivedField name=\"r\"" + attrs + ">" + expression +
                        "</DerivedField></TransformationDictionary></PMML>");
  const QZStatus loaded = t.AddPMML(in, false);
  if (loaded.IsError()) return {loaded.GetErrorCode(), t.GetLastError(), Value()};
  ValueRecord record;
  for (const auto& input : inputs) record.Add(input.first, input.second);
  const QZStatus status = t.Transform(record);
  return {status.GetErrorCode(), t.GetLastError(), record.Get("r")};
}

std::string Param(int i) { return "p" + std::to_string(i); }

// A function of n parameters giving p0 - p1 + p2*10 - ... : the position of each
// argument matters, so arguments landing in the wrong place show.
std::string Weighted(int n) {
  std::string body = "<FieldRef field=\"p0\"/>";
  for (int i = 1; i < n; ++i) {
    body = "<Apply function=\"+\">" + body + "<Apply function=\"*\"><FieldRef field=\"" +
           Param(i) + "\"/><Constant>" + std::to_string(i % 2 == 0 ? i : -i) +
           "</Constant></Apply></Apply>";
  }
  std::string params;
  for (int i = 0; i < n; ++i) params += "<ParameterField name=\"" + Param(i) + "\"/>";
  return "<DefineFunction name=\"w" + std::to_string(n) + "\" optype=\"continuous\">" + params +
         body + "</DefineFunction>";
}

std::string CallWeighted(int n, const std::string& attrs = "") {
  std::string call = "<Apply function=\"w" + std::to_string(n) + "\"" + attrs + ">";
  for (int i = 0; i < n; ++i) call += "<Constant>" + std::to_string(i + 1) + "</Constant>";
  return call + "</Apply>";
}

double Expected(int n) {
  double sum = 1;
  for (int i = 1; i < n; ++i) sum += (i + 1) * (i % 2 == 0 ? i : -i);
  return sum;
}

// Few and many arguments (the frame of a call with many lives elsewhere than that of a
// call with few) are passed in order; a call inside a call keeps the outer frame intact.
TEST(UserFunctionCalls, ArgumentsArriveInOrder) {
  for (int n : {1, 8, 9, 30}) {
    const Result r = Compute(Weighted(n), CallWeighted(n), {});
    EXPECT_EQ(r.code, 0) << r.error;
    EXPECT_EQ(r.value, Value(Expected(n))) << n << " arguments";
  }
  // w12(x, w9(1..9), 3, ..., 12): the inner call's result is the second argument.
  std::string outer = "<Apply function=\"w12\"><FieldRef field=\"x\"/>" + CallWeighted(9);
  for (int i = 2; i < 12; ++i) outer += "<Constant>" + std::to_string(i + 1) + "</Constant>";
  outer += "</Apply>";
  const Result nested = Compute(Weighted(9) + Weighted(12), outer, {{"x", Value(1.0)}});
  EXPECT_EQ(nested.code, 0) << nested.error;
  EXPECT_EQ(nested.value, Value(Expected(12) - 2.0 * -1 + Expected(9) * -1));
}

// An invalid argument (here a division by zero) makes the call invalid: refused by
// default, missing with asMissing (or the defaultValue), and with asIs the call gives
// what it has, a missing value. A missing argument with mapMissingTo skips the call.
TEST(UserFunctionCalls, InvalidAndMissingArguments) {
  const std::string twice =
      "<DefineFunction name=\"twice\" optype=\"continuous\"><ParameterField name=\"v\"/>"
      "<Apply function=\"*\"><FieldRef field=\"v\"/><Constant>2</Constant></Apply>"
      "</DefineFunction>";
  const std::string label =
      "<DefineFunction name=\"label\" optype=\"categorical\" dataType=\"string\">"
      "<ParameterField name=\"v\"/><Apply function=\"concat\"><Constant>n=</Constant>"
      "<FieldRef field=\"v\"/></Apply></DefineFunction>";
  const std::string invalid =
      "<Apply function=\"/\"><FieldRef field=\"x\"/><Constant>0</Constant></Apply>";
  const auto call = [&](const std::string& function, const std::string& attrs) {
    return "<Apply function=\"" + function + "\"" + attrs + ">" + invalid + "</Apply>";
  };
  const std::initializer_list<std::pair<const char*, Value>> x = {{"x", Value(1.0)}};

  const Result refused = Compute(twice, call("twice", ""), x);
  EXPECT_EQ(refused.code, 270006);
  EXPECT_EQ(refused.value, kSysMissing);

  for (const std::string& function : {std::string("twice"), std::string("label")}) {
    const std::string functions = function == "twice" ? twice : label;
    const Result asMissing =
        Compute(functions, call(function, " invalidValueTreatment=\"asMissing\""), x);
    EXPECT_EQ(asMissing.code, 0) << asMissing.error;
    EXPECT_TRUE(asMissing.value.IsMissing()) << function;

    const Result withDefault = Compute(
        functions, call(function, " invalidValueTreatment=\"asMissing\" defaultValue=\"7\""), x);
    EXPECT_EQ(withDefault.code, 0) << withDefault.error;
    EXPECT_EQ(withDefault.value.GetReal(), 7.0) << function;

    const Result asIs = Compute(functions, call(function, " invalidValueTreatment=\"asIs\""), x);
    EXPECT_EQ(asIs.code, 0) << asIs.error;
    EXPECT_TRUE(asIs.value.IsMissing()) << function;
  }

  const Result mapped = Compute(
      label, "<Apply function=\"label\" mapMissingTo=\"none\"><FieldRef field=\"x\"/></Apply>",
      {{"x", Value()}});
  EXPECT_EQ(mapped.code, 0) << mapped.error;
  EXPECT_EQ(mapped.value, Value("none"));
  EXPECT_EQ(Compute(label, "<Apply function=\"label\"><FieldRef field=\"x\"/></Apply>",
                    {{"x", Value(3.0)}})
                .value,
            Value("n=3"));
}

}  // namespace

// Which MiningSchema checks a segment still makes when its parent prepared the field:
// a number the parent computes needs none, but a model chain hands later segments the
// earlier segments' outputs, which may reuse such a name with a value that is invalid.

#include <string>

#include <gtest/gtest.h>

#include "ReferencePlugins.h"
#include "ScoringModel.h"
#include "Value.h"
#include "ValueRecord.h"

using QZCommon_800::ValueRecord;

namespace {

// A regression MiningModel whose LocalTransformations compute d = 2x (double); the
// segments read d. `first` is the first segment's Output content.
std::string Document(const std::string& method, const std::string& first) {
  return R"(<PMML version="4.4"><DataDictionary>
    <DataField name="x" optype="continuous" dataType="double"/>
    <DataField name="y" optype="continuous" dataType="double"/></DataDictionary>
    <MiningModel functionName="regression"><MiningSchema>
    <MiningField name="y" usageType="predicted"/><MiningField name="x"/></MiningSchema>
    <LocalTransformations><DerivedField name="d" optype="continuous" dataType="double">
      <Apply function="*"><FieldRef field="x"/><Constant>2</Constant></Apply>
    </DerivedField></LocalTransformations>
    <Segmentation multipleModelMethod=")" + method + R"(">
    <Segment id="1"><True/><RegressionModel functionName="regression">
      <MiningSchema><MiningField name="d"/></MiningSchema>)" + first + R"(
      <RegressionTable intercept="1"><NumericPredictor name="d" coefficient="1"/>
      </RegressionTable></RegressionModel></Segment>
    <Segment id="2"><True/><RegressionModel functionName="regression">
      <MiningSchema><MiningField name="d"/></MiningSchema>
      <RegressionTable intercept="0"><NumericPredictor name="d" coefficient="10"/>
      </RegressionTable></RegressionModel></Segment>
    </Segmentation></MiningModel></PMML>)";
}

// The first segment's output overwrites d with a text in the chain.
const char kTextOverD[] = R"(<Output><OutputField name="d" dataType="string"
    feature="transformedValue"><Constant dataType="string">abc</Constant></OutputField>
    </Output>)";

}  // namespace

TEST(SegmentChecks, ComputedNumbersAndChainedOutputs) {
  const struct {
    const char* method;
    const char* first;
    long status;      // of scoring x = 3
    double expected;  // the prediction when scored
  } cases[] = {
      {"sum", "", 0, 7.0 + 60.0},   // d = 6 passes both segments
      {"modelChain", "", 0, 60.0},  // the last segment decides
      // The text the chain leaves in d is no valid number for the second segment.
      {"modelChain", kTextOverD, 261001, 0.0},  // invalid input
  };
  for (const auto& c : cases) {
    auto model = qztest::CreateModel(Document(c.method, c.first));
    ASSERT_NE(model, nullptr) << c.method;
    ValueRecord input, output;
    input.Add("x", 3.0);
    ASSERT_TRUE(model->Scorable(output).IsOK());
    const long status = model->Score(input, output).GetErrorCode();
    if (c.status == 0) {
      EXPECT_EQ(status, 0) << c.method;
      EXPECT_DOUBLE_EQ(output.Get("prediction").GetReal(), c.expected) << c.method;
    } else {
      EXPECT_EQ(status, c.status) << c.method << c.first;
      EXPECT_TRUE(output.Get("prediction").IsNull()) << c.method;
    }
  }
}

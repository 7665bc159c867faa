// Transformation documents with malformed content: each is refused at load with a
// status and a message naming what is wrong, never half-loaded.
#include "XercesTestEnvironment.h"
#include "QZTransformation.h"

#include <sstream>
#include <string>
#include <utility>

#include <gtest/gtest.h>

#include "ValueRecord.h"

namespace {

using QZCommon_800::QZStatus;
using QZTransformNS_8_0_0::QZTransformation;

const char kDataField[] = "<DataField name=\"x\" optype=\"continuous\" dataType=\"double\"/>";

std::string Pmml(const std::string& dictionary) {
  return std::string("<PMML version=\"4.4\"><DataDictionary>") + kDataField +
         "</DataDictionary><TransformationDictionary>" + dictionary +
         "</TransformationDictionary></PMML>";
}

std::string Derived(const std::string& expression) {
  return "<DerivedField name=\"a\">" + expression + "</DerivedField>";
}

// The status code and message of loading the document; the engine holds no field of a
// refused document.
std::pair<long, std::string> Load(const std::string& document) {
  QZTransformation t;
  std::istringstream in(document);
  const QZStatus status = t.AddPMML(in, false);
  EXPECT_TRUE(t.GetDerivedFieldNames().empty() || status.IsOK()) << document;
  return {status.GetErrorCode(), t.GetLastError()};
}

TEST(MalformedTransformations, RefusedWithTheReason) {
  const std::string x = "<FieldRef field=\"x\"/>";
  const std::string interval = "<Interval closure=\"closedClosed\" leftMargin=\"0\"/>";
  const std::pair<std::string, std::string> cases[] = {
      {Derived("<Constant missing=\"maybe\">1</Constant>"),
       "DerivedField 'a': Constant has a missing attribute 'maybe' that is no boolean"},
      {Derived("<Constant dataType=\"decimal\">1</Constant>"),
       "DerivedField 'a': Constant has an unknown dataType 'decimal'"},
      {Derived("<NormContinuous field=\"x\"><LinearNorm orig=\"0\"/>"
               "<LinearNorm orig=\"1\" norm=\"1\"/></NormContinuous>"),
       "DerivedField 'a': LinearNorm needs both 'orig' and 'norm'"},
      {Derived("<NormContinuous field=\"x\"><LinearNorm orig=\"low\" norm=\"0\"/>"
               "<LinearNorm orig=\"1\" norm=\"1\"/></NormContinuous>"),
       "DerivedField 'a': LinearNorm orig: 'low' is not a number"},
      {Derived("<NormContinuous field=\"x\" mapMissingTo=\"none\"><LinearNorm orig=\"0\" "
               "norm=\"0\"/><LinearNorm orig=\"1\" norm=\"1\"/></NormContinuous>"),
       "DerivedField 'a': NormContinuous mapMissingTo: 'none' is not a number"},
      {Derived("<NormContinuous field=\"x\"><LinearNorm orig=\"0\" norm=\"0\"/>" + x +
               "</NormContinuous>"),
       "DerivedField 'a': NormContinuous has an unexpected element 'FieldRef'"},
      {Derived("<NormDiscrete field=\"x\" value=\"1\" method=\"thermometer\"/>"),
       "DerivedField 'a': NormDiscrete has an unknown method 'thermometer'"},
      {Derived("<NormDiscrete field=\"x\" value=\"1\">" + x + "</NormDiscrete>"),
       "DerivedField 'a': NormDiscrete has an unexpected element 'FieldRef'"},
      {Derived("<Discretize field=\"x\"><DiscretizeBin>" + interval +
               "</DiscretizeBin></Discretize>"),
       "DerivedField 'a': DiscretizeBin has no 'binValue' attribute"},
      {Derived("<MapValues outputColumn=\"o\"><FieldColumnPair field=\"x\" column=\"i\"/>"
               "<InlineTable/><InlineTable/></MapValues>"),
       "DerivedField 'a': MapValues has an unexpected element 'InlineTable'"},
      {"<DerivedField name=\"a\" optype=\"interval\">" + x + "</DerivedField>",
       "DerivedField 'a' has an unknown optype 'interval'"},
      {"<DefineFunction optype=\"continuous\"><ParameterField name=\"p\"/>"
       "<FieldRef field=\"p\"/></DefineFunction>",
       "a DefineFunction has no 'name' attribute"},
      {"<DefineFunction name=\"f\" optype=\"continuous\"><ParameterField name=\"p\"/>"
       "<ParameterField name=\"p\"/><FieldRef field=\"p\"/></DefineFunction>",
       "DefineFunction 'f': ParameterField 'p' is defined twice"},
  };
  for (const auto& c : cases) {
    const auto refusal = Load(Pmml(c.first));
    EXPECT_EQ(refusal.first, 270004) << c.first;
    EXPECT_EQ(refusal.second, c.second) << c.first;
  }
}

// A derived field whose own nesting is shallow but whose calls of functions go too
// deep is refused as the nesting itself would be.
TEST(MalformedTransformations, NestingThroughCallsCountsForTheDerivedField) {
  std::string body = "<FieldRef field=\"p\"/>";
  for (int i = 0; i < 200; ++i) body = "<Apply function=\"abs\">" + body + "</Apply>";
  const std::string deep = "<DefineFunction name=\"deep\" optype=\"continuous\">"
                           "<ParameterField name=\"p\"/>" + body + "</DefineFunction>";
  std::string call = "<Apply function=\"deep\"><FieldRef field=\"x\"/></Apply>";
  for (int i = 0; i < 60; ++i) call = "<Apply function=\"abs\">" + call + "</Apply>";
  EXPECT_EQ(Load(Pmml(deep + Derived(call))),
            std::make_pair(270004L, std::string("DerivedField 'a': expressions are nested "
                                                "deeper than 250 levels, counting the calls "
                                                "of functions")));

  // Shallower by a margin, the same document loads.
  std::string shallow = "<Apply function=\"deep\"><FieldRef field=\"x\"/></Apply>";
  for (int i = 0; i < 20; ++i) shallow = "<Apply function=\"abs\">" + shallow + "</Apply>";
  EXPECT_EQ(Load(Pmml(deep + Derived(shallow))).first, 0);
}

}  // namespace

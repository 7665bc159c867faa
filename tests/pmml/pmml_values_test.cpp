// Value and category helpers: categories and labels, valid and missing values, flags,
// targets, the bins of a Discretize, and the list settings value.

#include <limits>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>
#include <xercesc/dom/DOMDocument.hpp>

#include "QZMV.h"
#include "QZSafeParser.h"
#include "QZSettings.h"
#include "QZVarList.h"
#include "ScoringPMMLParser.h"
#include "Value.h"
#include "XercesTestEnvironment.h"

using QZCommon_800::QZMV;
using QZCommon_800::Value;
using QZScoring_800::ScoringPMMLParser;
using QZXML_800::QZVarList;

namespace {

// The protected bin reader, opened up for the test.
class BinReader : public ScoringPMMLParser {
 public:
  using ScoringPMMLParser::SetBinsFrTransDict;
};

struct Dictionary {
  Dictionary() {
    vars.AddContVar("x", "", QZXML_800::ROLE_INPUT);
    vars.GetEncoderAt(0)->AddMissingValue(-1.0, "");
    vars.AddCatVar("s", "", std::vector<std::string>{"a", "b", "c"},
                   std::vector<std::string>{"A", "", "C"}, QZXML_800::ROLE_TARGET);
    vars.GetEncoderAt(1)->AddMissingValue("?", "");
    vars.AddCatVar("n", "", std::vector<double>{1, 2}, QZXML_800::ROLE_TARGET);
    vars.AddCatVar("empty", "", 0, QZXML_800::ML_STRING_CATEGORICAL, QZXML_800::ROLE_INPUT);
  }
  const QZXML_800::IQZVariable* operator()(const char* name) const {
    return vars.GetVariable(name);
  }
  QZVarList vars;
};

}  // namespace

// Category lists and labels (an empty label falls back to the category text); targets
// in list order; flags are categorical with exactly two categories.
TEST(PMMLValues, ValuesLabelsTargetsAndFlags) {
  Dictionary d;
  using Pairs = std::vector<std::pair<Value, std::string>>;
  EXPECT_EQ((Pairs{{Value("a"), "A"}, {Value("b"), "b"}, {Value("c"), "C"}}),
            ScoringPMMLParser::GetValueLabels(d("s")));
  EXPECT_EQ((Pairs{{Value(1.0), "1"}, {Value(2.0), "2"}}),
            ScoringPMMLParser::GetValueLabels(d("n")));
  EXPECT_EQ((std::vector<Value>{Value(1.0), Value(2.0)}), ScoringPMMLParser::GetValues(d("n")));
  EXPECT_TRUE(ScoringPMMLParser::GetValues(d("x")).empty());
  EXPECT_TRUE(ScoringPMMLParser::GetValueLabels(nullptr).empty());

  const auto targets = ScoringPMMLParser::GetTargetVars(d.vars);
  ASSERT_EQ(2u, targets.size());
  EXPECT_EQ("s", targets[0]->GetName());
  EXPECT_EQ("n", targets[1]->GetName());
  EXPECT_TRUE(ScoringPMMLParser::GetTargetVars(QZVarList()).empty());

  EXPECT_TRUE(ScoringPMMLParser::IsFlagVariable(d("n")));
  EXPECT_FALSE(ScoringPMMLParser::IsFlagVariable(d("s")));
  EXPECT_FALSE(ScoringPMMLParser::IsFlagVariable(d("x")));
  EXPECT_FALSE(ScoringPMMLParser::IsFlagVariable(nullptr));
}

// Missing, valid and valid-category answers across kinds of variables and values.
TEST(PMMLValues, MissingAndValidValues) {
  Dictionary d;
  struct Row {
    const char* var;
    Value value;
    bool missing, valid, validCat;
  };
  const Value sysmis(QZMV::Missing());
  const Row rows[] = {
      {"x", Value(3.5), false, true, false},   {"x", Value("3.5"), false, false, false},
      {"x", Value(), true, false, false},      {"x", sysmis, true, false, false},
      {"x", Value(-1.0), true, false, false},  {"x", Value("abc"), true, false, false},
      {"s", Value("b"), false, true, true},    {"s", Value("z"), false, false, false},
      {"s", Value("?"), true, false, false},   {"s", Value(), true, false, false},
      {"s", sysmis, false, false, false},      {"n", Value(2.0), false, true, true},
      {"n", Value("2"), false, true, true},    {"n", Value(5.0), false, false, false},
      {"n", sysmis, true, false, false},       {"empty", Value("q"), false, true, false},
      {"empty", Value(), true, false, false},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(testing::Message() << row.var << " = " << row.value);
    EXPECT_EQ(row.missing, ScoringPMMLParser::IsMissingValue(d(row.var), row.value));
    EXPECT_EQ(row.valid, ScoringPMMLParser::IsValidValue(d(row.var), row.value));
    EXPECT_EQ(row.validCat, ScoringPMMLParser::IsValidCatValue(d(row.var), row.value));
  }
  EXPECT_TRUE(ScoringPMMLParser::IsMissingValue(nullptr, Value(1.0)));
  EXPECT_FALSE(ScoringPMMLParser::IsValidValue(nullptr, Value(1.0)));
  EXPECT_TRUE(ScoringPMMLParser::IsValidValue(d("n"), std::string("1")));
  EXPECT_TRUE(ScoringPMMLParser::IsValidValue(d("n"), std::string("1.0")));
  EXPECT_TRUE(ScoringPMMLParser::IsValidValue(d("s"), std::string("c")));
  EXPECT_FALSE(ScoringPMMLParser::IsValidValue(d("s"), std::string("C")));
  EXPECT_FALSE(ScoringPMMLParser::IsValidValue(d("x"), std::string("1")));
}

// The bins of the first DerivedField whose Discretize reads the field.
TEST(PMMLValues, BinsOfADiscretize) {
  QZXML_800::QZSafeDOMParser dom;
  std::istringstream in(R"(<TransformationDictionary>
    <DerivedField name="other"><Discretize field="y"><DiscretizeBin binValue="q">
      <Interval closure="openClosed" rightMargin="1"/></DiscretizeBin></Discretize></DerivedField>
    <DerivedField name="bins"><Discretize field="x">
      <DiscretizeBin binValue="low">
        <Interval closure="openClosed" leftMargin="-5" rightMargin="10"/></DiscretizeBin>
      <DiscretizeBin binValue="mid">
        <Interval closure="openClosed" leftMargin="10" rightMargin="20"/></DiscretizeBin>
      <DiscretizeBin binValue="high"><Interval closure="openOpen" leftMargin="20"/></DiscretizeBin>
    </Discretize></DerivedField>
    <DerivedField name="second"><Discretize field="x"><DiscretizeBin binValue="z">
      <Interval closure="openOpen" rightMargin="3"/></DiscretizeBin></Discretize></DerivedField>
    <DerivedField name="open"><Discretize field="w"><DiscretizeBin>
      <Interval closure="openOpen" rightMargin="x"/></DiscretizeBin></Discretize></DerivedField>
  </TransformationDictionary>)");
  xercesc::DOMDocument* doc = QZXML_800::QZSafeDOMParser::ParseSafely(dom, in, nullptr);
  ASSERT_NE(doc, nullptr);
  BinReader reader;
  std::vector<double> bounds{9.0};
  std::vector<std::string> bins{"stale"};
  ASSERT_TRUE(reader.SetBinsFrTransDict(doc->getDocumentElement(), "x", bounds, bins));
  EXPECT_EQ((std::vector<double>{-5, 10, 20, std::numeric_limits<double>::max()}), bounds);
  EXPECT_EQ((std::vector<std::string>{"low", "mid", "high"}), bins);

  ASSERT_TRUE(reader.SetBinsFrTransDict(doc->getDocumentElement(), "w", bounds, bins));
  EXPECT_EQ((std::vector<double>{std::numeric_limits<double>::lowest(),
                                 std::numeric_limits<double>::max()}),
            bounds);
  EXPECT_TRUE(bins.empty());

  EXPECT_FALSE(reader.SetBinsFrTransDict(doc->getDocumentElement(), "none", bounds, bins));
  EXPECT_TRUE(bounds.empty() && bins.empty());
  EXPECT_FALSE(reader.SetBinsFrTransDict(nullptr, "x", bounds, bins));
}

// The list settings value: its text, and element order byte-wise (bytes above 0x7f
// after ASCII).
TEST(PMMLValues, StringListSettingValue) {
  using List = QZXML_800::QZVecValue<std::string>;
  EXPECT_EQ("Vector Value: Length of vector = 3\n", List({"a", "b", "c"}).GetText());
  EXPECT_TRUE(List({"z"}).Less(List({"\xC3\xA9"})));
}

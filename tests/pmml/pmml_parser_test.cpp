#include <limits>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <xercesc/util/PlatformUtils.hpp>

#include "QZVarList.h"
#include "ScoringPMMLParser.h"
#include "XercesTestEnvironment.h"

using QZCommon_800::QZStatus;
using QZScoring_800::ScoringPMMLParser;
using QZXML_800::IQZVariable;
using QZXML_800::QZCatVar;
using QZXML_800::QZContVar;
using QZXML_800::QZVarList;

namespace {

constexpr double kLowest = std::numeric_limits<double>::lowest();
constexpr double kHighest = std::numeric_limits<double>::max();

long Fill(ScoringPMMLParser& parser, QZVarList& vars, const std::string& xml) {
  std::istringstream in(xml);
  return parser.FillVarList(vars, in).GetErrorCode();
}

long Fill(QZVarList& vars, const std::string& xml) {
  ScoringPMMLParser parser;
  return Fill(parser, vars, xml);
}

std::string Dictionary(const std::string& fields) {
  return "<DataDictionary>" + fields + "</DataDictionary>";
}

const QZCatVar* Cat(const QZVarList& vars, const char* name) {
  return dynamic_cast<const QZCatVar*>(vars.GetVariable(name));
}

// Storage codes by x-storageType, dataType, optype and the storageType extension.
TEST(PMMLParserTest, StorageCodes) {
  const struct {
    const char* attributes;
    int storage;
    int level;
  } cases[] = {
      {"optype='categorical' dataType='integer'", 1, 2},
      {"optype='categorical' dataType='boolean'", 1, 2},
      {"optype='continuous' dataType='double'", 2, 1},
      {"optype='continuous' dataType='float'", 2, 1},
      {"optype='continuous' dataType='date'", 2, 1},
      {"optype='continuous' dataType='time'", 2, 1},
      {"optype='continuous' dataType='dateTime'", 2, 1},
      {"optype='categorical' dataType='string'", 3, 3},
      {"optype='continuous' dataType='dateDaysSince[0]'", 4, 1},
      {"optype='continuous' dataType='dateDaysSince[1960]'", 4, 1},
      {"optype='continuous' dataType='dateDaysSince[1970]'", 4, 1},
      {"optype='continuous' dataType='dateDaysSince[1980]'", 4, 1},
      {"optype='continuous' dataType='timeSeconds'", 5, 1},
      {"optype='continuous' dataType='dateTimeSecondsSince[0]'", 6, 1},
      {"optype='continuous' dataType='dateTimeSecondsSince[1980]'", 6, 1},
      {"optype='categorical'", 3, 3},
      {"optype='ordinal'", 3, 3},
      {"optype='continuous'", 2, 1},
      {"optype='categorical' dataType='integer' x-storageType='string'", 3, 3},
      {"optype='categorical' dataType='string' x-storageType='numeric'", 2, 2},
      {"optype='categorical' dataType='decimal' x-storageType='numeric'", 2, 2},
  };
  std::string fields;
  for (size_t i = 0; i < std::size(cases); ++i) {
    fields += "<DataField name='f" + std::to_string(i) + "' " + cases[i].attributes + "/>";
  }
  QZVarList vars;
  ASSERT_EQ(Fill(vars, Dictionary(fields)), 0);
  ASSERT_EQ(vars.Size(), static_cast<int>(std::size(cases)));
  for (size_t i = 0; i < std::size(cases); ++i) {
    EXPECT_EQ(vars.GetVarAt(i)->GetStorageType(), cases[i].storage) << cases[i].attributes;
    EXPECT_EQ(vars.GetVarAt(i)->GetMeasureLevel(), cases[i].level) << cases[i].attributes;
  }

  // An extension storageType "string" turns integer values into string categories.
  QZVarList ext;
  ASSERT_EQ(Fill(ext, Dictionary("<DataField name='s' optype='categorical' dataType='integer'>"
                                 "<Extension name='storageType' value='string'/>"
                                 "<Value value='01'/><Value value='2'/></DataField>")),
            0);
  const QZCatVar* s = Cat(ext, "s");
  ASSERT_NE(s, nullptr);
  EXPECT_EQ(s->GetStorageType(), 3);
  EXPECT_EQ(s->GetEncoder()->GetValueType(), 3);
  EXPECT_EQ(s->GetEncoder()->GetStringAt(0), "01");
}

// Which dictionaries a document contributes, in which order, and which roots it may have.
TEST(PMMLParserTest, DictionariesAndRoots) {
  QZVarList vars;
  ASSERT_EQ(Fill(vars,
                 "<PMML version='4.1'><Header/><TransformationDictionary>"
                 "<DerivedField name='d1' optype='continuous'/><Other/>"
                 "<DerivedField name='d2' optype='categorical'/></TransformationDictionary>"
                 "<DataDictionary><DataField name='a' optype='continuous'/>"
                 "<DataField name='b' optype='categorical'/><DataField name='c' "
                 "optype='continuous'/></DataDictionary>"
                 "<TreeModel><LocalTransformations><DerivedField name='lt' optype='continuous'/>"
                 "</LocalTransformations></TreeModel></PMML>"),
            0);
  ASSERT_EQ(vars.Size(), 5);
  const char* order[] = {"a", "b", "c", "d1", "d2"};
  for (int i = 0; i < 5; ++i) EXPECT_EQ(vars.GetVarAt(i)->GetName(), order[i]);
  EXPECT_EQ(vars.GetVarAt(0)->GetRole(), QZXML_800::ROLE_NONE);

  QZVarList local;
  EXPECT_EQ(Fill(local, "<LocalTransformations><DerivedField name='x' optype='continuous'/>"
                        "<DataField name='ignored' optype='continuous'/></LocalTransformations>"),
            0);
  EXPECT_EQ(local.Size(), 1);
  EXPECT_EQ(Fill(local, "<Header/>"), 105);
  EXPECT_EQ(Fill(local, "<pmml/>"), 105);
  EXPECT_EQ(Fill(local, "<PMML/>"), 0);
}

// Categories and their labels, missing values by property and by extension, ranges.
TEST(PMMLParserTest, CategoriesMissingValuesAndRanges) {
  QZVarList vars;
  ASSERT_EQ(
      Fill(vars,
           Dictionary(
               "<DataField name='s' optype='categorical' dataType='string'>"
               "<Value value='a' displayValue='A'/><Value value='b' displayValue='B'/><Value/>"
               "<Value value='c' displayValue='C'/><Value value='?' property='missing'/>"
               "</DataField>"
               "<DataField name='nolabel' optype='categorical' dataType='string'>"
               "<Value value='a' displayValue='A'/><Value value=''/></DataField>"
               "<DataField name='n' optype='categorical' dataType='integer'>"
               "<Value value='1'/><Value value='2'/><Value value='x'/>"
               "<Extension name='MissingValue'><Value value='9' property='invalid'/></Extension>"
               "<Extension name='invalidRangeLower' value='100'/>"
               "<Extension name='invalidRangeUpper' value='200'/></DataField>"
               "<DataField name='c' optype='continuous'/>"
               "<DataField name='c0' optype='continuous' dataType='double'>"
               "<Interval leftMargin='-5' rightMargin='5'/><Interval leftMargin='0'/>"
               "<Value value='-1' property='missing'/></DataField>"
               "<DataField name='sc' optype='continuous' dataType='string'>"
               "<Interval leftMargin='zz'/></DataField>")),
      0);
  const QZCatVar* s = Cat(vars, "s");
  ASSERT_NE(s, nullptr);
  EXPECT_EQ(s->GetNumCategories(), 3);
  EXPECT_EQ(s->GetEncoder()->GetLabels(), (std::vector<std::string>{"A", "B", "C"}));
  EXPECT_TRUE(s->GetEncoder()->IsMissingString("?"));
  EXPECT_EQ(s->GetEncoder()->IndexOfString("?"), -1.0);

  // One label short: the categories come without labels.
  EXPECT_EQ(Cat(vars, "nolabel")->GetNumCategories(), 2);
  EXPECT_TRUE(Cat(vars, "nolabel")->GetEncoder()->GetLabels().empty());

  const QZCatVar* n = Cat(vars, "n");
  ASSERT_NE(n, nullptr);
  EXPECT_EQ(n->GetMeasureLevel(), QZXML_800::ML_NUMERIC_CATEGORICAL);
  EXPECT_EQ(n->GetNumCategories(), 2);  // 'x' is no number, yet its label counts
  EXPECT_TRUE(n->GetEncoder()->GetLabels().empty());
  EXPECT_TRUE(n->GetEncoder()->IsMissingNumber(9));
  EXPECT_TRUE(n->GetEncoder()->IsMissingNumber(150));
  EXPECT_FALSE(n->GetEncoder()->IsMissingNumber(2));

  const auto* c = dynamic_cast<const QZContVar*>(vars.GetVariable("c"));
  ASSERT_NE(c, nullptr);
  EXPECT_EQ(c->GetMinimum(), kLowest);
  EXPECT_EQ(c->GetMaximum(), kHighest);
  const auto* c0 = dynamic_cast<const QZContVar*>(vars.GetVariable("c0"));
  ASSERT_NE(c0, nullptr);
  EXPECT_EQ(c0->GetMinimum(), 0);  // the last Interval alone counts
  EXPECT_EQ(c0->GetMaximum(), kHighest);
  EXPECT_TRUE(c0->GetEncoder()->IsMissingNumber(-1));
  EXPECT_NE(vars.GetVariable("sc"), nullptr);  // a string field ignores its Interval
}

// Flag measure and true category, ordinal mark, number and string formats.
TEST(PMMLParserTest, FlagsOrdinalAndFormats) {
  QZVarList vars;
  ASSERT_EQ(
      Fill(vars,
           Dictionary(
               "<DataField name='flag' optype='categorical' dataType='string'>"
               "<Extension name='x-measure' value='flag'/>"
               "<Extension name='flagTypeTrueValue' value='Y'/>"
               "<Value value='N'/><Value value='Y'/></DataField>"
               "<DataField name='other' optype='categorical' dataType='string'>"
               "<Extension name='measure' value='flag'/>"
               "<Extension name='flagTypeTrueValue' value='T'/>"
               "<Value value='N'/><Value value='Y'/></DataField>"
               "<DataField name='num' optype='ordinal' dataType='integer'>"
               "<Extension><Extension name='flagTypeTrueValue' value='2'/></Extension>"
               "<Value value='1'/><Value value='2'/></DataField>"
               "<DataField name='w' optype='continuous' dataType='double'>"
               "<Extension name='width' value='8'/><Extension name='decimals' value='2'/>"
               "</DataField>"
               "<DataField name='fmt' optype='continuous' dataType='integer'>"
               "<Extension name='format' value='#'/></DataField>"
               "<DataField name='str' optype='categorical' dataType='string'>"
               "<Extension name='stringLength' value='20'/></DataField>"
               "<DataField name='day' optype='continuous' dataType='dateDaysSince[0]'>"
               "<Extension name='width' value='8'/></DataField>")),
      0);
  const QZCatVar* flag = Cat(vars, "flag");
  EXPECT_TRUE(flag->GetFlagMeasure());
  EXPECT_TRUE(flag->GetBinaryFlag());
  EXPECT_EQ(flag->GetBinaryFlagTrueIndex(), 1);
  EXPECT_FALSE(flag->GetOrdinalFlag());
  EXPECT_TRUE(Cat(vars, "other")->GetFlagMeasure());
  EXPECT_FALSE(Cat(vars, "other")->GetBinaryFlag());  // true value not a category
  const QZCatVar* num = Cat(vars, "num");
  EXPECT_FALSE(num->GetFlagMeasure());
  EXPECT_EQ(num->GetBinaryFlagTrueIndex(), 1);  // nested extensions count too
  EXPECT_TRUE(num->GetOrdinalFlag());

  using Attributes = std::vector<std::pair<std::string, std::string>>;
  const QZXML_800::XMLElement* w = vars.GetVariable("w")->GetFormat();
  ASSERT_NE(w, nullptr);
  EXPECT_EQ(w->GetName(), "NumberFormat");
  EXPECT_EQ(w->GetAttributes(),
            (Attributes{{"name", ""}, {"formatType", "standard"}, {"width", "8"},
                        {"decimalPlaces", "2"}, {"decimalSymbol", "local"},
                        {"groupingSymbol", "none"}}));
  ASSERT_NE(vars.GetVariable("fmt")->GetFormat(), nullptr);
  EXPECT_EQ(*vars.GetVariable("fmt")->GetFormat()->GetAttribute("width"), "");
  const QZXML_800::XMLElement* str = vars.GetVariable("str")->GetFormat();
  ASSERT_NE(str, nullptr);
  EXPECT_EQ(str->GetName(), "StringFormat");
  EXPECT_EQ(str->GetAttributes(),
            (Attributes{{"name", ""}, {"hexadecimal", "false"}, {"width", "20"}}));
  EXPECT_EQ(vars.GetVariable("day")->GetFormat(), nullptr);
}

// Error statuses: what each reports, what stays in the list, and how the status lives on.
TEST(PMMLParserTest, ErrorStatuses) {
  const std::string good = "<DataField name='ok' optype='continuous'/>";
  const struct {
    std::string fields;
    long code;
  } cases[] = {
      {good + "<DataField optype='continuous'/><DataField name='z' optype='continuous'/>",
       108},
      {good + "<DataField name='z'/>", 108},
      {good + "<DataField name='z' optype='continuous' dataType='decimal'/>", 109},
      {good + "<DataField name='z' optype='continuous'><Interval rightMargin='1,5'/>"
              "</DataField>",
       109},
      {good + "<DataField name='ok' optype='categorical'/>", 111},
  };
  for (const auto& c : cases) {
    ScoringPMMLParser parser;
    QZVarList vars;
    EXPECT_EQ(Fill(parser, vars, Dictionary(c.fields)), c.code) << c.fields;
    EXPECT_EQ(parser.GetStatus().GetErrorCode(), c.code);
    EXPECT_EQ(vars.Size(), 1) << c.fields;  // the field before the error stays
  }

  // Malformed XML, a DOCTYPE and too deep nesting end as 104 with a reason, never
  // as an exception; the next read starts afresh.
  ScoringPMMLParser parser;
  QZVarList vars;
  std::string deep;
  for (int i = 0; i < 1200; ++i) deep += "<a>";
  const std::string hostile[] = {
      "<DataDictionary><DataField name='a' optype='continuous'></DataDictionary>",
      "<?xml version='1.0'?><!DOCTYPE d [<!ENTITY e 'x'>]><DataDictionary/>", deep,
      "", "not xml"};
  for (const std::string& xml : hostile) {
    EXPECT_EQ(Fill(parser, vars, xml), 104) << xml.substr(0, 60);
    EXPECT_FALSE(parser.GetXercesMessage().empty());
  }
  EXPECT_EQ(vars.Size(), 0);
  // The element form returns a standing error without reading.
  EXPECT_EQ(parser.FillVarList(vars, static_cast<xercesc::DOMElement*>(nullptr)).GetErrorCode(),
            104);
  EXPECT_EQ(Fill(parser, vars, Dictionary(good)), 0);
  EXPECT_TRUE(parser.GetXercesMessage().empty());
  EXPECT_EQ(vars.Size(), 1);
}

// Parsers initialise and terminate Xerces-C++ once each, in any order of lifetimes, and
// an encoding parser converts through its code page.
TEST(PMMLParserTest, SeveralParsersAndEncodings) {
  auto first = std::make_unique<ScoringPMMLParser>();
  auto second = std::make_unique<ScoringPMMLParser>("ISO-8859-1");
  EXPECT_TRUE(first->InitXerces().IsOK());
  EXPECT_TRUE(second->GetStatus().IsOK());
  QZVarList vars;
  EXPECT_EQ(Fill(*first, vars, Dictionary("<DataField name='a' optype='continuous'/>")), 0);
  first.reset();
  EXPECT_EQ(Fill(*second, vars,
                 "<?xml version='1.0' encoding='UTF-8'?>" +
                     Dictionary("<DataField name='caf\xC3\xA9' optype='continuous'/>")),
            0);
  EXPECT_NE(vars.GetVariable("caf\xE9"), nullptr);
  second.reset();
  {
    ScoringPMMLParser utf8("");
    EXPECT_EQ(Fill(utf8, vars,
                   Dictionary("<DataField name='\xC3\xA9t\xC3\xA9' optype='continuous'/>")),
              0);
    EXPECT_NE(vars.GetVariable("\xC3\xA9t\xC3\xA9"), nullptr);
  }
  // Balanced: ending the test environment's own initialisation shuts Xerces-C++ down.
  xercesc::XMLPlatformUtils::Terminate();
  const bool down = xercesc::XMLPlatformUtils::fgTransService == nullptr;
  xercesc::XMLPlatformUtils::Initialize();
  EXPECT_TRUE(down);
}

}  // namespace

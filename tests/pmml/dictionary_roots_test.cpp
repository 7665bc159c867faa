// Reading the variable list from the dictionaries of a document: a stand-alone
// TransformationDictionary as the root, and a failure in the data dictionary that is
// not hidden by well-formed transformations after it.
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "QZVarList.h"
#include "ScoringPMMLParser.h"
#include "ScoringStatusCodes.h"
#include "XercesTestEnvironment.h"

using QZScoring_800::ScoringPMMLParser;
using QZXML_800::QZVarList;

namespace {

long Fill(ScoringPMMLParser& parser, QZVarList& vars, const std::string& xml) {
  std::istringstream in(xml);
  return parser.FillVarList(vars, in).GetErrorCode();
}

}  // namespace

TEST(DictionaryRoots, StandAloneTransformationDictionary) {
  ScoringPMMLParser parser;
  QZVarList vars;
  ASSERT_EQ(Fill(parser, vars,
                 "<TransformationDictionary><DefineFunction name='f'/>"
                 "<DerivedField name='d' optype='continuous' dataType='double'/>"
                 "<DataField name='ignored' optype='continuous'/></TransformationDictionary>"),
            0);
  ASSERT_EQ(vars.Size(), 1);
  EXPECT_EQ(vars.GetVarAt(0)->GetName(), "d");
}

// The first failing dictionary decides the status; the same parser reads a good
// document afterwards.
TEST(DictionaryRoots, DataDictionaryFailureIsKept) {
  ScoringPMMLParser parser;
  QZVarList vars;
  EXPECT_EQ(Fill(parser, vars,
                 "<PMML version='4.1'><DataDictionary><DataField name='a'/></DataDictionary>"
                 "<TransformationDictionary><DerivedField name='d' optype='continuous'/>"
                 "</TransformationDictionary></PMML>"),
            QZScoring_800::SCORING_PMML_MISSING_ATTRIBUTE);
  EXPECT_EQ(vars.GetVariable("d"), nullptr);
  EXPECT_EQ(Fill(parser, vars,
                 "<PMML version='4.1'><DataDictionary><DataField name='b' optype='ordinal' "
                 "dataType='decimal'/></DataDictionary><TransformationDictionary/></PMML>"),
            QZScoring_800::SCORING_PMML_INVALID_FIELD_TYPE);

  QZVarList fresh;
  EXPECT_EQ(Fill(parser, fresh,
                 "<PMML version='4.1'><DataDictionary><DataField name='a' optype='continuous'/>"
                 "</DataDictionary></PMML>"),
            0);
  EXPECT_EQ(fresh.Size(), 1);
}

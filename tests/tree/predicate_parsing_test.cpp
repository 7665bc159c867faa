#include <filesystem>
#include <fstream>
#include <map>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>

#include "QZSafeParser.h"
#include "QZSettings.h"
#include "QZVarList.h"
#include "ScoringCompoundPredicate.h"
#include "ScoringDiscreteSplit.h"
#include "ScoringException.h"
#include "ScoringPMMLParser.h"
#include "ScoringScaleSplit.h"
#include "ScoringScorerFactory.h"
#include "ScoringSetPredicate.h"
#include "ScoringSimplePredicate.h"
#include "ValueRecord.h"
#include "XercesTestEnvironment.h"

using namespace QZScoring_800;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace {

// Tracing on for the whole process: the level is read once, at the first trace call,
// which this makes (GetScoringNames traces) while component.cfg asks for level 2. Each
// test runs in its own folder, and a line is written only where component.cfg exists.
void EnableTracingHere() { std::ofstream("component.cfg") << "loglevel,2\n"; }
const bool kTracing = [] {
  EnableTracingHere();
  std::map<std::string, std::string> names;
  ScoringScorerFactory::GetScoringNames(names, QZXML_800::QZSettings());
  return true;
}();

// x nominal A,B,C; o ordinal A,B,C; n numbers 1,2,3; c continuous; e no categories;
// q texts with blanks and quotes.
const char kDictionary[] = R"(<DataDictionary>
  <DataField name="x" optype="categorical" dataType="string">
    <Value value="A"/><Value value="B"/><Value value="C"/></DataField>
  <DataField name="o" optype="ordinal" dataType="string">
    <Value value="A"/><Value value="B"/><Value value="C"/></DataField>
  <DataField name="n" optype="categorical" dataType="integer">
    <Value value="1"/><Value value="2"/><Value value="3"/></DataField>
  <DataField name="c" optype="continuous" dataType="double"/>
  <DataField name="e" optype="categorical" dataType="string"/>
  <DataField name="q" optype="categorical" dataType="string">
    <Value value="a b"/><Value value="c"/><Value value="d"/><Value value="say &quot;hi&quot;"/>
  </DataField>
</DataDictionary>)";

// Entry values joined by '|' (discrete) or the range in interval notation (scale),
// then the missing-value map.
std::string Describe(const ScoringSplitVar* split) {
  std::ostringstream out;
  if (const auto* discrete = dynamic_cast<const ScoringDiscreteSplit*>(split)) {
    const char* separator = "";
    for (const Value* value : discrete->GetSplitValues()) {
      out << separator << value->GetString();
      separator = "|";
    }
  } else if (const auto* scale = dynamic_cast<const ScoringScaleSplit*>(split)) {
    if (const auto* range = scale->GetSplitValueRangeFirst()) {
      out << (range->GetLowEnd() ? '[' : '(') << *range->GetMin() << ',' << *range->GetMax()
          << (range->GetHighEnd() ? ']' : ')');
    }
  }
  out << " map " << split->GetMissvalMap();
  return out.str();
}

class PredicateParsingTest : public ::testing::Test {
 protected:
  void SetUp() override {
    std::istringstream dictionary(kDictionary);
    ASSERT_TRUE(parser_.FillVarList(vars_, dictionary).IsOK());
  }

  xercesc::DOMElement* Element(const std::string& xml) {
    std::istringstream in(xml);
    xercesc::DOMDocument* document = QZXML_800::QZSafeDOMParser::ParseSafely(dom_, in, nullptr);
    return document != nullptr ? document->getDocumentElement() : nullptr;
  }

  // What a parse gives: the predicate's split, "null", "parsed" (no split) or the
  // failure as "code: message".
  template <class Parse>
  static std::string Outcome(Parse parse) {
    try {
      std::unique_ptr<ScoringPredicate> predicate(parse());
      if (!predicate) return "null";
      return predicate->GetSplit() != nullptr ? Describe(predicate->GetSplit()) : "parsed";
    } catch (const ScoringException& e) {
      return std::to_string(e.GetErrorCode()) + ": " + e.GetErrorMessage();
    }
  }
  // Parses the element with the operation its tag calls for.
  std::string Parse(const std::string& xml) {
    return Outcome([&]() -> ScoringPredicate* {
      xercesc::DOMNode* node = Element(xml);
      if (xml.rfind("<SimplePredicate", 0) == 0) return parser_.ParsePredicate(node, vars_);
      if (xml.rfind("<SimpleSetPredicate", 0) == 0) return parser_.ParseSetPredicate(node, vars_);
      return parser_.ParseCompoundPredicate(node, vars_);
    });
  }
  std::string Simple(const std::string& attributes) {
    return Parse("<SimplePredicate " + attributes + "/>");
  }

  ScoringPMMLParser parser_;
  QZXML_800::QZSafeDOMParser dom_;
  QZXML_800::QZVarList vars_;
};

// Every operator of a SimplePredicate on nominal, ordinal, numeric-category and
// continuous fields: the split built, or the exact failure.
TEST_F(PredicateParsingTest, SimplePredicateOperatorsPerFieldKind) {
  const char* const cases[][2] = {
      {R"(field="x" operator="equal" value="B")", "B map -1"},
      {R"(field="x" operator="equal" value="D")",
       "1: Value list is required and split value should be in the list!D"},
      {R"(field="x" operator="equal")", "1: value attribute is required for split variable x"},
      {R"(field="x" operator="equal" value="")", " map 0"},
      {R"(field="x" operator="notEqual" value="")",
       "1: Only equal operator is allowed for null string value"},
      {R"(field="x" operator="isMissing" value="A")",
       "1: No value attribute allowed after \"isMissing\""},
      {R"(field="x" operator="isMissing")", " map 0"},
      {R"(field="o" operator="greaterOrEqual" value="B")", "B|C map -1"},
      {R"(field="o" operator="lessOrEqual" value="B")", "A|B map -1"},
      {R"(field="o" operator="equal" value="B")", "B map -1"},
      {R"(field="o" operator="lessThan" value="A")", " map -1"},
      {R"(field="o" operator="greaterThan" value="C")", " map -1"},
      {R"(field="o" operator="isMissing")", "A|B|C map 0"},
      {R"(field="o" operator="equal" value="D")", "9: Invalid split value for variable: o"},
      {R"(field="o" operator="notEqual" value="B")", "9: Invalid operator!!"},
      {R"(field="n" operator="equal" value="2.0")", "2 map -1"},
      {R"(field="n" operator="equal" value="4")",
       "1: Value list is required and split value should be in the list!4"},
      {R"(field="n" operator="equal" value="")", " map 0"},
      {R"(field="c" operator="lessOrEqual" value="5")", "(-inf,5] map -1"},
      {R"(field="c" operator="lessThan" value="5")", "(-inf,5) map -1"},
      {R"(field="c" operator="greaterThan" value="5")", "(5,inf) map -1"},
      {R"(field="c" operator="greaterOrEqual" value="-2.5")", "[-2.5,inf) map -1"},
      {R"(field="c" operator="equal" value="5")", "[5,5] map -1"},
      {R"(field="c" operator="notEqual" value="5")", "5: notEqual: Not supported!"},
      {R"(field="c" operator="isMissing")", " map 0"},
      {R"(field="c" operator="isNotMissing")", "(-inf,inf) map -1"},
      {R"(field="c" operator="isNotMissing" value="1")",
       "1: No value allowed after \"isMissing\" or\"isNotMissing\""},
      {R"(field="c" operator="equal" value="")", " map 0"},
      {R"(field="c" operator="lessThan" value="")", "1: Only \"Equal\" allowed here!!!"},
      {R"(field="zz" operator="equal" value="1")", "8: zz: Invalid Split Variable!"},
  };
  for (const auto& c : cases) EXPECT_EQ(Simple(c[0]), c[1]) << c[0];
}

// Mended: missing tests are never unknown on any field kind; "notEqual" on a nominal
// field holds for the other categories; ordering comparisons on a nominal field and
// comparisons without a usable number are refused.
TEST_F(PredicateParsingTest, MendedSimplePredicateFaults) {
  const char* const cases[][2] = {
      {R"(field="x" operator="isNotMissing")", " map 0"},
      {R"(field="o" operator="isNotMissing")", "A|B|C map 0"},
      {R"(field="x" operator="isNotMissing" value="A")",
       "1: No value allowed after \"isMissing\" or\"isNotMissing\""},
      {R"(field="x" operator="notEqual" value="B")", "A|C map -1"},
      {R"(field="n" operator="notEqual" value="2")", "1|3 map -1"},
      {R"(field="x" operator="notEqual" value="D")",
       "1: Value list is required and split value should be in the list!D"},
      {R"(field="e" operator="notEqual" value="D")", "4: eValue list is required!"},
      {R"(field="x" operator="lessThan" value="B")", "9: Invalid operator!!"},
      {R"(field="n" operator="greaterOrEqual" value="2")", "9: Invalid operator!!"},
      {R"(field="c" operator="lessThan" value="abc")", "5: Invalid split value: abc"},
      {R"(field="c" operator="greaterThan")",
       "5: value attribute is required for operator greaterThan"},
  };
  for (const auto& c : cases) EXPECT_EQ(Simple(c[0]), c[1]) << c[0];

  using R = ScoringPredicate;
  const struct {
    const char* field;
    const char* attributes;
    Value value;  // null: missing
    R::PredicateResult expected;
  } evaluations[] = {
      {"c", R"(operator="isMissing")", Value(1.5), R::PREDICATE_FALSE},
      {"c", R"(operator="isMissing")", Value(), R::PREDICATE_TRUE},
      {"c", R"(operator="isNotMissing")", Value(), R::PREDICATE_FALSE},
      {"x", R"(operator="isMissing")", Value("A"), R::PREDICATE_FALSE},
      {"x", R"(operator="isNotMissing")", Value("A"), R::PREDICATE_TRUE},
      {"x", R"(operator="isNotMissing")", Value(), R::PREDICATE_FALSE},
      {"x", R"(operator="notEqual" value="B")", Value("A"), R::PREDICATE_TRUE},
      {"x", R"(operator="notEqual" value="B")", Value("B"), R::PREDICATE_FALSE},
      {"x", R"(operator="notEqual" value="B")", Value(), R::PREDICATE_UNKNOWN},
  };
  for (const auto& e : evaluations) {
    std::unique_ptr<ScoringSimplePredicate> predicate(parser_.ParsePredicate(
        Element(std::string("<SimplePredicate field=\"") + e.field + "\" " + e.attributes + "/>"),
        vars_));
    ValueRecord record;
    record.Add(e.field, e.value);
    EXPECT_EQ(predicate->Evaluate(record), e.expected) << e.attributes << " on " << e.value;
  }
}

// SimpleSetPredicate arrays: operators, types, quotes, escapes, white space, counts.
TEST_F(PredicateParsingTest, SetPredicateArrays) {
  const char* const cases[][5] = {
      {"x", "isIn", R"(n="2" type="string")", "A C", "A|C map -1"},
      {"x", "isNotIn", R"(n="1" type="string")", "B", "A|C map -1"},
      {"q", "isIn", R"(n="3" type="string")", R"("a b" c  d)", "a b|c|d map -1"},
      {"q", "isIn", R"(n="2" type="string")", R"("a b" c  d)", "a b|c map -1"},
      {"q", "isIn", R"(n="4" type="string")", R"("a b" c  d)",
       "12: Number of Elements doesn't match with array size!"},
      // Mended: every white space separates; without "n" every element is read; an
      // escaped quote is a quote; an unclosed quote is refused.
      {"q", "isIn", R"(n="3" type="string")", "c\td&#13;\n\"a b\"\n", "c|d|a b map -1"},
      {"q", "isIn", R"(type="string")", R"(d "a b")", "d|a b map -1"},
      {"q", "isIn", R"(n="2" type="string")", R"("say \"hi\"" c)", "say \"hi\"|c map -1"},
      {"q", "isIn", R"(n="1" type="string")", R"("a b)",
       "12: Number of Elements doesn't match with array size!"},
      {"n", "isIn", R"(n="2" type="int")", "1 1.5", "3: Invalid integer string -- 1.5"},
      {"n", "isIn", R"(n="2" type="real")", "1 2.5e", "3: Invalid double string -- 2.5e"},
      {"n", "isNotIn", R"(n="1" type="real")", "1.0", "2|3 map -1"},
      {"n", "isIn", R"(n="x" type="int")", "1", "3: Invalid integer string -- x"},
      {"x", "bogus", R"(n="1" type="double")", "A", "11: double Invalid Operator!"},
      {"x", "isIn", R"(n="1")", "A", "11:  Invalid Operator!"},
      {"x", "bogus", R"(n="1" type="string")", "A", "9: bogus Invalid Operator!"},
      {"x", "isIn", R"(n="1" type="string")", "D", "3: In valid split value!"},
      {"x", "isNotIn", R"(n="1" type="string")", "D", "3: Invalid category value: D"},
      {"x", "isIn", R"(n="1" type="string")", "", "4: Array Node is required!!!"},
      {"x", "isIn", R"(n="1" type="string")", " \n ", "4: No Elements found in array!"},
      {"c", "isIn", R"(n="1" type="real")", "1", "null"},
      {"zz", "isIn", R"(n="1" type="string")", "A", "8: Variable zz not in the dictionary!"},
      {"e", "isIn", R"(n="1" type="string")", "A", "4: e: category value list is required!!"},
  };
  for (const auto& c : cases) {
    EXPECT_EQ(Parse(std::string("<SimpleSetPredicate field=\"") + c[0] + "\" booleanOperator=\"" +
                  c[1] + "\"><Array " + c[2] + ">" + c[3] + "</Array></SimpleSetPredicate>"),
              c[4])
        << c[0] << " " << c[3];
  }
  EXPECT_EQ(Parse(R"(<SimpleSetPredicate field="x" booleanOperator="isIn"/>)"),
            "9: Array Node is required!!!");
}

// The lines of every trace file below the working folder, by file (earlier test
// processes may have left theirs there).
std::map<std::string, std::vector<std::string>> TraceFiles() {
  std::map<std::string, std::vector<std::string>> files;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(".")) {
    const std::string path = entry.path().string();
    if (path.size() < 12 || path.compare(path.size() - 12, 12, "_scoring.log") != 0) continue;
    std::ifstream in(path);
    for (std::string line; std::getline(in, line);) files[path].push_back(line);
  }
  return files;
}

// Compound predicates: operators, skipped and dropped children, and a failure three
// levels deep that leaves one trace entry per level and nothing built.
TEST_F(PredicateParsingTest, CompoundPredicates) {
  EXPECT_EQ(Parse(R"(<CompoundPredicate booleanOperator="AND"><True/></CompoundPredicate>)"),
            "11: AND: Invalid Boolean Operator for the Compound Predicate");
  EXPECT_EQ(Parse("<CompoundPredicate/>"),
            "11: : Invalid Boolean Operator for the Compound Predicate");

  std::unique_ptr<ScoringCompoundPredicate> compound(parser_.ParseCompoundPredicate(
      Element(R"(<CompoundPredicate booleanOperator="or"> <True/><Extension/><Unknown/>
          <SimpleSetPredicate field="c" booleanOperator="isIn"><Array n="1" type="real">1</Array>
          </SimpleSetPredicate><CompoundPredicate booleanOperator="xor"><False/></CompoundPredicate>
          <SimplePredicate field="x" operator="equal" value="A"/></CompoundPredicate>)"),
      vars_));
  ASSERT_EQ(compound->GetCount(), 3);
  EXPECT_EQ(compound->GetBoolOperator(), ScoringPredicate::BOOL_OR);
  EXPECT_EQ(compound->GetPredicates()[0]->GetPredType(), ScoringPredicate::TRUE_PREDICATE);
  EXPECT_EQ(compound->GetPredicates()[1]->GetPredType(), ScoringPredicate::COMPOUND_PREDICATE);
  EXPECT_EQ(compound->GetPredicates()[2]->GetPredType(), ScoringPredicate::SIMPLE_PREDICATE);

  EnableTracingHere();
  auto before = TraceFiles();
  EXPECT_EQ(Parse(R"(<CompoundPredicate booleanOperator="and"><True/>
                          <CompoundPredicate booleanOperator="or"><False/>
                            <CompoundPredicate booleanOperator="surrogate">
                              <SimplePredicate field="zz" operator="equal" value="1"/>
                            </CompoundPredicate></CompoundPredicate></CompoundPredicate>)"),
            "8: zz: Invalid Split Variable!");
  std::vector<std::string> lines;  // the lines this failure added
  for (const auto& file : TraceFiles()) {
    lines.insert(lines.end(), file.second.begin() + before[file.first].size(), file.second.end());
  }
  ASSERT_EQ(lines.size(), 4u);
  const std::string prefix = "  Exception:Function:QZScoring_800::ScoringPMMLParser::";
  const char* functions[] = {"ParsePredicate; Line:", "ParseCompoundPredicate; Line:",
                             "ParseCompoundPredicate; Line:", "ParseCompoundPredicate; Line:"};
  for (size_t i = 0; i < 4; ++i) {
    EXPECT_EQ(lines[i].rfind(prefix + functions[i], 0), 0u) << lines[i];
  }
}

// The predicate service: each root element, and null (never an exception) for
// anything else, failures inside, garbage and hostile documents.
TEST_F(PredicateParsingTest, GetPredicateRoots) {
  QZXML_800::QZSettings settings;
  auto get = [&](const std::string& text) {
    std::istringstream in(text);
    return std::unique_ptr<ScoringPredicate>(
        ScoringScorerFactory::GetPredicate(settings, vars_, in));
  };
  // Listed in the order of ScoringPredicate::PredicateType.
  const char* const roots[] = {
      R"(<CompoundPredicate booleanOperator="and"><True/></CompoundPredicate>)",
      R"(<SimplePredicate field="c" operator="lessThan" value="3"/>)",
      R"(<SimpleSetPredicate field="x" booleanOperator="isIn"><Array n="1" type="string">A</Array>
         </SimpleSetPredicate>)",
      "<True/>",
      "<?xml version=\"1.0\"?>\n<False/>",
  };
  for (int type = 0; type < 5; ++type) {
    const auto predicate = get(roots[type]);
    ASSERT_NE(predicate, nullptr) << roots[type];
    EXPECT_EQ(predicate->GetPredType(), type) << roots[type];
  }
  std::string deep;
  for (int i = 0; i < 2000; ++i) deep += "<CompoundPredicate booleanOperator=\"and\">";
  for (int i = 0; i < 2000; ++i) deep += "</CompoundPredicate>";
  const std::string refused[] = {
      "<Foo/>", "", "not xml at all", "<True>", "<!DOCTYPE True [<!ENTITY a \"x\">]><True/>", deep,
      R"(<SimplePredicate field="zz" operator="equal" value="1"/>)",
      R"(<CompoundPredicate booleanOperator="and">
           <SimplePredicate field="x" operator="equal" value="D"/></CompoundPredicate>)",
  };
  for (const std::string& text : refused) EXPECT_EQ(get(text), nullptr) << text.substr(0, 80);
}

}  // namespace

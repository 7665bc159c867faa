// The model-attribute scan: the record it fills, the skeleton and capture it writes,
// and how it ends on incomplete, foreign and hostile documents.

#include <chrono>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <xercesc/dom/DOM.hpp>

#include "QZSafeParser.h"
#include "ScoringModelAttr.h"
#include "ScoringScorerFactory.h"
#include "ScoringStr.h"
#include "XercesTestEnvironment.h"

using QZCommon_800::QZStatus;
using QZScoring_800::QZScoringConst;
using QZScoring_800::ScoringModelAttr;
using QZScoring_800::ScoringOutputField;
using QZScoring_800::ScoringScorerFactory;
using QZScoring_800::ScoringStr;

namespace {

const std::vector<std::string> kModelNames = {"TreeModel", "MiningModel", "RegressionModel"};

QZStatus Scan(const std::string& document, ScoringModelAttr& record,
              const std::vector<std::string>& names = kModelNames) {
  std::istringstream pmml(document);
  ScoringModelAttr* pointer = &record;
  return ScoringScorerFactory::GetModelAttr(pmml, names, pointer, "UTF-8");
}

// Re-parses text with the safe parser; empty when it is not a well-formed document,
// otherwise the root's name followed by the names of its child elements.
std::vector<std::string> RootAndChildren(const std::string& text) {
  QZXML_800::QZSafeDOMParser parser;
  std::istringstream in(text);
  std::string error;
  xercesc::DOMDocument* document = QZXML_800::QZSafeDOMParser::ParseSafely(parser, in, &error);
  if (document == nullptr) {
    ADD_FAILURE() << error << " in\n" << text;
    return {};
  }
  const xercesc::DOMElement* root = document->getDocumentElement();
  std::vector<std::string> names{ScoringStr(root->getTagName()).toUTF8()};
  for (auto* child = root->getFirstElementChild(); child; child = child->getNextElementSibling()) {
    names.push_back(ScoringStr(child->getTagName()).toUTF8());
  }
  return names;
}

std::vector<std::string> Names(const std::vector<ScoringOutputField*>& fields) {
  std::vector<std::string> names;
  for (const ScoringOutputField* field : fields) names.push_back(field->GetName());
  return names;
}

const char kTreeDocument[] = R"(<?xml version="1.0" encoding="UTF-8"?>
<PMML version="4.1" xmlns="http://www.dmg.org/PMML-4_1">
  <Header copyright="c"><Application name="Modeler &amp; Co" version="18.0"/>
    <Annotation>stray header text</Annotation><Timestamp>2020</Timestamp></Header>
  <MiningBuildTask><Extension name="task">build &lt;notes&gt;</Extension></MiningBuildTask>
  <DataDictionary numberOfFields="4">
    <DataField name="colour" optype="categorical" dataType="string">
      <Value value="red &amp; blue" property="valid">R&amp;B</Value>
      <Extension name="x"><Extension name="y" value="a&quot;b"/></Extension>
    </DataField>
    <DataField name="age" optype="continuous" dataType="double"/>
    <DataField name="income" optype="continuous" dataType="double"/>
    <DataField name="response" optype="categorical" dataType="string"/>
    <Extension><x:meta xmlns:x="urn:example">prefixed</x:meta></Extension>
  </DataDictionary>
  <TransformationDictionary>
    <DerivedField name="ageSquared" optype="continuous" dataType="double">
      <Apply function="*"><FieldRef field="age"/><FieldRef field="age"/></Apply>
    </DerivedField>
  </TransformationDictionary>
  <TreeModel modelName="Response tree" functionName="classification" algorithmName="C5">
    <Extension extender="qzscoring" name="modelID" value="model-7"/>
    <Extension extender="other" name="adjustedPropensity"><Ignored/></Extension>
    <Extension extender="qzscoring" name="adjustedPropensity">
      <Network bias="0.5"><Extension name="inner">w &lt; 1</Extension><Weight value="2"/></Network>
    </Extension>
    <MiningSchema>
      <MiningField name="colour"/>
      <MiningField name="age" usageType="active"/>
      <MiningField name="income" usageType="order"/>
      <MiningField name="response" usageType="predicted"/>
      <MiningField name="weight" usageType="supplementary"/>
      <MiningField name="response2" usageType="target"/>
      <MiningField/>
      <Extension extender="qzscoring" name="DerivedFields">
        <MiningField name="ageSquared"/>
        <MiningField name="notAnInput" usageType="supplementary"/>
        <Extension name="nested"><MiningField name="hidden"/></Extension>
        <MiningField name="ageCubed" usageType="active"/>
      </Extension>
      <MiningField name="late"/>
    </MiningSchema>
    <Output>
      <OutputField name="prediction" feature="predictedValue" targetField="response"/>
      <OutputField name="probability" feature="probability" value="yes"/>
      <OutputField name="prediction" feature="probability"/>
      <OutputField feature="nameless"/>
    </Output>
    <Node score="yes"><True/><Extension name="text">model body &amp; text</Extension></Node>
  </TreeModel>
</PMML>)";

}  // namespace

// A realistic document fills every field of the record, in document order.
TEST(ModelAttrScan, FillsTheRecordFromARealisticDocument) {
  ScoringModelAttr record;
  const QZStatus status = Scan(kTreeDocument, record);
  ASSERT_TRUE(status.IsOK()) << status.GetErrorCode();
  EXPECT_EQ(record.GetVersion(), "4.1");
  EXPECT_EQ(record.GetAppName(), "Modeler & Co");
  EXPECT_EQ(record.GetAppVersion(), "18.0");
  EXPECT_EQ(record.GetModelElement(), "TreeModel");
  EXPECT_EQ(record.GetModelType(), QZScoringConst::MODEL_TREE);
  EXPECT_EQ(record.GetModelName(), "Response tree");
  EXPECT_EQ(record.GetFunctionName(), "classification");
  EXPECT_EQ(record.GetAlgorithmName(), "C5");
  EXPECT_EQ(record.GetModelID(), "model-7");
  EXPECT_EQ(record.GetMultipleModelMethod(), "");
  EXPECT_TRUE(record.HasTransformationDictionary());
  EXPECT_EQ(record.GetDataFields(),
            (std::vector<std::string>{"colour", "age", "income", "response"}));
  EXPECT_EQ(record.GetDerivedFields(), std::vector<std::string>{"ageSquared"});
  // No usage type, "active" and "order" are inputs; "predicted" a target; others and a
  // field without attributes are not recorded; a nested extension hides its fields.
  EXPECT_EQ(record.GetActiveFields(),
            (std::vector<std::string>{"colour", "age", "income", "late"}));
  EXPECT_EQ(record.GetTargetFields(), (std::vector<std::string>{"response", "response2"}));
  EXPECT_EQ(record.GetDerivedInputs(), (std::vector<std::string>{"ageSquared", "ageCubed"}));
  // The first of two output fields of one name is held; a nameless one is not.
  const auto& fields = record.GetOutputFields();
  ASSERT_EQ(Names(fields), (std::vector<std::string>{"prediction", "probability"}));
  EXPECT_EQ(fields[0]->GetFeature(), "predictedValue");
  EXPECT_EQ(fields[0]->GetTargetField(), "response");
  EXPECT_EQ(fields[0]->GetValue(), "");
  EXPECT_EQ(fields[1]->GetValue(), "yes");
}

// The skeleton holds the root with its version only, the build task and both
// dictionaries verbatim and escaped, and nothing of the header or the model.
TEST(ModelAttrScan, SkeletonIsTheDocumentWithoutHeaderAndModel) {
  ScoringModelAttr record;
  ASSERT_TRUE(Scan(kTreeDocument, record).IsOK());
  const std::string skeleton = record.GetSkeletonStream().str();
  EXPECT_EQ(skeleton.rfind("<PMML version=\"4.1\">\n", 0), 0u) << skeleton;
  EXPECT_EQ(skeleton.substr(skeleton.size() - 7), "</PMML>");
  EXPECT_NE(skeleton.find("<Value value=\"red &amp; blue\" property=\"valid\">R&amp;B</Value>"),
            std::string::npos) << skeleton;
  EXPECT_NE(skeleton.find("build &lt;notes&gt;"), std::string::npos);
  EXPECT_NE(skeleton.find("<FieldRef field=\"age\"></FieldRef>"), std::string::npos);
  for (const char* absent : {"stray", "2020", "Application", "TreeModel", "MiningSchema",
                             "model body", "Network", "xmlns=\""}) {
    EXPECT_EQ(skeleton.find(absent), std::string::npos) << absent << " in\n" << skeleton;
  }
  EXPECT_EQ(RootAndChildren(skeleton),
            (std::vector<std::string>{"PMML", "MiningBuildTask", "DataDictionary",
                                      "TransformationDictionary"}));
}

// The capture holds the whole adjusted-propensity extension, a nested extension
// included, and nothing after it.
TEST(ModelAttrScan, CapturesTheAdjustedPropensityExtension) {
  ScoringModelAttr record;
  ASSERT_TRUE(Scan(kTreeDocument, record).IsOK());
  ASSERT_NE(record.GetAdjustedPropensityStream(), nullptr);
  const std::string capture = record.GetAdjustedPropensityStream()->str();
  EXPECT_EQ(capture.rfind("<Extension extender=\"qzscoring\" name=\"adjustedPropensity\">", 0),
            0u) << capture;
  EXPECT_NE(capture.find("<Extension name=\"inner\">w &lt; 1</Extension><Weight value=\"2\">"),
            std::string::npos) << capture;
  EXPECT_EQ(capture.substr(capture.size() - 12), "</Extension>");
  EXPECT_EQ(capture.find("Ignored"), std::string::npos);
  EXPECT_EQ(capture.find("MiningSchema"), std::string::npos);
  EXPECT_EQ(RootAndChildren(capture), (std::vector<std::string>{"Extension", "Network"}));
}

// A MiningModel: the record describes the top model only. Its own segmentation gives
// the method; segments' schemas, outputs, extensions and segmentations are ignored.
TEST(ModelAttrScan, SubModelsDoNotLeakIntoTheRecord) {
  const std::string segment =
      "<Segment><True/><TreeModel modelName=\"sub\" functionName=\"classification\">"
      "<Extension extender=\"qzscoring\" name=\"modelID\" value=\"sub-id\"/>"
      "<MiningSchema><MiningField name=\"b\"/><MiningField name=\"t\" usageType=\"predicted\"/>"
      "</MiningSchema><Output><OutputField name=\"subOut\"/></Output>"
      "<Segmentation multipleModelMethod=\"average\"/><Node/></TreeModel></Segment>";
  const std::string document =
      "<PMML version=\"4.0\"><Header/><DataDictionary><DataField name=\"a\"/></DataDictionary>"
      "<MiningModel functionName=\"classification\"><MiningSchema><MiningField name=\"a\"/>"
      "</MiningSchema><Segmentation multipleModelMethod=\"majorityVote\">" +
      segment + segment + "</Segmentation></MiningModel></PMML>";
  ScoringModelAttr record;
  ASSERT_TRUE(Scan(document, record).IsOK());
  EXPECT_EQ(record.GetModelType(), QZScoringConst::MODEL_MINING);
  EXPECT_EQ(record.GetModelName(), "MiningModel");  // no modelName: the element name
  EXPECT_EQ(record.GetMultipleModelMethod(), "majorityVote");
  EXPECT_EQ(record.GetActiveFields(), std::vector<std::string>{"a"});
  EXPECT_TRUE(record.GetTargetFields().empty());
  EXPECT_TRUE(record.GetOutputFields().empty());
  EXPECT_EQ(record.GetModelID(), "");
}

// How a scan ends on documents of other kinds, incomplete or partly unknown ones.
TEST(ModelAttrScan, StatusAndModelTypeByKindOfDocument) {
  struct Case {
    const char* what;
    std::string document;
    long code;
    int type;
    const char* element;
  };
  const std::string dictionary = "<PMML version=\"4.1\"><DataDictionary/>";
  const Case cases[] = {
      {"time-series document", "<HRZXML><Header><Application name=\"ts\"/></Header></HRZXML>",
       0, 17, ""},
      {"unlisted model", dictionary + "<NeuralNetwork/></PMML>", 0, 0, ""},
      {"unlisted model with transformations",
       dictionary + "<TransformationDictionary/><NeuralNetwork/></PMML>", 0, 16, ""},
      {"no data dictionary", "<PMML version=\"4.1\"><TreeModel/></PMML>", 0, 0, ""},
      {"listed model", dictionary + "<RegressionModel/></PMML>", 0, 7, "RegressionModel"},
      {"truncated", dictionary + "<TreeModel><Node>", 260007, 13, "TreeModel"},
      {"empty PMML element", "<PMML version=\"4.1\"/>", 0, 0, ""},
      {"another root", "<Doc><PMML><DataDictionary/></PMML></Doc>", 260007, 0, ""},
      {"malformed", dictionary + "<TreeModel></Tree></PMML>", 260007, 13, "TreeModel"},
      {"empty input", "", 260007, 0, ""},
  };
  for (const Case& c : cases) {
    ScoringModelAttr record;
    const QZStatus status = Scan(c.document, record);
    EXPECT_EQ(status.GetErrorCode(), c.code) << c.what;
    EXPECT_EQ(status.GetFlag(), c.code != 0) << c.what;
    EXPECT_EQ(record.GetModelType(), c.type) << c.what;
    EXPECT_EQ(record.GetModelElement(), c.element) << c.what;
  }
  ScoringModelAttr record;
  ASSERT_TRUE(Scan("<HRZXML><x/></HRZXML>", record).IsOK());
  EXPECT_EQ(record.GetSkeletonStream().str(), "");
  ScoringModelAttr* none = nullptr;
  std::istringstream pmml(kTreeDocument);
  const QZStatus status = ScoringScorerFactory::GetModelAttr(pmml, kModelNames, none, "UTF-8");
  EXPECT_EQ(status.GetErrorCode(), 260007);
  EXPECT_TRUE(status.GetFlag());
  EXPECT_EQ(none, nullptr);
}

// Hostile documents end in 260007 at once, reading nothing from outside the document.
TEST(ModelAttrScan, RefusesHostileDocumentsQuickly) {
  const std::string laughs =
      "<?xml version=\"1.0\"?><!DOCTYPE PMML [<!ENTITY a \"aaaaaaaaaa\">"
      "<!ENTITY b \"&a;&a;&a;&a;&a;&a;&a;&a;&a;&a;\"><!ENTITY c \"&b;&b;&b;&b;&b;&b;&b;&b;&b;&b;\">"
      "<!ENTITY d \"&c;&c;&c;&c;&c;&c;&c;&c;&c;&c;\"><!ENTITY e \"&d;&d;&d;&d;&d;&d;&d;&d;&d;&d;\">"
      "<!ENTITY f \"&e;&e;&e;&e;&e;&e;&e;&e;&e;&e;\"><!ENTITY g \"&f;&f;&f;&f;&f;&f;&f;&f;&f;&f;\">"
      "]><PMML version=\"4.1\"><DataDictionary><DataField name=\"&g;\"/></DataDictionary>"
      "<TreeModel/></PMML>";
  const std::string external =
      "<?xml version=\"1.0\"?><!DOCTYPE PMML [<!ENTITY host SYSTEM \"file:///etc/hostname\">]>"
      "<PMML version=\"4.1\"><DataDictionary><DataField name=\"&host;\"/></DataDictionary>"
      "<TreeModel/></PMML>";
  std::string deep = "<PMML version=\"4.1\"><DataDictionary/><TreeModel>";
  for (int i = 0; i < 200000; ++i) deep += "<a>";
  for (int i = 0; i < 200000; ++i) deep += "</a>";
  deep += "</TreeModel></PMML>";
  for (const std::string* document : {&laughs, &external, static_cast<const std::string*>(&deep)}) {
    ScoringModelAttr record;
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(Scan(*document, record).GetErrorCode(), 260007);
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(1));
    EXPECT_TRUE(record.GetDataFields().empty());
  }
}

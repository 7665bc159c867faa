// The scorer registry and dispatcher, loading the real test plug-ins built beside the
// scoring library.

#include <memory>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "QZSafeParser.h"
#include "ScoringDynamicLoadedLibrary.h"
#include "ScoringScorerFactory.h"
#include "ValueRecord.h"
#include "XercesTestEnvironment.h"

using QZCommon_800::IQZScore;
using QZScoring_800::QZScoringConst;
using QZScoring_800::ScoringScorerFactory;
using QZXML_800::QZSettings;
using QZXML_800::QZVarList;

namespace {

const char kTreeDocument[] =
    "<?xml version=\"1.0\"?>\n"
    "<PMML version=\"4.0\"><Header/><DataDictionary/>"
    "<TreeModel functionName=\"classification\"><Node/></TreeModel></PMML>";

// A registry: scoringDll maps each (element, plug-in) pair; modelDll lists the model
// element names.
QZSettings Registry(std::initializer_list<std::pair<const char*, const char*>> plugins,
                    const char* version = "4.0", const char* modelType = "TreeModel") {
  QZSettings scoring, models, settings;
  for (const auto& p : plugins) scoring.AddSetting(p.first, p.second, false);
  models.AddSetting("MiningModel", "", false);
  models.AddSetting("TreeModel", "", false);
  settings.AddSetting("scoringDll", scoring, true);
  settings.AddSetting("modelDll", models, true);
  settings.AddSetting("scoring_version", version, true);
  settings.AddSetting("scoring_modelType", modelType, true);
  return settings;
}

std::string Dispatch(QZSettings settings, const std::string& document = kTreeDocument) {
  QZVarList variables;
  std::istringstream pmml(document);
  std::unique_ptr<IQZScore> scorer(ScoringScorerFactory::GetScorer(settings, variables, pmml));
  return scorer ? scorer->GetType() : "null";
}

}  // namespace

TEST(ScorerFactory, ModelTypeIsExactAndCaseSensitive) {
  EXPECT_EQ(ScoringScorerFactory::GetModelType("TreeModel"), QZScoringConst::MODEL_TREE);
  EXPECT_EQ(ScoringScorerFactory::GetModelType("AssociationModel"), 1);
  EXPECT_EQ(ScoringScorerFactory::GetModelType("NearestNeighborModel"), 15);
  EXPECT_EQ(ScoringScorerFactory::GetModelType("SupportVectorMachineModel"), 10);
  EXPECT_EQ(ScoringScorerFactory::GetModelType("treemodel"), QZScoringConst::MODEL_UNKNOWN);
  EXPECT_EQ(ScoringScorerFactory::GetModelType("TreeModel "), 0);
  EXPECT_EQ(ScoringScorerFactory::GetModelType(""), 0);
}

TEST(ScorerFactory, RegistryReadingReportsAbsentOrWrongKindSettings) {
  std::map<std::string, std::string> names{{"stale", "x"}};
  std::vector<std::string> models{"stale"};
  QZSettings empty;
  EXPECT_EQ(ScoringScorerFactory::GetScoringNames(names, empty).GetErrorCode(), 260006);
  EXPECT_TRUE(names.empty());
  EXPECT_EQ(ScoringScorerFactory::GetModelNames(models, empty).GetErrorCode(), 260005);
  EXPECT_TRUE(models.empty());

  // A text where nested settings belong is refused like an absent one.
  QZSettings wrongKind;
  wrongKind.AddSetting("scoringDll", "QZTestStream", true);
  wrongKind.AddSetting("modelDll", "TreeModel", true);
  EXPECT_EQ(ScoringScorerFactory::GetScoringNames(names, wrongKind).GetErrorCode(), 260006);
  EXPECT_EQ(ScoringScorerFactory::GetModelNames(models, wrongKind).GetErrorCode(), 260005);
  EXPECT_EQ(Dispatch(wrongKind), "null");

  QZSettings settings = Registry({{"TreeModel", "QZTestStream"}, {"Veritor", "QZTestDom"}});
  ASSERT_TRUE(ScoringScorerFactory::GetScoringNames(names, settings).IsOK());
  EXPECT_EQ(names, (std::map<std::string, std::string>{{"TreeModel", "QZTestStream"},
                                                       {"Veritor", "QZTestDom"}}));
  ASSERT_TRUE(ScoringScorerFactory::GetModelNames(models, settings).IsOK());
  EXPECT_EQ(models, (std::vector<std::string>{"MiningModel", "TreeModel"}));
}

TEST(ScorerFactory, DispatchPicksThePluginByTypeAndVersion) {
  const std::string streamed = "stream:" + std::to_string(sizeof(kTreeDocument) - 1) + ":0";
  EXPECT_EQ(Dispatch(Registry({{"TreeModel", "QZTestStream"}})), streamed);

  // "4.1" is always accepted; another version goes to the Veritor entry.
  QZSettings settings = Registry({{"TreeModel", "QZTestStream"}, {"Veritor", "QZTestDom"}}, "4.1");
  settings.AddSetting("versionSupported", "3.2", true);
  EXPECT_EQ(Dispatch(settings), streamed);
  EXPECT_EQ(Dispatch(Registry({{"TreeModel", "QZTestStream"}, {"Veritor", "QZTestDom"}}, "3.2")),
            "element:TreeModel");
  settings = Registry({{"TreeModel", "QZTestDom"}, {"Veritor", "QZTestStream"}}, "3.2");
  settings.AddSetting("versionSupported", "3.2", true);
  EXPECT_EQ(Dispatch(settings), "element:TreeModel");

  // A model type without an entry of its own goes to Veritor too.
  EXPECT_EQ(Dispatch(Registry({{"Veritor", "QZTestStream"}}, "4.0", "MiningModel")), streamed);

  // No entry for the type and no Veritor: nothing is loaded, no scorer.
  EXPECT_EQ(Dispatch(Registry({{"TreeModel", "QZTestStream"}}, "3.2")), "null");
  EXPECT_EQ(Dispatch(Registry({{"TreeModel", ""}})), "null");
}

TEST(ScorerFactory, StreamAttemptFallsBackToTheParsedElement) {
  // The DOM plug-in reads the whole stream and gives null: the element attempt must see
  // the document from its start.
  EXPECT_EQ(Dispatch(Registry({{"TreeModel", "QZTestDom"}})), "element:TreeModel");

  // The model element is searched by the model-names list, at any depth.
  const std::string nested =
      "<PMML version=\"4.0\"><Header/><MiningModel><Segmentation><Segment>"
      "<TreeModel/></Segment></Segmentation></MiningModel></PMML>";
  EXPECT_EQ(Dispatch(Registry({{"TreeModel", "QZTestDom"}}), nested), "element:MiningModel");

  // Not XML, not PMML, or no listed model element: the element attempt fails too.
  EXPECT_EQ(Dispatch(Registry({{"TreeModel", "QZTestDom"}}), "not xml at all"), "null");
  EXPECT_EQ(Dispatch(Registry({{"TreeModel", "QZTestDom"}}), "<Other><TreeModel/></Other>"),
            "null");
  EXPECT_EQ(Dispatch(Registry({{"TreeModel", "QZTestDom"}}),
                     "<PMML><NeuralNetwork/></PMML>"),
            "null");
  EXPECT_EQ(Dispatch(Registry({{"TreeModel", "QZTestDom"}}), "<PMML><TreeModel></PMML>"),
            "null");
}

TEST(ScorerFactory, BrokenPluginsGiveNoScorerAndNoException) {
  for (const char* plugin : {"QZTestNullParser", "QZTestNoEntry", "QZTestThrows",
                             "QZNoSuchPlugin"}) {
    SCOPED_TRACE(plugin);
    EXPECT_EQ(Dispatch(Registry({{"TreeModel", plugin}})), "null");
  }

  // The loader keeps the system's reason for each failure.
  QZScoring_800::ScoringDynamicLoadedLibrary missing("QZNoSuchPlugin800r.dll", 1);
  EXPECT_NE(missing.LoadLibraryNow(), 0);
  EXPECT_NE(missing.GetErrorString(), "");
  QZScoring_800::ScoringDynamicLoadedLibrary noEntry("QZTestNoEntry800r.dll", 1);
  EXPECT_EQ(noEntry.LoadLibraryNow(), 0);
  EXPECT_EQ(noEntry.GetErrorString(), "");
  EXPECT_EQ(noEntry.GetSymbolAddress("GetScoreParser"), nullptr);
  EXPECT_NE(noEntry.GetErrorString(), "");
  EXPECT_EQ(noEntry.LoadLibraryNow(), 0);
  EXPECT_EQ(noEntry.GetErrorString(), "");
}

TEST(ScorerFactory, GetDOMDocumentRewindsOnlyAHealthyStream) {
  const std::vector<std::string> models{"TreeModel"};
  xercesc::DOMDocument* document = nullptr;
  xercesc::DOMElement* element = nullptr;

  QZXML_800::QZSafeDOMParser parser;
  std::istringstream consumed(kTreeDocument);
  consumed.ignore(1000);  // at end of file, fail bit set
  EXPECT_TRUE(ScoringScorerFactory::GetDOMDocument(models, consumed, &parser, document, element)
                  .IsOK());
  ASSERT_NE(element, nullptr);
  EXPECT_EQ(element->getOwnerDocument(), document);

  QZXML_800::QZSafeDOMParser second;
  std::istringstream bad(kTreeDocument);
  bad.setstate(std::ios::badbit);
  EXPECT_EQ(ScoringScorerFactory::GetDOMDocument(models, bad, &second, document, element)
                .GetErrorCode(),
            260010);
  EXPECT_EQ(document, nullptr);
  EXPECT_EQ(element, nullptr);

  // A document type declaration is refused, whatever it declares.
  QZXML_800::QZSafeDOMParser third;
  std::istringstream hostile(
      "<?xml version=\"1.0\"?><!DOCTYPE PMML [<!ENTITY x SYSTEM \"file:///etc/hostname\">]>"
      "<PMML><TreeModel>&x;</TreeModel></PMML>");
  EXPECT_EQ(ScoringScorerFactory::GetDOMDocument(models, hostile, &third, document, element)
                .GetErrorCode(),
            260010);
  EXPECT_EQ(ScoringScorerFactory::GetDOMDocument(models, hostile, nullptr, document, element)
                .GetErrorCode(),
            260010);
}

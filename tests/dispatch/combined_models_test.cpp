// Combined models end to end through the factory: multi models from streams and files,
// split models keyed by one and two split fields, the status codes and ownership.
// The documents are scored by the echo plug-in: "prediction" is the document's target
// name, "probability" its input field's value (status 78 when that field is missing).

#include <cstdio>
#include <fstream>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "ScoringFactory.h"
#include "ScoringModel.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringFactory;
using QZScoring_800::ScoringModel;
using QZXML_800::QZSettings;
using QZXML_800::QZVecValue;
using Names = std::vector<std::string>;

namespace {

// A tree document with a continuous input, one or more categorical targets and any
// further data fields (not in the mining schema).
std::string Document(const std::string& input, const Names& targets,
                     const std::string& extraFields = "") {
  std::string fields = "<DataField name=\"" + input + "\" optype=\"continuous\" dataType=\"double\"/>";
  std::string schema = "<MiningField name=\"" + input + "\"/>";
  for (const std::string& target : targets) {
    fields += "<DataField name=\"" + target + "\" optype=\"categorical\" dataType=\"string\">"
              "<Value value=\"Y\"/></DataField>";
    schema += "<MiningField name=\"" + target + "\" usageType=\"predicted\"/>";
  }
  return "<PMML version=\"4.1\"><Header><Application name=\"app-" + targets.front() +
         "\" version=\"1\"/></Header><DataDictionary>" + fields + extraFields +
         "</DataDictionary><TreeModel modelName=\"m-" + targets.front() +
         "\" functionName=\"classification\"><MiningSchema>" + schema +
         "</MiningSchema><Node/></TreeModel></PMML>";
}

QZSettings Registry() {
  QZSettings scoring, models, settings;
  scoring.AddSetting("TreeModel", "QZTestEcho", false);
  models.AddSetting("TreeModel", "", false);
  settings.AddSetting("scoringDll", scoring, true);
  settings.AddSetting("modelDll", models, true);
  return settings;
}

// Owns the streams of a stream list.
struct Streams {
  explicit Streams(const Names& documents) {
    for (const std::string& document : documents) {
      owned.push_back(std::make_unique<std::stringstream>(document));
      list.push_back(owned.back().get());
    }
  }
  std::vector<std::unique_ptr<std::stringstream>> owned;
  std::vector<std::stringstream*> list;
};

// Temporary PMML files, removed with the object.
struct Files {
  explicit Files(const Names& documents) {
    for (size_t i = 0; i < documents.size(); ++i) {
      paths.push_back(::testing::TempDir() + "qz_combined_" + std::to_string(i) + ".pmml");
      std::ofstream(paths.back()) << documents[i];
    }
  }
  ~Files() {
    for (const std::string& path : paths) std::remove(path.c_str());
  }
  Names paths;
};

ValueRecord Record(std::initializer_list<std::pair<const char*, Value>> fields) {
  ValueRecord record;
  for (const auto& [name, value] : fields) record.Add(name, value);
  return record;
}

QZSettings SplitSettings(const Names& fields, const Names& ids,
                         const std::vector<std::vector<Value>>& keys) {
  QZSettings split;
  split.AddSetting("scoring_splitFields", fields, true);
  split.AddSetting("scoring_splitModelIDs", ids, true);
  for (size_t i = 0; i < keys.size(); ++i) {
    split.AddSetting(ids[i], new QZVecValue<Value>(keys[i]), true);
  }
  QZSettings settings = Registry();
  settings.AddSetting("scoring_splitModel", split, true);
  return settings;
}

}  // namespace

// Each sub-model's outputs come back under its model ID, from streams and from files;
// a sub-model that fails on a record leaves its entries as they were.
TEST(CombinedModels, MultiModelGathersOutputsPerModelId) {
  const Names documents = {Document("x", {"ta"}), Document("y", {"tb"})};
  Streams streams(documents);
  Files files(documents);
  for (bool fromFiles : {false, true}) {
    SCOPED_TRACE(fromFiles ? "files" : "streams");
    ScoringFactory factory;
    QZSettings settings = Registry();
    settings.AddSetting("scoring_modelIDs", Names{"A", "B"}, true);
    settings.AddSetting("scoring_pmmlFiles", files.paths, true);
    ScoringModel* model = fromFiles ? factory.CreateScoringModel(settings)
                                    : factory.CreateScoringModel(settings, streams.list);
    ASSERT_NE(model, nullptr) << factory.GetStatus().GetErrorCode();
    EXPECT_EQ(model->GetScoringModelType(), ScoringModel::SCORING_MULTI_MODEL);
    EXPECT_EQ(model->GetSubType(), "TreeModel");

    ValueRecord output;
    ASSERT_TRUE(model->Scorable(output).IsOK());
    EXPECT_EQ(output.Get("prediction").GetEntryNames(), (Names{"A", "B"}));

    ValueRecord input = Record({{"x", 1.5}, {"y", 2.5}});
    ASSERT_TRUE(model->Score(input, output).IsOK());
    EXPECT_EQ(output["prediction"]["A"].GetString(), "ta");
    EXPECT_EQ(output["prediction"]["B"].GetString(), "tb");
    EXPECT_EQ(output["probability"]["B"].GetReal(), 2.5);

    input["x"] = 7.0;
    input["y"] = Value();  // B fails (78); the combined model does not
    ASSERT_TRUE(model->Score(input, output).IsOK());
    EXPECT_EQ(output["probability"]["A"].GetReal(), 7.0);
    EXPECT_EQ(output["probability"]["B"].GetReal(), 2.5);
  }
}

// The multi forms' statuses, a held model kept, and the shorter of the ID and document
// lists deciding the sub-models; nothing new is held after a failure.
TEST(CombinedModels, MultiFormsStatusesAndListLengths) {
  const Names documents = {Document("x", {"ta"}), Document("y", {"tb"})};
  auto withIds = [](const Names& ids) {
    QZSettings settings = Registry();
    settings.AddSetting("scoring_modelIDs", ids, true);
    return settings;
  };
  struct Case { const char* what; QZSettings settings; Names documents; long code; Names ids; };
  const Case cases[] = {
      {"two streams, no IDs", Registry(), documents, 260028, {}},
      {"more IDs than streams", withIds({"A", "B", "C"}), documents, 0, {"A", "B"}},
      {"fewer IDs than streams", withIds({"A"}), documents, 0, {"A"}},
      {"a failing document", withIds({"A", "B"}), {documents[0], "not xml"}, 260007, {}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.what);
    ScoringFactory factory;
    QZSettings settings = c.settings;
    ScoringModel* model = factory.CreateScoringModel(settings, Streams(c.documents).list);
    EXPECT_EQ(factory.GetStatus().GetErrorCode(), c.code);
    ValueRecord output;
    if (model != nullptr) model->Scorable(output);
    EXPECT_EQ(output.Get("prediction").GetEntryNames(), c.ids);
    if (c.code != 0) {
      EXPECT_EQ(factory.Detach(), nullptr);
    }
  }

  // One stream without IDs is the single-document form; a held model is neither
  // replaced nor deleted by a combined form.
  ScoringFactory factory;
  QZSettings settings = Registry();
  Streams one({documents[0]});
  ScoringModel* solo = factory.CreateScoringModel(settings, one.list);
  ASSERT_NE(solo, nullptr);
  EXPECT_EQ(solo->GetScoringModelType(), ScoringModel::SCORING_SOLO_MODEL);
  QZSettings ids = withIds({"A"});
  EXPECT_EQ(factory.CreateScoringModel(ids, one.list), nullptr);
  EXPECT_EQ(factory.GetStatus().GetErrorCode(), 260002);
  std::unique_ptr<ScoringModel> taken(factory.Detach());
  EXPECT_EQ(taken.get(), solo);

  // The settings form: 260003 for one empty name (and the one-file form is not tried
  // again until Detach) and for files without IDs; a file that cannot be opened fails
  // the multi model, whose IDs may come as a list of values.
  Files files(documents);
  settings.AddSetting("scoring_pmmlFiles", Names{""}, true);
  EXPECT_EQ(factory.CreateScoringModel(settings), nullptr);
  EXPECT_EQ(factory.GetStatus().GetErrorCode(), 260003);
  settings.AddSetting("scoring_pmmlFiles", Names{files.paths[0]}, true);
  EXPECT_EQ(factory.CreateScoringModel(settings), nullptr);
  factory.Detach();
  ASSERT_NE(factory.CreateScoringModel(settings), nullptr);
  taken.reset(factory.Detach());
  settings.AddSetting("scoring_pmmlFiles", files.paths, true);
  EXPECT_EQ(factory.CreateScoringModel(settings), nullptr);
  EXPECT_EQ(factory.GetStatus().GetErrorCode(), 260003);
  settings.AddSetting("scoring_modelIDs", new QZVecValue<Value>({Value("A"), Value("B")}), true);
  settings.AddSetting("scoring_pmmlFiles", Names{files.paths[0], "/no/such.pmml"}, true);
  EXPECT_EQ(factory.CreateScoringModel(settings), nullptr);
  EXPECT_EQ(factory.GetStatus().GetErrorCode(), 260004);
  EXPECT_EQ(factory.Detach(), nullptr);
}

// A split model keyed by a number and a text picks the sub-model of the record's key,
// also when the input layout changes; a key of no sub-model and a missing split field
// are statuses that do not stick.
TEST(CombinedModels, SplitModelChoosesSubModelByKey) {
  const std::string colorField =
      "<DataField name=\"color\" optype=\"categorical\" dataType=\"string\">"
      "<Value value=\"red\" displayValue=\"Red\"/><Value value=\"blue\"/></DataField>";
  auto region = [](const char* category) {
    return std::string("<DataField name=\"region\" optype=\"categorical\" dataType=\"string\">"
                       "<Value value=\"") + category + "\"/></DataField>";
  };
  Streams streams({Document("x", {"ta"}, region("s")), Document("x", {"tb"}, colorField),
                   Document("x", {"tc"}, region("n"))});
  QZSettings settings = SplitSettings({"k", "r"}, {"A", "B", "C"},
                                      {{2.0, "n"}, {1.0, "s"}, {1.0, "n"}});
  ScoringFactory factory;
  ScoringModel* model = factory.CreateScoringModel(settings, streams.list);
  ASSERT_NE(model, nullptr) << factory.GetStatus().GetErrorCode();
  EXPECT_EQ(model->GetScoringModelType(), ScoringModel::SCORING_SPLIT_MODEL);
  // The first sub-model is the smallest key, (1, "n"): document C.
  EXPECT_EQ(model->GetAppName(), "app-tc");
  // Variables of every sub-model; a categorical one that only a later sub-model has
  // comes with its categories and labels; a shared one gets the categories of all.
  const QZXML_800::QZVarList& variables = model->GetVarList();
  EXPECT_EQ(variables.Size(), 6);
  EXPECT_EQ(variables.GetVariable("region")->GetEncoder()->GetCount(), 2);
  ASSERT_NE(variables.GetVariable("color"), nullptr);
  EXPECT_EQ(variables.GetVariable("color")->GetEncoder()->GetLabels(), (Names{"Red", "blue"}));

  ValueRecord output;
  ASSERT_TRUE(model->Scorable(output).IsOK());
  ValueRecord input = Record({{"k", 1.0}, {"r", "s"}, {"x", 3.0}});
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_EQ(output.Get("prediction").GetString(), "tb");
  EXPECT_EQ(output.Get("probability").GetReal(), 3.0);

  input["k"] = "1";  // a text never equals a number: no key matches
  EXPECT_EQ(model->Score(input, output).GetErrorCode(), 260009);
  EXPECT_TRUE(output.Get("prediction").IsNull());

  ValueRecord reordered = Record({{"x", 4.0}, {"r", "n"}, {"k", 2.0}});
  ASSERT_TRUE(model->Score(reordered, output).IsOK());
  EXPECT_EQ(output.Get("prediction").GetString(), "ta");
  ValueRecord withoutR = Record({{"k", 1.0}, {"x", 4.0}});
  EXPECT_EQ(model->Score(withoutR, output).GetErrorCode(), 260027);
  input["r"] = "n";
  input["k"] = 1.0;
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_EQ(output.Get("prediction").GetString(), "tc");
}

// One split field with text keys; a split field missing from the first record; a
// repeated key (its sub-model is deleted); an ID without a key of its own (skipped with
// its stream); a failing document.
TEST(CombinedModels, SplitFormSkipsAndRefuses) {
  Streams streams({Document("x", {"ta"}), Document("x", {"tb"}), "not xml",
                   Document("x", {"td"})});
  QZSettings split;
  split.AddSetting("scoring_splitFields", Names{"r"}, true);
  split.AddSetting("scoring_splitModelIDs", Names{"A", "B", "C", "D"}, true);
  split.AddSetting("A", Names{"n"}, true);
  split.AddSetting("B", Names{"s"}, true);
  split.AddSetting("D", Names{"n"}, true);  // the key of A again
  QZSettings settings = Registry();
  settings.AddSetting("scoring_splitModel", split, true);
  ScoringFactory factory;
  ScoringModel* model = factory.CreateScoringModel(settings, streams.list);
  ASSERT_NE(model, nullptr) << factory.GetStatus().GetErrorCode();
  ValueRecord output;
  ValueRecord first = Record({{"x", 1.0}});
  EXPECT_EQ(model->Score(first, output).GetErrorCode(), 260027);
  ValueRecord input = Record({{"r", "n"}, {"x", 1.0}});
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_EQ(output.Get("prediction").GetString(), "ta");

  // With C keyed, its document fails the whole split model.
  split.AddSetting("C", Names{"e"}, true);
  settings.AddSetting("scoring_splitModel", split, true);
  ScoringFactory failing;
  Streams again({Document("x", {"ta"}), Document("x", {"tb"}), "not xml"});
  EXPECT_EQ(failing.CreateScoringModel(settings, again.list), nullptr);
  EXPECT_EQ(failing.GetStatus().GetErrorCode(), 260007);
  EXPECT_EQ(failing.Detach(), nullptr);
}

// Once Scorable has seen a sub-model with two targets, the output of a single-target
// sub-model is nested under its target name; before that it is flat.
TEST(CombinedModels, SplitModelNestsSingleTargetOutputAfterScorable) {
  Streams streams({Document("x", {"ta"}), Document("x", {"t1", "t2"})});
  QZSettings settings = SplitSettings({"k"}, {"A", "B"}, {{1.0}, {2.0}});
  ScoringFactory factory;
  ScoringModel* model = factory.CreateScoringModel(settings, streams.list);
  ASSERT_NE(model, nullptr) << factory.GetStatus().GetErrorCode();
  ValueRecord input = Record({{"k", 1.0}, {"x", 5.0}});
  ValueRecord output = Record({{"prediction", Value()}, {"probability", Value()}});
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_EQ(output.Get("prediction").GetString(), "ta");

  ASSERT_TRUE(model->Scorable(output).IsOK());
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_EQ(output["prediction"]["ta"].GetString(), "ta");
  EXPECT_EQ(output["probability"]["ta"].GetReal(), 5.0);
  input["k"] = 2.0;  // two targets: flat
  ASSERT_TRUE(model->Score(input, output).IsOK());
  EXPECT_EQ(output.Get("prediction").GetString(), "t1");
}

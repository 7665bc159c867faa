// The abstract model: attributes read through the attribute record, ownership of what
// the model holds, and copying.

#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "QZTransformation.h"
#include "ScoringAbsModel.h"
#include "ScoringAdjustedPropensity.h"
#include "ScoringModelAttr.h"
#include "ScoringOutputField.h"

using QZCommon_800::QZStatus;
using QZCommon_800::ValueRecord;
using QZScoring_800::QZScoringConst;
using QZScoring_800::ScoringAbsModel;
using QZScoring_800::ScoringModelAttr;
using QZScoring_800::ScoringOutputField;
using QZTransformNS_8_0_0::QZTransformation;

namespace {

class PlainModel : public ScoringAbsModel {
 public:
  PlainModel() = default;
  PlainModel(const QZXML_800::QZSettings& s, const QZXML_800::QZVarList& v)
      : ScoringAbsModel(s, v) {}
  QZScoring_800::ScoringModel* Clone() const override { return nullptr; }
  QZStatus Score(ValueRecord&, ValueRecord&) override { return QZStatus(); }
  QZStatus Scorable(ValueRecord&) override { return QZStatus(); }
};

// Without a record every record attribute is empty and its setters do nothing.
TEST(AbsModel, WithoutRecordGivesEmptyResults) {
  PlainModel model;
  model.SetModelName("m");
  model.SetType(QZScoringConst::MODEL_TREE);
  EXPECT_EQ(model.GetType(), QZScoringConst::MODEL_UNKNOWN);
  for (const std::string& text : {model.GetAlgName(), model.GetModelName(), model.GetVersion(),
                                  model.GetModelID(), model.GetAppName(), model.GetAppVersion()}) {
    EXPECT_EQ(text, "");
  }
  EXPECT_EQ(model.GetOutputField("probability", ""), nullptr);
  EXPECT_TRUE(model.GetOutputFields().empty());
}

// The type is computed from the record on first use; 16 (transformations only) is
// cached, 0 never is.
TEST(AbsModel, TypeComesFromRecord) {
  PlainModel transformationsOnly, unknown;
  auto* record = new ScoringModelAttr();
  record->SetHasTransformationDictionary(true);
  transformationsOnly.SetScoreModelAtts(record);
  EXPECT_EQ(transformationsOnly.GetType(), QZScoringConst::MODEL_TRANSFORMATIONS);
  record->SetModelElement("TreeModel");
  EXPECT_EQ(transformationsOnly.GetType(), QZScoringConst::MODEL_TRANSFORMATIONS);

  record = new ScoringModelAttr();
  record->SetModelElement("NoSuchModel");
  record->SetHasTransformationDictionary(true);
  unknown.SetScoreModelAtts(record);
  EXPECT_EQ(unknown.GetType(), QZScoringConst::MODEL_UNKNOWN);
  record->SetModelElement("TreeModel");
  EXPECT_EQ(unknown.GetType(), QZScoringConst::MODEL_TREE);
}

// Setters store only non-empty texts; replaced objects are freed, the one held is not
// (checked by the leak checker); the first output field of a feature is found.
TEST(AbsModel, SettersOwnershipAndOutputFields) {
  PlainModel model;
  auto* record = new ScoringModelAttr();
  for (const char* value : {"yes", "no"}) {
    auto* field = new ScoringOutputField();
    field->SetName(std::string("p-") + value);
    field->SetFeature("probability");
    field->SetValue(value);
    record->AddOutputField(field);
  }
  model.SetScoreModelAtts(record);
  model.SetModelName("churn");
  model.SetModelName("");
  EXPECT_EQ(model.GetModelName(), "churn");
  model.SetDerivedFields({"a", "b"});
  model.SetDerivedFields({});
  EXPECT_EQ(model.GetDerivedFields(), (std::vector<std::string>{"a", "b"}));

  EXPECT_EQ(model.GetOutputField("probability", "")->GetName(), "p-yes");
  EXPECT_EQ(model.GetOutputField("probability", "no")->GetName(), "p-no");
  EXPECT_EQ(model.GetOutputField("probability", "No"), nullptr);
  EXPECT_EQ(model.GetOutputField("", ""), nullptr);

  model.SetScoreModelAtts(record);
  model.SetScoreModelAtts(nullptr);
  EXPECT_EQ(model.GetOutputFields().size(), 2u);
  model.SetScoreModelAtts(new ScoringModelAttr());
  EXPECT_EQ(model.GetModelName(), "");

  auto* engine = new QZTransformation();
  model.SetTransformation(engine);
  model.SetTransformation(engine);
  EXPECT_EQ(model.GetTransformation(), engine);
  model.SetTransformation(nullptr);
  EXPECT_EQ(model.GetTransformation(), nullptr);
  model.SetAdjustedPropensity(new QZScoring_800::ScoringAdjustedPropensity(nullptr, nullptr));
  model.SetAdjustedPropensity(new QZScoring_800::ScoringAdjustedPropensity(nullptr, nullptr));
}

// Copies take the settings, variable list and lists, never the owned objects.
TEST(AbsModel, CopyLeavesOwnedObjectsBehind) {
  QZXML_800::QZSettings settings;
  settings.AddSetting("encoding", "UTF-8", true);
  QZXML_800::QZVarList variables;
  variables.AddContVar("x", "x", QZXML_800::ROLE_INPUT);
  PlainModel model(settings, variables);
  model.SetScoreModelAtts(new ScoringModelAttr());
  model.SetModelName("churn");
  model.SetSubType("TreeModel");
  model.SetDerivedFields({"d"});
  model.SetNeedDerivedPredictor(true);
  model.SetTransformation(new QZTransformation());

  PlainModel copy(model), assigned;
  assigned.SetScoreModelAtts(new ScoringModelAttr());
  assigned = model;
  for (const PlainModel* m : {&copy, &assigned}) {
    EXPECT_EQ(m->GetSettings(), settings);
    EXPECT_EQ(m->GetVarList().Size(), 1);
    EXPECT_EQ(m->GetSubType(), "TreeModel");
    EXPECT_EQ(m->GetDerivedFields(), std::vector<std::string>{"d"});
    EXPECT_TRUE(m->NeedDerivedPredictor());
    EXPECT_EQ(m->GetModelName(), "");
    EXPECT_EQ(m->GetTransformation(), nullptr);
  }
  EXPECT_NE(model.GetTransformation(), nullptr);
}

}  // namespace

// Output fields, and the attribute record that owns them.

#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "ScoringModelAttr.h"
#include "ScoringOutputField.h"

using QZScoring_800::QZScoringConst;
using QZScoring_800::ScoringModelAttr;
using QZScoring_800::ScoringOutputField;

// Defaults, and setters that never clear a field with an empty text.
TEST(OutputField, DefaultsAndSettersKeepTextOnEmptyArgument) {
  ScoringOutputField field;
  EXPECT_EQ(field.GetName(), "");
  EXPECT_EQ(field.GetRuleFeature(), "consequent");
  EXPECT_EQ(field.GetAlgorithm(), "exclusiveRecommendation");
  EXPECT_EQ(field.GetRank(), 1);
  EXPECT_EQ(field.GetRankBasis(), "confidence");
  EXPECT_EQ(field.GetRankOrder(), "descending");
  EXPECT_FALSE(field.IsMultiValued());

  field.SetAlgorithm("");
  EXPECT_EQ(field.GetAlgorithm(), "exclusiveRecommendation");
  field.SetValue("yes");
  field.SetValue("");
  EXPECT_EQ(field.GetValue(), "yes");
  field.SetRank(0);
  EXPECT_EQ(field.GetRank(), 0);
  field.SetMultiValued(true);
  field.SetMultiValued(false);
  EXPECT_FALSE(field.IsMultiValued());
  std::ostringstream out;
  field.Display(out);
  EXPECT_EQ(out.str(), "");
}

// Copies carry every field; self-assignment changes nothing.
TEST(OutputField, CopyAndAssignmentCarryAllFields) {
  ScoringOutputField field;
  field.SetName("p");
  field.SetDisplayName("Probability");
  field.SetOPType("continuous");
  field.SetDataType("double");
  field.SetTargetField("t");
  field.SetFeature("probability");
  field.SetValue("yes");
  field.SetRuleFeature("antecedent");
  field.SetAlgorithm("recommendation");
  field.SetRank(3);
  field.SetRankBasis("support");
  field.SetRankOrder("ascending");
  field.SetMultiValued(true);

  ScoringOutputField assigned;
  assigned = field;
  for (const ScoringOutputField& copy : {ScoringOutputField(field), assigned}) {
    EXPECT_EQ(copy.GetName(), "p");
    EXPECT_EQ(copy.GetDisplayName(), "Probability");
    EXPECT_EQ(copy.GetOPType(), "continuous");
    EXPECT_EQ(copy.GetDataType(), "double");
    EXPECT_EQ(copy.GetTargetField(), "t");
    EXPECT_EQ(copy.GetFeature(), "probability");
    EXPECT_EQ(copy.GetValue(), "yes");
    EXPECT_EQ(copy.GetRuleFeature(), "antecedent");
    EXPECT_EQ(copy.GetAlgorithm(), "recommendation");
    EXPECT_EQ(copy.GetRank(), 3);
    EXPECT_EQ(copy.GetRankBasis(), "support");
    EXPECT_EQ(copy.GetRankOrder(), "ascending");
    EXPECT_TRUE(copy.IsMultiValued());
  }
  ScoringOutputField& self = assigned;
  assigned = self;
  EXPECT_EQ(assigned.GetDisplayName(), "Probability");
}

// The record takes a field only when its name is new, and copies lists independently
// (its own list included).
TEST(ModelAttr, OwnsOutputFieldsOfDistinctNames) {
  ScoringModelAttr record;
  EXPECT_FALSE(record.AddOutputField(nullptr));
  auto first = std::make_unique<ScoringOutputField>();
  first->SetName("a");
  first->SetFeature("predictedValue");
  ASSERT_TRUE(record.AddOutputField(first.get()));
  first.release();
  ScoringOutputField duplicate;
  duplicate.SetName("a");
  EXPECT_FALSE(record.AddOutputField(&duplicate));
  ScoringOutputField* second = new ScoringOutputField;
  second->SetName("b");
  ASSERT_TRUE(record.AddOutputField(second));
  ASSERT_EQ(record.GetOutputFields().size(), 2u);

  ScoringModelAttr other;
  other.CopyOutputFields(record.GetOutputFields());
  ASSERT_EQ(other.GetOutputFields().size(), 2u);
  EXPECT_NE(other.GetOutputFields()[0], record.GetOutputFields()[0]);
  EXPECT_EQ(other.GetOutputFields()[0]->GetFeature(), "predictedValue");
  record.CopyOutputFields(record.GetOutputFields());
  ASSERT_EQ(record.GetOutputFields().size(), 2u);
  EXPECT_EQ(record.GetOutputFields()[1]->GetName(), "b");
  record.ClearOutputFields();
  EXPECT_TRUE(record.GetOutputFields().empty());
  EXPECT_EQ(other.GetOutputFields().size(), 2u);
}

// The model type comes from the model element, else from a transformation dictionary,
// and is kept once known; the propensity stream is replaced, never double-deleted.
TEST(ModelAttr, ModelTypeAndPropensityStream) {
  ScoringModelAttr record;
  EXPECT_EQ(record.GetEncoding(), "UTF-8");
  EXPECT_EQ(record.GetModelType(), QZScoringConst::MODEL_UNKNOWN);
  record.SetHasTransformationDictionary(true);
  EXPECT_EQ(record.GetModelType(), QZScoringConst::MODEL_TRANSFORMATIONS);
  record.SetModelElement("TreeModel");
  EXPECT_EQ(record.GetModelType(), QZScoringConst::MODEL_TRANSFORMATIONS);  // cached

  ScoringModelAttr tree;
  tree.SetModelElement("TreeModel");
  tree.SetHasTransformationDictionary(true);
  EXPECT_EQ(tree.GetModelType(), QZScoringConst::MODEL_TREE);
  tree.SetModelType(QZScoringConst::MODEL_HRZXML);
  EXPECT_EQ(tree.GetModelType(), QZScoringConst::MODEL_HRZXML);

  EXPECT_EQ(tree.GetAdjustedPropensityStream(), nullptr);
  auto* stream = new std::stringstream("one");
  tree.SetAdjustedPropensityStream(stream);
  tree.SetAdjustedPropensityStream(stream);
  EXPECT_EQ(tree.GetAdjustedPropensityStream()->str(), "one");
  tree.SetAdjustedPropensityStream(new std::stringstream("two"));
  EXPECT_EQ(tree.GetAdjustedPropensityStream()->str(), "two");
}

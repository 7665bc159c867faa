// The variable list, the two variable kinds and their encoders.

#include <limits>
#include <memory>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "QZMV.h"
#include "QZVarList.h"
#include "XMLElement.h"

using QZCommon_800::QZMV;
using namespace QZXML_800;

namespace {

const double kLowest = std::numeric_limits<double>::lowest();
const double kLargest = std::numeric_limits<double>::max();
const double kNaN = std::numeric_limits<double>::quiet_NaN();

// A variable of another implementation than the library's, as a plug-in might write.
class ForeignVariable : public IQZVariable {
 public:
  explicit ForeignVariable(std::string name) : name_(std::move(name)) {}
  IQZVariable* Clone() const override { return new ForeignVariable(*this); }
  std::string GetName() const override { return name_; }
  std::string GetLabel() const override { return name_; }
  MeasureLevel GetMeasureLevel() const override { return ML_CONTINUOUS; }
  int GetNumCategories() const override { return 0; }
  VariableRole GetRole() const override { return role_; }
  void SetRole(VariableRole role) override { role_ = role; }
  int GetStorageType() const override { return 0; }
  void SetStorageType(int) override {}
  bool GetFlagMeasure() const override { return false; }
  void SetFlagMeasure(bool) override {}
  const XMLElement* GetFormat() const override { return nullptr; }
  void SetFormat(XMLElement* format) override { delete format; }
  IQZEncoder* GetEncoder() override { return nullptr; }
  const IQZEncoder* GetEncoder() const override { return nullptr; }

 private:
  std::string name_;
  VariableRole role_ = ROLE_NONE;
};

std::vector<int> Targets(const QZVarList& list) { return list.GetTargetIndices(); }

}  // namespace

// Adds return consecutive indices; empty and repeated names are refused and leave the
// list unchanged; lookups by index and name agree.
TEST(VarList, AddAndLookUp) {
  QZVarList list;
  EXPECT_EQ(0, list.AddContVar("age", "Age", ROLE_INPUT));
  EXPECT_EQ(1, list.AddCatVar("colour", "Colour", std::vector<std::string>{"r", "g"},
                              ROLE_NONE));
  EXPECT_EQ(2, list.AddCatVar("grade", "Grade", 4, ML_NUMERIC_CATEGORICAL, ROLE_NONE));
  EXPECT_EQ(-1, list.AddContVar("age", "again", ROLE_NONE));
  EXPECT_EQ(-1, list.AddCatVar("", "empty", std::vector<double>{1.0}, ROLE_NONE));
  EXPECT_EQ(-1, list.AddCatVar("level1", "bad level", 0, ML_CONTINUOUS, ROLE_NONE));
  // The capacity is a hint only: a huge one neither fails nor reserves it all.
  EXPECT_EQ(3, list.AddCatVar("many", "many", std::numeric_limits<int>::max(),
                              ML_STRING_CATEGORICAL, ROLE_NONE));
  EXPECT_EQ(4, list.Size());

  EXPECT_EQ(1, list.FindVariable("colour"));
  EXPECT_EQ(-1, list.FindVariable("Colour"));
  EXPECT_EQ(list.GetVarAt(2), list.GetVariable("grade"));
  EXPECT_EQ(nullptr, list.GetVariable("nope"));
  EXPECT_EQ(nullptr, list.GetVarAt(-1));
  EXPECT_EQ(nullptr, list.GetVarAt(4));
  EXPECT_EQ(nullptr, list.GetEncoderAt(4));
  EXPECT_EQ("Age", list.GetVarAt(0)->GetLabel());
  EXPECT_EQ(ML_STRING_CATEGORICAL, list.GetVarAt(1)->GetMeasureLevel());
  EXPECT_EQ(ML_NUMERIC_CATEGORICAL, list.GetVarAt(2)->GetMeasureLevel());
  EXPECT_EQ(0, list.GetVarAt(2)->GetNumCategories());
  EXPECT_EQ(2, list.GetEncoderAt(2)->GetValueType());
}

// A continuous variable covers the whole finite range by default, keeps an explicit
// range, and its number encoder holds missing values but never categories.
TEST(VarList, ContinuousVariable) {
  QZVarList list;
  list.AddContVar("x", "x", ROLE_NONE);
  list.AddContVar("y", "y", 0.0, 10.0, ROLE_NONE, true, 2);
  const auto* x = dynamic_cast<const QZContVar*>(list.GetVarAt(0));
  const auto* y = dynamic_cast<const QZContVar*>(list.GetVarAt(1));
  ASSERT_TRUE(x && y);
  EXPECT_EQ(kLowest, x->GetMinimum());
  EXPECT_EQ(kLargest, x->GetMaximum());
  EXPECT_EQ(10.0, y->GetMaximum());
  EXPECT_TRUE(y->GetIntegerFlag());
  EXPECT_EQ(2, y->GetDecimals());
  EXPECT_EQ(ML_CONTINUOUS, x->GetMeasureLevel());

  IQZEncoder* encoder = list.GetEncoderAt(0);
  ASSERT_NE(nullptr, encoder);
  EXPECT_EQ(2, encoder->GetValueType());
  EXPECT_EQ(-1, encoder->AddCategory(5.0));
  EXPECT_EQ(0, encoder->GetCount());
  EXPECT_EQ(0, list.GetVarAt(0)->GetNumCategories());
  encoder->AddMissingValue(99.0, "unknown");
  EXPECT_TRUE(encoder->IsMissingNumber(99.0));
  EXPECT_FALSE(encoder->IsMissingNumber(98.0));
}

// Categories keep their first position, are never added twice, take the label at their
// position (labels may be fewer), and are found in both representations.
TEST(VarList, CategoriesAndLabels) {
  QZVarList list;
  list.AddCatVar("s", "s", std::vector<std::string>{"a", "b", "a", "c"},
                 std::vector<std::string>{"A", "B", "A2"}, ROLE_NONE);
  const IQZEncoder* text = list.GetEncoderAt(0);
  EXPECT_EQ(3, text->GetCount());
  EXPECT_EQ((std::vector<std::string>{"A", "B"}), text->GetLabels());
  EXPECT_EQ(2.0, text->IndexOfString("c"));
  EXPECT_EQ(-1.0, text->IndexOfString("d"));
  EXPECT_EQ("b", text->GetStringAt(1));
  EXPECT_EQ("", text->GetStringAt(3));

  list.AddCatVar("n", "n", std::vector<double>{2.5, 1.0, kNaN, 2.5, -0.0, QZMV::Missing()},
                 std::vector<std::string>{"two and a half", "one", "nan", "dup", "", "m"},
                 ROLE_NONE);
  IQZEncoder* number = list.GetEncoderAt(1);
  EXPECT_EQ(3, number->GetCount());
  EXPECT_EQ((std::vector<std::string>{"two and a half", "one", ""}), number->GetLabels());
  EXPECT_EQ("2.5", number->GetStringAt(0));
  EXPECT_EQ(1.0, number->IndexOfNumber(1.0));
  EXPECT_EQ(2.0, number->IndexOfNumber(0.0));   // minus zero is zero
  EXPECT_EQ(0.0, number->IndexOfString(" 2.5 "));
  EXPECT_EQ(-1.0, number->IndexOfString("x"));
  EXPECT_EQ(-1.0, number->IndexOfNumber(kNaN));
  EXPECT_EQ(1, number->AddCategory(1.0));
  EXPECT_EQ(3, number->AddCategory("7"));
  EXPECT_EQ(-1, number->AddCategory("seven"));
  EXPECT_EQ(4, list.GetVarAt(1)->GetNumCategories());

  // A text encoder reads numbers by their text; its categories read as numbers.
  IQZEncoder* digits = list.GetEncoderAt(
      list.AddCatVar("d", "d", std::vector<std::string>{"10", "x"}, ROLE_NONE));
  EXPECT_EQ(0.0, digits->IndexOfNumber(10.0));
  EXPECT_EQ(10.0, digits->GetNumberAt(0));
  EXPECT_TRUE(QZMV::IsMissing(digits->GetNumberAt(1)));
  EXPECT_EQ(2, digits->AddCategory(3.0));
  EXPECT_EQ("3", digits->GetStringAt(2));
  EXPECT_TRUE(digits->GetLabels().empty());
}

// Missing values: listed numbers and texts (each also found in the other form), the
// inclusive range, and system-missing or NaN on every encoder.
TEST(VarList, MissingValues) {
  QZVarList list;
  list.AddCatVar("n", "n", std::vector<double>{1.0, 2.0}, ROLE_NONE);
  IQZEncoder* number = list.GetEncoderAt(0);
  EXPECT_TRUE(number->IsMissingNumber(QZMV::Missing()));
  EXPECT_TRUE(number->IsMissingNumber(kNaN));
  EXPECT_FALSE(number->IsMissingNumber(-1.0));
  number->AddMissingValue(-1.0, "refused");
  number->AddMissingValue("999", "unknown");
  number->SetMissingRange(100.0, 200.0);
  EXPECT_TRUE(number->IsMissingNumber(-1.0));
  EXPECT_TRUE(number->IsMissingNumber(999.0));
  EXPECT_TRUE(number->IsMissingNumber(100.0));
  EXPECT_TRUE(number->IsMissingNumber(200.0));
  EXPECT_FALSE(number->IsMissingNumber(200.5));
  EXPECT_FALSE(number->IsMissingNumber(1.0));
  EXPECT_TRUE(number->IsMissingString("-1"));
  EXPECT_TRUE(number->IsMissingString("150"));
  EXPECT_TRUE(number->IsMissingString("abc"));  // no number at all
  EXPECT_FALSE(number->IsMissingString("2"));
  EXPECT_EQ(2, number->GetCount());  // missing values are no categories

  list.AddCatVar("s", "s", std::vector<std::string>{"a"}, ROLE_NONE);
  IQZEncoder* text = list.GetEncoderAt(1);
  text->AddMissingValue(std::string("?"), "");
  text->AddMissingValue(-9.0, "");
  EXPECT_TRUE(text->IsMissingString("?"));
  EXPECT_TRUE(text->IsMissingString("-9"));
  EXPECT_TRUE(text->IsMissingNumber(-9.0));
  EXPECT_FALSE(text->IsMissingString("a"));
  EXPECT_FALSE(text->IsMissingString(""));
  EXPECT_TRUE(text->IsMissingNumber(QZMV::Missing()));
}

// The target indices stay ascending and current however a role changes: at the add,
// through the list, or through the variable itself; copies and moves keep tracking.
TEST(VarList, TargetIndicesFollowRoles) {
  QZVarList list;
  for (const char* name : {"a", "b", "c", "d"}) list.AddContVar(name, name, ROLE_INPUT);
  EXPECT_TRUE(Targets(list).empty());
  EXPECT_EQ(nullptr, list.GetTargetRespVariable());

  list.AddContVar("e", "e", ROLE_TARGET);
  EXPECT_TRUE(list.SetVariableRole(2, ROLE_TARGET));
  list.GetVarAt(0)->SetRole(ROLE_TARGET);
  list.GetVariable("c")->SetRole(ROLE_TARGET);  // already a target: no duplicate
  EXPECT_EQ((std::vector<int>{0, 2, 4}), Targets(list));
  EXPECT_EQ("a", list.GetTargetRespVariable()->GetName());
  EXPECT_FALSE(list.SetVariableRole(9, ROLE_TARGET));

  list.GetVarAt(0)->SetRole(ROLE_INPUT);
  EXPECT_EQ((std::vector<int>{2, 4}), Targets(list));
  EXPECT_EQ("c", list.GetTargetRespVariable()->GetName());

  QZVarList copy(list);
  copy.GetVarAt(1)->SetRole(ROLE_TARGET);
  list.GetVarAt(4)->SetRole(ROLE_NONE);
  EXPECT_EQ((std::vector<int>{1, 2, 4}), Targets(copy));
  EXPECT_EQ((std::vector<int>{2}), Targets(list));

  QZVarList moved(std::move(copy));
  moved.GetVarAt(3)->SetRole(ROLE_TARGET);
  EXPECT_EQ((std::vector<int>{1, 2, 3, 4}), Targets(moved));
  QZVarList assigned;
  assigned = std::move(moved);
  assigned.GetVarAt(1)->SetRole(ROLE_INPUT);
  EXPECT_EQ((std::vector<int>{2, 3, 4}), Targets(assigned));
  assigned = list;
  assigned.GetVarAt(0)->SetRole(ROLE_TARGET);
  EXPECT_EQ((std::vector<int>{0, 2}), Targets(assigned));
  EXPECT_EQ((std::vector<int>{2}), Targets(list));
}

// Copies are deep: categories, flags, formats and encoders of a copy are its own.
TEST(VarList, CopiesAreDeep) {
  QZVarList list;
  int index = list.AddCatVar("f", "Flag", std::vector<std::string>{"N", "Y"}, ROLE_TARGET);
  auto* flag = dynamic_cast<QZCatVar*>(list.GetVarAt(index));
  ASSERT_NE(nullptr, flag);
  flag->SetBinaryFlag(true, 1);
  flag->SetStorageType(STORAGE_STRING);
  XMLElement* format = XMLElement::Create("StringFormat");
  format->AddAttribute("width", "20");
  flag->SetFormat(format);

  QZVarList copy = list;
  QZVarList& same = copy;
  copy = same;  // self-assignment keeps the content
  list.GetEncoderAt(0)->AddCategory("maybe");
  flag->SetFormat(nullptr);
  flag->SetBinaryFlag(false, 1);

  const auto* copied = dynamic_cast<const QZCatVar*>(copy.GetVariable("f"));
  ASSERT_NE(nullptr, copied);
  EXPECT_EQ(2, copied->GetNumCategories());
  EXPECT_TRUE(copied->GetBinaryFlag());
  EXPECT_EQ(1, copied->GetBinaryFlagTrueIndex());
  EXPECT_EQ(STORAGE_STRING, copied->GetStorageType());
  ASSERT_NE(nullptr, copied->GetFormat());
  EXPECT_EQ("StringFormat", copied->GetFormat()->GetName());
  EXPECT_EQ(3, list.GetVarAt(0)->GetNumCategories());
  EXPECT_EQ(nullptr, flag->GetFormat());
  EXPECT_FALSE(flag->GetBinaryFlag());
  EXPECT_LT(flag->GetBinaryFlagTrueIndex(), 0);
  EXPECT_EQ(copied, copy.GetTargetRespVariable());
}

// Categorical marks: the ordinal flag, the binary flag with its true index, the flag
// measure; a new variable carries none of them.
TEST(VarList, CategoricalMarks) {
  QZCatVar variable("v", "V", ML_NUMERIC_CATEGORICAL, ROLE_NONE);
  EXPECT_FALSE(variable.GetOrdinalFlag());
  EXPECT_FALSE(variable.GetBinaryFlag());
  EXPECT_LT(variable.GetBinaryFlagTrueIndex(), 0);
  EXPECT_FALSE(variable.GetFlagMeasure());
  EXPECT_EQ(STORAGE_UNKNOWN, variable.GetStorageType());
  variable.SetOrdinalFlag(true);
  variable.SetFlagMeasure(true);
  variable.SetBinaryFlag(true, 0);
  EXPECT_TRUE(variable.GetOrdinalFlag());
  EXPECT_TRUE(variable.GetFlagMeasure());
  EXPECT_EQ(0, variable.GetBinaryFlagTrueIndex());

  // Any level but the numeric one gives text categories.
  QZCatVar odd("o", "O", ML_CONTINUOUS, ROLE_NONE);
  EXPECT_EQ(ML_STRING_CATEGORICAL, odd.GetMeasureLevel());
  EXPECT_EQ(3, odd.GetEncoder()->GetValueType());
}

// AddVariable takes ownership; refused variables are deleted (the leak checker would
// see otherwise), except one that already belongs to a list.
TEST(VarList, AddVariableOwnership) {
  QZVarList list;
  EXPECT_EQ(-1, list.AddVariable(nullptr));
  EXPECT_EQ(0, list.AddVariable(new QZContVar("a", "A", ROLE_NONE)));
  EXPECT_EQ(-1, list.AddVariable(new QZContVar("a", "again", ROLE_NONE)));
  EXPECT_EQ(-1, list.AddVariable(new QZCatVar("", "", ML_STRING_CATEGORICAL, ROLE_NONE)));
  EXPECT_EQ(-1, list.AddVariable(list.GetVarAt(0)));
  QZVarList other;
  EXPECT_EQ(-1, other.AddVariable(list.GetVarAt(0)));
  EXPECT_EQ(1, list.Size());
  EXPECT_EQ("A", list.GetVarAt(0)->GetLabel());

  // A clone belongs to no list and can be added elsewhere.
  EXPECT_EQ(0, other.AddVariable(list.GetVarAt(0)->Clone()));
  other.GetVarAt(0)->SetRole(ROLE_TARGET);
  EXPECT_EQ((std::vector<int>{0}), Targets(other));
  EXPECT_TRUE(Targets(list).empty());
}

// Variables of another implementation are accepted; their own role changes, which the
// list cannot observe, still show in the target indices.
TEST(VarList, ForeignVariables) {
  QZVarList list;
  list.AddContVar("mine", "mine", ROLE_TARGET);
  EXPECT_EQ(1, list.AddVariable(new ForeignVariable("theirs")));
  EXPECT_EQ(nullptr, list.GetEncoderAt(1));
  list.GetVarAt(1)->SetRole(ROLE_TARGET);
  EXPECT_EQ((std::vector<int>{0, 1}), Targets(list));
  list.GetVarAt(0)->SetRole(ROLE_NONE);
  EXPECT_EQ("theirs", list.GetTargetRespVariable()->GetName());

  QZVarList copy(list);
  EXPECT_EQ(1, copy.FindVariable("theirs"));
  EXPECT_EQ((std::vector<int>{1}), Targets(copy));
}

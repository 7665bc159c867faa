// The order of settings collections (Compare, ==, <): names, then values by kind and
// content, nested collections by their content, and one consistent order even for
// values of classes that cannot compare with each other, so collections can key maps.

#include <algorithm>
#include <memory>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "QZDisplay.h"
#include "QZSettings.h"

using namespace QZXML_800;

namespace {

// A text-kind value of another class than QZStringValue: comparable with its own class
// only.
class Code : public IQZSettingValue {
 public:
  explicit Code(int code) : code_(code) {}
  Code* Clone() const override { return new Code(*this); }
  bool Equals(const IQZSettingValue& other) const override {
    const auto* code = dynamic_cast<const Code*>(&other);
    return code != nullptr && code->code_ == code_;
  }
  bool Less(const IQZSettingValue& other) const override {
    const auto* code = dynamic_cast<const Code*>(&other);
    return code != nullptr && code_ < code->code_;
  }
  uint64_t Size() const override { return 1; }
  double GetReal() const override { return code_; }
  std::string GetText() const override { return std::to_string(code_); }
  bool GetBool() const override { return code_ != 0; }
  int GetInt() const override { return code_; }
  int GetType() const override { return SV_STRING; }
  int GetElementType() const override { return 0; }
  void Display() const override {}

 private:
  int code_;
};

QZSettings One(const std::string& name, IQZSettingValue* value) {
  QZSettings settings;
  settings.AddSetting(name, value, false);
  return settings;
}

QZSettings Nested(const std::string& inner) {
  QZSettings nested;
  nested.AddSetting("k", inner, false);
  QZSettings settings;
  settings.AddSetting("n", nested, false);
  return settings;
}

// Compare is antisymmetric and agrees with == and <.
void ExpectOrdered(const QZSettings& low, const QZSettings& high) {
  EXPECT_EQ(-1, low.Compare(high));
  EXPECT_EQ(1, high.Compare(low));
  EXPECT_TRUE(low < high);
  EXPECT_FALSE(high < low);
  EXPECT_TRUE(low != high);
}

}  // namespace

TEST(SettingsOrder, NamesKindsAndContent) {
  // Names decide first, then the value: text < list < truth value < nested collection.
  ExpectOrdered(One("a", new QZStringValue("z")), One("b", new QZStringValue("a")));
  ExpectOrdered(One("a", new QZStringValue("z")), One("a", new QZVecValue<std::string>({"a"})));
  ExpectOrdered(One("a", new QZVecValue<std::string>()), One("a", new QZBoolValue(false)));
  ExpectOrdered(One("a", new QZBoolValue(true)), One("a", new QZSettingsValue(QZSettings())));
  // Lists of different element types order by the element type.
  ExpectOrdered(One("a", new QZVecValue<double>({9.0})), One("a", new QZVecValue<std::string>()));
  // A collection that is a prefix of another comes first.
  QZSettings longer = One("a", new QZStringValue("1"));
  longer.AddSetting("b", "2", false);
  ExpectOrdered(One("a", new QZStringValue("1")), longer);

  // Nested collections compare by content, copies equal their originals.
  ExpectOrdered(Nested("1"), Nested("2"));
  EXPECT_EQ(0, Nested("1").Compare(Nested("1")));
  EXPECT_TRUE(Nested("1") == Nested("1"));
  QZSettings copy;
  copy = Nested("2");
  EXPECT_TRUE(copy == Nested("2"));

  // As map keys: equal collections are one key, and the order is the same whichever
  // way the keys were inserted.
  const std::vector<QZSettings> keys = {Nested("2"), One("a", new QZBoolValue(true)),
                                        Nested("1"), One("a", new QZStringValue("x")),
                                        Nested("2")};
  std::set<QZSettings> forward(keys.begin(), keys.end());
  std::set<QZSettings> backward(keys.rbegin(), keys.rend());
  EXPECT_EQ(4u, forward.size());
  EXPECT_TRUE(std::equal(forward.begin(), forward.end(), backward.begin(), backward.end()));
}

// Values of one kind but classes that cannot compare get an order by class that is the
// same in both directions; two such values of one class compare by their own order.
TEST(SettingsOrder, IncomparableClasses) {
  const QZSettings text = One("a", new QZStringValue("5"));
  const QZSettings code = One("a", new Code(5));
  const int forward = text.Compare(code);
  EXPECT_NE(0, forward);
  EXPECT_EQ(-forward, code.Compare(text));
  ExpectOrdered(One("a", new Code(1)), One("a", new Code(2)));
  EXPECT_TRUE(One("a", new Code(3)) == One("a", new Code(3)));
}

// A nested collection held as a value: its queries, copy and display.
TEST(SettingsOrder, NestedCollectionValue) {
  QZSettings inner;
  inner.AddSetting("p", "1", false);
  inner.AddSetting("q", true, false);
  const QZSettingsValue value(inner);
  EXPECT_EQ(2u, value.Size());
  EXPECT_EQ(2, value.GetInt());
  EXPECT_TRUE(value.GetBool());
  EXPECT_FALSE(QZSettingsValue(QZSettings()).GetBool());
  EXPECT_EQ("Settings Value: Number of settings = 2\n", value.GetText());
  EXPECT_EQ(IQZSettingValue::SV_SETTINGS, value.GetType());
  EXPECT_TRUE(value.Equals(QZSettingsValue(inner)));
  EXPECT_FALSE(value.Equals(QZStringValue("x")));
  EXPECT_FALSE(value.Less(QZStringValue("x")));

  // An assigned setting holds its own copy of the value.
  QZSetting setting("s", new QZStringValue("old"));
  {
    QZSetting other("t", new QZSettingsValue(inner));
    setting = other;
  }
  EXPECT_EQ("t", setting.GetName());
  EXPECT_EQ(IQZSettingValue::SV_SETTINGS, setting.GetValue()->GetType());
  EXPECT_EQ(2u, setting.GetValue()->Size());

  std::ostringstream out;
  std::ostream* previous = QZDisplay_800::GetDisplayStream();
  QZDisplay_800::SetDisplayStream(&out);
  value.Display();
  QZStringValue("abc").Display();
  QZBoolValue(false).Display();
  QZDisplay_800::SetDisplayStream(previous);
  EXPECT_EQ("Setting Value Type: Settings\nTotal number of setting value: 2\n\n"
            "Setting Value Type: String\nSetting value: abc\n"
            "Setting Value Type: Bool\nSetting value: false\n",
            out.str());
}

// Settings: the collection's add/replace/read rules and the list value QZVecValue.

#include <limits>
#include <memory>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

#include "QZDisplay.h"
#include "QZSettings.h"
#include "Value.h"

using QZCommon_800::Value;
using namespace QZXML_800;

namespace {

using Strings = std::vector<std::string>;

std::vector<std::string> TextsOf(const QZSettings& settings, const std::string& name) {
  std::vector<std::string> texts;
  for (const QZSetting* setting : settings.GetSettingByName(name)) {
    texts.push_back(setting->GetValue()->GetText());
  }
  return texts;
}

// Captures what the Display functions write while it lives.
class DisplayCapture {
 public:
  DisplayCapture() : previous_(QZDisplay_800::GetDisplayStream()) {
    QZDisplay_800::SetDisplayStream(&out_);
  }
  ~DisplayCapture() { QZDisplay_800::SetDisplayStream(previous_); }
  std::string Text() const { return out_.str(); }

 private:
  std::ostream* previous_;
  std::ostringstream out_;
};

}  // namespace

// Names may repeat; replace changes the first setting of a name in place (or appends
// when absent); names come back distinct in order of first addition.
TEST(Settings, AddAndReplace) {
  QZSettings settings;
  settings.AddSetting("b", "1", false);
  settings.AddSetting("a", "2", false);
  settings.AddSetting("b", "3", false);
  settings.AddSetting("b", "4", true);
  settings.AddSetting("c", std::string("5"), true);
  settings.AddSetting("d", static_cast<const char*>(nullptr), false);
  settings.AddSetting("e", static_cast<IQZSettingValue*>(nullptr), false);

  EXPECT_EQ((Strings{"b", "a", "c"}), settings.GetSettingNames());
  EXPECT_EQ((Strings{"4", "3"}), TextsOf(settings, "b"));
  EXPECT_EQ(4, settings.Size());
  EXPECT_EQ("a", settings.GetSettingAt(1)->GetName());
  EXPECT_EQ(nullptr, settings.GetSettingAt(4));
  EXPECT_FALSE(settings.Contains("d"));
  EXPECT_TRUE(settings.GetSettingByName("zz").empty());

  settings.RemoveSetting("b");
  EXPECT_FALSE(settings.Contains("b"));
  EXPECT_EQ((Strings{"a", "c"}), settings.GetSettingNames());
}

// Typed reads look at the first setting of a name and leave the output untouched when
// it is absent or of another kind.
TEST(Settings, TypedReads) {
  QZSettings nested;
  nested.AddSetting("TreeModel", "QZTree", false);
  QZSettings settings;
  settings.AddSetting("text", "hello", false);
  settings.AddSetting("text", "second", false);
  settings.AddSetting("flag", true, false);
  settings.AddSetting("flagText", "false", false);
  settings.AddSetting("yes", "yes", false);
  settings.AddSetting("list", Strings{"x", "y"}, false);
  settings.AddSetting("values", new QZVecValue<Value>({Value(1), Value("a")}), false);
  settings.AddSetting("nested", nested, false);

  std::string text = "untouched";
  EXPECT_TRUE(settings.GetSettingValByName("text", text));
  EXPECT_EQ("hello", text);
  text = "untouched";
  EXPECT_FALSE(settings.GetSettingValByName("flag", text));
  EXPECT_FALSE(settings.GetSettingValByName("list", text));
  EXPECT_FALSE(settings.GetSettingValByName("absent", text));
  EXPECT_EQ("untouched", text);

  bool flag = false;
  EXPECT_TRUE(settings.GetSettingValByName("flag", flag));
  EXPECT_TRUE(flag);
  EXPECT_TRUE(settings.GetSettingValByName("flagText", flag));
  EXPECT_FALSE(flag);
  flag = true;
  EXPECT_FALSE(settings.GetSettingValByName("yes", flag));
  EXPECT_TRUE(flag);

  Strings list{"old"};
  EXPECT_TRUE(settings.GetSettingValByName("list", list));
  EXPECT_EQ((Strings{"x", "y"}), list);
  list = {"old"};
  EXPECT_FALSE(settings.GetSettingValByName("values", list));
  EXPECT_FALSE(settings.GetSettingValByName("text", list));
  EXPECT_EQ((Strings{"old"}), list);

  QZSettings out;
  EXPECT_TRUE(settings.GetSettingValByName("nested", out));
  EXPECT_TRUE(settings.GetSettingValByName("nested", out));  // replaces, not appends
  EXPECT_EQ((Strings{"TreeModel"}), out.GetSettingNames());
  EXPECT_FALSE(settings.GetSettingValByName("text", out));
  EXPECT_EQ(1, out.Size());

  // A list built outside the library is read by it (one type identity).
  settings.AddSetting("list", new QZVecValue<std::string>({"p"}), true);
  EXPECT_TRUE(settings.GetSettingValByName("list", list));
  EXPECT_EQ((Strings{"p"}), list);
}

// Copies are deep, also when a collection is nested into itself or read into itself.
TEST(Settings, DeepCopies) {
  QZSettings settings;
  settings.AddSetting("a", "1", false);
  settings.AddSetting("self", settings, false);
  QZSettings copy(settings);
  settings.AddSetting("a", "changed", true);

  std::string text;
  ASSERT_TRUE(copy.GetSettingValByName("a", text));
  EXPECT_EQ("1", text);
  QZSettings inner;
  ASSERT_TRUE(settings.GetSettingValByName("self", inner));
  EXPECT_EQ((Strings{"a"}), inner.GetSettingNames());

  ASSERT_TRUE(settings.GetSettingValByName("self", settings));
  EXPECT_EQ(1, settings.Size());
  ASSERT_TRUE(settings.GetSettingValByName("a", text));
  EXPECT_EQ("1", text);

  QZSettings& same = copy;
  copy = same;  // self-assignment
  EXPECT_EQ(2, copy.Size());
  std::unique_ptr<IQZSettingValue> clone(copy.GetSettingAt(1)->GetValue()->Clone());
  copy.RemoveSetting("self");
  EXPECT_EQ(IQZSettingValue::SV_SETTINGS, clone->GetType());
  EXPECT_EQ(1u, clone->Size());
}

// A list value's queries and display, the same for every element type; the element
// type code comes from the element type.
TEST(Settings, VecValueQueries) {
  QZVecValue<std::string> three({"a", "b", "c"});
  EXPECT_EQ("Vector Value: Length of vector = 3\n", three.GetText());
  EXPECT_EQ(3u, three.Size());
  EXPECT_EQ(3, three.GetInt());
  EXPECT_TRUE(three.GetBool());
  EXPECT_EQ(std::numeric_limits<double>::lowest(), three.GetReal());
  EXPECT_EQ(IQZSettingValue::SV_VECTOR, three.GetType());
  EXPECT_EQ(3, three.GetElementType());

  QZVecValue<Value> empty;
  EXPECT_EQ("Vector Value: Length of vector = 0\n", empty.GetText());
  EXPECT_FALSE(empty.GetBool());
  EXPECT_EQ(0, empty.GetElementType());

  EXPECT_EQ(1, QZVecValue<int>().GetElementType());
  EXPECT_EQ(2, QZVecValue<double>().GetElementType());
  EXPECT_EQ(4, (QZVecValue<std::pair<std::string, int>>().GetElementType()));
  EXPECT_EQ(5, (QZVecValue<std::pair<std::string, double>>().GetElementType()));
  EXPECT_EQ(6, (QZVecValue<std::pair<std::string, std::string>>().GetElementType()));
  EXPECT_EQ(7, QZVecValue<QZSettings>().GetElementType());
  EXPECT_EQ(0, QZVecValue<long>().GetElementType());

  std::unique_ptr<QZVecValue<std::string>> clone(three.Clone());
  clone->GetValues().push_back("d");
  EXPECT_EQ(3u, three.Size());

  DisplayCapture capture;
  three.Display();
  EXPECT_EQ("Setting Value Type: Vector\nTotal number of setting value: 3\n\n",
            capture.Text());
}

// Element-wise comparison: the first differing element decides, a proper prefix is
// less, and values of another kind or element type are neither equal nor less.
TEST(Settings, VecValueComparison) {
  QZVecValue<std::string> ab({"a", "b"}), ac({"a", "c"}), a({"a"}), ab2({"a", "b"});
  EXPECT_TRUE(ab.Less(ac));
  EXPECT_FALSE(ac.Less(ab));
  EXPECT_TRUE(a.Less(ab));
  EXPECT_FALSE(ab.Less(a));
  EXPECT_TRUE(ab.Equals(ab2));
  EXPECT_TRUE(ab.Equals(ab));
  EXPECT_FALSE(ab.Less(ab2));
  EXPECT_FALSE(a.Equals(ab));

  QZVecValue<Value> values({Value("a"), Value("b")});
  QZStringValue text("a");
  EXPECT_FALSE(ab.Equals(values));
  EXPECT_FALSE(ab.Less(values));
  EXPECT_FALSE(values.Less(ab));
  EXPECT_FALSE(ab.Equals(text));
  EXPECT_FALSE(text.Equals(a));

  // Byte-wise text order; Value order (a real before a text) for Value elements.
  EXPECT_TRUE(QZVecValue<std::string>({"Z"}).Less(QZVecValue<std::string>({"a"})));
  EXPECT_TRUE(QZVecValue<std::string>({"a"}).Less(QZVecValue<std::string>({"\xC3\xA9"})));
  EXPECT_TRUE(QZVecValue<Value>({Value(9)}).Less(QZVecValue<Value>({Value("1")})));

  // Nested settings compare by content.
  QZSettings one, two;
  one.AddSetting("k", "1", false);
  two.AddSetting("k", "2", false);
  QZVecValue<QZSettings> first({one}), second({two}), again({one});
  EXPECT_TRUE(first.Less(second));
  EXPECT_FALSE(second.Less(first));
  EXPECT_TRUE(first.Equals(again));
}

// The scalar values: texts read as numbers and truth values, truth values as texts.
TEST(Settings, ScalarValues) {
  QZStringValue number(" 42.9 "), word("true"), none("abc");
  EXPECT_DOUBLE_EQ(42.9, number.GetReal());
  EXPECT_EQ(42, number.GetInt());
  EXPECT_TRUE(number.GetBool());
  EXPECT_TRUE(word.GetBool());
  EXPECT_FALSE(none.GetBool());
  EXPECT_EQ(0, none.GetInt());
  EXPECT_EQ(0, QZStringValue("1e300").GetInt());
  EXPECT_EQ(IQZSettingValue::SV_STRING, none.GetType());
  EXPECT_TRUE(QZStringValue("a").Less(QZStringValue("b")));

  QZBoolValue yes(true), no(false);
  EXPECT_EQ("true", yes.GetText());
  EXPECT_EQ(0, no.GetInt());
  EXPECT_TRUE(no.Less(yes));
  EXPECT_FALSE(yes.Less(no));
  EXPECT_FALSE(yes.Equals(word));
  EXPECT_EQ(IQZSettingValue::SV_BOOL, yes.GetType());

  // A setting built without a value holds an empty text.
  QZSetting empty("e", static_cast<IQZSettingValue*>(nullptr));
  EXPECT_EQ("", empty.GetValue()->GetText());
}

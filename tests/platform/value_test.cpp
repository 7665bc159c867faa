#include "Value.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <memory>
#include <sstream>
#include <vector>

#include <gtest/gtest.h>

using QZCommon_800::QZMV;
using QZCommon_800::Value;

namespace {

const double kInf = std::numeric_limits<double>::infinity();

// Kinds, tags and the missing tests of every way to build a value.
TEST(ValueTest, KindsAndMissing) {
  EXPECT_EQ(Value().GetType(), Value::NULL_TYPE);
  EXPECT_TRUE(Value::NULL_VALUE.IsNull());
  EXPECT_EQ(Value(3).GetType(), 3);
  EXPECT_EQ(Value(2.5).GetType(), Value::REAL_TYPE);
  EXPECT_EQ(Value(7L).GetReal(), 7.0);
  EXPECT_EQ(Value(std::string("x")).GetType(), 5);
  EXPECT_EQ(Value("x").GetType(), Value::STRING_TYPE);
  EXPECT_TRUE(Value(static_cast<const char*>(nullptr)).IsNull());

  Value nan(std::nan(""));
  EXPECT_TRUE(nan.IsSystemMissingValue());
  EXPECT_TRUE(nan.IsNumericValue());
  EXPECT_EQ(nan.GetReal(), QZMV::Missing());
  Value assignedNan("text");
  assignedNan = std::nan("");
  EXPECT_TRUE(assignedNan.IsSystemMissingValue());

  EXPECT_TRUE(Value().IsMissing());
  EXPECT_FALSE(static_cast<bool>(Value()));
  EXPECT_TRUE(Value(QZMV::Missing()).IsMissing());
  EXPECT_FALSE(static_cast<bool>(Value(QZMV::Missing())));
  EXPECT_TRUE(static_cast<bool>(Value(0)));
  EXPECT_TRUE(static_cast<bool>(Value("")));  // an empty text is not missing
  EXPECT_FALSE(Value("").IsMissing());
  EXPECT_EQ(Value().GetReal(), QZMV::Missing());
}

// Reals as text: shortest round-trip form; missing and null give an empty text.
TEST(ValueTest, RealToText) {
  EXPECT_EQ(Value(800).GetString(), "800");
  EXPECT_EQ(Value(2.5).GetString(), "2.5");
  EXPECT_EQ(Value(1e300).GetString(), "1e+300");
  EXPECT_EQ(Value::GetInfinity().GetString(), "inf");
  EXPECT_EQ((-Value::GetInfinity()).GetString(), "-inf");
  EXPECT_EQ(Value(0.1).GetString(), "0.1");
  EXPECT_EQ(Value(-0.0).GetString(), "0");
  EXPECT_EQ(Value(-3).GetString(), "-3");
  EXPECT_EQ(Value(QZMV::Missing()).GetString(), "");
  EXPECT_EQ(Value().GetString(), "");
  EXPECT_EQ(Value("as is ").GetString(), "as is ");
  // Plain notation up to 20 integer digits and down to 6 leading zeros, exponents beyond.
  EXPECT_EQ(Value(1e6).GetString(), "1000000");
  EXPECT_EQ(Value(-123456.5).GetString(), "-123456.5");
  EXPECT_EQ(Value(1e20).GetString(), "100000000000000000000");
  EXPECT_EQ(Value(1e21).GetString(), "1e+21");
  EXPECT_EQ(Value(0.000125).GetString(), "0.000125");
  EXPECT_EQ(Value(1e-7).GetString(), "1e-07");

  // Every text reads back as the same double.
  for (double d : {1.0 / 3.0, 123456789.125, 5e-324, 2.2250738585072014e-308,
                   std::numeric_limits<double>::max(), -0.000123, 1e21, 9007199254740993.0}) {
    std::string text = Value(d).GetString();
    EXPECT_EQ(Value(text).GetReal(), d) << text;
  }
}

// Text to real: the whole text must be one number; blanks around it are allowed.
TEST(ValueTest, TextToReal) {
  EXPECT_EQ(Value(" 42 ").GetReal(), 42.0);
  EXPECT_EQ(Value("\t-2.5e3\r\n").GetReal(), -2500.0);
  EXPECT_EQ(Value("+7").GetReal(), 7.0);
  EXPECT_EQ(Value(".5").GetReal(), 0.5);
  EXPECT_EQ(Value("inf").GetReal(), kInf);
  EXPECT_EQ(Value("-Infinity").GetReal(), -kInf);
  // Out of range: the magnitude decides between infinity and zero.
  EXPECT_EQ(Value("1e400").GetReal(), kInf);
  EXPECT_EQ(Value("-1e400").GetReal(), -kInf);
  EXPECT_EQ(Value("1e-400").GetReal(), 0.0);
  EXPECT_EQ(Value(std::string(400, '9')).GetReal(), kInf);
  EXPECT_EQ(Value("0." + std::string(400, '0') + "1").GetReal(), 0.0);
  EXPECT_EQ(Value("0." + std::string(400, '0') + "1e800").GetReal(), kInf);
  EXPECT_EQ(Value("0." + std::string(400, '0') + "1e500").GetReal(), 1e99);

  for (const char* bad : {"", "   ", "abc", "1,5", "1.5x", "x1", "0x10", "+-1", "++1", "+",
                          "-", "1 2", "nan", "-NaN", "1e", "e5"}) {
    EXPECT_TRUE(Value(bad).GetReal() == QZMV::Missing()) << '"' << bad << '"';
  }
  EXPECT_EQ(Value::TextToReal(std::string_view("12", 1)), 1.0);  // reads only the view
}

// The order: null < real < string < struct; missing lowest; equality agrees with it.
TEST(ValueTest, StrictWeakOrderAcrossKinds) {
  Value structA;
  structA["a"] = 1;
  Value structAB = structA;
  structAB["b"] = 2;
  Value structB;
  structB["b"] = 0;
  std::vector<Value> ordered = {Value(),         Value(QZMV::Missing()), -Value::GetInfinity(),
                                Value(-1),       Value(0),               Value(1),
                                Value(1e300),    Value::GetInfinity(),   Value(""),
                                Value("1"),      Value("B"),             Value("a"),
                                Value("ab"),     Value("\xC3\xA9"),      structA,
                                structAB,        structB};
  for (size_t i = 0; i < ordered.size(); ++i) {
    for (size_t j = 0; j < ordered.size(); ++j) {
      const Value& a = ordered[i];
      const Value& b = ordered[j];
      EXPECT_EQ(a < b, i < j) << a << " vs " << b;
      EXPECT_EQ(a == b, i == j) << a << " vs " << b;
      EXPECT_EQ(a != b, i != j);
      EXPECT_EQ(a <= b, i <= j);
      EXPECT_EQ(a > b, i > j);
      EXPECT_EQ(a >= b, i >= j);
    }
  }
  EXPECT_NE(Value("1"), Value(1));
  EXPECT_EQ(Value(0.0), Value(-0.0));
  EXPECT_EQ(Value(std::nan("")), Value(QZMV::Missing()));

  std::vector<Value> shuffled(ordered.rbegin(), ordered.rend());
  std::swap(shuffled[2], shuffled[9]);
  std::sort(shuffled.begin(), shuffled.end());
  EXPECT_EQ(shuffled, ordered);
}

// Copies are deep and independent; moves leave null behind; assignment across kinds.
TEST(ValueTest, CopyMoveAndAssign) {
  Value text(std::string(100, 'x'));
  Value copy = text;
  copy = "short";
  EXPECT_EQ(text.GetString(), std::string(100, 'x'));

  Value moved = std::move(text);
  EXPECT_EQ(moved.GetString().size(), 100u);
  EXPECT_TRUE(text.IsNull());  // NOLINT(bugprone-use-after-move): documented state

  Value s;
  s["k"] = "v";
  Value deep = s;
  deep["k"] = 5;
  EXPECT_EQ(s.Find("k")->GetString(), "v");

  Value v = 1.5;
  v = std::string("now text");
  EXPECT_TRUE(v.IsString());
  v = static_cast<const char*>(nullptr);
  EXPECT_TRUE(v.IsNull());
  v = s;
  EXPECT_TRUE(v.IsStruct());
  v = 4;
  EXPECT_EQ(v.GetReal(), 4.0);
  v = 0;  // an int, not a null text pointer
  EXPECT_EQ(v.GetReal(), 0.0);
  v = size_t{7};
  EXPECT_EQ(v.GetReal(), 7.0);
  v = 4;
  Value& same = v;
  v = same;  // self-assignment keeps the value
  EXPECT_EQ(v.GetReal(), 4.0);
  v = std::move(same);
  EXPECT_EQ(v.GetReal(), 4.0);

  std::unique_ptr<Value> clone(s.Clone());
  ASSERT_NE(clone, nullptr);
  EXPECT_EQ(*clone, s);
}

// Assigning a value one of its own entries (or entry texts) must not read freed memory.
TEST(ValueTest, AssignFromOwnEntry) {
  Value v;
  v["inner"]["x"] = "deep";
  v = v["inner"];
  EXPECT_EQ(v.GetEntryNames(), std::vector<std::string>{"x"});
  v = std::move(v["x"]);
  EXPECT_EQ(v.GetString(), "deep");

  Value w;
  w["t"] = std::string(50, 'y');
  w = w.Find("t")->GetText();
  EXPECT_EQ(w.GetString(), std::string(50, 'y'));
}

// Structured values: creation by operator[], lookup, order and stable entry references.
TEST(ValueTest, StructEntries) {
  Value v = 3.0;
  Value& first = v["b"];
  EXPECT_TRUE(v.IsStruct());
  EXPECT_TRUE(first.IsNull());
  first = 1;
  for (int i = 0; i < 100; ++i) v["e" + std::to_string(i)] = i;
  EXPECT_EQ(first.GetReal(), 1.0);  // still the entry after many additions
  v["a"] = v["c"];                  // both new: the right side must survive the left's add
  EXPECT_TRUE(v.Find("a")->IsNull());

  EXPECT_EQ(v.GetEntryNames().size(), 103u);
  EXPECT_EQ(v.GetEntryNames()[0], "b");
  EXPECT_EQ(v.GetEntryNames()[101], "c");
  EXPECT_EQ(v.Find("e7")->GetReal(), 7.0);
  EXPECT_EQ(v.Find("zz"), nullptr);
  EXPECT_EQ(Value(1).Find("b"), nullptr);
  EXPECT_TRUE(Value("s").GetEntryNames().empty());
  EXPECT_EQ(v.GetString(), "");
  EXPECT_EQ(v.GetReal(), QZMV::Missing());
  EXPECT_FALSE(v.IsMissing());
}

// Negation and stream output.
TEST(ValueTest, NegationAndOutput) {
  EXPECT_EQ((-Value(2.5)).GetReal(), -2.5);
  EXPECT_TRUE((-Value(QZMV::Missing())).IsSystemMissingValue());
  EXPECT_EQ((-Value("x")).GetString(), "x");
  EXPECT_TRUE((-Value()).IsNull());
  EXPECT_EQ((-Value::GetInfinity()).GetReal(), -kInf);

  Value s;
  s["a"] = 1;
  s["b"] = "x";
  s["c"]["d"] = 2.5;
  s["n"];
  std::ostringstream os;
  os << s << '|' << Value(800) << '|' << Value() << '|' << Value("t");
  EXPECT_EQ(os.str(), "{a=1, b=x, c={d=2.5}, n=}|800||t");
}

}  // namespace

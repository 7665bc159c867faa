// The built-in functions of the transformation engine, family by family: hand-computed
// results, missing arguments, invalid results, and the refusal of malformed or hostile
// constant patterns at load.
#include "XercesTestEnvironment.h"
#include "QZTransformation.h"

#include <cmath>
#include <initializer_list>
#include <sstream>
#include <string>
#include <utility>

#include <gtest/gtest.h>

#include "QZMV.h"
#include "Value.h"
#include "ValueRecord.h"

namespace {

using QZCommon_800::QZMV;
using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;

std::string C(const std::string& text) { return "<Constant>" + text + "</Constant>"; }
std::string F(const std::string& field) { return "<FieldRef field=\"" + field + "\"/>"; }
std::string Missing() { return "<Constant missing=\"true\"/>"; }
std::string A(const std::string& function, std::initializer_list<std::string> args,
              const std::string& attrs = "") {
  std::string xml = "<Apply function=\"" + function + "\"" + attrs + ">";
  for (const std::string& arg : args) xml += arg;
  return xml + "</Apply>";
}

// The outcome of computing one derived field "r" (without a dataType unless attrs give
// one) over a record of inputs.
struct Outcome {
  long code;          // the load's status when it failed, else Transform's
  std::string error;  // the engine's message
  Value value;        // r after Transform
};

Outcome Compute(const std::string& expression,
                std::initializer_list<std::pair<const char*, Value>> inputs = {},
                const std::string& attrs = "", const std::string& dataDictionary = "") {
  QZTransformation t;
  std::istringstream in("<PMML version=\"4.4\">" + dataDictionary +
                        "<TransformationDictionary><DerivedField name=\"r\"" + attrs + ">" +
                        expression + "</DerivedField></TransformationDictionary></PMML>");
  const QZStatus loaded = t.AddPMML(in, false);
  if (loaded.IsError()) return {loaded.GetErrorCode(), t.GetLastError(), Value()};
  ValueRecord record;
  for (const auto& input : inputs) record.Add(input.first, input.second);
  const QZStatus status = t.Transform(record);
  return {status.GetErrorCode(), t.GetLastError(), record.Get("r")};
}

Value R(const std::string& expression,
        std::initializer_list<std::pair<const char*, Value>> inputs = {}) {
  const Outcome o = Compute(expression, inputs);
  EXPECT_EQ(o.code, 0) << o.error << " in " << expression;
  return o.value;
}

double Real(const std::string& expression,
            std::initializer_list<std::pair<const char*, Value>> inputs = {}) {
  return R(expression, inputs).GetReal();
}

long Code(const std::string& expression,
          std::initializer_list<std::pair<const char*, Value>> inputs = {}) {
  return Compute(expression, inputs).code;
}

const Value kSysMissing(QZMV::Missing());

// + - * / on numbers, on texts that read as numbers, and on missing values.
TEST(TransformFunctions, Arithmetic) {
  EXPECT_EQ(R(A("+", {C("2.5"), C("4")})), Value(6.5));
  EXPECT_EQ(R(A("-", {C("2.5"), C("4")})), Value(-1.5));
  EXPECT_EQ(R(A("*", {C("3"), C("-2")})), Value(-6.0));
  EXPECT_EQ(R(A("/", {C("7"), C("2")})), Value(3.5));
  EXPECT_EQ(R(A("+", {F("x"), C("1")}), {{"x", Value(" 3 ")}}), Value(4.0));
  EXPECT_EQ(R(A("+", {F("x"), C("1")}), {{"x", Value("abc")}}), kSysMissing);
  EXPECT_EQ(R(A("+", {F("x"), C("1")}), {{"x", Value()}}), kSysMissing);
  EXPECT_EQ(R(A("*", {F("absent"), C("1")})), kSysMissing);
  // Nested, with a missing value deep inside.
  EXPECT_EQ(R(A("*", {A("+", {F("x"), C("1")}), A("-", {C("10"), F("y")})}),
              {{"x", Value(2.0)}, {"y", Value(4.0)}}),
            Value(18.0));
  EXPECT_EQ(R(A("*", {A("+", {F("x"), C("1")}), A("-", {C("10"), F("y")})}),
              {{"x", Value(2.0)}, {"y", kSysMissing}}),
            kSysMissing);
}

// Aggregates leave missing arguments out; all missing gives missing.
TEST(TransformFunctions, Aggregates) {
  EXPECT_EQ(R(A("min", {C("2"), Missing(), C("-1")})), Value(-1.0));
  EXPECT_EQ(R(A("max", {C("2"), Missing(), C("-1")})), Value(2.0));
  EXPECT_EQ(R(A("sum", {C("1"), C("2"), Missing()})), Value(3.0));
  EXPECT_EQ(R(A("avg", {C("1"), C("2"), Missing()})), Value(1.5));
  EXPECT_EQ(R(A("median", {C("5"), C("1"), C("3")})), Value(3.0));
  EXPECT_EQ(R(A("median", {C("4"), C("1"), C("3"), C("2")})), Value(2.5));
  EXPECT_EQ(R(A("product", {C("2"), C("3"), C("4")})), Value(24.0));
  EXPECT_EQ(R(A("sum", {Missing(), F("absent")})), kSysMissing);
  // More arguments than fit on the stack.
  EXPECT_EQ(R(A("median", {C("9"), C("1"), C("8"), C("2"), C("7"), C("3"), C("6"), C("4"),
                           C("5"), C("10")})),
            Value(5.5));
}

// Mathematical functions with hand-computed values, and their rounding rules.
TEST(TransformFunctions, Mathematics) {
  EXPECT_EQ(Real(A("log10", {C("1000")})), 3.0);
  EXPECT_EQ(Real(A("ln", {C("1")})), 0.0);
  EXPECT_EQ(Real(A("sqrt", {C("16")})), 4.0);
  EXPECT_EQ(Real(A("abs", {C("-2")})), 2.0);
  EXPECT_EQ(Real(A("exp", {C("0")})), 1.0);
  EXPECT_EQ(Real(A("pow", {C("2"), C("10")})), 1024.0);
  EXPECT_EQ(Real(A("threshold", {C("3"), C("2")})), 1.0);
  EXPECT_EQ(Real(A("threshold", {C("2"), C("2")})), 0.0);
  EXPECT_EQ(Real(A("floor", {C("-1.5")})), -2.0);
  EXPECT_EQ(Real(A("ceil", {C("-1.5")})), -1.0);
  EXPECT_EQ(Real(A("round", {C("2.5")})), 3.0);
  EXPECT_EQ(Real(A("round", {C("-2.5")})), -2.0);
  EXPECT_EQ(Real(A("round", {C("1.4")})), 1.0);
  EXPECT_EQ(Real(A("rint", {C("2.5")})), 2.0);
  EXPECT_EQ(Real(A("rint", {C("3.5")})), 4.0);
  EXPECT_EQ(Real(A("rint", {C("-2.5")})), -2.0);
  EXPECT_EQ(Real(A("modulo", {C("-13"), C("4")})), 3.0);
  EXPECT_EQ(Real(A("modulo", {C("13"), C("-4")})), -3.0);
  EXPECT_EQ(Real(A("hypot", {C("3"), C("4")})), 5.0);
  EXPECT_DOUBLE_EQ(Real(A("expm1", {C("1e-10")})), 1.00000000005e-10);
  EXPECT_DOUBLE_EQ(Real(A("ln1p", {C("1e-10")})), 9.9999999995e-11);
  EXPECT_EQ(Real(A("sin", {C("0")})), 0.0);
  EXPECT_EQ(Real(A("cos", {C("0")})), 1.0);
  EXPECT_EQ(Real(A("tan", {C("0")})), 0.0);
  EXPECT_DOUBLE_EQ(Real(A("asin", {C("1")})), M_PI / 2);
  EXPECT_EQ(Real(A("acos", {C("1")})), 0.0);
  EXPECT_DOUBLE_EQ(Real(A("atan", {C("1")})), M_PI / 4);
  EXPECT_EQ(Real(A("sinh", {C("0")})), 0.0);
  EXPECT_EQ(Real(A("cosh", {C("0")})), 1.0);
  EXPECT_DOUBLE_EQ(Real(A("tanh", {C("1")})), 0.76159415595576489);
  EXPECT_EQ(R(A("sqrt", {F("absent")})), kSysMissing);
}

// The normal distribution family, against reference values; the inverse is exact to a
// few units in the last place, also far in the tails.
TEST(TransformFunctions, NormalDistribution) {
  EXPECT_EQ(Real(A("erf", {C("0")})), 0.0);
  EXPECT_DOUBLE_EQ(Real(A("erf", {C("1")})), 0.84270079294971487);
  EXPECT_EQ(Real(A("stdNormalCDF", {C("0")})), 0.5);
  EXPECT_DOUBLE_EQ(Real(A("stdNormalPDF", {C("0")})), 0.3989422804014327);
  EXPECT_EQ(Real(A("normalCDF", {C("1"), C("1"), C("2")})), 0.5);
  EXPECT_DOUBLE_EQ(Real(A("normalPDF", {C("3"), C("1"), C("2")})), 0.12098536225957168);
  EXPECT_EQ(Real(A("normalIDF", {C("0.5"), C("3"), C("2")})), 3.0);
  EXPECT_NEAR(Real(A("normalIDF", {C("0.975"), C("10"), C("2")})), 13.919927969080106, 1e-13);
  EXPECT_NEAR(Real(A("stdNormalIDF", {C("0.975")})), 1.9599639845400536, 1e-14);
  EXPECT_NEAR(Real(A("stdNormalIDF", {C("1e-10")})), -6.361340902404056, 1e-13);
  for (const char* p : {"1e-300", "1e-50", "0.001", "0.3", "0.7", "0.999999"}) {
    const double x = Real(A("stdNormalIDF", {C(p)}));
    const double back = Real(A("stdNormalCDF", {C(Value(x).GetString())}));
    EXPECT_NEAR(back / std::stod(p), 1.0, 1e-12) << p;
  }
  // Outside the domain the result is invalid.
  EXPECT_EQ(Code(A("normalCDF", {C("1"), C("0"), C("0")})), 270006);
  EXPECT_EQ(Code(A("stdNormalIDF", {C("1.5")})), 270006);
}

// Invalid results: refused under returnInvalid (the default), and with the other
// treatments; an invalid argument makes the enclosing Apply's result invalid too.
TEST(TransformFunctions, InvalidResults) {
  const Outcome divide = Compute(A("+", {C("1"), A("/", {F("x"), C("0")})}), {{"x", Value(1.0)}});
  EXPECT_EQ(divide.code, 270006);
  EXPECT_EQ(divide.error, "DerivedField 'r': Apply '/' gave an invalid result");
  EXPECT_EQ(divide.value, kSysMissing);
  for (const std::string& e : {A("ln", {C("0")}), A("ln", {C("-1")}), A("sqrt", {C("-1")}),
                               A("asin", {C("2")}), A("log10", {C("0")}),
                               A("exp", {C("1000")}), A("modulo", {C("1"), C("0")})}) {
    EXPECT_EQ(Code(e), 270006) << e;
  }
  const std::string asIs = " invalidValueTreatment=\"asIs\"";
  const std::string asMissing = " invalidValueTreatment=\"asMissing\"";
  EXPECT_EQ(R(A("/", {C("1"), C("0")}, asIs)), Value::GetInfinity());
  EXPECT_EQ(R(A("sqrt", {C("-1")}, asIs)), kSysMissing);
  EXPECT_EQ(R(A("/", {C("1"), C("0")}, asMissing)), kSysMissing);
  EXPECT_EQ(R(A("/", {C("1"), C("0")}, asMissing + " defaultValue=\"-1\"")), Value(-1.0));
  // The outer Apply treats the invalid result of the inner one.
  EXPECT_EQ(R(A("+", {C("1"), A("/", {C("1"), C("0")})}, asMissing)), kSysMissing);
  // Infinite inputs are values, not invalid: the result is what arithmetic gives.
  EXPECT_EQ(R(A("+", {C("INF"), C("1")})), Value::GetInfinity());
  EXPECT_EQ(Code(A("-", {C("INF"), C("INF")})), 270006);
}

// isMissing, isNotMissing, comparisons, and, or, not, isIn, isNotIn, if.
TEST(TransformFunctions, TestsAndLogic) {
  EXPECT_EQ(R(A("isMissing", {F("x")}), {{"x", Value()}}), Value(1.0));
  EXPECT_EQ(R(A("isMissing", {F("absent")})), Value(1.0));
  EXPECT_EQ(R(A("isMissing", {F("x")}), {{"x", Value(0.0)}}), Value(0.0));
  EXPECT_EQ(R(A("isNotMissing", {F("x")}), {{"x", Value("")}}), Value(1.0));

  EXPECT_EQ(R(A("equal", {C("2"), C("2.0")})), Value(1.0));
  EXPECT_EQ(R(A("equal", {F("x"), C("2")}), {{"x", Value("2")}}), Value(1.0));
  EXPECT_EQ(R(A("equal", {F("x"), F("y")}), {{"x", Value("a")}, {"y", Value("a")}}), Value(1.0));
  EXPECT_EQ(R(A("equal", {F("x"), C("2")}), {{"x", Value("two")}}), Value(0.0));
  EXPECT_EQ(R(A("notEqual", {C("1"), C("2")})), Value(1.0));
  EXPECT_EQ(R(A("lessThan", {C("1"), C("2")})), Value(1.0));
  EXPECT_EQ(R(A("lessThan", {F("x"), F("y")}), {{"x", Value("b")}, {"y", Value("a")}}), Value(0.0));
  EXPECT_EQ(R(A("lessOrEqual", {C("2"), C("2")})), Value(1.0));
  EXPECT_EQ(R(A("greaterThan", {C("2"), C("2")})), Value(0.0));
  EXPECT_EQ(R(A("greaterOrEqual", {C("3"), C("2")})), Value(1.0));
  EXPECT_EQ(R(A("lessThan", {F("x"), C("2")}), {{"x", Value()}}), kSysMissing);
  EXPECT_EQ(Code(A("lessThan", {F("x"), C("2")}), {{"x", Value("abc")}}), 270006);

  // Three-valued logic: a settling argument decides even beside a missing one.
  EXPECT_EQ(R(A("and", {C("1"), C("0")})), Value(0.0));
  EXPECT_EQ(R(A("and", {F("m"), C("0")})), Value(0.0));
  EXPECT_EQ(R(A("and", {F("m"), C("1")})), kSysMissing);
  EXPECT_EQ(R(A("and", {C("true"), C("1"), C("1")})), Value(1.0));
  EXPECT_EQ(R(A("or", {F("m"), C("1")})), Value(1.0));
  EXPECT_EQ(R(A("or", {C("0"), F("m")})), kSysMissing);
  EXPECT_EQ(R(A("or", {C("0"), C("false")})), Value(0.0));
  EXPECT_EQ(R(A("not", {C("1")})), Value(0.0));
  EXPECT_EQ(R(A("not", {F("m")})), kSysMissing);

  EXPECT_EQ(R(A("isIn", {C("2"), C("1"), C("2"), C("3")})), Value(1.0));
  EXPECT_EQ(R(A("isIn", {F("s"), C("a"), C("c")}), {{"s", Value("b")}}), Value(0.0));
  EXPECT_EQ(R(A("isNotIn", {F("s"), C("a"), C("c")}), {{"s", Value("b")}}), Value(1.0));
  EXPECT_EQ(R(A("isIn", {F("m"), C("a")})), kSysMissing);

  EXPECT_EQ(R(A("if", {C("1"), C("yes"), C("no")})), Value("yes"));
  EXPECT_EQ(R(A("if", {C("0"), C("yes"), C("no")})), Value("no"));
  EXPECT_TRUE(R(A("if", {C("0"), C("yes")})).IsNull());
  EXPECT_TRUE(R(A("if", {F("m"), C("yes"), C("no")})).IsNull());
  // Only the branch taken is evaluated: neither the missing nor the invalid one counts.
  EXPECT_EQ(R(A("if", {C("1"), C("5"), F("m")})), Value(5.0));
  EXPECT_EQ(R(A("if", {C("0"), A("/", {C("1"), C("0")}), C("2")})), Value(2.0));
}

// Text functions work on characters, not bytes; numbers become their shortest text.
TEST(TransformFunctions, Text) {
  EXPECT_EQ(R(A("uppercase", {C("aBc-\xC3\xA9")})), Value("ABC-\xC3\xA9"));
  EXPECT_EQ(R(A("lowercase", {C("aBC")})), Value("abc"));
  EXPECT_EQ(R(A("stringLength", {C("h\xC3\xA9llo")})), Value(5.0));
  EXPECT_EQ(R(A("substring", {C("h\xC3\xA9llo"), C("2"), C("3")})), Value("\xC3\xA9ll"));
  EXPECT_EQ(R(A("substring", {C("abc"), C("5"), C("2")})), Value(""));
  EXPECT_EQ(Code(A("substring", {C("abc"), C("0"), C("1")})), 270006);
  EXPECT_EQ(Code(A("substring", {C("abc"), C("1.5"), C("1")})), 270006);
  EXPECT_EQ(R(A("trimBlanks", {F("s")}), {{"s", Value("  a b \t")}}), Value("a b"));
  EXPECT_EQ(R(A("concat", {C("a"), C("1"), F("x"), C("b")}), {{"x", Value(2.5)}}), Value("a12.5b"));
  EXPECT_TRUE(R(A("concat", {C("a"), F("m")})).IsNull());
  EXPECT_EQ(R(A("uppercase", {F("x")}), {{"x", Value(800)}}), Value("800"));
}

// replace and matches: ECMAScript expressions, $-references in the replacement, and
// empty matches; malformed or back-referencing constant patterns are refused at load,
// bad patterns from data give invalid results, and hostile inputs stay fast.
TEST(TransformFunctions, RegularExpressions) {
  EXPECT_EQ(R(A("replace", {C("BBBB"), C("B+"), C("c")})), Value("c"));
  EXPECT_EQ(R(A("replace", {C("abcd"), C("(b)(c)"), C("$2$1")})), Value("acbd"));
  EXPECT_EQ(R(A("replace", {C("abc"), C("x*"), C("-")})), Value("-a-b-c-"));
  EXPECT_EQ(R(A("replace", {C("a.b"), C("\\."), C("$$")})), Value("a$b"));
  EXPECT_EQ(R(A("replace", {C("ab ab"), C("b"), C("[$&amp;]")})), Value("a[b] a[b]"));
  EXPECT_EQ(R(A("matches", {C("hello world"), C("o w")})), Value(1.0));
  EXPECT_EQ(R(A("matches", {C("abc"), C("^b")})), Value(0.0));
  EXPECT_EQ(R(A("matches", {C("abc"), C("c$")})), Value(1.0));
  EXPECT_EQ(R(A("matches", {F("s"), F("p")}), {{"s", Value("x1")}, {"p", Value("[0-9]")}}),
            Value(1.0));

  const Outcome bad = Compute(A("matches", {F("s"), C("(")}));
  EXPECT_EQ(bad.code, 270004);
  const std::string refused =
      "DerivedField 'r': Apply 'matches': the regular expression is refused: ";
  EXPECT_EQ(bad.error.substr(0, refused.size()), refused);
  EXPECT_EQ(Code(A("replace", {F("s"), C("(a)\\1"), C("x")})), 270004);
  EXPECT_EQ(Code(A("matches", {F("s"), C(std::string(1001, 'a'))})), 270004);
  EXPECT_EQ(Code(A("matches", {F("s"), F("p")}), {{"s", Value("x")}, {"p", Value("[")}}), 270006);

  // A pattern that makes a backtracking matcher take exponential time, on the longest
  // text accepted; a longer text gives an invalid result.
  const Value longText(std::string(4096, 'a'));
  EXPECT_EQ(R(A("matches", {F("s"), C("(a*)*b")}), {{"s", longText}}), Value(0.0));
  EXPECT_EQ(R(A("replace", {F("s"), C("(a|aa)+$"), C("x")}), {{"s", longText}}), Value("x"));
  EXPECT_EQ(Code(A("matches", {F("s"), C("a")}), {{"s", Value(std::string(4097, 'a'))}}), 270006);
}

// formatNumber: printf-like patterns, validated so that no conversion but a number's
// ever reaches the C library.
TEST(TransformFunctions, FormatNumber) {
  EXPECT_EQ(R(A("formatNumber", {C("3.14159"), C("%.2f")})), Value("3.14"));
  EXPECT_EQ(R(A("formatNumber", {C("7"), C("%03d")})), Value("007"));
  EXPECT_EQ(R(A("formatNumber", {C("255"), C("%X")})), Value("FF"));
  EXPECT_EQ(R(A("formatNumber", {C("2.7"), C("%d")})), Value("2"));
  EXPECT_EQ(R(A("formatNumber", {C("5"), C("Value: %+d%%")})), Value("Value: +5%"));
  EXPECT_EQ(R(A("formatNumber", {C("12345.678"), C("%10.1e")})), Value("   1.2e+04"));
  EXPECT_EQ(R(A("formatNumber", {C("1"), C("%ld")})), Value("1"));
  EXPECT_TRUE(R(A("formatNumber", {F("m"), C("%d")})).IsNull());
  for (const char* format : {"%n", "%s", "%c", "%p", "%d %d", "%201d", "%.500f", "%*d", "%",
                             "%lllld", "%q"}) {
    const Outcome o = Compute(A("formatNumber", {C("1"), C(format)}));
    EXPECT_EQ(o.code, 270004) << format;
    const std::string prefix = "DerivedField 'r': Apply 'formatNumber': the pattern";
    EXPECT_EQ(o.error.substr(0, prefix.size()), prefix) << format;
  }
  // Patterns from data are checked per record.
  EXPECT_EQ(Code(A("formatNumber", {C("1"), F("p")}), {{"p", Value("%n")}}), 270006);
  EXPECT_EQ(R(A("formatNumber", {C("1"), F("p")}), {{"p", Value("%5.1f")}}), Value("  1.0"));
  EXPECT_EQ(Code(A("formatNumber", {C("-1"), C("%u")})), 270006);
  EXPECT_EQ(Code(A("formatNumber", {C("1e300"), C("%d")})), 270006);
}

// Dates: ISO 8601 texts and numeric date types, counted from a year, and formatted.
TEST(TransformFunctions, Dates) {
  EXPECT_EQ(R(A("dateDaysSinceYear", {C("2003-04-01"), C("1960")})), Value(15796.0));
  EXPECT_EQ(R(A("dateDaysSinceYear", {C("2000-01-01"), C("0")})), Value(730485.0));
  EXPECT_EQ(R(A("dateDaysSinceYear", {C("1959-12-31T23:00:00"), C("1960")})), Value(-1.0));
  EXPECT_EQ(R(A("dateSecondsSinceYear", {C("1960-01-03T03:30:03"), C("1960")})),
            Value(185403.0));
  EXPECT_EQ(R(A("dateSecondsSinceYear", {C("1960-01-03 03:30:03Z"), C("1960")})),
            Value(185403.0));
  EXPECT_EQ(R(A("dateSecondsSinceMidnight", {C("05:20:02")})), Value(19202.0));
  EXPECT_EQ(R(A("dateSecondsSinceMidnight", {C("2020-06-01T00:00:01.5+02:00")})), Value(1.5));
  EXPECT_EQ(R(A("formatDatetime", {C("2024-02-29T13:05:09"), C("%Y/%m/%d %H:%M:%S")})),
            Value("2024/02/29 13:05:09"));
  EXPECT_EQ(R(A("formatDatetime", {C("2024-02-29T13:05:09"), C("%a %b %e %j, %I %p %y %%")})),
            Value("Thu Feb 29 060, 01 PM 24 %"));
  EXPECT_EQ(R(A("formatDatetime", {C("1999-12-31"), C("%A %B %F %D %u")})),
            Value("Friday December 1999-12-31 12/31/99 5"));

  // A numeric date is read by its declared type.
  const std::string dictionary =
      "<DataDictionary><DataField name=\"d\" optype=\"continuous\" "
      "dataType=\"dateDaysSince[1970]\"/><DataField name=\"t\" optype=\"continuous\" "
      "dataType=\"dateTimeSecondsSince[1980]\"/></DataDictionary>";
  EXPECT_EQ(Compute(A("dateDaysSinceYear", {F("d"), C("1960")}), {{"d", Value(1.0)}}, "",
                    dictionary)
                .value,
            Value(3654.0));
  EXPECT_EQ(Compute(A("formatDatetime", {F("t"), C("%F %T")}), {{"t", Value(86399.0)}}, "",
                    dictionary)
                .value,
            Value("1980-01-01 23:59:59"));

  // Dates that do not exist, missing parts and texts of another form are invalid.
  for (const std::string& e : {A("dateDaysSinceYear", {C("2023-02-29"), C("1960")}),
                               A("dateDaysSinceYear", {C("12:00:00"), C("1960")}),
                               A("dateSecondsSinceMidnight", {C("2020-01-01")}),
                               A("dateDaysSinceYear", {C("01/02/2003"), C("1960")}),
                               A("dateDaysSinceYear", {C("2003-04-01"), C("1960.5")}),
                               A("dateSecondsSinceMidnight", {C("25:00:00")}),
                               A("formatDatetime", {C("10:00"), C("%Y")})}) {
    EXPECT_EQ(Code(e), 270006) << e;
  }
  EXPECT_EQ(R(A("dateDaysSinceYear", {F("m"), C("1960")})), kSysMissing);
  EXPECT_EQ(Code(A("formatDatetime", {C("2020-01-01"), C("%Q")})), 270004);
}

// Typing of an Apply's result by the derived field's dataType.
TEST(TransformFunctions, ResultTyping) {
  EXPECT_EQ(Compute(A("+", {C("1"), C("2")}), {}, " dataType=\"string\"").value, Value("3"));
  EXPECT_EQ(Compute(A("concat", {C("1"), C("2")}), {}, " dataType=\"integer\"").value,
            Value(12.0));
  EXPECT_EQ(Compute(A("equal", {C("1"), C("1")}), {}, " dataType=\"boolean\"").value,
            Value(1.0));
  EXPECT_EQ(Compute(A("concat", {C("a"), C("b")}), {}, " dataType=\"double\"").value,
            kSysMissing);
  EXPECT_EQ(Compute(A("concat", {C("7"), C("5")}), {}, " optype=\"continuous\"").value,
            Value(75.0));
}

}  // namespace

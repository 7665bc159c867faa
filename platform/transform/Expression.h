// Compiled expressions of the transformation engine: the tree a DerivedField's XML is
// turned into at load, evaluated per record without touching XML or names.
#ifndef QZ_PLATFORM_TRANSFORM_EXPRESSION_H_
#define QZ_PLATFORM_TRANSFORM_EXPRESSION_H_

#include <cmath>
#include <limits>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "Value.h"
#include "ValueRecord.h"

namespace QZTransformNS_8_0_0 {
namespace internal {

using QZCommon_800::QZMV;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

// PMML data types. kNone: the attribute is absent.
enum class DataType {
  kNone, kString, kInteger, kFloat, kDouble, kBoolean, kDate, kTime, kDateTime,
  kDateDaysSince0, kDateDaysSince1960, kDateDaysSince1970, kDateDaysSince1980,
  kTimeSeconds, kDateTimeSecondsSince0, kDateTimeSecondsSince1960,
  kDateTimeSecondsSince1970, kDateTimeSecondsSince1980
};

// The kind of Value a data type is stored as.
enum class ValueKind {
  kAsComputed,  // no conversion (no dataType; date, time, dateTime)
  kReal,        // real; text read as a number
  kBoolean,     // real 1/0; also reads the texts "true"/"false"
  kText,        // string; reals written as their shortest text
};

// Reads a PMML dataType name; false when the name is not one.
bool ParseDataType(const std::string& name, DataType* type);
ValueKind KindOf(DataType type);
// True for integer, float and double (the types whose values are plain numbers).
bool IsNumericType(DataType type);

// Converts a computed value in place to the kind of a derived field. Missing becomes
// system-missing for real and boolean kinds and null for the others.
void CoerceToKind(ValueKind kind, Value& value);

// Reads the text of a constant (a Constant element, a mapMissingTo attribute) as a value
// of the data type: numbers for the numeric types (integer: a whole number), "true",
// "false", "1", "0" for boolean, the text itself for string, date and time types (kept
// as text), and for kNone a number when the text reads as one, else the text. Returns
// false, with the reason in *why, when the text does not fit the type.
bool MakeConstant(const std::string& text, DataType type, Value* out, std::string* why);

// The system-missing double. Inside the engine a NaN stands for an invalid result (a
// Value never holds NaN, so the two cannot be confused).
constexpr double kMissing = std::numeric_limits<double>::lowest();
inline bool IsMissingReal(double d) { return d == kMissing; }
inline bool IsInvalidReal(double d) { return d != d; }
inline double InvalidReal() { return std::numeric_limits<double>::quiet_NaN(); }

// A value read as a boolean: 1 true, 0 false, -1 missing. Reals are true when not zero;
// texts "true"/"false" and texts that read as numbers count; other texts are missing.
int ToBool(const Value& value);
// Equality as the comparison functions see it: reals numerically; a real and a text
// numerically when the text reads as a number (never equal otherwise); texts byte-wise.
// Missing values are never equal to anything (callers test for missing first).
bool ValuesEqual(const Value& a, const Value& b);
// Order as lessThan and its relatives see it: -1, 0, 1, or 2 when the two cannot be
// ordered (a real against a text that is no number, or a missing value).
int CompareValues(const Value& a, const Value& b);

// A literal of a table or a value list: its text and, when the text reads as one, its
// number (system-missing otherwise). A value matches it by ValuesEqual's rule.
struct Cell {
  std::string text;
  double number = kMissing;

  Cell() = default;
  explicit Cell(std::string t) : text(std::move(t)), number(Value::TextToReal(text)) {}
  bool Matches(const Value& value) const {
    if (value.IsNumericValue()) return !IsMissingReal(number) && value.GetReal() == number;
    return value.IsString() && value.GetText() == text;
  }
};

class Expr;

// What an expression reads while it is evaluated: the record, the record index bound to
// each slot (a name the program knows; -1 when the record lacks it) and, inside a
// user-defined function, the call's arguments.
struct EvalContext {
  ValueRecord* record = nullptr;
  const int* index = nullptr;
  const Value* params = nullptr;
  // The innermost Apply whose invalid result is being passed up, for the message of a
  // refused record; reset by an Apply that turns an invalid result into a value.
  mutable const Expr* invalidAt = nullptr;

  // An input reference: a slot (>= 0) or, inside a function, parameter -ref-1.
  const Value& Input(int ref) const {
    if (ref >= 0) {
      const int i = index[ref];
      return i >= 0 ? (*record)[static_cast<size_t>(i)] : Value::NULL_VALUE;
    }
    return params[-ref - 1];
  }
};

// A compiled expression. Trees are built once at load and immutable afterwards.
// Evaluation never allocates for real results. Three ways to evaluate, with one meaning:
// Eval writes the value, EvalReal gives it as a number (the fast path for numeric
// expressions), EvalRef gives a pointer to it (to a stored value where there is one,
// otherwise to scratch). Each reports an invalid result: Eval by returning false,
// EvalReal by NaN, EvalRef by a null pointer.
class Expr {
 public:
  explicit Expr(bool numeric) : numeric_(numeric) {}
  virtual ~Expr() = default;
  Expr(const Expr&) = delete;
  Expr& operator=(const Expr&) = delete;

  // Writes the result into out, which is never a value the expression reads.
  virtual bool Eval(const EvalContext& ctx, Value& out) const = 0;
  // The result as a number: system-missing when missing or not a number, NaN invalid.
  virtual double EvalReal(const EvalContext& ctx) const;
  virtual const Value* EvalRef(const EvalContext& ctx, Value& scratch) const {
    return Eval(ctx, scratch) ? &scratch : nullptr;
  }
  // True when every result is a real (or missing), so EvalReal loses nothing.
  bool IsNumeric() const { return numeric_; }
  // The dataType the value is declared with (a FieldRef's field, a Constant), kNone when
  // unknown. Date functions read numeric dates by it.
  DataType DeclaredType() const { return declared_; }
  void SetDeclaredType(DataType type) { declared_ = type; }
  // For messages: "Apply '+'"; empty for expressions that never give invalid results.
  virtual std::string Describe() const { return std::string(); }

 private:
  bool numeric_;
  DataType declared_ = DataType::kNone;
};

using ExprPtr = std::unique_ptr<Expr>;

// Constant: a fixed value (null for missing="true").
class ConstantExpr final : public Expr {
 public:
  explicit ConstantExpr(Value value)
      : Expr(value.IsNumericValue() || value.IsNull()),
        value_(std::move(value)),
        real_(value_.GetReal()) {}
  bool Eval(const EvalContext&, Value& out) const override {
    out = value_;
    return true;
  }
  double EvalReal(const EvalContext&) const override { return real_; }
  const Value* EvalRef(const EvalContext&, Value&) const override { return &value_; }
  const Value& Get() const { return value_; }

 private:
  Value value_;
  double real_;
};

// FieldRef: the value of a field of the record (or of a function's parameter), or the
// mapMissingTo value when it is missing (absent, null or system-missing) and one is given.
class FieldRefExpr final : public Expr {
 public:
  FieldRefExpr(int ref, bool hasMapMissing, Value mapMissingTo)
      : Expr(false),
        ref_(ref),
        hasMapMissing_(hasMapMissing),
        mapMissingTo_(std::move(mapMissingTo)),
        mapMissingReal_(mapMissingTo_.GetReal()) {}
  bool Eval(const EvalContext& ctx, Value& out) const override {
    out = *Ref(ctx);
    return true;
  }
  double EvalReal(const EvalContext& ctx) const override {
    const Value& v = ctx.Input(ref_);
    return (hasMapMissing_ && v.IsMissing()) ? mapMissingReal_ : v.GetReal();
  }
  const Value* EvalRef(const EvalContext& ctx, Value&) const override { return Ref(ctx); }
  int Reference() const { return ref_; }

 private:
  const Value* Ref(const EvalContext& ctx) const {
    const Value& v = ctx.Input(ref_);
    return (hasMapMissing_ && v.IsMissing()) ? &mapMissingTo_ : &v;
  }

  int ref_;
  bool hasMapMissing_;
  Value mapMissingTo_;
  double mapMissingReal_;
};

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

#endif  // QZ_PLATFORM_TRANSFORM_EXPRESSION_H_

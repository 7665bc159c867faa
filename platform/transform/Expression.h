// Compiled expressions of the transformation engine: the tree a DerivedField's XML is
// turned into at load, evaluated per record without touching XML or names.
#ifndef QZ_PLATFORM_TRANSFORM_EXPRESSION_H_
#define QZ_PLATFORM_TRANSFORM_EXPRESSION_H_

#include <memory>
#include <string>
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

// Converts a computed value in place to the kind of a derived field. Missing becomes
// system-missing for real and boolean kinds and null for the others.
void CoerceToKind(ValueKind kind, Value& value);

// Reads the text of a constant (a Constant element, a mapMissingTo attribute) as a value
// of the data type: numbers for the numeric types (integer: a whole number), "true",
// "false", "1", "0" for boolean, the text itself for string, date and time types (kept
// as text), and for kNone a number when the text reads as one, else the text. Returns
// false, with the reason in *why, when the text does not fit the type.
bool MakeConstant(const std::string& text, DataType type, Value* out, std::string* why);

// What an expression reads while it is evaluated: the record, and for each slot (a name
// the program knows) the record index bound to it, or -1 when the record lacks it.
struct EvalContext {
  ValueRecord* record;
  const int* index;

  const Value& Field(int slot) const {
    const int i = index[slot];
    return i >= 0 ? (*record)[static_cast<size_t>(i)] : Value::NULL_VALUE;
  }
};

// A compiled expression. Trees are built once at load and immutable afterwards, so they
// may be shared between loaded programs. Evaluation never allocates for real results.
class Expr {
 public:
  virtual ~Expr() = default;
  // Writes the result into out. out is never a value the expression reads.
  virtual void Eval(const EvalContext& ctx, Value& out) const = 0;
  // The result as a number (system-missing when missing or not a number). Numeric
  // nodes override it so that arithmetic over them needs no Value at all.
  virtual double EvalReal(const EvalContext& ctx) const {
    Value v;
    Eval(ctx, v);
    return v.GetReal();
  }
};

using ExprPtr = std::unique_ptr<Expr>;

// Constant: a fixed value (null for missing="true").
class ConstantExpr : public Expr {
 public:
  explicit ConstantExpr(Value value) : value_(std::move(value)), real_(value_.GetReal()) {}
  void Eval(const EvalContext&, Value& out) const override { out = value_; }
  double EvalReal(const EvalContext&) const override { return real_; }

 private:
  Value value_;
  double real_;
};

// FieldRef: the value of a field of the record, or the mapMissingTo value when the
// field is missing (absent, null or system-missing) and one is given.
class FieldRefExpr : public Expr {
 public:
  FieldRefExpr(int slot, bool hasMapMissing, Value mapMissingTo)
      : slot_(slot), hasMapMissing_(hasMapMissing), mapMissingTo_(std::move(mapMissingTo)) {}
  void Eval(const EvalContext& ctx, Value& out) const override {
    const Value& v = ctx.Field(slot_);
    out = (hasMapMissing_ && v.IsMissing()) ? mapMissingTo_ : v;
  }
  double EvalReal(const EvalContext& ctx) const override {
    const Value& v = ctx.Field(slot_);
    return (hasMapMissing_ && v.IsMissing()) ? mapMissingTo_.GetReal() : v.GetReal();
  }

 private:
  int slot_;
  bool hasMapMissing_;
  Value mapMissingTo_;
};

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

#endif  // QZ_PLATFORM_TRANSFORM_EXPRESSION_H_

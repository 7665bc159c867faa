// The expression elements that read one field (or, in MapValues, several) and map its
// value through a table: NormContinuous, NormDiscrete, Discretize and MapValues.
#ifndef QZ_PLATFORM_TRANSFORM_ELEMENTS_H_
#define QZ_PLATFORM_TRANSFORM_ELEMENTS_H_

#include <cstdint>
#include <string>
#include <unordered_map>
#include <vector>

#include "Expression.h"

namespace QZTransformNS_8_0_0 {
namespace internal {

// NormContinuous: piecewise linear through the (orig, norm) points, orig strictly
// ascending, at least two points. Values outside the points are extrapolated from the
// outer segment (asIs), missing (asMissingValues) or the outer norm (asExtremeValues).
class NormContinuousExpr final : public Expr {
 public:
  enum class Outliers { kAsIs, kAsMissing, kAsExtreme };
  NormContinuousExpr(int ref, std::vector<double> orig, std::vector<double> norm,
                     Outliers outliers, bool hasMapMissing, double mapMissingTo);
  bool Eval(const EvalContext& ctx, Value& out) const override {
    out = EvalReal(ctx);
    return true;
  }
  double EvalReal(const EvalContext& ctx) const override;

 private:
  int ref_;
  std::vector<double> orig_;
  std::vector<double> norm_;
  Outliers outliers_;
  bool hasMapMissing_;
  double mapMissingTo_;
};

// NormDiscrete: 1 when the field's value is the given value, else 0.
class NormDiscreteExpr final : public Expr {
 public:
  NormDiscreteExpr(int ref, Cell value, bool hasMapMissing, double mapMissingTo)
      : Expr(true),
        ref_(ref),
        value_(std::move(value)),
        hasMapMissing_(hasMapMissing),
        mapMissingTo_(mapMissingTo) {}
  bool Eval(const EvalContext& ctx, Value& out) const override {
    out = EvalReal(ctx);
    return true;
  }
  double EvalReal(const EvalContext& ctx) const override {
    const Value& v = ctx.Input(ref_);
    if (v.IsMissing()) return hasMapMissing_ ? mapMissingTo_ : kMissing;
    return value_.Matches(v) ? 1.0 : 0.0;
  }

 private:
  int ref_;
  Cell value_;
  bool hasMapMissing_;
  double mapMissingTo_;
};

// A value an element gives as its result, with its number ready for EvalReal.
struct Result {
  bool present = false;
  Value value;
  double real = kMissing;

  Result() = default;
  explicit Result(Value v) : present(true), value(std::move(v)), real(value.GetReal()) {}
};

// Discretize: the binValue of the first bin whose interval holds the field's value;
// defaultValue when none does (a text that is no number included); mapMissingTo when
// the value is missing.
class DiscretizeExpr final : public Expr {
 public:
  struct Bin {
    double left;   // -infinity when open-ended
    double right;  // +infinity when open-ended
    bool leftClosed;
    bool rightClosed;
    Result value;
  };
  DiscretizeExpr(int ref, std::vector<Bin> bins, Result mapMissingTo, Result defaultValue);
  bool Eval(const EvalContext& ctx, Value& out) const override {
    out = Find(ctx).value;
    return true;
  }
  double EvalReal(const EvalContext& ctx) const override { return Find(ctx).real; }
  const Value* EvalRef(const EvalContext& ctx, Value&) const override { return &Find(ctx).value; }

 private:
  const Result& Find(const EvalContext& ctx) const;

  int ref_;
  std::vector<Bin> bins_;
  Result mapMissingTo_;
  Result defaultValue_;
  Result missing_;
};

// MapValues: the outputColumn of the first row whose cells match the values of every
// FieldColumnPair; defaultValue when no row does; mapMissingTo when one of the values is
// missing. The rows are indexed on the first pair's column, so finding a row costs a
// hash lookup and the check of the other pairs on the candidates only.
class MapValuesExpr final : public Expr {
 public:
  struct Row {
    std::vector<Cell> cells;  // one per pair; a row lacking a column never matches
    std::vector<bool> has;
    Result output;
  };
  MapValuesExpr(std::vector<int> refs, std::vector<Row> rows, Result mapMissingTo,
                Result defaultValue);
  bool Eval(const EvalContext& ctx, Value& out) const override {
    out = Find(ctx).value;
    return true;
  }
  double EvalReal(const EvalContext& ctx) const override { return Find(ctx).real; }
  const Value* EvalRef(const EvalContext& ctx, Value&) const override { return &Find(ctx).value; }

 private:
  const Result& Find(const EvalContext& ctx) const;
  bool RowMatches(const Row& row, const EvalContext& ctx) const;

  std::vector<int> refs_;
  std::vector<Row> rows_;
  // Rows in document order by the first pair's cell: by text, and by number for cells
  // that read as numbers.
  std::unordered_map<std::string, std::vector<uint32_t>> byText_;
  std::unordered_map<double, std::vector<uint32_t>> byNumber_;
  Result mapMissingTo_;
  Result defaultValue_;
  Result missing_;
};

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

#endif  // QZ_PLATFORM_TRANSFORM_ELEMENTS_H_

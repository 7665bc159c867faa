// The built-in functions. Each function is a node class; numeric ones compute on
// doubles (EvalReal) without building Values, others on Values. A node reports how its
// computation ended (an Outcome) and ApplyExpr turns that into the Apply's result.
#include "Functions.h"

#include <algorithm>
#include <cmath>
#include <unordered_map>

#include "Dates.h"
#include "QZTransformation.h"
#include "Text.h"

namespace QZTransformNS_8_0_0 {
namespace internal {

namespace {

constexpr long kMalformed = QZTransformation::TRANSFORM_MALFORMED;

// Room for the arguments of a call or the values of a median without allocating.
constexpr size_t kInlineValues = 8;

// ---------------------------------------------------------------------------------
// Numeric helpers

// True for missing (the lowest double) and invalid (NaN) alike: both fail x > lowest.
inline bool Special(double x) { return !(x > kMissing); }

// The outcome of a numeric function of the inputs, given its raw result: an invalid
// input makes it invalid, then a missing input missing; a NaN result is invalid, and
// so is an infinite one from finite inputs (an overflow, a pole such as ln(0)).
Outcome Classify(const double* in, size_t n, double r) {
  for (size_t i = 0; i < n; ++i) {
    if (IsInvalidReal(in[i])) return Outcome::kInvalid;
  }
  for (size_t i = 0; i < n; ++i) {
    if (IsMissingReal(in[i])) return Outcome::kMissingInput;
  }
  if (IsInvalidReal(r)) return Outcome::kInvalid;
  if (std::isinf(r)) {
    for (size_t i = 0; i < n; ++i) {
      if (std::isinf(in[i])) return Outcome::kOk;
    }
    return Outcome::kInvalid;
  }
  return Outcome::kOk;
}

// A value read as a boolean: 1, 0, -1 missing, -2 invalid.
int BoolOf(const Expr& e, const EvalContext& ctx) {
  if (e.IsNumeric()) {
    const double x = e.EvalReal(ctx);
    if (IsInvalidReal(x)) return -2;
    if (IsMissingReal(x)) return -1;
    return x != 0.0 ? 1 : 0;
  }
  Value scratch;
  const Value* v = e.EvalRef(ctx, scratch);
  return v == nullptr ? -2 : ToBool(*v);
}

// The text of an argument (a real as its shortest text); scratch and buffer hold what
// the view points into.
Outcome TextOf(const Expr& e, const EvalContext& ctx, Value& scratch, std::string& buffer,
               std::string_view* out) {
  const Value* v = e.EvalRef(ctx, scratch);
  if (v == nullptr) return Outcome::kInvalid;
  if (v->IsString()) {
    *out = v->GetText();
    return Outcome::kOk;
  }
  if (v->IsMissing() || !v->IsNumericValue()) return Outcome::kMissingInput;
  buffer = Value::RealToText(v->GetReal());
  *out = buffer;
  return Outcome::kOk;
}

// A number argument that must be a whole number within [low, high].
Outcome WholeOf(const Expr& e, const EvalContext& ctx, double low, double high, double* out) {
  const double x = e.EvalReal(ctx);
  if (IsInvalidReal(x)) return Outcome::kInvalid;
  if (IsMissingReal(x)) return Outcome::kMissingInput;
  if (!(x >= low && x <= high) || std::floor(x) != x) return Outcome::kInvalid;
  *out = x;
  return Outcome::kOk;
}

// The worse of two outcomes (invalid before missing).
Outcome Worse(Outcome a, Outcome b) {
  if (a == Outcome::kInvalid || b == Outcome::kInvalid) return Outcome::kInvalid;
  return a != Outcome::kOk ? a : b;
}

const ConstantExpr* AsConstant(const ExprPtr& e) {
  return dynamic_cast<const ConstantExpr*>(e.get());
}

// ---------------------------------------------------------------------------------
// Node frameworks

// A function with a numeric result. Derived::Compute(ctx, outcome) returns the raw
// number and leaves outcome at kOk, or sets it.
template <class Derived>
class RealApply : public ApplyExpr {
 public:
  explicit RealApply(const ApplySite& site) : ApplyExpr(site.function, site.options, true) {}

  double EvalReal(const EvalContext& ctx) const final {
    Outcome o = Outcome::kOk;
    const double r = static_cast<const Derived*>(this)->Compute(ctx, o);
    return o == Outcome::kOk ? r : FinishReal(ctx, r, o);
  }
  bool Eval(const EvalContext& ctx, Value& out) const final {
    Outcome o = Outcome::kOk;
    const double r = static_cast<const Derived*>(this)->Compute(ctx, o);
    if (o == Outcome::kOk) {
      out = r;
      return true;
    }
    if (IsNumeric()) {
      const double d = FinishReal(ctx, r, o);
      if (IsInvalidReal(d)) return false;
      out = d;
      return true;
    }
    out = r;  // mapMissingTo or defaultValue is a text
    return FinishValue(ctx, out, o);
  }
};

// A function with a result of any kind. Derived::Compute(ctx, out) writes the raw value
// and returns the outcome.
template <class Derived>
class ValueApply : public ApplyExpr {
 public:
  ValueApply(const ApplySite& site, bool numericResult)
      : ApplyExpr(site.function, site.options, numericResult) {}

  bool Eval(const EvalContext& ctx, Value& out) const final {
    const Outcome o = static_cast<const Derived*>(this)->Compute(ctx, out);
    return o == Outcome::kOk || FinishValue(ctx, out, o);
  }
};

// ---------------------------------------------------------------------------------
// Arithmetic and mathematics

template <double (*F)(double)>
class Unary final : public RealApply<Unary<F>> {
 public:
  explicit Unary(ApplySite& site) : RealApply<Unary<F>>(site), a_(std::move(site.args[0])) {}
  double Compute(const EvalContext& ctx, Outcome& o) const {
    const double a = a_->EvalReal(ctx);
    const double r = F(a);
    if (Special(a) || !std::isfinite(r)) o = Classify(&a, 1, r);
    return r;
  }

 private:
  ExprPtr a_;
};

template <double (*F)(double, double)>
class Binary final : public RealApply<Binary<F>> {
 public:
  explicit Binary(ApplySite& site)
      : RealApply<Binary<F>>(site), a_(std::move(site.args[0])), b_(std::move(site.args[1])) {}
  double Compute(const EvalContext& ctx, Outcome& o) const {
    const double in[2] = {a_->EvalReal(ctx), b_->EvalReal(ctx)};
    const double r = F(in[0], in[1]);
    if (Special(in[0]) || Special(in[1]) || !std::isfinite(r)) o = Classify(in, 2, r);
    return r;
  }

 private:
  ExprPtr a_;
  ExprPtr b_;
};

template <double (*F)(double, double, double)>
class Ternary final : public RealApply<Ternary<F>> {
 public:
  explicit Ternary(ApplySite& site)
      : RealApply<Ternary<F>>(site),
        a_(std::move(site.args[0])),
        b_(std::move(site.args[1])),
        c_(std::move(site.args[2])) {}
  double Compute(const EvalContext& ctx, Outcome& o) const {
    const double in[3] = {a_->EvalReal(ctx), b_->EvalReal(ctx), c_->EvalReal(ctx)};
    const double r = F(in[0], in[1], in[2]);
    if (Special(in[0]) || Special(in[1]) || Special(in[2]) || !std::isfinite(r)) {
      o = Classify(in, 3, r);
    }
    return r;
  }

 private:
  ExprPtr a_;
  ExprPtr b_;
  ExprPtr c_;
};

double Add(double a, double b) { return a + b; }
double Subtract(double a, double b) { return a - b; }
double Multiply(double a, double b) { return a * b; }
double Divide(double a, double b) { return a / b; }
double Pow(double a, double b) { return std::pow(a, b); }
double Threshold(double a, double b) { return a > b ? 1.0 : 0.0; }
double Modulo(double a, double b) { return a - b * std::floor(a / b); }
double Hypot(double a, double b) { return std::hypot(a, b); }

double Log10(double x) { return std::log10(x); }
double Ln(double x) { return std::log(x); }
double Sqrt(double x) { return std::sqrt(x); }
double Abs(double x) { return std::fabs(x); }
double Exp(double x) { return std::exp(x); }
double Floor(double x) { return std::floor(x); }
double Ceil(double x) { return std::ceil(x); }
// Half-way cases go up (towards positive infinity): round(-2.5) is -2.
double Round(double x) {
  const double f = std::floor(x);
  return x - f >= 0.5 ? f + 1.0 : f;
}
// Half-way cases go to the even neighbour, whatever the floating-point rounding mode.
double Rint(double x) {
  const double f = std::floor(x);
  const double d = x - f;
  if (d > 0.5) return f + 1.0;
  if (d < 0.5) return f;
  return std::fmod(f, 2.0) == 0.0 ? f : f + 1.0;
}
double Expm1(double x) { return std::expm1(x); }
double Ln1p(double x) { return std::log1p(x); }
double Sin(double x) { return std::sin(x); }
double Asin(double x) { return std::asin(x); }
double Sinh(double x) { return std::sinh(x); }
double Cos(double x) { return std::cos(x); }
double Acos(double x) { return std::acos(x); }
double Cosh(double x) { return std::cosh(x); }
double Tan(double x) { return std::tan(x); }
double Atan(double x) { return std::atan(x); }
double Tanh(double x) { return std::tanh(x); }
double Erf(double x) { return std::erf(x); }

constexpr double kSqrt2 = 1.41421356237309504880;
constexpr double kSqrt2Pi = 2.50662827463100050242;

double StdNormalCDF(double x) { return 0.5 * std::erfc(-x / kSqrt2); }
double StdNormalPDF(double x) { return std::exp(-0.5 * x * x) / kSqrt2Pi; }

// The inverse of the standard normal distribution: a rational approximation (relative
// error about 1e-9) refined by two Halley steps on erfc to full double precision.
// p outside [0, 1] gives NaN; 0 and 1 give the infinities.
double StdNormalIDF(double p) {
  if (!(p >= 0.0 && p <= 1.0)) return std::nan("");
  if (p == 0.0) return -HUGE_VAL;
  if (p == 1.0) return HUGE_VAL;
  static const double a[6] = {-3.969683028665376e+01, 2.209460984245205e+02,
                              -2.759285104469687e+02, 1.383577518672690e+02,
                              -3.066479806614716e+01, 2.506628277459239e+00};
  static const double b[5] = {-5.447609879822406e+01, 1.615858368580409e+02,
                              -1.556989798598866e+02, 6.680131188771972e+01,
                              -1.328068155288572e+01};
  static const double c[6] = {-7.784894002430293e-03, -3.223964580411365e-01,
                              -2.400758277161838e+00, -2.549732539343734e+00,
                              4.374664141464968e+00,  2.938163982698783e+00};
  static const double d[4] = {7.784695709041462e-03, 3.224671290700398e-01,
                              2.445134137142996e+00, 3.754408661907416e+00};
  const double low = 0.02425;
  double x;
  if (p < low) {
    const double q = std::sqrt(-2.0 * std::log(p));
    x = (((((c[0] * q + c[1]) * q + c[2]) * q + c[3]) * q + c[4]) * q + c[5]) /
        ((((d[0] * q + d[1]) * q + d[2]) * q + d[3]) * q + 1.0);
  } else if (p <= 1.0 - low) {
    const double q = p - 0.5;
    const double r = q * q;
    x = (((((a[0] * r + a[1]) * r + a[2]) * r + a[3]) * r + a[4]) * r + a[5]) * q /
        (((((b[0] * r + b[1]) * r + b[2]) * r + b[3]) * r + b[4]) * r + 1.0);
  } else {
    const double q = std::sqrt(-2.0 * std::log1p(-p));
    x = -(((((c[0] * q + c[1]) * q + c[2]) * q + c[3]) * q + c[4]) * q + c[5]) /
        ((((d[0] * q + d[1]) * q + d[2]) * q + d[3]) * q + 1.0);
  }
  for (int step = 0; step < 2; ++step) {
    // Work on the nearer tail so that the error term keeps its precision.
    const double e = p < 0.5 ? 0.5 * std::erfc(-x / kSqrt2) - p
                             : (1.0 - p) - 0.5 * std::erfc(x / kSqrt2);
    const double u = e * kSqrt2Pi * std::exp(0.5 * x * x);
    if (!std::isfinite(u)) break;
    x -= u / (1.0 + 0.5 * x * u);
  }
  return x;
}

double NormalCDF(double x, double mu, double sigma) {
  return sigma > 0.0 ? StdNormalCDF((x - mu) / sigma) : std::nan("");
}
double NormalPDF(double x, double mu, double sigma) {
  return sigma > 0.0 ? StdNormalPDF((x - mu) / sigma) / sigma : std::nan("");
}
double NormalIDF(double p, double mu, double sigma) {
  return sigma > 0.0 ? mu + sigma * StdNormalIDF(p) : std::nan("");
}

// min, max, sum, avg, median, product: missing arguments are left out; all of them
// missing gives a missing result.
class Aggregate final : public RealApply<Aggregate> {
 public:
  enum Op { kMin, kMax, kSum, kAvg, kMedian, kProduct };
  Aggregate(ApplySite& site, Op op) : RealApply(site), op_(op), args_(std::move(site.args)) {}

  double Compute(const EvalContext& ctx, Outcome& o) const {
    double inline_[kInlineValues];
    std::vector<double> heap;
    double* values = inline_;
    if (op_ == kMedian && args_.size() > kInlineValues) {
      heap.resize(args_.size());
      values = heap.data();
    }
    size_t n = 0;
    bool anyInfinite = false;
    double acc = op_ == kProduct ? 1.0 : (op_ == kMin ? HUGE_VAL : (op_ == kMax ? -HUGE_VAL : 0.0));
    for (const ExprPtr& arg : args_) {
      const double x = arg->EvalReal(ctx);
      if (IsInvalidReal(x)) {
        o = Outcome::kInvalid;
        return x;
      }
      if (IsMissingReal(x)) continue;
      anyInfinite = anyInfinite || std::isinf(x);
      switch (op_) {
        case kMin: acc = std::min(acc, x); break;
        case kMax: acc = std::max(acc, x); break;
        case kSum:
        case kAvg: acc += x; break;
        case kProduct: acc *= x; break;
        case kMedian: values[n] = x; break;
      }
      ++n;
    }
    if (n == 0) {
      o = Outcome::kMissingInput;
      return kMissing;
    }
    if (op_ == kAvg) acc /= static_cast<double>(n);
    if (op_ == kMedian) {
      const size_t half = n / 2;
      std::nth_element(values, values + half, values + n);
      acc = values[half];
      if (n % 2 == 0) acc = 0.5 * (acc + *std::max_element(values, values + half));
    }
    if (IsInvalidReal(acc) || (std::isinf(acc) && !anyInfinite)) o = Outcome::kInvalid;
    return acc;
  }

 private:
  Op op_;
  std::vector<ExprPtr> args_;
};

// ---------------------------------------------------------------------------------
// Tests and logic (results are 1 and 0)

class MissingTest final : public RealApply<MissingTest> {
 public:
  MissingTest(ApplySite& site, bool negate)
      : RealApply(site), negate_(negate), a_(std::move(site.args[0])) {}
  double Compute(const EvalContext& ctx, Outcome& o) const {
    Value scratch;
    const Value* v = a_->EvalRef(ctx, scratch);
    if (v == nullptr) {
      o = Outcome::kInvalid;
      return InvalidReal();
    }
    return v->IsMissing() != negate_ ? 1.0 : 0.0;
  }

 private:
  bool negate_;
  ExprPtr a_;
};

// isValid / isNotValid: a missing value is neither.
class ValidTest final : public RealApply<ValidTest> {
 public:
  ValidTest(ApplySite& site, bool negate)
      : RealApply(site),
        negate_(negate),
        a_(std::move(site.args[0])),
        validity_(site.validity.empty() ? nullptr : site.validity[0]) {}
  double Compute(const EvalContext& ctx, Outcome& o) const {
    Value scratch;
    const Value* v = a_->EvalRef(ctx, scratch);
    if (v == nullptr) {
      o = Outcome::kInvalid;
      return InvalidReal();
    }
    if (v->IsMissing()) return 0.0;
    const bool valid = validity_ == nullptr || validity_->IsValid(*v);
    return valid != negate_ ? 1.0 : 0.0;
  }

 private:
  bool negate_;
  ExprPtr a_;
  std::shared_ptr<const FieldValidity> validity_;
};

class Compare final : public RealApply<Compare> {
 public:
  enum Op { kEqual, kNotEqual, kLess, kLessOrEqual, kGreater, kGreaterOrEqual };
  Compare(ApplySite& site, Op op)
      : RealApply(site),
        op_(op),
        a_(std::move(site.args[0])),
        b_(std::move(site.args[1])),
        numeric_(a_->IsNumeric() && b_->IsNumeric()) {}

  double Compute(const EvalContext& ctx, Outcome& o) const {
    int c;  // -1, 0, 1; 2 unordered
    if (numeric_) {
      const double in[2] = {a_->EvalReal(ctx), b_->EvalReal(ctx)};
      if (Special(in[0]) || Special(in[1])) {
        o = Classify(in, 2, 0.0);
        return kMissing;
      }
      c = in[0] < in[1] ? -1 : (in[0] > in[1] ? 1 : 0);
    } else {
      Value sa;
      Value sb;
      const Value* a = a_->EvalRef(ctx, sa);
      const Value* b = b_->EvalRef(ctx, sb);
      if (a == nullptr || b == nullptr) {
        o = Outcome::kInvalid;
        return InvalidReal();
      }
      if (a->IsMissing() || b->IsMissing()) {
        o = Outcome::kMissingInput;
        return kMissing;
      }
      if (op_ == kEqual || op_ == kNotEqual) {
        c = ValuesEqual(*a, *b) ? 0 : 2;
      } else {
        c = CompareValues(*a, *b);
        if (c == 2) {  // a number against a text that is none
          o = Outcome::kInvalid;
          return InvalidReal();
        }
      }
    }
    bool r = false;
    switch (op_) {
      case kEqual: r = c == 0; break;
      case kNotEqual: r = c != 0; break;
      case kLess: r = c == -1; break;
      case kLessOrEqual: r = c == -1 || c == 0; break;
      case kGreater: r = c == 1; break;
      case kGreaterOrEqual: r = c == 1 || c == 0; break;
    }
    return r ? 1.0 : 0.0;
  }

 private:
  Op op_;
  ExprPtr a_;
  ExprPtr b_;
  bool numeric_;
};

// and / or in three-valued logic: a settling argument (false for and, true for or)
// decides even when another is missing; the arguments after it are not evaluated.
class Logic final : public RealApply<Logic> {
 public:
  Logic(ApplySite& site, bool isAnd) : RealApply(site), and_(isAnd), args_(std::move(site.args)) {}
  double Compute(const EvalContext& ctx, Outcome& o) const {
    const int settles = and_ ? 0 : 1;
    bool anyMissing = false;
    for (const ExprPtr& arg : args_) {
      const int b = BoolOf(*arg, ctx);
      if (b == -2) {
        o = Outcome::kInvalid;
        return InvalidReal();
      }
      if (b == settles) return static_cast<double>(settles);
      anyMissing = anyMissing || b == -1;
    }
    if (anyMissing) {
      o = Outcome::kMissingInput;
      return kMissing;
    }
    return and_ ? 1.0 : 0.0;
  }

 private:
  bool and_;
  std::vector<ExprPtr> args_;
};

class Not final : public RealApply<Not> {
 public:
  explicit Not(ApplySite& site) : RealApply(site), a_(std::move(site.args[0])) {}
  double Compute(const EvalContext& ctx, Outcome& o) const {
    const int b = BoolOf(*a_, ctx);
    if (b < 0) {
      o = b == -2 ? Outcome::kInvalid : Outcome::kMissingInput;
      return b == -2 ? InvalidReal() : kMissing;
    }
    return b == 1 ? 0.0 : 1.0;
  }

 private:
  ExprPtr a_;
};

// isIn / isNotIn: whether the first argument equals one of the others (missing ones
// among the others are left out).
class InTest final : public RealApply<InTest> {
 public:
  InTest(ApplySite& site, bool negate)
      : RealApply(site), negate_(negate), args_(std::move(site.args)) {}
  double Compute(const EvalContext& ctx, Outcome& o) const {
    Value sx;
    const Value* x = args_[0]->EvalRef(ctx, sx);
    if (x == nullptr || x->IsMissing()) {
      o = x == nullptr ? Outcome::kInvalid : Outcome::kMissingInput;
      return x == nullptr ? InvalidReal() : kMissing;
    }
    bool found = false;
    for (size_t i = 1; i < args_.size() && !found; ++i) {
      Value sv;
      const Value* v = args_[i]->EvalRef(ctx, sv);
      if (v == nullptr) {
        o = Outcome::kInvalid;
        return InvalidReal();
      }
      found = !v->IsMissing() && ValuesEqual(*x, *v);
    }
    return found != negate_ ? 1.0 : 0.0;
  }

 private:
  bool negate_;
  std::vector<ExprPtr> args_;
};

// if (condition, then [, else]): only the branch taken is evaluated; a missing condition
// gives a missing result, and so does a false one without an else branch.
class If final : public ApplyExpr {
 public:
  explicit If(ApplySite& site)
      : ApplyExpr(site.function, site.options,
                  site.args[1]->IsNumeric() && (site.args.size() < 3 || site.args[2]->IsNumeric())),
        cond_(std::move(site.args[0])),
        then_(std::move(site.args[1])),
        else_(site.args.size() > 2 ? std::move(site.args[2]) : nullptr) {}

  double EvalReal(const EvalContext& ctx) const override {
    if (!IsNumeric()) return Expr::EvalReal(ctx);
    const Expr* branch = nullptr;
    const Outcome o = Choose(ctx, &branch);
    if (o != Outcome::kOk) return FinishReal(ctx, InvalidReal(), o);
    const double r = branch->EvalReal(ctx);
    if (IsInvalidReal(r)) return FinishReal(ctx, r, Outcome::kInvalid);
    if (IsMissingReal(r)) return FinishReal(ctx, r, Outcome::kMissingInput);
    return r;
  }
  bool Eval(const EvalContext& ctx, Value& out) const override {
    const Expr* branch = nullptr;
    Outcome o = Choose(ctx, &branch);
    if (o == Outcome::kOk) {
      if (!branch->Eval(ctx, out)) {
        o = Outcome::kInvalid;
      } else if (out.IsMissing()) {
        o = Outcome::kMissingInput;
      }
    } else {
      out = Value();
    }
    return o == Outcome::kOk || FinishValue(ctx, out, o);
  }

 private:
  Outcome Choose(const EvalContext& ctx, const Expr** branch) const {
    const int c = BoolOf(*cond_, ctx);
    if (c == -2) return Outcome::kInvalid;
    if (c == -1) return Outcome::kMissingInput;
    *branch = c == 1 ? then_.get() : else_.get();
    return *branch != nullptr ? Outcome::kOk : Outcome::kMissingResult;
  }

  ExprPtr cond_;
  ExprPtr then_;
  ExprPtr else_;
};

// ---------------------------------------------------------------------------------
// Text

class TextCase final : public ValueApply<TextCase> {
 public:
  enum Op { kUpper, kLower, kTrim };
  TextCase(ApplySite& site, Op op)
      : ValueApply(site, false), op_(op), a_(std::move(site.args[0])) {}
  Outcome Compute(const EvalContext& ctx, Value& out) const {
    Value scratch;
    std::string buffer;
    std::string_view text;
    const Outcome o = TextOf(*a_, ctx, scratch, buffer, &text);
    if (o != Outcome::kOk) return o;
    switch (op_) {
      case kUpper: out = AsciiUpper(text); break;
      case kLower: out = AsciiLower(text); break;
      case kTrim: out = std::string(TrimBlanks(text)); break;
    }
    return Outcome::kOk;
  }

 private:
  Op op_;
  ExprPtr a_;
};

class StringLength final : public RealApply<StringLength> {
 public:
  explicit StringLength(ApplySite& site) : RealApply(site), a_(std::move(site.args[0])) {}
  double Compute(const EvalContext& ctx, Outcome& o) const {
    Value scratch;
    std::string buffer;
    std::string_view text;
    o = TextOf(*a_, ctx, scratch, buffer, &text);
    return o == Outcome::kOk ? static_cast<double>(CodePointCount(text)) : kMissing;
  }

 private:
  ExprPtr a_;
};

// substring (text, start, length): start counts characters from 1; both whole numbers,
// start at least 1 and length at least 0 (otherwise the result is invalid).
class Substring final : public ValueApply<Substring> {
 public:
  explicit Substring(ApplySite& site)
      : ValueApply(site, false),
        a_(std::move(site.args[0])),
        start_(std::move(site.args[1])),
        length_(std::move(site.args[2])) {}
  Outcome Compute(const EvalContext& ctx, Value& out) const {
    Value scratch;
    std::string buffer;
    std::string_view text;
    double start = 0;
    double length = 0;
    Outcome o = TextOf(*a_, ctx, scratch, buffer, &text);
    o = Worse(o, WholeOf(*start_, ctx, 1, 1e15, &start));
    o = Worse(o, WholeOf(*length_, ctx, 0, 1e15, &length));
    if (o != Outcome::kOk) return o;
    out = std::string(
        CodePointSubstring(text, static_cast<size_t>(start), static_cast<size_t>(length)));
    return Outcome::kOk;
  }

 private:
  ExprPtr a_;
  ExprPtr start_;
  ExprPtr length_;
};

class Concat final : public ValueApply<Concat> {
 public:
  explicit Concat(ApplySite& site) : ValueApply(site, false), args_(std::move(site.args)) {}
  Outcome Compute(const EvalContext& ctx, Value& out) const {
    std::string result;
    for (const ExprPtr& arg : args_) {
      Value scratch;
      std::string buffer;
      std::string_view text;
      const Outcome o = TextOf(*arg, ctx, scratch, buffer, &text);
      if (o != Outcome::kOk) return o;
      result.append(text);
    }
    out = std::move(result);
    return Outcome::kOk;
  }

 private:
  std::vector<ExprPtr> args_;
};

// The compiled pattern of matches or replace: built at load when the pattern is a
// Constant, otherwise for each call.
class PatternArg {
 public:
  explicit PatternArg(ExprPtr pattern) : pattern_(std::move(pattern)) {
    const ConstantExpr* constant = AsConstant(pattern_);
    if (constant == nullptr || constant->Get().IsMissing()) return;
    std::string why;
    const std::string text = constant->Get().GetString();
    if (!fixed_.Compile(text, &why)) throw BuildError{kMalformed, why};
    isFixed_ = true;
  }
  // The pattern to use, compiled into *scratch when it is not fixed.
  Outcome Get(const EvalContext& ctx, Regex* scratch, const Regex** out) const {
    if (isFixed_) {
      *out = &fixed_;
      return Outcome::kOk;
    }
    Value sv;
    std::string buffer;
    std::string_view text;
    const Outcome o = TextOf(*pattern_, ctx, sv, buffer, &text);
    if (o != Outcome::kOk) return o;
    std::string why;
    if (!scratch->Compile(text, &why)) return Outcome::kInvalid;
    *out = scratch;
    return Outcome::kOk;
  }

 private:
  ExprPtr pattern_;
  Regex fixed_;
  bool isFixed_ = false;
};

class Matches final : public RealApply<Matches> {
 public:
  explicit Matches(ApplySite& site)
      : RealApply(site), a_(std::move(site.args[0])), pattern_(std::move(site.args[1])) {}
  double Compute(const EvalContext& ctx, Outcome& o) const {
    Value scratch;
    std::string buffer;
    std::string_view text;
    Regex compiled;
    const Regex* re = nullptr;
    o = Worse(TextOf(*a_, ctx, scratch, buffer, &text), pattern_.Get(ctx, &compiled, &re));
    if (o != Outcome::kOk) return o == Outcome::kInvalid ? InvalidReal() : kMissing;
    const int found = re->Search(text);
    if (found < 0) {
      o = Outcome::kInvalid;
      return InvalidReal();
    }
    return found;
  }

 private:
  ExprPtr a_;
  PatternArg pattern_;
};

class Replace final : public ValueApply<Replace> {
 public:
  explicit Replace(ApplySite& site)
      : ValueApply(site, false),
        a_(std::move(site.args[0])),
        pattern_(std::move(site.args[1])),
        replacement_(std::move(site.args[2])) {}
  Outcome Compute(const EvalContext& ctx, Value& out) const {
    Value s1;
    Value s2;
    std::string b1;
    std::string b2;
    std::string_view text;
    std::string_view replacement;
    Regex compiled;
    const Regex* re = nullptr;
    Outcome o = TextOf(*a_, ctx, s1, b1, &text);
    o = Worse(o, pattern_.Get(ctx, &compiled, &re));
    o = Worse(o, TextOf(*replacement_, ctx, s2, b2, &replacement));
    if (o != Outcome::kOk) return o;
    std::string result;
    if (!re->Replace(text, replacement, &result)) return Outcome::kInvalid;
    out = std::move(result);
    return Outcome::kOk;
  }

 private:
  ExprPtr a_;
  PatternArg pattern_;
  ExprPtr replacement_;
};

// The pattern argument of formatNumber and formatDatetime: a constant pattern is parsed
// once at load (a malformed one is refused there), any other per record.
template <class Format>
class FormatPattern {
 public:
  explicit FormatPattern(ExprPtr pattern) : pattern_(std::move(pattern)) {
    const ConstantExpr* constant = AsConstant(pattern_);
    if (constant == nullptr || constant->Get().IsMissing()) return;
    std::string why;
    if (!fixed_.Parse(constant->Get().GetString(), &why)) throw BuildError{kMalformed, why};
    isFixed_ = true;
  }

  // Writes what into out as the pattern says, given the outcome of computing what.
  template <class T>
  Outcome Apply(Outcome o, const T& what, const EvalContext& ctx, Value& out) const {
    Format parsed;
    const Format* format = &fixed_;
    if (!isFixed_) {
      Value scratch;
      std::string buffer;
      std::string_view text;
      std::string why;
      o = Worse(o, TextOf(*pattern_, ctx, scratch, buffer, &text));
      if (o != Outcome::kOk) return o;
      if (!parsed.Parse(text, &why)) return Outcome::kInvalid;
      format = &parsed;
    }
    if (o != Outcome::kOk) return o;
    std::string result;
    if (!format->Format(what, &result)) return Outcome::kInvalid;
    out = std::move(result);
    return Outcome::kOk;
  }

 private:
  ExprPtr pattern_;
  Format fixed_;
  bool isFixed_ = false;
};

class FormatNumberFn final : public ValueApply<FormatNumberFn> {
 public:
  explicit FormatNumberFn(ApplySite& site)
      : ValueApply(site, false), a_(std::move(site.args[0])), pattern_(std::move(site.args[1])) {}
  Outcome Compute(const EvalContext& ctx, Value& out) const {
    const double x = a_->EvalReal(ctx);
    const Outcome o = IsInvalidReal(x) ? Outcome::kInvalid
                      : (IsMissingReal(x) ? Outcome::kMissingInput : Outcome::kOk);
    return pattern_.Apply(o, x, ctx, out);
  }

 private:
  ExprPtr a_;
  FormatPattern<NumberFormat> pattern_;
};

// ---------------------------------------------------------------------------------
// Dates

// The date argument of a date function: ISO text, or a number of a numeric date type.
Outcome DateOf(const Expr& e, const EvalContext& ctx, DateTime* out) {
  Value scratch;
  const Value* v = e.EvalRef(ctx, scratch);
  if (v == nullptr) return Outcome::kInvalid;
  if (v->IsMissing()) return Outcome::kMissingInput;
  return ToDateTime(*v, e.DeclaredType(), out) ? Outcome::kOk : Outcome::kInvalid;
}

class FormatDatetimeFn final : public ValueApply<FormatDatetimeFn> {
 public:
  explicit FormatDatetimeFn(ApplySite& site)
      : ValueApply(site, false), a_(std::move(site.args[0])), pattern_(std::move(site.args[1])) {}
  Outcome Compute(const EvalContext& ctx, Value& out) const {
    DateTime when;
    const Outcome o = DateOf(*a_, ctx, &when);
    return pattern_.Apply(o, when, ctx, out);
  }

 private:
  ExprPtr a_;
  FormatPattern<DateFormat> pattern_;
};

// dateDaysSinceYear, dateSecondsSinceYear, dateSecondsSinceMidnight.
class DateCount final : public RealApply<DateCount> {
 public:
  enum Op { kDaysSinceYear, kSecondsSinceYear, kSecondsSinceMidnight };
  DateCount(ApplySite& site, Op op)
      : RealApply(site),
        op_(op),
        a_(std::move(site.args[0])),
        year_(site.args.size() > 1 ? std::move(site.args[1]) : nullptr) {}
  double Compute(const EvalContext& ctx, Outcome& o) const {
    DateTime when;
    o = DateOf(*a_, ctx, &when);
    double year = 0;
    if (year_ != nullptr) o = Worse(o, WholeOf(*year_, ctx, -1e6, 1e6, &year));
    if (o == Outcome::kOk) {
      if (op_ == kSecondsSinceMidnight) {
        if (when.hasTime) return when.seconds;
      } else if (when.hasDate) {
        const double days =
            static_cast<double>(when.days - DaysFromCivil(static_cast<int64_t>(year), 1, 1));
        return op_ == kDaysSinceYear ? days : days * 86400.0 + when.seconds;
      }
      o = Outcome::kInvalid;  // a time without a date, or a date without a time
    }
    return o == Outcome::kInvalid ? InvalidReal() : kMissing;
  }

 private:
  Op op_;
  ExprPtr a_;
  ExprPtr year_;
};

// ---------------------------------------------------------------------------------
// User-defined functions

class Call final : public ApplyExpr {
 public:
  Call(ApplySite& site, const Function& function)
      : ApplyExpr(site.function, site.options,
                  function.kind == ValueKind::kReal || function.kind == ValueKind::kBoolean ||
                      (function.kind == ValueKind::kAsComputed && function.body != nullptr &&
                       function.body->IsNumeric())),
        function_(function),
        args_(std::move(site.args)) {}

  bool Eval(const EvalContext& ctx, Value& out) const override {
    const Outcome o = Compute(ctx, out);
    return o == Outcome::kOk || FinishValue(ctx, out, o);
  }

 private:
  Outcome Compute(const EvalContext& ctx, Value& out) const {
    const size_t n = args_.size();
    Value inline_[kInlineValues];
    std::unique_ptr<Value[]> heap;
    Value* frame = inline_;
    if (n > kInlineValues) {
      heap.reset(new Value[n]);
      frame = heap.get();
    }
    bool anyMissing = false;
    for (size_t i = 0; i < n; ++i) {
      if (!args_[i]->Eval(ctx, frame[i])) {
        out = Value();
        return Outcome::kInvalid;
      }
      CoerceToKind(function_.paramKinds[i], frame[i]);
      anyMissing = anyMissing || frame[i].IsMissing();
    }
    // With mapMissingTo, a call with a missing argument is not evaluated.
    if (anyMissing && HasMapMissing()) return Outcome::kMissingInput;
    EvalContext inner;
    inner.record = ctx.record;
    inner.index = ctx.index;
    inner.params = frame;
    const bool ok = function_.body->Eval(inner, out);
    if (ctx.invalidAt == nullptr) ctx.invalidAt = inner.invalidAt;
    if (!ok) return Outcome::kInvalid;
    CoerceToKind(function_.kind, out);
    if (out.IsMissing()) return anyMissing ? Outcome::kMissingInput : Outcome::kMissingResult;
    return Outcome::kOk;
  }

  const Function& function_;
  std::vector<ExprPtr> args_;
};

// ---------------------------------------------------------------------------------
// The table of built-in functions

using Builder = ExprPtr (*)(ApplySite&);

struct Builtin {
  int minArgs;
  int maxArgs;  // -1: no limit
  Builder build;
};

template <double (*F)(double)>
ExprPtr MakeUnary(ApplySite& s) { return ExprPtr(new Unary<F>(s)); }
template <double (*F)(double, double)>
ExprPtr MakeBinary(ApplySite& s) { return ExprPtr(new Binary<F>(s)); }
template <double (*F)(double, double, double)>
ExprPtr MakeTernary(ApplySite& s) { return ExprPtr(new Ternary<F>(s)); }
template <Aggregate::Op Op>
ExprPtr MakeAggregate(ApplySite& s) { return ExprPtr(new Aggregate(s, Op)); }
template <Compare::Op Op>
ExprPtr MakeCompare(ApplySite& s) { return ExprPtr(new Compare(s, Op)); }
template <TextCase::Op Op>
ExprPtr MakeTextCase(ApplySite& s) { return ExprPtr(new TextCase(s, Op)); }
template <DateCount::Op Op>
ExprPtr MakeDateCount(ApplySite& s) { return ExprPtr(new DateCount(s, Op)); }
template <bool Negate>
ExprPtr MakeMissingTest(ApplySite& s) { return ExprPtr(new MissingTest(s, Negate)); }
template <bool Negate>
ExprPtr MakeValidTest(ApplySite& s) { return ExprPtr(new ValidTest(s, Negate)); }
template <bool Negate>
ExprPtr MakeInTest(ApplySite& s) { return ExprPtr(new InTest(s, Negate)); }
template <bool IsAnd>
ExprPtr MakeLogic(ApplySite& s) { return ExprPtr(new Logic(s, IsAnd)); }
template <class Node>
ExprPtr Make(ApplySite& s) { return ExprPtr(new Node(s)); }

const std::unordered_map<std::string, Builtin>& Builtins() {
  static const std::unordered_map<std::string, Builtin> kTable = {
      {"+", {2, 2, &MakeBinary<Add>}},
      {"-", {2, 2, &MakeBinary<Subtract>}},
      {"*", {2, 2, &MakeBinary<Multiply>}},
      {"/", {2, 2, &MakeBinary<Divide>}},
      {"min", {1, -1, &MakeAggregate<Aggregate::kMin>}},
      {"max", {1, -1, &MakeAggregate<Aggregate::kMax>}},
      {"sum", {1, -1, &MakeAggregate<Aggregate::kSum>}},
      {"avg", {1, -1, &MakeAggregate<Aggregate::kAvg>}},
      {"median", {1, -1, &MakeAggregate<Aggregate::kMedian>}},
      {"product", {1, -1, &MakeAggregate<Aggregate::kProduct>}},
      {"log10", {1, 1, &MakeUnary<Log10>}},
      {"ln", {1, 1, &MakeUnary<Ln>}},
      {"sqrt", {1, 1, &MakeUnary<Sqrt>}},
      {"abs", {1, 1, &MakeUnary<Abs>}},
      {"exp", {1, 1, &MakeUnary<Exp>}},
      {"pow", {2, 2, &MakeBinary<Pow>}},
      {"threshold", {2, 2, &MakeBinary<Threshold>}},
      {"floor", {1, 1, &MakeUnary<Floor>}},
      {"ceil", {1, 1, &MakeUnary<Ceil>}},
      {"round", {1, 1, &MakeUnary<Round>}},
      {"modulo", {2, 2, &MakeBinary<Modulo>}},
      {"expm1", {1, 1, &MakeUnary<Expm1>}},
      {"ln1p", {1, 1, &MakeUnary<Ln1p>}},
      {"rint", {1, 1, &MakeUnary<Rint>}},
      {"hypot", {2, 2, &MakeBinary<Hypot>}},
      {"sin", {1, 1, &MakeUnary<Sin>}},
      {"asin", {1, 1, &MakeUnary<Asin>}},
      {"sinh", {1, 1, &MakeUnary<Sinh>}},
      {"cos", {1, 1, &MakeUnary<Cos>}},
      {"acos", {1, 1, &MakeUnary<Acos>}},
      {"cosh", {1, 1, &MakeUnary<Cosh>}},
      {"tan", {1, 1, &MakeUnary<Tan>}},
      {"atan", {1, 1, &MakeUnary<Atan>}},
      {"tanh", {1, 1, &MakeUnary<Tanh>}},
      {"erf", {1, 1, &MakeUnary<Erf>}},
      {"normalCDF", {3, 3, &MakeTernary<NormalCDF>}},
      {"normalPDF", {3, 3, &MakeTernary<NormalPDF>}},
      {"stdNormalCDF", {1, 1, &MakeUnary<StdNormalCDF>}},
      {"stdNormalPDF", {1, 1, &MakeUnary<StdNormalPDF>}},
      {"normalIDF", {3, 3, &MakeTernary<NormalIDF>}},
      {"stdNormalIDF", {1, 1, &MakeUnary<StdNormalIDF>}},
      {"isMissing", {1, 1, &MakeMissingTest<false>}},
      {"isNotMissing", {1, 1, &MakeMissingTest<true>}},
      {"isValid", {1, 1, &MakeValidTest<false>}},
      {"isNotValid", {1, 1, &MakeValidTest<true>}},
      {"equal", {2, 2, &MakeCompare<Compare::kEqual>}},
      {"notEqual", {2, 2, &MakeCompare<Compare::kNotEqual>}},
      {"lessThan", {2, 2, &MakeCompare<Compare::kLess>}},
      {"lessOrEqual", {2, 2, &MakeCompare<Compare::kLessOrEqual>}},
      {"greaterThan", {2, 2, &MakeCompare<Compare::kGreater>}},
      {"greaterOrEqual", {2, 2, &MakeCompare<Compare::kGreaterOrEqual>}},
      {"and", {2, -1, &MakeLogic<true>}},
      {"or", {2, -1, &MakeLogic<false>}},
      {"not", {1, 1, &Make<Not>}},
      {"isIn", {2, -1, &MakeInTest<false>}},
      {"isNotIn", {2, -1, &MakeInTest<true>}},
      {"if", {2, 3, &Make<If>}},
      {"uppercase", {1, 1, &MakeTextCase<TextCase::kUpper>}},
      {"lowercase", {1, 1, &MakeTextCase<TextCase::kLower>}},
      {"trimBlanks", {1, 1, &MakeTextCase<TextCase::kTrim>}},
      {"stringLength", {1, 1, &Make<StringLength>}},
      {"substring", {3, 3, &Make<Substring>}},
      {"concat", {1, -1, &Make<Concat>}},
      {"replace", {3, 3, &Make<Replace>}},
      {"matches", {2, 2, &Make<Matches>}},
      {"formatNumber", {2, 2, &Make<FormatNumberFn>}},
      {"formatDatetime", {2, 2, &Make<FormatDatetimeFn>}},
      {"dateDaysSinceYear", {2, 2, &MakeDateCount<DateCount::kDaysSinceYear>}},
      {"dateSecondsSinceYear", {2, 2, &MakeDateCount<DateCount::kSecondsSinceYear>}},
      {"dateSecondsSinceMidnight", {1, 1, &MakeDateCount<DateCount::kSecondsSinceMidnight>}},
  };
  return kTable;
}

}  // namespace

ApplyExpr::ApplyExpr(std::string function, const ApplyOptions& options, bool numericResult)
    : Expr(numericResult &&
           (!options.hasMapMissing || options.mapMissingTo.IsNumericValue()) &&
           (!options.hasDefault || options.defaultValue.IsNumericValue())),
      function_(std::move(function)),
      options_(options),
      mapMissingReal_(options.mapMissingTo.GetReal()),
      defaultReal_(options.defaultValue.GetReal()) {}

double ApplyExpr::FinishReal(const EvalContext& ctx, double raw, Outcome outcome) const {
  if (outcome == Outcome::kInvalid) {
    switch (options_.invalid) {
      case InvalidTreatment::kReturnInvalid:
        if (ctx.invalidAt == nullptr) ctx.invalidAt = this;
        return InvalidReal();
      case InvalidTreatment::kAsIs:
        ctx.invalidAt = nullptr;
        return IsInvalidReal(raw) ? kMissing : raw;
      case InvalidTreatment::kAsMissing:
        ctx.invalidAt = nullptr;
        outcome = Outcome::kMissingResult;
        break;
    }
  }
  if (outcome == Outcome::kMissingInput && options_.hasMapMissing) return mapMissingReal_;
  if (outcome != Outcome::kOk && options_.hasDefault) return defaultReal_;
  return outcome == Outcome::kOk ? raw : kMissing;
}

bool ApplyExpr::FinishValue(const EvalContext& ctx, Value& out, Outcome outcome) const {
  if (outcome == Outcome::kInvalid) {
    switch (options_.invalid) {
      case InvalidTreatment::kReturnInvalid:
        if (ctx.invalidAt == nullptr) ctx.invalidAt = this;
        return false;
      case InvalidTreatment::kAsIs:
        ctx.invalidAt = nullptr;
        return true;
      case InvalidTreatment::kAsMissing:
        ctx.invalidAt = nullptr;
        outcome = Outcome::kMissingResult;
        break;
    }
  }
  if (outcome == Outcome::kMissingInput && options_.hasMapMissing) {
    out = options_.mapMissingTo;
  } else if (outcome != Outcome::kOk && options_.hasDefault) {
    out = options_.defaultValue;
  } else if (outcome != Outcome::kOk) {
    out = IsNumeric() ? Value(kMissing) : Value();
  }
  return true;
}

bool FieldValidity::IsValid(const Value& value) const {
  if (value.IsMissing()) return false;
  if (numeric && IsMissingReal(value.GetReal())) return false;
  for (const Cell& cell : notValid) {
    if (cell.Matches(value)) return false;
  }
  if (valid.empty() && intervals.empty()) return true;
  for (const Cell& cell : valid) {
    if (cell.Matches(value)) return true;
  }
  const double x = value.GetReal();
  if (IsMissingReal(x)) return false;
  for (const Interval& interval : intervals) {
    if (interval.Contains(x)) return true;
  }
  return false;
}

bool FindBuiltin(const std::string& name, int* minArgs, int* maxArgs) {
  const auto& table = Builtins();
  const auto found = table.find(name);
  if (found == table.end()) return false;
  *minArgs = found->second.minArgs;
  *maxArgs = found->second.maxArgs;
  return true;
}

ExprPtr BuildApply(ApplySite& site) { return Builtins().at(site.function).build(site); }

ExprPtr BuildCall(ApplySite& site, const Function& function) {
  return ExprPtr(new Call(site, function));
}

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

// Apply: the built-in functions of PMML and calls of user-defined functions, with the
// Apply element's handling of missing and invalid results.
#ifndef QZ_PLATFORM_TRANSFORM_FUNCTIONS_H_
#define QZ_PLATFORM_TRANSFORM_FUNCTIONS_H_

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "Expression.h"

namespace QZTransformNS_8_0_0 {
namespace internal {

// What an Apply does with an invalid result (a division by zero, the logarithm of a
// negative number, an argument that was itself invalid).
enum class InvalidTreatment : uint8_t {
  kReturnInvalid,  // the result is invalid: the record is refused unless an enclosing
                   // Apply treats it otherwise
  kAsIs,           // the number as computed (an infinity; NaN becomes missing)
  kAsMissing,      // missing (then defaultValue, when given)
};

// The attributes of an Apply element besides its function.
struct ApplyOptions {
  bool hasMapMissing = false;  // mapMissingTo: the result when an argument is missing
  Value mapMissingTo;
  bool hasDefault = false;     // defaultValue: the result when it would be missing
  Value defaultValue;
  InvalidTreatment invalid = InvalidTreatment::kReturnInvalid;
};

// How a function's computation ended.
enum class Outcome : uint8_t {
  kOk,
  kMissingInput,   // an argument the result depends on is missing
  kMissingResult,  // the result is missing although the arguments are not
  kInvalid,
};

// A data field's declared values, for isValid and isNotValid: a value is valid when it is
// not missing, reads as a number for a numeric dataType, is not listed as invalid or
// missing, and, when the field lists valid values or intervals, is one of them.
struct FieldValidity {
  struct Interval {
    double left;   // -infinity when open-ended
    double right;  // +infinity when open-ended
    bool leftClosed;
    bool rightClosed;
    bool Contains(double x) const {
      return (leftClosed ? x >= left : x > left) && (rightClosed ? x <= right : x < right);
    }
  };
  bool numeric = false;
  std::vector<Cell> valid;
  std::vector<Cell> notValid;  // listed as invalid or as missing
  std::vector<Interval> intervals;

  bool IsValid(const Value& value) const;
};

// A user-defined function (DefineFunction). Built in two steps during one load: the
// signature first, so that calls may be compiled in any document order, then the body.
// Immutable once its load has succeeded.
struct Function {
  std::string name;
  std::vector<std::string> params;
  std::vector<ValueKind> paramKinds;
  std::vector<DataType> paramTypes;
  DataType dataType = DataType::kNone;
  ValueKind kind = ValueKind::kAsComputed;
  ExprPtr body;
  // For the checks after compiling: the functions the body calls, with the nesting
  // depth of each call, and the depth of the body's own nesting.
  std::vector<std::pair<const Function*, int>> calls;
  int ownDepth = 0;
  int depth = 0;  // nesting depth of an evaluation, through the calls
  uint64_t ownSteps = 0;  // nodes of the body
  uint64_t steps = 0;     // nodes one call visits at most, through the calls
};

// The base of every Apply node: the function's name (for messages) and the options, and
// how a raw outcome becomes the Apply's result.
class ApplyExpr : public Expr {
 public:
  ApplyExpr(std::string function, const ApplyOptions& options, bool numericResult);
  std::string Describe() const override { return "Apply '" + function_ + "'"; }

 protected:
  // The number an outcome other than kOk gives; raw is the computed number (used by
  // asIs). NaN when the Apply's result is invalid.
  double FinishReal(const EvalContext& ctx, double raw, Outcome outcome) const;
  // The same for a value: out holds the raw result and receives the final one. False
  // when the result is invalid.
  bool FinishValue(const EvalContext& ctx, Value& out, Outcome outcome) const;
  bool HasMapMissing() const { return options_.hasMapMissing; }

 private:
  std::string function_;
  ApplyOptions options_;
  double mapMissingReal_;
  double defaultReal_;
};

// Thrown by BuildApply for an Apply that cannot be built (an invalid constant pattern,
// for example); the loader adds the field and the element to the message.
struct BuildError {
  long code;
  std::string message;
};

// What the loader knows about one Apply when it builds it.
struct ApplySite {
  std::string function;
  ApplyOptions options;
  std::vector<ExprPtr> args;
  // Per argument: the validity of the data field it refers to, when it is a FieldRef to
  // a data field whose declaration is known (for isValid and isNotValid).
  std::vector<std::shared_ptr<const FieldValidity>> validity;
};

// Whether the name is a built-in function, and the number of arguments it takes (max
// -1: any number from min on).
bool FindBuiltin(const std::string& name, int* minArgs, int* maxArgs);
// Builds the node of a built-in function (the name and the number of arguments are
// already checked). Throws BuildError.
ExprPtr BuildApply(ApplySite& site);
// Builds a call of a user-defined function (the number of arguments is checked).
ExprPtr BuildCall(ApplySite& site, const Function& function);

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

#endif  // QZ_PLATFORM_TRANSFORM_FUNCTIONS_H_

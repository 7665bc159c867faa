// A loaded set of derived fields and user-defined functions, their evaluation order, and
// the binding of their names to the positions of a record layout.
#ifndef QZ_PLATFORM_TRANSFORM_PROGRAM_H_
#define QZ_PLATFORM_TRANSFORM_PROGRAM_H_

#include <cstdint>
#include <memory>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include "Expression.h"
#include "Functions.h"

namespace QZTransformNS_8_0_0 {
namespace internal {

// Deepest nesting of expressions accepted, counted through calls of user-defined
// functions: evaluation recurses once per level, so this bounds the stack it needs
// (a few hundred bytes a level) far below any thread's stack.
constexpr int kMaxExpressionDepth = 250;
// Most expression nodes one record may evaluate, counted through calls of user-defined
// functions (every call site evaluates the callee's body again), over all loaded derived
// fields. Functions that call others twice would otherwise double the work per level and
// hang Transform on a document of a few kilobytes.
constexpr uint64_t kMaxEvaluationSteps = 10000000;

// A field an expression reads, and the element that reads it (for messages).
struct FieldUse {
  int slot;
  std::string element;
};

// One compiled DerivedField. Immutable once its load has succeeded.
struct DerivedField {
  std::string name;
  DataType dataType = DataType::kNone;
  ValueKind kind = ValueKind::kAsComputed;
  std::string optype;  // as written; empty when absent
  int slot = -1;       // the slot of its own name
  ExprPtr expr;
  bool numeric = false;  // computed through EvalReal (the result is a number)
  std::vector<FieldUse> uses;  // every field the expression reads
  std::vector<std::pair<const Function*, int>> calls;  // user functions, at their depth
  int ownDepth = 0;
  uint64_t ownSteps = 0;  // nodes of its own expression
  uint64_t steps = 0;     // nodes one evaluation visits at most, through the calls
};

// What a loaded document declares about one of its input fields (a DataField).
struct DataFieldInfo {
  DataType dataType = DataType::kNone;
  std::shared_ptr<const FieldValidity> validity;
};

// Everything one engine has loaded. Copies are cheap (compiled fields and functions are
// shared and immutable), so a load works on a copy and replaces the engine's program
// only when it succeeds.
class Program {
 public:
  // The slot of a name (every name a derived field writes or an expression reads);
  // added when new.
  int Slot(const std::string& name);
  // The slot of a name, or -1.
  int FindSlot(const std::string& name) const;
  const std::vector<std::string>& SlotNames() const { return slotNames_; }

  // Appends a compiled field; false (nothing added) when a field of that name exists.
  bool AddField(std::shared_ptr<const DerivedField> field);
  bool IsDerived(const std::string& name) const { return derived_.count(name) != 0; }
  // The dataType of a loaded derived field; kNone when there is none of that name.
  DataType DerivedType(const std::string& name) const;
  const std::vector<std::shared_ptr<const DerivedField>>& Fields() const { return fields_; }

  // Adds a user-defined function (its body may still be compiled afterwards, during the
  // same load); false when one of that name exists.
  bool AddFunction(std::shared_ptr<Function> function);
  // The function of that name, or null.
  const Function* FindFunction(const std::string& name) const;

  // Computes the evaluation order (each field after the fields it reads, otherwise in
  // document order). False, with the fields of one cycle in *cycle, when fields depend
  // on each other in a cycle.
  bool ComputeOrder(std::vector<std::string>* cycle);
  const std::vector<size_t>& Order() const { return order_; }

  // The input fields the loaded documents declare (their DataDictionary).
  // knowsDataFields: at least one loaded document had a DataDictionary.
  std::unordered_map<std::string, DataFieldInfo> dataFields;
  bool knowsDataFields = false;

 private:
  std::vector<std::string> slotNames_;
  std::unordered_map<std::string, int> slots_;
  std::vector<std::shared_ptr<const DerivedField>> fields_;  // document order
  std::unordered_map<std::string, size_t> derived_;          // name -> index in fields_
  std::unordered_map<std::string, std::shared_ptr<const Function>> functions_;
  std::vector<size_t> order_;  // indices into fields_
};

// Record positions of a program's slots for one record layout. Binding looks names up
// once; checking that a later record has the same layout compares the record's layout
// identity and size.
class Binding {
 public:
  // True when the record has the layout bound last.
  bool Matches(const ValueRecord& record) const {
    return bound_ && record.GetLayoutId() == layoutId_ && record.Size() == size_;
  }
  // Appends the derived fields the record lacks (null, in document order) and binds
  // every slot to its position.
  void Bind(const Program& program, ValueRecord& record);
  void Reset() { bound_ = false; }
  const int* Index() const { return index_.data(); }

 private:
  bool bound_ = false;
  uint64_t layoutId_ = 0;
  size_t size_ = 0;
  std::vector<int> index_;  // per slot: record position or -1
};

// Computes every derived field of the program into the record, in dependency order.
// False when a field's result is invalid (an Apply that returns invalid results): that
// field and the ones after it in the order are set to missing, and *error names the
// field and the function.
bool Run(const Program& program, Binding& binding, ValueRecord& record, std::string* error);

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

#endif  // QZ_PLATFORM_TRANSFORM_PROGRAM_H_

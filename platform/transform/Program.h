// A loaded set of derived fields, their evaluation order, and the binding of their names
// to the positions of a record layout.
#ifndef QZ_PLATFORM_TRANSFORM_PROGRAM_H_
#define QZ_PLATFORM_TRANSFORM_PROGRAM_H_

#include <memory>
#include <string>
#include <unordered_map>
#include <unordered_set>
#include <vector>

#include "Expression.h"

namespace QZTransformNS_8_0_0 {
namespace internal {

// A field an expression reads, and the element that reads it (for messages).
struct FieldUse {
  int slot;
  std::string element;
};

// One compiled DerivedField. Immutable once compiled.
struct DerivedField {
  std::string name;
  DataType dataType = DataType::kNone;
  ValueKind kind = ValueKind::kAsComputed;
  std::string optype;  // as written; empty when absent
  int slot = -1;       // the slot of its own name
  ExprPtr expr;
  std::vector<FieldUse> uses;  // every field the expression reads
};

// Everything one engine has loaded. Copies are cheap (compiled fields are shared and
// immutable), so a load works on a copy and replaces the engine's program only when it
// succeeds.
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
  const std::vector<std::shared_ptr<const DerivedField>>& Fields() const { return fields_; }

  // Computes the evaluation order (each field after the fields it reads, otherwise in
  // document order). False, with the fields of one cycle in *cycle, when fields depend
  // on each other in a cycle.
  bool ComputeOrder(std::vector<std::string>* cycle);
  const std::vector<size_t>& Order() const { return order_; }

  // Names of the input fields the loaded documents declare (their DataDictionary).
  // knowsDataFields: at least one loaded document had a DataDictionary.
  std::unordered_set<std::string> dataFields;
  bool knowsDataFields = false;

 private:
  std::vector<std::string> slotNames_;
  std::unordered_map<std::string, int> slots_;
  std::vector<std::shared_ptr<const DerivedField>> fields_;  // document order
  std::unordered_set<std::string> derived_;
  std::vector<size_t> order_;  // indices into fields_
};

// Record positions of a program's slots for one record layout. Binding looks names up;
// checking that a record still has the bound layout compares the names at the bound
// positions and so needs no lookup (except for names the record lacked).
class Binding {
 public:
  // True when the record has the layout bound last.
  bool Matches(const Program& program, const ValueRecord& record) const;
  // Appends the derived fields the record lacks (null, in document order) and binds
  // every slot to its position.
  void Bind(const Program& program, ValueRecord& record);
  void Reset() { bound_ = false; }
  const int* Index() const { return index_.data(); }

 private:
  bool bound_ = false;
  size_t size_ = 0;
  std::vector<int> index_;   // per slot: record position or -1
  std::vector<int> present_; // slots bound to a position
  std::vector<int> absent_;  // slots the record lacks
};

// Computes every derived field of the program into the record, in dependency order.
void Run(const Program& program, Binding& binding, ValueRecord& record);

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

#endif  // QZ_PLATFORM_TRANSFORM_PROGRAM_H_

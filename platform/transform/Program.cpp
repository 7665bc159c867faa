// The loaded program: slots, dependency order, record binding and evaluation.
#include "Program.h"

namespace QZTransformNS_8_0_0 {
namespace internal {

int Program::Slot(const std::string& name) {
  const auto found = slots_.find(name);
  if (found != slots_.end()) return found->second;
  const int slot = static_cast<int>(slotNames_.size());
  slotNames_.push_back(name);
  slots_.emplace(name, slot);
  return slot;
}

int Program::FindSlot(const std::string& name) const {
  const auto found = slots_.find(name);
  return found == slots_.end() ? -1 : found->second;
}

bool Program::AddField(std::shared_ptr<const DerivedField> field) {
  if (!derived_.insert(field->name).second) return false;
  fields_.push_back(std::move(field));
  return true;
}

bool Program::ComputeOrder(std::vector<std::string>* cycle) {
  const size_t n = fields_.size();
  std::vector<int> fieldOfSlot(slotNames_.size(), -1);
  for (size_t f = 0; f < n; ++f) fieldOfSlot[fields_[f]->slot] = static_cast<int>(f);

  // Depth-first, without recursion: a chain of derived fields may be very long.
  enum : char { kNew, kActive, kDone };
  std::vector<char> state(n, kNew);
  struct Frame {
    size_t field;
    size_t next;  // next use to follow
  };
  std::vector<Frame> stack;
  std::vector<size_t> order;
  order.reserve(n);
  for (size_t root = 0; root < n; ++root) {
    if (state[root] != kNew) continue;
    state[root] = kActive;
    stack.push_back({root, 0});
    while (!stack.empty()) {
      Frame& top = stack.back();
      const std::vector<FieldUse>& uses = fields_[top.field]->uses;
      if (top.next < uses.size()) {
        const int dep = fieldOfSlot[uses[top.next++].slot];
        if (dep < 0 || state[dep] == kDone) continue;
        if (state[dep] == kActive) {
          cycle->clear();
          size_t from = stack.size();
          while (stack[from - 1].field != static_cast<size_t>(dep)) --from;
          for (size_t i = from - 1; i < stack.size(); ++i) {
            cycle->push_back(fields_[stack[i].field]->name);
          }
          cycle->push_back(fields_[dep]->name);
          return false;
        }
        state[dep] = kActive;
        stack.push_back({static_cast<size_t>(dep), 0});
      } else {
        state[top.field] = kDone;
        order.push_back(top.field);
        stack.pop_back();
      }
    }
  }
  order_ = std::move(order);
  return true;
}

bool Binding::Matches(const Program& program, const ValueRecord& record) const {
  if (!bound_ || record.Size() != size_) return false;
  const std::vector<std::string>& names = program.SlotNames();
  for (int slot : present_) {
    if (record.GetName(static_cast<size_t>(index_[slot])) != names[slot]) return false;
  }
  for (int slot : absent_) {
    if (record.Contains(names[slot])) return false;
  }
  return true;
}

void Binding::Bind(const Program& program, ValueRecord& record) {
  bound_ = false;
  for (const auto& field : program.Fields()) {
    if (!record.Contains(field->name)) record.Add(field->name, Value());
  }
  const std::vector<std::string>& names = program.SlotNames();
  index_.assign(names.size(), -1);
  present_.clear();
  absent_.clear();
  for (size_t slot = 0; slot < names.size(); ++slot) {
    index_[slot] = record.IndexOf(names[slot]);
    (index_[slot] >= 0 ? present_ : absent_).push_back(static_cast<int>(slot));
  }
  size_ = record.Size();
  bound_ = true;
}

void Run(const Program& program, Binding& binding, ValueRecord& record) {
  if (!binding.Matches(program, record)) binding.Bind(program, record);
  const EvalContext ctx{&record, binding.Index()};
  const auto& fields = program.Fields();
  for (size_t f : program.Order()) {
    const DerivedField& field = *fields[f];
    // Bound, so the position exists; no expression reads its own field (that would be
    // a cycle, refused at load), so writing in place aliases nothing.
    Value& target = record[static_cast<size_t>(ctx.index[field.slot])];
    field.expr->Eval(ctx, target);
    CoerceToKind(field.kind, target);
  }
}

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

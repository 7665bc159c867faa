// The loaded program: slots, dependency order, record binding and evaluation.
#include "Program.h"

#include <limits>

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
  // A load that fails part-way drops its whole copy of the program, so nothing here
  // needs undoing on failure.
  if (derived_.count(field->name) != 0) return false;
  fields_.push_back(std::move(field));
  derived_.emplace(fields_.back()->name, fields_.size() - 1);
  return true;
}

DataType Program::DerivedType(const std::string& name) const {
  const auto found = derived_.find(name);
  return found == derived_.end() ? DataType::kNone : fields_[found->second]->dataType;
}

bool Program::AddFunction(std::shared_ptr<Function> function) {
  const std::string name = function->name;
  return functions_.emplace(name, std::move(function)).second;
}

const Function* Program::FindFunction(const std::string& name) const {
  const auto found = functions_.find(name);
  return found == functions_.end() ? nullptr : found->second.get();
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

void Binding::Bind(const Program& program, ValueRecord& record) {
  bound_ = false;
  for (const auto& field : program.Fields()) {
    if (!record.Contains(field->name)) record.Add(field->name, Value());
  }
  const std::vector<std::string>& names = program.SlotNames();
  index_.assign(names.size(), -1);
  for (size_t slot = 0; slot < names.size(); ++slot) index_[slot] = record.IndexOf(names[slot]);
  layoutId_ = record.GetLayoutId();
  size_ = record.Size();
  bound_ = true;
}

namespace {

// A float field holds the nearest single-precision number, as a model trained on it
// compares it (a tree's thresholds are often single-precision numbers too). Missing
// stays missing.
double ToSinglePrecision(double d) {
  if (IsMissingReal(d)) return d;
  constexpr double kMax = std::numeric_limits<float>::max();
  if (d > kMax) return std::numeric_limits<double>::infinity();  // no float holds it
  if (d < -kMax) return -std::numeric_limits<double>::infinity();
  return static_cast<double>(static_cast<float>(d));
}

// A missing value of the field's kind: system-missing for numbers, else null.
void SetMissing(const DerivedField& field, Value& value) {
  const bool real = field.numeric || field.kind == ValueKind::kReal ||
                    field.kind == ValueKind::kBoolean;
  value = real ? Value(kMissing) : Value();
}

}  // namespace

bool Run(const Program& program, Binding& binding, ValueRecord& record, std::string* error) {
  if (!binding.Matches(record)) binding.Bind(program, record);
  EvalContext ctx;
  ctx.record = &record;
  ctx.index = binding.Index();
  const auto& fields = program.Fields();
  const std::vector<size_t>& order = program.Order();
  for (size_t k = 0; k < order.size(); ++k) {
    const DerivedField& field = *fields[order[k]];
    // Bound, so the position exists; no expression reads its own field (that would be
    // a cycle, refused at load), so writing in place aliases nothing.
    Value& target = record[static_cast<size_t>(ctx.index[field.slot])];
    bool valid;
    if (field.numeric) {
      const double d = field.expr->EvalReal(ctx);
      valid = !IsInvalidReal(d);
      if (valid) target = field.dataType == DataType::kFloat ? ToSinglePrecision(d) : d;
    } else {
      valid = field.expr->Eval(ctx, target);
      if (valid) CoerceToKind(field.kind, target);
      if (valid && field.dataType == DataType::kFloat && target.IsNumericValue()) {
        target = ToSinglePrecision(target.GetReal());
      }
    }
    if (!valid) {
      const std::string where =
          ctx.invalidAt != nullptr ? ctx.invalidAt->Describe() : std::string("its expression");
      *error = "DerivedField '" + field.name + "': " + where + " gave an invalid result";
      for (size_t rest = k; rest < order.size(); ++rest) {
        const DerivedField& f = *fields[order[rest]];
        SetMissing(f, record[static_cast<size_t>(ctx.index[f.slot])]);
      }
      return false;
    }
  }
  return true;
}

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

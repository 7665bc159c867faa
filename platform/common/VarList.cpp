// The variable list: owned variables in order, a name index and the target indices,
// which the library's variables keep current by reporting their role changes.
#include <algorithm>
#include <utility>

#include "Encoders.h"
#include "QZVarList.h"

namespace QZXML_800 {

namespace {

// Adds the categories to the variable's encoder in order, each once; a newly added
// category takes the label at its position, when there is one.
template <class C>
void FillCategories(QZCatVar& variable, const std::vector<C>& categories,
                    const std::vector<std::string>* labels) {
  // The variable was built by this component, so its encoder is one of ours.
  auto& encoder = static_cast<EncoderBase&>(*variable.GetEncoder());
  encoder.Reserve(categories.size());
  for (size_t i = 0; i < categories.size(); ++i) {
    int before = encoder.GetCount();
    int index = encoder.AddCategory(categories[i]);
    if (index >= before && labels != nullptr && i < labels->size()) {
      encoder.SetLabel(index, (*labels)[i]);
    }
  }
}

// Makes room for one more element with geometric growth, so that a later push_back
// cannot fail.
template <class E>
void RoomForOne(std::vector<E>& elements) {
  if (elements.size() == elements.capacity()) {
    elements.reserve(std::max<size_t>(8, 2 * elements.size()));
  }
}

}  // namespace

QZVarList::QZVarList() = default;

QZVarList::QZVarList(const QZVarList& other) {
  variables_.reserve(other.variables_.size());
  byName_.reserve(other.byName_.size());
  for (const auto& variable : other.variables_) {
    // Only a broken foreign implementation clones to null; such a variable is dropped.
    std::unique_ptr<IQZVariable> copy(variable->Clone());
    if (copy) Append(std::move(copy));
  }
}

QZVarList::QZVarList(QZVarList&& other) noexcept
    : variables_(std::move(other.variables_)),
      byName_(std::move(other.byName_)),
      targets_(std::move(other.targets_)),
      foreignCount_(other.foreignCount_) {
  other.variables_.clear();
  other.byName_.clear();
  other.targets_.clear();
  other.foreignCount_ = 0;
  AdoptAll();
}

QZVarList& QZVarList::operator=(const QZVarList& other) {
  if (this != &other) *this = QZVarList(other);
  return *this;
}

QZVarList& QZVarList::operator=(QZVarList&& other) noexcept {
  if (this != &other) {
    variables_ = std::move(other.variables_);
    byName_ = std::move(other.byName_);
    targets_ = std::move(other.targets_);
    foreignCount_ = other.foreignCount_;
    other.variables_.clear();
    other.byName_.clear();
    other.targets_.clear();
    other.foreignCount_ = 0;
    AdoptAll();
  }
  return *this;
}

QZVarList::~QZVarList() = default;

int QZVarList::Size() const { return static_cast<int>(variables_.size()); }

IQZVariable* QZVarList::GetVarAt(int i) {
  if (i < 0 || i >= Size()) return nullptr;
  return variables_[i].get();
}

const IQZVariable* QZVarList::GetVarAt(int i) const {
  if (i < 0 || i >= Size()) return nullptr;
  return variables_[i].get();
}

IQZVariable* QZVarList::GetVariable(const std::string& name) {
  return GetVarAt(FindVariable(name));
}

const IQZVariable* QZVarList::GetVariable(const std::string& name) const {
  return GetVarAt(FindVariable(name));
}

int QZVarList::FindVariable(const std::string& name) const {
  auto found = byName_.find(name);
  return found == byName_.end() ? -1 : found->second;
}

const IQZVariable* QZVarList::GetTargetRespVariable() const {
  const std::vector<int>& targets = GetTargetIndices();
  return targets.empty() ? nullptr : GetVarAt(targets.front());
}

const std::vector<int>& QZVarList::GetTargetIndices() const {
  if (foreignCount_ > 0) RefreshForeignTargets();
  return targets_;
}

IQZEncoder* QZVarList::GetEncoderAt(int i) {
  IQZVariable* variable = GetVarAt(i);
  return variable == nullptr ? nullptr : variable->GetEncoder();
}

const IQZEncoder* QZVarList::GetEncoderAt(int i) const {
  const IQZVariable* variable = GetVarAt(i);
  return variable == nullptr ? nullptr : variable->GetEncoder();
}

bool QZVarList::SetVariableRole(int i, VariableRole role) {
  IQZVariable* variable = GetVarAt(i);
  if (variable == nullptr) return false;
  variable->SetRole(role);
  return true;
}

int QZVarList::AddContVar(const std::string& name, const std::string& label,
                          VariableRole role) {
  if (name.empty() || FindVariable(name) >= 0) return -1;
  return Append(std::make_unique<QZContVar>(name, label, role));
}

int QZVarList::AddContVar(const std::string& name, const std::string& label, double min,
                          double max, VariableRole role, bool isInteger, int decimals) {
  if (name.empty() || FindVariable(name) >= 0) return -1;
  return Append(
      std::make_unique<QZContVar>(name, label, min, max, role, isInteger, decimals));
}

int QZVarList::AddCatVar(const std::string& name, const std::string& label,
                         const std::vector<std::string>& categories, VariableRole role) {
  if (name.empty() || FindVariable(name) >= 0) return -1;
  auto variable = std::make_unique<QZCatVar>(name, label, ML_STRING_CATEGORICAL, role);
  FillCategories(*variable, categories, nullptr);
  return Append(std::move(variable));
}

int QZVarList::AddCatVar(const std::string& name, const std::string& label,
                         const std::vector<std::string>& categories,
                         const std::vector<std::string>& labels, VariableRole role) {
  if (name.empty() || FindVariable(name) >= 0) return -1;
  auto variable = std::make_unique<QZCatVar>(name, label, ML_STRING_CATEGORICAL, role);
  FillCategories(*variable, categories, &labels);
  return Append(std::move(variable));
}

int QZVarList::AddCatVar(const std::string& name, const std::string& label,
                         const std::vector<double>& categories, VariableRole role) {
  if (name.empty() || FindVariable(name) >= 0) return -1;
  auto variable = std::make_unique<QZCatVar>(name, label, ML_NUMERIC_CATEGORICAL, role);
  FillCategories(*variable, categories, nullptr);
  return Append(std::move(variable));
}

int QZVarList::AddCatVar(const std::string& name, const std::string& label,
                         const std::vector<double>& categories,
                         const std::vector<std::string>& labels, VariableRole role) {
  if (name.empty() || FindVariable(name) >= 0) return -1;
  auto variable = std::make_unique<QZCatVar>(name, label, ML_NUMERIC_CATEGORICAL, role);
  FillCategories(*variable, categories, &labels);
  return Append(std::move(variable));
}

int QZVarList::AddCatVar(const std::string& name, const std::string& label, int capacity,
                         MeasureLevel level, VariableRole role) {
  if (level != ML_NUMERIC_CATEGORICAL && level != ML_STRING_CATEGORICAL) return -1;
  if (name.empty() || FindVariable(name) >= 0) return -1;
  auto variable = std::make_unique<QZCatVar>(name, label, level, role);
  // The capacity is only a hint: a huge one must not exhaust memory up front.
  const int kMaxReserved = 1 << 16;
  if (capacity > 0) {
    static_cast<EncoderBase&>(*variable->GetEncoder())
        .Reserve(static_cast<size_t>(std::min(capacity, kMaxReserved)));
  }
  return Append(std::move(variable));
}

int QZVarList::AddVariable(IQZVariable* variable) {
  if (variable == nullptr) return -1;
  // A variable of another list stays with that list: deleting it would leave the other
  // list (possibly this one) with a dangling pointer.
  auto* ours = dynamic_cast<QZVariableBase*>(variable);
  if (ours != nullptr && ours->owner_ != nullptr) return -1;
  std::unique_ptr<IQZVariable> owned(variable);
  std::string name = owned->GetName();
  if (name.empty() || FindVariable(name) >= 0) return -1;
  return Append(std::move(owned));
}

int QZVarList::Append(std::unique_ptr<IQZVariable> variable) {
  int index = Size();
  bool target = variable->GetRole() == ROLE_TARGET;
  // Everything that can fail runs before the list changes.
  RoomForOne(variables_);
  if (target) RoomForOne(targets_);
  byName_.emplace(variable->GetName(), index);

  if (auto* ours = dynamic_cast<QZVariableBase*>(variable.get())) {
    ours->owner_ = this;
    ours->index_ = index;
  } else {
    ++foreignCount_;
  }
  if (target) targets_.push_back(index);
  variables_.push_back(std::move(variable));
  return index;
}

void QZVarList::OnRoleChanged(int index, VariableRole role) {
  auto position = std::lower_bound(targets_.begin(), targets_.end(), index);
  bool listed = position != targets_.end() && *position == index;
  if (role == ROLE_TARGET && !listed) {
    targets_.insert(position, index);
  } else if (role != ROLE_TARGET && listed) {
    targets_.erase(position);
  }
}

void QZVarList::AdoptAll() {
  for (size_t i = 0; i < variables_.size(); ++i) {
    if (auto* ours = dynamic_cast<QZVariableBase*>(variables_[i].get())) {
      ours->owner_ = this;
      ours->index_ = static_cast<int>(i);
    }
  }
}

void QZVarList::RefreshForeignTargets() const {
  targets_.clear();
  for (size_t i = 0; i < variables_.size(); ++i) {
    if (variables_[i]->GetRole() == ROLE_TARGET) targets_.push_back(static_cast<int>(i));
  }
}

}  // namespace QZXML_800

// ValueRecord: named fields with a copy-on-write layout shared between copies.
#include "ValueRecord.h"

#include <atomic>
#include <unordered_map>
#include <utility>

namespace QZCommon_800 {

namespace {

// Identities of layouts: never reused within a process (0 means "no layout").
uint64_t NextLayoutId() noexcept {
  static std::atomic<uint64_t> counter{0};
  return counter.fetch_add(1, std::memory_order_relaxed) + 1;
}

}  // namespace

// The field names in order and their positions. Never changed while shared: a record
// that adds a field to a shared layout copies it first. Names are only ever appended,
// so one layout's names up to a given size never change; a copy gets an identity of
// its own because it will grow differently.
struct ValueRecord::Layout {
  Layout() : id(NextLayoutId()) {}
  Layout(const Layout& other) : names(other.names), index(other.index), id(NextLayoutId()) {}
  Layout& operator=(const Layout&) = delete;

  std::vector<std::string> names;
  std::unordered_map<std::string, size_t> index;
  uint64_t id;
};

ValueRecord::ValueRecord(size_t capacity) {
  if (capacity == 0) return;
  // The capacity is a hint: a size that cannot be reserved leaves an empty record that
  // grows on demand.
  try {
    auto layout = std::make_shared<Layout>();
    layout->names.reserve(capacity);
    layout->index.reserve(capacity);
    values_.reserve(capacity);
    layout_ = std::move(layout);
    layoutId_ = layout_->id;
  } catch (...) {
    // values_ reserves last: a failure leaves it untouched
  }
}

ValueRecord::ValueRecord(const ValueRecord& other) = default;

ValueRecord::ValueRecord(ValueRecord&& other) noexcept
    : layout_(std::move(other.layout_)), values_(std::move(other.values_)),
      layoutId_(other.layoutId_) {
  other.values_.clear();
  other.layoutId_ = 0;
}

ValueRecord& ValueRecord::operator=(const ValueRecord& other) {
  if (this == &other) return *this;
  if (layout_ == other.layout_) {
    values_ = other.values_;  // same names: element-wise, keeps this record's storage
    return *this;
  }
  std::vector<Value> values(other.values_);
  layout_ = other.layout_;
  layoutId_ = other.layoutId_;
  values_ = std::move(values);
  return *this;
}

ValueRecord& ValueRecord::operator=(ValueRecord&& other) noexcept {
  if (this == &other) return *this;
  layout_ = std::move(other.layout_);
  values_ = std::move(other.values_);
  layoutId_ = other.layoutId_;
  other.layout_.reset();
  other.layoutId_ = 0;
  other.values_.clear();
  return *this;
}

ValueRecord::~ValueRecord() = default;

ValueRecord::Layout& ValueRecord::WritableLayout() {
  if (!layout_) {
    layout_ = std::make_shared<Layout>();
  } else if (layout_.use_count() > 1) {
    layout_ = std::make_shared<Layout>(*layout_);
  }
  layoutId_ = layout_->id;
  return *layout_;
}

size_t ValueRecord::Append(const std::string& name, const Value& value) {
  // Every step that may throw comes before the first change that is visible, or is
  // undone, so a failed append leaves the record as it was.
  Value copy(value);  // value may be one of this record's own values
  Layout& layout = WritableLayout();
  size_t position = values_.size();
  if (values_.size() == values_.capacity()) {
    values_.reserve(values_.capacity() < 8 ? 8 : values_.capacity() * 2);
  }
  auto inserted = layout.index.emplace(name, position).first;
  try {
    layout.names.push_back(name);
  } catch (...) {
    layout.index.erase(inserted);
    throw;
  }
  values_.push_back(std::move(copy));  // capacity is there and moves do not throw
  return position;
}

void ValueRecord::Add(const std::string& name, const Value& value) {
  int position = IndexOf(name);
  if (position >= 0) {
    values_[static_cast<size_t>(position)] = value;
  } else {
    Append(name, value);
  }
}

Value& ValueRecord::operator[](const std::string& name) {
  int position = IndexOf(name);
  if (position >= 0) return values_[static_cast<size_t>(position)];
  return values_[Append(name, Value())];
}

Value& ValueRecord::OutOfRange() noexcept {
  thread_local Value scratch;
  scratch = Value();
  return scratch;
}

Value ValueRecord::Get(const std::string& name) const {
  int position = IndexOf(name);
  return position >= 0 ? values_[static_cast<size_t>(position)] : Value();
}

int ValueRecord::IndexOf(const std::string& name) const noexcept {
  if (!layout_) return -1;
  auto found = layout_->index.find(name);
  return found == layout_->index.end() ? -1 : static_cast<int>(found->second);
}

const std::string& ValueRecord::GetName(size_t index) const noexcept {
  static const std::string noName;  // a local static: usable during static initialisation
  return index < values_.size() ? layout_->names[index] : noName;
}

std::vector<std::string> ValueRecord::Names(bool all) const {
  std::vector<std::string> names;
  if (!layout_) return names;
  if (all) return layout_->names;
  for (size_t i = 0; i < values_.size(); ++i) {
    if (!values_[i].IsNull()) names.push_back(layout_->names[i]);
  }
  return names;
}

void ValueRecord::ClearValues() noexcept {
  for (Value& value : values_) value = Value();
}

}  // namespace QZCommon_800

// An ordered list of uniquely named values: the input and output rows of scoring.
#ifndef QZ_PLATFORM_VALUERECORD_H_
#define QZ_PLATFORM_VALUERECORD_H_

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "QZPlatformExport.h"
#include "Value.h"

namespace QZCommon_800 {

// Fields keep the order in which they were added; names are unique and looked up in
// constant time. Copies share the field names (the layout) until one of them adds a
// field, so copying a record costs about as much as copying its values.
// References returned by operator[] are invalidated when a field is added (as with
// std::vector): do not hold one across an Add or a lookup that may add. ClearValues and
// value writes keep them valid.
// A record is not synchronised: share it between threads only for reading.
class QZCOMMON_API ValueRecord {
 public:
  // An empty record with room for `capacity` fields before it grows.
  // The capacity is a hint: one that cannot be reserved gives an empty record that grows.
  explicit ValueRecord(size_t capacity = 0);
  // Copies hold their own values and share the names until one of them adds a field.
  // A moved-from record is empty and usable.
  ValueRecord(const ValueRecord& other);
  ValueRecord(ValueRecord&& other) noexcept;
  ValueRecord& operator=(const ValueRecord& other);
  ValueRecord& operator=(ValueRecord&& other) noexcept;
  ~ValueRecord();

  // Appends the field; when the name exists the field keeps its place and takes the
  // value. The value may be one of this record's own values.
  void Add(const std::string& name, const Value& value);
  // The named field's value; a null field is appended when the name is absent.
  Value& operator[](const std::string& name);
  // The value at the index. Out of range (a caller's mistake) gives a scratch null
  // value instead of touching memory that is not the record's: the const form gives
  // Value::NULL_VALUE, the other form a per-thread scratch value that is reset to null
  // on each such call, so writes to it are lost.
  Value& operator[](size_t index) noexcept {
    return index < values_.size() ? values_[index] : OutOfRange();
  }
  const Value& operator[](size_t index) const noexcept {
    return index < values_.size() ? values_[index] : Value::NULL_VALUE;
  }
  // Copy of the named value; null when absent.
  Value Get(const std::string& name) const;
  // Copy of the value at the index; null when out of range.
  Value Get(size_t index) const { return index < values_.size() ? values_[index] : Value(); }
  // Position of the named field, -1 when absent.
  int IndexOf(const std::string& name) const noexcept;
  // True when the name is a field of the record.
  bool Contains(const std::string& name) const noexcept { return IndexOf(name) >= 0; }
  // Number of fields.
  size_t Size() const noexcept { return values_.size(); }
  // The name of the field at the index; an empty text when out of range.
  const std::string& GetName(size_t index) const noexcept;
  // all: every name in order; false: the names whose value is not null, in order.
  std::vector<std::string> Names(bool all = true) const;
  // Every value becomes null; names, order and storage are kept (no reallocation).
  void ClearValues() noexcept;
  // A cheap identity of the field names: two records (or one record at two moments)
  // with the same layout id and the same Size have the same names at every position.
  // Copies share the id until one of them adds a field; ids are never reused. 0 for a
  // record that never had a field. Lets a caller that cached field positions check a
  // record's layout with two comparisons instead of name lookups.
  uint64_t GetLayoutId() const noexcept { return layoutId_; }

 private:
  struct Layout;
  static Value& OutOfRange() noexcept;
  // The layout, ready to take a new name: created when absent, copied when shared.
  Layout& WritableLayout();
  size_t Append(const std::string& name, const Value& value);

  std::shared_ptr<Layout> layout_;  // names and their index; shared between copies
  std::vector<Value> values_;       // one per name, same order
  uint64_t layoutId_ = 0;           // layout_->id, or 0 without a layout (read per record)
};

}  // namespace QZCommon_800

#endif  // QZ_PLATFORM_VALUERECORD_H_

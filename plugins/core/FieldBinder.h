// Field binding: a model names the fields it reads or writes once, at compile time, and
// learns their positions in a record once per record layout. Per record it then checks
// the layout with two comparisons and reads or writes by position.
#ifndef QZPLUGIN_CORE_FIELDBINDER_H_
#define QZPLUGIN_CORE_FIELDBINDER_H_

#include <cstdint>
#include <string>
#include <unordered_map>
#include <vector>

#include "Value.h"
#include "ValueRecord.h"

namespace QZPlugin_800 {

// The fields one model reads, as slots. Add at compile time; Bind before each record
// (it looks names up only when the record's layout differs from the last one); Get by
// slot. A field the record lacks reads as null. One thread at a time.
class FieldBinder {
 public:
  FieldBinder() = default;
  FieldBinder(const FieldBinder&) = delete;
  FieldBinder& operator=(const FieldBinder&) = delete;

  // The slot of the named field, added when new.
  int Add(const std::string& name);
  // The slot of the named field, -1 when it was never added.
  int Find(const std::string& name) const;
  int Count() const { return static_cast<int>(names_.size()); }
  const std::string& Name(int slot) const { return names_[static_cast<size_t>(slot)]; }

  // Learns the positions of every slot in the record, unless the record has the layout
  // bound last. Allocates nothing when the layout is unchanged.
  void Bind(const QZCommon_800::ValueRecord& record) {
    if (record.GetLayoutId() == layout_ && record.Size() == size_) return;
    Rebind(record);
  }
  // The slot's position in the bound layout, -1 when the record lacks the field.
  int Position(int slot) const { return positions_[static_cast<size_t>(slot)]; }
  // The slot's value in `record` (which must have the bound layout); null when absent.
  const QZCommon_800::Value& Get(const QZCommon_800::ValueRecord& record, int slot) const {
    const int position = positions_[static_cast<size_t>(slot)];
    return position < 0 ? QZCommon_800::Value::NULL_VALUE
                        : record[static_cast<size_t>(position)];
  }

 private:
  void Rebind(const QZCommon_800::ValueRecord& record);

  std::vector<std::string> names_;
  std::unordered_map<std::string, int> slots_;
  std::vector<int> positions_;
  uint64_t layout_ = UINT64_MAX;
  size_t size_ = 0;
};

// Read access to one prepared record through a model's binder: what a model kind's
// evaluator sees. Cheap to copy; valid while the record and the binder are.
class FieldView {
 public:
  FieldView(const QZCommon_800::ValueRecord& record, const FieldBinder& binder)
      : record_(&record), binder_(&binder) {}
  const QZCommon_800::Value& Get(int slot) const { return binder_->Get(*record_, slot); }
  // The slot's value as a number; NaN when it is missing or no number.
  double Number(int slot) const;
  // The whole record, for services that look fields up themselves (tree predicates).
  const QZCommon_800::ValueRecord& Record() const { return *record_; }
  const FieldBinder& Binder() const { return *binder_; }

 private:
  const QZCommon_800::ValueRecord* record_;
  const FieldBinder* binder_;
};

// The fields one model writes, in declaration order. Bind adds the fields an output
// record lacks (as null, in order), once per output layout; Set writes by index.
class RecordWriter {
 public:
  RecordWriter() = default;
  RecordWriter(const RecordWriter&) = delete;
  RecordWriter& operator=(const RecordWriter&) = delete;

  // The index of the named field, added when new (a name is written once).
  int Add(const std::string& name);
  int Count() const { return static_cast<int>(names_.size()); }
  const std::string& Name(int index) const { return names_[static_cast<size_t>(index)]; }
  // Appends the fields as null, in order, to the record (a present name keeps its place
  // and becomes null).
  void Declare(QZCommon_800::ValueRecord& record) const;
  // Makes every field present in the record and learns the positions, unless the
  // record has the layout bound last.
  void Bind(QZCommon_800::ValueRecord& record) {
    if (record.GetLayoutId() == layout_ && record.Size() == size_) return;
    Rebind(record);
  }
  QZCommon_800::Value& At(QZCommon_800::ValueRecord& record, int index) const {
    return record[static_cast<size_t>(positions_[static_cast<size_t>(index)])];
  }

 private:
  void Rebind(QZCommon_800::ValueRecord& record);

  std::vector<std::string> names_;
  std::unordered_map<std::string, int> indices_;
  std::vector<int> positions_;
  uint64_t layout_ = UINT64_MAX;
  size_t size_ = 0;
};

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_FIELDBINDER_H_

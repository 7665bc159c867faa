#include "FieldBinder.h"

#include <limits>

#include "QZMV.h"

namespace QZPlugin_800 {

int FieldBinder::Add(const std::string& name) {
  auto found = slots_.find(name);
  if (found != slots_.end()) return found->second;
  const int slot = Count();
  names_.push_back(name);
  slots_.emplace(name, slot);
  positions_.push_back(-1);
  layout_ = UINT64_MAX;  // the new slot has no position yet
  return slot;
}

int FieldBinder::Find(const std::string& name) const {
  auto found = slots_.find(name);
  return found == slots_.end() ? -1 : found->second;
}

void FieldBinder::Rebind(const QZCommon_800::ValueRecord& record) {
  for (size_t i = 0; i < names_.size(); ++i) positions_[i] = record.IndexOf(names_[i]);
  layout_ = record.GetLayoutId();
  size_ = record.Size();
}

double FieldView::Number(int slot) const {
  const double number = Get(slot).GetReal();
  return QZCommon_800::QZMV::IsMissing(number) ? std::numeric_limits<double>::quiet_NaN()
                                               : number;
}

int RecordWriter::Add(const std::string& name) {
  auto found = indices_.find(name);
  if (found != indices_.end()) return found->second;
  const int index = Count();
  names_.push_back(name);
  indices_.emplace(name, index);
  positions_.push_back(-1);
  layout_ = UINT64_MAX;
  return index;
}

void RecordWriter::Declare(QZCommon_800::ValueRecord& record) const {
  for (const std::string& name : names_) record.Add(name, QZCommon_800::Value());
}

void RecordWriter::Rebind(QZCommon_800::ValueRecord& record) {
  for (const std::string& name : names_) {
    if (!record.Contains(name)) record.Add(name, QZCommon_800::Value());
  }
  for (size_t i = 0; i < names_.size(); ++i) positions_[i] = record.IndexOf(names_[i]);
  layout_ = record.GetLayoutId();
  size_ = record.Size();
}

}  // namespace QZPlugin_800

// Encoders of the common component: categories with a hash index and missing values.
#include "Encoders.h"

#include "QZMV.h"
#include "Value.h"

namespace QZXML_800 {

using QZCommon_800::QZMV;
using QZCommon_800::Value;

namespace {

// Minus zero and zero are one category and one missing value.
double Key(double d) { return d == 0.0 ? 0.0 : d; }

double IndexOrAbsent(int index) { return index < 0 ? -1.0 : static_cast<double>(index); }

// Appends key to categories unless the index knows it; returns its index. When memory
// runs out both containers are left as they were.
template <class K>
int AddIndexed(std::vector<K>& categories, std::unordered_map<K, int>& index, const K& key) {
  auto found = index.find(key);
  if (found != index.end()) return found->second;
  int position = static_cast<int>(categories.size());
  categories.push_back(key);
  try {
    index.emplace(key, position);
  } catch (...) {
    categories.pop_back();
    throw;
  }
  return position;
}

}  // namespace

IQZEncoder::~IQZEncoder() = default;

// ---- EncoderBase ----

bool EncoderBase::IsMissingString(const std::string& s) const {
  return missingStrings_.count(s) != 0;
}

bool EncoderBase::IsMissingNumber(double d) const {
  if (QZMV::IsMissing(d)) return true;
  if (!missingNumbers_.empty() && missingNumbers_.count(Key(d)) != 0) return true;
  return hasRange_ && rangeLow_ <= d && d <= rangeHigh_;
}

void EncoderBase::AddMissingValue(double d, const std::string& /*label*/) {
  if (QZMV::IsMissing(d)) return;  // missing anyway
  missingNumbers_.insert(Key(d));
  missingStrings_.insert(Value::RealToText(d));
}

void EncoderBase::AddMissingValue(const std::string& s, const std::string& /*label*/) {
  missingStrings_.insert(s);
  double d = Value::TextToReal(s);
  if (!QZMV::IsMissing(d)) missingNumbers_.insert(Key(d));
}

void EncoderBase::SetMissingRange(double low, double high) {
  hasRange_ = true;
  rangeLow_ = low;
  rangeHigh_ = high;
}

const std::vector<std::string>& EncoderBase::GetLabels() const { return labels_; }

void EncoderBase::SetLabel(int index, const std::string& label) {
  if (index < 0) return;
  if (labels_.size() <= static_cast<size_t>(index)) labels_.resize(index + 1);
  labels_[index] = label;
}

// ---- NumberEncoder ----

NumberEncoder* NumberEncoder::Clone() const { return new NumberEncoder(*this); }

int NumberEncoder::GetValueType() const { return 2; }

int NumberEncoder::GetCount() const { return static_cast<int>(categories_.size()); }

std::string NumberEncoder::GetStringAt(int i) const {
  if (i < 0 || i >= GetCount()) return std::string();
  return Value::RealToText(categories_[i]);
}

double NumberEncoder::GetNumberAt(int i) const {
  if (i < 0 || i >= GetCount()) return QZMV::Missing();
  return categories_[i];
}

double NumberEncoder::IndexOfString(const std::string& s) const {
  return IndexOfNumber(Value::TextToReal(s));
}

double NumberEncoder::IndexOfNumber(double d) const {
  auto found = index_.find(Key(d));
  return found == index_.end() ? -1.0 : IndexOrAbsent(found->second);
}

bool NumberEncoder::IsMissingString(const std::string& s) const {
  // A text that is no number cannot be a value of a numeric variable.
  return EncoderBase::IsMissingString(s) || IsMissingNumber(Value::TextToReal(s));
}

int NumberEncoder::AddCategory(double d) {
  if (!allowCategories_ || QZMV::IsMissing(d)) return -1;
  return AddIndexed(categories_, index_, Key(d));
}

int NumberEncoder::AddCategory(const std::string& s) {
  return AddCategory(Value::TextToReal(s));
}

void NumberEncoder::Reserve(size_t capacity) {
  if (!allowCategories_) return;
  categories_.reserve(capacity);
  index_.reserve(capacity);
}

// ---- StringEncoder ----

StringEncoder* StringEncoder::Clone() const { return new StringEncoder(*this); }

int StringEncoder::GetValueType() const { return 3; }

int StringEncoder::GetCount() const { return static_cast<int>(categories_.size()); }

std::string StringEncoder::GetStringAt(int i) const {
  if (i < 0 || i >= GetCount()) return std::string();
  return categories_[i];
}

double StringEncoder::GetNumberAt(int i) const {
  if (i < 0 || i >= GetCount()) return QZMV::Missing();
  return Value::TextToReal(categories_[i]);
}

double StringEncoder::IndexOfString(const std::string& s) const {
  auto found = index_.find(s);
  return found == index_.end() ? -1.0 : IndexOrAbsent(found->second);
}

double StringEncoder::IndexOfNumber(double d) const {
  if (QZMV::IsMissing(d)) return -1.0;
  return IndexOfString(Value::RealToText(d));
}

int StringEncoder::AddCategory(double d) {
  if (QZMV::IsMissing(d)) return -1;
  return AddCategory(Value::RealToText(d));
}

int StringEncoder::AddCategory(const std::string& s) {
  return AddIndexed(categories_, index_, s);
}

void StringEncoder::Reserve(size_t capacity) {
  categories_.reserve(capacity);
  index_.reserve(capacity);
}

}  // namespace QZXML_800

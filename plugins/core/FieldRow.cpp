#include "FieldRow.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace QZPlugin_800 {

int FieldRow::AddNumber(int slot, const QZXML_800::IQZEncoder* encoder) {
  for (size_t i = 0; i < numbers_.size(); ++i) {
    if (numbers_[i].slot != slot) continue;
    return numbers_[i].encoder == encoder ? static_cast<int>(i) : -1;
  }
  numbers_.push_back({slot, encoder});
  states_.push_back(kMissing);
  Pad();
  return static_cast<int>(numbers_.size() - 1);
}

void FieldRow::Pad() {
  const size_t size = std::max<size_t>({numbers_.size(), categories_.size(), 1});
  values_.resize(size, std::numeric_limits<double>::quiet_NaN());
  codes_.resize(size, kUnknown);
}

int FieldRow::AddCategory(int slot, const QZXML_800::IQZVariable* variable) {
  for (size_t i = 0; i < categories_.size(); ++i) {
    if (categories_[i].slot != slot) continue;
    return categories_[i].variable == variable ? static_cast<int>(i) : -1;
  }
  categories_.push_back({slot, variable, memo_->Add(variable)});
  Pad();
  return static_cast<int>(categories_.size() - 1);
}

void FieldRow::Decode(const FieldView& fields) {
  record_ = &fields.Record();
  binder_ = &fields.Binder();
  constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
  uint64_t odd = 0;
  for (size_t i = 0; i < numbers_.size(); ++i) {
    const QZCommon_800::Value& value = fields.Get(numbers_[i].slot);
    double x = kNaN;
    uint8_t state = kMissing;
    if (value.IsNumericValue()) {
      const double number = value.GetReal();
      const QZXML_800::IQZEncoder* encoder = numbers_[i].encoder;
      if (!value.IsSystemMissingValue() &&
          (encoder == nullptr || !encoder->IsMissingNumber(number))) {
        if (std::isnan(number)) {
          state = kNotANumber;
        } else {
          x = number;
          state = kNumber;
        }
      }
    } else if (!value.IsNull()) {
      state = kOther;
    }
    values_[i] = x;
    states_[i] = state;
    if (state != kNumber && i < 64) odd |= uint64_t{1} << i;
  }
  odd_ = odd;
  std::fill(codes_.begin(), codes_.end(), kUnknown);
}

int FieldRow::LookUp(int index) noexcept {
  const CategoryField& field = categories_[static_cast<size_t>(index)];
  return memo_->Code(field.memo, binder_->Get(*record_, field.slot));
}

}  // namespace QZPlugin_800

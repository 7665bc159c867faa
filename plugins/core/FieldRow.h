// The fields a model's tests read, decoded once per record: each numeric field to a
// double and a state, each categorical field to its category code. A tree tests the
// same few fields again and again, and an ensemble's trees test the same fields of one
// record: decoding a value once (its kind, its declared missing numbers, its category)
// and comparing plain numbers afterwards is what makes the walk cheap. An ensemble
// decodes one row for all its trees (CompiledModel::JoinRow).
#ifndef QZPLUGIN_CORE_FIELDROW_H_
#define QZPLUGIN_CORE_FIELDROW_H_

#include <cstdint>
#include <vector>

#include "Categories.h"
#include "FieldBinder.h"
#include "QZVarList.h"
#include "ScoringPredicate.h"
#include "Value.h"

namespace QZPlugin_800 {

class FieldRow {
 public:
  // What a numeric field's value is. Number() is NaN for every state but kNumber.
  enum NumberState : uint8_t {
    kNumber,      // a number, not declared missing
    kMissing,     // null, system-missing, or a number the field declares missing
    kNotANumber,  // a NaN number the field does not declare missing: in no range
    kOther        // neither number nor null: only the predicate itself can judge it
  };

  explicit FieldRow(CategoryCodeMemo& memo) : memo_(&memo) { Pad(); }
  FieldRow(const FieldRow&) = delete;
  FieldRow& operator=(const FieldRow&) = delete;

  // The index of the numeric field read through `slot`, whose declared missing numbers
  // `encoder` judges (null: none); -1 when the slot is there with another encoder.
  int AddNumber(int slot, const QZXML_800::IQZEncoder* encoder);
  // The index of the categorical field read through `slot`, coded by `variable`; -1 when
  // the slot is there with another variable.
  int AddCategory(int slot, const QZXML_800::IQZVariable* variable);

  int Numbers() const { return static_cast<int>(numbers_.size()); }
  int Categories() const { return static_cast<int>(categories_.size()); }
  int NumberSlot(int index) const { return numbers_[static_cast<size_t>(index)].slot; }
  const QZXML_800::IQZEncoder* NumberEncoder(int index) const {
    return numbers_[static_cast<size_t>(index)].encoder;
  }
  int CategorySlot(int index) const { return categories_[static_cast<size_t>(index)].slot; }
  const QZXML_800::IQZVariable* CategoryVariable(int index) const {
    return categories_[static_cast<size_t>(index)].variable;
  }

  // Decodes the numeric fields of the record `fields` shows; category codes are worked
  // out on first use. Allocates nothing.
  void Decode(const FieldView& fields);

  double Number(int index) const { return values_[static_cast<size_t>(index)]; }
  // Bit i set: number i (of the first 64) is not kNumber.
  uint64_t OddNumbers() const { return odd_; }
  NumberState State(int index) const {
    return static_cast<NumberState>(states_[static_cast<size_t>(index)]);
  }
  // The numbers by index, for loops that read many.
  const double* NumberData() const { return values_.data(); }
  // The category codes by index, valid for the fields Code has been asked about since
  // the last Decode. Both arrays have an entry at every index below the larger of
  // Numbers() and Categories() (and at least one), so that a loop may read either at
  // an index meant for the other.
  const int* CodeData() const { return codes_.data(); }
  // The ScoringPredicate::CategoryCode of a categorical field's value.
  int Code(int index) noexcept {
    int& code = codes_[static_cast<size_t>(index)];
    if (code == kUnknown) code = LookUp(index);
    return code;
  }

 private:
  static constexpr int kUnknown = INT32_MIN;

  struct NumberField {
    int slot;
    const QZXML_800::IQZEncoder* encoder;
  };
  struct CategoryField {
    int slot;
    const QZXML_800::IQZVariable* variable;
    int memo;  // the variable's slot in the document's memo
  };

  int LookUp(int index) noexcept;
  void Pad();

  CategoryCodeMemo* memo_;
  std::vector<NumberField> numbers_;
  std::vector<CategoryField> categories_;
  // The record being decoded, for the category codes.
  const QZCommon_800::ValueRecord* record_ = nullptr;
  const FieldBinder* binder_ = nullptr;
  uint64_t odd_ = ~uint64_t{0};
  std::vector<double> values_;
  std::vector<uint8_t> states_;
  std::vector<int> codes_;
};

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_FIELDROW_H_

// The library's encoders: categories held in order with a hash index, plus the values
// that count as missing. Internal to the common component.
#ifndef QZ_PLATFORM_COMMON_ENCODERS_H_
#define QZ_PLATFORM_COMMON_ENCODERS_H_

#include <memory>
#include <string>
#include <unordered_map>
#include <unordered_set>
#include <vector>

#include "QZVarList.h"

namespace QZXML_800 {

// What both encoders share: the missing values, the missing range and the labels.
class EncoderBase : public IQZEncoder {
 public:
  bool IsMissingString(const std::string& s) const override;
  bool IsMissingNumber(double d) const override;
  void AddMissingValue(double d, const std::string& label) override;
  void AddMissingValue(const std::string& s, const std::string& label) override;
  void SetMissingRange(double low, double high) override;
  const std::vector<std::string>& GetLabels() const override;

  // Sets the label of the category at index, growing the labels with empty entries.
  void SetLabel(int index, const std::string& label);
  // Makes room for that many categories.
  virtual void Reserve(size_t capacity) = 0;

 private:
  std::unordered_set<double> missingNumbers_;
  std::unordered_set<std::string> missingStrings_;
  bool hasRange_ = false;
  double rangeLow_ = 0.0;
  double rangeHigh_ = 0.0;
  std::vector<std::string> labels_;
};

// Number categories (value type 2). The encoder of a continuous variable is one that
// refuses every category.
class NumberEncoder final : public EncoderBase {
 public:
  explicit NumberEncoder(bool allowCategories) : allowCategories_(allowCategories) {}

  NumberEncoder* Clone() const override;
  int GetValueType() const override;
  int GetCount() const override;
  std::string GetStringAt(int i) const override;
  double GetNumberAt(int i) const override;
  double IndexOfString(const std::string& s) const override;
  double IndexOfNumber(double d) const override;
  bool IsMissingString(const std::string& s) const override;
  int AddCategory(double d) override;
  int AddCategory(const std::string& s) override;
  void Reserve(size_t capacity) override;

 private:
  bool allowCategories_;
  std::vector<double> categories_;
  std::unordered_map<double, int> index_;
};

// Text categories (value type 3).
class StringEncoder final : public EncoderBase {
 public:
  StringEncoder* Clone() const override;
  int GetValueType() const override;
  int GetCount() const override;
  std::string GetStringAt(int i) const override;
  double GetNumberAt(int i) const override;
  double IndexOfString(const std::string& s) const override;
  double IndexOfNumber(double d) const override;
  int AddCategory(double d) override;
  int AddCategory(const std::string& s) override;
  void Reserve(size_t capacity) override;

 private:
  std::vector<std::string> categories_;
  std::unordered_map<std::string, int> index_;
};

}  // namespace QZXML_800

#endif  // QZ_PLATFORM_COMMON_ENCODERS_H_

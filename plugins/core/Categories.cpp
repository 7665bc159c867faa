#include "Categories.h"

#include <cmath>
#include <limits>

#include "PluginDom.h"
#include "QZMV.h"
#include "ScoringPredicate.h"

namespace QZPlugin_800 {

namespace {

// Small tables are searched linearly: cheaper than hashing the text.
constexpr size_t kLinearLimit = 8;

// The number a category text stands for: its value, 1 and 0 for the boolean texts,
// else NaN.
double TextNumber(const std::string& text) {
  if (text == "true") return 1.0;
  if (text == "false") return 0.0;
  double number = 0.0;
  if (DomReader::ParseNumber(text, number)) return number;
  const double loose = QZCommon_800::Value::TextToReal(text);
  return QZCommon_800::QZMV::IsMissing(loose) ? std::numeric_limits<double>::quiet_NaN() : loose;
}

}  // namespace

int CategoryTable::Intern(const std::string& text) {
  auto found = index_.find(text);
  if (found != index_.end()) return found->second;
  const int index = Size();
  const double number = TextNumber(text);
  texts_.push_back(text);
  numbers_.push_back(number);
  // Boolean texts stay texts in the output: they name their categories best.
  if (numeric_ && !std::isnan(number) && text != "true" && text != "false") {
    values_.emplace_back(number);
  } else {
    values_.emplace_back(text);
  }
  index_.emplace(text, index);
  return index;
}

int CategoryTable::Find(const std::string& text) const {
  auto found = index_.find(text);
  if (found != index_.end()) return found->second;
  const double number = TextNumber(text);
  return std::isnan(number) ? -1 : MatchNumber(number);
}

int CategoryTable::MatchNumber(double number) const noexcept {
  for (size_t i = 0; i < numbers_.size(); ++i) {
    if (numbers_[i] == number) return static_cast<int>(i);
  }
  return -1;
}

int CategoryTable::Match(const QZCommon_800::Value& value) const noexcept {
  if (value.IsString()) {
    const std::string& text = value.GetText();
    if (texts_.size() <= kLinearLimit) {
      for (size_t i = 0; i < texts_.size(); ++i) {
        if (texts_[i] == text) return static_cast<int>(i);
      }
    } else {
      auto found = index_.find(text);
      if (found != index_.end()) return found->second;
    }
    const double number = value.GetReal();
    return QZCommon_800::QZMV::IsMissing(number) ? -1 : MatchNumber(number);
  }
  if (value.IsNumericValue() && !value.IsSystemMissingValue()) return MatchNumber(value.GetReal());
  return -1;
}

int CategoryCodeMemo::Add(const QZXML_800::IQZVariable* variable) {
  for (size_t i = 0; i < entries_.size(); ++i) {
    if (entries_[i].variable == variable) {
      ++entries_[i].users;
      return static_cast<int>(i);
    }
  }
  entries_.push_back({variable, std::string(), 0, 1, false});
  return static_cast<int>(entries_.size() - 1);
}

int CategoryCodeMemo::Code(int slot, const QZCommon_800::Value& value) noexcept {
  Entry& entry = entries_[static_cast<size_t>(slot)];
  if (entry.users < 2 || !value.IsString()) {
    return QZScoring_800::ScoringPredicate::CategoryCode(entry.variable, value);
  }
  const std::string& text = value.GetText();
  if (entry.known && entry.text == text) return entry.code;
  entry.known = false;
  try {
    entry.text = text;  // reuses the capacity of the text before
  } catch (...) {
    return QZScoring_800::ScoringPredicate::CategoryCode(entry.variable, value);
  }
  entry.code = QZScoring_800::ScoringPredicate::CategoryCode(entry.variable, value);
  entry.known = true;
  return entry.code;
}

}  // namespace QZPlugin_800

// Settings: the value kinds, one named setting, and the ordered collection.
#include "QZSettings.h"

#include <algorithm>
#include <limits>
#include <typeindex>
#include <typeinfo>
#include <unordered_set>

#include "QZMV.h"

namespace QZXML_800 {

using QZCommon_800::QZMV;
using QZCommon_800::Value;

// The common list instantiations, compiled once here and exported with the class.
template class QZVecValue<int>;
template class QZVecValue<double>;
template class QZVecValue<std::string>;
template class QZVecValue<std::pair<std::string, int>>;
template class QZVecValue<std::pair<std::string, double>>;
template class QZVecValue<std::pair<std::string, std::string>>;
template class QZVecValue<QZSettings>;
template class QZVecValue<Value>;

namespace {

// Three-way comparison of two setting values of any kinds: by kind, by element type,
// by the values' own order, and for unrelated classes of one kind by their class.
int CompareValues(const IQZSettingValue& a, const IQZSettingValue& b) {
  if (a.GetType() != b.GetType()) return a.GetType() < b.GetType() ? -1 : 1;
  if (a.GetElementType() != b.GetElementType()) {
    return a.GetElementType() < b.GetElementType() ? -1 : 1;
  }
  if (a.Less(b)) return -1;
  if (b.Less(a)) return 1;
  if (a.Equals(b)) return 0;
  std::type_index ta(typeid(a)), tb(typeid(b));
  if (ta == tb) return 0;  // incomparable values of one class count as equal
  return ta < tb ? -1 : 1;
}

}  // namespace

IQZSettingValue::~IQZSettingValue() = default;

// ---- QZStringValue ----

QZStringValue::QZStringValue(std::string text) : text_(std::move(text)) {}

QZStringValue* QZStringValue::Clone() const { return new QZStringValue(*this); }

bool QZStringValue::Equals(const IQZSettingValue& other) const {
  const auto* text = dynamic_cast<const QZStringValue*>(&other);
  return text != nullptr && text_ == text->text_;
}

bool QZStringValue::Less(const IQZSettingValue& other) const {
  const auto* text = dynamic_cast<const QZStringValue*>(&other);
  return text != nullptr && text_ < text->text_;
}

uint64_t QZStringValue::Size() const { return 1; }

double QZStringValue::GetReal() const { return Value::TextToReal(text_); }

std::string QZStringValue::GetText() const { return text_; }

bool QZStringValue::GetBool() const {
  if (text_ == "true") return true;
  double d = GetReal();
  return !QZMV::IsMissing(d) && d != 0.0;
}

int QZStringValue::GetInt() const {
  double d = GetReal();
  // Only numbers that fit in an int convert; anything else would be undefined.
  if (QZMV::IsMissing(d) || !(d > -2147483649.0 && d < 2147483648.0)) return 0;
  return static_cast<int>(d);
}

int QZStringValue::GetType() const { return SV_STRING; }

int QZStringValue::GetElementType() const { return 0; }

void QZStringValue::Display() const {
  QZDisplay_800::DisplayS("Setting Value Type", "String");
  QZDisplay_800::DisplayS("Setting value", text_);
}

// ---- QZBoolValue ----

QZBoolValue::QZBoolValue(bool value) : value_(value) {}

QZBoolValue* QZBoolValue::Clone() const { return new QZBoolValue(*this); }

bool QZBoolValue::Equals(const IQZSettingValue& other) const {
  const auto* truth = dynamic_cast<const QZBoolValue*>(&other);
  return truth != nullptr && value_ == truth->value_;
}

bool QZBoolValue::Less(const IQZSettingValue& other) const {
  const auto* truth = dynamic_cast<const QZBoolValue*>(&other);
  return truth != nullptr && !value_ && truth->value_;
}

uint64_t QZBoolValue::Size() const { return 1; }

double QZBoolValue::GetReal() const { return value_ ? 1.0 : 0.0; }

std::string QZBoolValue::GetText() const { return value_ ? "true" : "false"; }

bool QZBoolValue::GetBool() const { return value_; }

int QZBoolValue::GetInt() const { return value_ ? 1 : 0; }

int QZBoolValue::GetType() const { return SV_BOOL; }

int QZBoolValue::GetElementType() const { return 0; }

void QZBoolValue::Display() const {
  QZDisplay_800::DisplayS("Setting Value Type", "Bool");
  QZDisplay_800::DisplayS("Setting value", GetText());
}

// ---- QZSettingsValue ----

QZSettingsValue::QZSettingsValue(QZSettings settings) : settings_(std::move(settings)) {}

const QZSettings& QZSettingsValue::GetSettings() const { return settings_; }

QZSettingsValue* QZSettingsValue::Clone() const { return new QZSettingsValue(*this); }

bool QZSettingsValue::Equals(const IQZSettingValue& other) const {
  const auto* nested = dynamic_cast<const QZSettingsValue*>(&other);
  return nested != nullptr && settings_.Compare(nested->settings_) == 0;
}

bool QZSettingsValue::Less(const IQZSettingValue& other) const {
  const auto* nested = dynamic_cast<const QZSettingsValue*>(&other);
  return nested != nullptr && settings_.Compare(nested->settings_) < 0;
}

uint64_t QZSettingsValue::Size() const { return static_cast<uint64_t>(settings_.Size()); }

double QZSettingsValue::GetReal() const { return std::numeric_limits<double>::lowest(); }

std::string QZSettingsValue::GetText() const {
  return "Settings Value: Number of settings = " + std::to_string(settings_.Size()) + "\n";
}

bool QZSettingsValue::GetBool() const { return settings_.Size() > 0; }

int QZSettingsValue::GetInt() const { return settings_.Size(); }

int QZSettingsValue::GetType() const { return SV_SETTINGS; }

int QZSettingsValue::GetElementType() const { return 0; }

void QZSettingsValue::Display() const {
  QZDisplay_800::DisplayS("Setting Value Type", "Settings");
  QZDisplay_800::DisplayI("Total number of setting value", settings_.Size());
  QZDisplay_800::DisplayText(0, "\n");
}

// ---- QZSetting ----

namespace {

// A copy of the value; an empty text in place of none (a moved-from setting's).
std::unique_ptr<IQZSettingValue> CloneOrEmpty(const IQZSettingValue* value) {
  if (value == nullptr) return std::make_unique<QZStringValue>(std::string());
  return std::unique_ptr<IQZSettingValue>(value->Clone());
}

}  // namespace

QZSetting::QZSetting(const std::string& name, IQZSettingValue* value)
    : QZSetting(name, std::unique_ptr<IQZSettingValue>(value)) {}

QZSetting::QZSetting(const std::string& name, std::unique_ptr<IQZSettingValue> value)
    : name_(name), value_(std::move(value)) {
  if (!value_) value_ = std::make_unique<QZStringValue>(std::string());
}

QZSetting::QZSetting(const QZSetting& other)
    : name_(other.name_), value_(CloneOrEmpty(other.value_.get())) {}

QZSetting& QZSetting::operator=(const QZSetting& other) {
  if (this != &other) {
    std::unique_ptr<IQZSettingValue> value = CloneOrEmpty(other.value_.get());
    name_ = other.name_;
    value_ = std::move(value);
  }
  return *this;
}

QZSetting::~QZSetting() = default;

const std::string& QZSetting::GetName() const { return name_; }

const IQZSettingValue* QZSetting::GetValue() const { return value_.get(); }

void QZSetting::SetValue(IQZSettingValue* value) {
  if (value != nullptr) value_.reset(value);
}

// ---- QZSettings ----

QZSettings::QZSettings() = default;
QZSettings::QZSettings(const QZSettings& other) = default;
QZSettings::QZSettings(QZSettings&& other) noexcept = default;
QZSettings::~QZSettings() = default;

QZSettings& QZSettings::operator=(const QZSettings& other) {
  // Copy first: other may be nested inside this collection.
  if (this != &other) settings_ = std::vector<QZSetting>(other.settings_);
  return *this;
}

QZSettings& QZSettings::operator=(QZSettings&& other) noexcept = default;

void QZSettings::AddSetting(const std::string& name, const std::string& text, bool replace) {
  Put(name, std::make_unique<QZStringValue>(text), replace);
}

void QZSettings::AddSetting(const std::string& name, const char* text, bool replace) {
  if (text != nullptr) Put(name, std::make_unique<QZStringValue>(text), replace);
}

void QZSettings::AddSetting(const std::string& name, bool value, bool replace) {
  Put(name, std::make_unique<QZBoolValue>(value), replace);
}

void QZSettings::AddSetting(const std::string& name, const std::vector<std::string>& list,
                            bool replace) {
  Put(name, std::make_unique<QZVecValue<std::string>>(list), replace);
}

void QZSettings::AddSetting(const std::string& name, const QZSettings& nested,
                            bool replace) {
  Put(name, std::make_unique<QZSettingsValue>(nested), replace);
}

void QZSettings::AddSetting(const std::string& name, IQZSettingValue* value, bool replace) {
  std::unique_ptr<IQZSettingValue> owned(value);
  if (owned) Put(name, std::move(owned), replace);
}

void QZSettings::Put(const std::string& name, std::unique_ptr<IQZSettingValue> value,
                     bool replace) {
  QZSetting* existing = replace ? First(name) : nullptr;
  if (existing != nullptr) {
    existing->SetValue(value.release());
  } else {
    settings_.emplace_back(name, std::move(value));
  }
}

std::vector<std::string> QZSettings::GetSettingNames() const {
  std::vector<std::string> names;
  std::unordered_set<std::string> seen;
  for (const QZSetting& setting : settings_) {
    if (seen.insert(setting.GetName()).second) names.push_back(setting.GetName());
  }
  return names;
}

std::vector<const QZSetting*> QZSettings::GetSettingByName(const std::string& name) const {
  std::vector<const QZSetting*> found;
  for (const QZSetting& setting : settings_) {
    if (setting.GetName() == name) found.push_back(&setting);
  }
  return found;
}

bool QZSettings::GetSettingValByName(const std::string& name, std::string& out) const {
  const QZSetting* setting = First(name);
  if (setting == nullptr || setting->GetValue()->GetType() != IQZSettingValue::SV_STRING) {
    return false;
  }
  out = setting->GetValue()->GetText();
  return true;
}

bool QZSettings::GetSettingValByName(const std::string& name,
                                     std::vector<std::string>& out) const {
  const QZSetting* setting = First(name);
  if (setting == nullptr) return false;
  const auto* list = dynamic_cast<const QZVecValue<std::string>*>(setting->GetValue());
  if (list == nullptr) return false;
  out = list->GetValues();
  return true;
}

bool QZSettings::GetSettingValByName(const std::string& name, bool& out) const {
  const QZSetting* setting = First(name);
  if (setting == nullptr) return false;
  const IQZSettingValue* value = setting->GetValue();
  if (value->GetType() == IQZSettingValue::SV_BOOL) {
    out = value->GetBool();
    return true;
  }
  if (value->GetType() == IQZSettingValue::SV_STRING) {
    std::string text = value->GetText();
    if (text == "true" || text == "false") {
      out = text == "true";
      return true;
    }
  }
  return false;
}

bool QZSettings::GetSettingValByName(const std::string& name, QZSettings& out) const {
  const QZSetting* setting = First(name);
  if (setting == nullptr) return false;
  const auto* nested = dynamic_cast<const QZSettingsValue*>(setting->GetValue());
  if (nested == nullptr) return false;
  out = nested->GetSettings();  // safe when out holds nested: assignment copies first
  return true;
}

bool QZSettings::Contains(const std::string& name) const { return First(name) != nullptr; }

void QZSettings::RemoveSetting(const std::string& name) {
  settings_.erase(std::remove_if(settings_.begin(), settings_.end(),
                                 [&](const QZSetting& s) { return s.GetName() == name; }),
                  settings_.end());
}

int QZSettings::Size() const { return static_cast<int>(settings_.size()); }

const QZSetting* QZSettings::GetSettingAt(int i) const {
  if (i < 0 || i >= Size()) return nullptr;
  return &settings_[i];
}

int QZSettings::Compare(const QZSettings& other) const {
  if (this == &other) return 0;
  size_t common = std::min(settings_.size(), other.settings_.size());
  for (size_t i = 0; i < common; ++i) {
    int names = settings_[i].GetName().compare(other.settings_[i].GetName());
    if (names != 0) return names < 0 ? -1 : 1;
    int values = CompareValues(*settings_[i].GetValue(), *other.settings_[i].GetValue());
    if (values != 0) return values;
  }
  if (settings_.size() == other.settings_.size()) return 0;
  return settings_.size() < other.settings_.size() ? -1 : 1;
}

const QZSetting* QZSettings::First(const std::string& name) const {
  for (const QZSetting& setting : settings_) {
    if (setting.GetName() == name) return &setting;
  }
  return nullptr;
}

QZSetting* QZSettings::First(const std::string& name) {
  for (QZSetting& setting : settings_) {
    if (setting.GetName() == name) return &setting;
  }
  return nullptr;
}

}  // namespace QZXML_800

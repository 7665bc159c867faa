// Named settings: an ordered collection whose values are texts, truth values, lists
// (QZVecValue) or nested settings.
#ifndef QZ_PLATFORM_QZSETTINGS_H_
#define QZ_PLATFORM_QZSETTINGS_H_

#include <cstdint>
#include <limits>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "QZDisplay.h"
#include "QZPlatformExport.h"
#include "Value.h"

namespace QZXML_800 {

class QZSettings;

// The value of one setting. Values are immutable once stored in a setting; copies are
// made with Clone. Equals and Less compare values of the same kind (and, for lists, the
// same element type); against any other value both are false.
class QZCOMMON_API IQZSettingValue {
 public:
  // GetType codes.
  enum Type { SV_STRING = 1, SV_VECTOR = 2, SV_BOOL = 3, SV_SETTINGS = 4 };

  virtual ~IQZSettingValue();
  // A deep copy owned by the caller.
  virtual IQZSettingValue* Clone() const = 0;
  virtual bool Equals(const IQZSettingValue& other) const = 0;
  virtual bool Less(const IQZSettingValue& other) const = 0;
  // The number of values held (elements of a list, settings of nested settings, else 1).
  virtual uint64_t Size() const = 0;
  virtual double GetReal() const = 0;
  virtual std::string GetText() const = 0;
  virtual bool GetBool() const = 0;
  virtual int GetInt() const = 0;
  // A Type code.
  virtual int GetType() const = 0;
  // The element type code of a list (see QZVecValue); 0 for every other kind.
  virtual int GetElementType() const = 0;
  // Writes a description through the QZDisplay_800 functions.
  virtual void Display() const = 0;
};

// Element type codes of QZVecValue, fixed by the element type: int 1, double 2,
// std::string 3, pair<string,int> 4, pair<string,double> 5, pair<string,string> 6,
// QZSettings 7, any other type 0.
template <class T> struct QZVecElementCode { static constexpr int value = 0; };
template <> struct QZVecElementCode<int> { static constexpr int value = 1; };
template <> struct QZVecElementCode<double> { static constexpr int value = 2; };
template <> struct QZVecElementCode<std::string> { static constexpr int value = 3; };
template <> struct QZVecElementCode<std::pair<std::string, int>> {
  static constexpr int value = 4;
};
template <> struct QZVecElementCode<std::pair<std::string, double>> {
  static constexpr int value = 5;
};
template <> struct QZVecElementCode<std::pair<std::string, std::string>> {
  static constexpr int value = 6;
};
template <> struct QZVecElementCode<QZSettings> { static constexpr int value = 7; };

// A list value: a vector of T (T needs operator<, which orders the elements when two
// lists are compared). Its text is "Vector Value: Length of vector = N" and a line end,
// its real value the lowest finite double, its truth value "not empty" and its int the
// element count. Equals/Less compare element by element (a proper prefix is less)
// against a list of the same element type only. The common instantiations (int, double,
// std::string, the three pairs, QZSettings, QZCommon_800::Value) live in the library,
// so their type identity is the same in every module (dynamic_cast works across
// shared libraries).
template <class T>
class QZCOMMON_API QZVecValue : public IQZSettingValue {
 public:
  explicit QZVecValue(std::vector<T> values = {});

  const std::vector<T>& GetValues() const;
  std::vector<T>& GetValues();

  QZVecValue* Clone() const override;
  bool Equals(const IQZSettingValue& other) const override;
  bool Less(const IQZSettingValue& other) const override;
  uint64_t Size() const override;
  double GetReal() const override;
  std::string GetText() const override;
  bool GetBool() const override;
  int GetInt() const override;
  int GetType() const override;
  int GetElementType() const override;
  void Display() const override;

 private:
  // -1, 0 or 1: this list against other, position by position.
  int Compare(const QZVecValue& other) const;

  std::vector<T> values_;
  int elementType_;
};

// A text value. Its real value is the text read as a number (system-missing when it is
// none); its truth value is true for "true" or a non-zero number; its int is the number
// truncated (0 when it is none or out of range).
class QZCOMMON_API QZStringValue : public IQZSettingValue {
 public:
  explicit QZStringValue(std::string text);

  QZStringValue* Clone() const override;
  bool Equals(const IQZSettingValue& other) const override;
  bool Less(const IQZSettingValue& other) const override;  // byte-wise text order
  uint64_t Size() const override;
  double GetReal() const override;
  std::string GetText() const override;
  bool GetBool() const override;
  int GetInt() const override;
  int GetType() const override;
  int GetElementType() const override;
  void Display() const override;

 private:
  std::string text_;
};

// A truth value: text "true"/"false", real and int 1/0; false orders before true.
class QZCOMMON_API QZBoolValue : public IQZSettingValue {
 public:
  explicit QZBoolValue(bool value);

  QZBoolValue* Clone() const override;
  bool Equals(const IQZSettingValue& other) const override;
  bool Less(const IQZSettingValue& other) const override;
  uint64_t Size() const override;
  double GetReal() const override;
  std::string GetText() const override;
  bool GetBool() const override;
  int GetInt() const override;
  int GetType() const override;
  int GetElementType() const override;
  void Display() const override;

 private:
  bool value_;
};

// One named setting; owns its value.
class QZCOMMON_API QZSetting {
 public:
  // Takes ownership of the value; a null value is stored as an empty text.
  QZSetting(const std::string& name, IQZSettingValue* value);
  QZSetting(const std::string& name, std::unique_ptr<IQZSettingValue> value);
  // Deep copies.
  QZSetting(const QZSetting& other);
  QZSetting& operator=(const QZSetting& other);
  QZSetting(QZSetting&&) noexcept = default;
  QZSetting& operator=(QZSetting&&) noexcept = default;
  ~QZSetting();

  const std::string& GetName() const;
  // The value, owned by the setting; never null.
  const IQZSettingValue* GetValue() const;
  // Takes ownership of the value and replaces the current one; a null value leaves the
  // setting unchanged.
  void SetValue(IQZSettingValue* value);

 private:
  std::string name_;
  std::unique_ptr<IQZSettingValue> value_;
};

// An ordered collection of named settings; a name may occur more than once. Lookups by
// name are linear in the number of settings. Copies are deep. Not synchronised:
// concurrent readers are safe, a writer needs exclusive access. Pointers handed out
// (GetSettingByName, GetSettingAt) stay valid until the collection is next changed.
class QZCOMMON_API QZSettings {
 public:
  QZSettings();
  QZSettings(const QZSettings& other);
  QZSettings(QZSettings&& other) noexcept;
  QZSettings& operator=(const QZSettings& other);
  QZSettings& operator=(QZSettings&& other) noexcept;
  ~QZSettings();

  // replace true: the first setting of that name takes the new value, keeping its
  // place (appended when absent); false: a further setting of that name is appended.
  void AddSetting(const std::string& name, const std::string& text, bool replace);
  // As the text form; a null pointer adds nothing.
  void AddSetting(const std::string& name, const char* text, bool replace);
  void AddSetting(const std::string& name, bool value, bool replace);
  // Stores a QZVecValue<std::string>.
  void AddSetting(const std::string& name, const std::vector<std::string>& list,
                  bool replace);
  // Stores a copy of the nested settings (nested may be this collection).
  void AddSetting(const std::string& name, const QZSettings& nested, bool replace);
  // Takes ownership of the value; a null value is refused (nothing added).
  void AddSetting(const std::string& name, IQZSettingValue* value, bool replace);

  // The distinct names, in order of first addition.
  std::vector<std::string> GetSettingNames() const;
  // Every setting of that name, in order; empty when absent.
  std::vector<const QZSetting*> GetSettingByName(const std::string& name) const;
  // The value of the first setting of that name. False (out untouched) when absent or
  // of another kind. The text form reads text values only; the list form reads any
  // QZVecValue<std::string>; the bool form reads truth values and the texts
  // "true"/"false"; the settings form reads nested settings.
  bool GetSettingValByName(const std::string& name, std::string& out) const;
  bool GetSettingValByName(const std::string& name, std::vector<std::string>& out) const;
  bool GetSettingValByName(const std::string& name, bool& out) const;
  bool GetSettingValByName(const std::string& name, QZSettings& out) const;
  bool Contains(const std::string& name) const;
  // Removes every setting of that name.
  void RemoveSetting(const std::string& name);

  // The number of settings (repeated names counted each time).
  int Size() const;
  // The setting at i in order of addition, null when out of range.
  const QZSetting* GetSettingAt(int i) const;

  // Three-way comparison of the content, a strict weak order: setting by setting, the
  // name, then the value (by kind, element type, then the value's own order); a proper
  // prefix is less. Returns -1, 0 or 1.
  int Compare(const QZSettings& other) const;
  bool operator==(const QZSettings& other) const { return Compare(other) == 0; }
  bool operator!=(const QZSettings& other) const { return Compare(other) != 0; }
  bool operator<(const QZSettings& other) const { return Compare(other) < 0; }

 private:
  // The first setting of that name, null when absent.
  const QZSetting* First(const std::string& name) const;
  QZSetting* First(const std::string& name);
  // Stores an owned, non-null value under the name (see AddSetting).
  void Put(const std::string& name, std::unique_ptr<IQZSettingValue> value, bool replace);

  std::vector<QZSetting> settings_;
};

// Nested settings as a value. Its int and size are the number of settings, its truth
// value "not empty", its real value the lowest finite double; it orders by
// QZSettings::Compare.
class QZCOMMON_API QZSettingsValue : public IQZSettingValue {
 public:
  explicit QZSettingsValue(QZSettings settings);

  const QZSettings& GetSettings() const;

  QZSettingsValue* Clone() const override;
  bool Equals(const IQZSettingValue& other) const override;
  bool Less(const IQZSettingValue& other) const override;
  uint64_t Size() const override;
  double GetReal() const override;
  std::string GetText() const override;
  bool GetBool() const override;
  int GetInt() const override;
  int GetType() const override;
  int GetElementType() const override;
  void Display() const override;

 private:
  QZSettings settings_;
};

// ---- QZVecValue ----

template <class T>
QZVecValue<T>::QZVecValue(std::vector<T> values)
    : values_(std::move(values)), elementType_(QZVecElementCode<T>::value) {}

template <class T>
const std::vector<T>& QZVecValue<T>::GetValues() const {
  return values_;
}

template <class T>
std::vector<T>& QZVecValue<T>::GetValues() {
  return values_;
}

template <class T>
QZVecValue<T>* QZVecValue<T>::Clone() const {
  return new QZVecValue<T>(*this);
}

template <class T>
int QZVecValue<T>::Compare(const QZVecValue& other) const {
  const std::vector<T>& theirs = other.values_;
  for (size_t i = 0; i < values_.size(); ++i) {
    if (i >= theirs.size()) return 1;
    if (values_[i] < theirs[i]) return -1;
    if (theirs[i] < values_[i]) return 1;
  }
  return values_.size() < theirs.size() ? -1 : 0;
}

template <class T>
bool QZVecValue<T>::Equals(const IQZSettingValue& other) const {
  const auto* list = dynamic_cast<const QZVecValue<T>*>(&other);
  return list != nullptr && Compare(*list) == 0;
}

template <class T>
bool QZVecValue<T>::Less(const IQZSettingValue& other) const {
  const auto* list = dynamic_cast<const QZVecValue<T>*>(&other);
  return list != nullptr && Compare(*list) < 0;
}

template <class T>
uint64_t QZVecValue<T>::Size() const {
  return values_.size();
}

template <class T>
double QZVecValue<T>::GetReal() const {
  return std::numeric_limits<double>::lowest();
}

template <class T>
std::string QZVecValue<T>::GetText() const {
  return "Vector Value: Length of vector = " + std::to_string(values_.size()) + "\n";
}

template <class T>
bool QZVecValue<T>::GetBool() const {
  return !values_.empty();
}

template <class T>
int QZVecValue<T>::GetInt() const {
  return static_cast<int>(values_.size());
}

template <class T>
int QZVecValue<T>::GetType() const {
  return SV_VECTOR;
}

template <class T>
int QZVecValue<T>::GetElementType() const {
  return elementType_;
}

template <class T>
void QZVecValue<T>::Display() const {
  QZDisplay_800::DisplayS("Setting Value Type", "Vector");
  QZDisplay_800::DisplayI("Total number of setting value", static_cast<int>(values_.size()));
  QZDisplay_800::DisplayText(0, "\n");
}

// The common instantiations are compiled once, inside the library.
extern template class QZVecValue<int>;
extern template class QZVecValue<double>;
extern template class QZVecValue<std::string>;
extern template class QZVecValue<std::pair<std::string, int>>;
extern template class QZVecValue<std::pair<std::string, double>>;
extern template class QZVecValue<std::pair<std::string, std::string>>;
extern template class QZVecValue<QZSettings>;
extern template class QZVecValue<QZCommon_800::Value>;

}  // namespace QZXML_800

#endif  // QZ_PLATFORM_QZSETTINGS_H_

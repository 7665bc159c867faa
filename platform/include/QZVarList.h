// Variables of a data dictionary: their categories and missing values (encoders), the
// continuous and categorical variable kinds, and the ordered list that owns them.
#ifndef QZ_PLATFORM_QZVARLIST_H_
#define QZ_PLATFORM_QZVARLIST_H_

#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

#include "QZPlatformExport.h"
#include "XMLElement.h"

namespace QZXML_800 {

class QZVarList;

// How a variable's values are measured. Levels 2 and 3 are categorical: their
// categories are numbers (2) or texts (3).
enum MeasureLevel {
  ML_UNKNOWN = 0,
  ML_CONTINUOUS = 1,
  ML_NUMERIC_CATEGORICAL = 2,
  ML_STRING_CATEGORICAL = 3
};

// The part a variable plays in a model. ROLE_NONE is the role of a freshly read data
// dictionary field, before the mining schema assigns roles.
enum VariableRole { ROLE_NONE = 0, ROLE_TARGET = 2, ROLE_INPUT = 4 };

// Storage codes of IQZVariable::SetStorageType.
enum StorageType {
  STORAGE_UNKNOWN = 0,
  STORAGE_INTEGER = 1,
  STORAGE_REAL = 2,
  STORAGE_STRING = 3,
  STORAGE_DATE_DAYS = 4,         // days since an epoch
  STORAGE_TIME_SECONDS = 5,      // seconds of the day
  STORAGE_DATETIME_SECONDS = 6   // seconds since an epoch
};

// A variable's categories (numbers or texts, in order of addition, each at most once),
// their labels, and the values that count as missing for the variable.
// Lookups (IndexOf..., IsMissing...) take constant time on average. Not synchronised:
// concurrent readers are safe, a writer needs exclusive access.
class QZCOMMON_API IQZEncoder {
 public:
  virtual ~IQZEncoder();
  // A deep copy owned by the caller.
  virtual IQZEncoder* Clone() const = 0;
  // 2 when the categories are numbers, 3 when they are texts.
  virtual int GetValueType() const = 0;
  // The number of categories.
  virtual int GetCount() const = 0;
  // The category at i as text (a number as Value(d).GetString()); empty out of range.
  virtual std::string GetStringAt(int i) const = 0;
  // The category at i as a number (a text read as a number, system-missing when it is
  // none); system-missing out of range.
  virtual double GetNumberAt(int i) const = 0;
  // The index of a category, -1.0 when absent. A number encoder reads the text as a
  // number; a text encoder looks up a number by its text (Value(d).GetString()).
  virtual double IndexOfString(const std::string& s) const = 0;
  virtual double IndexOfNumber(double d) const = 0;
  // Whether a text counts as missing: a listed missing text; on a number encoder also a
  // text that reads as a missing number (or as no number at all).
  virtual bool IsMissingString(const std::string& s) const = 0;
  // Whether a number counts as missing: a listed missing number, a number inside the
  // missing range (both ends included), and system-missing or NaN.
  virtual bool IsMissingNumber(double d) const = 0;
  // Lists a missing value. A number is also listed as its text and a text that reads as
  // a number also as that number, so both lookups agree. The label is not kept.
  virtual void AddMissingValue(double d, const std::string& label) = 0;
  virtual void AddMissingValue(const std::string& s, const std::string& label) = 0;
  // Sets the one missing range (replacing an earlier one); both ends are included.
  virtual void SetMissingRange(double low, double high) = 0;
  // Adds a category and returns its index; an existing category is not added twice (its
  // index is returned). Returns -1 when refused: system-missing or NaN, a text that is
  // no number on a number encoder, or any category on a continuous variable's encoder.
  virtual int AddCategory(double d) = 0;
  virtual int AddCategory(const std::string& s) = 0;
  // The category labels by category index; may be shorter than the categories and may
  // hold empty entries.
  virtual const std::vector<std::string>& GetLabels() const = 0;
};

// A variable of a data dictionary: name, label, measure level, role, storage, flag
// measure, format and encoder. Not synchronised, like IQZEncoder.
class QZCOMMON_API IQZVariable {
 public:
  virtual ~IQZVariable();
  // A deep copy owned by the caller, belonging to no list.
  virtual IQZVariable* Clone() const = 0;
  virtual std::string GetName() const = 0;
  virtual std::string GetLabel() const = 0;
  virtual MeasureLevel GetMeasureLevel() const = 0;
  // The encoder's number of categories (0 for a continuous variable).
  virtual int GetNumCategories() const = 0;
  virtual VariableRole GetRole() const = 0;
  // Changes the role; the owning list's target indices follow at once.
  virtual void SetRole(VariableRole role) = 0;
  // Storage code (StorageType): 1..6, 0 when unknown.
  virtual int GetStorageType() const = 0;
  virtual void SetStorageType(int code) = 0;
  // Whether the variable is measured as a flag (a two-valued field).
  virtual bool GetFlagMeasure() const = 0;
  virtual void SetFlagMeasure(bool flag) = 0;
  // The number or string format description, null when none; owned by the variable.
  virtual const XMLElement* GetFormat() const = 0;
  // Takes ownership of the format (null removes it); an earlier format is deleted.
  virtual void SetFormat(XMLElement* format) = 0;
  // The variable's encoder (owned by the variable), null when none.
  virtual IQZEncoder* GetEncoder() = 0;
  virtual const IQZEncoder* GetEncoder() const = 0;
};

// What the library's two variable kinds share: plain storage of the IQZVariable state,
// an encoder that always exists, and the link to the list that owns the variable, so
// that a role change reaches the list's target indices however it is made.
class QZCOMMON_API QZVariableBase : public IQZVariable {
 public:
  ~QZVariableBase() override;
  QZVariableBase& operator=(const QZVariableBase&) = delete;

  std::string GetName() const override;
  std::string GetLabel() const override;
  VariableRole GetRole() const override;
  void SetRole(VariableRole role) override;
  int GetStorageType() const override;
  void SetStorageType(int code) override;
  bool GetFlagMeasure() const override;
  void SetFlagMeasure(bool flag) override;
  const XMLElement* GetFormat() const override;
  void SetFormat(XMLElement* format) override;
  IQZEncoder* GetEncoder() override;
  const IQZEncoder* GetEncoder() const override;
  int GetNumCategories() const override;

 protected:
  // Takes ownership of the encoder (never null).
  QZVariableBase(const std::string& name, const std::string& label, VariableRole role,
                 std::unique_ptr<IQZEncoder> encoder);
  // Deep copy (encoder and format cloned) that belongs to no list.
  QZVariableBase(const QZVariableBase& other);

 private:
  friend class QZVarList;

  std::string name_;
  std::string label_;
  VariableRole role_;
  int storageType_ = STORAGE_UNKNOWN;
  bool flagMeasure_ = false;
  std::unique_ptr<XMLElement> format_;
  std::unique_ptr<IQZEncoder> encoder_;
  QZVarList* owner_ = nullptr;  // the list that owns this variable, if any
  int index_ = -1;              // its position in that list
};

// A continuous variable: a number range and an encoder (value type 2) that never holds
// categories but holds the missing values.
class QZCOMMON_API QZContVar : public QZVariableBase {
 public:
  // The range is the whole finite double range.
  QZContVar(const std::string& name, const std::string& label, VariableRole role);
  // isInteger: values are whole numbers; decimals: digits after the point to show,
  // negative when unspecified.
  QZContVar(const std::string& name, const std::string& label, double minimum,
            double maximum, VariableRole role, bool isInteger, int decimals);

  QZContVar* Clone() const override;
  MeasureLevel GetMeasureLevel() const override;

  double GetMinimum() const;
  double GetMaximum() const;
  bool GetIntegerFlag() const;
  int GetDecimals() const;

 private:
  double minimum_;
  double maximum_;
  bool isInteger_ = false;
  int decimals_ = -1;
};

// A categorical variable whose categories are numbers (level 2) or texts (level 3),
// with its ordinal mark and, for a flag, the index of its true category.
class QZCOMMON_API QZCatVar : public QZVariableBase {
 public:
  // No categories yet. Any level other than 2 gives a text-categorical variable.
  QZCatVar(const std::string& name, const std::string& label, MeasureLevel level,
           VariableRole role);

  QZCatVar* Clone() const override;
  MeasureLevel GetMeasureLevel() const override;

  void SetOrdinalFlag(bool flag);
  bool GetOrdinalFlag() const;
  // Marks the variable as a binary flag whose true category is at trueIndex; clearing
  // the flag also clears the true index.
  void SetBinaryFlag(bool flag, int trueIndex);
  bool GetBinaryFlag() const;
  // The index of the true category, negative when none.
  int GetBinaryFlagTrueIndex() const;

 private:
  MeasureLevel level_;
  bool ordinal_ = false;
  bool binary_ = false;
  int trueIndex_ = -1;
};

// An ordered list of uniquely named variables (a data dictionary) that owns them.
// Lookup by name takes constant time on average. The target indices always follow the
// variables' current roles. Copies are deep. Not synchronised: concurrent readers are
// safe, a writer (including a role change through a variable) needs exclusive access.
// One exception: a list holding variables of another IQZVariable implementation than
// QZContVar/QZCatVar recomputes its target indices when they are read, so reading them
// is then a write.
class QZCOMMON_API QZVarList {
 public:
  QZVarList();
  QZVarList(const QZVarList& other);
  QZVarList(QZVarList&& other) noexcept;
  QZVarList& operator=(const QZVarList& other);
  QZVarList& operator=(QZVarList&& other) noexcept;
  ~QZVarList();

  int Size() const;
  // The variable at i (owned by the list), null when out of range.
  IQZVariable* GetVarAt(int i);
  const IQZVariable* GetVarAt(int i) const;
  // The variable of that name (owned by the list), null when absent.
  IQZVariable* GetVariable(const std::string& name);
  const IQZVariable* GetVariable(const std::string& name) const;
  // The index of the variable of that name, -1 when absent.
  int FindVariable(const std::string& name) const;
  // The first variable whose role is ROLE_TARGET, null when none.
  const IQZVariable* GetTargetRespVariable() const;
  // Indices of the variables whose role is ROLE_TARGET, ascending. The reference stays
  // valid as long as the list does; its content follows later role changes.
  const std::vector<int>& GetTargetIndices() const;
  // The encoder of the variable at i, null when out of range or when it has none.
  IQZEncoder* GetEncoderAt(int i);
  const IQZEncoder* GetEncoderAt(int i) const;
  // Sets the role of the variable at i; false (nothing changed) when out of range.
  bool SetVariableRole(int i, VariableRole role);

  // Every add returns the new index, or -1 when refused (an empty name or a name that
  // is already present), in which case the list is unchanged.
  // A continuous variable over the whole finite double range.
  int AddContVar(const std::string& name, const std::string& label, VariableRole role);
  // A continuous variable over [min, max]; see QZContVar for isInteger and decimals.
  int AddContVar(const std::string& name, const std::string& label, double min, double max,
                 VariableRole role, bool isInteger, int decimals);
  // A categorical variable with text categories (level 3), optionally with labels by
  // position. Repeated categories are added once and keep the first one's label.
  int AddCatVar(const std::string& name, const std::string& label,
                const std::vector<std::string>& categories, VariableRole role);
  int AddCatVar(const std::string& name, const std::string& label,
                const std::vector<std::string>& categories,
                const std::vector<std::string>& labels, VariableRole role);
  // A categorical variable with number categories (level 2), optionally with labels by
  // position. Repeated categories are added once; system-missing and NaN are skipped.
  int AddCatVar(const std::string& name, const std::string& label,
                const std::vector<double>& categories, VariableRole role);
  int AddCatVar(const std::string& name, const std::string& label,
                const std::vector<double>& categories,
                const std::vector<std::string>& labels, VariableRole role);
  // A categorical variable without categories yet; capacity is a hint of how many will
  // come. Also refused (-1) when the level is not 2 or 3.
  int AddCatVar(const std::string& name, const std::string& label, int capacity,
                MeasureLevel level, VariableRole role);
  // Takes ownership of the variable. When refused (null, empty or present name) it is
  // deleted, except a variable that already belongs to a list: that one is left to its
  // list untouched.
  int AddVariable(IQZVariable* variable);

 private:
  friend class QZVariableBase;

  // Appends an owned variable whose name has been checked; returns its index.
  int Append(std::unique_ptr<IQZVariable> variable);
  // Keeps the target indices in step with the role of the variable at index.
  void OnRoleChanged(int index, VariableRole role);
  // Makes this list the owner of every variable it holds (after a copy or move).
  void AdoptAll();
  // Recomputes the target indices from the roles, for lists that hold variables of
  // other IQZVariable implementations, whose role changes the list cannot observe.
  void RefreshForeignTargets() const;

  std::vector<std::unique_ptr<IQZVariable>> variables_;
  std::unordered_map<std::string, int> byName_;
  mutable std::vector<int> targets_;
  int foreignCount_ = 0;  // variables that are not QZVariableBase
};

}  // namespace QZXML_800

#endif  // QZ_PLATFORM_QZVARLIST_H_

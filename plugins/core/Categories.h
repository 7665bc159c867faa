// Category interning: every category text a model mentions gets a small index once, at
// compile time, so that scoring compares indices instead of texts.
#ifndef QZPLUGIN_CORE_CATEGORIES_H_
#define QZPLUGIN_CORE_CATEGORIES_H_

#include <string>
#include <unordered_map>
#include <vector>

#include "Value.h"

namespace QZXML_800 {
class IQZVariable;
}

namespace QZPlugin_800 {

// The categories of one field, in the order they were interned (a target's dictionary
// categories first). Each category is a text; one that reads as a number also matches
// record values by number ("1" matches 1.0 and "1.0"; "true" and "false" match 1 and 0). Building (Intern) must not
// overlap with use; Match and the accessors only read and allocate nothing.
class CategoryTable {
 public:
  // `numeric`: the field stores numbers, so AsValue gives reals for number texts.
  explicit CategoryTable(bool numeric = false) : numeric_(numeric) {}

  // The index of the text, adding it at the end when absent.
  int Intern(const std::string& text);
  // The index of the category the text names (exactly, else by number); -1 when none.
  int Find(const std::string& text) const;
  // The index of the category a record value names; -1 when the value is missing or
  // names none. A string matches by text (then by number), a real by number.
  int Match(const QZCommon_800::Value& value) const noexcept;

  int Size() const { return static_cast<int>(texts_.size()); }
  bool Empty() const { return texts_.empty(); }
  const std::string& Text(int index) const { return texts_[static_cast<size_t>(index)]; }
  // The category as an output value: a real for a numeric field whose text is a
  // number ("true" and "false" excepted), else the text.
  const QZCommon_800::Value& AsValue(int index) const {
    return values_[static_cast<size_t>(index)];
  }
  bool IsNumeric() const { return numeric_; }

 private:
  int MatchNumber(double number) const noexcept;

  bool numeric_;
  std::vector<std::string> texts_;
  std::vector<QZCommon_800::Value> values_;
  std::vector<double> numbers_;  // the text read as a number; NaN when it is none
  std::unordered_map<std::string, int> index_;
};

// The CategoryCode (ScoringPredicate::CategoryCode) of the text a categorical field
// holds, shared by every model of one document: the trees of an ensemble test the same
// fields of one record, and finding a text among a field's categories costs far more
// than comparing it with the text found last. Each variable keeps its last text and
// code; a value that is no text, or a field only one model tests, is not kept. One
// thread at a time.
class CategoryCodeMemo {
 public:
  // The slot of the variable, added when new (at compile time, once per model that
  // tests it).
  int Add(const QZXML_800::IQZVariable* variable);
  int Code(int slot, const QZCommon_800::Value& value) noexcept;

 private:
  struct Entry {
    const QZXML_800::IQZVariable* variable;
    std::string text;
    int code;
    int users;   // the models that test the variable
    bool known;  // text and code belong together
  };
  std::vector<Entry> entries_;
};

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_CATEGORIES_H_

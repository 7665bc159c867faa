// How CSV cells become the values of a model's input record, and how a model's output
// record becomes CSV columns.
#ifndef QZSCORE_RECORDS_H_
#define QZSCORE_RECORDS_H_

#include <string>
#include <unordered_map>
#include <vector>

#include "Value.h"
#include "ValueRecord.h"

namespace qzscore {

// Field name -> whether its storage is numeric (integer, real, date and time codes).
using FieldKinds = std::unordered_map<std::string, bool>;

// Whether a variable's storage code asks for numbers (codes 1, 2, 4, 5, 6).
bool IsNumericStorage(int storage);

// Turns a cell into a value: an empty cell or one equal to a missing token gives a null
// value; a numeric field gives a real, a text field the text. False when a numeric
// cell is not a number (the value is then null).
bool ConvertCell(const std::string& cell, bool numeric, const std::vector<std::string>& missing,
                 QZCommon_800::Value& out);

// The input columns a model reads: every header column named like a field in kinds
// (the first of repeated names), in header order. Immutable after construction, so
// several threads may share one.
class InputLayout {
 public:
  InputLayout(const std::vector<std::string>& header, const FieldKinds& kinds,
              std::vector<std::string> missingTokens);

  // Adds the input fields, null, to an empty record in layout order.
  void Prepare(QZCommon_800::ValueRecord& input) const;
  // Sets the record's layout fields from a row (cells beyond the row are null). Appends
  // to notNumbers the header index of each numeric cell that is not a number.
  void Fill(const std::vector<std::string>& cells, QZCommon_800::ValueRecord& input,
            std::vector<size_t>& notNumbers) const;
  bool Contains(const std::string& name) const;

 private:
  struct Column {
    size_t cell;
    bool numeric;
  };
  std::vector<Column> columns_;
  std::vector<std::string> names_;
  std::vector<std::string> missing_;
};

// The columns of a laid-out output record (after Scorable): a field N is one column,
// a structured value gives one column "N.E" per entry E (nested entries likewise).
// Immutable after construction; share it between threads freely.
class OutputLayout {
 public:
  explicit OutputLayout(const QZCommon_800::ValueRecord& laidOut);

  const std::vector<std::string>& Names() const { return names_; }
  size_t Size() const { return names_.size(); }
  // The text of a column for an output record of the same layout: empty for a missing
  // value, the value of a structure's single entry, numbers in shortest round-trip form.
  std::string Text(const QZCommon_800::ValueRecord& output, size_t column) const;
  // The value of a column; null when absent.
  QZCommon_800::Value Get(const QZCommon_800::ValueRecord& output, size_t column) const;

 private:
  void Add(size_t field, const std::string& name, std::vector<std::string>& path,
           const QZCommon_800::Value& value);

  struct Column {
    size_t field;
    std::vector<std::string> path;
  };
  std::vector<Column> columns_;
  std::vector<std::string> names_;
};

}  // namespace qzscore

#endif  // QZSCORE_RECORDS_H_

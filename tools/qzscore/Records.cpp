#include "Records.h"

#include <sstream>
#include <unordered_set>
#include <utility>

#include "QZMV.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace qzscore {

bool IsNumericStorage(int storage) {
  return storage == 1 || storage == 2 || storage == 4 || storage == 5 || storage == 6;
}

bool ConvertCell(const std::string& cell, bool numeric, const std::vector<std::string>& missing,
                 Value& out) {
  if (cell.empty()) {
    out = Value();
    return true;
  }
  for (const std::string& token : missing) {
    if (cell == token) {
      out = Value();
      return true;
    }
  }
  if (!numeric) {
    out = cell;
    return true;
  }
  const double number = Value::TextToReal(cell);
  if (QZCommon_800::QZMV::IsMissing(number)) {
    out = Value();
    return false;
  }
  out = number;
  return true;
}

InputLayout::InputLayout(const std::vector<std::string>& header, const FieldKinds& kinds,
                         std::vector<std::string> missingTokens)
    : missing_(std::move(missingTokens)) {
  std::unordered_set<std::string> seen;
  for (size_t i = 0; i < header.size(); ++i) {
    const auto kind = kinds.find(header[i]);
    if (kind == kinds.end() || !seen.insert(header[i]).second) continue;
    columns_.push_back({i, kind->second});
    names_.push_back(header[i]);
  }
}

void InputLayout::Prepare(ValueRecord& input) const {
  for (const std::string& name : names_) input.Add(name, Value());
}

void InputLayout::Fill(const std::vector<std::string>& cells, ValueRecord& input,
                       std::vector<size_t>& notNumbers) const {
  static const std::string kEmpty;
  for (size_t i = 0; i < columns_.size(); ++i) {
    const Column& column = columns_[i];
    const std::string& cell = column.cell < cells.size() ? cells[column.cell] : kEmpty;
    if (!ConvertCell(cell, column.numeric, missing_, input[i])) notNumbers.push_back(column.cell);
  }
}

bool InputLayout::Contains(const std::string& name) const {
  for (const std::string& known : names_) {
    if (known == name) return true;
  }
  return false;
}

OutputLayout::OutputLayout(const ValueRecord& laidOut) {
  for (size_t i = 0; i < laidOut.Size(); ++i) {
    std::vector<std::string> path;
    Add(i, laidOut.GetName(i), path, laidOut[i]);
  }
}

void OutputLayout::Add(size_t field, const std::string& name, std::vector<std::string>& path,
                       const Value& value) {
  if (!value.IsStruct()) {
    columns_.push_back({field, path});
    names_.push_back(name);
    return;
  }
  for (const std::string& entry : value.GetEntryNames()) {
    path.push_back(entry);
    Add(field, name + "." + entry, path, *value.Find(entry));
    path.pop_back();
  }
}

Value OutputLayout::Get(const ValueRecord& output, size_t column) const {
  const Column& c = columns_[column];
  if (c.field >= output.Size()) return Value();
  const Value* value = &output[c.field];
  for (const std::string& entry : c.path) {
    value = value->Find(entry);
    if (value == nullptr) return Value();
  }
  // A split model nests each field under its sub-model's target name: one entry.
  while (value->IsStruct()) {
    const std::vector<std::string> entries = value->GetEntryNames();
    if (entries.size() != 1) break;
    value = value->Find(entries.front());
  }
  return *value;
}

std::string OutputLayout::Text(const ValueRecord& output, size_t column) const {
  const Value value = Get(output, column);
  if (!value.IsStruct()) return value.GetString();
  std::ostringstream text;
  text << value;
  return text.str();
}

}  // namespace qzscore

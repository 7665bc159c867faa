// Reading the validation corpus's data tables in tests: CSV lines (quoted cells with
// doubled quotes) and number cells.
#ifndef QZSCORING_TESTS_SUPPORT_CORPUSTEXT_H_
#define QZSCORING_TESTS_SUPPORT_CORPUSTEXT_H_

#include <string>
#include <vector>

#include "QZMV.h"
#include "Value.h"

namespace qztest {

// The cells of one CSV line; a carriage return outside quotes is dropped.
inline std::vector<std::string> SplitCsv(const std::string& line) {
  std::vector<std::string> cells;
  std::string cell;
  bool quoted = false;
  for (size_t i = 0; i < line.size(); ++i) {
    const char c = line[i];
    if (quoted) {
      if (c == '"' && i + 1 < line.size() && line[i + 1] == '"') {
        cell += '"';
        ++i;
      } else if (c == '"') {
        quoted = false;
      } else {
        cell += c;
      }
    } else if (c == '"') {
      quoted = true;
    } else if (c == ',') {
      cells.push_back(cell);
      cell.clear();
    } else if (c != '\r') {
      cell += c;
    }
  }
  cells.push_back(cell);
  return cells;
}

// The cell's number; false for an empty cell or one that is no number.
inline bool ParseNumber(const std::string& text, double& out) {
  if (text.empty()) return false;
  const double d = QZCommon_800::Value::TextToReal(text);
  if (QZCommon_800::QZMV::IsMissing(d)) return false;
  out = d;
  return true;
}

}  // namespace qztest

#endif  // QZSCORING_TESTS_SUPPORT_CORPUSTEXT_H_

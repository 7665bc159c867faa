// qzscore verify: scores the inputs of a table that also holds expected results and
// reports, per expected column, how many records agree.
//
// Expected columns: "prediction"; "Probability_CAT" (the output field
// "probability(CAT)", or a field of that very name); "expect:FIELD"; "status" (the
// expected status code of each record, empty for success); and any column named like
// an output column that is not a field of the model.

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <iomanip>
#include <iostream>

#include "Commands.h"
#include "Csv.h"
#include "Output.h"
#include "QZMV.h"
#include "StatusText.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace qzscore {

namespace {

constexpr size_t kShownPerColumn = 5;

struct Check {
  size_t column;      // in the expected table
  std::string field;  // the output column compared with
  long output = -1;   // its index in the output layout; -1: the model has none
  uint64_t agree = 0;
  uint64_t disagree = 0;
  double largest = 0.0;  // the largest difference between numbers seen
};

bool ReadNumber(const std::string& text, double& number) {
  number = Value::TextToReal(text);
  return !QZCommon_800::QZMV::IsMissing(number);
}

// Empty expects a missing value. Numbers agree within the tolerance relative to the
// larger of the two, or absolutely within tolerance * 1e-6 near zero; anything else
// compares as text, exactly.
bool Agrees(const std::string& expected, const Value& actual, double tolerance,
            double& difference) {
  difference = 0.0;
  if (expected.empty()) return actual.IsMissing();
  if (actual.IsMissing()) return false;
  double e = 0.0, a = 0.0;
  if (ReadNumber(expected, e) && (actual.IsNumericValue() ? (a = actual.GetReal(), true)
                                                          : ReadNumber(actual.GetString(), a))) {
    if (std::isinf(e) || std::isinf(a)) return e == a;
    difference = std::fabs(e - a);
    return difference <= tolerance * std::max(std::fabs(e), std::fabs(a)) ||
           difference <= tolerance * 1e-6;
  }
  return actual.GetString() == expected;
}

// The output column an expected column is compared with; empty when it is no
// expected column.
std::string ComparedField(const std::string& name, const FieldKinds& kinds,
                          const OutputLayout& outputs) {
  const std::vector<std::string>& names = outputs.Names();
  const auto has = [&names](const std::string& field) {
    return std::find(names.begin(), names.end(), field) != names.end();
  };
  if (name == "prediction") return name;
  if (name.rfind("Probability_", 0) == 0) {
    const std::string field = "probability(" + name.substr(12) + ")";
    return has(field) || !has(name) ? field : name;
  }
  if (name.rfind("expect:", 0) == 0) return name.substr(7);
  if (kinds.count(name) == 0 && has(name)) return name;
  return std::string();
}

}  // namespace

int RunVerify(const VerifyOptions& options) {
  std::string error;
  Registry registry;
  ModelSource source;
  if (!MakeRegistry(options.models, registry, error) ||
      !source.Open(options.models.model, registry, error)) {
    Report(error);
    return kExitUsage;
  }
  uint64_t size = 0;
  auto in = OpenInput(options.expected, size, error);
  if (in == nullptr) {
    Report(error);
    return kExitUsage;
  }
  const std::string name = DisplayName(options.expected);
  CsvReader reader(*in, options.separator);
  std::vector<std::string> header;
  if (reader.Next(header) != CsvReader::Result::kRecord) {
    Report(name + ": " +
           (reader.GetError().empty() ? "the file is empty; expected a header row"
                                      : reader.GetError()));
    return kExitUsage;
  }
  std::unique_ptr<ModelInstance> instance = source.Create(error);
  if (instance == nullptr) {
    Report(error);
    return kExitUsage;
  }
  QZScoring_800::ScoringModel& model = instance->Model();
  ValueRecord laidOut;
  const long layoutCode = model.Scorable(laidOut).GetErrorCode();
  if (layoutCode != 0) {
    Report(source.Describe() +
           ": the model cannot lay out its output: " + DescribeStatus(layoutCode));
    return kExitUsage;
  }
  const OutputLayout outputs(laidOut);
  std::vector<Check> checks;
  size_t statusColumn = header.size();
  FieldKinds kinds = source.Kinds();
  for (size_t c = 0; c < header.size(); ++c) {
    if (header[c] == "status") {
      statusColumn = c;
      continue;
    }
    const std::string field = ComparedField(header[c], kinds, outputs);
    if (field.empty()) continue;
    Check check{c, field};
    const auto at = std::find(outputs.Names().begin(), outputs.Names().end(), field);
    if (at != outputs.Names().end()) check.output = at - outputs.Names().begin();
    checks.push_back(check);
    kinds.erase(header[c]);  // an expected column is never an input
  }
  if (checks.empty() && statusColumn == header.size()) {
    Report(name +
           ": no column holds expected results (prediction, Probability_CAT, "
           "expect:FIELD, status, or the name of an output field)");
    return kExitUsage;
  }
  for (const Check& check : checks) {
    if (check.output < 0) {
      Report(name + ": column '" + header[check.column] + "' expects the output field '" +
             check.field + "', which the model does not produce");
    }
  }

  const InputLayout inputs(header, kinds, options.missing);
  ValueRecord input;
  ValueRecord& output = laidOut;  // the model computes only the fields laid out
  inputs.Prepare(input);
  std::vector<std::string> cells;
  std::vector<size_t> notNumbers;
  uint64_t records = 0, failed = 0, shownFailures = 0;
  for (;;) {
    const CsvReader::Result result = reader.Next(cells);
    if (result == CsvReader::Result::kError) {
      Report(name + ", row " + std::to_string(records + 1) + " (line " +
             std::to_string(reader.GetLine()) + "): " + reader.GetError());
      return kExitUsage;
    }
    if (result == CsvReader::Result::kEnd) break;
    if (reader.WasBlankLine() && header.size() > 1) continue;
    ++records;
    const std::string where = name + ", row " + std::to_string(records) + " (line " +
                              std::to_string(reader.GetLine()) + "): ";
    long code = -1;
    if (cells.size() == header.size()) {
      inputs.Fill(cells, input, notNumbers);
      output.ClearValues();
      code = model.Score(input, output).GetErrorCode();
    }
    const std::string expectedStatus = statusColumn < cells.size() ? cells[statusColumn] : "";
    const long expectedCode =
        expectedStatus.empty() ? 0 : std::strtol(expectedStatus.c_str(), nullptr, 10);
    if (code != expectedCode) {
      ++failed;
      if (shownFailures++ < kShownPerColumn) {
        Report(where + (code < 0 ? std::to_string(cells.size()) + " cells where the header has " +
                                       std::to_string(header.size())
                                 : "status " + DescribeStatus(code) + ", expected " +
                                       std::to_string(expectedCode)));
      }
    }
    for (Check& check : checks) {
      const std::string& expected = check.column < cells.size() ? cells[check.column] : "";
      const Value actual =
          check.output < 0 || code != 0 ? Value() : outputs.Get(output, check.output);
      double difference = 0.0;
      if (Agrees(expected, actual, options.tolerance, difference)) {
        ++check.agree;
        check.largest = std::max(check.largest, difference);
        continue;
      }
      if (check.disagree++ < kShownPerColumn) {
        Report(where + header[check.column] + ": got '" + actual.GetString() + "', expected '" +
               expected + "'");
      }
    }
  }

  bool allAgree = failed == 0;
  std::cout << std::left << std::setw(32) << "column" << std::right << std::setw(10) << "agree"
            << std::setw(10) << "disagree"
            << "  largest absolute difference\n";
  for (const Check& check : checks) {
    allAgree = allAgree && check.disagree == 0;
    std::cout << std::left << std::setw(32) << header[check.column] << std::right << std::setw(10)
              << check.agree << std::setw(10) << check.disagree << "  " << check.largest << "\n";
  }
  std::cout << records << " records, " << failed << " with an unexpected status; "
            << (allAgree ? "all agree" : "DISAGREEMENT") << " (tolerance " << options.tolerance
            << ")\n";
  std::cout.flush();
  return allAgree ? kExitOk : kExitRecordsFailed;
}

}  // namespace qzscore

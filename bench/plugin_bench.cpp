// Records per second through whole solo models of the validation corpus, scored by the
// reference plug-ins: each model is created by the scoring factory (registry pointing
// at QZTree, QZRegression and QZMining), and scores records already held as
// ValueRecords of one layout (its dataset, then the larger input table of its data
// set), on one thread, transformations and all. Run a Release build:
//   bin/plugin_bench --benchmark_repetitions=5 --benchmark_report_aggregates_only=true
// The corpus is read from QZSCORING_CORPUS_DIR when that is set, else from the folder
// the build names; its models are unzipped (with unzip) into a temporary folder.
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <map>
#include <memory>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include <benchmark/benchmark.h>

#include "QZSettings.h"
#include "QZVarList.h"
#include "ScoringFactory.h"
#include "ScoringModel.h"
#include "Value.h"
#include "ValueRecord.h"
#include "CorpusText.h"
#include "ReferenceRegistry.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringFactory;
using QZScoring_800::ScoringModel;
using QZXML_800::QZSettings;

namespace {

std::string CorpusDir() {
  const char* dir = std::getenv("QZSCORING_CORPUS_DIR");
  return dir != nullptr && *dir != '\0' ? dir : QZ_CORPUS_DIR;
}

// A model ready to score, with its records.
struct Loaded {
  std::unique_ptr<ScoringModel> model;
  std::vector<ValueRecord> records;
  size_t refused = 0;  // records of the tables the model refuses, left out
  std::string error;   // why there is nothing to score
};

// Appends the rows of a CSV file as records of the template's layout: every column
// named like an input field of the template, as a number for numeric storage.
void ReadRecords(const std::string& path, const QZXML_800::QZVarList& variables,
                 const ValueRecord& layout, std::vector<ValueRecord>& records) {
  std::ifstream in(path);
  std::string line;
  if (!std::getline(in, line)) return;
  std::vector<std::pair<size_t, int>> columns;  // CSV column, record position
  const std::vector<std::string> header = qztest::SplitCsv(line);
  for (size_t c = 0; c < header.size(); ++c) {
    const int position = layout.IndexOf(header[c]);
    bool taken = false;
    for (const auto& column : columns) taken = taken || column.second == position;
    if (position >= 0 && !taken) columns.emplace_back(c, position);
  }
  while (std::getline(in, line)) {
    if (line.empty()) continue;
    const std::vector<std::string> cells = qztest::SplitCsv(line);
    ValueRecord record = layout;  // a copy shares the layout
    for (const auto& [c, position] : columns) {
      const std::string& cell = c < cells.size() ? cells[c] : std::string();
      const QZXML_800::IQZVariable* variable = variables.GetVariable(header[c]);
      const int storage = variable->GetStorageType();
      const bool numeric = storage != QZXML_800::STORAGE_STRING &&
                           storage != QZXML_800::STORAGE_UNKNOWN;
      double number = 0.0;
      if (cell.empty()) {
        record[static_cast<size_t>(position)] = Value();
      } else if (numeric && qztest::ParseNumber(cell, number)) {
        record[static_cast<size_t>(position)] = number;
      } else {
        record[static_cast<size_t>(position)] = cell;
      }
    }
    records.push_back(std::move(record));
  }
}

Loaded Load(const std::string& name, const std::string& table) {
  Loaded loaded;
  const std::string cpmml = CorpusDir() + "/cpmml";
  const std::filesystem::path dir =
      std::filesystem::temp_directory_path() / "qz_plugin_bench_models";
  std::filesystem::create_directories(dir);
  const std::string unzip =
      "unzip -oq '" + cpmml + "/models/" + name + ".zip' -d '" + dir.string() + "'";
  if (std::system(unzip.c_str()) != 0) {
    loaded.error = "cannot unzip " + name + " from " + cpmml;
    return loaded;
  }
  QZSettings settings = qztest::ReferenceRegistry();
  ScoringFactory factory;
  loaded.model.reset(factory.CreateScoringModel(settings, (dir / (name + ".xml")).string()));
  factory.Detach();
  if (!loaded.model) {
    loaded.error = name + ": no model (status " +
                   std::to_string(factory.GetStatus().GetErrorCode()) + ")";
    return loaded;
  }

  // The layout: the model's input fields (targets left out), in dataset column order.
  const QZXML_800::QZVarList& variables = loaded.model->GetVarList();
  const std::string dataset = cpmml + "/datasets/" + name + ".csv";
  std::ifstream in(dataset);
  std::string header;
  std::getline(in, header);
  ValueRecord layout;
  for (const std::string& column : qztest::SplitCsv(header)) {
    const QZXML_800::IQZVariable* variable = variables.GetVariable(column);
    if (variable != nullptr && variable->GetRole() != QZXML_800::ROLE_TARGET &&
        !layout.Contains(column)) {
      layout.Add(column, Value());
    }
  }
  // Scoring may append the document's derived inputs to an input record: lay them out
  // once, so that every record keeps the one layout a host's rows have.
  ValueRecord output;
  loaded.model->Scorable(output);
  ValueRecord probe = layout;
  loaded.model->Score(probe, output);
  layout = probe;
  layout.ClearValues();
  ReadRecords(dataset, variables, layout, loaded.records);
  ReadRecords(cpmml + "/inputs/" + table + ".csv", variables, layout, loaded.records);

  // Records the document refuses (values outside its fields' declared ranges or
  // categories, under returnInvalid) are left out: the figures are for records scored.
  std::vector<ValueRecord> scored;
  for (ValueRecord& record : loaded.records) {
    if (loaded.model->Score(record, output).IsOK()) scored.push_back(std::move(record));
  }
  loaded.refused = loaded.records.size() - scored.size();
  loaded.records = std::move(scored);
  if (loaded.records.empty()) loaded.error = name + ": no record scores";
  return loaded;
}

// Models are loaded once per process and kept for every repetition.
Loaded& Model(const std::string& name, const std::string& table) {
  static std::map<std::string, Loaded> models;
  auto found = models.find(name);
  if (found == models.end()) found = models.emplace(name, Load(name, table)).first;
  return found->second;
}

void BM_Score(benchmark::State& state, const char* name, const char* table) {
  Loaded& loaded = Model(name, table);
  if (!loaded.error.empty()) {
    state.SkipWithError(loaded.error.c_str());
    return;
  }
  ValueRecord output;
  loaded.model->Scorable(output);
  std::vector<ValueRecord>& records = loaded.records;
  size_t next = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(loaded.model->Score(records[next], output));
    if (++next == records.size()) next = 0;
  }
  state.counters["records/s"] =
      benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
  state.counters["records"] = static_cast<double>(records.size());
  state.counters["refused"] = static_cast<double>(loaded.refused);
}

BENCHMARK_CAPTURE(BM_Score, IrisTree, "IrisTree", "Iris");
BENCHMARK_CAPTURE(BM_Score, single_audit_dectree, "single_audit_dectree", "Audit");
BENCHMARK_CAPTURE(BM_Score, HousingGBTRegressor, "HousingGBTRegressor", "Housing");
BENCHMARK_CAPTURE(BM_Score, HousingRFRegressor, "HousingRFRegressor", "Housing");
BENCHMARK_CAPTURE(BM_Score, AuditRandomForest, "AuditRandomForest", "Audit");

}  // namespace

BENCHMARK_MAIN();

// An example host: scores the records of a CSV file (a header row, then numbers) with a
// PMML regression model created by the scoring factory, whose registry sends the model
// to the example plug-in, and prints one prediction per record.
//
//   score_example MODEL.pmml RECORDS.csv

#include <fstream>
#include <iostream>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "ScoringFactory.h"
#include "ScoringModel.h"
#include "ValueRecord.h"

using namespace QZScoring_800;

namespace {

std::vector<std::string> SplitCsvLine(const std::string& line) {
  std::vector<std::string> cells;
  std::stringstream in(line);
  std::string cell;
  while (std::getline(in, cell, ',')) cells.push_back(cell);
  return cells;
}

// The registry: which plug-in scores which model element.
QZXML_800::QZSettings MakeRegistry() {
  QZXML_800::QZSettings scoring, models, settings;
  scoring.AddSetting("RegressionModel", "QZExampleRegression", false);
  scoring.AddSetting("Veritor", "QZExampleRegression", false);
  models.AddSetting("RegressionModel", "", false);
  settings.AddSetting("scoringDll", scoring, true);
  settings.AddSetting("modelDll", models, true);
  return settings;
}

int Run(const char* modelFile, const char* csvFile) {
  std::ifstream csv(csvFile);
  if (!csv) {
    std::cerr << "cannot open " << csvFile << "\n";
    return 2;
  }
  QZXML_800::QZSettings settings = MakeRegistry();
  ScoringFactory factory;
  std::unique_ptr<ScoringModel> model(factory.CreateScoringModel(settings, modelFile));
  factory.Detach();  // the model is ours from here on
  if (!model) {
    std::cerr << modelFile << ": no model (status " << factory.GetStatus().GetErrorCode()
              << ")\n";
    return 1;
  }

  std::string line;
  std::getline(csv, line);
  const std::vector<std::string> header = SplitCsvLine(line);
  QZCommon_800::ValueRecord input, output;
  for (const std::string& name : header) input.Add(name, QZCommon_800::Value());
  model->Scorable(output);

  std::cout << line << ",prediction\n";
  while (std::getline(csv, line)) {
    const std::vector<std::string> cells = SplitCsvLine(line);
    for (size_t i = 0; i < header.size(); ++i) {
      input[i] = i < cells.size() ? QZCommon_800::Value(QZCommon_800::Value(cells[i]).GetReal())
                                  : QZCommon_800::Value();
    }
    const QZCommon_800::QZStatus status = model->Score(input, output);
    std::cout << line << ","
              << (status.IsOK() ? output.Get("prediction").GetString() : "error") << "\n";
  }
  return 0;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 3) {
    std::cerr << "usage: score_example MODEL.pmml RECORDS.csv\n";
    return 2;
  }
  return Run(argv[1], argv[2]);
}

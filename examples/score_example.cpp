// An example host: scores the records of a CSV file (a header row, then numbers) with a
// PMML regression model through the plug-in registry, and prints one prediction per
// record.
//
//   score_example MODEL.pmml RECORDS.csv

#include <fstream>
#include <iostream>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <xercesc/util/PlatformUtils.hpp>

#include "QZSafeParser.h"
#include "ScoringScorerFactory.h"
#include "ScoringStr.h"
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
  std::ifstream pmml(modelFile, std::ios::binary);
  std::ifstream csv(csvFile);
  if (!pmml || !csv) {
    std::cerr << "cannot open " << (!pmml ? modelFile : csvFile) << "\n";
    return 2;
  }
  QZXML_800::QZSettings settings = MakeRegistry();

  // Tell the dispatcher which model and PMML version the document holds.
  std::vector<std::string> modelNames;
  ScoringScorerFactory::GetModelNames(modelNames, settings);
  QZXML_800::QZSafeDOMParser parser;
  xercesc::DOMDocument* document = nullptr;
  xercesc::DOMElement* model = nullptr;
  if (ScoringScorerFactory::GetDOMDocument(modelNames, pmml, &parser, document, model).IsError()) {
    std::cerr << modelFile << ": no RegressionModel in a PMML document\n";
    return 1;
  }
  ScoringStr version(document->getDocumentElement()->getAttribute(u"version"));
  settings.AddSetting("scoring_version", version.toUTF8(), true);
  settings.AddSetting("scoring_modelType", ScoringStr(model->getTagName()).toUTF8(), true);

  QZXML_800::QZVarList variables;
  std::unique_ptr<QZCommon_800::IQZScore> scorer(
      ScoringScorerFactory::GetScorer(settings, variables, pmml));
  if (!scorer) {
    std::cerr << modelFile << ": no plug-in could score this model\n";
    return 1;
  }

  std::string line;
  std::getline(csv, line);
  const std::vector<std::string> header = SplitCsvLine(line);
  QZCommon_800::ValueRecord input, output;
  for (const std::string& name : header) input.Add(name, QZCommon_800::Value());
  scorer->Scorable(output);

  std::cout << line << ",prediction\n";
  while (std::getline(csv, line)) {
    const std::vector<std::string> cells = SplitCsvLine(line);
    for (size_t i = 0; i < header.size(); ++i) {
      input[i] = i < cells.size() ? QZCommon_800::Value(QZCommon_800::Value(cells[i]).GetReal())
                                  : QZCommon_800::Value();
    }
    const QZCommon_800::QZStatus status = scorer->Score(input, output);
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
  try {
    xercesc::XMLPlatformUtils::Initialize();
  } catch (...) {
    std::cerr << "cannot initialise the XML parser\n";
    return 1;
  }
  int rc = Run(argv[1], argv[2]);
  xercesc::XMLPlatformUtils::Terminate();
  return rc;
}

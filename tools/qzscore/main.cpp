// qzscore: scores CSV tables with PMML models through the scoring library, and shows
// and checks what the library makes of a document.
//
//   qzscore score MODEL.pmml [INPUT.csv|-] [-o OUTPUT.csv] [options]
//   qzscore inspect MODEL.pmml... [--json]
//   qzscore verify MODEL.pmml EXPECTED.csv [--tolerance T]
//   qzscore plugins

#include <CLI/CLI.hpp>
#include <iostream>
#include <thread>

#include "Commands.h"
#include "Output.h"

namespace qzscore {

namespace {

const char kMainFooter[] = R"(
Exit status: 0 success; 1 some records failed (score) or disagreed (verify), or a
plug-in does not load (plugins); 2 bad usage, unreadable input, or a model that cannot
be created. Run 'qzscore COMMAND --help' for a command's options and examples.)";

const char kScoreFooter[] = R"(
Each cell becomes the kind of value its field's storage asks for: a number for numeric
storage (a cell that is not a number is read as missing and counted), text otherwise;
empty cells and --missing tokens are missing. A record that fails is written with empty
outputs and counted; the summary on standard error gives the counts.

Examples:
  qzscore score examples/tree/iris_tree.pmml examples/tree/iris.csv
  qzscore score model.pmml records.csv -o scored.csv --keep-input id --threads 4
  cat records.csv | qzscore score model.pmml > scored.csv
  qzscore score --model tree=tree.pmml --model reg=reg.pmml records.csv
      (a multi model: columns prediction.tree, prediction.reg, ...)
  qzscore score --split-field region --model north=north.pmml --model south=south.pmml \
      --model west=west.pmml records.csv
      (a split model: each record is scored by the document of its region)
  qzscore score --plugin RegressionModel=QZExampleRegression \
      examples/data/house_price.pmml examples/data/houses.csv)";

const char kInspectFooter[] = R"(
Shows the model element, PMML version, names, application, plug-in, targets, inputs and
derived inputs, every variable (role, measure, storage, categories, missing values,
flags), the output fields, and whether transformations and an adjusted propensity are
present.

Examples:
  qzscore inspect examples/tree/iris_tree.pmml
  qzscore inspect --json model.pmml | jq '.variables[] | select(.role == "input") | .name')";

const char kVerifyFooter[] = R"(
Expected columns: prediction; Probability_CAT (compared with the output field
probability(CAT)); expect:FIELD; status (the expected status code, empty for success);
and any column named like an output field that is not a field of the model. Numbers
agree within the tolerance relative to the larger one (or within TOL * 1e-6 near zero),
texts exactly. Exit status 1 on any disagreement.

Examples:
  qzscore verify examples/tree/iris_tree.pmml examples/tree/iris_expected.csv
  qzscore verify model.pmml expected.csv --tolerance 1e-9)";

const char kPluginsFooter[] = R"(
Examples:
  qzscore plugins
  qzscore plugins --registry my_registry.txt --plugin TreeModel=MyTree)";

void AddRegistryOptions(CLI::App* command, ModelCommandOptions& options) {
  command
      ->add_option("--registry", options.registryFile,
                   "Registry file replacing the built-in one: lines 'ELEMENT = PLUGIN' "
                   "('#' comments; 'versionSupported = V')")
      ->type_name("FILE");
  command
      ->add_option("--plugin", options.plugins,
                   "Set one registry entry, e.g. TreeModel=QZTree or Veritor=QZMining "
                   "(repeatable)")
      ->type_name("ELEMENT=PLUGIN")
      ->allow_extra_args(false);
}

void AddModelOptions(CLI::App* command, ModelCommandOptions& options) {
  command
      ->add_option("--model", options.model.assignments,
                   "A document of a multi model (ID=FILE; outputs become FIELD.ID) or, "
                   "with --split-field, of a split model (KEY=FILE; a key has one value "
                   "per split field, comma-separated); repeatable")
      ->type_name("ID=FILE")
      ->allow_extra_args(false);
  command
      ->add_option("--split-field", options.model.splitFields,
                   "A field whose values choose the sub-model (repeatable)")
      ->type_name("NAME")
      ->allow_extra_args(false);
  AddRegistryOptions(command, options);
}

// "," -> ','; "tab" or "\t" -> a tab. False for anything that cannot separate fields.
bool ParseSeparator(const std::string& text, char& separator) {
  if (text == "tab" || text == "\\t" || text == "\t") {
    separator = '\t';
    return true;
  }
  if (text.size() != 1 || text[0] == '"' || text[0] == '\n' || text[0] == '\r') return false;
  separator = text[0];
  return true;
}

// MODEL and INPUT positionals: with --model the first positional is the input.
bool Positionals(ModelCommandOptions& models, std::string& first, std::string& second,
                 std::string& input, bool inputRequired, std::string& error) {
  if (models.model.assignments.empty()) {
    if (!models.model.splitFields.empty()) {
      error = "--split-field needs --model KEY=FILE for each sub-model";
      return false;
    }
    if (first.empty()) {
      error = "no model: give MODEL.pmml, or --model ID=FILE for each model";
      return false;
    }
    models.model.file = first;
    input = second;
  } else {
    if (!second.empty()) {
      error = "with --model, give only the input after the options (got '" + first + "' and '" +
              second + "')";
      return false;
    }
    input = first;
  }
  if (inputRequired && input.empty()) {
    error = "no table of expected results given";
    return false;
  }
  return true;
}

int Main(int argc, char** argv) {
  CLI::App app{"qzscore: score CSV tables with PMML models, inspect and verify models.", "qzscore"};
  app.footer(kMainFooter);
  app.require_subcommand(1);

  ScoreOptions scoreOptions;
  std::string scoreFirst, scoreSecond, scoreSeparator = ",";
  scoreOptions.threads = std::max(1u, std::thread::hardware_concurrency());
  CLI::App* score = app.add_subcommand("score", "Score the records of a CSV table; write CSV");
  score->footer(kScoreFooter);
  score->add_option("MODEL", scoreFirst, "The PMML document (left out with --model)");
  score->add_option("INPUT", scoreSecond,
                    "The CSV table with a header row; - or nothing: standard input");
  score
      ->add_option("-o,--output", scoreOptions.output, "Output CSV file (default: standard output)")
      ->type_name("FILE");
  score
      ->add_option("--keep-input", scoreOptions.keepInput,
                   "Input columns copied before the outputs: all, none, or COL,COL,...")
      ->type_name("all|none|COLS")
      ->capture_default_str();
  score
      ->add_option("--separator", scoreSeparator,
                   "Field separator of input and output (',', ';', tab, ...)")
      ->type_name("CHAR")
      ->capture_default_str();
  score
      ->add_option("--missing", scoreOptions.missing, "A cell text that means missing (repeatable)")
      ->type_name("TOKEN")
      ->allow_extra_args(false);
  score
      ->add_option("--threads", scoreOptions.threads,
                   "Scoring threads, one model each (default: the number of cores)")
      ->type_name("N")
      ->check(CLI::Range(1u, 256u));
  score->add_flag("--fail-fast", scoreOptions.failFast, "Stop at the first record that fails");
  score->add_flag("-q,--quiet", scoreOptions.quiet, "No progress line and no summary");
  AddModelOptions(score, scoreOptions.models);

  ModelCommandOptions inspectOptions;
  std::vector<std::string> inspectFiles;
  bool json = false;
  CLI::App* inspect =
      app.add_subcommand("inspect", "Show what the library reads from a PMML document");
  inspect->footer(kInspectFooter);
  inspect->add_option("MODEL", inspectFiles, "One or more PMML documents")->required();
  inspect->add_flag("--json", json, "Write JSON instead of text");
  AddRegistryOptions(inspect, inspectOptions);

  VerifyOptions verifyOptions;
  std::string verifyFirst, verifySecond, verifySeparator = ",";
  CLI::App* verify =
      app.add_subcommand("verify", "Score a table holding expected results and compare");
  verify->footer(kVerifyFooter);
  verify->add_option("MODEL", verifyFirst, "The PMML document (left out with --model)");
  verify->add_option("EXPECTED", verifySecond, "CSV table of inputs and expected results");
  verify->add_option("--tolerance", verifyOptions.tolerance, "Relative tolerance for numbers")
      ->check(CLI::NonNegativeNumber)
      ->capture_default_str();
  verify->add_option("--separator", verifySeparator, "Field separator of the table")
      ->type_name("CHAR");
  verify
      ->add_option("--missing", verifyOptions.missing,
                   "A cell text that means missing (repeatable)")
      ->type_name("TOKEN")
      ->allow_extra_args(false);
  AddModelOptions(verify, verifyOptions.models);

  ModelCommandOptions pluginsOptions;
  CLI::App* plugins =
      app.add_subcommand("plugins", "List the registry and whether each plug-in loads");
  plugins->footer(kPluginsFooter);
  AddRegistryOptions(plugins, pluginsOptions);

  if (argc < 2) {
    std::cerr << app.help();
    return kExitUsage;
  }
  try {
    app.parse(argc, argv);
  } catch (const CLI::ParseError& e) {
    if (e.get_exit_code() == 0) return app.exit(e);
    Report(std::string(e.what()) + " (see qzscore --help)");
    return kExitUsage;
  }

  std::string error;
  if (score->parsed()) {
    if (!ParseSeparator(scoreSeparator, scoreOptions.separator)) {
      Report("--separator " + scoreSeparator + ": expected one character other than a quote");
      return kExitUsage;
    }
    if (!Positionals(scoreOptions.models, scoreFirst, scoreSecond, scoreOptions.input, false,
                     error)) {
      Report(error);
      return kExitUsage;
    }
    if (scoreOptions.input.empty()) scoreOptions.input = "-";
    return RunScore(scoreOptions);
  }
  if (inspect->parsed()) return RunInspect(inspectFiles, inspectOptions, json);
  if (verify->parsed()) {
    if (!ParseSeparator(verifySeparator, verifyOptions.separator)) {
      Report("--separator " + verifySeparator + ": expected one character other than a quote");
      return kExitUsage;
    }
    if (!Positionals(verifyOptions.models, verifyFirst, verifySecond, verifyOptions.expected, true,
                     error)) {
      Report(error);
      return kExitUsage;
    }
    return RunVerify(verifyOptions);
  }
  return RunPlugins(pluginsOptions);
}

}  // namespace

}  // namespace qzscore

int main(int argc, char** argv) {
  std::ios::sync_with_stdio(false);
  try {
    return qzscore::Main(argc, argv);
  } catch (const std::exception& e) {
    qzscore::Report(std::string("stopped: ") + e.what());
  } catch (...) {
    qzscore::Report("stopped by an unexpected error");
  }
  return qzscore::kExitUsage;
}

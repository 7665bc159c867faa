// The subcommands of qzscore. Each returns the process exit status and reports every
// problem as one line on standard error; none throws except std::bad_alloc.
#ifndef QZSCORE_COMMANDS_H_
#define QZSCORE_COMMANDS_H_

#include <string>
#include <vector>

#include "Models.h"
#include "Registry.h"

namespace qzscore {

// Exit statuses: success; some records failed (or, for verify, disagreed); bad usage,
// unreadable input, or a model that cannot be created.
constexpr int kExitOk = 0;
constexpr int kExitRecordsFailed = 1;
constexpr int kExitUsage = 2;

// Options every subcommand that builds models shares.
struct ModelCommandOptions {
  ModelOptions model;
  std::string registryFile;          // replaces the built-in registry when set
  std::vector<std::string> plugins;  // "ELEMENT=PLUGIN", applied after the file
};

struct ScoreOptions {
  ModelCommandOptions models;
  std::string input = "-";        // "-": standard input
  std::string output;             // empty or "-": standard output
  std::string keepInput = "all";  // "all", "none" or a comma-separated column list
  char separator = ',';
  std::vector<std::string> missing;
  unsigned threads = 1;
  bool failFast = false;
  bool quiet = false;
};

struct VerifyOptions {
  ModelCommandOptions models;
  std::string expected;
  double tolerance = 1e-6;
  char separator = ',';
  std::vector<std::string> missing;
};

// Builds the registry the options ask for. False with one line of error.
bool MakeRegistry(const ModelCommandOptions& options, Registry& registry, std::string& error);

// Scores a CSV table and writes the kept input columns and the output fields as CSV.
int RunScore(const ScoreOptions& options);
// Describes one or more documents as the library reads them (text or JSON on stdout).
int RunInspect(const std::vector<std::string>& files, const ModelCommandOptions& options,
               bool json);
// Scores a table that also holds expected results and reports agreement per column.
int RunVerify(const VerifyOptions& options);
// Lists the registry's entries and whether each plug-in loads (1 when one does not).
int RunPlugins(const ModelCommandOptions& options);

}  // namespace qzscore

#endif  // QZSCORE_COMMANDS_H_

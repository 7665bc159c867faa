// The registry from the command line, and qzscore plugins.

#include <iomanip>
#include <iostream>

#include "Commands.h"
#include "Output.h"

namespace qzscore {

bool MakeRegistry(const ModelCommandOptions& options, Registry& registry, std::string& error) {
  registry = Registry::BuiltIn();
  if (!options.registryFile.empty() && !registry.LoadFile(options.registryFile, error)) {
    return false;
  }
  for (const std::string& assignment : options.plugins) {
    if (!registry.SetEntry(assignment, error)) return false;
  }
  return true;
}

int RunPlugins(const ModelCommandOptions& options) {
  Registry registry;
  std::string error;
  if (!MakeRegistry(options, registry, error)) {
    Report(error);
    return kExitUsage;
  }
  int status = kExitOk;
  auto row = [](const std::string& a, const std::string& b, const std::string& c,
                const std::string& d) {
    std::cout << std::left << std::setw(18) << a << " " << std::setw(22) << b << " "
              << std::setw(28) << c << " " << d << "\n";
  };
  row("element", "plug-in", "library", "status");
  for (const auto& [element, plugin] : registry.Entries()) {
    const std::string problem = Registry::CheckPlugin(plugin);
    if (!problem.empty()) status = kExitRecordsFailed;
    row(element, plugin, Registry::LibraryFile(plugin),
        problem.empty() ? "loads" : "cannot be loaded: " + problem);
  }
  const QZXML_800::QZSettings settings = registry.ToSettings();
  std::string supported = "4.0";
  settings.GetSettingValByName("versionSupported", supported);
  std::cout << "\nDocuments of PMML " << supported << " and 4.1 go to their element's entry; "
            << "documents of any other\nversion, and elements without an entry, go to "
            << "\"Veritor\".\n";
  std::cout.flush();
  return status;
}

}  // namespace qzscore

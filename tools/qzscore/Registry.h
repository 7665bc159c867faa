// The plug-in registry qzscore hands to the scoring factory: which plug-in scores which
// PMML model element. Built in, read from a file, or changed entry by entry.
#ifndef QZSCORE_REGISTRY_H_
#define QZSCORE_REGISTRY_H_

#include <string>
#include <utility>
#include <vector>

#include "QZSettings.h"

namespace qzscore {

// An ordered map from model element name (or "Veritor", the entry for documents of a
// PMML version the dispatcher does not take as its own) to plug-in base name. Plain
// value type; not synchronised.
class Registry {
 public:
  // The shipped plug-ins: TreeModel QZTree, RegressionModel QZRegression, MiningModel
  // and Veritor QZMining.
  static Registry BuiltIn();

  // The PMML model element names the library knows, ensembles first (a document's first
  // model element in this order is the one dispatched).
  static const std::vector<std::string>& ModelElements();

  // Replaces every entry by those of a file of lines "ELEMENT = PLUGIN" ('#' starts a
  // comment; a line "versionSupported = V" sets that setting). False with one line of
  // error ("FILE:LINE: what") for an unreadable file, a malformed line, an unknown
  // element or a plug-in that cannot be loaded; the registry is then unchanged.
  bool LoadFile(const std::string& path, std::string& error);

  // Sets one entry from "ELEMENT=PLUGIN". False with a message as for LoadFile.
  bool SetEntry(const std::string& assignment, std::string& error);

  // The settings the factory reads: "scoringDll", "modelDll" (every known element) and
  // "versionSupported" when one was given.
  QZXML_800::QZSettings ToSettings() const;

  // The entry the dispatcher uses for a document of that element and PMML version:
  // the element's own when the version is taken, else "Veritor". Empty when none.
  std::string EntryFor(const std::string& element, const std::string& version) const;
  // The plug-in of an entry; empty when the entry is absent.
  std::string PluginOf(const std::string& entry) const;

  // The entries, element and plug-in, in the order they were set.
  const std::vector<std::pair<std::string, std::string>>& Entries() const { return entries_; }

  // The file name of a plug-in's library ("QZTree" -> "QZTree800r.dll").
  static std::string LibraryFile(const std::string& plugin);
  // Empty when the plug-in's library loads and has its entry point, otherwise the
  // system's reason (naming the library file).
  static std::string CheckPlugin(const std::string& plugin);

 private:
  bool Set(const std::string& element, const std::string& plugin, std::string& error);

  std::vector<std::pair<std::string, std::string>> entries_;
  std::string versionSupported_;
};

}  // namespace qzscore

#endif  // QZSCORE_REGISTRY_H_

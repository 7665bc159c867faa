// Loading a scorer plug-in library by file name and resolving its entry point.
#ifndef QZSCORING_SCORINGDYNAMICLOADEDLIBRARY_H_
#define QZSCORING_SCORINGDYNAMICLOADEDLIBRARY_H_

#include <string>

#include "QZScoringExport.h"

namespace QZScoring_800 {

// One plug-in library, loaded on demand. Failures are returned, never thrown, and the
// system's text for the last failure is kept (GetErrorString). A library once loaded
// stays loaded until the process ends; destroying this object does not unload it.
// Not to be shared between threads.
class QZSCORING_API ScoringDynamicLoadedLibrary {
 public:
  // Remembers the file name to load (a null name counts as empty); loads nothing yet.
  // `option` is kept for callers that pass one; no operation consults it.
  ScoringDynamicLoadedLibrary(const char* libraryName, int option);
  ScoringDynamicLoadedLibrary(const std::string& libraryName, int option);
  ScoringDynamicLoadedLibrary(const ScoringDynamicLoadedLibrary&) = delete;
  ScoringDynamicLoadedLibrary& operator=(const ScoringDynamicLoadedLibrary&) = delete;
  ~ScoringDynamicLoadedLibrary();

  // The plug-in file name for `name`: `name` itself when it is longer than four
  // characters and ends in ".dll" in any letter case, otherwise `name` + ".dll".
  static std::string QZDecorateDynamicPathName(const std::string& name);

  // Loads the library by its name unchanged (the system's search rules find it).
  // Returns 0 on success or when already loaded; otherwise a non-zero error number
  // (errno when the system set one, else 1) with the system's text in the error
  // string. Clears the error string first.
  int LoadLibraryNow();

  // Loads the library if needed and returns the address of `symbolName`. Returns null
  // when loading fails (the load's error text stays) or the symbol is absent (the
  // system's text becomes the error string). Clears the error string first.
  void* GetSymbolAddress(const char* symbolName);

  // A copy of the text of the last failure; empty when the last operation succeeded.
  std::string GetErrorString() const;

 private:
  void* fModule;
  // Kept for the object's binary layout; nothing reads them.
  [[maybe_unused]] int fOption;
  [[maybe_unused]] int fReserved;
  std::string fLibraryName;
  std::string fErrorString;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGDYNAMICLOADEDLIBRARY_H_

// The operating-system seam of the scoring library. Everything that differs between
// systems (dynamic loading, thread and process ids, directory creation, the path
// separator) is declared here and implemented in one file per system, chosen by CMake.
// No other file of the library calls the operating system for these services.
#ifndef QZSCORING_PORT_PORT_H_
#define QZSCORING_PORT_PORT_H_

#include <mutex>
#include <string>

namespace QZScoring_800 {
namespace port {

// Separator between a directory and a file name in paths the library builds itself.
extern const char kPathSeparator;

// Loads the shared library `name` (passed unchanged, so the system's search rules
// apply) with all its symbols bound at once. Returns the module handle, or null on
// failure with *errorNumber set to a non-zero error number and *errorText to the
// system's description. A module once loaded is never unloaded. Thread-safe.
void* OpenLibrary(const std::string& name, int* errorNumber, std::string* errorText);

// Looks up `symbol` in a module returned by OpenLibrary. Returns its address, or null
// with *errorText set to the system's description (never empty on failure).
// Thread-safe.
void* FindSymbol(void* module, const char* symbol, std::string* errorText);

// The calling thread's id as the system numbers threads (unique among live threads).
long CurrentThreadId();

// The id of the current process.
long CurrentProcessId();

// Creates the directory `path` (relative to the current directory unless absolute).
// Returns true when it exists afterwards, whether created now or already present.
bool MakeDirectory(const std::string& path);

// A lock that the thread holding it may take again; each Lock needs its Unlock.
// The standard library's recursive mutex is portable enough to serve every system.
class RecursiveMutex {
 public:
  RecursiveMutex() = default;
  RecursiveMutex(const RecursiveMutex&) = delete;
  RecursiveMutex& operator=(const RecursiveMutex&) = delete;

  void Lock() { mutex_.lock(); }
  void Unlock() { mutex_.unlock(); }

 private:
  std::recursive_mutex mutex_;
};

}  // namespace port
}  // namespace QZScoring_800

#endif  // QZSCORING_PORT_PORT_H_

// The operating-system seam for POSIX systems (Linux): dlopen for plug-ins, the
// kernel's thread id for trace file names, mkdir for the trace directory.
#include "port.h"

#include <dlfcn.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/types.h>
#include <unistd.h>

#include <cerrno>

namespace QZScoring_800 {
namespace port {

const char kPathSeparator = '/';

namespace {

// dlopen reports no error number of its own. errno, when the failed call left one
// (typically ENOENT from the file search), is the closest thing; otherwise this
// fixed non-zero value stands for "the loader refused the library".
constexpr int kGenericLoadError = 1;

std::string LastDlError(const char* fallback) {
  const char* text = dlerror();
  return text != nullptr && *text != '\0' ? std::string(text) : std::string(fallback);
}

// The folder of the shared object holding this code; empty when unknown.
std::string OwnFolder() {
  static const int anchor = 0;
  Dl_info info;
  if (dladdr(&anchor, &info) == 0 || info.dli_fname == nullptr) return std::string();
  const std::string path(info.dli_fname);
  const size_t slash = path.rfind('/');
  return slash == std::string::npos ? std::string() : path.substr(0, slash);
}

}  // namespace

void* OpenLibrary(const std::string& name, int* errorNumber, std::string* errorText) {
  // An empty name would give the handle of the main program, not a plug-in.
  if (name.empty()) {
    *errorNumber = EINVAL;
    *errorText = "empty library name";
    return nullptr;
  }
  dlerror();  // forget any earlier, unrelated error text
  errno = 0;
  void* module = dlopen(name.c_str(), RTLD_NOW);
  if (module != nullptr) return module;
  const int savedErrno = errno;
  const std::string savedText = LastDlError("cannot load library");

  // The loader searches the run path of the object that calls dlopen. When dlopen is
  // intercepted (sanitizer runtimes do this) that object is no longer this library, so
  // a bare name is tried once more in this library's own folder, where plug-ins are
  // installed.
  const std::string folder = name.find('/') == std::string::npos ? OwnFolder() : std::string();
  if (!folder.empty()) {
    module = dlopen((folder + "/" + name).c_str(), RTLD_NOW);
    if (module != nullptr) return module;
    dlerror();
  }
  *errorNumber = savedErrno != 0 ? savedErrno : kGenericLoadError;
  *errorText = savedText;
  return nullptr;
}

void* FindSymbol(void* module, const char* symbol, std::string* errorText) {
  if (module == nullptr || symbol == nullptr || *symbol == '\0') {
    *errorText = "invalid module or symbol name";
    return nullptr;
  }
  dlerror();
  void* address = dlsym(module, symbol);
  // A symbol whose value is null is of no use to a caller expecting an entry point,
  // so it counts as not found as well.
  if (address == nullptr) *errorText = LastDlError("undefined symbol");
  return address;
}

long CurrentThreadId() { return static_cast<long>(syscall(SYS_gettid)); }

long CurrentProcessId() { return static_cast<long>(getpid()); }

bool MakeDirectory(const std::string& path) {
  if (mkdir(path.c_str(), 0777) == 0) return true;
  struct stat info;
  return errno == EEXIST && stat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode);
}

}  // namespace port
}  // namespace QZScoring_800

// What every harness shares: Xerces-C++ initialised once for the process, the
// library's diagnostic output discarded, and small helpers to turn fuzz bytes into
// records and streams.
#ifndef QZ_FUZZ_SUPPORT_H_
#define QZ_FUZZ_SUPPORT_H_

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include <xercesc/util/PlatformUtils.hpp>

#include "QZDisplay.h"

namespace qzfuzz {

// Called from LLVMFuzzerInitialize. Xerces-C++ stays initialised until the process
// ends (the library's parsers initialise and terminate it again on top, counted).
inline void InitProcess() {
  xercesc::XMLPlatformUtils::Initialize();
  QZDisplay_800::SetDisplayStream(nullptr);
}

// Stops the run with a message that names the broken property, so that libFuzzer
// records the input as a crash.
[[noreturn]] inline void Fail(const char* what, const std::string& detail = std::string()) {
  std::fprintf(stderr, "property violated: %s%s%s\n", what, detail.empty() ? "" : ": ",
               detail.c_str());
  std::abort();
}

// The names given by name="..." attributes in text, unique, in order, at most max.
// Harnesses use them as the fields of the records they score.
inline std::vector<std::string> NamesIn(const std::string& text, size_t max = 24) {
  std::vector<std::string> names;
  const std::string key = "name=\"";
  for (size_t at = text.find(key); at != std::string::npos && names.size() < max;
       at = text.find(key, at + 1)) {
    const size_t begin = at + key.size();
    const size_t end = text.find('"', begin);
    if (end == std::string::npos) break;
    std::string name = text.substr(begin, end - begin);
    if (name.empty() || name.size() > 64) continue;
    bool seen = false;
    for (const auto& n : names) seen = seen || n == name;
    if (!seen) names.push_back(name);
  }
  return names;
}

}  // namespace qzfuzz

#endif  // QZ_FUZZ_SUPPORT_H_

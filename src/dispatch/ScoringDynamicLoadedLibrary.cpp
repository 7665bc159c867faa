#include "ScoringDynamicLoadedLibrary.h"

#include <cctype>

#include "port.h"

namespace QZScoring_800 {

namespace {
const char kLibrarySuffix[] = ".dll";
constexpr std::size_t kLibrarySuffixLength = sizeof(kLibrarySuffix) - 1;
}  // namespace

ScoringDynamicLoadedLibrary::ScoringDynamicLoadedLibrary(const char* libraryName,
                                                         int option)
    : fModule(nullptr),
      fOption(option),
      fReserved(0),
      fLibraryName(libraryName != nullptr ? libraryName : "") {}

ScoringDynamicLoadedLibrary::ScoringDynamicLoadedLibrary(const std::string& libraryName,
                                                         int option)
    : fModule(nullptr), fOption(option), fReserved(0), fLibraryName(libraryName) {}

// The module stays loaded: scorers created by the plug-in may outlive this object.
ScoringDynamicLoadedLibrary::~ScoringDynamicLoadedLibrary() = default;

std::string ScoringDynamicLoadedLibrary::QZDecorateDynamicPathName(
    const std::string& name) {
  std::string decorated = name;
  if (name.size() > kLibrarySuffixLength) {
    const std::size_t start = name.size() - kLibrarySuffixLength;
    bool hasSuffix = true;
    for (std::size_t i = 0; i < kLibrarySuffixLength; ++i) {
      const unsigned char c = static_cast<unsigned char>(name[start + i]);
      if (std::tolower(c) != kLibrarySuffix[i]) {
        hasSuffix = false;
        break;
      }
    }
    if (hasSuffix) return decorated;
  }
  decorated += kLibrarySuffix;
  return decorated;
}

int ScoringDynamicLoadedLibrary::LoadLibraryNow() {
  fErrorString.clear();
  if (fModule != nullptr) return 0;
  int errorNumber = 0;
  fModule = port::OpenLibrary(fLibraryName, &errorNumber, &fErrorString);
  return fModule != nullptr ? 0 : errorNumber;
}

void* ScoringDynamicLoadedLibrary::GetSymbolAddress(const char* symbolName) {
  fErrorString.clear();
  if (LoadLibraryNow() != 0) return nullptr;
  return port::FindSymbol(fModule, symbolName, &fErrorString);
}

std::string ScoringDynamicLoadedLibrary::GetErrorString() const { return fErrorString; }

}  // namespace QZScoring_800

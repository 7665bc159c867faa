// Plug-in loading: name decoration, loading, symbol lookup and the error string.
#include "ScoringDynamicLoadedLibrary.h"

#include <gtest/gtest.h>

#include <string>

namespace QZScoring_800 {
namespace {

// ".dll" is appended unless the name is longer than four characters and already ends
// in ".dll" in any letter case.
TEST(ScoringDynamicLoadedLibraryTest, DecorationAppendsDllOnlyWhenMissing) {
  EXPECT_EQ(ScoringDynamicLoadedLibrary::QZDecorateDynamicPathName("tree800r"),
            "tree800r.dll");
  EXPECT_EQ(ScoringDynamicLoadedLibrary::QZDecorateDynamicPathName("TREE800R.DLL"),
            "TREE800R.DLL");
  EXPECT_EQ(ScoringDynamicLoadedLibrary::QZDecorateDynamicPathName("a.Dll"), "a.Dll");
  EXPECT_EQ(ScoringDynamicLoadedLibrary::QZDecorateDynamicPathName(".dll"), ".dll.dll");
  EXPECT_EQ(ScoringDynamicLoadedLibrary::QZDecorateDynamicPathName(""), ".dll");
  EXPECT_EQ(ScoringDynamicLoadedLibrary::QZDecorateDynamicPathName("lib.so"),
            "lib.so.dll");
  EXPECT_EQ(ScoringDynamicLoadedLibrary::QZDecorateDynamicPathName("x.dllx"),
            "x.dllx.dll");
}

// A library that loads: loading twice is a no-op, symbols resolve and work, and a
// missing symbol gives null with a text that the next success clears.
TEST(ScoringDynamicLoadedLibraryTest, LoadsALibraryAndResolvesSymbols) {
  ScoringDynamicLoadedLibrary library("libm.so.6", 1);
  EXPECT_EQ(library.LoadLibraryNow(), 0);
  EXPECT_EQ(library.GetErrorString(), "");
  EXPECT_EQ(library.LoadLibraryNow(), 0);

  void* address = library.GetSymbolAddress("cos");
  ASSERT_NE(address, nullptr);
  EXPECT_EQ(library.GetErrorString(), "");
  auto cosine = reinterpret_cast<double (*)(double)>(address);
  EXPECT_DOUBLE_EQ(cosine(0.0), 1.0);

  EXPECT_EQ(library.GetSymbolAddress("qz_no_such_symbol"), nullptr);
  EXPECT_NE(library.GetErrorString(), "");
  EXPECT_NE(library.GetErrorString().find("qz_no_such_symbol"), std::string::npos);
  EXPECT_EQ(library.GetSymbolAddress(""), nullptr);
  EXPECT_NE(library.GetErrorString(), "");
  EXPECT_EQ(library.GetSymbolAddress(nullptr), nullptr);
  EXPECT_NE(library.GetErrorString(), "");

  EXPECT_EQ(library.LoadLibraryNow(), 0);
  EXPECT_EQ(library.GetErrorString(), "");
}

// A library that does not load: a non-zero error number, the system's text naming
// the file, and symbol lookups that fail with the load's text.
TEST(ScoringDynamicLoadedLibraryTest, MissingLibraryFailsWithErrorText) {
  ScoringDynamicLoadedLibrary library(std::string("libqz_no_such_plugin800r.dll"), 1);
  EXPECT_NE(library.LoadLibraryNow(), 0);
  const std::string loadError = library.GetErrorString();
  EXPECT_NE(loadError.find("libqz_no_such_plugin800r.dll"), std::string::npos) << loadError;

  EXPECT_EQ(library.GetSymbolAddress("GetScoreParser"), nullptr);
  EXPECT_EQ(library.GetErrorString(), loadError);

  // An empty (or null) name must not resolve to the host program itself.
  ScoringDynamicLoadedLibrary unnamed(static_cast<const char*>(nullptr), 1);
  EXPECT_NE(unnamed.LoadLibraryNow(), 0);
  EXPECT_NE(unnamed.GetErrorString(), "");
  EXPECT_EQ(unnamed.GetSymbolAddress("malloc"), nullptr);
}

}  // namespace
}  // namespace QZScoring_800

// ParseInt, ParseDouble, VerifyInt and VerifyDouble on arbitrary text. Checked against
// an independent reading: ParseInt accepts exactly an optionally signed run of digits
// within the int range, with its value; ParseDouble accepts only plain decimal text
// and then gives what strtod gives; the UTF-16 forms agree with the narrow forms, and
// Verify* throw exactly when Parse* refuse.
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "FuzzSupport.h"
#include "ScoringBaseParser.h"
#include "ScoringException.h"

using QZScoring_800::ScoringBaseParser;
using QZScoring_800::ScoringException;

namespace {

// Optionally signed digits within the int range.
bool ReferenceInt(const std::string& text, int& out) {
  size_t at = (!text.empty() && (text[0] == '+' || text[0] == '-')) ? 1 : 0;
  if (at == text.size()) return false;
  for (size_t i = at; i < text.size(); ++i) {
    if (text[i] < '0' || text[i] > '9') return false;
  }
  // Digits only, so strtoll reads the whole text; long long holds anything that can
  // fit in an int, and saturates (ERANGE) beyond.
  errno = 0;
  const long long value = std::strtoll(text.c_str(), nullptr, 10);
  if (errno == ERANGE || value < INT_MIN || value > INT_MAX) return false;
  out = static_cast<int>(value);
  return true;
}

// Only the characters of a plain decimal real.
bool PlainDecimalCharacters(const std::string& text) {
  if (text.empty()) return false;
  for (char c : text) {
    if (!((c >= '0' && c <= '9') || c == '+' || c == '-' || c == '.' || c == 'e' || c == 'E')) {
      return false;
    }
  }
  return true;
}

std::vector<XMLCh> Wide(const std::string& text) {
  std::vector<XMLCh> wide;
  for (unsigned char c : text) wide.push_back(c);
  wide.push_back(0);
  return wide;
}

bool Same(double a, double b) { return a == b || (a != a && b != b); }

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  qzfuzz::InitProcess();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size > 4096) return 0;
  const std::string text(reinterpret_cast<const char*>(data), size);
  // Text is read up to a NUL by the UTF-16 form; keep both forms on the same text.
  const std::string narrow = text.substr(0, text.find('\0'));
  const std::vector<XMLCh> wide = Wide(narrow);

  int expectedInt = 0;
  const bool intOk = ReferenceInt(narrow, expectedInt);
  int parsedInt = 12345, wideInt = 12345;
  if (ScoringBaseParser::ParseInt(narrow, parsedInt) != intOk) {
    qzfuzz::Fail("ParseInt accepts differently from the reference", narrow);
  }
  if (intOk && parsedInt != expectedInt) qzfuzz::Fail("ParseInt gives another value", narrow);
  if (!intOk && parsedInt != 12345) qzfuzz::Fail("ParseInt changed out on failure", narrow);
  if (ScoringBaseParser::ParseInt(wide.data(), wideInt) != intOk ||
      (intOk && wideInt != expectedInt)) {
    qzfuzz::Fail("the UTF-16 ParseInt disagrees", narrow);
  }
  try {
    const int verified = ScoringBaseParser::VerifyInt(narrow);
    if (!intOk || verified != expectedInt) qzfuzz::Fail("VerifyInt accepted", narrow);
  } catch (const ScoringException& e) {
    if (intOk) qzfuzz::Fail("VerifyInt threw on valid text", narrow);
  }

  double parsed = 0.25, wideParsed = 0.25;
  const bool doubleOk = ScoringBaseParser::ParseDouble(narrow, parsed);
  if (doubleOk) {
    if (!PlainDecimalCharacters(narrow)) qzfuzz::Fail("ParseDouble accepted", narrow);
    const double reference = std::strtod(narrow.c_str(), nullptr);
    if (!Same(parsed, reference)) qzfuzz::Fail("ParseDouble differs from strtod", narrow);
  } else if (parsed != 0.25) {
    qzfuzz::Fail("ParseDouble changed out on failure", narrow);
  }
  if (intOk && !doubleOk) qzfuzz::Fail("an integer text is no double", narrow);
  if (ScoringBaseParser::ParseDouble(wide.data(), wideParsed) != doubleOk ||
      (doubleOk && !Same(wideParsed, parsed))) {
    qzfuzz::Fail("the UTF-16 ParseDouble disagrees", narrow);
  }
  try {
    const double verified = ScoringBaseParser::VerifyDouble(narrow);
    if (!doubleOk || !Same(verified, parsed)) qzfuzz::Fail("VerifyDouble accepted", narrow);
    (void)ScoringBaseParser::VerifyInt(wide.data());
  } catch (const ScoringException& e) {
    if (e.GetErrorCode() != 3) qzfuzz::Fail("Verify* threw another code", narrow);
  }
  try {
    (void)ScoringBaseParser::VerifyDouble(wide.data());
  } catch (const ScoringException&) {
  }

  // Non-ASCII UTF-16 units (such as full-width digits) are never numbers.
  if (size >= 2 && size <= 64) {
    std::vector<XMLCh> units(size / 2 + 1, 0);
    std::memcpy(units.data(), data, (size / 2) * 2);
    bool ascii = true;
    for (size_t i = 0; i + 1 < units.size(); ++i) ascii = ascii && units[i] != 0 && units[i] < 128;
    int unitsInt = 0;
    double unitsDouble = 0;
    const bool a = ScoringBaseParser::ParseInt(units.data(), unitsInt);
    const bool b = ScoringBaseParser::ParseDouble(units.data(), unitsDouble);
    if (!ascii) {
      bool anyWide = false;
      for (size_t i = 0; i + 1 < units.size() && units[i] != 0; ++i) anyWide |= units[i] >= 128;
      if (anyWide && (a || b)) qzfuzz::Fail("a non-ASCII UTF-16 text was read as a number");
    }
  }
  return 0;
}

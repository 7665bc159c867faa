// UTF-8 and UTF-16 conversions of ScoringStr and ScoringTranscoder. The bytes are read
// both as UTF-8 and as UTF-16 code units:
//  - valid UTF-8 without NUL decodes and encodes back unchanged; malformed UTF-8 keeps a
//    prefix;
//  - decoding a text in pieces cut at character boundaries and appending them gives
//    the same string as decoding it whole;
//  - ScoringStr::toUTF8 and a UTF-8 ScoringTranscoder agree on any UTF-16 text, and
//    what they write decodes back to a prefix of it;
//  - a Latin-1 transcoder gives one byte per unit up to the first unit beyond U+00FF.
#include <cstring>
#include <string>
#include <vector>

#include <xercesc/util/XMLString.hpp>

#include "FuzzSupport.h"
#include "ScoringStr.h"
#include "ScoringTranscoder.h"

using QZScoring_800::ScoringStr;
using QZScoring_800::ScoringTranscoder;

namespace {

// The length of the valid UTF-8 character at text[at], 0 when there is none.
size_t CharLength(const std::string& text, size_t at) {
  const auto byte = [&](size_t i) { return static_cast<unsigned char>(text[i]); };
  const unsigned char c = byte(at);
  size_t n;
  uint32_t code;
  if (c < 0x80) return 1;
  if (c >= 0xC2 && c <= 0xDF) {
    n = 2, code = c & 0x1F;
  } else if (c >= 0xE0 && c <= 0xEF) {
    n = 3, code = c & 0x0F;
  } else if (c >= 0xF0 && c <= 0xF4) {
    n = 4, code = c & 0x07;
  } else {
    return 0;
  }
  if (at + n > text.size()) return 0;
  for (size_t i = 1; i < n; ++i) {
    if ((byte(at + i) & 0xC0) != 0x80) return 0;
    code = (code << 6) | (byte(at + i) & 0x3F);
  }
  if ((n == 3 && code < 0x800) || (n == 4 && (code < 0x10000 || code > 0x10FFFF))) return 0;
  if (code >= 0xD800 && code <= 0xDFFF) return 0;
  return n;
}

// Character boundaries of text when it is valid UTF-8 without NUL; empty otherwise.
std::vector<size_t> Boundaries(const std::string& text) {
  std::vector<size_t> cuts{0};
  for (size_t at = 0; at < text.size();) {
    if (text[at] == '\0') return {};
    const size_t n = CharLength(text, at);
    if (n == 0) return {};
    at += n;
    cuts.push_back(at);
  }
  return cuts;
}

bool SameUnits(const XMLCh* a, const XMLCh* b) {
  return xercesc::XMLString::equals(a, b);
}

// True when a (null-terminated) is a prefix of b.
bool UnitPrefix(const XMLCh* a, const XMLCh* b) {
  if (a == nullptr) return true;
  if (b == nullptr) return a[0] == 0;
  for (; *a != 0; ++a, ++b) {
    if (*a != *b) return false;
  }
  return true;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  qzfuzz::InitProcess();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size > 8192) return 0;
  static ScoringTranscoder utf8("UTF-8");
  static ScoringTranscoder latin1("ISO-8859-1");
  const std::string bytes(reinterpret_cast<const char*>(data), size);

  // As UTF-8.
  ScoringStr whole;
  whole.assignUTF8(bytes);
  const std::string back = whole.toUTF8();
  if (bytes.compare(0, back.size(), back) != 0) {
    qzfuzz::Fail("decoding and encoding UTF-8 gave no prefix of the input");
  }
  const std::vector<size_t> cuts = Boundaries(bytes);
  if (!cuts.empty()) {
    if (back != bytes) qzfuzz::Fail("valid UTF-8 did not survive a round trip");
    if (utf8.TranscodeTo(whole.xc_str()) != bytes) {
      qzfuzz::Fail("the UTF-8 transcoder disagrees on valid text");
    }
    // Cut into two and into three pieces at boundaries picked from the text's length.
    const size_t k = cuts.size();
    const std::vector<std::vector<size_t>> splits = {
        {cuts[k / 2]}, {cuts[k / 3], cuts[(2 * k) / 3]}, {cuts[1 % k]}};
    for (const auto& split : splits) {
      ScoringStr pieces;
      size_t from = 0;
      for (size_t to : split) {
        ScoringStr piece;
        piece.assignUTF8(bytes.substr(from, to - from));
        pieces.append(piece);
        from = to;
      }
      ScoringStr last;
      last.assignUTF8(bytes.substr(from));
      pieces.append(last);
      if (!whole.empty() && !SameUnits(pieces.xc_str(), whole.xc_str())) {
        qzfuzz::Fail("UTF-8 decoded in pieces differs from decoded whole");
      }
    }
  }

  // As UTF-16 code units.
  std::vector<XMLCh> units(size / 2 + 1, 0);
  std::memcpy(units.data(), data, (size / 2) * 2);
  const ScoringStr wide(units.data());
  const std::string encoded = wide.toUTF8();
  if (utf8.TranscodeTo(units.data()) != encoded) {
    qzfuzz::Fail("ScoringStr::toUTF8 and the UTF-8 transcoder disagree");
  }
  ScoringStr decoded;
  decoded.assignUTF8(encoded);
  if (!UnitPrefix(decoded.xc_str(), units.data())) {
    qzfuzz::Fail("UTF-16 encoded and decoded again is no prefix of the units");
  }
  const std::string narrow = latin1.TranscodeTo(units.data());
  size_t plain = 0;
  while (units[plain] != 0 && units[plain] < 0x100) ++plain;
  if (narrow.size() != plain) qzfuzz::Fail("the Latin-1 transcoder stopped at another place");
  for (size_t i = 0; i < plain; ++i) {
    if (static_cast<unsigned char>(narrow[i]) != units[i]) qzfuzz::Fail("Latin-1 byte differs");
  }

  // Other operations on the decoded text.
  ScoringStr copy(whole);
  copy.append(wide);
  (void)copy.ContainsString(wide.xc_str());
  static const XMLCh kA[] = {'a', 0};
  static const XMLCh kBB[] = {'b', 'b', 0};
  (void)copy.replaceSubstring(kA, kBB);
  copy.truncateString(static_cast<unsigned int>(size % 7));
  (void)copy.convertToInteger();
  (void)copy.toUTF8();
  return 0;
}

// Text helpers of the transformation engine's string functions: UTF-8 aware lengths and
// substrings, regular expressions with limits, and printf-like number formats that are
// validated before any of their text reaches the C library.
#ifndef QZ_PLATFORM_TRANSFORM_TEXT_H_
#define QZ_PLATFORM_TRANSFORM_TEXT_H_

#include <cstddef>
#include <regex>
#include <string>
#include <string_view>

namespace QZTransformNS_8_0_0 {
namespace internal {

// Longest regular expression accepted, in bytes.
constexpr size_t kMaxPatternLength = 1000;
// Longest text that matches and replace search, in bytes: matching time grows with the
// square of the text's length, so longer texts give an invalid result instead.
constexpr size_t kMaxRegexInput = 4096;
// Longest text replace may produce, in bytes.
constexpr size_t kMaxReplaceOutput = 1 << 20;

// Characters (UTF-8 code points) in the text.
size_t CodePointCount(std::string_view text);
// The characters from the 1-based start, at most length of them (empty past the end).
std::string_view CodePointSubstring(std::string_view text, size_t start, size_t length);
// ASCII letters changed; other bytes (UTF-8 sequences included) kept.
std::string AsciiUpper(std::string_view text);
std::string AsciiLower(std::string_view text);
// Without leading and trailing blanks (space, tab, carriage return, line feed).
std::string_view TrimBlanks(std::string_view text);

// An ECMAScript regular expression whose matching time is linear in the text's length
// for each match found (back-references are refused, since they would need
// backtracking). Immutable once compiled.
class Regex {
 public:
  // False, with the reason in *why, when the pattern is too long, malformed, uses a
  // back-reference or compiles to too large an automaton.
  bool Compile(std::string_view pattern, std::string* why);
  // Whether some part of the text matches: 1 or 0; -1 when the text is too long or the
  // matcher gives up.
  int Search(std::string_view text) const;
  // Every match replaced by the replacement, in which $1 to $99 name groups, $& the
  // match, $` and $' the text before and after it, and $$ a dollar sign. An empty match
  // also replaces, once at each position. False when the text or the result is too
  // long, or the matcher gives up.
  bool Replace(std::string_view text, std::string_view replacement, std::string* out) const;

 private:
  std::regex anchored_;  // the pattern behind a lazy prefix that is group 1
  unsigned groups_ = 0;  // the pattern's own groups
};

// A validated formatNumber pattern: literal text ("%%" for a percent sign) around at most
// one conversion %[flags][width][.precision][length]type, flags from "-+ #0", width and
// precision up to 200, length modifiers (h, l, L, q, j, z, t) accepted and ignored, and
// type one of d i o u x X (the number's integer part) or e E f F g G a A.
class NumberFormat {
 public:
  // False, with the reason in *why, for anything else.
  bool Parse(std::string_view pattern, std::string* why);
  // Writes the number by the pattern. False when an integer conversion gets a number
  // that is not finite or out of range (or negative for o u x X).
  bool Format(double value, std::string* out) const;

 private:
  std::string prefix_;
  std::string suffix_;
  std::string spec_;  // rebuilt from the parsed parts: nothing of the pattern's own text
  char type_ = 0;     // 0: no conversion
};

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

#endif  // QZ_PLATFORM_TRANSFORM_TEXT_H_

// Text helpers: UTF-8 walking, regular expressions run in polynomial time, and number
// formats rebuilt from their parsed parts.
#include "Text.h"

#include <cmath>
#include <cstdio>

namespace QZTransformNS_8_0_0 {
namespace internal {

namespace {

// libstdc++ can run an expression without back-references as a simulation of its
// automaton: time linear in the text for one match attempt, and no recursion that grows
// with the text (its backtracking matcher recurses once per character and is
// exponential on patterns such as (a*)*b).
#if defined(__GLIBCXX__)
constexpr std::regex::flag_type kRegexFlags =
    std::regex::ECMAScript | std::regex_constants::__polynomial;
#else
constexpr std::regex::flag_type kRegexFlags = std::regex::ECMAScript;
#endif

bool IsContinuation(char c) { return (static_cast<unsigned char>(c) & 0xC0) == 0x80; }

// Byte length of the character starting at text[i].
size_t CharLength(std::string_view text, size_t i) {
  size_t n = 1;
  while (i + n < text.size() && IsContinuation(text[i + n])) ++n;
  return n;
}

using Match = std::match_results<std::string_view::const_iterator>;

// Matches the anchored expression at `from`: its lazy prefix lets one pass of the
// automaton find the leftmost match at or after `from` (a search that tried every start
// position in turn would cost the square of the text's length).
bool MatchFrom(const std::regex& anchored, std::string_view text, size_t from, Match* m) {
  auto flags = std::regex_constants::match_continuous;
  if (from > 0) flags |= std::regex_constants::match_prev_avail;
  return std::regex_search(text.begin() + static_cast<std::ptrdiff_t>(from), text.end(), *m,
                           anchored, flags);
}

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

// Appends the replacement for one match; group g of the pattern is m[g + 1].
void Expand(std::string_view replacement, const Match& m, unsigned groups,
            std::string_view text, size_t start, size_t end, std::string* out) {
  for (size_t i = 0; i < replacement.size(); ++i) {
    const char c = replacement[i];
    if (c != '$' || i + 1 == replacement.size()) {
      out->push_back(c);
      continue;
    }
    const char n = replacement[i + 1];
    if (n == '$') {
      out->push_back('$');
      ++i;
    } else if (n == '&') {
      out->append(text.substr(start, end - start));
      ++i;
    } else if (n == '`') {
      out->append(text.substr(0, start));
      ++i;
    } else if (n == '\'') {
      out->append(text.substr(end));
      ++i;
    } else if (IsDigit(n)) {
      unsigned group = static_cast<unsigned>(n - '0');
      size_t used = 1;
      if (i + 2 < replacement.size() && IsDigit(replacement[i + 2])) {
        const unsigned two = group * 10 + static_cast<unsigned>(replacement[i + 2] - '0');
        if (two >= 1 && two <= groups) {
          group = two;
          used = 2;
        }
      }
      if (group >= 1 && group <= groups) {
        const auto& sub = m[group + 1];
        if (sub.matched) out->append(sub.first, sub.second);
        i += used;
      } else {
        out->push_back('$');
      }
    } else {
      out->push_back('$');
    }
  }
}

}  // namespace

bool Regex::Compile(std::string_view pattern, std::string* why) {
  if (pattern.size() > kMaxPatternLength) {
    *why = "the regular expression is longer than " + std::to_string(kMaxPatternLength) +
           " characters";
    return false;
  }
  try {
    // The pattern alone first: wrapped, a malformed pattern such as "a)|(b" could read
    // as a different, valid one.
    const std::regex alone(pattern.begin(), pattern.end(), kRegexFlags);
    groups_ = alone.mark_count();
    std::string wrapped = "([\\s\\S]*?)(?:";
    wrapped.append(pattern.data(), pattern.size());
    wrapped += ')';
    anchored_ = std::regex(wrapped, kRegexFlags);
    return true;
  } catch (const std::regex_error& e) {
    *why = std::string("the regular expression is refused: ") + e.what();
    return false;
  }
}

int Regex::Search(std::string_view text) const {
  if (text.size() > kMaxRegexInput) return -1;
  try {
    Match m;
    return MatchFrom(anchored_, text, 0, &m) ? 1 : 0;
  } catch (const std::exception&) {
    return -1;  // the matcher ran out of resources
  }
}

bool Regex::Replace(std::string_view text, std::string_view replacement,
                    std::string* out) const {
  if (text.size() > kMaxRegexInput) return false;
  try {
    std::string result;
    Match m;
    size_t pos = 0;
    while (pos <= text.size() && MatchFrom(anchored_, text, pos, &m)) {
      const size_t start = static_cast<size_t>(m[1].second - text.begin());
      const size_t end = static_cast<size_t>(m[0].second - text.begin());
      result.append(text.substr(pos, start - pos));
      Expand(replacement, m, groups_, text, start, end, &result);
      if (result.size() > kMaxReplaceOutput) return false;
      if (end > start) {
        pos = end;
      } else {
        // An empty match: keep the next character and look again after it.
        if (start == text.size()) {
          pos = start + 1;
          break;
        }
        const size_t n = CharLength(text, start);
        result.append(text.substr(start, n));
        pos = start + n;
      }
    }
    if (pos < text.size()) result.append(text.substr(pos));
    if (result.size() > kMaxReplaceOutput) return false;
    *out = std::move(result);
    return true;
  } catch (const std::exception&) {
    return false;
  }
}


size_t CodePointCount(std::string_view text) {
  size_t n = 0;
  for (char c : text) n += IsContinuation(c) ? 0 : 1;
  return n;
}

std::string_view CodePointSubstring(std::string_view text, size_t start, size_t length) {
  size_t i = 0;
  for (size_t skipped = 1; skipped < start && i < text.size(); ++skipped) {
    i += CharLength(text, i);
  }
  size_t end = i;
  for (size_t taken = 0; taken < length && end < text.size(); ++taken) {
    end += CharLength(text, end);
  }
  return text.substr(i, end - i);
}

std::string AsciiUpper(std::string_view text) {
  std::string out(text);
  for (char& c : out) {
    if (c >= 'a' && c <= 'z') c = static_cast<char>(c - 'a' + 'A');
  }
  return out;
}

std::string AsciiLower(std::string_view text) {
  std::string out(text);
  for (char& c : out) {
    if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
  }
  return out;
}

std::string_view TrimBlanks(std::string_view text) {
  const char* blanks = " \t\r\n";
  const size_t first = text.find_first_not_of(blanks);
  if (first == std::string_view::npos) return std::string_view();
  return text.substr(first, text.find_last_not_of(blanks) - first + 1);
}

namespace {

constexpr unsigned kMaxWidth = 200;

// Reads up to three digits at pattern[*i]; false when there are more or the value is
// above kMaxWidth.
bool SmallNumber(std::string_view pattern, size_t* i, unsigned* out) {
  unsigned v = 0;
  size_t n = 0;
  while (*i < pattern.size() && IsDigit(pattern[*i])) {
    if (++n > 3) return false;
    v = v * 10 + static_cast<unsigned>(pattern[(*i)++] - '0');
  }
  *out = v;
  return v <= kMaxWidth;
}

bool IsIntegerType(char c) {
  return c == 'd' || c == 'i' || c == 'o' || c == 'u' || c == 'x' || c == 'X';
}

bool IsRealType(char c) {
  return c == 'e' || c == 'E' || c == 'f' || c == 'F' || c == 'g' || c == 'G' || c == 'a' ||
         c == 'A';
}

}  // namespace

bool NumberFormat::Parse(std::string_view pattern, std::string* why) {
  std::string prefix;
  std::string suffix;
  std::string spec;
  char type = 0;
  for (size_t i = 0; i < pattern.size();) {
    std::string& literal = type == 0 ? prefix : suffix;
    if (pattern[i] != '%') {
      literal.push_back(pattern[i++]);
      continue;
    }
    ++i;
    if (i < pattern.size() && pattern[i] == '%') {
      literal.push_back('%');
      ++i;
      continue;
    }
    if (type != 0) {
      *why = "the pattern has more than one conversion";
      return false;
    }
    spec = "%";
    std::string flags;
    while (i < pattern.size() &&
           std::string_view("-+ #0").find(pattern[i]) != std::string_view::npos) {
      if (flags.find(pattern[i]) == std::string::npos) flags.push_back(pattern[i]);
      ++i;
    }
    spec += flags;
    unsigned width = 0;
    if (!SmallNumber(pattern, &i, &width)) {
      *why = "the pattern's width is above " + std::to_string(kMaxWidth);
      return false;
    }
    if (width > 0) spec += std::to_string(width);
    if (i < pattern.size() && pattern[i] == '.') {
      ++i;
      unsigned precision = 0;
      if (!SmallNumber(pattern, &i, &precision)) {
        *why = "the pattern's precision is above " + std::to_string(kMaxWidth);
        return false;
      }
      spec += "." + std::to_string(precision);
    }
    size_t lengths = 0;
    while (i < pattern.size() &&
           std::string_view("hlLqjzt").find(pattern[i]) != std::string_view::npos) {
      if (++lengths > 2) break;
      ++i;
    }
    if (i == pattern.size() || lengths > 2 ||
        !(IsIntegerType(pattern[i]) || IsRealType(pattern[i]))) {
      *why = "the pattern has no valid conversion (expected %[flags][width][.precision]type "
             "with type one of d i o u x X e E f F g G a A)";
      return false;
    }
    type = pattern[i++];
    if (IsIntegerType(type)) spec += "ll";
    spec.push_back(type);
  }
  prefix_ = std::move(prefix);
  suffix_ = std::move(suffix);
  spec_ = std::move(spec);
  type_ = type;
  return true;
}

bool NumberFormat::Format(double value, std::string* out) const {
  // Width and precision are at most 200 each, and a double has at most 309 digits
  // before the point.
  char buffer[1024];
  int n = 0;
  if (type_ == 0) {
    n = 0;
  } else if (IsIntegerType(type_)) {
    if (!std::isfinite(value)) return false;
    const double whole = std::trunc(value);
    const bool isSigned = type_ == 'd' || type_ == 'i';
    if (isSigned) {
      if (whole < -9.2e18 || whole > 9.2e18) return false;
      n = std::snprintf(buffer, sizeof buffer, spec_.c_str(), static_cast<long long>(whole));
    } else {
      if (whole < 0 || whole > 1.8e19) return false;
      n = std::snprintf(buffer, sizeof buffer, spec_.c_str(),
                        static_cast<unsigned long long>(whole));
    }
  } else {
    n = std::snprintf(buffer, sizeof buffer, spec_.c_str(), value);
  }
  if (n < 0 || static_cast<size_t>(n) >= sizeof buffer) return false;
  std::string text;
  text.reserve(prefix_.size() + static_cast<size_t>(n) + suffix_.size());
  text += prefix_;
  text.append(buffer, static_cast<size_t>(n));
  text += suffix_;
  *out = std::move(text);
  return true;
}

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

// ISO 8601 reading, calendar arithmetic and date formatting, independent of the locale
// and of the C library's time functions (which know neither year 0 nor years past 2038
// everywhere).
#include "Dates.h"

#include <cmath>

namespace QZTransformNS_8_0_0 {
namespace internal {

namespace {

constexpr double kSecondsPerDay = 86400.0;
// Beyond this many days from 1970 (about 2.7 million years) a value is taken as no date:
// it keeps every day count and second count exact in a double.
constexpr double kMaxDays = 1e9;

bool IsLeap(int64_t y) { return (y % 4 == 0 && y % 100 != 0) || y % 400 == 0; }

unsigned DaysInMonth(int64_t y, unsigned m) {
  static const unsigned kDays[12] = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
  return m == 2 && IsLeap(y) ? 29 : kDays[m - 1];
}

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

// Reads exactly n digits at text[*pos].
bool Digits(std::string_view text, size_t* pos, size_t n, unsigned* out) {
  if (*pos + n > text.size()) return false;
  unsigned v = 0;
  for (size_t i = 0; i < n; ++i) {
    const char c = text[*pos + i];
    if (!IsDigit(c)) return false;
    v = v * 10 + static_cast<unsigned>(c - '0');
  }
  *pos += n;
  *out = v;
  return true;
}

bool ParseDate(std::string_view text, size_t* pos, DateTime* out) {
  size_t p = *pos;
  bool negative = false;
  if (p < text.size() && text[p] == '-') {
    negative = true;
    ++p;
  }
  const size_t start = p;
  int64_t year = 0;
  while (p < text.size() && IsDigit(text[p])) {
    if (p - start >= 9) return false;
    year = year * 10 + (text[p] - '0');
    ++p;
  }
  if (p - start < 4) return false;
  if (negative) year = -year;
  unsigned month = 0;
  unsigned day = 0;
  if (p >= text.size() || text[p] != '-') return false;
  ++p;
  if (!Digits(text, &p, 2, &month) || month < 1 || month > 12) return false;
  if (p >= text.size() || text[p] != '-') return false;
  ++p;
  if (!Digits(text, &p, 2, &day) || day < 1 || day > DaysInMonth(year, month)) return false;
  out->days = DaysFromCivil(year, month, day);
  out->hasDate = true;
  *pos = p;
  return true;
}

bool ParseTime(std::string_view text, size_t* pos, DateTime* out) {
  size_t p = *pos;
  unsigned hour = 0;
  unsigned minute = 0;
  unsigned second = 0;
  double fraction = 0.0;
  if (!Digits(text, &p, 2, &hour)) return false;
  if (p >= text.size() || text[p] != ':') return false;
  ++p;
  if (!Digits(text, &p, 2, &minute)) return false;
  if (p < text.size() && text[p] == ':') {
    ++p;
    if (!Digits(text, &p, 2, &second)) return false;
    if (p < text.size() && (text[p] == '.' || text[p] == ',')) {
      ++p;
      double scale = 0.1;
      const size_t start = p;
      while (p < text.size() && IsDigit(text[p])) {
        fraction += (text[p] - '0') * scale;
        scale /= 10;
        ++p;
      }
      if (p == start) return false;
    }
  }
  const bool endOfDay = hour == 24 && minute == 0 && second == 0 && fraction == 0.0;
  if ((hour > 23 && !endOfDay) || minute > 59 || second > 60) return false;
  // Zone designator: accepted, and the time is taken as written.
  if (p < text.size() && text[p] == 'Z') {
    ++p;
  } else if (p < text.size() && (text[p] == '+' || text[p] == '-')) {
    ++p;
    unsigned zh = 0;
    unsigned zm = 0;
    if (!Digits(text, &p, 2, &zh)) return false;
    if (p < text.size() && text[p] == ':') ++p;
    if (!Digits(text, &p, 2, &zm) || zh > 14 || zm > 59) return false;
  }
  out->seconds = hour * 3600.0 + minute * 60.0 + second + fraction;
  out->hasTime = true;
  *pos = p;
  return true;
}

int64_t FloorDiv(int64_t a, int64_t b) {
  const int64_t q = a / b;
  return (a % b != 0 && ((a < 0) != (b < 0))) ? q - 1 : q;
}

int64_t EpochDays(int year) { return DaysFromCivil(year, 1, 1); }

const char* const kDayNames[7] = {"Sunday",   "Monday", "Tuesday", "Wednesday",
                                  "Thursday", "Friday", "Saturday"};
const char* const kMonthNames[12] = {"January", "February", "March",     "April",
                                     "May",     "June",     "July",      "August",
                                     "September", "October", "November", "December"};

bool IsDateConversion(char c) {
  switch (c) {
    case 'a': case 'A': case 'b': case 'B': case 'd': case 'e': case 'F': case 'j':
    case 'm': case 'u': case 'w': case 'y': case 'Y': case 'D': case 'h':
      return true;
    default:
      return false;
  }
}

bool IsTimeConversion(char c) {
  switch (c) {
    case 'H': case 'I': case 'M': case 'p': case 'S': case 'T': case 'R':
      return true;
    default:
      return false;
  }
}

void AppendNumber(std::string* out, int64_t v, int width, char pad) {
  char buffer[32];
  const bool negative = v < 0;
  uint64_t u = negative ? 0 - static_cast<uint64_t>(v) : static_cast<uint64_t>(v);
  int n = 0;
  do {
    buffer[n++] = static_cast<char>('0' + u % 10);
    u /= 10;
  } while (u != 0);
  if (negative) out->push_back('-');
  for (int i = n; i < width; ++i) out->push_back(pad);
  while (n > 0) out->push_back(buffer[--n]);
}

}  // namespace

int64_t DaysFromCivil(int64_t y, unsigned m, unsigned d) {
  y -= m <= 2 ? 1 : 0;
  const int64_t era = (y >= 0 ? y : y - 399) / 400;
  const int64_t yoe = y - era * 400;
  const int64_t doy = (153 * (m > 2 ? m - 3 : m + 9) + 2) / 5 + d - 1;
  const int64_t doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
  return era * 146097 + doe - 719468;
}

void CivilFromDays(int64_t z, int64_t* year, unsigned* month, unsigned* day) {
  z += 719468;
  const int64_t era = (z >= 0 ? z : z - 146096) / 146097;
  const int64_t doe = z - era * 146097;
  const int64_t yoe = (doe - doe / 1460 + doe / 36524 - doe / 146096) / 365;
  const int64_t doy = doe - (365 * yoe + yoe / 4 - yoe / 100);
  const int64_t mp = (5 * doy + 2) / 153;
  *day = static_cast<unsigned>(doy - (153 * mp + 2) / 5 + 1);
  *month = static_cast<unsigned>(mp < 10 ? mp + 3 : mp - 9);
  *year = yoe + era * 400 + (*month <= 2 ? 1 : 0);
}

bool ParseIsoDateTime(std::string_view text, DateTime* out) {
  const char* blanks = " \t\r\n";
  const size_t first = text.find_first_not_of(blanks);
  if (first == std::string_view::npos) return false;
  text = text.substr(first, text.find_last_not_of(blanks) - first + 1);

  DateTime result;
  size_t p = 0;
  const bool timeOnly = text.size() > 2 && IsDigit(text[0]) && IsDigit(text[1]) && text[2] == ':';
  if (timeOnly) {
    if (!ParseTime(text, &p, &result)) return false;
  } else {
    if (!ParseDate(text, &p, &result)) return false;
    if (p < text.size() && (text[p] == 'T' || text[p] == ' ')) {
      ++p;
      if (!ParseTime(text, &p, &result)) return false;
    }
  }
  if (p != text.size()) return false;
  *out = result;
  return true;
}

bool ToDateTime(const Value& value, DataType declared, DateTime* out) {
  if (value.IsString()) return ParseIsoDateTime(value.GetText(), out);
  if (!value.IsNumericValue() || value.IsSystemMissingValue()) return false;
  const double v = value.GetReal();
  if (!std::isfinite(v)) return false;
  DateTime result;
  switch (declared) {
    case DataType::kDateDaysSince0:
    case DataType::kDateDaysSince1960:
    case DataType::kDateDaysSince1970:
    case DataType::kDateDaysSince1980: {
      if (std::fabs(v) > kMaxDays) return false;
      const int epoch = declared == DataType::kDateDaysSince0      ? 0
                        : declared == DataType::kDateDaysSince1960 ? 1960
                        : declared == DataType::kDateDaysSince1970 ? 1970
                                                                   : 1980;
      result.days = static_cast<int64_t>(std::floor(v)) + EpochDays(epoch);
      result.hasDate = true;
      break;
    }
    case DataType::kDateTimeSecondsSince0:
    case DataType::kDateTimeSecondsSince1960:
    case DataType::kDateTimeSecondsSince1970:
    case DataType::kDateTimeSecondsSince1980: {
      if (std::fabs(v) > kMaxDays * kSecondsPerDay) return false;
      const int epoch = declared == DataType::kDateTimeSecondsSince0      ? 0
                        : declared == DataType::kDateTimeSecondsSince1960 ? 1960
                        : declared == DataType::kDateTimeSecondsSince1970 ? 1970
                                                                          : 1980;
      const double day = std::floor(v / kSecondsPerDay);
      result.days = static_cast<int64_t>(day) + EpochDays(epoch);
      result.seconds = v - day * kSecondsPerDay;
      result.hasDate = true;
      result.hasTime = true;
      break;
    }
    case DataType::kTimeSeconds:
      if (v < 0 || v > kMaxDays * kSecondsPerDay) return false;
      result.seconds = v;
      result.hasTime = true;
      break;
    default:
      return false;
  }
  *out = result;
  return true;
}

bool DateFormat::Parse(std::string_view pattern, std::string* why) {
  needsDate_ = false;
  for (size_t i = 0; i < pattern.size(); ++i) {
    if (pattern[i] != '%') continue;
    if (i + 1 == pattern.size()) {
      *why = "the pattern ends with a lone '%'";
      return false;
    }
    const char c = pattern[++i];
    if (IsDateConversion(c)) {
      needsDate_ = true;
    } else if (c != '%' && !IsTimeConversion(c)) {
      *why = std::string("the pattern has an unsupported conversion '%") + c + "'";
      return false;
    }
  }
  pattern_.assign(pattern.data(), pattern.size());
  return true;
}

bool DateFormat::Format(const DateTime& value, std::string* out) const {
  if (needsDate_ && !value.hasDate) return false;
  int64_t year = 0;
  unsigned month = 1;
  unsigned day = 1;
  if (value.hasDate) CivilFromDays(value.days, &year, &month, &day);
  const int64_t whole = static_cast<int64_t>(std::floor(value.seconds));
  const int64_t hour = whole / 3600;
  const int64_t minute = whole / 60 % 60;
  const int64_t second = whole % 60;
  const int weekday = static_cast<int>(value.days - 7 * FloorDiv(value.days + 4, 7) + 4);
  const int64_t yearDay = value.days - DaysFromCivil(year, 1, 1) + 1;

  std::string text;
  for (size_t i = 0; i < pattern_.size(); ++i) {
    const char c = pattern_[i];
    if (c != '%') {
      text.push_back(c);
      continue;
    }
    switch (pattern_[++i]) {
      case '%': text.push_back('%'); break;
      case 'a': text.append(kDayNames[weekday], 3); break;
      case 'A': text += kDayNames[weekday]; break;
      case 'b':
      case 'h': text.append(kMonthNames[month - 1], 3); break;
      case 'B': text += kMonthNames[month - 1]; break;
      case 'd': AppendNumber(&text, day, 2, '0'); break;
      case 'e': AppendNumber(&text, day, 2, ' '); break;
      case 'j': AppendNumber(&text, yearDay, 3, '0'); break;
      case 'm': AppendNumber(&text, month, 2, '0'); break;
      case 'u': AppendNumber(&text, weekday == 0 ? 7 : weekday, 1, '0'); break;
      case 'w': AppendNumber(&text, weekday, 1, '0'); break;
      case 'y': AppendNumber(&text, (year % 100 + 100) % 100, 2, '0'); break;
      case 'Y': AppendNumber(&text, year, 1, '0'); break;
      case 'F':
        AppendNumber(&text, year, 4, '0');
        text.push_back('-');
        AppendNumber(&text, month, 2, '0');
        text.push_back('-');
        AppendNumber(&text, day, 2, '0');
        break;
      case 'D':
        AppendNumber(&text, month, 2, '0');
        text.push_back('/');
        AppendNumber(&text, day, 2, '0');
        text.push_back('/');
        AppendNumber(&text, (year % 100 + 100) % 100, 2, '0');
        break;
      case 'H': AppendNumber(&text, hour, 2, '0'); break;
      case 'I': AppendNumber(&text, (hour + 11) % 12 + 1, 2, '0'); break;
      case 'M': AppendNumber(&text, minute, 2, '0'); break;
      case 'S': AppendNumber(&text, second, 2, '0'); break;
      case 'p': text += hour % 24 < 12 ? "AM" : "PM"; break;
      case 'R':
      case 'T':
        AppendNumber(&text, hour, 2, '0');
        text.push_back(':');
        AppendNumber(&text, minute, 2, '0');
        if (pattern_[i] == 'T') {
          text.push_back(':');
          AppendNumber(&text, second, 2, '0');
        }
        break;
      default: break;  // Parse admits nothing else
    }
  }
  *out = std::move(text);
  return true;
}

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

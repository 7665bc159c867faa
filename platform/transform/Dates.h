// Dates and times of the transformation engine: ISO 8601 texts, the numeric date types
// of PMML (days or seconds since a year), and strftime-like formatting.
#ifndef QZ_PLATFORM_TRANSFORM_DATES_H_
#define QZ_PLATFORM_TRANSFORM_DATES_H_

#include <cstdint>
#include <string>
#include <string_view>

#include "Expression.h"

namespace QZTransformNS_8_0_0 {
namespace internal {

// A point in the proleptic Gregorian calendar: a day (counted from 1970-01-01) and the
// seconds into it. A time alone has no day; a date alone has no time (seconds 0).
struct DateTime {
  int64_t days = 0;
  double seconds = 0.0;
  bool hasDate = false;
  bool hasTime = false;
};

// Days from 1970-01-01 to the date (month 1-12, day 1-31; not checked here).
int64_t DaysFromCivil(int64_t year, unsigned month, unsigned day);
// The date of a day counted from 1970-01-01.
void CivilFromDays(int64_t days, int64_t* year, unsigned* month, unsigned* day);

// Reads an ISO 8601 date ("2024-02-29"), time ("13:45", "13:45:30.25") or date and time
// ("2024-02-29T13:45:30", a blank instead of the T also accepted). A trailing zone ("Z",
// "+01:00") is accepted and ignored: the time is taken as written. Years have four or
// more digits and may be negative. False when the text is none of these or names a
// date or time that does not exist.
bool ParseIsoDateTime(std::string_view text, DateTime* out);

// Reads a value as a date and time: a text by ParseIsoDateTime; a real when the value is
// declared with a numeric date type (dateDaysSince[Y], dateTimeSecondsSince[Y],
// timeSeconds). False for anything else.
bool ToDateTime(const Value& value, DataType declared, DateTime* out);

// A validated formatDatetime pattern: strftime conversions %a %A %b %B %d %e %F %H %I
// %j %m %M %p %S %T %u %w %y %Y %D %R %h and %%, and literal text.
class DateFormat {
 public:
  // False, with the reason in *why, for an unknown conversion or a lone % at the end.
  bool Parse(std::string_view pattern, std::string* why);
  // Writes the date and time by the pattern. False when the value lacks a part the
  // pattern asks for (a day of a time alone).
  bool Format(const DateTime& value, std::string* out) const;

 private:
  std::string pattern_;
  bool needsDate_ = false;
};

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

#endif  // QZ_PLATFORM_TRANSFORM_DATES_H_

// Dates at the edges of the calendar: years before year 1, times of day given as
// seconds (timeSeconds), and the pattern letters of formatDatetime that name a weekday.
#include "XercesTestEnvironment.h"
#include "QZTransformation.h"

#include <initializer_list>
#include <sstream>
#include <string>
#include <utility>

#include <gtest/gtest.h>

#include "QZMV.h"
#include "Value.h"
#include "ValueRecord.h"

namespace {

using QZCommon_800::QZMV;
using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;

struct Result {
  long code;
  std::string error;
  Value value;
};

// Computes the derived field "r" with a data field "t" of the given dataType.
Result Compute(const std::string& expression, const Value& t = Value(),
               const std::string& dataType = "string") {
  QZTransformation t_;
  std::istringstream in(
      "<PMML version=\"4.4\"><DataDictionary><DataField name=\"t\" optype=\"continuous\" "
      "dataType=\"" + dataType + "\"/></DataDictionary><TransformationDictionary>"
      "<DerivedField name=\"r\">" + expression + "</DerivedField></TransformationDictionary>"
      "</PMML>");
  const QZStatus loaded = t_.AddPMML(in, false);
  if (loaded.IsError()) return {loaded.GetErrorCode(), t_.GetLastError(), Value()};
  ValueRecord record;
  record.Add("t", t);
  const QZStatus status = t_.Transform(record);
  return {status.GetErrorCode(), t_.GetLastError(), record.Get("r")};
}

std::string Apply(const std::string& function, const std::string& first,
                  const std::string& second = "") {
  return "<Apply function=\"" + function + "\">" + first + second + "</Apply>";
}
std::string C(const std::string& text) { return "<Constant>" + text + "</Constant>"; }
const std::string kT = "<FieldRef field=\"t\"/>";

Value Ok(const Result& r) {
  EXPECT_EQ(r.code, 0) << r.error;
  return r.value;
}

// Years are astronomical: year 0 is 1 BC and a leap year (divisible by 400), year -1 is
// 2 BC; the days count on through them without a gap.
TEST(CalendarDates, YearsBeforeYearOne) {
  EXPECT_EQ(Ok(Compute(Apply("dateDaysSinceYear", C("0000-01-01"), C("0")))), Value(0.0));
  EXPECT_EQ(Ok(Compute(Apply("dateDaysSinceYear", C("0000-12-31"), C("0")))), Value(365.0));
  EXPECT_EQ(Ok(Compute(Apply("dateDaysSinceYear", C("-0001-12-31"), C("0")))), Value(-1.0));
  EXPECT_EQ(Ok(Compute(Apply("dateDaysSinceYear", C("-0001-01-01"), C("0")))), Value(-365.0));
  EXPECT_EQ(Ok(Compute(Apply("dateDaysSinceYear", C("-0004-02-29"), C("0")))),
            Value(-4.0 * 365 - 1 + 31 + 28));
  EXPECT_EQ(Ok(Compute(Apply("formatDatetime", C("-0001-03-01"), C("%Y|%y|%m")))),
            Value("-1|99|03"));
  // A minus sign needs the four-digit year after it; -0003-02-29 does not exist.
  EXPECT_EQ(Compute(Apply("dateDaysSinceYear", C("-001-01-01"), C("0"))).code, 270006);
  EXPECT_EQ(Compute(Apply("dateDaysSinceYear", C("-0003-02-29"), C("0"))).code, 270006);
}

// A timeSeconds field is a time of day: it formats and counts as one, has no date, and
// is refused outside the range of times.
TEST(CalendarDates, TimeSecondsFields) {
  EXPECT_EQ(Ok(Compute(Apply("formatDatetime", kT, C("%H:%M:%S")), Value(3661.0),
                       "timeSeconds")),
            Value("01:01:01"));
  EXPECT_EQ(Ok(Compute(Apply("dateSecondsSinceMidnight", kT), Value(45296.5), "timeSeconds")),
            Value(45296.5));
  EXPECT_EQ(Compute(Apply("formatDatetime", kT, C("%Y")), Value(60.0), "timeSeconds").code,
            270006);
  EXPECT_EQ(Compute(Apply("dateSecondsSinceMidnight", kT), Value(-1.0), "timeSeconds").code,
            270006);
  EXPECT_EQ(Compute(Apply("dateDaysSinceYear", kT, C("1960")), Value(60.0), "timeSeconds").code,
            270006);
}

// %w counts the weekday from Sunday = 0, %u from Monday = 1 to Sunday = 7; a pattern
// ending in a lone '%' is refused at load.
TEST(CalendarDates, WeekdayPatterns) {
  EXPECT_EQ(Ok(Compute(Apply("formatDatetime", C("2023-01-01"), C("%w %u %a")))),
            Value("0 7 Sun"));
  EXPECT_EQ(Ok(Compute(Apply("formatDatetime", C("2023-01-07"), C("%w %u %A")))),
            Value("6 6 Saturday"));
  const Result lone = Compute(Apply("formatDatetime", C("2023-01-01"), C("%Y %")));
  EXPECT_EQ(lone.code, 270004);
  EXPECT_NE(lone.error.find("the pattern ends with a lone '%'"), std::string::npos)
      << lone.error;
  // A pattern from a field is judged per record: invalid, not a load failure.
  EXPECT_EQ(Compute(Apply("formatDatetime", C("2023-01-01"), kT), Value("%d %")).code, 270006);
}

}  // namespace

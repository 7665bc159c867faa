// The library's diagnostic trace: plain text lines, one file per thread, inside a
// directory per process. Tracing is off unless "component.cfg" in the current
// directory holds a positive "loglevel". Internal to the library, never exported.
#ifndef QZSCORING_DISPATCH_TRACELOG_H_
#define QZSCORING_DISPATCH_TRACELOG_H_

#include <string>

namespace QZScoring_800 {

// Formats a printf-style line and appends it to "<thread id>_<logFileName>" in the
// process's log directory, when `level` does not exceed the trace level. The trace
// level is read from "component.cfg" at the first call in the process and never
// again; while it is below `level` a call costs one comparison. An empty or null
// file name formats but writes nothing. Lines longer than 10,239 characters are cut.
// Never throws; every failure loses the line silently. Thread-safe.
void TraceLog(const char* logFileName, int level, const char* format, ...)
    __attribute__((format(printf, 3, 4)));

// The first positive "loglevel" value in "component.cfg", or 0 when the file is
// absent or holds none. Only the first 63 characters of each line count; the rest of
// a longer line is skipped, never read as a line of its own.
int ReadLogLevel();

// `text` without leading and trailing blanks, tabs and form feeds.
std::string TrimBlanks(const std::string& text);

// Creates "log<process id>" in the current directory if needed and returns its name.
std::string MakeLogDirectory();

// Appends `text` and a newline to the calling thread's log file, provided
// "component.cfg" can still be opened and `level` is within a positive trace level.
// Failures are silent.
void WriteLogLine(const char* logFileName, int level, const char* text);

// Forgets the trace level read, so that the next trace call reads "component.cfg"
// again. For tests only; not safe while other threads trace.
void ResetTraceLevelForTesting();

}  // namespace QZScoring_800

#endif  // QZSCORING_DISPATCH_TRACELOG_H_

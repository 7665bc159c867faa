#include "TraceLog.h"

#include <atomic>
#include <climits>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <limits>

#include "port.h"

namespace QZScoring_800 {

namespace {

const char kConfigFileName[] = "component.cfg";
const char kLevelKey[] = "loglevel";
// A configuration line counts up to this many bytes, terminator included.
constexpr std::streamsize kConfigLineBuffer = 64;
constexpr std::size_t kMessageBuffer = 10240;

// Stands for "not read yet". It is the largest int, so that on the hot path a single
// "trace level < call level" test is false and leads to the slow path that reads it.
constexpr int kLevelNotRead = INT_MAX;

// Racing first calls both read the same file and store the same value.
std::atomic<int> gTraceLevel{kLevelNotRead};

int CurrentTraceLevel() {
  int level = gTraceLevel.load(std::memory_order_relaxed);
  if (level == kLevelNotRead) {
    level = ReadLogLevel();
    gTraceLevel.store(level, std::memory_order_relaxed);
  }
  return level;
}

bool IsTrimmed(char c) { return c == ' ' || c == '\t' || c == '\f'; }

// The leading decimal integer of `text` as atoi reads it, but clamped to the int
// range instead of overflowing.
int LeadingInteger(const std::string& text) {
  const long value = std::strtol(text.c_str(), nullptr, 10);
  if (value > INT_MAX) return INT_MAX;
  if (value < INT_MIN) return INT_MIN;
  return static_cast<int>(value);
}

}  // namespace

std::string TrimBlanks(const std::string& text) {
  std::size_t begin = 0;
  std::size_t end = text.size();
  while (begin < end && IsTrimmed(text[begin])) ++begin;
  while (end > begin && IsTrimmed(text[end - 1])) --end;
  return text.substr(begin, end - begin);
}

int ReadLogLevel() {
  std::ifstream config(kConfigFileName);
  if (!config) return 0;
  char buffer[kConfigLineBuffer];
  while (true) {
    config.getline(buffer, kConfigLineBuffer);
    if (config.bad()) return 0;
    if (config.fail()) {
      // Nothing extracted means end of file; otherwise the line was too long: keep
      // its first part and skip the rest.
      if (config.gcount() == 0) return 0;
      config.clear();
      config.ignore(std::numeric_limits<std::streamsize>::max(), '\n');
    }
    const std::string line(buffer);
    const std::size_t comma = line.find(',');
    if (comma != std::string::npos) {
      const std::string key = TrimBlanks(line.substr(0, comma));
      const int value = LeadingInteger(TrimBlanks(line.substr(comma + 1)));
      if (key == kLevelKey && value > 0) return value;
    }
    if (config.eof()) return 0;
  }
}

std::string MakeLogDirectory() {
  const std::string directory = "log" + std::to_string(port::CurrentProcessId());
  port::MakeDirectory(directory);
  return directory;
}

void WriteLogLine(const char* logFileName, int level, const char* text) {
  if (logFileName == nullptr || *logFileName == '\0') return;
  // Removing the configuration switches tracing off at once, without a re-read.
  if (!std::ifstream(kConfigFileName)) return;
  const int traceLevel = CurrentTraceLevel();
  if (traceLevel < 1 || level > traceLevel) return;
  const std::string path = MakeLogDirectory() + port::kPathSeparator +
                           std::to_string(port::CurrentThreadId()) + "_" + logFileName;
  std::ofstream log(path, std::ios::out | std::ios::app);
  if (!log) return;
  log << (text != nullptr ? text : "") << '\n';
  log.flush();
}

void TraceLog(const char* logFileName, int level, const char* format, ...) {
  if (gTraceLevel.load(std::memory_order_relaxed) < level) return;
  try {
    if (CurrentTraceLevel() < level || format == nullptr) return;
    char message[kMessageBuffer] = {};
    va_list args;
    va_start(args, format);
    std::vsnprintf(message, sizeof message, format, args);
    va_end(args);
    if (logFileName != nullptr && *logFileName != '\0') {
      WriteLogLine(logFileName, level, message);
    }
  } catch (...) {
    // Tracing must never disturb the operation being traced.
  }
}

void ResetTraceLevelForTesting() { gTraceLevel.store(kLevelNotRead); }

}  // namespace QZScoring_800

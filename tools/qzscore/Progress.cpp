#include "Progress.h"

#include <unistd.h>

#include <cstdio>
#include <string>

namespace qzscore {

Progress::Progress(bool wanted, uint64_t totalBytes)
    : enabled_(wanted && ::isatty(STDERR_FILENO) == 1),
      totalBytes_(totalBytes),
      start_(Clock::now()),
      lastDraw_(start_) {}

Progress::~Progress() { Finish(); }

double Progress::Elapsed() const {
  return std::chrono::duration<double>(Clock::now() - start_).count();
}

void Progress::Update(uint64_t records, uint64_t bytesRead) {
  if (!enabled_) return;
  const Clock::time_point now = Clock::now();
  if (now - start_ < std::chrono::seconds(1) || now - lastDraw_ < std::chrono::milliseconds(100)) {
    return;
  }
  lastDraw_ = now;
  const double seconds = std::chrono::duration<double>(now - start_).count();
  char line[160];
  int length = std::snprintf(line, sizeof line, "\r%llu records, %.0f records/s",
                             static_cast<unsigned long long>(records), records / seconds);
  if (totalBytes_ > 0 && length > 0) {
    const double share = bytesRead >= totalBytes_ ? 1.0 : double(bytesRead) / double(totalBytes_);
    const int width = 30;
    const int filled = static_cast<int>(share * width);
    std::string bar(static_cast<size_t>(filled), '#');
    bar.append(static_cast<size_t>(width - filled), '.');
    std::snprintf(line + length, sizeof line - static_cast<size_t>(length), "  [%s] %3.0f%%",
                  bar.c_str(), share * 100.0);
  }
  std::fputs(line, stderr);
  std::fflush(stderr);
  drawn_ = true;
}

void Progress::Finish() {
  if (!drawn_) return;
  std::fputs("\r\033[K", stderr);
  std::fflush(stderr);
  drawn_ = false;
}

}  // namespace qzscore

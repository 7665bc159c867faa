// A progress line with records per second on standard error, shown only when standard
// error is a terminal and the run has lasted more than a second.
#ifndef QZSCORE_PROGRESS_H_
#define QZSCORE_PROGRESS_H_

#include <chrono>
#include <cstdint>

namespace qzscore {

// Used by one thread at a time. totalBytes is the input's size, 0 when unknown.
class Progress {
 public:
  Progress(bool wanted, uint64_t totalBytes);
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  // Redraws the line at most ten times a second.
  void Update(uint64_t records, uint64_t bytesRead);
  // Erases the line, if one was drawn.
  void Finish();
  // Seconds since construction.
  double Elapsed() const;

 private:
  using Clock = std::chrono::steady_clock;
  bool enabled_;
  bool drawn_ = false;
  uint64_t totalBytes_;
  Clock::time_point start_;
  Clock::time_point lastDraw_;
};

}  // namespace qzscore

#endif  // QZSCORE_PROGRESS_H_

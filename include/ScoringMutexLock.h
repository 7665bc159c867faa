// The scope guard for a ScoringMutex.
#ifndef QZSCORING_SCORINGMUTEXLOCK_H_
#define QZSCORING_SCORINGMUTEXLOCK_H_

#include "QZScoringExport.h"
#include "ScoringMutex.h"

namespace QZScoring_800 {

// Holds `mutex` locked from construction to destruction, so the lock is released on
// every path out of the scope, exceptions included. A null mutex guards nothing.
// Not copyable.
class QZSCORING_API ScoringMutexLock {
 public:
  explicit ScoringMutexLock(ScoringMutex* mutex);
  ScoringMutexLock(const ScoringMutexLock&) = delete;
  ScoringMutexLock& operator=(const ScoringMutexLock&) = delete;
  ~ScoringMutexLock();

 private:
  ScoringMutex* fMutex;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGMUTEXLOCK_H_

// The lock type of the scoring library.
#ifndef QZSCORING_SCORINGMUTEX_H_
#define QZSCORING_SCORINGMUTEX_H_

#include <memory>

#include "QZScoringExport.h"

namespace QZScoring_800 {

// A re-entrant lock: the thread holding it may lock it again, and must unlock it as
// often as it locked it. Prefer taking it through a ScoringMutexLock, which cannot
// forget the unlock. Not copyable.
class QZSCORING_API ScoringMutex {
 public:
  ScoringMutex();
  ScoringMutex(const ScoringMutex&) = delete;
  ScoringMutex& operator=(const ScoringMutex&) = delete;
  // Must not be called while any thread holds the lock.
  ~ScoringMutex();

  // Blocks until the calling thread holds the lock.
  void lock();
  // Releases one lock of the calling thread, which must hold it.
  void unlock();

 private:
  class Section;
  std::unique_ptr<Section> fSection;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGMUTEX_H_

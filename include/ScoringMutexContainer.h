// The one process-wide lock of the scoring library.
#ifndef QZSCORING_SCORINGMUTEXCONTAINER_H_
#define QZSCORING_SCORINGMUTEXCONTAINER_H_

#include "QZScoringExport.h"
#include "ScoringMutex.h"

namespace QZScoring_800 {

// Owner of the process-wide lock that serialises Xerces-C++ initialisation and
// termination. The lock is created on first use (at the latest when the library
// loads) and is never destroyed, so it stays usable even from code that runs during
// static destruction.
class QZSCORING_API ScoringMutexContainer {
 public:
  // The address of the process-wide lock; never null, the same for every call.
  // Thread-safe. Take it through a ScoringMutexLock.
  static ScoringMutex* GetMutex();
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGMUTEXCONTAINER_H_

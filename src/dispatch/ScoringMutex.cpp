#include <new>

#include "ScoringMutex.h"
#include "ScoringMutexContainer.h"
#include "ScoringMutexLock.h"
#include "port.h"

namespace QZScoring_800 {

class ScoringMutex::Section : public port::RecursiveMutex {};

ScoringMutex::ScoringMutex() : fSection(new Section) {}

ScoringMutex::~ScoringMutex() = default;

void ScoringMutex::lock() { fSection->Lock(); }

void ScoringMutex::unlock() { fSection->Unlock(); }

ScoringMutexLock::ScoringMutexLock(ScoringMutex* mutex) : fMutex(mutex) {
  if (fMutex != nullptr) fMutex->lock();
}

ScoringMutexLock::~ScoringMutexLock() {
  if (fMutex != nullptr) fMutex->unlock();
}

ScoringMutex* ScoringMutexContainer::GetMutex() {
  // Built in static storage and never destroyed: a host or plug-in may still take the
  // lock from its own static destructors after this library's have run.
  alignas(ScoringMutex) static unsigned char storage[sizeof(ScoringMutex)];
  static ScoringMutex* const fMutex = new (storage) ScoringMutex;
  return fMutex;
}

namespace {
// Creates the lock while the library loads, before any thread can race for it.
ScoringMutex* const gProcessMutexAtLoad = ScoringMutexContainer::GetMutex();
}  // namespace

}  // namespace QZScoring_800

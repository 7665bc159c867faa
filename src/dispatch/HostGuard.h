// The one place where operations that a host calls turn an unexpected exception into a
// status: nothing thrown inside the library or a plug-in reaches the host.
#ifndef QZSCORING_SRC_DISPATCH_HOST_GUARD_H_
#define QZSCORING_SRC_DISPATCH_HOST_GUARD_H_

#include <exception>

#include "QZStatus.h"
#include "ScoringStatusCodes.h"
#include "TraceLog.h"

namespace QZScoring_800 {

// Runs body (returning a QZStatus) and returns its status. When body throws anything
// (a plug-in's scorer that throws, memory running out) the result is
// SCORING_INTERNAL_ERROR and a trace line names the function and the reason.
template <class Body>
QZCommon_800::QZStatus GuardStatus(const char* function, Body&& body) noexcept {
  try {
    return body();
  } catch (const std::exception& e) {
    TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s", function, e.what());
  } catch (...) {
    TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s", function, "unknown");
  }
  return QZCommon_800::QZStatus(SCORING_INTERNAL_ERROR, false);
}

}  // namespace QZScoring_800

#endif  // QZSCORING_SRC_DISPATCH_HOST_GUARD_H_

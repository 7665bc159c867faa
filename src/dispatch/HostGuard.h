// The one place where operations that a host calls turn an unexpected exception into a
// status: nothing thrown inside the library or a plug-in reaches the host.
#ifndef QZSCORING_SRC_DISPATCH_HOST_GUARD_H_
#define QZSCORING_SRC_DISPATCH_HOST_GUARD_H_

#include <exception>

#include "QZStatus.h"
#include "ScoringStatusCodes.h"
#include "TraceLog.h"

namespace QZScoring_800 {

namespace host_guard {

// Runs body (returning a QZStatus); when it throws, writes a trace line naming the
// function and the reason and returns `code`.
template <class Body>
QZCommon_800::QZStatus Guard(long code, const char* function, Body&& body) noexcept {
  try {
    return body();
  } catch (const std::exception& e) {
    TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s", function, e.what());
  } catch (...) {
    TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s", function, "unknown");
  }
  return QZCommon_800::QZStatus(code, false);
}

}  // namespace host_guard

// Runs body (returning a QZStatus) and returns its status. When body throws anything
// (memory running out, a fault inside the library) the result is
// SCORING_INTERNAL_ERROR and a trace line names the function and the reason.
template <class Body>
QZCommon_800::QZStatus GuardStatus(const char* function, Body&& body) noexcept {
  return host_guard::Guard(SCORING_INTERNAL_ERROR, function, body);
}

// Runs one call into a model's scorer (a plug-in's code). When the scorer throws, the
// result is SCORING_SCORER_EXCEPTION and a trace line names the function and the
// reason, so that a host can tell a faulty plug-in from a failure of the library.
template <class Call>
QZCommon_800::QZStatus GuardScorerCall(const char* function, Call&& call) noexcept {
  return host_guard::Guard(SCORING_SCORER_EXCEPTION, function, call);
}

}  // namespace QZScoring_800

#endif  // QZSCORING_SRC_DISPATCH_HOST_GUARD_H_

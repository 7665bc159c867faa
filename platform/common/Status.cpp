// Out-of-line destructors of the platform's interfaces, so that their vtables and type
// information live once, in this library.
#include "IQZScore.h"
#include "ProgressReport.h"

namespace QZCommon_800 {

IQZScore::~IQZScore() = default;

ProgressReport::~ProgressReport() = default;

}  // namespace QZCommon_800

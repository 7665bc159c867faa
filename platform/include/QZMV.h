// The system-missing number of the platform.
#ifndef QZ_PLATFORM_QZMV_H_
#define QZ_PLATFORM_QZMV_H_

#include <limits>

#include "QZPlatformExport.h"

namespace QZCommon_800 {

// The system-missing double is the lowest finite double. NaN is never stored as a
// number; anything that reads a NaN treats it as system-missing.
struct QZCOMMON_API QZMV {
  static constexpr double Missing() { return std::numeric_limits<double>::lowest(); }
  static constexpr bool IsMissing(double d) { return d == Missing() || d != d; }
};

}  // namespace QZCommon_800

#endif  // QZ_PLATFORM_QZMV_H_

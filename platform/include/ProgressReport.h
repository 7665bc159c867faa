// A sink for progress measures reported while a long operation runs.
#ifndef QZ_PLATFORM_PROGRESSREPORT_H_
#define QZ_PLATFORM_PROGRESSREPORT_H_

#include <string>

#include "QZPlatformExport.h"

namespace QZCommon_800 {

// Progress reporter interface; implementations are deleted through it. What a measure's
// name means is agreed between the reporting operation and the implementation.
class QZCOMMON_API ProgressReport {
 public:
  virtual ~ProgressReport();
  // A countable measure (a step number, a count of records) of the given name.
  virtual int DiscreteMeasure(const std::string& name) = 0;
  // A continuous measure (a fraction done, a time) of the given name.
  virtual double ScaleMeasure(const std::string& name) = 0;
};

}  // namespace QZCommon_800

#endif  // QZ_PLATFORM_PROGRESSREPORT_H_

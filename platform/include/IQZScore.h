// The scorer interface: what a plug-in's score parser returns and what a model drives.
#ifndef QZ_PLATFORM_IQZSCORE_H_
#define QZ_PLATFORM_IQZSCORE_H_

#include <string>

#include "QZPlatformExport.h"
#include "QZStatus.h"
#include "ValueRecord.h"

namespace QZCommon_800 {

// A scorer. Deleted through this interface; one thread at a time uses an instance.
// The order of the virtual operations is part of the plug-in binary interface.
class QZCOMMON_API IQZScore {
 public:
  virtual ~IQZScore();
  // True when the scorer was built completely and can score.
  virtual bool IsReady() const = 0;
  // Scores one input record into the output record; a failure's code is in the status
  // and the output's content is then unspecified.
  virtual QZStatus Score(const ValueRecord& input, ValueRecord& output) = 0;
  // Adds to the record the fields that Score will write (as null), so that a host can
  // lay out its output record before scoring.
  virtual QZStatus Scorable(ValueRecord& record) = 0;
  // The scorer's type text.
  virtual std::string GetType() const = 0;
};

}  // namespace QZCommon_800

#endif  // QZ_PLATFORM_IQZSCORE_H_

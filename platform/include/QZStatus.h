// The outcome of a platform or library operation: a numeric code (0 is success) and a
// flag.
#ifndef QZ_PLATFORM_QZSTATUS_H_
#define QZ_PLATFORM_QZSTATUS_H_

#include "QZPlatformExport.h"

namespace QZCommon_800 {

class QZCOMMON_API QZStatus {
 public:
  // Success, code 0.
  QZStatus() = default;
  // An error with that code (code 0 counts as success). The flag marks a code that was
  // passed on from a deeper operation, or work that is unfinished.
  QZStatus(long code, bool flag) : code_(code), flag_(flag) {}

  bool IsOK() const { return code_ == 0; }
  bool IsError() const { return code_ != 0; }
  long GetErrorCode() const { return code_; }
  bool GetFlag() const { return flag_; }

 private:
  long code_ = 0;
  bool flag_ = false;
};

}  // namespace QZCommon_800

#endif  // QZ_PLATFORM_QZSTATUS_H_

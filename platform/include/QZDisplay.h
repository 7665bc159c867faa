// Diagnostic output of the platform: captions with values, and free text.
#ifndef QZ_PLATFORM_QZDISPLAY_H_
#define QZ_PLATFORM_QZDISPLAY_H_

#include <iosfwd>
#include <string>

#include "QZPlatformExport.h"

namespace QZDisplay_800 {

// Chooses the stream the Display functions write to (std::cerr until set); a null
// pointer discards their output. The stream is not owned and must outlive its use.
// Calls may come from any thread; each Display call writes under one lock, so lines of
// different threads do not interleave.
QZCOMMON_API void SetDisplayStream(std::ostream* stream) noexcept;
// The stream currently chosen; null when output is discarded.
QZCOMMON_API std::ostream* GetDisplayStream() noexcept;

// Writes "caption: value" and a line end. Never throws.
QZCOMMON_API void DisplayI(const std::string& caption, int value) noexcept;
// Writes "caption: text" and a line end. Never throws.
QZCOMMON_API void DisplayS(const std::string& caption, const std::string& text) noexcept;
// Writes the text as it is (no line end added). The level grades the text for the
// caller; every level is written. Never throws.
QZCOMMON_API void DisplayText(int level, const std::string& text) noexcept;

}  // namespace QZDisplay_800

#endif  // QZ_PLATFORM_QZDISPLAY_H_

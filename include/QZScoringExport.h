// Export macro of the scoring library. The library is built with hidden visibility;
// only the classes and functions marked QZSCORING_API are part of its binary interface.
#ifndef QZSCORING_EXPORT_H_
#define QZSCORING_EXPORT_H_

#if defined(_WIN32)
#  if defined(QZSCORING_BUILDING)
#    define QZSCORING_API __declspec(dllexport)
#  else
#    define QZSCORING_API __declspec(dllimport)
#  endif
#else
#  define QZSCORING_API __attribute__((visibility("default")))
#endif

#endif  // QZSCORING_EXPORT_H_

// Export macros of the three platform libraries. The libraries are built with hidden
// visibility; only what these macros mark is part of their binary interface.
#ifndef QZ_PLATFORM_EXPORT_H_
#define QZ_PLATFORM_EXPORT_H_

#if defined(_WIN32)
#  if defined(QZCOMMON_BUILDING)
#    define QZCOMMON_API __declspec(dllexport)
#  else
#    define QZCOMMON_API __declspec(dllimport)
#  endif
#  if defined(QZTRANSFORM_BUILDING)
#    define QZTRANSFORM_API __declspec(dllexport)
#  else
#    define QZTRANSFORM_API __declspec(dllimport)
#  endif
#  if defined(QZPARSEXML_BUILDING)
#    define QZPARSEXML_API __declspec(dllexport)
#  else
#    define QZPARSEXML_API __declspec(dllimport)
#  endif
#else
#  define QZCOMMON_API __attribute__((visibility("default")))
#  define QZTRANSFORM_API __attribute__((visibility("default")))
#  define QZPARSEXML_API __attribute__((visibility("default")))
#endif

#endif  // QZ_PLATFORM_EXPORT_H_

// A narrow tag or attribute name in UTF-16, made once per lookup so that walking many
// DOM nodes compares code units without converting the name again for each node.
#ifndef QZSCORING_PMML_WIDENAME_H_
#define QZSCORING_PMML_WIDENAME_H_

#include <cstddef>
#include <string>

#include <xercesc/util/XercesDefs.hpp>

#include "ScoringStr.h"

namespace QZScoring_800 {

// Short ASCII names (every PMML name) are widened into an inline buffer without any
// allocation; other names go through Xerces-C++'s default transcoder, as ScoringStr
// does. Needs Xerces-C++ initialised only for the second kind.
class WideName {
 public:
  explicit WideName(const std::string& name) {
    if (name.size() < kInline && IsAscii(name)) {
      for (std::size_t i = 0; i < name.size(); ++i) fInline[i] = static_cast<XMLCh>(name[i]);
      fInline[name.size()] = 0;
      fText = fInline;
    } else {
      fConverted = ScoringStr(name);
      fInline[0] = 0;
      fText = fConverted.xc_str() != nullptr ? fConverted.xc_str() : fInline;
    }
  }
  WideName(const WideName&) = delete;
  WideName& operator=(const WideName&) = delete;

  // The name in UTF-16, never null, valid while this object lives.
  const XMLCh* c_str() const { return fText; }

 private:
  static constexpr std::size_t kInline = 64;

  static bool IsAscii(const std::string& s) {
    for (char c : s) {
      if (static_cast<unsigned char>(c) >= 0x80) return false;
    }
    return true;
  }

  XMLCh fInline[kInline];
  ScoringStr fConverted;
  const XMLCh* fText;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_PMML_WIDENAME_H_

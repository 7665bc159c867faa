// Conversion of UTF-16 text to a named code page.
#ifndef QZSCORING_SCORINGTRANSCODER_H_
#define QZSCORING_SCORINGTRANSCODER_H_

#include <memory>
#include <string>

#include <xercesc/util/XercesDefs.hpp>

#include "QZScoringExport.h"

XERCES_CPP_NAMESPACE_BEGIN
class XMLTranscoder;
XERCES_CPP_NAMESPACE_END

namespace QZScoring_800 {

// Converts UTF-16 text to one code page through a transcoder of Xerces-C++'s
// transcoding service. Needs Xerces-C++ initialised while it is created and used.
// Reports no errors: an encoding the service refuses leaves the object invalid,
// converting every text to an empty string. One thread at a time per object.
class QZSCORING_API ScoringTranscoder {
 public:
  // A transcoder for "UTF-8".
  ScoringTranscoder();
  // A transcoder for `encoding`; a null or empty name means "UTF-8".
  explicit ScoringTranscoder(const char* encoding);
  ScoringTranscoder(const ScoringTranscoder&) = delete;
  ScoringTranscoder& operator=(const ScoringTranscoder&) = delete;
  virtual ~ScoringTranscoder();

  // True when the transcoding service provided a transcoder.
  bool IsValid() const;
  // `text` (null counts as empty) in the transcoder's code page. A character the code
  // page cannot represent ends the result early; an invalid object gives "".
  std::string TranscodeTo(const XMLCh* text) const;

 private:
  std::unique_ptr<XERCES_CPP_NAMESPACE::XMLTranscoder> fTranscoder;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGTRANSCODER_H_

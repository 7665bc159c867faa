#include "ScoringTranscoder.h"

#include <xercesc/util/PlatformUtils.hpp>
#include <xercesc/util/TransService.hpp>
#include <xercesc/util/XMLException.hpp>

#include "TranscodeSteps.h"

XERCES_CPP_NAMESPACE_USE

namespace QZScoring_800 {

namespace {
const char kDefaultEncoding[] = "UTF-8";
constexpr XMLSize_t kTranscoderBlockSize = 4096;
}  // namespace

ScoringTranscoder::ScoringTranscoder() : ScoringTranscoder(kDefaultEncoding) {}

ScoringTranscoder::ScoringTranscoder(const char* encoding) {
  if (encoding == nullptr || *encoding == '\0') encoding = kDefaultEncoding;
  XMLTransService* service = XMLPlatformUtils::fgTransService;
  if (service == nullptr) return;  // Xerces-C++ not initialised
  try {
    XMLTransService::Codes result = XMLTransService::Ok;
    std::unique_ptr<XMLTranscoder> transcoder(
        service->makeNewTranscoderFor(encoding, result, kTranscoderBlockSize,
                                      XMLPlatformUtils::fgMemoryManager));
    if (result == XMLTransService::Ok) fTranscoder = std::move(transcoder);
  } catch (const XMLException&) {
    // The service refused the name: the object stays invalid.
  }
}

ScoringTranscoder::~ScoringTranscoder() = default;

bool ScoringTranscoder::IsValid() const { return fTranscoder != nullptr; }

std::string ScoringTranscoder::TranscodeTo(const XMLCh* text) const {
  std::string result;
  if (fTranscoder == nullptr || text == nullptr) return result;
  transcode::EncodeInSteps(*fTranscoder, text, std::char_traits<XMLCh>::length(text),
                           result);
  return result;
}

}  // namespace QZScoring_800

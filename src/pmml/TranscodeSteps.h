// Step-wise conversion between UTF-16 and a code page through a Xerces-C++
// transcoder, shared by ScoringStr and ScoringTranscoder. Conversions never throw:
// they stop at the first character that cannot be converted and keep everything
// converted before it, whatever the step boundaries.
#ifndef QZSCORING_PMML_TRANSCODESTEPS_H_
#define QZSCORING_PMML_TRANSCODESTEPS_H_

#include <algorithm>
#include <string>

#include <xercesc/util/TransService.hpp>
#include <xercesc/util/XMLException.hpp>

namespace QZScoring_800 {
namespace transcode {

// Each step produces at most this many bytes or code units.
constexpr XMLSize_t kStepSize = 1000;

inline bool IsHighSurrogate(XMLCh c) { return c >= 0xD800 && c <= 0xDBFF; }
inline bool IsLowSurrogate(XMLCh c) { return c >= 0xDC00 && c <= 0xDFFF; }

// The length of the longest prefix of `text` without an unpaired surrogate. Such a
// unit is no character in any code page; Xerces-C++'s UTF-8 transcoder would encode
// it as invalid UTF-8 or even merge it with the unit after it.
inline XMLSize_t WellFormedLength(const XMLCh* text, XMLSize_t size) {
  for (XMLSize_t i = 0; i < size; ++i) {
    if (IsHighSurrogate(text[i])) {
      if (i + 1 == size || !IsLowSurrogate(text[i + 1])) return i;
      ++i;
    } else if (IsLowSurrogate(text[i])) {
      return i;
    }
  }
  return size;
}

// The number of bytes of the UTF-8 sequence that `lead` starts (1 for a byte that
// starts none, which the transcoder then rejects).
inline XMLSize_t Utf8SequenceLength(XMLByte lead) {
  if (lead >= 0xF0 && lead <= 0xF7) return 4;
  if (lead >= 0xE0) return lead <= 0xEF ? 3 : 1;
  if (lead >= 0xC0) return 2;
  return 1;
}

// The length of the longest prefix of `bytes` without a byte from 0xF5 to 0xFF. No
// such byte occurs in UTF-8, and Xerces-C++'s UTF-8 transcoder does not always refuse
// one: once a step has produced more than 32 units, it skips a sequence led by 0xF5 to
// 0xF7 (a value beyond U+10FFFF) without a word and goes on after it.
inline XMLSize_t Utf8CandidateLength(const XMLByte* bytes, XMLSize_t size) {
  for (XMLSize_t i = 0; i < size; ++i) {
    if (bytes[i] >= 0xF5) return i;
  }
  return size;
}

// Appends `text` (size units) converted by `transcoder` to `out`. A transcoder that
// throws loses the whole step it was working on, so the failing step is redone one
// character at a time to keep every byte before the character it refuses.
inline void EncodeInSteps(XERCES_CPP_NAMESPACE::XMLTranscoder& transcoder,
                          const XMLCh* text, XMLSize_t size, std::string& out) {
  size = WellFormedLength(text, size);
  XMLByte block[kStepSize];
  XMLSize_t done = 0;
  bool oneByOne = false;
  while (done < size) {
    XMLSize_t count = size - done;
    if (oneByOne) count = IsHighSurrogate(text[done]) ? 2 : 1;
    XMLSize_t eaten = 0;
    XMLSize_t produced = 0;
    try {
      produced = transcoder.transcodeTo(text + done, count, block, kStepSize, eaten,
                                        XERCES_CPP_NAMESPACE::XMLTranscoder::UnRep_Throw);
    } catch (const XERCES_CPP_NAMESPACE::XMLException&) {
      if (oneByOne) return;
      oneByOne = true;
      continue;
    }
    out.append(reinterpret_cast<const char*>(block), produced);
    if (eaten == 0) return;  // a step that consumes nothing would repeat forever
    done += eaten;
  }
}

// Appends the UTF-16 decoding of `bytes` (size bytes) by a UTF-8 `transcoder` to
// `out`. Malformed input ends the decoding as EncodeInSteps ends an encoding; an
// incomplete sequence at the end is dropped.
inline void DecodeInSteps(XERCES_CPP_NAMESPACE::XMLTranscoder& transcoder,
                          const XMLByte* bytes, XMLSize_t size, std::u16string& out) {
  size = Utf8CandidateLength(bytes, size);
  XMLCh block[kStepSize];
  unsigned char sizes[kStepSize];
  XMLSize_t done = 0;
  bool oneByOne = false;
  while (done < size) {
    XMLSize_t count = size - done;
    if (oneByOne) count = std::min(count, Utf8SequenceLength(bytes[done]));
    XMLSize_t eaten = 0;
    XMLSize_t produced = 0;
    try {
      produced = transcoder.transcodeFrom(bytes + done, count, block, kStepSize, eaten,
                                          sizes);
    } catch (const XERCES_CPP_NAMESPACE::XMLException&) {
      if (oneByOne) return;
      oneByOne = true;
      continue;
    }
    out.append(block, produced);
    if (eaten == 0) return;
    done += eaten;
  }
}

}  // namespace transcode
}  // namespace QZScoring_800

#endif  // QZSCORING_PMML_TRANSCODESTEPS_H_

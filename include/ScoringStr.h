// An owned UTF-16 string for the boundary between Xerces-C++ text and narrow strings.
#ifndef QZSCORING_SCORINGSTR_H_
#define QZSCORING_SCORINGSTR_H_

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>

#include <xercesc/util/XercesDefs.hpp>

#include "QZScoringExport.h"

namespace QZScoring_800 {

// A value holding one owned, null-terminated UTF-16 buffer, or null. Null differs from
// an empty buffer only for xc_str, equals and operator==; empty and length treat both
// alike. Copies are independent. Conversions from and to narrow text need Xerces-C++
// to be initialised. No operation reports an error: a failing conversion ends early
// with what was converted so far. One thread at a time per object.
class QZSCORING_API ScoringStr {
 public:
  // Null content.
  ScoringStr();
  // A copy of `text`; null stays null.
  ScoringStr(const XMLCh* text);
  // `text` converted from the local code page by Xerces-C++'s default transcoder.
  // Never null: text that does not convert gives an empty string.
  ScoringStr(const std::string& text);
  // As the std::string form; a null pointer gives null content.
  ScoringStr(const char* text);
  ScoringStr(const ScoringStr& other);
  // Takes over the buffer of `other`, which is left null.
  ScoringStr(ScoringStr&& other) noexcept;
  ~ScoringStr();

  // Each assignment frees the old buffer and installs a copy (null gives null).
  ScoringStr& operator=(const ScoringStr& other);
  ScoringStr& operator=(ScoringStr&& other) noexcept;
  ScoringStr& operator=(const XMLCh* text);
  // Converts from the local code page as the constructor does; null gives null.
  ScoringStr& operator=(const char* text);

  // The content becomes the one-unit string `c`; a zero `c` gives an empty string.
  void assign(XMLCh c);

  // Append text. A null or empty argument (or a zero unit) changes nothing;
  // appending to null content makes a copy of the argument.
  void append(const ScoringStr& text);
  void append(const XMLCh* text);
  void append(XMLCh c);
  // Appends narrow local-code-page text after conversion.
  void append(const char* text);

  // The buffer, possibly null; owned by this object and valid until it changes.
  const XMLCh* xc_str() const;
  // True for null content or length 0.
  bool empty() const;
  // The number of UTF-16 code units before the terminator; 0 for null.
  std::uint32_t length() const;
  // XMLString::equals of the content and `text`: null and empty count as equal.
  bool equals(const XMLCh* text) const;
  // False when either side is null; otherwise equality of the texts.
  bool operator==(const ScoringStr& other) const;
  // Null content.
  void clear();

  // True when `text` occurs in the content; an empty `text` occurs in any non-null
  // content at least as long. False when either is null.
  bool ContainsString(const XMLCh* text) const;
  // Replaces every non-overlapping occurrence of `from` (leftmost first) by `to`
  // (null or empty `to` removes them). Returns the number replaced; an empty result
  // gives null content. A null or empty `from` changes nothing and returns 0.
  std::uint32_t replaceSubstring(const XMLCh* from, const XMLCh* to);
  // Removes the last n code units (all of them when n exceeds the length, leaving an
  // empty, non-null string). Null content is left alone.
  void truncateString(unsigned int n);
  // The content read as an unsigned decimal number, wrapping modulo 2^32. 0 for null
  // or empty content and for any content holding a unit other than '0' to '9'.
  std::uint32_t convertToInteger();

  // The content encoded as UTF-8. Null content gives an empty string; a unit that
  // cannot be encoded (an unpaired surrogate) ends the result early.
  std::string toUTF8() const;
  // The content becomes the decoding of the UTF-8 `text` (null when `text` is empty).
  // Malformed UTF-8 ends the decoding; what was decoded before it is kept.
  void assignUTF8(const std::string& text);

 private:
  // Frees the buffer and installs a copy of `count` units at `text` (null when
  // `text` is null).
  void Set(const XMLCh* text, std::size_t count);
  void SetNarrow(const char* text);

  std::unique_ptr<XMLCh[]> fBuffer;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGSTR_H_

#include "ScoringStr.h"

#include <string>

#include <xercesc/util/PlatformUtils.hpp>
#include <xercesc/util/XMLException.hpp>
#include <xercesc/util/XMLString.hpp>
#include <xercesc/util/XMLUTF8Transcoder.hpp>
#include <xercesc/util/XMLUni.hpp>

#include "TranscodeSteps.h"

XERCES_CPP_NAMESPACE_USE

namespace QZScoring_800 {

namespace {

using Traits = std::char_traits<XMLCh>;

std::size_t Length(const XMLCh* text) { return text != nullptr ? Traits::length(text) : 0; }

// Local-code-page text as UTF-16, through Xerces-C++'s default transcoder. Text that
// does not convert gives an empty string.
std::u16string FromLocalCodePage(const char* text) {
  XMLCh* converted = nullptr;
  try {
    converted = XMLString::transcode(text);
  } catch (const XMLException&) {
    return std::u16string();
  }
  if (converted == nullptr) return std::u16string();
  std::u16string result(converted);
  XMLString::release(&converted);
  return result;
}

}  // namespace

ScoringStr::ScoringStr() = default;

ScoringStr::ScoringStr(const XMLCh* text) { Set(text, Length(text)); }

ScoringStr::ScoringStr(const std::string& text) { SetNarrow(text.c_str()); }

ScoringStr::ScoringStr(const char* text) {
  if (text != nullptr) SetNarrow(text);
}

ScoringStr::ScoringStr(const ScoringStr& other) {
  Set(other.fBuffer.get(), Length(other.fBuffer.get()));
}

ScoringStr::ScoringStr(ScoringStr&& other) noexcept = default;

ScoringStr::~ScoringStr() = default;

ScoringStr& ScoringStr::operator=(const ScoringStr& other) {
  if (this != &other) Set(other.fBuffer.get(), Length(other.fBuffer.get()));
  return *this;
}

ScoringStr& ScoringStr::operator=(ScoringStr&& other) noexcept = default;

ScoringStr& ScoringStr::operator=(const XMLCh* text) {
  // `text` may point into our own buffer; Set copies before it frees.
  Set(text, Length(text));
  return *this;
}

ScoringStr& ScoringStr::operator=(const char* text) {
  if (text == nullptr) {
    fBuffer.reset();
  } else {
    SetNarrow(text);
  }
  return *this;
}

void ScoringStr::Set(const XMLCh* text, std::size_t count) {
  if (text == nullptr) {
    fBuffer.reset();
    return;
  }
  std::unique_ptr<XMLCh[]> copy(new XMLCh[count + 1]);
  Traits::copy(copy.get(), text, count);
  copy[count] = 0;
  fBuffer = std::move(copy);
}

void ScoringStr::SetNarrow(const char* text) {
  const std::u16string converted = FromLocalCodePage(text);
  Set(converted.c_str(), converted.size());
}

void ScoringStr::assign(XMLCh c) {
  const XMLCh text[2] = {c, 0};
  Set(text, c != 0 ? 1 : 0);
}

void ScoringStr::append(const ScoringStr& text) { append(text.xc_str()); }

void ScoringStr::append(const XMLCh* text) {
  const std::size_t added = Length(text);
  if (added == 0) return;
  std::u16string joined(fBuffer.get() != nullptr ? fBuffer.get() : u"");
  joined.append(text, added);
  Set(joined.c_str(), joined.size());
}

void ScoringStr::append(XMLCh c) {
  const XMLCh text[2] = {c, 0};
  append(text);
}

void ScoringStr::append(const char* text) {
  if (text == nullptr || *text == '\0') return;
  const std::u16string converted = FromLocalCodePage(text);
  append(converted.c_str());
}

const XMLCh* ScoringStr::xc_str() const { return fBuffer.get(); }

bool ScoringStr::empty() const { return length() == 0; }

std::uint32_t ScoringStr::length() const {
  return static_cast<std::uint32_t>(Length(fBuffer.get()));
}

bool ScoringStr::equals(const XMLCh* text) const {
  return XMLString::equals(fBuffer.get(), text);
}

bool ScoringStr::operator==(const ScoringStr& other) const {
  if (fBuffer == nullptr || other.fBuffer == nullptr) return false;
  return XMLString::equals(fBuffer.get(), other.fBuffer.get());
}

void ScoringStr::clear() { fBuffer.reset(); }

bool ScoringStr::ContainsString(const XMLCh* text) const {
  if (text == nullptr || fBuffer == nullptr) return false;
  const std::u16string_view content(fBuffer.get());
  return content.find(std::u16string_view(text)) != std::u16string_view::npos;
}

std::uint32_t ScoringStr::replaceSubstring(const XMLCh* from, const XMLCh* to) {
  if (from == nullptr || *from == 0 || !ContainsString(from)) return 0;
  const std::u16string_view content(fBuffer.get());
  const std::u16string_view pattern(from);
  const std::u16string_view replacement(to != nullptr ? to : u"");
  std::u16string result;
  std::uint32_t count = 0;
  std::size_t position = 0;
  while (position < content.size()) {
    const std::size_t found = content.find(pattern, position);
    if (found == std::u16string_view::npos) break;
    result.append(content.substr(position, found - position));
    result.append(replacement);
    ++count;
    position = found + pattern.size();
  }
  result.append(content.substr(position));
  if (result.empty()) {
    fBuffer.reset();
  } else {
    Set(result.c_str(), result.size());
  }
  return count;
}

void ScoringStr::truncateString(unsigned int n) {
  if (fBuffer == nullptr) return;
  const std::size_t size = Length(fBuffer.get());
  const std::size_t kept = n >= size ? 0 : size - n;
  Traits::assign(fBuffer.get() + kept, size - kept, 0);
}

std::uint32_t ScoringStr::convertToInteger() {
  if (fBuffer == nullptr) return 0;
  std::uint32_t value = 0;
  for (const XMLCh* c = fBuffer.get(); *c != 0; ++c) {
    if (*c < u'0' || *c > u'9') return 0;
    value = value * 10u + static_cast<std::uint32_t>(*c - u'0');
  }
  return value;
}

std::string ScoringStr::toUTF8() const {
  std::string result;
  const XMLSize_t size = Length(fBuffer.get());
  if (size == 0) return result;
  try {
    XMLUTF8Transcoder transcoder(XMLUni::fgUTF8EncodingString, transcode::kStepSize);
    transcode::EncodeInSteps(transcoder, fBuffer.get(), size, result);
  } catch (const XMLException&) {
    // No transcoder: nothing converted.
  }
  return result;
}

void ScoringStr::assignUTF8(const std::string& text) {
  fBuffer.reset();
  if (text.empty()) return;
  std::u16string decoded;
  try {
    XMLUTF8Transcoder transcoder(XMLUni::fgUTF8EncodingString, transcode::kStepSize);
    transcode::DecodeInSteps(transcoder, reinterpret_cast<const XMLByte*>(text.data()),
                             text.size(), decoded);
  } catch (const XMLException&) {
    // No transcoder: nothing decoded.
  }
  // A decoded U+0000 ends the text, as it would in any null-terminated buffer.
  decoded.resize(Traits::length(decoded.c_str()));
  if (!decoded.empty()) Set(decoded.c_str(), decoded.size());
}

}  // namespace QZScoring_800

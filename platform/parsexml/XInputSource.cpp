// QZXInputSource: a Xerces-C++ input source reading a std::istream.
#include "QZXInputSource.h"

#include <xercesc/util/PlatformUtils.hpp>

namespace QZXML_800 {

namespace {

// Reads bytes from the std::istream as the parser asks for them. Nothing may be thrown
// out of readBytes (an exception there leaks the parser's reader), so a stream failure
// of any kind ends the input instead.
class IStreamBinInputStream : public xercesc::BinInputStream {
 public:
  explicit IStreamBinInputStream(std::istream& in) : in_(in) {}
  IStreamBinInputStream(const IStreamBinInputStream&) = delete;
  IStreamBinInputStream& operator=(const IStreamBinInputStream&) = delete;

  XMLFilePos curPos() const override { return position_; }

  XMLSize_t readBytes(XMLByte* const toFill, const XMLSize_t maxToRead) override {
    if (ended_ || maxToRead == 0) return 0;
    XMLSize_t got = 0;
    try {
      if (in_.good()) {
        in_.read(reinterpret_cast<char*>(toFill), static_cast<std::streamsize>(maxToRead));
        got = static_cast<XMLSize_t>(in_.gcount());
      }
    } catch (...) {
      // A stream with exceptions enabled throws at its end or on an error. The bytes
      // read before the throw are in the buffer and counted by gcount (zero when the
      // stream buffer itself failed); the input ends after them.
      got = static_cast<XMLSize_t>(in_.gcount());
      if (got > maxToRead) got = 0;
      ended_ = true;
    }
    if (got == 0) ended_ = true;
    position_ += got;
    return got;
  }

  const XMLCh* getContentType() const override { return nullptr; }

 private:
  std::istream& in_;
  XMLFilePos position_ = 0;
  bool ended_ = false;
};

}  // namespace

// The system id only names the source in error messages; nothing is ever resolved
// against it.
QZXInputSource::QZXInputSource(std::istream& in)
    : xercesc::InputSource("istream", xercesc::XMLPlatformUtils::fgMemoryManager), in_(in) {}

QZXInputSource::~QZXInputSource() = default;

xercesc::BinInputStream* QZXInputSource::makeStream() const {
  return new (getMemoryManager()) IStreamBinInputStream(in_);
}

}  // namespace QZXML_800

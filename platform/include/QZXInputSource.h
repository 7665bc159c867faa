// A Xerces-C++ input source over a standard input stream.
#ifndef QZ_PLATFORM_QZXINPUTSOURCE_H_
#define QZ_PLATFORM_QZXINPUTSOURCE_H_

#include <istream>

#include <xercesc/sax/InputSource.hpp>
#include <xercesc/util/BinInputStream.hpp>

#include "QZPlatformExport.h"

namespace QZXML_800 {

// Lets a Xerces-C++ parser read a document from a std::istream, starting at the
// stream's current position. The stream is not owned and must outlive every parse that
// uses this source. A stream error (a failed read, or an exception the stream throws)
// simply ends the input: the parser then sees a truncated document and reports its own
// error. The creator destroys the source after the parse. Xerces-C++ must be initialised
// (XMLPlatformUtils::Initialize) before construction. Not copyable.
class QZPARSEXML_API QZXInputSource : public xercesc::InputSource {
 public:
  explicit QZXInputSource(std::istream& in);
  ~QZXInputSource() override;
  QZXInputSource(const QZXInputSource&) = delete;
  QZXInputSource& operator=(const QZXInputSource&) = delete;

  // A new byte stream reading the std::istream, owned by the caller (the parser deletes
  // it after the parse). Each call reads on from wherever the std::istream stands.
  xercesc::BinInputStream* makeStream() const override;

 private:
  std::istream& in_;
};

}  // namespace QZXML_800

#endif  // QZ_PLATFORM_QZXINPUTSOURCE_H_

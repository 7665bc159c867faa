// Safely configured Xerces-C++ parsers for untrusted XML: every DOM and SAX2 parser of
// this project is made here, so that none of them can be pointed at a file, a URL or an
// exponential entity expansion by the document it reads.
//
// What every parser made here does:
//  - refuses any DOCTYPE (a PMML document never needs one), which stops every entity
//    attack before it starts;
//  - refuses every external entity, DTD or schema the scanner might ask for (an entity
//    resolver that throws), disables the default entity resolution, never loads an
//    external DTD, never validates and never processes or loads schemas;
//  - limits entity expansion to kQZEntityExpansionLimit and element nesting to a depth
//    (kQZDefaultMaxElementDepth unless the constructor is told otherwise), and refuses
//    an element with more than kQZMaxAttributes attributes or an attribute value longer
//    than kQZMaxAttributeLength;
//  - treats errors and fatal errors as failures by throwing, so that a truncated tree
//    or a partly delivered event stream is never taken for a whole document.
//
// Xerces-C++ must be initialised (XMLPlatformUtils::Initialize) before anything here is
// constructed, and stay initialised until it is destroyed.
#ifndef QZ_PLATFORM_QZSAFEPARSER_H_
#define QZ_PLATFORM_QZSAFEPARSER_H_

#include <exception>
#include <istream>
#include <memory>
#include <string>

#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/parsers/XercesDOMParser.hpp>
#include <xercesc/sax/InputSource.hpp>
#include <xercesc/sax/Locator.hpp>
#include <xercesc/sax2/DefaultHandler.hpp>
#include <xercesc/sax2/SAX2XMLReader.hpp>
#include <xercesc/util/SecurityManager.hpp>

#include "QZPlatformExport.h"

namespace QZXML_800 {

// Deepest element nesting a parser accepts unless told otherwise (the root is depth 1).
constexpr unsigned kQZDefaultMaxElementDepth = 1000;
// Entity expansions a parser allows per document (only the five predefined entities
// can occur at all, since no DOCTYPE is accepted).
constexpr unsigned kQZEntityExpansionLimit = 100;
// Most attributes one element may carry, and the longest attribute value (in UTF-16 code
// units). PMML needs a few dozen short attributes; the DOM adds an element's attributes
// in time that grows with the square of their number, and every reading step copies a
// value, so larger ones only serve to exhaust time or memory.
constexpr unsigned kQZMaxAttributes = 100;
constexpr unsigned kQZMaxAttributeLength = 1u << 20;

// The text of a Xerces-C++ string as UTF-8, whatever the locale; empty for a null
// pointer or when the text cannot be transcoded. Never throws.
QZPARSEXML_API std::string TranscodeToUTF8(const XMLCh* text) noexcept;

// When e holds one of the exceptions a Xerces-C++ parse can throw (XMLException,
// DOMException, SAXParseException, SAXException, OutOfMemoryException), writes a
// message for it into *message (when message is not null; parse errors as "line L,
// column C: text") and returns true. Returns false for anything else (for example a
// value a SAX2 handler threw on purpose), leaving *message unchanged. Never throws.
QZPARSEXML_API bool DescribeXMLException(std::exception_ptr e, std::string* message) noexcept;

// A DOM parser with the safe settings above. Use it like XercesDOMParser; parse() throws
// (none of these derives from std::exception): SAXParseException for a malformed or
// refused document (DOCTYPE, external entity, nesting too deep), XMLException (bad
// encoding, I/O), DOMException (for example an impossible XML declaration),
// OutOfMemoryException. Catch them all at the seam, or use ParseSafely, which does.
// Do not turn any safe setting back off through the base class's setters; ParseSafely
// puts them back before each parse in any case. One thread at a time. Not copyable.
class QZPARSEXML_API QZSafeDOMParser : public xercesc::XercesDOMParser {
 public:
  // A parser accepting elements nested up to maxElementDepth deep (the root is 1).
  explicit QZSafeDOMParser(unsigned maxElementDepth = kQZDefaultMaxElementDepth);
  ~QZSafeDOMParser() override;
  QZSafeDOMParser(const QZSafeDOMParser&) = delete;
  QZSafeDOMParser& operator=(const QZSafeDOMParser&) = delete;

  // Parses the document from the stream's current position. Success: the document,
  // owned by the parser (valid until the next parse or the parser's destruction; take
  // it with adoptDocument() to keep it longer), *error untouched. Failure of any kind:
  // null, with the reason in *error when error is not null. Never throws.
  static xercesc::DOMDocument* ParseSafely(QZSafeDOMParser& parser, std::istream& in,
                                           std::string* error) noexcept;
  // The same over any input source (not owned).
  static xercesc::DOMDocument* ParseSafely(QZSafeDOMParser& parser,
                                           const xercesc::InputSource& source,
                                           std::string* error) noexcept;

  // Sets every safe setting again (namespaces on, no validation, no schemas, no
  // external DTD, refusing resolver, security manager, throwing error handler).
  void ApplySafeSettings();

  // The nesting limit given at construction.
  unsigned GetMaxElementDepth() const { return maxDepth_; }

  // Scanner events, overridden to count the element depth and check the attributes;
  // they throw a SAXParseException when the nesting goes deeper than the limit or the
  // attributes are too many or too long.
  void startDocument() override;
  void startElement(const xercesc::XMLElementDecl& elemDecl, const unsigned int urlId,
                    const XMLCh* const elemPrefix,
                    const xercesc::RefVectorOf<xercesc::XMLAttr>& attrList,
                    const XMLSize_t attrCount, const bool isEmpty,
                    const bool isRoot) override;
  void endElement(const xercesc::XMLElementDecl& elemDecl, const unsigned int urlId,
                  const bool isRoot, const XMLCh* const elemPrefix) override;

 private:
  struct Guards;
  std::unique_ptr<Guards> guards_;
  unsigned maxDepth_;
  unsigned depth_ = 0;
};

// The base of every SAX2 handler of this project. It refuses a DOCTYPE and every
// external entity, turns errors and fatal errors into exceptions, and counts the element
// depth against a limit. A derived handler that overrides startElement, endElement,
// startDocument, endDocument or setDocumentLocator calls the base version first (or
// EnterElement / LeaveElement for the depth). The refusals of a DOCTYPE and of entities
// are final. Install it on a reader with CreateSafeSAX2Reader; the handler must outlive
// the reader's parses. What a parse throws: as for QZSafeDOMParser::parse, plus
// whatever a derived handler throws itself.
class QZPARSEXML_API QZSafeSAX2Handler : public xercesc::DefaultHandler {
 public:
  // A handler accepting elements nested up to maxElementDepth deep (the root is 1).
  explicit QZSafeSAX2Handler(unsigned maxElementDepth = kQZDefaultMaxElementDepth);
  ~QZSafeSAX2Handler() override;
  QZSafeSAX2Handler(const QZSafeSAX2Handler&) = delete;
  QZSafeSAX2Handler& operator=(const QZSafeSAX2Handler&) = delete;

  // Counting the depth (startDocument resets it, a parse may have been broken off);
  // startElement also refuses attributes that are too many or too long.
  void startDocument() override;
  void startElement(const XMLCh* const uri, const XMLCh* const localname,
                    const XMLCh* const qname, const xercesc::Attributes& attrs) override;
  void endElement(const XMLCh* const uri, const XMLCh* const localname,
                  const XMLCh* const qname) override;
  // Keeps the locator for the position in refusal messages; endDocument forgets it.
  // (The locator belongs to the reader and is only valid during its parse.)
  void setDocumentLocator(const xercesc::Locator* const locator) override;
  void endDocument() override;

  // Refusals of a DOCTYPE and of every external entity: each throws a
  // SAXParseException.
  void startDTD(const XMLCh* const name, const XMLCh* const publicId,
                const XMLCh* const systemId) final;
  xercesc::InputSource* resolveEntity(const XMLCh* const publicId,
                                      const XMLCh* const systemId) final;
  // Errors and fatal errors throw the exception they are given. A derived handler may
  // throw something of its own instead, but must throw: returning would let the parse
  // go on (error) or end quietly with part of the document unread (fatalError).
  void error(const xercesc::SAXParseException& exc) override;
  void fatalError(const xercesc::SAXParseException& exc) override;

  // Current element depth (0 outside the root) and the limit.
  unsigned GetElementDepth() const { return depth_; }
  unsigned GetMaxElementDepth() const { return maxDepth_; }
  // The security manager CreateSafeSAX2Reader installs; owned by the handler.
  xercesc::SecurityManager* GetSecurityManager() { return &security_; }

 protected:
  // One level deeper; throws a SAXParseException beyond the limit.
  void EnterElement();
  // One level up.
  void LeaveElement() {
    if (depth_ > 0) --depth_;
  }
  // Throws a SAXParseException with the message at the current document position
  // (without a position outside a parse).
  [[noreturn]] void Refuse(const std::string& message) const;

 private:
  xercesc::SecurityManager security_;
  const xercesc::Locator* locator_ = nullptr;
  unsigned maxDepth_;
  unsigned depth_ = 0;
};

// A new SAX2 reader with the safe settings (no validation, no schemas, no external
// DTD, no default entity resolution, namespaces on, the handler's security manager)
// and the handler installed as content, lexical, error and entity handler. The reader
// is owned by the caller, must be destroyed before Xerces-C++ is terminated, and must
// not parse after the handler is gone. Throws only what Xerces-C++ throws when it
// cannot create a reader (OutOfMemoryException, XMLException).
QZPARSEXML_API std::unique_ptr<xercesc::SAX2XMLReader> CreateSafeSAX2Reader(
    QZSafeSAX2Handler& handler);

}  // namespace QZXML_800

#endif  // QZ_PLATFORM_QZSAFEPARSER_H_

// The safe DOM parser, the safe SAX2 reader and handler, and the translation of Xerces-C++
// exceptions into messages.
#include "QZSafeParser.h"

#include <string>

#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/dom/DOMException.hpp>
#include <xercesc/internal/XMLScanner.hpp>
#include <xercesc/sax/ErrorHandler.hpp>
#include <xercesc/sax/SAXParseException.hpp>
#include <xercesc/sax2/Attributes.hpp>
#include <xercesc/sax2/XMLReaderFactory.hpp>
#include <xercesc/util/OutOfMemoryException.hpp>
#include <xercesc/util/TransService.hpp>
#include <xercesc/util/XMLEntityResolver.hpp>
#include <xercesc/util/XMLException.hpp>
#include <xercesc/util/XMLResourceIdentifier.hpp>
#include <xercesc/util/XMLString.hpp>
#include <xercesc/util/XMLUni.hpp>

#include "QZXInputSource.h"

namespace QZXML_800 {

namespace xc = xercesc;

namespace {

// Text of our own messages as a Xerces-C++ string (released when the holder goes).
class Utf16 {
 public:
  explicit Utf16(const std::string& text)
      : converted_(reinterpret_cast<const XMLByte*>(text.data()), text.size(), "UTF-8") {}
  const XMLCh* get() const { return converted_.str(); }

 private:
  xc::TranscodeFromStr converted_;
};

[[noreturn]] void ThrowRefusal(const std::string& message, const xc::Locator* locator) {
  Utf16 text(message);
  if (locator != nullptr) throw xc::SAXParseException(text.get(), *locator);
  throw xc::SAXParseException(text.get(), nullptr, nullptr, 0, 0);
}

std::string DepthMessage(unsigned limit) {
  return "elements nested deeper than " + std::to_string(limit) + " levels";
}

// Why an element's attributes are refused (too many, or a value too long); empty when
// they are acceptable. valueAt(i) is the value of attribute i.
template <class ValueAt>
std::string AttributeProblem(XMLSize_t count, ValueAt valueAt) {
  if (count > kQZMaxAttributes) {
    return "an element with more than " + std::to_string(kQZMaxAttributes) + " attributes";
  }
  for (XMLSize_t i = 0; i < count; ++i) {
    if (xc::XMLString::stringLen(valueAt(i)) > kQZMaxAttributeLength) {
      return "an attribute value longer than " + std::to_string(kQZMaxAttributeLength) +
             " characters";
    }
  }
  return std::string();
}

std::string EntityMessage(const XMLCh* systemId, const XMLCh* publicId) {
  std::string id = TranscodeToUTF8(systemId);
  if (id.empty()) id = TranscodeToUTF8(publicId);
  return "external entity refused: " + id;
}

// Refuses every external entity, DTD or schema a DOM parser's scanner asks for.
class RefusingResolver : public xc::XMLEntityResolver {
 public:
  xc::InputSource* resolveEntity(xc::XMLResourceIdentifier* id) override {
    if (id == nullptr) ThrowRefusal("external entity refused", nullptr);
    ThrowRefusal(EntityMessage(id->getSystemId(), id->getPublicId()), id->getLocator());
  }
};

// Makes errors and fatal errors end the parse by an exception: without it a fatal error
// leaves a truncated tree that looks like a whole document.
class ThrowingErrorHandler : public xc::ErrorHandler {
 public:
  void warning(const xc::SAXParseException&) override {}
  void error(const xc::SAXParseException& exc) override { throw exc; }
  void fatalError(const xc::SAXParseException& exc) override { throw exc; }
  void resetErrors() override {}
};

std::string Located(const xc::SAXParseException& e) {
  return "line " + std::to_string(e.getLineNumber()) + ", column " +
         std::to_string(e.getColumnNumber()) + ": " + TranscodeToUTF8(e.getMessage());
}

}  // namespace

std::string TranscodeToUTF8(const XMLCh* text) noexcept {
  if (text == nullptr) return std::string();
  try {
    xc::TranscodeToStr utf8(text, "UTF-8");
    return std::string(reinterpret_cast<const char*>(utf8.str()), utf8.length());
  } catch (...) {
    return std::string();
  }
}

bool DescribeXMLException(std::exception_ptr e, std::string* message) noexcept {
  if (!e) return false;
  std::string text;
  try {
    try {
      std::rethrow_exception(e);
    } catch (const xc::SAXParseException& x) {
      text = Located(x);
    } catch (const xc::SAXException& x) {
      text = TranscodeToUTF8(x.getMessage());
    } catch (const xc::OutOfMemoryException&) {
      text = "out of memory while reading the XML document";
    } catch (const xc::XMLException& x) {
      text = TranscodeToUTF8(x.getMessage());
    } catch (const xc::DOMException& x) {
      text = "DOM error " + std::to_string(x.code) + ": " + TranscodeToUTF8(x.getMessage());
    }
  } catch (...) {
    // Not one of Xerces-C++'s exceptions (or building the text failed).
    return false;
  }
  if (message != nullptr) *message = std::move(text);
  return true;
}

// ---------------------------------------------------------------------------------------
// QZSafeDOMParser

struct QZSafeDOMParser::Guards {
  xc::SecurityManager security;
  RefusingResolver resolver;
  ThrowingErrorHandler errors;
};

QZSafeDOMParser::QZSafeDOMParser(unsigned maxElementDepth)
    : guards_(new Guards), maxDepth_(maxElementDepth) {
  guards_->security.setEntityExpansionLimit(kQZEntityExpansionLimit);
  ApplySafeSettings();
}

QZSafeDOMParser::~QZSafeDOMParser() = default;

void QZSafeDOMParser::ApplySafeSettings() {
  getScanner()->setDisallowDTD(true);
  setValidationScheme(Val_Never);
  setDoNamespaces(true);
  setDoSchema(false);
  setLoadSchema(false);
  setValidationSchemaFullChecking(false);
  setIdentityConstraintChecking(false);
  setHandleMultipleImports(false);
  setLoadExternalDTD(false);
  setSkipDTDValidation(true);
  setDisableDefaultEntityResolution(true);
  setCreateEntityReferenceNodes(false);
  setDoXInclude(false);
  useCachedGrammarInParse(false);
  cacheGrammarFromParse(false);
  setExitOnFirstFatalError(true);
  setSecurityManager(&guards_->security);
  setXMLEntityResolver(&guards_->resolver);
  setErrorHandler(&guards_->errors);
}

xc::DOMDocument* QZSafeDOMParser::ParseSafely(QZSafeDOMParser& parser, std::istream& in,
                                              std::string* error) noexcept {
  try {
    QZXInputSource source(in);
    return ParseSafely(parser, source, error);
  } catch (...) {
    if (error != nullptr) *error = "out of memory while preparing to read the document";
    return nullptr;
  }
}

xc::DOMDocument* QZSafeDOMParser::ParseSafely(QZSafeDOMParser& parser,
                                              const xc::InputSource& source,
                                              std::string* error) noexcept {
  std::string reason;
  try {
    parser.ApplySafeSettings();
    parser.parse(source);
    xc::DOMDocument* document = parser.getDocument();
    if (parser.getErrorCount() != 0) {
      reason = "the document has XML errors";
    } else if (document == nullptr || document->getDocumentElement() == nullptr) {
      reason = "the document has no root element";
    } else {
      return document;
    }
  } catch (const std::exception& e) {
    reason = e.what();
  } catch (...) {
    if (!DescribeXMLException(std::current_exception(), &reason)) {
      reason = "unexpected failure while reading the document";
    }
  }
  if (error != nullptr) {
    try {
      *error = std::move(reason);
    } catch (...) {
    }
  }
  return nullptr;
}

void QZSafeDOMParser::startDocument() {
  depth_ = 0;
  XercesDOMParser::startDocument();
}

void QZSafeDOMParser::startElement(const xc::XMLElementDecl& elemDecl,
                                   const unsigned int urlId, const XMLCh* const elemPrefix,
                                   const xc::RefVectorOf<xc::XMLAttr>& attrList,
                                   const XMLSize_t attrCount, const bool isEmpty,
                                   const bool isRoot) {
  const unsigned mine = ++depth_;
  if (mine > maxDepth_) ThrowRefusal(DepthMessage(maxDepth_), getScanner()->getLocator());
  const std::string problem = AttributeProblem(
      attrCount, [&attrList](XMLSize_t i) { return attrList.elementAt(i)->getValue(); });
  if (!problem.empty()) ThrowRefusal(problem, getScanner()->getLocator());
  XercesDOMParser::startElement(elemDecl, urlId, elemPrefix, attrList, attrCount, isEmpty,
                                isRoot);
  // An empty element gets no separate end event from the scanner; whether the base
  // reports one through endElement is its own affair, so count it up here if it did not.
  if (isEmpty && depth_ == mine) --depth_;
}

void QZSafeDOMParser::endElement(const xc::XMLElementDecl& elemDecl,
                                 const unsigned int urlId, const bool isRoot,
                                 const XMLCh* const elemPrefix) {
  XercesDOMParser::endElement(elemDecl, urlId, isRoot, elemPrefix);
  if (depth_ > 0) --depth_;
}

// ---------------------------------------------------------------------------------------
// QZSafeSAX2Handler

QZSafeSAX2Handler::QZSafeSAX2Handler(unsigned maxElementDepth) : maxDepth_(maxElementDepth) {
  security_.setEntityExpansionLimit(kQZEntityExpansionLimit);
}

QZSafeSAX2Handler::~QZSafeSAX2Handler() = default;

void QZSafeSAX2Handler::startDocument() { depth_ = 0; }

void QZSafeSAX2Handler::startElement(const XMLCh* const, const XMLCh* const,
                                     const XMLCh* const, const xc::Attributes& attrs) {
  EnterElement();
  const std::string problem =
      AttributeProblem(attrs.getLength(), [&attrs](XMLSize_t i) { return attrs.getValue(i); });
  if (!problem.empty()) Refuse(problem);
}

void QZSafeSAX2Handler::endElement(const XMLCh* const, const XMLCh* const,
                                   const XMLCh* const) {
  LeaveElement();
}

void QZSafeSAX2Handler::setDocumentLocator(const xc::Locator* const locator) {
  locator_ = locator;
}

void QZSafeSAX2Handler::endDocument() { locator_ = nullptr; }

void QZSafeSAX2Handler::startDTD(const XMLCh* const, const XMLCh* const,
                                 const XMLCh* const) {
  Refuse("a DOCTYPE is not allowed");
}

xc::InputSource* QZSafeSAX2Handler::resolveEntity(const XMLCh* const publicId,
                                                  const XMLCh* const systemId) {
  Refuse(EntityMessage(systemId, publicId));
}

void QZSafeSAX2Handler::error(const xc::SAXParseException& exc) { throw exc; }

void QZSafeSAX2Handler::fatalError(const xc::SAXParseException& exc) { throw exc; }

void QZSafeSAX2Handler::EnterElement() {
  if (depth_ >= maxDepth_) Refuse(DepthMessage(maxDepth_));
  ++depth_;
}

void QZSafeSAX2Handler::Refuse(const std::string& message) const {
  ThrowRefusal(message, locator_);
}

std::unique_ptr<xc::SAX2XMLReader> CreateSafeSAX2Reader(QZSafeSAX2Handler& handler) {
  std::unique_ptr<xc::SAX2XMLReader> reader(xc::XMLReaderFactory::createXMLReader());
  reader->setFeature(xc::XMLUni::fgSAX2CoreNameSpaces, true);
  reader->setFeature(xc::XMLUni::fgSAX2CoreValidation, false);
  reader->setFeature(xc::XMLUni::fgXercesDynamic, false);
  reader->setFeature(xc::XMLUni::fgXercesSchema, false);
  reader->setFeature(xc::XMLUni::fgXercesLoadSchema, false);
  reader->setFeature(xc::XMLUni::fgXercesSchemaFullChecking, false);
  reader->setFeature(xc::XMLUni::fgXercesLoadExternalDTD, false);
  reader->setFeature(xc::XMLUni::fgXercesDisableDefaultEntityResolution, true);
  reader->setFeature(xc::XMLUni::fgXercesUseCachedGrammarInParse, false);
  reader->setFeature(xc::XMLUni::fgXercesCacheGrammarFromParse, false);
  reader->setProperty(xc::XMLUni::fgXercesSecurityManager, handler.GetSecurityManager());
  reader->setContentHandler(&handler);
  reader->setLexicalHandler(&handler);
  reader->setErrorHandler(&handler);
  reader->setEntityResolver(&handler);
  reader->setDTDHandler(&handler);
  return reader;
}

}  // namespace QZXML_800

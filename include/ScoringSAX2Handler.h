// The base of the library's SAX2 handlers: a safe handler (no DOCTYPE, no external
// entities, bounded depth) that can echo what it reads as escaped UTF-8 text.
#ifndef QZSCORING_SCORING_SAX2_HANDLER_H_
#define QZSCORING_SCORING_SAX2_HANDLER_H_

#include <memory>
#include <string>

#include <xercesc/framework/XMLFormatter.hpp>
#include <xercesc/sax2/Attributes.hpp>

#include "QZSafeParser.h"
#include "QZScoringExport.h"
#include "ScoringTranscoder.h"

namespace QZScoring_800 {

// Character data reaches the formatter, which escapes it and hands the UTF-8 bytes to
// writeChars; the base drops them, a derived handler decides where they go. error
// and fatalError end a parse by throwing a HandlerState (XML_ERROR, XML_FATAL_ERROR);
// a derived handler may throw SCAN_DONE to end a parse early on success. Install it
// with QZXML_800::CreateSafeSAX2Reader. Needs Xerces-C++ initialised for its whole
// life. Not copyable; one parse at a time.
class QZSCORING_API ScoringSAX2Handler : public QZXML_800::QZSafeSAX2Handler,
                                         public xercesc::XMLFormatTarget {
 public:
  // Where a scan stands, and (thrown) how it ended. The thrown values share numbers
  // with states: 1 is both "inside PMML" and "the scan ended successfully".
  enum HandlerState : int {
    STATE_START = 0,                     // before the root element
    STATE_PMML = 1,                      // inside PMML, at top level
    STATE_HEADER = 2,                    // inside Header
    STATE_APPLICATION = 3,               // inside Application
    STATE_MINING_BUILD_TASK = 6,         // inside MiningBuildTask (echoed)
    STATE_AFTER_MINING_BUILD_TASK = 7,
    STATE_DATA_DICTIONARY = 8,           // inside DataDictionary (echoed)
    STATE_AFTER_DATA_DICTIONARY = 9,
    STATE_TRANSFORMATIONS = 10,          // inside TransformationDictionary (echoed)
    STATE_AFTER_TRANSFORMATIONS = 11,
    STATE_MODEL = 12,                    // inside the model element
    STATE_ADJUSTED_PROPENSITY = 13,      // inside the adjusted-propensity extension
    STATE_MINING_SCHEMA = 14,            // inside the model's mining schema
    STATE_DERIVED_INPUTS = 15,           // inside its derived-fields extension
    STATE_DERIVED_INPUTS_NESTED = 16,    // inside an extension nested in that one
    STATE_AFTER_MINING_SCHEMA = 18,
    STATE_OUTPUT = 19,                   // inside the model's Output
    STATE_END = 32,                      // after the PMML end tag
    STATE_HRZXML = 33,                   // a time-series XML document
    SCAN_DONE = 1,                       // thrown: the scan ended successfully
    XML_ERROR = 3,                       // thrown: the parser reported an error
    XML_FATAL_ERROR = 4                  // thrown: the parser reported a fatal error
  };

  // A handler in STATE_START whose attribute texts are transcoded to encoding (empty
  // means "UTF-8"; a name the transcoding service refuses falls back to UTF-8).
  // Throws only what Xerces-C++ throws when memory runs out.
  explicit ScoringSAX2Handler(const std::string& encoding);
  ~ScoringSAX2Handler() override;

  // Escapes "&", "<" and ">" and writes the text through the formatter.
  void characters(const XMLCh* const chars, const XMLSize_t length) override;
  // Count the element depth only.
  void startElement(const XMLCh* const uri, const XMLCh* const localname,
                    const XMLCh* const qname, const xercesc::Attributes& attrs) override;
  void endElement(const XMLCh* const uri, const XMLCh* const localname,
                  const XMLCh* const qname) override;
  // Do nothing.
  void ignorableWhitespace(const XMLCh* const chars, const XMLSize_t length) override;
  void processingInstruction(const XMLCh* const target, const XMLCh* const data) override;
  void warning(const xercesc::SAXParseException& exc) override;
  // Throw XML_ERROR and XML_FATAL_ERROR: the document is not usable.
  void error(const xercesc::SAXParseException& exc) override;
  void fatalError(const xercesc::SAXParseException& exc) override;
  // The formatter's output (UTF-8 bytes); dropped here.
  void writeChars(const XMLByte* const toWrite, const XMLSize_t count,
                  xercesc::XMLFormatter* const formatter) override;

  // text in the handler's encoding; empty for null.
  std::string ToString(const XMLCh* text) const;
  // The value of the attribute of that qualified name, or null when absent. Owned by
  // the parser, valid during the event.
  static const XMLCh* GetAttribute(const xercesc::Attributes& attrs, const XMLCh* name);
  static const XMLCh* GetAttribute(const xercesc::Attributes& attrs, const std::string& name);
  // Whether text equals name: without a transcoder by comparing with name in UTF-16
  // exactly, with one by comparing the transcoded text. A null text equals "".
  static bool IsEqual(const XMLCh* text, const std::string& name);
  static bool IsEqual(const ScoringTranscoder* transcoder, const XMLCh* text,
                      const std::string& name);

  // Where the handler stands.
  HandlerState GetState() const { return fState; }

 protected:
  void SetState(HandlerState state) { fState = state; }
  xercesc::XMLFormatter& GetFormatter() { return *fFormatter; }
  // Echoes a start tag: "<", the name, each attribute as name="value" (value with
  // attribute escapes), ">".
  void EchoStartTag(const XMLCh* qname, const xercesc::Attributes& attrs);
  // Echoes "</", the name, ">".
  void EchoEndTag(const XMLCh* qname);

 private:
  std::unique_ptr<ScoringTranscoder> fTranscoder;
  std::unique_ptr<xercesc::XMLFormatter> fFormatter;
  HandlerState fState;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_SAX2_HANDLER_H_

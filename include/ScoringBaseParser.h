// DOM navigation, attribute access, text conversion and strict number parsing: the
// small services every piece of PMML reading needs on top of a Xerces-C++ DOM tree.
#ifndef QZSCORING_SCORINGBASEPARSER_H_
#define QZSCORING_SCORINGBASEPARSER_H_

#include <memory>
#include <string>

#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/dom/DOMNode.hpp>
#include <xercesc/dom/DOMNodeList.hpp>

#include "QZScoringExport.h"
#include "ScoringTranscoder.h"

namespace QZScoring_800 {

// The base of the library's DOM-based PMML readers. Tag and attribute names are narrow
// strings (the constants of ScoringPMMLTags); DOM text is UTF-16. Tag comparison is
// exact and case-sensitive on the node name, namespace prefix included. The static
// operations keep no state and may run on any thread once Xerces-C++ is initialised;
// the instance operations use the parser's optional transcoder, one thread at a time.
// Not copyable: the parser is the sole owner of its transcoder.
class QZSCORING_API ScoringBaseParser {
 public:
  // No transcoder: text converts through Xerces-C++'s default (local code page).
  ScoringBaseParser();
  ScoringBaseParser(const ScoringBaseParser&) = delete;
  ScoringBaseParser& operator=(const ScoringBaseParser&) = delete;
  // Deletes the transcoder.
  virtual ~ScoringBaseParser();

  // --- Element navigation. A null node yields null; text and comment nodes are
  // skipped. Results are owned by the DOM.

  // The first child of `node` that is an element named `tag`; null if none.
  static xercesc::DOMElement* GetFirstChildElement(const xercesc::DOMNode* node,
                                                   const std::string& tag);
  // The first sibling after `node` that is an element named `tag`; null if none.
  static xercesc::DOMElement* GetNextSiblingElement(const xercesc::DOMNode* node,
                                                    const std::string& tag);
  // The first child / following sibling that is an element of any tag; null if none.
  static xercesc::DOMElement* GetFirstChildElement(const xercesc::DOMNode* node);
  static xercesc::DOMElement* GetNextSiblingElement(const xercesc::DOMNode* node);
  // `node` itself when it is an element (named `tag`); else null.
  static xercesc::DOMElement* AsElement(const xercesc::DOMNode* node, const std::string& tag);
  static xercesc::DOMElement* AsElement(const xercesc::DOMNode* node);
  // True when the element's node name equals `tag`; false for a null element.
  static bool TagNameEquals(const xercesc::DOMElement* element, const std::string& tag);
  // Every descendant element named `tag`, at any depth, in document order. The list is
  // owned by the DOM; null for a null element or document.
  static xercesc::DOMNodeList* GetElementsByTagName(const xercesc::DOMElement* element,
                                                    const std::string& tag);
  static xercesc::DOMNodeList* GetElementsByTagName(const xercesc::DOMDocument* document,
                                                    const std::string& tag);

  // --- Attributes.

  // The value of the attribute `name`, owned by the DOM; null when the element is null
  // or has no such attribute. A present but empty attribute gives an empty string.
  static const XMLCh* GetAttribute(const xercesc::DOMElement* element, const std::string& name);
  // As above when `node` is an element; null for any other node.
  static const XMLCh* GetAttribute(const xercesc::DOMNode* node, const std::string& name);
  // -1 when the attribute is absent (out untouched); 0 when ParseInt / ParseDouble
  // accepts it (out set); 1 when it is present but not a valid number (out untouched).
  static int GetIntAttribute(const xercesc::DOMElement* element, const std::string& name,
                             int& out);
  static int GetDoubleAttribute(const xercesc::DOMElement* element, const std::string& name,
                                double& out);

  // --- Text comparison and conversion.

  // True when `text` equals `s` converted by Xerces-C++'s default transcoder, code unit
  // by code unit. A null text counts as empty.
  static bool IsEqual(const XMLCh* text, const std::string& s);
  // With a transcoder: `text` converted by it equals `s` byte by byte. Without one: as
  // IsEqual.
  bool IsEqualEx(const XMLCh* text, const std::string& s) const;
  // `text` as a narrow string: through the transcoder when one is set, else through
  // Xerces-C++'s default transcoding to the local code page. Null gives "". Text that
  // cannot be converted ends the result early. Never throws.
  std::string ToString(const XMLCh* text) const;
  // Replaces the transcoder with a new one for `encoding` ("" means "UTF-8"). The new
  // transcoder stays even when the encoding is refused; ToString then yields "".
  // Needs Xerces-C++ initialised.
  void CreateTranscoder(const std::string& encoding);
  // Deletes the transcoder (conversions fall back to the default transcoding).
  void FreeTranscoder();
  // The transcoder, owned by the parser; null when none is set.
  const ScoringTranscoder* GetTranscoder() const;

  // --- Strict number parsing. Parse* never throw; Verify* throw ScoringException
  // code 3 with "Invalid integer string -- " or "Invalid double string -- " followed by
  // the rejected text.

  // True with out set when `text` is an optionally signed run of decimal digits (no
  // blanks, point or exponent) within the 32-bit int range; false, out untouched,
  // otherwise. The UTF-16 form accepts the same texts.
  static bool ParseInt(const XMLCh* text, int& out);
  static bool ParseInt(const std::string& text, int& out);
  static int VerifyInt(const XMLCh* text);
  static int VerifyInt(const std::string& text);
  // True with out set when `text` is a plain decimal real: digits, at most one '.',
  // an optional exponent letter ('e' or 'E') with its own sign; no blanks, infinity,
  // NaN or hexadecimal forms. False, out untouched, otherwise.
  static bool ParseDouble(const XMLCh* text, double& out);
  static bool ParseDouble(const std::string& text, double& out);
  static double VerifyDouble(const XMLCh* text);
  static double VerifyDouble(const std::string& text);

 private:
  std::unique_ptr<ScoringTranscoder> fTranscoder;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGBASEPARSER_H_

// The SAX2 handler of the model-attribute scan.
#ifndef QZSCORING_SCORING_PMML_SAX2_HANDLER_H_
#define QZSCORING_SCORING_PMML_SAX2_HANDLER_H_

#include <sstream>
#include <string>
#include <vector>

#include "QZScoringExport.h"
#include "ScoringModelAttr.h"
#include "ScoringSAX2Handler.h"

namespace QZScoring_800 {

// Fills an attribute record from a PMML document while it is parsed: version,
// application, data and derived field names, the model element (the first element
// named in the model-names list after the data dictionary) with its names, the model's
// own mining schema, output fields, "modelID" and adjusted-propensity extensions and
// segmentation method (direct children of the model element only, never those of
// sub-models), the skeleton document and the adjusted-propensity capture. Throws
// SCAN_DONE at the PMML end tag, or at once for an "HRZXML" root. The model names and
// the record are not owned and must outlive the handler. Not copyable.
class QZSCORING_API ScoringPMMLSAX2Handler : public ScoringSAX2Handler {
 public:
  // A handler filling record, recognising the model elements named in modelNames (in
  // list order), with attribute texts transcoded to encoding. Throws only what
  // Xerces-C++ throws when memory runs out.
  ScoringPMMLSAX2Handler(const std::string& encoding, const std::vector<std::string>& modelNames,
                         ScoringModelAttr& record);
  ~ScoringPMMLSAX2Handler() override;

  // The scan's state machine; each throws SCAN_DONE when the scan is complete.
  void startElement(const XMLCh* const uri, const XMLCh* const localname,
                    const XMLCh* const qname, const xercesc::Attributes& attrs) override;
  void endElement(const XMLCh* const uri, const XMLCh* const localname,
                  const XMLCh* const qname) override;
  // Formats text only where it is kept (the skeleton's sections and the capture); text
  // anywhere else costs a state check.
  void characters(const XMLCh* const chars, const XMLSize_t length) override;
  // Appends the bytes to the skeleton stream (inside PMML before the model, and in the
  // mining build task, data and transformation dictionaries) or to the capture stream
  // (inside the adjusted-propensity extension); drops them elsewhere.
  void writeChars(const XMLByte* const toWrite, const XMLSize_t count,
                  xercesc::XMLFormatter* const formatter) override;

 private:
  // Whether character data is kept in the current state.
  bool IsEchoing() const;
  // Whether the element is one of this library's own extensions.
  bool IsOwnExtension(const xercesc::Attributes& attrs) const;
  // Makes the element the model element when the model-names list names it.
  void MatchModelElement(const XMLCh* qname, const xercesc::Attributes& attrs);
  // The rules for the model element's direct children.
  void StartModelChild(const XMLCh* qname, const xercesc::Attributes& attrs);
  void AddMiningField(const xercesc::Attributes& attrs);
  void AddOutputField(const xercesc::Attributes& attrs);
  // The attribute's value in the handler's encoding; empty when absent.
  std::string Attribute(const xercesc::Attributes& attrs, const XMLCh* name) const;

  std::string fModelElement;
  const std::vector<std::string>& fModelNames;
  std::vector<std::u16string> fWideModelNames;  // the model names in UTF-16
  ScoringModelAttr& fRecord;
  std::stringstream* fCapture;  // the record's adjusted-propensity stream while captured
  unsigned fSectionDepth;       // depth of the top-level section being read
  unsigned fModelDepth;         // depth of the model element; 0 outside it
  unsigned fCaptureDepth;       // depth of the captured extension
  unsigned fDerivedDepth;       // depth of the mining schema's derived-fields extension
  bool fHasSegmentation;        // the model's segmentation method was read
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_PMML_SAX2_HANDLER_H_

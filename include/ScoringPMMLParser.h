// The library's DOM-based PMML reader: the Xerces-C++ life cycle it manages, its status,
// and the data dictionary as a variable list.
#ifndef QZSCORING_SCORINGPMMLPARSER_H_
#define QZSCORING_SCORINGPMMLPARSER_H_

#include <istream>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/dom/DOMNode.hpp>

#include "QZScoringExport.h"
#include "QZStatus.h"
#include "QZSettings.h"
#include "QZVarList.h"
#include "ScoringBaseParser.h"
#include "Value.h"

namespace QZXML_800 {
class QZSafeDOMParser;
}

namespace QZScoring_800 {

class ScoringCompoundPredicate;
class ScoringDiscreteSplit;
class ScoringScaleSplit;
class ScoringSetPredicate;
class ScoringSimplePredicate;

// Reads PMML for the library and its plug-ins. Each parser initialises Xerces-C++ at
// most once (under the process lock) and terminates it exactly as often in its
// destructor, so any number of parsers may live at once beside other users of
// Xerces-C++. Its operations never throw: failures are status codes (103 to 111) kept
// in the parser's status, with Xerces-C++'s text in the Xerces message. DOM elements
// from a stream read stay valid until the next stream read or the parser's
// destruction. One thread at a time per parser.
class QZSCORING_API ScoringPMMLParser : public ScoringBaseParser {
 public:
  // No transcoder, empty encoding, status OK; Xerces-C++ is initialised on first use.
  ScoringPMMLParser();
  // Initialises Xerces-C++ at once (status 103 when it refuses), then converts every
  // attribute text through a transcoder for `encoding` ("" means "UTF-8").
  explicit ScoringPMMLParser(const std::string& encoding);
  ScoringPMMLParser(const ScoringPMMLParser&) = delete;
  ScoringPMMLParser& operator=(const ScoringPMMLParser&) = delete;
  // Deletes the transcoder, the DOM parser and every document it parsed, then
  // terminates Xerces-C++ once when this parser initialised it. Never throws.
  ~ScoringPMMLParser() override;

  // Appends a variable (role 0) for every DataField of a DataDictionary, or every
  // DerivedField of a TransformationDictionary or LocalTransformations, under
  // `element` (a null element adds nothing). Returns the parser's status unchanged when
  // it is an error, else OK, 108 (a field without name or optype), 109 (unknown
  // dataType, or an Interval margin that is no number) or 111 (the list refused a
  // variable); 104 only when reading fails unexpectedly (out of memory). Variables
  // added before an error stay. Never stores into the status.
  virtual QZCommon_800::QZStatus FillVarList(QZXML_800::QZVarList& vars,
                                             xercesc::DOMElement* element);
  // Parses the whole document from the stream and appends the fields of its
  // DataDictionary, then of its TransformationDictionary (root "PMML"), or of the root
  // itself when it is one of those or LocalTransformations. The result becomes the
  // parser's status: 103 when Xerces-C++ cannot be initialised, 104 when the text does
  // not parse (malformed, a DOCTYPE, nested too deep; the Xerces message tells why),
  // 105 for another root, else as the element form.
  virtual QZCommon_800::QZStatus FillVarList(QZXML_800::QZVarList& vars, std::istream& pmml);

  // Adds one setting per Parameter child of element: its "value" text, or a
  // QZVecValue<std::string> of the texts of its ListValue. Returns the parser's status
  // when it is an error, else OK or 108 (a Parameter without "name"); never stores into
  // the status.
  virtual QZCommon_800::QZStatus FillSettings(QZXML_800::QZSettings& settings,
                                              xercesc::DOMElement* element);

  // Value and category helpers: questions about variables of a filled variable list.
  // All are safe on null variables (empty results, false), keep no state, never throw.
  static std::vector<const QZXML_800::IQZVariable*> GetTargetVars(
      const QZXML_800::QZVarList& vars);
  static std::vector<QZCommon_800::Value> GetValues(const QZXML_800::IQZVariable* variable);
  static std::vector<std::pair<QZCommon_800::Value, std::string>> GetValueLabels(
      const QZXML_800::IQZVariable* variable);
  static bool IsValidCatValue(const QZXML_800::IQZVariable* variable,
                              const QZCommon_800::Value& value);
  static bool IsValidValue(const QZXML_800::IQZVariable* variable, const std::string& text);
  static bool IsValidValue(const QZXML_800::IQZVariable* variable,
                           const QZCommon_800::Value& value);
  static bool IsMissingValue(const QZXML_800::IQZVariable* variable,
                             const QZCommon_800::Value& value);
  static bool IsFlagVariable(const QZXML_800::IQZVariable* variable);

  // Predicate parsing: node is a CompoundPredicate, SimplePredicate or
  // SimpleSetPredicate element whose fields are looked up in vars. Each returns a new
  // predicate owned by the caller (ParseSetPredicate: null for a field that is not
  // categorical) or throws ScoringException, leaving nothing allocated.
  ScoringCompoundPredicate* ParseCompoundPredicate(xercesc::DOMNode* node,
                                                   const QZXML_800::QZVarList& vars);
  ScoringSimplePredicate* ParsePredicate(xercesc::DOMNode* node,
                                         const QZXML_800::QZVarList& vars);
  ScoringSetPredicate* ParseSetPredicate(xercesc::DOMNode* node,
                                         const QZXML_800::QZVarList& vars);

  // A copy of the parser's status.
  QZCommon_800::QZStatus GetStatus() const;
  // The text of the last Xerces-C++ failure met by this parser ("" when none).
  std::string GetXercesMessage() const;
  // Initialises Xerces-C++ and creates the DOM parser, once per parser. Returns the
  // status unchanged when it is an error or the DOM parser already exists; else OK,
  // or 103 with the Xerces message set when Xerces-C++ refuses.
  QZCommon_800::QZStatus InitXerces();

 protected:
  // The encoding name given to the constructor ("" for the default constructor).
  const std::string& GetEncoding() const { return fEncoding; }

  // Reads the bins of the Discretize of the DerivedField (a direct child of dictionary)
  // that discretizes field: bounds gets the first interval's lower margin then each
  // interval's upper margin, binValues each bin's value. False (both empty) when no
  // derived field discretizes field.
  bool SetBinsFrTransDict(xercesc::DOMElement* dictionary, const std::string& field,
                          std::vector<double>& bounds,
                          std::vector<std::string>& binValues) const;

 private:
  // Split parsing for the predicate parsers; each throws ScoringException on failure
  // and leaves nothing allocated.
  ScoringDiscreteSplit* HandleNodeDiscreteSplit(xercesc::DOMNode* node,
                                                const QZXML_800::IQZVariable* variable);
  ScoringScaleSplit* HandleNodeScaleSplit(xercesc::DOMNode* node,
                                          const QZXML_800::IQZVariable* variable);
  ScoringDiscreteSplit* HandleArrayDiscreteSplit(xercesc::DOMNode* node,
                                                 const QZXML_800::IQZVariable* variable);
  void SetDiscreteSplitValue(const QZXML_800::IQZVariable* variable,
                             ScoringDiscreteSplit* split, const XMLCh* value, int childIndex);
  int HandleOrdinalVariable(xercesc::DOMElement* element,
                            const QZXML_800::IQZVariable* variable, int& low, int& high);
  int GetIndexOfOrdinalValue(const std::string& text, const QZXML_800::IQZVariable* variable);
  void GetScaleSplitValue(const XMLCh* value, const XMLCh* op, double& low, double& high,
                          bool& included);
  std::vector<std::string> Remove(const QZXML_800::IQZVariable* variable,
                                  std::vector<std::string> texts);
  xercesc::DOMNode* GetArrayNode(xercesc::DOMNode* node);
  std::vector<std::string> GetArrayElements(xercesc::DOMNode* arrayNode, const XMLCh* type);

  // Appends the variable of one DataField or DerivedField; returns its status.
  QZCommon_800::QZStatus AddField(QZXML_800::QZVarList& vars,
                                  const xercesc::DOMElement* field) const;

  QZCommon_800::QZStatus fStatus;
  std::unique_ptr<QZXML_800::QZSafeDOMParser> fParser;
  std::string fXercesMessage;
  std::string fEncoding;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGPMMLPARSER_H_

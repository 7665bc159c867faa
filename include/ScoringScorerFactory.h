// The registry of scorer plug-ins and the dispatcher that turns a PMML model document
// into a scorer.
#ifndef QZSCORING_SCORING_SCORER_FACTORY_H_
#define QZSCORING_SCORING_SCORER_FACTORY_H_

#include <istream>
#include <map>
#include <string>
#include <vector>

#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/parsers/XercesDOMParser.hpp>

#include "IQZScore.h"
#include "QZScoringConst.h"
#include "QZScoringExport.h"
#include "QZSettings.h"
#include "QZStatus.h"
#include "QZVarList.h"

namespace QZTransformNS_8_0_0 {
class QZTransformation;
}

namespace QZScoring_800 {

class ScoringModelAttr;
class ScoringPredicate;

// All operations are static and keep no state; they work only on what they are given
// and may run on any thread. The registry lives in the caller's settings:
//   "scoringDll"  nested settings: model element name -> plug-in base name;
//   "modelDll"    nested settings whose entry names are the model element names.
// A plug-in with base name B is the library file B800r.dll, found by the dynamic
// loader's search rules (LD_LIBRARY_PATH, then the folder of the scoring library).
class QZSCORING_API ScoringScorerFactory {
 public:
  ScoringScorerFactory() = delete;

  // Clears names and fills it from "scoringDll" (entry name -> its text value; empty
  // when an entry is not a text). 260006 when "scoringDll" is absent or not nested
  // settings.
  static QZCommon_800::QZStatus GetScoringNames(std::map<std::string, std::string>& names,
                                                const QZXML_800::QZSettings& settings);

  // Clears names and fills it with the entry names of "modelDll", in settings order.
  // 260005 when "modelDll" is absent or not nested settings.
  static QZCommon_800::QZStatus GetModelNames(std::vector<std::string>& names,
                                              const QZXML_800::QZSettings& settings);

  // The model type of a model element name; exact, case-sensitive; MODEL_UNKNOWN for
  // any other name.
  static QZScoringConst::ModelType GetModelType(const std::string& elementName);

  // The dispatcher: picks the plug-in for "scoring_modelType" (or the "Veritor" entry
  // when the type has no entry or "scoring_version" is neither "versionSupported",
  // default "4.0", nor "4.1"), offers it the stream, then (when that gives null or
  // throws) the parsed model element.
  // Returns a new scorer owned by the caller, or null when none could be obtained.
  static QZCommon_800::IQZScore* GetScorer(QZXML_800::QZSettings& settings,
                                           QZXML_800::QZVarList& variables,
                                           std::istream& pmml);

  // One attempt through the stream with the plug-in of that base name. Null when the
  // name is empty, the library or its entry point is missing, or the plug-in offers no
  // parser or no scorer (a plug-in's exception counts as no scorer).
  static QZCommon_800::IQZScore* GetScorer(const std::string& baseName,
                                           QZXML_800::QZSettings& settings,
                                           QZXML_800::QZVarList& variables,
                                           std::istream& pmml);

  // One attempt through a parsed model element; otherwise as the stream form.
  static QZCommon_800::IQZScore* GetScorer(const std::string& baseName,
                                           QZXML_800::QZSettings& settings,
                                           QZXML_800::QZVarList& variables,
                                           xercesc::DOMDocument* document,
                                           xercesc::DOMElement* element);

  // Rewinds the stream (unless its bad bit is set), parses it with parser and finds the
  // first element named by modelNames (tried in list order) under a "PMML" root. On
  // success document and element are set; the document stays owned by the parser.
  // 260010 (document null) when the stream does not parse or holds no such element.
  // Parse failures are never thrown.
  static QZCommon_800::QZStatus GetDOMDocument(const std::vector<std::string>& modelNames,
                                               std::istream& pmml,
                                               xercesc::XercesDOMParser* parser,
                                               xercesc::DOMDocument*& document,
                                               xercesc::DOMElement*& element);

  // Scans a PMML (or time-series XML) document once, without building a tree, into
  // record: model type, version, names, target, active and derived-input fields, output
  // fields, the skeleton document and the adjusted-propensity extension. record must
  // point to a record owned by the caller. OK when a complete document of a known kind
  // was recognised; 260007 (flag set) otherwise, with the record keeping what was read.
  static QZCommon_800::QZStatus GetModelAttr(std::istream& pmml,
                                             const std::vector<std::string>& modelNames,
                                             ScoringModelAttr*& record,
                                             const std::string& encoding);

  // Fills variables from the record's skeleton document and gives them the roles of
  // the model's mining schema. OK for a null record or an unusable skeleton stream
  // (nothing filled); a data-dictionary failure passes its code on with the flag set.
  static QZCommon_800::QZStatus ParseVarList(QZXML_800::QZVarList& variables,
                                             ScoringModelAttr*& record);

  // A new transformation engine loaded with the skeleton's transformations, owned by
  // the caller; null for a null record or when the engine refuses them.
  static QZTransformNS_8_0_0::QZTransformation* GetTransformation(ScoringModelAttr*& record);

  // Builds a predicate from a stand-alone predicate document (root CompoundPredicate,
  // SimplePredicate, SimpleSetPredicate, True or False) over the fields of variables,
  // reading texts with the settings' "encoding". A new predicate owned by the caller, or
  // null for any failure; never throws.
  static ScoringPredicate* GetPredicate(QZXML_800::QZSettings& settings,
                                        QZXML_800::QZVarList& variables, std::istream& pmml);
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_SCORER_FACTORY_H_

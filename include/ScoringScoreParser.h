// The plug-in contract: what a scorer plug-in library hands to the scoring library.
#ifndef QZSCORING_SCORING_SCORE_PARSER_H_
#define QZSCORING_SCORING_SCORE_PARSER_H_

#include <istream>

#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>

#include "IQZScore.h"
#include "QZScoringExport.h"
#include "QZSettings.h"
#include "QZVarList.h"

// Marks a plug-in's entry point as exported from the plug-in library:
//   QZSCORING_PLUGIN_EXPORT QZScoring_800::ScoringScoreParser* GetScoreParser() {...}
#if defined(_WIN32)
#  define QZSCORING_PLUGIN_EXPORT extern "C" __declspec(dllexport)
#else
#  define QZSCORING_PLUGIN_EXPORT extern "C" __attribute__((visibility("default")))
#endif

namespace QZScoring_800 {

// A plug-in's score parser turns one PMML model document into a scorer. A plug-in
// library exports
//     extern "C" QZScoring_800::ScoringScoreParser* GetScoreParser();
// which returns a new parser (or null when it offers none); the library deletes the
// parser right after use. The library first offers the document as a stream; when that
// gives null, it parses the document and offers the model element. Each operation
// returns a new scorer owned by the caller, or null when the plug-in cannot score the
// document; an exception thrown by the entry point or the parser counts as null. The
// slot order (destructor, CreateFromElement, CreateFromStream) is part of the contract.
class QZSCORING_API ScoringScoreParser {
 public:
  virtual ~ScoringScoreParser();

  // document and element belong to the caller and live until this call returns.
  virtual QZCommon_800::IQZScore* CreateFromElement(QZXML_800::QZSettings& settings,
                                                    QZXML_800::QZVarList& variables,
                                                    xercesc::DOMDocument* document,
                                                    xercesc::DOMElement* element) = 0;

  // pmml is positioned at the start of the document; the plug-in may consume it.
  virtual QZCommon_800::IQZScore* CreateFromStream(QZXML_800::QZSettings& settings,
                                                   QZXML_800::QZVarList& variables,
                                                   std::istream& pmml) = 0;
};

// The type of a plug-in's entry point, resolved by the name "GetScoreParser".
typedef ScoringScoreParser* (*GetScoreParserFunction)();

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_SCORE_PARSER_H_

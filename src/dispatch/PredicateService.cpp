// The predicate service: a stand-alone PMML predicate document to a predicate object.

#include <istream>
#include <memory>
#include <string>

#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>

#include "QZSafeParser.h"
#include "QZScoringTags.h"
#include "ScoringCompoundPredicate.h"
#include "ScoringFalsePredicate.h"
#include "ScoringPMMLParser.h"
#include "ScoringPMMLTags.h"
#include "ScoringScorerFactory.h"
#include "ScoringSetPredicate.h"
#include "ScoringSimplePredicate.h"
#include "ScoringTruePredicate.h"

using QZXML_800::QZSettings;
using QZXML_800::QZVarList;

namespace QZScoring_800 {

ScoringPredicate* ScoringScorerFactory::GetPredicate(QZSettings& settings, QZVarList& variables,
                                                     std::istream& pmml) {
  using Tags = ScoringPMMLTags;
  try {
    std::string encoding;
    if (!settings.GetSettingValByName(QZScoringTags::SCORING_ATT_ENCODING, encoding)) {
      encoding = "UTF-8";
    }
    // The PMML parser keeps Xerces-C++ initialised; the DOM parser, declared after it,
    // is destroyed (with its document) before that ends.
    ScoringPMMLParser parser(encoding);
    if (parser.GetStatus().IsError()) return nullptr;
    QZXML_800::QZSafeDOMParser domParser;
    if (!pmml.bad()) {
      pmml.clear();
      pmml.seekg(0);
    }
    xercesc::DOMDocument* document =
        QZXML_800::QZSafeDOMParser::ParseSafely(domParser, pmml, nullptr);
    xercesc::DOMElement* root = document != nullptr ? document->getDocumentElement() : nullptr;
    if (root == nullptr) return nullptr;

    std::unique_ptr<ScoringPredicate> predicate;
    if (ScoringBaseParser::TagNameEquals(root, Tags::PMML_ELE_COMPOUND_PREDICATE)) {
      predicate.reset(parser.ParseCompoundPredicate(root, variables));
    } else if (ScoringBaseParser::TagNameEquals(root, Tags::PMML_ELE_SIMPLE_PREDICATE)) {
      predicate.reset(parser.ParsePredicate(root, variables));
    } else if (ScoringBaseParser::TagNameEquals(root, Tags::PMML_ELE_SIMPLE_SET_PREDICATE)) {
      predicate.reset(parser.ParseSetPredicate(root, variables));
    } else if (ScoringBaseParser::TagNameEquals(root, Tags::PMML_ELE_TRUE)) {
      predicate = std::make_unique<ScoringTruePredicate>();
    } else if (ScoringBaseParser::TagNameEquals(root, Tags::PMML_ELE_FALSE)) {
      predicate = std::make_unique<ScoringFalsePredicate>();
    }
    // Any other root is no predicate ("PREDICATE is required!"): null, like every
    // other failure.
    return predicate.release();
  } catch (...) {
    // ScoringException from the parsers, Xerces-C++ DOM failures, memory exhaustion:
    // whatever was built has been released on the way out.
    return nullptr;
  }
}

}  // namespace QZScoring_800

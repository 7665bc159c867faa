// The model-attribute scan: one SAX2 pass over a model document into an attribute
// record, without building a tree.

#include <memory>

#include <xercesc/sax2/SAX2XMLReader.hpp>
#include <xercesc/util/XMLUni.hpp>

#include "QZSafeParser.h"
#include "QZXInputSource.h"
#include "ScoringModelAttr.h"
#include "ScoringPMMLSAX2Handler.h"
#include "ScoringScorerFactory.h"
#include "ScoringStatusCodes.h"
#include "TraceLog.h"

using QZCommon_800::QZStatus;

namespace QZScoring_800 {

namespace {

// Parses the document with the scan's handler. True when the handler ended the parse
// with SCAN_DONE; false for everything else a parse can end with: a parse that runs to
// the end without the PMML end tag, an error or fatal error, a refused DOCTYPE, external
// entity or nesting depth, a failing input stream, and memory exhaustion.
bool Scan(std::istream& pmml, const std::vector<std::string>& modelNames,
          ScoringModelAttr& record, const std::string& encoding) {
  try {
    ScoringPMMLSAX2Handler handler(encoding, modelNames, record);
    std::unique_ptr<xercesc::SAX2XMLReader> reader = QZXML_800::CreateSafeSAX2Reader(handler);
    // Namespace declarations are reported as attributes, so that an echoed element
    // whose name carries a prefix keeps the declaration that binds it.
    reader->setFeature(xercesc::XMLUni::fgSAX2CoreNameSpacePrefixes, true);
    QZXML_800::QZXInputSource source(pmml);
    try {
      reader->parse(source);
    } catch (ScoringSAX2Handler::HandlerState state) {
      return state == ScoringSAX2Handler::SCAN_DONE;
    }
    return false;
  } catch (...) {
    std::string message;
    if (QZXML_800::DescribeXMLException(std::current_exception(), &message)) {
      TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s",
               "QZScoring_800::ScoringScorerFactory::GetModelAttr", message.c_str());
    }
    return false;
  }
}

}  // namespace

QZStatus ScoringScorerFactory::GetModelAttr(std::istream& pmml,
                                            const std::vector<std::string>& modelNames,
                                            ScoringModelAttr*& record,
                                            const std::string& encoding) {
  QZStatus status(SCORING_SCAN_INCOMPLETE, true);
  if (record != nullptr && Scan(pmml, modelNames, *record, encoding)) status = QZStatus();
  return status;
}

}  // namespace QZScoring_800

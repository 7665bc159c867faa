// The status codes the scoring library reports in a QZStatus. Zero means success;
// every code below is an error. The library attaches no text to them.
#ifndef QZSCORING_SCORINGSTATUSCODES_H_
#define QZSCORING_SCORINGSTATUSCODES_H_

namespace QZScoring_800 {

// Reading PMML (data dictionary, settings).
constexpr long SCORING_XERCES_INIT_FAILED = 103;      // Xerces-C++ refused to initialise
constexpr long SCORING_PMML_PARSE_FAILED = 104;       // the stream did not parse into a document
constexpr long SCORING_PMML_INVALID_ROOT = 105;       // no document element, or a root tag not accepted
constexpr long SCORING_PMML_MISSING_ATTRIBUTE = 108;  // a field or parameter lacks a required attribute
constexpr long SCORING_PMML_INVALID_FIELD_TYPE = 109;  // unknown data type, or an interval margin that is no number
constexpr long SCORING_PMML_VARIABLE_REJECTED = 111;  // the variable list refused a variable

// Model creation, dispatch and scoring.
constexpr long SCORING_MODEL_ALREADY_HELD = 260002;     // the factory holds a model; Detach it first
constexpr long SCORING_INVALID_PMML_FILES = 260003;     // "scoring_pmmlFiles" empty, or several files without "scoring_modelIDs"
constexpr long SCORING_FILE_OPEN_FAILED = 260004;       // the PMML file cannot be opened
constexpr long SCORING_NO_MODEL_DLL_SETTINGS = 260005;  // no nested settings "modelDll"
constexpr long SCORING_NO_SCORING_DLL_SETTINGS = 260006;  // no nested settings "scoringDll"
constexpr long SCORING_SCAN_INCOMPLETE = 260007;        // the scan found no complete document of a known kind
constexpr long SCORING_NO_SCORER = 260009;              // no scorer or sub-model, or no sub-model matches the split key
constexpr long SCORING_SCORER_UNAVAILABLE = 260010;     // no scorer obtained, or no model element of a known name
constexpr long SCORING_NOT_SUPPORTED = 260016;          // operation not supported by this scorer, or network not read
constexpr long SCORING_NO_RAW_PROPENSITY = 260017;      // the raw propensity cannot be computed from the output record
constexpr long SCORING_NETWORK_SIZE_MISMATCH = 260023;  // network weight and bias arrays differ in length
constexpr long SCORING_SPLIT_FIELD_MISSING = 260027;    // a split field is not a field of the input record
constexpr long SCORING_NO_MODEL_IDS = 260028;           // no "scoring_modelIDs" and not exactly one stream
constexpr long SCORING_SCORER_EXCEPTION = 260029;       // the model's scorer (a plug-in) threw from Score or Scorable
// An operation a host called failed unexpectedly inside the library itself (an
// exception such as memory exhaustion); nothing of it escapes to the host.
constexpr long SCORING_INTERNAL_ERROR = 260099;

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGSTATUSCODES_H_

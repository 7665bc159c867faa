// The vocabulary of setting names and values that hosts, the library and plug-ins
// share. Each constant holds its exact text.
#ifndef QZSCORING_QZSCORING_TAGS_H_
#define QZSCORING_QZSCORING_TAGS_H_

namespace QZScoring_800 {

class QZScoringTags {
 public:
  QZScoringTags() = delete;

  // The "extender" of this library's own PMML extensions (the adjusted-propensity
  // network, the model ID and the mining schema's derived fields).
  static constexpr char SCORING_EXTENDER[] = "qzscoring";

  static constexpr char QZ_VAL_TRUE[] = "true";
  static constexpr char QZ_VAL_FALSE[] = "false";
  static constexpr char SCORING_ATT_MISSINGVALUEPOLICY[] = "missingValuePolicy";
  static constexpr char SCORING_ATT_MAXPREDICTIONS[] = "maxPredictions";
  static constexpr char SCORING_ATT_MAXCATEGORIES[] = "maxCategories";
  static constexpr char SCORING_ATT_SCOREVALUE[] = "scoreValue";
  static constexpr char SCORING_ATT_ENCODING[] = "encoding";
  static constexpr char SCORING_ATT_SCORINGDLL[] = "scoringDll";
  static constexpr char SCORING_ATT_MODELDLL[] = "modelDll";
  static constexpr char SCORING_ATT_VERSIONSUPPORTED[] = "versionSupported";
  static constexpr char SCORING_ATT_ISOUTPUTINPUTDATA[] = "isOutputInputData";
  static constexpr char SCORING_ATT_ISOUTPUTALL[] = "isOutputAll";
  static constexpr char SCORING_ATT_ISPREDICTION[] = "isPrediction";
  static constexpr char SCORING_ATT_ISPROBABILITY[] = "isProbability";
  static constexpr char SCORING_ATT_ISPROBABILITYCATEOGRY[] = "isProbabilityCategory";
  static constexpr char SCORING_ATT_ISCONFIDENCE[] = "isConfidence";
  static constexpr char SCORING_ATT_ISSTDDEV[] = "isStandardDeviation";
  static constexpr char SCORING_ATT_ISPROPENSITY[] = "isPropensity";
  static constexpr char SCORING_ATT_ISRAWPROPENSITY[] = "isRawPropensity";
  static constexpr char SCORING_ATT_ISNODEID[] = "isNodeID";
  static constexpr char SCORING_ATT_ISCUMHAZARD[] = "isCumHazard";
  static constexpr char SCORING_ATT_ISNEIGHBOR[] = "isNeighbor";
  static constexpr char SCORING_ATT_ISDISTANCE[] = "isDistance";
  static constexpr char SCORING_ATT_ISCASELABEL[] = "isCaseLabel";
  static constexpr char SCORING_ATT_ISRULEID[] = "isRuleID";
  static constexpr char SCORING_ATT_ISKOHONENX[] = "isKohonenX";
  static constexpr char SCORING_ATT_ISKOHONENY[] = "isKohonenY";
  static constexpr char SCORING_ATT_ISSTANDARDDEVIATIONREQUIRED[] = "isStandardDeviationRequired";
  static constexpr char SCORING_ATT_ISOTHERS[] = "isOthers";
  static constexpr char SCORING_ATT_ISENSEMBLE[] = "isEnsemble";
  static constexpr char SCORING_ATT_ISBASEMODELS[] = "isBaseModels";
  static constexpr char SCORING_ATT_ISREFERENCEMODEL[] = "isReferenceModel";
  static constexpr char SCORING_ATT_MODELID[] = "modelID";
  static constexpr char SCORING_ATT_RESULTTYPE[] = "resultType";
  static constexpr char SCORING_ATT_NAMEPATTERN[] = "namePattern";
  static constexpr char SCORING_ATT_RESOLVENAMECONFLICT[] = "resolveNameConflict";
  static constexpr char SCORING_ATT_NAMELIST[] = "nameList";
  static constexpr char SCORING_ATT_LABELPATTERN[] = "labelPattern";
  static constexpr char SCORING_ATT_USENAMELIST[] = "useNameList";
  static constexpr char SCORING_ATT_ENABLESQL[] = "enableSQL";
  static constexpr char SCORING_ATT_CONFIDENCEBASEDON[] = "confidenceBasedOn";
  static constexpr char SCORING_VAL_ONPROBABILITY[] = "onProbability";
  static constexpr char SCORING_VAL_ONINCREASE[] = "onIncrease";
  static constexpr char SCORING_ATT_PMMLFILES[] = "scoring_pmmlFiles";
  static constexpr char SCORING_ATT_VERSION[] = "scoring_version";
  static constexpr char SCORING_ATT_MODELTYPE[] = "scoring_modelType";
  static constexpr char SCORING_ATT_MULTIPLEMODELMETHOD[] = "scoring_multipleModelMethod";
  static constexpr char SCORING_ATT_MODELIDS[] = "scoring_modelIDs";
  static constexpr char SCORING_ATT_NEEDDERIVEDPREDICTOR[] = "scoring_needDerivedPredictor";
  static constexpr char SCORING_ATT_SPLITMODEL[] = "scoring_splitModel";
  static constexpr char SCORING_ATT_SPLITMODELIDS[] = "scoring_splitModelIDs";
  static constexpr char SCORING_ATT_SPLITFIELDS[] = "scoring_splitFields";
  static constexpr char SCORING_ATT_SPLITVALUES[] = "scoring_splitValues";
  static constexpr char SCORING_ATT_SELFLEARN_TARGET[] = "scoring_selfTargetName";
};

}  // namespace QZScoring_800

#endif  // QZSCORING_QZSCORING_TAGS_H_

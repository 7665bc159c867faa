// The PMML vocabulary the library and its scorer plug-ins share: element, attribute,
// value, extension, output-feature and statistics names, namespace texts. Each
// constant holds its exact, case-sensitive text; compare DOM text with them through
// the helpers of ScoringBaseParser. Every constant converts to std::string where one is
// expected.
#ifndef QZSCORING_SCORINGPMMLTAGS_H_
#define QZSCORING_SCORINGPMMLTAGS_H_

#include "QZScoringTags.h"

namespace QZScoring_800 {

// Names are PMML_<role>_<text in upper case>, with an underscore at each word break of
// the text: ELE elements, NAME other capitalised names, ATT attributes, VAL attribute
// values, EXT extension names and attributes, ASSOC association vocabulary, OUT
// output features, OPT scoring options, STAT statistics, NS namespace texts.
class ScoringPMMLTags {
 public:
  ScoringPMMLTags() = delete;

  // Element names of the PMML standard.
  static constexpr char PMML_ELE_ANNOTATION[] = "Annotation";
  static constexpr char PMML_ELE_ANOVA[] = "Anova";
  static constexpr char PMML_ELE_ANOVA_ROW[] = "AnovaRow";
  static constexpr char PMML_ELE_APPLICATION[] = "Application";
  static constexpr char PMML_ELE_APPLY[] = "Apply";
  static constexpr char PMML_ELE_ARRAY[] = "Array";
  static constexpr char PMML_ELE_ASSOCIATION_MODEL[] = "AssociationModel";
  static constexpr char PMML_ELE_BAYES_NET_MODEL[] = "BayesNetModel";
  static constexpr char PMML_ELE_BOUNDARY_VALUE_MEANS[] = "BoundaryValueMeans";
  static constexpr char PMML_ELE_BOUNDARY_VALUES[] = "BoundaryValues";
  static constexpr char PMML_ELE_CLASS_LABELS[] = "ClassLabels";
  static constexpr char PMML_ELE_CLUSTERING_MODEL[] = "ClusteringModel";
  static constexpr char PMML_ELE_COMPOUND_PREDICATE[] = "CompoundPredicate";
  static constexpr char PMML_ELE_CON[] = "Con";
  static constexpr char PMML_ELE_CONFUSION_MATRIX[] = "ConfusionMatrix";
  static constexpr char PMML_ELE_CONT_STATS[] = "ContStats";
  static constexpr char PMML_ELE_COUNTS[] = "Counts";
  static constexpr char PMML_ELE_COVARIANCES[] = "Covariances";
  static constexpr char PMML_ELE_COVARIATE_LIST[] = "CovariateList";
  static constexpr char PMML_ELE_DATA_DICTIONARY[] = "DataDictionary";
  static constexpr char PMML_ELE_DATA_FIELD[] = "DataField";
  static constexpr char PMML_ELE_DERIVED_FIELD[] = "DerivedField";
  static constexpr char PMML_ELE_DISCRETIZE[] = "Discretize";
  static constexpr char PMML_ELE_DISCRETIZE_BIN[] = "DiscretizeBin";
  static constexpr char PMML_ELE_DISCR_STATS[] = "DiscrStats";
  static constexpr char PMML_ELE_EXTENSION[] = "Extension";
  static constexpr char PMML_ELE_FACTOR_LIST[] = "FactorList";
  static constexpr char PMML_ELE_FALSE[] = "False";
  static constexpr char PMML_ELE_FIELD_COLUMN_PAIR[] = "FieldColumnPair";
  static constexpr char PMML_ELE_FIELD_REF[] = "FieldRef";
  static constexpr char PMML_ELE_GENERAL_REGRESSION_MODEL[] = "GeneralRegressionModel";
  static constexpr char PMML_ELE_HEADER[] = "Header";
  static constexpr char PMML_ELE_INLINE_TABLE[] = "InlineTable";
  static constexpr char PMML_ELE_INTERVAL[] = "Interval";
  static constexpr char PMML_ELE_LIFT_DATA[] = "LiftData";
  static constexpr char PMML_ELE_LIFT_GRAPH[] = "LiftGraph";
  static constexpr char PMML_ELE_LINEAR_NORM[] = "LinearNorm";
  static constexpr char PMML_ELE_LOCAL_TRANSFORMATIONS[] = "LocalTransformations";
  static constexpr char PMML_ELE_MAP_VALUES[] = "MapValues";
  static constexpr char PMML_ELE_MATRIX[] = "Matrix";
  static constexpr char PMML_ELE_MINING_BUILD_TASK[] = "MiningBuildTask";
  static constexpr char PMML_ELE_MINING_FIELD[] = "MiningField";
  static constexpr char PMML_ELE_MINING_MODEL[] = "MiningModel";
  static constexpr char PMML_ELE_MINING_SCHEMA[] = "MiningSchema";
  static constexpr char PMML_ELE_MODEL_EXPLANATION[] = "ModelExplanation";
  static constexpr char PMML_ELE_MODEL_LIFT_GRAPH[] = "ModelLiftGraph";
  static constexpr char PMML_ELE_MODEL_STATS[] = "ModelStats";
  static constexpr char PMML_ELE_NAIVE_BAYES_MODEL[] = "NaiveBayesModel";
  static constexpr char PMML_ELE_NEAREST_NEIGHBOR_MODEL[] = "NearestNeighborModel";
  static constexpr char PMML_ELE_NEURAL_INPUT[] = "NeuralInput";
  static constexpr char PMML_ELE_NEURAL_INPUTS[] = "NeuralInputs";
  static constexpr char PMML_ELE_NEURAL_LAYER[] = "NeuralLayer";
  static constexpr char PMML_ELE_NEURAL_NETWORK[] = "NeuralNetwork";
  static constexpr char PMML_ELE_NEURAL_OUTPUT[] = "NeuralOutput";
  static constexpr char PMML_ELE_NEURAL_OUTPUTS[] = "NeuralOutputs";
  static constexpr char PMML_ELE_NEURON[] = "Neuron";
  static constexpr char PMML_ELE_NORM_CONTINUOUS[] = "NormContinuous";
  static constexpr char PMML_ELE_NORM_DISCRETE[] = "NormDiscrete";
  static constexpr char PMML_ELE_NUMERIC_INFO[] = "NumericInfo";
  static constexpr char PMML_ELE_OUTPUT[] = "Output";
  static constexpr char PMML_ELE_OUTPUT_FIELD[] = "OutputField";
  static constexpr char PMML_ELE_PARAMETER[] = "Parameter";
  static constexpr char PMML_ELE_PARAMETER_LIST[] = "ParameterList";
  static constexpr char PMML_ELE_PARAM_MATRIX[] = "ParamMatrix";
  static constexpr char PMML_ELE_PARTITION[] = "Partition";
  static constexpr char PMML_ELE_PARTITION_FIELD_STATS[] = "PartitionFieldStats";
  static constexpr char PMML_ELE_P_CELL[] = "PCell";
  static constexpr char PMML_ELE_P_COV_CELL[] = "PCovCell";
  static constexpr char PMML_ELE_P_COV_MATRIX[] = "PCovMatrix";
  static constexpr char PMML_ELE_PMML[] = "PMML";
  static constexpr char PMML_ELE_PP_CELL[] = "PPCell";
  static constexpr char PMML_ELE_PP_MATRIX[] = "PPMatrix";
  static constexpr char PMML_ELE_PREDICTIVE_MODEL_QUALITY[] = "PredictiveModelQuality";
  static constexpr char PMML_ELE_PREDICTOR[] = "Predictor";
  static constexpr char PMML_ELE_REGRESSION_MODEL[] = "RegressionModel";
  static constexpr char PMML_ELE_RULE_SET_MODEL[] = "RuleSetModel";
  static constexpr char PMML_ELE_SEGMENT[] = "Segment";
  static constexpr char PMML_ELE_SEGMENTATION[] = "Segmentation";
  static constexpr char PMML_ELE_SEQUENCE_MODEL[] = "SequenceModel";
  static constexpr char PMML_ELE_SIMPLE_PREDICATE[] = "SimplePredicate";
  static constexpr char PMML_ELE_SIMPLE_SET_PREDICATE[] = "SimpleSetPredicate";
  static constexpr char PMML_ELE_SUPPORT_VECTOR_MACHINE_MODEL[] = "SupportVectorMachineModel";
  static constexpr char PMML_ELE_TEXT_MODEL[] = "TextModel";
  static constexpr char PMML_ELE_TIME_SERIES_MODEL[] = "TimeSeriesModel";
  static constexpr char PMML_ELE_TIMESTAMP[] = "Timestamp";
  static constexpr char PMML_ELE_TRANSFORMATION_DICTIONARY[] = "TransformationDictionary";
  static constexpr char PMML_ELE_TREE_MODEL[] = "TreeModel";
  static constexpr char PMML_ELE_TRUE[] = "True";
  static constexpr char PMML_ELE_UNIVARIATE_STATS[] = "UnivariateStats";
  static constexpr char PMML_ELE_VALUE[] = "Value";
  static constexpr char PMML_ELE_X_COORDINATES[] = "XCoordinates";
  static constexpr char PMML_ELE_Y_COORDINATES[] = "YCoordinates";

  // Other capitalised names of the vocabulary (not PMML element names).
  static constexpr char PMML_NAME_DERIVED_FIELDS[] = "DerivedFields";
  static constexpr char PMML_NAME_FIELDS[] = "Fields";
  static constexpr char PMML_NAME_INTERVALS[] = "Intervals";
  static constexpr char PMML_NAME_N[] = "N";
  static constexpr char PMML_NAME_PREDICTED_VALUE[] = "PredictedValue";
  static constexpr char PMML_NAME_PROBABILITY[] = "Probability";
  static constexpr char PMML_NAME_PROBABILITY_0[] = "Probability_0";
  static constexpr char PMML_NAME_PROBABILITY_1[] = "Probability_1";
  static constexpr char PMML_NAME_PROBABILITY_2[] = "Probability_2";

  // Attribute names.
  static constexpr char PMML_ATT_ACTIVATION_FUNCTION[] = "activationFunction";
  static constexpr char PMML_ATT_ACTIVE_MODEL_ID[] = "activeModelID";
  static constexpr char PMML_ATT_ALGORITHM[] = "algorithm";
  static constexpr char PMML_ATT_ALGORITHM_NAME[] = "algorithmName";
  static constexpr char PMML_ATT_BIN_VALUE[] = "binValue";
  static constexpr char PMML_ATT_BOOLEAN_OPERATOR[] = "booleanOperator";
  static constexpr char PMML_ATT_CARDINALITY[] = "cardinality";
  static constexpr char PMML_ATT_CLOSURE[] = "closure";
  static constexpr char PMML_ATT_COPYRIGHT[] = "copyright";
  static constexpr char PMML_ATT_DATA_TYPE[] = "dataType";
  static constexpr char PMML_ATT_DEFAULT_VALUE[] = "defaultValue";
  static constexpr char PMML_ATT_DEGREES_OF_FREEDOM[] = "degreesOfFreedom";
  static constexpr char PMML_ATT_DESCRIPTION[] = "description";
  static constexpr char PMML_ATT_DISPLAY_NAME[] = "displayName";
  static constexpr char PMML_ATT_DISPLAY_VALUE[] = "displayValue";
  static constexpr char PMML_ATT_ENTITY_ID[] = "entityId";
  static constexpr char PMML_ATT_EXTENDER[] = "extender";
  static constexpr char PMML_ATT_FEATURE[] = "feature";
  static constexpr char PMML_ATT_FIELD[] = "field";
  static constexpr char PMML_ATT_FIELD_NAME[] = "fieldName";
  static constexpr char PMML_ATT_FROM[] = "from";
  static constexpr char PMML_ATT_FUNCTION[] = "function";
  static constexpr char PMML_ATT_FUNCTION_NAME[] = "functionName";
  static constexpr char PMML_ATT_HIGH_VALUE[] = "highValue";
  static constexpr char PMML_ATT_ID[] = "id";
  static constexpr char PMML_ATT_IMPORTANCE[] = "importance";
  static constexpr char PMML_ATT_IS_MULTI_VALUED[] = "isMultiValued";
  static constexpr char PMML_ATT_IS_SCORABLE[] = "isScorable";
  static constexpr char PMML_ATT_KIND[] = "kind";
  static constexpr char PMML_ATT_LABEL[] = "label";
  static constexpr char PMML_ATT_LEFT_MARGIN[] = "leftMargin";
  static constexpr char PMML_ATT_LOW_VALUE[] = "lowValue";
  static constexpr char PMML_ATT_MAP_MISSING_TO[] = "mapMissingTo";
  static constexpr char PMML_ATT_MISSING_VALUE_REPLACEMENT[] = "missingValueReplacement";
  static constexpr char PMML_ATT_MISSING_VALUE_TREATMENT[] = "missingValueTreatment";
  static constexpr char PMML_ATT_MODEL_ID[] = "modelID";
  static constexpr char PMML_ATT_MODEL_NAME[] = "modelName";
  static constexpr char PMML_ATT_MODEL_TYPE[] = "modelType";
  static constexpr char PMML_ATT_MULTIPLE_MODEL_METHOD[] = "multipleModelMethod";
  static constexpr char PMML_ATT_NAME[] = "name";
  static constexpr char PMML_ATT_NORMALIZATION_METHOD[] = "normalizationMethod";
  static constexpr char PMML_ATT_NUMBER_OF_FIELDS[] = "numberOfFields";
  static constexpr char PMML_ATT_NUMBER_OF_LAYERS[] = "numberOfLayers";
  static constexpr char PMML_ATT_NUMBER_OF_NEURONS[] = "numberOfNeurons";
  static constexpr char PMML_ATT_OPERATOR[] = "operator";
  static constexpr char PMML_ATT_OPTYPE[] = "optype";
  static constexpr char PMML_ATT_OUTLIERS[] = "outliers";
  static constexpr char PMML_ATT_PARAMETER_NAME[] = "parameterName";
  static constexpr char PMML_ATT_PREDICTOR_NAME[] = "predictorName";
  static constexpr char PMML_ATT_PROPERTY[] = "property";
  static constexpr char PMML_ATT_RANK_BASIS[] = "rankBasis";
  static constexpr char PMML_ATT_RANK_ORDER[] = "rankOrder";
  static constexpr char PMML_ATT_RIGHT_MARGIN[] = "rightMargin";
  static constexpr char PMML_ATT_TARGET_CATEGORY[] = "targetCategory";
  static constexpr char PMML_ATT_TARGET_FIELD[] = "targetField";
  static constexpr char PMML_ATT_TARGET_REFERENCE_CATEGORY[] = "targetReferenceCategory";
  static constexpr char PMML_ATT_THRESHOLD[] = "threshold";
  static constexpr char PMML_ATT_TYPE[] = "type";
  static constexpr char PMML_ATT_USAGE_TYPE[] = "usageType";
  static constexpr char PMML_ATT_VALUE[] = "value";
  static constexpr char PMML_ATT_VERSION[] = "version";
  static constexpr char PMML_ATT_WEIGHT[] = "weight";
  static constexpr char PMML_ATT_WIDTH[] = "width";
  static constexpr char PMML_ATT_XMLNS[] = "xmlns";
  static constexpr char PMML_ATT_XMLNS_XSI[] = "xmlns:xsi";
  static constexpr char PMML_ATT_XSI_SCHEMA_LOCATION[] = "xsi:schemaLocation";

  // Attribute values: optypes, data types, operators, closures, missing-value
  // treatments, multiple-model methods, functions, sort orders and PMML versions.
  static constexpr char PMML_VAL_3_2[] = "3.2";
  static constexpr char PMML_VAL_4_0[] = "4.0";
  static constexpr char PMML_VAL_4_1[] = "4.1";
  static constexpr char PMML_VAL_ACTIVE[] = "active";
  static constexpr char PMML_VAL_AND[] = "and";
  static constexpr char PMML_VAL_ARCTAN[] = "arctan";
  static constexpr char PMML_VAL_ASCENDING[] = "ascending";
  static constexpr char PMML_VAL_AS_EXTREME_VALUES[] = "asExtremeValues";
  static constexpr char PMML_VAL_AS_IS[] = "asIs";
  static constexpr char PMML_VAL_AS_MEAN[] = "asMean";
  static constexpr char PMML_VAL_AS_MISSING_VALUES[] = "asMissingValues";
  static constexpr char PMML_VAL_AS_MODE[] = "asMode";
  static constexpr char PMML_VAL_AS_VALUE[] = "asValue";
  static constexpr char PMML_VAL_AVERAGE[] = "average";
  static constexpr char PMML_VAL_CATEGORICAL[] = "categorical";
  static constexpr char PMML_VAL_CLASSIFICATION[] = "classification";
  static constexpr char PMML_VAL_CLOSED_CLOSED[] = "closedClosed";
  static constexpr char PMML_VAL_CLOSED_OPEN[] = "closedOpen";
  static constexpr char PMML_VAL_CLUSTERING[] = "clustering";
  static constexpr char PMML_VAL_CONTINUOUS[] = "continuous";
  static constexpr char PMML_VAL_COSINE[] = "cosine";
  static constexpr char PMML_VAL_COX_REGRESSION[] = "CoxRegression";
  static constexpr char PMML_VAL_DATE[] = "date";
  static constexpr char PMML_VAL_DATE_DAYS_SINCE_1970[] = "dateDaysSince[1970]";
  static constexpr char PMML_VAL_DATE_TIME[] = "dateTime";
  static constexpr char PMML_VAL_DATE_TIME_SECONDS_SINCE_1970[] = "dateTimeSecondsSince[1970]";
  static constexpr char PMML_VAL_DESCENDING[] = "descending";
  static constexpr char PMML_VAL_DOUBLE[] = "double";
  static constexpr char PMML_VAL_ELLIOTT[] = "Elliott";
  static constexpr char PMML_VAL_EQUAL[] = "equal";
  static constexpr char PMML_VAL_EXPONENTIAL[] = "exponential";
  static constexpr char PMML_VAL_FLOAT[] = "float";
  static constexpr char PMML_VAL_GAUSS[] = "Gauss";
  static constexpr char PMML_VAL_GENERALIZED_LINEAR[] = "generalizedLinear";
  static constexpr char PMML_VAL_GENERAL_LINEAR[] = "generalLinear";
  static constexpr char PMML_VAL_GREATER_OR_EQUAL[] = "greaterOrEqual";
  static constexpr char PMML_VAL_GREATER_THAN[] = "greaterThan";
  static constexpr char PMML_VAL_IDENTITY[] = "identity";
  static constexpr char PMML_VAL_IN[] = "in";
  static constexpr char PMML_VAL_INT[] = "int";
  static constexpr char PMML_VAL_INTEGER[] = "integer";
  static constexpr char PMML_VAL_INVALID[] = "invalid";
  static constexpr char PMML_VAL_IS_MISSING[] = "isMissing";
  static constexpr char PMML_VAL_IS_NOT_MISSING[] = "isNotMissing";
  static constexpr char PMML_VAL_LESS_OR_EQUAL[] = "lessOrEqual";
  static constexpr char PMML_VAL_LESS_THAN[] = "lessThan";
  static constexpr char PMML_VAL_LOGISTIC[] = "logistic";
  static constexpr char PMML_VAL_MAJORITY_VOTE[] = "majorityVote";
  static constexpr char PMML_VAL_MAX[] = "max";
  static constexpr char PMML_VAL_MEDIAN[] = "median";
  static constexpr char PMML_VAL_MISSING[] = "missing";
  static constexpr char PMML_VAL_MULTINOMIAL_LOGISTIC[] = "multinomialLogistic";
  static constexpr char PMML_VAL_NOT_EQUAL[] = "notEqual";
  static constexpr char PMML_VAL_OPEN_CLOSED[] = "openClosed";
  static constexpr char PMML_VAL_OPEN_OPEN[] = "openOpen";
  static constexpr char PMML_VAL_OR[] = "or";
  static constexpr char PMML_VAL_ORDINAL[] = "ordinal";
  static constexpr char PMML_VAL_ORDINAL_MULTINOMIAL[] = "ordinalMultinomial";
  static constexpr char PMML_VAL_OUT[] = "out";
  static constexpr char PMML_VAL_PREDICTED[] = "predicted";
  static constexpr char PMML_VAL_RADIAL_BASIS[] = "radialBasis";
  static constexpr char PMML_VAL_REAL[] = "real";
  static constexpr char PMML_VAL_RECIPROCAL[] = "reciprocal";
  static constexpr char PMML_VAL_REGRESSION[] = "regression";
  static constexpr char PMML_VAL_SELECT_ALL[] = "selectAll";
  static constexpr char PMML_VAL_SELECT_FIRST[] = "selectFirst";
  static constexpr char PMML_VAL_SIMPLEMAX[] = "simplemax";
  static constexpr char PMML_VAL_SINE[] = "sine";
  static constexpr char PMML_VAL_SOFTMAX[] = "softmax";
  static constexpr char PMML_VAL_SQUARE[] = "square";
  static constexpr char PMML_VAL_STRING[] = "string";
  static constexpr char PMML_VAL_SUM[] = "sum";
  static constexpr char PMML_VAL_SURROGATE[] = "surrogate";
  static constexpr char PMML_VAL_TANH[] = "tanh";
  static constexpr char PMML_VAL_TIME[] = "time";
  static constexpr char PMML_VAL_TIME_SECONDS[] = "timeSeconds";
  static constexpr char PMML_VAL_TRUE[] = "true";
  static constexpr char PMML_VAL_VALID[] = "valid";
  static constexpr char PMML_VAL_WEIGHTED_AVERAGE[] = "weightedAverage";
  static constexpr char PMML_VAL_WEIGHTED_MAJORITY_VOTE[] = "weightedMajorityVote";
  static constexpr char PMML_VAL_WEIGHTED_MEDIAN[] = "weightedMedian";
  static constexpr char PMML_VAL_XOR[] = "xor";

  // Extension names and extension attributes (the "x-" attributes extend a DataField).
  static constexpr char PMML_EXT_ADVICE[] = "advice";
  static constexpr char PMML_EXT_CONTAINER_MODEL[] = "containerModel";
  static constexpr char PMML_EXT_DEPLOYABILITY[] = "deployability";
  static constexpr char PMML_EXT_FALSE_VALUE1[] = "falseValue1";
  static constexpr char PMML_EXT_FLAG_TYPE_TRUE_VALUE[] = "flagTypeTrueValue";
  static constexpr char PMML_EXT_INVALID_RANGE_LOWER[] = "invalidRangeLower";
  static constexpr char PMML_EXT_INVALID_RANGE_UPPER[] = "invalidRangeUpper";
  static constexpr char PMML_EXT_KOHONEN_X_DIMENSION[] = "kohonenXDimension";
  static constexpr char PMML_EXT_KOHONEN_Y_DIMENSION[] = "kohonenYDimension";
  static constexpr char PMML_EXT_MEASURE[] = "measure";
  static constexpr char PMML_EXT_MODEL[] = "model";
  static constexpr char PMML_EXT_OUTPUT_NEURON[] = "outputNeuron";
  static constexpr char PMML_EXT_TRANSFORMATIONS[] = "transformations";
  static constexpr char PMML_EXT_TRUE_VALUE1[] = "trueValue1";
  static constexpr char PMML_EXT_X_KOHONEN_X_DIMENSION[] = "x-kohonenXDimension";
  static constexpr char PMML_EXT_X_KOHONEN_Y_DIMENSION[] = "x-kohonenYDimension";
  static constexpr char PMML_EXT_X_MEASURE[] = "x-measure";
  static constexpr char PMML_EXT_X_STORAGE_TYPE[] = "x-storageType";

  // Association and recommendation vocabulary.
  static constexpr char PMML_ASSOC_ANTECEDENT[] = "antecedent";
  static constexpr char PMML_ASSOC_ASSOC_CHECK_BASKET[] = "assocCheckBasket";
  static constexpr char PMML_ASSOC_ASSOC_EQUALS_BASKET[] = "assocEqualsBasket";
  static constexpr char PMML_ASSOC_ASSOC_REPEAT_PREDICATIONS[] = "assocRepeatPredications";
  static constexpr char PMML_ASSOC_ASSOC_RULE_CRITERION[] = "assocRuleCriterion";
  static constexpr char PMML_ASSOC_CONFIDENCE[] = "confidence";
  static constexpr char PMML_ASSOC_CONSEQUENT[] = "consequent";
  static constexpr char PMML_ASSOC_EXCLUSIVE_RECOMMENDATION[] = "exclusiveRecommendation";
  static constexpr char PMML_ASSOC_IS_INSIDE_BASKET[] = "isInsideBasket";
  static constexpr char PMML_ASSOC_IS_OUTSIDE_BASKET[] = "isOutsideBasket";
  static constexpr char PMML_ASSOC_LIFT[] = "lift";
  static constexpr char PMML_ASSOC_NOT_CHECK_BASKET[] = "notCheckBasket";
  static constexpr char PMML_ASSOC_RECOMMENDATION[] = "recommendation";
  static constexpr char PMML_ASSOC_RULE[] = "rule";
  static constexpr char PMML_ASSOC_RULE_ASSOCIATION[] = "ruleAssociation";
  static constexpr char PMML_ASSOC_RULE_FEATURE[] = "ruleFeature";
  static constexpr char PMML_ASSOC_RULE_ID[] = "ruleId";
  static constexpr char PMML_ASSOC_RULESUPPORT[] = "rulesupport";
  static constexpr char PMML_ASSOC_SUPPORT[] = "support";

  // Output-feature names: what an output field delivers, by model family.
  static constexpr char PMML_OUT_ADJUSTEDPROPENSITY[] = "adjustedpropensity";
  static constexpr char PMML_OUT_ANOMALY_ANOMVARINFO[] = "anomaly-anomvarinfo";
  static constexpr char PMML_OUT_ANOMALY_AVRIMPACT[] = "anomaly-avrimpact";
  static constexpr char PMML_OUT_ANOMALY_CLUSTERID[] = "anomaly-clusterid";
  static constexpr char PMML_OUT_ANOMALY_FLAG[] = "anomaly-flag";
  static constexpr char PMML_OUT_ANOMALY_INDEX[] = "anomaly-index";
  static constexpr char PMML_OUT_ANOMALY_NORMVALUE[] = "anomaly-normvalue";
  static constexpr char PMML_OUT_ANOMALY_VARNAME[] = "anomaly-varname";
  static constexpr char PMML_OUT_ANOMALY_VARVALUE[] = "anomaly-varvalue";
  static constexpr char PMML_OUT_ASSOC_ANTECEDENT[] = "assoc-antecedent";
  static constexpr char PMML_OUT_ASSOC_ASSOCIATIONRULE[] = "assoc-associationrule";
  static constexpr char PMML_OUT_ASSOC_CONFIDENCE[] = "assoc-confidence";
  static constexpr char PMML_OUT_ASSOC_CONSEQUENT[] = "assoc-consequent";
  static constexpr char PMML_OUT_ASSOC_CONSEQUENTDESCRIPTOR[] = "assoc-consequentdescriptor";
  static constexpr char PMML_OUT_ASSOC_ITEM[] = "assoc-item";
  static constexpr char PMML_OUT_ASSOC_LIFT[] = "assoc-lift";
  static constexpr char PMML_OUT_ASSOC_SUPPORT[] = "assoc-support";
  static constexpr char PMML_OUT_ASSOCRULE_CONSEQUENT[] = "assocrule-consequent";
  static constexpr char PMML_OUT_ASSOCRULE_CRITERIONVALUE[] = "assocrule-criterionvalue";
  static constexpr char PMML_OUT_ASSOCRULE_DESCRIPTOR[] = "assocrule-descriptor";
  static constexpr char PMML_OUT_ASSOCRULE_SORTCRITERION[] = "assocrule-sortcriterion";
  static constexpr char PMML_OUT_CLUSTERING_CLUSTERID[] = "clustering-clusterid";
  static constexpr char PMML_OUT_CLUSTERING_KMEANS_CLUSTERID[] = "clustering-kmeans-clusterid";
  static constexpr char PMML_OUT_CLUSTERING_KMEANS_DISTANCE[] = "clustering-kmeans-distance";
  static constexpr char PMML_OUT_CLUSTERING_KOHONEN[] = "clustering-kohonen";
  static constexpr char PMML_OUT_CLUSTERING_KOHONEN_X[] = "clustering-kohonen-x";
  static constexpr char PMML_OUT_CLUSTERING_KOHONEN_XY[] = "clustering-kohonen-xy";
  static constexpr char PMML_OUT_CLUSTERING_KOHONEN_Y[] = "clustering-kohonen-y";
  static constexpr char PMML_OUT_COX_CUMHAZARD[] = "cox-cumhazard";
  static constexpr char PMML_OUT_COX_DEADSTRING[] = "cox-deadstring";
  static constexpr char PMML_OUT_KNN_CASEID[] = "knn-caseid";
  static constexpr char PMML_OUT_KNN_CASELABEL[] = "knn-caselabel";
  static constexpr char PMML_OUT_KNN_DESCRIPTOR[] = "knn-descriptor";
  static constexpr char PMML_OUT_KNN_DISTANCE[] = "knn-distance";
  static constexpr char PMML_OUT_PREDICTED_VALUE[] = "predictedValue";
  static constexpr char PMML_OUT_PREDICTION[] = "prediction";
  static constexpr char PMML_OUT_PROBABILITY[] = "probability";
  static constexpr char PMML_OUT_PROBCATEGORY[] = "probcategory";
  static constexpr char PMML_OUT_RAWPROPENSITY[] = "rawpropensity";
  static constexpr char PMML_OUT_RULESET_DL_PROBABILITY[] = "ruleset-dl-probability";
  static constexpr char PMML_OUT_RULESET_FIRSTID[] = "ruleset-firstid";
  static constexpr char PMML_OUT_RULESET_IDFIRE[] = "ruleset-idfire";
  static constexpr char PMML_OUT_SELFLEARNING_DESCRIPTOR[] = "selflearning-descriptor";
  static constexpr char PMML_OUT_SELFLEARNING_MEANPERFORMANCE[] = "selflearning-meanperformance";
  static constexpr char PMML_OUT_SELFLEARNING_MODELNAME[] = "selflearning-modelname";
  static constexpr char PMML_OUT_SELFLEARNING_SECONDCATPROB[] = "selflearning-secondcatprob";
  static constexpr char PMML_OUT_SELFLEARNING_STDDEVPERFORMANCE[] = "selflearning-stddevperformance";
  static constexpr char PMML_OUT_SEQUENTIAL_CAUSE[] = "sequential-cause";
  static constexpr char PMML_OUT_SEQUENTIAL_CONFIDENCE[] = "sequential-confidence";
  static constexpr char PMML_OUT_SEQUENTIAL_ITEM[] = "sequential-item";
  static constexpr char PMML_OUT_SEQUENTIAL_SEQCONSEQUENTDESCRIPTOR[] = "sequential-seqconsequentdescriptor";
  static constexpr char PMML_OUT_SEQUENTIAL_SUPPORT[] = "sequential-support";
  static constexpr char PMML_OUT_TARGET_FIELD_DISPLAY_VALUE[] = "targetFieldDisplayValue";
  static constexpr char PMML_OUT_TARGET_FIELD_VALUE[] = "targetFieldValue";
  static constexpr char PMML_OUT_TIMESERIES_LOWERCONFIDENCE[] = "timeseries-lowerconfidence";
  static constexpr char PMML_OUT_TIMESERIES_NOISERESIDUALS[] = "timeseries-noiseresiduals";
  static constexpr char PMML_OUT_TIMESERIES_UPPERCONFIDENCE[] = "timeseries-upperconfidence";
  static constexpr char PMML_OUT_TREE_NODEID[] = "tree-nodeid";
  static constexpr char PMML_OUT_TREE_NODESTATS[] = "tree-nodestats";

  // Scoring options and model parameters.
  static constexpr char PMML_OPT_ALL_PROBABILITIES[] = "all_probabilities";
  static constexpr char PMML_OPT_ASSOCIATION_CONFIDENCE[] = "association_confidence";
  static constexpr char PMML_OPT_ASSOCIATION_PREDICTION[] = "association_prediction";
  static constexpr char PMML_OPT_ASSOCIATION_RULEID[] = "association_ruleid";
  static constexpr char PMML_OPT_CUMULATIVE_HAZARD[] = "cumulative_hazard";
  static constexpr char PMML_OPT_FUTURE_TIME_AS[] = "future_time_as";
  static constexpr char PMML_OPT_NUM_FUTURE_TIMES[] = "num_future_times";
  static constexpr char PMML_OPT_PAST_SURVIVAL_TIME[] = "past_survival_time";
  static constexpr char PMML_OPT_SELFLEARNING_CONFIDENCE[] = "selflearning_confidence";
  static constexpr char PMML_OPT_SELFLEARNING_PREDICTION[] = "selflearning_prediction";
  static constexpr char PMML_OPT_SELFLEARNING_RANDOMIZATION[] = "selflearningRandomization";
  static constexpr char PMML_OPT_SELFLEARNING_RANDOM_SEED[] = "selflearningRandomSeed";
  static constexpr char PMML_OPT_SELFLEARNING_RELIABILITY[] = "selflearningReliability";
  static constexpr char PMML_OPT_SELFLEARNING_SORT[] = "selflearningSort";
  static constexpr char PMML_OPT_SELFLEARNING_TARGET_FIELDS[] = "selflearningTargetFields";
  static constexpr char PMML_OPT_TIME_FIELD[] = "time_field";
  static constexpr char PMML_OPT_TIME_INTERVAL[] = "time_interval";

  // Statistics and model-quality names.
  static constexpr char PMML_STAT_ADJ_R_SQUARED[] = "adj-r-squared";
  static constexpr char PMML_STAT_AIC[] = "AIC";
  static constexpr char PMML_STAT_AI_CC[] = "AICc";
  static constexpr char PMML_STAT_BETA[] = "beta";
  static constexpr char PMML_STAT_BIAS[] = "bias";
  static constexpr char PMML_STAT_BIC[] = "BIC";
  static constexpr char PMML_STAT_DF[] = "df";
  static constexpr char PMML_STAT_DIAGONAL[] = "diagonal";
  static constexpr char PMML_STAT_F_STATISTIC[] = "fStatistic";
  static constexpr char PMML_STAT_F_VALUE[] = "fValue";
  static constexpr char PMML_STAT_INVALID_FREQ[] = "invalidFreq";
  static constexpr char PMML_STAT_MAXIMUM[] = "maximum";
  static constexpr char PMML_STAT_MEAN[] = "mean";
  static constexpr char PMML_STAT_MEAN_OF_SQUARES[] = "meanOfSquares";
  static constexpr char PMML_STAT_MINIMUM[] = "minimum";
  static constexpr char PMML_STAT_MISSING_FREQ[] = "missingFreq";
  static constexpr char PMML_STAT_MISSING_INTERVAL[] = "missingInterval";
  static constexpr char PMML_STAT_MODEL_DF[] = "modelDF";
  static constexpr char PMML_STAT_N[] = "n";
  static constexpr char PMML_STAT_NORM[] = "norm";
  static constexpr char PMML_STAT_NUM_OF_PREDICTORS[] = "numOfPredictors";
  static constexpr char PMML_STAT_NUM_OF_RECORDS[] = "numOfRecords";
  static constexpr char PMML_STAT_NUM_OF_RECORDS_WEIGHTED[] = "numOfRecordsWeighted";
  static constexpr char PMML_STAT_ORIG[] = "orig";
  static constexpr char PMML_STAT_P_COL[] = "pCol";
  static constexpr char PMML_STAT_P_ROW[] = "pRow";
  static constexpr char PMML_STAT_P_VALUE[] = "pValue";
  static constexpr char PMML_STAT_R_SQUARED[] = "r-squared";
  static constexpr char PMML_STAT_RESIDUAL[] = "residual";
  static constexpr char PMML_STAT_ROBUST[] = "robust";
  static constexpr char PMML_STAT_ROW[] = "row";
  static constexpr char PMML_STAT_STANDARD_DEVIATION[] = "standardDeviation";
  static constexpr char PMML_STAT_STANDARD_ERROR[] = "standardError";
  static constexpr char PMML_STAT_STDDEV[] = "stddev";
  static constexpr char PMML_STAT_SUM_OF_SQUARES[] = "sumOfSquares";
  static constexpr char PMML_STAT_SUM_SQUARED_ERROR[] = "sumSquaredError";
  static constexpr char PMML_STAT_SUM_SQUARED_REGRESSION[] = "sumSquaredRegression";
  static constexpr char PMML_STAT_T_COL[] = "tCol";
  static constexpr char PMML_STAT_TOTAL_FREQ[] = "totalFreq";
  static constexpr char PMML_STAT_T_ROW[] = "tRow";

  // Namespace names of PMML 3.2, 4.0 and 4.1, their xsi:schemaLocation forms (name,
  // blank, schema file) and the W3C XML Schema instance namespace.
  static constexpr char PMML_NS_PMML_3_2[] = "http://www.dmg.org/PMML-3_2";
  static constexpr char PMML_NS_PMML_4_0[] = "http://www.dmg.org/PMML-4_0";
  static constexpr char PMML_NS_PMML_4_1[] = "http://www.dmg.org/PMML-4_1";
  static constexpr char PMML_NS_SCHEMA_LOCATION_3_2[] = "http://www.dmg.org/PMML-3_2 pmml-3-2.xsd";
  static constexpr char PMML_NS_SCHEMA_LOCATION_4_0[] = "http://www.dmg.org/PMML-4_0 pmml-4-0.xsd";
  static constexpr char PMML_NS_SCHEMA_LOCATION_4_1[] = "http://www.dmg.org/PMML-4_1 pmml-4-1.xsd";
  static constexpr char PMML_NS_XSI[] = "http://www.w3.org/2001/XMLSchema-instance";

  // The copyright attribute text of a Header this library writes.
  static constexpr char PMML_COPYRIGHT[] = "Copyright (c) the qzscoring project";
  // The extender identifier of this library's own extensions (one text for both
  // vocabularies).
  static constexpr const char* PMML_EXTENDER = QZScoringTags::SCORING_EXTENDER;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGPMMLTAGS_H_

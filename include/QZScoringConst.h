// Constants shared by the library and its plug-ins.
#ifndef QZSCORING_CONST_H_
#define QZSCORING_CONST_H_

namespace QZScoring_800 {

struct QZScoringConst {
  // The kind of model a PMML document holds, from its model element's name
  // (ScoringScorerFactory::GetModelType). The last two are not element names: a
  // document with a transformation dictionary and no model, and a time-series XML
  // document whose root element is "HRZXML".
  enum ModelType {
    MODEL_UNKNOWN = 0,
    MODEL_ASSOCIATION = 1,
    MODEL_CLUSTERING = 2,
    MODEL_GENERAL_REGRESSION = 3,
    MODEL_MINING = 4,
    MODEL_NAIVE_BAYES = 5,
    MODEL_NEURAL_NETWORK = 6,
    MODEL_REGRESSION = 7,
    MODEL_RULE_SET = 8,
    MODEL_SEQUENCE = 9,
    MODEL_SUPPORT_VECTOR_MACHINE = 10,
    MODEL_TEXT = 11,
    MODEL_TIME_SERIES = 12,
    MODEL_TREE = 13,
    MODEL_BAYES_NET = 14,
    MODEL_NEAREST_NEIGHBOR = 15,
    MODEL_TRANSFORMATIONS = 16,
    MODEL_HRZXML = 17
  };
};

}  // namespace QZScoring_800

#endif  // QZSCORING_CONST_H_

// Predicate parsing: a PMML CompoundPredicate, SimplePredicate or SimpleSetPredicate
// element of a DOM tree to a predicate object, its fields looked up in a variable list.

#include <memory>
#include <string>

#include <xercesc/dom/DOMNode.hpp>

#include "QZVarList.h"
#include "ScoringCompoundPredicate.h"
#include "ScoringDiscreteSplit.h"
#include "ScoringException.h"
#include "ScoringFalsePredicate.h"
#include "ScoringPMMLParser.h"
#include "ScoringPMMLTags.h"
#include "ScoringScaleSplit.h"
#include "ScoringSetPredicate.h"
#include "ScoringSimplePredicate.h"
#include "ScoringTruePredicate.h"
#include "TreeParsing.h"

using QZXML_800::IQZVariable;
using QZXML_800::QZVarList;
using xercesc::DOMNode;

namespace QZScoring_800 {

namespace {

using Tags = ScoringPMMLTags;
using tree_parsing::Attribute;
using tree_parsing::Equals;
using tree_parsing::IsElementNamed;
using tree_parsing::TraceParseException;
using tree_parsing::WideText;

constexpr WideText kCompoundPredicate(Tags::PMML_ELE_COMPOUND_PREDICATE);
constexpr WideText kSimplePredicate(Tags::PMML_ELE_SIMPLE_PREDICATE);
constexpr WideText kSimpleSetPredicate(Tags::PMML_ELE_SIMPLE_SET_PREDICATE);
constexpr WideText kTrue(Tags::PMML_ELE_TRUE);
constexpr WideText kFalse(Tags::PMML_ELE_FALSE);
constexpr WideText kField(Tags::PMML_ATT_FIELD);
constexpr WideText kOperator(Tags::PMML_ATT_OPERATOR);
constexpr WideText kBooleanOperator(Tags::PMML_ATT_BOOLEAN_OPERATOR);
constexpr WideText kAnd(Tags::PMML_VAL_AND);
constexpr WideText kOr(Tags::PMML_VAL_OR);
constexpr WideText kXor(Tags::PMML_VAL_XOR);
constexpr WideText kSurrogate(Tags::PMML_VAL_SURROGATE);
constexpr WideText kIsMissing(Tags::PMML_VAL_IS_MISSING);
constexpr WideText kIsNotMissing(Tags::PMML_VAL_IS_NOT_MISSING);

const char kParseCompoundPredicate[] = "QZScoring_800::ScoringPMMLParser::ParseCompoundPredicate";
const char kParsePredicate[] = "QZScoring_800::ScoringPMMLParser::ParsePredicate";
const char kParseSetPredicate[] = "QZScoring_800::ScoringPMMLParser::ParseSetPredicate";

bool IsCategorical(const IQZVariable* variable) {
  const int level = variable->GetMeasureLevel();
  return level == QZXML_800::ML_NUMERIC_CATEGORICAL || level == QZXML_800::ML_STRING_CATEGORICAL;
}

}  // namespace

ScoringCompoundPredicate* ScoringPMMLParser::ParseCompoundPredicate(DOMNode* node,
                                                                     const QZVarList& vars) {
  try {
    const XMLCh* text = Attribute(node, kBooleanOperator.c_str());
    ScoringPredicate::CompoundBoolOperator op;
    if (Equals(text, kAnd.c_str())) {
      op = ScoringPredicate::BOOL_AND;
    } else if (Equals(text, kOr.c_str())) {
      op = ScoringPredicate::BOOL_OR;
    } else if (Equals(text, kXor.c_str())) {
      op = ScoringPredicate::BOOL_XOR;
    } else if (Equals(text, kSurrogate.c_str())) {
      op = ScoringPredicate::BOOL_SURROGATE;
    } else {
      throw ScoringException(
          ScoringException::SCORING_EXC_INVALID_BOOLEAN_OPERATOR,
          ToString(text) + ": Invalid Boolean Operator for the Compound Predicate");
    }
    auto compound = std::make_unique<ScoringCompoundPredicate>(op);
    for (DOMNode* child = node->getFirstChild(); child != nullptr;
         child = child->getNextSibling()) {
      if (child->getNodeType() != DOMNode::ELEMENT_NODE) continue;
      const XMLCh* name = child->getNodeName();
      std::unique_ptr<ScoringPredicate> predicate;
      if (Equals(name, kSimplePredicate.c_str())) {
        predicate.reset(ParsePredicate(child, vars));
      } else if (Equals(name, kCompoundPredicate.c_str())) {
        predicate.reset(ParseCompoundPredicate(child, vars));
      } else if (Equals(name, kSimpleSetPredicate.c_str())) {
        predicate.reset(ParseSetPredicate(child, vars));  // null on a non-categorical field
      } else if (Equals(name, kTrue.c_str())) {
        predicate = std::make_unique<ScoringTruePredicate>();
      } else if (Equals(name, kFalse.c_str())) {
        predicate = std::make_unique<ScoringFalsePredicate>();
      }
      if (predicate) compound->AddPredicate(predicate.release());
    }
    return compound.release();
  } catch (const ScoringException&) {
    TraceParseException(kParseCompoundPredicate, __LINE__);
    throw;
  }
}

ScoringSimplePredicate* ScoringPMMLParser::ParsePredicate(DOMNode* node, const QZVarList& vars) {
  try {
    const std::string field = ToString(Attribute(node, kField.c_str()));
    const IQZVariable* variable = vars.GetVariable(field);
    if (variable == nullptr) {
      throw ScoringException(ScoringException::SCORING_EXC_UNKNOWN_VARIABLE,
                             field + ": Invalid Split Variable!");
    }
    std::unique_ptr<ScoringSplitVar> split;
    if (IsCategorical(variable)) {
      split.reset(HandleNodeDiscreteSplit(node, variable));
    } else {
      split.reset(HandleNodeScaleSplit(node, variable));
    }
    auto predicate = std::make_unique<ScoringSimplePredicate>(split.get());
    split.release();  // now owned by the predicate

    // PMML's missing tests are never unknown: the predicate answers them itself.
    if (IsElementNamed(node, kSimplePredicate.c_str())) {
      const XMLCh* op = Attribute(node, kOperator.c_str());
      if (Equals(op, kIsMissing.c_str())) {
        predicate->SetMissingTest(ScoringSimplePredicate::MISSING_TEST_IS_MISSING);
      } else if (Equals(op, kIsNotMissing.c_str())) {
        predicate->SetMissingTest(ScoringSimplePredicate::MISSING_TEST_IS_NOT_MISSING);
      }
    }
    return predicate.release();
  } catch (const ScoringException&) {
    TraceParseException(kParsePredicate, __LINE__);
    throw;
  }
}

ScoringSetPredicate* ScoringPMMLParser::ParseSetPredicate(DOMNode* node, const QZVarList& vars) {
  try {
    const std::string field = ToString(Attribute(node, kField.c_str()));
    const IQZVariable* variable = vars.GetVariable(field);
    if (variable == nullptr) {
      throw ScoringException(ScoringException::SCORING_EXC_UNKNOWN_VARIABLE,
                             "Variable " + field + " not in the dictionary!");
    }
    if (!IsCategorical(variable)) return nullptr;
    if (variable->GetNumCategories() == 0) {
      throw ScoringException(ScoringException::SCORING_EXC_MISSING_ELEMENT,
                             field + ": category value list is required!!");
    }
    std::unique_ptr<ScoringDiscreteSplit> split(HandleArrayDiscreteSplit(node, variable));
    auto predicate = std::make_unique<ScoringSetPredicate>(split.get());
    split.release();  // now owned by the predicate
    return predicate.release();
  } catch (const ScoringException&) {
    TraceParseException(kParseSetPredicate, __LINE__);
    throw;
  }
}

}  // namespace QZScoring_800

// Split parsing: the split variable that a SimplePredicate or SimpleSetPredicate element
// describes. Every split built here uses the one child index 0: its values or range are
// those for which the predicate holds; its missing-value map is -1 (missing input makes
// the predicate unknown) or 0 (missing input makes it true).

#include <algorithm>
#include <cmath>
#include <limits>
#include <memory>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/dom/DOMNode.hpp>

#include "QZVarList.h"
#include "ScoringDiscreteSplit.h"
#include "ScoringException.h"
#include "ScoringPMMLParser.h"
#include "ScoringPMMLTags.h"
#include "ScoringRange.h"
#include "ScoringScaleSplit.h"
#include "TreeParsing.h"
#include "Value.h"

using QZCommon_800::Value;
using QZXML_800::IQZEncoder;
using QZXML_800::IQZVariable;
using xercesc::DOMElement;
using xercesc::DOMNode;

namespace QZScoring_800 {

namespace {

using Tags = ScoringPMMLTags;
using tree_parsing::Attribute;
using tree_parsing::Equals;
using tree_parsing::IsElementNamed;
using tree_parsing::TraceParseException;
using tree_parsing::WideText;
using Code = ScoringException::ExceptionCode;

constexpr WideText kSimplePredicate(Tags::PMML_ELE_SIMPLE_PREDICATE);
constexpr WideText kSimpleSetPredicate(Tags::PMML_ELE_SIMPLE_SET_PREDICATE);
constexpr WideText kArray(Tags::PMML_ELE_ARRAY);
constexpr WideText kOperator(Tags::PMML_ATT_OPERATOR);
constexpr WideText kValue(Tags::PMML_ATT_VALUE);
constexpr WideText kBooleanOperator(Tags::PMML_ATT_BOOLEAN_OPERATOR);
constexpr WideText kType(Tags::PMML_ATT_TYPE);
constexpr WideText kCount(Tags::PMML_STAT_N);
constexpr WideText kEqual(Tags::PMML_VAL_EQUAL);
constexpr WideText kNotEqual(Tags::PMML_VAL_NOT_EQUAL);
constexpr WideText kLessThan(Tags::PMML_VAL_LESS_THAN);
constexpr WideText kLessOrEqual(Tags::PMML_VAL_LESS_OR_EQUAL);
constexpr WideText kGreaterThan(Tags::PMML_VAL_GREATER_THAN);
constexpr WideText kGreaterOrEqual(Tags::PMML_VAL_GREATER_OR_EQUAL);
constexpr WideText kIsMissing(Tags::PMML_VAL_IS_MISSING);
constexpr WideText kIsNotMissing(Tags::PMML_VAL_IS_NOT_MISSING);
constexpr WideText kIsIn("isIn");
constexpr WideText kIsNotIn("isNotIn");
constexpr WideText kString(Tags::PMML_VAL_STRING);
constexpr WideText kReal(Tags::PMML_VAL_REAL);
constexpr WideText kInt(Tags::PMML_VAL_INT);

const char kHandleNodeDiscreteSplit[] =
    "QZScoring_800::ScoringPMMLParser::HandleNodeDiscreteSplit";
const char kHandleNodeScaleSplit[] = "QZScoring_800::ScoringPMMLParser::HandleNodeScaleSplit";
const char kHandleArrayDiscreteSplit[] =
    "QZScoring_800::ScoringPMMLParser::HandleArrayDiscreteSplit";
const char kSetDiscreteSplitValue[] = "QZScoring_800::ScoringPMMLParser::SetDiscreteSplitValue";
const char kGetScaleSplitValue[] = "QZScoring_800::ScoringPMMLParser::GetScaleSplitValue";
const char kRemove[] = "QZScoring_800::ScoringPMMLParser::Remove";
const char kGetArrayNode[] = "QZScoring_800::ScoringPMMLParser::GetArrayNode";
const char kGetArrayElements[] = "QZScoring_800::ScoringPMMLParser::GetArrayElements";

const char kArrayNodeRequired[] = "Array Node is required!!!";
const char kArraySizeMismatch[] = "Number of Elements doesn't match with array size!";
const char kInvalidOperator[] = "Invalid operator!!";

constexpr double kInfinity = std::numeric_limits<double>::infinity();

bool IsOrdinal(const IQZVariable* variable) {
  const auto* categorical = dynamic_cast<const QZXML_800::QZCatVar*>(variable);
  return categorical != nullptr && categorical->GetOrdinalFlag();
}

bool HasTextCategories(const IQZVariable* variable) {
  return variable->GetMeasureLevel() == QZXML_800::ML_STRING_CATEGORICAL;
}

// The ordering comparisons, which have no meaning on an unordered field.
bool IsOrderingOperator(const XMLCh* op) {
  return Equals(op, kLessThan.c_str()) || Equals(op, kLessOrEqual.c_str()) ||
         Equals(op, kGreaterThan.c_str()) || Equals(op, kGreaterOrEqual.c_str());
}

// The categories of a categorical variable, read in place from its encoder by position
// and looked up through the encoder's index, so that no step of a parse scans or copies
// the whole category list more than once.
class Categories {
 public:
  explicit Categories(const IQZVariable* variable)
      : fEncoder(variable->GetEncoder()), fNumbers(!HasTextCategories(variable)) {}

  int Count() const { return fEncoder != nullptr ? fEncoder->GetCount() : 0; }
  // The category at position i, as ScoringPMMLParser::GetValues gives it.
  Value At(int i) const {
    return fNumbers ? Value(fEncoder->GetNumberAt(i)) : Value(fEncoder->GetStringAt(i));
  }
  // The text of the category at position i (a number's shortest decimal text).
  std::string TextAt(int i) const {
    return fNumbers ? Value::RealToText(fEncoder->GetNumberAt(i)) : fEncoder->GetStringAt(i);
  }
  // The position of the category a value text names (the number it reads as, for number
  // categories); -1 when none does.
  int IndexOf(const std::string& text) const {
    if (Count() == 0) return -1;
    const double index = fNumbers ? fEncoder->IndexOfNumber(Value::TextToReal(text))
                                  : fEncoder->IndexOfString(text);
    return index < 0.0 ? -1 : static_cast<int>(index);
  }
  // The category text that a value text names: numbers in their shortest decimal text.
  std::string Canonical(const std::string& text) const {
    return fNumbers ? Value::RealToText(Value::TextToReal(text)) : text;
  }

 private:
  const IQZEncoder* fEncoder;
  bool fNumbers;
};

// The split value that an attribute text names: a text for text categories, else the
// number the text reads as. Refuses an absent text and, when the variable lists
// categories, a value that is not one of them.
std::unique_ptr<Value> NewSplitValue(const ScoringBaseParser& parser,
                                     const IQZVariable* variable, const XMLCh* valueText) {
  if (valueText == nullptr) {
    throw ScoringException(ScoringException::SCORING_EXC_INVALID_SPLIT,
                           "value attribute is required for split variable " +
                               variable->GetName());
  }
  std::string text = parser.ToString(valueText);
  auto value = HasTextCategories(variable) ? std::make_unique<Value>(text)
                                           : std::make_unique<Value>(Value::TextToReal(text));
  if (variable->GetNumCategories() != 0 && !ScoringPMMLParser::IsValidValue(variable, *value)) {
    throw ScoringException(ScoringException::SCORING_EXC_INVALID_SPLIT,
                           "Value list is required and split value should be in the list!" +
                               text);
  }
  return value;
}

bool IsArraySpace(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

bool HasArrayToken(const XMLCh* text) {
  for (; text != nullptr && *text != 0; ++text) {
    if (*text > 0x7F || !IsArraySpace(static_cast<char>(*text))) return true;
  }
  return false;
}

// The text of an array: its text and CDATA children joined, comments skipped.
std::u16string ArrayText(const DOMNode* array) {
  std::u16string text;
  for (const DOMNode* child = array->getFirstChild(); child != nullptr;
       child = child->getNextSibling()) {
    const auto type = child->getNodeType();
    if (type == DOMNode::TEXT_NODE || type == DOMNode::CDATA_SECTION_NODE) {
      const XMLCh* value = child->getNodeValue();
      if (value != nullptr) text += value;
    }
  }
  return text;
}

// A quoted array element's text: an escaped quote (\") stands for the quote itself;
// every other backslash is kept.
std::string Unescape(const std::string& text, size_t begin, size_t end) {
  std::string element;
  element.reserve(end - begin);
  for (size_t i = begin; i < end; ++i) {
    if (text[i] == '\\' && i + 1 < end && text[i + 1] == '"') ++i;
    element.push_back(text[i]);
  }
  return element;
}

}  // namespace

ScoringDiscreteSplit* ScoringPMMLParser::HandleNodeDiscreteSplit(DOMNode* node,
                                                                 const IQZVariable* variable) {
  try {
    const Categories categories(variable);
    int low = 0;
    int high = variable->GetNumCategories() - 1;
    bool validRange = true;
    auto split = std::make_unique<ScoringDiscreteSplit>(variable);
    const bool ordinal = IsOrdinal(variable);

    // Narrows the ordinal range to the positions the element's operator and value select.
    auto narrowOrdinal = [&](DOMElement* element) {
      int from = 0;
      int to = 0;
      HandleOrdinalVariable(element, variable, from, to);
      low = std::max(low, from);
      high = std::min(high, to);
      return std::make_pair(from, to);
    };

    if (IsElementNamed(node, kSimplePredicate.c_str())) {
      auto* element = static_cast<DOMElement*>(node);
      const XMLCh* op = Attribute(element, kOperator.c_str());
      const XMLCh* value = Attribute(element, kValue.c_str());
      if (Equals(op, kIsMissing.c_str()) || Equals(op, kIsNotMissing.c_str())) {
        // A missing test compares no value; the predicate itself answers it.
        if (value != nullptr) {
          throw ScoringException(ScoringException::SCORING_EXC_INVALID_SPLIT,
                                 Equals(op, kIsMissing.c_str())
                                     ? "No value attribute allowed after \"isMissing\""
                                     : "No value allowed after \"isMissing\" or\"isNotMissing\"");
        }
        split->SetMissvalMap(0);
      } else if (value != nullptr && *value == 0) {
        if (!Equals(op, kEqual.c_str())) {
          throw ScoringException(ScoringException::SCORING_EXC_INVALID_SPLIT,
                                 "Only equal operator is allowed for null string value");
        }
        if (!HasTextCategories(variable)) {
          split->SetMissvalMap(0);
        } else {
          if (categories.Count() == 0) {
            throw ScoringException(ScoringException::SCORING_EXC_MISSING_ELEMENT,
                                   variable->GetName() + "Value list is required!");
          }
          // An empty category is a value of its own; without one, empty means missing.
          if (categories.IndexOf(std::string()) < 0) {
            split->SetMissvalMap(0);
          } else if (!ordinal) {
            SetDiscreteSplitValue(variable, split.get(), value, 0);
          } else {
            const auto selected = narrowOrdinal(element);
            if (selected.first > high || selected.second < low) validRange = false;
          }
        }
      } else if (ordinal) {
        narrowOrdinal(element);
      } else if (IsOrderingOperator(op)) {
        throw ScoringException(ScoringException::SCORING_EXC_INVALID_OPERATOR, kInvalidOperator);
      } else if (Equals(op, kNotEqual.c_str())) {
        // Every category but the value, as "isNotIn" with one element.
        const std::unique_ptr<Value> excluded = NewSplitValue(*this, variable, value);
        if (categories.Count() == 0) {
          throw ScoringException(ScoringException::SCORING_EXC_MISSING_ELEMENT,
                                 variable->GetName() + "Value list is required!");
        }
        for (int i = 0; i < categories.Count(); ++i) {
          Value category = categories.At(i);
          if (category != *excluded) split->PutSplit(new Value(std::move(category)), 0);
        }
      } else {
        SetDiscreteSplitValue(variable, split.get(), value, 0);
      }
    }

    if (!validRange) {
      throw ScoringException(ScoringException::SCORING_EXC_INVALID_RANGE,
                             "Invalid split value range!!!");
    }
    if (ordinal) {
      const int count = categories.Count();
      if (count == 0) {
        throw ScoringException(ScoringException::SCORING_EXC_MISSING_ELEMENT,
                               "Value list is required!!");
      }
      for (int i = low; i <= high && i < count; ++i) {
        split->PutSplit(new Value(categories.At(i)), 0);
      }
    }
    return split.release();
  } catch (const ScoringException&) {
    TraceParseException(kHandleNodeDiscreteSplit, __LINE__);
    throw;
  }
}

void ScoringPMMLParser::SetDiscreteSplitValue(const IQZVariable* variable,
                                              ScoringDiscreteSplit* split, const XMLCh* value,
                                              int childIndex) {
  try {
    split->PutSplit(NewSplitValue(*this, variable, value).release(), childIndex);
  } catch (const ScoringException&) {
    TraceParseException(kSetDiscreteSplitValue, __LINE__);
    throw;
  }
}

int ScoringPMMLParser::HandleOrdinalVariable(DOMElement* element, const IQZVariable* variable,
                                             int& low, int& high) {
  const std::string text = ToString(Attribute(element, kValue.c_str()));
  const XMLCh* op = Attribute(element, kOperator.c_str());
  const int index = GetIndexOfOrdinalValue(text, variable);
  const int last = variable->GetNumCategories() - 1;
  if (index == -1) {
    throw ScoringException(ScoringException::SCORING_EXC_INVALID_OPERATOR,
                           "Invalid split value for variable: " + variable->GetName());
  }
  if (Equals(op, kGreaterThan.c_str())) {
    low = index + 1;
    high = last;
  } else if (Equals(op, kGreaterOrEqual.c_str())) {
    low = index;
    high = last;
  } else if (Equals(op, kLessThan.c_str())) {
    low = 0;
    high = index - 1;
  } else if (Equals(op, kLessOrEqual.c_str())) {
    low = 0;
    high = index;
  } else if (Equals(op, kEqual.c_str())) {
    low = high = index;
    return 0;
  } else {
    throw ScoringException(ScoringException::SCORING_EXC_INVALID_OPERATOR, kInvalidOperator);
  }
  return 1;
}

int ScoringPMMLParser::GetIndexOfOrdinalValue(const std::string& text,
                                              const IQZVariable* variable) {
  const Categories categories(variable);
  if (categories.Count() == 0) {
    throw ScoringException(ScoringException::SCORING_EXC_INVALID_SPLIT,
                           variable->GetName() + ": Value list is required!!");
  }
  return categories.IndexOf(text);
}

ScoringScaleSplit* ScoringPMMLParser::HandleNodeScaleSplit(DOMNode* node,
                                                           const IQZVariable* variable) {
  try {
    auto split = std::make_unique<ScoringScaleSplit>(variable);
    double low = -kInfinity;
    double high = kInfinity;
    bool lowIncluded = false;
    bool highIncluded = false;
    bool seen = false;
    if (IsElementNamed(node, kSimplePredicate.c_str())) {
      seen = true;
      const XMLCh* op = Attribute(node, kOperator.c_str());
      const XMLCh* value = Attribute(node, kValue.c_str());
      const bool isMissing = Equals(op, kIsMissing.c_str());
      const bool isNotMissing = Equals(op, kIsNotMissing.c_str());
      if (value != nullptr && (isMissing || isNotMissing)) {
        throw ScoringException(ScoringException::SCORING_EXC_INVALID_SPLIT,
                               "No value allowed after \"isMissing\" or\"isNotMissing\"");
      }
      if (isMissing) {
        split->SetMissvalMap(0);
      } else if (value != nullptr && *value == 0) {
        if (!Equals(op, kEqual.c_str())) {
          throw ScoringException(ScoringException::SCORING_EXC_INVALID_SPLIT,
                                 "Only \"Equal\" allowed here!!!");
        }
        split->SetMissvalMap(0);
      } else if (isNotMissing) {
        split->PutSplit(new ScoringRange(-kInfinity, kInfinity, false, false), 0);
        return split.release();
      } else {
        double from = 0.0;
        double to = 0.0;
        bool included = false;
        GetScaleSplitValue(value, op, from, to, included);
        if (from > -kInfinity) {
          low = from;
          lowIncluded = included;
        }
        if (to < kInfinity) {
          high = to;
          highIncluded = included;
        }
      }
    }
    if (low > high) {
      throw ScoringException(ScoringException::SCORING_EXC_INVALID_RANGE,
                             variable->GetName() + ": Invalid split value range!!!");
    }
    // A missing test or an empty "equal" holds for missing input only: no range.
    if (!(seen && low == -kInfinity && high == kInfinity)) {
      split->PutSplit(new ScoringRange(low, high, lowIncluded, highIncluded), 0);
    }
    return split.release();
  } catch (const ScoringException&) {
    TraceParseException(kHandleNodeScaleSplit, __LINE__);
    throw;
  }
}

void ScoringPMMLParser::GetScaleSplitValue(const XMLCh* value, const XMLCh* op, double& low,
                                           double& high, bool& included) {
  try {
    enum { kAbove, kFrom, kBelow, kUpTo, kAt } comparison;
    if (Equals(op, kGreaterThan.c_str())) {
      comparison = kAbove;
    } else if (Equals(op, kGreaterOrEqual.c_str())) {
      comparison = kFrom;
    } else if (Equals(op, kLessThan.c_str())) {
      comparison = kBelow;
    } else if (Equals(op, kLessOrEqual.c_str())) {
      comparison = kUpTo;
    } else if (Equals(op, kEqual.c_str())) {
      comparison = kAt;
    } else {
      throw ScoringException(ScoringException::SCORING_EXC_INVALID_RANGE,
                             ToString(op) + ": Not supported!");
    }
    // A comparison needs a number to compare with; never build a range from none.
    if (value == nullptr) {
      throw ScoringException(ScoringException::SCORING_EXC_INVALID_RANGE,
                             "value attribute is required for operator " + ToString(op));
    }
    // A number too large for a double (1e400) reads as infinity. Infinite range ends are
    // open, so x < 1e400 would hold for no number: such comparisons are refused.
    double number = 0.0;
    if (!ParseDouble(value, number) || !std::isfinite(number)) {
      throw ScoringException(ScoringException::SCORING_EXC_INVALID_RANGE,
                             "Invalid split value: " + ToString(value));
    }
    low = -kInfinity;
    high = kInfinity;
    switch (comparison) {
      case kAbove:
        low = number;
        included = false;
        break;
      case kFrom:
        low = number;
        included = true;
        break;
      case kBelow:
        high = number;
        included = false;
        break;
      case kUpTo:
        high = number;
        included = true;
        break;
      case kAt:
        low = high = number;
        included = true;
        break;
    }
  } catch (const ScoringException&) {
    TraceParseException(kGetScaleSplitValue, __LINE__);
    throw;
  }
}

ScoringDiscreteSplit* ScoringPMMLParser::HandleArrayDiscreteSplit(DOMNode* node,
                                                                  const IQZVariable* variable) {
  try {
    if (variable->GetNumCategories() == 0) {
      throw ScoringException(ScoringException::SCORING_EXC_INVALID_VALUE,
                             variable->GetName() + ": Value list is required!");
    }
    auto split = std::make_unique<ScoringDiscreteSplit>(variable);
    const XMLCh* op = nullptr;
    const XMLCh* type = nullptr;
    std::vector<std::string> texts;
    if (IsElementNamed(node, kSimpleSetPredicate.c_str())) {
      op = Attribute(node, kBooleanOperator.c_str());
      DOMNode* array = GetArrayNode(node);
      type = Attribute(array, kType.c_str());
      texts = GetArrayElements(array, type);
    }
    if (!Equals(type, kString.c_str()) && !Equals(type, kReal.c_str()) &&
        !Equals(type, kInt.c_str())) {
      throw ScoringException(ScoringException::SCORING_EXC_INVALID_BOOLEAN_OPERATOR,
                             ToString(type) + " Invalid Operator!");
    }
    if (Equals(op, kIsIn.c_str())) {
      for (std::string& text : texts) {
        auto value = std::make_unique<Value>(std::move(text));
        if (!IsValidValue(variable, *value)) {
          throw ScoringException(ScoringException::SCORING_EXC_INVALID_VALUE,
                                 "In valid split value!");
        }
        split->PutSplit(value.release(), 0);
      }
    } else if (Equals(op, kIsNotIn.c_str())) {
      for (std::string& text : Remove(variable, std::move(texts))) {
        split->PutSplit(new Value(std::move(text)), 0);
      }
    } else {
      throw ScoringException(ScoringException::SCORING_EXC_INVALID_OPERATOR,
                             ToString(op) + " Invalid Operator!");
    }
    return split.release();
  } catch (const ScoringException&) {
    TraceParseException(kHandleArrayDiscreteSplit, __LINE__);
    throw;
  }
}

std::vector<std::string> ScoringPMMLParser::Remove(const IQZVariable* variable,
                                                   std::vector<std::string> texts) {
  try {
    const Categories categories(variable);
    // How many times each category text is listed; a listing removes one category.
    std::unordered_map<std::string, int> listed;
    listed.reserve(texts.size());
    for (const std::string& text : texts) {
      if (categories.IndexOf(text) < 0) {
        throw ScoringException(ScoringException::SCORING_EXC_INVALID_VALUE,
                               "Invalid category value: " + text);
      }
      ++listed[categories.Canonical(text)];
    }
    const int count = categories.Count();
    if (count == 0) {
      throw ScoringException(ScoringException::SCORING_EXC_MISSING_ELEMENT,
                             variable->GetName() + ": Category value list is required!!!");
    }
    std::vector<std::string> remaining;
    remaining.reserve(static_cast<size_t>(count));
    for (int i = 0; i < count; ++i) {
      std::string text = categories.TextAt(i);
      const auto found = listed.find(text);
      if (found != listed.end() && found->second > 0) {
        --found->second;
        continue;
      }
      remaining.push_back(std::move(text));
    }
    return remaining;
  } catch (const ScoringException&) {
    TraceParseException(kRemove, __LINE__);
    throw;
  }
}

DOMNode* ScoringPMMLParser::GetArrayNode(DOMNode* node) {
  try {
    for (DOMNode* child = node != nullptr ? node->getFirstChild() : nullptr; child != nullptr;
         child = child->getNextSibling()) {
      if (xercesc::XMLString::equals(child->getNodeName(), kArray.c_str())) return child;
    }
    throw ScoringException(ScoringException::SCORING_EXC_INVALID_OPERATOR, kArrayNodeRequired);
  } catch (const ScoringException&) {
    TraceParseException(kGetArrayNode, __LINE__);
    throw;
  }
}

std::vector<std::string> ScoringPMMLParser::GetArrayElements(DOMNode* arrayNode,
                                                             const XMLCh* type) {
  try {
    // Without "n" every element is read; with it, exactly n must be there.
    const XMLCh* countText = Attribute(arrayNode, kCount.c_str());
    const bool counted = countText != nullptr && *countText != 0;
    const long long count = counted ? VerifyInt(countText) : 0;
    if (arrayNode == nullptr || arrayNode->getFirstChild() == nullptr) {
      throw ScoringException(ScoringException::SCORING_EXC_MISSING_ELEMENT, kArrayNodeRequired);
    }
    const std::u16string wide = ArrayText(arrayNode);
    if (!HasArrayToken(wide.c_str())) {
      throw ScoringException(ScoringException::SCORING_EXC_MISSING_ELEMENT,
                             "No Elements found in array!");
    }
    const bool reals = Equals(type, kReal.c_str());
    const bool ints = Equals(type, kInt.c_str());
    const std::string text = ToString(wide.c_str());
    const size_t length = text.size();

    // Elements are separated by white space; a double-quoted element may hold white
    // space and escaped quotes (\").
    std::vector<std::string> elements;
    size_t i = 0;
    while (i < length && (!counted || static_cast<long long>(elements.size()) < count)) {
      const char c = text[i];
      if (IsArraySpace(c)) {
        ++i;
        continue;
      }
      if (c == '\\' && i + 1 < length && text[i + 1] == '"') {
        i += 2;  // a stray escaped quote between elements
        continue;
      }
      std::string element;
      if (c == '"') {
        size_t close = i + 1;
        while (close < length && !(text[close] == '"' && text[close - 1] != '\\')) ++close;
        if (close >= length) {
          throw ScoringException(ScoringException::SCORING_EXC_ARRAY_SIZE_MISMATCH,
                                 kArraySizeMismatch);
        }
        element = Unescape(text, i + 1, close);
        i = close + 1;
      } else {
        size_t end = i;
        while (end < length && !IsArraySpace(text[end])) ++end;
        element.assign(text, i, end - i);
        i = end;
      }
      if (reals) VerifyDouble(element);
      if (ints) VerifyInt(element);
      elements.push_back(std::move(element));
    }
    if (counted && static_cast<long long>(elements.size()) != count) {
      throw ScoringException(ScoringException::SCORING_EXC_ARRAY_SIZE_MISMATCH,
                             kArraySizeMismatch);
    }
    return elements;
  } catch (const ScoringException&) {
    TraceParseException(kGetArrayElements, __LINE__);
    throw;
  }
}

}  // namespace QZScoring_800

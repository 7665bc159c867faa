#include "TreeModel.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <memory>
#include <iterator>
#include <string>
#include <vector>

#include <xercesc/dom/DOMElement.hpp>

#include "PluginDom.h"
#include "QZVarList.h"
#include "ScoringCompoundPredicate.h"
#include "ScoringException.h"
#include "ScoringFalsePredicate.h"
#include "ScoringPMMLParser.h"
#include "ScoringPredicate.h"
#include "ScoringSetPredicate.h"
#include "ScoringSimplePredicate.h"
#include "ScoringTruePredicate.h"
#include "StepTree.h"

namespace QZPlugin_800 {

namespace {

using QZCommon_800::Value;
using QZScoring_800::ScoringPredicate;
using xercesc::DOMElement;
using Outcome = ScoringPredicate::PredicateResult;

constexpr uint32_t kNoNode = UINT32_MAX;
constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

enum class MissingStrategy { kNone, kLastPrediction, kNullPrediction, kDefaultChild,
                             kWeightedConfidence, kAggregateNodes };

MissingStrategy ParseMissingStrategy(const std::string& text) {
  if (text.empty() || text == "none") return MissingStrategy::kNone;
  if (text == "lastPrediction") return MissingStrategy::kLastPrediction;
  if (text == "nullPrediction") return MissingStrategy::kNullPrediction;
  if (text == "defaultChild") return MissingStrategy::kDefaultChild;
  if (text == "weightedConfidence") return MissingStrategy::kWeightedConfidence;
  if (text == "aggregateNodes") return MissingStrategy::kAggregateNodes;
  throw CompileError("TreeModel missingValueStrategy '" + text + "' is not supported");
}

bool IsPredicateElement(const DOMElement* element) {
  return IsElement(element, u"SimplePredicate") || IsElement(element, u"CompoundPredicate") ||
         IsElement(element, u"SimpleSetPredicate") || IsElement(element, u"True") ||
         IsElement(element, u"False");
}

bool IsCategorical(const QZXML_800::IQZVariable* variable) {
  const int level = variable->GetMeasureLevel();
  return level == QZXML_800::ML_NUMERIC_CATEGORICAL || level == QZXML_800::ML_STRING_CATEGORICAL;
}

// Refuses what the library's predicate parsers would accept with a different meaning:
// elements a CompoundPredicate would silently skip, a SimpleSetPredicate it would drop
// (on a field that is not categorical), and operators a categorical split would read
// as "equal".
void CheckPredicate(const DomReader& reader, const QZXML_800::QZVarList& variables,
                    const DOMElement* element) {
  if (IsElement(element, u"SimplePredicate")) {
    static const char* const kOperators[] = {"equal",       "notEqual",       "lessThan",
                                             "lessOrEqual", "greaterThan",    "greaterOrEqual",
                                             "isMissing",   "isNotMissing"};
    const std::string op = reader.Attr(element, u"operator");
    if (std::find(std::begin(kOperators), std::end(kOperators), op) == std::end(kOperators)) {
      throw CompileError("SimplePredicate operator '" + op + "' is not supported");
    }
  } else if (IsElement(element, u"SimpleSetPredicate")) {
    const std::string field = reader.Attr(element, u"field");
    const QZXML_800::IQZVariable* variable = variables.GetVariable(field);
    if (variable != nullptr && !IsCategorical(variable)) {
      throw CompileError("SimpleSetPredicate on field '" + field +
                         "', which is not categorical, is not supported");
    }
  } else if (IsElement(element, u"CompoundPredicate")) {
    for (const DOMElement* child : ChildElements(element)) {
      if (IsElement(child, u"Extension")) continue;
      if (!IsPredicateElement(child)) {
        throw CompileError("predicate element '" + reader.Name(child) + "' is not supported");
      }
      CheckPredicate(reader, variables, child);
    }
  }
}

// The predicate of a node, built by the library's predicate parsers.
std::unique_ptr<ScoringPredicate> ParseNodePredicate(ModelContext& context,
                                                     const DOMElement* element) {
  const QZXML_800::QZVarList& variables = context.Variables();
  CheckPredicate(context.Reader(), variables, element);
  if (IsElement(element, u"True")) return std::make_unique<QZScoring_800::ScoringTruePredicate>();
  if (IsElement(element, u"False")) {
    return std::make_unique<QZScoring_800::ScoringFalsePredicate>();
  }
  QZScoring_800::ScoringPMMLParser& parser = context.Document().Parser();
  xercesc::DOMNode* node = const_cast<DOMElement*>(element);  // the parsers only read it
  std::unique_ptr<ScoringPredicate> predicate;
  try {
    if (IsElement(element, u"SimplePredicate")) {
      predicate.reset(parser.ParsePredicate(node, variables));
    } else if (IsElement(element, u"CompoundPredicate")) {
      predicate.reset(parser.ParseCompoundPredicate(node, variables));
    } else {
      predicate.reset(parser.ParseSetPredicate(node, variables));
    }
  } catch (const QZScoring_800::ScoringException& e) {
    throw CompileError(context.Reader().Name(element) + " refused (code " +
                       std::to_string(e.GetErrorCode()) + "): " + e.GetErrorMessage());
  }
  if (!predicate) throw CompileError(context.Reader().Name(element) + " could not be built");
  return predicate;
}

// How a node's predicate is tested: the constants need no call; a comparison with
// numbers, or a test of a categorical field, is answered from the predicate's plain
// form with the value read through the model's field slot; anything else (and any value
// the plain form does not judge) is left to the predicate itself.
enum class Test : uint8_t { kAlways, kNever, kNumeric, kCategory, kEvaluate };

// What a classification node predicts when it decides: nothing, one category it is
// certain of (probability and confidence 1), or a distribution row.
enum class Decision : uint8_t { kNothing, kCertain, kDistribution };

// A NumericTest without its encoder (which the tree keeps once per field): the range
// and the three results packed into one byte beside the inclusion marks.
struct NumericRange {
  double low;
  double high;
};

// One node as scoring reads it, 32 bytes, so that two siblings usually share a cache
// line: how its predicate is tested and where its children are. What a node predicts
// and its id lie in arrays of their own, read only by the node that decides. The
// children of a node are consecutive in the array, so the tests of siblings, made one
// after the other, lie side by side, and the node that decides is the one just tested.
struct Node {
  union {
    NumericRange numeric;                    // kNumeric
    ScoringPredicate::CategoryTest category;  // kCategory
  };
  uint32_t firstChild = 0;  // children: [firstChild, endChild)
  uint32_t endChild = 0;
  uint16_t field = 0;       // kNumeric, kCategory: the field's index in the FieldRow
  Test test : 4;
  Decision decision : 4;
  // kNumeric: bit 0 low end included, bit 1 high end included, then two bits each for
  // the results of a missing value, a number in the range and any other number.
  uint8_t form = 0;

  Node() : numeric(), test(Test::kEvaluate), decision(Decision::kNothing) {}
};
static_assert(sizeof(Node) == 32, "two nodes to a cache line");

uint8_t PackNumericForm(const QZScoring_800::ScoringSimplePredicate::NumericTest& test) {
  return static_cast<uint8_t>((test.lowIncluded ? 1 : 0) | (test.highIncluded ? 2 : 0) |
                              (test.missing & 3) << 2 | (test.inRange & 3) << 4 |
                              (test.outOfRange & 3) << 6);
}

// One ScoreDistribution as read, before the category count is final.
struct Entry {
  int category;
  double count, probability, confidence;
};

// One branch followed under weightedConfidence or aggregateNodes.
struct Branch {
  uint32_t node;
  double weight;
};

class TreeEvaluator : public ModelEvaluator {
 public:
  explicit TreeEvaluator(ModelContext& context);
  void Evaluate(const FieldView& fields, ModelResult& result) override;
  FieldRow* Row() override { return &row_; }
  const StepTree* Steps() const override { return steps_.Empty() ? nullptr : &steps_; }
  void DecideStep(uint32_t node, ModelResult& result) override {
    if (node != StepTree::kDecidesNothing) Decide(node, 0, result);
  }
  bool Rebase(const std::vector<int>& numbers, const std::vector<int>& categories) override;
  void EvaluateRow(FieldRow& row, const QZCommon_800::ValueRecord& record,
                   ModelResult& result) override {
    Walk(Input{row, record}, result);
  }

 private:
  void CompileNode(ModelContext& context, uint32_t index,
                   std::vector<const DOMElement*>& elements,
                   std::vector<std::vector<Entry>>& entries,
                   std::vector<std::string>& defaults);
  void CompileTest(ModelContext& context, Node& node, const ScoringPredicate& predicate);
  void CompileDistributions(const std::vector<std::vector<Entry>>& entries);
  void ResolveDefaultChildren(const std::vector<std::string>& defaults);

  // One record as the walk reads it: the decoded row, and the record itself for the
  // predicates the row does not answer.
  struct Input {
    FieldRow& row;
    const QZCommon_800::ValueRecord& record;
  };

  Outcome Check(uint32_t index, const Input& in) const {
    const Node& node = nodes_[index];
    Outcome outcome = ScoringPredicate::PREDICATE_UNKNOWN;
    switch (node.test) {
      case Test::kAlways:
        return ScoringPredicate::PREDICATE_TRUE;
      case Test::kNever:
        return ScoringPredicate::PREDICATE_FALSE;
      case Test::kNumeric:
        if (EvaluateNumeric(node, in.row, outcome)) return outcome;
        break;
      case Test::kCategory:
        if (ScoringPredicate::EvaluateCategoryTest(node.category, in.row.Code(node.field),
                                                   outcome)) {
          return outcome;
        }
        break;
      case Test::kEvaluate:
        break;
    }
    return predicates_[index]->Evaluate(in.record);
  }
  // What ScoringSimplePredicate::EvaluateNumericTest answers for the node's test, from
  // the decoded number; false for a value only the predicate can judge.
  static bool EvaluateNumeric(const Node& node, const FieldRow& row, Outcome& result) {
    const double x = row.Number(node.field);
    unsigned shift;
    if (!std::isnan(x)) {
      const bool above = (node.form & 1) != 0 ? x >= node.numeric.low : x > node.numeric.low;
      const bool below = (node.form & 2) != 0 ? x <= node.numeric.high : x < node.numeric.high;
      shift = above && below ? 4 : 6;
    } else {
      switch (row.State(node.field)) {
        case FieldRow::kMissing:
          shift = 2;
          break;
        case FieldRow::kNotANumber:
          shift = 6;
          break;
        default:
          return false;
      }
    }
    result = static_cast<Outcome>((node.form >> shift) & 3);
    return true;
  }
  void Walk(const Input& in, ModelResult& result);
  void CompileSteps();
  void Decide(uint32_t index, int missing, ModelResult& result) const;
  void PushBranches(const Input& in, uint32_t parent, uint32_t first, double weight);
  void FollowBranches(const Input& in, uint32_t entity, ModelResult& result);
  void Gather(uint32_t index, double weight);

  MissingStrategy strategy_ = MissingStrategy::kNone;
  bool returnLast_ = false;  // noTrueChildStrategy="returnLastPrediction"
  double penalty_ = 1.0;
  bool classification_ = false;
  size_t categories_ = 0;  // the category count of the distribution rows

  // Per node, the root first.
  std::vector<Node> nodes_;
  std::vector<double> scores_;     // regression: the score; NaN when none
  std::vector<int> predicted_;     // classification: the predicted category; -1 when none
  std::vector<double> weights_;    // the record count that weighs a node against its siblings
  std::vector<std::unique_ptr<ScoringPredicate>> predicates_;
  std::vector<uint32_t> defaultChildren_;  // kNoNode when none
  std::vector<Value> ids_;                 // the node ids (null for a node without one)
  std::vector<uint8_t> hasId_;             // ids_ holds the node's id
  std::vector<uint32_t> outcomes_;  // kCertain: the category; kDistribution: the row
  // The fields the numeric and category tests read, decoded per record (unless the
  // tree joined its ensemble's row).
  FieldRow row_;
  // Per distribution row: `categories_` probabilities, then as many confidences.
  std::vector<double> rows_;
  // Per distribution row, `categories_` record counts (for aggregateNodes).
  std::vector<double> counts_;

  // The tree as a branch-free walk, for ensembles of shallow trees; empty for a tree
  // deeper than StepTree::kShallow or a test that can give more than true and false
  // for plain values.
  StepTree steps_;

  // The scratch of weightedConfidence and aggregateNodes, sized at compile time.
  std::vector<Branch> branches_;
  std::vector<double> sumProbabilities_;
  std::vector<double> sumConfidences_;
  double sumValue_ = 0.0;
  double sumWeight_ = 0.0;
};

TreeEvaluator::TreeEvaluator(ModelContext& context)
    : row_(context.Document().CategoryCodes()) {
  const DomReader& reader = context.Reader();
  const DOMElement* model = context.Element();
  strategy_ = ParseMissingStrategy(reader.Attr(model, u"missingValueStrategy"));
  const std::string noTrueChild =
      reader.Attr(model, u"noTrueChildStrategy", "returnNullPrediction");
  if (noTrueChild == "returnLastPrediction") {
    returnLast_ = true;
  } else if (noTrueChild != "returnNullPrediction") {
    throw CompileError("TreeModel noTrueChildStrategy '" + noTrueChild + "' is not supported");
  }
  penalty_ = reader.Number(model, u"missingValuePenalty", 1.0);
  if (!(penalty_ >= 0.0 && penalty_ <= 1.0)) {
    throw CompileError("TreeModel missingValuePenalty must lie between 0 and 1");
  }
  const std::string split = reader.Attr(model, u"splitCharacteristic", "multiSplit");
  if (split != "multiSplit" && split != "binarySplit") {
    throw CompileError("TreeModel splitCharacteristic '" + split + "' is not supported");
  }
  classification_ = context.IsClassification();

  const DOMElement* root = FirstChildElement(model, u"Node");
  if (root == nullptr) throw CompileError("TreeModel has no Node");
  if (NextSiblingElement(root, u"Node") != nullptr) {
    throw CompileError("TreeModel has more than one root Node");
  }
  // Breadth first, so that the children of every node are consecutive.
  std::vector<const DOMElement*> elements{root};
  std::vector<std::vector<Entry>> entries(1);
  std::vector<std::string> defaults(1);
  nodes_.emplace_back();
  for (uint32_t i = 0; i < elements.size(); ++i) {
    CompileNode(context, i, elements, entries, defaults);
  }
  if (classification_) {
    categories_ = static_cast<size_t>(context.TargetCategories()->Size());
    CompileDistributions(entries);
    sumProbabilities_.assign(categories_, 0.0);
    sumConfidences_.assign(categories_, 0.0);
  }
  defaultChildren_.assign(nodes_.size(), kNoNode);
  if (strategy_ == MissingStrategy::kDefaultChild) ResolveDefaultChildren(defaults);
  branches_.reserve(nodes_.size());
  CompileSteps();
}

// Builds the branch-free walk when every test gives true or false for plain values:
// constants, numeric tests whose results in and out of the range are true or false,
// and category tests. Missing values are left to the full walk, so the missing value
// strategy never applies to it.
void TreeEvaluator::CompileSteps() {
  StepTree steps;
  std::vector<uint32_t> parents(nodes_.size(), kNoNode);
  std::vector<int> depths(nodes_.size(), 1);  // the steps a walk takes to reach a node
  for (uint32_t i = 0; i < nodes_.size(); ++i) {
    for (uint32_t c = nodes_[i].firstChild; c < nodes_[i].endChild; ++c) {
      parents[c] = i;
      depths[c] = depths[i] + static_cast<int>(c - nodes_[i].firstChild) + 1;
    }
  }
  constexpr auto kTrue = ScoringPredicate::PREDICATE_TRUE;
  constexpr auto kFalse = ScoringPredicate::PREDICATE_FALSE;
  for (uint32_t i = 0; i < nodes_.size(); ++i) {
    const Node& node = nodes_[i];
    StepTree::Node step;
    int count = 64;
    if (node.test == Test::kAlways || node.test == Test::kNever) {
      step = StepTree::Constant(node.test == Test::kAlways);
    } else if (node.test == Test::kNumeric) {
      const auto in = static_cast<Outcome>((node.form >> 4) & 3);
      const auto out = static_cast<Outcome>((node.form >> 6) & 3);
      if ((in != kTrue && in != kFalse) || (out != kTrue && out != kFalse)) return;
      step = StepTree::Number(node.field, node.numeric.low, (node.form & 1) != 0,
                              node.numeric.high, (node.form & 2) != 0, in == kTrue,
                              out == kTrue);
    } else if (node.test == Test::kCategory) {
      step = StepTree::Category(node.field, node.category.members);
      count = node.category.count;
    } else {
      return;
    }
    // True: on to the first child, or this node decides. False: on to the next
    // sibling, or the parent decides when it may (returnLastPrediction), else nothing.
    step.next[1] = node.firstChild < node.endChild ? node.firstChild : (i | StepTree::kEnd);
    const uint32_t parent = parents[i];
    if (parent != kNoNode && i + 1 < nodes_[parent].endChild) {
      step.next[0] = i + 1;
    } else {
      step.next[0] = (parent != kNoNode && returnLast_ ? parent : StepTree::kDecidesNothing) |
                     StepTree::kEnd;
    }
    steps.Add(step, depths[i], count);
  }
  if (nodes_.size() >= StepTree::kDecidesNothing / 2 || steps.Depth() > StepTree::kShallow) {
    return;
  }
  steps.Finish();
  if (!classification_) steps.SetValues(scores_.data());
  steps_ = std::move(steps);
}

void TreeEvaluator::CompileNode(ModelContext& context, uint32_t index,
                                std::vector<const DOMElement*>& elements,
                                std::vector<std::vector<Entry>>& entries,
                                std::vector<std::string>& defaults) {
  const DomReader& reader = context.Reader();
  const DOMElement* element = elements[index];
  const DOMElement* predicate = nullptr;
  std::vector<const DOMElement*> children;
  for (const DOMElement* child : ChildElements(element)) {
    if (IsElement(child, u"Extension") || IsElement(child, u"Partition")) continue;
    if (predicate == nullptr) {
      if (!IsPredicateElement(child)) {
        throw CompileError("Node predicate element '" + reader.Name(child) +
                           "' is not supported");
      }
      predicate = child;
    } else if (IsElement(child, u"Node")) {
      children.push_back(child);
    } else if (IsElement(child, u"ScoreDistribution")) {
      if (!classification_) continue;
      CategoryTable* categories = context.TargetCategories();
      const std::string text = reader.Required(child, u"value");
      int category = categories->Find(text);
      if (category < 0) category = categories->Intern(text);
      entries[index].push_back({category, reader.Number(child, u"recordCount", kNaN),
                                reader.Number(child, u"probability", kNaN),
                                reader.Number(child, u"confidence", kNaN)});
    } else {
      throw CompileError("Node element '" + reader.Name(child) + "' is not supported");
    }
  }
  if (predicate == nullptr) throw CompileError("Node without predicate");

  predicates_.push_back(ParseNodePredicate(context, predicate));
  CompileTest(context, nodes_[index], *predicates_.back());

  ids_.emplace_back();
  hasId_.push_back(0);
  outcomes_.push_back(0);
  if (DomReader::Has(element, u"id")) {
    ids_.back() = Value(reader.Attr(element, u"id"));
    hasId_.back() = 1;
  }
  scores_.push_back(kNaN);
  predicted_.push_back(-1);
  if (DomReader::Has(element, u"score")) {
    const std::string score = reader.Attr(element, u"score");
    if (classification_) {
      CategoryTable* categories = context.TargetCategories();
      predicted_.back() = categories->Find(score);
      if (predicted_.back() < 0) predicted_.back() = categories->Intern(score);
    } else if (!DomReader::ParseNumber(score, scores_.back())) {
      throw CompileError("Node score '" + score + "' is not a number");
    }
  }
  double weight = reader.Number(element, u"recordCount", kNaN);
  if (std::isnan(weight)) {
    // Without its own count a node weighs what its distribution counts, else 1.
    double sum = 0.0;
    for (const Entry& entry : entries[index]) sum += std::isnan(entry.count) ? 0.0 : entry.count;
    weight = sum > 0.0 ? sum : 1.0;
  }
  if (weight < 0.0) throw CompileError("Node recordCount must not be negative");
  weights_.push_back(weight);
  defaults[index] = reader.Attr(element, u"defaultChild");

  const uint32_t first = static_cast<uint32_t>(nodes_.size());
  const uint32_t end = first + static_cast<uint32_t>(children.size());
  if (end < first || end == kNoNode) throw CompileError("TreeModel has too many nodes");
  nodes_[index].firstChild = first;
  nodes_[index].endChild = end;
  for (const DOMElement* child : children) {
    elements.push_back(child);
    nodes_.emplace_back();
    entries.emplace_back();
    defaults.emplace_back();
  }
}

// Chooses how the node's predicate is tested: constants by their kind, simple and set
// predicates by the plain form the library gives when it has one.
void TreeEvaluator::CompileTest(ModelContext& context, Node& node,
                                const ScoringPredicate& predicate) {
  const QZScoring_800::ScoringSplitVar* split = predicate.GetSplit();
  switch (predicate.GetPredType()) {
    case ScoringPredicate::TRUE_PREDICATE:
      node.test = Test::kAlways;
      return;
    case ScoringPredicate::FALSE_PREDICATE:
      node.test = Test::kNever;
      return;
    case ScoringPredicate::SIMPLE_PREDICATE: {
      const auto& simple = static_cast<const QZScoring_800::ScoringSimplePredicate&>(predicate);
      QZScoring_800::ScoringSimplePredicate::NumericTest numeric;
      if (simple.GetNumericTest(numeric)) {
        // A field read with two encoders is left to the predicates.
        const int field = row_.AddNumber(context.AddField(split->GetSplitName()),
                                         numeric.encoder);
        if (field < 0 || field > UINT16_MAX) return;
        node.numeric = {numeric.low, numeric.high};
        node.form = PackNumericForm(numeric);
        node.test = Test::kNumeric;
        node.field = static_cast<uint16_t>(field);
        return;
      }
      if (simple.GetCategoryTest(node.category)) node.test = Test::kCategory;
      break;
    }
    case ScoringPredicate::SET_PREDICATE: {
      const auto& set = static_cast<const QZScoring_800::ScoringSetPredicate&>(predicate);
      if (set.GetCategoryTest(node.category)) node.test = Test::kCategory;
      break;
    }
    default:
      return;
  }
  if (node.test != Test::kCategory) return;
  // A field read through two variables is left to the predicates.
  node.test = Test::kEvaluate;
  const int field = row_.AddCategory(context.AddField(split->GetSplitName()),
                                     split->GetSplitVar());
  if (field < 0 || field > UINT16_MAX) return;
  node.test = Test::kCategory;
  node.field = static_cast<uint16_t>(field);
}

// Points the numeric and category tests at the fields' places in the ensemble's row.
bool TreeEvaluator::Rebase(const std::vector<int>& numbers, const std::vector<int>& categories) {
  for (const std::vector<int>* places : {&numbers, &categories}) {
    for (int place : *places) {
      if (place < 0 || place > UINT16_MAX) return false;
    }
  }
  for (Node& node : nodes_) {
    if (node.test == Test::kNumeric) {
      node.field = static_cast<uint16_t>(numbers[node.field]);
    } else if (node.test == Test::kCategory) {
      node.field = static_cast<uint16_t>(categories[node.field]);
    }
  }
  steps_.Rebase(numbers, categories);
  return true;
}

// Makes every node's distribution a probability vector over the target's categories:
// the `probability` attributes when every entry has one, else the record counts
// divided by their sum; a node with a score and no usable distribution is certain of
// its score. Confidences are the `confidence` attributes when every entry has one,
// else the probabilities. Counts (for aggregateNodes) are the record counts, else the
// probabilities times the node's weight. A node whose distribution says no more than
// that it is certain of its category is kept as kCertain, without a row.
void TreeEvaluator::CompileDistributions(const std::vector<std::vector<Entry>>& entries) {
  const size_t k = categories_;
  std::vector<double> p(k), c(k), n(k);
  for (size_t i = 0; i < nodes_.size(); ++i) {
    Node& node = nodes_[i];
    int& category = predicted_[i];
    const std::vector<Entry>& list = entries[i];
    bool allProbabilities = !list.empty(), allCounts = !list.empty(),
         allConfidences = !list.empty();
    double total = 0.0;
    for (const Entry& entry : list) {
      allProbabilities = allProbabilities && !std::isnan(entry.probability);
      allConfidences = allConfidences && !std::isnan(entry.confidence);
      allCounts = allCounts && !std::isnan(entry.count);
      if (!std::isnan(entry.count)) total += entry.count;
    }
    const bool usable = allProbabilities || (allCounts && total > 0.0);
    if (!usable && category < 0) continue;  // this node predicts nothing

    std::fill(p.begin(), p.end(), 0.0);
    std::fill(c.begin(), c.end(), 0.0);
    std::fill(n.begin(), n.end(), 0.0);
    if (usable) {
      for (const Entry& entry : list) {
        const size_t at = static_cast<size_t>(entry.category);
        p[at] += allProbabilities ? entry.probability : entry.count / total;
        if (allConfidences) c[at] += entry.confidence;
        if (allCounts) n[at] += entry.count;
      }
    } else {
      p[static_cast<size_t>(category)] = 1.0;
    }
    for (size_t j = 0; j < k; ++j) {
      if (!usable || !allConfidences) c[j] = p[j];
      if (!usable || !allCounts) n[j] = p[j] * weights_[i];
    }
    if (category < 0) category = static_cast<int>(std::max_element(p.begin(), p.end()) - p.begin());

    bool certain = true;
    for (size_t j = 0; j < k && certain; ++j) {
      const double one = j == static_cast<size_t>(category) ? 1.0 : 0.0;
      certain = p[j] == one && c[j] == one && n[j] == one * weights_[i];
    }
    if (certain) {
      node.decision = Decision::kCertain;
      outcomes_[i] = static_cast<uint32_t>(category);
      continue;
    }
    node.decision = Decision::kDistribution;
    outcomes_[i] = static_cast<uint32_t>(counts_.size() / k);
    rows_.insert(rows_.end(), p.begin(), p.end());
    rows_.insert(rows_.end(), c.begin(), c.end());
    counts_.insert(counts_.end(), n.begin(), n.end());
  }
}

void TreeEvaluator::ResolveDefaultChildren(const std::vector<std::string>& defaults) {
  for (size_t i = 0; i < nodes_.size(); ++i) {
    const Node& node = nodes_[i];
    if (defaults[i].empty() || node.firstChild == node.endChild) continue;
    for (uint32_t c = node.firstChild; c < node.endChild; ++c) {
      if (hasId_[c] != 0 && ids_[c].GetText() == defaults[i]) defaultChildren_[i] = c;
    }
    if (defaultChildren_[i] == kNoNode) {
      throw CompileError("Node defaultChild '" + defaults[i] + "' names none of its children");
    }
  }
}

void TreeEvaluator::Evaluate(const FieldView& fields, ModelResult& result) {
  row_.Decode(fields);
  Walk(Input{row_, fields.Record()}, result);
}

void TreeEvaluator::Walk(const Input& in, ModelResult& result) {
  const Outcome rootOutcome = Check(0, in);
  if (rootOutcome == ScoringPredicate::PREDICATE_FALSE) return;
  const bool spreads = strategy_ == MissingStrategy::kWeightedConfidence ||
                       strategy_ == MissingStrategy::kAggregateNodes;
  if (rootOutcome == ScoringPredicate::PREDICATE_UNKNOWN) {
    if (!spreads) return;  // no node decided yet
    branches_.clear();
    branches_.push_back({0, 1.0});
    FollowBranches(in, 0, result);
    return;
  }

  uint32_t at = 0;
  int missing = 0;  // how often the strategy stood in for an unknown predicate
  for (;;) {
    const Node& node = nodes_[at];
    if (node.firstChild == node.endChild) break;
    uint32_t next = kNoNode;
    bool stop = false;
    for (uint32_t c = node.firstChild; c < node.endChild && next == kNoNode && !stop; ++c) {
      const Outcome outcome = Check(c, in);
      if (outcome == ScoringPredicate::PREDICATE_TRUE) {
        next = c;
      } else if (outcome == ScoringPredicate::PREDICATE_UNKNOWN) {
        switch (strategy_) {
          case MissingStrategy::kNone:
            break;  // unknown counts as false
          case MissingStrategy::kNullPrediction:
            return;
          case MissingStrategy::kLastPrediction:
            ++missing;
            stop = true;
            break;
          case MissingStrategy::kDefaultChild:
            ++missing;
            next = defaultChildren_[at];
            stop = next == kNoNode;  // without a default child the node decides
            break;
          case MissingStrategy::kWeightedConfidence:
          case MissingStrategy::kAggregateNodes:
            branches_.clear();
            PushBranches(in, at, c, 1.0);
            FollowBranches(in, at, result);
            return;
        }
      }
    }
    if (stop) break;
    if (next == kNoNode) {
      if (!returnLast_) return;
      break;
    }
    at = next;
  }
  Decide(at, missing, result);
}

void TreeEvaluator::Decide(uint32_t index, int missing, ModelResult& result) const {
  const Node& node = nodes_[index];
  if (!classification_) {
    if (std::isnan(scores_[index])) return;
    result.value = scores_[index];
  } else {
    double factor = 1.0;
    for (int i = 0; i < missing; ++i) factor *= penalty_;
    if (node.decision == Decision::kCertain) {
      // Reset left every probability and confidence at zero.
      const size_t category = outcomes_[index];
      if (category < result.probabilities.size()) {
        result.probabilities[category] = 1.0;
        result.confidences[category] = factor;
      }
      result.category = static_cast<int>(category);
    } else if (node.decision == Decision::kDistribution) {
      const size_t k = std::min(categories_, result.probabilities.size());
      const double* p = &rows_[2 * outcomes_[index] * categories_];
      const double* c = p + categories_;
      for (size_t j = 0; j < k; ++j) {
        result.probabilities[j] = p[j];
        result.confidences[j] = c[j] * factor;
      }
      result.category = predicted_[index];
    } else {
      return;
    }
    result.hasProbabilities = true;
    result.hasConfidences = true;
  }
  result.entityId = hasId_[index] != 0 ? &ids_[index] : nullptr;
  result.state = ModelResult::kValue;
}

// Pushes the branch `first` of `parent` and every later sibling whose predicate is not
// false. weightedConfidence shares `weight` among them by their record counts.
void TreeEvaluator::PushBranches(const Input& in, uint32_t parent, uint32_t first,
                                 double weight) {
  const size_t start = branches_.size();
  branches_.push_back({first, weights_[first]});
  for (uint32_t c = first + 1; c < nodes_[parent].endChild; ++c) {
    if (Check(c, in) != ScoringPredicate::PREDICATE_FALSE) {
      branches_.push_back({c, weights_[c]});
    }
  }
  double total = 0.0;
  for (size_t i = start; i < branches_.size(); ++i) total += branches_[i].weight;
  const double count = static_cast<double>(branches_.size() - start);
  for (size_t i = start; i < branches_.size(); ++i) {
    branches_[i].weight = total > 0.0 ? weight * branches_[i].weight / total : weight / count;
  }
}

// Follows every pending branch to the nodes that decide it (leaves, or nodes without a
// true child under returnLastPrediction) and combines them: weightedConfidence by the
// branch weights, aggregateNodes by the record counts. `entity` is the node where the
// record's path divided.
void TreeEvaluator::FollowBranches(const Input& in, uint32_t entity,
                                   ModelResult& result) {
  std::fill(sumProbabilities_.begin(), sumProbabilities_.end(), 0.0);
  std::fill(sumConfidences_.begin(), sumConfidences_.end(), 0.0);
  sumValue_ = 0.0;
  sumWeight_ = 0.0;
  while (!branches_.empty()) {
    const Branch branch = branches_.back();
    branches_.pop_back();
    uint32_t at = branch.node;
    for (;;) {
      const Node& node = nodes_[at];
      if (node.firstChild == node.endChild) {
        Gather(at, branch.weight);
        break;
      }
      uint32_t next = kNoNode;
      bool divided = false;
      for (uint32_t c = node.firstChild; c < node.endChild; ++c) {
        const Outcome outcome = Check(c, in);
        if (outcome == ScoringPredicate::PREDICATE_TRUE) {
          next = c;
          break;
        }
        if (outcome == ScoringPredicate::PREDICATE_UNKNOWN) {
          PushBranches(in, at, c, branch.weight);
          divided = true;
          break;
        }
      }
      if (divided) break;
      if (next == kNoNode) {
        if (returnLast_) Gather(at, branch.weight);
        break;
      }
      at = next;
    }
  }
  if (!(sumWeight_ > 0.0)) return;  // no branch predicted anything

  if (!classification_) {
    result.value = sumValue_ / sumWeight_;
  } else {
    const size_t k = std::min(categories_, result.probabilities.size());
    const bool weighted = strategy_ == MissingStrategy::kWeightedConfidence;
    for (size_t j = 0; j < k; ++j) {
      result.probabilities[j] = sumProbabilities_[j] / sumWeight_;
      result.confidences[j] = (weighted ? sumConfidences_[j] : sumProbabilities_[j]) / sumWeight_;
    }
    result.hasProbabilities = true;
    result.hasConfidences = true;
    const std::vector<double>& decisive = result.confidences;
    result.category = static_cast<int>(
        std::max_element(decisive.begin(), decisive.begin() + static_cast<long>(k)) -
        decisive.begin());
  }
  result.entityId = hasId_[entity] != 0 ? &ids_[entity] : nullptr;
  result.state = ModelResult::kValue;
}

// Adds one deciding node to the sums: weightedConfidence its probabilities and
// confidences times the branch weight; aggregateNodes its record counts.
void TreeEvaluator::Gather(uint32_t index, double weight) {
  const Node& node = nodes_[index];
  const bool weighted = strategy_ == MissingStrategy::kWeightedConfidence;
  if (!classification_) {
    if (std::isnan(scores_[index])) return;
    const double w = weighted ? weight : weights_[index];
    sumValue_ += w * scores_[index];
    sumWeight_ += w;
    return;
  }
  if (node.decision == Decision::kNothing) return;
  if (node.decision == Decision::kCertain) {
    const double w = weighted ? weight : weights_[index];
    sumProbabilities_[outcomes_[index]] += w;
    sumConfidences_[outcomes_[index]] += w;
    sumWeight_ += w;
    return;
  }
  const double* p = &rows_[2 * outcomes_[index] * categories_];
  const double* c = p + categories_;
  const double* n = &counts_[outcomes_[index] * categories_];
  for (size_t j = 0; j < categories_; ++j) {
    if (weighted) {
      sumProbabilities_[j] += weight * p[j];
      sumConfidences_[j] += weight * c[j];
    } else {
      sumProbabilities_[j] += n[j];
      sumWeight_ += n[j];
    }
  }
  if (weighted) sumWeight_ += weight;
}

std::unique_ptr<ModelEvaluator> CompileTreeModel(ModelContext& context) {
  return std::make_unique<TreeEvaluator>(context);
}

}  // namespace

void RegisterTreeModel(KindRegistry& registry) {
  registry.Add("TreeModel", &CompileTreeModel);
}

}  // namespace QZPlugin_800

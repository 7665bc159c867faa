#include "MiningModel.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "PluginDom.h"
#include "QZVarList.h"
#include "ScoringCompoundPredicate.h"
#include "ScoringException.h"
#include "ScoringPMMLParser.h"
#include "ScoringPredicate.h"
#include "ScoringSetPredicate.h"
#include "ScoringSimplePredicate.h"

namespace QZPlugin_800 {

namespace {

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringPredicate;

enum class Method { kMajorityVote, kWeightedMajorityVote, kAverage, kWeightedAverage, kMedian,
                    kWeightedMedian, kMax, kSum, kWeightedSum, kSelectFirst, kSelectAll,
                    kModelChain };

struct MethodInfo {
  const char* name;
  Method method;
  bool weighted;
  bool classification;  // applies to classification
  bool regression;      // applies to regression
};

constexpr MethodInfo kMethods[] = {
    {"majorityVote", Method::kMajorityVote, false, true, false},
    {"weightedMajorityVote", Method::kWeightedMajorityVote, true, true, false},
    {"average", Method::kAverage, false, true, true},
    {"weightedAverage", Method::kWeightedAverage, true, true, true},
    {"median", Method::kMedian, false, true, true},
    {"weightedMedian", Method::kWeightedMedian, true, true, true},
    {"max", Method::kMax, false, true, true},
    {"sum", Method::kSum, false, false, true},
    {"weightedSum", Method::kWeightedSum, true, false, true},
    {"selectFirst", Method::kSelectFirst, false, true, true},
    {"selectAll", Method::kSelectAll, false, true, true},
    {"modelChain", Method::kModelChain, false, true, true},
};

enum class MissingPrediction { kContinue, kSkipSegment, kReturnMissing };

enum class Selector { kTrue, kFalse, kPredicate };

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

struct Segment {
  Selector selector = Selector::kTrue;
  std::unique_ptr<ScoringPredicate> predicate;
  double weight = 1.0;
  std::string id;           // the Segment's id, else its 1-based position
  bool compatible = false;  // predicts the mining model's target in its terms
  bool joined = false;      // reads the mining model's row (CompiledModel::JoinRow)
  int step = -1;            // its StepTree's index in the walk of the shallow trees
  const double* values = nullptr;  // a regression StepTree's node scores, when final
  std::unique_ptr<CompiledModel> model;

  bool Selected(const ValueRecord& record) const {
    switch (selector) {
      case Selector::kTrue:
        return true;
      case Selector::kFalse:
        return false;
      case Selector::kPredicate:
        break;
    }
    return predicate->Evaluate(record) == ScoringPredicate::PREDICATE_TRUE;
  }
};

// The weighted median of (value, weight) pairs, which it sorts: the first value at
// which the cumulative weight reaches half the total, or the mean of that value and
// the next when it reaches exactly half. NaN for no pairs.
double WeightedMedian(std::vector<std::pair<double, double>>& pairs) {
  std::sort(pairs.begin(), pairs.end());
  double total = 0.0;
  for (const auto& p : pairs) total += p.second;
  const double half = total / 2.0;
  double cumulative = 0.0;
  for (size_t i = 0; i < pairs.size(); ++i) {
    cumulative += pairs[i].second;
    if (cumulative == half && i + 1 < pairs.size()) {
      return (pairs[i].first + pairs[i + 1].first) / 2.0;
    }
    if (cumulative >= half) return pairs[i].first;
  }
  return pairs.empty() ? kNaN : pairs.back().first;
}

// Takes a segment's result as the mining model's own (same function and categories).
void Adopt(const ModelResult& from, ModelResult& to) {
  to.state = from.state;
  to.value = from.value;
  to.category = from.category;
  to.hasProbabilities =
      from.hasProbabilities && from.probabilities.size() == to.probabilities.size();
  if (to.hasProbabilities) to.probabilities = from.probabilities;
  to.hasConfidences =
      from.hasConfidences && from.confidences.size() == to.confidences.size();
  if (to.hasConfidences) to.confidences = from.confidences;
  to.entityId = from.entityId;
  to.standardError = from.standardError;
  to.error = from.error;
}

class MiningEvaluator : public ModelEvaluator {
 public:
  explicit MiningEvaluator(ModelContext& context);
  void Evaluate(const FieldView& fields, ModelResult& result) override;

 private:
  void CompileSegment(ModelContext& context, const xercesc::DOMElement* element,
                      size_t position);
  void ParseSelector(ModelContext& context, const xercesc::DOMElement* element,
                     const QZXML_800::QZVarList& scope, Segment& segment,
                     const std::string& where) const;
  void AddChainedFields(const DomReader& reader, const xercesc::DOMElement* model,
                        const CompiledModel& compiled);

  void Combine(const ValueRecord& record, ModelResult& result);
  bool Contribute(const ModelResult& segment, double weight);
  bool ContributeValue(double value, double weight);
  bool SumSteps(ModelResult& result) const;
  void FinishRegression(ModelResult& result);
  void FinishClassification(double missingVotes, ModelResult& result);
  void SelectFirst(const ValueRecord& record, ModelResult& result);
  void SelectAll(const ValueRecord& record, ModelResult& result);
  void Chain(const ValueRecord& record, ModelResult& result);
  const ValueRecord& PrepareChain(const ValueRecord& record);
  const ModelResult& ScoreSegment(const Segment& segment, const ValueRecord& record) {
    return segment.joined ? segment.model->ScoreRow(row_, record) : segment.model->Score(record);
  }

  Method method_ = Method::kAverage;
  bool weighted_ = false;
  bool classification_ = false;
  const CategoryTable* categories_ = nullptr;
  MissingPrediction missing_ = MissingPrediction::kContinue;
  double missingThreshold_ = 1.0;
  // modelChain: the visible fields plus the OutputFields of the segments, for the
  // predicates and models of later segments. Declared before the segments, which
  // point into it, so that it outlives them.
  std::unique_ptr<QZXML_800::QZVarList> chainScope_;
  std::vector<Segment> segments_;
  // The fields of the segments that joined it, decoded once per record for all of them.
  FieldRow row_;
  bool joined_ = false;
  // The shallow trees among them, walked side by side for every record.
  StepForest forest_;
  // Sums and averages of regression trees that are all walked side by side and always
  // used: the sum over the walks' scores.
  bool sumsSteps_ = false;

  // Per-record scratch; capacities are reserved at compile time or on the first record.
  std::vector<double> values_;   // regression: one prediction per contributing segment
  std::vector<double> weights_;  // one weight per contributing segment
  std::vector<int> votes_;       // classification: one category per contributing segment
  std::vector<double> dists_;    // classification: K probabilities per contributing segment
  std::vector<std::pair<double, double>> pairs_;  // medians
  size_t width_ = 0;             // K of the record being scored
  ValueRecord chain_;
  uint64_t chainFor_ = UINT64_MAX;
  size_t chainSize_ = 0;
  Value summary_;                // selectAll: the per-segment predictions
  std::vector<Value*> entries_;  // selectAll: each segment's entry in summary_
};

MiningEvaluator::MiningEvaluator(ModelContext& context)
    : row_(context.Document().CategoryCodes()) {
  const DomReader& reader = context.Reader();
  classification_ = context.IsClassification();
  categories_ = context.TargetCategories();
  const xercesc::DOMElement* segmentation = FirstChildElement(context.Element(), u"Segmentation");
  if (segmentation == nullptr) {
    throw CompileError("MiningModel without Segmentation (model composition) is not supported");
  }
  const std::string name = reader.Required(segmentation, u"multipleModelMethod");
  const MethodInfo* info = nullptr;
  for (const MethodInfo& m : kMethods) {
    if (name == m.name) info = &m;
  }
  if (info == nullptr) {
    throw CompileError("Segmentation multipleModelMethod '" + name + "' is not supported");
  }
  if (classification_ ? !info->classification : !info->regression) {
    throw CompileError("multipleModelMethod '" + name + "' does not apply to " +
                       (classification_ ? "classification" : "regression"));
  }
  method_ = info->method;
  weighted_ = info->weighted;

  std::string treatment = reader.Attr(segmentation, u"missingPredictionTreatment");
  if (treatment.empty()) treatment = reader.Attr(segmentation, u"x-missingPredictionTreatment");
  if (treatment.empty() || treatment == "continue") {
    missing_ = MissingPrediction::kContinue;
  } else if (treatment == "skipSegment") {
    missing_ = MissingPrediction::kSkipSegment;
  } else if (treatment == "returnMissing") {
    missing_ = MissingPrediction::kReturnMissing;
  } else {
    throw CompileError("missingPredictionTreatment '" + treatment + "' is not supported");
  }
  missingThreshold_ = DomReader::Has(segmentation, u"missingThreshold")
                          ? reader.Number(segmentation, u"missingThreshold", 1.0)
                          : reader.Number(segmentation, u"x-missingThreshold", 1.0);

  if (method_ == Method::kModelChain) {
    chainScope_ = std::make_unique<QZXML_800::QZVarList>(context.Variables());
  }
  size_t position = 0;
  for (const xercesc::DOMElement* child : ChildElements(segmentation)) {
    if (IsElement(child, u"Extension")) continue;
    if (!IsElement(child, u"Segment")) {
      throw CompileError("Segmentation element '" + reader.Name(child) + "' is not supported");
    }
    CompileSegment(context, child, ++position);
  }
  if (segments_.empty()) throw CompileError("Segmentation has no Segment");

  // Combining methods read every segment's result in the mining model's terms; a chain
  // needs that only of the segment that ends it.
  for (size_t i = 0; i < segments_.size(); ++i) {
    const bool checked = method_ != Method::kModelChain || i + 1 == segments_.size();
    if (checked && !segments_[i].compatible) {
      throw CompileError("Segment '" + segments_[i].id + "' does not predict the " +
                         (classification_ ? "categories of '" : "value of '") +
                         context.Target() + "' (" + segments_[i].model->Kind() + " " +
                         (segments_[i].model->IsClassification() ? "classification"
                                                                 : "regression") + ")");
    }
  }
  if (method_ == Method::kSelectAll) {
    // One entry per segment, laid out once: scoring writes them in place.
    for (size_t i = 0; i < segments_.size(); ++i) {
      for (size_t j = 0; j < i; ++j) {
        if (segments_[i].id == segments_[j].id) {
          throw CompileError("Segment id '" + segments_[i].id + "' appears twice");
        }
      }
      entries_.push_back(&summary_[segments_[i].id]);
    }
  }
  // Segments that read the record as it is (not a chain's, which grows from segment to
  // segment) decode their fields from one row.
  if (method_ != Method::kModelChain) {
    for (Segment& segment : segments_) {
      segment.joined = segment.model->JoinRow(row_, context);
      joined_ = joined_ || segment.joined;
    }
  }
  // Combining methods score every used segment: their shallow trees are walked side by
  // side.
  const bool combines = method_ != Method::kSelectFirst && method_ != Method::kSelectAll &&
                        method_ != Method::kModelChain;
  for (Segment& segment : segments_) {
    const StepTree* steps = combines && segment.joined ? segment.model->Steps() : nullptr;
    if (steps == nullptr) continue;
    segment.step = static_cast<int>(forest_.Size());
    forest_.Add(steps);
    if (!classification_ && !segment.model->HasTargets()) segment.values = steps->Values();
  }
  sumsSteps_ = !classification_ && (method_ == Method::kSum || method_ == Method::kAverage ||
                                    method_ == Method::kWeightedSum ||
                                    method_ == Method::kWeightedAverage);
  for (const Segment& segment : segments_) {
    sumsSteps_ = sumsSteps_ && segment.selector == Selector::kTrue && segment.values != nullptr;
  }
  values_.reserve(segments_.size());
  weights_.reserve(segments_.size());
  votes_.reserve(segments_.size());
  pairs_.reserve(segments_.size());
}

void MiningEvaluator::ParseSelector(ModelContext& context, const xercesc::DOMElement* element,
                                    const QZXML_800::QZVarList& scope, Segment& segment,
                                    const std::string& where) const {
  if (IsElement(element, u"True")) {
    segment.selector = Selector::kTrue;
    return;
  }
  if (IsElement(element, u"False")) {
    segment.selector = Selector::kFalse;
    return;
  }
  segment.selector = Selector::kPredicate;
  QZScoring_800::ScoringPMMLParser& parser = context.Document().Parser();
  auto* node = const_cast<xercesc::DOMElement*>(element);
  try {
    if (IsElement(element, u"SimplePredicate")) {
      segment.predicate.reset(parser.ParsePredicate(node, scope));
    } else if (IsElement(element, u"CompoundPredicate")) {
      segment.predicate.reset(parser.ParseCompoundPredicate(node, scope));
    } else if (IsElement(element, u"SimpleSetPredicate")) {
      segment.predicate.reset(parser.ParseSetPredicate(node, scope));
      if (!segment.predicate) {
        throw CompileError(where + ": SimpleSetPredicate on field '" +
                           context.Reader().Attr(element, u"field") +
                           "', which is not categorical");
      }
    } else {
      throw CompileError(where + ": predicate '" + context.Reader().Name(element) +
                         "' is not supported");
    }
  } catch (const QZScoring_800::ScoringException& e) {
    throw CompileError(where + ": predicate refused: " + e.GetErrorMessage());
  }
}

void MiningEvaluator::CompileSegment(ModelContext& context, const xercesc::DOMElement* element,
                                     size_t position) {
  const DomReader& reader = context.Reader();
  Segment segment;
  segment.id = reader.Attr(element, u"id", std::to_string(position));
  const std::string where = "Segment '" + segment.id + "'";
  segment.weight = reader.Number(element, u"weight", 1.0);
  const xercesc::DOMElement* predicate = nullptr;
  const xercesc::DOMElement* model = nullptr;
  for (const xercesc::DOMElement* child : ChildElements(element)) {
    if (IsElement(child, u"Extension")) continue;
    if (predicate == nullptr) {
      predicate = child;
    } else if (model == nullptr) {
      model = child;
    } else {
      throw CompileError(where + ": element '" + reader.Name(child) + "' is not supported");
    }
  }
  if (model == nullptr) throw CompileError(where + " has no model");
  const QZXML_800::QZVarList& scope = chainScope_ ? *chainScope_ : context.Variables();
  ParseSelector(context, predicate, scope, segment, where);

  try {
    if (chainScope_) {
      // Later segments see the earlier ones' outputs. Their fields are checked by their
      // own MiningSchemas (an empty parent schema vouches for nothing).
      FieldBinder unused;
      MiningSchema none;
      ModelContext chained(context.Document(), context.Element(), context.Kind(),
                           context.Function(), context.Target(), context.TargetCategories(),
                           *chainScope_, unused, none);
      segment.model = chained.CompileNested(model);
    } else {
      segment.model = context.CompileNested(model);
    }
  } catch (const CompileError& e) {
    throw CompileError(where + ": " + e.what());
  }
  segment.compatible = segment.model->Function() == context.Function() &&
                       (!classification_ || segment.model->TargetCategories() == categories_);
  if (chainScope_) AddChainedFields(reader, model, *segment.model);
  segments_.push_back(std::move(segment));
}

void MiningEvaluator::AddChainedFields(const DomReader& reader, const xercesc::DOMElement* model,
                                       const CompiledModel& compiled) {
  for (const xercesc::DOMElement* e :
       ChildElements(FirstChildElement(model, u"Output"), u"OutputField")) {
    const std::string name = reader.Attr(e, u"name");
    if (name.empty() || chainScope_->FindVariable(name) >= 0) continue;
    const std::string feature = reader.Attr(e, u"feature", "predictedValue");
    const std::string optype = reader.Attr(e, u"optype");
    const std::string type = reader.Attr(e, u"dataType");
    const bool predicted = feature == "predictedValue" || feature == "predictedDisplayValue";
    bool categorical = optype == "categorical" || optype == "ordinal" || type == "string" ||
                       type == "boolean" ||
                       (optype.empty() && type.empty() && predicted && compiled.IsClassification());
    if (optype == "continuous") categorical = false;
    if (!categorical) {
      chainScope_->AddContVar(name, name, QZXML_800::ROLE_INPUT);
      continue;
    }
    std::vector<std::string> categories;
    if (feature == "predictedValue" && compiled.TargetCategories() != nullptr) {
      for (int i = 0; i < compiled.TargetCategories()->Size(); ++i) {
        categories.push_back(compiled.TargetCategories()->Text(i));
      }
    }
    chainScope_->AddCatVar(name, name, categories, QZXML_800::ROLE_INPUT);
  }
}

void MiningEvaluator::Evaluate(const FieldView& fields, ModelResult& result) {
  const ValueRecord& record = fields.Record();
  if (joined_) row_.Decode(fields);
  switch (method_) {
    case Method::kSelectFirst:
      SelectFirst(record, result);
      break;
    case Method::kSelectAll:
      SelectAll(record, result);
      break;
    case Method::kModelChain:
      Chain(record, result);
      break;
    default:
      Combine(record, result);
      break;
  }
}

void MiningEvaluator::Combine(const ValueRecord& record, ModelResult& result) {
  values_.clear();
  weights_.clear();
  votes_.clear();
  dists_.clear();
  width_ = result.probabilities.size();
  const bool voting = method_ == Method::kMajorityVote || method_ == Method::kWeightedMajorityVote;
  if (forest_.Size() > 0) {
    forest_.Walk(row_);
    if (sumsSteps_ && SumSteps(result)) return;
  }
  double used = 0.0, missing = 0.0;
  for (const Segment& segment : segments_) {
    if (!segment.Selected(record)) continue;
    const double weight = weighted_ ? segment.weight : 1.0;
    bool contributed;
    if (segment.step >= 0 && forest_.Plain(static_cast<size_t>(segment.step))) {
      const uint32_t node = forest_.Decides(static_cast<size_t>(segment.step));
      if (segment.values != nullptr) {
        contributed = ContributeValue(
            node == StepTree::kDecidesNothing ? kNaN : segment.values[node], weight);
      } else {
        contributed = Contribute(segment.model->ScoreStep(node), weight);
      }
    } else {
      const ModelResult& r = ScoreSegment(segment, record);
      if (r.state == ModelResult::kInvalid) {
        result.state = ModelResult::kInvalid;
        result.error = r.error;
        return;
      }
      contributed = Contribute(r, weight);
    }
    used += weight;
    if (!contributed) {
      missing += weight;
      if (missing_ == MissingPrediction::kReturnMissing) return;
      // Continuing with a missing number leaves the combination missing.
      if (missing_ == MissingPrediction::kContinue && !voting) return;
    }
  }
  // The share of missing weight, once something is missing (total weights may be
  // negative).
  if (missing != 0.0 && missing > missingThreshold_ * used) return;
  if (classification_) {
    FinishClassification(missing_ == MissingPrediction::kContinue ? missing : 0.0, result);
  } else {
    FinishRegression(result);
  }
}

bool MiningEvaluator::Contribute(const ModelResult& r, double weight) {
  if (r.state != ModelResult::kValue) return false;
  if (!classification_) return ContributeValue(r.value, weight);
  if (r.category < 0 || static_cast<size_t>(r.category) >= width_) return false;
  weights_.push_back(weight);
  if (method_ == Method::kMajorityVote || method_ == Method::kWeightedMajorityVote) {
    votes_.push_back(r.category);
    return true;
  }
  if (r.hasProbabilities && r.probabilities.size() == width_) {
    dists_.insert(dists_.end(), r.probabilities.begin(), r.probabilities.end());
  } else {
    dists_.resize(dists_.size() + width_, 0.0);
    dists_[dists_.size() - width_ + static_cast<size_t>(r.category)] = 1.0;
  }
  return true;
}

// Combine for sumsSteps_, in the same order of operations: false, with the result
// untouched, when a walk did not reach a score (the general loop then decides).
bool MiningEvaluator::SumSteps(ModelResult& result) const {
  double value = 0.0, total = 0.0;
  for (size_t t = 0; t < segments_.size(); ++t) {
    const uint32_t node = forest_.Decides(t);
    if (!forest_.Plain(t) || node == StepTree::kDecidesNothing) return false;
    const double v = segments_[t].values[node];
    if (std::isnan(v)) return false;
    if (weighted_) {
      value += segments_[t].weight * v;
      total += segments_[t].weight;
    } else {
      value += v;
    }
  }
  if (method_ == Method::kAverage) value /= static_cast<double>(segments_.size());
  if (method_ == Method::kWeightedAverage) value = total != 0.0 ? value / total : kNaN;
  if (std::isnan(value)) return true;
  result.value = value;
  result.state = ModelResult::kValue;
  return true;
}

bool MiningEvaluator::ContributeValue(double value, double weight) {
  if (std::isnan(value)) return false;
  values_.push_back(value);
  weights_.push_back(weight);
  return true;
}

void MiningEvaluator::FinishRegression(ModelResult& result) {
  if (values_.empty()) return;
  double value = 0.0;
  switch (method_) {
    case Method::kAverage:
    case Method::kSum:
      for (double v : values_) value += v;
      if (method_ == Method::kAverage) value /= static_cast<double>(values_.size());
      break;
    case Method::kWeightedAverage:
    case Method::kWeightedSum: {
      double total = 0.0;
      for (size_t i = 0; i < values_.size(); ++i) {
        value += weights_[i] * values_[i];
        total += weights_[i];
      }
      if (method_ == Method::kWeightedAverage) value = total != 0.0 ? value / total : kNaN;
      break;
    }
    case Method::kMedian:
    case Method::kWeightedMedian:
      pairs_.clear();
      for (size_t i = 0; i < values_.size(); ++i) pairs_.emplace_back(values_[i], weights_[i]);
      value = WeightedMedian(pairs_);
      break;
    case Method::kMax:
      value = *std::max_element(values_.begin(), values_.end());
      break;
    default:
      return;
  }
  if (std::isnan(value)) return;
  result.value = value;
  result.state = ModelResult::kValue;
}

void MiningEvaluator::FinishClassification(double missingVotes, ModelResult& result) {
  const size_t k = width_;
  const size_t n = weights_.size();
  if (n == 0 || k == 0) return;
  std::vector<double>& p = result.probabilities;
  std::fill(p.begin(), p.end(), 0.0);
  switch (method_) {
    case Method::kMajorityVote:
    case Method::kWeightedMajorityVote: {
      double total = missingVotes;
      for (size_t i = 0; i < n; ++i) {
        p[static_cast<size_t>(votes_[i])] += weights_[i];
        total += weights_[i];
      }
      if (total <= 0.0) return;
      for (double& v : p) v /= total;
      break;
    }
    case Method::kAverage:
    case Method::kWeightedAverage: {
      double total = 0.0;
      for (size_t i = 0; i < n; ++i) {
        for (size_t c = 0; c < k; ++c) p[c] += weights_[i] * dists_[i * k + c];
        total += weights_[i];
      }
      if (total == 0.0) return;
      for (double& v : p) v /= total;
      break;
    }
    case Method::kMedian:
    case Method::kWeightedMedian:
      for (size_t c = 0; c < k; ++c) {
        pairs_.clear();
        for (size_t i = 0; i < n; ++i) pairs_.emplace_back(dists_[i * k + c], weights_[i]);
        p[c] = WeightedMedian(pairs_);
      }
      break;
    case Method::kMax: {
      // The category of the highest probability of any segment (the first segment,
      // then the first category, among equals); the segments giving it are averaged.
      size_t best = 0;
      double top = -std::numeric_limits<double>::infinity();
      for (size_t i = 0; i < n; ++i) {
        for (size_t c = 0; c < k; ++c) {
          if (dists_[i * k + c] > top) {
            top = dists_[i * k + c];
            best = c;
          }
        }
      }
      double count = 0.0;
      for (size_t i = 0; i < n; ++i) {
        if (dists_[i * k + best] != top) continue;
        for (size_t c = 0; c < k; ++c) p[c] += dists_[i * k + c];
        count += 1.0;
      }
      for (double& v : p) v /= count;
      result.category = static_cast<int>(best);
      result.hasProbabilities = true;
      result.state = ModelResult::kValue;
      return;
    }
    default:
      return;
  }
  result.PickMostProbable();
}

void MiningEvaluator::SelectFirst(const ValueRecord& record, ModelResult& result) {
  for (const Segment& segment : segments_) {
    if (!segment.Selected(record)) continue;
    const ModelResult& r = ScoreSegment(segment, record);
    if (r.state == ModelResult::kMissing && missing_ == MissingPrediction::kSkipSegment) continue;
    Adopt(r, result);
    return;
  }
}

void MiningEvaluator::SelectAll(const ValueRecord& record, ModelResult& result) {
  bool decided = false;
  for (size_t i = 0; i < segments_.size(); ++i) {
    const Segment& segment = segments_[i];
    Value& entry = *entries_[i];
    entry = Value();
    if (!segment.Selected(record)) continue;
    const ModelResult& r = ScoreSegment(segment, record);
    if (r.state == ModelResult::kInvalid || (r.state == ModelResult::kMissing &&
                                             missing_ == MissingPrediction::kReturnMissing)) {
      Adopt(r, result);
      result.entityId = nullptr;
      return;
    }
    if (r.state != ModelResult::kValue) continue;
    if (!classification_) {
      entry = r.value;
    } else if (r.category >= 0) {
      entry = categories_->AsValue(r.category);
    }
    if (!decided) {
      Adopt(r, result);
      decided = true;
    }
  }
  result.entityId = decided ? &summary_ : nullptr;
}

const ValueRecord& MiningEvaluator::PrepareChain(const ValueRecord& record) {
  if (record.GetLayoutId() != chainFor_ || record.Size() != chainSize_) {
    chain_ = ValueRecord(record.Size() + 8);
    for (size_t i = 0; i < record.Size(); ++i) chain_.Add(record.GetName(i), Value());
    for (Segment& segment : segments_) segment.model->Output().Declare(chain_);
    chainFor_ = record.GetLayoutId();
    chainSize_ = record.Size();
  }
  for (size_t i = 0; i < record.Size(); ++i) chain_[i] = record[i];
  for (size_t i = record.Size(); i < chain_.Size(); ++i) chain_[i] = Value();
  return chain_;
}

void MiningEvaluator::Chain(const ValueRecord& record, ModelResult& result) {
  PrepareChain(record);
  const Segment* last = nullptr;
  const ModelResult* decided = nullptr;
  for (Segment& segment : segments_) {
    if (!segment.Selected(chain_)) continue;
    const ModelResult& r = segment.model->Score(chain_);
    if (r.state == ModelResult::kInvalid) {
      result.state = ModelResult::kInvalid;
      result.error = r.error;
      return;
    }
    if (r.state == ModelResult::kMissing) {
      if (missing_ == MissingPrediction::kReturnMissing) return;
      if (missing_ == MissingPrediction::kSkipSegment) continue;
    }
    const QZCommon_800::QZStatus written =
        segment.model->Output().Write(r, segment.model->Prepared(chain_), chain_);
    if (written.IsError()) {
      result.state = ModelResult::kInvalid;
      result.error = written.GetErrorCode();
      return;
    }
    last = &segment;
    decided = &r;
  }
  if (last != nullptr && last->compatible) Adopt(*decided, result);
}

std::unique_ptr<ModelEvaluator> CompileMiningModel(ModelContext& context) {
  return std::make_unique<MiningEvaluator>(context);
}

}  // namespace

void RegisterMiningModel(KindRegistry& registry) {
  registry.Add("MiningModel", &CompileMiningModel);
}

}  // namespace QZPlugin_800

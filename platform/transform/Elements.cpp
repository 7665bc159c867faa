// NormContinuous, NormDiscrete, Discretize and MapValues at evaluation time.
#include "Elements.h"

#include <algorithm>

namespace QZTransformNS_8_0_0 {
namespace internal {

namespace {

// Numeric when every result it can give is a real (or absent, which is missing).
bool AllNumeric(const std::vector<const Result*>& results) {
  for (const Result* r : results) {
    if (r->present && !r->value.IsNumericValue()) return false;
  }
  return true;
}

// The result of an element that finds nothing: system-missing when its results are
// numbers, null otherwise.
Result Nothing(bool numeric) {
  Result r;
  if (numeric) r.value = Value(kMissing);
  return r;
}

std::vector<const Result*> ResultsOf(const std::vector<DiscretizeExpr::Bin>& bins,
                                     const Result& a, const Result& b) {
  std::vector<const Result*> all{&a, &b};
  for (const auto& bin : bins) all.push_back(&bin.value);
  return all;
}

std::vector<const Result*> ResultsOf(const std::vector<MapValuesExpr::Row>& rows,
                                     const Result& a, const Result& b) {
  std::vector<const Result*> all{&a, &b};
  for (const auto& row : rows) all.push_back(&row.output);
  return all;
}

}  // namespace

NormContinuousExpr::NormContinuousExpr(int ref, std::vector<double> orig,
                                       std::vector<double> norm, Outliers outliers,
                                       bool hasMapMissing, double mapMissingTo)
    : Expr(true),
      ref_(ref),
      orig_(std::move(orig)),
      norm_(std::move(norm)),
      outliers_(outliers),
      hasMapMissing_(hasMapMissing),
      mapMissingTo_(mapMissingTo) {}

double NormContinuousExpr::EvalReal(const EvalContext& ctx) const {
  const double x = ctx.Input(ref_).GetReal();
  if (IsMissingReal(x)) return hasMapMissing_ ? mapMissingTo_ : kMissing;
  const size_t last = orig_.size() - 1;
  size_t i;  // the segment: from point i to point i + 1
  if (x < orig_[0]) {
    if (outliers_ == Outliers::kAsMissing) return kMissing;
    if (outliers_ == Outliers::kAsExtreme) return norm_[0];
    i = 0;
  } else if (x > orig_[last]) {
    if (outliers_ == Outliers::kAsMissing) return kMissing;
    if (outliers_ == Outliers::kAsExtreme) return norm_[last];
    i = last - 1;
  } else if (last < 8) {
    i = 0;
    while (i + 1 < last && x > orig_[i + 1]) ++i;
  } else {
    i = static_cast<size_t>(std::upper_bound(orig_.begin(), orig_.end(), x) - orig_.begin());
    i = i == 0 ? 0 : std::min(i - 1, last - 1);
  }
  const double r =
      norm_[i] + (x - orig_[i]) * (norm_[i + 1] - norm_[i]) / (orig_[i + 1] - orig_[i]);
  return r == r ? r : kMissing;  // an infinite input on a flat segment
}

DiscretizeExpr::DiscretizeExpr(int ref, std::vector<Bin> bins, Result mapMissingTo,
                               Result defaultValue)
    : Expr(AllNumeric(ResultsOf(bins, mapMissingTo, defaultValue))),
      ref_(ref),
      bins_(std::move(bins)),
      mapMissingTo_(std::move(mapMissingTo)),
      defaultValue_(std::move(defaultValue)),
      missing_(Nothing(IsNumeric())) {}

const Result& DiscretizeExpr::Find(const EvalContext& ctx) const {
  const Value& v = ctx.Input(ref_);
  if (v.IsMissing()) return mapMissingTo_.present ? mapMissingTo_ : missing_;
  const double x = v.GetReal();
  if (!IsMissingReal(x)) {
    for (const Bin& bin : bins_) {
      if ((bin.leftClosed ? x >= bin.left : x > bin.left) &&
          (bin.rightClosed ? x <= bin.right : x < bin.right)) {
        return bin.value;
      }
    }
  }
  return defaultValue_.present ? defaultValue_ : missing_;
}

MapValuesExpr::MapValuesExpr(std::vector<int> refs, std::vector<Row> rows, Result mapMissingTo,
                             Result defaultValue)
    : Expr(AllNumeric(ResultsOf(rows, mapMissingTo, defaultValue))),
      refs_(std::move(refs)),
      rows_(std::move(rows)),
      mapMissingTo_(std::move(mapMissingTo)),
      defaultValue_(std::move(defaultValue)),
      missing_(Nothing(IsNumeric())) {
  for (uint32_t r = 0; r < rows_.size(); ++r) {
    Row& row = rows_[r];
    if (!row.output.present) row.output = missing_;
    if (!row.has[0]) continue;
    byText_[row.cells[0].text].push_back(r);
    if (!IsMissingReal(row.cells[0].number)) byNumber_[row.cells[0].number].push_back(r);
  }
}

bool MapValuesExpr::RowMatches(const Row& row, const EvalContext& ctx) const {
  for (size_t i = 1; i < refs_.size(); ++i) {
    if (!row.has[i] || !row.cells[i].Matches(ctx.Input(refs_[i]))) return false;
  }
  return true;
}

const Result& MapValuesExpr::Find(const EvalContext& ctx) const {
  for (int ref : refs_) {
    if (ctx.Input(ref).IsMissing()) return mapMissingTo_.present ? mapMissingTo_ : missing_;
  }
  const Value& first = ctx.Input(refs_[0]);
  const std::vector<uint32_t>* candidates = nullptr;
  if (first.IsNumericValue()) {
    const auto found = byNumber_.find(first.GetReal());
    if (found != byNumber_.end()) candidates = &found->second;
  } else if (first.IsString()) {
    const auto found = byText_.find(first.GetText());
    if (found != byText_.end()) candidates = &found->second;
  }
  if (candidates != nullptr) {
    for (uint32_t r : *candidates) {
      if (RowMatches(rows_[r], ctx)) return rows_[r].output;
    }
  }
  return defaultValue_.present ? defaultValue_ : missing_;
}

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

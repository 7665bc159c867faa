// Value ranges: the abstract interface and ScoringRange, a range with owned bounds.

#include <memory>
#include <ostream>

#include "ScoringRange.h"
#include "ScoringValueRange.h"
#include "Value.h"

using QZCommon_800::Value;

namespace QZScoring_800 {

namespace {

// A minimum given as system-missing stands for "no lower bound".
void AdjustMin(Value& min) {
  if (min.IsSystemMissingValue() && min.IsNumericValue()) min = -Value::GetInfinity();
}

std::unique_ptr<Value> MinusInfinity() {
  return std::make_unique<Value>(-Value::GetInfinity());
}

std::unique_ptr<Value> CloneOf(const Value& value) {
  return std::make_unique<Value>(value);
}

// Value::Compare, with two ordinary reals compared in place (the common case).
int CompareValues(const Value& a, const Value& b) {
  if (a.IsNumericValue() && b.IsNumericValue() && !a.IsSystemMissingValue() &&
      !b.IsSystemMissingValue()) {
    const double x = a.GetReal(), y = b.GetReal();
    return (x > y) - (x < y);
  }
  return a.Compare(b);
}

}  // namespace

ScoringValueRange::~ScoringValueRange() = default;

ScoringRange::ScoringRange(Value* min, Value* max, bool lowEnd, bool highEnd)
    : fMin(min), fMax(max != min ? max : nullptr), fHighEnd(highEnd), fLowEnd(lowEnd) {
  if (!fMin) {
    fMin = MinusInfinity();
  } else {
    AdjustMin(*fMin);
  }
  // One object given for both bounds: the maximum gets its own copy.
  if (max != nullptr && max == min) fMax = CloneOf(*fMin);
  if (!fMax) fMax = std::make_unique<Value>(Value::GetInfinity());
}

ScoringRange::ScoringRange(double min, double max, bool lowEnd, bool highEnd)
    : fMin(std::make_unique<Value>(min)),
      fMax(std::make_unique<Value>(max)),
      fHighEnd(highEnd),
      fLowEnd(lowEnd) {
  AdjustMin(*fMin);
}

ScoringRange::ScoringRange(Value* point) : fMin(point), fHighEnd(true), fLowEnd(true) {
  if (!fMin) {
    fMin = MinusInfinity();
    fMax = std::make_unique<Value>(Value::GetInfinity());
  } else {
    AdjustMin(*fMin);
    fMax = CloneOf(*fMin);
  }
}

ScoringRange::ScoringRange(const ScoringRange& other)
    : ScoringValueRange(other),
      fMin(CloneOf(*other.fMin)),
      fMax(CloneOf(*other.fMax)),
      fHighEnd(other.fHighEnd),
      fLowEnd(other.fLowEnd) {}

ScoringRange& ScoringRange::operator=(const ScoringRange& other) {
  if (this == &other) return *this;
  std::unique_ptr<Value> min = CloneOf(*other.fMin);
  std::unique_ptr<Value> max = CloneOf(*other.fMax);
  fMin = std::move(min);
  fMax = std::move(max);
  fHighEnd = other.fHighEnd;
  fLowEnd = other.fLowEnd;
  return *this;
}

ScoringRange::~ScoringRange() = default;

bool ScoringRange::operator==(const ScoringValueRange& other) const {
  const Value* min = other.GetMin();
  const Value* max = other.GetMax();
  return min != nullptr && max != nullptr && *fMin == *min && *fMax == *max &&
         fHighEnd == other.GetHighEnd() && fLowEnd == other.GetLowEnd();
}

ScoringRange* ScoringRange::Clone() const {
  try {
    return new ScoringRange(*this);
  } catch (...) {
    return nullptr;
  }
}

void ScoringRange::SetMin(Value* min) {
  if (min == nullptr || min == fMin.get()) return;
  fMin.reset(min);
  AdjustMin(*fMin);
}

void ScoringRange::SetMax(Value* max) {
  if (max == nullptr || max == fMax.get()) return;
  fMax.reset(max);
}

bool ScoringRange::IsInRange(const Value* value) const {
  if (value == nullptr) return false;
  const int low = CompareValues(*value, *fMin);
  if (fLowEnd ? low < 0 : low <= 0) return false;
  const int high = CompareValues(*value, *fMax);
  return fHighEnd ? high <= 0 : high < 0;
}

const Value* ScoringRange::GetMin() const { return fMin.get(); }

const Value* ScoringRange::GetMax() const { return fMax.get(); }

bool ScoringRange::GetHighEnd() const { return fHighEnd; }

bool ScoringRange::GetLowEnd() const { return fLowEnd; }

void ScoringRange::Display(std::ostream& out) const {
  out << "  Start Range Display   \n";
  out << "MinValue: " << *fMin << ";  MaxValue: " << *fMax;
  out << (fHighEnd ? "; High End included" : "; High End not included");
  out << (fLowEnd ? "; lower End included" : "; lower End not included");
  out << "\n End of Range Display\n\n";
}

}  // namespace QZScoring_800

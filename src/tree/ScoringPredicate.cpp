// Predicates with three-valued evaluation: simple, set, compound, true and false.

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <memory>
#include <new>
#include <typeinfo>
#include <ostream>
#include <utility>
#include <vector>

#include "QZVarList.h"
#include "ScoringCompoundPredicate.h"
#include "ScoringFalsePredicate.h"
#include "ScoringPMMLParser.h"
#include "ScoringPredicate.h"
#include "ScoringScaleSplit.h"
#include "ScoringSetPredicate.h"
#include "ScoringSimplePredicate.h"
#include "ScoringTruePredicate.h"
#include "Value.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZXML_800::IQZVariable;

namespace QZScoring_800 {

namespace {

using Result = ScoringPredicate::PredicateResult;

// A field position cached per record layout, packed into one word so that threads
// evaluating the same predicate read and replace it without a lock: the layout id in
// the high bits, the field's index in the low kIndexBits. A layout's names never change
// at positions below its size, so a matching id and an index below the record's size
// identify the field without comparing its name. 0 means "nothing cached".
constexpr int kIndexBits = 24;
constexpr uint64_t kIndexMask = (uint64_t{1} << kIndexBits) - 1;
constexpr uint64_t kMaxLayoutId = (uint64_t{1} << (64 - kIndexBits)) - 1;

// The record's value of the variable, read in place; Value::NULL_VALUE when the record
// lacks the field or there is no variable. Looks the name up only when the record's
// layout differs from the one cached. May throw std::bad_alloc (the variable's name).
const Value& FieldValue(const ValueRecord& record, const IQZVariable* variable,
                        std::atomic<uint64_t>& slot) {
  const uint64_t layout = record.GetLayoutId();
  const uint64_t cached = slot.load(std::memory_order_relaxed);
  if (cached != 0 && (cached >> kIndexBits) == layout) {
    const size_t index = static_cast<size_t>(cached & kIndexMask);
    if (index < record.Size()) return record[index];
  }
  if (variable == nullptr) return Value::NULL_VALUE;
  const int index = record.IndexOf(variable->GetName());
  if (index < 0) return Value::NULL_VALUE;
  const auto position = static_cast<uint64_t>(index);
  if (layout != 0 && layout <= kMaxLayoutId && position <= kIndexMask) {
    slot.store((layout << kIndexBits) | position, std::memory_order_relaxed);
  }
  return record[static_cast<size_t>(index)];
}

bool IsCategorical(int level) {
  return level == QZXML_800::ML_NUMERIC_CATEGORICAL || level == QZXML_800::ML_STRING_CATEGORICAL;
}

// A clone of a split that is not silently lost: copies throw instead.
std::unique_ptr<const ScoringSplitVar> CloneSplit(const ScoringSplitVar* split) {
  if (split == nullptr) return nullptr;
  std::unique_ptr<const ScoringSplitVar> copy(split->Clone());
  if (!copy) throw std::bad_alloc();
  return copy;
}

// The split as a ScoringScaleSplit when it is exactly one (not a class derived from it,
// which may answer differently); else null.
const ScoringScaleSplit* ExactScaleSplit(const ScoringSplitVar* split) {
  if (split == nullptr || typeid(*split) != typeid(ScoringScaleSplit)) return nullptr;
  return static_cast<const ScoringScaleSplit*>(split);
}

// The split's variable when it is not categorical; else null.
const IQZVariable* ContinuousVariable(const ScoringScaleSplit* split) {
  if (split == nullptr) return nullptr;
  const IQZVariable* variable = split->GetSplitVar();
  return variable != nullptr && !IsCategorical(variable->GetMeasureLevel()) ? variable : nullptr;
}

constexpr int kTextValues = 3;  // IQZEncoder::GetValueType of a text encoder

// The encoder that judges a continuous variable's numbers, when the variable is one of
// the platform's own (their encoder is made with them and never replaced) and the
// encoder holds numbers; else null.
const QZXML_800::IQZEncoder* FixedNumberEncoder(const IQZVariable* variable) {
  if (dynamic_cast<const QZXML_800::QZVariableBase*>(variable) == nullptr) return nullptr;
  const QZXML_800::IQZEncoder* encoder = variable->GetEncoder();
  return encoder != nullptr && encoder->GetValueType() != kTextValues ? encoder : nullptr;
}

// ScoringPMMLParser::IsMissingValue for a real that is not system-missing, on a variable
// that is not categorical: only the variable's encoder can still call it missing.
bool IsDeclaredMissingNumber(const IQZVariable* variable, const QZXML_800::IQZEncoder* fixed,
                             const Value& value) {
  if (fixed != nullptr) return fixed->IsMissingNumber(value.GetReal());
  const QZXML_800::IQZEncoder* encoder = variable->GetEncoder();
  if (encoder == nullptr) return false;
  if (encoder->GetValueType() != kTextValues) {
    return encoder->IsMissingNumber(value.GetReal());
  }
  return ScoringPMMLParser::IsMissingValue(variable, value);
}

// The number of categories a CategoryTest covers for the variable: 1 to 64 for a
// categorical variable of the platform's own (whose encoder only ever gains categories,
// so that an index keeps naming the same category); 0 when it covers none.
int CoveredCategories(const IQZVariable* variable) {
  if (dynamic_cast<const QZXML_800::QZVariableBase*>(variable) == nullptr) return 0;
  if (!IsCategorical(variable->GetMeasureLevel())) return 0;
  const QZXML_800::IQZEncoder* encoder = variable->GetEncoder();
  const int count = encoder != nullptr ? encoder->GetCount() : 0;
  return count >= 1 && count <= 64 ? count : 0;
}

// Sets bit i of `test.members` when `holds` is true for category i of the variable.
// False when the categories cannot be listed.
template <typename Holds>
bool SetMembers(const IQZVariable* variable, ScoringPredicate::CategoryTest& test, Holds holds) {
  const std::vector<Value> categories = ScoringPMMLParser::GetValues(variable);
  if (categories.size() != static_cast<size_t>(test.count)) return false;
  for (int i = 0; i < test.count; ++i) {
    if (holds(categories[static_cast<size_t>(i)])) test.members |= uint64_t{1} << i;
  }
  return true;
}

// A copy of the named field's value for callers that want their own.
Value CopyOfField(const IQZVariable* variable, const ValueRecord& record) {
  if (variable == nullptr) return Value();
  try {
    return record.Get(variable->GetName());
  } catch (...) {
    return Value();  // out of memory: nothing to hand out
  }
}

}  // namespace

ScoringPredicate::~ScoringPredicate() = default;

int ScoringPredicate::CategoryCode(const IQZVariable* variable, const Value& value) noexcept {
  if (variable == nullptr) return CATEGORY_UNDECIDED;
  try {
    // Missing as the missing tests see it; a predicate that is no missing test treats
    // a missing value as it treats one that is no category.
    if (value.IsMissing() || ScoringPMMLParser::IsMissingValue(variable, value)) {
      return CATEGORY_MISSING;
    }
    const QZXML_800::IQZEncoder* encoder = variable->GetEncoder();
    if (encoder == nullptr || encoder->GetCount() == 0) return CATEGORY_UNDECIDED;
    // The lookups ScoringPMMLParser::IsValidValue makes, for the kinds of value whose
    // category the splits match by that category's own value.
    double index = -1.0;
    const int level = variable->GetMeasureLevel();
    if (level == QZXML_800::ML_STRING_CATEGORICAL && value.IsString()) {
      index = encoder->IndexOfString(value.GetText());
    } else if (level == QZXML_800::ML_NUMERIC_CATEGORICAL && value.IsNumericValue()) {
      index = encoder->IndexOfNumber(value.GetReal());
    } else {
      return CATEGORY_UNDECIDED;
    }
    return index == -1.0 ? CATEGORY_NONE : static_cast<int>(index);
  } catch (...) {
    return CATEGORY_UNDECIDED;
  }
}

// ---- ScoringSimplePredicate ----

ScoringSimplePredicate::ScoringSimplePredicate()
    : fScaleSplit(nullptr),
      fContinuousVariable(nullptr),
      fNumberEncoder(nullptr),
      fMissingTest(MISSING_TEST_NONE),
      fFieldSlot(0) {}

ScoringSimplePredicate::ScoringSimplePredicate(const ScoringSplitVar* split)
    : fSplit(split),
      fScaleSplit(ExactScaleSplit(split)),
      fContinuousVariable(ContinuousVariable(fScaleSplit)),
      fNumberEncoder(FixedNumberEncoder(fContinuousVariable)),
      fMissingTest(MISSING_TEST_NONE),
      fFieldSlot(0) {}

ScoringSimplePredicate::ScoringSimplePredicate(const ScoringSimplePredicate& other)
    : ScoringPredicate(other),
      fSplit(CloneSplit(other.fSplit.get())),
      fScaleSplit(ExactScaleSplit(fSplit.get())),
      fContinuousVariable(ContinuousVariable(fScaleSplit)),
      fNumberEncoder(FixedNumberEncoder(fContinuousVariable)),
      fMissingTest(other.fMissingTest),
      fFieldSlot(0) {}

ScoringSimplePredicate& ScoringSimplePredicate::operator=(const ScoringSimplePredicate& other) {
  if (this == &other) return *this;
  fSplit = CloneSplit(other.fSplit.get());
  fScaleSplit = ExactScaleSplit(fSplit.get());
  fContinuousVariable = ContinuousVariable(fScaleSplit);
  fNumberEncoder = FixedNumberEncoder(fContinuousVariable);
  fMissingTest = other.fMissingTest;
  fFieldSlot.store(0, std::memory_order_relaxed);
  return *this;
}

ScoringSimplePredicate::~ScoringSimplePredicate() = default;

ScoringSimplePredicate* ScoringSimplePredicate::Clone() const {
  try {
    return new ScoringSimplePredicate(*this);
  } catch (...) {
    return nullptr;
  }
}

ScoringPredicate::PredicateResult ScoringSimplePredicate::Evaluate(
    const ValueRecord& record) const {
  const ScoringSplitVar* split = fSplit.get();
  if (split == nullptr) return PREDICATE_UNKNOWN;
  try {
    // The common case: a comparison of a continuous field's real value with numbers.
    // The split is exactly a ScoringScaleSplit, so its members are read in place.
    if (fScaleSplit != nullptr && fScaleSplit->fNumericOnly && fMissingTest == MISSING_TEST_NONE &&
        fContinuousVariable != nullptr && fScaleSplit->fVariable == fContinuousVariable) {
      const Value& value = FieldValue(record, fContinuousVariable, fFieldSlot);
      if (value.IsNumericValue()) {
        const int unmatched = fScaleSplit->fMissvalMap;
        if (value.IsSystemMissingValue() ||
            IsDeclaredMissingNumber(fContinuousVariable, fNumberEncoder, value)) {
          return unmatched != -1 ? PREDICATE_TRUE : PREDICATE_UNKNOWN;
        }
        const int index = fScaleSplit->ChildIndexOfNumber(value.GetReal(), unmatched);
        return index == -1 ? PREDICATE_FALSE : PREDICATE_TRUE;
      }
    }
    const IQZVariable* variable = split->GetSplitVar();
    const Value& value = FieldValue(record, variable, fFieldSlot);
    if (fMissingTest != MISSING_TEST_NONE) {
      // PMML's missing tests are never unknown; an unknown category is present.
      const bool missing = value.IsMissing() || ScoringPMMLParser::IsMissingValue(variable, value);
      return missing == (fMissingTest == MISSING_TEST_IS_MISSING) ? PREDICATE_TRUE
                                                                  : PREDICATE_FALSE;
    }
    const int level = variable != nullptr ? variable->GetMeasureLevel() : QZXML_800::ML_UNKNOWN;
    // On a categorical field a value that is no category counts as missing.
    bool missing = IsCategorical(level) ? !ScoringPMMLParser::IsValidValue(variable, value)
                                        : ScoringPMMLParser::IsMissingValue(variable, value);
    missing = missing || value.IsMissing();
    if (missing) return split->GetMissvalMap() != -1 ? PREDICATE_TRUE : PREDICATE_UNKNOWN;
    // The value is not missing for the variable: a scale split need not ask again.
    const int index = fScaleSplit != nullptr ? fScaleSplit->ChildIndexOfPresent(value)
                                             : split->GetSplitChildIndex(&value);
    return index == -1 ? PREDICATE_FALSE : PREDICATE_TRUE;
  } catch (...) {
    return PREDICATE_UNKNOWN;
  }
}

bool ScoringSimplePredicate::GetNumericTest(NumericTest& test) const noexcept {
  // The cases Evaluate answers from the number alone: a real is judged missing by the
  // encoder and placed by the split's one numeric range; null is missing.
  const ScoringScaleSplit* split = fScaleSplit;
  if (split == nullptr || !split->fNumericOnly || split->fNumeric.size() > 1 ||
      fNumberEncoder == nullptr || split->fVariable != fContinuousVariable) {
    return false;
  }
  NumericTest form{0.0, 0.0, fNumberEncoder, false, false,
                   PREDICATE_UNKNOWN, PREDICATE_FALSE, PREDICATE_FALSE};
  if (split->fNumeric.empty()) {
    form.low = std::numeric_limits<double>::infinity();  // holds no number
    form.high = -form.low;
  } else {
    const ScoringScaleSplit::NumericRange& range = split->fNumeric.front();
    form.low = range.low;
    form.high = range.high;
    form.lowIncluded = range.lowIncluded;
    form.highIncluded = range.highIncluded;
  }
  const int unmatched = split->fMissvalMap;
  switch (fMissingTest) {
    case MISSING_TEST_NONE:
      form.missing = unmatched != -1 ? PREDICATE_TRUE : PREDICATE_UNKNOWN;
      form.inRange = split->fNumeric.empty() || split->fNumeric.front().childIndex != -1
                         ? PREDICATE_TRUE
                         : PREDICATE_FALSE;
      form.outOfRange = unmatched != -1 ? PREDICATE_TRUE : PREDICATE_FALSE;
      break;
    case MISSING_TEST_IS_MISSING:
      form.missing = PREDICATE_TRUE;
      break;
    case MISSING_TEST_IS_NOT_MISSING:
      form.missing = PREDICATE_FALSE;
      form.inRange = form.outOfRange = PREDICATE_TRUE;
      break;
    default:
      return false;
  }
  test = form;
  return true;
}

bool ScoringSimplePredicate::GetCategoryTest(CategoryTest& test) const noexcept {
  const ScoringSplitVar* split = fSplit.get();
  if (split == nullptr) return false;
  try {
    const IQZVariable* variable = split->GetSplitVar();
    CategoryTest form{0, CoveredCategories(variable), PREDICATE_UNKNOWN, PREDICATE_UNKNOWN};
    if (form.count == 0) return false;
    if (fMissingTest != MISSING_TEST_NONE) {
      // A value that is no category is present, not missing.
      const bool isMissing = fMissingTest == MISSING_TEST_IS_MISSING;
      form.missing = isMissing ? PREDICATE_TRUE : PREDICATE_FALSE;
      form.noCategory = isMissing ? PREDICATE_FALSE : PREDICATE_TRUE;
      if (!isMissing) {
        form.members = form.count == 64 ? ~uint64_t{0} : (uint64_t{1} << form.count) - 1;
      }
    } else {
      // As Evaluate answers a valid category, and a missing or invalid value.
      form.missing = form.noCategory =
          split->GetMissvalMap() != -1 ? PREDICATE_TRUE : PREDICATE_UNKNOWN;
      const ScoringScaleSplit* scale = fScaleSplit;
      const bool listed = SetMembers(variable, form, [split, scale](const Value& category) {
        const int index = scale != nullptr ? scale->ChildIndexOfPresent(category)
                                           : split->GetSplitChildIndex(&category);
        return index != -1;
      });
      if (!listed) return false;
    }
    test = form;
    return true;
  } catch (...) {
    return false;
  }
}

ScoringPredicate::PredicateType ScoringSimplePredicate::GetPredType() const {
  return SIMPLE_PREDICATE;
}

bool ScoringSimplePredicate::IsDerivedPredictor() const { return false; }

void ScoringSimplePredicate::SetSplit(const ScoringSplitVar* split) {
  if (split == fSplit.get()) return;
  fSplit.reset(split);
  fScaleSplit = ExactScaleSplit(split);
  fContinuousVariable = ContinuousVariable(fScaleSplit);
  fNumberEncoder = FixedNumberEncoder(fContinuousVariable);
  fFieldSlot.store(0, std::memory_order_relaxed);
}

const ScoringSplitVar* ScoringSimplePredicate::GetSplit() const { return fSplit.get(); }

void ScoringSimplePredicate::Display(std::ostream& out) const { out << "Simple Predicate: \n"; }

void ScoringSimplePredicate::SetMissingTest(MissingTest test) { fMissingTest = test; }

ScoringSimplePredicate::MissingTest ScoringSimplePredicate::GetMissingTest() const {
  return fMissingTest;
}

Value ScoringSimplePredicate::GetScoreValue(const IQZVariable* variable,
                                            const ValueRecord& record) const {
  return CopyOfField(variable, record);
}

// ---- ScoringSetPredicate ----

ScoringSetPredicate::ScoringSetPredicate() : fFieldSlot(0) {}

ScoringSetPredicate::ScoringSetPredicate(const ScoringSplitVar* split)
    : fSplit(split), fFieldSlot(0) {}

ScoringSetPredicate::ScoringSetPredicate(const ScoringSetPredicate& other)
    : ScoringPredicate(other), fSplit(CloneSplit(other.fSplit.get())), fFieldSlot(0) {}

ScoringSetPredicate& ScoringSetPredicate::operator=(const ScoringSetPredicate& other) {
  if (this == &other) return *this;
  fSplit = CloneSplit(other.fSplit.get());
  fFieldSlot.store(0, std::memory_order_relaxed);
  return *this;
}

ScoringSetPredicate::~ScoringSetPredicate() = default;

ScoringSetPredicate* ScoringSetPredicate::Clone() const {
  try {
    return new ScoringSetPredicate(*this);
  } catch (...) {
    return nullptr;
  }
}

ScoringPredicate::PredicateResult ScoringSetPredicate::Evaluate(const ValueRecord& record) const {
  const ScoringSplitVar* split = fSplit.get();
  if (split == nullptr) return PREDICATE_UNKNOWN;
  try {
    const IQZVariable* variable = split->GetSplitVar();
    const Value& value = FieldValue(record, variable, fFieldSlot);
    // Missing and invalid values are unknown; the missing-value map is not consulted.
    if (value) {
      const int level = variable != nullptr ? variable->GetMeasureLevel() : QZXML_800::ML_UNKNOWN;
      const bool unusable = IsCategorical(level)
                                ? !ScoringPMMLParser::IsValidValue(variable, value)
                                : ScoringPMMLParser::IsMissingValue(variable, value);
      if (unusable) return PREDICATE_UNKNOWN;
    }
    if (value.IsMissing()) return PREDICATE_UNKNOWN;
    return split->GetSplitChildIndex(&value) == -1 ? PREDICATE_FALSE : PREDICATE_TRUE;
  } catch (...) {
    return PREDICATE_UNKNOWN;
  }
}

bool ScoringSetPredicate::GetCategoryTest(CategoryTest& test) const noexcept {
  const ScoringSplitVar* split = fSplit.get();
  if (split == nullptr) return false;
  try {
    const IQZVariable* variable = split->GetSplitVar();
    // Missing and invalid values are unknown; a category holds when its child is one.
    CategoryTest form{0, CoveredCategories(variable), PREDICATE_UNKNOWN, PREDICATE_UNKNOWN};
    if (form.count == 0) return false;
    const bool listed = SetMembers(variable, form, [split](const Value& category) {
      return split->GetSplitChildIndex(&category) != -1;
    });
    if (!listed) return false;
    test = form;
    return true;
  } catch (...) {
    return false;
  }
}

ScoringPredicate::PredicateType ScoringSetPredicate::GetPredType() const {
  return SET_PREDICATE;
}

bool ScoringSetPredicate::IsDerivedPredictor() const { return false; }

void ScoringSetPredicate::SetSplit(const ScoringSplitVar* split) {
  if (split == fSplit.get()) return;
  fSplit.reset(split);
  fFieldSlot.store(0, std::memory_order_relaxed);
}

const ScoringSplitVar* ScoringSetPredicate::GetSplit() const { return fSplit.get(); }

void ScoringSetPredicate::Display(std::ostream& out) const { out << "Set Predicate: \n"; }

Value ScoringSetPredicate::GetScoreValue(const IQZVariable* variable,
                                         const ValueRecord& record) const {
  return CopyOfField(variable, record);
}

// ---- ScoringCompoundPredicate ----

namespace {

// Appends clones of `from` to `to`; all clones are made before `to` changes, so a
// failure leaves `to` as it was.
void AppendClones(const std::vector<ScoringPredicate*>& from, std::vector<ScoringPredicate*>& to) {
  std::vector<std::unique_ptr<ScoringPredicate>> clones;
  clones.reserve(from.size());
  for (const ScoringPredicate* child : from) {
    if (child == nullptr) continue;
    clones.emplace_back(child->Clone());
    if (!clones.back()) throw std::bad_alloc();
  }
  to.reserve(to.size() + clones.size());
  for (auto& clone : clones) to.push_back(clone.release());
}

// A child's result; a null child (which only a misuse of GetPredicates can insert)
// cannot decide anything.
Result EvaluateChild(const ScoringPredicate* child, const ValueRecord& record) {
  return child != nullptr ? child->Evaluate(record) : ScoringPredicate::PREDICATE_UNKNOWN;
}

}  // namespace

ScoringCompoundPredicate::ScoringCompoundPredicate() : fBoolOperator(BOOL_SURROGATE) {}

ScoringCompoundPredicate::ScoringCompoundPredicate(CompoundBoolOperator op)
    : fBoolOperator(op) {}

ScoringCompoundPredicate::ScoringCompoundPredicate(const ScoringCompoundPredicate& other)
    : ScoringPredicate(other), fBoolOperator(other.fBoolOperator) {
  AppendClones(other.fPredicates, fPredicates);
}

ScoringCompoundPredicate& ScoringCompoundPredicate::operator=(
    const ScoringCompoundPredicate& other) {
  if (this == &other) return *this;
  AppendClones(other.fPredicates, fPredicates);
  fBoolOperator = other.fBoolOperator;
  return *this;
}

ScoringCompoundPredicate::~ScoringCompoundPredicate() {
  for (ScoringPredicate* child : fPredicates) delete child;
}

ScoringCompoundPredicate* ScoringCompoundPredicate::Clone() const {
  try {
    return new ScoringCompoundPredicate(*this);
  } catch (...) {
    return nullptr;
  }
}

ScoringPredicate::PredicateResult ScoringCompoundPredicate::Evaluate(
    const ValueRecord& record) const {
  try {
    return Combine(record);
  } catch (...) {
    return PREDICATE_UNKNOWN;  // a plug-in's own child predicate threw
  }
}

ScoringPredicate::PredicateResult ScoringCompoundPredicate::Combine(
    const ValueRecord& record) const {
  bool anyUnknown = false;
  switch (fBoolOperator) {
    case BOOL_OR:
      for (const ScoringPredicate* child : fPredicates) {
        const Result result = EvaluateChild(child, record);
        if (result == PREDICATE_TRUE) return PREDICATE_TRUE;
        anyUnknown = anyUnknown || result == PREDICATE_UNKNOWN;
      }
      return anyUnknown ? PREDICATE_UNKNOWN : PREDICATE_FALSE;
    case BOOL_AND:
      for (const ScoringPredicate* child : fPredicates) {
        const Result result = EvaluateChild(child, record);
        if (result == PREDICATE_FALSE) return PREDICATE_FALSE;
        anyUnknown = anyUnknown || result == PREDICATE_UNKNOWN;
      }
      return anyUnknown ? PREDICATE_UNKNOWN : PREDICATE_TRUE;
    case BOOL_XOR: {
      bool odd = false;
      for (const ScoringPredicate* child : fPredicates) {
        const Result result = EvaluateChild(child, record);
        if (result == PREDICATE_UNKNOWN) return PREDICATE_UNKNOWN;
        odd = odd != (result == PREDICATE_TRUE);
      }
      return odd ? PREDICATE_TRUE : PREDICATE_FALSE;
    }
    case BOOL_SURROGATE:
      for (const ScoringPredicate* child : fPredicates) {
        const Result result = EvaluateChild(child, record);
        if (result != PREDICATE_UNKNOWN) return result;
      }
      return PREDICATE_UNKNOWN;
    default:
      return PREDICATE_UNKNOWN;
  }
}

ScoringPredicate::PredicateType ScoringCompoundPredicate::GetPredType() const {
  return COMPOUND_PREDICATE;
}

bool ScoringCompoundPredicate::IsDerivedPredictor() const {
  for (const ScoringPredicate* child : fPredicates) {
    if (child != nullptr && child->IsDerivedPredictor()) return true;
  }
  return false;
}

void ScoringCompoundPredicate::SetSplit(const ScoringSplitVar* /*split*/) {}

const ScoringSplitVar* ScoringCompoundPredicate::GetSplit() const { return nullptr; }

void ScoringCompoundPredicate::Display(std::ostream& out) const {
  out << "Compound Predicate: \n";
}

void ScoringCompoundPredicate::AddPredicate(ScoringPredicate* predicate) {
  std::unique_ptr<ScoringPredicate> owned(predicate);
  if (!owned) return;
  fPredicates.push_back(owned.get());
  owned.release();
}

bool ScoringCompoundPredicate::RemovePredicate(ScoringPredicate* predicate) {
  for (auto it = fPredicates.begin(); it != fPredicates.end(); ++it) {
    if (*it == predicate) {
      fPredicates.erase(it);
      return true;
    }
  }
  return false;
}

int ScoringCompoundPredicate::GetCount() const { return static_cast<int>(fPredicates.size()); }

const std::vector<ScoringPredicate*>& ScoringCompoundPredicate::GetPredicates() const {
  return fPredicates;
}

std::vector<ScoringPredicate*>& ScoringCompoundPredicate::GetPredicates() {
  return fPredicates;
}

void ScoringCompoundPredicate::SetBoolOperator(CompoundBoolOperator op) { fBoolOperator = op; }

ScoringPredicate::CompoundBoolOperator ScoringCompoundPredicate::GetBoolOperator() const {
  return static_cast<CompoundBoolOperator>(fBoolOperator);
}

// ---- ScoringTruePredicate and ScoringFalsePredicate ----

ScoringTruePredicate::ScoringTruePredicate() = default;
ScoringTruePredicate::ScoringTruePredicate(const ScoringTruePredicate& other) = default;
ScoringTruePredicate& ScoringTruePredicate::operator=(const ScoringTruePredicate& other) = default;
ScoringTruePredicate::~ScoringTruePredicate() = default;

ScoringTruePredicate* ScoringTruePredicate::Clone() const {
  return new (std::nothrow) ScoringTruePredicate();
}

ScoringPredicate::PredicateResult ScoringTruePredicate::Evaluate(
    const ValueRecord& /*record*/) const {
  return PREDICATE_TRUE;
}

ScoringPredicate::PredicateType ScoringTruePredicate::GetPredType() const {
  return TRUE_PREDICATE;
}

bool ScoringTruePredicate::IsDerivedPredictor() const { return false; }

void ScoringTruePredicate::SetSplit(const ScoringSplitVar* /*split*/) {}

const ScoringSplitVar* ScoringTruePredicate::GetSplit() const { return nullptr; }

void ScoringTruePredicate::Display(std::ostream& out) const { out << "Constant TRUE\n"; }

ScoringFalsePredicate::ScoringFalsePredicate() = default;
ScoringFalsePredicate::ScoringFalsePredicate(const ScoringFalsePredicate& other) = default;
ScoringFalsePredicate& ScoringFalsePredicate::operator=(const ScoringFalsePredicate& other) =
    default;
ScoringFalsePredicate::~ScoringFalsePredicate() = default;

ScoringFalsePredicate* ScoringFalsePredicate::Clone() const {
  return new (std::nothrow) ScoringFalsePredicate();
}

ScoringPredicate::PredicateResult ScoringFalsePredicate::Evaluate(
    const ValueRecord& /*record*/) const {
  return PREDICATE_FALSE;
}

ScoringPredicate::PredicateType ScoringFalsePredicate::GetPredType() const {
  return FALSE_PREDICATE;
}

bool ScoringFalsePredicate::IsDerivedPredictor() const { return false; }

void ScoringFalsePredicate::SetSplit(const ScoringSplitVar* /*split*/) {}

const ScoringSplitVar* ScoringFalsePredicate::GetSplit() const { return nullptr; }

void ScoringFalsePredicate::Display(std::ostream& out) const { out << "Constant FALSE\n"; }

}  // namespace QZScoring_800

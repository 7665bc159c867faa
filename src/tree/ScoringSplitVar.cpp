// Split variables: the base, the discrete split of categorical fields and the scale
// split of all other fields.

#include <memory>
#include <new>
#include <ostream>
#include <string>
#include <typeinfo>
#include <unordered_map>
#include <utility>
#include <vector>

#include "QZMV.h"
#include "QZVarList.h"
#include "ScoringDiscreteSplit.h"
#include "ScoringPMMLParser.h"
#include "ScoringRange.h"
#include "ScoringScaleSplit.h"
#include "ScoringSplitVar.h"
#include "Value.h"

using QZCommon_800::QZMV;
using QZCommon_800::Value;
using QZXML_800::IQZVariable;

namespace QZScoring_800 {

namespace {

// A clone of what `source` points to, for copies that must not silently lose a part.
template <class T>
std::unique_ptr<T> CloneOrThrow(const T& source) {
  std::unique_ptr<T> copy(source.Clone());
  if (!copy) throw std::bad_alloc();
  return copy;
}

// Appends clones of `from`'s entries to `to`: all clones are made before `to` changes,
// so a failure leaves `to` as it was.
template <class T>
void AppendClones(const std::vector<std::pair<std::unique_ptr<T>, int>>& from,
                  std::vector<std::pair<std::unique_ptr<T>, int>>& to) {
  std::vector<std::pair<std::unique_ptr<T>, int>> clones;
  clones.reserve(from.size());
  for (const auto& entry : from) clones.emplace_back(CloneOrThrow(*entry.first), entry.second);
  to.reserve(to.size() + clones.size());
  for (auto& clone : clones) to.push_back(std::move(clone));
}

bool IsNumber(const Value& v) { return v.IsNumericValue() && !v.IsSystemMissingValue(); }

}  // namespace

// ---- ScoringSplitVar ----

ScoringSplitVar::ScoringSplitVar() : fVariable(nullptr), fMissvalMap(-1) {}

ScoringSplitVar::ScoringSplitVar(const IQZVariable* variable)
    : fVariable(variable), fMissvalMap(-1) {}

ScoringSplitVar::ScoringSplitVar(const ScoringSplitVar& other) = default;

ScoringSplitVar& ScoringSplitVar::operator=(const ScoringSplitVar& other) = default;

ScoringSplitVar::~ScoringSplitVar() = default;

void ScoringSplitVar::SetSplitVar(const IQZVariable* variable) { fVariable = variable; }

void ScoringSplitVar::SetMissvalMap(int index) { fMissvalMap = index; }

const IQZVariable* ScoringSplitVar::GetSplitVar() const { return fVariable; }

std::string ScoringSplitVar::GetSplitName() const {
  return fVariable != nullptr ? fVariable->GetName() : std::string();
}

std::string ScoringSplitVar::GetSplitLabel() const {
  return fVariable != nullptr ? fVariable->GetLabel() : std::string();
}

int ScoringSplitVar::GetSplitType() const { return -1; }

int ScoringSplitVar::GetSplitMLevel() const {
  return fVariable != nullptr ? fVariable->GetMeasureLevel() : QZXML_800::ML_UNKNOWN;
}

int ScoringSplitVar::GetMissvalMap() const { return fMissvalMap; }

// ---- ScoringDiscreteSplit ----

namespace {

// Below this many entries a scan is as fast as a hash lookup and needs no memory.
constexpr size_t kIndexThreshold = 8;

}  // namespace

// The entries by the keys under which a value can match them, each key giving the
// position of the first entry with that key, so that the earliest match among the
// candidates is the one a scan would find.
struct ScoringDiscreteSplit::Index {
  std::unordered_map<std::string, size_t> texts;       // text entries by text
  std::unordered_map<double, size_t> numbers;          // number entries by number
  std::unordered_map<double, size_t> textNumbers;      // text entries that read as numbers
  bool others = false;  // a null or structured entry: lookups scan instead

  void Add(const Value& value, size_t position) {
    if (value.IsString()) {
      texts.emplace(value.GetText(), position);
      const double number = value.GetReal();
      if (!QZMV::IsMissing(number)) textNumbers.emplace(number, position);
    } else if (value.IsNumericValue()) {
      numbers.emplace(value.GetReal(), position);
    } else {
      others = true;
    }
  }
};

void ScoringDiscreteSplit::IndexDeleter::operator()(Index* index) const noexcept {
  delete index;
}

ScoringDiscreteSplit::ScoringDiscreteSplit(const IQZVariable* variable)
    : ScoringSplitVar(variable), fStartIndex(-1), fEndIndex(-1) {}

ScoringDiscreteSplit::ScoringDiscreteSplit(const ScoringDiscreteSplit& other)
    : ScoringSplitVar(other), fStartIndex(other.fStartIndex), fEndIndex(other.fEndIndex) {
  AppendClones(other.fEntries, fEntries);
  for (size_t i = 0; i < fEntries.size(); ++i) IndexEntry(i);
}

ScoringDiscreteSplit& ScoringDiscreteSplit::operator=(const ScoringDiscreteSplit& other) {
  if (this == &other) return *this;
  const size_t first = fEntries.size();
  AppendClones(other.fEntries, fEntries);
  for (size_t i = first; i < fEntries.size(); ++i) IndexEntry(i);
  ScoringSplitVar::operator=(other);
  fStartIndex = other.fStartIndex;
  fEndIndex = other.fEndIndex;
  return *this;
}

ScoringDiscreteSplit::~ScoringDiscreteSplit() = default;

ScoringDiscreteSplit* ScoringDiscreteSplit::Clone() const {
  try {
    return new ScoringDiscreteSplit(*this);
  } catch (...) {
    return nullptr;
  }
}

bool ScoringDiscreteSplit::Matches(const Value& entry, const Value& value) const {
  // Values of one kind follow Value's own equality. A text and a number stand for the
  // same category when they agree as the variable's categories are kept: as texts for
  // text categories, as numbers otherwise (so the text "2" and the number 2 match on a
  // numeric field, whichever kind the record or the PMML array supplied).
  if (entry.IsString() && value.IsString()) return entry.GetText() == value.GetText();
  if (entry.IsNumericValue() && value.IsNumericValue()) return entry.GetReal() == value.GetReal();
  const bool mixed = (entry.IsString() && value.IsNumericValue()) ||
                     (entry.IsNumericValue() && value.IsString());
  if (!mixed) return entry == value;
  if (GetSplitMLevel() == QZXML_800::ML_STRING_CATEGORICAL) {
    const Value& number = entry.IsString() ? value : entry;
    const Value& text = entry.IsString() ? entry : value;
    return IsNumber(number) && number.GetString() == text.GetText();
  }
  const Value entryNumber(entry.GetReal());
  const Value valueNumber(value.GetReal());
  return IsNumber(entryNumber) && entryNumber == valueNumber;
}

size_t ScoringDiscreteSplit::FindByScan(const Value& value) const {
  for (size_t i = 0; i < fEntries.size(); ++i) {
    if (Matches(*fEntries[i].first, value)) return i;
  }
  return fEntries.size();
}

size_t ScoringDiscreteSplit::FindByIndex(const Value& value) const {
  const Index& index = *fIndex;
  size_t best = fEntries.size();
  auto consider = [&best](const auto& map, const auto& key) {
    const auto found = map.find(key);
    if (found != map.end() && found->second < best) best = found->second;
  };
  // The same candidates as Matches, looked up instead of scanned.
  if (value.IsString()) {
    consider(index.texts, value.GetText());
    const double number = value.GetReal();
    if (!QZMV::IsMissing(number)) {
      if (GetSplitMLevel() != QZXML_800::ML_STRING_CATEGORICAL) {
        consider(index.numbers, number);
      } else {
        const auto found = index.numbers.find(number);
        if (found != index.numbers.end() && found->second < best &&
            fEntries[found->second].first->GetString() == value.GetText()) {
          best = found->second;
        }
      }
    }
  } else {
    consider(index.numbers, value.GetReal());
    if (!value.IsSystemMissingValue()) {
      if (GetSplitMLevel() == QZXML_800::ML_STRING_CATEGORICAL) {
        consider(index.texts, value.GetString());
      } else {
        consider(index.textNumbers, value.GetReal());
      }
    }
  }
  return best;
}

int ScoringDiscreteSplit::GetSplitChildIndex(const Value* value) const {
  if (value == nullptr) return GetMissvalMap();
  try {
    const bool indexed = fIndex && !fIndex->others &&
                         (value->IsString() || value->IsNumericValue());
    const size_t position = indexed ? FindByIndex(*value) : FindByScan(*value);
    if (position < fEntries.size()) return fEntries[position].second;
  } catch (...) {
    // Out of memory while writing a number's text: treated as unmatched.
  }
  return GetMissvalMap();
}

void ScoringDiscreteSplit::Display(std::ostream& out) const {
  const auto* category = dynamic_cast<const QZXML_800::QZCatVar*>(GetSplitVar());
  out << "SplitVarName = " << GetSplitName();
  out << (category != nullptr && category->GetOrdinalFlag() ? "; Var type: Ordinal\n"
                                                            : "; Var type: Categorical\n");
  out << "Missing Value index: " << GetMissvalMap() << "\n";
  if (fStartIndex >= 0 && fEndIndex >= 0) {
    out << "Split value index starts from  " << fStartIndex << " to " << fEndIndex << "\n";
  }
  for (const auto& entry : fEntries) {
    out << "Value = " << entry.first->GetString() << "; " << "Index = " << entry.second << "\n";
  }
  out << "\n";
}

void ScoringDiscreteSplit::PutSplit(Value* value, int childIndex) {
  std::unique_ptr<Value> owned(value);
  if (!owned) return;
  fEntries.emplace_back(std::move(owned), childIndex);
  IndexEntry(fEntries.size() - 1);
}

void ScoringDiscreteSplit::IndexEntry(size_t position) {
  try {
    if (fIndex) {
      fIndex->Add(*fEntries[position].first, position);
    } else if (fEntries.size() >= kIndexThreshold) {
      std::unique_ptr<Index, IndexDeleter> index(new Index());
      for (size_t i = 0; i < fEntries.size(); ++i) index->Add(*fEntries[i].first, i);
      fIndex = std::move(index);
    }
  } catch (...) {
    fIndex.reset();  // out of memory: lookups scan, which needs no index
  }
}

std::vector<const Value*> ScoringDiscreteSplit::GetSplitValues() const {
  std::vector<const Value*> values;
  values.reserve(fEntries.size());
  for (const auto& entry : fEntries) values.push_back(entry.first.get());
  return values;
}

std::vector<const Value*> ScoringDiscreteSplit::GetSplitValuesForIndex(int index) const {
  std::vector<const Value*> values;
  for (const auto& entry : fEntries) {
    if (entry.second == index) values.push_back(entry.first.get());
  }
  return values;
}

std::vector<const Value*> ScoringDiscreteSplit::GetSplitValuesFirst() const {
  std::vector<const Value*> values;
  if (!fEntries.empty()) values.push_back(fEntries.front().first.get());
  return values;
}

void ScoringDiscreteSplit::SetStartAndEndIndex(int start, int end) {
  fStartIndex = start;
  fEndIndex = end;
}

void ScoringDiscreteSplit::GetStartAndEndIndex(int& start, int& end) const {
  start = fStartIndex;
  end = fEndIndex;
}

// ---- ScoringScaleSplit ----

ScoringScaleSplit::ScoringScaleSplit(const IQZVariable* variable) : ScoringSplitVar(variable) {}

ScoringScaleSplit::ScoringScaleSplit(const ScoringScaleSplit& other) : ScoringSplitVar(other) {
  AppendClones(other.fEntries, fEntries);
  RebuildNumeric();
}

ScoringScaleSplit& ScoringScaleSplit::operator=(const ScoringScaleSplit& other) {
  if (this == &other) return *this;
  AppendClones(other.fEntries, fEntries);
  RebuildNumeric();
  ScoringSplitVar::operator=(other);
  return *this;
}

ScoringScaleSplit::~ScoringScaleSplit() = default;

ScoringScaleSplit* ScoringScaleSplit::Clone() const {
  try {
    return new ScoringScaleSplit(*this);
  } catch (...) {
    return nullptr;
  }
}

int ScoringScaleSplit::GetSplitChildIndex(const Value* value) const {
  const IQZVariable* variable = GetSplitVar();
  if (value == nullptr || ScoringPMMLParser::IsMissingValue(variable, *value)) {
    return GetMissvalMap();
  }
  return ChildIndexOfPresent(*value);
}

int ScoringScaleSplit::ChildIndexOfPresent(const Value& value) const {
  // A text on a field that is not text-categorical is placed by the number it reads as
  // (it is no missing value, so it reads as one): Value's order would put every text
  // above every number.
  if (fNumericOnly && value.IsNumericValue()) {
    return ChildIndexOfNumber(value.GetReal(), GetMissvalMap());
  }
  const Value* probe = &value;
  Value number;
  const IQZVariable* variable = GetSplitVar();
  if (value.IsString() && variable != nullptr &&
      variable->GetMeasureLevel() != QZXML_800::ML_STRING_CATEGORICAL) {
    number = value.GetReal();
    probe = &number;
  }
  for (const auto& entry : fEntries) {
    if (entry.first->IsInRange(probe)) return entry.second;
  }
  return GetMissvalMap();
}

void ScoringScaleSplit::Display(std::ostream& out) const {
  out << "SplitVarName = " << GetSplitName() << "\n";
  out << "Missing Value index: " << GetMissvalMap() << "\n";
  for (const auto& entry : fEntries) {
    out << "Index = " << entry.second << "\n";
    entry.first->Display(out);
  }
  out << "\n";
}

void ScoringScaleSplit::AddNumeric(const ScoringValueRange& range, int childIndex) noexcept {
  if (!fNumericOnly) return;
  const Value* low = range.GetMin();
  const Value* high = range.GetMax();
  // A class derived from ScoringRange may place values its own way.
  const bool plain = typeid(range) == typeid(ScoringRange) && low != nullptr &&
                     high != nullptr && low->IsNumericValue() && high->IsNumericValue() &&
                     !low->IsSystemMissingValue() && !high->IsSystemMissingValue();
  if (plain) {
    try {
      fNumeric.push_back({low->GetReal(), high->GetReal(), range.GetLowEnd(),
                          range.GetHighEnd(), childIndex});
      return;
    } catch (...) {
      // Out of memory: ranges are then placed through their own IsInRange.
    }
  }
  fNumericOnly = false;
  fNumeric.clear();
  fNumeric.shrink_to_fit();
}

void ScoringScaleSplit::RebuildNumeric() noexcept {
  fNumericOnly = true;
  fNumeric.clear();
  for (const auto& entry : fEntries) AddNumeric(*entry.first, entry.second);
}

void ScoringScaleSplit::PutSplit(ScoringValueRange* range, int childIndex) {
  std::unique_ptr<ScoringValueRange> owned(range);
  if (!owned) return;
  fEntries.emplace_back(std::move(owned), childIndex);
  AddNumeric(*fEntries.back().first, childIndex);
}

const ScoringValueRange* ScoringScaleSplit::GetSplitValueRangeForIndex(int index) const {
  for (const auto& entry : fEntries) {
    if (entry.second == index) return entry.first.get();
  }
  return nullptr;
}

const ScoringValueRange* ScoringScaleSplit::GetSplitValueRangeFirst() const {
  return fEntries.empty() ? nullptr : fEntries.front().first.get();
}

}  // namespace QZScoring_800

// A split variable of a non-categorical field: a list of value ranges, each with the
// child index it leads to.
#ifndef QZSCORING_SCORINGSCALESPLIT_H_
#define QZSCORING_SCORINGSCALESPLIT_H_

#include <memory>
#include <ostream>
#include <utility>
#include <vector>

#include "QZScoringExport.h"
#include "ScoringSplitVar.h"
#include "ScoringValueRange.h"
#include "Value.h"

namespace QZScoring_800 {

// Entries (range, child index) in insertion order; the first range holding a value
// decides its child index, so overlapping ranges resolve by insertion order. A text
// value that reads as a number is placed by that number. The split owns its ranges.
// Filled once (PutSplit), then only read: const operations may run concurrently.
class QZSCORING_API ScoringScaleSplit : public ScoringSplitVar {
 public:
  // No entries; missing-value map -1.
  explicit ScoringScaleSplit(const QZXML_800::IQZVariable* variable = nullptr);
  // Deep copy: every range is cloned; variable and map copied.
  ScoringScaleSplit(const ScoringScaleSplit& other);
  // Appends clones of the other's entries after those held, and copies the variable
  // and map. Self-assignment changes nothing.
  ScoringScaleSplit& operator=(const ScoringScaleSplit& other);
  // Deletes every range.
  ~ScoringScaleSplit() override;

  // A deep copy owned by the caller.
  ScoringScaleSplit* Clone() const override;
  // The missing-value map for a null value, a value that is missing for the variable
  // (ScoringPMMLParser::IsMissingValue) or one no range holds; otherwise the child
  // index of the first range holding it. Never throws.
  int GetSplitChildIndex(const QZCommon_800::Value* value) const override;
  // "SplitVarName = <name>", the map, then per entry its index and the range's Display.
  void Display(std::ostream& out) const override;

  // Appends an entry and takes ownership of the range. A null range is ignored. Throws
  // std::bad_alloc only when memory runs out, having deleted the range.
  void PutSplit(ScoringValueRange* range, int childIndex);
  // The range of the first entry with that child index, null when none; owned by the
  // split.
  const ScoringValueRange* GetSplitValueRangeForIndex(int index) const;
  // The first entry's range, null when there are no entries.
  const ScoringValueRange* GetSplitValueRangeFirst() const;

 private:
  friend class ScoringSimplePredicate;

  // An entry's range as plain numbers, kept beside the entries while every range is
  // exactly a ScoringRange with real bounds (the splits the PMML parsers build), so
  // that placing a number needs no virtual call and no Value comparison.
  struct NumericRange {
    double low;
    double high;
    bool lowIncluded;
    bool highIncluded;
    int childIndex;
  };

  // GetSplitChildIndex for a value the caller has found not missing for the variable.
  int ChildIndexOfPresent(const QZCommon_800::Value& value) const;
  // The child index of the first range holding a real number that is not missing;
  // `unmatched` when none does. Only while fNumericOnly.
  int ChildIndexOfNumber(double number, int unmatched) const noexcept {
    // The comparisons ScoringRange::IsInRange makes, for a number and bounds that are
    // not missing.
    for (const NumericRange& range : fNumeric) {
      if (!(range.lowIncluded ? number >= range.low : number > range.low)) continue;
      if (range.highIncluded ? number <= range.high : number < range.high) {
        return range.childIndex;
      }
    }
    return unmatched;
  }
  // Adds the numeric form of a new entry, or drops the numeric form for good.
  void AddNumeric(const ScoringValueRange& range, int childIndex) noexcept;
  // Rebuilds the numeric form from the entries.
  void RebuildNumeric() noexcept;

  std::vector<std::pair<std::unique_ptr<ScoringValueRange>, int>> fEntries;
  std::vector<NumericRange> fNumeric;  // one per entry while fNumericOnly
  bool fNumericOnly = true;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGSCALESPLIT_H_

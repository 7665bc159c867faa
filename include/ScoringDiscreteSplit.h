// A split variable of a categorical field: a list of category values, each with the
// child index it leads to.
#ifndef QZSCORING_SCORINGDISCRETESPLIT_H_
#define QZSCORING_SCORINGDISCRETESPLIT_H_

#include <cstddef>
#include <memory>
#include <ostream>
#include <utility>
#include <vector>

#include "QZScoringExport.h"
#include "ScoringSplitVar.h"
#include "Value.h"

namespace QZScoring_800 {

// Entries (value, child index) in insertion order; the first entry equal to a value
// decides its child index. A value of one kind (text or number) matches an entry of
// the other kind when both read as the same category of the variable: as numbers for
// a variable with number categories, as texts for one with text categories. The split
// owns its values. Filled once (PutSplit), then only read: const operations may run
// concurrently. Splits of many entries keep a hash index of them, so a lookup takes
// constant time on average.
class QZSCORING_API ScoringDiscreteSplit : public ScoringSplitVar {
 public:
  // No entries; missing-value map, start and end index -1.
  explicit ScoringDiscreteSplit(const QZXML_800::IQZVariable* variable = nullptr);
  // Deep copy: every value is cloned; variable, map, start and end copied.
  ScoringDiscreteSplit(const ScoringDiscreteSplit& other);
  // Appends clones of the other's entries after those held, and copies the variable,
  // map, start and end. Self-assignment changes nothing.
  ScoringDiscreteSplit& operator=(const ScoringDiscreteSplit& other);
  // Deletes every value.
  ~ScoringDiscreteSplit() override;

  // A deep copy owned by the caller.
  ScoringDiscreteSplit* Clone() const override;
  // The child index of the first entry equal to the value; the missing-value map for
  // a null value or when none matches. Never throws.
  int GetSplitChildIndex(const QZCommon_800::Value* value) const override;
  // "SplitVarName = <name>; Var type: Ordinal|Categorical", the map, the start and end
  // index when both are set, then one line per entry.
  void Display(std::ostream& out) const override;

  // Appends an entry and takes ownership of the value. A null value is ignored. Throws
  // std::bad_alloc only when memory runs out, having deleted the value.
  void PutSplit(QZCommon_800::Value* value, int childIndex);
  // All entry values in order; the pointers stay owned by the split.
  std::vector<const QZCommon_800::Value*> GetSplitValues() const;
  // The values of the entries with that child index, in order.
  std::vector<const QZCommon_800::Value*> GetSplitValuesForIndex(int index) const;
  // Only the first entry's value; empty when there are no entries.
  std::vector<const QZCommon_800::Value*> GetSplitValuesFirst() const;
  // A pair of category positions kept for Display only (-1 when unset).
  void SetStartAndEndIndex(int start, int end);
  void GetStartAndEndIndex(int& start, int& end) const;

 private:
  struct Index;
  struct QZSCORING_API IndexDeleter {
    void operator()(Index* index) const noexcept;
  };

  // True when the entry value stands for the same category as the given value.
  bool Matches(const QZCommon_800::Value& entry, const QZCommon_800::Value& value) const;
  // The position of the first entry matching the value, entries.size() when none.
  size_t FindByScan(const QZCommon_800::Value& value) const;
  size_t FindByIndex(const QZCommon_800::Value& value) const;
  // Adds the entry at `position` to the index, creating the index once the split is
  // large enough to need one.
  void IndexEntry(size_t position);

  std::vector<std::pair<std::unique_ptr<QZCommon_800::Value>, int>> fEntries;
  int fStartIndex;
  int fEndIndex;
  std::unique_ptr<Index, IndexDeleter> fIndex;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGDISCRETESPLIT_H_

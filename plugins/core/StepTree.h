// A decision tree as a branch-free walk, for records whose tested fields are all plain
// (numbers; categories every test knows), where each test is true or false: every
// step is one test and a choice of two places to go. An ensemble of shallow trees
// walks several of them side by side (WalkTogether): the steps of different trees do
// not wait for each other, so the processor overlaps them, where one walk at a time
// waits on each node before it can load the next.
#ifndef QZPLUGIN_CORE_STEPTREE_H_
#define QZPLUGIN_CORE_STEPTREE_H_

#include <cstddef>
#include <cstdint>
#include <vector>

#include "FieldRow.h"

namespace QZPlugin_800 {

class StepTree {
 public:
  // Marks a place where the walk ends (in Node::next as given to Add): the low bits
  // name the node that decides, or kDecidesNothing.
  static constexpr uint32_t kEnd = 0x80000000U;
  static constexpr uint32_t kDecidesNothing = 0x7FFFFFFFU;

  // Walking trees side by side pays while they are about this deep: each group of
  // trees makes as many steps as its deepest one needs.
  static constexpr int kShallow = 8;

  enum Kind : uint8_t { kNumber, kCategory };

  // One test. Node 0 is the root. A number test holds per its result for a number in
  // [low, high] or out of it (open ends are closed on the next double in, which is
  // exact for every number that is not NaN); a constant is a number test with both
  // results alike.
  struct Node {
    union {
      struct {
        double low;
        double high;
      } range;           // kNumber
      uint64_t members;  // kCategory: bit i set, the test holds for category i
    };
    uint32_t next[2];    // [test false, test true]
    uint16_t field;      // the number's or the category code's index in the row
    Kind kind;
    // kNumber: bit 0 the result out of the range, bit 1 in it, bit 4 set when the test
    // reads its field (all but constants: a test whose results are alike for every
    // number, such as isMissing, still needs the field plain).
    uint8_t form;
  };

  static Node Constant(bool holds);
  static Node Number(uint16_t field, double low, bool lowIncluded, double high,
                     bool highIncluded, bool inRange, bool outOfRange);
  static Node Category(uint16_t field, uint64_t members);

  // Adds a node, numbered as added; its `next` are nodes or kEnd | the node that
  // decides. `steps` is how many tests a walk makes to reach it and test it (the root:
  // 1). `count` (kCategory) is the number of categories the test covers: a code beyond
  // it is not plain. Finish once every node is added.
  void Add(const Node& node, int steps, int count = 64);
  void Finish();
  bool Empty() const { return nodes_.empty(); }
  // The most tests any walk makes.
  int Depth() const { return depth_; }

  // Regression: the score of each node (NaN: none), which a caller may read for the
  // node that decides; null otherwise.
  void SetValues(const double* values) { values_ = values; }
  const double* Values() const { return values_; }

  // Moves the tests onto another row, as ModelEvaluator::Rebase.
  void Rebase(const std::vector<int>& numbers, const std::vector<int>& categories);

  // Whether every field the tests read is plain in the row: then the walk gives what
  // the tree's full walk gives. `oddNumbers` is the row's OddNumbers(); `oddCodes` has
  // bit i set when category i's code is not below every count that category's tests
  // cover (StepForest works it out). Fields from 64 on are checked one by one.
  bool Plain(FieldRow& row, uint64_t oddNumbers, uint64_t oddCodes) const {
    if (((numberMask_ & oddNumbers) | (categoryMask_ & oddCodes)) != 0) return false;
    for (uint16_t field : wideNumbers_) {
      if (row.State(field) != FieldRow::kNumber) return false;
    }
    for (const CategoryField& category : categories_) {
      if (category.field < 64) continue;
      const int code = row.Code(category.field);
      if (code < 0 || code >= category.count) return false;
    }
    return true;
  }

  // Walks `count` trees together over the row and stores the node that decides each
  // (or kDecidesNothing) in `decides`. The category codes the trees read must have been
  // asked of the row; a tree whose row is not plain gets an answer that means nothing.
  static void WalkTogether(const StepTree* const* trees, size_t count, const FieldRow& row,
                           uint32_t* decides);

 private:
  friend class StepForest;

  struct CategoryField {
    uint16_t field;
    int count;  // the fewest categories a test on the field covers
  };

  // Where a test sends the walk. The row keeps an entry at every field index either
  // kind uses, so reading a number for a category test is harmless. A code outside
  // 0..63 is never plain; masking keeps the shift defined.
  static uint32_t Next(const Node& node, const double* numbers, const int* codes) {
    unsigned holds;
    if (node.kind == kNumber) {
      const double x = numbers[node.field];
      const unsigned in = static_cast<unsigned>(x >= node.range.low) &
                          static_cast<unsigned>(x <= node.range.high);
      holds = (node.form >> in) & 1U;
    } else {
      holds = static_cast<unsigned>(
                  node.members >> (static_cast<unsigned>(codes[node.field]) & 63U)) & 1U;
    }
    return node.next[holds];
  }
  static constexpr uint8_t kReadsField = 16;
  static bool IsConstant(const Node& node) {
    return node.kind == kNumber && (node.form & kReadsField) == 0;
  }

  void Track(const Node& node, int count);

  // The tree's nodes, then one end node per decision (a constant that stays put).
  std::vector<Node> nodes_;
  std::vector<uint32_t> decisions_;  // per end node: the node that decides
  uint32_t ends_ = 0;                // the first end node
  int depth_ = 0;
  uint64_t numberMask_ = 0;            // the numbers below 64 the tests read
  uint64_t categoryMask_ = 0;          // the categories below 64 the tests read
  std::vector<uint16_t> wideNumbers_;  // and those from 64 on
  std::vector<CategoryField> categories_;
  const double* values_ = nullptr;
};

// The trees of one ensemble that are walked side by side, over the ensemble's row.
// Per record Walk finds which trees the record's fields are plain for (with one test
// for all of them when every field is) and walks every tree; the answers of the others
// mean nothing.
class StepForest {
 public:
  void Add(const StepTree* tree);
  size_t Size() const { return trees_.size(); }

  void Walk(FieldRow& row);
  bool Plain(size_t index) const { return allPlain_ || plain_[index] != 0; }
  // The node that decides tree `index`, or StepTree::kDecidesNothing.
  uint32_t Decides(size_t index) const { return decides_[index]; }

 private:
  std::vector<const StepTree*> trees_;
  uint64_t numbers_ = 0;     // the numbers below 64 any tree reads
  uint64_t categories_ = 0;  // likewise the categories
  bool wide_ = false;        // some tree reads a field from 64 on
  // Each category a tree reads, with the fewest categories any test on it covers.
  std::vector<StepTree::CategoryField> limits_;
  bool allPlain_ = false;
  std::vector<uint8_t> plain_;
  std::vector<uint32_t> decides_;
};

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_STEPTREE_H_

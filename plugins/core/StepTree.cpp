#include "StepTree.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <map>

namespace QZPlugin_800 {

StepTree::Node StepTree::Constant(bool holds) {
  constexpr double kInfinity = std::numeric_limits<double>::infinity();
  Node node = Number(0, -kInfinity, true, kInfinity, true, holds, holds);
  node.form &= static_cast<uint8_t>(~kReadsField);
  return node;
}

StepTree::Node StepTree::Number(uint16_t field, double low, bool lowIncluded, double high,
                                bool highIncluded, bool inRange, bool outOfRange) {
  constexpr double kInfinity = std::numeric_limits<double>::infinity();
  Node node{};
  // x > low is x >= the next double above low for every x but NaN (infinities too).
  node.range.low = lowIncluded ? low : std::nextafter(low, kInfinity);
  node.range.high = highIncluded ? high : std::nextafter(high, -kInfinity);
  node.field = field;
  node.kind = kNumber;
  node.form = static_cast<uint8_t>((outOfRange ? 1 : 0) | (inRange ? 2 : 0) | kReadsField);
  return node;
}

StepTree::Node StepTree::Category(uint16_t field, uint64_t members) {
  Node node{};
  node.members = members;
  node.field = field;
  node.kind = kCategory;
  return node;
}

void StepTree::Add(const Node& node, int steps, int count) {
  nodes_.push_back(node);
  depth_ = std::max(depth_, steps);
  Track(node, count);
}

void StepTree::Finish() {
  ends_ = static_cast<uint32_t>(nodes_.size());
  std::map<uint32_t, uint32_t> ends;  // decision -> its end node
  for (uint32_t i = 0; i < ends_; ++i) {
    for (int side = 0; side < 2; ++side) {
      const uint32_t next = nodes_[i].next[side];
      if ((next & kEnd) == 0) continue;
      const uint32_t decision = next & ~kEnd;
      auto found = ends.find(decision);
      if (found == ends.end()) {
        found = ends.emplace(decision, static_cast<uint32_t>(nodes_.size())).first;
        Node end = Constant(true);
        end.next[0] = end.next[1] = found->second;
        nodes_.push_back(end);
        decisions_.push_back(decision);
      }
      nodes_[i].next[side] = found->second;
    }
  }
}

void StepTree::Track(const Node& node, int count) {
  if (node.kind == kCategory) {
    for (CategoryField& category : categories_) {
      if (category.field != node.field) continue;
      category.count = std::min(category.count, count);
      return;
    }
    categories_.push_back({node.field, count});
    if (node.field < 64) categoryMask_ |= uint64_t{1} << node.field;
    return;
  }
  if (IsConstant(node)) return;  // reads no field
  if (node.field < 64) {
    numberMask_ |= uint64_t{1} << node.field;
  } else if (std::find(wideNumbers_.begin(), wideNumbers_.end(), node.field) ==
             wideNumbers_.end()) {
    wideNumbers_.push_back(node.field);
  }
}

void StepTree::Rebase(const std::vector<int>& numbers, const std::vector<int>& categories) {
  const std::vector<CategoryField> counts = categories_;
  numberMask_ = 0;
  categoryMask_ = 0;
  wideNumbers_.clear();
  categories_.clear();
  for (Node& node : nodes_) {
    int count = 64;
    if (node.kind == kCategory) {
      for (const CategoryField& c : counts) {
        if (c.field == node.field) count = c.count;
      }
      node.field = static_cast<uint16_t>(categories[node.field]);
    } else if (!IsConstant(node)) {
      node.field = static_cast<uint16_t>(numbers[node.field]);
    }
    Track(node, count);
  }
}

void StepTree::WalkTogether(const StepTree* const* trees, size_t count, const FieldRow& row,
                            uint32_t* decides) {
  constexpr size_t kLanes = 8;
  const double* numbers = row.NumberData();
  const int* codes = row.CodeData();
  for (size_t first = 0; first < count; first += kLanes) {
    const size_t lanes = std::min(kLanes, count - first);
    const Node* base[kLanes];
    uint32_t at[kLanes];
    int rounds = 0;
    for (size_t k = 0; k < lanes; ++k) {
      base[k] = trees[first + k]->nodes_.data();
      at[k] = 0;
      rounds = std::max(rounds, trees[first + k]->depth_);
    }
    // After Depth() tests every walk has reached its end node, where it stays.
    for (int round = 0; round < rounds; ++round) {
      for (size_t k = 0; k < lanes; ++k) at[k] = Next(base[k][at[k]], numbers, codes);
    }
    for (size_t k = 0; k < lanes; ++k) {
      const StepTree& tree = *trees[first + k];
      decides[first + k] =
          at[k] >= tree.ends_ ? tree.decisions_[at[k] - tree.ends_] : kDecidesNothing;
    }
  }
}

void StepForest::Add(const StepTree* tree) {
  trees_.push_back(tree);
  plain_.push_back(0);
  decides_.push_back(StepTree::kDecidesNothing);
  numbers_ |= tree->numberMask_;
  categories_ |= tree->categoryMask_;
  wide_ = wide_ || !tree->wideNumbers_.empty();
  for (const StepTree::CategoryField& category : tree->categories_) {
    wide_ = wide_ || category.field >= 64;
    auto found = std::find_if(limits_.begin(), limits_.end(),
                              [&](const StepTree::CategoryField& c) {
                                return c.field == category.field;
                              });
    if (found == limits_.end()) {
      limits_.push_back(category);
    } else {
      found->count = std::min(found->count, category.count);
    }
  }
}

void StepForest::Walk(FieldRow& row) {
  const uint64_t oddNumbers = row.OddNumbers();
  uint64_t oddCodes = 0;
  for (const StepTree::CategoryField& limit : limits_) {
    const int code = row.Code(limit.field);  // every code the walks read
    if (limit.field < 64 && (code < 0 || code >= limit.count)) {
      oddCodes |= uint64_t{1} << limit.field;
    }
  }
  allPlain_ = !wide_ && ((numbers_ & oddNumbers) | (categories_ & oddCodes)) == 0;
  if (!allPlain_) {
    for (size_t t = 0; t < trees_.size(); ++t) {
      plain_[t] = trees_[t]->Plain(row, oddNumbers, oddCodes) ? 1 : 0;
    }
  }
  StepTree::WalkTogether(trees_.data(), trees_.size(), row, decides_.data());
}

}  // namespace QZPlugin_800

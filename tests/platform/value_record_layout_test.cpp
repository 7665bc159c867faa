// The layout id a record caches beside its layout must follow the layout through
// moves and assignments, or callers that cache field positions by it read wrong fields.

#include <utility>

#include <gtest/gtest.h>

#include "Value.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

TEST(ValueRecordLayout, IdFollowsMovesAndAssignments) {
  ValueRecord a(4);
  const uint64_t empty = a.GetLayoutId();
  EXPECT_NE(empty, 0u);  // a reserved record already has its own layout
  a.Add("x", Value(1.0));
  const uint64_t id = a.GetLayoutId();

  ValueRecord moved(std::move(a));
  EXPECT_EQ(moved.GetLayoutId(), id);
  EXPECT_EQ(a.GetLayoutId(), 0u);  // moved-from: no layout
  a.Add("y", Value(2.0));          // and usable: a fresh layout
  EXPECT_NE(a.GetLayoutId(), 0u);
  EXPECT_NE(a.GetLayoutId(), id);

  ValueRecord copied;
  copied = moved;  // shares the layout until one of them adds a field
  EXPECT_EQ(copied.GetLayoutId(), id);
  copied.Add("z", Value(3.0));
  EXPECT_NE(copied.GetLayoutId(), id);
  EXPECT_EQ(moved.GetLayoutId(), id);

  ValueRecord target;
  target.Add("w", Value(4.0));
  target = std::move(moved);
  EXPECT_EQ(target.GetLayoutId(), id);
  EXPECT_EQ(target.IndexOf("x"), 0);
  EXPECT_EQ(moved.GetLayoutId(), 0u);
  EXPECT_EQ(moved.Size(), 0u);
}

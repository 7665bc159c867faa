#include "ValueRecord.h"

#include <cstdlib>
#include <new>
#include <string>
#include <vector>

#include <gtest/gtest.h>

// Counts heap allocations of this program, so that tests can assert that the paths
// every scored record takes do not allocate.
namespace {
long gAllocations = 0;
}  // namespace

void* operator new(std::size_t size) {
  ++gAllocations;
  if (void* p = std::malloc(size == 0 ? 1 : size)) return p;
  throw std::bad_alloc();
}
void operator delete(void* p) noexcept { std::free(p); }
void operator delete(void* p, std::size_t) noexcept { std::free(p); }

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace {

using Names = std::vector<std::string>;

// Fields keep their first place; Add replaces; lookups by name and index agree.
TEST(ValueRecordTest, OrderAndLookup) {
  ValueRecord r(4);
  EXPECT_EQ(r.Size(), 0u);
  r.Add("b", Value(1));
  r.Add("a", Value("x"));
  r["c"];
  r.Add("b", Value(2));  // replaced in place
  EXPECT_EQ(r.Names(), (Names{"b", "a", "c"}));
  EXPECT_EQ(r.Names(false), (Names{"b", "a"}));  // c is null
  EXPECT_EQ(r.IndexOf("a"), 1);
  EXPECT_EQ(r.IndexOf("zz"), -1);
  EXPECT_TRUE(r.Contains("c"));
  EXPECT_FALSE(r.Contains("C"));
  EXPECT_EQ(r.Get("b").GetReal(), 2.0);
  EXPECT_EQ(r[1].GetString(), "x");
  EXPECT_EQ(r.GetName(2), "c");
  EXPECT_TRUE(r.Get("zz").IsNull());
  EXPECT_EQ(r.Size(), 3u);  // Get of an absent name adds nothing

  ValueRecord big;
  for (int i = 0; i < 1000; ++i) big["f" + std::to_string(i)] = i;
  for (int i = 0; i < 1000; i += 37) {
    EXPECT_EQ(big.IndexOf("f" + std::to_string(i)), i);
    EXPECT_EQ(big.Get(static_cast<size_t>(i)).GetReal(), i);
  }
}

// Indexes out of range never touch memory outside the record.
TEST(ValueRecordTest, OutOfRangeIndex) {
  ValueRecord r;
  EXPECT_TRUE(r.Get(size_t{0}).IsNull());
  EXPECT_EQ(r.GetName(0), "");
  r["a"] = 1;
  EXPECT_TRUE(r.Get(5).IsNull());
  EXPECT_EQ(r.GetName(5), "");
  r[5] = "lost";  // written to the scratch value
  EXPECT_TRUE(r[5].IsNull());
  EXPECT_EQ(r.Size(), 1u);
  const ValueRecord& cr = r;
  EXPECT_TRUE(cr[9].IsNull());

  ValueRecord huge(static_cast<size_t>(-1));  // a capacity that cannot be had is a hint
  EXPECT_EQ(huge.Size(), 0u);
  huge["x"] = 1;
  EXPECT_EQ(huge.IndexOf("x"), 0);
}

// Copies share names until one adds a field; values are never shared.
TEST(ValueRecordTest, CopiesAreIndependent) {
  ValueRecord original;
  original["x"] = 1;
  original["y"] = "text";
  ValueRecord copy(original);
  copy["x"] = 5;
  copy["z"] = 3;
  original["w"] = 4;
  EXPECT_EQ(original.Names(), (Names{"x", "y", "w"}));
  EXPECT_EQ(copy.Names(), (Names{"x", "y", "z"}));
  EXPECT_EQ(original.Get("x").GetReal(), 1.0);
  EXPECT_EQ(copy.IndexOf("w"), -1);
  EXPECT_EQ(original.IndexOf("z"), -1);

  ValueRecord assigned;
  assigned["q"] = 0;
  assigned = copy;
  EXPECT_EQ(assigned.Names(), copy.Names());
  assigned = original;  // a different layout replaces the names too
  EXPECT_EQ(assigned.Get("w").GetReal(), 4.0);
  ValueRecord& same = assigned;
  assigned = same;  // self-assignment keeps the record
  EXPECT_EQ(assigned.Size(), 3u);

  ValueRecord moved(std::move(assigned));
  EXPECT_EQ(moved.Size(), 3u);
  EXPECT_EQ(assigned.Size(), 0u);  // NOLINT(bugprone-use-after-move): empty and usable
  EXPECT_EQ(assigned.IndexOf("x"), -1);
  assigned["again"] = 1;
  EXPECT_EQ(assigned.Names(), Names{"again"});
  moved = std::move(assigned);
  EXPECT_EQ(moved.Names(), Names{"again"});
}

// ClearValues keeps names and storage; values become null.
TEST(ValueRecordTest, ClearValuesKeepsLayout) {
  ValueRecord r;
  for (int i = 0; i < 50; ++i) r["f" + std::to_string(i)] = std::string(40, 'v');
  const Value* storage = &r[0];
  r.ClearValues();
  EXPECT_EQ(&r[0], storage);
  EXPECT_EQ(r.Size(), 50u);
  EXPECT_TRUE(r.Names(false).empty());
  EXPECT_EQ(r.IndexOf("f49"), 49);
  r["f3"] = 3;
  EXPECT_EQ(&r[0], storage);
  EXPECT_EQ(r.Names(false), Names{"f3"});
}

// Adding a field whose value is one of the record's own values, while the record grows.
TEST(ValueRecordTest, AddOwnValueWhileGrowing) {
  ValueRecord r;
  r["a"] = std::string(64, 'a');
  for (int i = 0; i < 40; ++i) r.Add("copy" + std::to_string(i), r[0]);
  EXPECT_EQ(r.Get("copy39").GetString(), std::string(64, 'a'));
  r.Add("a", r[1]);  // replace with another field's value
  EXPECT_EQ(r.Get("a").GetString(), std::string(64, 'a'));
}

// Reading, copying and writing reals, lookups by name and clearing a record: no heap.
TEST(ValueRecordTest, HotPathsDoNotAllocate) {
  ValueRecord r(8);
  r["a"] = 1.5;
  r["b"] = "short";
  r["c"] = 2;
  const std::string name = "c";
  long before = gAllocations;
  double sum = 0;
  for (int i = 0; i < 100; ++i) {
    Value v(0.5 * i);
    Value copy(v);
    Value moved(std::move(copy));
    moved = v;
    moved = 3.0;
    if (v && !v.IsMissing() && v.GetType() == Value::REAL_TYPE) sum += v.GetReal();
    sum += (v < moved) + (v == Value(1.0));
    sum += r[r.IndexOf(name)].GetReal() + r.Contains("a");
    r.ClearValues();
    r[0] = v;
    r[size_t{2}] = 1.0;
  }
  EXPECT_EQ(gAllocations, before);
  EXPECT_GT(sum, 0);
  r.Add("long", Value(std::string(64, 'x')));  // the counter does see the library's heap
  EXPECT_GT(gAllocations, before);
}

}  // namespace

// Transform on a record layout it has bound allocates nothing for numeric fields: this
// program counts every allocation made through operator new.
#include "XercesTestEnvironment.h"
#include "QZTransformation.h"

#include <atomic>
#include <cstdlib>
#include <new>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "Value.h"
#include "ValueRecord.h"

namespace {
std::atomic<long> allocations{0};
}  // namespace

void* operator new(std::size_t size) {
  allocations.fetch_add(1, std::memory_order_relaxed);
  if (void* p = std::malloc(size == 0 ? 1 : size)) return p;
  throw std::bad_alloc();
}
void operator delete(void* p) noexcept { std::free(p); }
void operator delete(void* p, std::size_t) noexcept { std::free(p); }

namespace {

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;

const char* const kDocument = R"(<PMML version="4.4"><TransformationDictionary>
 <DefineFunction name="scaled" optype="continuous" dataType="double">
  <ParameterField name="v"/><ParameterField name="k"/>
  <Apply function="*"><FieldRef field="v"/><FieldRef field="k"/></Apply>
 </DefineFunction>
 <DerivedField name="norm" optype="continuous" dataType="double">
  <NormContinuous field="x" mapMissingTo="0"><LinearNorm orig="0" norm="0"/>
   <LinearNorm orig="10" norm="1"/></NormContinuous>
 </DerivedField>
 <DerivedField name="bin" optype="continuous" dataType="integer">
  <Discretize field="x" defaultValue="0"><DiscretizeBin binValue="1">
   <Interval closure="closedOpen" leftMargin="0" rightMargin="5"/></DiscretizeBin>
   <DiscretizeBin binValue="2"><Interval closure="closedOpen" leftMargin="5"/></DiscretizeBin>
  </Discretize>
 </DerivedField>
 <DerivedField name="mapped" optype="continuous" dataType="double">
  <MapValues outputColumn="o" defaultValue="-1"><FieldColumnPair field="c" column="i"/>
   <InlineTable><row><i>red</i><o>1</o></row><row><i>a-rather-long-category-name</i><o>2</o>
   </row></InlineTable></MapValues>
 </DerivedField>
 <DerivedField name="indicator" optype="continuous" dataType="double">
  <NormDiscrete field="c" value="a-rather-long-category-name"/>
 </DerivedField>
 <DerivedField name="nested" optype="continuous" dataType="double">
  <Apply function="if">
   <Apply function="and"><Apply function="greaterThan"><FieldRef field="x"/><Constant>2</Constant>
    </Apply><Apply function="isNotMissing"><FieldRef field="y"/></Apply></Apply>
   <Apply function="scaled"><Apply function="sum"><FieldRef field="norm"/><FieldRef field="bin"/>
    <FieldRef field="y"/></Apply><Constant>2</Constant></Apply>
   <Apply function="median"><FieldRef field="x"/><FieldRef field="y"/><Constant>3</Constant></Apply>
  </Apply>
 </DerivedField>
 <DerivedField name="compared" optype="continuous" dataType="boolean">
  <Apply function="equal">
   <FieldRef field="c"/><Constant>a-rather-long-category-name</Constant>
  </Apply>
 </DerivedField>
</TransformationDictionary></PMML>)";

// Once the layout is bound, records of it are computed without a single allocation,
// whatever their values (category texts included, as long as no text is produced).
TEST(TransformAllocation, NoAllocationOnABoundLayout) {
  QZTransformation t;
  std::istringstream in(kDocument);
  ASSERT_TRUE(t.AddPMML(in, false).IsOK()) << t.GetLastError();
  ValueRecord record;
  record.Add("x", Value(1.0));
  record.Add("y", Value(2.0));
  record.Add("c", Value("a-rather-long-category-name"));
  ASSERT_TRUE(t.Transform(record).IsOK()) << t.GetLastError();  // binds
  EXPECT_EQ(record.Get("nested"), Value(2.0));

  const long before = allocations.load();
  int ok = 0;
  int computed = 0;
  for (int i = 0; i < 100; ++i) {
    record[size_t{0}] = i % 7 == 0 ? Value() : Value(i * 0.5);
    record[size_t{1}] = i % 5 == 0 ? Value() : Value(i * 0.25);
    ok += t.Transform(record).IsOK() ? 1 : 0;
    computed += record[size_t{7}].IsMissing() ? 0 : 1;  // nested
  }
  EXPECT_EQ(allocations.load() - before, 0);
  EXPECT_EQ(ok, 100);
  EXPECT_GT(computed, 80);
  // x = 6, y = 2.5: 2 * (0.6 + 2 + 2.5).
  record[size_t{0}] = 6.0;
  record[size_t{1}] = 2.5;
  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_DOUBLE_EQ(record.Get("nested").GetReal(), 10.2);
  EXPECT_EQ(record.Get("compared"), Value(1.0));
  EXPECT_EQ(record.Get("mapped"), Value(2.0));
}

}  // namespace

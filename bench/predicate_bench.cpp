// Predicate evaluation on a record of fifty fields: the inner loop of tree scoring.
// Each benchmark also reports heap allocations per evaluation ("allocs").
#include <atomic>
#include <cstdlib>
#include <memory>
#include <new>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>

#include "QZVarList.h"
#include "ScoringCompoundPredicate.h"
#include "ScoringDiscreteSplit.h"
#include "ScoringRange.h"
#include "ScoringScaleSplit.h"
#include "ScoringSetPredicate.h"
#include "ScoringSimplePredicate.h"
#include "Value.h"
#include "ValueRecord.h"

using namespace QZScoring_800;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace {
std::atomic<long> gAllocations{0};
}  // namespace

// Counts every heap allocation of the process. The replaced operators pair malloc with
// free, which GCC cannot see once it inlines them into their callers.
#if defined(__GNUC__) && !defined(__clang__)
#pragma GCC diagnostic ignored "-Wmismatched-new-delete"
#endif
void* operator new(std::size_t size) {
  gAllocations.fetch_add(1, std::memory_order_relaxed);
  if (void* p = std::malloc(size == 0 ? 1 : size)) return p;
  throw std::bad_alloc();
}
void operator delete(void* p) noexcept { std::free(p); }
void operator delete(void* p, std::size_t) noexcept { std::free(p); }

namespace {

constexpr int kFields = 50;
constexpr int kCategories = 20;

std::string FieldName(int i) { return "input_field_" + std::to_string(i); }
std::string Category(int i) { return "category_" + std::to_string(i); }

// Fifty fields: every fifth a category text (category_<i mod 20>), the rest reals i*1.5;
// the variable list declares them the same way (texts nominal with twenty categories).
struct Setup {
  Setup() : record(kFields) {
    std::vector<std::string> categories;
    for (int c = 0; c < kCategories; ++c) categories.push_back(Category(c));
    for (int i = 0; i < kFields; ++i) {
      if (i % 5 == 0) {
        vars.AddCatVar(FieldName(i), "", categories, QZXML_800::ROLE_INPUT);
        record.Add(FieldName(i), Value(Category(i % kCategories)));
      } else {
        vars.AddContVar(FieldName(i), "", QZXML_800::ROLE_INPUT);
        record.Add(FieldName(i), Value(i * 1.5));
      }
    }
  }
  // field < bound
  ScoringSimplePredicate* LessThan(int field, double bound) const {
    auto* split = new ScoringScaleSplit(vars.GetVariable(FieldName(field)));
    split->PutSplit(new ScoringRange(nullptr, new Value(bound), false, false), 0);
    return new ScoringSimplePredicate(split);
  }
  QZXML_800::QZVarList vars;
  ValueRecord record;
};

void Run(benchmark::State& state, const ScoringPredicate& predicate, const ValueRecord& record,
         ScoringPredicate::PredicateResult expected) {
  if (predicate.Evaluate(record) != expected) {
    state.SkipWithError("unexpected result");
    return;
  }
  const long before = gAllocations.load();
  for (auto _ : state) {
    benchmark::DoNotOptimize(predicate.Evaluate(record));
  }
  state.counters["allocs"] = benchmark::Counter(
      static_cast<double>(gAllocations.load() - before), benchmark::Counter::kAvgIterations);
}

// lessThan on a continuous field.
void BM_SimpleContinuous(benchmark::State& state) {
  Setup setup;
  std::unique_ptr<ScoringPredicate> predicate(setup.LessThan(37, 60.0));
  Run(state, *predicate, setup.record, ScoringPredicate::PREDICATE_TRUE);
}
BENCHMARK(BM_SimpleContinuous);

// equal on a nominal text field (field 25 holds category_5).
void BM_SimpleString(benchmark::State& state) {
  Setup setup;
  auto* split = new ScoringDiscreteSplit(setup.vars.GetVariable(FieldName(25)));
  split->PutSplit(new Value(Category(5)), 0);
  ScoringSimplePredicate predicate(split);
  Run(state, predicate, setup.record, ScoringPredicate::PREDICATE_TRUE);
}
BENCHMARK(BM_SimpleString);

// isIn over twenty categories; the value is the last one listed (a full scan).
void BM_SetOfTwenty(benchmark::State& state) {
  Setup setup;
  auto* split = new ScoringDiscreteSplit(setup.vars.GetVariable(FieldName(45)));
  for (int c = 0; c < kCategories; ++c) split->PutSplit(new Value(Category((c + 6) % 20)), 0);
  ScoringSetPredicate predicate(split);
  Run(state, predicate, setup.record, ScoringPredicate::PREDICATE_TRUE);
}
BENCHMARK(BM_SetOfTwenty);

// "and" over five continuous comparisons that all hold (every child evaluated).
void BM_CompoundOfFive(benchmark::State& state) {
  Setup setup;
  ScoringCompoundPredicate predicate(ScoringPredicate::BOOL_AND);
  for (int field : {3, 14, 22, 38, 49}) predicate.AddPredicate(setup.LessThan(field, 1000.0));
  Run(state, predicate, setup.record, ScoringPredicate::PREDICATE_TRUE);
}
BENCHMARK(BM_CompoundOfFive);

// For comparison: the copying accessor the predicates no longer use per record.
void BM_GetScoreValueCopy(benchmark::State& state) {
  Setup setup;
  std::unique_ptr<ScoringSimplePredicate> predicate(setup.LessThan(37, 60.0));
  const QZXML_800::IQZVariable* variable = predicate->GetSplit()->GetSplitVar();
  for (auto _ : state) {
    benchmark::DoNotOptimize(predicate->GetScoreValue(variable, setup.record));
  }
}
BENCHMARK(BM_GetScoreValueCopy);

}  // namespace

BENCHMARK_MAIN();

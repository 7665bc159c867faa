// Costs of the Value and ValueRecord operations that scoring repeats per record.
#include <string>
#include <vector>

#include <benchmark/benchmark.h>

#include "Value.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace {

constexpr int kFields = 50;

std::vector<std::string> FieldNames() {
  std::vector<std::string> names;
  for (int i = 0; i < kFields; ++i) names.push_back("input_field_" + std::to_string(i));
  return names;
}

// A record like a scoring row: mostly reals, every fifth field a category text.
ValueRecord MakeRecord(const std::vector<std::string>& names) {
  ValueRecord record(names.size());
  for (size_t i = 0; i < names.size(); ++i) {
    if (i % 5 == 0) {
      record.Add(names[i], Value("category_" + std::to_string(i)));
    } else {
      record.Add(names[i], Value(i * 1.5));
    }
  }
  return record;
}

void BM_ValueGetReal(benchmark::State& state) {
  Value v(2.5);
  for (auto _ : state) {
    benchmark::DoNotOptimize(v);
    double sum = v.IsMissing() ? 0.0 : v.GetReal();
    if (v && v.GetType() == Value::REAL_TYPE) sum += 1.0;
    benchmark::DoNotOptimize(sum);
  }
}
BENCHMARK(BM_ValueGetReal);

void BM_ValueCopyReal(benchmark::State& state) {
  Value v(2.5);
  for (auto _ : state) {
    benchmark::DoNotOptimize(v);
    Value copy(v);
    benchmark::DoNotOptimize(copy);
  }
}
BENCHMARK(BM_ValueCopyReal);

void BM_ValueStringGetReal(benchmark::State& state) {
  Value v(" 1234.5625 ");
  for (auto _ : state) {
    benchmark::DoNotOptimize(v);
    benchmark::DoNotOptimize(v.GetReal());
  }
}
BENCHMARK(BM_ValueStringGetReal);

void BM_ValueRealGetString(benchmark::State& state) {
  Value v(1234.5625);
  for (auto _ : state) {
    benchmark::DoNotOptimize(v);
    benchmark::DoNotOptimize(v.GetString());
  }
}
BENCHMARK(BM_ValueRealGetString);

void BM_RecordCopy(benchmark::State& state) {
  const std::vector<std::string> names = FieldNames();
  const ValueRecord record = MakeRecord(names);
  for (auto _ : state) {
    ValueRecord copy(record);
    benchmark::DoNotOptimize(copy);
  }
}
BENCHMARK(BM_RecordCopy);

void BM_RecordLookupByName(benchmark::State& state) {
  const std::vector<std::string> names = FieldNames();
  const ValueRecord record = MakeRecord(names);
  size_t i = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(record.IndexOf(names[i]));
    i = i + 1 == names.size() ? 0 : i + 1;
  }
}
BENCHMARK(BM_RecordLookupByName);

void BM_RecordClearAndRefill(benchmark::State& state) {
  const std::vector<std::string> names = FieldNames();
  ValueRecord record = MakeRecord(names);
  const ValueRecord source = MakeRecord(names);
  for (auto _ : state) {
    record.ClearValues();
    for (size_t i = 0; i < names.size(); ++i) record[i] = source[i];
    benchmark::DoNotOptimize(record);
  }
}
BENCHMARK(BM_RecordClearAndRefill);

void BM_RecordClearAndRefillByName(benchmark::State& state) {
  const std::vector<std::string> names = FieldNames();
  ValueRecord record = MakeRecord(names);
  const ValueRecord source = MakeRecord(names);
  for (auto _ : state) {
    record.ClearValues();
    for (size_t i = 0; i < names.size(); ++i) record[names[i]] = source[i];
    benchmark::DoNotOptimize(record);
  }
}
BENCHMARK(BM_RecordClearAndRefillByName);

}  // namespace

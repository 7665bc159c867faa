// The split model's own cost per record: 100 sub-models keyed by a number and a text,
// scored through the split model against the same records scored directly by the
// matching solo models. The difference is the key building and the lookup; it is
// printed per number of records at the end and must not grow with that number.
//   bin/split_bench --benchmark_repetitions=9 --benchmark_report_aggregates_only=true
//                   --benchmark_enable_random_interleaving=true

#include <cstdio>
#include <map>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>

#include "IQZScore.h"
#include "ScoringSoloModel.h"
#include "ScoringSplitModel.h"
#include "ValueRecord.h"

using QZCommon_800::IQZScore;
using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringModel;
using QZScoring_800::ScoringSoloModel;
using QZScoring_800::ScoringSplitModel;

namespace {

constexpr int kNumbers = 10;
constexpr int kRegions = 10;  // 100 sub-models
constexpr int kFillers = 8;   // further input fields around the split fields

// A light scorer, so that the split model's share of the time stands out.
class BenchScorer : public IQZScore {
 public:
  explicit BenchScorer(double id) : id_(id) {}
  bool IsReady() const override { return true; }
  QZStatus Scorable(ValueRecord& record) override {
    record.Add("prediction", Value());
    record.Add("probability", Value());
    return QZStatus();
  }
  QZStatus Score(const ValueRecord& input, ValueRecord& output) override {
    output["prediction"] = id_;
    output["probability"] = input.Get("x");
    return QZStatus();
  }
  std::string GetType() const override { return "BENCH"; }

 private:
  double id_;
};

std::string Region(int r) { return "region_" + std::to_string(r); }

// The split model, the records (copies of one layout, as a host reading rows produces)
// and, for each record, the solo model its key selects.
struct Setup {
  explicit Setup(size_t count) {
    for (int n = 0; n < kNumbers; ++n) {
      for (int r = 0; r < kRegions; ++r) {
        auto solo = std::make_unique<ScoringSoloModel>(QZXML_800::QZSettings(),
                                                       QZXML_800::QZVarList());
        solo->SetScorer(new BenchScorer(n * kRegions + r));
        if (split.AddModel({Value(n), Value(Region(r))}, solo.get())) solo.release();
      }
    }
    split.SetSplitFields({"k", "region"});
    split.Scorable(output);

    ValueRecord layout;
    for (int f = 0; f < kFillers / 2; ++f) layout.Add("a" + std::to_string(f), Value(f));
    layout.Add("k", Value());
    layout.Add("region", Value());
    layout.Add("x", Value());
    for (int f = 0; f < kFillers / 2; ++f) layout.Add("b" + std::to_string(f), Value(f));
    const size_t k = static_cast<size_t>(layout.IndexOf("k"));
    const size_t region = static_cast<size_t>(layout.IndexOf("region"));
    const size_t x = static_cast<size_t>(layout.IndexOf("x"));

    std::mt19937 random(42);
    records.reserve(count);
    direct.reserve(count);
    for (size_t i = 0; i < count; ++i) {
      const int n = static_cast<int>(random() % kNumbers);
      const int r = static_cast<int>(random() % kRegions);
      records.push_back(layout);
      records.back()[k] = n;
      records.back()[region] = Region(r);
      records.back()[x] = static_cast<double>(i);
      direct.push_back(split.GetModel().at({Value(n), Value(Region(r))}));
    }
  }

  ScoringSplitModel split;
  std::vector<ValueRecord> records;
  std::vector<ScoringModel*> direct;  // owned by the split model
  ValueRecord output;
};

void BM_SplitModel(benchmark::State& state) {
  Setup setup(static_cast<size_t>(state.range(0)));
  size_t i = 0;
  for (auto _ : state) {
    if (setup.split.Score(setup.records[i], setup.output).IsError()) {
      state.SkipWithError("split model failed");
      break;
    }
    if (++i == setup.records.size()) i = 0;
  }
  state.SetItemsProcessed(state.iterations());
}

// The same records, each scored by the solo model of its key; the output is cleared
// as the split model clears it.
void BM_SoloModels(benchmark::State& state) {
  Setup setup(static_cast<size_t>(state.range(0)));
  size_t i = 0;
  for (auto _ : state) {
    setup.output.ClearValues();
    if (setup.direct[i]->Score(setup.records[i], setup.output).IsError()) {
      state.SkipWithError("solo model failed");
      break;
    }
    if (++i == setup.records.size()) i = 0;
  }
  state.SetItemsProcessed(state.iterations());
}

void RecordCounts(benchmark::internal::Benchmark* benchmark) {
  for (int count : {1 << 8, 1 << 12, 1 << 16, 1 << 18}) benchmark->Arg(count);
}
BENCHMARK(BM_SplitModel)->Apply(RecordCounts);
BENCHMARK(BM_SoloModels)->Apply(RecordCounts);

// The console output, plus the split model's own time per record (split minus solo)
// for each number of records, from the medians when repetitions are asked for.
class OwnCostReporter : public benchmark::ConsoleReporter {
 public:
  void ReportRuns(const std::vector<Run>& runs) override {
    ConsoleReporter::ReportRuns(runs);
    for (const Run& run : runs) {
      auto& times = run.run_type == Run::RT_Aggregate ? median_ : single_;
      if (run.run_type == Run::RT_Aggregate && run.aggregate_name != "median") continue;
      times[run.run_name.args][run.run_name.function_name] = run.GetAdjustedRealTime();
    }
  }
  void Finalize() override {
    ConsoleReporter::Finalize();
    const auto& times = median_.empty() ? single_ : median_;
    for (const auto& [records, byName] : times) {
      const auto split = byName.find("BM_SplitModel");
      const auto solo = byName.find("BM_SoloModels");
      if (split == byName.end() || solo == byName.end()) continue;
      std::printf("%8s records: split model's own cost %.1f ns per record\n", records.c_str(),
                  split->second - solo->second);
    }
  }

 private:
  using Times = std::map<std::string, std::map<std::string, double>>;
  Times median_;
  Times single_;
};

}  // namespace

int main(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  OwnCostReporter reporter;
  benchmark::RunSpecifiedBenchmarks(&reporter);
  benchmark::Shutdown();
  return 0;
}

// qzscore score: the input is read in batches by the calling thread, scored by one
// model per scoring thread, and written in input order by a writer thread. A fixed pool
// of batches bounds memory whatever the input's size: the reader waits for the writer
// to hand a batch back before it reads more.

#include <algorithm>
#include <atomic>
#include <condition_variable>
#include <cstdio>
#include <deque>
#include <functional>
#include <map>
#include <mutex>
#include <thread>

#include "Commands.h"
#include "Csv.h"
#include "Output.h"
#include "Progress.h"
#include "StatusText.h"

using QZCommon_800::ValueRecord;

namespace qzscore {

namespace {

constexpr size_t kBatchRecords = 256;
constexpr size_t kBatchBytes = size_t{1} << 20;
constexpr size_t kMessageLimit = 20;
// A cell or output text this large is given back after its batch, so that a few huge
// records do not keep their memory for the rest of the run.
constexpr size_t kKeepCapacity = size_t{1} << 16;

struct Tally {
  uint64_t records = 0;
  uint64_t scored = 0;
  uint64_t failed = 0;
  uint64_t wrongWidth = 0;
  uint64_t notNumbers = 0;
  std::map<long, uint64_t> codes;

  void Add(const Tally& other) {
    records += other.records;
    scored += other.scored;
    failed += other.failed;
    wrongWidth += other.wrongWidth;
    notNumbers += other.notNumbers;
    for (const auto& [code, count] : other.codes) codes[code] += count;
  }
};

struct Batch {
  uint64_t sequence = 0;
  uint64_t firstRow = 0;  // data row number of the first record, from 1
  size_t count = 0;
  std::vector<std::vector<std::string>> rows;
  std::vector<uint64_t> lines;
  std::string text;
  std::vector<std::string> messages;
  bool moreMessages = false;  // messages beyond the limit were left out
  Tally tally;
  bool stopped = false;  // --fail-fast: the batch ends at its first failed record

  void Reset() {
    for (auto& row : rows) {
      for (auto& cell : row) {
        if (cell.capacity() > kKeepCapacity) std::string().swap(cell);
      }
    }
    if (text.capacity() > 16 * kBatchBytes) std::string().swap(text);
    count = 0;
    text.clear();
    messages.clear();
    moreMessages = false;
    tally = Tally();
    stopped = false;
  }
};

// What every scoring thread reads; immutable while the threads run.
struct Context {
  std::string inputName;
  std::vector<std::string> header;
  std::vector<size_t> kept;  // header indices written before the outputs
  const InputLayout* inputs = nullptr;
  const OutputLayout* outputs = nullptr;
  std::vector<std::string> derivedFields;  // a transformations-only document's outputs
  bool transformationsOnly = false;
  char separator = ',';
  bool failFast = false;
};

// One scoring thread's model and records.
class RowScorer {
 public:
  RowScorer(const Context& context, std::unique_ptr<ModelInstance> instance)
      : context_(context), instance_(std::move(instance)) {
    context_.inputs->Prepare(input_);
    instance_->Model().Scorable(output_);
  }

  void Process(Batch& batch) {
    for (size_t i = 0; i < batch.count; ++i) {
      const bool failed = !ScoreRow(batch, i);
      if (failed && context_.failFast) {
        batch.count = i + 1;
        batch.stopped = true;
        break;
      }
    }
  }

 private:
  void Message(Batch& batch, size_t i, const std::string& what) {
    if (batch.messages.size() >= kMessageLimit) {
      batch.moreMessages = true;
      return;
    }
    batch.messages.push_back(context_.inputName + ", row " + std::to_string(batch.firstRow + i) +
                             " (line " + std::to_string(batch.lines[i]) + "): " + what);
  }

  // Scores record i of the batch and appends its output row; false when it failed.
  bool ScoreRow(Batch& batch, size_t i) {
    const std::vector<std::string>& cells = batch.rows[i];
    Tally& tally = batch.tally;
    ++tally.records;
    bool ok = cells.size() == context_.header.size();
    if (!ok) {
      ++tally.wrongWidth;
      Message(batch, i,
              std::to_string(cells.size()) + " cells where the header has " +
                  std::to_string(context_.header.size()) + "; not scored");
    } else {
      notNumbers_.clear();
      context_.inputs->Fill(cells, input_, notNumbers_);
      for (const size_t cell : notNumbers_) {
        ++tally.notNumbers;
        Message(batch, i,
                "column '" + context_.header[cell] + "': '" + cells[cell] +
                    "' is not a number; read as missing");
      }
      output_.ClearValues();
      long code = instance_->Model().Score(input_, output_).GetErrorCode();
      if (context_.transformationsOnly && code == 260016) {
        code = 0;  // such a document has no scorer: its derived fields are the result
        for (const std::string& name : context_.derivedFields) {
          output_["transformations"][name] = input_.Get(name);
        }
      }
      ok = code == 0;
      if (!ok) {
        ++tally.codes[code];
        Message(batch, i, "scoring failed: " + DescribeStatus(code));
      }
    }
    ++(ok ? tally.scored : tally.failed);

    std::string& out = batch.text;
    bool first = true;
    for (const size_t k : context_.kept) {
      if (!first) out.push_back(context_.separator);
      first = false;
      if (k < cells.size()) AppendCsvField(out, cells[k], context_.separator);
    }
    for (size_t c = 0; c < context_.outputs->Size(); ++c) {
      if (!first) out.push_back(context_.separator);
      first = false;
      if (ok) AppendCsvField(out, context_.outputs->Text(output_, c), context_.separator);
    }
    out.push_back('\n');
    return ok;
  }

  const Context& context_;
  std::unique_ptr<ModelInstance> instance_;
  ValueRecord input_;
  ValueRecord output_;
  std::vector<size_t> notNumbers_;
};

// The queues between the reader, the scoring threads and the writer, under one lock.
class Pipeline {
 public:
  explicit Pipeline(size_t batches) {
    for (size_t i = 0; i < batches; ++i) free_.push_back(std::make_unique<Batch>());
  }

  // A batch to fill; null once the run is stopping.
  std::unique_ptr<Batch> TakeFree() {
    std::unique_lock<std::mutex> lock(mutex_);
    changed_.wait(lock, [&] { return stop_ || !free_.empty(); });
    if (stop_) return nullptr;
    std::unique_ptr<Batch> batch = std::move(free_.back());
    free_.pop_back();
    return batch;
  }
  void GiveBack(std::unique_ptr<Batch> batch) {
    batch->Reset();
    std::lock_guard<std::mutex> lock(mutex_);
    free_.push_back(std::move(batch));
    changed_.notify_all();
  }
  void PushWork(std::unique_ptr<Batch> batch) {
    std::lock_guard<std::mutex> lock(mutex_);
    work_.push_back(std::move(batch));
    changed_.notify_all();
  }
  void EndOfInput(uint64_t batches) {
    std::lock_guard<std::mutex> lock(mutex_);
    readingDone_ = true;
    batchCount_ = batches;
    changed_.notify_all();
  }
  // The next batch to score; null when there is none left or the run is stopping.
  std::unique_ptr<Batch> TakeWork() {
    std::unique_lock<std::mutex> lock(mutex_);
    changed_.wait(lock, [&] { return stop_ || !work_.empty() || readingDone_; });
    if (stop_ || work_.empty()) return nullptr;
    std::unique_ptr<Batch> batch = std::move(work_.front());
    work_.pop_front();
    return batch;
  }
  void PushDone(std::unique_ptr<Batch> batch) {
    std::lock_guard<std::mutex> lock(mutex_);
    const uint64_t sequence = batch->sequence;
    done_[sequence] = std::move(batch);
    changed_.notify_all();
  }
  // The scored batch with that sequence number; null at the end or when stopping.
  std::unique_ptr<Batch> TakeDone(uint64_t sequence) {
    std::unique_lock<std::mutex> lock(mutex_);
    changed_.wait(lock, [&] {
      return stop_ || done_.count(sequence) != 0 || (readingDone_ && sequence >= batchCount_);
    });
    const auto found = done_.find(sequence);
    if (stop_ || found == done_.end()) return nullptr;
    std::unique_ptr<Batch> batch = std::move(found->second);
    done_.erase(found);
    return batch;
  }
  void Stop(const std::string& fatal = std::string()) {
    std::lock_guard<std::mutex> lock(mutex_);
    stop_ = true;
    if (fatal_.empty()) fatal_ = fatal;
    changed_.notify_all();
  }
  std::string Fatal() {
    std::lock_guard<std::mutex> lock(mutex_);
    return fatal_;
  }

 private:
  std::mutex mutex_;
  std::condition_variable changed_;
  std::vector<std::unique_ptr<Batch>> free_;
  std::deque<std::unique_ptr<Batch>> work_;
  std::map<uint64_t, std::unique_ptr<Batch>> done_;
  bool readingDone_ = false;
  uint64_t batchCount_ = 0;
  bool stop_ = false;
  std::string fatal_;
};

// Threads joined when the group is destroyed. A group left by an exception (a thread
// that could not be started) is told to stop first, so that no thread keeps waiting.
class ThreadGroup {
 public:
  explicit ThreadGroup(std::function<void()> stop = nullptr) : stop_(std::move(stop)) {}
  ~ThreadGroup() {
    if (stop_ &&
        std::any_of(threads_.begin(), threads_.end(), [](auto& t) { return t.joinable(); })) {
      stop_();
    }
    JoinAll();
  }
  ThreadGroup(const ThreadGroup&) = delete;
  ThreadGroup& operator=(const ThreadGroup&) = delete;

  template <class Body>
  void Start(Body body) {
    threads_.emplace_back(std::move(body));
  }
  void JoinAll() {
    for (std::thread& thread : threads_) {
      if (thread.joinable()) thread.join();
    }
  }

 private:
  std::function<void()> stop_;
  std::vector<std::thread> threads_;
};

// Reads records into batches until the input ends, fails, or the run stops. Returns
// the error text of a malformed input, empty otherwise.
std::string ReadBatches(CsvReader& reader, const Context& context, Pipeline& pipeline,
                        std::atomic<uint64_t>& bytesRead) {
  uint64_t row = 0;
  uint64_t sequence = 0;
  std::string error;
  bool ended = false;
  while (!ended) {
    std::unique_ptr<Batch> batch = pipeline.TakeFree();
    if (batch == nullptr) break;
    batch->sequence = sequence;
    batch->firstRow = row + 1;
    size_t bytes = 0;
    while (batch->count < kBatchRecords && bytes < kBatchBytes) {
      if (batch->count == batch->rows.size()) {
        batch->rows.emplace_back();
        batch->lines.push_back(0);
      }
      std::vector<std::string>& cells = batch->rows[batch->count];
      const CsvReader::Result result = reader.Next(cells);
      if (result != CsvReader::Result::kRecord) {
        if (result == CsvReader::Result::kError) {
          error = context.inputName + ", row " + std::to_string(row + 1) + " (line " +
                  std::to_string(reader.GetLine()) + "): " + reader.GetError();
        }
        ended = true;
        break;
      }
      // An empty line is no record, unless the table has a single column.
      if (reader.WasBlankLine() && context.header.size() > 1) continue;
      batch->lines[batch->count] = reader.GetLine();
      for (const std::string& cell : cells) bytes += cell.size() + 1;
      ++batch->count;
      ++row;
    }
    bytesRead = reader.GetBytesRead();
    if (batch->count == 0) {
      pipeline.GiveBack(std::move(batch));
      break;
    }
    pipeline.PushWork(std::move(batch));
    ++sequence;
  }
  pipeline.EndOfInput(sequence);
  return error;
}

std::string Summary(const std::string& input, const Tally& tally, double seconds) {
  std::string text = DisplayName(input) + ": " + std::to_string(tally.records) + " records read, " +
                     std::to_string(tally.scored) + " scored, " + std::to_string(tally.failed) +
                     " failed";
  std::string reasons;
  for (const auto& [code, count] : tally.codes) {
    reasons +=
        (reasons.empty() ? "" : ", ") + std::to_string(count) + " x status " + std::to_string(code);
  }
  if (tally.wrongWidth > 0) {
    reasons += (reasons.empty() ? "" : ", ") + std::to_string(tally.wrongWidth) +
               " x wrong number of cells";
  }
  if (!reasons.empty()) text += " (" + reasons + ")";
  if (tally.notNumbers > 0) {
    text += ", " + std::to_string(tally.notNumbers) + " cells not a number (read as missing)";
  }
  char timing[80];
  std::snprintf(timing, sizeof timing, " in %.2f s (%.0f records/s)", seconds,
                seconds > 0 ? tally.records / seconds : 0.0);
  return text + timing;
}

// Header indices for --keep-input; false with a message for an unknown column.
bool KeptColumns(const std::string& choice, const std::vector<std::string>& header,
                 std::vector<size_t>& kept, std::string& error) {
  kept.clear();
  if (choice == "none") return true;
  if (choice == "all") {
    for (size_t i = 0; i < header.size(); ++i) kept.push_back(i);
    return true;
  }
  std::vector<std::string> names;
  if (!SplitCsvText(choice, names)) {
    error = "--keep-input " + choice + ": expected all, none, or a comma-separated column list";
    return false;
  }
  for (const std::string& name : names) {
    const auto at = std::find(header.begin(), header.end(), name);
    if (at == header.end()) {
      error = "--keep-input: the input has no column '" + name + "'";
      return false;
    }
    kept.push_back(static_cast<size_t>(at - header.begin()));
  }
  return true;
}

}  // namespace

int RunScore(const ScoreOptions& options) {
  std::string error;
  Registry registry;
  ModelSource source;
  if (!MakeRegistry(options.models, registry, error) ||
      !source.Open(options.models.model, registry, error)) {
    Report(error);
    return kExitUsage;
  }
  uint64_t inputSize = 0;
  auto in = OpenInput(options.input, inputSize, error);
  if (in == nullptr) {
    Report(error);
    return kExitUsage;
  }
  Context context;
  context.inputName = DisplayName(options.input);
  context.separator = options.separator;
  context.failFast = options.failFast;
  CsvReader reader(*in, options.separator);
  switch (reader.Next(context.header)) {
    case CsvReader::Result::kRecord:
      break;
    case CsvReader::Result::kEnd:
      Report(context.inputName + ": the input is empty; expected a header row of column names");
      return kExitUsage;
    case CsvReader::Result::kError:
      Report(context.inputName + ", header (line 1): " + reader.GetError());
      return kExitUsage;
  }
  if (!KeptColumns(options.keepInput, context.header, context.kept, error)) {
    Report(error);
    return kExitUsage;
  }
  for (const std::string& field : options.models.model.splitFields) {
    if (std::find(context.header.begin(), context.header.end(), field) == context.header.end()) {
      Report(context.inputName + ": no column for the split field '" + field + "'");
      return kExitUsage;
    }
  }
  for (const std::string& field : source.InputFields()) {
    if (std::find(context.header.begin(), context.header.end(), field) == context.header.end()) {
      Report("warning: " + context.inputName + " has no column '" + field +
             "' (an input field of the model); it is missing in every record");
    }
  }

  // One model per thread, each made by its own factory, created side by side.
  const unsigned threads = std::max(1u, options.threads);
  std::vector<std::unique_ptr<ModelInstance>> instances(threads);
  std::vector<std::string> errors(threads);
  {
    ThreadGroup creators;
    for (unsigned t = 0; t < threads; ++t) {
      creators.Start([&, t] {
        try {
          instances[t] = source.Create(errors[t]);
        } catch (const std::exception& e) {
          errors[t] = std::string("cannot create the model: ") + e.what();
        }
      });
    }
  }
  for (unsigned t = 0; t < threads; ++t) {
    if (instances[t] == nullptr) {
      Report(errors[t]);
      return kExitUsage;
    }
  }
  ValueRecord laidOut;
  const long layoutCode = instances.front()->Model().Scorable(laidOut).GetErrorCode();
  if (layoutCode != 0) {
    Report(source.Describe() +
           ": the model cannot lay out its output: " + DescribeStatus(layoutCode));
    return kExitUsage;
  }
  const InputLayout inputs(context.header, source.Kinds(), options.missing);
  const OutputLayout outputs(laidOut);
  context.inputs = &inputs;
  context.outputs = &outputs;
  context.transformationsOnly = source.IsTransformationsOnly();
  if (context.transformationsOnly) {
    context.derivedFields = source.Documents().front().attr->GetDerivedFields();
  }

  auto out = OpenOutput(options.output, error);
  if (out == nullptr) {
    Report(error);
    return kExitUsage;
  }
  std::vector<std::string> names;
  for (const size_t k : context.kept) names.push_back(context.header[k]);
  names.insert(names.end(), outputs.Names().begin(), outputs.Names().end());
  std::string headerText;
  AppendCsvRecord(headerText, names, options.separator);
  out->write(headerText.data(), static_cast<std::streamsize>(headerText.size()));

  Pipeline pipeline(2 * threads + 2);
  Progress progress(!options.quiet, inputSize);
  std::atomic<uint64_t> bytesRead{0};
  Tally total;
  ThreadGroup group([&pipeline] { pipeline.Stop("stopped early"); });
  for (unsigned t = 0; t < threads; ++t) {
    group.Start([&, t] {
      try {
        RowScorer scorer(context, std::move(instances[t]));
        while (std::unique_ptr<Batch> batch = pipeline.TakeWork()) {
          scorer.Process(*batch);
          pipeline.PushDone(std::move(batch));
        }
      } catch (const std::exception& e) {
        pipeline.Stop(std::string("scoring stopped: ") + e.what());
      }
    });
  }
  group.Start([&] {
    size_t shown = 0;
    bool noted = false;
    try {
      for (uint64_t next = 0;; ++next) {
        std::unique_ptr<Batch> batch = pipeline.TakeDone(next);
        if (batch == nullptr) break;
        out->write(batch->text.data(), static_cast<std::streamsize>(batch->text.size()));
        if (!*out) {
          pipeline.Stop(DisplayName(options.output.empty() ? "-" : options.output) +
                        ": writing the output failed");
          break;
        }
        if (!batch->messages.empty()) progress.Finish();
        for (const std::string& message : batch->messages) {
          if (shown++ < kMessageLimit) Report(message);
        }
        if (shown > kMessageLimit || (batch->moreMessages && shown == kMessageLimit)) {
          if (!noted) Report("further row messages are not shown; the summary counts them");
          noted = true;
        }
        total.Add(batch->tally);
        progress.Update(total.records, bytesRead);
        const bool stopped = batch->stopped;
        pipeline.GiveBack(std::move(batch));
        if (stopped) {
          pipeline.Stop();
          break;
        }
      }
    } catch (const std::exception& e) {
      pipeline.Stop(std::string("writing stopped: ") + e.what());
    }
  });

  std::string readError;
  try {
    readError = ReadBatches(reader, context, pipeline, bytesRead);
  } catch (const std::exception& e) {
    pipeline.Stop(std::string("reading stopped: ") + e.what());
  }
  group.JoinAll();
  out->flush();
  progress.Finish();

  const std::string fatal = pipeline.Fatal();
  if (!fatal.empty() || !readError.empty() || !*out) {
    Report(!fatal.empty() ? fatal : !readError.empty() ? readError : "writing the output failed");
    if (!options.quiet) Report(Summary(options.input, total, progress.Elapsed()));
    return kExitUsage;
  }
  if (!options.quiet) Report(Summary(options.input, total, progress.Elapsed()));
  if (options.failFast && total.failed > 0)
    Report("stopped at the first failed record (--fail-fast)");
  return total.failed > 0 ? kExitRecordsFailed : kExitOk;
}

}  // namespace qzscore

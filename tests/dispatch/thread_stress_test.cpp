// Many threads at once, with the trace log switched on: scoring threads each create
// factories and models (one document, several side by side, a split model; from files
// and from streams) with the reference plug-ins, score thousands of records and destroy
// everything, while predicate threads read a data dictionary, build predicates with
// GetPredicate and evaluate them (also predicates shared by all of them, and copies of
// those made meanwhile). Every result is compared with a single-threaded run (itself
// checked against the corpus's expected predictions) or with the predicate's
// three-valued logic worked out here, and every thread's trace file must hold whole,
// balanced lines.
//
// The program holds this one test: the trace level is read once per process, at the
// first trace call, which must see this test's component.cfg.
//
// QZ_STRESS_ROUNDS (default 6) sets how often each thread goes through its work.

#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <map>
#include <memory>
#include <mutex>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "QZMV.h"
#include "QZSettings.h"
#include "QZVarList.h"
#include "CorpusText.h"
#include "ReferencePlugins.h"
#include "ScoringFactory.h"
#include "ScoringModel.h"
#include "ScoringPMMLParser.h"
#include "ScoringPredicate.h"
#include "ScoringScorerFactory.h"
#include "Value.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringFactory;
using QZScoring_800::ScoringModel;
using QZScoring_800::ScoringPredicate;
using QZScoring_800::ScoringScorerFactory;
using QZXML_800::QZSettings;
using QZXML_800::QZVecValue;
using Names = std::vector<std::string>;

namespace {

constexpr int kScoringThreads = 3;
constexpr int kPredicateThreads = 2;
// Each document's table is scored repeatedly until at least this many records.
constexpr size_t kRecordsPerDocument = 300;

long ThreadId() { return static_cast<long>(syscall(SYS_gettid)); }

std::string RepositoryDir() {
  std::string dir = QZ_TEST_DATA_DIR;  // <repository>/tests/data
  for (int i = 0; i < 2; ++i) dir = dir.substr(0, dir.find_last_of('/'));
  return dir;
}

std::string ReadFile(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  std::ostringstream text;
  text << in.rdbuf();
  return text.str();
}

// Every bit of a value: reals in hexadecimal, structured values entry by entry.
void Serialize(const Value& value, std::string& out) {
  if (value.IsStruct()) {
    out += '{';
    for (const std::string& name : value.GetEntryNames()) {
      out += name + ':';
      Serialize(*value.Find(name), out);
      out += ';';
    }
    out += '}';
  } else if (value.IsNumericValue()) {
    char buffer[64];
    std::snprintf(buffer, sizeof buffer, "%a", value.GetReal());
    out += buffer;
  } else if (value.IsNull()) {
    out += "<null>";
  } else {
    out += '"' + value.GetString() + '"';
  }
}

void Serialize(const ValueRecord& record, std::string& out) {
  for (size_t i = 0; i < record.Size(); ++i) {
    out += record.GetName(i) + '=';
    Serialize(record[i], out);
    out += ',';
  }
}

// One document (or several, side by side or split) and the table scored with it.
struct Job {
  enum Kind { kSolo, kMulti, kSplit } kind = kSolo;
  std::string name;
  Names files;  // the documents
  Names ids;    // sub-model IDs (multi) or split keys (split)
  std::string table;
  bool checkPrediction = false;  // the table's "prediction" column is the expected result

  // From the table, and from the single-threaded run.
  Names header;
  std::vector<Names> rows;
  Names outcomes;  // per row: status, input record after scoring, output record
  size_t repeat = 1;
};

// Creates the job's model with a new factory each time, from the files themselves or
// from streams of their text. The factory is destroyed before the model when asked, as
// a host that keeps only the model does.
std::unique_ptr<ScoringModel> CreateModel(const Job& job, bool fromFiles, long& status) {
  QZSettings settings = qztest::ReferenceRegistry();
  std::vector<std::unique_ptr<std::stringstream>> owned;
  std::vector<std::stringstream*> streams;
  for (const std::string& file : job.files) {
    owned.push_back(std::make_unique<std::stringstream>(ReadFile(file)));
    streams.push_back(owned.back().get());
  }
  ScoringFactory factory;
  ScoringModel* model = nullptr;
  switch (job.kind) {
    case Job::kSolo:
      if (fromFiles) {
        model = factory.CreateScoringModel(settings, job.files.front());
      } else {
        model = factory.CreateScoringModel(settings, *streams.front());
      }
      break;
    case Job::kMulti:
      settings.AddSetting("scoring_modelIDs", job.ids, true);
      if (fromFiles) {
        settings.AddSetting("scoring_pmmlFiles", job.files, true);
        model = factory.CreateScoringModel(settings);
      } else {
        model = factory.CreateScoringModel(settings, streams);
      }
      break;
    case Job::kSplit: {
      QZSettings split;
      split.AddSetting("scoring_splitFields", Names{"region"}, true);
      split.AddSetting("scoring_splitModelIDs", job.ids, true);
      for (const std::string& id : job.ids) {
        split.AddSetting(id, new QZVecValue<Value>({Value(id)}), true);
      }
      settings.AddSetting("scoring_splitModel", split, true);
      model = factory.CreateScoringModel(settings, streams);
      break;
    }
  }
  status = factory.GetStatus().GetErrorCode();
  factory.Detach();
  return std::unique_ptr<ScoringModel>(model);
}

// The input record of the table's columns: numbers where the model's variable of that
// name stores numbers, texts otherwise; the expected-result columns are left out.
struct Inputs {
  ValueRecord record;
  std::vector<std::pair<size_t, bool>> columns;  // table column, numeric

  Inputs(const ScoringModel& model, const Names& header) {
    const QZXML_800::QZVarList& variables = model.GetVarList();
    for (size_t c = 0; c < header.size(); ++c) {
      const std::string& name = header[c];
      if (name == "prediction" || name.rfind("Probability_", 0) == 0 || record.Contains(name)) {
        continue;
      }
      const QZXML_800::IQZVariable* variable = variables.GetVariable(name);
      const int storage = variable != nullptr ? variable->GetStorageType() : -1;
      columns.emplace_back(c, variable != nullptr && storage != QZXML_800::STORAGE_STRING &&
                                  storage != QZXML_800::STORAGE_UNKNOWN);
      record.Add(name, Value());
    }
  }

  void Fill(const Names& cells) {
    for (size_t i = 0; i < columns.size(); ++i) {
      const size_t c = columns[i].first;
      const std::string cell = c < cells.size() ? cells[c] : std::string();
      double number = 0.0;
      if (cell.empty()) {
        record[i] = Value();
      } else if (columns[i].second && qztest::ParseNumber(cell, number)) {
        record[i] = number;
      } else {
        record[i] = cell;
      }
    }
  }
};

// Scores every row of the job's table with one model; outcome(row, text) receives each.
template <class Outcome>
bool ScoreTable(ScoringModel& model, const Job& job, size_t repeat, Outcome outcome) {
  Inputs inputs(model, job.header);
  ValueRecord output;
  if (!model.Scorable(output).IsOK()) return false;
  for (size_t r = 0; r < repeat; ++r) {
    for (size_t row = 0; row < job.rows.size(); ++row) {
      inputs.Fill(job.rows[row]);
      output.ClearValues();
      const long status = model.Score(inputs.record, output).GetErrorCode();
      std::string text = std::to_string(status) + '|';
      Serialize(inputs.record, text);
      text += '|';
      Serialize(output, text);
      outcome(row, text, output);
    }
  }
  return true;
}

// A category must match exactly; numbers to 1e-6 relative.
bool Agrees(const std::string& expected, const Value& actual) {
  if (expected.empty()) return actual.IsMissing();
  if (actual.IsMissing()) return false;
  double e = 0.0, a = 0.0;
  if (qztest::ParseNumber(expected, e)) {
    if (actual.IsNumericValue()) {
      a = actual.GetReal();
    } else if (!qztest::ParseNumber(actual.GetString(), a)) {
      return false;
    }
    return std::fabs(e - a) <= 1e-6 * std::max({std::fabs(e), std::fabs(a), 1e-300});
  }
  return actual.GetString() == expected;
}

// ---- predicates ----

enum Tri { T = ScoringPredicate::PREDICATE_TRUE, F = ScoringPredicate::PREDICATE_FALSE,
           U = ScoringPredicate::PREDICATE_UNKNOWN };

Tri And(Tri a, Tri b) { return a == F || b == F ? F : (a == U || b == U ? U : T); }
Tri Or(Tri a, Tri b) { return a == T || b == T ? T : (a == U || b == U ? U : F); }
Tri Xor(Tri a, Tri b) { return a == U || b == U ? U : (a != b ? T : F); }
Tri Of(bool b) { return b ? T : F; }

const char kDictionary[] = R"(<DataDictionary>
  <DataField name="x" optype="categorical" dataType="string">
    <Value value="A"/><Value value="B"/><Value value="C"/></DataField>
  <DataField name="c" optype="continuous" dataType="double"/>
  <DataField name="n" optype="categorical" dataType="integer">
    <Value value="1"/><Value value="2"/><Value value="3"/></DataField>
</DataDictionary>)";

// The records: every combination of x in A, B, C, missing; c in 1.5, 3, 7, missing; n in
// 1, 2, 3, missing.
struct Probe {
  Value x, c, n;
};

std::vector<Probe> Probes() {
  const std::vector<Value> xs = {Value("A"), Value("B"), Value("C"), Value()};
  const std::vector<Value> cs = {Value(1.5), Value(3.0), Value(7.0), Value()};
  const std::vector<Value> ns = {Value(1.0), Value(2.0), Value(3.0), Value()};
  std::vector<Probe> probes;
  for (const Value& x : xs)
    for (const Value& c : cs)
      for (const Value& n : ns) probes.push_back({x, c, n});
  return probes;
}

Tri Less3(const Probe& p) { return p.c.IsNull() ? U : Of(p.c.GetReal() < 3); }
Tri InAC(const Probe& p) { return p.x.IsNull() ? U : Of(p.x.GetString() != "B"); }
Tri InB(const Probe& p) { return p.x.IsNull() ? U : Of(p.x.GetString() == "B"); }

struct PredicateCase {
  const char* document;
  Tri (*expected)(const Probe&);  // null: GetPredicate gives null
};

const char kLess3[] = R"(<SimplePredicate field="c" operator="lessThan" value="3"/>)";
const char kInAC[] = R"(<SimpleSetPredicate field="x" booleanOperator="isIn">
  <Array n="2" type="string">A C</Array></SimpleSetPredicate>)";

const std::vector<PredicateCase>& PredicateCases() {
  static const std::vector<PredicateCase> cases = {
      {kLess3, Less3},
      {kInAC, InAC},
      {R"(<CompoundPredicate booleanOperator="and">
           <SimplePredicate field="c" operator="lessThan" value="3"/>
           <SimpleSetPredicate field="x" booleanOperator="isIn">
             <Array n="2" type="string">A C</Array></SimpleSetPredicate></CompoundPredicate>)",
       [](const Probe& p) { return And(Less3(p), InAC(p)); }},
      {R"(<CompoundPredicate booleanOperator="or">
           <SimplePredicate field="c" operator="isMissing"/>
           <SimplePredicate field="n" operator="equal" value="2"/></CompoundPredicate>)",
       [](const Probe& p) {
         return Or(Of(p.c.IsNull()), p.n.IsNull() ? U : Of(p.n.GetReal() == 2));
       }},
      {R"(<CompoundPredicate booleanOperator="surrogate">
           <SimplePredicate field="c" operator="greaterOrEqual" value="5"/>
           <SimpleSetPredicate field="x" booleanOperator="isNotIn">
             <Array n="1" type="string">B</Array></SimpleSetPredicate></CompoundPredicate>)",
       [](const Probe& p) {
         if (!p.c.IsNull()) return Of(p.c.GetReal() >= 5);
         return p.x.IsNull() ? U : Of(p.x.GetString() != "B");
       }},
      {R"(<CompoundPredicate booleanOperator="xor">
           <SimplePredicate field="c" operator="lessThan" value="3"/>
           <SimpleSetPredicate field="x" booleanOperator="isIn">
             <Array n="1" type="string">B</Array></SimpleSetPredicate></CompoundPredicate>)",
       [](const Probe& p) { return Xor(Less3(p), InB(p)); }},
      {"<True/>", [](const Probe&) { return T; }},
      {"<False/>", [](const Probe&) { return F; }},
      // No such field: the parser throws, traces one line, and the service gives null.
      {R"(<SimplePredicate field="zz" operator="equal" value="1"/>)", nullptr},
      {"not xml at all", nullptr},
  };
  return cases;
}

// The index of the case whose failure writes one ParsePredicate trace line.
constexpr size_t kTracedFailure = 8;

ValueRecord ProbeRecord(const Probe& p) {
  ValueRecord record;
  record.Add("x", p.x);
  record.Add("c", p.c);
  record.Add("n", p.n);
  return record;
}

// The same values in a copy of `layout` (fields x, c, n): copies share its layout.
ValueRecord ProbeRecord(const Probe& p, const ValueRecord& layout) {
  ValueRecord record(layout);
  record[0] = p.x;
  record[1] = p.c;
  record[2] = p.n;
  return record;
}

// ---- the run ----

// What the threads found, gathered under a lock.
class Findings {
 public:
  void Add(const std::string& problem) {
    std::lock_guard<std::mutex> guard(lock_);
    if (++count_ <= 20) problems_.push_back(problem);
  }
  long Count() const { return count_; }
  std::string Text() const {
    std::string text;
    for (const std::string& p : problems_) text += "\n  " + p;
    return text;
  }

 private:
  std::mutex lock_;
  long count_ = 0;
  Names problems_;
};

struct ThreadLog {
  long threadId = 0;
  bool predicates = false;
  long tracedFailures = 0;  // predicate threads: builds of the traced failing case
};

std::vector<Job> Jobs(const std::string& corpusModels) {
  const std::string examples = RepositoryDir() + "/examples/";
  const std::string corpus = std::string(QZ_CORPUS_DIR) + "/cpmml/datasets/";
  std::vector<Job> jobs;
  auto solo = [&](const std::string& name, const std::string& file, const std::string& table,
                  bool check) {
    Job job;
    job.name = name;
    job.files = {file};
    job.table = table;
    job.checkPrediction = check;
    jobs.push_back(job);
  };
  solo("tree", examples + "tree/iris_tree.pmml", examples + "tree/iris.csv", false);
  solo("regression", examples + "regression/subscription.pmml",
       examples + "regression/customers.csv", false);
  solo("ensemble", examples + "ensemble/iris_vote.pmml", examples + "ensemble/iris.csv", false);
  solo("propensity", examples + "propensity/response.pmml",
       examples + "propensity/customers.csv", false);
  solo("transformations", examples + "transformations/prepare.pmml",
       examples + "transformations/people.csv", false);
  for (const char* model : {"IrisTree", "AuditTree", "ensemble_iris_dectree", "IrisMultinomReg",
                            "HousingLRClassifier_PCA", "HousingGBTRegressor"}) {
    solo(model, corpusModels + "/" + model + ".xml", corpus + model + ".csv", true);
  }
  Job multi;
  multi.kind = Job::kMulti;
  multi.name = "multi";
  multi.files = {examples + "split/north.pmml", examples + "split/south.pmml"};
  multi.ids = {"north", "south"};
  multi.table = examples + "split/houses.csv";
  jobs.push_back(multi);
  Job split = multi;
  split.kind = Job::kSplit;
  split.name = "split";
  split.files.push_back(examples + "split/west.pmml");
  split.ids.push_back("west");
  jobs.push_back(split);
  return jobs;
}

}  // namespace

TEST(ThreadStress, FactoriesModelsAndPredicatesInManyThreadsAgreeWithOneThread) {
  // Tracing on for the whole process, before the library's first trace call.
  std::ofstream("component.cfg") << "loglevel,2\n";
  const char* roundsText = std::getenv("QZ_STRESS_ROUNDS");
  const int rounds = roundsText != nullptr ? std::max(1, std::atoi(roundsText)) : 6;

  const std::string corpus = std::string(QZ_CORPUS_DIR) + "/cpmml";
  ASSERT_TRUE(std::ifstream(std::string(QZ_CORPUS_DIR) + "/README.md").good())
      << "the validation corpus is not at '" << QZ_CORPUS_DIR << "'";
  ASSERT_EQ(std::system("mkdir -p corpus_models"), 0);
  std::vector<Job> jobs = Jobs("corpus_models");
  for (const Job& job : jobs) {
    if (!job.checkPrediction) continue;
    const std::string unzip =
        "unzip -oq '" + corpus + "/models/" + job.name + ".zip' -d corpus_models";
    ASSERT_EQ(std::system(unzip.c_str()), 0) << "cannot unzip " << job.name;
  }

  size_t recordsPerRound = 0;
  for (Job& job : jobs) {
    std::ifstream table(job.table);
    ASSERT_TRUE(table.good()) << job.table;
    std::string line;
    std::getline(table, line);
    job.header = qztest::SplitCsv(line);
    while (std::getline(table, line)) {
      if (!line.empty()) job.rows.push_back(qztest::SplitCsv(line));
    }
    ASSERT_FALSE(job.rows.empty()) << job.table;
    job.repeat = (kRecordsPerDocument + job.rows.size() - 1) / job.rows.size();
    recordsPerRound += job.repeat * job.rows.size();
  }

  // First contact, all at once: every thread makes the process's first library calls
  // at the same moment (the trace level is read, Xerces-C++ initialised, the plug-ins
  // loaded) and scores a document of its own kind; checked against the run below.
  constexpr int kThreads = kScoringThreads + kPredicateThreads;
  std::vector<Names> firstOutcomes(kThreads);
  {
    std::atomic<int> waiting{kThreads};
    std::vector<std::thread> threads;
    for (int t = 0; t < kThreads; ++t) {
      threads.emplace_back([&, t] {
        waiting.fetch_sub(1);
        while (waiting.load() > 0) std::this_thread::yield();
        std::map<std::string, std::string> names;
        ScoringScorerFactory::GetScoringNames(names, qztest::ReferenceRegistry());
        const Job& job = jobs[static_cast<size_t>(t) % jobs.size()];
        long status = 0;
        auto model = CreateModel(job, t % 2 == 0, status);
        if (!model) return;
        ScoreTable(*model, job, 1, [&](size_t, const std::string& text, const ValueRecord&) {
          firstOutcomes[t].push_back(text);
        });
      });
    }
    for (std::thread& thread : threads) thread.join();
  }

  // The single-threaded run: the outcome of every row, checked against the corpus.
  for (Job& job : jobs) {
    SCOPED_TRACE(job.name);
    const size_t predictionColumn =
        std::find(job.header.begin(), job.header.end(), "prediction") - job.header.begin();
    ASSERT_TRUE(!job.checkPrediction || predictionColumn < job.header.size());

    long status = 0;
    auto model = CreateModel(job, true, status);
    ASSERT_NE(model, nullptr) << "status " << status;
    long disagreements = 0;
    ASSERT_TRUE(ScoreTable(*model, job, 1, [&](size_t row, const std::string& text,
                                               const ValueRecord& output) {
      job.outcomes.push_back(text);
      if (job.checkPrediction &&
          !Agrees(job.rows[row][predictionColumn], output.Get("prediction"))) {
        ++disagreements;
      }
    }));
    EXPECT_EQ(disagreements, 0) << "the single-threaded run disagrees with the corpus";
    // Statuses other than success are kept as they are (a transformations-only
    // document's scorer does not score); most rows must score.
    const long scored = std::count_if(job.outcomes.begin(), job.outcomes.end(),
                                      [](const std::string& o) { return o.rfind("0|", 0) == 0; });
    if (job.name != "transformations") {
      EXPECT_GT(scored * 2, static_cast<long>(job.rows.size()));
    }
  }
  for (int t = 0; t < kThreads; ++t) {
    EXPECT_EQ(firstOutcomes[t], jobs[static_cast<size_t>(t) % jobs.size()].outcomes)
        << "first contact in thread " << t;
  }

  // Predicates every predicate thread evaluates at the same time (they refer to the
  // variables of their list, which therefore outlives them).
  QZSettings predicateSettings;
  QZXML_800::QZVarList sharedVariables;
  std::vector<std::unique_ptr<ScoringPredicate>> shared;
  {
    QZScoring_800::ScoringPMMLParser parser;
    std::istringstream dictionary(kDictionary);
    ASSERT_TRUE(parser.FillVarList(sharedVariables, dictionary).IsOK());
    for (const PredicateCase& c : PredicateCases()) {
      std::istringstream in(c.document);
      shared.emplace_back(
          ScoringScorerFactory::GetPredicate(predicateSettings, sharedVariables, in));
      ASSERT_EQ(shared.back() != nullptr, c.expected != nullptr) << c.document;
    }
  }
  const std::vector<Probe> probes = Probes();
  const ValueRecord layout = ProbeRecord(Probe{});

  Findings findings;
  std::atomic<long> recordsScored{0}, modelsCreated{0}, predicatesBuilt{0}, evaluations{0};
  std::vector<ThreadLog> logs(kThreads);
  std::atomic<int> ready{0};
  auto startTogether = [&] {
    ready.fetch_add(1);
    while (ready.load() < kThreads) std::this_thread::yield();
  };

  auto scorer = [&](int t) {
    logs[t].threadId = ThreadId();
    startTogether();
    for (int round = 0; round < rounds; ++round) {
      for (size_t j = 0; j < jobs.size(); ++j) {
        const Job& job = jobs[(j + t) % jobs.size()];
        const bool fromFiles = (round + j + t) % 2 == 0;
        long status = 0;
        auto model = CreateModel(job, fromFiles, status);
        if (!model) {
          findings.Add(job.name + ": no model, status " + std::to_string(status));
          continue;
        }
        ++modelsCreated;
        long scored = 0;
        const bool laidOut = ScoreTable(*model, job, job.repeat,
                                        [&](size_t row, const std::string& text,
                                            const ValueRecord&) {
          ++scored;
          if (text != job.outcomes[row]) {
            findings.Add(job.name + " row " + std::to_string(row) + ": " + text +
                         "\n    expected " + job.outcomes[row]);
          }
        });
        if (!laidOut) findings.Add(job.name + ": Scorable failed");
        recordsScored += scored;
      }
    }
  };

  auto predicates = [&](int t) {
    logs[t].threadId = ThreadId();
    logs[t].predicates = true;
    startTogether();
    for (int round = 0; round < rounds * 4; ++round) {
      // Its own variable list, read by its own PMML parser (Xerces-C++ is initialised
      // and terminated with it).
      QZXML_800::QZVarList variables;
      {
        QZScoring_800::ScoringPMMLParser parser;
        std::istringstream dictionary(kDictionary);
        if (!parser.FillVarList(variables, dictionary).IsOK()) {
          findings.Add("the data dictionary did not read");
          continue;
        }
      }
      // Records of one layout shared by all threads (copies of one template) meet the
      // predicates' cached field positions; fresh records of their own replace them.
      const bool sharedLayout = round % 2 == 0;
      const std::vector<PredicateCase>& cases = PredicateCases();
      for (size_t i = 0; i < cases.size(); ++i) {
        QZSettings settings;
        std::istringstream in(cases[i].document);
        std::unique_ptr<ScoringPredicate> own(
            ScoringScorerFactory::GetPredicate(settings, variables, in));
        if (i == kTracedFailure) ++logs[t].tracedFailures;
        if ((own != nullptr) != (cases[i].expected != nullptr)) {
          findings.Add(std::string("GetPredicate gave ") + (own ? "a predicate" : "null") +
                       " for " + cases[i].document);
          continue;
        }
        if (!own) continue;
        ++predicatesBuilt;
        // A copy of the shared predicate, made while the other threads read it too.
        const std::unique_ptr<ScoringPredicate> copy(shared[i]->Clone());
        for (const Probe& probe : probes) {
          const ValueRecord record =
              sharedLayout ? ProbeRecord(probe, layout) : ProbeRecord(probe);
          const Tri expected = cases[i].expected(probe);
          for (const ScoringPredicate* predicate : {own.get(), shared[i].get(), copy.get()}) {
            const int result = predicate->Evaluate(record);
            ++evaluations;
            if (result != expected) {
              findings.Add(std::string(cases[i].document) + " on x=" + probe.x.GetString() +
                           " c=" + probe.c.GetString() + " n=" + probe.n.GetString() + ": " +
                           std::to_string(result) + ", expected " + std::to_string(expected));
            }
          }
        }
      }
    }
  };

  const auto start = std::chrono::steady_clock::now();
  std::vector<std::thread> threads;
  for (int t = 0; t < kScoringThreads; ++t) threads.emplace_back(scorer, t);
  for (int t = kScoringThreads; t < kThreads; ++t) {
    threads.emplace_back(predicates, t);
  }
  for (std::thread& thread : threads) thread.join();
  const double seconds =
      std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();

  EXPECT_EQ(findings.Count(), 0) << findings.Text();
  EXPECT_EQ(recordsScored.load(),
            static_cast<long>(recordsPerRound) * rounds * kScoringThreads);
  EXPECT_EQ(modelsCreated.load(), static_cast<long>(jobs.size()) * rounds * kScoringThreads);
  std::cout << kScoringThreads << " scoring threads: " << modelsCreated << " models, "
            << recordsScored << " records; " << kPredicateThreads << " predicate threads: "
            << predicatesBuilt << " predicates, " << evaluations << " evaluations; "
            << seconds << " s\n";

  // Each thread's trace file holds whole lines only; every creation's entry has its exit
  // line, and every traced predicate failure its exception line.
  const std::string logDirectory = "log" + std::to_string(getpid());
  for (const ThreadLog& log : logs) {
    SCOPED_TRACE("thread " + std::to_string(log.threadId));
    std::ifstream in(logDirectory + "/" + std::to_string(log.threadId) + "_scoring.log");
    ASSERT_TRUE(in.good()) << "no trace file";
    long entries = 0, exits = 0, failures = 0, lines = 0;
    std::string line;
    while (std::getline(in, line)) {
      ++lines;
      const bool known = line.rfind("Enter:QZScoring_800::", 0) == 0 ||
                         line.rfind("Exit :QZScoring_800::", 0) == 0 ||
                         line.rfind("  Exception:Function:QZScoring_800::", 0) == 0;
      EXPECT_TRUE(known) << line;
      if (line == "Enter:QZScoring_800::ScoringFactory::CreateScoringModel") ++entries;
      if (line == "Exit :QZScoring_800::ScoringFactory::CreateScoringModel") ++exits;
      if (line.rfind("  Exception:Function:QZScoring_800::ScoringPMMLParser::ParsePredicate; "
                     "Line:", 0) == 0) {
        ++failures;
      }
    }
    EXPECT_GT(lines, 0);
    EXPECT_EQ(entries, exits);
    if (log.predicates) {
      EXPECT_EQ(failures, log.tracedFailures);
    } else {
      EXPECT_GE(entries, static_cast<long>(jobs.size()) * rounds);
    }
  }
}

// Cost per record of the transformation engine: a realistic data preparation of twenty
// derived fields (NormContinuous, MapValues, Discretize, NormDiscrete and nested Apply),
// and one Apply of "+" alone. Records share one layout, as a host's rows do, so the
// figures are those of the bound fast path.
#include <sstream>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>
#include <xercesc/util/PlatformUtils.hpp>

#include "QZTransformation.h"
#include "Value.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;

namespace {

// Xerces-C++ for loading, for the whole run.
struct Xerces {
  Xerces() { xercesc::XMLPlatformUtils::Initialize(); }
  ~Xerces() { xercesc::XMLPlatformUtils::Terminate(); }
} const kXerces;

std::string Derived(const std::string& name, const std::string& type, const std::string& body) {
  return "<DerivedField name=\"" + name + "\" optype=\"" +
         (type == "string" ? "categorical" : "continuous") + "\" dataType=\"" + type + "\">" +
         body + "</DerivedField>";
}

std::string Ref(const std::string& field) { return "<FieldRef field=\"" + field + "\"/>"; }
std::string Num(const std::string& text) { return "<Constant>" + text + "</Constant>"; }
std::string Apply(const std::string& function, const std::string& args) {
  return "<Apply function=\"" + function + "\">" + args + "</Apply>";
}

std::string Norm(const std::string& field, double scale) {
  return "<NormContinuous field=\"" + field +
         "\"><LinearNorm orig=\"0\" norm=\"0\"/><LinearNorm orig=\"" + std::to_string(scale) +
         "\" norm=\"0.5\"/><LinearNorm orig=\"" + std::to_string(4 * scale) +
         "\" norm=\"1\"/></NormContinuous>";
}

std::string Bins(const std::string& field, double step) {
  std::string xml = "<Discretize field=\"" + field + "\" defaultValue=\"0\">";
  for (int i = 0; i < 5; ++i) {
    xml += "<DiscretizeBin binValue=\"" + std::to_string(i + 1) +
           "\"><Interval closure=\"closedOpen\" leftMargin=\"" + std::to_string(i * step) +
           "\" rightMargin=\"" + std::to_string((i + 1) * step) + "\"/></DiscretizeBin>";
  }
  return xml + "</Discretize>";
}

std::string Table(const std::string& field, const std::vector<std::string>& keys) {
  std::string xml = "<MapValues outputColumn=\"out\" defaultValue=\"0\"><FieldColumnPair field=\"" +
                    field + "\" column=\"in\"/><InlineTable>";
  for (size_t i = 0; i < keys.size(); ++i) {
    xml += "<row><in>" + keys[i] + "</in><out>" + std::to_string(0.1 * (i + 1)) + "</out></row>";
  }
  return xml + "</InlineTable></MapValues>";
}

// Twenty derived fields over eight inputs (six numbers, two categories).
std::string Preparation() {
  const std::vector<std::string> regions = {"north", "south", "east", "west", "centre"};
  const std::vector<std::string> codes = {"1", "2", "3", "4", "5", "6", "7", "8"};
  std::string d;
  d += Derived("n_age", "double", Norm("age", 20));
  d += Derived("n_income", "double", Norm("income", 20000));
  d += Derived("n_balance", "double", Norm("balance", 1000));
  d += Derived("n_tenure", "double", Norm("tenure", 12));
  d += Derived("n_visits", "double", Norm("visits", 5));
  d += Derived("m_region", "double", Table("region", regions));
  d += Derived("m_product", "double", Table("product", codes));
  d += Derived("m_visits", "double", Table("visits", codes));
  d += Derived("b_age", "integer", Bins("age", 15));
  d += Derived("b_income", "integer", Bins("income", 25000));
  d += Derived("b_balance", "integer", Bins("balance", 2000));
  d += Derived("b_tenure", "integer", Bins("tenure", 24));
  d += Derived("is_north", "double", "<NormDiscrete field=\"region\" value=\"north\"/>");
  d += Derived("a_ratio", "double",
               Apply("/", Ref("balance") + Apply("+", Ref("income") + Num("1"))));
  d += Derived("a_log_income", "double", Apply("ln", Apply("+", Ref("income") + Num("1"))));
  d += Derived("a_interaction", "double",
               Apply("*", Ref("n_age") + Apply("-", Num("1") + Ref("n_income"))));
  d += Derived("a_score", "double",
               Apply("+", Apply("*", Num("0.4") + Ref("n_balance")) +
                              Apply("*", Num("0.6") + Ref("m_region"))));
  d += Derived("a_flag", "double",
               Apply("if", Apply("greaterThan", Ref("income") + Num("50000")) + Num("1") +
                               Num("0")));
  d += Derived("a_sum", "double",
               Apply("sum", Ref("n_age") + Ref("n_income") + Ref("n_balance") + Ref("n_tenure")));
  d += Derived("a_exp", "double",
               Apply("exp", Apply("*", Num("-0.5") + Apply("pow", Ref("a_score") + Num("2")))));
  return "<PMML version=\"4.4\"><DataDictionary>"
         "<DataField name=\"age\" optype=\"continuous\" dataType=\"double\"/>"
         "<DataField name=\"income\" optype=\"continuous\" dataType=\"double\"/>"
         "<DataField name=\"balance\" optype=\"continuous\" dataType=\"double\"/>"
         "<DataField name=\"tenure\" optype=\"continuous\" dataType=\"double\"/>"
         "<DataField name=\"visits\" optype=\"continuous\" dataType=\"double\"/>"
         "<DataField name=\"product\" optype=\"categorical\" dataType=\"integer\"/>"
         "<DataField name=\"region\" optype=\"categorical\" dataType=\"string\"/>"
         "<DataField name=\"extra\" optype=\"continuous\" dataType=\"double\"/>"
         "</DataDictionary><TransformationDictionary>" +
         d + "</TransformationDictionary></PMML>";
}

constexpr int kRecords = 64;

// Input records of one layout, the derived fields already present.
std::vector<ValueRecord> Records(QZTransformation& t) {
  const char* regions[] = {"north", "south", "east", "west", "centre", "abroad"};
  ValueRecord layout;
  for (const char* name : {"age", "income", "balance", "tenure", "visits", "product", "region",
                           "extra"}) {
    layout.Add(name, Value());
  }
  t.GetDerivedVariableInfo(layout, true);
  std::vector<ValueRecord> records(kRecords, layout);
  for (int i = 0; i < kRecords; ++i) {
    ValueRecord& r = records[static_cast<size_t>(i)];
    r[size_t{0}] = 18.0 + (i * 7) % 60;
    r[size_t{1}] = 10000.0 + i * 1711.0;
    r[size_t{2}] = (i % 9) * 550.5;
    r[size_t{3}] = (i * 5) % 120;
    r[size_t{4}] = (i % 10);
    r[size_t{5}] = (i % 9) + 1;
    r[size_t{6}] = regions[i % 6];
    r[size_t{7}] = i == 13 ? Value() : Value(i * 0.25);
  }
  return records;
}

void Run(benchmark::State& state, const std::string& document, int derivedFields) {
  QZTransformation t;
  std::istringstream in(document);
  if (t.AddPMML(in, false).IsError()) {
    state.SkipWithError(t.GetLastError().c_str());
    return;
  }
  std::vector<ValueRecord> records = Records(t);
  for (ValueRecord& record : records) {
    if (t.Transform(record).IsError()) {
      state.SkipWithError(t.GetLastError().c_str());
      return;
    }
  }
  size_t next = 0;
  for (auto _ : state) {
    ValueRecord& record = records[next];
    next = (next + 1) % kRecords;
    const bool ok = t.Transform(record).IsOK();
    benchmark::DoNotOptimize(ok);
    benchmark::ClobberMemory();
  }
  state.SetItemsProcessed(state.iterations());
  state.counters["ns_per_field"] = benchmark::Counter(
      static_cast<double>(state.iterations()) * derivedFields,
      benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

// A record through the twenty-field preparation.
void BM_TransformPreparation(benchmark::State& state) { Run(state, Preparation(), 20); }
BENCHMARK(BM_TransformPreparation);

// A record through one derived field, the Apply of "+" over two inputs.
void BM_TransformApplyPlus(benchmark::State& state) {
  Run(state,
      "<PMML version=\"4.4\"><TransformationDictionary>" +
          Derived("sum", "double", Apply("+", Ref("age") + Ref("income"))) +
          "</TransformationDictionary></PMML>",
      1);
}
BENCHMARK(BM_TransformApplyPlus);

}  // namespace

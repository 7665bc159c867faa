// Cost of the model-attribute scan against a bare SAX2 parse of the same large
// document. The scan tokenises the whole model, so it can only be as fast as the
// parser; the figure that matters is the ratio of the two, printed at the end.
//   bin/scan_bench --benchmark_repetitions=15 --benchmark_report_aggregates_only=true
//                  --benchmark_enable_random_interleaving=true
// (interleaving keeps a changing machine load from favouring either side).

#include <cstdio>
#include <map>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>
#include <xercesc/sax2/DefaultHandler.hpp>
#include <xercesc/sax2/SAX2XMLReader.hpp>
#include <xercesc/sax2/XMLReaderFactory.hpp>
#include <xercesc/util/PlatformUtils.hpp>
#include <xercesc/util/SecurityManager.hpp>
#include <xercesc/util/XMLUni.hpp>

#include "QZSafeParser.h"
#include "QZXInputSource.h"
#include "ScoringModelAttr.h"
#include "ScoringScorerFactory.h"

using QZScoring_800::ScoringModelAttr;
using QZScoring_800::ScoringScorerFactory;

namespace {

constexpr int kFields = 40;
constexpr int kSegments = 400;
constexpr int kNodesPerTree = 300;

std::string Field(int i) { return "field_" + std::to_string(i); }

// One tree of nested nodes, each with a predicate and a score distribution.
void AppendTree(std::string& out, int segment) {
  out += "<TreeModel modelName=\"tree_" + std::to_string(segment) +
         "\" functionName=\"classification\" splitCharacteristic=\"binarySplit\">\n"
         "<MiningSchema>\n";
  for (int f = 0; f < kFields; ++f) out += "<MiningField name=\"" + Field(f) + "\"/>\n";
  out += "<MiningField name=\"target\" usageType=\"predicted\"/>\n</MiningSchema>\n"
         "<Node id=\"0\" score=\"yes\" recordCount=\"1000\"><True/>\n";
  int open = 0;
  for (int n = 1; n < kNodesPerTree; ++n) {
    const int f = (segment + n) % kFields;
    out += "<Node id=\"" + std::to_string(n) + "\" score=\"" + (n % 2 ? "yes" : "no") +
           "\" recordCount=\"" + std::to_string(1000 - n) + "\">\n"
           "<SimplePredicate field=\"" + Field(f) + "\" operator=\"lessOrEqual\" value=\"" +
           std::to_string(n * 0.37) + "\"/>\n"
           "<ScoreDistribution value=\"yes\" recordCount=\"" + std::to_string(n) +
           "\" confidence=\"0.25\"/>\n<ScoreDistribution value=\"no\" recordCount=\"" +
           std::to_string(1000 - 2 * n) + "\" confidence=\"0.75\"/>\n";
    ++open;
    if (n % 4 == 0) {  // close a few levels so the trees stay shallow
      for (; open > 0; --open) out += "</Node>\n";
    }
  }
  for (; open > 0; --open) out += "</Node>\n";
  out += "</Node>\n</TreeModel>\n";
}

// A MiningModel of kSegments trees with a data and a transformation dictionary: about
// 30 MB of PMML.
std::string MakeDocument() {
  std::string out =
      "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
      "<PMML version=\"4.1\" xmlns=\"http://www.dmg.org/PMML-4_1\">\n"
      "<Header><Application name=\"bench\" version=\"1\"/></Header>\n"
      "<DataDictionary numberOfFields=\"" + std::to_string(kFields + 1) + "\">\n";
  for (int f = 0; f < kFields; ++f) {
    out += "<DataField name=\"" + Field(f) + "\" optype=\"continuous\" dataType=\"double\">"
           "<Interval closure=\"closedClosed\" leftMargin=\"0\" rightMargin=\"100\"/>"
           "</DataField>\n";
  }
  out += "<DataField name=\"target\" optype=\"categorical\" dataType=\"string\">"
         "<Value value=\"yes\"/><Value value=\"no\"/></DataField>\n</DataDictionary>\n"
         "<TransformationDictionary>\n";
  for (int f = 0; f < kFields; f += 4) {
    out += "<DerivedField name=\"scaled_" + Field(f) +
           "\" optype=\"continuous\" dataType=\"double\"><NormContinuous field=\"" + Field(f) +
           "\"><LinearNorm orig=\"0\" norm=\"0\"/><LinearNorm orig=\"100\" norm=\"1\"/>"
           "</NormContinuous></DerivedField>\n";
  }
  out += "</TransformationDictionary>\n"
         "<MiningModel modelName=\"forest\" functionName=\"classification\">\n<MiningSchema>\n";
  for (int f = 0; f < kFields; ++f) out += "<MiningField name=\"" + Field(f) + "\"/>\n";
  out += "<MiningField name=\"target\" usageType=\"predicted\"/>\n</MiningSchema>\n"
         "<Output><OutputField name=\"prediction\" feature=\"predictedValue\"/></Output>\n"
         "<Segmentation multipleModelMethod=\"majorityVote\">\n";
  for (int s = 0; s < kSegments; ++s) {
    out += "<Segment id=\"" + std::to_string(s) + "\"><True/>\n";
    AppendTree(out, s);
    out += "</Segment>\n";
  }
  out += "</Segmentation>\n</MiningModel>\n</PMML>\n";
  return out;
}

const std::string& Document() {
  static const std::string document = MakeDocument();
  return document;
}

void Rewind(std::istringstream& in) {
  in.clear();
  in.seekg(0);
}

void BM_ModelAttrScan(benchmark::State& state) {
  std::istringstream in(Document());
  const std::vector<std::string> names = {"MiningModel", "TreeModel"};
  for (auto _ : state) {
    Rewind(in);
    ScoringModelAttr record;
    ScoringModelAttr* pointer = &record;
    if (ScoringScorerFactory::GetModelAttr(in, names, pointer, "UTF-8").IsError()) {
      state.SkipWithError("scan failed");
      break;
    }
    benchmark::DoNotOptimize(record.GetSkeletonStream());
  }
  state.SetBytesProcessed(state.iterations() * static_cast<int64_t>(Document().size()));
}
BENCHMARK(BM_ModelAttrScan)->Unit(benchmark::kMillisecond);

// The same document through a reader with the scan's features and a handler that does
// nothing at all.
void BM_BareSAX2Parse(benchmark::State& state) {
  std::istringstream in(Document());
  xercesc::DefaultHandler handler;
  xercesc::SecurityManager security;
  security.setEntityExpansionLimit(QZXML_800::kQZEntityExpansionLimit);
  std::unique_ptr<xercesc::SAX2XMLReader> reader(xercesc::XMLReaderFactory::createXMLReader());
  using xercesc::XMLUni;
  reader->setFeature(XMLUni::fgSAX2CoreNameSpaces, true);
  reader->setFeature(XMLUni::fgSAX2CoreNameSpacePrefixes, true);
  reader->setFeature(XMLUni::fgSAX2CoreValidation, false);
  reader->setFeature(XMLUni::fgXercesDynamic, false);
  reader->setFeature(XMLUni::fgXercesSchema, false);
  reader->setFeature(XMLUni::fgXercesLoadSchema, false);
  reader->setFeature(XMLUni::fgXercesSchemaFullChecking, false);
  reader->setFeature(XMLUni::fgXercesLoadExternalDTD, false);
  reader->setFeature(XMLUni::fgXercesDisableDefaultEntityResolution, true);
  reader->setProperty(XMLUni::fgXercesSecurityManager, &security);
  reader->setContentHandler(&handler);
  reader->setErrorHandler(&handler);
  for (auto _ : state) {
    Rewind(in);
    QZXML_800::QZXInputSource source(in);
    reader->parse(source);
  }
  state.SetBytesProcessed(state.iterations() * static_cast<int64_t>(Document().size()));
}
BENCHMARK(BM_BareSAX2Parse)->Unit(benchmark::kMillisecond);

// The console output, plus the scan's time as a multiple of the bare parse's (from the
// medians when repetitions are asked for, else from the single runs).
class RatioReporter : public benchmark::ConsoleReporter {
 public:
  void ReportRuns(const std::vector<Run>& runs) override {
    ConsoleReporter::ReportRuns(runs);
    for (const Run& run : runs) {
      const std::string name = run.run_name.function_name;
      if (run.run_type == Run::RT_Aggregate && run.aggregate_name == "median") {
        median_[name] = run.GetAdjustedRealTime();
      } else if (run.run_type == Run::RT_Iteration) {
        single_[name] = run.GetAdjustedRealTime();
      }
    }
  }
  void Finalize() override {
    ConsoleReporter::Finalize();
    const auto& times = median_.empty() ? single_ : median_;
    const auto scan = times.find("BM_ModelAttrScan");
    const auto bare = times.find("BM_BareSAX2Parse");
    if (scan != times.end() && bare != times.end() && bare->second > 0) {
      std::printf("document %.1f MB; scan time / bare parse time = %.3f\n",
                  static_cast<double>(Document().size()) / 1e6, scan->second / bare->second);
    }
  }

 private:
  std::map<std::string, double> median_;
  std::map<std::string, double> single_;
};

}  // namespace

int main(int argc, char** argv) {
  xercesc::XMLPlatformUtils::Initialize();
  benchmark::Initialize(&argc, argv);
  {
    RatioReporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);
  }
  benchmark::Shutdown();
  xercesc::XMLPlatformUtils::Terminate();
  return 0;
}

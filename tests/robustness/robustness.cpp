// Hostile documents and data against the entry points a host uses: the scoring factory
// with the reference plug-ins, the predicate service, the data-dictionary reader, the
// transformation engine and qzscore's CSV reader. Each attack runs in a child process of
// its own, so that a crash, a hang or a memory blow-up stays there; the parent kills a
// child that runs too long, and measures its wall time and peak memory.
//
//   robustness            prints the results as a Markdown table
//   robustness --check    the same, and exits with 1 when any attack is out of bounds
//   robustness --only S   runs only the attacks whose name contains S
//
// An attack is within bounds when it ends within 2 s of CPU time (wall time varies with
// the load of a shared machine; a child still running after 10 s is killed) and 1 GiB,
// without a crash, and what the caller gets is either a clear failure (a status code, a
// null result, an error message) or the correct result. A listening socket on 127.0.0.1 catches any
// connection an attack's document points at.

#include <arpa/inet.h>
#include <netinet/in.h>
#include <poll.h>
#include <signal.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/time.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <functional>
#include <iostream>
#include <limits>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <xercesc/util/PlatformUtils.hpp>

#include "Csv.h"
#include "HostileTransformations.h"
#include "QZDisplay.h"
#include "Records.h"
#include "ReferenceRegistry.h"
#include "QZMV.h"
#include "QZSettings.h"
#include "QZTransformation.h"
#include "QZVarList.h"
#include "ScoringFactory.h"
#include "ScoringModel.h"
#include "ScoringPMMLParser.h"
#include "ScoringPredicate.h"
#include "ScoringScorerFactory.h"
#include "StatusText.h"
#include "Value.h"
#include "ValueRecord.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringFactory;
using QZScoring_800::ScoringModel;
using QZScoring_800::ScoringPredicate;
using QZScoring_800::ScoringScorerFactory;
using QZTransformNS_8_0_0::QZTransformation;
using QZXML_800::QZSettings;
using QZXML_800::QZVarList;

namespace {

// ---------------------------------------------------------------------------------------
// Bounds. Sanitized builds run several times slower and map a large shadow memory, so
// they get wider ones (the point there is crashes and undefined behaviour, not speed).

#if defined(__SANITIZE_ADDRESS__)
constexpr bool kSanitized = true;
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
constexpr bool kSanitized = true;
#else
constexpr bool kSanitized = false;
#endif
#else
constexpr bool kSanitized = false;
#endif

constexpr double kTimeBound = kSanitized ? 15.0 : 2.0;                    // seconds
constexpr long kMemoryBoundKiB = kSanitized ? 6L << 20 : 1L << 20;         // 1 GiB
constexpr double kKillAfter = kSanitized ? 60.0 : 10.0;                    // seconds
// Address space of a child: a blow-up fails there instead of starving the machine.
constexpr rlim_t kChildAddressSpace = rlim_t{3} << 30;

// Port of the loopback listener the documents point at (set in main).
int gPort = 0;
std::string Loopback(const std::string& path) {
  return "http://127.0.0.1:" + std::to_string(gPort) + path;
}

// ---------------------------------------------------------------------------------------
// What an attack reports: what the caller got, and whether each part was a clear failure
// or the correct result.

struct Outcome {
  std::string got;
  bool ok = true;

  void Add(const std::string& part, bool good) {
    if (!got.empty()) got += "; ";
    got += part;
    if (!good) {
      got += " (UNEXPECTED)";
      ok = false;
    }
  }
};

std::string Shorten(std::string text, size_t most = 70) {
  for (char& c : text) {
    if (c == '\n' || c == '\r' || c == '\t') c = ' ';
  }
  if (text.size() > most) text = text.substr(0, most - 3) + "...";
  return text;
}

// Text for a Markdown table cell.
std::string Cell(const std::string& text) {
  std::string cell;
  for (char c : text) {
    if (c == '|') cell += '\\';
    cell += c;
  }
  return cell;
}

std::string Code(long code) { return code == 0 ? "0" : qzscore::DescribeStatus(code); }

// ---------------------------------------------------------------------------------------
// Documents.

const char kDictionary[] = R"(<DataDictionary>
    <DataField name="x" optype="continuous" dataType="double"/>
    <DataField name="c" optype="categorical" dataType="string">
      <Value value="r"/><Value value="g"/><Value value="b"/></DataField>
    <DataField name="y" optype="categorical" dataType="string">
      <Value value="A"/><Value value="B"/></DataField>
  </DataDictionary>)";

// A TreeModel over x (continuous) and c (r, g, b) predicting y (A or B). `prolog` comes
// before the root, `rootAttributes` on PMML, `header` inside it before the dictionary,
// `dictionary` replaces the data dictionary, `nodes` follows the mining schema.
struct TreeParts {
  std::string prolog = "<?xml version=\"1.0\"?>\n";
  std::string rootAttributes = "version=\"4.1\"";
  std::string header = "<Header copyright=\"none\"/>";
  std::string dictionary = kDictionary;
  std::string nodes;
};

// x < 5 gives A, else B; the root's score is A.
const char kTwoLeaves[] = R"(<Node id="0" score="A" recordCount="8"><True/>
    <Node id="1" score="A" recordCount="4">
      <SimplePredicate field="x" operator="lessThan" value="5"/></Node>
    <Node id="2" score="B" recordCount="4">
      <SimplePredicate field="x" operator="greaterOrEqual" value="5"/></Node>
  </Node>)";

std::string TreeDocument(const TreeParts& parts) {
  return parts.prolog + "<PMML " + parts.rootAttributes + ">" + parts.header + parts.dictionary +
         R"(<TreeModel functionName="classification" missingValueStrategy="none"
               noTrueChildStrategy="returnNullPrediction"><MiningSchema>
           <MiningField name="y" usageType="predicted"/><MiningField name="x"/>
           <MiningField name="c"/></MiningSchema>)" +
         (parts.nodes.empty() ? std::string(kTwoLeaves) : parts.nodes) + "</TreeModel></PMML>";
}

std::string TreeDocument() { return TreeDocument(TreeParts()); }

// A document of transformations only (no model): d = the expression, over x and s.
std::string TransformDocument(const std::string& functions, const std::string& expression) {
  return R"(<PMML version="4.1"><DataDictionary>
      <DataField name="x" optype="continuous" dataType="double"/>
      <DataField name="s" optype="categorical" dataType="string"/></DataDictionary>
    <TransformationDictionary>)" +
         functions + R"(<DerivedField name="d" optype="continuous" dataType="double">)" +
         expression + "</DerivedField></TransformationDictionary></PMML>";
}

// ---------------------------------------------------------------------------------------
// Entry points.

// Diagnostics the library writes while a call runs.
class CaptureDisplay {
 public:
  CaptureDisplay() { QZDisplay_800::SetDisplayStream(&text_); }
  ~CaptureDisplay() { QZDisplay_800::SetDisplayStream(&std::cerr); }
  std::string Text() const { return text_.str(); }
  std::string FirstLine() const {
    const std::string all = text_.str();
    return all.substr(0, all.find('\n'));
  }

 private:
  std::ostringstream text_;
};

struct Created {
  std::unique_ptr<ScoringModel> model;
  long status = 0;
  std::string notes;  // every diagnostic line
};

Created Create(const std::string& document) {
  Created created;
  CaptureDisplay display;
  QZSettings settings = qztest::ReferenceRegistry();
  ScoringFactory factory;
  std::istringstream in(document);
  created.model.reset(factory.CreateScoringModel(settings, in));
  created.status = factory.GetStatus().GetErrorCode();
  factory.Detach();
  created.notes = display.Text();
  return created;
}

// The prediction for one record: its text, "missing", or "status N".
std::string Predict(ScoringModel& model, const Value& x, const Value& c = Value("r")) {
  ValueRecord input, output;
  input.Add("x", x);
  input.Add("c", c);
  CaptureDisplay display;
  const long layout = model.Scorable(output).GetErrorCode();
  if (layout != 0) return "status " + std::to_string(layout);
  const long status = model.Score(input, output).GetErrorCode();
  if (status != 0) return "status " + std::to_string(status);
  const Value prediction = output.Get("prediction");
  if (prediction.IsNull() || prediction.IsMissing()) return "missing";
  return prediction.GetString();
}

// The variables of kDictionary, for the predicate service.
QZVarList DictionaryVariables() {
  QZVarList variables;
  QZScoring_800::ScoringPMMLParser parser;
  std::istringstream in(kDictionary);
  parser.FillVarList(variables, in);
  return variables;
}

std::unique_ptr<ScoringPredicate> GetPredicate(const std::string& document) {
  CaptureDisplay display;
  QZSettings settings;
  QZVarList variables = DictionaryVariables();
  std::istringstream in(document);
  return std::unique_ptr<ScoringPredicate>(
      ScoringScorerFactory::GetPredicate(settings, variables, in));
}

struct Filled {
  long status = 0;
  std::string message;
  int count = 0;
};

Filled FillVarList(const std::string& document) {
  CaptureDisplay display;
  Filled filled;
  QZVarList variables;
  QZScoring_800::ScoringPMMLParser parser;
  std::istringstream in(document);
  filled.status = parser.FillVarList(variables, in).GetErrorCode();
  filled.message = parser.GetXercesMessage();
  filled.count = variables.Size();
  return filled;
}

struct Loaded {
  long status = 0;
  std::string error;
  std::unique_ptr<QZTransformation> engine;
};

Loaded LoadTransformations(const std::string& document) {
  CaptureDisplay display;
  Loaded loaded;
  loaded.engine = std::make_unique<QZTransformation>();
  std::istringstream in(document);
  loaded.status = loaded.engine->AddPMML(in, false).GetErrorCode();
  loaded.error = loaded.engine->GetLastError();
  return loaded;
}

// ---------------------------------------------------------------------------------------
// Checks shared by the attacks.

// The factory refuses the document: no model, an error status. forbidden (when not
// empty) must appear nowhere the caller can see.
void ExpectFactoryRefuses(Outcome& outcome, const std::string& document,
                          const std::string& forbidden = std::string()) {
  const Created created = Create(document);
  const bool leaked = !forbidden.empty() && created.notes.find(forbidden) != std::string::npos;
  outcome.Add("factory: " + (created.model ? std::string("a model") : "null, " +
                                                  Shorten(Code(created.status), 60)) +
                  (leaked ? ", file text in the diagnostics" : ""),
              created.model == nullptr && created.status != 0 && !leaked);
}

void ExpectPredicateRefused(Outcome& outcome, const std::string& document) {
  const auto predicate = GetPredicate(document);
  outcome.Add(std::string("GetPredicate: ") + (predicate ? "a predicate" : "null"),
              predicate == nullptr);
}

void ExpectVarListRefuses(Outcome& outcome, const std::string& document) {
  const Filled filled = FillVarList(document);
  outcome.Add("FillVarList: " + std::to_string(filled.status) +
                  (filled.message.empty() ? "" : " (" + Shorten(filled.message, 50) + ")"),
              filled.status != 0 && filled.count == 0);
}

void ExpectTransformRefuses(Outcome& outcome, const std::string& document) {
  const Loaded loaded = LoadTransformations(document);
  outcome.Add("AddPMML: " + std::to_string(loaded.status), loaded.status != 0);
}

// The same hostile document through every XML entry point; predicateDocument is its
// stand-alone predicate form.
Outcome RefusedEverywhere(const std::string& document, const std::string& predicateDocument,
                          const std::string& forbidden = std::string()) {
  Outcome outcome;
  ExpectFactoryRefuses(outcome, document, forbidden);
  ExpectPredicateRefused(outcome, predicateDocument);
  ExpectVarListRefuses(outcome, document);
  ExpectTransformRefuses(outcome, document);
  return outcome;
}

const char kAllXml[] = "CreateScoringModel, GetPredicate, FillVarList, AddPMML";

// The factory builds the model and it predicts expected for x = 3 and expected2 for x = 7
// (A and B for the two-leaf tree).
void ExpectScores(Outcome& outcome, const std::string& label, const std::string& document,
                  const std::string& expected = "A", const std::string& expected2 = "B") {
  const Created created = Create(document);
  if (!created.model) {
    outcome.Add(label + ": null, " + Shorten(Code(created.status), 60), false);
    return;
  }
  const std::string low = Predict(*created.model, 3.0);
  const std::string high = Predict(*created.model, 7.0);
  outcome.Add(label + ": scores " + low + "/" + high, low == expected && high == expected2);
}

// ---------------------------------------------------------------------------------------
// The attacks.

std::string BillionLaughsDtd(const std::string& root) {
  std::string dtd = "<!DOCTYPE " + root + " [\n<!ENTITY lol0 \"lol\">\n";
  for (int i = 1; i <= 9; ++i) {
    dtd += "<!ENTITY lol" + std::to_string(i) + " \"";
    for (int j = 0; j < 10; ++j) dtd += "&lol" + std::to_string(i - 1) + ";";
    dtd += "\">\n";
  }
  return dtd + "]>\n";
}

Outcome BillionLaughs() {
  TreeParts parts;
  parts.prolog = BillionLaughsDtd("PMML");
  parts.header = "<Header copyright=\"&lol9;\"/>";
  return RefusedEverywhere(TreeDocument(parts),
                           BillionLaughsDtd("SimplePredicate") +
                               R"(<SimplePredicate field="c" operator="equal" value="&lol9;"/>)");
}

Outcome QuadraticBlowUp() {
  // One 100 KB entity referenced 30,000 times: 3 GB of text from a 220 KB document.
  const std::string dtd = [] {
    return std::string(" [<!ENTITY big \"") + std::string(100000, 'x') + "\">]>";
  }();
  std::string references;
  for (int i = 0; i < 30000; ++i) references += "&big;";
  TreeParts parts;
  parts.prolog = "<!DOCTYPE PMML" + dtd;
  parts.header = "<Header><Annotation>" + references + "</Annotation></Header>";
  return RefusedEverywhere(TreeDocument(parts),
                           "<!DOCTYPE SimplePredicate" + dtd +
                               "<SimplePredicate field=\"c\" operator=\"equal\" value=\"" +
                               references + "\"/>");
}

// The first line of /etc/passwd: the text that must never reach a caller.
std::string PasswdLine() {
  std::ifstream in("/etc/passwd");
  std::string line;
  std::getline(in, line);
  return line;
}

Outcome ExternalEntityFile() {
  const std::string secret = PasswdLine();
  const std::string general = "<!DOCTYPE PMML [<!ENTITY file SYSTEM \"file:///etc/passwd\">]>\n";
  const std::string parameter =
      "<!DOCTYPE PMML [<!ENTITY % file SYSTEM \"file:///etc/passwd\"> %file;]>\n";
  TreeParts parts;
  parts.prolog = general;
  parts.header = "<Header copyright=\"&file;\"><Annotation>&file;</Annotation></Header>";
  parts.dictionary = std::string(kDictionary).replace(std::string(kDictionary).find("\"b\""), 3,
                                                      "\"&file;\"");
  Outcome outcome = RefusedEverywhere(
      TreeDocument(parts),
      "<!DOCTYPE SimplePredicate [<!ENTITY file SYSTEM \"file:///etc/passwd\">]>"
      "<SimplePredicate field=\"c\" operator=\"equal\" value=\"&file;\"/>",
      secret);
  parts.prolog = parameter;
  parts.header = "<Header/>";
  ExpectFactoryRefuses(outcome, TreeDocument(parts), secret);
  return outcome;
}

Outcome ExternalDtd() {
  TreeParts parts;
  parts.prolog = "<!DOCTYPE PMML SYSTEM \"" + Loopback("/pmml.dtd") + "\">\n";
  Outcome outcome = RefusedEverywhere(
      TreeDocument(parts), "<!DOCTYPE True SYSTEM \"" + Loopback("/p.dtd") + "\"><True/>");
  parts.prolog = "<!DOCTYPE PMML PUBLIC \"-//x//y\" \"file:///etc/passwd\">\n";
  ExpectFactoryRefuses(outcome, TreeDocument(parts), PasswdLine());
  return outcome;
}

Outcome SchemaLocation() {
  // A valid document that names a schema on the loopback listener: it must score, and
  // nothing may be fetched (the parent checks the listener).
  TreeParts parts;
  parts.rootAttributes =
      "xmlns=\"http://www.dmg.org/PMML-4_1\" "
      "xmlns:xsi=\"http://www.w3.org/2001/XMLSchema-instance\" "
      "xsi:schemaLocation=\"http://www.dmg.org/PMML-4_1 " +
      Loopback("/pmml.xsd") + "\" version=\"4.1\"";
  Outcome outcome;
  ExpectScores(outcome, "schemaLocation", TreeDocument(parts));
  parts.rootAttributes =
      "xmlns:xsi=\"http://www.w3.org/2001/XMLSchema-instance\" "
      "xsi:noNamespaceSchemaLocation=\"" + Loopback("/pmml.xsd") + "\" version=\"4.1\"";
  ExpectScores(outcome, "noNamespaceSchemaLocation", TreeDocument(parts));
  const auto predicate = GetPredicate(
      "<True xmlns:xsi=\"http://www.w3.org/2001/XMLSchema-instance\" "
      "xsi:noNamespaceSchemaLocation=\"" + Loopback("/p.xsd") + "\"/>");
  outcome.Add(std::string("GetPredicate: ") + (predicate ? "True" : "null"), true);
  const Filled filled = FillVarList(TreeDocument(parts));
  outcome.Add("FillVarList: " + std::to_string(filled.count) + " fields",
              filled.status == 0 && filled.count == 3);
  return outcome;
}

std::string Nested(const std::string& open, const std::string& close, int depth,
                   const std::string& inner = std::string()) {
  std::string text;
  text.reserve(depth * (open.size() + close.size()) + inner.size());
  for (int i = 0; i < depth; ++i) text += open;
  text += inner;
  for (int i = 0; i < depth; ++i) text += close;
  return text;
}

Outcome NestedElements() {
  TreeParts parts;
  parts.header = "<Header>" + Nested("<Extension>", "</Extension>", 200000) + "</Header>";
  return RefusedEverywhere(TreeDocument(parts),
                           Nested("<CompoundPredicate booleanOperator=\"and\">",
                                  "</CompoundPredicate>", 200000, "<True/>"));
}

Outcome DeepCompoundPredicate() {
  const std::string deep = Nested("<CompoundPredicate booleanOperator=\"or\">",
                                  "</CompoundPredicate>", 100000, "<True/><False/>");
  Outcome outcome;
  ExpectPredicateRefused(outcome, deep);
  TreeParts parts;
  parts.nodes = "<Node score=\"A\"><True/><Node score=\"B\">" + deep + "</Node></Node>";
  ExpectFactoryRefuses(outcome, TreeDocument(parts));
  // Within the depth limit the same nesting is read and placed correctly.
  const std::string allowed = Nested("<CompoundPredicate booleanOperator=\"and\">",
                                     "</CompoundPredicate>", 900,
                                     "<True/><SimplePredicate field=\"x\" operator=\"lessThan\" "
                                     "value=\"5\"/>");
  const auto predicate = GetPredicate(allowed);
  outcome.Add(std::string("900 deep: GetPredicate ") + (predicate ? "a predicate" : "null"),
              predicate != nullptr);
  parts.nodes = R"(<Node score="B"><True/><Node score="A">)" + allowed +
                R"(</Node><Node score="B"><True/></Node></Node>)";
  ExpectScores(outcome, "900 deep in a TreeModel", TreeDocument(parts));
  return outcome;
}

// A category value of 50 MB, refused while the document is read (each call reads the
// whole 50 MB first, about half a second).
std::string HugeCategoryDocument() {
  TreeParts parts;
  parts.dictionary = std::string(kDictionary);
  parts.dictionary.replace(parts.dictionary.find("\"b\""), 3,
                           "\"" + std::string(50u << 20, 'v') + "\"");
  return TreeDocument(parts);
}

Outcome HugeAttribute() {
  Outcome outcome;
  ExpectFactoryRefuses(outcome, HugeCategoryDocument());
  ExpectPredicateRefused(outcome, "<SimplePredicate field=\"c\" operator=\"equal\" value=\"" +
                                      std::string(50u << 20, 'v') + "\"/>");
  return outcome;
}

Outcome HugeAttributeServices() {
  Outcome outcome;
  ExpectVarListRefuses(outcome, HugeCategoryDocument());
  ExpectTransformRefuses(outcome, HugeCategoryDocument());
  return outcome;
}

Outcome HugeText() {
  // The same 50 MB as element text (an Annotation): read, and the model scores.
  TreeParts parts;
  parts.header = "<Header><Annotation>" + std::string(50u << 20, 'v') + "</Annotation></Header>";
  Outcome outcome;
  ExpectScores(outcome, "factory", TreeDocument(parts));
  return outcome;
}

Outcome InvalidUtf8() {
  TreeParts parts;
  parts.header = "<Header copyright=\"bad \xff\xfe byte\"/>";
  Outcome outcome = RefusedEverywhere(
      TreeDocument(parts), "<SimplePredicate field=\"c\" operator=\"equal\" value=\"\xc3\x28\"/>");
  // Overlong form and an unpaired surrogate in element text.
  parts.header = "<Header><Annotation>\xc0\xaf \xed\xa0\x80</Annotation></Header>";
  ExpectFactoryRefuses(outcome, TreeDocument(parts));
  // In a data value: no category matches, the tree falls to its default.
  const Created created = Create(TreeDocument());
  if (created.model) {
    // Not one of the categories: the record is invalid (status 261001), as for any
    // unknown category.
    const std::string p = Predict(*created.model, 3.0, Value("\xff\xfe"));
    outcome.Add("data value: " + p, p == "status 261001");
  }
  return outcome;
}

std::string ToUtf16(const std::string& ascii, bool bigEndian) {
  std::string out = bigEndian ? "\xfe\xff" : "\xff\xfe";
  for (char c : ascii) {
    if (bigEndian) out += '\0';
    out += c;
    if (!bigEndian) out += '\0';
  }
  return out;
}

Outcome Utf16Document() {
  TreeParts parts;
  parts.prolog = "<?xml version=\"1.0\" encoding=\"UTF-16\"?>\n";
  const std::string document = TreeDocument(parts);
  Outcome outcome;
  ExpectScores(outcome, "UTF-16LE", ToUtf16(document, false));
  ExpectScores(outcome, "UTF-16BE", ToUtf16(document, true));
  const auto predicate = GetPredicate(ToUtf16("<True/>", false));
  outcome.Add(std::string("GetPredicate: ") + (predicate ? "True" : "null"),
              predicate != nullptr);
  const Filled filled = FillVarList(ToUtf16(document, false));
  outcome.Add("FillVarList: " + std::to_string(filled.count) + " fields",
              filled.status == 0 && filled.count == 3);
  // Declared UTF-16 but written in ASCII without a byte-order mark: read by what the
  // bytes are (the text is the same), or refused.
  const Created mislabelled = Create(document);
  const std::string p = mislabelled.model ? Predict(*mislabelled.model, 3.0) + "/" +
                                                Predict(*mislabelled.model, 7.0)
                                          : "null " + std::to_string(mislabelled.status);
  outcome.Add("mislabelled: " + p, p == "A/B" || (!mislabelled.model && mislabelled.status != 0));
  return outcome;
}

Outcome TruncatedDocument() {
  const std::string document = TreeDocument();
  const size_t end = document.rfind("</PMML>");
  int refused = 0, created = 0, cuts = 0;
  long firstStatus = 0;
  for (int i = 0; i < 64; ++i) {
    const size_t cut = end * i / 64 + 1;
    ++cuts;
    const Created result = Create(document.substr(0, cut));
    if (result.model) {
      ++created;
    } else if (result.status != 0) {
      ++refused;
      if (firstStatus == 0) firstStatus = result.status;
    }
  }
  Outcome outcome;
  outcome.Add("factory: " + std::to_string(refused) + " of " + std::to_string(cuts) +
                  " cuts null with a status (" + Shorten(Code(firstStatus), 50) + ")",
              refused == cuts && created == 0);
  ExpectPredicateRefused(outcome, "<CompoundPredicate booleanOperator=\"and\"><True/>");
  ExpectVarListRefuses(outcome, document.substr(0, document.find("</DataDictionary>")));
  ExpectTransformRefuses(outcome, TransformDocument("", "<Constant>1</Constant>").substr(0, 200));
  return outcome;
}

const char* const kNumberTexts[] = {"1e400", "-1e400", "-0", "NaN", "inf", "-INF", "1e-400"};

// Number texts refused wherever a number is read; 1e400 is infinity, 1e-400 and -0 zero.
bool RefusedNumber(const std::string& text) {
  return text == "NaN" || text == "inf" || text == "-INF";
}

bool Infinite(const std::string& text) { return text == "1e400" || text == "-1e400"; }

Outcome NumbersInIntervals() {
  Outcome outcome;
  for (const char* text : kNumberTexts) {
    TreeParts parts;
    parts.dictionary = std::string(kDictionary);
    parts.dictionary.replace(
        parts.dictionary.find("dataType=\"double\"/>"), 19,
        std::string("dataType=\"double\"><Interval closure=\"closedClosed\" leftMargin=\"") +
            text + "\" rightMargin=\"10\"/></DataField>");
    const Filled filled = FillVarList(TreeDocument(parts));
    const Created created = Create(TreeDocument(parts));
    std::string part = std::string(text) + ": FillVarList " + std::to_string(filled.status);
    bool good;
    if (RefusedNumber(text)) {
      part += created.model ? ", a model" : ", null " + std::to_string(created.status);
      good = filled.status != 0 && !created.model;
    } else {
      // [1e400, 10] holds no number: x = 3 is invalid (status 261001); the other
      // intervals hold 3.
      const std::string p = created.model ? Predict(*created.model, 3.0) : "no model";
      part += ", x=3 scores " + p;
      good = filled.status == 0 &&
             p == (std::string(text) == "1e400" ? "status 261001" : "A");
    }
    outcome.Add(part, good);
  }
  return outcome;
}

Outcome NumbersInPredicates() {
  Outcome outcome;
  for (const char* text : kNumberTexts) {
    TreeParts parts;
    parts.nodes = std::string(R"(<Node score="B"><True/><Node score="A">
        <SimplePredicate field="x" operator="lessThan" value=")") +
                  text + R"("/></Node><Node score="B"><True/></Node></Node>)";
    const Created created = Create(TreeDocument(parts));
    const auto predicate = GetPredicate(
        std::string("<SimplePredicate field=\"x\" operator=\"lessThan\" value=\"") + text + "\"/>");
    std::string part = std::string(text) + ": GetPredicate " + (predicate ? "ok" : "null");
    bool good;
    // A comparison with infinity is refused too: infinite range ends are open.
    if (RefusedNumber(text) || Infinite(text)) {
      part += created.model ? ", a model" : ", null " + std::to_string(created.status);
      good = !created.model && !predicate;
    } else {
      // x < 0 is false for x = 0 and x = 7.
      const std::string zero = created.model ? Predict(*created.model, 0.0) : "no model";
      const std::string seven = created.model ? Predict(*created.model, 7.0) : "no model";
      part += ", x=0/7 scores " + zero + "/" + seven;
      good = predicate != nullptr && zero == "B" && seven == "B";
    }
    outcome.Add(part, good);
  }
  return outcome;
}

Outcome NumbersInConstants() {
  Outcome outcome;
  for (const char* text : kNumberTexts) {
    const Loaded loaded = LoadTransformations(
        TransformDocument("", std::string("<Constant dataType=\"double\">") + text + "</Constant>"));
    std::string part = std::string(text) + ": ";
    bool good;
    if (loaded.status != 0) {
      part += "AddPMML " + std::to_string(loaded.status);
      good = true;
    } else {
      ValueRecord record;
      record.Add("x", 1.0);
      const long status = loaded.engine->Transform(record).GetErrorCode();
      const Value d = record.Get("d");
      const double v = d.GetReal();
      part += status != 0 ? "Transform " + std::to_string(status)
                          : (d.IsMissing() ? std::string("missing") : d.GetString());
      const std::string t = text;
      if (t == "1e400" || t == "inf") {
        good = v == std::numeric_limits<double>::infinity();
      } else if (t == "-1e400" || t == "-INF") {
        good = v == -std::numeric_limits<double>::infinity();
      } else if (t == "-0" || t == "1e-400") {
        good = !d.IsMissing() && v == 0.0;
      } else {
        good = d.IsMissing();  // NaN
      }
    }
    outcome.Add(part, good);
  }
  return outcome;
}

Outcome NumbersInData() {
  Outcome outcome;
  const Created created = Create(TreeDocument());
  if (!created.model) {
    outcome.Add("factory: null", false);
    return outcome;
  }
  // As text (a host's string value), as a double, and through qzscore's cell reading.
  for (const char* text : kNumberTexts) {
    const double number = Value::TextToReal(text);
    const std::string asText = Predict(*created.model, Value(text));
    const std::string asNumber = Predict(*created.model, Value(number));
    Value cell;
    const bool isNumber = qzscore::ConvertCell(text, true, {}, cell);
    const std::string t = text;
    // Infinite ends of ranges are open, so an infinite value satisfies no comparison and
    // the tree gives no prediction (as for a missing value). NaN is missing as a double;
    // as text it is no number, and so an invalid value (261001).
    std::string expected = "missing";
    if (t == "-0" || t == "1e-400") expected = "A";
    const std::string expectedText = t == "NaN" ? "status 261001" : expected;
    outcome.Add(t + ": " + asText + "/" + asNumber + (isNumber ? "" : ", CSV cell not a number"),
                asText == expectedText && asNumber == expected && isNumber == (t != "NaN"));
  }
  const std::string nan = Predict(*created.model, Value(std::nan("")));
  outcome.Add("NaN double: " + nan, nan == "missing");
  return outcome;
}

Outcome HugeArrayCount() {
  Outcome outcome;
  for (const char* n : {"2000000000", "99999999999999999999", "-1"}) {
    const std::string set = std::string(R"(<SimpleSetPredicate field="c" booleanOperator="isIn">)"
                                        R"(<Array n=")") +
                            n + R"(" type="string">r g</Array></SimpleSetPredicate>)";
    TreeParts parts;
    parts.nodes = R"(<Node score="A"><True/><Node score="B">)" + set +
                  R"(</Node><Node score="A"><True/></Node></Node>)";
    const auto predicate = GetPredicate(set);
    const Created created = Create(TreeDocument(parts));
    outcome.Add(std::string("n=") + n + ": GetPredicate " + (predicate ? "a predicate" : "null") +
                    ", factory " +
                    (created.model ? "a model" : "null " + std::to_string(created.status)),
                !predicate && !created.model && created.status != 0);
  }
  return outcome;
}

// A stream buffer that yields a prefix, then n copies of one character, then a suffix,
// without holding the text.
class RepeatBuffer : public std::streambuf {
 public:
  RepeatBuffer(std::string prefix, char fill, size_t count, std::string suffix)
      : prefix_(std::move(prefix)), suffix_(std::move(suffix)), chunk_(1 << 16, fill),
        left_(count) {
    setg(prefix_.data(), prefix_.data(), prefix_.data() + prefix_.size());
  }

 protected:
  int_type underflow() override {
    if (gptr() < egptr()) return traits_type::to_int_type(*gptr());
    if (left_ > 0) {
      const size_t n = std::min(left_, chunk_.size());
      left_ -= n;
      setg(chunk_.data(), chunk_.data(), chunk_.data() + n);
    } else if (!suffixDone_) {
      suffixDone_ = true;
      setg(suffix_.data(), suffix_.data(), suffix_.data() + suffix_.size());
    } else {
      return traits_type::eof();
    }
    return gptr() < egptr() ? traits_type::to_int_type(*gptr()) : underflow();
  }

 private:
  std::string prefix_, suffix_, chunk_;
  size_t left_;
  bool suffixDone_ = false;
};

Outcome HugeCsvLine() {
  Outcome outcome;
  const size_t size = size_t{100} << 20;
  struct Case {
    const char* label;
    std::string prefix;
    std::string suffix;
  };
  const Case cases[] = {{"plain", "x,c\n", "\n1,r\n"},
                        {"quoted", "x,c\n\"", "\"\n1,r\n"},
                        {"unterminated quote", "x,c\n1,\"", ""}};
  for (const Case& c : cases) {
    RepeatBuffer buffer(c.prefix, 'a', size, c.suffix);
    std::istream in(&buffer);
    qzscore::CsvReader reader(in);
    std::vector<std::string> fields;
    const auto header = reader.Next(fields);
    const auto line = reader.Next(fields);
    const bool failed = header == qzscore::CsvReader::Result::kRecord &&
                        line == qzscore::CsvReader::Result::kError;
    outcome.Add(std::string(c.label) + ": " +
                    (failed ? "error \"" + Shorten(reader.GetError(), 45) + "\""
                            : std::string("no error")),
                failed);
  }
  return outcome;
}

std::string Attributes(int count) {
  std::string attributes;
  for (int i = 0; i < count; ++i) attributes += " a" + std::to_string(i) + "=\"1\"";
  return attributes;
}

Outcome ManyAttributes() {
  const std::string attributes = Attributes(100000);
  TreeParts parts;
  parts.header = "<Header" + attributes + "/>";
  Outcome outcome;
  ExpectFactoryRefuses(outcome, TreeDocument(parts));
  ExpectPredicateRefused(outcome, "<True" + attributes + "/>");
  ExpectVarListRefuses(outcome, TreeDocument(parts));
  ExpectTransformRefuses(outcome, TreeDocument(parts));
  // A duplicate attribute is a malformed document.
  parts.header = "<Header a1=\"1\" b=\"2\" a1=\"3\"/>";
  ExpectFactoryRefuses(outcome, TreeDocument(parts));
  return outcome;
}

Outcome AttributesAtLimit() {
  // 10,000 elements with 100 attributes each (a 10 MB document): read, and the model
  // scores.
  std::string many;
  const std::string full = Attributes(100);
  for (int i = 0; i < 10000; ++i) many += "<Extension" + full + "/>";
  TreeParts parts;
  parts.header = "<Header>" + many + "</Header>";
  Outcome outcome;
  ExpectScores(outcome, "factory", TreeDocument(parts));
  return outcome;
}

Outcome DeepSegmentation() {
  // MiningModels nested through Segments as deep as the element limit allows, each
  // segment selecting with a True predicate; the innermost is the two-leaf tree.
  const int depth = 240;
  const std::string schema = R"(<MiningSchema><MiningField name="y" usageType="predicted"/>
      <MiningField name="x"/><MiningField name="c"/></MiningSchema>)";
  const std::string open = R"(<MiningModel functionName="classification">)" + schema +
                           R"(<Segmentation multipleModelMethod="selectFirst"><Segment><True/>)";
  const std::string close = "</Segment></Segmentation></MiningModel>";
  const std::string tree = R"(<TreeModel functionName="classification"
      missingValueStrategy="none" noTrueChildStrategy="returnNullPrediction">)" +
                           schema + kTwoLeaves + "</TreeModel>";
  Outcome outcome;
  const std::string document = std::string("<PMML version=\"4.1\">") + kDictionary +
                               Nested(open, close, depth, tree) + "</PMML>";
  const Created created = Create(document);
  if (!created.model) {
    outcome.Add(std::to_string(depth) + " deep: null, " + Shorten(Code(created.status), 60),
                created.status != 0);
  } else {
    const std::string low = Predict(*created.model, 3.0);
    const std::string high = Predict(*created.model, 7.0);
    outcome.Add(std::to_string(depth) + " deep: scores " + low + "/" + high,
                low == "A" && high == "B");
  }
  const std::string deeper = std::string("<PMML version=\"4.1\">") + kDictionary +
                             Nested(open, close, 400, tree) + "</PMML>";
  ExpectFactoryRefuses(outcome, deeper);
  return outcome;
}

Outcome RegexBacktracking() {
  // Patterns that take exponential time in a backtracking matcher, on 4,001 characters
  // that never match. matches gives 0 (through if, as a number); replace gives the
  // text back, which a double field reads as missing.
  Outcome outcome;
  const std::string text(4000, 'a');
  struct Case {
    const char* function;
    const char* pattern;
  };
  for (const Case& c : {Case{"matches", "(a+)+$"}, Case{"matches", "(a|aa)*c"},
                        Case{"matches", "^(a?){25}a{25}$"}, Case{"replace", "(a*)*b"}}) {
    const bool replace = std::string(c.function) == "replace";
    const std::string call = std::string("<Apply function=\"") + c.function +
                             "\"><FieldRef field=\"s\"/><Constant>" + c.pattern + "</Constant>" +
                             (replace ? "<Constant>z</Constant>" : "") + "</Apply>";
    const Loaded loaded = LoadTransformations(TransformDocument(
        "", replace ? call
                    : "<Apply function=\"if\">" + call +
                          "<Constant>1</Constant><Constant>0</Constant></Apply>"));
    std::string part = std::string(c.function) + " " + c.pattern + " on " +
                       std::to_string(text.size() + 1) + " chars: ";
    if (loaded.status != 0) {
      outcome.Add(part + "AddPMML " + std::to_string(loaded.status), true);
      continue;
    }
    ValueRecord record;
    record.Add("x", 1.0);
    record.Add("s", text + "!");
    const long status = loaded.engine->Transform(record).GetErrorCode();
    const Value d = record.Get("d");
    part += status != 0 ? "Transform " + std::to_string(status)
                        : (d.IsMissing() || d.IsNull() ? std::string("missing") : d.GetString());
    const bool good = status != 0 || (replace ? d.IsMissing() || d.IsNull() : d.GetReal() == 0.0);
    outcome.Add(part, good);
  }
  return outcome;
}

Outcome ExponentialFunctions() {
  // 2^60 calls for f60 if every call is computed, 60 nested levels.
  const int levels = 60;
  const std::string functions = qztest::DoublingFunctions(levels);
  const Loaded loaded = LoadTransformations(TransformDocument(
      functions, "<Apply function=\"f" + std::to_string(levels) +
                     "\"><FieldRef field=\"x\"/></Apply>"));
  Outcome outcome;
  if (loaded.status != 0) {
    outcome.Add("AddPMML " + std::to_string(loaded.status) + " (" + Shorten(loaded.error, 80) + ")",
                true);
    return outcome;
  }
  ValueRecord record;
  record.Add("x", 1.0);
  const long status = loaded.engine->Transform(record).GetErrorCode();
  const double expected = std::ldexp(2.0, levels);  // (1 + 1) * 2^60
  const Value d = record.Get("d");
  outcome.Add("Transform " + std::to_string(status) + ", d = " + d.GetString(),
              status != 0 || d.GetReal() == expected);
  return outcome;
}

Outcome FormatWidth() {
  Outcome outcome;
  for (const char* pattern : {"%999999999d", "%.2000000000f", "%2147483648s"}) {
    const Loaded loaded = LoadTransformations(
        TransformDocument("", std::string("<Apply function=\"formatNumber\"><FieldRef "
                                          "field=\"x\"/><Constant>") +
                                  pattern + "</Constant></Apply>"));
    std::string part = std::string(pattern) + ": ";
    if (loaded.status != 0) {
      outcome.Add(part + "AddPMML " + std::to_string(loaded.status), true);
      continue;
    }
    ValueRecord record;
    record.Add("x", 1.0);
    const long status = loaded.engine->Transform(record).GetErrorCode();
    const Value d = record.Get("d");
    outcome.Add(part + "Transform " + std::to_string(status) + ", " +
                    std::to_string(d.GetString().size()) + " chars",
                status != 0 || d.GetString().size() < 1000);
  }
  return outcome;
}

// ---------------------------------------------------------------------------------------
// Running attacks in children.

struct Attack {
  const char* name;
  const char* entry;
  std::function<Outcome()> run;
};

std::vector<Attack> Attacks() {
  return {
      {"billion laughs (10^9 expansions)", kAllXml, BillionLaughs},
      {"quadratic blow-up (100 KB entity x 30,000)", kAllXml, QuadraticBlowUp},
      {"external entity file:///etc/passwd (general, parameter)", kAllXml, ExternalEntityFile},
      {"external DTD (loopback http, file)", kAllXml, ExternalDtd},
      {"xsi:schemaLocation on loopback (valid document)",
       "CreateScoringModel, GetPredicate, FillVarList", SchemaLocation},
      {"200,000 nested elements", kAllXml, NestedElements},
      {"CompoundPredicate nested 100,000 deep", "GetPredicate, CreateScoringModel (TreeModel)",
       DeepCompoundPredicate},
      {"50 MB attribute value", "CreateScoringModel, GetPredicate", HugeAttribute},
      {"50 MB attribute value", "FillVarList, AddPMML", HugeAttributeServices},
      {"50 MB of element text (valid document)", "CreateScoringModel, Score", HugeText},
      {"invalid UTF-8 (attribute, text, data value)", kAllXml, InvalidUtf8},
      {"UTF-16 document (LE, BE; mislabelled UTF-8)", "CreateScoringModel, GetPredicate, FillVarList",
       Utf16Document},
      {"truncated document (64 cut points)", kAllXml, TruncatedDocument},
      {"numbers in DataField Interval (1e400 -1e400 -0 NaN inf -INF 1e-400)",
       "FillVarList, CreateScoringModel, Score", NumbersInIntervals},
      {"numbers in SimplePredicate value", "GetPredicate, CreateScoringModel, Score",
       NumbersInPredicates},
      {"numbers in Constant", "AddPMML, Transform", NumbersInConstants},
      {"numbers as data values (text, double, CSV cell)", "Score, qzscore ConvertCell",
       NumbersInData},
      {"Array n=\"2000000000\" (also 10^20, -1)", "GetPredicate, CreateScoringModel",
       HugeArrayCount},
      {"100 MB CSV line (plain, quoted, unterminated)", "qzscore CsvReader", HugeCsvLine},
      {"100,000 attributes on one element (and a duplicate)", kAllXml, ManyAttributes},
      {"10,000 elements of 100 attributes each (valid document, 10 MB)",
       "CreateScoringModel, Score", AttributesAtLimit},
      {"MiningModel segments nested 240 and 400 deep", "CreateScoringModel, Score",
       DeepSegmentation},
      {"regular expressions built to backtrack", "AddPMML, Transform", RegexBacktracking},
      {"DefineFunctions calling each other twice, 60 levels (2^60 calls)", "AddPMML, Transform",
       ExponentialFunctions},
      {"formatNumber with a width of 10^9", "AddPMML, Transform", FormatWidth},
  };
}

struct Row {
  std::string got;
  double seconds = 0;     // wall time
  double cpuSeconds = 0;  // user and system time
  long peakKiB = 0;
  bool ok = false;
  std::string verdict;
};

// Runs the attack in a child, reading its outcome through a pipe: a status byte ('1'
// for ok, '0' otherwise) followed by the text of what the caller got.
Row RunInChild(const Attack& attack, int listener) {
  Row row;
  int pipeFds[2];
  if (pipe(pipeFds) != 0) {
    row.verdict = "FAIL: no pipe";
    return row;
  }
  std::cout.flush();
  std::cerr.flush();
  const auto start = std::chrono::steady_clock::now();
  const pid_t pid = fork();
  if (pid == 0) {
    close(pipeFds[0]);
    if (!kSanitized) {
      rlimit limit{kChildAddressSpace, kChildAddressSpace};
      setrlimit(RLIMIT_AS, &limit);
    }
    std::string message;
    try {
      const Outcome outcome = attack.run();
      message = (outcome.ok ? "1" : "0") + outcome.got;
    } catch (const std::exception& e) {
      message = std::string("0exception escaped: ") + e.what();
    } catch (...) {
      message = "0exception escaped";
    }
    size_t written = 0;
    while (written < message.size()) {
      const ssize_t n = write(pipeFds[1], message.data() + written, message.size() - written);
      if (n <= 0) break;
      written += static_cast<size_t>(n);
    }
    _exit(0);
  }
  close(pipeFds[1]);
  if (pid < 0) {
    close(pipeFds[0]);
    row.verdict = "FAIL: no fork";
    return row;
  }
  std::string message;
  bool killed = false;
  char buffer[4096];
  for (;;) {
    const double elapsed =
        std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    if (elapsed >= kKillAfter) {
      kill(pid, SIGKILL);
      killed = true;
      break;
    }
    pollfd fd{pipeFds[0], POLLIN, 0};
    const int ready = poll(&fd, 1, static_cast<int>((kKillAfter - elapsed) * 1000) + 1);
    if (ready < 0 && errno == EINTR) continue;
    if (ready <= 0) continue;
    const ssize_t n = read(pipeFds[0], buffer, sizeof buffer);
    if (n <= 0) break;  // the child closed the pipe: it is done
    message.append(buffer, static_cast<size_t>(n));
  }
  close(pipeFds[0]);
  int status = 0;
  rusage usage{};
  while (wait4(pid, &status, 0, &usage) < 0 && errno == EINTR) {
  }
  row.seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
  row.peakKiB = usage.ru_maxrss;
  row.cpuSeconds = static_cast<double>(usage.ru_utime.tv_sec + usage.ru_stime.tv_sec) +
                   static_cast<double>(usage.ru_utime.tv_usec + usage.ru_stime.tv_usec) / 1e6;

  // Any connection to the loopback listener is a fetch the document asked for.
  int connections = 0;
  for (;;) {
    const int client = accept(listener, nullptr, nullptr);
    if (client < 0) break;
    ++connections;
    close(client);
  }

  std::vector<std::string> problems;
  if (killed) {
    problems.push_back("killed after " + std::to_string(static_cast<int>(kKillAfter)) + " s");
  } else if (WIFSIGNALED(status)) {
    problems.push_back(std::string("crashed: ") + strsignal(WTERMSIG(status)));
  } else if (!WIFEXITED(status) || WEXITSTATUS(status) != 0 || message.empty()) {
    problems.push_back("child failed");
  }
  if (!message.empty()) {
    row.got = message.substr(1);
    if (message[0] != '1') problems.push_back("unclear or wrong result");
  }
  if (row.cpuSeconds > kTimeBound) problems.push_back("over time");
  if (row.peakKiB > kMemoryBoundKiB) problems.push_back("over memory");
  if (connections > 0) problems.push_back(std::to_string(connections) + " loopback connection(s)");
  row.ok = problems.empty();
  if (row.ok) {
    row.verdict = "ok";
  } else {
    row.verdict = "**FAIL**:";
    for (const std::string& p : problems) row.verdict += " " + p + ";";
    row.verdict.pop_back();
  }
  return row;
}

int OpenListener() {
  const int fd = socket(AF_INET, SOCK_STREAM | SOCK_NONBLOCK, 0);
  if (fd < 0) return -1;
  sockaddr_in address{};
  address.sin_family = AF_INET;
  address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
  address.sin_port = 0;
  socklen_t length = sizeof address;
  if (bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof address) != 0 || listen(fd, 16) != 0 ||
      getsockname(fd, reinterpret_cast<sockaddr*>(&address), &length) != 0) {
    close(fd);
    return -1;
  }
  gPort = ntohs(address.sin_port);
  return fd;
}

// Whether a connection to the listener shows up where RunInChild looks for one (so that
// "no connection" means something).
bool ListenerSeesConnections(int listener) {
  const int client = socket(AF_INET, SOCK_STREAM, 0);
  if (client < 0) return false;
  sockaddr_in address{};
  address.sin_family = AF_INET;
  address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
  address.sin_port = htons(static_cast<uint16_t>(gPort));
  const bool connected = connect(client, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0;
  close(client);
  bool seen = false;
  for (int attempt = 0; connected && !seen && attempt < 100; ++attempt) {
    const int accepted = accept(listener, nullptr, nullptr);
    if (accepted >= 0) {
      seen = true;
      close(accepted);
    } else {
      usleep(1000);
    }
  }
  return seen;
}

std::string FormatSeconds(double s) {
  char text[32];
  std::snprintf(text, sizeof text, s < 0.01 ? "%.3f s" : "%.2f s", s);
  return text;
}

std::string FormatMemory(long kib) {
  char text[32];
  std::snprintf(text, sizeof text, "%.0f MiB", static_cast<double>(kib) / 1024.0);
  return text;
}

}  // namespace

int main(int argc, char** argv) {
  bool check = false;
  std::string only;
  for (int i = 1; i < argc; ++i) {
    const std::string arg = argv[i];
    if (arg == "--check") {
      check = true;
    } else if (arg == "--only" && i + 1 < argc) {
      only = argv[++i];
    } else {
      std::cerr << "usage: robustness [--check] [--only TEXT]\n";
      return 2;
    }
  }
  signal(SIGPIPE, SIG_IGN);
  const int listener = OpenListener();
  if (listener < 0) {
    std::cerr << "robustness: cannot listen on 127.0.0.1\n";
    return 2;
  }
  if (!ListenerSeesConnections(listener)) {
    std::cerr << "robustness: the loopback listener does not see connections\n";
    return 2;
  }
  xercesc::XMLPlatformUtils::Initialize();

  std::cout << "| attack | entry points | what the caller gets | time (CPU) | wall time | "
               "peak memory | verdict |\n"
               "|---|---|---|---:|---:|---:|---|\n";
  int failed = 0, run = 0;
  for (const Attack& attack : Attacks()) {
    if (!only.empty() && std::string(attack.name).find(only) == std::string::npos) continue;
    ++run;
    const Row row = RunInChild(attack, listener);
    if (!row.ok) ++failed;
    std::cout << "| " << attack.name << " | " << attack.entry << " | "
              << Cell(Shorten(row.got, 100000)) << " | " << FormatSeconds(row.cpuSeconds) << " | "
              << FormatSeconds(row.seconds) << " | "
              << FormatMemory(row.peakKiB) << " | " << row.verdict << " |" << std::endl;
  }
  std::cout << "\n" << run - failed << " of " << run << " attacks within bounds ("
            << kTimeBound << " s of CPU time, " << kMemoryBoundKiB / 1024 << " MiB"
            << (kSanitized ? ", sanitized build" : "") << ").\n";
  xercesc::XMLPlatformUtils::Terminate();
  close(listener);
  return check && failed > 0 ? 1 : 0;
}

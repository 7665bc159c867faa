// Ensembles of random shallow trees against the same trees scored alone. A MiningModel
// decodes one row per record and walks its shallow trees side by side (or adds their
// scores directly); a TreeModel document of its own always takes the full walk. Over
// every record of a grid (numbers on each threshold, infinities, declared missing,
// null and absent values, a number as text, every category and an unknown one) the
// ensemble must give the combination of the standalone predictions.

#include <algorithm>
#include <cmath>
#include <limits>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "ScoringModel.h"
#include "Value.h"
#include "ValueRecord.h"
#include "ReferencePlugins.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringModel;

namespace {

constexpr double kInf = std::numeric_limits<double>::infinity();
constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
const char* const kCategories[] = {"red", "green", "blue"};
const char* const kTargets[] = {"A", "B", "C"};
// Where a tree's MiningSchema fields go (the standalone and the segment form differ).
const char kSchema[] = "@SCHEMA@";

// Random trees over x1, x2 (continuous; x1 declares -999 missing) and c (red, green,
// blue), with thresholds from a small set that the records hit exactly.
class Forest {
 public:
  // Dense trees predict nearly always: every root holds, one node in forty has no
  // score, a node without a true child decides, no missing value ends the walk without
  // a prediction. Otherwise one node in five has no score and any strategy applies.
  Forest(unsigned seed, bool dense) : rng_(seed), dense_(dense) {}

  // A TreeModel whose walks make at most `maxSteps` tests (a node's k-th child, from
  // 1, takes k tests after its parent).
  std::string Tree(bool classification, int maxSteps = 8, const std::string& targets = "") {
    static const char* const kStrategies[] = {"none", "nullPrediction", "lastPrediction",
                                              "defaultChild"};
    const unsigned strategy = Pick(4);
    const bool last = dense_ || Pick(4) != 0;
    int id = 0;
    deepest_ = 0;
    const std::string nodes = Node(classification, 1, maxSteps, &id);
    return std::string("<TreeModel functionName=\"") +
           (classification ? "classification" : "regression") + "\" missingValueStrategy=\"" +
           kStrategies[dense_ && strategy == 1 ? 0 : strategy] + "\" noTrueChildStrategy=\"" +
           (last ? "returnLastPrediction" : "returnNullPrediction") +
           "\"><MiningSchema><MiningField name=\"y\" usageType=\"predicted\"/>" + kSchema +
           "</MiningSchema>" + targets + nodes + "</TreeModel>";
  }
  // A tree too deep for the side-by-side walk.
  std::string Deep(bool classification) {
    std::string tree;
    do {
      tree = Tree(classification, 14);
    } while (deepest_ <= 8);
    return tree;
  }
  unsigned Pick(unsigned n) { return static_cast<unsigned>(rng_() % n); }

 private:
  std::string Predicate() {
    // notEqual applies to categories only: the library refuses it on a number.
    static const char* const kOperators[] = {"lessThan", "lessOrEqual", "greaterThan",
                                             "greaterOrEqual", "equal"};
    // The largest double: x > it holds for infinity alone. (Its negation is the
    // system-missing value.)
    static const char* const kThresholds[] = {"-1", "0", "0.5", "2",  "3",
                                              "-1", "0", "2",   "0.5", "1.7976931348623157e308"};
    const std::string field = Pick(2) != 0 ? "x1" : "x2";
    const unsigned kind = Pick(20);
    if (kind < 10) {
      const std::string op = kOperators[Pick(5)];
      return "<SimplePredicate field=\"" + field + "\" operator=\"" + op + "\" value=\"" +
             kThresholds[Pick(10)] + "\"/>";
    }
    if (kind < 12) {
      const std::string op = Pick(2) != 0 ? "equal" : "notEqual";
      return "<SimplePredicate field=\"c\" operator=\"" + op + "\" value=\"" +
             kCategories[Pick(3)] + "\"/>";
    }
    if (kind < 15) {
      const std::string op = Pick(2) != 0 ? "isIn" : "isNotIn";
      const unsigned first = Pick(3), second = Pick(3);
      std::string array = kCategories[first];
      if (second != first) array += std::string(" ") + kCategories[second];
      return "<SimpleSetPredicate field=\"c\" booleanOperator=\"" + op + "\"><Array n=\"" +
             (second != first ? "2" : "1") + "\" type=\"string\">" + array +
             "</Array></SimpleSetPredicate>";
    }
    if (kind < 18) return "<True/>";
    if (kind < 19) return "<False/>";
    const std::string op = Pick(2) != 0 ? "isMissing" : "isNotMissing";
    return "<SimplePredicate field=\"" + field + "\" operator=\"" + op + "\"/>";
  }
  // The score attribute (or none) and, for some classification nodes, record counts.
  void Outcome(bool classification, bool root, std::string* score, std::string* counts) {
    static const char* const kScores[] = {"-2.5", "-1", "0",    "0.1", "0.2",
                                          "0.3",  "1",  "7.25", "1e6"};
    if (Pick(dense_ ? 40 : root ? 10 : 5) != 0) {
      *score = std::string(" score=\"") +
               (classification ? kTargets[Pick(3)] : kScores[Pick(9)]) + "\"";
    }
    if (!classification || Pick(3) != 0) return;
    for (const char* target : kTargets) {
      *counts += std::string("<ScoreDistribution value=\"") + target + "\" recordCount=\"" +
                 std::to_string(1 + Pick(4)) + "\"/>";
    }
  }
  std::string Node(bool classification, int steps, int maxSteps, int* id) {
    deepest_ = std::max(deepest_, steps);
    const bool root = *id == 0;
    const std::string name = "n" + std::to_string((*id)++);
    const std::string predicate = root && (dense_ || Pick(5) != 0) ? "<True/>" : Predicate();
    std::string score, counts;
    Outcome(classification, root, &score, &counts);
    unsigned children = 0;
    const int room = maxSteps - steps;
    if (room >= 2 && Pick(static_cast<unsigned>(steps) + 1) < 2) {
      children = 2 + Pick(static_cast<unsigned>(std::min(3, room - 1)));
    }
    std::string inner, fallback;
    const unsigned chosen = children > 0 ? Pick(children) : 0;
    for (unsigned k = 0; k < children; ++k) {
      if (k == chosen) fallback = " defaultChild=\"n" + std::to_string(*id) + "\"";
      inner += Node(classification, steps + static_cast<int>(k) + 1, maxSteps, id);
    }
    return "<Node id=\"" + name + "\"" + score + fallback + ">" + predicate + counts + inner +
           "</Node>";
  }

  std::mt19937 rng_;
  bool dense_;
  int deepest_ = 0;
};

// The document around one model: x1, x2, c and the target y.
std::string Document(bool classification, const std::string& model) {
  return std::string(R"(<PMML version="4.4"><DataDictionary>
    <DataField name="x1" optype="continuous" dataType="double">
      <Value value="-999" property="missing"/></DataField>
    <DataField name="x2" optype="continuous" dataType="double"/>
    <DataField name="c" optype="categorical" dataType="string">
      <Value value="red"/><Value value="green"/><Value value="blue"/></DataField>)") +
         (classification ? R"(<DataField name="y" optype="categorical" dataType="string">
      <Value value="A"/><Value value="B"/><Value value="C"/></DataField>)"
                         : R"(<DataField name="y" optype="continuous" dataType="double"/>)") +
         "</DataDictionary>" + model + "</PMML>";
}

// Each field test of a tree wrapped as "test and true": the same answer, from the
// library's predicate itself rather than from the row the trees decode.
std::string Wrapped(const std::string& tree) {
  std::string text;
  size_t from = 0;
  for (size_t at; (at = tree.find("<Simple", from)) != std::string::npos;) {
    const bool set = tree.compare(at, 19, "<SimpleSetPredicate") == 0;
    const size_t end = set ? tree.find("</SimpleSetPredicate>", at) + 21 : tree.find("/>", at) + 2;
    text += tree.substr(from, at - from) + "<CompoundPredicate booleanOperator=\"and\">" +
            tree.substr(at, end - at) + "<True/></CompoundPredicate>";
    from = end;
  }
  return text + tree.substr(from);
}

// One segment: its tree in both forms, its weight and its selector. A tree alone keeps
// an unknown category as it is and tests through its predicates; a segment lists only
// the numbers (its MiningModel checks them), so that it reads the ensemble's row.
struct Member {
  Member(const std::string& tree, double w) : weight(w) {
    const size_t at = tree.find(kSchema), rest = at + sizeof(kSchema) - 1;
    alone = Wrapped(tree.substr(0, at) +
                    R"(<MiningField name="x1"/><MiningField name="x2"/>
                       <MiningField name="c" invalidValueTreatment="asIs"/>)" +
                    tree.substr(rest));
    segment = tree.substr(0, at) + R"(<MiningField name="x1"/><MiningField name="x2"/>)" +
              tree.substr(rest);
  }
  std::string alone, segment;
  double weight;
  std::string selector = "<True/>";
};

struct Ensemble {
  bool classification = false;
  std::string method;
  std::string treatment = "continue";
  double threshold = 1.0;
  std::vector<Member> members;

  // Adds `count` random trees, walks at most `maxSteps` tests, weights 0.25 to 2.
  void Add(Forest& forest, int count, int maxSteps = 8) {
    for (int i = 0; i < count; ++i) {
      const std::string tree = forest.Tree(classification, maxSteps);
      members.emplace_back(tree, 0.25 * (1 + forest.Pick(8)));
    }
  }
  std::string Pmml() const {
    std::string segments;
    for (size_t i = 0; i < members.size(); ++i) {
      segments += "<Segment id=\"s" + std::to_string(i) + "\" weight=\"" +
                  Value(members[i].weight).GetString() + "\">" + members[i].selector +
                  members[i].segment + "</Segment>";
    }
    return Document(classification,
                    std::string("<MiningModel functionName=\"") +
                        (classification ? "classification" : "regression") +
                        R"("><MiningSchema><MiningField name="y" usageType="predicted"/>
          <MiningField name="x1"/><MiningField name="x2"/>
          <MiningField name="c" invalidValueTreatment="asIs"/></MiningSchema>
          <Segmentation multipleModelMethod=")" + method + "\" missingPredictionTreatment=\"" +
                        treatment + "\" missingThreshold=\"" + Value(threshold).GetString() +
                        "\">" + segments + "</Segmentation></MiningModel>");
  }
};

// One value of a field in a record (absent: the field is left out).
struct Cell {
  Value value;
  bool absent = false;
};

// What one model gave for one record.
struct Prediction {
  bool has = false;
  double value = kNaN;
  std::string category;
  double probabilities[3] = {0, 0, 0};
};

Prediction Read(ScoringModel& model, ValueRecord& input, ValueRecord& output,
                bool classification) {
  Prediction p;
  EXPECT_EQ(model.Score(input, output).GetErrorCode(), 0);
  const Value prediction = output.Get("prediction");
  p.has = !prediction.IsNull() && !prediction.IsSystemMissingValue();
  if (!p.has) return p;
  p.value = classification ? kNaN : prediction.GetReal();
  p.category = classification ? prediction.GetString() : "";
  for (int c = 0; c < 3 && classification; ++c) {
    p.probabilities[c] = output.Get(std::string("probability(") + kTargets[c] + ")").GetReal();
  }
  return p;
}

std::string Show(const Prediction& p, bool classification) {
  return !p.has ? "none" : classification ? p.category : Value(p.value).GetString();
}

// The combination of the standalone predictions of the segments `used` (their
// selectors hold): in segment order, weighted for the weighted methods; votes count
// the segments that predict nothing in the share under "continue".
Prediction Combine(const Ensemble& e, const std::vector<Prediction>& alone,
                   const std::vector<bool>& used) {
  const bool weighted = e.method.compare(0, 8, "weighted") == 0;
  const bool voting = e.method.find("ajorityVote") != std::string::npos;
  const Prediction none;
  double usedWeight = 0.0, missing = 0.0, sum = 0.0, total = 0.0;
  std::vector<size_t> contributors;
  for (size_t i = 0; i < alone.size(); ++i) {
    if (!used[i]) continue;
    const double w = weighted ? e.members[i].weight : 1.0;
    usedWeight += w;
    if (alone[i].has) {
      contributors.push_back(i);
      continue;
    }
    missing += w;
    if (e.treatment == "returnMissing" || (e.treatment == "continue" && !voting)) return none;
  }
  // A threshold bounds the missing share; with nothing missing it never applies.
  if ((missing != 0.0 && missing > e.threshold * usedWeight) || contributors.empty()) {
    return none;
  }
  Prediction p;
  if (voting && e.treatment == "continue") total = missing;
  for (size_t i : contributors) {
    const double w = weighted ? e.members[i].weight : 1.0;
    sum += weighted ? w * alone[i].value : alone[i].value;
    total += w;
    for (int c = 0; c < 3; ++c) {
      p.probabilities[c] += voting ? (alone[i].category == kTargets[c] ? w : 0.0)
                                   : w * alone[i].probabilities[c];
    }
  }
  if (!e.classification) {
    if (e.method == "average") sum /= static_cast<double>(contributors.size());
    if (e.method == "weightedAverage") sum = total != 0.0 ? sum / total : kNaN;
    p.value = sum;
    p.has = !std::isnan(sum);
    return p;
  }
  if (total <= 0.0) return none;
  int best = 0;
  for (int c = 0; c < 3; ++c) {
    p.probabilities[c] /= total;
    if (p.probabilities[c] > p.probabilities[best]) best = c;  // first of equals
  }
  p.category = kTargets[best];
  p.has = true;
  return p;
}

bool Same(const Ensemble& e, const Prediction& got, const Prediction& want) {
  if (got.has != want.has) return false;
  if (!want.has) return true;
  if (!e.classification) {
    // Sums and averages add in segment order, as the standalone results were added.
    const bool exact = e.method == "sum" || e.method == "average";
    const double error = std::abs(got.value - want.value);
    return exact ? got.value == want.value : error <= 1e-12 * std::max(1.0, std::abs(want.value));
  }
  bool same = got.category == want.category;
  for (int c = 0; c < 3; ++c) {
    same = same && std::abs(got.probabilities[c] - want.probabilities[c]) <= 1e-12;
  }
  return same;
}

// Scores every record of the grid with the ensemble and with each tree alone (at most
// five disagreements reported per ensemble).
void ExpectAgreement(const Ensemble& e, const std::string& label) {
  std::unique_ptr<ScoringModel> ensemble = qztest::CreateModel(e.Pmml());
  ASSERT_NE(ensemble, nullptr) << label << "\n" << e.Pmml();
  std::vector<std::unique_ptr<ScoringModel>> trees;
  for (const Member& m : e.members) {
    trees.push_back(qztest::CreateModel(Document(e.classification, m.alone)));
    ASSERT_NE(trees.back(), nullptr) << label << "\n" << m.alone;
  }
  ValueRecord output;
  std::vector<ValueRecord> outputs(trees.size());
  ASSERT_TRUE(ensemble->Scorable(output).IsOK());
  for (size_t i = 0; i < trees.size(); ++i) ASSERT_TRUE(trees[i]->Scorable(outputs[i]).IsOK());

  std::vector<Cell> numbers, categories;
  for (double x : {-1.0, 0.0, -0.0, 0.5, 2.0, 3.0, 1.25, 10.0, kInf, -kInf, -999.0,
                   std::numeric_limits<double>::max(), kNaN /* system-missing */}) {
    numbers.push_back({Value(x)});
  }
  numbers.push_back({Value(std::string("0.5"))});  // a number as text
  for (const char* c : {"red", "green", "blue", "purple"}) categories.push_back({Value(c)});
  for (std::vector<Cell>* cells : {&numbers, &categories}) {
    cells->push_back({Value()});        // null
    cells->push_back({Value(), true});  // absent
  }
  ValueRecord kept;  // the records with every field, changed in place
  for (const char* name : {"x1", "x2", "c"}) kept.Add(name, Value());
  int failures = 0;
  for (const Cell& x1 : numbers) {
    for (const Cell& x2 : numbers) {
      for (const Cell& c : categories) {
        const Cell* cells[] = {&x1, &x2, &c};
        ValueRecord fresh;
        const bool full = !x1.absent && !x2.absent && !c.absent;
        std::string where = label + ":";
        for (size_t f = 0; f < 3; ++f) {
          const std::string name = kept.GetName(f);
          where += " " + name + "=" + (cells[f]->absent ? "(absent)" : cells[f]->value.GetString());
          if (full) kept[f] = cells[f]->value;
          if (!full && !cells[f]->absent) fresh.Add(name, cells[f]->value);
        }
        ValueRecord& input = full ? kept : fresh;
        std::vector<Prediction> alone;
        std::vector<bool> used;
        for (size_t i = 0; i < trees.size(); ++i) {
          alone.push_back(Read(*trees[i], input, outputs[i], e.classification));
          where += "\n  tree " + std::to_string(i) + ": " + Show(alone.back(), e.classification);
          // A selector other than True is x2 > 0, the range (0, infinity) whose infinite
          // end is open; a text counts as its number.
          const Value& x = x2.value;
          used.push_back(e.members[i].selector == "<True/>" ||
                         (!x2.absent && !x.IsNull() && !x.IsSystemMissingValue() &&
                          x.GetReal() > 0.0 && x.GetReal() < kInf));
        }
        const Prediction got = Read(*ensemble, input, output, e.classification);
        const Prediction want = Combine(e, alone, used);
        const bool same = Same(e, got, want);
        EXPECT_TRUE(same) << where << "\n  ensemble: " << Show(got, e.classification)
                          << ", expected " << Show(want, e.classification);
        if (!same && ++failures == 5) return;
      }
    }
  }
}

}  // namespace

// Sums and averages of shallow regression trees (up to eleven, so that the side-by-
// side walk runs more than one group of eight), dense ones that nearly always predict
// and sparse ones that often do not.
TEST(ShallowEnsembles, RegressionCombinationsMatchTheTreesAlone) {
  const struct {
    const char* method;
    const char* treatment;
    double threshold;
    int trees, maxSteps;
    bool dense;
  } cases[] = {
      {"sum", "continue", 1.0, 11, 8, true},
      {"average", "continue", 1.0, 11, 8, true},
      {"weightedSum", "continue", 1.0, 9, 8, true},
      {"weightedAverage", "continue", 1.0, 9, 8, true},
      {"average", "returnMissing", 1.0, 3, 4, true},
      {"sum", "skipSegment", 0.5, 11, 6, false},
      {"weightedAverage", "skipSegment", 0.6, 5, 8, false},
      {"sum", "continue", 1.0, 2, 3, false},
  };
  unsigned seed = 1;
  for (const auto& c : cases) {
    Forest forest(seed++, c.dense);
    Ensemble e;
    e.method = c.method;
    e.treatment = c.treatment;
    e.threshold = c.threshold;
    e.Add(forest, c.trees, c.maxSteps);
    ExpectAgreement(e, std::string(c.method) + "/" + c.treatment + "/" + std::to_string(c.trees));
  }
}

// Votes (the share of the segments, the first category in target order among equals)
// and averaged distributions of shallow classification trees.
TEST(ShallowEnsembles, ClassificationCombinationsMatchTheTreesAlone) {
  const struct {
    const char* method;
    const char* treatment;
    int trees;
    bool dense;
  } cases[] = {
      {"majorityVote", "continue", 11, false},   {"weightedMajorityVote", "continue", 10, false},
      {"majorityVote", "skipSegment", 4, false}, {"average", "skipSegment", 9, false},
      {"weightedAverage", "continue", 5, true},
  };
  unsigned seed = 100;
  for (const auto& c : cases) {
    Forest forest(seed++, c.dense);
    Ensemble e;
    e.classification = true;
    e.method = c.method;
    e.treatment = c.treatment;
    e.Add(forest, c.trees);
    ExpectAgreement(e, std::string(c.method) + "/" + c.treatment);
  }
}

// Segments the fast paths must leave to the full walk, among shallow ones: a tree
// deeper than eight tests, Targets that rescale a segment's score, a selector other
// than True; and negative weights, bounded by missingThreshold or adding up below zero.
TEST(ShallowEnsembles, SegmentsOffTheFastPathAgree) {
  Forest forest(7, true);
  for (bool classification : {false, true}) {
    Ensemble e;
    e.classification = classification;
    e.method = classification ? "majorityVote" : "sum";
    e.Add(forest, 4);
    e.members.insert(e.members.begin() + 1, Member(forest.Deep(classification), 1.0));
    ExpectAgreement(e, e.method + " with a deep tree");
  }
  Ensemble rescaled;
  rescaled.method = "weightedSum";
  rescaled.Add(forest, 4);
  const std::string targets =
      R"(<Targets><Target field="y" rescaleFactor="2" rescaleConstant="1"/></Targets>)";
  rescaled.members.insert(rescaled.members.begin() + 2,
                          Member(forest.Tree(false, 8, targets), 0.5));
  ExpectAgreement(rescaled, "weightedSum with Targets");

  Ensemble selected;
  selected.method = "average";
  selected.treatment = "skipSegment";
  selected.Add(forest, 5);
  selected.members[1].selector =
      R"(<SimplePredicate field="x2" operator="greaterThan" value="0"/>)";
  ExpectAgreement(selected, "average with a selector");

  Ensemble negative;
  negative.method = "weightedSum";
  negative.treatment = "skipSegment";
  negative.threshold = 0.4;
  negative.Add(forest, 4);
  for (double sign : {1.0, -1.0}) {
    const double w[] = {1.5 * sign, -0.5, 2.0 * sign, -0.25};
    for (size_t i = 0; i < 4; ++i) negative.members[i].weight = w[i];
    ExpectAgreement(negative, "weightedSum, weights adding up to " +
                                  Value(w[0] + w[1] + w[2] + w[3]).GetString());
  }
}

// Tests whose result is the same for every plain number still read their field: an
// isMissing or isNotMissing child is no constant when the field is missing. Trees that
// test no field at all (a root that decides) share an empty row.
TEST(ShallowEnsembles, TestsOfMissingValuesAndTreesWithoutFields) {
  const std::string head = std::string(R"(<TreeModel functionName="regression"
      noTrueChildStrategy="returnLastPrediction"><MiningSchema>)") + kSchema + "</MiningSchema>";
  const std::string missingTests = head + R"(<Node score="1"><True/>
      <Node score="2"><SimplePredicate field="x2" operator="isMissing"/></Node>
      <Node score="3"><SimplePredicate field="x1" operator="isNotMissing"/>
        <Node score="4"><SimplePredicate field="c" operator="equal" value="red"/></Node>
      </Node></Node></TreeModel>)";
  const std::string always = head + R"(<Node score="5"><True/></Node></TreeModel>)";
  const std::string never = head + R"(<Node score="6"><False/></Node></TreeModel>)";
  for (const char* method : {"sum", "weightedAverage"}) {
    Ensemble e;
    e.method = method;
    e.members.emplace_back(missingTests, 0.5);
    e.members.emplace_back(always, 2.0);
    ExpectAgreement(e, std::string(method) + " with missing tests");
  }
  Ensemble e;
  e.method = "sum";
  e.treatment = "skipSegment";
  for (const std::string* tree : {&always, &never, &always}) e.members.emplace_back(*tree, 1.0);
  ExpectAgreement(e, "sum of trees without fields");
}

// A scorer plug-in for the dispatch tests, built several times with a different
// behaviour each (chosen by a compile definition):
//   PLUGIN_STREAM       the stream attempt succeeds
//   PLUGIN_DOM          the stream attempt consumes the stream and gives null; the
//                       element attempt succeeds
//   PLUGIN_NULL_PARSER  the entry point returns null
//   PLUGIN_THROWS       both attempts throw
//   PLUGIN_NO_ENTRY     no entry point at all
//   PLUGIN_SETTINGS     the stream attempt gives a scorer whose "prediction" and
//                       "probability" are the model settings "test_prediction" and
//                       "test_probability" at the time of each Score
//   PLUGIN_ECHO         the stream attempt gives a scorer whose "prediction" is the name
//                       of the document's target and whose "probability" echoes the
//                       document's first input field; 78 when that field is missing
//   PLUGIN_FAULTS       a faulty plug-in steered by model settings read at each call:
//                       "test_parser_fault" at creation ("stream-throws": the stream
//                       attempt consumes the stream and throws, the element attempt
//                       succeeds; "both-throw"), "test_fault" at each scorer call (see
//                       FaultyScorer)
//   PLUGIN_ENTRY_THROWS the entry point throws
// The scorer's type text tells the test which attempt made it and what it saw.

#include <iterator>
#include <limits>
#include <stdexcept>
#include <string>

#include "ScoringScoreParser.h"
#include "ScoringStr.h"
#include "Value.h"
#include "ValueRecord.h"

using QZCommon_800::IQZScore;
using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

namespace {

class EchoScorer : public IQZScore {
 public:
  explicit EchoScorer(std::string type) : type_(std::move(type)) {}
  bool IsReady() const override { return true; }
  QZStatus Scorable(ValueRecord& record) override {
    record.Add("prediction", Value());
    return QZStatus();
  }
  QZStatus Score(const ValueRecord& input, ValueRecord& output) override {
    output["prediction"] = input.Get("x").GetReal() * 2;
    return QZStatus();
  }
  std::string GetType() const override { return type_; }

 private:
  std::string type_;
};

class SettingsScorer : public IQZScore {
 public:
  explicit SettingsScorer(QZXML_800::QZSettings& settings) : settings_(settings) {}
  bool IsReady() const override { return true; }
  QZStatus Scorable(ValueRecord& record) override {
    record.Add("prediction", Value());
    record.Add("probability", Value());
    return QZStatus();
  }
  QZStatus Score(const ValueRecord&, ValueRecord& output) override {
    std::string prediction, probability;
    if (!settings_.GetSettingValByName("test_prediction", prediction)) return QZStatus(77, false);
    settings_.GetSettingValByName("test_probability", probability);
    output["prediction"] = prediction;
    output["probability"] = Value(probability).GetReal();
    return QZStatus();
  }
  std::string GetType() const override { return "SETTINGS"; }

 private:
  QZXML_800::QZSettings& settings_;
};

class TargetEchoScorer : public IQZScore {
 public:
  explicit TargetEchoScorer(const QZXML_800::QZVarList& variables) {
    if (const auto* target = variables.GetTargetRespVariable()) target_ = target->GetName();
    for (int i = 0; i < variables.Size() && input_.empty(); ++i) {
      if (variables.GetVarAt(i)->GetRole() == QZXML_800::ROLE_INPUT) {
        input_ = variables.GetVarAt(i)->GetName();
      }
    }
  }
  bool IsReady() const override { return true; }
  QZStatus Scorable(ValueRecord& record) override {
    record.Add("prediction", Value());
    record.Add("probability", Value());
    return QZStatus();
  }
  QZStatus Score(const ValueRecord& input, ValueRecord& output) override {
    const int at = input.IndexOf(input_);
    if (at < 0 || input[static_cast<size_t>(at)].IsMissing()) return QZStatus(78, false);
    output["prediction"] = target_;
    output["probability"] = input[static_cast<size_t>(at)];
    return QZStatus();
  }
  std::string GetType() const override { return "ECHO"; }

 private:
  std::string target_;
  std::string input_;
};

#if defined(PLUGIN_FAULTS)
// Declares "prediction" and "probability" and scores "Y" with probability "x" / 10, unless
// the model setting "test_fault" (read at each call) names a fault:
//   score-throws, score-throws-other   Score throws a std::runtime_error, or an int
//   scorable-throws                    Scorable throws after declaring "prediction"
//   status                             Scorable gives 261777, Score 261778 (own codes)
//   undeclared                         Score also writes "extra" and "note", never declared
//   not-ready                          IsReady is false; the calls work as usual
class FaultyScorer : public IQZScore {
 public:
  FaultyScorer(QZXML_800::QZSettings& settings, std::string type)
      : settings_(settings), type_(std::move(type)) {}
  bool IsReady() const override { return Fault() != "not-ready"; }
  QZStatus Scorable(ValueRecord& record) override {
    const std::string fault = Fault();
    record.Add("prediction", Value());
    if (fault == "scorable-throws") throw std::runtime_error("scorable fault");
    record.Add("probability", Value());
    return fault == "status" ? QZStatus(261777, false) : QZStatus();
  }
  QZStatus Score(const ValueRecord& input, ValueRecord& output) override {
    const std::string fault = Fault();
    output["prediction"] = "Y";
    if (fault == "score-throws") throw std::runtime_error("score fault");
    if (fault == "score-throws-other") throw 7;
    if (fault == "status") return QZStatus(261778, false);
    output["probability"] = input.Get("x").GetReal() / 10;
    if (fault == "undeclared") {
      output["extra"] = input.Get("x").GetReal() + 1;
      output["note"] = "undeclared";
    }
    return QZStatus();
  }
  std::string GetType() const override { return type_; }

 private:
  std::string Fault() const {
    std::string fault;
    settings_.GetSettingValByName("test_fault", fault);
    return fault;
  }

  QZXML_800::QZSettings& settings_;
  std::string type_;
};

std::string ParserFault(const QZXML_800::QZSettings& settings) {
  std::string fault;
  settings.GetSettingValByName("test_parser_fault", fault);
  return fault;
}
#endif

class TestParser : public QZScoring_800::ScoringScoreParser {
 public:
  IQZScore* CreateFromElement(QZXML_800::QZSettings& settings, QZXML_800::QZVarList&,
                              xercesc::DOMDocument* document,
                              xercesc::DOMElement* element) override {
#if defined(PLUGIN_THROWS)
    throw std::runtime_error("element");
#endif
    if (document == nullptr || element == nullptr) return nullptr;
    QZScoring_800::ScoringStr name(element->getTagName());
#if defined(PLUGIN_FAULTS)
    if (ParserFault(settings) == "both-throw") throw std::runtime_error("element");
    return new FaultyScorer(settings, "element:" + name.toUTF8());
#else
    (void)settings;
#endif
    return new EchoScorer("element:" + name.toUTF8());
  }

  IQZScore* CreateFromStream(QZXML_800::QZSettings& settings, QZXML_800::QZVarList& variables,
                             std::istream& pmml) override {
#if defined(PLUGIN_SETTINGS)
    return new SettingsScorer(settings);
#endif
#if defined(PLUGIN_ECHO)
    return new TargetEchoScorer(variables);
#endif
#if defined(PLUGIN_FAULTS)
    if (ParserFault(settings).empty()) return new FaultyScorer(settings, "FAULTY");
    pmml.ignore(std::numeric_limits<std::streamsize>::max());
    throw std::runtime_error("stream");
#endif
    (void)settings;
#if defined(PLUGIN_THROWS)
    throw 42;
#endif
    std::string text((std::istreambuf_iterator<char>(pmml)), std::istreambuf_iterator<char>());
#if defined(PLUGIN_DOM)
    (void)variables;
    return nullptr;
#else
    return new EchoScorer("stream:" + std::to_string(text.size()) + ":" +
                          std::to_string(variables.Size()));
#endif
  }
};

}  // namespace

#if !defined(PLUGIN_NO_ENTRY)
QZSCORING_PLUGIN_EXPORT QZScoring_800::ScoringScoreParser* GetScoreParser() {
#if defined(PLUGIN_NULL_PARSER)
  return nullptr;
#elif defined(PLUGIN_ENTRY_THROWS)
  throw std::runtime_error("no parser today");
#else
  return new TestParser();
#endif
}
#endif

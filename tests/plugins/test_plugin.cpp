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
// The scorer's type text tells the test which attempt made it and what it saw.

#include <iterator>
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

class TestParser : public QZScoring_800::ScoringScoreParser {
 public:
  IQZScore* CreateFromElement(QZXML_800::QZSettings&, QZXML_800::QZVarList&,
                              xercesc::DOMDocument* document,
                              xercesc::DOMElement* element) override {
#if defined(PLUGIN_THROWS)
    throw std::runtime_error("element");
#endif
    if (document == nullptr || element == nullptr) return nullptr;
    QZScoring_800::ScoringStr name(element->getTagName());
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
#else
  return new TestParser();
#endif
}
#endif

#include "PluginScorer.h"

#include <exception>
#include <new>
#include <utility>
#include <vector>

#include <xercesc/dom/DOMDocument.hpp>

#include "PluginDom.h"
#include "QZDisplay.h"
#include "QZSafeParser.h"
#include "ScoringStatusCodes.h"

namespace QZPlugin_800 {

using QZCommon_800::IQZScore;
using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

PluginScorer::PluginScorer(QZXML_800::QZSettings& settings,
                           const QZXML_800::QZVarList& variables,
                           std::unique_ptr<CompiledDocument> document)
    : ScoringBaseScorer(settings, variables), document_(std::move(document)) {
  CompiledModel& model = document_->Root();
  host_.Add("prediction");
  if (model.IsClassification() && model.TargetCategories() != nullptr) {
    host_.Add("probability");
    categoryCount_ = model.TargetCategories()->Size();
    for (int i = 0; i < categoryCount_; ++i) {
      host_.Add("probability(" + model.TargetCategories()->Text(i) + ")");
    }
  }
}

PluginScorer::~PluginScorer() = default;

bool PluginScorer::IsReady() const { return true; }

std::string PluginScorer::GetType() const { return document_->Root().Kind(); }

QZStatus PluginScorer::Scorable(ValueRecord& record) {
  try {
    host_.Declare(record);
    document_->Root().Output().Declare(record);
    return QZStatus();
  } catch (...) {
    return QZStatus(QZScoring_800::SCORING_SCORER_EXCEPTION, false);
  }
}

QZStatus PluginScorer::Score(const ValueRecord& input, ValueRecord& output) {
  try {
    return ScoreRecord(input, output);
  } catch (...) {
    return QZStatus(QZScoring_800::SCORING_SCORER_EXCEPTION, false);
  }
}

QZStatus PluginScorer::ScoreRecord(const ValueRecord& input, ValueRecord& output) {
  CompiledModel& model = document_->Root();
  const ModelResult& result = model.Score(input);
  host_.Bind(output);
  const bool scored = result.state == ModelResult::kValue;
  Value& prediction = host_.At(output, 0);
  if (!scored) {
    prediction = Value();
  } else if (model.IsClassification()) {
    if (result.category >= 0) {
      prediction = model.TargetCategories()->AsValue(result.category);
    } else {
      prediction = Value();
    }
  } else {
    prediction = result.value;
  }
  if (model.IsClassification() && model.TargetCategories() != nullptr) {
    const bool probable = scored && result.hasProbabilities;
    Value& probability = host_.At(output, 1);
    if (probable && result.category >= 0) {
      probability = result.probabilities[static_cast<size_t>(result.category)];
    } else {
      probability = Value();
    }
    for (int i = 0; i < categoryCount_; ++i) {
      Value& field = host_.At(output, 2 + i);
      if (probable && static_cast<size_t>(i) < result.probabilities.size()) {
        field = result.probabilities[static_cast<size_t>(i)];
      } else {
        field = Value();
      }
    }
  }
  if (result.state == ModelResult::kInvalid) {
    if (model.Output().Count() > 0) model.Output().Write(result, model.Prepared(input), output);
    return QZStatus(result.error, false);
  }
  if (model.Output().Count() == 0) return QZStatus();  // no Output fields: nothing to write
  return model.Output().Write(result, model.Prepared(input), output);
}

namespace {

// Writes one diagnostic line for a refused or failed document. Never throws.
void Note(const std::string& plugin, const std::string& text) noexcept {
  QZDisplay_800::DisplayS(plugin, text);
}

class PluginScoreParser : public QZScoring_800::ScoringScoreParser {
 public:
  PluginScoreParser(std::string name, std::vector<KindRegistrar> registrars)
      : name_(std::move(name)), registrars_(std::move(registrars)) {}

  IQZScore* CreateFromElement(QZXML_800::QZSettings& settings, QZXML_800::QZVarList& variables,
                              xercesc::DOMDocument* document,
                              xercesc::DOMElement* element) override {
    try {
      if (document == nullptr) return nullptr;
      return Create(settings, variables, document->getDocumentElement(), element);
    } catch (...) {
      Refused(std::current_exception());
      return nullptr;
    }
  }

  IQZScore* CreateFromStream(QZXML_800::QZSettings& settings, QZXML_800::QZVarList& variables,
                             std::istream& pmml) override {
    try {
      pmml.clear();
      pmml.seekg(0);
      QZXML_800::QZSafeDOMParser parser;
      std::string error;
      xercesc::DOMDocument* document = QZXML_800::QZSafeDOMParser::ParseSafely(parser, pmml, &error);
      if (document == nullptr) {
        Note(name_, "the document does not parse: " + error);
        return nullptr;
      }
      return Create(settings, variables, document->getDocumentElement(), nullptr);
    } catch (...) {
      Refused(std::current_exception());
      return nullptr;
    }
  }

 private:
  IQZScore* Create(QZXML_800::QZSettings& settings, QZXML_800::QZVarList& variables,
                   const xercesc::DOMElement* root, const xercesc::DOMElement* offered) {
    if (!IsElement(root, u"PMML")) throw CompileError("the document's root is not PMML");
    KindRegistry kinds;
    for (KindRegistrar registrar : registrars_) registrar(kinds);
    std::string encoding = "UTF-8";
    settings.GetSettingValByName("encoding", encoding);
    DomReader reader(encoding);

    // The model element: the one the library's scan named, else the element offered
    // when it sits directly in the document, else the first of a kind this plug-in knows.
    std::string wanted;
    settings.GetSettingValByName("scoring_modelType", wanted);
    const xercesc::DOMElement* model = nullptr;
    for (const xercesc::DOMElement* e : ChildElements(root)) {
      if (!wanted.empty() && reader.Name(e) == wanted) {
        model = e;
        break;
      }
    }
    if (model == nullptr && offered != nullptr && offered->getParentNode() == root) model = offered;
    if (model == nullptr) {
      for (const xercesc::DOMElement* e : ChildElements(root)) {
        if (kinds.Find(reader.Name(e)) != nullptr) {
          model = e;
          break;
        }
      }
    }
    if (model == nullptr) throw CompileError("the document holds no model this plug-in scores");

    std::unique_ptr<CompiledDocument> compiled =
        CompiledDocument::Compile(kinds, reader, settings, variables, root, model);
    auto scorer = std::make_unique<PluginScorer>(settings, variables, std::move(compiled));
    return scorer.release();
  }

  void Refused(std::exception_ptr error) const noexcept {
    try {
      try {
        std::rethrow_exception(error);
      } catch (const CompileError& e) {
        Note(name_, std::string("refused: ") + e.what());
      } catch (const std::exception& e) {
        Note(name_, std::string("failed: ") + e.what());
      } catch (...) {
        std::string message;
        if (!QZXML_800::DescribeXMLException(error, &message)) message = "unexpected exception";
        Note(name_, "failed: " + message);
      }
    } catch (...) {
      // Out of memory while describing the failure: the null scorer says enough.
    }
  }

  std::string name_;
  std::vector<KindRegistrar> registrars_;
};

}  // namespace

QZScoring_800::ScoringScoreParser* NewScoreParser(
    const char* pluginName, std::initializer_list<KindRegistrar> registrars) noexcept {
  try {
    return new PluginScoreParser(pluginName, std::vector<KindRegistrar>(registrars));
  } catch (...) {
    return nullptr;
  }
}

}  // namespace QZPlugin_800

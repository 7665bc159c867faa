// The host-facing side of the reference plug-ins: the score parser a plug-in's
// "GetScoreParser" returns, and the scorer it makes from a compiled document.
#ifndef QZPLUGIN_CORE_PLUGINSCORER_H_
#define QZPLUGIN_CORE_PLUGINSCORER_H_

#include <initializer_list>
#include <memory>
#include <string>

#include "CompiledModel.h"
#include "FieldBinder.h"
#include "ScoringBaseScorer.h"
#include "ScoringScoreParser.h"

namespace QZPlugin_800 {

// The scorer of one compiled document. Scorable lays out "prediction", then for
// classification "probability" (of the predicted category) and "probability(CAT)" for
// each target category in dictionary order, then one field per OutputField of the
// model, named as the document names it. Score writes them by position (the output
// layout is learnt once per layout). A record refused under returnInvalid leaves them
// null and returns PLUGIN_INVALID_INPUT (or the transformation engine's code); an
// unexpected failure returns SCORING_SCORER_EXCEPTION. Nothing throws. One thread at a
// time; scorers share nothing.
class PluginScorer : public QZScoring_800::ScoringBaseScorer {
 public:
  // Takes the compiled document. `settings` must outlive the scorer.
  PluginScorer(QZXML_800::QZSettings& settings, const QZXML_800::QZVarList& variables,
               std::unique_ptr<CompiledDocument> document);
  ~PluginScorer() override;

  // True: a scorer exists only once its document compiled.
  bool IsReady() const override;
  // The model element name ("RegressionModel", "TreeModel", "MiningModel").
  std::string GetType() const override;
  QZCommon_800::QZStatus Scorable(QZCommon_800::ValueRecord& record) override;
  QZCommon_800::QZStatus Score(const QZCommon_800::ValueRecord& input,
                               QZCommon_800::ValueRecord& output) override;

 private:
  QZCommon_800::QZStatus ScoreRecord(const QZCommon_800::ValueRecord& input,
                                     QZCommon_800::ValueRecord& output);

  std::unique_ptr<CompiledDocument> document_;
  RecordWriter host_;      // prediction, probability, probability(CAT)...
  int categoryCount_ = 0;  // classification: the probability(CAT) fields
};

// Makes the score parser of a plug-in named `pluginName` whose scorers compile the
// model kinds the registrars add. The parser reads the document from the stream with
// the safe DOM parser (clearing the stream's state and rewinding it first), or takes
// the element the library parsed; it compiles the document's model element (the one
// named by "scoring_modelType", else the first of a known kind). A document it refuses
// gives null and one diagnostic line through QZDisplay ("<plugin>: <reason>"). Returns
// null only when memory runs out. Never throws.
QZScoring_800::ScoringScoreParser* NewScoreParser(
    const char* pluginName, std::initializer_list<KindRegistrar> registrars) noexcept;

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_PLUGINSCORER_H_

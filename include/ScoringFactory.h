// The entry point of a host: turns PMML documents into scoring models.
#ifndef QZSCORING_SCORING_FACTORY_H_
#define QZSCORING_SCORING_FACTORY_H_

#include <istream>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "QZScoringExport.h"
#include "QZSettings.h"
#include "QZStatus.h"

namespace QZScoring_800 {

class ScoringModel;

// A factory initialises Xerces-C++ for its lifetime and holds the last model it built
// until the host takes it with Detach; the factory deletes a model it still holds when
// it is destroyed or when Attach replaces it. Every operation reports failure through
// its result (null) and GetStatus; none throws. One thread uses a factory at a time;
// several factories may live in several threads.
class QZSCORING_API ScoringFactory {
 public:
  // Initialises Xerces-C++; when that fails GetStatus reports 103.
  ScoringFactory();
  ~ScoringFactory();
  // A held model has one owner: factories are not copied.
  ScoringFactory(const ScoringFactory&) = delete;
  ScoringFactory& operator=(const ScoringFactory&) = delete;

  // Creates a model from the PMML document in the file, as the stream form does.
  // 260004 when the file cannot be opened.
  ScoringModel* CreateScoringModel(QZXML_800::QZSettings& settings, const std::string& fileName);

  // Creates a model from one PMML (or time-series XML) document. settings holds the
  // plug-in registry ("scoringDll", "modelDll") and receives "scoring_version",
  // "scoring_modelType" and "scoring_multipleModelMethod" of the document. The model is
  // returned and held by the factory (see Detach); null on failure with the reason in
  // GetStatus: 260002 a model is already held (it stays held), 260005/260006 registry
  // settings missing, 260007 the document could not be scanned, 260010 no scorer,
  // 104 to 111 the data dictionary could not be read.
  ScoringModel* CreateScoringModel(QZXML_800::QZSettings& settings, std::istream& pmml);

  // Creates a model from the files listed in "scoring_pmmlFiles": one file gives the
  // file form (not tried while the status holds an earlier error; Detach resets it);
  // otherwise a multi model whose sub-models are named by "scoring_modelIDs" (one ID per
  // file; the shorter list ends the loop). 260003 when the one file name is empty, or
  // "scoring_modelIDs" is absent; 260002 when a model is held (it stays held); a failing
  // document fails the whole model with its own code and nothing new is held.
  ScoringModel* CreateScoringModel(QZXML_800::QZSettings& settings);

  // Creates a model from documents in memory: with nested settings "scoring_splitModel"
  // a split model (sub-model i from stream i, keyed by its split model ID's values),
  // else with "scoring_modelIDs" a multi model, else the stream form of the single
  // stream (260028 for any other number of streams). The ID and stream lists are read
  // up to the shorter one; a null stream reads as an empty document. 260002 when a model
  // is held (it stays held). Failures as in the settings form. The streams stay the
  // caller's.
  ScoringModel* CreateScoringModel(QZXML_800::QZSettings& settings,
                                   const std::vector<std::stringstream*>& streams);

  // The setting name as a list of texts: a list of strings (QZVecValue<std::string>),
  // or the texts of a QZVecValue<Value>; empty when absent or of another kind. Never
  // throws.
  static std::vector<std::string> GetVecStringValue(const QZXML_800::QZSettings& settings,
                                                    const std::string& name);

  // Deletes the held model, if any, and holds model instead (ownership passes to the
  // factory; null holds none).
  void Attach(ScoringModel* model);

  // Hands the held model to the caller (null when none) and resets the status to OK.
  ScoringModel* Detach();

  // The outcome of the last operation.
  QZCommon_800::QZStatus GetStatus() const;

 private:
  // Builds the combined models through the single-document forms (CombinedModels.cpp).
  friend class CombinedModelCreation;

  QZCommon_800::QZStatus InitXerces();
  void TermXerces();
  ScoringModel* CreateFromStream(QZXML_800::QZSettings& settings, std::istream& pmml);

  QZCommon_800::QZStatus status_;
  std::unique_ptr<ScoringModel> model_;
  bool xercesInitialised_ = false;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORING_FACTORY_H_

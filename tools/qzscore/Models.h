// The models qzscore scores with: one PMML document, several side by side (a multi
// model under model IDs) or one per value of split fields (a split model). Documents
// are read and scanned once; every thread then creates its own model from them.
#ifndef QZSCORE_MODELS_H_
#define QZSCORE_MODELS_H_

#include <memory>
#include <string>
#include <vector>

#include "QZVarList.h"
#include "Records.h"
#include "Registry.h"
#include "ScoringFactory.h"
#include "ScoringModel.h"
#include "ScoringModelAttr.h"

namespace qzscore {

// What the command line asks for.
struct ModelOptions {
  std::string file;                      // one document; empty with assignments
  std::vector<std::string> assignments;  // "ID=FILE" (multi) or "KEY=FILE" (split)
  std::vector<std::string> splitFields;  // non-empty: a split model
};

// One document, as read and scanned.
struct Document {
  std::string file;
  std::string id;                        // model ID (multi), key text (split), else empty
  std::vector<QZCommon_800::Value> key;  // split key, one value per split field
  std::string text;
  std::unique_ptr<QZScoring_800::ScoringModelAttr> attr;
  QZXML_800::QZVarList variables;
  int type = 0;  // the model type, read once (the record computes it lazily)
};

// A model with the factory that built it; the factory owns the model and keeps the XML
// parser initialised for the model's lifetime. Used by one thread at a time.
class ModelInstance {
 public:
  ModelInstance(std::unique_ptr<QZScoring_800::ScoringFactory> factory,
                QZScoring_800::ScoringModel* model)
      : factory_(std::move(factory)), model_(model) {}
  ModelInstance(const ModelInstance&) = delete;
  ModelInstance& operator=(const ModelInstance&) = delete;
  QZScoring_800::ScoringModel& Model() { return *model_; }

 private:
  std::unique_ptr<QZScoring_800::ScoringFactory> factory_;
  QZScoring_800::ScoringModel* model_;
};

// The documents of one run and how to build a model from them. After Open, Create may
// be called from several threads at once.
class ModelSource {
 public:
  ModelSource();
  ~ModelSource();
  ModelSource(const ModelSource&) = delete;
  ModelSource& operator=(const ModelSource&) = delete;

  // Reads and scans every document and checks the options. False with one line of
  // error naming the file and what is wrong.
  bool Open(const ModelOptions& options, const Registry& registry, std::string& error);

  // A new model; null with one line of error (the failing document and the status
  // code's text, with a hint at the registry when no scorer was found).
  std::unique_ptr<ModelInstance> Create(std::string& error) const;

  const std::vector<Document>& Documents() const { return documents_; }
  // Every field of every document (the first document's kind wins) and the split fields.
  const FieldKinds& Kinds() const { return kinds_; }
  // The input fields of every document (mining-schema inputs), each once.
  const std::vector<std::string>& InputFields() const { return inputs_; }
  // A single document holding only transformations: its derived fields are its output.
  bool IsTransformationsOnly() const { return transformationsOnly_; }
  // "FILE", or "N documents".
  std::string Describe() const;

 private:
  // The model, held by factory; null with the factory's status code.
  QZScoring_800::ScoringModel* Build(QZScoring_800::ScoringFactory& factory, long& code) const;
  std::string Explain(const Document& document, long code) const;

  std::unique_ptr<QZScoring_800::ScoringFactory> xml_;  // keeps Xerces-C++ initialised
  Registry registry_;
  std::vector<Document> documents_;
  std::vector<std::string> splitFields_;
  bool multi_ = false;
  bool transformationsOnly_ = false;
  FieldKinds kinds_;
  std::vector<std::string> inputs_;
};

// Scans one document's text into its attribute record and variable list, with the
// registry's model element names. False with "FILE: what is wrong".
bool ScanDocument(Document& document, std::string& error);

}  // namespace qzscore

#endif  // QZSCORE_MODELS_H_

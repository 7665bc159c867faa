// The core every model kind of the reference plug-ins shares: a registry of model-kind
// compilers by element name, the compile-time view of a document and of one model, and
// the compiled model that runs MiningSchema, LocalTransformations, the kind's
// evaluator, Targets and Output for one record.
//
// A model kind plugs in with one function that compiles its model element into a
// ModelEvaluator (the per-record part). Everything around it is done here, the same for
// every kind, and segments of an ensemble are compiled through the same path
// (ModelContext::CompileNested), so a MiningModel can hold models of any kind the
// registry knows.
//
// Adding a kind: a function `void RegisterXxx(KindRegistry&)` adds the element name with
// its EvaluatorCompiler. The compiler reads context.Element(), asks context.AddField
// for a slot per field it reads, interns the categories it names into
// context.TargetCategories() (classification), compiles segments with
// context.CompileNested, and returns a ModelEvaluator that reads the prepared record
// through FieldView by those slots and fills the ModelResult. The plug-in entry points
// (plugins/entry) pass the registrars to NewScoreParser.
#ifndef QZPLUGIN_CORE_COMPILEDMODEL_H_
#define QZPLUGIN_CORE_COMPILEDMODEL_H_

#include <map>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include <xercesc/dom/DOMElement.hpp>

#include "Categories.h"
#include "FieldBinder.h"
#include "FieldRow.h"
#include "StepTree.h"
#include "MiningSchema.h"
#include "ModelResult.h"
#include "OutputFields.h"
#include "PluginDom.h"
#include "QZSettings.h"
#include "QZTransformation.h"
#include "QZVarList.h"
#include "Targets.h"
#include "ValueRecord.h"

namespace QZScoring_800 {
class ScoringPMMLParser;
}

namespace QZPlugin_800 {

class CompiledDocument;
class CompiledModel;
class ModelContext;

// The per-record part of one model kind, made by the kind's compiler. Evaluate computes
// the result before Targets: state kValue with `value` (regression) or `probabilities`
// and `category` (classification, indices of the target's CategoryTable), or leaves
// kMissing when it cannot predict. It reads the prepared record only through `fields`
// (by the slots its compiler added), must not throw for any input value and should
// allocate nothing for numeric work. Used by one thread at a time.
class ModelEvaluator {
 public:
  virtual ~ModelEvaluator();
  virtual void Evaluate(const FieldView& fields, ModelResult& result) = 0;

  // Evaluators that read their fields through a FieldRow (keyed by the model's slots)
  // give it here, so that an ensemble can decode one row for all of its models; null
  // for evaluators that read the record only through FieldView.
  virtual FieldRow* Row() { return nullptr; }
  // Moves the evaluator onto an ensemble's row: number i of Row() is number
  // `numbers[i]` there, category i is category `categories[i]`. Afterwards the
  // evaluator is called only through EvaluateRow. False (nothing changed) when it
  // cannot address those places.
  virtual bool Rebase(const std::vector<int>& numbers, const std::vector<int>& categories);
  // Evaluate, over the ensemble's row decoded from `record`.
  virtual void EvaluateRow(FieldRow& row, const QZCommon_800::ValueRecord& record,
                           ModelResult& result);
  // Evaluators that can give their decision as a StepTree over their row (after
  // Rebase, over the ensemble's): the tree; null otherwise.
  virtual const StepTree* Steps() const { return nullptr; }
  // The result of the node a StepTree walk ended on (kDecidesNothing: none).
  virtual void DecideStep(uint32_t node, ModelResult& result);
};

// Compiles one model element into its evaluator; throws CompileError when it refuses
// the model (never returns null).
using EvaluatorCompiler = std::unique_ptr<ModelEvaluator> (*)(ModelContext& context);

// Which model elements a plug-in scores, and with which compiler.
class KindRegistry {
 public:
  // Registers (or replaces) the compiler of a model element name.
  void Add(const std::string& element, EvaluatorCompiler compiler);
  // The compiler of the element name; null when the kind is unknown.
  EvaluatorCompiler Find(const std::string& element) const;

 private:
  std::vector<std::pair<std::string, EvaluatorCompiler>> kinds_;
};

// A function that adds one or more kinds to a registry (each kind library has one).
using KindRegistrar = void (*)(KindRegistry& registry);

// The two mining functions the plug-ins score.
enum class MiningFunction { kRegression, kClassification };

// The compile-time view of a whole document: its reader, settings, kinds, data and
// transformation dictionaries, and the objects that must outlive compilation (shared
// target categories, variable lists of model scopes), which it keeps in the
// CompiledDocument being built. Lives only while the document is compiled.
class DocumentContext {
 public:
  DocumentContext(const KindRegistry& kinds, DomReader& reader, QZXML_800::QZSettings& settings,
                  const xercesc::DOMElement* root, CompiledDocument& owner);
  ~DocumentContext();
  DocumentContext(const DocumentContext&) = delete;
  DocumentContext& operator=(const DocumentContext&) = delete;

  const DomReader& Reader() const { return reader_; }
  QZXML_800::QZSettings& Settings() const { return settings_; }
  const KindRegistry& Kinds() const { return kinds_; }

  // The DataField element of that name; null when the dictionary has none.
  const xercesc::DOMElement* DataField(const std::string& name) const;
  // The TransformationDictionary element; null when absent.
  const xercesc::DOMElement* TransformationDictionary() const { return transformations_; }
  bool HasGlobalDerivedFields() const { return hasGlobalDerived_; }
  bool HasDefineFunctions() const { return hasDefineFunctions_; }
  // The valid categories of a field in dictionary order: the variable's categories, or
  // (when the variable list kept none, as for boolean fields) the texts of the
  // DataField's valid Values.
  std::vector<std::string> DeclaredCategories(const std::string& field,
                                              const QZXML_800::IQZVariable* variable) const;
  // Whether the DataField declares missing or invalid values (Values with another
  // property than "valid", or a missing range): only then does scoring ask the
  // variable's encoder about each value.
  bool DeclaresMissingValues(const std::string& field) const;

  // The category codes of categorical fields' values, shared by every model of the
  // document. Owned by the compiled document.
  CategoryCodeMemo& CategoryCodes();

  // The category table of a target field, shared by every model of the document that
  // predicts it, created from its declared categories on first use. Owned by the
  // compiled document.
  CategoryTable* TargetCategories(const std::string& field,
                                  const QZXML_800::IQZVariable* variable);

  // The library's PMML reader for this document (configured with its encoding): for
  // the predicate and split parsers and the variable lists of LocalTransformations.
  QZScoring_800::ScoringPMMLParser& Parser();

  // Compiles one model element within the variable scope of its parent (top level:
  // `parent` null). `inheritedTarget` is the parent's target, used when the model's
  // MiningSchema names none; `parent` lets the model skip field checks the parent's
  // MiningSchema already makes. Throws CompileError when refused.
  std::unique_ptr<CompiledModel> Compile(const xercesc::DOMElement* model,
                                         const QZXML_800::QZVarList& scope,
                                         const std::string& inheritedTarget,
                                         const MiningSchema* parent);

 private:
  // A new variable list, a copy of `parent` plus the DerivedFields of `local`, owned by
  // the compiled document.
  const QZXML_800::QZVarList& NewScope(const QZXML_800::QZVarList& parent,
                                       const xercesc::DOMElement* local);
  // Whether the solo model around the scorer computes the TransformationDictionary
  // into the input record (it does so for documents that list derived inputs, and for
  // hosts that set "scoring_needDerivedPredictor").
  bool HostComputesGlobals(const xercesc::DOMElement* model) const;

  const KindRegistry& kinds_;
  DomReader& reader_;
  QZXML_800::QZSettings& settings_;
  CompiledDocument& owner_;
  std::map<std::string, const xercesc::DOMElement*> dataFields_;
  const xercesc::DOMElement* transformations_ = nullptr;
  bool hasGlobalDerived_ = false;
  bool hasDefineFunctions_ = false;
  std::unique_ptr<QZScoring_800::ScoringPMMLParser> fieldReader_;  // made on first use
};

// What a kind's compiler sees of the model it compiles.
class ModelContext {
 public:
  ModelContext(DocumentContext& document, const xercesc::DOMElement* element, std::string kind,
               MiningFunction function, std::string target, CategoryTable* categories,
               const QZXML_800::QZVarList& variables, FieldBinder& fields,
               const MiningSchema& schema)
      : document_(document), element_(element), kind_(std::move(kind)), function_(function),
        target_(std::move(target)), categories_(categories), variables_(variables),
        fields_(fields), schema_(schema) {}

  DocumentContext& Document() { return document_; }
  const DomReader& Reader() const { return document_.Reader(); }
  // The model element being compiled.
  const xercesc::DOMElement* Element() const { return element_; }
  // Its element name ("RegressionModel", "TreeModel", ...).
  const std::string& Kind() const { return kind_; }
  MiningFunction Function() const { return function_; }
  bool IsClassification() const { return function_ == MiningFunction::kClassification; }
  // The target field ("" when the model names none and inherits none).
  const std::string& Target() const { return target_; }
  // Classification: the target's categories, which the compiler may extend (Intern)
  // with categories the model names that the dictionary lacks. Null for regression.
  CategoryTable* TargetCategories() const { return categories_; }
  // The fields visible to the model: data dictionary, transformation dictionary, and
  // the derived fields of enclosing and own LocalTransformations.
  const QZXML_800::QZVarList& Variables() const { return variables_; }
  // The slot through which Evaluate reads a field (FieldView::Get).
  int AddField(const std::string& name) { return fields_.Add(name); }
  // Compiles a nested model element (a segment) of any registered kind within this
  // model's scope and target. Throws CompileError when refused.
  std::unique_ptr<CompiledModel> CompileNested(const xercesc::DOMElement* model) {
    return document_.Compile(model, variables_, target_, &schema_);
  }

 private:
  DocumentContext& document_;
  const xercesc::DOMElement* element_;
  std::string kind_;
  MiningFunction function_;
  std::string target_;
  CategoryTable* categories_;
  const QZXML_800::QZVarList& variables_;
  FieldBinder& fields_;
  const MiningSchema& schema_;
};

// One compiled model: MiningSchema, LocalTransformations (through the transformation
// engine), the kind's evaluator, Targets and Output, with the per-record state they
// need (working record, result). Scoring writes only the model's own state, so models
// compiled separately share nothing; one thread at a time per model.
class CompiledModel {
 public:
  ~CompiledModel();
  CompiledModel(const CompiledModel&) = delete;
  CompiledModel& operator=(const CompiledModel&) = delete;

  const std::string& Kind() const { return kind_; }
  MiningFunction Function() const { return function_; }
  bool IsClassification() const { return function_ == MiningFunction::kClassification; }
  const std::string& Target() const { return target_; }
  // Classification: the target's categories (shared within the document); else null.
  const CategoryTable* TargetCategories() const { return categories_; }

  // Scores one record: checks and treats the active fields, computes the local derived
  // fields, runs the evaluator and applies Targets. The result stays valid until the
  // next Score. kInvalid carries the status code in `error`. Never throws for any
  // input value.
  const ModelResult& Score(const QZCommon_800::ValueRecord& input);
  // The record the last Score handed to the evaluator: `input` itself, or the model's
  // working copy (treated values, local derived fields) when it needs one.
  const QZCommon_800::ValueRecord& Prepared(const QZCommon_800::ValueRecord& input) const {
    return copy_ ? working_ : input;
  }
  // Lets a parent decode this model's fields into `shared` (its own row, keyed by the
  // parent's slots of `parent`) when Score would do nothing with the record but hand
  // it to the evaluator: no working copy, field checks or transformations of its own,
  // and an evaluator that reads a FieldRow. Returns false, changing nothing, when the
  // model cannot join (or a field is read with another encoder or variable there).
  // After joining the parent scores the model only through ScoreRow.
  bool JoinRow(FieldRow& shared, ModelContext& parent);
  // Score for a model that joined a row, decoded from `input`.
  const ModelResult& ScoreRow(FieldRow& row, const QZCommon_800::ValueRecord& input);
  // The evaluator's StepTree (null when it has none) and Score for a model that joined
  // a row whose fields are plain for that tree, given the node the walk ended on.
  const StepTree* Steps() const { return evaluator_->Steps(); }
  const ModelResult& ScoreStep(uint32_t node);
  // Whether Targets change the evaluator's results.
  bool HasTargets() const { return targets_.Active(); }

  // The model's OutputFields.
  OutputStage& Output() { return output_; }
  const MiningSchema& Schema() const { return schema_; }

 private:
  friend class DocumentContext;
  CompiledModel();

  void PrepareWorking(const QZCommon_800::ValueRecord& input);

  std::string kind_;
  MiningFunction function_ = MiningFunction::kRegression;
  std::string target_;
  CategoryTable* categories_ = nullptr;
  FieldBinder fields_;
  MiningSchema schema_;
  std::unique_ptr<QZTransformNS_8_0_0::QZTransformation> engine_;
  std::unique_ptr<ModelEvaluator> evaluator_;
  TargetStage targets_;
  OutputStage output_;

  bool copy_ = false;  // scores a working copy of its input
  QZCommon_800::ValueRecord working_;
  uint64_t workingFor_ = UINT64_MAX;  // input layout the working copy was built for
  size_t workingSize_ = 0;
  ModelResult result_;
};

// Everything a compiled document owns: its variable lists, the shared category tables
// and the top-level model. Built by Compile, then only scored.
class CompiledDocument {
 public:
  // Compiles `model`, the model element of the PMML document whose root is `root`.
  // `variables` is the document's variable list (data dictionary and transformation
  // dictionary, as the library built it). Throws CompileError when refused.
  static std::unique_ptr<CompiledDocument> Compile(const KindRegistry& kinds,
                                                   DomReader& reader,
                                                   QZXML_800::QZSettings& settings,
                                                   const QZXML_800::QZVarList& variables,
                                                   const xercesc::DOMElement* root,
                                                   const xercesc::DOMElement* model);
  CompiledDocument(const CompiledDocument&) = delete;
  CompiledDocument& operator=(const CompiledDocument&) = delete;
  ~CompiledDocument();

  CompiledModel& Root() { return *root_; }

 private:
  friend class DocumentContext;
  CompiledDocument() = default;

  QZXML_800::QZVarList variables_;
  std::vector<std::unique_ptr<QZXML_800::QZVarList>> scopes_;
  std::map<std::string, std::unique_ptr<CategoryTable>> categories_;
  CategoryCodeMemo codes_;
  std::unique_ptr<CompiledModel> root_;
};

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_COMPILEDMODEL_H_

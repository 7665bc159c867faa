#include "CompiledModel.h"

#include "PluginStatus.h"
#include "ScoringPMMLParser.h"

namespace QZPlugin_800 {

using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;

ModelEvaluator::~ModelEvaluator() = default;

bool ModelEvaluator::Rebase(const std::vector<int>&, const std::vector<int>&) { return false; }

void ModelEvaluator::EvaluateRow(FieldRow&, const ValueRecord&, ModelResult&) {}

void ModelEvaluator::DecideStep(uint32_t, ModelResult&) {}

void KindRegistry::Add(const std::string& element, EvaluatorCompiler compiler) {
  for (auto& kind : kinds_) {
    if (kind.first == element) {
      kind.second = compiler;
      return;
    }
  }
  kinds_.emplace_back(element, compiler);
}

EvaluatorCompiler KindRegistry::Find(const std::string& element) const {
  for (const auto& kind : kinds_) {
    if (kind.first == element) return kind.second;
  }
  return nullptr;
}

// ---------------------------------------------------------------------------------------
// DocumentContext

DocumentContext::DocumentContext(const KindRegistry& kinds, DomReader& reader,
                                 QZXML_800::QZSettings& settings,
                                 const xercesc::DOMElement* root, CompiledDocument& owner)
    : kinds_(kinds), reader_(reader), settings_(settings), owner_(owner) {
  const xercesc::DOMElement* dictionary = FirstChildElement(root, u"DataDictionary");
  for (const xercesc::DOMElement* field : ChildElements(dictionary, u"DataField")) {
    dataFields_.emplace(reader_.Attr(field, u"name"), field);
  }
  transformations_ = FirstChildElement(root, u"TransformationDictionary");
  hasGlobalDerived_ = FirstChildElement(transformations_, u"DerivedField") != nullptr;
  hasDefineFunctions_ = FirstChildElement(transformations_, u"DefineFunction") != nullptr;
}

DocumentContext::~DocumentContext() = default;

const xercesc::DOMElement* DocumentContext::DataField(const std::string& name) const {
  auto found = dataFields_.find(name);
  return found == dataFields_.end() ? nullptr : found->second;
}

std::vector<std::string> DocumentContext::DeclaredCategories(
    const std::string& field, const QZXML_800::IQZVariable* variable) const {
  std::vector<std::string> categories;
  for (const Value& value : QZScoring_800::ScoringPMMLParser::GetValues(variable)) {
    categories.push_back(value.GetString());
  }
  if (!categories.empty()) return categories;
  for (const xercesc::DOMElement* value : ChildElements(DataField(field), u"Value")) {
    const std::string property = reader_.Attr(value, u"property", "valid");
    if (property == "valid" && DomReader::Has(value, u"value")) {
      categories.push_back(reader_.Attr(value, u"value"));
    }
  }
  return categories;
}

CategoryCodeMemo& DocumentContext::CategoryCodes() { return owner_.codes_; }

bool DocumentContext::DeclaresMissingValues(const std::string& field) const {
  const xercesc::DOMElement* element = DataField(field);
  for (const xercesc::DOMElement* child : ChildElements(element)) {
    if (IsElement(child, u"Value")) {
      if (reader_.Attr(child, u"property", "valid") != "valid") return true;
    } else if (IsElement(child, u"Extension")) {
      const std::string name = reader_.Attr(child, u"name");
      if (name == "MissingValue" || name == "invalidRangeLower" || name == "invalidRangeUpper") {
        return true;
      }
    }
  }
  return false;
}

CategoryTable* DocumentContext::TargetCategories(const std::string& field,
                                                 const QZXML_800::IQZVariable* variable) {
  std::unique_ptr<CategoryTable>& table = owner_.categories_[field];
  if (!table) {
    const bool numeric = variable != nullptr &&
                         variable->GetStorageType() != QZXML_800::STORAGE_STRING &&
                         variable->GetStorageType() != QZXML_800::STORAGE_UNKNOWN;
    table = std::make_unique<CategoryTable>(numeric);
    for (const std::string& category : DeclaredCategories(field, variable)) {
      table->Intern(category);
    }
  }
  return table.get();
}

QZScoring_800::ScoringPMMLParser& DocumentContext::Parser() {
  if (!fieldReader_) {
    std::string encoding = "UTF-8";
    settings_.GetSettingValByName("encoding", encoding);
    fieldReader_ = std::make_unique<QZScoring_800::ScoringPMMLParser>(encoding);
  }
  return *fieldReader_;
}

const QZXML_800::QZVarList& DocumentContext::NewScope(const QZXML_800::QZVarList& parent,
                                                      const xercesc::DOMElement* local) {
  auto scope = std::make_unique<QZXML_800::QZVarList>(parent);
  const QZStatus status =
      Parser().FillVarList(*scope, const_cast<xercesc::DOMElement*>(local));
  if (status.IsError()) {
    throw CompileError("LocalTransformations: the derived fields cannot be read (status " +
                       std::to_string(status.GetErrorCode()) + ")");
  }
  owner_.scopes_.push_back(std::move(scope));
  return *owner_.scopes_.back();
}

bool DocumentContext::HostComputesGlobals(const xercesc::DOMElement* model) const {
  bool need = false;
  if (settings_.GetSettingValByName("scoring_needDerivedPredictor", need) && need) return true;
  const xercesc::DOMElement* schema = FirstChildElement(model, u"MiningSchema");
  for (const xercesc::DOMElement* e : ChildElements(schema, u"Extension")) {
    if (reader_.Attr(e, u"extender") == "qzscoring" &&
        reader_.Attr(e, u"name") == "DerivedFields" &&
        FirstChildElement(e, u"MiningField") != nullptr) {
      return true;
    }
  }
  return false;
}

std::unique_ptr<CompiledModel> DocumentContext::Compile(const xercesc::DOMElement* model,
                                                        const QZXML_800::QZVarList& scope,
                                                        const std::string& inheritedTarget,
                                                        const MiningSchema* parent) {
  const bool topLevel = parent == nullptr;
  std::unique_ptr<CompiledModel> compiled(new CompiledModel());
  compiled->kind_ = reader_.Name(model);
  const EvaluatorCompiler compiler = kinds_.Find(compiled->kind_);
  if (compiler == nullptr) {
    throw CompileError("model element '" + compiled->kind_ + "' is not supported");
  }
  if (reader_.Attr(model, u"isScorable") == "false") {
    throw CompileError(compiled->kind_ + " is marked not scorable");
  }
  const std::string function = reader_.Attr(model, u"functionName");
  if (function == "regression") {
    compiled->function_ = MiningFunction::kRegression;
  } else if (function == "classification") {
    compiled->function_ = MiningFunction::kClassification;
  } else {
    throw CompileError(compiled->kind_ + " functionName '" + function + "' is not supported");
  }

  compiled->schema_.Compile(FirstChildElement(model, u"MiningSchema"), *this, scope,
                            compiled->fields_, parent);
  std::string target = compiled->schema_.Target();
  if (target.empty()) target = inheritedTarget;
  if (target.empty() && topLevel) {
    target = reader_.Attr(model, u"targetFieldName");
    if (target.empty() && scope.GetTargetRespVariable() != nullptr) {
      target = scope.GetTargetRespVariable()->GetName();
    }
  }
  compiled->target_ = target;
  if (compiled->IsClassification()) {
    compiled->categories_ = TargetCategories(target, scope.GetVariable(target));
  }

  const xercesc::DOMElement* local = FirstChildElement(model, u"LocalTransformations");
  const bool hasLocal = FirstChildElement(local, u"DerivedField") != nullptr;
  const QZXML_800::QZVarList& modelScope = hasLocal ? NewScope(scope, local) : scope;
  // Numeric local fields reach the segments as numbers (the engine stores a number or
  // system-missing in them), so they need no validity check there. Not for a model
  // chain: it hands later segments the earlier ones' outputs, which may reuse the name.
  const xercesc::DOMElement* segmentation = FirstChildElement(model, u"Segmentation");
  if (hasLocal && reader_.Attr(segmentation, u"multipleModelMethod") != "modelChain") {
    for (const xercesc::DOMElement* derived : ChildElements(local, u"DerivedField")) {
      const std::string type = reader_.Attr(derived, u"dataType");
      if (type == "double" || type == "float" || type == "integer") {
        compiled->schema_.AddComputedNumber(reader_.Attr(derived, u"name"));
      }
    }
  }

  ModelContext context(*this, model, compiled->kind_, compiled->function_, target,
                       compiled->categories_, modelScope, compiled->fields_,
                       compiled->schema_);
  compiled->evaluator_ = compiler(context);
  if (!compiled->evaluator_) throw CompileError(compiled->kind_ + " could not be compiled");

  compiled->targets_.Compile(FirstChildElement(model, u"Targets"), reader_, target,
                             compiled->IsClassification(), compiled->categories_);
  compiled->output_.Compile(FirstChildElement(model, u"Output"), *this, target,
                            compiled->IsClassification(), compiled->categories_,
                            compiled->targets_);

  // The document's own derived fields are computed here only when the solo model
  // around the scorer does not compute them, or when local fields call its functions.
  const bool globals = transformations_ != nullptr &&
                       ((topLevel && hasGlobalDerived_ && !HostComputesGlobals(model)) ||
                        (hasLocal && hasDefineFunctions_));
  if (globals || hasLocal) {
    compiled->engine_ = std::make_unique<QZTransformNS_8_0_0::QZTransformation>();
    QZStatus status;
    if (globals) status = compiled->engine_->AddTransformationDictionary(transformations_);
    if (status.IsOK() && hasLocal) status = compiled->engine_->AddTransformationDictionary(local);
    if (status.IsError()) {
      throw CompileError(compiled->kind_ + ": transformations refused by the engine: " +
                         compiled->engine_->GetLastError());
    }
  }
  compiled->copy_ = compiled->engine_ != nullptr || compiled->schema_.ChangesValues();
  compiled->schema_.Finish(compiled->copy_);
  return compiled;
}

// ---------------------------------------------------------------------------------------
// CompiledModel

CompiledModel::CompiledModel() = default;
CompiledModel::~CompiledModel() = default;

void CompiledModel::PrepareWorking(const ValueRecord& input) {
  if (input.GetLayoutId() != workingFor_ || input.Size() != workingSize_) {
    working_ = ValueRecord(input.Size() + 8);
    for (size_t i = 0; i < input.Size(); ++i) working_.Add(input.GetName(i), Value());
    // Active fields the input lacks still get a place, for their replacement values.
    for (const std::string& name : schema_.ActiveFields()) {
      if (!working_.Contains(name)) working_.Add(name, Value());
    }
    if (engine_) engine_->GetDerivedVariableInfo(working_, true);
    workingFor_ = input.GetLayoutId();
    workingSize_ = input.Size();
  }
  for (size_t i = 0; i < input.Size(); ++i) working_[i] = input[i];
  for (size_t i = input.Size(); i < working_.Size(); ++i) working_[i] = Value();
}

bool CompiledModel::JoinRow(FieldRow& shared, ModelContext& parent) {
  FieldRow* own = evaluator_->Row();
  if (own == nullptr || copy_ || engine_ || schema_.HasChecks()) return false;
  std::vector<int> numbers, categories;
  for (int i = 0; i < own->Numbers(); ++i) {
    const int slot = parent.AddField(fields_.Name(own->NumberSlot(i)));
    numbers.push_back(shared.AddNumber(slot, own->NumberEncoder(i)));
    if (numbers.back() < 0) return false;
  }
  for (int i = 0; i < own->Categories(); ++i) {
    const int slot = parent.AddField(fields_.Name(own->CategorySlot(i)));
    categories.push_back(shared.AddCategory(slot, own->CategoryVariable(i)));
    if (categories.back() < 0) return false;
  }
  return evaluator_->Rebase(numbers, categories);
}

const ModelResult& CompiledModel::ScoreRow(FieldRow& row, const ValueRecord& input) {
  result_.Reset(categories_ != nullptr ? categories_->Size() : 0);
  evaluator_->EvaluateRow(row, input, result_);
  targets_.Finish(result_);
  return result_;
}

const ModelResult& CompiledModel::ScoreStep(uint32_t node) {
  result_.Reset(categories_ != nullptr ? categories_->Size() : 0);
  evaluator_->DecideStep(node, result_);
  targets_.Finish(result_);
  return result_;
}

const ModelResult& CompiledModel::Score(const ValueRecord& input) {
  result_.Reset(categories_ != nullptr ? categories_->Size() : 0);
  const ValueRecord* record = &input;
  if (copy_) {
    PrepareWorking(input);
    record = &working_;
  }
  fields_.Bind(*record);
  if (schema_.HasChecks() && !schema_.Apply(*record, copy_ ? &working_ : nullptr, fields_)) {
    result_.state = ModelResult::kInvalid;
    result_.error = PLUGIN_INVALID_INPUT;
    return result_;
  }
  if (engine_) {
    const QZStatus status = engine_->Transform(working_);
    if (status.IsError()) {
      result_.state = ModelResult::kInvalid;
      result_.error = status.GetErrorCode();
      return result_;
    }
  }
  evaluator_->Evaluate(FieldView(*record, fields_), result_);
  targets_.Finish(result_);
  return result_;
}

// ---------------------------------------------------------------------------------------
// CompiledDocument

CompiledDocument::~CompiledDocument() = default;

std::unique_ptr<CompiledDocument> CompiledDocument::Compile(
    const KindRegistry& kinds, DomReader& reader, QZXML_800::QZSettings& settings,
    const QZXML_800::QZVarList& variables, const xercesc::DOMElement* root,
    const xercesc::DOMElement* model) {
  std::unique_ptr<CompiledDocument> document(new CompiledDocument());
  document->variables_ = variables;
  DocumentContext context(kinds, reader, settings, root, *document);
  document->root_ = context.Compile(model, document->variables_, std::string(), nullptr);
  return document;
}

}  // namespace QZPlugin_800

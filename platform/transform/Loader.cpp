// From DOM elements to compiled expressions. Each expression element has one compile
// function in a table keyed by element name; an element without an entry (Aggregate,
// Lag, TextIndex, anything unknown) is refused as unsupported, so a new element kind is
// one function and one table row.
#include "Loader.h"

#include <algorithm>
#include <cmath>
#include <memory>
#include <unordered_map>
#include <unordered_set>
#include <vector>

#include <xercesc/dom/DOMAttr.hpp>
#include <xercesc/dom/DOMNode.hpp>

#include "Elements.h"
#include "QZSafeParser.h"
#include "QZTransformation.h"

namespace QZTransformNS_8_0_0 {
namespace internal {

namespace xc = xercesc;

namespace {

constexpr long kUnsupported = QZTransformation::TRANSFORM_UNSUPPORTED;
constexpr long kUnknownReference = QZTransformation::TRANSFORM_UNKNOWN_REFERENCE;
constexpr long kMalformed = QZTransformation::TRANSFORM_MALFORMED;
constexpr long kCycle = QZTransformation::TRANSFORM_CYCLE;

using XString = std::basic_string<XMLCh>;

// An ASCII name as a Xerces-C++ string (names of PMML attributes are ASCII).
XString X(const char* ascii) {
  XString out;
  while (*ascii != '\0') out.push_back(static_cast<XMLCh>(*ascii++));
  return out;
}

// The attribute's value when present (an empty value counts as present).
bool GetAttribute(const xc::DOMElement& element, const char* name, std::string* value) {
  const xc::DOMAttr* attr = element.getAttributeNode(X(name).c_str());
  if (attr == nullptr) return false;
  *value = QZXML_800::TranscodeToUTF8(attr->getValue());
  return true;
}

// The element's own character data (text and CDATA children, not those of nested
// elements such as an Extension).
std::string OwnText(const xc::DOMElement& element) {
  std::string text;
  for (const xc::DOMNode* n = element.getFirstChild(); n != nullptr; n = n->getNextSibling()) {
    const auto type = n->getNodeType();
    if (type == xc::DOMNode::TEXT_NODE || type == xc::DOMNode::CDATA_SECTION_NODE) {
      text += QZXML_800::TranscodeToUTF8(n->getNodeValue());
    }
  }
  return text;
}

// The child elements, without Extensions (which may appear anywhere and are ignored).
std::vector<const xc::DOMElement*> Content(const xc::DOMElement& element) {
  std::vector<const xc::DOMElement*> children;
  for (const xc::DOMElement* c = element.getFirstElementChild(); c != nullptr;
       c = c->getNextElementSibling()) {
    if (ElementName(*c) != "Extension") children.push_back(c);
  }
  return children;
}

bool ParseClosure(const std::string& closure, bool* leftClosed, bool* rightClosed) {
  if (closure == "openOpen" || closure == "openClosed" || closure == "closedOpen" ||
      closure == "closedClosed") {
    *leftClosed = closure.compare(0, 6, "closed") == 0;
    *rightClosed = closure.size() >= 6 && closure.compare(closure.size() - 6, 6, "Closed") == 0;
    return true;
  }
  return false;
}

// The derived fields a load defines, known before any of them is compiled, so that a
// reference may precede the definition.
struct LoadScope {
  std::unordered_map<std::string, DataType> derivedTypes;
};

// Compiles one DerivedField's or DefineFunction's expression: knows its owner (for
// messages), the data type its constants are read as, the function whose parameters
// are in scope (none for a DerivedField), and records what the expression reads and
// calls.
class Compiler {
 public:
  Compiler(Program& program, const LoadScope& scope, std::string owner, DataType ownerType,
           const Function* function)
      : program_(program),
        scope_(scope),
        owner_(std::move(owner)),
        ownerType_(ownerType),
        function_(function) {}

  ExprPtr Compile(const xc::DOMElement& element);

  // Refuses the owner: "<owner>: <what>".
  [[noreturn]] void Fail(long code, const std::string& what) const {
    throw LoadError{code, owner_ + ": " + what};
  }
  // Refuses the owner for something of its own element: "<owner> <what>".
  [[noreturn]] void FailOwner(long code, const std::string& what) const {
    throw LoadError{code, owner_ + " " + what};
  }

  // The reference of a field the expression reads: a slot, or a parameter inside a
  // function. Remembered for ordering and checking.
  int Input(const std::string& name, const std::string& element) {
    if (function_ != nullptr) {
      const auto& params = function_->params;
      const auto found = std::find(params.begin(), params.end(), name);
      if (found == params.end()) {
        Fail(kUnknownReference, element + " refers to '" + name +
                                    "', which is not a parameter of the function");
      }
      return -static_cast<int>(found - params.begin()) - 1;
    }
    const int slot = program_.Slot(name);
    uses_.push_back({slot, element});
    return slot;
  }
  // The field's declared dataType, kNone when unknown.
  DataType DeclaredType(const std::string& name) const {
    if (function_ != nullptr) {
      const auto& params = function_->params;
      const auto found = std::find(params.begin(), params.end(), name);
      return found == params.end()
                 ? DataType::kNone
                 : function_->paramTypes[static_cast<size_t>(found - params.begin())];
    }
    const auto local = scope_.derivedTypes.find(name);
    if (local != scope_.derivedTypes.end()) return local->second;
    if (program_.IsDerived(name)) return program_.DerivedType(name);
    const auto data = program_.dataFields.find(name);
    return data != program_.dataFields.end() ? data->second.dataType : DataType::kNone;
  }
  // The validity a FieldRef argument's data field declares; null when unknown.
  std::shared_ptr<const FieldValidity> ValidityOf(const xc::DOMElement& element) const {
    std::string name;
    if (function_ != nullptr || ElementName(element) != "FieldRef" ||
        !GetAttribute(element, "field", &name) || program_.IsDerived(name) ||
        scope_.derivedTypes.count(name) != 0) {
      return nullptr;
    }
    const auto data = program_.dataFields.find(name);
    return data != program_.dataFields.end() ? data->second.validity : nullptr;
  }

  // Reads a constant's text as the given type or, when it has none, as the owner's type
  // if it belongs to the owner's own expression (not to one nested in it: a constant
  // inside an Apply of an integer field may well be 2.5).
  Value Constant(const std::string& text, DataType type, const std::string& what) const {
    if (type == DataType::kNone && depth_ <= 1) type = ownerType_;
    Value value;
    std::string why;
    if (!MakeConstant(text, type, &value, &why)) {
      Fail(kMalformed, what + ": " + why);
    }
    return value;
  }
  // An optional constant attribute read as Constant does.
  bool OptionalConstant(const xc::DOMElement& element, const char* attribute, DataType type,
                        const std::string& elementName, Value* out) const {
    std::string text;
    if (!GetAttribute(element, attribute, &text)) return false;
    *out = Constant(text, type, elementName + " " + attribute);
    return true;
  }
  // A required attribute.
  std::string Required(const xc::DOMElement& element, const char* attribute,
                       const std::string& elementName) const {
    std::string value;
    if (!GetAttribute(element, attribute, &value) || value.empty()) {
      Fail(kMalformed, elementName + " has no '" + attribute + "' attribute");
    }
    return value;
  }
  // A number attribute; false when absent.
  bool Number(const xc::DOMElement& element, const char* attribute,
              const std::string& elementName, double* out) const {
    std::string text;
    if (!GetAttribute(element, attribute, &text)) return false;
    *out = Value::TextToReal(text);
    if (IsMissingReal(*out)) {
      Fail(kMalformed, elementName + " " + attribute + ": '" + text + "' is not a number");
    }
    return true;
  }
  // A dataType attribute, kNone when absent; refuses names that are no PMML type.
  DataType ReadDataType(const xc::DOMElement& element, const std::string& elementName) const {
    std::string name;
    if (!GetAttribute(element, "dataType", &name)) return DataType::kNone;
    DataType type;
    if (!ParseDataType(name, &type)) {
      const std::string what = "has an unknown dataType '" + name + "'";
      if (elementName == "DerivedField" || elementName == "DefineFunction") {
        FailOwner(kMalformed, what);
      }
      Fail(kMalformed, elementName + " " + what);
    }
    return type;
  }
  [[noreturn]] void Unexpected(const std::string& elementName, const xc::DOMElement& child) const {
    Fail(kMalformed, elementName + " has an unexpected element '" + ElementName(child) + "'");
  }

  Program& program() { return program_; }
  const std::vector<FieldUse>& uses() const { return uses_; }
  std::vector<std::pair<const Function*, int>>& calls() { return calls_; }
  int depth() const { return depth_; }
  int maxDepth() const { return maxDepth_; }
  uint64_t steps() const { return steps_; }

 private:
  Program& program_;
  const LoadScope& scope_;
  std::string owner_;
  DataType ownerType_;
  const Function* function_;
  std::vector<FieldUse> uses_;
  std::vector<std::pair<const Function*, int>> calls_;
  int depth_ = 0;
  int maxDepth_ = 0;
  uint64_t steps_ = 0;  // expression nodes compiled
};

ExprPtr CompileConstant(Compiler& c, const xc::DOMElement& element) {
  const DataType type = c.ReadDataType(element, "Constant");
  std::string missing;
  if (GetAttribute(element, "missing", &missing)) {
    if (missing == "true" || missing == "1") return ExprPtr(new ConstantExpr(Value()));
    if (missing != "false" && missing != "0") {
      c.Fail(kMalformed, "Constant has a missing attribute '" + missing + "' that is no boolean");
    }
  }
  ExprPtr e(new ConstantExpr(c.Constant(OwnText(element), type, "Constant")));
  e->SetDeclaredType(type);
  return e;
}

ExprPtr CompileFieldRef(Compiler& c, const xc::DOMElement& element) {
  const std::string field = c.Required(element, "field", "FieldRef");
  Value mapMissingTo;
  const bool hasMapMissing =
      c.OptionalConstant(element, "mapMissingTo", DataType::kNone, "FieldRef", &mapMissingTo);
  ExprPtr e(new FieldRefExpr(c.Input(field, "FieldRef"), hasMapMissing, std::move(mapMissingTo)));
  e->SetDeclaredType(c.DeclaredType(field));
  return e;
}

ExprPtr CompileNormContinuous(Compiler& c, const xc::DOMElement& element) {
  const std::string kName = "NormContinuous";
  const std::string field = c.Required(element, "field", kName);
  double mapMissingTo = kMissing;
  const bool hasMapMissing = c.Number(element, "mapMissingTo", kName, &mapMissingTo);
  auto outliers = NormContinuousExpr::Outliers::kAsIs;
  std::string text;
  if (GetAttribute(element, "outliers", &text)) {
    if (text == "asMissingValues") {
      outliers = NormContinuousExpr::Outliers::kAsMissing;
    } else if (text == "asExtremeValues") {
      outliers = NormContinuousExpr::Outliers::kAsExtreme;
    } else if (text != "asIs") {
      c.Fail(kMalformed, kName + " has an unknown outliers treatment '" + text + "'");
    }
  }
  std::vector<double> orig;
  std::vector<double> norm;
  for (const xc::DOMElement* child : Content(element)) {
    if (ElementName(*child) != "LinearNorm") c.Unexpected(kName, *child);
    double o = 0;
    double n = 0;
    if (!c.Number(*child, "orig", "LinearNorm", &o) ||
        !c.Number(*child, "norm", "LinearNorm", &n)) {
      c.Fail(kMalformed, "LinearNorm needs both 'orig' and 'norm'");
    }
    if (!orig.empty() && !(o > orig.back())) {
      c.Fail(kMalformed, kName + ": the orig values of LinearNorm must ascend strictly");
    }
    orig.push_back(o);
    norm.push_back(n);
  }
  if (orig.size() < 2) c.Fail(kMalformed, kName + " needs at least two LinearNorm elements");
  return ExprPtr(new NormContinuousExpr(c.Input(field, kName), std::move(orig), std::move(norm),
                                        outliers, hasMapMissing, mapMissingTo));
}

ExprPtr CompileNormDiscrete(Compiler& c, const xc::DOMElement& element) {
  const std::string kName = "NormDiscrete";
  const std::string field = c.Required(element, "field", kName);
  std::string value;
  if (!GetAttribute(element, "value", &value))
    c.Fail(kMalformed, kName + " has no 'value' attribute");
  std::string method;
  if (GetAttribute(element, "method", &method) && method != "indicator") {
    c.Fail(kMalformed, kName + " has an unknown method '" + method + "'");
  }
  double mapMissingTo = kMissing;
  const bool hasMapMissing = c.Number(element, "mapMissingTo", kName, &mapMissingTo);
  for (const xc::DOMElement* child : Content(element)) c.Unexpected(kName, *child);
  return ExprPtr(
      new NormDiscreteExpr(c.Input(field, kName), Cell(value), hasMapMissing, mapMissingTo));
}

ExprPtr CompileDiscretize(Compiler& c, const xc::DOMElement& element) {
  const std::string kName = "Discretize";
  const std::string field = c.Required(element, "field", kName);
  const DataType type = c.ReadDataType(element, kName);
  Value v;
  Result mapMissingTo;
  Result defaultValue;
  if (c.OptionalConstant(element, "mapMissingTo", type, kName, &v)) mapMissingTo = Result(v);
  if (c.OptionalConstant(element, "defaultValue", type, kName, &v)) defaultValue = Result(v);
  std::vector<DiscretizeExpr::Bin> bins;
  for (const xc::DOMElement* bin : Content(element)) {
    if (ElementName(*bin) != "DiscretizeBin") c.Unexpected(kName, *bin);
    std::string binValue;
    if (!GetAttribute(*bin, "binValue", &binValue)) {
      c.Fail(kMalformed, "DiscretizeBin has no 'binValue' attribute");
    }
    const std::vector<const xc::DOMElement*> intervals = Content(*bin);
    if (intervals.size() != 1 || ElementName(*intervals[0]) != "Interval") {
      c.Fail(kMalformed, "DiscretizeBin '" + binValue + "' needs exactly one Interval");
    }
    const xc::DOMElement& interval = *intervals[0];
    DiscretizeExpr::Bin b{-HUGE_VAL, HUGE_VAL, false, false,
                          Result(c.Constant(binValue, type, "DiscretizeBin binValue"))};
    if (!ParseClosure(c.Required(interval, "closure", "Interval"), &b.leftClosed, &b.rightClosed)) {
      c.Fail(kMalformed, "Interval has an unknown closure");
    }
    c.Number(interval, "leftMargin", "Interval", &b.left);
    c.Number(interval, "rightMargin", "Interval", &b.right);
    if (b.left > b.right) c.Fail(kMalformed, "Interval has a leftMargin above its rightMargin");
    bins.push_back(std::move(b));
  }
  return ExprPtr(new DiscretizeExpr(c.Input(field, kName), std::move(bins), std::move(mapMissingTo),
                                    std::move(defaultValue)));
}

ExprPtr CompileMapValues(Compiler& c, const xc::DOMElement& element) {
  const std::string kName = "MapValues";
  const std::string outputColumn = c.Required(element, "outputColumn", kName);
  const DataType type = c.ReadDataType(element, kName);
  Value v;
  Result mapMissingTo;
  Result defaultValue;
  if (c.OptionalConstant(element, "mapMissingTo", type, kName, &v)) mapMissingTo = Result(v);
  if (c.OptionalConstant(element, "defaultValue", type, kName, &v)) defaultValue = Result(v);

  std::vector<std::string> fields;
  std::vector<std::string> columns;
  const xc::DOMElement* table = nullptr;
  for (const xc::DOMElement* child : Content(element)) {
    const std::string name = ElementName(*child);
    if (name == "FieldColumnPair") {
      fields.push_back(c.Required(*child, "field", name));
      columns.push_back(c.Required(*child, "column", name));
    } else if (name == "InlineTable" && table == nullptr) {
      table = child;
    } else if (name == "TableLocator") {
      c.Fail(kUnsupported, kName + ": TableLocator is not supported");
    } else {
      c.Unexpected(kName, *child);
    }
  }
  if (fields.empty()) c.Fail(kMalformed, kName + " has no FieldColumnPair");
  if (table == nullptr) c.Fail(kMalformed, kName + " has no InlineTable");

  std::vector<MapValuesExpr::Row> rows;
  for (const xc::DOMElement* row : Content(*table)) {
    if (ElementName(*row) != "row") c.Unexpected("InlineTable", *row);
    MapValuesExpr::Row r;
    r.cells.resize(columns.size());
    r.has.assign(columns.size(), false);
    bool hasOutput = false;
    for (const xc::DOMElement* cell : Content(*row)) {
      const std::string column = ElementName(*cell);
      for (size_t i = 0; i < columns.size(); ++i) {
        if (columns[i] == column && !r.has[i]) {
          r.cells[i] = Cell(OwnText(*cell));
          r.has[i] = true;
        }
      }
      if (column == outputColumn && !hasOutput) {
        r.output =
            Result(c.Constant(OwnText(*cell), type, kName + " column '" + outputColumn + "'"));
        hasOutput = true;
      }
    }
    rows.push_back(std::move(r));
  }
  std::vector<int> refs;
  for (const std::string& field : fields) refs.push_back(c.Input(field, "FieldColumnPair"));
  return ExprPtr(new MapValuesExpr(std::move(refs), std::move(rows), std::move(mapMissingTo),
                                   std::move(defaultValue)));
}

// Everything of an Apply but its arguments, read outside CompileApply so that the
// frame CompileApply keeps on the stack for each level of nesting stays small.
[[gnu::noinline]] std::unique_ptr<ApplySite> ReadApply(Compiler& c, const xc::DOMElement& element,
                                                       const Function** function,
                                                       std::vector<const xc::DOMElement*>* args) {
  auto site = std::make_unique<ApplySite>();
  site->function = c.Required(element, "function", "Apply");
  const std::string what = "Apply '" + site->function + "'";

  int minArgs = 0;
  int maxArgs = 0;
  if (!FindBuiltin(site->function, &minArgs, &maxArgs)) {
    *function = c.program().FindFunction(site->function);
    if (*function == nullptr) {
      c.Fail(kUnsupported, what + ": the function is neither a built-in function nor a "
                                  "DefineFunction");
    }
    minArgs = maxArgs = static_cast<int>((*function)->params.size());
  }
  *args = Content(element);
  const int n = static_cast<int>(args->size());
  if (n < minArgs || (maxArgs >= 0 && n > maxArgs)) {
    const std::string expected = minArgs == maxArgs ? std::to_string(minArgs)
                                 : maxArgs < 0      ? "at least " + std::to_string(minArgs)
                                                    : std::to_string(minArgs) + " to " +
                                                          std::to_string(maxArgs);
    const bool one = minArgs == 1 && (maxArgs == 1 || maxArgs < 0);
    c.Fail(kMalformed, what + " takes " + expected + " argument" + (one ? "" : "s") + ", not " +
                           std::to_string(n));
  }

  ApplyOptions& options = site->options;
  options.hasMapMissing =
      c.OptionalConstant(element, "mapMissingTo", DataType::kNone, what, &options.mapMissingTo);
  options.hasDefault =
      c.OptionalConstant(element, "defaultValue", DataType::kNone, what, &options.defaultValue);
  std::string text;
  if (GetAttribute(element, "invalidValueTreatment", &text)) {
    if (text == "asIs") {
      options.invalid = InvalidTreatment::kAsIs;
    } else if (text == "asMissing") {
      options.invalid = InvalidTreatment::kAsMissing;
    } else if (text != "returnInvalid") {
      c.Fail(kMalformed, what + " has an unknown invalidValueTreatment '" + text + "'");
    }
  }
  site->args.reserve(args->size());
  site->validity.reserve(args->size());
  return site;
}

// Builds the Apply's node once its arguments are compiled.
[[gnu::noinline]] ExprPtr BuildApplyNode(Compiler& c, ApplySite& site, const Function* function) {
  if (function != nullptr) {
    c.calls().emplace_back(function, c.depth());
    return BuildCall(site, *function);
  }
  try {
    return BuildApply(site);
  } catch (const BuildError& e) {
    c.Fail(e.code, "Apply '" + site.function + "': " + e.message);
  }
}

ExprPtr CompileApply(Compiler& c, const xc::DOMElement& element) {
  const Function* function = nullptr;
  std::vector<const xc::DOMElement*> args;
  std::unique_ptr<ApplySite> site = ReadApply(c, element, &function, &args);
  for (const xc::DOMElement* arg : args) {
    site->validity.push_back(c.ValidityOf(*arg));
    site->args.push_back(c.Compile(*arg));
  }
  return BuildApplyNode(c, *site, function);
}

using ElementCompiler = ExprPtr (*)(Compiler&, const xc::DOMElement&);

const std::unordered_map<std::string, ElementCompiler>& ExpressionElements() {
  static const std::unordered_map<std::string, ElementCompiler> kTable = {
      {"Constant", &CompileConstant},
      {"FieldRef", &CompileFieldRef},
      {"NormContinuous", &CompileNormContinuous},
      {"NormDiscrete", &CompileNormDiscrete},
      {"Discretize", &CompileDiscretize},
      {"MapValues", &CompileMapValues},
      {"Apply", &CompileApply},
  };
  return kTable;
}

// The compile function of an element (kept out of Compile's frame, which is on the
// stack once per level of nesting).
[[gnu::noinline]] ElementCompiler FindElementCompiler(const Compiler& c,
                                                      const xc::DOMElement& element, int depth) {
  const std::string name = ElementName(element);
  const auto& table = ExpressionElements();
  const auto found = table.find(name);
  if (found == table.end()) c.Fail(kUnsupported, "element '" + name + "' is not supported");
  // Checked before descending, so compiling needs no more stack than evaluating.
  if (depth > kMaxExpressionDepth) {
    c.Fail(kMalformed, "expressions are nested deeper than " +
                           std::to_string(kMaxExpressionDepth) + " levels");
  }
  return found->second;
}

ExprPtr Compiler::Compile(const xc::DOMElement& element) {
  const ElementCompiler compile = FindElementCompiler(*this, element, ++depth_);
  maxDepth_ = std::max(maxDepth_, depth_);
  ++steps_;
  ExprPtr expr = compile(*this, element);
  --depth_;
  return expr;
}

// The one expression of a DerivedField or DefineFunction, among elements it may hold
// besides (allowed).
const xc::DOMElement* TheExpression(const Compiler& c, const xc::DOMElement& element,
                                    const char* allowed) {
  const xc::DOMElement* expression = nullptr;
  for (const xc::DOMElement* child : Content(element)) {
    const std::string name = ElementName(*child);
    if (name == allowed) continue;
    if (expression != nullptr) {
      c.FailOwner(kMalformed, "has more than one expression ('" + ElementName(*expression) +
                                  "' and '" + name + "')");
    }
    expression = child;
  }
  if (expression == nullptr) c.FailOwner(kMalformed, "has no expression");
  return expression;
}

std::shared_ptr<DerivedField> CompileDerivedField(const xc::DOMElement& element,
                                                  const std::string& name,
                                                  const LoadScope& scope, Program& program) {
  auto field = std::make_shared<DerivedField>();
  field->name = name;
  Compiler compiler(program, scope, "DerivedField '" + name + "'", DataType::kNone, nullptr);
  field->dataType = compiler.ReadDataType(element, "DerivedField");
  Compiler typed(program, scope, "DerivedField '" + name + "'", field->dataType, nullptr);
  field->kind = KindOf(field->dataType);
  if (GetAttribute(element, "optype", &field->optype) && field->optype != "categorical" &&
      field->optype != "ordinal" && field->optype != "continuous") {
    typed.FailOwner(kMalformed, "has an unknown optype '" + field->optype + "'");
  }
  // A continuous field without a dataType holds numbers.
  if (field->dataType == DataType::kNone && field->optype == "continuous") {
    field->kind = ValueKind::kReal;
  }
  const xc::DOMElement* expression = TheExpression(typed, element, "Value");
  field->slot = program.Slot(field->name);
  field->expr = typed.Compile(*expression);
  field->numeric = field->expr->IsNumeric() && field->kind != ValueKind::kText;
  field->uses = typed.uses();
  field->calls = std::move(typed.calls());
  field->ownDepth = typed.maxDepth();
  field->ownSteps = typed.steps();
  return field;
}

// Reads a DefineFunction's signature (the body is compiled later).
std::shared_ptr<Function> ReadSignature(const xc::DOMElement& element, const LoadScope& scope,
                                        Program& program) {
  auto function = std::make_shared<Function>();
  if (!GetAttribute(element, "name", &function->name) || function->name.empty()) {
    throw LoadError{kMalformed, "a DefineFunction has no 'name' attribute"};
  }
  Compiler c(program, scope, "DefineFunction '" + function->name + "'", DataType::kNone, nullptr);
  int minArgs = 0;
  int maxArgs = 0;
  if (FindBuiltin(function->name, &minArgs, &maxArgs)) {
    c.FailOwner(kMalformed, "has the name of a built-in function");
  }
  function->dataType = c.ReadDataType(element, "DefineFunction");
  function->kind = KindOf(function->dataType);
  for (const xc::DOMElement* child : Content(element)) {
    if (ElementName(*child) != "ParameterField") continue;
    const std::string param = c.Required(*child, "name", "ParameterField");
    if (std::find(function->params.begin(), function->params.end(), param) !=
        function->params.end()) {
      c.Fail(kMalformed, "ParameterField '" + param + "' is defined twice");
    }
    const DataType type = c.ReadDataType(*child, "ParameterField");
    function->params.push_back(param);
    function->paramTypes.push_back(type);
    function->paramKinds.push_back(KindOf(type));
  }
  return function;
}

void CompileBody(const xc::DOMElement& element, Function& function, const LoadScope& scope,
                 Program& program) {
  Compiler c(program, scope, "DefineFunction '" + function.name + "'", function.dataType,
             &function);
  function.body = c.Compile(*TheExpression(c, element, "ParameterField"));
  function.calls = std::move(c.calls());
  function.ownDepth = c.maxDepth();
  function.ownSteps = c.steps();
}

// The nesting depth of an evaluation through calls: own depth, or a call's depth plus
// the callee's.
int TotalDepth(int ownDepth, const std::vector<std::pair<const Function*, int>>& calls) {
  int depth = ownDepth;
  for (const auto& call : calls) depth = std::max(depth, call.second + call.first->depth);
  return depth;
}

// The nodes one evaluation visits at most: its own, and the callee's for every call site.
// Stops counting just past the limit, so that the sum cannot overflow.
uint64_t TotalSteps(uint64_t ownSteps, const std::vector<std::pair<const Function*, int>>& calls) {
  uint64_t steps = ownSteps;
  for (const auto& call : calls) {
    steps += call.first->steps;
    if (steps > kMaxEvaluationSteps) return kMaxEvaluationSteps + 1;
  }
  return steps;
}

std::string StepsText() {
  return "evaluating it takes more than " + std::to_string(kMaxEvaluationSteps) +
         " steps, counting the calls of functions";
}

// Refuses calls between the new functions that form a cycle, then gives each its total
// depth (callees first). Depth-first without recursion: chains of calls may be long.
void CheckFunctions(const std::vector<std::shared_ptr<Function>>& functions) {
  std::unordered_map<const Function*, size_t> index;
  for (size_t i = 0; i < functions.size(); ++i) index.emplace(functions[i].get(), i);
  enum : char { kNew, kActive, kDone };
  std::vector<char> state(functions.size(), kNew);
  struct Frame {
    size_t function;
    size_t next;
  };
  std::vector<Frame> stack;
  for (size_t root = 0; root < functions.size(); ++root) {
    if (state[root] != kNew) continue;
    state[root] = kActive;
    stack.push_back({root, 0});
    while (!stack.empty()) {
      Frame& top = stack.back();
      Function& f = *functions[top.function];
      if (top.next < f.calls.size()) {
        const auto found = index.find(f.calls[top.next++].first);
        if (found == index.end() || state[found->second] == kDone) continue;  // loaded before
        if (state[found->second] == kActive) {
          size_t from = stack.size();
          while (stack[from - 1].function != found->second) --from;
          if (from == stack.size()) {
            throw LoadError{kCycle, "DefineFunction '" + f.name + "' calls itself"};
          }
          std::string text = "DefineFunctions ";
          for (size_t i = from - 1; i < stack.size(); ++i) {
            text += "'" + functions[stack[i].function]->name + "' -> ";
          }
          text += "'" + functions[found->second]->name + "' call each other in a cycle";
          throw LoadError{kCycle, text};
        }
        state[found->second] = kActive;
        stack.push_back({found->second, 0});
      } else {
        f.depth = TotalDepth(f.ownDepth, f.calls);
        if (f.depth > kMaxExpressionDepth) {
          throw LoadError{kMalformed, "DefineFunction '" + f.name +
                                          "': expressions are nested deeper than " +
                                          std::to_string(kMaxExpressionDepth) +
                                          " levels, counting the calls of functions"};
        }
        f.steps = TotalSteps(f.ownSteps, f.calls);
        if (f.steps > kMaxEvaluationSteps) {
          throw LoadError{kMalformed, "DefineFunction '" + f.name + "': " + StepsText()};
        }
        state[top.function] = kDone;
        stack.pop_back();
      }
    }
  }
}

std::string CycleText(const std::vector<std::string>& cycle) {
  if (cycle.size() <= 2) return "DerivedField '" + cycle.front() + "' refers to itself";
  std::string text = "DerivedFields ";
  for (size_t i = 0; i < cycle.size(); ++i) {
    if (i > 0) text += " -> ";
    text += "'" + cycle[i] + "'";
  }
  return text + " depend on each other in a cycle";
}

}  // namespace

std::string ElementName(const xc::DOMElement& element) {
  const XMLCh* local = element.getLocalName();
  return QZXML_800::TranscodeToUTF8(local != nullptr ? local : element.getTagName());
}

void ReadDataDictionary(const xc::DOMElement& dataDictionary, Program& program) {
  program.knowsDataFields = true;
  for (const xc::DOMElement* child : Content(dataDictionary)) {
    std::string name;
    if (ElementName(*child) != "DataField" || !GetAttribute(*child, "name", &name)) continue;
    DataFieldInfo info;
    std::string text;
    if (GetAttribute(*child, "dataType", &text)) ParseDataType(text, &info.dataType);
    auto validity = std::make_shared<FieldValidity>();
    validity->numeric = KindOf(info.dataType) == ValueKind::kReal;
    for (const xc::DOMElement* item : Content(*child)) {
      const std::string kind = ElementName(*item);
      if (kind == "Value" && GetAttribute(*item, "value", &text)) {
        std::string property = "valid";
        GetAttribute(*item, "property", &property);
        (property == "valid" ? validity->valid : validity->notValid).push_back(Cell(text));
      } else if (kind == "Interval") {
        FieldValidity::Interval interval{-HUGE_VAL, HUGE_VAL, false, false};
        if (!GetAttribute(*item, "closure", &text) ||
            !ParseClosure(text, &interval.leftClosed, &interval.rightClosed)) {
          continue;  // the data dictionary's own reader judges its form
        }
        if (GetAttribute(*item, "leftMargin", &text)) interval.left = Value::TextToReal(text);
        if (GetAttribute(*item, "rightMargin", &text)) interval.right = Value::TextToReal(text);
        if (IsMissingReal(interval.left)) interval.left = -HUGE_VAL;
        if (IsMissingReal(interval.right)) interval.right = HUGE_VAL;
        validity->intervals.push_back(interval);
      }
    }
    info.validity = std::move(validity);
    program.dataFields[name] = std::move(info);
  }
}

void CompileTransformations(const xc::DOMElement& root, Program& program) {
  const std::string rootName = ElementName(root);
  const size_t firstNew = program.Fields().size();

  // Every name first, so that fields and functions may be used before their definition.
  LoadScope scope;
  std::vector<std::pair<const xc::DOMElement*, std::string>> derived;
  std::vector<std::pair<const xc::DOMElement*, std::shared_ptr<Function>>> functions;
  std::unordered_set<std::string> names;
  for (const xc::DOMElement* child : Content(root)) {
    const std::string kind = ElementName(*child);
    if (kind == "DerivedField") {
      std::string name;
      if (!GetAttribute(*child, "name", &name) || name.empty()) {
        throw LoadError{kMalformed, "DerivedField number " + std::to_string(derived.size() + 1) +
                                        " has no 'name' attribute"};
      }
      if (!names.insert(name).second || program.IsDerived(name)) {
        throw LoadError{kMalformed, "DerivedField '" + name + "' is defined twice"};
      }
      std::string type;
      DataType dataType = DataType::kNone;
      if (GetAttribute(*child, "dataType", &type)) ParseDataType(type, &dataType);
      scope.derivedTypes[name] = dataType;
      derived.emplace_back(child, name);
    } else if (kind == "DefineFunction") {
      std::shared_ptr<Function> function = ReadSignature(*child, scope, program);
      if (!program.AddFunction(function)) {
        throw LoadError{kMalformed, "DefineFunction '" + function->name + "' is defined twice"};
      }
      functions.emplace_back(child, std::move(function));
    } else {
      std::string id;
      const std::string what = GetAttribute(*child, "name", &id) ? kind + " '" + id + "'"
                                                                 : "element '" + kind + "'";
      throw LoadError{kUnsupported, rootName + ": " + what + " is not supported"};
    }
  }

  for (const auto& f : functions) CompileBody(*f.first, *f.second, scope, program);
  std::vector<std::shared_ptr<Function>> newFunctions;
  for (const auto& f : functions) newFunctions.push_back(f.second);
  CheckFunctions(newFunctions);

  for (const auto& d : derived) {
    std::shared_ptr<DerivedField> field = CompileDerivedField(*d.first, d.second, scope, program);
    if (TotalDepth(field->ownDepth, field->calls) > kMaxExpressionDepth) {
      throw LoadError{kMalformed, "DerivedField '" + field->name +
                                      "': expressions are nested deeper than " +
                                      std::to_string(kMaxExpressionDepth) +
                                      " levels, counting the calls of functions"};
    }
    field->steps = TotalSteps(field->ownSteps, field->calls);
    program.AddField(std::move(field));
  }
  // Transform evaluates every field once a record: the bound holds for all of them.
  uint64_t steps = 0;
  for (const auto& field : program.Fields()) {
    steps += field->steps;
    if (steps > kMaxEvaluationSteps) {
      throw LoadError{kMalformed, "DerivedField '" + field->name + "': with the fields before it, " +
                                      StepsText()};
    }
  }

  // References can be checked only once every field is known (any document order).
  const auto& fields = program.Fields();
  const std::vector<std::string>& slotNames = program.SlotNames();
  if (program.knowsDataFields) {
    for (size_t f = firstNew; f < fields.size(); ++f) {
      for (const FieldUse& use : fields[f]->uses) {
        const std::string& name = slotNames[static_cast<size_t>(use.slot)];
        if (!program.IsDerived(name) && program.dataFields.count(name) == 0) {
          throw LoadError{kUnknownReference,
                          "DerivedField '" + fields[f]->name + "': " + use.element +
                              " refers to '" + name +
                              "', which is neither a data field nor a derived field"};
        }
      }
    }
  }
  std::vector<std::string> cycle;
  if (!program.ComputeOrder(&cycle)) throw LoadError{kCycle, CycleText(cycle)};
}

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

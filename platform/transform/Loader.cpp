// From DOM elements to compiled expressions. Each expression element has one compile
// function in a table keyed by element name; an element without an entry is refused as
// unsupported, so a new element kind is one function and one table row.
#include "Loader.h"

#include <unordered_map>
#include <vector>

#include <xercesc/dom/DOMAttr.hpp>
#include <xercesc/dom/DOMNode.hpp>

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

std::vector<const xc::DOMElement*> ChildElements(const xc::DOMElement& element) {
  std::vector<const xc::DOMElement*> children;
  for (const xc::DOMElement* c = element.getFirstElementChild(); c != nullptr;
       c = c->getNextElementSibling()) {
    children.push_back(c);
  }
  return children;
}

// Compiles the expression of one DerivedField: knows the field (for messages and for
// recording the fields it reads) and the data type its constants are read as.
class Compiler {
 public:
  Compiler(Program& program, DerivedField& field) : program_(program), field_(field) {}

  ExprPtr Compile(const xc::DOMElement& element);

  // Refuses the field: "DerivedField 'name': <what>".
  [[noreturn]] void Fail(long code, const std::string& what) const {
    throw LoadError{code, "DerivedField '" + field_.name + "': " + what};
  }
  // Refuses the field for something of the DerivedField element itself:
  // "DerivedField 'name' <what>".
  [[noreturn]] void FailField(long code, const std::string& what) const {
    throw LoadError{code, "DerivedField '" + field_.name + "' " + what};
  }
  // A field the expression reads: its slot, remembered for ordering and checking.
  int Use(const std::string& name, const char* element) {
    const int slot = program_.Slot(name);
    field_.uses.push_back({slot, element});
    return slot;
  }
  // Reads a constant's text as the given type, or as the field's own type when the
  // constant has none.
  Value Constant(const std::string& text, DataType type, const std::string& what) {
    Value value;
    std::string why;
    if (!MakeConstant(text, type != DataType::kNone ? type : field_.dataType, &value, &why)) {
      Fail(kMalformed, what + ": " + why);
    }
    return value;
  }
  // A dataType attribute, kNone when absent; refuses names that are no PMML type.
  DataType ReadDataType(const xc::DOMElement& element, const std::string& elementName) {
    std::string name;
    if (!GetAttribute(element, "dataType", &name)) return DataType::kNone;
    DataType type;
    if (!ParseDataType(name, &type)) {
      const std::string what = "has an unknown dataType '" + name + "'";
      if (elementName == "DerivedField") FailField(kMalformed, what);
      Fail(kMalformed, elementName + " " + what);
    }
    return type;
  }

 private:
  Program& program_;
  DerivedField& field_;
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
  return ExprPtr(new ConstantExpr(c.Constant(OwnText(element), type, "Constant")));
}

ExprPtr CompileFieldRef(Compiler& c, const xc::DOMElement& element) {
  std::string field;
  if (!GetAttribute(element, "field", &field) || field.empty()) {
    c.Fail(kMalformed, "FieldRef has no 'field' attribute");
  }
  std::string text;
  const bool hasMapMissing = GetAttribute(element, "mapMissingTo", &text);
  Value mapMissingTo;
  if (hasMapMissing) mapMissingTo = c.Constant(text, DataType::kNone, "FieldRef mapMissingTo");
  return ExprPtr(new FieldRefExpr(c.Use(field, "FieldRef"), hasMapMissing,
                                  std::move(mapMissingTo)));
}

using ElementCompiler = ExprPtr (*)(Compiler&, const xc::DOMElement&);

const std::unordered_map<std::string, ElementCompiler>& ExpressionElements() {
  static const std::unordered_map<std::string, ElementCompiler> kTable = {
      {"Constant", &CompileConstant},
      {"FieldRef", &CompileFieldRef},
  };
  return kTable;
}

ExprPtr Compiler::Compile(const xc::DOMElement& element) {
  const std::string name = ElementName(element);
  const auto& table = ExpressionElements();
  const auto found = table.find(name);
  if (found == table.end()) Fail(kUnsupported, "element '" + name + "' is not supported");
  return found->second(*this, element);
}

std::shared_ptr<const DerivedField> CompileDerivedField(const xc::DOMElement& element,
                                                        size_t position, Program& program) {
  auto field = std::make_shared<DerivedField>();
  if (!GetAttribute(element, "name", &field->name) || field->name.empty()) {
    throw LoadError{kMalformed, "DerivedField number " + std::to_string(position) +
                                " has no 'name' attribute"};
  }
  Compiler compiler(program, *field);
  field->dataType = compiler.ReadDataType(element, "DerivedField");
  field->kind = KindOf(field->dataType);
  if (GetAttribute(element, "optype", &field->optype) && field->optype != "categorical" &&
      field->optype != "ordinal" && field->optype != "continuous") {
    compiler.FailField(kMalformed, "has an unknown optype '" + field->optype + "'");
  }
  // The content: extensions and valid-value lists around exactly one expression.
  const xc::DOMElement* expression = nullptr;
  for (const xc::DOMElement* child : ChildElements(element)) {
    const std::string name = ElementName(*child);
    if (name == "Extension" || name == "Value") continue;
    if (expression != nullptr) {
      compiler.FailField(kMalformed, "has more than one expression ('" +
                                         ElementName(*expression) + "' and '" + name + "')");
    }
    expression = child;
  }
  if (expression == nullptr) compiler.FailField(kMalformed, "has no expression");
  field->slot = program.Slot(field->name);
  field->expr = compiler.Compile(*expression);
  return field;
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
  for (const xc::DOMElement* child : ChildElements(dataDictionary)) {
    std::string name;
    if (ElementName(*child) == "DataField" && GetAttribute(*child, "name", &name)) {
      program.dataFields.insert(name);
    }
  }
}

void CompileTransformations(const xc::DOMElement& root, Program& program) {
  const std::string rootName = ElementName(root);
  const size_t firstNew = program.Fields().size();
  size_t position = 0;
  for (const xc::DOMElement* child : ChildElements(root)) {
    const std::string name = ElementName(*child);
    if (name == "Extension") continue;
    if (name != "DerivedField") {
      std::string id;
      const std::string what = GetAttribute(*child, "name", &id)
                                   ? name + " '" + id + "'"
                                   : "element '" + name + "'";
      throw LoadError{kUnsupported, rootName + ": " + what + " is not supported"};
    }
    std::shared_ptr<const DerivedField> field = CompileDerivedField(*child, ++position, program);
    if (!program.AddField(field)) {
      throw LoadError{kMalformed, "DerivedField '" + field->name + "' is defined twice"};
    }
  }

  // References can be checked only once every field is known (any document order).
  const auto& fields = program.Fields();
  const std::vector<std::string>& slotNames = program.SlotNames();
  if (program.knowsDataFields) {
    for (size_t f = firstNew; f < fields.size(); ++f) {
      for (const FieldUse& use : fields[f]->uses) {
        const std::string& name = slotNames[use.slot];
        if (!program.IsDerived(name) && program.dataFields.count(name) == 0) {
          throw LoadError{kUnknownReference, "DerivedField '" + fields[f]->name + "': " + use.element +
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

#include "ScoringPMMLParser.h"

#include <exception>
#include <limits>
#include <new>
#include <optional>
#include <string>
#include <vector>

#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMNamedNodeMap.hpp>
#include <xercesc/util/PlatformUtils.hpp>
#include <xercesc/util/XMLString.hpp>

#include "QZSafeParser.h"
#include "ScoringMutexContainer.h"
#include "ScoringMutexLock.h"
#include "ScoringPMMLTags.h"
#include "ScoringStatusCodes.h"
#include "TraceLog.h"
#include "WideName.h"
#include "XMLElement.h"

XERCES_CPP_NAMESPACE_USE
using QZCommon_800::QZStatus;
using QZXML_800::IQZEncoder;
using QZXML_800::IQZVariable;
using QZXML_800::QZCatVar;
using QZXML_800::QZVarList;
using QZXML_800::XMLElement;

namespace QZScoring_800 {

namespace {

using Tags = ScoringPMMLTags;

const char kLogFile[] = "scoring.log";
const char kInitXerces[] = "QZScoring_800::ScoringPMMLParser::InitXerces";
const char kFillVarList[] = "QZScoring_800::ScoringPMMLParser::FillVarList";

constexpr double kLowest = std::numeric_limits<double>::lowest();
constexpr double kHighest = std::numeric_limits<double>::max();
// IQZEncoder::GetValueType of an encoder whose categories are numbers.
constexpr int kNumberValues = 2;

// Storage codes by dataType. The day and second counts keep no epoch year.
struct StorageEntry {
  const char* dataType;
  int code;
};
const StorageEntry kStorageTable[] = {
    {Tags::PMML_VAL_INTEGER, QZXML_800::STORAGE_INTEGER},
    {"boolean", QZXML_800::STORAGE_INTEGER},
    {Tags::PMML_VAL_DOUBLE, QZXML_800::STORAGE_REAL},
    {Tags::PMML_VAL_FLOAT, QZXML_800::STORAGE_REAL},
    {Tags::PMML_VAL_DATE, QZXML_800::STORAGE_REAL},
    {Tags::PMML_VAL_TIME, QZXML_800::STORAGE_REAL},
    {Tags::PMML_VAL_DATE_TIME, QZXML_800::STORAGE_REAL},
    {Tags::PMML_VAL_STRING, QZXML_800::STORAGE_STRING},
    {"dateDaysSince[0]", QZXML_800::STORAGE_DATE_DAYS},
    {"dateDaysSince[1960]", QZXML_800::STORAGE_DATE_DAYS},
    {Tags::PMML_VAL_DATE_DAYS_SINCE_1970, QZXML_800::STORAGE_DATE_DAYS},
    {"dateDaysSince[1980]", QZXML_800::STORAGE_DATE_DAYS},
    {Tags::PMML_VAL_TIME_SECONDS, QZXML_800::STORAGE_TIME_SECONDS},
    {"dateTimeSecondsSince[0]", QZXML_800::STORAGE_DATETIME_SECONDS},
    {"dateTimeSecondsSince[1960]", QZXML_800::STORAGE_DATETIME_SECONDS},
    {Tags::PMML_VAL_DATE_TIME_SECONDS_SINCE_1970, QZXML_800::STORAGE_DATETIME_SECONDS},
    {"dateTimeSecondsSince[1980]", QZXML_800::STORAGE_DATETIME_SECONDS},
};

QZStatus Error(long code) { return QZStatus(code, false); }

// Writes the trace entry for an exception caught at `line` of `function`.
void TraceException(const char* function, int line) {
  TraceLog(kLogFile, 2, "  Exception:Function:%s; Line:%s", function,
           std::to_string(line).c_str());
}

// A message for the exception being handled: Xerces-C++'s own text where it has one.
std::string DescribeCurrentException() {
  std::string message;
  try {
    throw;
  } catch (const std::bad_alloc&) {
    message = "out of memory";
  } catch (const std::exception& e) {
    message = e.what();
  } catch (...) {
    if (!QZXML_800::DescribeXMLException(std::current_exception(), &message)) {
      message = "unexpected failure";
    }
  }
  return message;
}

// The per-field working data of FillVarList; none of it survives the field.
struct FieldData {
  std::string name;
  std::string label;
  bool categorical = true;
  bool ordinal = false;
  bool numeric = true;
  int storage = QZXML_800::STORAGE_UNKNOWN;
  bool flagMeasure = false;
  const XMLCh* flagTrueValue = nullptr;
  bool hasFormat = false;
  std::optional<std::string> width;
  std::optional<std::string> decimals;
  std::vector<std::string> validStrings, invalidStrings;
  std::vector<double> validNumbers, invalidNumbers;
  std::vector<std::string> validLabels, invalidLabels;
  double intervalLow = kLowest, intervalHigh = kHighest;
  double missingLow = kLowest, missingHigh = kHighest;
};

// Calls visit for every element named `tag` below `root` (at any depth, in document
// order). Walks the tree directly instead of asking the document for a node list, which
// the document would keep cached until it is released.
template <class Visit>
void ForEachDescendant(const DOMNode* root, const std::string& tag, Visit visit) {
  const WideName name(tag);
  const DOMNode* node = root->getFirstChild();
  while (node != nullptr) {
    if (node->getNodeType() == DOMNode::ELEMENT_NODE &&
        XMLString::equals(node->getNodeName(), name.c_str())) {
      visit(static_cast<const DOMElement*>(node));
    }
    if (const DOMNode* child = node->getFirstChild()) {
      node = child;
      continue;
    }
    while (node != root && node->getNextSibling() == nullptr) node = node->getParentNode();
    node = node != root ? node->getNextSibling() : nullptr;
  }
}

std::string LabelAt(const std::vector<std::string>& labels, size_t i) {
  return i < labels.size() ? labels[i] : std::string();
}

// The missing values (and range) of a field that holds numbers.
void AddMissingNumbers(IQZEncoder& encoder, const FieldData& field) {
  for (size_t i = 0; i < field.invalidNumbers.size(); ++i) {
    encoder.AddMissingValue(field.invalidNumbers[i], LabelAt(field.invalidLabels, i));
  }
  if (field.missingLow != kLowest || field.missingHigh != kHighest) {
    encoder.SetMissingRange(field.missingLow, field.missingHigh);
  }
}

// Adds a categorical variable from its categories: with their labels when there is one
// label per category, without categories (capacity form) when there are none.
template <class T>
int AddCategorical(QZVarList& vars, const FieldData& field, const std::vector<T>& categories,
                   QZXML_800::MeasureLevel level) {
  if (categories.size() == field.validLabels.size()) {
    if (!categories.empty()) {
      return vars.AddCatVar(field.name, field.label, categories, field.validLabels,
                            QZXML_800::ROLE_NONE);
    }
  } else if (!categories.empty()) {
    return vars.AddCatVar(field.name, field.label, categories, QZXML_800::ROLE_NONE);
  }
  return vars.AddCatVar(field.name, field.label, 0, level, QZXML_800::ROLE_NONE);
}

}  // namespace

ScoringPMMLParser::ScoringPMMLParser() = default;

ScoringPMMLParser::ScoringPMMLParser(const std::string& encoding) : fEncoding(encoding) {
  // The transcoder needs Xerces-C++ running, and it must be gone before this parser
  // terminates Xerces-C++ again: initialise first, free first in the destructor.
  InitXerces();
  try {
    CreateTranscoder(encoding);
  } catch (...) {
    FreeTranscoder();  // out of memory: conversions fall back to the default
  }
}

ScoringPMMLParser::~ScoringPMMLParser() {
  FreeTranscoder();
  if (!fParser) return;
  try {
    ScoringMutexLock lock(ScoringMutexContainer::GetMutex());
    fParser.reset();
    XMLPlatformUtils::Terminate();
  } catch (...) {
    // Destruction must not throw; Xerces-C++ reports nothing useful here.
  }
}

QZStatus ScoringPMMLParser::GetStatus() const { return fStatus; }

std::string ScoringPMMLParser::GetXercesMessage() const { return fXercesMessage; }

QZStatus ScoringPMMLParser::InitXerces() {
  if (fStatus.IsError() || fParser) return fStatus;
  try {
    ScoringMutexLock lock(ScoringMutexContainer::GetMutex());
    XMLPlatformUtils::Initialize();
    try {
      fParser = std::make_unique<QZXML_800::QZSafeDOMParser>();
    } catch (...) {
      XMLPlatformUtils::Terminate();  // keep Xerces-C++'s count balanced
      throw;
    }
  } catch (...) {
    fXercesMessage = DescribeCurrentException();
    fStatus = Error(SCORING_XERCES_INIT_FAILED);
    TraceException(kInitXerces, __LINE__);
  }
  return fStatus;
}

QZStatus ScoringPMMLParser::FillVarList(QZVarList& vars, std::istream& pmml) {
  fXercesMessage.clear();
  InitXerces();
  if (!fParser) return fStatus;
  fStatus = QZStatus();
  try {
    std::string error;
    DOMDocument* document = QZXML_800::QZSafeDOMParser::ParseSafely(*fParser, pmml, &error);
    if (document == nullptr) {
      fXercesMessage = error;
      TraceException(kFillVarList, __LINE__);
      return fStatus = Error(SCORING_PMML_PARSE_FAILED);
    }
    DOMElement* root = document->getDocumentElement();
    if (root == nullptr) return fStatus = Error(SCORING_PMML_INVALID_ROOT);

    DOMElement* dataDictionary = nullptr;
    DOMElement* transformationDictionary = nullptr;
    DOMElement* localTransformations = nullptr;
    if (TagNameEquals(root, Tags::PMML_ELE_PMML)) {
      dataDictionary = GetFirstChildElement(root, Tags::PMML_ELE_DATA_DICTIONARY);
      transformationDictionary =
          GetFirstChildElement(root, Tags::PMML_ELE_TRANSFORMATION_DICTIONARY);
    } else if (TagNameEquals(root, Tags::PMML_ELE_DATA_DICTIONARY)) {
      dataDictionary = root;
    } else if (TagNameEquals(root, Tags::PMML_ELE_TRANSFORMATION_DICTIONARY)) {
      transformationDictionary = root;
    } else if (TagNameEquals(root, Tags::PMML_ELE_LOCAL_TRANSFORMATIONS)) {
      localTransformations = root;
    } else {
      return fStatus = Error(SCORING_PMML_INVALID_ROOT);
    }
    if (dataDictionary != nullptr) fStatus = FillVarList(vars, dataDictionary);
    if (transformationDictionary != nullptr) {
      fStatus = FillVarList(vars, transformationDictionary);
    }
    if (localTransformations != nullptr) fStatus = FillVarList(vars, localTransformations);
  } catch (...) {
    fXercesMessage = DescribeCurrentException();
    TraceException(kFillVarList, __LINE__);
    fStatus = Error(SCORING_PMML_PARSE_FAILED);
  }
  return fStatus;
}

QZStatus ScoringPMMLParser::FillVarList(QZVarList& vars, DOMElement* element) {
  if (fStatus.IsError()) return fStatus;
  if (element == nullptr) return QZStatus();
  try {
    const bool derived = TagNameEquals(element, Tags::PMML_ELE_TRANSFORMATION_DICTIONARY) ||
                         TagNameEquals(element, Tags::PMML_ELE_LOCAL_TRANSFORMATIONS);
    const std::string fieldTag =
        derived ? Tags::PMML_ELE_DERIVED_FIELD : Tags::PMML_ELE_DATA_FIELD;
    QZStatus status;
    for (const DOMElement* field = GetFirstChildElement(element, fieldTag);
         field != nullptr && status.IsOK(); field = GetNextSiblingElement(field, fieldTag)) {
      status = AddField(vars, field);
    }
    return status;
  } catch (...) {
    // Nothing here is expected to throw; memory exhaustion or a broken DOM must still
    // end as a status rather than escape to a plug-in.
    fXercesMessage = DescribeCurrentException();
    TraceException(kFillVarList, __LINE__);
    return Error(SCORING_PMML_PARSE_FAILED);
  }
}

QZStatus ScoringPMMLParser::AddField(QZVarList& vars, const DOMElement* element) const {
  FieldData field;

  // Name, label and kind.
  const XMLCh* name = GetAttribute(element, Tags::PMML_ATT_NAME);
  if (name == nullptr) return Error(SCORING_PMML_MISSING_ATTRIBUTE);
  field.name = ToString(name);
  const XMLCh* displayName = GetAttribute(element, Tags::PMML_ATT_DISPLAY_NAME);
  field.label = displayName != nullptr ? ToString(displayName) : field.name;
  const XMLCh* optype = GetAttribute(element, Tags::PMML_ATT_OPTYPE);
  if (optype == nullptr) return Error(SCORING_PMML_MISSING_ATTRIBUTE);
  if (IsEqual(optype, Tags::PMML_VAL_CONTINUOUS)) {
    field.categorical = false;
  } else if (IsEqual(optype, Tags::PMML_VAL_ORDINAL)) {
    field.ordinal = true;
  }

  // Storage: an explicit storage type first, then the data type.
  const XMLCh* storageType = GetAttribute(element, Tags::PMML_EXT_X_STORAGE_TYPE);
  const XMLCh* dataType = GetAttribute(element, Tags::PMML_ATT_DATA_TYPE);
  if (storageType != nullptr && IsEqual(storageType, Tags::PMML_VAL_STRING)) {
    field.storage = QZXML_800::STORAGE_STRING;
  } else if (storageType != nullptr && IsEqual(storageType, "numeric")) {
    field.storage = QZXML_800::STORAGE_REAL;
  } else if (dataType == nullptr) {
    field.storage = field.categorical ? QZXML_800::STORAGE_STRING : QZXML_800::STORAGE_REAL;
  } else {
    for (const StorageEntry& entry : kStorageTable) {
      if (IsEqual(dataType, entry.dataType)) {
        field.storage = entry.code;
        break;
      }
    }
    if (field.storage == QZXML_800::STORAGE_UNKNOWN) {
      return Error(SCORING_PMML_INVALID_FIELD_TYPE);
    }
  }

  // Extensions anywhere below the field, in document order: measure, storage and
  // format hints. A later hint of the same kind replaces an earlier one.
  ForEachDescendant(element, Tags::PMML_ELE_EXTENSION, [&](const DOMElement* extension) {
    const XMLCh* extName = GetAttribute(extension, Tags::PMML_ATT_NAME);
    const XMLCh* extValue = GetAttribute(extension, Tags::PMML_ATT_VALUE);
    auto text = [&]() {
      return extValue != nullptr ? std::optional<std::string>(ToString(extValue))
                                 : std::nullopt;
    };
    if (IsEqual(extName, Tags::PMML_EXT_MEASURE) || IsEqual(extName, Tags::PMML_EXT_X_MEASURE)) {
      if (extValue != nullptr && IsEqual(extValue, "flag")) field.flagMeasure = true;
    } else if (IsEqual(extName, "storageType")) {
      if (extValue != nullptr && IsEqual(extValue, Tags::PMML_VAL_STRING)) {
        field.storage = QZXML_800::STORAGE_STRING;
      }
    } else if (IsEqual(extName, Tags::PMML_EXT_FLAG_TYPE_TRUE_VALUE)) {
      field.flagTrueValue = extValue;
    } else if (IsEqual(extName, "format")) {
      field.hasFormat = extValue != nullptr;
    } else if (IsEqual(extName, Tags::PMML_ATT_WIDTH) || IsEqual(extName, "stringLength")) {
      field.width = text();
    } else if (IsEqual(extName, "decimals")) {
      field.decimals = text();
    }
  });
  field.numeric = field.storage != QZXML_800::STORAGE_STRING;

  // The display format the hints describe; handed to the variable at the end.
  std::unique_ptr<XMLElement> format;
  const bool number = field.storage == QZXML_800::STORAGE_INTEGER ||
                      field.storage == QZXML_800::STORAGE_REAL;
  if (number && (field.hasFormat || field.width || field.decimals)) {
    format.reset(XMLElement::Create("NumberFormat"));
    format->AddAttribute(Tags::PMML_ATT_NAME, "");
    format->AddAttribute("formatType", "standard");
    format->AddAttribute(Tags::PMML_ATT_WIDTH, field.width.value_or(""));
    format->AddAttribute("decimalPlaces", field.decimals.value_or(""));
    format->AddAttribute("decimalSymbol", "local");
    format->AddAttribute("groupingSymbol", "none");
  } else if (field.storage == QZXML_800::STORAGE_STRING && field.width) {
    format.reset(XMLElement::Create("StringFormat"));
    format->AddAttribute(Tags::PMML_ATT_NAME, "");
    format->AddAttribute("hexadecimal", "false");
    format->AddAttribute(Tags::PMML_ATT_WIDTH, *field.width);
  }

  // Values (categories and missing values), the interval and the missing range.
  auto addValue = [&](const DOMElement* value) {
    const DOMNamedNodeMap* attributes = value->getAttributes();
    if (attributes == nullptr || attributes->getLength() == 0) return;
    const XMLCh* property = GetAttribute(value, Tags::PMML_ATT_PROPERTY);
    const bool valid = property == nullptr || IsEqual(property, Tags::PMML_VAL_VALID);
    const XMLCh* text = GetAttribute(value, Tags::PMML_ATT_VALUE);
    if (text != nullptr) {
      double number = 0.0;
      if (!field.numeric) {
        (valid ? field.validStrings : field.invalidStrings).push_back(ToString(text));
      } else if (ParseDouble(text, number)) {
        (valid ? field.validNumbers : field.invalidNumbers).push_back(number);
      }
    }
    const XMLCh* display = GetAttribute(value, Tags::PMML_ATT_DISPLAY_VALUE);
    const std::string label =
        display != nullptr ? ToString(display) : (text != nullptr ? ToString(text) : "");
    if (!label.empty()) (valid ? field.validLabels : field.invalidLabels).push_back(label);
  };
  auto margin = [&](const DOMElement* interval, const char* name, double absent,
                    double& out) {
    const XMLCh* text = GetAttribute(interval, name);
    if (text == nullptr) {
      out = absent;
      return true;
    }
    return ParseDouble(text, out);
  };
  for (const DOMElement* child = GetFirstChildElement(element); child != nullptr;
       child = GetNextSiblingElement(child)) {
    if (TagNameEquals(child, Tags::PMML_ELE_VALUE)) {
      addValue(child);
    } else if (TagNameEquals(child, Tags::PMML_ELE_INTERVAL)) {
      if (!field.numeric) continue;
      if (!margin(child, Tags::PMML_ATT_LEFT_MARGIN, kLowest, field.intervalLow) ||
          !margin(child, Tags::PMML_ATT_RIGHT_MARGIN, kHighest, field.intervalHigh)) {
        return Error(SCORING_PMML_INVALID_FIELD_TYPE);
      }
    } else if (TagNameEquals(child, Tags::PMML_ELE_EXTENSION)) {
      const XMLCh* extName = GetAttribute(child, Tags::PMML_ATT_NAME);
      const XMLCh* extValue = GetAttribute(child, Tags::PMML_ATT_VALUE);
      double number = 0.0;
      if (IsEqual(extName, "MissingValue")) {
        for (const DOMElement* value = GetFirstChildElement(child, Tags::PMML_ELE_VALUE);
             value != nullptr; value = GetNextSiblingElement(value, Tags::PMML_ELE_VALUE)) {
          addValue(value);
        }
      } else if (IsEqual(extName, Tags::PMML_EXT_INVALID_RANGE_LOWER)) {
        if (ParseDouble(extValue, number)) field.missingLow = number;
      } else if (IsEqual(extName, Tags::PMML_EXT_INVALID_RANGE_UPPER)) {
        if (ParseDouble(extValue, number)) field.missingHigh = number;
      }
    }
  }

  // The variable itself, then its missing values.
  int index = -1;
  if (!field.categorical) {
    index = vars.AddContVar(field.name, field.label, field.intervalLow, field.intervalHigh,
                            QZXML_800::ROLE_NONE, false, -1);
    if (index < 0) return Error(SCORING_PMML_VARIABLE_REJECTED);
    if (IQZEncoder* encoder = vars.GetEncoderAt(index)) AddMissingNumbers(*encoder, field);
  } else if (!field.numeric) {
    index = AddCategorical(vars, field, field.validStrings, QZXML_800::ML_STRING_CATEGORICAL);
    if (index < 0) return Error(SCORING_PMML_VARIABLE_REJECTED);
    if (IQZEncoder* encoder = vars.GetEncoderAt(index)) {
      for (size_t i = 0; i < field.invalidStrings.size(); ++i) {
        encoder->AddMissingValue(field.invalidStrings[i], LabelAt(field.invalidLabels, i));
      }
    }
  } else {
    index = AddCategorical(vars, field, field.validNumbers, QZXML_800::ML_NUMERIC_CATEGORICAL);
    if (index < 0) return Error(SCORING_PMML_VARIABLE_REJECTED);
    if (IQZEncoder* encoder = vars.GetEncoderAt(index)) AddMissingNumbers(*encoder, field);
  }

  // Finishing marks: storage, flag measure, flag true category, ordinal, format.
  IQZVariable* variable = vars.GetVarAt(index);
  if (variable == nullptr) return Error(SCORING_PMML_VARIABLE_REJECTED);
  variable->SetStorageType(field.storage);
  variable->SetFlagMeasure(field.flagMeasure);
  const QZXML_800::MeasureLevel level = variable->GetMeasureLevel();
  if (level == QZXML_800::ML_NUMERIC_CATEGORICAL || level == QZXML_800::ML_STRING_CATEGORICAL) {
    auto* categorical = dynamic_cast<QZCatVar*>(variable);
    const IQZEncoder* encoder = variable->GetEncoder();
    if (field.flagTrueValue != nullptr && encoder != nullptr && categorical != nullptr) {
      double found = -1.0;
      double number = 0.0;
      if (encoder->GetValueType() == kNumberValues) {
        if (ParseDouble(field.flagTrueValue, number)) found = encoder->IndexOfNumber(number);
      } else {
        found = encoder->IndexOfString(ToString(field.flagTrueValue));
      }
      const int trueIndex = static_cast<int>(found);
      if (trueIndex >= 0) categorical->SetBinaryFlag(true, trueIndex);
    }
    if (categorical != nullptr) categorical->SetOrdinalFlag(field.ordinal);
  }
  if (format) variable->SetFormat(format.release());
  return QZStatus();
}

}  // namespace QZScoring_800

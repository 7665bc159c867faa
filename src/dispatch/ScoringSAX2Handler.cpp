// The library's SAX2 handlers: the echoing base and the model-attribute scan.

#include "ScoringSAX2Handler.h"

#include <xercesc/util/XMLString.hpp>
#include <xercesc/util/XMLUni.hpp>

#include "QZScoringTags.h"
#include "ScoringPMMLSAX2Handler.h"
#include "ScoringStr.h"

using xercesc::Attributes;
using xercesc::XMLFormatter;
using xercesc::XMLString;

namespace QZScoring_800 {

namespace {

// Element and attribute names, in UTF-16 so that the scan compares them with the
// parser's text without transcoding.
constexpr XMLCh kPMML[] = u"PMML";
constexpr XMLCh kHRZXML[] = u"HRZXML";
constexpr XMLCh kHeader[] = u"Header";
constexpr XMLCh kApplication[] = u"Application";
constexpr XMLCh kMiningBuildTask[] = u"MiningBuildTask";
constexpr XMLCh kDataDictionary[] = u"DataDictionary";
constexpr XMLCh kDataField[] = u"DataField";
constexpr XMLCh kTransformationDictionary[] = u"TransformationDictionary";
constexpr XMLCh kDerivedField[] = u"DerivedField";
constexpr XMLCh kExtension[] = u"Extension";
constexpr XMLCh kMiningSchema[] = u"MiningSchema";
constexpr XMLCh kMiningField[] = u"MiningField";
constexpr XMLCh kOutput[] = u"Output";
constexpr XMLCh kOutputField[] = u"OutputField";
constexpr XMLCh kSegmentation[] = u"Segmentation";

constexpr XMLCh kName[] = u"name";
constexpr XMLCh kVersion[] = u"version";
constexpr XMLCh kValue[] = u"value";
constexpr XMLCh kExtender[] = u"extender";
constexpr XMLCh kModelName[] = u"modelName";
constexpr XMLCh kFunctionName[] = u"functionName";
constexpr XMLCh kAlgorithmName[] = u"algorithmName";
constexpr XMLCh kUsageType[] = u"usageType";
constexpr XMLCh kFeature[] = u"feature";
constexpr XMLCh kTargetField[] = u"targetField";
constexpr XMLCh kMultipleModelMethod[] = u"multipleModelMethod";

constexpr XMLCh kAdjustedPropensity[] = u"adjustedPropensity";
constexpr XMLCh kModelID[] = u"modelID";
constexpr XMLCh kDerivedFields[] = u"DerivedFields";
constexpr XMLCh kActive[] = u"active";
constexpr XMLCh kOrder[] = u"order";
constexpr XMLCh kPredicted[] = u"predicted";
constexpr XMLCh kTarget[] = u"target";  // PMML 4.2 and later name a predicted field so

constexpr XMLCh kPMMLStartTagOpen[] = u"<PMML version=\"";
constexpr XMLCh kPMMLStartTagClose[] = u"\">\n";
constexpr XMLCh kPMMLEndTag[] = u"</PMML>";

// Exact comparison of parser text with a name; a null text equals nothing but "".
inline bool Is(const XMLCh* text, const XMLCh* name) { return XMLString::equals(text, name); }

// The extender identifier in UTF-16, made once.
const std::u16string& WideExtender() {
  static const std::u16string extender = [] {
    std::u16string wide;
    for (const char* c = QZScoringTags::SCORING_EXTENDER; *c != '\0'; ++c) {
      wide.push_back(static_cast<char16_t>(static_cast<unsigned char>(*c)));
    }
    return wide;
  }();
  return extender;
}

// The element depth at which the sections directly inside the PMML root sit.
constexpr unsigned kTopLevelDepth = 2;

}  // namespace

// ScoringSAX2Handler

ScoringSAX2Handler::ScoringSAX2Handler(const std::string& encoding)
    : fTranscoder(std::make_unique<ScoringTranscoder>(encoding.c_str())),
      fFormatter(std::make_unique<XMLFormatter>("UTF-8", "1.0", this,
                                                XMLFormatter::NoEscapes,
                                                XMLFormatter::UnRep_CharRef)),
      fState(STATE_START) {}

ScoringSAX2Handler::~ScoringSAX2Handler() = default;

void ScoringSAX2Handler::characters(const XMLCh* const chars, const XMLSize_t length) {
  fFormatter->formatBuf(chars, length, XMLFormatter::CharEscapes);
}

void ScoringSAX2Handler::startElement(const XMLCh* const uri, const XMLCh* const localname,
                                      const XMLCh* const qname, const Attributes& attrs) {
  QZSafeSAX2Handler::startElement(uri, localname, qname, attrs);
}

void ScoringSAX2Handler::endElement(const XMLCh* const uri, const XMLCh* const localname,
                                    const XMLCh* const qname) {
  QZSafeSAX2Handler::endElement(uri, localname, qname);
}

void ScoringSAX2Handler::ignorableWhitespace(const XMLCh* const, const XMLSize_t) {}

void ScoringSAX2Handler::processingInstruction(const XMLCh* const, const XMLCh* const) {}

void ScoringSAX2Handler::warning(const xercesc::SAXParseException&) {}

void ScoringSAX2Handler::error(const xercesc::SAXParseException&) { throw XML_ERROR; }

void ScoringSAX2Handler::fatalError(const xercesc::SAXParseException&) {
  throw XML_FATAL_ERROR;
}

void ScoringSAX2Handler::writeChars(const XMLByte* const, const XMLSize_t, XMLFormatter* const) {}

std::string ScoringSAX2Handler::ToString(const XMLCh* text) const {
  if (text == nullptr) return std::string();
  if (fTranscoder->IsValid()) return fTranscoder->TranscodeTo(text);
  return QZXML_800::TranscodeToUTF8(text);
}

const XMLCh* ScoringSAX2Handler::GetAttribute(const Attributes& attrs, const XMLCh* name) {
  return name == nullptr ? nullptr : attrs.getValue(name);
}

const XMLCh* ScoringSAX2Handler::GetAttribute(const Attributes& attrs, const std::string& name) {
  ScoringStr wide;
  wide.assignUTF8(name);
  return wide.xc_str() == nullptr ? nullptr : attrs.getValue(wide.xc_str());
}

bool ScoringSAX2Handler::IsEqual(const XMLCh* text, const std::string& name) {
  ScoringStr wide;
  wide.assignUTF8(name);
  return XMLString::equals(text, wide.xc_str());
}

bool ScoringSAX2Handler::IsEqual(const ScoringTranscoder* transcoder, const XMLCh* text,
                                 const std::string& name) {
  if (transcoder == nullptr) return IsEqual(text, name);
  return transcoder->TranscodeTo(text) == name;
}

void ScoringSAX2Handler::EchoStartTag(const XMLCh* qname, const Attributes& attrs) {
  XMLFormatter& out = *fFormatter;
  out << XMLFormatter::NoEscapes << xercesc::chOpenAngle << qname;
  const XMLSize_t count = attrs.getLength();
  for (XMLSize_t i = 0; i < count; ++i) {
    out << XMLFormatter::NoEscapes << xercesc::chSpace << attrs.getQName(i)
        << xercesc::chEqual << xercesc::chDoubleQuote << XMLFormatter::AttrEscapes
        << attrs.getValue(i) << XMLFormatter::NoEscapes << xercesc::chDoubleQuote;
  }
  out << XMLFormatter::NoEscapes << xercesc::chCloseAngle;
}

void ScoringSAX2Handler::EchoEndTag(const XMLCh* qname) {
  *fFormatter << XMLFormatter::NoEscapes << xercesc::chOpenAngle << xercesc::chForwardSlash
              << qname << xercesc::chCloseAngle;
}

// ScoringPMMLSAX2Handler

ScoringPMMLSAX2Handler::ScoringPMMLSAX2Handler(const std::string& encoding,
                                               const std::vector<std::string>& modelNames,
                                               ScoringModelAttr& record)
    : ScoringSAX2Handler(encoding),
      fModelNames(modelNames),
      fRecord(record),
      fCapture(nullptr),
      fSectionDepth(0),
      fModelDepth(0),
      fCaptureDepth(0),
      fDerivedDepth(0),
      fHasSegmentation(false) {
  fWideModelNames.reserve(modelNames.size());
  for (const std::string& name : modelNames) {
    ScoringStr wide;
    wide.assignUTF8(name);
    fWideModelNames.emplace_back(wide.xc_str() == nullptr ? u"" : wide.xc_str());
  }
}

ScoringPMMLSAX2Handler::~ScoringPMMLSAX2Handler() = default;

std::string ScoringPMMLSAX2Handler::Attribute(const Attributes& attrs, const XMLCh* name) const {
  return ToString(attrs.getValue(name));
}

bool ScoringPMMLSAX2Handler::IsEchoing() const {
  switch (GetState()) {
    case STATE_PMML:
      // Only text directly inside the root, not inside a top-level element skipped.
      return GetElementDepth() == 1;
    case STATE_MINING_BUILD_TASK:
    case STATE_DATA_DICTIONARY:
    case STATE_TRANSFORMATIONS:
    case STATE_ADJUSTED_PROPENSITY:
    case STATE_END:
      return true;
    default:
      return false;
  }
}

void ScoringPMMLSAX2Handler::characters(const XMLCh* const chars, const XMLSize_t length) {
  if (IsEchoing()) ScoringSAX2Handler::characters(chars, length);
}

void ScoringPMMLSAX2Handler::writeChars(const XMLByte* const toWrite, const XMLSize_t count,
                                        XMLFormatter* const) {
  std::ostream* out = nullptr;
  switch (GetState()) {
    case STATE_PMML:
    case STATE_MINING_BUILD_TASK:
    case STATE_DATA_DICTIONARY:
    case STATE_TRANSFORMATIONS:
    case STATE_END:
      out = &fRecord.GetSkeletonStream();
      break;
    case STATE_ADJUSTED_PROPENSITY:
      out = fCapture;
      break;
    default:
      return;
  }
  if (out == nullptr) return;
  out->write(reinterpret_cast<const char*>(toWrite), static_cast<std::streamsize>(count));
  out->flush();
}

void ScoringPMMLSAX2Handler::startElement(const XMLCh* const uri, const XMLCh* const localname,
                                          const XMLCh* const qname, const Attributes& attrs) {
  ScoringSAX2Handler::startElement(uri, localname, qname, attrs);
  const unsigned depth = GetElementDepth();
  switch (GetState()) {
    case STATE_START:
      if (depth != 1) break;  // inside a root of another kind
      if (Is(qname, kHRZXML)) {
        fRecord.SetModelType(QZScoringConst::MODEL_HRZXML);
        SetState(STATE_HRZXML);
        throw SCAN_DONE;
      }
      if (Is(qname, kPMML)) {
        const XMLCh* version = attrs.getValue(kVersion);
        fRecord.SetVersion(ToString(version));
        SetState(STATE_PMML);
        // The skeleton's root carries the version only.
        GetFormatter() << XMLFormatter::NoEscapes << kPMMLStartTagOpen
                       << XMLFormatter::AttrEscapes << (version ? version : u"")
                       << XMLFormatter::NoEscapes << kPMMLStartTagClose;
      }
      break;
    case STATE_PMML:
      if (depth != kTopLevelDepth) break;
      if (Is(qname, kHeader)) {
        fSectionDepth = depth;
        SetState(STATE_HEADER);
      } else if (Is(qname, kMiningBuildTask)) {
        fSectionDepth = depth;
        SetState(STATE_MINING_BUILD_TASK);
      } else if (Is(qname, kDataDictionary)) {
        fSectionDepth = depth;
        SetState(STATE_DATA_DICTIONARY);
      }
      break;
    case STATE_HEADER:
      if (Is(qname, kApplication)) {
        fRecord.SetAppName(Attribute(attrs, kName));
        fRecord.SetAppVersion(Attribute(attrs, kVersion));
        SetState(STATE_APPLICATION);
      }
      break;
    case STATE_AFTER_MINING_BUILD_TASK:
      if (depth == kTopLevelDepth && Is(qname, kDataDictionary)) {
        fSectionDepth = depth;
        SetState(STATE_DATA_DICTIONARY);
      }
      break;
    case STATE_DATA_DICTIONARY:
      if (Is(qname, kDataField)) fRecord.GetDataFields().push_back(Attribute(attrs, kName));
      break;
    case STATE_AFTER_DATA_DICTIONARY:
      if (depth == kTopLevelDepth && Is(qname, kTransformationDictionary)) {
        fRecord.SetHasTransformationDictionary(true);
        fSectionDepth = depth;
        SetState(STATE_TRANSFORMATIONS);
        break;
      }
      MatchModelElement(qname, attrs);
      break;
    case STATE_TRANSFORMATIONS:
      if (Is(qname, kDerivedField)) fRecord.GetDerivedFields().push_back(Attribute(attrs, kName));
      break;
    case STATE_AFTER_TRANSFORMATIONS:
      MatchModelElement(qname, attrs);
      break;
    case STATE_MODEL:
    case STATE_AFTER_MINING_SCHEMA:
      if (fModelDepth != 0 && depth == fModelDepth + 1) StartModelChild(qname, attrs);
      break;
    case STATE_MINING_SCHEMA:
      if (Is(qname, kExtension)) {
        if (IsOwnExtension(attrs) && Is(attrs.getValue(kName), kDerivedFields)) {
          fDerivedDepth = depth;
          SetState(STATE_DERIVED_INPUTS);
        }
      } else if (Is(qname, kMiningField)) {
        AddMiningField(attrs);
      }
      break;
    case STATE_DERIVED_INPUTS:
      if (Is(qname, kExtension)) {
        SetState(STATE_DERIVED_INPUTS_NESTED);
      } else if (Is(qname, kMiningField)) {
        AddMiningField(attrs);
      }
      break;
    case STATE_OUTPUT:
      if (Is(qname, kOutputField)) AddOutputField(attrs);
      break;
    default:
      break;
  }
  switch (GetState()) {
    case STATE_MINING_BUILD_TASK:
    case STATE_DATA_DICTIONARY:
    case STATE_TRANSFORMATIONS:
    case STATE_ADJUSTED_PROPENSITY:
      EchoStartTag(qname, attrs);
      break;
    default:
      break;
  }
}

void ScoringPMMLSAX2Handler::endElement(const XMLCh* const uri, const XMLCh* const localname,
                                        const XMLCh* const qname) {
  const unsigned depth = GetElementDepth();  // the depth of the element that ends
  ScoringSAX2Handler::endElement(uri, localname, qname);
  const HandlerState state = GetState();
  switch (state) {
    case STATE_MINING_BUILD_TASK:
    case STATE_DATA_DICTIONARY:
    case STATE_TRANSFORMATIONS:
    case STATE_ADJUSTED_PROPENSITY:
      EchoEndTag(qname);
      break;
    default:
      break;
  }
  if (depth == 1) {
    if (Is(qname, kPMML)) {
      SetState(STATE_END);
      GetFormatter() << XMLFormatter::NoEscapes << kPMMLEndTag;
      throw SCAN_DONE;
    }
    return;
  }
  switch (state) {
    case STATE_HEADER:
      if (depth == fSectionDepth) SetState(STATE_PMML);
      break;
    case STATE_APPLICATION:
      if (Is(qname, kApplication)) SetState(STATE_HEADER);
      break;
    case STATE_MINING_BUILD_TASK:
      if (depth == fSectionDepth) SetState(STATE_AFTER_MINING_BUILD_TASK);
      break;
    case STATE_DATA_DICTIONARY:
      if (depth == fSectionDepth) SetState(STATE_AFTER_DATA_DICTIONARY);
      break;
    case STATE_TRANSFORMATIONS:
      if (depth == fSectionDepth) SetState(STATE_AFTER_TRANSFORMATIONS);
      break;
    case STATE_ADJUSTED_PROPENSITY:
      if (depth == fCaptureDepth) {
        fCapture = nullptr;
        SetState(STATE_MODEL);
      }
      break;
    case STATE_MINING_SCHEMA:
      if (depth == fModelDepth + 1) SetState(STATE_AFTER_MINING_SCHEMA);
      break;
    case STATE_DERIVED_INPUTS:
      if (depth == fDerivedDepth) SetState(STATE_MINING_SCHEMA);
      break;
    case STATE_DERIVED_INPUTS_NESTED:
      if (depth == fDerivedDepth + 1) SetState(STATE_DERIVED_INPUTS);
      break;
    case STATE_OUTPUT:
      if (depth == fModelDepth + 1) SetState(STATE_AFTER_MINING_SCHEMA);
      break;
    case STATE_MODEL:
    case STATE_AFTER_MINING_SCHEMA:
      // Past the model element nothing more is read from the model's body.
      if (depth == fModelDepth) fModelDepth = 0;
      break;
    default:
      break;
  }
}

bool ScoringPMMLSAX2Handler::IsOwnExtension(const Attributes& attrs) const {
  const XMLCh* extender = attrs.getValue(kExtender);
  return extender != nullptr && WideExtender() == extender;
}

void ScoringPMMLSAX2Handler::MatchModelElement(const XMLCh* qname, const Attributes& attrs) {
  for (std::size_t i = 0; i < fWideModelNames.size(); ++i) {
    if (!Is(qname, fWideModelNames[i].c_str())) continue;
    const std::string& name = fModelNames[i];
    fModelElement = name;
    fRecord.SetModelElement(name);
    std::string modelName = ScoringStr(attrs.getValue(kModelName)).toUTF8();
    fRecord.SetModelName(modelName.empty() ? name : modelName);
    fRecord.SetFunctionName(ScoringStr(attrs.getValue(kFunctionName)).toUTF8());
    fRecord.SetAlgorithmName(ScoringStr(attrs.getValue(kAlgorithmName)).toUTF8());
    fModelDepth = GetElementDepth();
    SetState(STATE_MODEL);
    return;
  }
}

void ScoringPMMLSAX2Handler::StartModelChild(const XMLCh* qname, const Attributes& attrs) {
  const HandlerState state = GetState();
  if (state == STATE_MODEL && Is(qname, kExtension)) {
    if (!IsOwnExtension(attrs)) return;
    const XMLCh* name = attrs.getValue(kName);
    if (Is(name, kAdjustedPropensity)) {
      auto capture = std::make_unique<std::stringstream>();
      fCapture = capture.get();
      fRecord.SetAdjustedPropensityStream(capture.release());
      fCaptureDepth = GetElementDepth();
      SetState(STATE_ADJUSTED_PROPENSITY);
    } else if (Is(name, kModelID)) {
      fRecord.SetModelID(Attribute(attrs, kValue));
    }
  } else if (state == STATE_MODEL && Is(qname, kMiningSchema)) {
    SetState(STATE_MINING_SCHEMA);
  } else if (state == STATE_AFTER_MINING_SCHEMA && Is(qname, kOutput)) {
    SetState(STATE_OUTPUT);
  } else if (!fHasSegmentation && Is(qname, kSegmentation)) {
    fHasSegmentation = true;
    fRecord.SetMultipleModelMethod(Attribute(attrs, kMultipleModelMethod));
  }
}

void ScoringPMMLSAX2Handler::AddMiningField(const Attributes& attrs) {
  if (attrs.getLength() == 0) return;
  const XMLCh* usage = attrs.getValue(kUsageType);
  const bool input = usage == nullptr || *usage == 0 || Is(usage, kActive) || Is(usage, kOrder);
  const bool target = !input && (Is(usage, kPredicted) || Is(usage, kTarget));
  if (!input && !target) return;
  std::string name = Attribute(attrs, kName);
  if (target) {
    fRecord.GetTargetFields().push_back(std::move(name));
  } else if (GetState() == STATE_DERIVED_INPUTS) {
    fRecord.GetDerivedInputs().push_back(std::move(name));
  } else {
    fRecord.GetActiveFields().push_back(std::move(name));
  }
}

void ScoringPMMLSAX2Handler::AddOutputField(const Attributes& attrs) {
  const std::string name = Attribute(attrs, kName);
  if (name.empty()) return;
  auto field = std::make_unique<ScoringOutputField>();
  field->SetName(name);
  field->SetFeature(Attribute(attrs, kFeature));
  field->SetValue(Attribute(attrs, kValue));
  field->SetTargetField(Attribute(attrs, kTargetField));
  if (fRecord.AddOutputField(field.get())) field.release();
}

}  // namespace QZScoring_800

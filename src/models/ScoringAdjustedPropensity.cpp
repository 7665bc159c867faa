#include "ScoringAdjustedPropensity.h"

#include <climits>
#include <cmath>

#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>

#include "ModelFieldNames.h"
#include "QZSafeParser.h"
#include "QZScoringTags.h"
#include "QZXInputSource.h"
#include "ScoringBaseParser.h"
#include "ScoringPMMLTags.h"
#include "ScoringStatusCodes.h"
#include "TraceLog.h"
#include "Value.h"

namespace QZScoring_800 {

using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using xercesc::DOMElement;
namespace fields = model_fields;

namespace {

// Element names of the network extension.
const char kNetworkElement[] = "AdjustedPropensityByNN";
const char kHiddenLayer[] = "HiddenLayer";
const char kOutputLayer[] = "OutputLayer";
// The description of a network that serves every multiple-model method.
const char kStandalone[] = "standalone";
const char kDefaultEncoding[] = "UTF-8";
// IQZEncoder::GetValueType of an encoder whose categories are numbers.
constexpr int kNumberCategories = 2;

// Splits text at unescaped delimiters into tokens (cleared first). A backslash takes
// the next character, which must be a backslash or the delimiter, literally. Every
// delimiter ends a token, empty ones included; the text after the last delimiter is
// the last token. False on a bad escape, with the tokens found before kept.
bool Tokenize(const std::string& text, std::vector<std::string>& tokens, char delimiter) {
  tokens.clear();
  std::string token;
  bool pending = false;  // characters taken since the last delimiter
  for (size_t i = 0; i < text.size(); ++i) {
    char c = text[i];
    if (c == '\\') {
      if (i + 1 >= text.size() || (text[i + 1] != '\\' && text[i + 1] != delimiter)) {
        return false;
      }
      token.push_back(text[++i]);
      pending = true;
    } else if (c == delimiter) {
      tokens.push_back(token);
      token.clear();
      pending = false;
    } else {
      token.push_back(c);
      pending = true;
    }
  }
  if (pending) tokens.push_back(token);
  return true;
}

// Appends the numbers of a space-separated text; nothing when the text has a bad
// escape.
void AppendNumbers(const std::string& text, std::vector<double>& numbers) {
  std::vector<std::string> tokens;
  if (!Tokenize(text, tokens, ' ')) return;
  for (const std::string& token : tokens) numbers.push_back(Value(token).GetReal());
}

// The whole text of an element as a number.
double ElementNumber(const ScoringBaseParser& text, const DOMElement* element) {
  return Value(text.ToString(element->getTextContent())).GetReal();
}

// The index of a value among the target's categories; -1 when it is none.
int CategoryIndex(const QZXML_800::IQZEncoder* encoder, const Value& prediction) {
  if (encoder == nullptr) return -1;
  double index;
  if (encoder->GetValueType() == kNumberCategories) {
    index = encoder->IndexOfNumber(prediction.GetReal());
  } else if (prediction.IsString()) {
    index = encoder->IndexOfString(prediction.GetText());
  } else {
    index = encoder->IndexOfString(prediction.GetString());
  }
  index = std::trunc(index);
  // Also refuses NaN, for which every comparison is false.
  return index >= 0.0 && index <= static_cast<double>(INT_MAX) ? static_cast<int>(index) : -1;
}

}  // namespace

ScoringAdjustedPropensity::ScoringAdjustedPropensity(const QZXML_800::QZSettings* settings,
                                                     const QZXML_800::QZVarList* variables)
    : fSettings(settings), fVarList(variables), fOutputBias(0.0), fReady(false) {}

ScoringAdjustedPropensity::~ScoringAdjustedPropensity() = default;

bool ScoringAdjustedPropensity::ParseNetwork(std::istream* stream) {
  bool result = false;
  if (stream != nullptr) {
    try {
      result = ReadNetwork(*stream);
    } catch (...) {
      // Xerces-C++ DOM exceptions and memory exhaustion alike: the network is unread.
      TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s",
               "QZScoring_800::ScoringAdjustedPropensity::ParseNetwork", "reading the network");
      result = false;
    }
  }
  fReady = result;
  return result;
}

bool ScoringAdjustedPropensity::ReadNetwork(std::istream& stream) {
  // A second read replaces the network instead of extending it.
  fHiddenWeights.clear();
  fHiddenBiases.clear();
  fOutputWeights.clear();
  fOutputBias = 0.0;

  std::string method = kStandalone;
  std::string encoding = kDefaultEncoding;
  if (fSettings != nullptr) {
    fSettings->GetSettingValByName(QZScoringTags::SCORING_ATT_MULTIPLEMODELMETHOD, method);
    fSettings->GetSettingValByName(QZScoringTags::SCORING_ATT_ENCODING, encoding);
  }

  QZXML_800::QZSafeDOMParser parser;
  if (!stream.bad()) {
    stream.clear();
    stream.seekg(0);
  }
  ScoringBaseParser text;
  text.CreateTranscoder(encoding);
  QZXML_800::QZXInputSource source(stream);
  std::string error;
  xercesc::DOMDocument* document = QZXML_800::QZSafeDOMParser::ParseSafely(parser, source, &error);
  if (document == nullptr) {
    TraceLog("scoring.log", 2, "  Exception:Function:%s; Line:%s",
             "QZScoring_800::ScoringAdjustedPropensity::ParseNetwork", error.c_str());
    return false;
  }
  const DOMElement* root = document->getDocumentElement();
  if (!ScoringBaseParser::TagNameEquals(root, ScoringPMMLTags::PMML_ELE_EXTENSION)) return false;

  for (const DOMElement* network = ScoringBaseParser::GetFirstChildElement(root, kNetworkElement);
       network != nullptr;
       network = ScoringBaseParser::GetNextSiblingElement(network, kNetworkElement)) {
    const XMLCh* description =
        ScoringBaseParser::GetAttribute(network, ScoringPMMLTags::PMML_ATT_DESCRIPTION);
    // An absent description counts as empty, so it matches only an empty method.
    if (!ScoringBaseParser::IsEqual(description, kStandalone) &&
        !ScoringBaseParser::IsEqual(description, method)) {
      continue;
    }

    const DOMElement* hidden = ScoringBaseParser::GetFirstChildElement(network, kHiddenLayer);
    if (hidden != nullptr) {
      const DOMElement* matrix =
          ScoringBaseParser::GetFirstChildElement(hidden, ScoringPMMLTags::PMML_ELE_MATRIX);
      const DOMElement* weights =
          ScoringBaseParser::GetFirstChildElement(matrix, ScoringPMMLTags::PMML_ELE_ARRAY);
      if (weights != nullptr) {
        AppendNumbers(text.ToString(weights->getTextContent()), fHiddenWeights);
      }
      const DOMElement* biases =
          ScoringBaseParser::GetFirstChildElement(hidden, ScoringPMMLTags::PMML_ELE_ARRAY);
      if (biases != nullptr) {
        AppendNumbers(text.ToString(biases->getTextContent()), fHiddenBiases);
      }
    }

    const DOMElement* output = ScoringBaseParser::GetFirstChildElement(network, kOutputLayer);
    if (output != nullptr) {
      const DOMElement* matrix =
          ScoringBaseParser::GetFirstChildElement(output, ScoringPMMLTags::PMML_ELE_MATRIX);
      const std::string array = ScoringPMMLTags::PMML_ELE_ARRAY;
      for (const DOMElement* weight = ScoringBaseParser::GetFirstChildElement(matrix, array);
           weight != nullptr; weight = ScoringBaseParser::GetNextSiblingElement(weight, array)) {
        fOutputWeights.push_back(ElementNumber(text, weight));
      }
      const DOMElement* bias =
          ScoringBaseParser::GetFirstChildElement(output, ScoringPMMLTags::PMML_ELE_ARRAY);
      if (bias != nullptr) fOutputBias = ElementNumber(text, bias);
    }
  }
  return fHiddenWeights.size() == fHiddenBiases.size() &&
         fHiddenWeights.size() == fOutputWeights.size();
}

bool ScoringAdjustedPropensity::IsReady() const { return fReady; }

QZStatus ScoringAdjustedPropensity::ComputeRawPropensity(ValueRecord& output) const {
  const QZStatus failed(SCORING_NO_RAW_PROPENSITY, false);
  int predictionIndex = output.IndexOf(fields::kPrediction);
  int probabilityIndex = output.IndexOf(fields::kProbability);
  if (predictionIndex < 0 || probabilityIndex < 0) return failed;

  const QZXML_800::IQZVariable* target =
      fVarList != nullptr ? fVarList->GetTargetRespVariable() : nullptr;
  if (target == nullptr) return failed;
  QZXML_800::MeasureLevel level = target->GetMeasureLevel();
  if (level != QZXML_800::ML_NUMERIC_CATEGORICAL && level != QZXML_800::ML_STRING_CATEGORICAL) {
    return failed;
  }
  const auto* flag = dynamic_cast<const QZXML_800::QZCatVar*>(target);
  if (flag == nullptr || !flag->GetBinaryFlag()) return failed;

  int trueIndex = flag->GetBinaryFlagTrueIndex();
  int predicted = CategoryIndex(target->GetEncoder(), output[static_cast<size_t>(predictionIndex)]);
  if (trueIndex < 0 || predicted < 0) return failed;

  double probability = output[static_cast<size_t>(probabilityIndex)].GetReal();
  // 1 minus the system-missing number would pass for a huge propensity.
  if (QZCommon_800::QZMV::IsMissing(probability)) return failed;
  try {
    output[fields::kRawPropensity] = predicted == trueIndex ? probability : 1.0 - probability;
  } catch (...) {
    // Only adding the field can fail (memory); the record keeps its layout.
    return failed;
  }
  return QZStatus();
}

QZStatus ScoringAdjustedPropensity::ComputeAdjustedPropensity(ValueRecord& output) const {
  if (!fReady) return QZStatus(SCORING_NOT_SUPPORTED, false);
  QZStatus status = ComputeRawPropensity(output);
  if (status.IsError()) return status;

  double x = output[static_cast<size_t>(output.IndexOf(fields::kRawPropensity))].GetReal();
  if (fHiddenWeights.size() != fHiddenBiases.size() ||
      fHiddenWeights.size() != fOutputWeights.size()) {
    return QZStatus(SCORING_NETWORK_SIZE_MISMATCH, false);
  }
  double y = fOutputBias;
  for (size_t k = 0; k < fHiddenWeights.size(); ++k) {
    y += fOutputWeights[k] * std::tanh(fHiddenWeights[k] * x + fHiddenBiases[k]);
  }
  try {
    output[fields::kAdjustedPropensity] = y;
  } catch (...) {
    return QZStatus(SCORING_NO_RAW_PROPENSITY, false);
  }
  return QZStatus();
}

}  // namespace QZScoring_800

// An example scorer plug-in: scores a PMML RegressionModel with one RegressionTable of
// NumericPredictors (prediction = intercept + sum of coefficient * x^exponent). It reads
// the parsed model element, so its stream attempt declines.

#include <cmath>
#include <string>
#include <utility>
#include <vector>

#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/dom/DOMNodeList.hpp>

#include "QZMV.h"
#include "ScoringScoreParser.h"
#include "ScoringStr.h"
#include "Value.h"
#include "ValueRecord.h"

using QZCommon_800::IQZScore;
using QZCommon_800::QZMV;
using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZScoring_800::ScoringStr;

namespace {

struct Term {
  std::string field;
  double coefficient;
  double exponent;
};

std::string Attribute(const xercesc::DOMElement* element, const char16_t* name) {
  return ScoringStr(element->getAttribute(name)).toUTF8();
}

double Number(const std::string& text, double fallback) {
  const Value value(text);
  return text.empty() || value.IsMissing() ? fallback : value.GetReal();
}

class LinearScorer : public IQZScore {
 public:
  LinearScorer(double intercept, std::vector<Term> terms)
      : intercept_(intercept), terms_(std::move(terms)) {}

  bool IsReady() const override { return true; }
  std::string GetType() const override { return "ExampleRegression"; }

  QZStatus Scorable(ValueRecord& record) override {
    record.Add("prediction", Value());
    return QZStatus();
  }

  // A missing or non-numeric input makes the prediction missing.
  QZStatus Score(const ValueRecord& input, ValueRecord& output) override {
    double sum = intercept_;
    for (const Term& term : terms_) {
      const double x = input.Get(term.field).GetReal();
      if (QZMV::IsMissing(x)) {
        sum = QZMV::Missing();
        break;
      }
      sum += term.coefficient * std::pow(x, term.exponent);
    }
    output["prediction"] = sum;
    return QZStatus();
  }

 private:
  double intercept_;
  std::vector<Term> terms_;
};

class ExampleParser : public QZScoring_800::ScoringScoreParser {
 public:
  IQZScore* CreateFromStream(QZXML_800::QZSettings&, QZXML_800::QZVarList&,
                             std::istream&) override {
    return nullptr;
  }

  IQZScore* CreateFromElement(QZXML_800::QZSettings&, QZXML_800::QZVarList&,
                              xercesc::DOMDocument*, xercesc::DOMElement* model) override {
    if (model == nullptr) return nullptr;
    xercesc::DOMNodeList* tables = model->getElementsByTagName(u"RegressionTable");
    if (tables->getLength() != 1) return nullptr;
    auto* table = static_cast<xercesc::DOMElement*>(tables->item(0));
    std::vector<Term> terms;
    xercesc::DOMNodeList* predictors = table->getElementsByTagName(u"NumericPredictor");
    for (XMLSize_t i = 0; i < predictors->getLength(); ++i) {
      auto* p = static_cast<xercesc::DOMElement*>(predictors->item(i));
      terms.push_back({Attribute(p, u"name"), Number(Attribute(p, u"coefficient"), 0),
                       Number(Attribute(p, u"exponent"), 1)});
    }
    return new LinearScorer(Number(Attribute(table, u"intercept"), 0), std::move(terms));
  }
};

}  // namespace

QZSCORING_PLUGIN_EXPORT QZScoring_800::ScoringScoreParser* GetScoreParser() {
  return new ExampleParser();
}

#include "RegressionModel.h"

#include <cmath>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "PluginDom.h"

namespace QZPlugin_800 {

namespace {

enum class Normalization { kNone, kSimplemax, kSoftmax, kLogit, kProbit, kCloglog, kExp,
                           kLoglog, kCauchit };

Normalization ParseNormalization(const std::string& text) {
  if (text.empty() || text == "none") return Normalization::kNone;
  if (text == "simplemax") return Normalization::kSimplemax;
  if (text == "softmax") return Normalization::kSoftmax;
  if (text == "logit") return Normalization::kLogit;
  if (text == "probit") return Normalization::kProbit;
  if (text == "cloglog") return Normalization::kCloglog;
  if (text == "exp") return Normalization::kExp;
  if (text == "loglog") return Normalization::kLoglog;
  if (text == "cauchit") return Normalization::kCauchit;
  throw CompileError("RegressionModel normalizationMethod '" + text + "' is not supported");
}

// The inverse link of one table's value (softmax of a single value is the logistic).
double Link(Normalization method, double y) {
  constexpr double kPi = 3.14159265358979323846;
  switch (method) {
    case Normalization::kSoftmax:
    case Normalization::kLogit:
      return 1.0 / (1.0 + std::exp(-y));
    case Normalization::kProbit:
      return 0.5 * std::erfc(-y / std::sqrt(2.0));
    case Normalization::kCloglog:
      return 1.0 - std::exp(-std::exp(y));
    case Normalization::kLoglog:
      return std::exp(-std::exp(-y));
    case Normalization::kCauchit:
      return 0.5 + std::atan(y) / kPi;
    case Normalization::kExp:
      return std::exp(y);
    case Normalization::kNone:
    case Normalization::kSimplemax:
      break;
  }
  return y;
}

struct NumericTerm {
  uint32_t table;
  uint32_t input;  // index into the numeric inputs read once per record
  double coefficient;
  double exponent;
};

struct ProductTerm {
  uint32_t table;
  uint32_t begin, end;  // its factors: productInputs_[begin, end)
  double coefficient;
};

// A categorical field, the categories its predictors name, and the coefficient of each
// (category, table) pair, laid out as [category * tables + table].
struct CategoricalField {
  int slot;
  CategoryTable categories;
  std::vector<double> coefficients;
};

class RegressionEvaluator : public ModelEvaluator {
 public:
  explicit RegressionEvaluator(ModelContext& context);
  void Evaluate(const FieldView& fields, ModelResult& result) override;

 private:
  struct PendingCategorical {
    size_t field;
    int category;
    uint32_t table;
    double coefficient;
  };

  uint32_t NumericInput(ModelContext& context, const std::string& name);
  void CompileTable(ModelContext& context, const xercesc::DOMElement* table, uint32_t index,
                    std::vector<PendingCategorical>& pending);
  void Classify(ModelResult& result) const;

  Normalization method_ = Normalization::kNone;
  bool classification_ = false;
  std::vector<double> intercepts_;  // per table
  std::vector<int> tableCategory_;  // classification: the category of each table
  int otherCategory_ = -1;          // binary target: the category of the second outcome
  std::vector<int> inputSlots_;
  std::vector<NumericTerm> numericTerms_;
  std::vector<ProductTerm> productTerms_;
  std::vector<uint32_t> productInputs_;
  std::vector<CategoricalField> categorical_;

  // Per-record scratch, sized at compile time.
  std::vector<double> inputs_;
  std::vector<double> sums_;
};

uint32_t RegressionEvaluator::NumericInput(ModelContext& context, const std::string& name) {
  const int slot = context.AddField(name);
  for (size_t i = 0; i < inputSlots_.size(); ++i) {
    if (inputSlots_[i] == slot) return static_cast<uint32_t>(i);
  }
  inputSlots_.push_back(slot);
  return static_cast<uint32_t>(inputSlots_.size() - 1);
}

void RegressionEvaluator::CompileTable(ModelContext& context, const xercesc::DOMElement* table,
                                       uint32_t index, std::vector<PendingCategorical>& pending) {
  const DomReader& reader = context.Reader();
  intercepts_.push_back(reader.Number(table, u"intercept", 0.0));
  for (const xercesc::DOMElement* p : ChildElements(table)) {
    if (IsElement(p, u"NumericPredictor")) {
      const std::string name = reader.Required(p, u"name");
      const double coefficient = reader.RequiredNumber(p, u"coefficient");
      const double exponent = reader.Number(p, u"exponent", 1.0);
      numericTerms_.push_back({index, NumericInput(context, name), coefficient, exponent});
    } else if (IsElement(p, u"CategoricalPredictor")) {
      const int slot = context.AddField(reader.Required(p, u"name"));
      size_t field = 0;
      while (field < categorical_.size() && categorical_[field].slot != slot) ++field;
      if (field == categorical_.size()) categorical_.push_back(CategoricalField{slot, CategoryTable(), {}});
      const int category = categorical_[field].categories.Intern(reader.Required(p, u"value"));
      pending.push_back({field, category, index, reader.RequiredNumber(p, u"coefficient")});
    } else if (IsElement(p, u"PredictorTerm")) {
      ProductTerm term{index, static_cast<uint32_t>(productInputs_.size()), 0,
                       reader.RequiredNumber(p, u"coefficient")};
      for (const xercesc::DOMElement* ref : ChildElements(p, u"FieldRef")) {
        productInputs_.push_back(NumericInput(context, reader.Required(ref, u"field")));
      }
      term.end = static_cast<uint32_t>(productInputs_.size());
      if (term.begin == term.end) throw CompileError("PredictorTerm without FieldRef");
      productTerms_.push_back(term);
    } else if (!IsElement(p, u"Extension")) {
      throw CompileError("RegressionTable element '" + reader.Name(p) + "' is not supported");
    }
  }
}

RegressionEvaluator::RegressionEvaluator(ModelContext& context) {
  const DomReader& reader = context.Reader();
  const xercesc::DOMElement* model = context.Element();
  method_ = ParseNormalization(reader.Attr(model, u"normalizationMethod"));
  classification_ = context.IsClassification();
  const std::vector<const xercesc::DOMElement*> tables = ChildElements(model, u"RegressionTable");
  if (tables.empty()) throw CompileError("RegressionModel has no RegressionTable");

  if (!classification_) {
    if (tables.size() != 1) throw CompileError("a regression RegressionModel needs one RegressionTable");
    if (method_ == Normalization::kSimplemax) {
      throw CompileError("normalizationMethod 'simplemax' does not apply to regression");
    }
  } else {
    CategoryTable* categories = context.TargetCategories();
    for (const xercesc::DOMElement* table : tables) {
      const std::string text = reader.Required(table, u"targetCategory");
      int category = categories->Find(text);
      if (category < 0) category = categories->Intern(text);
      for (int seen : tableCategory_) {
        if (seen == category) throw CompileError("two RegressionTables for category '" + text + "'");
      }
      tableCategory_.push_back(category);
    }
    if (tables.size() == 1) {
      // One table for a binary target: the other category is its complement.
      if (categories->Size() != 2 || method_ == Normalization::kSimplemax) {
        throw CompileError("one RegressionTable needs a binary target and no simplemax");
      }
      otherCategory_ = 1 - tableCategory_[0];
    } else if (tables.size() == 2) {
      otherCategory_ = tableCategory_[1];
    }
  }

  std::vector<PendingCategorical> pending;
  for (size_t t = 0; t < tables.size(); ++t) {
    CompileTable(context, tables[t], static_cast<uint32_t>(t), pending);
  }
  const size_t tableCount = tables.size();
  for (CategoricalField& field : categorical_) {
    field.coefficients.assign(static_cast<size_t>(field.categories.Size()) * tableCount, 0.0);
  }
  for (const PendingCategorical& p : pending) {
    categorical_[p.field].coefficients[static_cast<size_t>(p.category) * tableCount + p.table] +=
        p.coefficient;
  }
  inputs_.assign(inputSlots_.size(), 0.0);
  sums_.assign(tableCount, 0.0);
}

void RegressionEvaluator::Evaluate(const FieldView& fields, ModelResult& result) {
  for (size_t i = 0; i < inputSlots_.size(); ++i) {
    inputs_[i] = fields.Number(inputSlots_[i]);
    if (std::isnan(inputs_[i])) return;  // a missing input: no prediction
  }
  for (size_t t = 0; t < sums_.size(); ++t) sums_[t] = intercepts_[t];
  for (const NumericTerm& term : numericTerms_) {
    const double x = inputs_[term.input];
    const double power = term.exponent == 1.0   ? x
                         : term.exponent == 2.0 ? x * x
                                                : std::pow(x, term.exponent);
    sums_[term.table] += term.coefficient * power;
  }
  for (const ProductTerm& term : productTerms_) {
    double product = term.coefficient;
    for (uint32_t i = term.begin; i < term.end; ++i) product *= inputs_[productInputs_[i]];
    sums_[term.table] += product;
  }
  const size_t tableCount = sums_.size();
  for (const CategoricalField& field : categorical_) {
    const QZCommon_800::Value& value = fields.Get(field.slot);
    if (value.IsMissing() || (value.IsString() && value.GetText().empty())) return;
    const int category = field.categories.Match(value);
    if (category < 0) continue;  // a category no predictor names contributes nothing
    const double* row = &field.coefficients[static_cast<size_t>(category) * tableCount];
    for (size_t t = 0; t < tableCount; ++t) sums_[t] += row[t];
  }

  if (!classification_) {
    result.value = Link(method_, sums_[0]);
    result.state = std::isnan(result.value) ? ModelResult::kMissing : ModelResult::kValue;
    return;
  }
  Classify(result);
}

void RegressionEvaluator::Classify(ModelResult& result) const {
  std::vector<double>& p = result.probabilities;
  const size_t tables = sums_.size();
  switch (method_) {
    case Normalization::kSoftmax: {
      // With one table for a binary target, the other category's value is 0.
      double top = otherCategory_ >= 0 && tables == 1 ? 0.0 : sums_[0];
      for (double y : sums_) top = y > top ? y : top;
      double total = 0.0;
      for (size_t t = 0; t < tables; ++t) {
        const double e = std::exp(sums_[t] - top);
        p[static_cast<size_t>(tableCategory_[t])] = e;
        total += e;
      }
      if (tables == 1) {
        const double e = std::exp(-top);
        p[static_cast<size_t>(otherCategory_)] = e;
        total += e;
      }
      for (double& v : p) v /= total;
      break;
    }
    case Normalization::kSimplemax: {
      double total = 0.0;
      for (double y : sums_) total += y;
      if (total == 0.0) return;  // no proportions: no prediction
      for (size_t t = 0; t < tables; ++t) {
        p[static_cast<size_t>(tableCategory_[t])] = sums_[t] / total;
      }
      break;
    }
    default:
      if (otherCategory_ >= 0) {
        const double first = Link(method_, sums_[0]);
        p[static_cast<size_t>(tableCategory_[0])] = first;
        p[static_cast<size_t>(otherCategory_)] = 1.0 - first;
      } else {
        for (size_t t = 0; t < tables; ++t) {
          p[static_cast<size_t>(tableCategory_[t])] = Link(method_, sums_[t]);
        }
      }
      break;
  }
  for (double v : p) {
    if (std::isnan(v)) return;
  }
  result.PickMostProbable();
}

std::unique_ptr<ModelEvaluator> CompileRegressionModel(ModelContext& context) {
  return std::make_unique<RegressionEvaluator>(context);
}

}  // namespace

void RegisterRegressionModel(KindRegistry& registry) {
  registry.Add("RegressionModel", &CompileRegressionModel);
}

}  // namespace QZPlugin_800

// The library's variable kinds: continuous and categorical variables over the shared
// state of QZVariableBase.
#include <limits>
#include <utility>

#include "Encoders.h"
#include "QZVarList.h"
#include "XMLElement.h"

namespace QZXML_800 {

IQZVariable::~IQZVariable() = default;

// ---- QZVariableBase ----

QZVariableBase::QZVariableBase(const std::string& name, const std::string& label,
                               VariableRole role, std::unique_ptr<IQZEncoder> encoder)
    : name_(name), label_(label), role_(role), encoder_(std::move(encoder)) {}

QZVariableBase::QZVariableBase(const QZVariableBase& other)
    : IQZVariable(other),
      name_(other.name_),
      label_(other.label_),
      role_(other.role_),
      storageType_(other.storageType_),
      flagMeasure_(other.flagMeasure_),
      format_(other.format_ ? other.format_->Clone() : nullptr),
      encoder_(other.encoder_ ? other.encoder_->Clone() : nullptr) {}

QZVariableBase::~QZVariableBase() = default;

std::string QZVariableBase::GetName() const { return name_; }

std::string QZVariableBase::GetLabel() const { return label_; }

VariableRole QZVariableBase::GetRole() const { return role_; }

void QZVariableBase::SetRole(VariableRole role) {
  role_ = role;
  if (owner_ != nullptr) owner_->OnRoleChanged(index_, role);
}

int QZVariableBase::GetStorageType() const { return storageType_; }

void QZVariableBase::SetStorageType(int code) { storageType_ = code; }

bool QZVariableBase::GetFlagMeasure() const { return flagMeasure_; }

void QZVariableBase::SetFlagMeasure(bool flag) { flagMeasure_ = flag; }

const XMLElement* QZVariableBase::GetFormat() const { return format_.get(); }

void QZVariableBase::SetFormat(XMLElement* format) { format_.reset(format); }

IQZEncoder* QZVariableBase::GetEncoder() { return encoder_.get(); }

const IQZEncoder* QZVariableBase::GetEncoder() const { return encoder_.get(); }

int QZVariableBase::GetNumCategories() const {
  return encoder_ ? encoder_->GetCount() : 0;
}

// ---- QZContVar ----

QZContVar::QZContVar(const std::string& name, const std::string& label, VariableRole role)
    : QZContVar(name, label, std::numeric_limits<double>::lowest(),
                std::numeric_limits<double>::max(), role, false, -1) {}

QZContVar::QZContVar(const std::string& name, const std::string& label, double minimum,
                     double maximum, VariableRole role, bool isInteger, int decimals)
    : QZVariableBase(name, label, role, std::make_unique<NumberEncoder>(false)),
      minimum_(minimum),
      maximum_(maximum),
      isInteger_(isInteger),
      decimals_(decimals) {}

QZContVar* QZContVar::Clone() const { return new QZContVar(*this); }

MeasureLevel QZContVar::GetMeasureLevel() const { return ML_CONTINUOUS; }

double QZContVar::GetMinimum() const { return minimum_; }

double QZContVar::GetMaximum() const { return maximum_; }

bool QZContVar::GetIntegerFlag() const { return isInteger_; }

int QZContVar::GetDecimals() const { return decimals_; }

// ---- QZCatVar ----

namespace {

std::unique_ptr<IQZEncoder> EncoderForLevel(MeasureLevel level) {
  if (level == ML_NUMERIC_CATEGORICAL) return std::make_unique<NumberEncoder>(true);
  return std::make_unique<StringEncoder>();
}

}  // namespace

QZCatVar::QZCatVar(const std::string& name, const std::string& label, MeasureLevel level,
                   VariableRole role)
    : QZVariableBase(name, label, role, EncoderForLevel(level)),
      level_(level == ML_NUMERIC_CATEGORICAL ? ML_NUMERIC_CATEGORICAL
                                             : ML_STRING_CATEGORICAL) {}

QZCatVar* QZCatVar::Clone() const { return new QZCatVar(*this); }

MeasureLevel QZCatVar::GetMeasureLevel() const { return level_; }

void QZCatVar::SetOrdinalFlag(bool flag) { ordinal_ = flag; }

bool QZCatVar::GetOrdinalFlag() const { return ordinal_; }

void QZCatVar::SetBinaryFlag(bool flag, int trueIndex) {
  binary_ = flag;
  trueIndex_ = flag ? trueIndex : -1;
}

bool QZCatVar::GetBinaryFlag() const { return binary_; }

int QZCatVar::GetBinaryFlagTrueIndex() const { return trueIndex_; }

}  // namespace QZXML_800

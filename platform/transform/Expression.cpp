// Data types, value conversion and constants of the transformation engine.
#include "Expression.h"

#include <cmath>
#include <string_view>
#include <unordered_map>

namespace QZTransformNS_8_0_0 {
namespace internal {

namespace {

std::string_view Trimmed(std::string_view text) {
  const char* blanks = " \t\r\n";
  const size_t first = text.find_first_not_of(blanks);
  if (first == std::string_view::npos) return std::string_view();
  const size_t last = text.find_last_not_of(blanks);
  return text.substr(first, last - first + 1);
}

// 1 for "true"/"1", 0 for "false"/"0" (xs:boolean), -1 otherwise.
int BooleanOf(std::string_view text) {
  text = Trimmed(text);
  if (text == "true" || text == "1") return 1;
  if (text == "false" || text == "0") return 0;
  return -1;
}

}  // namespace

bool ParseDataType(const std::string& name, DataType* type) {
  static const std::unordered_map<std::string, DataType> kTypes = {
      {"string", DataType::kString},
      {"integer", DataType::kInteger},
      {"float", DataType::kFloat},
      {"double", DataType::kDouble},
      {"boolean", DataType::kBoolean},
      {"date", DataType::kDate},
      {"time", DataType::kTime},
      {"dateTime", DataType::kDateTime},
      {"dateDaysSince[0]", DataType::kDateDaysSince0},
      {"dateDaysSince[1960]", DataType::kDateDaysSince1960},
      {"dateDaysSince[1970]", DataType::kDateDaysSince1970},
      {"dateDaysSince[1980]", DataType::kDateDaysSince1980},
      {"timeSeconds", DataType::kTimeSeconds},
      {"dateTimeSecondsSince[0]", DataType::kDateTimeSecondsSince0},
      {"dateTimeSecondsSince[1960]", DataType::kDateTimeSecondsSince1960},
      {"dateTimeSecondsSince[1970]", DataType::kDateTimeSecondsSince1970},
      {"dateTimeSecondsSince[1980]", DataType::kDateTimeSecondsSince1980},
  };
  const auto found = kTypes.find(name);
  if (found == kTypes.end()) return false;
  *type = found->second;
  return true;
}

bool IsNumericType(DataType type) {
  return type == DataType::kInteger || type == DataType::kFloat || type == DataType::kDouble;
}

ValueKind KindOf(DataType type) {
  switch (type) {
    case DataType::kString:
      return ValueKind::kText;
    case DataType::kBoolean:
      return ValueKind::kBoolean;
    case DataType::kNone:
    case DataType::kDate:
    case DataType::kTime:
    case DataType::kDateTime:
      return ValueKind::kAsComputed;
    default:
      return ValueKind::kReal;  // integer, float, double, and the numeric date types
  }
}

void CoerceToKind(ValueKind kind, Value& value) {
  switch (kind) {
    case ValueKind::kAsComputed:
      return;
    case ValueKind::kReal:
      if (!value.IsNumericValue()) value = value.GetReal();
      return;
    case ValueKind::kBoolean:
      if (value.IsString()) {
        const int b = BooleanOf(value.GetText());
        value = b >= 0 ? static_cast<double>(b) : value.GetReal();
      } else if (!value.IsNumericValue()) {
        value = QZMV::Missing();
      }
      return;
    case ValueKind::kText:
      if (value.IsNumericValue()) {
        if (value.IsSystemMissingValue()) {
          value = Value();
        } else {
          std::string text = value.GetString();
          value = text;
        }
      } else if (value.IsStruct()) {
        value = Value();
      }
      return;
  }
}

bool MakeConstant(const std::string& text, DataType type, Value* out, std::string* why) {
  switch (KindOf(type)) {
    case ValueKind::kText:
      *out = Value(text);
      return true;
    case ValueKind::kBoolean: {
      const int b = BooleanOf(text);
      if (b < 0) {
        *why = "'" + text + "' is not a boolean";
        return false;
      }
      *out = Value(static_cast<double>(b));
      return true;
    }
    case ValueKind::kReal: {
      const double d = Value::TextToReal(text);
      if (QZMV::IsMissing(d)) {
        *why = "'" + text + "' is not a number";
        return false;
      }
      if (type == DataType::kInteger && !(std::isfinite(d) && std::floor(d) == d)) {
        *why = "'" + text + "' is not an integer";
        return false;
      }
      *out = Value(d);
      return true;
    }
    case ValueKind::kAsComputed:
      break;
  }
  if (type == DataType::kNone) {
    const double d = Value::TextToReal(text);
    *out = QZMV::IsMissing(d) ? Value(text) : Value(d);
  } else {
    *out = Value(text);  // date and time texts are kept as they are written
  }
  return true;
}

double Expr::EvalReal(const EvalContext& ctx) const {
  Value scratch;
  const Value* v = EvalRef(ctx, scratch);
  return v != nullptr ? v->GetReal() : InvalidReal();
}

int ToBool(const Value& value) {
  if (value.IsNumericValue()) {
    if (value.IsSystemMissingValue()) return -1;
    return value.GetReal() != 0.0 ? 1 : 0;
  }
  if (!value.IsString()) return -1;
  const int b = BooleanOf(value.GetText());
  if (b >= 0) return b;
  const double d = Value::TextToReal(value.GetText());
  if (IsMissingReal(d)) return -1;
  return d != 0.0 ? 1 : 0;
}

bool ValuesEqual(const Value& a, const Value& b) {
  if (a.IsNumericValue() && b.IsNumericValue()) return a.GetReal() == b.GetReal();
  if (a.IsString() && b.IsString()) return a.GetText() == b.GetText();
  if (a.IsMissing() || b.IsMissing()) return false;
  const double x = a.GetReal();
  const double y = b.GetReal();
  return !IsMissingReal(x) && !IsMissingReal(y) && x == y;
}

int CompareValues(const Value& a, const Value& b) {
  if (a.IsMissing() || b.IsMissing()) return 2;
  if (a.IsString() && b.IsString()) {
    const int c = a.GetText().compare(b.GetText());
    return c < 0 ? -1 : (c > 0 ? 1 : 0);
  }
  const double x = a.GetReal();
  const double y = b.GetReal();
  if (IsMissingReal(x) || IsMissingReal(y)) return 2;
  return x < y ? -1 : (x > y ? 1 : 0);
}

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

// Value: the slow paths (strings and structs), text conversion and ordering.
#include "Value.h"

#include <charconv>
#include <cstdlib>
#include <deque>
#include <limits>
#include <ostream>
#include <system_error>

namespace QZCommon_800 {

// Entries of a structured value. A deque keeps references to entries valid while
// further entries are added.
struct Value::Entries {
  std::deque<std::pair<std::string, Value>> items;
};

void Value::EntriesDeleter::operator()(Entries* entries) const noexcept { delete entries; }

const Value Value::NULL_VALUE;

namespace {

bool IsBlank(char c) {
  return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\f' || c == '\v';
}

int KindRank(uint16_t type) {
  switch (type) {
    case Value::REAL_TYPE: return 1;
    case Value::STRING_TYPE: return 2;
    case Value::STRUCT_TYPE: return 3;
    default: return 0;
  }
}

int Sign(int v) { return (v > 0) - (v < 0); }

// The value of a syntactically valid number that from_chars found out of range: an
// infinity when its decimal magnitude is large, zero when it is tiny.
double OutOfRangeReal(const char* first, const char* last) {
  bool negative = false;
  if (first != last && *first == '-') {
    negative = true;
    ++first;
  }
  // Decimal position of the first significant digit, relative to the point.
  long magnitude = 0;
  bool seenPoint = false;
  bool seenDigit = false;
  const char* p = first;
  for (; p != last && *p != 'e' && *p != 'E'; ++p) {
    if (*p == '.') {
      seenPoint = true;
    } else if (!seenDigit && *p == '0') {
      if (seenPoint) --magnitude;
    } else if (!seenDigit) {
      seenDigit = true;
      if (!seenPoint) ++magnitude;
    } else if (!seenPoint) {
      ++magnitude;
    }
  }
  long exponent = 0;
  if (p != last) {
    ++p;
    bool negativeExponent = false;
    if (p != last && (*p == '+' || *p == '-')) negativeExponent = *p++ == '-';
    for (; p != last && *p >= '0' && *p <= '9'; ++p) {
      if (exponent < 100000000L) exponent = exponent * 10 + (*p - '0');
    }
    if (negativeExponent) exponent = -exponent;
  }
  double result = magnitude + exponent > 0 ? std::numeric_limits<double>::infinity() : 0.0;
  return negative ? -result : result;
}

}  // namespace

Value Value::GetInfinity() noexcept { return Value(std::numeric_limits<double>::infinity()); }

double Value::TextToReal(std::string_view text) noexcept {
  size_t begin = 0;
  size_t end = text.size();
  while (begin < end && IsBlank(text[begin])) ++begin;
  while (end > begin && IsBlank(text[end - 1])) --end;
  if (begin == end) return QZMV::Missing();
  const char* first = text.data() + begin;
  const char* last = text.data() + end;
  // from_chars takes a minus sign only; a single plus sign is allowed as well.
  if (*first == '+') {
    ++first;
    if (first == last || *first == '+' || *first == '-') return QZMV::Missing();
  }
  double d = 0.0;
  std::from_chars_result r = std::from_chars(first, last, d, std::chars_format::general);
  if (r.ec == std::errc::result_out_of_range) {
    d = OutOfRangeReal(first, r.ptr);
  } else if (r.ec != std::errc()) {
    return QZMV::Missing();
  }
  if (r.ptr != last || d != d) return QZMV::Missing();
  return d;
}

std::string Value::RealToText(double d) {
  if (QZMV::IsMissing(d)) return std::string();
  if (d == 0.0) return "0";  // minus zero too: it equals zero
  // The shortest digits that read back as the same double, written in plain decimal
  // notation for exponents from -6 to 20 (1000000, 0.000125) and in exponent notation
  // beyond (1e+300, 1e-07), as a reader of CSV files and category texts expects.
  char buffer[40];
  std::to_chars_result r =
      std::to_chars(buffer, buffer + sizeof buffer, d, std::chars_format::scientific);
  const std::string scientific(buffer, r.ptr);
  const size_t e = scientific.find('e');
  if (e == std::string::npos) return scientific;  // inf, -inf
  const int exponent = std::atoi(scientific.c_str() + e + 1);
  if (exponent < -6 || exponent > 20) return scientific;

  const bool negative = scientific[0] == '-';
  std::string digits;
  for (size_t i = negative ? 1 : 0; i < e; ++i) {
    if (scientific[i] != '.') digits += scientific[i];
  }
  std::string text(negative ? "-" : "");
  if (exponent >= 0) {
    const size_t whole = static_cast<size_t>(exponent) + 1;
    if (digits.size() <= whole) {
      text += digits;
      text.append(whole - digits.size(), '0');
    } else {
      text.append(digits, 0, whole);
      text += '.';
      text.append(digits, whole, std::string::npos);
    }
  } else {
    text += "0.";
    text.append(static_cast<size_t>(-exponent - 1), '0');
    text += digits;
  }
  return text;
}

std::string Value::GetString() const {
  if (type_ == STRING_TYPE) return text_;
  if (type_ == REAL_TYPE) return RealToText(real_);
  return std::string();
}

const std::string& Value::GetText() const noexcept {
  static const std::string empty;  // a local static: usable during static initialisation
  return type_ == STRING_TYPE ? text_ : empty;
}

void Value::CopyConstructSlow(const Value& other) {
  if (other.type_ == STRING_TYPE) {
    new (&text_) std::string(other.text_);
    type_ = STRING_TYPE;
  } else if (other.type_ == STRUCT_TYPE) {
    EntriesPtr copy(new Entries(*other.entries_));
    new (&entries_) EntriesPtr(std::move(copy));
    type_ = STRUCT_TYPE;
  }
}

void Value::MoveConstructSlow(Value& other) noexcept {
  if (other.type_ == STRING_TYPE) {
    new (&text_) std::string(std::move(other.text_));
    other.text_.~basic_string();
  } else {
    new (&entries_) EntriesPtr(std::move(other.entries_));
    other.entries_.~EntriesPtr();
  }
  type_ = other.type_;
  other.type_ = NULL_TYPE;
  other.real_ = 0.0;
}

void Value::AssignSlow(const Value& other) {
  if (type_ == STRING_TYPE && other.type_ == STRING_TYPE) {
    text_ = other.text_;  // reuses this value's buffer
    return;
  }
  // Copy first: other may be one of this struct's entries.
  Value copy(other);
  Release();
  type_ = NULL_TYPE;
  real_ = 0.0;
  MoveConstruct(copy);
}

void Value::MoveAssignSlow(Value& other) noexcept {
  // Take other's content first: it may be one of this struct's entries.
  Value taken(std::move(other));
  Release();
  type_ = NULL_TYPE;
  real_ = 0.0;
  MoveConstruct(taken);
}

Value& Value::operator=(const std::string& s) {
  if (type_ == STRING_TYPE) {
    text_ = s;
    return *this;
  }
  std::string copy(s);  // s may be the text of one of this struct's entries
  Release();
  new (&text_) std::string(std::move(copy));
  type_ = STRING_TYPE;
  return *this;
}

Value& Value::operator=(std::string&& s) noexcept {
  if (type_ == STRING_TYPE) {
    text_ = std::move(s);
    return *this;
  }
  std::string taken(std::move(s));  // s may be the text of one of this struct's entries
  Release();
  new (&text_) std::string(std::move(taken));
  type_ = STRING_TYPE;
  return *this;
}

Value& Value::operator=(const char* s) {
  if (s == nullptr) {
    Release();
    type_ = NULL_TYPE;
    real_ = 0.0;
    return *this;
  }
  if (type_ == STRING_TYPE) {
    text_ = s;
    return *this;
  }
  std::string copy(s);
  Release();
  new (&text_) std::string(std::move(copy));
  type_ = STRING_TYPE;
  return *this;
}

Value Value::operator-() const {
  if (type_ == REAL_TYPE && real_ != QZMV::Missing()) return Value(-real_);
  return *this;
}

void Value::MakeStruct() {
  if (type_ == STRUCT_TYPE) return;
  EntriesPtr fresh(new Entries());
  Release();
  new (&entries_) EntriesPtr(std::move(fresh));
  type_ = STRUCT_TYPE;
}

Value& Value::operator[](const std::string& name) {
  MakeStruct();
  for (auto& entry : entries_->items) {
    if (entry.first == name) return entry.second;
  }
  entries_->items.emplace_back(name, Value());
  return entries_->items.back().second;
}

const Value* Value::Find(const std::string& name) const noexcept {
  if (type_ != STRUCT_TYPE) return nullptr;
  for (const auto& entry : entries_->items) {
    if (entry.first == name) return &entry.second;
  }
  return nullptr;
}

std::vector<std::string> Value::GetEntryNames() const {
  std::vector<std::string> names;
  if (type_ != STRUCT_TYPE) return names;
  names.reserve(entries_->items.size());
  for (const auto& entry : entries_->items) names.push_back(entry.first);
  return names;
}

int Value::Compare(const Value& other) const noexcept {
  int rank = KindRank(type_);
  int otherRank = KindRank(other.type_);
  if (rank != otherRank) return rank < otherRank ? -1 : 1;
  switch (type_) {
    case REAL_TYPE: {
      bool missing = real_ == QZMV::Missing();
      bool otherMissing = other.real_ == QZMV::Missing();
      if (missing || otherMissing) return missing == otherMissing ? 0 : (missing ? -1 : 1);
      return (real_ > other.real_) - (real_ < other.real_);
    }
    case STRING_TYPE:
      return Sign(text_.compare(other.text_));
    case STRUCT_TYPE: {
      const auto& a = entries_->items;
      const auto& b = other.entries_->items;
      size_t common = a.size() < b.size() ? a.size() : b.size();
      for (size_t i = 0; i < common; ++i) {
        int c = Sign(a[i].first.compare(b[i].first));
        if (c == 0) c = a[i].second.Compare(b[i].second);
        if (c != 0) return c;
      }
      return (a.size() > b.size()) - (a.size() < b.size());
    }
    default:
      return 0;
  }
}

Value* Value::Clone() const {
  try {
    return new Value(*this);
  } catch (...) {
    return nullptr;
  }
}

std::ostream& operator<<(std::ostream& os, const Value& value) {
  if (!value.IsStruct()) return os << value.GetString();
  os << '{';
  bool first = true;
  for (const auto& entry : value.entries_->items) {
    if (!first) os << ", ";
    first = false;
    os << entry.first << '=' << entry.second;
  }
  return os << '}';
}

}  // namespace QZCommon_800

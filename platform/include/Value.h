// One typed value of the platform: null, a real number (system-missing included), a
// string, or a structured value with named entries.
#ifndef QZ_PLATFORM_VALUE_H_
#define QZ_PLATFORM_VALUE_H_

#include <cstdint>
#include <iosfwd>
#include <memory>
#include <new>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "QZMV.h"
#include "QZPlatformExport.h"

namespace QZCommon_800 {

// A small tagged value. Reals and nulls live inline: building, copying and reading them
// never allocates. A string keeps its text in place (short texts need no allocation); a
// structured value owns its entries on the heap.
// A Value is not synchronised: share it between threads only for reading.
class QZCOMMON_API Value {
 public:
  // Kind tags returned by GetType.
  enum Type : uint16_t { NULL_TYPE = 0, REAL_TYPE = 3, STRING_TYPE = 5, STRUCT_TYPE = 7 };

  // The null value.
  static const Value NULL_VALUE;
  // Positive infinity as a real; its negation is minus infinity.
  static Value GetInfinity() noexcept;

  // Null.
  constexpr Value() noexcept : type_(NULL_TYPE), real_(0.0) {}
  // A real. A NaN is stored as system-missing.
  Value(int v) noexcept : type_(REAL_TYPE), real_(v) {}
  Value(double d) noexcept : type_(REAL_TYPE), real_(d != d ? QZMV::Missing() : d) {}
  // Further integer widths, so that building from any integer is not ambiguous.
  Value(unsigned v) noexcept : type_(REAL_TYPE), real_(static_cast<double>(v)) {}
  Value(long v) noexcept : type_(REAL_TYPE), real_(static_cast<double>(v)) {}
  Value(unsigned long v) noexcept : type_(REAL_TYPE), real_(static_cast<double>(v)) {}
  Value(long long v) noexcept : type_(REAL_TYPE), real_(static_cast<double>(v)) {}
  Value(unsigned long long v) noexcept : type_(REAL_TYPE), real_(static_cast<double>(v)) {}
  // A string holding a copy of the text.
  Value(const std::string& s) : type_(STRING_TYPE) { new (&text_) std::string(s); }
  Value(std::string&& s) noexcept : type_(STRING_TYPE) { new (&text_) std::string(std::move(s)); }
  // A string; a null pointer gives null.
  Value(const char* s) : type_(NULL_TYPE), real_(0.0) {
    if (s != nullptr) {
      new (&text_) std::string(s);
      type_ = STRING_TYPE;
    }
  }

  // Deep copy (entries of a structured value are copied).
  Value(const Value& other) : type_(NULL_TYPE), real_(0.0) {
    if (other.type_ <= REAL_TYPE) {
      type_ = other.type_;
      real_ = other.real_;
    } else {
      CopyConstructSlow(other);
    }
  }
  // Takes the content; the moved-from value becomes null.
  Value(Value&& other) noexcept : type_(NULL_TYPE), real_(0.0) { MoveConstruct(other); }

  ~Value() { Release(); }

  // Deep copy. Safe when other is this value or one of its own entries.
  Value& operator=(const Value& other) {
    if (type_ <= REAL_TYPE && other.type_ <= REAL_TYPE) {
      type_ = other.type_;
      real_ = other.real_;
    } else if (this != &other) {
      AssignSlow(other);
    }
    return *this;
  }
  // Takes the content; the moved-from value becomes null (unless it is this value).
  Value& operator=(Value&& other) noexcept {
    if (type_ <= REAL_TYPE && other.type_ <= REAL_TYPE) {
      type_ = other.type_;
      real_ = other.real_;
      if (this != &other) other.type_ = NULL_TYPE;
    } else if (this != &other) {
      MoveAssignSlow(other);
    }
    return *this;
  }
  // Becomes a real (a NaN becomes system-missing).
  Value& operator=(double d) noexcept {
    if (type_ > REAL_TYPE) Release();
    type_ = REAL_TYPE;
    real_ = d != d ? QZMV::Missing() : d;
    return *this;
  }
  // Integers become reals; one overload per width keeps `v = 0` and `v = 5L` unambiguous.
  Value& operator=(int v) noexcept { return *this = static_cast<double>(v); }
  Value& operator=(unsigned v) noexcept { return *this = static_cast<double>(v); }
  Value& operator=(long v) noexcept { return *this = static_cast<double>(v); }
  Value& operator=(unsigned long v) noexcept { return *this = static_cast<double>(v); }
  Value& operator=(long long v) noexcept { return *this = static_cast<double>(v); }
  Value& operator=(unsigned long long v) noexcept { return *this = static_cast<double>(v); }
  // Becomes a string holding a copy of the text (or the moved text).
  Value& operator=(const std::string& s);
  Value& operator=(std::string&& s) noexcept;
  // Becomes a string; a null pointer makes it null.
  Value& operator=(const char* s);

  // A real negated (system-missing stays system-missing); every other kind unchanged.
  Value operator-() const;

  // The kind tag (a Type).
  uint16_t GetType() const noexcept { return type_; }
  // Real: itself. String: the whole text read as a real number (blanks around it
  // allowed, "inf"/"infinity" accepted), or system-missing when it is no number.
  // Null and struct: system-missing.
  double GetReal() const noexcept {
    if (type_ == REAL_TYPE) return real_;
    if (type_ == STRING_TYPE) return TextToReal(text_);
    return QZMV::Missing();
  }
  // String: itself. Real: shortest round-trip decimal text ("800", "2.5", "1e+300",
  // "inf", "-inf"; minus zero gives "0"). System-missing, null and struct: empty.
  std::string GetString() const;
  // The stored text of a string value without copying it; an empty text for any other
  // kind. The reference lives as long as the value is not changed.
  const std::string& GetText() const noexcept;

  // Kind null.
  bool IsNull() const noexcept { return type_ == NULL_TYPE; }
  // A real holding the system-missing double.
  bool IsSystemMissingValue() const noexcept {
    return type_ == REAL_TYPE && real_ == QZMV::Missing();
  }
  // Kind real (system-missing included).
  bool IsNumericValue() const noexcept { return type_ == REAL_TYPE; }
  // Kind string (an empty text included).
  bool IsString() const noexcept { return type_ == STRING_TYPE; }
  // Null or system-missing.
  bool IsMissing() const noexcept {
    return type_ == NULL_TYPE || (type_ == REAL_TYPE && real_ == QZMV::Missing());
  }
  // True when not missing (neither null nor system-missing).
  explicit operator bool() const noexcept { return !IsMissing(); }

  // Structured values. The named entry; a non-struct value first becomes an empty
  // struct (its content is dropped) and an absent entry is added as null. References
  // to entries stay valid while the struct lives (adding entries does not move them).
  // Lookup is linear in the number of entries: structs are meant to be small.
  Value& operator[](const std::string& name);
  // Entries are named, not numbered: `v[0]` would read a null text pointer.
  Value& operator[](int) = delete;
  // The named entry, or null when absent or when this is not a struct.
  const Value* Find(const std::string& name) const noexcept;
  // Entry names in insertion order; empty for a non-struct.
  std::vector<std::string> GetEntryNames() const;
  // Kind structured.
  bool IsStruct() const noexcept { return type_ == STRUCT_TYPE; }

  // Three-way comparison of the strict weak order: kinds order null < real < string <
  // struct; reals numerically with system-missing below every other real (minus
  // infinity included); strings byte-wise; structs entry by entry in insertion order
  // (name, then value; a prefix is lower). Returns -1, 0 or 1.
  int Compare(const Value& other) const noexcept;
  bool operator==(const Value& other) const noexcept { return Compare(other) == 0; }
  bool operator!=(const Value& other) const noexcept { return Compare(other) != 0; }
  bool operator<(const Value& other) const noexcept { return Compare(other) < 0; }
  bool operator<=(const Value& other) const noexcept { return Compare(other) <= 0; }
  bool operator>(const Value& other) const noexcept { return Compare(other) > 0; }
  bool operator>=(const Value& other) const noexcept { return Compare(other) >= 0; }

  // A heap copy owned by the caller (delete it); null only when memory runs out.
  Value* Clone() const;

  // Text read as a real, as GetReal reads a string value: system-missing when the text
  // (without surrounding blanks) is not one whole number or reads as NaN. Too large
  // magnitudes give an infinity, too small ones zero. Independent of the locale.
  static double TextToReal(std::string_view text) noexcept;
  // Shortest round-trip decimal text of a real, as GetString writes it.
  static std::string RealToText(double d);

  friend QZCOMMON_API std::ostream& operator<<(std::ostream& os, const Value& value);

 private:
  struct Entries;
  struct QZCOMMON_API EntriesDeleter {
    void operator()(Entries* entries) const noexcept;
  };
  using EntriesPtr = std::unique_ptr<Entries, EntriesDeleter>;

  // Ends the lifetime of the active string or entries; the tag is left unchanged.
  void Release() noexcept {
    if (type_ == STRING_TYPE) {
      text_.~basic_string();
    } else if (type_ == STRUCT_TYPE) {
      entries_.~EntriesPtr();
    }
  }
  // Construction from other's content into a value whose storage holds nothing.
  void MoveConstruct(Value& other) noexcept {
    if (other.type_ <= REAL_TYPE) {
      type_ = other.type_;
      real_ = other.real_;
    } else {
      MoveConstructSlow(other);
    }
    other.type_ = NULL_TYPE;
  }
  void CopyConstructSlow(const Value& other);
  void MoveConstructSlow(Value& other) noexcept;
  void AssignSlow(const Value& other);
  void MoveAssignSlow(Value& other) noexcept;
  void MakeStruct();

  uint16_t type_;
  union {
    double real_;         // REAL_TYPE
    std::string text_;    // STRING_TYPE
    EntriesPtr entries_;  // STRUCT_TYPE
  };
};

// Writes GetString(); a struct as {a=1, b=x} (nested structs likewise).
QZCOMMON_API std::ostream& operator<<(std::ostream& os, const Value& value);

}  // namespace QZCommon_800

#endif  // QZ_PLATFORM_VALUE_H_

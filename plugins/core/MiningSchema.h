// A model's MiningSchema: which fields it reads and what it does with missing, invalid
// and outlying values before the model sees them.
#ifndef QZPLUGIN_CORE_MININGSCHEMA_H_
#define QZPLUGIN_CORE_MININGSCHEMA_H_

#include <memory>
#include <string>
#include <vector>

#include <xercesc/dom/DOMElement.hpp>

#include "Categories.h"
#include "FieldBinder.h"
#include "QZVarList.h"
#include "Value.h"
#include "ValueRecord.h"

namespace QZPlugin_800 {

class DocumentContext;

// The compiled MiningSchema of one model. Compile reads it once; Apply checks and
// treats one prepared record, reading (and, for the model's own working copy, writing)
// by the positions of the model's FieldBinder.
//
// Order of treatment per active field: a missing value (null, system-missing, an empty
// text, or a missing value the data dictionary declares) is replaced by
// missingValueReplacement when there is one, or refuses the record under
// missingValueTreatment="returnInvalid". A value that is no valid value of the field
// (not a number for a numeric field, outside all its Intervals, not one of its
// declared categories, or a Value the dictionary declares invalid) follows invalidValueTreatment: returnInvalid (the default) refuses the
// record, asIs keeps it, asMissing makes it missing (then replaced as above), asValue
// replaces it by invalidValueReplacement. A valid number outside lowValue..highValue
// follows outliers: asMissingValues makes it missing, asExtremeValues clamps it.
class MiningSchema {
 public:
  enum class Usage { kActive, kTarget, kSupplementary, kGroup, kOrder, kFrequencyWeight,
                     kAnalysisWeight };

  MiningSchema() = default;
  MiningSchema(const MiningSchema&) = delete;
  MiningSchema& operator=(const MiningSchema&) = delete;

  // Reads the schema; every active field gets a slot in `binder`. The variables of
  // `scope` give each field's domain and must outlive the schema. `parent` is the
  // schema of the enclosing model (null at the top level): a field it guarantees to be
  // valid or missing, which this schema treats by default, is not checked again.
  // Throws CompileError for an unknown usage type or treatment, or a treatment without
  // its values.
  void Compile(const xercesc::DOMElement* schema, DocumentContext& document,
               const QZXML_800::QZVarList& scope, FieldBinder& binder,
               const MiningSchema* parent);

  // The first field of usage predicted or target; "" when none.
  const std::string& Target() const { return target_; }
  // Names of the active fields, in document order.
  const std::vector<std::string>& ActiveFields() const { return active_; }
  // Whether every record this schema lets through holds a valid value (or a missing
  // one) in the field: it refuses or replaces invalid values of it, or an enclosing
  // schema does.
  bool Guarantees(const std::string& field) const;
  // Whether Apply may have to change a value (a replacement, asMissing, asValue or an
  // outlier treatment): the model then scores a working copy of its input.
  bool ChangesValues() const { return changesValues_; }

  // Declares a field the model computes (a LocalTransformations field of a numeric data
  // type) into every record it hands its segments: such a record holds a number or
  // system-missing there, which a segment need not check again.
  void AddComputedNumber(const std::string& field) { computedNumbers_.push_back(field); }
  bool ComputesNumber(const std::string& field) const;
  // Called once the model knows whether it scores a working copy: without one, drops
  // the checks that can neither refuse a record nor change a value.
  void Finish(bool working);
  // Whether Apply has anything to check; when not, calling it is a no-op.
  bool HasChecks() const { return !fields_.empty(); }

  // Checks every active field of `record` (bound in `binder`) and, when `working` is the
  // same record as a writable copy, writes the treated values into it. Returns false
  // when the record is refused (returnInvalid). Allocates nothing for numeric work.
  bool Apply(const QZCommon_800::ValueRecord& record, QZCommon_800::ValueRecord* working,
             const FieldBinder& binder) const;

 private:
  enum class Invalid { kReturnInvalid, kAsIs, kAsMissing, kAsValue };
  enum class Outliers { kAsIs, kAsMissingValues, kAsExtremeValues };

  struct Interval {
    double low, high;
    bool lowOpen, highOpen;
  };

  struct Field {
    std::string name;
    int slot = -1;
    const QZXML_800::IQZVariable* variable = nullptr;  // null: no declared domain
    bool numeric = false;          // continuous: values must be numbers
    bool declaredMissing = false;  // the dictionary lists missing values for it
    std::vector<Interval> intervals;              // valid ranges; empty: any number
    std::unique_ptr<CategoryTable> categories;   // valid categories; null: any
    std::unique_ptr<CategoryTable> invalidValues;  // values the dictionary calls invalid
    bool hasReplacement = false;
    QZCommon_800::Value replacement;
    bool missingReturnsInvalid = false;
    Invalid invalid = Invalid::kReturnInvalid;
    QZCommon_800::Value invalidReplacement;
    Outliers outliers = Outliers::kAsIs;
    double lowValue = 0.0, highValue = 0.0;
    // Default treatment and every value it can see is valid or missing: without a
    // working copy to normalise missing values in, the check does nothing.
    bool noOpWithoutCopy = false;
  };

  static std::vector<Interval> ReadIntervals(const DocumentContext& document,
                                             const std::string& field);
  bool IsMissing(const Field& field, const QZCommon_800::Value& value) const;
  bool IsValid(const Field& field, const QZCommon_800::Value& value) const;

  std::vector<Field> fields_;  // the active fields Apply checks
  std::vector<std::string> active_;
  std::vector<std::string> guaranteed_;
  std::vector<std::string> computedNumbers_;
  std::string target_;
  bool changesValues_ = false;
};

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_MININGSCHEMA_H_

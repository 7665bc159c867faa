// A model's Output element: the named result fields the document asks for, computed
// from a ModelResult and written into an output record by position.
#ifndef QZPLUGIN_CORE_OUTPUTFIELDS_H_
#define QZPLUGIN_CORE_OUTPUTFIELDS_H_

#include <memory>
#include <string>
#include <vector>

#include <xercesc/dom/DOMElement.hpp>

#include "Categories.h"
#include "FieldBinder.h"
#include "ModelResult.h"
#include "QZTransformation.h"
#include "Targets.h"
#include "Value.h"
#include "ValueRecord.h"

namespace QZPlugin_800 {

class DocumentContext;

// The OutputFields of one model, in document order. Supported features:
// predictedValue (the default), predictedDisplayValue, probability and confidence (of
// the category named by `value`, else of the predicted one), entityId and nodeId,
// standardError, and transformedValue (an expression over the model's input fields and
// the other output fields, computed by the transformation engine). Others are refused
// at compile time. A record without prediction leaves every field null.
class OutputStage {
 public:
  OutputStage();
  ~OutputStage();
  OutputStage(const OutputStage&) = delete;
  OutputStage& operator=(const OutputStage&) = delete;

  // Reads the Output element (null: no fields). `categories` (classification, else
  // null) and `targets` must outlive the stage. Throws CompileError for an unsupported
  // feature, a field naming another target, or an expression the engine refuses.
  void Compile(const xercesc::DOMElement* output, DocumentContext& document,
               const std::string& targetField, bool classification,
               const CategoryTable* categories, const TargetStage& targets);

  int Count() const { return writer_.Count(); }
  const std::string& Name(int index) const { return writer_.Name(index); }
  // Appends the fields, null, in document order.
  void Declare(QZCommon_800::ValueRecord& record) const { writer_.Declare(record); }
  // Writes every field for `result` into `out` (missing fields are added). `prepared`
  // is the record the model scored, which transformedValue expressions read.
  // Returns the engine's status when an expression fails, else success.
  QZCommon_800::QZStatus Write(const ModelResult& result,
                               const QZCommon_800::ValueRecord& prepared,
                               QZCommon_800::ValueRecord& out);

 private:
  enum class Feature { kPredictedValue, kPredictedDisplayValue, kProbability, kConfidence,
                       kEntityId, kStandardError, kTransformedValue };
  enum class Kind { kAsIs, kReal, kText };

  struct Field {
    Feature feature = Feature::kPredictedValue;
    Kind kind = Kind::kAsIs;
    int category = -1;          // the `value` category; -1: the predicted one
    bool foreignValue = false;  // `value` names no category: probability 0
  };

  void Assign(QZCommon_800::Value& out, const Field& field, const ModelResult& result) const;
  QZCommon_800::QZStatus WriteTransformed(const QZCommon_800::ValueRecord& prepared,
                                          QZCommon_800::ValueRecord& out);

  std::vector<Field> fields_;
  RecordWriter writer_;
  bool classification_ = false;
  const CategoryTable* categories_ = nullptr;
  const TargetStage* targets_ = nullptr;

  // transformedValue: an engine over (prepared fields + the other outputs).
  std::unique_ptr<QZTransformNS_8_0_0::QZTransformation> engine_;
  QZCommon_800::ValueRecord scratch_;
  uint64_t scratchFor_ = UINT64_MAX;  // the prepared layout scratch_ was built for
  size_t scratchSize_ = 0;
  std::vector<int> scratchOut_;  // per output field: its position in scratch_
};

}  // namespace QZPlugin_800

#endif  // QZPLUGIN_CORE_OUTPUTFIELDS_H_

// The transformation engine: computes a PMML document's derived fields into records.
#ifndef QZ_PLATFORM_QZTRANSFORMATION_H_
#define QZ_PLATFORM_QZTRANSFORMATION_H_

#include <istream>
#include <memory>
#include <string>
#include <vector>

#include "QZPlatformExport.h"
#include "QZStatus.h"
#include "ValueRecord.h"

namespace QZTransformNS_8_0_0 {

// Reads the DerivedFields of a TransformationDictionary (or LocalTransformations),
// compiles each once into an expression tree, and computes them into records in
// dependency order. Supported expressions: Constant (dataType, missing="true") and
// FieldRef (mapMissingTo); any other element is refused at load with
// TRANSFORM_UNSUPPORTED.
//
// Loading parses with the safe parser (a DOCTYPE or an external entity is refused) and
// needs Xerces-C++ to be initialised by the caller (XMLPlatformUtils::Initialize), as the
// scoring library does; otherwise it fails with TRANSFORM_PARSE_FAILED. A load that
// fails changes nothing: what was loaded before stays as it was. Transform needs no
// Xerces-C++.
//
// Values written into a record: a derived field of dataType double, float, integer,
// boolean or a numeric date type gets a real (text read as a number; "true"/"false" as
// 1/0 for boolean); dataType string gets text; date, time and dateTime values and fields
// without a dataType keep the kind they were computed with. A missing result is
// system-missing in a real field and null otherwise.
//
// Not copyable. One thread at a time (Transform keeps a cache of the record layout).
class QZTRANSFORM_API QZTransformation {
 public:
  // Status codes of the engine (270001 to 270099).
  enum StatusCode : long {
    TRANSFORM_PARSE_FAILED = 270001,     // the document or dictionary could not be parsed
    TRANSFORM_UNSUPPORTED = 270002,      // an unsupported element or function
    TRANSFORM_UNKNOWN_REFERENCE = 270003,  // a field or function that does not exist
    TRANSFORM_MALFORMED = 270004,        // wrong arguments, missing attribute, bad value
    TRANSFORM_CYCLE = 270005,            // derived fields that depend on each other
    TRANSFORM_INVALID_RESULT = 270006,   // an invalid result under returnInvalid
    TRANSFORM_INTERNAL_ERROR = 270007,   // out of memory or another unexpected failure
  };

  // An engine with nothing loaded: Transform leaves records unchanged.
  QZTransformation();
  virtual ~QZTransformation();
  QZTransformation(const QZTransformation&) = delete;
  QZTransformation& operator=(const QZTransformation&) = delete;

  // Reads the TransformationDictionary of a PMML document (the whole document or a
  // skeleton) from the stream's current position. keepExisting false: replaces what was
  // loaded before; true: adds to it. A document without a TransformationDictionary
  // loads no fields. When the document has a DataDictionary, a FieldRef to a name that
  // is neither one of its DataFields nor a derived field is refused
  // (TRANSFORM_UNKNOWN_REFERENCE); without one, such names are taken as input fields.
  // A DerivedField name loaded twice is refused (TRANSFORM_MALFORMED).
  QZCommon_800::QZStatus AddPMML(std::istream& pmml, bool keepExisting);
  // Reads a stand-alone TransformationDictionary or LocalTransformations element and adds
  // its fields to what is loaded (FieldRef names that are not derived fields are taken
  // as input fields, unless an earlier AddPMML named the data fields).
  QZCommon_800::QZStatus AddTransformationDictionary(std::istream& dictionary);

  // Computes every derived field in dependency order and writes it into the record,
  // appending the fields that are absent (in document order). Fields the expressions
  // read that the record lacks count as missing. The first call on a record layout binds
  // field positions; later calls on the same layout look up no names.
  QZCommon_800::QZStatus Transform(QZCommon_800::ValueRecord& record);
  // Adds each derived field to the record with a null value, in document order.
  // onlyMissing true: names the record already has are left alone; false: their values
  // become null too (they keep their place).
  QZCommon_800::QZStatus GetDerivedVariableInfo(QZCommon_800::ValueRecord& record,
                                                 bool onlyMissing);
  // The derived field names in document order (in load order across documents).
  std::vector<std::string> GetDerivedFieldNames() const;

  // The message of the last operation that failed, naming the field and the element
  // (for example "DerivedField 'ratio': element 'Apply' is not supported"); empty after
  // an operation that succeeded.
  const std::string& GetLastError() const;

 private:
  class Impl;
  std::unique_ptr<Impl> impl_;
};

}  // namespace QZTransformNS_8_0_0

#endif  // QZ_PLATFORM_QZTRANSFORMATION_H_

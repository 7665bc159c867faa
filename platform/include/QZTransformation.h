// The transformation engine: computes a PMML document's derived fields into records.
#ifndef QZ_PLATFORM_QZTRANSFORMATION_H_
#define QZ_PLATFORM_QZTRANSFORMATION_H_

#include <istream>
#include <memory>
#include <string>
#include <vector>

#include <xercesc/util/XercesDefs.hpp>

#include "QZPlatformExport.h"
#include "QZStatus.h"
#include "ValueRecord.h"

XERCES_CPP_NAMESPACE_BEGIN
class DOMElement;
XERCES_CPP_NAMESPACE_END

namespace QZTransformNS_8_0_0 {

// Reads the DerivedFields and DefineFunctions of a TransformationDictionary (or
// LocalTransformations), compiles each once into an expression tree, and computes the
// fields into records in dependency order. Supported expressions: Constant, FieldRef,
// NormContinuous, NormDiscrete, Discretize, MapValues (InlineTable), Apply with every
// built-in function of PMML 4.4 and calls of DefineFunctions. Aggregate, Lag, TextIndex,
// TableLocator and unknown elements or functions are refused at load with
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
// 1/0 for boolean), and so does one of optype continuous without a dataType; dataType
// string gets text; date, time and dateTime values and other fields without a dataType
// keep the kind they were computed with. A missing result is system-missing in a real
// field and null otherwise. Booleans computed by functions are 1 and 0.
//
// Expressions nest at most 250 levels deep, counted through calls of DefineFunctions;
// deeper ones are refused at load (TRANSFORM_MALFORMED), so that neither loading nor
// computing needs more than a small part of any thread's stack. Regular expressions
// (matches, replace) run in time linear in their text per match, on texts of at most
// 4096 bytes; formatNumber and formatDatetime patterns are validated before use.
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
    TRANSFORM_CYCLE = 270005,            // fields (or functions) that depend on each other
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
  // The same from a DOM element a caller already holds (for example a model's
  // LocalTransformations, read by a plug-in): the element is read, not kept or changed.
  // A null element, or one of another name, is refused with TRANSFORM_PARSE_FAILED.
  QZCommon_800::QZStatus AddTransformationDictionary(const xercesc::DOMElement* dictionary);

  // Computes every derived field in dependency order and writes it into the record,
  // appending the fields that are absent (in document order). Fields the expressions
  // read that the record lacks count as missing. The first call on a record layout binds
  // field positions; later calls on the same layout look up no names and, for numeric
  // fields, allocate nothing. When a field's result is invalid under
  // invalidValueTreatment="returnInvalid", fails with TRANSFORM_INVALID_RESULT: the
  // fields computed before it keep their values, it and the remaining ones are missing.
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

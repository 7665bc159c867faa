// Compiling PMML transformation elements (a DOM tree) into a Program.
#ifndef QZ_PLATFORM_TRANSFORM_LOADER_H_
#define QZ_PLATFORM_TRANSFORM_LOADER_H_

#include <string>

#include <xercesc/dom/DOMElement.hpp>

#include "Program.h"

namespace QZTransformNS_8_0_0 {
namespace internal {

// A refusal at load: an engine status code and the message naming field and element.
struct LoadError {
  long code;
  std::string message;
};

// The element's name without a namespace prefix, as UTF-8.
std::string ElementName(const xercesc::DOMElement& element);

// Records the DataFields of a DataDictionary element (names, dataTypes, valid, invalid
// and missing values, intervals) as the program's data fields.
void ReadDataDictionary(const xercesc::DOMElement& dataDictionary, Program& program);

// Compiles every DefineFunction and DerivedField of a TransformationDictionary or
// LocalTransformations element into the program, then checks field references (against
// the program's data fields, when it knows them, and its derived fields), calls between
// functions, nesting depths, and computes the evaluation order. Throws LoadError; the
// program is then half-built and must be dropped.
void CompileTransformations(const xercesc::DOMElement& root, Program& program);

}  // namespace internal
}  // namespace QZTransformNS_8_0_0

#endif  // QZ_PLATFORM_TRANSFORM_LOADER_H_

#include "StatusText.h"

#include <utility>

namespace qzscore {

std::string DescribeStatus(long code) {
  static const std::pair<long, const char*> kTexts[] = {
      {0, "success"},
      {103, "the XML parser (Xerces-C++) could not be initialised"},
      {104, "the document's data dictionary could not be parsed"},
      {105, "the document's root element is not PMML"},
      {108, "a field or parameter of the document lacks a required attribute (name, optype)"},
      {109, "a field has an unknown dataType, or an Interval margin that is not a number"},
      {111, "a field could not be added to the variable list (empty or repeated name?)"},
      {260002, "the factory already holds a model"},
      {260003, "no PMML file named, or several files without model IDs"},
      {260004, "the PMML file cannot be opened"},
      {260005, "the registry lists no model elements (\"modelDll\")"},
      {260006, "the registry names no plug-ins (\"scoringDll\")"},
      {260007,
       "the file is not a complete PMML document (malformed XML, another root element, "
       "or no closing PMML tag)"},
      {260009, "the model has no scorer, or no sub-model matches the record's split-field values"},
      {260010, "no scorer could be obtained for the document"},
      {260016, "the operation is not supported by this scorer"},
      {260017, "the raw propensity cannot be computed from the output record"},
      {260023, "the adjusted-propensity network's weight and bias arrays differ in length"},
      {260027, "a split field is not a column of the input"},
      {260028, "no model IDs given and not exactly one document"},
      {260029, "the model's scorer (a plug-in) failed with an exception"},
      {260099, "an unexpected failure inside the library"},
      {261001, "an input value is invalid or missing and the model refuses such records"},
      {270001, "the transformations could not be parsed"},
      {270002, "a transformation uses an unsupported element or function"},
      {270003, "a transformation refers to a field or function that does not exist"},
      {270004, "a transformation is malformed"},
      {270005, "derived fields depend on each other in a cycle"},
      {270006, "a transformation's result is invalid (invalidValueTreatment \"returnInvalid\")"},
  };
  for (const auto& [known, text] : kTexts) {
    if (known == code) return std::to_string(code) + ": " + text;
  }
  return std::to_string(code) + ": a status code without a known meaning (from the plug-in?)";
}

}  // namespace qzscore

// The exception the PMML reading services throw for malformed model content.
#ifndef QZSCORING_SCORINGEXCEPTION_H_
#define QZSCORING_SCORINGEXCEPTION_H_

#include <cstdint>
#include <string>

#include "QZScoringExport.h"

namespace QZScoring_800 {

// A failure while reading PMML: a numeric code and a message. Thrown by value and
// caught by reference. The parsing services that plug-ins call pass it on to their
// caller; every operation a host reaches catches it and reports a status instead.
class QZSCORING_API ScoringException {
 public:
  // What went wrong, as a plain 32-bit number (GetErrorCode gives it as an int).
  enum ExceptionCode : std::int32_t {
    SCORING_EXC_NONE = 0,                // no failure (default-constructed exception)
    SCORING_EXC_INVALID_SPLIT = 1,       // a split value or attribute not allowed here
    SCORING_EXC_INVALID_VALUE = 3,       // a number or category text that is not valid
    SCORING_EXC_MISSING_ELEMENT = 4,     // a required element or value list is absent
    SCORING_EXC_INVALID_RANGE = 5,       // a value range or range operator not supported
    SCORING_EXC_UNKNOWN_VARIABLE = 8,    // a field that is not a usable variable
    SCORING_EXC_INVALID_OPERATOR = 9,    // an operator or node not valid for the split
    SCORING_EXC_INVALID_BOOLEAN_OPERATOR = 11,  // a boolean or array operator unknown
    SCORING_EXC_ARRAY_SIZE_MISMATCH = 12  // an array whose element count differs from n
  };

  // Code SCORING_EXC_NONE and an empty message.
  ScoringException();
  // The given code and a copy of the message.
  ScoringException(ExceptionCode code, const std::string& message);
  ScoringException(const ScoringException& other);
  ScoringException& operator=(const ScoringException& other);
  virtual ~ScoringException();

  // The code as an int.
  int GetErrorCode() const;
  // A copy of the message.
  std::string GetErrorMessage() const;

 private:
  ExceptionCode fCode;
  std::string fMessage;
};

}  // namespace QZScoring_800

#endif  // QZSCORING_SCORINGEXCEPTION_H_

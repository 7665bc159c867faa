#include "ScoringException.h"

namespace QZScoring_800 {

ScoringException::ScoringException() : fCode(SCORING_EXC_NONE) {}

ScoringException::ScoringException(ExceptionCode code, const std::string& message)
    : fCode(code), fMessage(message) {}

ScoringException::ScoringException(const ScoringException& other) = default;

ScoringException& ScoringException::operator=(const ScoringException& other) = default;

ScoringException::~ScoringException() = default;

int ScoringException::GetErrorCode() const { return static_cast<int>(fCode); }

std::string ScoringException::GetErrorMessage() const { return fMessage; }

}  // namespace QZScoring_800

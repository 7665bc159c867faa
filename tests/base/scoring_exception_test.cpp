// ScoringException: code and message survive construction, copying and throwing.
#include "ScoringException.h"

#include <gtest/gtest.h>

namespace QZScoring_800 {
namespace {

TEST(ScoringExceptionTest, CarriesCodeAndMessageThroughCopiesAndThrows) {
  const ScoringException none;
  EXPECT_EQ(none.GetErrorCode(), 0);
  EXPECT_EQ(none.GetErrorMessage(), "");

  const ScoringException original(ScoringException::SCORING_EXC_ARRAY_SIZE_MISMATCH,
                                  "Number of Elements doesn't match with array size!");
  const ScoringException copy(original);
  EXPECT_EQ(copy.GetErrorCode(), 12);
  EXPECT_EQ(copy.GetErrorMessage(), "Number of Elements doesn't match with array size!");

  ScoringException assigned;
  assigned = original;
  EXPECT_EQ(assigned.GetErrorCode(), original.GetErrorCode());
  EXPECT_EQ(assigned.GetErrorMessage(), original.GetErrorMessage());

  try {
    throw ScoringException(ScoringException::SCORING_EXC_INVALID_VALUE,
                           "Invalid integer string -- 1x");
  } catch (const ScoringException& caught) {
    EXPECT_EQ(caught.GetErrorCode(), 3);
    EXPECT_EQ(caught.GetErrorMessage(), "Invalid integer string -- 1x");
  }
}

}  // namespace
}  // namespace QZScoring_800

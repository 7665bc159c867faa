// The score parser's destructor lives in the library so that its type information is
// defined once for the library and every plug-in.

#include "ScoringScoreParser.h"

namespace QZScoring_800 {

ScoringScoreParser::~ScoringScoreParser() = default;

}  // namespace QZScoring_800

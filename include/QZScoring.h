// Everything a host or a plug-in needs: every public header of the scoring library and
// of the platform components. Include this one header and link QZScoring::scoring.
#ifndef QZSCORING_QZSCORING_H_
#define QZSCORING_QZSCORING_H_

// Platform: common data, XML input, transformation engine.
#include "QZMV.h"
#include "QZStatus.h"
#include "Value.h"
#include "ValueRecord.h"
#include "IQZScore.h"
#include "ProgressReport.h"
#include "QZDisplay.h"
#include "XMLElement.h"
#include "QZVarList.h"
#include "QZSettings.h"
#include "QZXInputSource.h"
#include "QZSafeParser.h"
#include "QZTransformation.h"

// The scoring library.
#include "QZScoringConst.h"
#include "QZScoringTags.h"
#include "ScoringAbsModel.h"
#include "ScoringAdjustedPropensity.h"
#include "ScoringBaseParser.h"
#include "ScoringDynamicLoadedLibrary.h"
#include "ScoringException.h"
#include "ScoringFactory.h"
#include "ScoringHRZXMLScorer.h"
#include "ScoringModel.h"
#include "ScoringModelAttr.h"
#include "ScoringMutex.h"
#include "ScoringMutexContainer.h"
#include "ScoringMutexLock.h"
#include "ScoringOutputField.h"
#include "ScoringPMMLParser.h"
#include "ScoringPMMLSAX2Handler.h"
#include "ScoringPMMLTags.h"
#include "ScoringSAX2Handler.h"
#include "ScoringScoreParser.h"
#include "ScoringScorerFactory.h"
#include "ScoringSoloModel.h"
#include "ScoringStatusCodes.h"
#include "ScoringStr.h"
#include "ScoringTranscoder.h"
#include "ScoringTransformationsScorer.h"

#endif  // QZSCORING_QZSCORING_H_

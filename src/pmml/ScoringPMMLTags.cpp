// The PMML tag constants are defined in include/ScoringPMMLTags.h (inline constexpr).

// A model created from document text through the factory with the registry of the
// reference plug-ins, and the check that such a document is refused.
#ifndef QZ_TESTS_REFERENCE_PLUGINS_H_
#define QZ_TESTS_REFERENCE_PLUGINS_H_

#include <iostream>
#include <memory>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "QZDisplay.h"
#include "ReferenceRegistry.h"
#include "QZSettings.h"
#include "ScoringFactory.h"
#include "ScoringModel.h"

namespace qztest {

// Null (with the factory's status in *status) when the model cannot be created.
inline std::unique_ptr<QZScoring_800::ScoringModel> CreateModel(const std::string& pmml,
                                                                 long* status = nullptr) {
  QZXML_800::QZSettings settings = ReferenceRegistry();
  QZScoring_800::ScoringFactory factory;
  std::istringstream in(pmml);
  std::unique_ptr<QZScoring_800::ScoringModel> model(factory.CreateScoringModel(settings, in));
  if (status != nullptr) *status = factory.GetStatus().GetErrorCode();
  factory.Detach();
  return model;
}

// A plug-in refuses the document at creation: no model, status 260010, and a diagnostic
// line that contains message.
inline void ExpectRefused(const std::string& pmml, const std::string& message) {
  std::ostringstream notes;
  QZDisplay_800::SetDisplayStream(&notes);
  long status = 0;
  auto model = CreateModel(pmml, &status);
  QZDisplay_800::SetDisplayStream(&std::cerr);
  EXPECT_EQ(model, nullptr) << message;
  EXPECT_EQ(status, 260010) << message;
  EXPECT_NE(notes.str().find(message), std::string::npos) << notes.str();
}

}  // namespace qztest

#endif  // QZ_TESTS_REFERENCE_PLUGINS_H_

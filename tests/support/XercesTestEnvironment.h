// Including this header initialises Xerces-C++ once for the whole test program, before
// the first test, and terminates it after the last.
#ifndef QZ_TESTS_XERCES_TEST_ENVIRONMENT_H_
#define QZ_TESTS_XERCES_TEST_ENVIRONMENT_H_

#include <gtest/gtest.h>
#include <xercesc/util/PlatformUtils.hpp>

namespace qztest {

class XercesEnvironment : public ::testing::Environment {
 public:
  void SetUp() override { xercesc::XMLPlatformUtils::Initialize(); }
  void TearDown() override { xercesc::XMLPlatformUtils::Terminate(); }
};

inline ::testing::Environment* const kXercesEnvironment =
    ::testing::AddGlobalTestEnvironment(new XercesEnvironment);

}  // namespace qztest

#endif  // QZ_TESTS_XERCES_TEST_ENVIRONMENT_H_

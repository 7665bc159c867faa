// Every test runs in a scratch folder of its own (<program's folder>/<Suite>.<Test>), so
// tests that ctest runs in parallel never share the files they write (configuration,
// trace logs, inputs and outputs of the command-line host).

#include <sys/stat.h>
#include <unistd.h>

#include <string>

#include <gtest/gtest.h>

namespace {

class PerTestDirectory : public ::testing::EmptyTestEventListener {
 public:
  void OnTestStart(const ::testing::TestInfo& test) override {
    char buffer[4096];
    if (getcwd(buffer, sizeof buffer) == nullptr) return;
    base_ = buffer;
    const std::string folder =
        base_ + "/" + test.test_suite_name() + "." + test.name();
    mkdir(folder.c_str(), 0777);
    if (chdir(folder.c_str()) != 0) base_.clear();
  }

  void OnTestEnd(const ::testing::TestInfo&) override {
    if (!base_.empty() && chdir(base_.c_str()) != 0) {
      ADD_FAILURE() << "cannot return to " << base_;
    }
    base_.clear();
  }

 private:
  std::string base_;
};

const bool kRegistered = [] {
  ::testing::UnitTest::GetInstance()->listeners().Append(new PerTestDirectory);
  return true;
}();

}  // namespace

#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>

#include <gmock/gmock.h>

#include <csignal>
#include <cstdio>
#include <cstdlib>

using lumora::assertThat;
using lumora::Platform;

namespace {

/// Prints its lines to standard error, marked.
class MarkingLog final : public lumora::Log {
public:
  void write(std::string_view line) override { std::fprintf(stderr, "log: %.*s\n", int(line.size()), line.data()); }
};

/// A log that fails an assertion of its own.
class FailingLog final : public lumora::Log {
public:
  void write(std::string_view) override { assertThat(false, "inner", "write", "FailingLog"); }
};

void failWithLog(std::shared_ptr<lumora::Log> log) {
  auto platform = Platform::current();
  platform.log = std::move(log);
  Platform::install(platform);
  assertThat(false, "self.tool != nil", "startExecution", "LMRAction");
}

} // namespace

TEST(Assertion, goesOn_whenTheConditionHolds) {
  assertThat(true, "self.tool != nil", "startExecution", "LMRAction");
}

TEST(AssertionDeathTest, namesConditionOperationAndUnitInOneLine_whenItFails) {
  EXPECT_DEATH(assertThat(false, "self.tool != nil", "startExecution", "LMRAction"),
               "^Assertion failed: self.tool != nil, in startExecution of LMRAction\n");
}

TEST(AssertionDeathTest, abortsTheProcess_whenItFails) {
  EXPECT_EXIT(assertThat(false, "condition", "operation", "unit"), testing::KilledBySignal(SIGABRT), "condition");
}

TEST(AssertionDeathTest, writesTheSameLineToTheLog_whenItFails) {
  EXPECT_DEATH(failWithLog(std::make_shared<MarkingLog>()),
               "log: Assertion failed: self.tool != nil, in startExecution of LMRAction\n");
}

TEST(AssertionDeathTest, stillReportsAndAborts_whenTheLogFailsAnAssertionItself) {
  EXPECT_EXIT(failWithLog(std::make_shared<FailingLog>()), testing::KilledBySignal(SIGABRT),
              "self.tool != nil.*\n.*inner, in write of FailingLog");
}

#include "FaultRun.h"

#include <LumoraKit/platform/linux/PosixToolRunner.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>

namespace lumora::tests {
namespace {

using testing::HasSubstr;

// More than a pipe holds.
const std::string longText(std::size_t{200} * 1024, 'x');
constexpr int cannotRun = 127;

class ToolRun : public FaultScenario {
public:
  using FaultScenario::FaultScenario;

protected:
  void run(const std::string& script) {
    status_ = backend::PosixToolRunner().run("/bin/sh", {"-c", script}, longText, output_, error_);
  }

  // Either everything as the tool had it, or an error that names the tool.
  void expectWhole(int status, const std::string& output, const std::string& error, const Fault& fault) const {
    if (fault.call == 0 || status_ != cannotRun) {
      EXPECT_EQ(status_, status);
      EXPECT_EQ(output_.size(), output.size());
      EXPECT_TRUE(output_ == output);
      EXPECT_EQ(error_, error);
    } else {
      EXPECT_THAT(error_, HasSubstr("/bin/sh: "));
    }
  }

  int status_ = -1;
  std::string output_;
  std::string error_;
};

class FilterRun final : public ToolRun {
public:
  using ToolRun::ToolRun;
  void act() override { run("cat; echo complaint >&2; exit 3"); }
  void check(const Fault& fault) override { expectWhole(3, longText, "complaint\n", fault); }
};

TEST(ToolRunnerFaults, giveWholeOutputsOrAnError) {
  expectHolds(runWithFaults<FilterRun>(), {"pipe2", "posix_spawn", "pidfd_open", "poll", "read", "write", "waitpid",
                                           "close", "posix_spawn_file_actions_adddup2"});
}

class InputLeftAlone final : public ToolRun {
public:
  using ToolRun::ToolRun;
  void act() override { run("exec <&-; echo done"); }
  void check(const Fault& fault) override { expectWhole(0, "done\n", "", fault); }
};

TEST(ToolRunnerFaults, giveWholeOutputsOrAnError_whenTheToolReadsNothing) {
  expectHolds(runWithFaults<InputLeftAlone>(), {"write", "read", "poll"});
}

class MissingTool final : public ToolRun {
public:
  using ToolRun::ToolRun;
  void act() override {
    status_ = backend::PosixToolRunner().run((folder_ / "missing").string(), {}, "", output_, error_);
  }
  void check(const Fault& /*fault*/) override {
    EXPECT_EQ(status_, cannotRun);
    EXPECT_THAT(error_, HasSubstr("missing: "));
  }
};

TEST(ToolRunnerFaults, giveAnError_whenThereIsNoTool) {
  expectHolds(runWithFaults<MissingTool>(), {"pipe2", "posix_spawn", "close"});
}

} // namespace
} // namespace lumora::tests

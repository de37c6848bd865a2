#include "RecordingTool.h"
#include "support/MainLoop.h"

#include <LumoraKit/actions/LMRActionFactory.h>

#include <gmock/gmock.h>

#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <thread>

#include <unistd.h>

namespace {

// A tool that writes half a reply and then nothing more for as long as its caller lives. After that it removes what it
// made: a caller that quits does not.
class HangingToolTest : public lumora::tests::RecordingToolTest {
protected:
  HangingToolTest() {
    // The tool's process is noted in a program that is run anew.
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    lumora::tests::writeFile(folder_ / "root/usr/bin/lumctl", "#!/bin/sh\nfolder='" + folder_.path().string() + R"('
printf '<plist version="1.0"><dict>'
echo $$ > "$folder/starting"
mv "$folder/starting" "$folder/process"
while kill -0 $PPID; do sleep 0.1; done 2> /dev/null
rm -rf "$folder"
)");
  }

  pid_t process() const { return std::atoi(lumora::tests::contentOf(folder_ / "process").c_str()); }

  void waitForTheTool() const {
    const auto limit = std::chrono::steady_clock::now() + lumora::tests::generousLimit;
    while (!std::filesystem::exists(folder_ / "process") && std::chrono::steady_clock::now() < limit) {
      std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
  }

  [[noreturn]] void startAndQuit() const {
    LMRActionFactory::actionToListCurrentTransfers()->start();
    waitForTheTool();
    std::exit(7);
  }
};

TEST_F(HangingToolTest, letsTheCallerQuitCleanly) {
  EXPECT_EXIT(startAndQuit(), testing::ExitedWithCode(7), "");
}

TEST_F(HangingToolTest, isAFailedRun_whenItIsKilled) {
  const auto action = LMRActionFactory::actionToListCurrentTransfers();
  std::jthread runner([&action] { action->runSynchronously(); });
  waitForTheTool();
  ASSERT_GT(process(), 0);
  ::kill(process(), SIGKILL);
  runner.join();
  ASSERT_TRUE(action->error());
  EXPECT_EQ(action->error()->code(), 128 + SIGKILL);
  EXPECT_EQ(action->result(), nullptr);
}

} // namespace
